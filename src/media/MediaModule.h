#pragma once
// The media module, libac-media.so: FFmpeg, SDL and what the program builds on them (probing,
// the preview player, the end-of-run sound), loaded into the program on first use. Loading
// FFmpeg's hundred or so shared libraries costs the window a good part of its start, and most
// sessions touch them only once a file is added or played; the tools and the tests link the
// same code directly.
//
// The program's side (MediaLoader.cpp) defines the functions of panels/Player.h, panels/Sound.h
// and medialist/MediaProbe.h itself and forwards them through this table. Both sides are built
// from one tree with one compiler, so C++ types cross the boundary as they are.
//
// Thread contract: the table is immutable once handed out.

#include "medialist/MediaFileInfo.h"
#include "panels/Player.h"

#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

namespace ac::media {

inline constexpr int kModuleVersion = 1;
inline constexpr const char* kModuleFileName = "libac-media.so";
inline constexpr const char* kModuleEntry = "ac_media_module";

struct ModuleApi {
    int version = 0;
    // A module of another build would read MediaFileInfo differently: refused when this differs.
    std::size_t infoSize = 0;

    int (*probeFile)(const std::string& path, MediaFileInfo& info);
    std::vector<std::string> (*demuxerExtensions)();

    void (*putenv)(const char* text);
    void (*initSize)(int width, int height);
    void (*init)();
    int (*open)(const char* path);
    double (*getLength)();
    void (*run)();
    double (*getCurPos)();
    void (*setCurPos)(double seconds);
    void (*togglePause)();
    void (*stop)();
    void (*deinit)();
    void (*setPictureSink)(player::PictureSink sink);
    std::string (*windowText)();
    bool (*isRunning)();
    bool (*clockIsAudioDevice)();
    std::vector<std::int16_t> (*peekQueuedSound)(std::size_t frames);

    void (*playSoundAsync)(const std::string& path);
    void (*waitForSounds)();
    void (*stopSounds)();
};

using ModuleEntry = const ModuleApi* (*)();

// The program's side: true once the module is in the process (loading it if `load`); the tests
// of the start use it to see that nothing loaded it early.
bool ModuleLoaded();

}  // namespace ac::media
