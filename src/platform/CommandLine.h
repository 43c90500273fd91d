#pragma once
// Splits the command text the program builds for ctt into argument words, the way the tool
// has always read it: runs of blanks separate words, double quotes group a word (and may make
// an empty one), and nothing else is special. A double quote inside a value travels as the
// character 0x0B, which the tool turns back into a quote; backslashes are ordinary characters.
//
//   ctt -relk -y  -i "/music/a b.wav" -title "My Song"   -vol  256   "/out/a b.mp3"
//
// Thread contract: any thread.

#include <string>
#include <string_view>
#include <vector>

namespace ac::platform {

// The character that stands for a double quote inside a quoted value.
inline constexpr char kQuoteStandIn = '\x0B';

std::vector<std::string> SplitCommandLine(std::string_view text);

}  // namespace ac::platform
