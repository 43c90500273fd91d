// Conversions that succeed: every honoured option checked on the file that comes out.

#include <algorithm>
#include <cmath>

#include "CttHarness.h"
#include "platform/CommandLine.h"

namespace ac::test {
namespace {

constexpr int kRate = 44100;
constexpr size_t kFrames = 3 * kRate;

class CttConvert : public ::testing::Test {
protected:
    static void SetUpTestSuite() {
        s_dir = new TempDir;
        s_noise = MakeNoise(kFrames, 1);
        WriteWav(*s_dir / "noise.wav", s_noise);
        s_loud = MakeNoise(kRate, 2, kRate, 2, 30000);
        WriteWav(*s_dir / "loud.wav", s_loud);
        WriteWav(*s_dir / "mono48.wav", MakeNoise(48000, 3, 48000, 1));
        WriteWav(*s_dir / "long.wav", MakeNoise(60 * kRate, 4));
        s_haveVideo = RunFfmpeg("-f lavfi -i testsrc=duration=2:size=160x120:rate=10 -f lavfi -i "
                                "sine=duration=2:sample_rate=44100 -c:v mpeg4 -c:a mp2 " +
                                *s_dir / "video.avi");
    }
    static void TearDownTestSuite() {
        delete s_dir;
        s_dir = nullptr;
    }

    static std::string Src(const char* name) { return *s_dir / name; }

    // Converts to a fresh WAV and reads it back.
    Pcm ToWav(const std::vector<std::string>& options, const char* input = "noise.wav") {
        const std::string out = m_out / "out.wav";
        const ToolResult r = RunCtt(Src(input), options, out);
        EXPECT_EQ(r.exitCode, 0) << r.err;
        Pcm pcm;
        EXPECT_TRUE(ReadWav(out, pcm));
        return pcm;
    }

