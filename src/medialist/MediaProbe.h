#pragma once
// Media probing: opens a source with libavformat, reads duration, tags and streams into a
// MediaFileInfo and closes it again. A cue track path ("SHEET|N") probes as that track: the
// span of the sheet and its titles, the streams of the audio file behind it.
//
// Thread contract: any thread; FFmpeg's demuxers keep no global state that needs a lock.

#include <string>

#include "medialist/MediaFileInfo.h"

namespace ac {

// 1 when the file could be opened (info then holds what was found), 0 when not.
int ProbeFile(const std::string& path, MediaFileInfo& info);

}  // namespace ac
