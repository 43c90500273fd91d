// The program's side of the media module: the functions of the player, the end-of-run sound
// and probing, forwarded to libac-media.so, which is loaded by the first call that needs it.
// Calls that only record something for later (the preview's window and picture sink, its box)
// or that have nothing to do before anything played (stop, position, deinit) do not load it,
// so the window starts without FFmpeg and SDL in the process.
#include "media/MediaModule.h"

#include "medialist/MediaProbe.h"
#include "panels/Sound.h"
#include "platform/Paths.h"

#include <dlfcn.h>

#include <atomic>
#include <cstdio>
#include <cstdlib>
#include <mutex>

namespace ac::media {
namespace {

std::atomic<const ModuleApi*> s_api{nullptr};
std::once_flag s_loadOnce;

// What the preview was told before the module came, handed over when it comes.
std::mutex s_pendingMutex;
std::string s_windowText;
player::PictureSink s_sink;
int s_width = 0;
int s_height = 0;

std::string FolderOf(const std::string& path) {
    const auto slash = path.rfind('/');
    return slash == std::string::npos ? std::string(".") : path.substr(0, slash);
}

const ModuleApi* Open() {
    std::vector<std::string> candidates;
    if (const char* forced = std::getenv("AC_MEDIA_MODULE"); forced != nullptr && *forced) {
        candidates.emplace_back(forced);
    }
    // Beside the conversion tool in the build tree (bin/), below it when installed.
    const std::string toolFolder = FolderOf(platform::FindConversionTool());
    candidates.push_back(toolFolder + "/modules/" + kModuleFileName);
    candidates.push_back(toolFolder + "/" + kModuleFileName);
    candidates.push_back(platform::ExecutableDirectory() + "/" + kModuleFileName);
    std::string errors;
    for (const std::string& path : candidates) {
        // Never closed: FFmpeg and SDL keep threads and exit handlers of their own.
        void* handle = ::dlopen(path.c_str(), RTLD_NOW | RTLD_LOCAL);
        if (handle == nullptr) {
            errors += std::string("\n  ") + ::dlerror();
            continue;
        }
        auto entry = reinterpret_cast<ModuleEntry>(::dlsym(handle, kModuleEntry));
        const ModuleApi* api = entry != nullptr ? entry() : nullptr;
        if (api != nullptr && api->version == kModuleVersion &&
            api->infoSize == sizeof(MediaFileInfo)) {
            return api;
        }
        errors += "\n  " + path + ": not a media module of this build";
    }
    std::fprintf(stderr, "audio-converter: cannot load the media module (%s); files cannot be "
                         "read or played:%s\n", kModuleFileName, errors.c_str());
    return nullptr;
}

const ModuleApi* Load() {
    std::call_once(s_loadOnce, [] {
        const ModuleApi* api = Open();
        if (api != nullptr) {
            std::lock_guard lock(s_pendingMutex);
            if (!s_windowText.empty()) {
                api->putenv(s_windowText.c_str());
            }
            if (s_sink) {
                api->setPictureSink(s_sink);
            }
            if (s_width > 0 && s_height > 0) {
                api->initSize(s_width, s_height);
            }
        }
        s_api = api;
    });
    return s_api.load();
}

const ModuleApi* Loaded() { return s_api.load(); }

}  // namespace

bool ModuleLoaded() { return Loaded() != nullptr; }

}  // namespace ac::media

using ac::media::Load;
using ac::media::Loaded;

extern "C" {

void avp_putenv(const char* text) {
    {
        std::lock_guard lock(ac::media::s_pendingMutex);
        ac::media::s_windowText = text != nullptr ? text : "";
    }
    if (auto* api = Loaded()) {
        api->putenv(text);
    }
}

void avp_init_size(int width, int height) {
    {
        std::lock_guard lock(ac::media::s_pendingMutex);
        ac::media::s_width = width;
        ac::media::s_height = height;
    }
    if (auto* api = Loaded()) {
        api->initSize(width, height);
    }
}

void avp_init(void) {
    if (auto* api = Load()) {
        api->init();
    }
}

int avp_open(const char* path) {
    auto* api = Load();
    return api != nullptr ? api->open(path) : 0;
}

double avp_get_length(void) {
    auto* api = Loaded();
    return api != nullptr ? api->getLength() : 0.0;
}

void avp_run(void) {
    if (auto* api = Loaded()) {
        api->run();
    }
}

double avp_get_cur_pos(void) {
    auto* api = Loaded();
    return api != nullptr ? api->getCurPos() : 0.0;
}

void avp_set_cur_pos(double seconds) {
    if (auto* api = Loaded()) {
        api->setCurPos(seconds);
    }
}

void avp_toggle_pause(void) {
    if (auto* api = Loaded()) {
        api->togglePause();
    }
}

void avp_stop(void) {
    if (auto* api = Loaded()) {
        api->stop();
    }
}

void avp_deinit(void) {
    if (auto* api = Loaded()) {
        api->deinit();
    }
}

}  // extern "C"

namespace ac::player {

void SetPictureSink(PictureSink sink) {
    {
        std::lock_guard lock(ac::media::s_pendingMutex);
        ac::media::s_sink = sink;
    }
    if (auto* api = Loaded()) {
        api->setPictureSink(std::move(sink));
    }
}

std::string WindowText() {
    if (auto* api = Loaded()) {
        return api->windowText();
    }
    std::lock_guard lock(ac::media::s_pendingMutex);
    return ac::media::s_windowText;
}

bool IsRunning() {
    auto* api = Loaded();
    return api != nullptr && api->isRunning();
}

bool ClockIsAudioDevice() {
    auto* api = Loaded();
    return api != nullptr && api->clockIsAudioDevice();
}

std::vector<std::int16_t> PeekQueuedSound(std::size_t frames) {
    auto* api = Loaded();
    return api != nullptr ? api->peekQueuedSound(frames) : std::vector<std::int16_t>{};
}

}  // namespace ac::player

namespace ac {

int ProbeFile(const std::string& path, MediaFileInfo& info) {
    auto* api = media::Load();
    return api != nullptr ? api->probeFile(path, info) : 0;
}

std::vector<std::string> DemuxerExtensions() {
    auto* api = media::Load();
    return api != nullptr ? api->demuxerExtensions() : std::vector<std::string>{};
}

void PlaySoundAsync(const std::string& path) {
    if (auto* api = media::Load()) {
        api->playSoundAsync(path);
    }
}

void WaitForSounds() {
    if (auto* api = media::Loaded()) {
        api->waitForSounds();
    }
}

void StopSounds() {
    if (auto* api = media::Loaded()) {
        api->stopSounds();
    }
}

}  // namespace ac
