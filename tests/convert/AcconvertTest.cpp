// acconvert end to end: the real program over fake tools for the failure paths, and over the
// real ctt for real conversions. Skipped while either is not built.

#include "platform/ChildProcess.h"

#include "../support/RunTool.h"
#include "../support/TempDir.h"
#include "platform/PartFiles.h"
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

// Seconds of 16-bit silence, stereo at 44.1 kHz unless told otherwise.
void WriteWav(const std::string& path, int seconds = 1, std::uint32_t rate = 44100,
              std::uint32_t channels = 2) {
    const std::uint32_t bytes = rate * channels * 2 * static_cast<std::uint32_t>(seconds);
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
        if (::access(kAcconvert.c_str(), X_OK) != 0)
            GTEST_SKIP() << "acconvert is not built";
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
    void TearDown() override { ::unsetenv("AC_CTT_PATH"); }
    void UseFakeTool(const std::string& body) {
        ::setenv("AC_CTT_PATH", test::WriteScript(dir / "fake-ctt", body).c_str(), 1);
    }
    std::string Args(const std::vector<std::string>& files, int jobs = 2) {
        std::string text = "\"" + kAcconvert + "\" --profile \"" + profile + "\" --jobs " +
                           std::to_string(jobs) + " --out \"" + out + "\"";
        for (const auto& file : files)
            text += " \"" + file + "\"";
        return text;
    }
    std::vector<std::string> Outputs() {
        std::vector<std::string> names;
        for (auto& entry : fs::directory_iterator(out))
            names.push_back(entry.path().filename());
        std::sort(names.begin(), names.end());
        return names;
    }
    // The argument list for RunTool, where words need no quoting.
    std::vector<std::string> Argv(const std::vector<std::string>& files, int jobs = 2) {
        std::vector<std::string> argv = {"--profile", profile, "--jobs", std::to_string(jobs), "--out", out};
        argv.insert(argv.end(), files.begin(), files.end());
        return argv;
    }
    static bool HasCtt() { return ::access(kCtt.c_str(), X_OK) == 0; }
    // Waits until `count` part files stand in the output folder and answers their writers.
    std::vector<int> WaitForPartFiles(std::size_t count) {
        for (int i = 0; i < 3000; ++i) {
            std::vector<int> pids;
            for (auto& entry : fs::directory_iterator(out)) {
                const std::string name = entry.path().filename();
                const std::size_t tag = name.rfind(".ctt");
                if (name.ends_with(".part") && tag != std::string::npos)
                    pids.push_back(std::atoi(name.c_str() + tag + 4));
            }
            if (pids.size() >= count)
                return pids;
            std::this_thread::sleep_for(std::chrono::milliseconds(10));
        }
        return {};
    }
    test::TempDir dir;
    std::string out = dir / "out";
    std::string profile = dir / "test.pf";
};

TEST_F(AcconvertTest, CtrlCEndsTheChildrenAndLeavesNoPartialOutput) {
    // Writes a partial output under the final name (the last word), then hangs.
    UseFakeTool("for last; do :; done; printf partial > \"$last\"; echo $$ >> '" + dir / "pids" +
                "'; echo started >> '" + dir / "log" + "'; exec sleep 600\n");
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
    std::ifstream pids(dir / "pids");
    for (int pid; pids >> pid;)
        EXPECT_TRUE(test::ProcessState(pid) == '?' || test::ProcessState(pid) == 'Z') << pid;
}

