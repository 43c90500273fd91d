// RIFF chunk walk for the image recorder and the libburn tracks.
#include "burn/WavFile.h"

#include <sys/stat.h>

#include <cstdio>
#include <memory>

namespace ac::burn {
namespace {

std::uint32_t Le32(std::string_view bytes, std::size_t at) {
    return static_cast<std::uint32_t>(static_cast<unsigned char>(bytes[at])) |
           static_cast<std::uint32_t>(static_cast<unsigned char>(bytes[at + 1])) << 8 |
           static_cast<std::uint32_t>(static_cast<unsigned char>(bytes[at + 2])) << 16 |
           static_cast<std::uint32_t>(static_cast<unsigned char>(bytes[at + 3])) << 24;
}

int Le16(std::string_view bytes, std::size_t at) {
    return static_cast<unsigned char>(bytes[at]) | static_cast<unsigned char>(bytes[at + 1]) << 8;
}

}  // namespace

bool ParseWavLayout(std::string_view head, std::int64_t fileSize, WavLayout& layout,
                    std::string& reason) {
    layout = WavLayout{};
    if (head.size() < 12 || head.substr(0, 4) != "RIFF" || head.substr(8, 4) != "WAVE") {
        reason = "not a WAV file";
        return false;
    }
    bool haveFormat = false;
    std::uint64_t at = 12;
    while (at + 8 <= head.size()) {
        const std::string_view id = head.substr(at, 4);
        const std::uint64_t size = Le32(head, at + 4);
        const std::uint64_t body = at + 8;
        if (id == "fmt ") {
            if (size < 16 || body + 16 > head.size())
                break;
            layout.format = Le16(head, body);
            layout.channels = Le16(head, body + 2);
            layout.sampleRate = static_cast<int>(Le32(head, body + 4));
            layout.bitsPerSample = Le16(head, body + 14);
            haveFormat = true;
        } else if (id == "data") {
            if (!haveFormat)
                break;
            layout.dataOffset = static_cast<std::int64_t>(body);
            const std::int64_t available = fileSize - layout.dataOffset;
            // A writer that never came back to fix the size leaves 0 or 0xFFFFFFFF: the PCM
            // then runs to the end of the file.
            layout.dataBytes =
                (size == 0 || size == 0xFFFFFFFFu || static_cast<std::int64_t>(size) > available)
                    ? available
                    : static_cast<std::int64_t>(size);
            if (layout.dataBytes < 0)
                layout.dataBytes = 0;
            return true;
        }
        at = body + size + (size & 1);
    }
    reason = haveFormat ? "no audio data in the WAV file" : "the WAV file has no format";
    return false;
}

bool ReadWavLayout(const std::string& path, WavLayout& layout, std::string& reason) {
    std::unique_ptr<std::FILE, int (*)(std::FILE*)> file(std::fopen(path.c_str(), "rb"),
                                                         std::fclose);
    struct stat info;
    if (!file || ::fstat(::fileno(file.get()), &info) != 0) {
        reason = "cannot open " + path;
        return false;
    }
    std::string head(65536, '\0');
    head.resize(std::fread(head.data(), 1, head.size(), file.get()));
    return ParseWavLayout(head, info.st_size, layout, reason);
}

}  // namespace ac::burn
