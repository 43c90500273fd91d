// .pf field splitting: any text with any delimiter splits without a crash; slot 0 is the input,
// the fields never hold more than the input, and stripped fields hold no quote.
#include "profile/ParameterSet.h"

#include <cstdint>
#include <string>

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    if (size < 2) return 0;
    const char delimiter = static_cast<char>(data[0]);
    const std::string_view text(reinterpret_cast<const char*>(data) + 1, size - 1);
    ac::FieldSplitter splitter(delimiter, '"');
    splitter.Split(text);
    if (splitter.GetField(0, false) != text) __builtin_trap();
    std::size_t total = 0;
    for (std::size_t i = 1; i <= splitter.FieldCount(); ++i) {
        const std::string field = splitter.GetField(i, false);
        if (field.size() > text.size()) __builtin_trap();
        if (splitter.GetField(i, true).find('"') != std::string::npos) __builtin_trap();
        total += field.size();
    }
    // Fields and the delimiters between them account for the whole input.
    if (delimiter != '\0' && total > text.size()) __builtin_trap();
    if (splitter.GetField(splitter.FieldCount() + 1, false) != "ERROR: Array index out of range.") {
        __builtin_trap();
    }
    return 0;
}
