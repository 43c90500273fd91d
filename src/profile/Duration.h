#pragma once
// Time texts of the t and ss parameters ("00:01:30", "90", "Full") in microseconds.
//
// Thread contract: any thread.

#include <cstdint>
#include <string_view>

namespace ac {

// "H:M:S[.ffffff]" or plain seconds, optionally negative, in microseconds. Text without leading
// digits ("Full") is 0.
std::int64_t ParseDuration(std::string_view text);

}  // namespace ac
