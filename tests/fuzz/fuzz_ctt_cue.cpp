// The lenient cue reader on any bytes: no crash, no hang, and every track points at a FILE
// line that exists or at none.
#include <cstdint>
#include <string>

#include "medialist/CueSheet.h"

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    const std::string_view bytes(reinterpret_cast<const char*>(data), size);
    const ac::CueSheetData sheet = ac::ParseCueSheet(bytes);
    for (const ac::CueSheetTrack& track : sheet.tracks) {
        if (track.fileIndex < -1 || track.fileIndex >= static_cast<int>(sheet.files.size())) __builtin_trap();
        if (track.index01 < -1 || track.index00 < -1) __builtin_trap();
    }
    ac::SplitCueTrackPath(bytes);
    return 0;
}
