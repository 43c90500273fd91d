#include "panels/PlayerSource.h"

#include "ctt/Sources.h"
#include "medialist/CueSheet.h"

#include <algorithm>
#include <climits>
#include <cmath>
#include <deque>

extern "C" {
#include <libavcodec/avcodec.h>
#include <libavformat/avformat.h>
}

namespace ac::player {
namespace {

struct FormatCloser {
    void operator()(AVFormatContext* ic) const { avformat_close_input(&ic); }
};
struct CodecCloser {
    void operator()(AVCodecContext* c) const { avcodec_free_context(&c); }
};
struct PacketFreer {
    void operator()(AVPacket* p) const { av_packet_free(&p); }
};
struct FrameFreer {
    void operator()(AVFrame* f) const { av_frame_free(&f); }
};

using CodecPtr = std::unique_ptr<AVCodecContext, CodecCloser>;

// Ten seconds of pictures at 30 per second: longer than the key frame distance of common files.
constexpr std::size_t kMostPutOff = 300;

CodecPtr OpenDecoder(const AVStream* stream, int threads) {
    const AVCodec* codec = avcodec_find_decoder(stream->codecpar->codec_id);
    if (codec == nullptr) {
        return nullptr;
    }
    CodecPtr context(avcodec_alloc_context3(codec));
    if (!context || avcodec_parameters_to_context(context.get(), stream->codecpar) < 0) {
        return nullptr;
    }
    context->pkt_timebase = stream->time_base;
    context->thread_count = threads;
    if (avcodec_open2(context.get(), codec, nullptr) < 0) {
        return nullptr;
    }
    return context;
}

class FileSource final : public PlayerSource {
public:
    bool Open(const std::string& path) {
        AVFormatContext* ic = nullptr;
        if (avformat_open_input(&ic, path.c_str(), nullptr, nullptr) < 0) {
            return false;
        }
        m_input.reset(ic);
        if (avformat_find_stream_info(ic, nullptr) < 0) {
            return false;
        }
        // The best audio stream, wherever it stands among the others (a video stream may come
        // first); the pictures of a cover are no video to play.
        m_audioIndex = av_find_best_stream(ic, AVMEDIA_TYPE_AUDIO, -1, -1, nullptr, 0);
        if (m_audioIndex >= 0) {
            m_audio = OpenDecoder(ic->streams[m_audioIndex], 1);
            if (!m_audio) {
                m_audioIndex = -1;
            }
        }
        m_videoIndex = av_find_best_stream(ic, AVMEDIA_TYPE_VIDEO, -1, m_audioIndex, nullptr, 0);
        if (m_videoIndex >= 0 &&
            (ic->streams[m_videoIndex]->disposition & AV_DISPOSITION_ATTACHED_PIC) == 0) {
            m_video = OpenDecoder(ic->streams[m_videoIndex], 2);
        }
        if (!m_video) {
            m_videoIndex = -1;
        }
        for (unsigned i = 0; i < ic->nb_streams; ++i) {
            if (static_cast<int>(i) != m_audioIndex && static_cast<int>(i) != m_videoIndex) {
                ic->streams[i]->discard = AVDISCARD_ALL;
            }
        }
        m_start = ic->start_time != AV_NOPTS_VALUE
                      ? static_cast<double>(ic->start_time) / AV_TIME_BASE
                      : 0.0;
        m_length = ComputeLength();
        m_packet.reset(av_packet_alloc());
        m_frame.reset(av_frame_alloc());
        return m_packet && m_frame && (m_audio || m_video);
    }

    double Length() const override { return m_length; }
    bool HasAudio() const override { return m_audio != nullptr; }
    bool HasVideo() const override { return m_video != nullptr; }
    int AudioRate() const override { return m_audio ? m_audio->sample_rate : 0; }

