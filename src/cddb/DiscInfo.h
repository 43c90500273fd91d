#pragma once
// CDDiscInfo: the flat record of one disc that the rip panel, the rip driver and the local cache
// share: artist, album, year, genre and the track titles, each cut to the capacity the record
// has always had, so a damaged or hostile record cannot make a name longer than a file system
// takes.
//
// Thread contract: a plain value; its holder decides.

#include <cstddef>
#include <string>
#include <string_view>
#include <vector>

namespace cddb {

// Capacities in bytes, the terminating zero of the old fixed buffers included.
inline constexpr std::size_t kArtistCapacity = 100;
inline constexpr std::size_t kAlbumCapacity = 100;
inline constexpr std::size_t kYearCapacity = 30;
inline constexpr std::size_t kGenreCapacity = 30;
inline constexpr std::size_t kTitleCapacity = 260;
inline constexpr int kMaxTracks = 99;

// Cuts text to fit a buffer of `capacity` bytes with its zero: at most capacity - 1 bytes, and
// never inside a UTF-8 sequence, so a cut name stays valid text.
std::string FitText(std::string_view text, std::size_t capacity);

struct CDDiscInfo {
    std::string artist;
    std::string album;
    std::string year;
    std::string genre;
    // 0 means no record. titles.size() == trackCount.
    int trackCount = 0;
    std::vector<std::string> titles;

    // Track count 0, every text empty.
    void Clear();
    // Applies the capacities to every field and keeps at most kMaxTracks titles.
    void Fit();
    // The title of track index (0-based), or empty when the record has none.
    std::string Title(int index) const;
};

}  // namespace cddb
