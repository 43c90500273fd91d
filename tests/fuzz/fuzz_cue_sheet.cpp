// The cue sheet reader on any bytes: no crash, no read past the track array, a record that
// always holds its terminators, and a result that matches its diagnostics.
#include "rip/CueSheet.h"

#include <cstdint>
#include <cstring>
#include <string>

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    std::string errors;
    std::string output;
    const std::string_view text(reinterpret_cast<const char*>(data), size);
    const int result = ac::ParseCueSheetText(text, "/fuzz/sheet.cue", {&errors, &output});
    const ac::CueSheet& sheet = *ac::g_CueSheet;
    if (sheet.trackCount > sheet.capacity || sheet.capacity != sheet.tracks.size()) __builtin_trap();
    if (std::strlen(sheet.title) > ac::kCueTextSize || std::strlen(sheet.performer) > ac::kCueTextSize) {
        __builtin_trap();
    }
    for (std::uint32_t i = 0; i < sheet.trackCount; ++i) {
        if (std::strlen(sheet.tracks[i].title) > ac::kCueTextSize) __builtin_trap();
    }
    if ((result == 0) != errors.empty()) __builtin_trap();
    ac::FreeCueSheet();
    return 0;
}
