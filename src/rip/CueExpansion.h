#pragma once
// A cue sheet added to a list becomes one row per track, "SHEET|N". The sheet is read by the
// strict reader first; a sheet it refuses (most sheets real rippers write: REM DATE 1999,
// several FILE lines, lower-case keywords) goes to the lenient reader, so every sheet that
// names its tracks gives rows, the same in the window and in the terminal tools.
//
// Thread contract: any thread; the strict reader's shared record is used under a lock.

#include <string>
#include <vector>

namespace ac {

struct CueRow {
    std::string trackPath;  // "SHEET|N", N from 1
    std::string title;      // the track's TITLE, empty when the sheet has none
};

struct CueExpansion {
    std::vector<CueRow> rows;
    // Set when neither reader found a track: names the sheet, and the line where the strict
    // reader stopped.
    std::string error;
};

CueExpansion ExpandCueSheet(const std::string& sheetPath);

}  // namespace ac
