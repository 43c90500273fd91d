#include "platform/CommandLine.h"

namespace ac::platform {

std::vector<std::string> SplitCommandLine(std::string_view text) {
    std::vector<std::string> words;
    std::string word;
    bool inWord = false;
    bool quoted = false;
    for (char c : text) {
        if (c == '"') {
            quoted = !quoted;
            inWord = true;  // "" is an empty word of its own
        } else if (!quoted && (c == ' ' || c == '\t' || c == '\n' || c == '\r')) {
            if (inWord) {
                words.push_back(std::move(word));
                word.clear();
                inWord = false;
            }
        } else {
            word += c;
            inWord = true;
        }
    }
    if (inWord) {
        words.push_back(std::move(word));
    }
    return words;
}

std::string QuoteCommandValue(std::string_view value) {
    std::string text;
    text.reserve(value.size() + 2);
    text += '"';
    for (char c : value) {
        if (c == '"') {
            text += kQuoteStandIn;
        } else if (c == kQuoteStandIn) {
            text += kValueEscape;
            text += 'v';
        } else if (c == kValueEscape) {
            text += kValueEscape;
            text += kValueEscape;
        } else {
            text += c;
        }
    }
    text += '"';
    return text;
}

std::string RestoreCommandValue(std::string_view word) {
    std::string value;
    value.reserve(word.size());
    for (std::size_t i = 0; i < word.size(); ++i) {
        const char c = word[i];
        if (c == kQuoteStandIn) {
            value += '"';
        } else if (c == kValueEscape && i + 1 < word.size() &&
                   (word[i + 1] == 'v' || word[i + 1] == kValueEscape)) {
            value += word[++i] == 'v' ? kQuoteStandIn : kValueEscape;
        } else {
            value += c;
        }
    }
    return value;
}

}  // namespace ac::platform