TEST_F(AcconvertTest, ExitsZeroOnlyWhenEveryFileCompleted) {
    UseFakeTool(
        "for last; do :; done\ncase \"$*\" in *bad.wav*) exit 3;; esac\n"
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
    if (::access(kCtt.c_str(), X_OK) != 0)
        GTEST_SKIP() << "ctt is not built";
    WriteWav(dir / "one.wav");
    WriteWav(dir / "album.wav", 4);
    std::ofstream(dir / "album.cue")
        << "PERFORMER \"Artist\"\nTITLE \"Album\"\n"
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
    for (const auto& name : Outputs())
        EXPECT_GT(fs::file_size(out + "/" + name), 0u) << name;
}

// Inputs that all map to one output name, run four at a time, and names holding every byte a
// file name can: each converts into a file of its own.
TEST_F(AcconvertTest, EveryInputGetsItsOwnCompleteOutputWhateverItsName) {
    if (!HasCtt())
        GTEST_SKIP() << "ctt is not built";
    std::vector<std::string> files;
    for (int i = 0; i < 12; ++i) {
        fs::create_directories(dir / ("d" + std::to_string(i)));
        files.push_back(dir / ("d" + std::to_string(i)) + "/same.wav");
        WriteWav(files.back());
    }
    const std::vector<std::string> hostile = {"12\" Mix", "it's \"quoted\"", "back\\slash",
                                              "new\nline", "-dash", "bad\xff\xfe", "vt\x0B\x10"};
    for (const std::string& name : hostile) {
        files.push_back(dir / (name + ".wav"));
        WriteWav(files.back());
    }
    const test::ToolResult run = test::RunTool(kAcconvert, Argv(files, 4), 300);
    EXPECT_EQ(run.exitCode, 0) << run.out << run.err;
    const std::vector<std::string> names = Outputs();
    EXPECT_EQ(names.size(), files.size()) << run.out;
    for (int i = 0; i < 12; ++i) {
        const std::string name = i == 0 ? "same.mp3" : "same-" + std::to_string(i) + ".mp3";
        EXPECT_TRUE(std::count(names.begin(), names.end(), name)) << name;
    }
    // The illegal characters of a name are dropped; every other byte stays.
    for (const char* name : {"12\" Mix.mp3", "backslash.mp3", "new\nline.mp3", "bad\xff\xfe.mp3", "vt\x0B\x10.mp3"})
        EXPECT_TRUE(std::count(names.begin(), names.end(), name)) << name;
    for (const std::string& name : names)
        EXPECT_GT(fs::file_size(out + "/" + name), 1000u) << name;
}

// Stopped by Ctrl-C, by kill, or killed outright: the tools end and no part file stays.
TEST_F(AcconvertTest, AStoppedOrKilledRunLeavesNothingInTheOutputFolder) {
    if (!HasCtt())
        GTEST_SKIP() << "ctt is not built";
    WriteWav(dir / "long.wav", 240);
    for (int signal : {SIGINT, SIGTERM, SIGKILL}) {
        Program program;
        ASSERT_TRUE(program.Launch(Args({dir / "long.wav", dir / "long.wav"})));
        const std::vector<int> writers = WaitForPartFiles(2);
        ASSERT_EQ(writers.size(), 2u) << program.Output();
        ::kill(program.ProcessId(), signal);
        program.WaitForExit();
        if (signal != SIGKILL) {
            EXPECT_EQ(program.ExitCode(), 130) << program.Output();
        }
        // Orphaned by SIGKILL, a tool notices at its next progress line that nobody reads.
        for (int pid : writers)
            EXPECT_TRUE(test::WaitForProcessState(pid, '?') || test::ProcessState(pid) == 'Z') << pid;
        EXPECT_TRUE(Outputs().empty()) << signal << ": " << (Outputs().empty() ? "" : Outputs()[0]);
    }
}

// A tool that ignores the request to end is killed after the grace period; its part file goes.
TEST_F(AcconvertTest, AToolThatIgnoresTheStopIsKilledAndItsPartFileRemoved) {
    UseFakeTool("trap '' TERM\nfor last; do :; done\n: > \"$(dirname \"$last\")/.$(basename \"$last\").ctt$$.part\"\n"
                "echo started >> '" + dir / "log" + "'\nwhile :; do sleep 0.05; done\n");
    WriteWav(dir / "a.wav");
    Program program;
    ASSERT_TRUE(program.Launch(Args({dir / "a.wav"})));
    ASSERT_EQ(WaitForPartFiles(1).size(), 1u) << program.Output();
    ::kill(program.ProcessId(), SIGINT);
    program.WaitForExit();
    EXPECT_EQ(program.ExitCode(), 130) << program.Output();
    EXPECT_TRUE(Outputs().empty());
}

// A real ripper's sheet that the strict reader refuses (REM DATE 1991) still gives its tracks,
// in Windows-1252 as the ripper wrote it.
TEST_F(AcconvertTest, RealCueSheetsRefusedByTheStrictReaderConvertTrackByTrack) {
    if (!HasCtt())
        GTEST_SKIP() << "ctt is not built";
    fs::copy_file(std::string(AC_CORPUS_DIR) + "/cue/rcue_good.cue", dir / "album.cue");
    WriteWav(dir / "My Bloody Valentine - Loveless.wav", 262, 8000, 1);
    const test::ToolResult run = test::RunTool(kAcconvert, Argv({dir / "album.cue"}), 300);
    EXPECT_EQ(run.exitCode, 0) << run.out << run.err;
    EXPECT_EQ(Outputs(), (std::vector<std::string>{"Loomer.mp3", "Only Shallow.mp3"})) << run.out;
    // A sheet that neither reader reads names itself and the line.
    std::ofstream(dir / "junk.cue") << "THIS IS\nNOT A SHEET\n";
    const test::ToolResult junk = test::RunTool(kAcconvert, Argv({dir / "junk.cue"}), 60);
    EXPECT_EQ(junk.exitCode, 1);
    EXPECT_NE(junk.err.find(dir / "junk.cue"), std::string::npos) << junk.err;
    EXPECT_NE(junk.err.find("line 2"), std::string::npos) << junk.err;
}

// The terminal tool behaves as terminal tools do: help on standard output, plain reasons for
// inputs it cannot use, the library's own chatter kept off the terminal, 100% for a finished run.
TEST_F(AcconvertTest, HelpReasonsAndTheFinalPercent) {
    const test::ToolResult help = test::RunTool(kAcconvert, {"--help"}, 60);
    EXPECT_EQ(help.exitCode, 0);
    EXPECT_EQ(help.out.rfind("usage: acconvert", 0), 0u) << help.out;
    EXPECT_NE(help.out.find("  mp3 "), std::string::npos) << "the profiles are listed";
    EXPECT_EQ(help.err, "");

    fs::create_directories(dir / "folder");
    std::ofstream(dir / "junk.mp3") << "no MPEG stream here";
    std::ofstream(dir / "file") << "x";
    UseFakeTool("for last; do :; done\necho '|Time>>> 0.99'; printf mp3 > \"$last\"\n");
    WriteWav(dir / "good.wav");
    const test::ToolResult run = test::RunTool(
        kAcconvert, Argv({dir / "good.wav", dir / "missing.wav", dir / "folder", dir / "junk.mp3"}), 60);
    EXPECT_EQ(run.exitCode, 1);
    EXPECT_NE(run.err.find(dir / "missing.wav" + ": no such file"), std::string::npos) << run.err;
    EXPECT_NE(run.err.find(dir / "folder" + ": is a folder"), std::string::npos) << run.err;
    EXPECT_NE(run.err.find("not a media file that can be read"), std::string::npos) << run.err;
    EXPECT_EQ(run.err.find("Invalid data"), std::string::npos) << "FFmpeg's own log: " << run.err;
    EXPECT_NE(run.out.find("done: " + dir / "good.wav"), std::string::npos) << run.out;
    EXPECT_NE(run.out.find("(all 100%)"), std::string::npos) << run.out;

    const test::ToolResult notFolder = test::RunTool(kAcconvert, {"--out", dir / "file", dir / "good.wav"}, 60);
    EXPECT_EQ(notFolder.exitCode, 2);
    EXPECT_NE(notFolder.err.find("is not a folder"), std::string::npos) << notFolder.err;
}

}  // namespace
}  // namespace ac
