#include "medialist/MediaProbe.h"

#include "medialist/TextDecoding.h"

#include <algorithm>
#include <climits>
#include <cstdio>
#include <cstdlib>
#include <sys/stat.h>
#include <unistd.h>

#include "medialist/CueSheet.h"

extern "C" {
#include <libavcodec/avcodec.h>
#include <libavformat/avformat.h>
#include <libavutil/pixdesc.h>
}

namespace ac {
namespace {

std::int32_t ClampToInt32(std::int64_t v) {
    return static_cast<std::int32_t>(std::clamp<std::int64_t>(v, INT32_MIN, INT32_MAX));
}

// Containers keep tags in different places: Ogg puts them on the stream, most others on the
// file. The file wins; the first audio stream fills the gaps.
std::string Tag(const AVFormatContext* ic, const AVStream* audio,
                std::initializer_list<const char*> keys) {
    for (const AVDictionary* dict :
         {static_cast<const AVDictionary*>(ic->metadata),
          audio ? static_cast<const AVDictionary*>(audio->metadata) : nullptr}) {
        for (const char* key : keys) {
            if (const AVDictionaryEntry* e = av_dict_get(dict, key, nullptr, 0); e && *e->value) {
                // RIFF INFO and some old taggers store bytes with no code page.
                return DecodeUnlabelledText(e->value);
            }
        }
    }
    return {};
}

std::string CodecName(const AVCodecParameters* par) {
    // The MPEG audio layers keep their plain names: the float decoders are an FFmpeg detail.
    switch (par->codec_id) {
        case AV_CODEC_ID_MP1:
            return "mp1";
        case AV_CODEC_ID_MP2:
            return "mp2";
        case AV_CODEC_ID_MP3:
            return "mp3";
        default:
            break;
    }
    if (const AVCodec* dec = avcodec_find_decoder(par->codec_id)) {
        return dec->name;
    }
    if (par->codec_id == AV_CODEC_ID_MPEG2TS) {
        return "mpeg2ts";
    }
    if (par->codec_id != AV_CODEC_ID_NONE) {
        if (const char* name = avcodec_get_name(par->codec_id); name && *name) {
            return name;
        }
    }
    char text[32];
    const std::uint32_t tag = par->codec_tag;
    if (par->codec_type == AVMEDIA_TYPE_VIDEO) {
        std::snprintf(text, sizeof text, "%c%c%c%c", static_cast<char>(tag & 0xFF),
                      static_cast<char>((tag >> 8) & 0xFF), static_cast<char>((tag >> 16) & 0xFF),
                      static_cast<char>((tag >> 24) & 0xFF));
    } else {
        std::snprintf(text, sizeof text, "0x%04x", tag);
    }
    return text;
}

std::int64_t StreamDurationUs(const AVStream* st) {
    if (st->duration == AV_NOPTS_VALUE || st->duration <= 0) {
        return AV_NOPTS_VALUE;
    }
    return av_rescale_q(st->duration, st->time_base, AVRational{1, 1000000});
}

void AddStream(const AVStream* st, MediaFileInfo& info, std::int64_t& audioUs,
               std::int64_t& videoUs) {
    const AVCodecParameters* par = st->codecpar;
    const std::string name = CodecName(par);
    switch (par->codec_type) {
        case AVMEDIA_TYPE_VIDEO: {
            // Cover art is a picture, not a video stream of the file.
            if (st->disposition & AV_DISPOSITION_ATTACHED_PIC) {
                return;
            }
            VideoStreamInfo v;
            v.codec = name;
            if (par->codec_id == AV_CODEC_ID_RAWVIDEO) {
                const char* pix = av_get_pix_fmt_name(static_cast<AVPixelFormat>(par->format));
                v.codec += std::string(", ") + (pix ? pix : "none");
            }
            if (par->width != 0) {
                v.width = par->width;
                v.height = par->height;
                AVRational rate = st->avg_frame_rate.num ? st->avg_frame_rate : st->r_frame_rate;
                v.frameRate = rate.den ? static_cast<float>(av_q2d(rate)) : 0.0f;
            }
            v.bitRate = ClampToInt32(par->bit_rate);
            info.videoStreams.push_back(v);
            videoUs = StreamDurationUs(st);
            break;
        }
        case AVMEDIA_TYPE_AUDIO: {
            AudioStreamInfo a;
            a.codec = name;
            a.channels = par->ch_layout.nb_channels;
            a.sampleRate = par->sample_rate;
            // Raw PCM is worth what its samples take, whatever the header claims.
            const int id = par->codec_id;
            if (id >= AV_CODEC_ID_PCM_S16LE && id <= AV_CODEC_ID_PCM_U16BE) {
                a.bitRate = ClampToInt32(std::int64_t{a.sampleRate} * a.channels * 16);
            } else if (id >= AV_CODEC_ID_PCM_S8 && id <= AV_CODEC_ID_PCM_ALAW) {
                a.bitRate = ClampToInt32(std::int64_t{a.sampleRate} * a.channels * 8);
            } else {
                a.bitRate = ClampToInt32(par->bit_rate);
            }
            info.audioStreams.push_back(a);
            audioUs = StreamDurationUs(st);
            break;
        }
        case AVMEDIA_TYPE_DATA:
        case AVMEDIA_TYPE_SUBTITLE:
            info.dataStreams.push_back(DataStreamInfo{name, ClampToInt32(par->bit_rate)});
            break;
        default:
            break;
    }
}

void SetDuration(MediaFileInfo& info, std::int64_t us) {
    if (us == AV_NOPTS_VALUE || us < 0) {
        return;
    }
    std::int64_t secs = us / 1000000;
    info.microseconds = static_cast<std::int32_t>(us % 1000000);
    info.hours = ClampToInt32(secs / 3600);
    info.minutes = static_cast<std::int32_t>((secs / 60) % 60);
    info.seconds = static_cast<std::int32_t>(secs % 60);
}

void ReadTags(const AVFormatContext* ic, const AVStream* audio, MediaFileInfo& info) {
    info.title = Tag(ic, audio, {"title"});
    info.author = Tag(ic, audio, {"artist", "author", "album_artist"});
    info.copyright = Tag(ic, audio, {"copyright"});
    info.comment = Tag(ic, audio, {"comment", "description"});
    info.album = Tag(ic, audio, {"album"});
    const int year = std::atoi(Tag(ic, audio, {"date", "year", "TYER", "TDRC"}).c_str());
    if (year > 0 && year < 2100) {
        info.year = std::to_string(year);
    }
    info.track = std::atoi(Tag(ic, audio, {"track", "tracknumber"}).c_str());
    info.genre = Tag(ic, audio, {"genre"});
    info.composer = Tag(ic, audio, {"composer"});
    info.origArtist = Tag(ic, audio, {"TOPE", "original_artist", "original artist"});
    info.url = Tag(ic, audio, {"url", "WOAR", "TXXX:url"});
    info.encodedBy = Tag(ic, audio, {"encoded_by", "TENC", "encodedby"});
}

}  // namespace

bool HeaderIsComplete(const AVFormatContext* ic, bool anyCodec) {
    if (ic->nb_streams == 0 || (ic->ctx_flags & AVFMTCTX_NOHEADER)) {
        return false;
    }
    for (unsigned i = 0; i < ic->nb_streams; ++i) {
        const AVCodecParameters* par = ic->streams[i]->codecpar;
        const bool pcm =
            par->codec_id >= AV_CODEC_ID_PCM_S16LE && par->codec_id < AV_CODEC_ID_ADPCM_IMA_QT;
        const bool trusted = pcm || (anyCodec && par->codec_id != AV_CODEC_ID_AAC &&
                                     par->codec_id != AV_CODEC_ID_NONE);
        if (par->codec_type != AVMEDIA_TYPE_AUDIO || !trusted || par->sample_rate <= 0 ||
            par->ch_layout.nb_channels <= 0 || ic->streams[i]->duration == AV_NOPTS_VALUE) {
            return false;
        }
    }
    return true;
}

namespace {

// FFmpeg's "Invalid data found when processing input" says little to a user; the common cases
// get words of their own.
std::string OpenErrorText(const std::string& path, int error) {
    struct stat st {};
    if (::stat(path.c_str(), &st) != 0) {
        return "no such file: " + path;
    }
    if (S_ISDIR(st.st_mode)) {
        return "is a folder: " + path;
    }
    if (::access(path.c_str(), R_OK) != 0) {
        return "cannot be read (no permission): " + path;
    }
    if (error == AVERROR_INVALIDDATA || error == AVERROR(EINVAL)) {
        return "not a media file that can be read: " + path;
    }
    char text[AV_ERROR_MAX_STRING_SIZE] = {};
    av_strerror(error, text, sizeof text);
    return std::string(text) + ": " + path;
}

}  // namespace

int ProbeFile(const std::string& path, MediaFileInfo& info) {
    info.path = path;
    info.probeError.clear();
    info.hours = info.minutes = info.seconds = info.microseconds = 0;
    info.videoStreams.clear();
    info.audioStreams.clear();
    info.dataStreams.clear();

    std::string mediaPath = path;
    CueTrackSpan span;
    const std::optional<CueTrackPath> cue = SplitCueTrackPath(path);
    if (cue) {
        std::string error;
        if (!ResolveCueTrack(cue->sheet, cue->track, span, error)) {
            info.bitRate = 0;
            info.probeError = error;
            return 0;
        }
        mediaPath = span.audioPath;
    }

    AVFormatContext* ic = nullptr;
    if (const int opened = avformat_open_input(&ic, mediaPath.c_str(), nullptr, nullptr);
        opened < 0) {
        info.bitRate = 0;
        info.probeError = OpenErrorText(mediaPath, opened);
        return 0;
    }
    // Probing many files must stay cheap: the headers say almost everything, a short look at
    // the packets fills in the rest.
    ic->probesize = 256 * 1024;
    ic->max_analyze_duration = 500000;
    const bool quick = HeaderIsComplete(ic, true);
    if (!quick) {
        avformat_find_stream_info(ic, nullptr);
    }

    const AVStream* firstAudio = nullptr;
    for (unsigned i = 0; i < ic->nb_streams && !firstAudio; ++i) {
        if (ic->streams[i]->codecpar->codec_type == AVMEDIA_TYPE_AUDIO) {
            firstAudio = ic->streams[i];
        }
    }
    ReadTags(ic, firstAudio, info);
    std::int64_t bitRate = ic->bit_rate;
    if (quick && bitRate == 0) {
        // The timing pass that would have filled this in was skipped; do as it does: the
        // streams' rates added up, else the file's size over its length.
        for (unsigned i = 0; i < ic->nb_streams; ++i) {
            bitRate += ic->streams[i]->codecpar->bit_rate;
        }
        const std::int64_t lengthUs = StreamDurationUs(ic->streams[0]);
        const std::int64_t size = ic->pb ? avio_size(ic->pb) : -1;
        if (bitRate == 0 && size > 0 && lengthUs > 0 && lengthUs != AV_NOPTS_VALUE) {
            bitRate = av_rescale(size, 8 * 1000000, lengthUs);
        }
    }
    info.bitRate = bitRate ? ClampToInt32(bitRate) : -1;

    std::int64_t audioUs = AV_NOPTS_VALUE;
    std::int64_t videoUs = AV_NOPTS_VALUE;
    for (unsigned i = 0; i < ic->nb_streams; ++i) {
        if (ic->streams[i]->codecpar) {
            AddStream(ic->streams[i], info, audioUs, videoUs);
        }
    }
    std::int64_t durationUs = ic->duration;
    if (durationUs == AV_NOPTS_VALUE) {
        durationUs = audioUs != AV_NOPTS_VALUE ? audioUs : videoUs;
    }
    if (cue) {
        // The sheet's own titles describe the track better than the album file's tags.
        const std::int64_t startUs = span.startFrame * 1000000 / kCueFramesPerSecond;
        if (span.endFrame >= 0) {
            durationUs = (span.endFrame - span.startFrame) * 1000000 / kCueFramesPerSecond;
        } else if (durationUs != AV_NOPTS_VALUE) {
            durationUs = std::max<std::int64_t>(durationUs - startUs, 0);
        }
        if (!span.title.empty())
            info.title = span.title;
        if (!span.performer.empty())
            info.author = span.performer;
        if (!span.album.empty())
            info.album = span.album;
        if (!span.genre.empty())
            info.genre = span.genre;
        const int year = std::atoi(span.date.c_str());
        if (year > 0 && year < 2100)
            info.year = std::to_string(year);
        info.track = span.trackNumber;
    }
    SetDuration(info, durationUs);
    avformat_close_input(&ic);
    return 1;
}

std::vector<std::string> DemuxerExtensions() {
    std::vector<std::string> extensions;
    void* opaque = nullptr;
    while (const AVInputFormat* format = av_demuxer_iterate(&opaque)) {
        if (format->extensions == nullptr) {
            continue;
        }
        std::string list = format->extensions;
        for (std::size_t start = 0; start <= list.size();) {
            std::size_t comma = list.find(',', start);
            if (comma == std::string::npos) {
                comma = list.size();
            }
            std::string extension = list.substr(start, comma - start);
            std::transform(extension.begin(), extension.end(), extension.begin(),
                           [](unsigned char c) { return static_cast<char>(std::tolower(c)); });
            if (!extension.empty()) {
                extensions.push_back(std::move(extension));
            }
            start = comma + 1;
        }
    }
    // Demuxers that recognise their files by content name no extension; users still know
    // these files by these names.
    static const std::pair<const char*, const char*> kByContent[] = {
        {"aif", "aiff"},      {"aiff", "aiff"}, {"aifc", "aiff"}, {"wav", "wav"},
        {"opus", "ogg"},      {"oga", "ogg"},   {"spx", "ogg"},   {"mka", "matroska"},
        {"webm", "matroska"}, {"w64", "w64"},   {"caf", "caf"},   {"m4b", "mov"}};
    for (const auto& [extension, demuxer] : kByContent) {
        if (av_find_input_format(demuxer) != nullptr) {
            extensions.emplace_back(extension);
        }
    }
    std::sort(extensions.begin(), extensions.end());
    extensions.erase(std::unique(extensions.begin(), extensions.end()), extensions.end());
    return extensions;
}

}  // namespace ac
