#pragma once
// Media probing: opens a source with libavformat, reads duration, tags and streams into a
// MediaFileInfo and closes it again. A cue track path ("SHEET|N") probes as that track: the
// span of the sheet and its titles, the streams of the audio file behind it.
//
// Thread contract: any thread; FFmpeg's demuxers keep no global state that needs a lock.

#include <string>
#include <vector>

#include "medialist/MediaFileInfo.h"

struct AVFormatContext;

namespace ac {

// True when the container's header already said everything about its audio streams (codec,
// rate, channels, length), so avformat_find_stream_info can be skipped: it reads and decodes
// ahead, which costs many times the rest of an open. Raw PCM is always described fully; with
// anyCodec, compressed audio is trusted too (except AAC, whose header may give half the rate
// of an SBR stream): enough for probing, while a decoder set-up wants the full look.
bool HeaderIsComplete(const AVFormatContext* ic, bool anyCodec = false);

// Every file extension a demuxer of the linked FFmpeg names, lower case, sorted, once each.
std::vector<std::string> DemuxerExtensions();

// 1 when the file could be opened (info then holds what was found), 0 when not.
int ProbeFile(const std::string& path, MediaFileInfo& info);

}  // namespace ac
