#pragma once
// The C library's reading of numbers and blanks, on string_views and without locale or
// undefined overflow: ini values and language headers are read as atoi and isspace read them.
//
// Thread contract: any thread.

#include <algorithm>
#include <climits>
#include <string_view>

namespace ac {

constexpr bool IsAsciiSpace(char c) {
    return c == ' ' || c == '\t' || c == '\n' || c == '\v' || c == '\f' || c == '\r';
}

constexpr char ToLowerAscii(char c) {
    return c >= 'A' && c <= 'Z' ? static_cast<char>(c - 'A' + 'a') : c;
}

constexpr bool EqualsIgnoringCase(std::string_view a, std::string_view b) {
    return a.size() == b.size() && std::equal(a.begin(), a.end(), b.begin(), [](char x, char y) {
               return ToLowerAscii(x) == ToLowerAscii(y);
           });
}

constexpr std::string_view TrimAsciiSpace(std::string_view s) {
    while (!s.empty() && IsAsciiSpace(s.front())) s.remove_prefix(1);
    while (!s.empty() && IsAsciiSpace(s.back())) s.remove_suffix(1);
    return s;
}

constexpr int HexDigitValue(char c) {
    if (c >= '0' && c <= '9') return c - '0';
    c = ToLowerAscii(c);
    return c >= 'a' && c <= 'f' ? c - 'a' + 10 : -1;
}

// atoi: leading blanks, a sign, digits up to the first other character; saturating where
// atoi's overflow would be undefined.
constexpr int ReadAtoi(std::string_view s) {
    std::size_t i = 0;
    while (i < s.size() && IsAsciiSpace(s[i])) ++i;
    bool negative = false;
    if (i < s.size() && (s[i] == '+' || s[i] == '-')) {
        negative = s[i] == '-';
        ++i;
    }
    long long value = 0;
    for (; i < s.size() && s[i] >= '0' && s[i] <= '9'; ++i) {
        value = std::min<long long>(value * 10 + (s[i] - '0'), 1LL + INT_MAX);
    }
    return static_cast<int>(std::clamp<long long>(negative ? -value : value, INT_MIN, INT_MAX));
}

}  // namespace ac
