// The command-text splitter: any text splits without a crash, and joining the words back with
// quotes splits to the same words again.
#include "platform/CommandLine.h"

#include <cstdint>
#include <string>

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    std::string_view text(reinterpret_cast<const char*>(data), size);
    auto words = ac::platform::SplitCommandLine(text);
    std::string joined;
    for (const std::string& word : words) {
        if (word.find('"') != std::string::npos) return 0;  // a quote cannot be re-quoted
        joined += "\"" + word + "\" ";
    }
    if (ac::platform::SplitCommandLine(joined) != words) __builtin_trap();
    return 0;
}
