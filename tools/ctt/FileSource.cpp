#include <algorithm>
#include <cmath>
#include <cstdio>
#include <cstring>

#include "Report.h"
#include "Sources.h"

extern "C" {
#include <libavcodec/avcodec.h>
#include <libavformat/avformat.h>
}

namespace ac::ctt {
namespace {

std::string AvError(int code) {
    char text[AV_ERROR_MAX_STRING_SIZE] = {0};
    av_strerror(code, text, sizeof text);
    return text;
}

// The size the data chunk of a RIFF WAVE file claims; -1 when unknown or "as long as it gets"
// (streamed WAVs write 0 or 0xFFFFFFFF there).
std::int64_t WavClaimedDataBytes(const std::string& path) {
    std::FILE* file = std::fopen(path.c_str(), "rb");
    if (!file) {
        return -1;
    }
    unsigned char head[12];
    std::int64_t claimed = -1;
    if (std::fread(head, 1, 12, file) == 12 && std::memcmp(head, "RIFF", 4) == 0) {
        unsigned char chunk[8];
        for (int guard = 0; guard < 64 && std::fread(chunk, 1, 8, file) == 8; ++guard) {
            const std::uint32_t size = chunk[4] | (chunk[5] << 8) | (chunk[6] << 16) |
                                       (static_cast<std::uint32_t>(chunk[7]) << 24);
            if (std::memcmp(chunk, "data", 4) == 0) {
                if (size != 0 && size != 0xFFFFFFFFu) {
                    claimed = size;
                }
                break;
            }
            if (std::fseek(file, static_cast<long>(size + (size & 1)), SEEK_CUR) != 0) {
                break;
            }
        }
    }
    std::fclose(file);
    return claimed;
}

class FileSource final : public AudioSource {
public:
    ~FileSource() override {
        av_packet_free(&m_packet);
        avcodec_free_context(&m_decoder);
        avformat_close_input(&m_format);
    }

    bool Open(const std::string& path, std::int64_t startUs, std::int64_t endUs) {
        int r = avformat_open_input(&m_format, path.c_str(), nullptr, nullptr);
        if (r < 0) {
            m_error = "cannot open input \"" + path + "\": " + AvError(r);
            return false;
        }
        r = avformat_find_stream_info(m_format, nullptr);
        if (r < 0) {
            m_error = "cannot read the streams of \"" + path + "\": " + AvError(r);
            return false;
        }
        for (unsigned i = 0; i < m_format->nb_streams; ++i) {
            m_format->streams[i]->discard = AVDISCARD_ALL;
            if (!m_stream && m_format->streams[i]->codecpar->codec_type == AVMEDIA_TYPE_AUDIO) {
                m_stream = m_format->streams[i];
            }
        }
        if (!m_stream) {
            m_error = "\"" + path + "\" has no audio stream";
            return false;
        }
        m_stream->discard = AVDISCARD_DEFAULT;
        const AVCodec* codec = avcodec_find_decoder(m_stream->codecpar->codec_id);
        if (!codec) {
            m_error = std::string("no decoder for the audio of \"") + path + "\" (" +
                      avcodec_get_name(m_stream->codecpar->codec_id) + ")";
            return false;
        }
        m_decoder = avcodec_alloc_context3(codec);
        m_packet = av_packet_alloc();
        if (!m_decoder || !m_packet ||
            avcodec_parameters_to_context(m_decoder, m_stream->codecpar) < 0) {
            m_error = "out of memory";
            return false;
        }
        m_decoder->pkt_timebase = m_stream->time_base;
        r = avcodec_open2(m_decoder, codec, nullptr);
        if (r < 0) {
            m_error = "cannot decode the audio of \"" + path + "\": " + AvError(r);
            return false;
        }
        if (m_decoder->sample_rate <= 0 || m_decoder->ch_layout.nb_channels <= 0) {
            m_error = "\"" + path + "\" has an audio stream without rate or channels";
            return false;
        }
        if (m_decoder->ch_layout.order == AV_CHANNEL_ORDER_UNSPEC) {
            int n = m_decoder->ch_layout.nb_channels;
            av_channel_layout_uninit(&m_decoder->ch_layout);
            av_channel_layout_default(&m_decoder->ch_layout, n);
        }
        const int rate = m_decoder->sample_rate;
        m_spanStart = llround(static_cast<double>(startUs) * rate / 1e6);
        m_spanEnd = endUs >= 0 ? llround(static_cast<double>(endUs) * rate / 1e6) : -1;
        if (m_stream->duration != AV_NOPTS_VALUE && m_stream->duration > 0) {
            m_declaredSamples = av_rescale_q(m_stream->duration, m_stream->time_base,
                                             AVRational{1, rate});
        }
        if (std::strcmp(m_format->iformat->name, "wav") == 0) {
            // FFmpeg trims a WAV's data size to the file; the header still tells what was meant.
            const std::int64_t claimed = WavClaimedDataBytes(path);
            const int blockAlign = m_stream->codecpar->block_align;
            if (claimed > 0 && blockAlign > 0) {
                m_declaredSamples = claimed / blockAlign;
            }
        }
        if (m_spanStart > 0) {
            SeekTo(0);
        }
        return true;
    }

    AVSampleFormat SampleFormat() const override { return m_decoder->sample_fmt; }
    int SampleRate() const override { return m_decoder->sample_rate; }
    const AVChannelLayout& Layout() const override { return m_decoder->ch_layout; }

