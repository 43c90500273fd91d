// The end-of-run sound on SDL's dummy driver: a short WAV plays out and its thread ends; missing
// and damaged files do nothing.

#include "panels/Sound.h"

#include "../support/TempDir.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <fstream>
#include <string>

namespace ac {
namespace {

void Put16(std::ofstream& out, std::uint16_t value) {
    out.put(static_cast<char>(value & 0xFF)).put(static_cast<char>(value >> 8));
}
void Put32(std::ofstream& out, std::uint32_t value) {
    Put16(out, static_cast<std::uint16_t>(value & 0xFFFF));
    Put16(out, static_cast<std::uint16_t>(value >> 16));
}

// 16-bit mono at 8000 Hz.
void WriteWav(const std::string& path, int samples) {
    std::ofstream out(path, std::ios::binary);
    const std::uint32_t dataBytes = static_cast<std::uint32_t>(samples) * 2;
    out << "RIFF";
    Put32(out, 36 + dataBytes);
    out << "WAVEfmt ";
    Put32(out, 16);
    Put16(out, 1);
    Put16(out, 1);
    Put32(out, 8000);
    Put32(out, 16000);
    Put16(out, 2);
    Put16(out, 16);
    out << "data";
    Put32(out, dataBytes);
    for (int i = 0; i < samples; ++i) {
        Put16(out, static_cast<std::uint16_t>((i % 40) * 500));
    }
}

TEST(SoundTest, ShortSoundsPlayOutOneBesideAnother) {
    test::TempDir dir;
    const std::string path = dir / "hint.wav";
    WriteWav(path, 800);
    PlaySoundAsync(path);
    PlaySoundAsync(path);
    WaitForSounds();
    PlaySoundAsync(path);
    StopSounds();
}

TEST(SoundTest, MissingEmptyAndDamagedFilesDoNothing) {
    test::TempDir dir;
    PlaySoundAsync("");
    PlaySoundAsync(dir / "absent.wav");
    const std::string damaged = dir / "damaged.wav";
    std::ofstream(damaged) << "RIFF....WAVEjunk";
    PlaySoundAsync(damaged);
    WaitForSounds();
}

}  // namespace
}  // namespace ac
