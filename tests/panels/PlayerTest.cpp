// The preview library on SDL's dummy sound driver, with files made at test time: opening and
// length, the clock against real time, pause, seeks checked sample for sample (each sample of
// the fixtures holds its own index), stopping, pictures, files that are odd or damaged, and a
// second life after deinit.

#include "panels/Player.h"

#include "../support/AudioFixtures.h"
#include "../support/DiscImages.h"
#include "../support/TempDir.h"

#include <gtest/gtest.h>

#include <atomic>
#include <chrono>
#include <cmath>
#include <fcntl.h>
#include <filesystem>
#include <mutex>
#include <thread>
#include <unistd.h>

namespace ac {
namespace {

using namespace std::chrono_literals;
using SteadyClock = std::chrono::steady_clock;

// Stereo 16-bit at `rate` where frame i holds i: left the low 15 bits, right the rest, so the
// first frame heard after a seek tells exactly where the seek landed.
test::Pcm CountingPcm(std::size_t frames, int rate = 44100) {
    test::Pcm pcm;
    pcm.rate = rate;
    pcm.channels = 2;
    pcm.samples.resize(frames * 2);
    for (std::size_t i = 0; i < frames; ++i) {
        pcm.samples[2 * i] = static_cast<std::int16_t>(i & 0x7FFF);
        pcm.samples[2 * i + 1] = static_cast<std::int16_t>(i >> 15);
    }
    return pcm;
}

long FrameIndexOf(const std::vector<std::int16_t>& stereo) {
    return static_cast<long>(stereo[0]) | (static_cast<long>(stereo[1]) << 15);
}

bool WaitFor(const std::function<bool()>& done, std::chrono::milliseconds limit = 5000ms) {
    const auto end = SteadyClock::now() + limit;
    while (SteadyClock::now() < end) {
        if (done()) {
            return true;
        }
        std::this_thread::sleep_for(2ms);
    }
    return done();
}

// One playback on a thread of its own, as the panel's worker runs it.
class Playback {
public:
    Playback() {
        m_thread = std::thread([this] {
            avp_run();
            m_done = true;
        });
    }
    ~Playback() { Stop(); }
    bool Done() const { return m_done; }
    // How long avp_run took to return after avp_stop.
    std::chrono::milliseconds Stop() {
        const auto begin = SteadyClock::now();
        if (m_thread.joinable()) {
            avp_stop();
            WaitFor([this] { return m_done.load(); }, 3000ms);
            m_thread.join();
        }
        return std::chrono::duration_cast<std::chrono::milliseconds>(SteadyClock::now() - begin);
    }
    void Join() {
        if (m_thread.joinable()) {
            m_thread.join();
        }
    }

private:
    std::atomic<bool> m_done{false};
    std::thread m_thread;
};

class PlayerTest : public ::testing::Test {
protected:
    static void SetUpTestSuite() {
        avp_putenv("SDL_WINDOWID=0x1234");
        avp_init_size(160, 160);
        avp_init();
    }
    void TearDown() override { player::SetPictureSink({}); }

    std::string MakeCountingWav(const std::string& name, double seconds, int rate = 44100) {
        const std::string path = m_dir / name;
        test::WriteWav(path, CountingPcm(static_cast<std::size_t>(seconds * rate), rate));
        return path;
    }

