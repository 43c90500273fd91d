#pragma once
// Where the PCM of a WAV file lies. Chunks are walked, never a fixed 44-byte header assumed:
// FFmpeg writes a LIST chunk before "data" when tags are set.
//
//   RIFF....WAVEfmt ␣(16 bytes: 1, 2, 44100, 176400, 4, 16)LIST(...)data(PCM)
//
// Thread contract: any thread.

#include <cstdint>
#include <string>
#include <string_view>

namespace ac::burn {

struct WavLayout {
    int format = 0;  // 1 PCM, 0xFFFE extensible
    int channels = 0;
    int sampleRate = 0;
    int bitsPerSample = 0;
    std::int64_t dataOffset = 0;
    std::int64_t dataBytes = 0;  // cut to what the file holds
    bool IsCdAudio() const {
        return (format == 1 || format == 0xFFFE) && channels == 2 && sampleRate == 44100 &&
               bitsPerSample == 16;
    }
};

// `head` is the start of the file (a few kilobytes are enough unless a chunk before "data" is
// larger), `fileSize` its whole length. False with a reason in words when no PCM is found.
bool ParseWavLayout(std::string_view head, std::int64_t fileSize, WavLayout& layout,
                    std::string& reason);

bool ReadWavLayout(const std::string& path, WavLayout& layout, std::string& reason);

}  // namespace ac::burn