    void Seek(double seconds) override {
        const auto target = static_cast<std::int64_t>((seconds + m_start) * AV_TIME_BASE);
        // At or before the target, so the frames from there on can be cut to it exactly.
        avformat_seek_file(m_input.get(), -1, INT64_MIN, target, target, 0);
        for (AVCodecContext* c : {m_audio.get(), m_video.get()}) {
            if (c != nullptr) {
                avcodec_flush_buffers(c);
            }
        }
        m_draining = false;
        m_putOff.clear();
        m_nextAudio = seconds;
    }

    void SetCatchingUp(bool catchingUp) override {
        m_catchingUp = catchingUp && m_video != nullptr;
        if (m_video && (m_catchingUp || m_putOff.empty())) {
            m_video->skip_frame = m_catchingUp ? AVDISCARD_NONREF : AVDISCARD_DEFAULT;
        }
    }

    bool HasBacklog() const override { return !m_catchingUp && !m_putOff.empty(); }
    void DecodeBacklog(const FrameSink& onVideo) override {
        if (HasBacklog()) {
            DecodePutOff(onVideo);
        }
    }

    bool Step(const FrameSink& onAudio, const FrameSink& onVideo) override {
        if (m_draining) {
            return false;
        }
        if (!m_catchingUp && !m_putOff.empty()) {
            DecodePutOff(onVideo);
        }
        const int read = av_read_frame(m_input.get(), m_packet.get());
        if (read < 0) {
            // End of file or a cut-off one: whatever the decoders still hold comes out.
            m_draining = true;
            while (!m_putOff.empty()) {
                DecodePutOff(onVideo);
            }
            Decode(m_audio.get(), m_audioIndex, nullptr, onAudio);
            Decode(m_video.get(), m_videoIndex, nullptr, onVideo);
            return false;
        }
        if (m_packet->stream_index == m_audioIndex) {
            Decode(m_audio.get(), m_audioIndex, m_packet.get(), onAudio);
        } else if (m_packet->stream_index == m_videoIndex) {
            // A sound that never reaches the target (it ends before the pictures do) must
            // not hold the pictures back without bound.
            if (m_putOff.size() >= kMostPutOff) {
                m_catchingUp = false;
            }
            if (m_audio && (m_catchingUp || !m_putOff.empty())) {
                m_putOff.emplace_back(av_packet_clone(m_packet.get()));
            } else {
                Decode(m_video.get(), m_videoIndex, m_packet.get(), onVideo);
            }
        }
        av_packet_unref(m_packet.get());
        return true;
    }

private:
    double ComputeLength() const {
        const AVFormatContext* ic = m_input.get();
        if (ic->duration != AV_NOPTS_VALUE && ic->duration > 0) {
            return static_cast<double>(ic->duration) / AV_TIME_BASE;
        }
        for (int index : {m_audioIndex, m_videoIndex}) {
            if (index >= 0 && ic->streams[index]->duration > 0) {
                return static_cast<double>(ic->streams[index]->duration) *
                       av_q2d(ic->streams[index]->time_base);
            }
        }
        return 0;
    }

    void DecodePutOff(const FrameSink& onVideo) {
        Decode(m_video.get(), m_videoIndex, m_putOff.front().get(), onVideo);
        m_putOff.pop_front();
        if (m_putOff.empty() && !m_catchingUp) {
            m_video->skip_frame = AVDISCARD_DEFAULT;
        }
    }

    void Decode(AVCodecContext* codec, int index, const AVPacket* packet, const FrameSink& sink) {
        if (codec == nullptr) {
            return;
        }
        // A damaged packet is skipped: the decoder resynchronises on the next one.
        if (avcodec_send_packet(codec, packet) < 0 && packet != nullptr) {
            return;
        }
        const double timeBase = av_q2d(m_input->streams[index]->time_base);
        while (avcodec_receive_frame(codec, m_frame.get()) == 0) {
            const std::int64_t pts = m_frame->best_effort_timestamp;
            double seconds = 0;
            if (index == m_audioIndex) {
                seconds = pts != AV_NOPTS_VALUE ? static_cast<double>(pts) * timeBase - m_start
                                                : m_nextAudio;
                if (m_frame->sample_rate > 0) {
                    m_nextAudio =
                        seconds + static_cast<double>(m_frame->nb_samples) / m_frame->sample_rate;
                }
            } else {
                seconds = pts != AV_NOPTS_VALUE ? static_cast<double>(pts) * timeBase - m_start : 0;
            }
            if (sink) {
                sink(m_frame.get(), seconds);
            }
            av_frame_unref(m_frame.get());
        }
    }

