// The tool's option parser on the words the launcher's splitter makes of any text: no crash,
// and an accepted command always names an input and an output and gives sane numbers.
#include <cstdint>
#include <string>

#include "CttOptions.h"
#include "Id3v1.h"
#include "platform/CommandLine.h"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    const std::string_view text(reinterpret_cast<const char*>(data), size);
    const auto words = ac::platform::SplitCommandLine(text);
    const ac::ctt::ParseResult result = ac::ctt::ParseArguments(words);
    for (const std::string& word : words) {
        ac::ctt::ParseDurationUs(word);
    }
    if (!result.options) {
        if (result.error.empty()) __builtin_trap();
        return 0;
    }
    const ac::ctt::CttOptions& o = *result.options;
    if (o.input.empty() || o.output.empty()) __builtin_trap();
    if (o.sampleRate < 0 || o.channels < 0 || o.channels > 8 || o.volume < 0 || o.bitRate < 0) __builtin_trap();
    if (ac::ctt::BuildId3v1Tag(o.tags).size() != 128) __builtin_trap();
    return 0;
}
