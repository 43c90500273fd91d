#pragma once
// Fills a format text from a language file. Translators' texts are outside input, so they never
// reach printf: each conversion (%s, %d, %u, %ld, %5.1f, ...) takes the next argument, which the
// caller has already turned into text; %% is a percent sign; a conversion without an argument
// left stays as written, and surplus arguments are dropped.
//
// Thread contract: any thread.

#include <initializer_list>
#include <string>
#include <string_view>

namespace ac {

std::string FormatText(std::string_view format, std::initializer_list<std::string_view> args);

}  // namespace ac
