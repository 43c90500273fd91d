#pragma once
// The command text that starts ctt for one job. The launcher puts the program in front; the text
// itself is what the tool has always been given, blanks and all:
//
//    -relk -y  -i "/music/song.wav" -title "My Song"     -acodec "mp3"  -ab "192"  ...
//
// Thread contract: any thread; the set passed in belongs to the caller for the call.
// ParseDuration (profile/Duration.h) comes with this header.

#include "profile/Duration.h"

#include <cstdint>
#include <string>
#include <string_view>

namespace ac {

class ParameterSet;

// Volume slider position (50 = unchanged, 0 = half, 100 = double) as ctt's -vol gain (256 = 1.0).
std::int32_t VolumeToGain(std::int32_t volume);

// The conversion list's text for source and output paths. Does not delete the old output: the
// driver does that itself before the launch. May set `title` of a "psp" profile (for the next
// start of the row).
std::string BuildConversionCommandText(std::string_view source, std::string_view output,
                                       std::int32_t volume, ParameterSet& parameters);

// The burn list's text, which always converts to WAV for the disc: no FLAC, AAC or psp rules,
// and video is always dropped.
std::string BuildBurnCommandText(std::string_view source, std::string_view output,
                                 std::int32_t volume, ParameterSet& parameters);

}  // namespace ac
