#include "cddb/DiscInfo.h"

#include <algorithm>

namespace cddb {

std::string FitText(std::string_view text, std::size_t capacity) {
    if (capacity == 0) {
        return {};
    }
    if (text.size() < capacity) {
        return std::string(text);
    }
    std::size_t end = capacity - 1;
    // Step back over continuation bytes so the cut lands on the start of a character.
    while (end > 0 && (static_cast<unsigned char>(text[end]) & 0xC0) == 0x80) {
        --end;
    }
    return std::string(text.substr(0, end));
}

void CDDiscInfo::Clear() {
    artist.clear();
    album.clear();
    year.clear();
    genre.clear();
    trackCount = 0;
    titles.clear();
}

void CDDiscInfo::Fit() {
    artist = FitText(artist, kArtistCapacity);
    album = FitText(album, kAlbumCapacity);
    year = FitText(year, kYearCapacity);
    genre = FitText(genre, kGenreCapacity);
    if (titles.size() > static_cast<std::size_t>(kMaxTracks)) {
        titles.resize(static_cast<std::size_t>(kMaxTracks));
    }
    for (std::string& title : titles) {
        title = FitText(title, kTitleCapacity);
    }
    trackCount = std::clamp(trackCount, 0, static_cast<int>(titles.size()));
    titles.resize(static_cast<std::size_t>(trackCount));
}

std::string CDDiscInfo::Title(int index) const {
    if (index < 0 || index >= trackCount || static_cast<std::size_t>(index) >= titles.size()) {
        return {};
    }
    return titles[static_cast<std::size_t>(index)];
}

}  // namespace cddb
