#pragma once
// What the preview decodes from: a media file through libavformat and libavcodec, one track
// of an audio CD or disc image ("DRIVE/TrackNN.cda") through the conversion tool's libcdio
// reader, or one track of a cue sheet ("SHEET|N") through its reader of file spans. A source
// hands out decoded frames with their place in seconds from the start of the file (of the
// track, for the last two); it knows nothing of queues, clocks or devices.
//
// Thread contract: one thread at a time (the preview's decoding thread after avp_open).

#include <functional>
#include <memory>
#include <string>

struct AVFrame;

namespace ac::player {

class PlayerSource {
public:
    using FrameSink = std::function<void(AVFrame* frame, double seconds)>;

    virtual ~PlayerSource() = default;

    // Seconds; 0 when unknown.
    virtual double Length() const = 0;
    virtual bool HasAudio() const = 0;
    virtual bool HasVideo() const = 0;
    // The first audio stream's sample rate, 0 without audio.
    virtual int AudioRate() const = 0;

    // Moves to a key point at or before `seconds`; the frames that follow tell where it landed.
    virtual void Seek(double seconds) = 0;

    // After a seek, until the sound has reached the target: pictures that no other picture
    // refers to are not decoded (they would be thrown away), and a file with sound puts off
    // decoding its pictures, so the sound of the new place is heard without waiting for a
    // long run of pictures from the last key frame. The pictures put off are decoded next,
    // ahead of the packets that follow them; the late ones are skipped when shown.
    virtual void SetCatchingUp(bool /*catchingUp*/) {}
    // Pictures put off while catching up that still wait to be decoded, and the decoding of the
    // next of them.
    virtual bool HasBacklog() const { return false; }
    virtual void DecodeBacklog(const FrameSink& /*onVideo*/) {}

    // Reads and decodes a little (one packet); frames go to the sinks. False at the end of the
    // file (the decoders' last frames already handed out) or on a read failure.
    virtual bool Step(const FrameSink& onAudio, const FrameSink& onVideo) = 0;
};

// Null when the file cannot be opened or has neither sound nor pictures to play.
std::unique_ptr<PlayerSource> OpenPlayerSource(const std::string& path);

}  // namespace ac::player
