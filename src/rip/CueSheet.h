#pragma once
// Cue sheets added to a list: the reader turns a sheet into its track count and track titles.
// It reads a deliberately narrow dialect: what its grammar does not list is a parse error, so
// many sheets written by other programs are refused (a blank line inside, a REM line with a bare
// number, several FILE lines, a keyword in lower case stored as nothing).
//
//   PERFORMER "Artist"
//   TITLE "Album"
//   FILE "album.wav" WAVE
//     TRACK 01 AUDIO
//       TITLE "First"
//       INDEX 01 00:00:00
//
// Thread contract: one sheet at a time, on the UI thread. The record lives in g_CueSheet from
// ParseCueSheet until FreeCueSheet.

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

namespace ac {

inline constexpr std::size_t kCueTextSize = 64;  // longest text kept, without the terminator

struct CueTrack {
    std::uint32_t kind = 0;  // always 0
    std::int32_t number = 0;
    char title[kCueTextSize + 1] = {};
    char performer[kCueTextSize + 1] = {};
    // Where the track ends: the INDEX 01 time of the next track; 0 for the last one.
    std::int32_t endMinute = 0;
    std::int32_t endSecond = 0;
    std::int32_t endFrame = 0;
};

struct CueSheet {
    char performer[kCueTextSize + 1] = {};
    char title[kCueTextSize + 1] = {};  // the sheet's own path until a TITLE line is read
    char file[kCueTextSize + 1] = {};
    char fileType[kCueTextSize + 1] = {};
    std::uint32_t trackCount = 0;  // finished tracks
    std::uint32_t capacity = 0;    // track records allocated
    std::vector<CueTrack> tracks;  // capacity records; the first trackCount are finished
};

inline constexpr std::uint32_t kCueInitialCapacity = 20;
// The parser's stack starts at 200 entries and may double up to this many.
inline constexpr std::size_t kCueMaxStackDepth = 10000;

// Where the reader's diagnostics go: the error stream and standard output in the program,
// strings in tests.
struct CueOutput {
    std::string* errors = nullptr;  // null: stderr
    std::string* output = nullptr;  // null: stdout
};

// The sheet the reader made last; null before the first parse and after FreeCueSheet.
extern CueSheet* g_CueSheet;

// Reads the sheet at `path` into a new g_CueSheet (freeing any earlier one). 0 on success, 1 on
// failure; the record stays for the caller also on failure (a sheet that could not be opened
// has no tracks).
int ParseCueSheet(const std::string& path, const CueOutput& out = {});
// The same on a text already in memory; `path` only fills the initial title.
int ParseCueSheetText(std::string_view text, std::string_view path, const CueOutput& out = {});
// Releases g_CueSheet; nothing happens when there is none.
void FreeCueSheet();

}  // namespace ac
