// One match line of a server's list: it parses into a category word, an id of at most eight
// hexadecimal digits and a title, or not at all; parsing never crashes, and a parsed line
// parses again to the same match once its line end is cut.
#include "cddb/CddbClient.h"
#include "resources/CodePage.h"

#include <cstdint>
#include <string>

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    const std::string_view line(reinterpret_cast<const char*>(data), size);
    cddb::CddbMatch match;
    if (!cddb::ParseMatchLine(line, match))
        return 0;
    if (match.category.empty() || match.category.size() >= size + 1)
        __builtin_trap();
    if (match.title.empty() && match.artist.empty())
        __builtin_trap();
    if (ac::SanitizeUtf8(match.title) != match.title)
        __builtin_trap();
    cddb::CddbMatch again;
    const std::size_t end = std::min(line.find('\n'), line.size());
    if (!cddb::ParseMatchLine(line.substr(0, end), again) || again.discId != match.discId ||
        again.category != match.category || again.title != match.title)
        __builtin_trap();
    return 0;
}
