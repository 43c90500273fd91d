// Bad input loses nothing: every failure is one clear error line, a non-zero exit in bounded
// time, and no output or temporary file left behind.

#include <sys/stat.h>
#include <unistd.h>

#include "CttHarness.h"

namespace ac::test {
namespace {

class CttErrors : public ::testing::Test {
protected:
    void SetUp() override {
        m_good = m_dir / "good.wav";
        WriteWav(m_good, MakeNoise(44100, 7));
    }

    void ExpectFailure(const ToolResult& r, const std::string& output, const char* errorPart) {
        EXPECT_FALSE(r.timedOut);
        EXPECT_GT(r.exitCode, 0) << "exit " << r.exitCode << " (a signal shows as -1)";
        EXPECT_EQ(r.err.rfind("|Error>>> ", 0), 0u) << r.err;
        EXPECT_NE(r.err.find(errorPart), std::string::npos) << r.err;
        ExpectNothingLeft(m_dir.Path(), output);
    }

    TempDir m_dir;
    std::string m_good;
};

struct BadInputCase {
    const char* name;
    std::string (*make)(const std::string& dir);
    const char* errorPart;
};

std::string TextFile(const std::string& dir) {
    WriteFile(dir + "/notes.mp3", "These are my notes, not music.\nLine two.\n");
    return dir + "/notes.mp3";
}
std::string EmptyFile(const std::string& dir) {
    WriteFile(dir + "/empty.wav", "");
    return dir + "/empty.wav";
}
std::string TruncatedWav(const std::string& dir) {
    // The header promises 3 s; the file holds one.
    WriteFile(dir + "/cut.wav", WavBytes(MakeNoise(44100, 8), 3 * 44100 * 4));
    return dir + "/cut.wav";
}
std::string GarbageMp3(const std::string& dir) {
    std::string bytes = "\xFF\xFB\x90\x64";
    Pcm noise = MakeNoise(20000, 9);
    bytes.append(reinterpret_cast<const char*>(noise.samples.data()), noise.samples.size() * 2);
    WriteFile(dir + "/garbage.mp3", bytes);
    return dir + "/garbage.mp3";
}
std::string Missing(const std::string& dir) { return dir + "/nowhere.wav"; }
std::string SheetWithoutAudio(const std::string& dir) {
    WriteFile(dir + "/lost.cue", "FILE \"lost.wav\" WAVE\n  TRACK 01 AUDIO\n    INDEX 01 00:00:00\n");
    return dir + "/lost.cue|1";
}
std::string TrackOutOfRange(const std::string& dir) {
    WriteFile(dir + "/one.cue", "FILE \"good.wav\" WAVE\n  TRACK 01 AUDIO\n    INDEX 01 00:00:00\n");
    return dir + "/one.cue|2";
}
std::string TrackPastTheAudio(const std::string& dir) {
    WriteFile(dir + "/far.cue", "FILE \"good.wav\" WAVE\n  TRACK 01 AUDIO\n    INDEX 01 00:00:00\n"
                                "  TRACK 02 AUDIO\n    INDEX 01 00:00:50\n  TRACK 03 AUDIO\n"
                                "    INDEX 01 00:05:00\n");
    return dir + "/far.cue|2";
}

class CttBadInput : public CttErrors, public ::testing::WithParamInterface<BadInputCase> {};

TEST_P(CttBadInput, FailsCleanly) {
    const std::string input = GetParam().make(m_dir.Path());
    const std::string out = m_dir / "out.mp3";
    ExpectFailure(RunCtt(input, {"-acodec", "mp3"}, out), out, GetParam().errorPart);
}

INSTANTIATE_TEST_SUITE_P(
    Table, CttBadInput,
    ::testing::Values(BadInputCase{"TextNamedMp3", TextFile, "\""},
                      BadInputCase{"Empty", EmptyFile, "empty.wav"},
                      BadInputCase{"Truncated", TruncatedWav, "truncated"},
                      BadInputCase{"Garbage", GarbageMp3, ""},
                      BadInputCase{"Missing", Missing, "does not exist"},
                      BadInputCase{"CueFileMissing", SheetWithoutAudio, "lost.wav"},
                      BadInputCase{"CueTrackOutOfRange", TrackOutOfRange, "track 2"},
                      BadInputCase{"CueTrackPastTheAudio", TrackPastTheAudio, "ends before"}),
    [](const auto& info) { return std::string(info.param.name); });

struct BadCommandCase {
    const char* name;
    std::vector<std::string> options;
    const char* output;  // relative to the folder
    const char* errorPart;
};

class CttBadCommand : public CttErrors, public ::testing::WithParamInterface<BadCommandCase> {};

TEST_P(CttBadCommand, FailsCleanly) {
    const std::string out = m_dir / GetParam().output;
    ExpectFailure(RunCtt(m_good, GetParam().options, out), out, GetParam().errorPart);
}

INSTANTIATE_TEST_SUITE_P(
    Table, CttBadCommand,
    ::testing::Values(
        BadCommandCase{"UnknownOption", {"-bogus", "1"}, "o.mp3", "unknown option"},
        BadCommandCase{"SenselessRate", {"-ar", "banana"}, "o.mp3", "-ar"},
        BadCommandCase{"CodecNotInFormat", {"-acodec", "mp3"}, "o.ogg", "does not fit"},
        BadCommandCase{"CodecNotInForcedFormat", {"-acodec", "vorbis", "-f", "mp3"}, "o.mp3", "does not fit"},
        BadCommandCase{"RateTheCodecLacks", {"-acodec", "mp3", "-ar", "96000"}, "o.mp3", "96000"},
        BadCommandCase{"UnknownExtension", {}, "o.xyz", "format"},
        BadCommandCase{"NoFolder", {}, "missing/o.mp3", "does not exist"},
        BadCommandCase{"StartPastTheEnd", {"-ss", "5"}, "o.wav", "beyond the end"}),
    [](const auto& info) { return std::string(info.param.name); });

TEST_F(CttErrors, ReadOnlyFolder) {
    if (geteuid() == 0) {
        GTEST_SKIP() << "root writes everywhere";
    }
    const std::string locked = m_dir / "locked";
    ASSERT_EQ(mkdir(locked.c_str(), 0555), 0);
    const std::string out = locked + "/o.mp3";
    const ToolResult r = RunCtt(m_good, {}, out);
    EXPECT_NE(r.exitCode, 0);
    EXPECT_NE(r.err.find("cannot be written"), std::string::npos) << r.err;
    EXPECT_FALSE(std::filesystem::exists(out));
    chmod(locked.c_str(), 0755);
}

TEST_F(CttErrors, ClosedStdoutEndsTheToolWithoutDebris) {
    const std::string longWav = m_dir / "long.wav";
    WriteWav(longWav, MakeNoise(120 * 44100, 10));
    const std::string out = m_dir / "o.mp3";
    const ToolResult r = RunTool(CttPath(), {"-relk", "-y", "-i", longWav, "-acodec", "mp3", out},
                                 60, /*closeStdoutAfter=*/0);
    EXPECT_FALSE(r.timedOut);
    EXPECT_GT(r.exitCode, 0) << "a signal death shows as -1";
    EXPECT_LT(r.seconds, 20);
    ExpectNothingLeft(m_dir.Path(), out);
}

TEST_F(CttErrors, ExistingOutputSurvivesAFailedReplace) {
    const std::string out = m_dir / "keep.mp3";
    WriteFile(out, "old");
    const ToolResult r = RunCtt(m_dir / "nowhere.wav", {}, out);
    EXPECT_NE(r.exitCode, 0);
    EXPECT_EQ(ReadFile(out), "old");
}

}  // namespace
}  // namespace ac::test
