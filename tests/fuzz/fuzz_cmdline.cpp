// The command text between the program and ctt: any text splits without a crash, and any list
// of words (every byte a file name can hold) quoted into a text, split again and restored gives
// the same words.
#include "platform/CommandLine.h"

#include <cstdint>
#include <string>
#include <vector>

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    std::string_view text(reinterpret_cast<const char*>(data), size);
    ac::platform::SplitCommandLine(text);

    // The input is the word list itself, words separated by NUL (which no argument can hold).
    std::vector<std::string> words;
    std::size_t start = 0;
    for (std::size_t at; (at = text.find('\0', start)) != std::string_view::npos; start = at + 1)
        words.emplace_back(text.substr(start, at - start));
    words.emplace_back(text.substr(start));

    std::string joined = "ctt -relk -y ";
    for (const std::string& word : words) joined += " " + ac::platform::QuoteCommandValue(word) + " ";
    const std::vector<std::string> split = ac::platform::SplitCommandLine(joined);
    if (split.size() != words.size() + 3) __builtin_trap();
    for (std::size_t i = 0; i < words.size(); ++i)
        if (ac::platform::RestoreCommandValue(split[i + 3]) != words[i]) __builtin_trap();
    return 0;
}
