#pragma once
// Ids of the rip panel's texts in the language files.

#include <cstdint>

namespace ac::riptext {

inline constexpr std::uint32_t kName = 106;
inline constexpr std::uint32_t kDuration = 107;
inline constexpr std::uint32_t kTarget = 109;
inline constexpr std::uint32_t kStatus = 110;
inline constexpr std::uint32_t kWaiting = 104;
inline constexpr std::uint32_t kPause = 105;
inline constexpr std::uint32_t kCompleted = 122;
inline constexpr std::uint32_t kFail = 123;
inline constexpr std::uint32_t kAbort = 124;
inline constexpr std::uint32_t kStopEncoding = 0xC004;
inline constexpr std::uint32_t kReRipQuestion = 0xC1A0;
inline constexpr std::uint32_t kInvalidArtist = 0xC1A1;  // then album, genre, year
inline constexpr std::uint32_t kAddDiscImage = 0xC1A5;
inline constexpr std::uint32_t kNoDiscImage = 0xC1A6;
inline constexpr std::uint32_t kTrack = 0xC1A7;
inline constexpr std::uint32_t kNoDrive = 0xC1A8;
inline constexpr std::uint32_t kRipSummary = 0xC1A9;
inline constexpr std::uint32_t kNoLocalRecord = 0xC1AA;

}  // namespace ac::riptext
