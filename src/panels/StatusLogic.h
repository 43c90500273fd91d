#pragma once
// The window-free arithmetic of the status panel and the message windows: run percentages, the
// runs and tiles of the status bar's filled part, and the name a refused file is listed under.
//
// Thread contract: pure functions, any thread.

#include "skin/SkinGeometry.h"

#include <string>
#include <string_view>
#include <vector>

namespace ac {

// done / total x 100, cut to a whole number; 0 when total is below 0.1 or not a number.
int Percent(double done, double total);
// The rip bar: a run whose sums overshoot (the last track runs past its table length) shows
// empty rather than full.
int RipPercent(double done, double total);

// What the status bar's painting needs of its state.
struct CapacityBarState {
    long long low = 0;
    long long high = 100;
    long long position = 0;
    long long nearMark = 0;
    long long overMark = 0;
    long long maxMark = 0;
    int tileOffsetX = 0;
    int width = 0;  // client width
};

// Marks in use: all three above 0. Without them the bar is a plain progress bar.
inline bool HasCapacityMarks(const CapacityBarState& state) {
    return state.nearMark > 0 && state.overMark > 0 && state.maxMark > 0;
}
// (position - low) / (high - low) x width, cut; 0 for an empty range.
int FilledWidth(const CapacityBarState& state);
// The runs of the filled part, each [x0, x1) in one fill, in painting order. A run may be empty
// (x1 <= x0): it then paints nothing, but the count of runs still tells the colours in use.
std::vector<CapacityRun> CapacityBarRuns(const CapacityBarState& state);
// x of each whole tile of a picture tileWidth wide that covers [from, to): the first at `from`,
// the last one starting before `to` (it may stick out behind it).
std::vector<int> TileStarts(int from, int to, int tileWidth);
// The scale of the marks case, the last tick carrying the unit text; empty without marks.
std::vector<ScaleTick> CapacityBarScale(const CapacityBarState& state, long long tickStep);

// The file's name without folder and extension. A suffix is an extension only when the last '.'
// stands at most five characters from the end ("x.flac" loses ".flac", "x.backup" keeps it).
std::string RefusedFileTitle(std::string_view path);

}  // namespace ac
