// acconvert end to end: the real program over fake tools for the failure paths, and over the
// real ctt for real conversions. Skipped while either is not built.

#include "platform/ChildProcess.h"

#include "../support/TempDir.h"
#include "FakeTool.h"

#include <gtest/gtest.h>

#include <chrono>
#include <csignal>
#include <cstdint>
#include <filesystem>
#include <fstream>
#include <mutex>
#include <thread>

namespace ac {
namespace {

namespace fs = std::filesystem;

const std::string kAcconvert = std::string(AC_BIN_DIR) + "/acconvert";
const std::string kCtt = std::string(AC_BIN_DIR) + "/ctt";

class Program : public platform::ImChildProcess {
public:
    ~Program() override { StopAndJoin(); }
    std::string Output() {
        std::lock_guard lock(m_mutex);
        return m_output;
    }

protected:
    void OnStdout(std::string_view text) override {
        std::lock_guard lock(m_mutex);
        m_output.append(text);
    }
    void OnStderr(std::string_view text) override { OnStdout(text); }

private:
    std::mutex m_mutex;
    std::string m_output;
};

// One second of 16-bit stereo silence at 44.1 kHz.
void WriteWav(const std::string& path, int seconds = 1) {
    const std::uint32_t rate = 44100, channels = 2, bytes = rate * channels * 2 * seconds;
    std::ofstream out(path, std::ios::binary);
    auto u32 = [&](std::uint32_t v) { out.write(reinterpret_cast<const char*>(&v), 4); };
    auto u16 = [&](std::uint16_t v) { out.write(reinterpret_cast<const char*>(&v), 2); };
    out.write("RIFF", 4);
    u32(36 + bytes);
    out.write("WAVEfmt ", 8);
    u32(16);
    u16(1);
    u16(channels);
    u32(rate);
    u32(rate * channels * 2);
    u16(channels * 2);
    u16(16);
    out.write("data", 4);
    u32(bytes);
    std::string silence(bytes, '\0');
    out.write(silence.data(), bytes);
}

class AcconvertTest : public ::testing::Test {
protected:
    void SetUp() override {
        if (::access(kAcconvert.c_str(), X_OK) != 0) GTEST_SKIP() << "acconvert is not built";
        // Settings and user profiles of the run stay in the temp folder.
        ::setenv("XDG_CONFIG_HOME", (dir / "config").c_str(), 1);
        ::setenv("XDG_DATA_HOME", (dir / "data").c_str(), 1);
        ::unsetenv("AC_CTT_PATH");
        fs::create_directories(out);
        // A profile of the test's own, so the run does not hang on what data.pkg holds.
        std::ofstream(profile) << "[Main]\nname=MP3 test\nFormat=mp3\nExtName=mp3\n"
                                  "[Parameter]\nacodec = 0, \"mp3\", \"mp3\"\n"
                                  "ab = 0, \"128\", \"128\"\nss = 0, \"0\", \"0\"\n";
    }
    void TearDown() override {
        ::unsetenv("AC_CTT_PATH");
    }
    void UseFakeTool(const std::string& body) {
        ::setenv("AC_CTT_PATH", test::WriteScript(dir / "fake-ctt", body).c_str(), 1);
    }
    std::string Args(const std::vector<std::string>& files, int jobs = 2) {
        std::string text = "\"" + kAcconvert + "\" --profile \"" + profile + "\" --jobs " + std::to_string(jobs) +
                           " --out \"" + out + "\"";
        for (const auto& file : files) text += " \"" + file + "\"";
        return text;
    }
    std::vector<std::string> Outputs() {
        std::vector<std::string> names;
        for (auto& entry : fs::directory_iterator(out)) names.push_back(entry.path().filename());
        std::sort(names.begin(), names.end());
        return names;
    }
    test::TempDir dir;
    std::string out = dir / "out";
    std::string profile = dir / "test.pf";
};

TEST_F(AcconvertTest, CtrlCEndsTheChildrenAndLeavesNoPartialOutput) {
    // Writes a partial output under the final name (the last word), then hangs.
    UseFakeTool("for last; do :; done; printf partial > \"$last\"; echo started >> '" + dir / "log" +
                "'; exec sleep 600\n");
    WriteWav(dir / "a.wav");
    WriteWav(dir / "b.wav");
    WriteWav(dir / "c.wav");
    Program program;
    ASSERT_TRUE(program.Launch(Args({dir / "a.wav", dir / "b.wav", dir / "c.wav"})));
    for (int i = 0; i < 2000 && test::ReadFile(dir / "log").size() < 16; ++i)
        std::this_thread::sleep_for(std::chrono::milliseconds(10));
    ASSERT_EQ(test::ReadFile(dir / "log"), "started\nstarted\n") << program.Output();
    ::kill(program.ProcessId(), SIGINT);
    program.WaitForExit();
    EXPECT_EQ(program.ExitCode(), 130) << program.Output();
    EXPECT_TRUE(Outputs().empty());
}

TEST_F(AcconvertTest, ExitsZeroOnlyWhenEveryFileCompleted) {
    UseFakeTool("for last; do :; done\ncase \"$*\" in *bad.wav*) exit 3;; esac\n"
                "echo '|Time>>> 1'; printf mp3 > \"$last\"\n");
    WriteWav(dir / "good.wav");
    WriteWav(dir / "bad.wav");
    {
        Program program;
        ASSERT_TRUE(program.Launch(Args({dir / "good.wav"})));
        program.WaitForExit();
        EXPECT_EQ(program.ExitCode(), 0) << program.Output();
        EXPECT_EQ(Outputs().size(), 1u);
    }
    Program program;
    ASSERT_TRUE(program.Launch(Args({dir / "good.wav", dir / "bad.wav", dir / "missing.wav"})));
    program.WaitForExit();
    EXPECT_EQ(program.ExitCode(), 1) << program.Output();
    EXPECT_NE(program.Output().find("FAILED"), std::string::npos);
}

TEST_F(AcconvertTest, RealConversionsOfFilesAndCueTracks) {
    if (::access(kCtt.c_str(), X_OK) != 0) GTEST_SKIP() << "ctt is not built";
    WriteWav(dir / "one.wav");
    WriteWav(dir / "album.wav", 4);
    std::ofstream(dir / "album.cue") << "PERFORMER \"Artist\"\nTITLE \"Album\"\n"
                                        "FILE \"album.wav\" WAVE\n"
                                        "  TRACK 01 AUDIO\n    TITLE \"First\"\n    INDEX 01 00:00:00\n"
                                        "  TRACK 02 AUDIO\n    TITLE \"Second\"\n    INDEX 01 00:02:00\n";
    Program program;
    ASSERT_TRUE(program.Launch(Args({dir / "one.wav", dir / "album.cue"})));
    program.WaitForExit();
    EXPECT_EQ(program.ExitCode(), 0) << program.Output();
    // Cue tracks are named by their titles, as the list names them.
    EXPECT_EQ(Outputs(), (std::vector<std::string>{"First.mp3", "Second.mp3", "one.mp3"}))
        << program.Output();
    for (const auto& name : Outputs()) EXPECT_GT(fs::file_size(out + "/" + name), 0u) << name;
}

}  // namespace
}  // namespace ac