    std::unique_ptr<AVFormatContext, FormatCloser> m_input;
    CodecPtr m_audio;
    CodecPtr m_video;
    std::unique_ptr<AVPacket, PacketFreer> m_packet;
    std::unique_ptr<AVFrame, FrameFreer> m_frame;
    int m_audioIndex = -1;
    int m_videoIndex = -1;
    double m_start = 0;
    double m_length = 0;
    double m_nextAudio = 0;
    bool m_draining = false;
    bool m_catchingUp = false;
    // Video packets read while the sound catches up with a seek, in file order.
    std::deque<std::unique_ptr<AVPacket, PacketFreer>> m_putOff;
};

// A track of an audio CD, or the span of a file a cue sheet's track names: the conversion
// tool's readers, so the preview hears exactly what a rip or a conversion would read.
class ReaderSource final : public PlayerSource {
public:
    explicit ReaderSource(std::unique_ptr<ctt::AudioSource> reader) : m_reader(std::move(reader)) {
        m_frame.reset(av_frame_alloc());
    }

    double Length() const override {
        const std::int64_t samples = m_reader->SpanLength();
        return samples > 0 ? static_cast<double>(samples) / m_reader->SampleRate() : 0.0;
    }
    bool HasAudio() const override { return true; }
    bool HasVideo() const override { return false; }
    int AudioRate() const override { return m_reader->SampleRate(); }

    void Seek(double seconds) override {
        m_reader->SeekTo(static_cast<std::int64_t>(seconds * m_reader->SampleRate()));
    }

    bool Step(const FrameSink& onAudio, const FrameSink& /*onVideo*/) override {
        std::int64_t position = 0;
        av_frame_unref(m_frame.get());
        if (!m_frame || m_reader->Next(m_frame.get(), position) != 1) {
            return false;
        }
        if (onAudio) {
            onAudio(m_frame.get(), static_cast<double>(position) / m_reader->SampleRate());
        }
        return true;
    }

private:
    std::unique_ptr<ctt::AudioSource> m_reader;
    std::unique_ptr<AVFrame, FrameFreer> m_frame;
};

}  // namespace

std::unique_ptr<PlayerSource> OpenPlayerSource(const std::string& path) {
    std::string error;
    if (ctt::IsCdaPath(path)) {
        std::unique_ptr<ctt::AudioSource> reader = ctt::OpenCdSource(path, error);
        if (!reader) {
            return nullptr;
        }
        return std::make_unique<ReaderSource>(std::move(reader));
    }
    if (const auto cue = SplitCueTrackPath(path)) {
        CueTrackSpan span;
        if (!ResolveCueTrack(cue->sheet, cue->track, span, error)) {
            return nullptr;
        }
        const std::int64_t startUs = span.startFrame * 1000000 / kCueFramesPerSecond;
        const std::int64_t endUs =
            span.endFrame < 0 ? -1 : span.endFrame * 1000000 / kCueFramesPerSecond;
        std::unique_ptr<ctt::AudioSource> reader =
            ctt::OpenFileSource(span.audioPath, startUs, endUs, error);
        if (!reader) {
            return nullptr;
        }
        return std::make_unique<ReaderSource>(std::move(reader));
    }
    auto source = std::make_unique<FileSource>();
    if (!source->Open(path)) {
        return nullptr;
    }
    return source;
}

}  // namespace ac::player
