#include "panels/Player.h"

#include "panels/PlayerSource.h"
#include "panels/SdlAudio.h"

#include <SDL.h>

#include <algorithm>
#include <atomic>
#include <chrono>
#include <condition_variable>
#include <cstring>
#include <deque>
#include <mutex>
#include <thread>

extern "C" {
#include <libavutil/channel_layout.h>
#include <libavutil/frame.h>
#include <libswresample/swresample.h>
#include <libswscale/swscale.h>
}

namespace ac::player {
namespace {

using Clock = std::chrono::steady_clock;

// The queues' bounds: memory stays flat whatever the file's length. Half a second of sound is
// far more than the device's buffer and the container's interleaving need; a few pictures
// carry the presentation over a slow decode. The hard cap only bites when a file holds its
// sound far behind its pictures: then the oldest picture goes.
constexpr double kAudioAheadSeconds = 0.5;
constexpr double kAudioLowSeconds = 0.15;
constexpr std::size_t kPictureSoftCap = 6;
constexpr std::size_t kPictureHardCap = 48;
constexpr int kOutputChannels = 2;
constexpr int kDeviceSamples = 1024;
// How often the presentation loop looks at the clock; also bounds how long avp_stop waits.
constexpr auto kTick = std::chrono::milliseconds(5);

double Seconds(Clock::duration d) {
    return std::chrono::duration<double>(d).count();
}

struct AudioChunk {
    std::vector<std::int16_t> samples;  // interleaved stereo
    std::size_t readFrames = 0;
    std::size_t Frames() const { return samples.size() / kOutputChannels; }
};

class Engine {
public:
    ~Engine() { Deinit(); }

    void PutEnv(const char* text) {
        std::lock_guard lock(m_mutex);
        m_windowText = text != nullptr ? text : "";
    }
    std::string WindowText() {
        std::lock_guard lock(m_mutex);
        return m_windowText;
    }
    void InitSize(int width, int height) {
        std::lock_guard lock(m_mutex);
        m_boxWidth = std::max(0, width);
        m_boxHeight = std::max(0, height);
    }
    void SetSink(PictureSink sink) {
        std::lock_guard lock(m_sinkMutex);
        m_sink = std::move(sink);
    }

    void Init() {
        std::lock_guard device(m_deviceMutex);
        if (m_sdlAudio) {
            return;
        }
        std::lock_guard sdl(SdlAudioLock());
        m_sdlAudio = InitSdlAudio();
    }

    void Deinit() {
        Stop();
        WaitForRunEnd();
        {
            std::lock_guard lock(m_mutex);
            m_source.reset();
            m_length = 0;
            ResetTimeline(0.0);
        }
        std::lock_guard device(m_deviceMutex);
        if (m_sdlAudio) {
            std::lock_guard sdl(SdlAudioLock());
            SDL_QuitSubSystem(SDL_INIT_AUDIO);
            m_sdlAudio = false;
        }
    }

    int Open(const char* path) {
        // A run that is still unwinding from avp_stop ends before the next file is taken.
        Stop();
        WaitForRunEnd();
        std::unique_ptr<PlayerSource> source =
            path != nullptr && *path != '\0' ? OpenPlayerSource(path) : nullptr;
        std::lock_guard lock(m_mutex);
        m_source = std::move(source);
        m_length = m_source ? m_source->Length() : 0.0;
        m_stop = false;
        m_paused = false;
        ResetTimeline(0.0);
        return m_source ? 1 : 0;
    }

    double Length() {
        std::lock_guard lock(m_mutex);
        return m_length;
    }

    double Position() {
        std::lock_guard lock(m_mutex);
        return ClockLocked();
    }

    void SetPosition(double seconds) {
        std::lock_guard lock(m_mutex);
        if (!m_source) {
            return;
        }
        seconds = std::clamp(seconds, 0.0, m_length > 0 ? m_length : seconds);
        ResetTimeline(seconds);
        m_seekPending = true;
        m_changed.notify_all();
    }

