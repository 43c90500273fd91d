// The tracks of an audio disc are WAV files whose headers the image recorder and the libburn
// recorder walk: any bytes must parse or fail without a crash, and a layout found must lie
// inside the file.
#include "burn/WavFile.h"

#include <cstdint>
#include <string>

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    const std::string_view bytes(reinterpret_cast<const char*>(data), size);
    ac::burn::WavLayout layout;
    std::string reason;
    // The file may be longer than the head that was read: the sizes must still hold.
    const std::int64_t fileSize = static_cast<std::int64_t>(size) + (size > 0 ? data[0] * 1000 : 0);
    if (ac::burn::ParseWavLayout(bytes, fileSize, layout, reason)) {
        if (layout.dataOffset < 12 || layout.dataOffset > static_cast<std::int64_t>(size) || layout.dataBytes < 0 ||
            layout.dataOffset + layout.dataBytes > fileSize) {
            __builtin_trap();
        }
    } else if (reason.empty()) {
        __builtin_trap();
    }
    return 0;
}
