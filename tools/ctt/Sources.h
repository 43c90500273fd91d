#pragma once
// Where the samples come from: a media file (optionally one span of it, for a cue track) or
// one track of an audio CD or disc image. Every source hands out decoded frames with the
// position of their first sample, counted from the start of its span, so the conversion can
// cut sample-exact whatever the source.
//
// Thread contract: one conversion thread.

#include <cstdint>
#include <map>
#include <memory>
#include <string>

extern "C" {
#include <libavutil/channel_layout.h>
#include <libavutil/frame.h>
#include <libavutil/samplefmt.h>
}

namespace ac::ctt {

class AudioSource {
public:
    virtual ~AudioSource() = default;

    virtual AVSampleFormat SampleFormat() const = 0;
    virtual int SampleRate() const = 0;
    virtual const AVChannelLayout& Layout() const = 0;

    // Samples in the span when known, else -1.
    virtual std::int64_t SpanLength() const = 0;

    // Moves near sample; the positions of the following frames tell where it landed.
    virtual void SeekTo(std::int64_t sample) = 0;

    // 1: frame filled and position set; 0: end of span; -1: failure, see Error().
    virtual int Next(AVFrame* frame, std::int64_t& position) = 0;

    // Called after the last frame: a source that knows its length can tell a cut-off file.
    virtual bool CheckComplete(std::int64_t samplesSeen) { (void)samplesSeen; return true; }

    const std::string& Error() const { return m_error; }
    // Tags the source itself knows (a cue sheet's titles); the command line wins over them.
    const std::map<std::string, std::string>& Tags() const { return m_tags; }

protected:
    std::string m_error;
    std::map<std::string, std::string> m_tags;
};

// A media file; the span [startSample, endSample) in the file's own sample rate, end -1 = to
// the end. Frame-exact spans are what cue tracks need: start and end come in CD frames.
std::unique_ptr<AudioSource> OpenFileSource(const std::string& path, std::int64_t startUs,
                                            std::int64_t endUs, std::string& error);

// "DRIVE/TrackNN.cda": DRIVE is a device path or a disc image (.cue, .bin, .toc, .nrg).
bool IsCdaPath(const std::string& path);
std::unique_ptr<AudioSource> OpenCdSource(const std::string& path, std::string& error);

}  // namespace ac::ctt