    void TogglePause() {
        bool paused = false;
        {
            std::lock_guard lock(m_mutex);
            if (!m_paused) {
                // The clock holds where it stands; the device's last buffer is not counted.
                m_wallBase = ClockLocked();
                m_lastCopied = 0;
            } else {
                m_wallStart = Clock::now();
                m_lastCallback = Clock::now();
            }
            m_paused = !m_paused;
            paused = m_paused;
            m_changed.notify_all();
        }
        // SDL takes the device's own lock, which its callback holds while it waits for ours.
        std::lock_guard device(m_deviceMutex);
        if (m_device != 0) {
            SDL_PauseAudioDevice(m_device, paused ? 1 : 0);
        }
    }

    void Stop() {
        std::lock_guard lock(m_mutex);
        m_stop = true;
        m_changed.notify_all();
    }

    bool IsRunning() {
        std::lock_guard lock(m_mutex);
        return m_running;
    }
    bool AudioClock() {
        std::lock_guard lock(m_mutex);
        return m_audioClock;
    }

    std::vector<std::int16_t> Peek(std::size_t frames) {
        std::lock_guard lock(m_mutex);
        std::vector<std::int16_t> out;
        for (const AudioChunk& chunk : m_audio) {
            for (std::size_t i = chunk.readFrames;
                 i < chunk.Frames() && out.size() < frames * kOutputChannels; ++i) {
                out.push_back(chunk.samples[i * kOutputChannels]);
                out.push_back(chunk.samples[i * kOutputChannels + 1]);
            }
        }
        return out;
    }

    void Run();

private:
    void ResetTimeline(double seconds);
    double ClockLocked() const;
    bool OpenDevice(int rate);
    void CloseDevice();
    void DecodeLoop();
    bool QueuesFullLocked() const;
    void OnAudioFrame(AVFrame* frame, double seconds, std::uint64_t generation);
    void OnVideoFrame(AVFrame* frame, double seconds, std::uint64_t generation);
    bool ConvertPicture(const AVFrame* frame, double seconds, Picture& picture);
    void FillDevice(std::uint8_t* stream, int bytes);
    void DrainAudioToClockLocked(double clock);
    bool PresentDue(Picture& out);
    void WaitForRunEnd();

    static void SdlCallback(void* self, Uint8* stream, int bytes) {
        static_cast<Engine*>(self)->FillDevice(stream, bytes);
    }

    std::mutex m_mutex;
    std::condition_variable m_changed;
    std::string m_windowText;
    int m_boxWidth = 0;
    int m_boxHeight = 0;
    std::unique_ptr<PlayerSource> m_source;
    double m_length = 0;
    bool m_stop = false;
    bool m_paused = false;
    bool m_running = false;
    bool m_decoderEnded = false;
    bool m_seekPending = false;
    std::uint64_t m_generation = 0;
    // The timeline: m_base is where playing (re)started; m_played counts the frames of sound
    // consumed since then; with no device the system clock runs from m_wallStart.
    double m_base = 0;
    std::uint64_t m_played = 0;
    std::uint64_t m_lastCopied = 0;
    Clock::time_point m_lastCallback;
    double m_wallBase = 0;
    Clock::time_point m_wallStart;
    bool m_audioClock = false;
    int m_outputRate = 44100;
    std::deque<AudioChunk> m_audio;
    std::size_t m_audioFrames = 0;
    std::deque<Picture> m_pictures;

    // Owned by the decoding thread.
    SwrContext* m_swr = nullptr;
    SwsContext* m_sws = nullptr;
    double m_trimTo = -1;
    double m_pictureTrimTo = -1;
    double m_seekTarget = 0;
    AVFrame* m_heldPicture = nullptr;
    double m_heldSeconds = 0;

    std::mutex m_deviceMutex;
    bool m_sdlAudio = false;
    SDL_AudioDeviceID m_device = 0;

