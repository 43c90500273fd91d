#include "resources/CodePage.h"

#include <iconv.h>

#include <cerrno>
#include <cstdint>

namespace ac {
namespace {

constexpr std::string_view kReplacement = "\xEF\xBF\xBD";  // U+FFFD in UTF-8

// Windows code pages whose glibc name is simply "CP" and the number. The IBM numbers that glibc
// also knows as CPnnn (930, 933, ...) are EBCDIC and are no Windows code page: they stay out.
constexpr int kPlainCpNumbers[] = {437,  737,  775,  850,  852,  855,  857,  858,  860, 861, 862,
                                   863,  864,  865,  866,  869,  874,  932,  936,  949, 950, 1250,
                                   1251, 1252, 1253, 1254, 1255, 1256, 1257, 1258, 1361};

struct NamedCodePage {
    int codePage;
    const char* name;
};

constexpr NamedCodePage kNamedCodePages[] = {
    {10000, "MACINTOSH"},   {10007, "MAC-CYRILLIC"}, {20127, "ANSI_X3.4-1968"},
    {20866, "KOI8-R"},      {21866, "KOI8-U"},       {28591, "ISO-8859-1"},
    {28592, "ISO-8859-2"},  {28593, "ISO-8859-3"},   {28594, "ISO-8859-4"},
    {28595, "ISO-8859-5"},  {28596, "ISO-8859-6"},   {28597, "ISO-8859-7"},
    {28598, "ISO-8859-8"},  {28599, "ISO-8859-9"},   {28603, "ISO-8859-13"},
    {28605, "ISO-8859-15"}, {38598, "ISO-8859-8"},   {50220, "ISO-2022-JP"},
    {51932, "EUC-JP"},      {51936, "EUC-CN"},       {51949, "EUC-KR"},
    {54936, "GB18030"},     {65000, "UTF-7"},        {kCodePageUtf8, "UTF-8"},
};

// Length of the valid UTF-8 sequence at the start of s, or 0 when its first byte starts none.
// The ranges of the second byte keep out overlong forms, surrogates and values past U+10FFFF.
std::size_t ValidSequenceLength(std::string_view s) {
    auto byte = [&](std::size_t i) { return static_cast<std::uint8_t>(s[i]); };
    const std::uint8_t lead = byte(0);
    if (lead < 0x80) {
        return 1;
    }
    std::size_t length = 0;
    std::uint8_t low = 0x80, high = 0xBF;
    if (lead >= 0xC2 && lead <= 0xDF) {
        length = 2;
    } else if (lead >= 0xE0 && lead <= 0xEF) {
        length = 3;
        low = lead == 0xE0 ? 0xA0 : 0x80;
        high = lead == 0xED ? 0x9F : 0xBF;
    } else if (lead >= 0xF0 && lead <= 0xF4) {
        length = 4;
        low = lead == 0xF0 ? 0x90 : 0x80;
        high = lead == 0xF4 ? 0x8F : 0xBF;
    } else {
        return 0;
    }
    if (s.size() < length || byte(1) < low || byte(1) > high) {
        return 0;
    }
    for (std::size_t i = 2; i < length; ++i) {
        if (byte(i) < 0x80 || byte(i) > 0xBF) {
            return 0;
        }
    }
    return length;
}

}  // namespace

std::string CodePageCharsetName(int codePage) {
    for (int number : kPlainCpNumbers) {
        if (number == codePage) {
            return "CP" + std::to_string(codePage);
        }
    }
    for (const auto& named : kNamedCodePages) {
        if (named.codePage == codePage) {
            return named.name;
        }
    }
    return {};
}

std::string SanitizeUtf8(std::string_view bytes) {
    std::string out;
    out.reserve(bytes.size());
    while (!bytes.empty()) {
        std::size_t length = ValidSequenceLength(bytes);
        if (length == 0) {
            out += kReplacement;
            length = 1;
        } else {
            out += bytes.substr(0, length);
        }
        bytes.remove_prefix(length);
    }
    return out;
}

CodePageConverter::CodePageConverter(int codePage) {
    std::string name = CodePageCharsetName(codePage);
    if (name.empty() || codePage == kCodePageUtf8) {
        return;
    }
    iconv_t cd = ::iconv_open("UTF-8", name.c_str());
    if (cd != reinterpret_cast<iconv_t>(-1)) {
        m_iconv = cd;
    }
}

CodePageConverter::~CodePageConverter() {
    if (m_iconv) {
        ::iconv_close(static_cast<iconv_t>(m_iconv));
    }
}

std::string CodePageConverter::ToUtf8(std::string_view bytes) {
    if (!m_iconv) {
        return SanitizeUtf8(bytes);
    }
    auto cd = static_cast<iconv_t>(m_iconv);
    ::iconv(cd, nullptr, nullptr, nullptr, nullptr);

    std::string out;
    out.reserve(bytes.size() * 2);
    char buffer[1024];
    // iconv's input pointer is not const for historic reasons; it never writes through it.
    char* in = const_cast<char*>(bytes.data());
    std::size_t inLeft = bytes.size();
    while (inLeft > 0) {
        char* outPtr = buffer;
        std::size_t outLeft = sizeof buffer;
        const std::size_t inBefore = inLeft;
        const std::size_t result = ::iconv(cd, &in, &inLeft, &outPtr, &outLeft);
        out.append(buffer, static_cast<std::size_t>(outPtr - buffer));
        if (result != static_cast<std::size_t>(-1)) {
            continue;
        }
        const bool progressed = inLeft != inBefore || outPtr != buffer;
        if (errno == E2BIG && progressed) {
            continue;
        }
        // EILSEQ (a byte the code page does not define), EINVAL (a sequence cut off at the
        // end of the line) or anything else: give up one byte, so the loop always moves on.
        out += kReplacement;
        ++in;
        --inLeft;
        ::iconv(cd, nullptr, nullptr, nullptr, nullptr);
    }
    // Encodings with shift states may owe a closing sequence.
    char* outPtr = buffer;
    std::size_t outLeft = sizeof buffer;
    ::iconv(cd, nullptr, nullptr, &outPtr, &outLeft);
    out.append(buffer, static_cast<std::size_t>(outPtr - buffer));
    return out;
}

std::string CodePageToUtf8(std::string_view bytes, int codePage) {
    CodePageConverter converter(codePage);
    return converter.ToUtf8(bytes);
}

}  // namespace ac
