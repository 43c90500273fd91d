#pragma once
// What probing found out about one source file: duration, tags and streams. Embedded in every
// list row; filled by ProbeFile, read by the list, the progress computation, the profile's tags
// and the file information window.
//
// Thread contract: a plain record; whoever owns the row owns it.

#include <cstdint>
#include <string>
#include <vector>

namespace ac {

struct VideoStreamInfo {
    std::string codec;
    std::int32_t width = 0;
    std::int32_t height = 0;
    float frameRate = 0;
    std::int32_t bitRate = 0;
};

struct AudioStreamInfo {
    std::string codec;
    std::int32_t channels = 0;
    std::int32_t bitRate = 0;
    std::int32_t sampleRate = 0;
};

struct DataStreamInfo {
    std::string codec;
    std::int32_t bitRate = 0;
};

struct MediaFileInfo {
    std::string path;
    // Why probing failed, in words a user can act on; empty when it succeeded.
    std::string probeError;
    // The whole duration; all 0 when unknown.
    std::int32_t hours = 0;
    std::int32_t minutes = 0;
    std::int32_t seconds = 0;
    std::int32_t microseconds = 0;
    // Overall bit rate; -1 when unknown.
    std::int32_t bitRate = -1;
    // Tags, title to timestamp: what a profile takes over from its source.
    std::string title;
    std::string author;
    std::string copyright;
    std::string comment;
    std::string album;
    std::string year;  // decimal text when the year lies in 1..2099, else empty
    std::int32_t track = 0;
    std::string genre;
    std::uint8_t tagByte1 = 0;
    std::uint8_t tagByte2 = 0;
    std::string composer;
    std::string origArtist;
    std::string url;
    std::string encodedBy;
    std::string timestamp;  // stays empty
    std::vector<VideoStreamInfo> videoStreams;
    std::vector<AudioStreamInfo> audioStreams;
    std::vector<DataStreamInfo> dataStreams;
};

}  // namespace ac