    std::mutex m_sinkMutex;
    PictureSink m_sink;
};

void Engine::ResetTimeline(double seconds) {
    ++m_generation;
    m_audio.clear();
    m_audioFrames = 0;
    m_pictures.clear();
    m_decoderEnded = false;
    m_base = seconds;
    m_played = 0;
    m_lastCopied = 0;
    m_lastCallback = Clock::now();
    m_wallBase = seconds;
    m_wallStart = Clock::now();
}

double Engine::ClockLocked() const {
    if (!m_audioClock) {
        if (m_paused || !m_running) {
            return m_wallBase;
        }
        return m_wallBase + Seconds(Clock::now() - m_wallStart);
    }
    const double rate = m_outputRate;
    const double handed = m_base + static_cast<double>(m_played) / rate;
    if (m_paused || m_lastCopied == 0) {
        return handed;
    }
    // The last buffer went to the device at the last callback and plays from then on.
    const double inFlight = static_cast<double>(m_lastCopied) / rate;
    const double elapsed = std::min(Seconds(Clock::now() - m_lastCallback), inFlight);
    return handed - inFlight + elapsed;
}

bool Engine::OpenDevice(int rate) {
    std::lock_guard device(m_deviceMutex);
    if (!m_sdlAudio) {
        return false;
    }
    SDL_AudioSpec want{};
    want.freq = rate;
    want.format = AUDIO_S16SYS;
    want.channels = kOutputChannels;
    want.samples = kDeviceSamples;
    want.callback = &Engine::SdlCallback;
    want.userdata = this;
    std::lock_guard sdl(SdlAudioLock());
    m_device = SDL_OpenAudioDevice(nullptr, 0, &want, nullptr, 0);
    return m_device != 0;
}

void Engine::CloseDevice() {
    std::lock_guard device(m_deviceMutex);
    if (m_device != 0) {
        std::lock_guard sdl(SdlAudioLock());
        SDL_CloseAudioDevice(m_device);
        m_device = 0;
    }
}

void Engine::FillDevice(std::uint8_t* stream, int bytes) {
    std::memset(stream, 0, static_cast<std::size_t>(bytes));
    std::lock_guard lock(m_mutex);
    const std::size_t want = static_cast<std::size_t>(bytes) / (2 * kOutputChannels);
    std::size_t copied = 0;
    if (!m_paused) {
        auto* out = reinterpret_cast<std::int16_t*>(stream);
        while (copied < want && !m_audio.empty()) {
            AudioChunk& chunk = m_audio.front();
            const std::size_t take = std::min(want - copied, chunk.Frames() - chunk.readFrames);
            std::memcpy(out + copied * kOutputChannels,
                        chunk.samples.data() + chunk.readFrames * kOutputChannels,
                        take * kOutputChannels * sizeof(std::int16_t));
            copied += take;
            chunk.readFrames += take;
            if (chunk.readFrames == chunk.Frames()) {
                m_audio.pop_front();
            }
        }
    }
    // An empty queue (a seek, a slow decode) plays silence and the clock waits for the sound.
    m_audioFrames -= copied;
    m_played += copied;
    m_lastCopied = copied;
    m_lastCallback = Clock::now();
    m_changed.notify_all();
}

void Engine::DrainAudioToClockLocked(double clock) {
    // No device: the sound is dropped as the system clock passes it, so decoding keeps pace.
    while (!m_audio.empty()) {
        AudioChunk& chunk = m_audio.front();
        const double end =
            m_base +
            static_cast<double>(m_played + chunk.Frames() - chunk.readFrames) / m_outputRate;
        if (end > clock) {
            break;
        }
        m_played += chunk.Frames() - chunk.readFrames;
        m_audioFrames -= chunk.Frames() - chunk.readFrames;
        m_audio.pop_front();
        m_changed.notify_all();
    }
}

bool Engine::QueuesFullLocked() const {
    const double queued = static_cast<double>(m_audioFrames) / m_outputRate;
    if (queued >= kAudioAheadSeconds) {
        return true;
    }
    const bool hasAudio = m_source && m_source->HasAudio();
    return m_pictures.size() >= kPictureSoftCap && (!hasAudio || queued >= kAudioLowSeconds);
}

void Engine::OnAudioFrame(AVFrame* frame, double seconds, std::uint64_t generation) {
    if (frame->nb_samples <= 0 || frame->sample_rate <= 0) {
        return;
    }
    if (m_swr == nullptr) {
        AVChannelLayout stereo{};
        av_channel_layout_default(&stereo, kOutputChannels);
        AVChannelLayout input{};
        if (av_channel_layout_copy(&input, &frame->ch_layout) < 0 || input.nb_channels == 0) {
            av_channel_layout_default(&input, std::max(1, frame->ch_layout.nb_channels));
        }
        const int failed = swr_alloc_set_opts2(&m_swr, &stereo, AV_SAMPLE_FMT_S16, m_outputRate,
                                               &input, static_cast<AVSampleFormat>(frame->format),
                                               frame->sample_rate, 0, nullptr);
        av_channel_layout_uninit(&input);
        if (failed < 0 || swr_init(m_swr) < 0) {
            swr_free(&m_swr);
            return;
        }
    }
    const int room = swr_get_out_samples(m_swr, frame->nb_samples);
    if (room <= 0) {
        return;
    }
    AudioChunk chunk;
    chunk.samples.resize(static_cast<std::size_t>(room) * kOutputChannels);
    auto* out = reinterpret_cast<std::uint8_t*>(chunk.samples.data());
    const int made =
        swr_convert(m_swr, &out, room, const_cast<const std::uint8_t**>(frame->extended_data),
                    frame->nb_samples);
    if (made <= 0) {
        return;
    }
    chunk.samples.resize(static_cast<std::size_t>(made) * kOutputChannels);
    if (m_trimTo >= 0) {
        // After a seek the sound starts exactly at the target: whole frames before it go, the
        // frame across it loses its head.
        const double end = seconds + static_cast<double>(made) / m_outputRate;
        if (end <= m_trimTo) {
            return;
        }
        const auto cut =
            static_cast<std::size_t>(std::max(0.0, (m_trimTo - seconds) * m_outputRate + 0.5));
        chunk.readFrames = std::min(cut, chunk.Frames());
        m_trimTo = -1;
        m_source->SetCatchingUp(false);
    }
    std::lock_guard lock(m_mutex);
    if (generation != m_generation) {
        return;
    }
    m_audioFrames += chunk.Frames() - chunk.readFrames;
    m_audio.push_back(std::move(chunk));
    m_changed.notify_all();
}

bool Engine::ConvertPicture(const AVFrame* frame, double seconds, Picture& picture) {
    if (frame->width <= 0 || frame->height <= 0) {
        return false;
    }
    int boxWidth = 0;
    int boxHeight = 0;
    {
        std::lock_guard lock(m_mutex);
        boxWidth = m_boxWidth;
        boxHeight = m_boxHeight;
    }
    // The shape the picture is meant to have on screen, then the largest such inside the box.
    double aspect = static_cast<double>(frame->width) / frame->height;
    if (frame->sample_aspect_ratio.num > 0 && frame->sample_aspect_ratio.den > 0) {
        aspect *= av_q2d(frame->sample_aspect_ratio);
    }
    if (boxWidth <= 0 || boxHeight <= 0) {
        boxWidth = frame->width;
        boxHeight = frame->height;
    }
    int width = boxWidth;
    int height = static_cast<int>(boxWidth / aspect + 0.5);
    if (height > boxHeight) {
        height = boxHeight;
        width = static_cast<int>(boxHeight * aspect + 0.5);
    }
    width = std::max(2, width);
    height = std::max(2, height);
    m_sws = sws_getCachedContext(m_sws, frame->width, frame->height,
                                 static_cast<AVPixelFormat>(frame->format), width, height,
                                 AV_PIX_FMT_RGB24, SWS_BILINEAR, nullptr, nullptr, nullptr);
    if (m_sws == nullptr) {
        return false;
    }
    picture.width = width;
    picture.height = height;
    picture.pts = seconds;
    picture.rgb.resize(static_cast<std::size_t>(width) * static_cast<std::size_t>(height) * 3);
    std::uint8_t* planes[4] = {picture.rgb.data(), nullptr, nullptr, nullptr};
    int strides[4] = {width * 3, 0, 0, 0};
    return sws_scale(m_sws, frame->data, frame->linesize, 0, frame->height, planes, strides) > 0;
}

void Engine::OnVideoFrame(AVFrame* frame, double seconds, std::uint64_t generation) {
    if (m_pictureTrimTo >= 0) {
        if (seconds < m_pictureTrimTo - 0.001) {
            // Before the target: only the newest stays, shown if nothing nearer comes.
            if (m_heldPicture == nullptr) {
                m_heldPicture = av_frame_alloc();
            }
            av_frame_unref(m_heldPicture);
            if (av_frame_ref(m_heldPicture, frame) == 0) {
                m_heldSeconds = seconds;
            }
            return;
        }
        m_pictureTrimTo = -1;
        if (!m_source->HasAudio()) {
            m_source->SetCatchingUp(false);
        }
        if (m_heldPicture != nullptr && m_heldPicture->width > 0 &&
            seconds > m_seekTarget + 0.001) {
            Picture held;
            if (ConvertPicture(m_heldPicture, m_heldSeconds, held)) {
                std::lock_guard lock(m_mutex);
                if (generation == m_generation) {
                    m_pictures.push_back(std::move(held));
                }
            }
        }
        if (m_heldPicture != nullptr) {
            av_frame_unref(m_heldPicture);
        }
    }
    {
        // A picture already behind the clock (the decoder catching up after a seek) would be
        // skipped when shown: it is not scaled either.
        std::lock_guard lock(m_mutex);
        if (m_audioClock && !m_pictures.empty() && seconds < ClockLocked() - 0.1) {
            return;
        }
    }
    Picture picture;
    if (!ConvertPicture(frame, seconds, picture)) {
        return;
    }
    std::lock_guard lock(m_mutex);
    if (generation != m_generation) {
        return;
    }
    m_pictures.push_back(std::move(picture));
    while (m_pictures.size() > kPictureHardCap) {
        m_pictures.pop_front();
    }
    m_changed.notify_all();
}

void Engine::DecodeLoop() {
    std::unique_lock lock(m_mutex);
    std::uint64_t generation = m_generation;
    bool first = true;
    while (!m_stop) {
        if (m_seekPending || first) {
            const double target = m_base;
            const bool seek = m_seekPending;
            m_seekPending = false;
            first = false;
            generation = m_generation;
            lock.unlock();
            if (seek) {
                m_source->Seek(target);
                if (m_swr != nullptr) {
                    swr_close(m_swr);
                    swr_init(m_swr);
                }
            }
            m_seekTarget = target;
            m_trimTo = seek ? target : -1;
            m_pictureTrimTo = seek ? target : -1;
            m_source->SetCatchingUp(seek && m_source->HasVideo());
            if (m_heldPicture != nullptr) {
                av_frame_unref(m_heldPicture);
            }
            lock.lock();
            continue;
        }
        // Pictures put off by a seek are decoded first, reading on only as far as the sound
        // needs to keep playing meanwhile.
        const bool backlog = m_source->HasBacklog();
        if (m_decoderEnded || (QueuesFullLocked() && !backlog)) {
            m_changed.wait(lock);
            continue;
        }
        const bool soundEnough =
            static_cast<double>(m_audioFrames) / m_outputRate >= kAudioLowSeconds;
        lock.unlock();
        if (backlog && soundEnough) {
            m_source->DecodeBacklog([this, generation](AVFrame* frame, double seconds) {
                OnVideoFrame(frame, seconds, generation);
            });
            lock.lock();
            continue;
        }
        const bool more = m_source->Step(
            [this, generation](AVFrame* frame, double seconds) {
                OnAudioFrame(frame, seconds, generation);
            },
            [this, generation](AVFrame* frame, double seconds) {
                OnVideoFrame(frame, seconds, generation);
            });
        lock.lock();
        if (!more && generation == m_generation) {
            m_decoderEnded = true;
            m_changed.notify_all();
        }
    }
}

bool Engine::PresentDue(Picture& out) {
    // Called with m_mutex held. Pictures whose time has come: the newest of them is shown, the
    // older ones were late and are skipped.
    const double clock = ClockLocked();
    bool found = false;
    while (!m_pictures.empty() && m_pictures.front().pts <= clock + 0.002) {
        out = std::move(m_pictures.front());
        m_pictures.pop_front();
        found = true;
    }
    if (found) {
        m_changed.notify_all();
    }
    return found;
}

void Engine::Run() {
    std::unique_lock lock(m_mutex);
    if (!m_source || m_running) {
        return;
    }
    m_running = true;
    const bool hasAudio = m_source->HasAudio();
    int rate = m_source->AudioRate();
    // Rates past 48 kHz are heard no better in a preview and cost the device more.
    m_outputRate = rate >= 8000 && rate <= 48000 ? rate : 48000;
    lock.unlock();
    const bool device = hasAudio && OpenDevice(m_outputRate);
    lock.lock();
    m_audioClock = device;
    ResetTimeline(m_base);
    const bool pausedAtStart = m_paused;
    lock.unlock();
    if (device) {
        std::lock_guard guard(m_deviceMutex);
        SDL_PauseAudioDevice(m_device, pausedAtStart ? 1 : 0);
    }
    std::thread decoder([this] { DecodeLoop(); });
    lock.lock();
    double lastShown = -1;
    while (!m_stop) {
        if (!m_audioClock && hasAudio) {
            DrainAudioToClockLocked(ClockLocked());
        }
        Picture picture;
        if (PresentDue(picture)) {
            lastShown = picture.pts;
            lock.unlock();
            {
                std::lock_guard sink(m_sinkMutex);
                if (m_sink) {
                    m_sink(picture);
                }
            }
            lock.lock();
            continue;
        }
        if (m_decoderEnded && m_audio.empty() && m_pictures.empty() && !m_paused) {
            // Everything is handed out: the run ends when the last sound has been heard.
            const double clock = ClockLocked();
            const double end = m_audioClock || hasAudio
                                   ? m_base + static_cast<double>(m_played) / m_outputRate
                                   : std::max(lastShown + 0.04, m_base);
            if (clock >= end - 0.0005) {
                break;
            }
        }
        m_changed.wait_for(lock, kTick);
    }
    // The clock keeps the place playing stopped at.
    m_wallBase = ClockLocked();
    m_stop = true;
    m_changed.notify_all();
    lock.unlock();
    decoder.join();
    CloseDevice();
    swr_free(&m_swr);
    sws_freeContext(m_sws);
    m_sws = nullptr;
    av_frame_free(&m_heldPicture);
    lock.lock();
    m_audioClock = false;
    m_audio.clear();
    m_audioFrames = 0;
    m_pictures.clear();
    m_running = false;
    m_changed.notify_all();
}

void Engine::WaitForRunEnd() {
    std::unique_lock lock(m_mutex);
    m_changed.wait(lock, [this] { return !m_running; });
}

Engine& TheEngine() {
    static Engine engine;
    return engine;
}

}  // namespace

void SetPictureSink(PictureSink sink) {
    TheEngine().SetSink(std::move(sink));
}
std::string WindowText() {
    return TheEngine().WindowText();
}
bool IsRunning() {
    return TheEngine().IsRunning();
}
bool ClockIsAudioDevice() {
    return TheEngine().AudioClock();
}
std::vector<std::int16_t> PeekQueuedSound(std::size_t frames) {
    return TheEngine().Peek(frames);
}

}  // namespace ac::player

using ac::player::TheEngine;

extern "C" {

void avp_putenv(const char* text) {
    TheEngine().PutEnv(text);
}
void avp_init_size(int width, int height) {
    TheEngine().InitSize(width, height);
}
void avp_init(void) {
    TheEngine().Init();
}
int avp_open(const char* path) {
    return TheEngine().Open(path);
}
double avp_get_length(void) {
    return TheEngine().Length();
}
void avp_run(void) {
    TheEngine().Run();
}
double avp_get_cur_pos(void) {
    return TheEngine().Position();
}
void avp_set_cur_pos(double seconds) {
    TheEngine().SetPosition(seconds);
}
void avp_toggle_pause(void) {
    TheEngine().TogglePause();
}
void avp_stop(void) {
    TheEngine().Stop();
}
void avp_deinit(void) {
    TheEngine().Deinit();
}
}
