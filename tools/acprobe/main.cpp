// acprobe FILE...: one JSON object per line and file, from ProbeFile. Exit code 1 when a file
// could not be probed (its object then says "ok": false).

#include <cstdio>
#include <string>

#include "medialist/MediaProbe.h"

extern "C" {
#include <libavutil/log.h>
}

namespace {

void AppendEscaped(std::string& out, const std::string& text) {
    out += '"';
    for (unsigned char c : text) {
        switch (c) {
            case '"': out += "\\\""; break;
            case '\\': out += "\\\\"; break;
            case '\n': out += "\\n"; break;
            case '\r': out += "\\r"; break;
            case '\t': out += "\\t"; break;
            default:
                if (c < 0x20) {
                    char buf[8];
                    std::snprintf(buf, sizeof buf, "\\u%04x", c);
                    out += buf;
                } else {
                    out += static_cast<char>(c);
                }
        }
    }
    out += '"';
}

void Field(std::string& out, const char* name, const std::string& value) {
    out += ",\"";
    out += name;
    out += "\":";
    AppendEscaped(out, value);
}

void Field(std::string& out, const char* name, long long value) {
    out += ",\"";
    out += name;
    out += "\":" + std::to_string(value);
}

std::string ToJson(const ac::MediaFileInfo& info, bool ok) {
    std::string out = "{\"ok\":";
    out += ok ? "true" : "false";
    Field(out, "path", info.path);
    Field(out, "hours", info.hours);
    Field(out, "minutes", info.minutes);
    Field(out, "seconds", info.seconds);
    Field(out, "microseconds", info.microseconds);
    Field(out, "bitRate", info.bitRate);
    Field(out, "title", info.title);
    Field(out, "author", info.author);
    Field(out, "copyright", info.copyright);
    Field(out, "comment", info.comment);
    Field(out, "album", info.album);
    Field(out, "year", info.year);
    Field(out, "track", info.track);
    Field(out, "genre", info.genre);
    Field(out, "composer", info.composer);
    Field(out, "origArtist", info.origArtist);
    Field(out, "url", info.url);
    Field(out, "encodedBy", info.encodedBy);
    out += ",\"videoStreams\":[";
    for (size_t i = 0; i < info.videoStreams.size(); ++i) {
        const auto& v = info.videoStreams[i];
        out += i ? ",{" : "{";
        out += "\"codec\":";
        AppendEscaped(out, v.codec);
        Field(out, "width", v.width);
        Field(out, "height", v.height);
        char rate[32];
        std::snprintf(rate, sizeof rate, "%.3f", static_cast<double>(v.frameRate));
        out += ",\"frameRate\":";
        out += rate;
        Field(out, "bitRate", v.bitRate);
        out += "}";
    }
    out += "],\"audioStreams\":[";
    for (size_t i = 0; i < info.audioStreams.size(); ++i) {
        const auto& a = info.audioStreams[i];
        out += i ? ",{" : "{";
        out += "\"codec\":";
        AppendEscaped(out, a.codec);
        Field(out, "channels", a.channels);
        Field(out, "sampleRate", a.sampleRate);
        Field(out, "bitRate", a.bitRate);
        out += "}";
    }
    out += "],\"dataStreams\":[";
    for (size_t i = 0; i < info.dataStreams.size(); ++i) {
        out += i ? ",{" : "{";
        out += "\"codec\":";
        AppendEscaped(out, info.dataStreams[i].codec);
        Field(out, "bitRate", info.dataStreams[i].bitRate);
        out += "}";
    }
    out += "]}\n";
    return out;
}

}  // namespace

int main(int argc, char** argv) {
    if (argc < 2) {
        std::fputs("usage: acprobe FILE...\n", stderr);
        return 2;
    }
    // Demuxer chatter ("estimating duration from bitrate") is no result of ours.
    av_log_set_level(AV_LOG_QUIET);
    int status = 0;
    std::string batch;
    for (int i = 1; i < argc; ++i) {
        ac::MediaFileInfo info;
        const bool ok = ac::ProbeFile(argv[i], info) != 0;
        if (!ok) {
            status = 1;
        }
        batch += ToJson(info, ok);
        if (batch.size() > 65536) {
            std::fwrite(batch.data(), 1, batch.size(), stdout);
            batch.clear();
        }
    }
    std::fwrite(batch.data(), 1, batch.size(), stdout);
    return status;
}
