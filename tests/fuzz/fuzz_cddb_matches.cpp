// A query reply comes from any server on the network: any body must give matches, no match or
// a protocol error without a crash; every match must have a category, a title and valid UTF-8,
// and the status decides the answer.
#include "cddb/CddbClient.h"
#include "resources/CodePage.h"

#include <cstdint>
#include <string>
#include <vector>

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    const std::string_view body(reinterpret_cast<const char*>(data), size);
    std::vector<cddb::CddbMatch> matches;
    std::vector<std::string> lines;
    const cddb::MatchResult result = cddb::ParseMatchList(body, matches, lines);
    if ((result == cddb::MatchResult::Matches) == matches.empty())
        __builtin_trap();
    if (matches.size() > lines.size() + 1)
        __builtin_trap();
    for (const cddb::CddbMatch& match : matches) {
        if (match.category.empty() || match.category.find_first_of(" \t\r\n") != std::string::npos)
            __builtin_trap();
        if (ac::SanitizeUtf8(match.title) != match.title ||
            ac::SanitizeUtf8(match.artist) != match.artist)
            __builtin_trap();
    }
    if (result == cddb::MatchResult::NoMatch && !body.starts_with("202"))
        __builtin_trap();
    // The reply as a whole HTTP answer: the body behind the first blank line.
    const std::string_view behind = cddb::ReplyBody(body);
    if (behind.size() > body.size())
        __builtin_trap();
    return 0;
}
