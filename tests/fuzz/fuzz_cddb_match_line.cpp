// One match line of a server's list: it parses into a category word, an id of at most eight
// hexadecimal digits and a title in valid UTF-8, or not at all, and parsing never crashes. (A
// parsed line cut at its line end need not parse again: a bare "\n" left inside the first cut
// ends the second one.)
#include "cddb/CddbClient.h"
#include "resources/CodePage.h"

#include <cstdint>
#include <string>

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    const std::string_view line(reinterpret_cast<const char*>(data), size);
    cddb::CddbMatch match;
    if (!cddb::ParseMatchLine(line, match))
        return 0;
    if (match.category.empty() || match.category.find_first_of(" \t\r\n") != std::string::npos)
        __builtin_trap();
    if (ac::SanitizeUtf8(match.title) != match.title ||
        ac::SanitizeUtf8(match.artist) != match.artist)
        __builtin_trap();
    if (match.title.find("\r\n") != std::string::npos)
        __builtin_trap();
    return 0;
}
