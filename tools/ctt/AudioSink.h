#pragma once
// The encoding end of a conversion: resampling, channel mixing and gain in one swresample
// pass, a FIFO that cuts the samples into the encoder's frame size, the encoder and the muxer.
// It writes to a temporary file; Commit() renames that into place, and anything else (an
// error, a destructor without Commit) deletes it, so no half-written output survives.
//
// Thread contract: one conversion thread; the encoder may run threads of its own.

#include <cstdint>
#include <map>
#include <string>

#include "CttOptions.h"

extern "C" {
#include <libavutil/channel_layout.h>
#include <libavutil/frame.h>
#include <libavutil/samplefmt.h>
}

struct AVFormatContext;
struct AVCodecContext;
struct AVStream;
struct AVPacket;
struct AVAudioFifo;
struct SwrContext;

namespace ac::ctt {

struct InputFormat {
    AVSampleFormat sampleFormat = AV_SAMPLE_FMT_NONE;
    int sampleRate = 0;
    const AVChannelLayout* layout = nullptr;
};

class AudioSink {
public:
    AudioSink() = default;
    ~AudioSink();
    AudioSink(const AudioSink&) = delete;
    AudioSink& operator=(const AudioSink&) = delete;

    // tags: option word -> value, already merged with the source's own.
    bool Open(const CttOptions& options, const InputFormat& input,
              const std::map<std::string, std::string>& tags, std::string& error);

    // count samples of frame, starting offset samples into it.
    bool Write(const AVFrame* frame, int offset, int count, std::string& error);
    bool WriteSilence(std::int64_t samples, std::string& error);

    // Drains everything, writes the trailer and moves the file into place.
    bool Commit(std::string& error);

private:
    bool Feed(const std::uint8_t* const* data, int count, std::string& error);
    bool EncodeFromFifo(bool flush, std::string& error);
    bool SendToEncoder(AVFrame* frame, std::string& error);
    void Discard();

    const CttOptions* m_options = nullptr;
    InputFormat m_input;
    std::string m_tempPath;
    std::string m_id3v1;  // appended after the trailer when asked for
    AVFormatContext* m_muxer = nullptr;
    AVCodecContext* m_encoder = nullptr;
    AVStream* m_stream = nullptr;
    AVPacket* m_packet = nullptr;
    SwrContext* m_swr = nullptr;
    AVAudioFifo* m_fifo = nullptr;
    AVFrame* m_frame = nullptr;
    std::uint8_t** m_convertBuffer = nullptr;
    int m_convertCapacity = 0;
    int m_frameSize = 0;
    std::int64_t m_nextPts = 0;
    bool m_headerWritten = false;
};

}  // namespace ac::ctt
