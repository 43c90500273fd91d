#pragma once
// Splits the command text the program builds for ctt into argument words, the way the tool
// has always read it: runs of blanks separate words, double quotes group a word (and may make
// an empty one), and nothing else is special. A double quote inside a value travels as the
// character 0x0B, which the tool turns back into a quote; backslashes are ordinary characters.
//
//   ctt -relk -y  -i "/music/a b.wav" -title "My Song"   -vol  256   "/out/a b.mp3"
//
// A file name may hold 0x0B itself. So that every byte a name can hold reaches the tool
// intact, 0x10 escapes: 0x10 'v' is a real 0x0B and 0x10 0x10 a real 0x10. Texts without either
// byte, which is every text anybody types, read exactly as they always have.
//
// Thread contract: any thread.

#include <string>
#include <string_view>
#include <vector>

namespace ac::platform {

// The character that stands for a double quote inside a quoted value.
inline constexpr char kQuoteStandIn = '\x0B';

inline constexpr char kValueEscape = '\x10';

std::vector<std::string> SplitCommandLine(std::string_view text);

// A value as it goes into the command text: in double quotes, with its quotes as 0x0B and the
// two escapes above.
std::string QuoteCommandValue(std::string_view value);
// The value a word of the split text stands for: the reverse of the encoding inside the quotes.
std::string RestoreCommandValue(std::string_view word);

}  // namespace ac::platform
