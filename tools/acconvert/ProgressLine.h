#pragma once
// The one line a terminal tool redraws in place while it works: the current item's name, its
// percent and bar, and the run's percent. Only ever drawn on a terminal; into a pipe or a file
// the tools write whole lines instead.
//
// Thread contract: the thread that owns `out`.

#include <cstdio>
#include <string>

namespace ac::console {

// "#########---------------------" for 30 percent.
std::string ProgressBar(int percent);

// Replaces the current line with: name (cut to 28 columns), percent, bar, overall percent.
void DrawProgressLine(std::FILE* out, std::string name, int percent, int overall);

// Wipes the progress line, so that a whole line can be written in its place.
void ClearProgressLine(std::FILE* out);

}  // namespace ac::console
