#pragma once
// A lenient reader of cue sheets as real programs write them (EAC, foobar, XLD, hand-edited):
// byte-order marks, UTF-16, legacy code pages, lower-case keywords, unquoted names with blanks,
// mixed line ends, several FILE lines and index gaps that cross file boundaries. It never fails:
// what it cannot read it skips. This is the reader behind cue track paths ("SHEET|N"), which
// ctt and probing resolve to an audio file and a sample span; the strict reader that expands a
// sheet into list rows lives with the rip code.
//
//   FILE "Rush - Signals - 02 - The Analog Kid.wav" WAVE
//       INDEX 01 00:00:00
//
// Thread contract: any thread; no shared state.

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace ac {

// CD frames: 75 to the second, 588 samples at 44.1 kHz.
inline constexpr int kCueFramesPerSecond = 75;

struct CueSheetTrack {
    int number = 0;      // as written on the TRACK line
    int fileIndex = -1;  // file of INDEX 01 (or of the TRACK line when it has none)
    std::string title;
    std::string performer;
    std::int64_t index00 = -1;  // frames into its file; -1 when absent
    std::int64_t index01 = -1;
};

struct CueSheetData {
    std::string title;
    std::string performer;
    std::string genre;
    std::string date;
    std::vector<std::string> files;  // names as written, in order
    std::vector<CueSheetTrack> tracks;
};

// Turns the sheet's bytes into UTF-8: BOMs go, UTF-16 is converted, and text that is not
// valid UTF-8 is read as Shift-JIS or Windows-1251 when it looks so, else as Windows-1252.
std::string DecodeCueText(std::string_view bytes);

CueSheetData ParseCueSheet(std::string_view bytes);

// "SHEET|N" with N a positive decimal: the sheet path and N. Anything else: nullopt.
struct CueTrackPath {
    std::string sheet;
    int track = 0;
};
std::optional<CueTrackPath> SplitCueTrackPath(std::string_view path);

// Track N (1-based, in sheet order) of a sheet on disk, resolved to its audio file.
struct CueTrackSpan {
    std::string audioPath;
    std::int64_t startFrame = 0;  // INDEX 01, in CD frames
    std::int64_t endFrame = -1;   // INDEX 01 of the next track in the same file; -1: end of file
    std::string title;
    std::string performer;  // the track's, else the sheet's
    std::string album;      // the sheet's title
    std::string genre;
    std::string date;
    int trackNumber = 0;
};
// Fills span or says why not in error ("cannot read cue sheet", "track 9 not in sheet", ...).
bool ResolveCueTrack(const std::string& sheetPath, int track, CueTrackSpan& span,
                     std::string& error);

// The file a FILE line names, looked for beside the sheet: the name without any folder part
// (sheets often carry the ripper's Windows path), then the same name in another case, then
// the same stem with another extension (a sheet written for a WAV, kept beside a FLAC).
std::string FindCueAudioFile(const std::string& sheetDir, const std::string& fileName);

}  // namespace ac
