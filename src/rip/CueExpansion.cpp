#include "rip/CueExpansion.h"

#include "medialist/CueSheet.h"
#include "rip/CueSheet.h"

#include <fstream>
#include <iterator>
#include <mutex>

namespace ac {
namespace {

std::mutex s_strictReaderMutex;  // g_CueSheet is one record for the whole program

// The strict reader keeps 64 bytes of a title, which may end inside a UTF-8 sequence.
std::string WithoutBrokenTail(std::string text) {
    std::size_t start = text.size();
    while (start > 0 && (static_cast<unsigned char>(text[start - 1]) & 0xC0) == 0x80) --start;
    if (start == 0) return text;
    const auto lead = static_cast<unsigned char>(text[start - 1]);
    const std::size_t need = lead >= 0xF0 ? 4 : lead >= 0xE0 ? 3 : lead >= 0xC0 ? 2 : 1;
    if (text.size() - (start - 1) < need) text.resize(start - 1);
    return text;
}

std::string TrimLineEnd(std::string text) {
    while (!text.empty() && (text.back() == '\n' || text.back() == '\r')) text.pop_back();
    return text;
}

}  // namespace

CueExpansion ExpandCueSheet(const std::string& sheetPath) {
    CueExpansion expansion;
    std::ifstream in(sheetPath, std::ios::binary);
    if (!in) {
        expansion.error = sheetPath + ": cannot be read";
        return expansion;
    }
    const std::string bytes((std::istreambuf_iterator<char>(in)), {});
    const std::string text = DecodeCueText(bytes);
    std::vector<std::string> titles;
    std::string strictError;
    {
        std::lock_guard lock(s_strictReaderMutex);
        std::string diagnostics;
        CueOutput quiet{&strictError, &diagnostics};
        if (ParseCueSheetText(text, sheetPath, quiet) == 0 && g_CueSheet) {
            for (std::uint32_t i = 0; i < g_CueSheet->trackCount; ++i)
                titles.push_back(WithoutBrokenTail(g_CueSheet->tracks[i].title));
        }
        FreeCueSheet();
    }
    const CueSheetData lenient = ParseCueSheet(std::string_view(bytes));
    if (titles.empty()) {
        for (const CueSheetTrack& track : lenient.tracks) titles.push_back(track.title);
    } else if (titles.size() == lenient.tracks.size()) {
        // The strict reader keeps 64 bytes of a title; the lenient one has the rest.
        for (std::size_t i = 0; i < titles.size(); ++i) {
            const std::string& whole = lenient.tracks[i].title;
            if (whole.size() > titles[i].size() && whole.starts_with(titles[i])) titles[i] = whole;
        }
    }
    for (std::size_t i = 0; i < titles.size(); ++i)
        expansion.rows.push_back({sheetPath + "|" + std::to_string(i + 1), std::move(titles[i])});
    if (expansion.rows.empty()) {
        const std::string reason = TrimLineEnd(strictError);
        expansion.error = sheetPath + ": " + (reason.empty() ? "no tracks in the cue sheet" : reason);
    }
    return expansion;
}

}  // namespace ac
