#pragma once
// Audio fixtures made at test time: seeded noise that differs between left and right (so a
// channel swap, a byte-order slip or a shift by one sample cannot pass), WAV files written and
// read by walking their chunks, and the Debian ffmpeg command for compressed sources.

#include <algorithm>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <fstream>
#include <iterator>
#include <string>
#include <vector>

#include "Files.h"

namespace ac::test {

// Interleaved 16-bit samples; frames() counts sample frames.
struct Pcm {
    int rate = 44100;
    int channels = 2;
    std::vector<std::int16_t> samples;
    size_t frames() const { return channels ? samples.size() / static_cast<size_t>(channels) : 0; }
};

inline Pcm MakeNoise(size_t frames, std::uint32_t seed, int rate = 44100, int channels = 2,
                     int amplitude = 12000) {
    Pcm pcm;
    pcm.rate = rate;
    pcm.channels = channels;
    pcm.samples.resize(frames * static_cast<size_t>(channels));
    std::uint32_t state = seed * 2654435761u + 1;
    for (size_t i = 0; i < pcm.samples.size(); ++i) {
        state = state * 1664525u + 1013904223u;
        const int value = static_cast<int>((state >> 16) % static_cast<std::uint32_t>(2 * amplitude + 1)) - amplitude;
        pcm.samples[i] = static_cast<std::int16_t>(value);
    }
    return pcm;
}

inline void PutLe(std::string& out, std::uint32_t v, int bytes) {
    for (int i = 0; i < bytes; ++i) {
        out += static_cast<char>((v >> (8 * i)) & 0xFF);
    }
}

inline std::string WavBytes(const Pcm& pcm, std::uint32_t claimedDataBytes = 0) {
    const auto dataBytes = static_cast<std::uint32_t>(pcm.samples.size() * 2);
    const std::uint32_t claimed = claimedDataBytes ? claimedDataBytes : dataBytes;
    std::string out = "RIFF";
    PutLe(out, 36 + claimed, 4);
    out += "WAVEfmt ";
    PutLe(out, 16, 4);
    PutLe(out, 1, 2);
    PutLe(out, static_cast<std::uint32_t>(pcm.channels), 2);
    PutLe(out, static_cast<std::uint32_t>(pcm.rate), 4);
    PutLe(out, static_cast<std::uint32_t>(pcm.rate * pcm.channels * 2), 4);
    PutLe(out, static_cast<std::uint32_t>(pcm.channels * 2), 2);
    PutLe(out, 16, 2);
    out += "data";
    PutLe(out, claimed, 4);
    out.append(reinterpret_cast<const char*>(pcm.samples.data()), dataBytes);
    return out;
}


inline void WriteWav(const std::string& path, const Pcm& pcm) { WriteFile(path, WavBytes(pcm)); }

// Reads a 16-bit PCM WAV, walking the chunks (a LIST chunk may stand before data).
inline bool ReadWav(const std::string& path, Pcm& pcm) {
    const std::string bytes = ReadFile(path);
    if (bytes.size() < 12 || bytes.compare(0, 4, "RIFF") != 0 || bytes.compare(8, 4, "WAVE") != 0) {
        return false;
    }
    auto le = [&](size_t at, int n) {
        std::uint32_t v = 0;
        for (int i = n - 1; i >= 0; --i) {
            v = (v << 8) | static_cast<unsigned char>(bytes[at + static_cast<size_t>(i)]);
        }
        return v;
    };
    size_t at = 12;
    bool haveFormat = false;
    while (at + 8 <= bytes.size()) {
        const std::string id = bytes.substr(at, 4);
        const size_t size = le(at + 4, 4);
        if (id == "fmt ") {
            if (le(at + 8, 2) != 1 || le(at + 22, 2) != 16) {
                return false;
            }
            pcm.channels = static_cast<int>(le(at + 10, 2));
            pcm.rate = static_cast<int>(le(at + 12, 4));
            haveFormat = true;
        } else if (id == "data" && haveFormat) {
            const size_t n = std::min(size, bytes.size() - at - 8) / 2;
            pcm.samples.resize(n);
            std::memcpy(pcm.samples.data(), bytes.data() + at + 8, n * 2);
            return true;
        }
        at += 8 + size + (size & 1);
    }
    return false;
}

// Runs the Debian ffmpeg command quietly; true on success.
inline bool RunFfmpeg(const std::string& arguments) {
    const std::string command = "ffmpeg -nostdin -hide_banner -loglevel error -y " + arguments;
    return std::system(command.c_str()) == 0;
}

}  // namespace ac::test