    std::int64_t SpanLength() const override {
        if (m_spanEnd >= 0) {
            return m_spanEnd - m_spanStart;
        }
        return m_declaredSamples > 0 ? std::max<std::int64_t>(m_declaredSamples - m_spanStart, 0)
                                     : -1;
    }

    void SeekTo(std::int64_t sample) override {
        const std::int64_t target = m_spanStart + sample;
        if (target <= 0) {
            return;
        }
        const std::int64_t ts = av_rescale_q(target, AVRational{1, m_decoder->sample_rate},
                                             m_stream->time_base) +
                                (m_stream->start_time != AV_NOPTS_VALUE ? m_stream->start_time : 0);
        if (av_seek_frame(m_format, m_stream->index, ts, AVSEEK_FLAG_BACKWARD) >= 0) {
            avcodec_flush_buffers(m_decoder);
            m_positionKnown = false;
        }
        // A file that cannot seek is decoded from its start; the frames are cut all the same.
    }

    int Next(AVFrame* frame, std::int64_t& position) override {
        for (;;) {
            int r = avcodec_receive_frame(m_decoder, frame);
            if (r >= 0) {
                if (!m_positionKnown) {
                    const std::int64_t pts = frame->best_effort_timestamp;
                    std::int64_t start = m_stream->start_time != AV_NOPTS_VALUE ? m_stream->start_time : 0;
                    m_next = pts == AV_NOPTS_VALUE
                                 ? 0
                                 : av_rescale_q(pts - start, m_stream->time_base,
                                                AVRational{1, m_decoder->sample_rate});
                    m_positionKnown = true;
                }
                position = m_next - m_spanStart;
                m_next += frame->nb_samples;
                ++m_goodFrames;
                if (m_spanEnd >= 0) {
                    const std::int64_t left = m_spanEnd - m_spanStart - position;
                    if (left <= 0) {
                        av_frame_unref(frame);
                        return 0;
                    }
                    // The next track starts inside this frame: hand out only our part.
                    frame->nb_samples = static_cast<int>(std::min<std::int64_t>(frame->nb_samples, left));
                }
                return 1;
            }
            if (r == AVERROR_EOF) {
                return 0;
            }
            if (r != AVERROR(EAGAIN)) {
                if (!CountDecodeError(r)) {
                    return -1;
                }
                continue;
            }
            if (m_draining) {
                return 0;
            }
            r = av_read_frame(m_format, m_packet);
            if (r == AVERROR_EOF) {
                m_draining = true;
                avcodec_send_packet(m_decoder, nullptr);
                continue;
            }
            if (r < 0) {
                m_error = "cannot read the input: " + AvError(r);
                return -1;
            }
            if (m_packet->stream_index == m_stream->index) {
                ++m_packets;
                r = avcodec_send_packet(m_decoder, m_packet);
                if (r < 0 && r != AVERROR(EAGAIN) && !CountDecodeError(r)) {
                    av_packet_unref(m_packet);
                    return -1;
                }
            }
            av_packet_unref(m_packet);
        }
    }

    bool CheckComplete(std::int64_t samplesSeen) override {
        if (m_goodFrames == 0) {
            m_error = "the input holds no decodable audio" +
                      (m_decodeErrors ? ": " + LastLibraryError() : std::string());
            return false;
        }
        // A header that promised more than the file holds: cut off in transfer. Lossy
        // containers estimate their length, so only a clear shortfall counts.
        if (m_spanEnd < 0 && m_declaredSamples > 0 && m_spanStart == 0) {
            const std::int64_t missing = m_declaredSamples - samplesSeen;
            const int rate = m_decoder->sample_rate;
            if (missing > rate / 2 && missing * 50 > m_declaredSamples) {
                m_error = "the input is truncated: it ends " +
                          std::to_string(static_cast<double>(missing) / rate) +
                          " s before its stated length";
                return false;
            }
        }
        if (m_spanEnd >= 0 && samplesSeen + m_decoder->sample_rate / 75 < m_spanEnd - m_spanStart) {
            m_error = "the audio file ends before the end of the track";
            return false;
        }
        return true;
    }

private:
    // A damaged packet or two in a long file is concealed as the decoders do; a file that is
    // mostly damage is an error.
    bool CountDecodeError(int code) {
        ++m_decodeErrors;
        if (code == AVERROR(ENOMEM) || m_decodeErrors > 50 ||
            (m_decodeErrors > 3 && m_decodeErrors * 20 > m_packets)) {
            std::string detail = LastLibraryError();
            m_error = "the input is damaged: " + (detail.empty() ? AvError(code) : detail);
            return false;
        }
        return true;
    }

    AVFormatContext* m_format = nullptr;
    AVStream* m_stream = nullptr;
    AVCodecContext* m_decoder = nullptr;
    AVPacket* m_packet = nullptr;
    std::int64_t m_spanStart = 0;
    std::int64_t m_spanEnd = -1;
    std::int64_t m_declaredSamples = -1;
    std::int64_t m_next = 0;
    bool m_positionKnown = false;
    bool m_draining = false;
    std::int64_t m_packets = 0;
    std::int64_t m_decodeErrors = 0;
    std::int64_t m_goodFrames = 0;
};

}  // namespace

std::unique_ptr<AudioSource> OpenFileSource(const std::string& path, std::int64_t startUs,
                                            std::int64_t endUs, std::string& error) {
    auto source = std::make_unique<FileSource>();
    if (!source->Open(path, startUs, endUs)) {
        error = source->Error();
        return nullptr;
    }
    return source;
}

}  // namespace ac::ctt
