#include "AudioSink.h"

#include "platform/PartFiles.h"

#include <strings.h>
#include <unistd.h>

#include <cerrno>
#include <climits>
#include <cstdio>
#include <cstring>
#include <filesystem>
#include <vector>
#include <algorithm>

#include "Id3v1.h"
#include "Report.h"

extern "C" {
#include <libavcodec/avcodec.h>
#include <libavformat/avformat.h>
#include <libavutil/audio_fifo.h>
#include <libavutil/opt.h>
#include <libavutil/parseutils.h>
#include <libswresample/swresample.h>
}

namespace ac::ctt {
namespace {

std::string AvError(int code) {
    char text[AV_ERROR_MAX_STRING_SIZE] = {0};
    av_strerror(code, text, sizeof text);
    return text;
}

// The profiles name codecs, not encoders: where FFmpeg has several encoders for one codec,
// take the one that sounds best (native vorbis is experimental, lame beats the rest).
const AVCodec* EncoderForFormat(const AVOutputFormat* format) {
    switch (format->audio_codec) {
        case AV_CODEC_ID_MP3: return avcodec_find_encoder_by_name("libmp3lame");
        case AV_CODEC_ID_VORBIS: return avcodec_find_encoder_by_name("libvorbis");
        case AV_CODEC_ID_NONE: return nullptr;
        default: return avcodec_find_encoder(format->audio_codec);
    }
}

bool CodecFitsFormat(const AVOutputFormat* format, AVCodecID codec) {
    const int answer = avformat_query_codec(format, codec, FF_COMPLIANCE_NORMAL);
    if (answer == 1) {
        return true;
    }
    if (answer == 0) {
        return false;
    }
    // Raw muxers carry exactly their own codec; the MPEG audio muxer takes every layer.
    if (std::strcmp(format->name, "mp3") == 0) {
        return codec == AV_CODEC_ID_MP3 || codec == AV_CODEC_ID_MP2 || codec == AV_CODEC_ID_MP1;
    }
    return codec == format->audio_codec;
}

int ChooseSampleRate(const AVCodec* codec, int wanted, bool explicitRate, std::string& error) {
    if (!codec->supported_samplerates) {
        return wanted;
    }
    int best = 0;
    for (const int* r = codec->supported_samplerates; *r; ++r) {
        if (*r == wanted) {
            return wanted;
        }
        if (!best || std::abs(*r - wanted) < std::abs(best - wanted)) {
            best = *r;
        }
    }
    if (explicitRate) {
        error = std::string("the codec ") + codec->name + " cannot encode at " +
                std::to_string(wanted) + " Hz";
        return 0;
    }
    return best;
}

bool ChooseLayout(const AVCodec* codec, int wanted, bool explicitCount, AVChannelLayout& out,
                  std::string& error) {
    if (!codec->ch_layouts) {
        av_channel_layout_default(&out, wanted);
        return true;
    }
    const AVChannelLayout* fallback = nullptr;
    for (const AVChannelLayout* l = codec->ch_layouts; l->nb_channels; ++l) {
        if (l->nb_channels == wanted) {
            return av_channel_layout_copy(&out, l) >= 0;
        }
        if (!fallback || (l->nb_channels <= wanted && l->nb_channels > fallback->nb_channels)) {
            fallback = l;
        }
    }
    if (explicitCount || !fallback) {
        error = std::string("the codec ") + codec->name + " cannot encode " +
                std::to_string(wanted) + " channels";
        return false;
    }
    return av_channel_layout_copy(&out, fallback) >= 0;
}

AVSampleFormat ChooseSampleFormat(const AVCodec* codec, AVSampleFormat input) {
    if (!codec->sample_fmts) {
        return input;
    }
    // Keep the source's depth when the encoder can take it: 24-bit FLAC stays 24-bit.
    for (const AVSampleFormat* f = codec->sample_fmts; *f != AV_SAMPLE_FMT_NONE; ++f) {
        if (*f == input || *f == av_get_packed_sample_fmt(input) ||
            *f == av_get_planar_sample_fmt(input)) {
            return *f;
        }
    }
    return codec->sample_fmts[0];
}

// Our tag words to the keys FFmpeg's muxers know. MP3 gets the ID3v2 frame for the original
// artist; elsewhere it is a free-form key.
void SetTags(AVFormatContext* muxer, const std::map<std::string, std::string>& tags, bool mp3) {
    static const std::map<std::string, std::string> kKeys = {
        {"title", "title"},     {"author", "artist"},   {"copyright", "copyright"},
        {"comment", "comment"}, {"album", "album"},     {"genre", "genre"},
        {"year", "date"},       {"composer", "composer"}, {"url", "url"},
        {"encodedby", "encoded_by"}, {"track", "track"},
    };
    for (const auto& [word, value] : tags) {
        if (value.empty()) {
            continue;
        }
        std::string key;
        if (word == "origaritist") {
            key = mp3 ? "TOPE" : "original_artist";
        } else if (word == "timestamp") {
            std::int64_t when = 0;
            if (av_parse_time(&when, value.c_str(), 0) < 0) {
                ReportWarning("timestamp \"" + value + "\" is no date; left out");
                continue;
            }
            key = "creation_time";
        } else if (auto it = kKeys.find(word); it != kKeys.end()) {
            key = it->second;
        } else {
            continue;
        }
        av_dict_set(&muxer->metadata, key.c_str(), value.c_str(), 0);
    }
}

std::string TempPathFor(const std::string& output) {
    return ac::platform::PartFilePath(output, ::getpid());
}

}  // namespace

AudioSink::~AudioSink() { Discard(); }

void AudioSink::Discard() {
    if (m_muxer) {
        if (m_muxer->pb) {
            avio_closep(&m_muxer->pb);
        }
        avformat_free_context(m_muxer);
        m_muxer = nullptr;
        if (!m_tempPath.empty()) {
            ::unlink(m_tempPath.c_str());
        }
    }
    avcodec_free_context(&m_encoder);
    av_packet_free(&m_packet);
    swr_free(&m_swr);
    if (m_fifo) {
        av_audio_fifo_free(m_fifo);
        m_fifo = nullptr;
    }
    av_frame_free(&m_frame);
    if (m_convertBuffer) {
        av_freep(&m_convertBuffer[0]);
        av_freep(&m_convertBuffer);
    }
}

bool AudioSink::Open(const CttOptions& options, const InputFormat& input,
                     const std::map<std::string, std::string>& tags, std::string& error) {
    m_options = &options;
    m_input = input;
    const std::string& output = options.output;
    int r = avformat_alloc_output_context2(&m_muxer, nullptr,
                                           options.format.empty() ? nullptr : options.format.c_str(),
                                           output.c_str());
    if (r < 0 || !m_muxer) {
        const bool ape = output.size() > 4 && strcasecmp(output.c_str() + output.size() - 4, ".ape") == 0;
        error = ape ? "Monkey's Audio (ape) can be read but not written"
                    : "no output format for \"" + output + "\": give -f or a known extension";
        return false;
    }
    const AVOutputFormat* format = m_muxer->oformat;
    const AVCodec* codec = options.codec.empty() ? EncoderForFormat(format)
                                                 : avcodec_find_encoder_by_name(options.codec.c_str());
    if (!codec || codec->type != AVMEDIA_TYPE_AUDIO) {
        error = options.codec.empty() ? std::string("the format ") + format->name + " has no audio codec"
                                      : "no encoder " + options.codec + " in this FFmpeg";
        return false;
    }
    if (!CodecFitsFormat(format, codec->id)) {
        error = std::string("the codec ") + avcodec_get_name(codec->id) + " does not fit the format " +
                (options.formatWord.empty() ? format->name : options.formatWord);
        return false;
    }

    m_encoder = avcodec_alloc_context3(codec);
    m_packet = av_packet_alloc();
    m_frame = av_frame_alloc();
    if (!m_encoder || !m_packet || !m_frame) {
        error = "out of memory";
        return false;
    }
    // G.726 is telephone speech: 8 kHz mono unless the profile says otherwise.
    const bool telephone = codec->id == AV_CODEC_ID_ADPCM_G726;
    int rate = options.sampleRate ? options.sampleRate : (telephone ? 8000 : input.sampleRate);
    rate = ChooseSampleRate(codec, rate, options.sampleRate != 0, error);
    if (!rate) {
        return false;
    }
    const int channels = options.channels ? options.channels
                                          : (telephone ? 1 : input.layout->nb_channels);
    if (!ChooseLayout(codec, channels, options.channels != 0, m_encoder->ch_layout, error)) {
        return false;
    }
    m_encoder->sample_rate = rate;
    m_encoder->sample_fmt = ChooseSampleFormat(codec, input.sampleFormat);
    m_encoder->time_base = AVRational{1, rate};
    m_encoder->thread_count = options.threads;
    if (options.bitRate) {
        m_encoder->bit_rate = options.bitRate;
    } else if (telephone) {
        m_encoder->bit_rate = 32000;
    }
    if (m_encoder->sample_fmt == AV_SAMPLE_FMT_S32 || m_encoder->sample_fmt == AV_SAMPLE_FMT_S32P) {
        // FLAC and the like store the source's real depth, not the container width.
        m_encoder->bits_per_raw_sample = std::min(av_get_bytes_per_sample(input.sampleFormat) * 8, 24);
    }
    if (format->flags & AVFMT_GLOBALHEADER) {
        m_encoder->flags |= AV_CODEC_FLAG_GLOBAL_HEADER;
    }
    r = avcodec_open2(m_encoder, codec, nullptr);
    if (r < 0) {
        std::string detail = LastLibraryError();
        error = std::string("cannot start the ") + codec->name + " encoder with these settings: " +
                (detail.empty() ? AvError(r) : detail);
        return false;
    }
    const bool variable = codec->capabilities & AV_CODEC_CAP_VARIABLE_FRAME_SIZE;
    m_frameSize = (m_encoder->frame_size > 0 && !variable) ? m_encoder->frame_size : 4096;

    m_stream = avformat_new_stream(m_muxer, nullptr);
    if (!m_stream || avcodec_parameters_from_context(m_stream->codecpar, m_encoder) < 0) {
        error = "out of memory";
        return false;
    }
    m_stream->time_base = m_encoder->time_base;

    // Gain rides on swresample's mixing matrix: exact on the lossless path, and it saturates.
    r = swr_alloc_set_opts2(&m_swr, &m_encoder->ch_layout, m_encoder->sample_fmt, rate,
                            const_cast<AVChannelLayout*>(input.layout), input.sampleFormat,
                            input.sampleRate, 0, nullptr);
    if (r < 0 || !m_swr) {
        error = "cannot set up the resampler";
        return false;
    }
    if (options.volume != 256) {
        av_opt_set_double(m_swr, "rematrix_volume", options.volume / 256.0, 0);
    }
    r = swr_init(m_swr);
    if (r < 0) {
        error = "cannot set up the resampler: " + AvError(r);
        return false;
    }
    m_fifo = av_audio_fifo_alloc(m_encoder->sample_fmt, m_encoder->ch_layout.nb_channels,
                                 m_frameSize * 2);
    if (!m_fifo) {
        error = "out of memory";
        return false;
    }

    const bool mp3 = std::strcmp(format->name, "mp3") == 0;
    SetTags(m_muxer, tags, mp3);
    m_tempPath = TempPathFor(output);
    r = avio_open(&m_muxer->pb, m_tempPath.c_str(), AVIO_FLAG_WRITE);
    if (r < 0) {
        m_tempPath.clear();  // nothing was made
        std::filesystem::path dir = std::filesystem::path(output).parent_path();
        error = "cannot write into the folder \"" + (dir.empty() ? std::string(".") : dir.string()) +
                "\": " + AvError(r);
        return false;
    }
    AVDictionary* muxOptions = nullptr;
    if (mp3) {
        av_dict_set(&muxOptions, "id3v2_version", options.id3v2 ? "3" : "0", 0);
        // The muxer's own ID3v1 depends on ID3v2 being on; Commit() appends ours.
        av_dict_set(&muxOptions, "write_id3v1", "0", 0);
        if (options.id3v1) {
            m_id3v1 = BuildId3v1Tag(tags);
        }
    }
    r = avformat_write_header(m_muxer, &muxOptions);
    av_dict_free(&muxOptions);
    if (r < 0) {
        error = "cannot start the output file: " + AvError(r);
        return false;
    }
    m_headerWritten = true;
    return true;
}

bool AudioSink::Feed(const std::uint8_t* const* data, int count, std::string& error) {
    const int room = swr_get_out_samples(m_swr, count);
    if (room > m_convertCapacity) {
        if (m_convertBuffer) {
            av_freep(&m_convertBuffer[0]);
            av_freep(&m_convertBuffer);
        }
        if (av_samples_alloc_array_and_samples(&m_convertBuffer, nullptr,
                                               m_encoder->ch_layout.nb_channels, room,
                                               m_encoder->sample_fmt, 0) < 0) {
            error = "out of memory";
            return false;
        }
        m_convertCapacity = room;
    }
    const int converted = swr_convert(m_swr, m_convertBuffer, m_convertCapacity,
                                      const_cast<const std::uint8_t**>(data), count);
    if (converted < 0) {
        error = "resampling failed: " + AvError(converted);
        return false;
    }
    if (converted > 0 &&
        av_audio_fifo_write(m_fifo, reinterpret_cast<void**>(m_convertBuffer), converted) < converted) {
        error = "out of memory";
        return false;
    }
    return EncodeFromFifo(false, error);
}

bool AudioSink::Write(const AVFrame* frame, int offset, int count, std::string& error) {
    if (count <= 0) {
        return true;
    }
    const AVSampleFormat fmt = static_cast<AVSampleFormat>(frame->format);
    const int bytes = av_get_bytes_per_sample(fmt);
    const int channels = frame->ch_layout.nb_channels;
    if (av_sample_fmt_is_planar(fmt)) {
        std::vector<const std::uint8_t*> planes(static_cast<size_t>(channels));
        for (int c = 0; c < channels; ++c) {
            planes[static_cast<size_t>(c)] =
                frame->extended_data[c] + static_cast<size_t>(offset) * bytes;
        }
        return Feed(planes.data(), count, error);
    }
    const std::uint8_t* planes[1] = {nullptr};
    planes[0] = frame->data[0] + static_cast<size_t>(offset) * bytes * channels;
    return Feed(planes, count, error);
}

bool AudioSink::WriteSilence(std::int64_t samples, std::string& error) {
    AVFrame* silence = av_frame_alloc();
    if (!silence) {
        error = "out of memory";
        return false;
    }
    bool ok = true;
    while (ok && samples > 0) {
        const int n = static_cast<int>(std::min<std::int64_t>(samples, 4096));
        silence->format = m_input.sampleFormat;
        silence->sample_rate = m_input.sampleRate;
        silence->nb_samples = n;
        av_channel_layout_copy(&silence->ch_layout, m_input.layout);
        if (av_frame_get_buffer(silence, 0) < 0) {
            error = "out of memory";
            ok = false;
            break;
        }
        av_samples_set_silence(silence->extended_data, 0, n, m_input.layout->nb_channels,
                               m_input.sampleFormat);
        ok = Write(silence, 0, n, error);
        av_frame_unref(silence);
        samples -= n;
    }
    av_frame_free(&silence);
    return ok;
}

bool AudioSink::SendToEncoder(AVFrame* frame, std::string& error) {
    int r = avcodec_send_frame(m_encoder, frame);
    if (r < 0 && r != AVERROR_EOF) {
        error = "encoding failed: " + AvError(r);
        return false;
    }
    for (;;) {
        r = avcodec_receive_packet(m_encoder, m_packet);
        if (r == AVERROR(EAGAIN) || r == AVERROR_EOF) {
            return true;
        }
        if (r < 0) {
            error = "encoding failed: " + AvError(r);
            return false;
        }
        m_packet->stream_index = m_stream->index;
        av_packet_rescale_ts(m_packet, m_encoder->time_base, m_stream->time_base);
        r = av_interleaved_write_frame(m_muxer, m_packet);
        if (r < 0) {
            error = "cannot write the output file: " + AvError(r);
            return false;
        }
    }
}

bool AudioSink::EncodeFromFifo(bool flush, std::string& error) {
    while (av_audio_fifo_size(m_fifo) >= m_frameSize || (flush && av_audio_fifo_size(m_fifo) > 0)) {
        const int n = std::min(av_audio_fifo_size(m_fifo), m_frameSize);
        m_frame->nb_samples = n;
        m_frame->format = m_encoder->sample_fmt;
        m_frame->sample_rate = m_encoder->sample_rate;
        av_channel_layout_copy(&m_frame->ch_layout, &m_encoder->ch_layout);
        if (av_frame_get_buffer(m_frame, 0) < 0) {
            error = "out of memory";
            return false;
        }
        av_audio_fifo_read(m_fifo, reinterpret_cast<void**>(m_frame->extended_data), n);
        m_frame->pts = m_nextPts;
        m_nextPts += n;
        const bool ok = SendToEncoder(m_frame, error);
        av_frame_unref(m_frame);
        if (!ok) {
            return false;
        }
    }
    return true;
}

bool AudioSink::Commit(std::string& error) {
    // What swresample still holds (its filter delay) comes out with a null input.
    for (;;) {
        const int before = av_audio_fifo_size(m_fifo);
        if (!Feed(nullptr, 0, error)) {
            return false;
        }
        if (av_audio_fifo_size(m_fifo) == before || swr_get_delay(m_swr, m_encoder->sample_rate) == 0) {
            break;
        }
    }
    if (!EncodeFromFifo(true, error) || !SendToEncoder(nullptr, error)) {
        return false;
    }
    int r = av_write_trailer(m_muxer);
    if (r < 0) {
        error = "cannot finish the output file: " + AvError(r);
        return false;
    }
    if (!m_id3v1.empty()) {
        const std::int64_t size = avio_size(m_muxer->pb);
        if (size < 0 || avio_seek(m_muxer->pb, size, SEEK_SET) < 0) {
            error = "cannot append the ID3v1 tag";
            return false;
        }
        avio_write(m_muxer->pb, reinterpret_cast<const unsigned char*>(m_id3v1.data()),
                   static_cast<int>(m_id3v1.size()));
        avio_flush(m_muxer->pb);
    }
    r = avio_closep(&m_muxer->pb);
    if (r < 0) {
        error = "cannot finish the output file: " + AvError(r);
        return false;
    }
    // Without -y an output that appeared meanwhile is kept: link() refuses to replace.
    const std::string& output = m_options->output;
    if (m_options->overwrite) {
        r = ::rename(m_tempPath.c_str(), output.c_str());
    } else {
        r = ::link(m_tempPath.c_str(), output.c_str());
        if (r != 0 && errno != EEXIST) {
            r = ::rename(m_tempPath.c_str(), output.c_str());  // file systems without hard links
        } else if (r == 0) {
            ::unlink(m_tempPath.c_str());
        }
    }
    if (r != 0) {
        error = "cannot move the finished file to \"" + output + "\": " + std::strerror(errno);
        return false;
    }
    avformat_free_context(m_muxer);
    m_muxer = nullptr;
    return true;
}

}  // namespace ac::ctt
