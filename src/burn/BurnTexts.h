#pragma once
// String ids of the burn mode's own texts (the language files key on them). They hold the area
// 0xC400-0xC47F of the program's own texts.
//
// Thread contract: constants.

#include <cstdint>

namespace ac::burn::text {

inline constexpr std::uint32_t kNoRecorder = 0xC400;  // "Not found a CD recorder"
inline constexpr std::uint32_t kEraseNonEmpty =
    0xC401;  // "The disc is not empty. Do you want to erase it?"
inline constexpr std::uint32_t kWarningCaption = 0xC402;  // "Warning..."
inline constexpr std::uint32_t kTempFolderFailed = 0xC403;
inline constexpr std::uint32_t kAllFailed = 0xC404;
inline constexpr std::uint32_t kSomeFailed = 0xC405;
inline constexpr std::uint32_t kInformationCaption = 0xC406;  // "Infomation"
inline constexpr std::uint32_t kCheckingDiscLoop = 0xC407;    // "Checking disc ..."
inline constexpr std::uint32_t kEjectingDisc = 0xC408;
inline constexpr std::uint32_t kWaitingDisc = 0xC409;
inline constexpr std::uint32_t kBurnDiscStarting = 0xC40A;
inline constexpr std::uint32_t kCancelledEject = 0xC40B;
inline constexpr std::uint32_t kWriteFailedStatus = 0xC40C;
inline constexpr std::uint32_t kWriteFailedEject = 0xC40D;
inline constexpr std::uint32_t kWaitingNextCopy = 0xC40E;
inline constexpr std::uint32_t kAnotherCopy = 0xC40F;
inline constexpr std::uint32_t kBurnSuccessful = 0xC410;
inline constexpr std::uint32_t kSuccessEject = 0xC411;
inline constexpr std::uint32_t kTracksUnavailable = 0xC412;
inline constexpr std::uint32_t kCheckingDiscEvent = 0xC413;  // "Checking disc..."
inline constexpr std::uint32_t kErasing = 0xC414;
inline constexpr std::uint32_t kErased = 0xC415;
inline constexpr std::uint32_t kNoDiscRetry = 0xC416;
inline constexpr std::uint32_t kDiscNotEmpty = 0xC417;
inline constexpr std::uint32_t kNoSpaceRetry = 0xC418;
inline constexpr std::uint32_t kBurnStarting = 0xC419;
inline constexpr std::uint32_t kWritingLeadIn = 0xC41A;
inline constexpr std::uint32_t kWritingData = 0xC41B;
inline constexpr std::uint32_t kClosingData = 0xC41C;
inline constexpr std::uint32_t kWritingAudio = 0xC41D;
inline constexpr std::uint32_t kWritingTrack = 0xC41E;  // "%d"
inline constexpr std::uint32_t kClosingTrack = 0xC41F;
inline constexpr std::uint32_t kCannotStopData = 0xC420;
inline constexpr std::uint32_t kStopAudioWrite = 0xC421;
inline constexpr std::uint32_t kDiscImage = 0xC422;               // the image recorder's name
inline constexpr std::uint32_t kWaitInsertEmpty = 0xC423;         // -99
inline constexpr std::uint32_t kWaitNotCd = 0xC424;               // -91
inline constexpr std::uint32_t kWaitNotWritable = 0xC425;         // -90, -88
inline constexpr std::uint32_t kWaitNoSpace = 0xC426;             // -89
inline constexpr std::uint32_t kWaitRewritableNotEmpty = 0xC427;  // 1
inline constexpr std::uint32_t kWaitCheckFailed = 0xC428;         // others
inline constexpr std::uint32_t kWaitingForDisc = 0xC429;
inline constexpr std::uint32_t kUnknownRecorder = 0xC42A;
inline constexpr std::uint32_t kMediaEmpty = 0xC42B;
inline constexpr std::uint32_t kMediaUnsupported = 0xC42C;
inline constexpr std::uint32_t kNotAvailable = 0xC42D;
inline constexpr std::uint32_t kEraseComplete = 0xC42E;
inline constexpr std::uint32_t kImageUnavailable = 0xC433;  // "%s"
inline constexpr std::uint32_t kImageWritten = 0xC434;      // "%s"

// Shared with the conversion run and the file intake.
inline constexpr std::uint32_t kMinuteUnit = 243;    // "Minute"
inline constexpr std::uint32_t kAddingFile = 49216;  // "Add %s..."
inline constexpr std::uint32_t kLoadFinished = 49217;
inline constexpr std::uint32_t kNameTooLong = 49218;
inline constexpr std::uint32_t kStopEncoding = 49156;  // "Are you sure to stop encoding?"
inline constexpr std::uint32_t kDiskFull = 49152;  // "There is not enough free size on the disk!"

}  // namespace ac::burn::text
