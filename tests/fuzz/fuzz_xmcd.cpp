// Disc entries come from any server on the network: any bytes must parse or fail without a
// crash, and the flat record made of them must hold its capacities and be valid UTF-8.
#include "cddb/CddbEntry.h"
#include "resources/CodePage.h"

#include <cstdint>
#include <string>

namespace {

bool IsCleanText(const std::string& text, std::size_t capacity) {
    return text.size() < capacity && ac::SanitizeUtf8(text) == text;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    const std::string_view body(reinterpret_cast<const char*>(data), size);
    cddb::CddbEntry entry;
    const cddb::EntryResult result = cddb::ParseEntry(body, entry);
    if (cddb::EntryResultText(result) == nullptr)
        __builtin_trap();

    cddb::CDDiscInfo info;
    cddb::EntryToDiscInfo(size > 0 ? body.substr(0, 1 + data[0] % 40) : "misc", entry, info);
    if (info.trackCount < 0 || info.trackCount > cddb::kMaxTracks ||
        info.titles.size() != static_cast<std::size_t>(info.trackCount)) {
        __builtin_trap();
    }
    if (!IsCleanText(info.artist, cddb::kArtistCapacity) ||
        !IsCleanText(info.album, cddb::kAlbumCapacity) ||
        !IsCleanText(info.year, cddb::kYearCapacity)) {
        __builtin_trap();
    }
    for (const std::string& title : info.titles) {
        if (!IsCleanText(title, cddb::kTitleCapacity))
            __builtin_trap();
    }
    // The genre may be the category as the caller gave it, bytes and all; only its size holds.
    if (info.genre.size() >= cddb::kGenreCapacity)
        __builtin_trap();
    return 0;
}