    test::TempDir m_dir;
};

TEST_F(PlayerTest, OpensPlayableFilesAndTellsTheirLength) {
    EXPECT_EQ(player::WindowText(), "SDL_WINDOWID=0x1234");
    ASSERT_EQ(avp_open(MakeCountingWav("three.wav", 3.0).c_str()), 1);
    EXPECT_NEAR(avp_get_length(), 3.0, 0.001);
    EXPECT_DOUBLE_EQ(avp_get_cur_pos(), 0.0);

    test::WriteFile(m_dir / "notes.txt", "these are words, not sound\n");
    EXPECT_EQ(avp_open((m_dir / "notes.txt").c_str()), 0);
    EXPECT_EQ(avp_open((m_dir / "absent.mp3").c_str()), 0);
    EXPECT_EQ(avp_open(""), 0);
    EXPECT_DOUBLE_EQ(avp_get_length(), 0.0);
    // Without an opened file the run returns at once.
    avp_run();
}

TEST_F(PlayerTest, PositionFollowsRealTimeAndPauseHoldsIt) {
    ASSERT_EQ(avp_open(MakeCountingWav("ten.wav", 10.0).c_str()), 1);
    Playback playback;
    ASSERT_TRUE(WaitFor([] { return avp_get_cur_pos() > 0.05; }));
    EXPECT_TRUE(player::ClockIsAudioDevice());
    const auto wallStart = SteadyClock::now();
    const double posStart = avp_get_cur_pos();
    std::this_thread::sleep_for(2000ms);
    const double wall = std::chrono::duration<double>(SteadyClock::now() - wallStart).count();
    const double advanced = avp_get_cur_pos() - posStart;
    EXPECT_NEAR(advanced / wall, 1.0, 0.05) << advanced << " s of sound in " << wall << " s";

    avp_toggle_pause();
    const double held = avp_get_cur_pos();
    std::this_thread::sleep_for(400ms);
    EXPECT_DOUBLE_EQ(avp_get_cur_pos(), held);
    avp_toggle_pause();
    ASSERT_TRUE(WaitFor([held] { return avp_get_cur_pos() > held + 0.1; }));
    EXPECT_LT(avp_get_cur_pos(), held + 1.0);
    EXPECT_FALSE(playback.Done());
}

TEST_F(PlayerTest, SeeksLandOnTheExactSample) {
    const std::string wav = MakeCountingWav("count.wav", 8.0);
    const std::string flac = m_dir / "count.flac";
    ASSERT_TRUE(test::RunFfmpeg("-i '" + wav + "' -c:a flac '" + flac + "'"));
    for (const std::string& path : {wav, flac}) {
        SCOPED_TRACE(path);
        ASSERT_EQ(avp_open(path.c_str()), 1);
        Playback playback;
        ASSERT_TRUE(WaitFor([] { return avp_get_cur_pos() > 0.02; }));
        // As the panel does it: hold still, jump, go on.
        avp_toggle_pause();
        for (double target : {5.25, 1.0, 7.5, 0.0}) {
            avp_set_cur_pos(target);
            EXPECT_DOUBLE_EQ(avp_get_cur_pos(), target);
            ASSERT_TRUE(WaitFor([] { return player::PeekQueuedSound(1).size() == 2; }));
            EXPECT_NEAR(FrameIndexOf(player::PeekQueuedSound(1)), std::lround(target * 44100), 1)
                << "seek to " << target;
        }
        avp_set_cur_pos(6.0);
        avp_toggle_pause();
        ASSERT_TRUE(WaitFor([] { return avp_get_cur_pos() > 6.05; }));
        EXPECT_LT(avp_get_cur_pos(), 7.0);
    }
}

TEST_F(PlayerTest, StopEndsTheRunPromptlyAlsoWhilePaused) {
    ASSERT_EQ(avp_open(MakeCountingWav("stop.wav", 6.0).c_str()), 1);
    {
        Playback playback;
        ASSERT_TRUE(WaitFor([] { return avp_get_cur_pos() > 0.2; }));
        // The figure itself goes to bench/player_bench.sh; here a hang would show.
        EXPECT_LT(playback.Stop().count(), 1000);
    }
    const double stoppedAt = avp_get_cur_pos();
    EXPECT_GT(stoppedAt, 0.2);
    EXPECT_FALSE(player::IsRunning());

    ASSERT_EQ(avp_open(MakeCountingWav("stop.wav", 6.0).c_str()), 1);
    Playback paused;
    ASSERT_TRUE(WaitFor([] { return avp_get_cur_pos() > 0.1; }));
    avp_toggle_pause();
    EXPECT_LT(paused.Stop().count(), 1000);
}

TEST_F(PlayerTest, ShortFilePlaysOutAndTheRunEnds) {
    ASSERT_EQ(avp_open(MakeCountingWav("short.wav", 0.4).c_str()), 1);
    const auto begin = SteadyClock::now();
    avp_run();
    const double took = std::chrono::duration<double>(SteadyClock::now() - begin).count();
    EXPECT_GT(took, 0.35);
    EXPECT_LT(took, 2.0);
    EXPECT_NEAR(avp_get_cur_pos(), 0.4, 0.05);
}

TEST_F(PlayerTest, VideoPicturesFitTheBoxAndFollowTheClock) {
    const std::string path = m_dir / "clip.mkv";
    // Sound after the pictures in the stream order, as some containers have it.
    ASSERT_TRUE(
        test::RunFfmpeg("-f lavfi -i testsrc=size=320x240:rate=25:duration=3 -f lavfi -i "
                        "sine=frequency=440:duration=3 -map 0:v -map 1:a -c:v mpeg4 -c:a flac '" +
                        path + "'"));
    std::mutex mutex;
    std::vector<std::pair<int, int>> sizes;
    std::vector<double> times;
    player::SetPictureSink([&](const player::Picture& picture) {
        std::lock_guard lock(mutex);
        sizes.emplace_back(picture.width, picture.height);
        times.push_back(picture.pts - avp_get_cur_pos());
        EXPECT_EQ(picture.rgb.size(), std::size_t(picture.width) * picture.height * 3);
    });
    ASSERT_EQ(avp_open(path.c_str()), 1);
    EXPECT_NEAR(avp_get_length(), 3.0, 0.1);
    Playback playback;
    // A second and a half holds 37 pictures; a build with thread checks on a small machine
    // decodes too slowly to show them all, and drops the late ones, as it should.
    std::this_thread::sleep_for(1500ms);
    playback.Stop();
    std::lock_guard lock(mutex);
    ASSERT_GT(sizes.size(), 15u);
    EXPECT_EQ(sizes.front(), std::make_pair(160, 120));
    for (double early : times) {
        // Never shown before its time, and never far behind it.
        EXPECT_LT(early, 0.01);
        EXPECT_GT(early, -0.1);
    }
}

TEST_F(PlayerTest, AfterASeekFarFromAKeyFrameSoundComesFirstAndPicturesCatchUp) {
    // One key frame for eight seconds of pictures: the seek has to decode its way to 6 s.
    const std::string path = m_dir / "longgop.mkv";
    ASSERT_TRUE(test::RunFfmpeg(
        "-f lavfi -i testsrc=size=320x240:rate=25:duration=8 -f lavfi -i sine=duration=8 "
        "-c:v mpeg4 -g 300 -c:a flac '" +
        path + "'"));
    std::mutex mutex;
    double lastPicture = -1;
    player::SetPictureSink([&](const player::Picture& picture) {
        std::lock_guard lock(mutex);
        lastPicture = picture.pts;
    });
    ASSERT_EQ(avp_open(path.c_str()), 1);
    Playback playback;
    ASSERT_TRUE(WaitFor([] { return avp_get_cur_pos() > 0.2; }));
    avp_set_cur_pos(6.0);
    ASSERT_TRUE(WaitFor([] { return avp_get_cur_pos() > 6.0; }, 2000ms));
    // How long the catching up takes depends on the machine (and on a sanitizer's slowdown);
    // what counts is that the pictures reach the sound and then keep in step with it.
    const auto inStep = [&] {
        std::lock_guard lock(mutex);
        return lastPicture > 6.0 && std::abs(lastPicture - avp_get_cur_pos()) < 0.15;
    };
    EXPECT_TRUE(WaitFor(inStep, 10000ms)) << "the pictures never caught up with the sound";
    if (avp_get_cur_pos() < 7.5) {
        std::this_thread::sleep_for(300ms);
        EXPECT_TRUE(WaitFor(inStep, 200ms)) << "the pictures fell behind again";
    }
}

TEST_F(PlayerTest, OddAndDamagedFilesPlayWithoutHanging) {
    // Eight channels at 192 kHz; an MP3 cut in the middle with garbage in its place.
    const std::string wide = m_dir / "wide.wav";
    ASSERT_TRUE(
        test::RunFfmpeg("-f lavfi -i sine=frequency=300:sample_rate=192000:duration=1 "
                        "-af 'pan=7.1|c0=c0|c1=c0|c2=c0|c3=c0|c4=c0|c5=c0|c6=c0|c7=c0' '" +
                        wide + "'"));
    const std::string mp3 = m_dir / "whole.mp3";
    ASSERT_TRUE(test::RunFfmpeg("-f lavfi -i sine=duration=3 -c:a libmp3lame '" + mp3 + "'"));
    std::string bytes = test::ReadFile(mp3);
    for (std::size_t i = bytes.size() / 3; i < bytes.size() / 2; ++i) {
        bytes[i] = static_cast<char>(i * 7919);
    }
    bytes.resize(bytes.size() * 2 / 3);
    const std::string broken = m_dir / "broken.mp3";
    test::WriteFile(broken, bytes);
    for (const std::string& path : {wide, broken}) {
        SCOPED_TRACE(path);
        ASSERT_EQ(avp_open(path.c_str()), 1);
        Playback playback;
        EXPECT_TRUE(WaitFor([&] { return playback.Done(); }, 6000ms));
    }
}

TEST_F(PlayerTest, FileDeletedWhilePlayingPlaysOnUntouched) {
    const std::string path = MakeCountingWav("gone.wav", 1.5);
    const std::string before = test::ReadFile(path);
    ASSERT_EQ(avp_open(path.c_str()), 1);
    Playback playback;
    ASSERT_TRUE(WaitFor([] { return avp_get_cur_pos() > 0.1; }));
    const std::string copy = m_dir / "kept.wav";
    std::filesystem::copy_file(path, copy);
    std::filesystem::remove(path);
    EXPECT_TRUE(WaitFor([&] { return playback.Done(); }, 4000ms));
    EXPECT_NEAR(avp_get_cur_pos(), 1.5, 0.05);
    // The player only ever reads.
    EXPECT_EQ(test::ReadFile(copy), before);
}

TEST_F(PlayerTest, TenHourFileSeeksToItsEnd) {
    // Mono 8 kHz: ten hours are 576 MB of zeros behind the header, kept sparse on disk.
    test::Pcm header;
    header.rate = 8000;
    header.channels = 1;
    const std::uint32_t dataBytes = 10u * 3600u * 8000u * 2u;
    const std::string path = m_dir / "long.wav";
    test::WriteFile(path, test::WavBytes(header, dataBytes));
    ASSERT_EQ(::truncate(path.c_str(), 44 + static_cast<off_t>(dataBytes)), 0);
    ASSERT_EQ(avp_open(path.c_str()), 1);
    EXPECT_NEAR(avp_get_length(), 36000.0, 0.01);
    avp_set_cur_pos(35999.5);
    Playback playback;
    EXPECT_TRUE(WaitFor([&] { return playback.Done(); }, 5000ms));
    EXPECT_NEAR(avp_get_cur_pos(), 36000.0, 0.05);
}

TEST_F(PlayerTest, CdTrackOfADiscImagePlaysAndSeeks) {
    const test::DiscImage image = test::WriteDiscImage(
        m_dir.Path(), "disc", {{.frames = 44100 * 2, .seed = 3}, {.frames = 44100 * 3, .seed = 4}});
    const std::string track = image.cuePath + "/Track02.cda";
    ASSERT_EQ(avp_open(track.c_str()), 1);
    EXPECT_NEAR(avp_get_length(), 3.0, 1.0 / 75);
    avp_set_cur_pos(1.0);
    avp_toggle_pause();
    Playback playback;
    ASSERT_TRUE(WaitFor([] { return player::PeekQueuedSound(1).size() == 2; }));
    // A CD seeks to whole sectors of 588 frames.
    const std::vector<std::int16_t> first = player::PeekQueuedSound(1);
    const auto& pcm = image.tracks[1].pcm.samples;
    EXPECT_EQ(first[0], pcm[2 * 44100]);
    EXPECT_EQ(first[1], pcm[2 * 44100 + 1]);
    avp_toggle_pause();
    EXPECT_TRUE(WaitFor([] { return avp_get_cur_pos() > 1.1; }));
    EXPECT_EQ(avp_open((m_dir.Path() + "/disc.cue/Track07.cda").c_str()), 0);
}

TEST_F(PlayerTest, CueTrackPlaysItsOwnSpanOfTheFile) {
    MakeCountingWav("album.wav", 8.0);
    const std::string sheet = m_dir / "album.cue";
    test::WriteFile(sheet, "FILE \"album.wav\" WAVE\n  TRACK 01 AUDIO\n    INDEX 01 00:00:00\n"
                           "  TRACK 02 AUDIO\n    INDEX 01 00:05:00\n");
    ASSERT_EQ(avp_open((sheet + "|1").c_str()), 1);
    EXPECT_NEAR(avp_get_length(), 5.0, 1.0 / 75);
    ASSERT_EQ(avp_open((sheet + "|2").c_str()), 1);
    EXPECT_NEAR(avp_get_length(), 3.0, 1.0 / 75);
    avp_toggle_pause();
    {
        Playback playback;
        ASSERT_TRUE(WaitFor([] { return player::PeekQueuedSound(1).size() == 2; }));
        EXPECT_EQ(FrameIndexOf(player::PeekQueuedSound(1)), 5 * 44100)
            << "the second track starts at its own INDEX 01";
        avp_set_cur_pos(2.0);
        ASSERT_TRUE(WaitFor([] { return player::PeekQueuedSound(1).size() == 2; }));
        EXPECT_NEAR(FrameIndexOf(player::PeekQueuedSound(1)), 7 * 44100, 588);
        avp_stop();
    }
    EXPECT_EQ(avp_open((sheet + "|3").c_str()), 0) << "no third track";
    test::WriteFile(m_dir / "lost.cue", "FILE \"gone.wav\" WAVE\n  TRACK 01 AUDIO\n    INDEX 01 00:00:00\n");
    EXPECT_EQ(avp_open((m_dir / "lost.cue|1").c_str()), 0) << "the sheet's file is missing";
}

TEST_F(PlayerTest, DeinitEndsEverythingAndASecondInitWorks) {
    ASSERT_EQ(avp_open(MakeCountingWav("again.wav", 4.0).c_str()), 1);
    Playback playback;
    ASSERT_TRUE(WaitFor([] { return avp_get_cur_pos() > 0.05; }));
    avp_deinit();
    EXPECT_TRUE(WaitFor([&] { return playback.Done(); }, 1000ms));
    playback.Join();
    EXPECT_EQ(avp_get_length(), 0.0);

    avp_init_size(100, 100);
    avp_init();
    ASSERT_EQ(avp_open(MakeCountingWav("again.wav", 4.0).c_str()), 1);
    Playback second;
    EXPECT_TRUE(WaitFor([] { return avp_get_cur_pos() > 0.1; }));
    EXPECT_TRUE(player::ClockIsAudioDevice());
}

}  // namespace
}  // namespace ac