    static TempDir* s_dir;
    static Pcm s_noise;
    static Pcm s_loud;
    static bool s_haveVideo;
    TempDir m_out;
};

TempDir* CttConvert::s_dir = nullptr;
Pcm CttConvert::s_noise;
Pcm CttConvert::s_loud;
bool CttConvert::s_haveVideo = false;

struct FormatCase {
    const char* options;
    const char* extension;
    const char* codec;
    int rate;
    int channels;
    double tolerance = 0.1;  // lossy encoders add delay and pad the last frame
};

class CttFormats : public CttConvert, public ::testing::WithParamInterface<FormatCase> {};

TEST_P(CttFormats, OutputHasTheAskedCodecRateChannelsAndLength) {
    const FormatCase& c = GetParam();
    const std::string out = m_out / (std::string("out.") + c.extension);
    const ToolResult r = RunCtt(Src("noise.wav"), platform::SplitCommandLine(c.options), out);
    ASSERT_EQ(r.exitCode, 0) << c.options << ": " << r.err;
    const MediaFileInfo info = Probe(out);
    ASSERT_EQ(info.audioStreams.size(), 1u);
    EXPECT_EQ(info.audioStreams[0].codec, c.codec);
    EXPECT_EQ(info.audioStreams[0].sampleRate, c.rate);
    EXPECT_EQ(info.audioStreams[0].channels, c.channels);
    EXPECT_NEAR(DurationOf(info), 3.0, c.tolerance) << c.options;
}

INSTANTIATE_TEST_SUITE_P(
    Table, CttFormats,
    ::testing::Values(FormatCase{"-acodec mp3 -ab 192", "mp3", "mp3", 44100, 2},
                      FormatCase{"-acodec mp3 -ar 32000 -ac \"1 (Mono)\"", "mp3", "mp3", 32000, 1},
                      FormatCase{"-f \"flac\"", "flac", "flac", 44100, 2},
                      FormatCase{"-acodec vorbis -ab 128 -ar 48000", "ogg", "vorbis", 48000, 2},
                      FormatCase{"-acodec aac -ab 128", "m4a", "aac", 44100, 2},
                      FormatCase{"-acodec aac -f mp4 -vn", "mp4", "aac", 44100, 2},
                      // A raw ADTS stream has no length; its reader estimates one from the bit rate.
                      FormatCase{"-acodec aac -f adts", "aac", "aac", 44100, 2, 0.5},
                      FormatCase{"-acodec wmav2 -ab 128", "wma", "wmav2", 44100, 2},
                      FormatCase{"-acodec wmav1 -ab 128 -f asf", "asf", "wmav1", 44100, 2},
                      FormatCase{"-acodec ac3", "ac3", "ac3", 44100, 2},
                      FormatCase{"-acodec mp2 -ar 48000", "mp2", "mp2", 48000, 2},
                      FormatCase{"-acodec pcm_s16be", "au", "pcm_s16be", 44100, 2},
                      FormatCase{"-acodec pcm_u8 -ar 22050 -ac 1", "wav", "pcm_u8", 22050, 1},
                      FormatCase{"-acodec g726", "wav", "g726", 8000, 1},
                      FormatCase{"-threads 2 -acodec mp3", "mp3", "mp3", 44100, 2}));

TEST_F(CttConvert, WorkedExampleCommandTextRunsAsTheProgramSendsIt) {
    const std::string out = m_out / "Song.mp3";
    const std::string text = " -relk -y  -i \"" + Src("noise.wav") +
                             "\" -title \"My Song\"     -acodec \"mp3\"  -ab \"192\"  -ar \"44100\"  "
                             "-ac \"2 (stereo)\"  -id3v1 -id3v2  -vol  256   \"" + out + "\"";
    const ToolResult r = RunTool(CttPath(), platform::SplitCommandLine(text));
    ASSERT_EQ(r.exitCode, 0) << r.err;
    EXPECT_EQ(r.err, "");
    const MediaFileInfo info = Probe(out);
    EXPECT_EQ(info.title, "My Song");
    ASSERT_EQ(info.audioStreams.size(), 1u);
    EXPECT_EQ(info.audioStreams[0].bitRate, 192000);
    const std::string bytes = ReadFile(out);
    EXPECT_EQ(bytes.compare(0, 4, "ID3\x03"), 0);
    EXPECT_EQ(bytes.compare(bytes.size() - 128, 10, "TAGMy Song"), 0);
}

struct TagCase {
    const char* extension;
    const char* options;
};

class CttTags : public CttConvert, public ::testing::WithParamInterface<TagCase> {};

TEST_P(CttTags, TagsOfTheCommandLineReachTheContainer) {
    const std::string out = m_out / (std::string("tags.") + GetParam().extension);
    std::vector<std::string> options = platform::SplitCommandLine(GetParam().options);
    for (const char* tag : {"-title", "T \x0Bq\x0B", "-author", "Au", "-album", "Al", "-year", "1999",
                            "-genre", "Rock", "-comment", "Co", "-composer", "Cm"}) {
        options.push_back(tag);
    }
    const ToolResult r = RunCtt(Src("noise.wav"), options, out);
    ASSERT_EQ(r.exitCode, 0) << r.err;
    const MediaFileInfo info = Probe(out);
    EXPECT_EQ(info.title, "T \"q\"");
    EXPECT_EQ(info.author, "Au");
    EXPECT_EQ(info.album, "Al");
    EXPECT_EQ(info.year, "1999");
    EXPECT_EQ(info.genre, "Rock");
    EXPECT_EQ(info.comment, "Co");
}

INSTANTIATE_TEST_SUITE_P(Table, CttTags,
                         ::testing::Values(TagCase{"mp3", "-acodec mp3 -id3v2"},
                                           TagCase{"flac", "-f flac"},
                                           TagCase{"ogg", "-acodec vorbis"},
                                           TagCase{"m4a", "-acodec aac"}));

TEST_F(CttConvert, Mp3CarriesId3OnlyWhenAsked) {
    const std::string plain = m_out / "plain.mp3";
    ASSERT_EQ(RunCtt(Src("noise.wav"), {"-title", "Lost", "-acodec", "mp3"}, plain).exitCode, 0);
    const std::string bytes = ReadFile(plain);
    EXPECT_NE(bytes.compare(0, 3, "ID3"), 0);
    EXPECT_NE(bytes.compare(bytes.size() - 128, 3, "TAG"), 0);
    EXPECT_EQ(Probe(plain).title, "");

    const std::string v1 = m_out / "v1.mp3";
    ASSERT_EQ(RunCtt(Src("noise.wav"),
                     {"-title", "Tt", "-author", "Aa", "-album", "Bb", "-year", "2001", "-id3v1"}, v1)
                  .exitCode,
              0);
    const std::string tail = ReadFile(v1).substr(ReadFile(v1).size() - 128);
    EXPECT_EQ(tail.substr(0, 3), "TAG");
    EXPECT_EQ(tail.substr(3, 3), std::string("Tt\0", 3));
    EXPECT_EQ(tail.substr(33, 2), "Aa");
    EXPECT_EQ(tail.substr(63, 2), "Bb");
    EXPECT_EQ(tail.substr(93, 4), "2001");
    EXPECT_NE(ReadFile(v1).compare(0, 3, "ID3"), 0);
}

TEST_F(CttConvert, LosslessPathIsSampleExactAndGainIsLinear) {
    const Pcm same = ToWav({"-vol", "256"});
    EXPECT_EQ(same.samples, s_noise.samples);

    const Pcm half = ToWav({"-vol", "128"});
    ASSERT_EQ(half.samples.size(), s_noise.samples.size());
    int worst = 0;
    for (size_t i = 0; i < half.samples.size(); ++i) {
        worst = std::max(worst, std::abs(half.samples[i] * 2 - s_noise.samples[i]));
    }
    EXPECT_LE(worst, 2);  // one LSB of rounding, doubled

    const Pcm doubled = ToWav({"-vol", "512"}, "loud.wav");
    ASSERT_EQ(doubled.samples.size(), s_loud.samples.size());
    size_t clipped = 0;
    for (size_t i = 0; i < doubled.samples.size(); ++i) {
        const int want = std::clamp(s_loud.samples[i] * 2, -32768, 32767);
        ASSERT_LE(std::abs(doubled.samples[i] - want), 1) << "sample " << i;
        clipped += (want == 32767 || want == -32768);
    }
    EXPECT_GT(clipped, 1000u);  // the fixture really clips, and saturates rather than wraps
}

TEST_F(CttConvert, StartDurationAndOffsetCutSampleExact) {
    const Pcm cut = ToWav({"-ss", "0.5", "-t", "00:00:01.25"});
    ASSERT_EQ(cut.frames(), 55125u);
    EXPECT_TRUE(std::equal(cut.samples.begin(), cut.samples.end(), s_noise.samples.begin() + 22050 * 2));

    const Pcm late = ToWav({"-itsoffset", "0.5"});
    ASSERT_EQ(late.frames(), kFrames + 22050);
    EXPECT_TRUE(std::all_of(late.samples.begin(), late.samples.begin() + 44100, [](int s) { return s == 0; }));
    EXPECT_TRUE(std::equal(s_noise.samples.begin(), s_noise.samples.end(), late.samples.begin() + 44100));

    const Pcm early = ToWav({"-itsoffset", "-1"});
    ASSERT_EQ(early.frames(), kFrames - kRate);
    EXPECT_TRUE(std::equal(early.samples.begin(), early.samples.end(), s_noise.samples.begin() + kRate * 2));
}

TEST_F(CttConvert, ResamplesAndMixesChannels) {
    const Pcm up = ToWav({"-ar", "44100", "-ac", "2"}, "mono48.wav");
    EXPECT_EQ(up.rate, 44100);
    ASSERT_EQ(up.channels, 2);
    EXPECT_NEAR(static_cast<double>(up.frames()), 44100.0, 2.0);
    for (size_t i = 0; i + 1 < up.samples.size(); i += 2) {
        ASSERT_EQ(up.samples[i], up.samples[i + 1]);
    }
}

TEST_F(CttConvert, VideoInputGivesItsFirstAudioStream) {
    if (!s_haveVideo) {
        GTEST_SKIP() << "ffmpeg could not make the video fixture";
    }
    const std::string out = m_out / "fromvideo.mp3";
    const ToolResult r = RunCtt(Src("video.avi"), {"-vn", "-s", "320x240", "-acodec", "mp3"}, out);
    ASSERT_EQ(r.exitCode, 0) << r.err;
    EXPECT_NE(r.err.find("|Warning>>> "), std::string::npos);
    const MediaFileInfo info = Probe(out);
    EXPECT_TRUE(info.videoStreams.empty());
    EXPECT_NEAR(DurationOf(info), 2.0, 0.1);
}

TEST_F(CttConvert, ProgressLinesRiseToTheDuration) {
    const std::string out = m_out / "long.mp3";
    const ToolResult r = RunCtt(Src("long.wav"), {"-acodec", "mp3", "-ar", "48000"}, out);
    ASSERT_EQ(r.exitCode, 0) << r.err;
    const std::vector<double> times = TimeLines(r.out);
    ASSERT_GE(times.size(), 2u) << r.out;
    EXPECT_TRUE(std::is_sorted(times.begin(), times.end()));
    EXPECT_NEAR(times.back(), 60.0, 1152.0 / 44100);
}

TEST_F(CttConvert, OverwriteOnlyWithY) {
    const std::string out = m_out / "taken.wav";
    WriteFile(out, "precious");
    ToolResult r = RunCtt(Src("noise.wav"), {}, out, /*overwrite=*/false);
    EXPECT_NE(r.exitCode, 0);
    EXPECT_NE(r.err.find("|Error>>> "), std::string::npos);
    EXPECT_EQ(ReadFile(out), "precious");

    r = RunCtt(Src("noise.wav"), {}, out, /*overwrite=*/true);
    ASSERT_EQ(r.exitCode, 0) << r.err;
    Pcm pcm;
    ASSERT_TRUE(ReadWav(out, pcm));
    EXPECT_EQ(pcm.samples, s_noise.samples);
}

}  // namespace
}  // namespace ac::test
