#include "medialist/MediaProbe.h"

#include <gtest/gtest.h>

#include "support/AudioFixtures.h"
#include "support/TempDir.h"

namespace ac {
namespace {

using test::MakeNoise;
using test::RunFfmpeg;
using test::TempDir;
using test::WavBytes;
using test::WriteFile;

class Probing : public ::testing::Test {
protected:
    static void SetUpTestSuite() {
        s_dir = new TempDir;
        s_haveFfmpeg = RunFfmpeg("-f lavfi -i sine=duration=1:sample_rate=44100 -metadata title=T "
                                 "-metadata artist=A -metadata album=B -metadata date=1999 -metadata track=3/12 "
                                 "-metadata genre=Jazz -metadata composer=C -metadata copyright=Cp "
                                 "-metadata comment=Cm -c:a flac " + *s_dir / "tags.flac") &&
                       RunFfmpeg("-f lavfi -i sine=duration=1 -metadata title=Ogg -c:a libvorbis " +
                                 *s_dir / "tags.ogg") &&
                       RunFfmpeg("-f lavfi -i sine=duration=1 -metadata date=2100 " + *s_dir / "y2100.mp3") &&
                       RunFfmpeg("-f lavfi -i sine=duration=1 -metadata date=0 " + *s_dir / "y0.flac") &&
                       RunFfmpeg("-f lavfi -i testsrc=duration=2:size=160x120:rate=10 -f lavfi -i "
                                 "sine=duration=2 -c:v rawvideo -pix_fmt yuv420p -c:a pcm_u8 -ac 1 " +
                                 *s_dir / "raw.avi");
    }
    static void TearDownTestSuite() {
        delete s_dir;
        s_dir = nullptr;
    }
    void SetUp() override {
        if (!s_haveFfmpeg) {
            GTEST_SKIP() << "ffmpeg could not make the fixtures";
        }
    }

    static MediaFileInfo Probe(const std::string& name, int expected = 1) {
        MediaFileInfo info;
        EXPECT_EQ(ProbeFile(*s_dir / name, info), expected) << name;
        return info;
    }

    static TempDir* s_dir;
    static bool s_haveFfmpeg;
};

TempDir* Probing::s_dir = nullptr;
bool Probing::s_haveFfmpeg = false;

TEST_F(Probing, RawPcmBitRateComesFromItsSamplesNotItsHeader) {
    std::string bytes = WavBytes(MakeNoise(44100 * 2 + 22050, 1));
    bytes[28] = 0x39;  // byte rate field: a lie
    bytes[29] = 0x30;
    bytes[30] = 0;
    bytes[31] = 0;
    WriteFile(*s_dir / "liar.wav", bytes);
    const MediaFileInfo info = Probe("liar.wav");
    ASSERT_EQ(info.audioStreams.size(), 1u);
    EXPECT_EQ(info.audioStreams[0].codec, "pcm_s16le");
    EXPECT_EQ(info.audioStreams[0].bitRate, 1411200);
    EXPECT_EQ(info.audioStreams[0].channels, 2);
    EXPECT_EQ(info.audioStreams[0].sampleRate, 44100);
    EXPECT_EQ(info.seconds, 2);
    EXPECT_EQ(info.microseconds, 500000);
}

TEST_F(Probing, EveryTagField) {
    const MediaFileInfo info = Probe("tags.flac");
    EXPECT_EQ(info.title, "T");
    EXPECT_EQ(info.author, "A");
    EXPECT_EQ(info.album, "B");
    EXPECT_EQ(info.year, "1999");
    EXPECT_EQ(info.track, 3);
    EXPECT_EQ(info.genre, "Jazz");
    EXPECT_EQ(info.composer, "C");
    EXPECT_EQ(info.copyright, "Cp");
    EXPECT_EQ(info.comment, "Cm");
    EXPECT_EQ(info.timestamp, "");
    EXPECT_EQ(info.seconds, 1);
    EXPECT_EQ(Probe("tags.ogg").title, "Ogg");  // Ogg keeps its tags on the stream
}

TEST_F(Probing, YearsOutsideOneTo2099AreLeftOut) {
    EXPECT_EQ(Probe("y2100.mp3").year, "");
    EXPECT_EQ(Probe("y0.flac").year, "");
}

TEST_F(Probing, RawVideoNamesItsPixelFormat) {
    const MediaFileInfo info = Probe("raw.avi");
    ASSERT_EQ(info.videoStreams.size(), 1u);
    EXPECT_EQ(info.videoStreams[0].codec, "rawvideo, yuv420p");
    EXPECT_EQ(info.videoStreams[0].width, 160);
    EXPECT_EQ(info.videoStreams[0].height, 120);
    EXPECT_FLOAT_EQ(info.videoStreams[0].frameRate, 10.0f);
    ASSERT_EQ(info.audioStreams.size(), 1u);
    EXPECT_EQ(info.audioStreams[0].bitRate, 44100 * 8);
    EXPECT_EQ(info.seconds, 2);
}

TEST_F(Probing, UnopenableFilesAnswerZeroWithNoDuration) {
    WriteFile(*s_dir / "empty.mp3", "");
    WriteFile(*s_dir / "notes.mp3", "These are my notes, not music.\n");
    for (const char* name : {"empty.mp3", "notes.mp3", "missing.wav", "missing.cue|1"}) {
        const MediaFileInfo info = Probe(name, 0);
        EXPECT_EQ(info.bitRate, 0) << name;
        EXPECT_EQ(info.hours + info.minutes + info.seconds + info.microseconds, 0) << name;
        EXPECT_TRUE(info.audioStreams.empty()) << name;
    }
}

// The Add dialog offers what FFmpeg reads; files a user has that the fixed list never named.
TEST(DemuxerExtensionsTest, NameTheContainersUsersHave) {
    const std::vector<std::string> extensions = DemuxerExtensions();
    for (const std::string wanted : {"mkv", "webm", "aif", "flac", "wav", "opus"}) {
        EXPECT_TRUE(std::binary_search(extensions.begin(), extensions.end(), wanted)) << wanted;
    }
    EXPECT_TRUE(std::is_sorted(extensions.begin(), extensions.end()));
    EXPECT_EQ(std::adjacent_find(extensions.begin(), extensions.end()), extensions.end());
}

}  // namespace
}  // namespace ac
