#include "panels/Sound.h"

#include "panels/SdlAudio.h"

#include <SDL.h>

#include <atomic>
#include <list>
#include <memory>
#include <mutex>
#include <thread>

namespace ac {

namespace {

struct SoundThread {
    std::thread thread;
    std::atomic<bool> done{false};
};

class SoundPlayer {
public:
    ~SoundPlayer() { Stop(); }

    void Start(const std::string& path) {
        std::lock_guard lock(m_mutex);
        ReapFinished();
        m_stop = false;
        auto sound = std::make_unique<SoundThread>();
        SoundThread* raw = sound.get();
        sound->thread = std::thread([this, path, raw] {
            Play(path);
            raw->done = true;
        });
        m_threads.push_back(std::move(sound));
    }

    void Wait() { JoinAll(); }

    void Stop() {
        m_stop = true;
        JoinAll();
    }

private:
    void ReapFinished() {
        for (auto it = m_threads.begin(); it != m_threads.end();) {
            if ((*it)->done) {
                (*it)->thread.join();
                it = m_threads.erase(it);
            } else {
                ++it;
            }
        }
    }

    void JoinAll() {
        std::list<std::unique_ptr<SoundThread>> threads;
        {
            std::lock_guard lock(m_mutex);
            threads.swap(m_threads);
        }
        for (auto& sound : threads) {
            sound->thread.join();
        }
    }

    void Play(const std::string& path) {
        // SDL's set-up and tear-down of the audio subsystem are not safe against each other.
        {
            std::lock_guard lock(SdlAudioLock());
            if (!InitSdlAudio()) {
                return;
            }
        }
        PlayOpened(path);
        std::lock_guard lock(SdlAudioLock());
        SDL_QuitSubSystem(SDL_INIT_AUDIO);
    }

    void PlayOpened(const std::string& path) {
        SDL_AudioSpec spec{};
        Uint8* buffer = nullptr;
        Uint32 length = 0;
        if (SDL_LoadWAV(path.c_str(), &spec, &buffer, &length) == nullptr) {
            return;
        }
        spec.callback = nullptr;
        SDL_AudioDeviceID device = 0;
        {
            std::lock_guard lock(SdlAudioLock());
            device = SDL_OpenAudioDevice(nullptr, 0, &spec, nullptr, 0);
        }
        if (device != 0) {
            SDL_QueueAudio(device, buffer, length);
            SDL_PauseAudioDevice(device, 0);
            // A device that stops taking data must not keep the thread for ever.
            const Uint32 frameBytes = SDL_AUDIO_BITSIZE(spec.format) / 8 * spec.channels;
            const Uint64 playMs =
                frameBytes != 0 && spec.freq > 0
                    ? Uint64(length) / frameBytes * 1000 / static_cast<Uint64>(spec.freq)
                    : 0;
            const Uint64 deadline = SDL_GetTicks64() + playMs + 2000;
            while (!m_stop && SDL_GetQueuedAudioSize(device) > 0 && SDL_GetTicks64() < deadline) {
                SDL_Delay(20);
            }
            std::lock_guard lock(SdlAudioLock());
            SDL_CloseAudioDevice(device);
        }
        SDL_FreeWAV(buffer);
    }

    std::mutex m_mutex;
    std::atomic<bool> m_stop{false};
    std::list<std::unique_ptr<SoundThread>> m_threads;
};

SoundPlayer& Player() {
    static SoundPlayer player;
    return player;
}

}  // namespace

void PlaySoundAsync(const std::string& path) {
    if (path.empty()) {
        return;
    }
    if (SDL_RWops* file = SDL_RWFromFile(path.c_str(), "rb")) {
        SDL_RWclose(file);
    } else {
        return;
    }
    Player().Start(path);
}

void WaitForSounds() {
    Player().Wait();
}

void StopSounds() {
    Player().Stop();
}

}  // namespace ac
