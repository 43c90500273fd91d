#pragma once
// The preview library: plays one file at a time on FFmpeg and SDL2 behind the plain C calls the
// player panel makes. Decoding runs on a thread of its own into bounded queues of sound and
// pictures; the sound device's consumption is the clock the pictures follow. Pictures are not
// drawn here: they go, scaled to fit the size given to avp_init_size, to the picture sink, and
// the panel paints them (that works alike on X11 and Wayland). Without a sound device, or on
// SDL's dummy driver, playback runs on the clock all the same.
//
// Thread contract: avp_run blocks on the caller's thread (the panel's worker) until the file
// has played out or avp_stop is called. avp_stop, avp_toggle_pause, avp_get_cur_pos and
// avp_set_cur_pos may be called from any thread during avp_run; the other calls come from one
// thread (the panel's UI thread). The picture sink runs on the avp_run thread.

#include <cstdint>
#include <functional>
#include <string>
#include <vector>

extern "C" {

// "SDL_WINDOWID=0x%X": the window the pictures are meant for. Recorded; the sink paints.
void avp_putenv(const char* text);
// The box the pictures are scaled into, keeping their aspect ratio.
void avp_init_size(int width, int height);
void avp_init(void);
// 1 when the file could be opened for playing, else 0. A file's track of an audio CD or disc
// image is "DRIVE/TrackNN.cda".
int avp_open(const char* path);
// Seconds; 0 when unknown.
double avp_get_length(void);
void avp_run(void);
double avp_get_cur_pos(void);
void avp_set_cur_pos(double seconds);
void avp_toggle_pause(void);
void avp_stop(void);
void avp_deinit(void);
}

namespace ac::player {

// One picture, 24-bit RGB rows without padding, with its place in the file in seconds.
struct Picture {
    int width = 0;
    int height = 0;
    double pts = 0;
    std::vector<std::uint8_t> rgb;
};

using PictureSink = std::function<void(const Picture&)>;
// Where decoded pictures go; an empty sink drops them. Set before avp_run.
void SetPictureSink(PictureSink sink);

// What avp_putenv recorded, for whoever wants to know which window was given.
std::string WindowText();

// True while avp_run is inside its loop; for callers that must wait for a run to end.
bool IsRunning();
// True when the clock of the running file is the sound device (false: the system clock).
bool ClockIsAudioDevice();
// The next frames of sound due to be heard, interleaved stereo 16-bit: what tests check a seek
// against. Fewer when less is queued.
std::vector<std::int16_t> PeekQueuedSound(std::size_t frames);

}  // namespace ac::player
