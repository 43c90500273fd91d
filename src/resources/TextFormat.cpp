#include "resources/TextFormat.h"

namespace ac {

std::string FormatText(std::string_view format, std::initializer_list<std::string_view> args) {
    static constexpr std::string_view kConversions = "sdiuxXcfgeEGp";
    std::string out;
    out.reserve(format.size() + 32);
    auto next = args.begin();
    std::size_t i = 0;
    while (i < format.size()) {
        char c = format[i];
        if (c != '%' || i + 1 >= format.size()) {
            out += c;
            ++i;
            continue;
        }
        if (format[i + 1] == '%') {
            out += '%';
            i += 2;
            continue;
        }
        // Flags, width, precision and length modifiers, then the conversion letter.
        std::size_t end = format.find_first_not_of("-+ #0123456789.hlLqjzt", i + 1);
        if (end == std::string_view::npos ||
            kConversions.find(format[end]) == std::string_view::npos || next == args.end()) {
            out += c;
            ++i;
            continue;
        }
        out += *next++;
        i = end + 1;
    }
    return out;
}

}  // namespace ac
