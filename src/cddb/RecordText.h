#pragma once
// Small text steps that the xmcd parser and the record files share, on top of the C-library
// readings of resources/TextScan.h.
//
// Thread contract: any thread.

#include "resources/TextScan.h"

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

namespace cddb {

using ac::ReadAtoi;
using ac::TrimAsciiSpace;

inline void ReplaceAll(std::string& text, std::string_view from, std::string_view to) {
    for (std::size_t at = 0; (at = text.find(from, at)) != std::string::npos; at += to.size()) {
        text.replace(at, from.size(), to);
    }
}

// strtoul(text, 16) kept to 32 bits: blanks, an optional "0x", hexadecimal digits; saturating.
inline std::uint32_t ReadHex(std::string_view text) {
    text = TrimAsciiSpace(text);
    if (text.size() > 2 && text[0] == '0' && (text[1] == 'x' || text[1] == 'X') &&
        ac::HexDigitValue(text[2]) >= 0) {
        text.remove_prefix(2);
    }
    std::uint64_t value = 0;
    for (std::size_t i = 0; i < text.size() && ac::HexDigitValue(text[i]) >= 0; ++i) {
        value = value * 16 + static_cast<std::uint64_t>(ac::HexDigitValue(text[i]));
        if (value > 0xFFFFFFFFu) {
            return 0xFFFFFFFFu;
        }
    }
    return static_cast<std::uint32_t>(value);
}

// The first `limit` blank-separated words of text.
inline std::vector<std::string_view> SplitWords(std::string_view text, std::size_t limit) {
    std::vector<std::string_view> words;
    while (words.size() < limit) {
        text = TrimAsciiSpace(text);
        if (text.empty()) {
            break;
        }
        std::size_t end = 0;
        while (end < text.size() && !ac::IsAsciiSpace(text[end])) {
            ++end;
        }
        words.push_back(text.substr(0, end));
        text.remove_prefix(end);
    }
    return words;
}

// Text behind its first `count` characters, counting a UTF-8 sequence as one character.
inline std::string_view SkipCharacters(std::string_view text, std::size_t count) {
    std::size_t at = 0;
    for (std::size_t skipped = 0; skipped < count && at < text.size(); ++skipped) {
        ++at;
        while (at < text.size() && (static_cast<unsigned char>(text[at]) & 0xC0) == 0x80) {
            ++at;
        }
    }
    return text.substr(at);
}

}  // namespace cddb
