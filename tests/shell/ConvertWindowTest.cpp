// The convert mode end to end in the real program: files added through the list panel, encoded
// by the real ctt (or a fake tool where a run must last), checked by probing the outputs; the
// questions, the stop paths and the after-run countdown. Runs under xvfb-run.

#include "../support/AudioFixtures.h"
#include "../support/ProgramHarness.h"
#include "../support/RunTool.h"

#include <gtest/gtest.h>

#include <sys/stat.h>

#include <algorithm>
#include <cstdlib>
#include <filesystem>
#include <thread>

namespace {

using namespace std::chrono_literals;
using ac::test::Program;
using ac::test::State;

// The rows the program reports: name, duration, type, target, status text, checked, selected,
// source and status number, separated by tabs.
std::vector<std::vector<std::string>> Rows(const State& state) {
    std::vector<std::vector<std::string>> rows;
    for (int i = 0;; ++i) {
        auto found = state.find("row" + std::to_string(i));
        if (found == state.end()) {
            return rows;
        }
        std::vector<std::string> fields;
        std::string field;
        std::istringstream in(found->second);
        while (std::getline(in, field, '\t')) {
            fields.push_back(field);
        }
        rows.push_back(fields);
    }
}

std::string Field(const State& state, const std::string& key) {
    auto found = state.find(key);
    return found == state.end() ? std::string() : found->second;
}

enum Job { kIdle = 0, kRunning = 1, kWaiting = 2, kPaused = 3, kPending = 4, kCompleted = 5,
           kAborted = 6, kUnknownFile = 7 };

int Status(const State& state, int row) {
    const auto rows = Rows(state);
    return row < static_cast<int>(rows.size()) && rows[std::size_t(row)].size() > 8
               ? std::atoi(rows[std::size_t(row)][8].c_str())
               : -2;
}

bool AllRowsAre(const State& state, int status, std::size_t count) {
    const auto rows = Rows(state);
    if (rows.size() != count) {
        return false;
    }
    for (std::size_t i = 0; i < rows.size(); ++i) {
        if (Status(state, static_cast<int>(i)) != status) {
            return false;
        }
    }
    return true;
}

// acprobe answers {"ok":true,...,"hours":0,"minutes":0,"seconds":3,"microseconds":12000,...}.
double ProbedSeconds(const std::string& path) {
    const ac::test::ToolResult probe = ac::test::RunTool(AC_BIN_DIR "/acprobe", {path});
    if (probe.out.find("\"ok\":true") == std::string::npos) {
        return -1.0;
    }
    auto number = [&](const std::string& key) {
        const auto at = probe.out.find("\"" + key + "\":");
        return at == std::string::npos ? 0.0 : std::atof(probe.out.c_str() + at + key.size() + 3);
    };
    return number("hours") * 3600 + number("minutes") * 60 + number("seconds") +
           number("microseconds") / 1e6;
}

class ConvertWindowTest : public ::testing::Test {
protected:
    void SetUp() override {
        ASSERT_NE(::getenv("DISPLAY"), nullptr) << "run under xvfb-run";
        std::filesystem::create_directories(m_home / "in");
        ::unsetenv("AC_CTT_PATH");
    }
    void TearDown() override { ::unsetenv("AC_CTT_PATH"); }

    std::string Wav(const std::string& name, double seconds, std::uint32_t seed) {
        const std::string path = m_home / ("in/" + name);
        ac::test::WriteWav(path, ac::test::MakeNoise(std::size_t(seconds * 44100), seed));
        return path;
    }
    // A tool that reports progress for about ten seconds, so that a run can be paused and
    // stopped while it lasts; the program is pointed at it through AC_CTT_PATH.
    void UseSlowTool() {
        const std::string tool = m_home / "slow-ctt";
        std::ofstream(tool)
            << "#!/bin/sh\ni=0\n"
               "while [ $i -lt 100 ]; do echo \"|Time>>> $i\"; i=$((i+1)); sleep 0.1; done\n"
               "exit 0\n";
        ::chmod(tool.c_str(), 0755);
        ::setenv("AC_CTT_PATH", tool.c_str(), 1);
    }
    std::string PowerLog() const { return Program::Slurp(m_home / "power.txt"); }

    ac::test::TempDir m_home;
};

TEST_F(ConvertWindowTest, EncodesAddedFilesAndAsksBeforeEncodingThemAgain) {
    const std::string first = Wav("first take.wav", 3.0, 1);
    const std::string second = Wav("second.wav", 2.0, 2);
    Program program(m_home);
    program.WaitShown();
    program.Send("outdir " + (m_home / "out"));
    program.Send("add " + first);
    program.Send("add " + second);
    State state = program.WaitFor([](const State& s) { return Rows(s).size() == 2; });
    ASSERT_EQ(Rows(state).size(), 2u);
    EXPECT_EQ(Rows(state)[0][0], "first take");
    EXPECT_EQ(Rows(state)[0][1], "00:00:03");
    EXPECT_EQ(Rows(state)[0][2], "wav");
    EXPECT_EQ(Rows(state)[0][5], "1") << "a new row is checked";

    program.Send("command 32776");
    state = program.WaitFor([](const State& s) { return AllRowsAre(s, kCompleted, 2); }, 60s);
    ASSERT_TRUE(AllRowsAre(state, kCompleted, 2)) << state["row0"] << " / " << state["row1"];
    EXPECT_NEAR(ProbedSeconds(m_home / "out/first take.mp3"), 3.0, 0.1);
    EXPECT_NEAR(ProbedSeconds(m_home / "out/second.mp3"), 2.0, 0.1);

    // Encoding finished rows again asks first; No leaves them as they are.
    program.Send("answer no");
    program.Send("command 32776");
    state = program.WaitFor([](const State& s) {
        return s.count("boxes") && s.at("boxes").find("re-encode") != std::string::npos;
    });
    EXPECT_NE(state["boxes"].find("Do you want to re-encode them?"), std::string::npos);
    std::this_thread::sleep_for(1s);
    EXPECT_TRUE(AllRowsAre(program.ReadState(), kCompleted, 2));
}

// Two jobs at a time, three sources of one name: the third starts while the second still
// writes its hidden part file, and must not take the second's name. Then Stop during a run of
// two leaves nothing in the output folder.
TEST_F(ConvertWindowTest, RunningJobsNeverShareANameAndStopLeavesNothingBehind) {
    ac::test::WriteSettings(m_home, "max_running_processes=dword:2\nmax_processes=dword:2\n");
    std::vector<std::string> sources;
    for (double seconds : {1.0, 40.0, 1.0}) {
        const std::string folder = "d" + std::to_string(sources.size());
        std::filesystem::create_directories(m_home / ("in/" + folder));
        sources.push_back(Wav(folder + "/a.wav", seconds, 30 + static_cast<std::uint32_t>(sources.size())));
    }
    Program program(m_home);
    program.WaitShown();
    const std::string out = m_home / "out";
    program.Send("outdir " + out);
    for (const std::string& source : sources) {
        program.Send("add " + source);
    }
    program.WaitFor([](const State& s) { return Rows(s).size() == 3; });
    program.Send("command 32776");
    State state = program.WaitFor([](const State& s) { return AllRowsAre(s, kCompleted, 3); }, 90s);
    ASSERT_TRUE(AllRowsAre(state, kCompleted, 3)) << state["row0"] << " / " << state["row2"];
    EXPECT_NEAR(ProbedSeconds(out + "/a.mp3"), 1.0, 0.1);
    EXPECT_NEAR(ProbedSeconds(out + "/a-1.mp3"), 40.0, 0.1);
    EXPECT_NEAR(ProbedSeconds(out + "/a-2.mp3"), 1.0, 0.1);

    program.Send("command 32773");  // Clear
    program.WaitFor([](const State& s) { return Rows(s).empty(); });
    const std::string longOne = Wav("long one.wav", 240.0, 40);
    const std::string longTwo = Wav("long two.wav", 240.0, 41);
    program.Send("add " + longOne);
    program.Send("add " + longTwo);
    program.WaitFor([](const State& s) { return Rows(s).size() == 2; });
    program.Send("command 32776");
    auto partFiles = [&] {
        int count = 0;
        for (const auto& entry : std::filesystem::directory_iterator(out)) {
            count += entry.path().filename().string().ends_with(".part");
        }
        return count;
    };
    state = program.WaitFor([&](const State& s) { return AllRowsAre(s, kRunning, 2) && partFiles() == 2; });
    ASSERT_TRUE(AllRowsAre(state, kRunning, 2));
    program.Send("answer yes");
    program.Send("command 32778");
    state = program.WaitFor([](const State& s) { return AllRowsAre(s, kAborted, 2); });
    EXPECT_TRUE(AllRowsAre(state, kAborted, 2));
    std::vector<std::string> left;
    for (const auto& entry : std::filesystem::directory_iterator(out)) {
        left.push_back(entry.path().filename());
    }
    std::sort(left.begin(), left.end());
    EXPECT_EQ(left, (std::vector<std::string>{"a-1.mp3", "a-2.mp3", "a.mp3"}));
}

// A run with a failing row and an unreadable one: the status text tallies the run, gives the
// tabs back, and a selected failed or unknown row says why, in the text and in its log.
TEST_F(ConvertWindowTest, FailedRowsSayWhyAndTheEndOfARunGivesTheTabsBack) {
    const std::string good = Wav("good.wav", 1.0, 50);
    const std::string cut = Wav("cut short.wav", 2.0, 51);
    std::filesystem::resize_file(cut, std::filesystem::file_size(cut) / 2);
    const std::string junk = m_home / "in/junk.mp3";
    std::ofstream(junk) << "no MPEG stream here";
    Program program(m_home);
    program.WaitShown();
    program.Send("outdir " + (m_home / "out"));
    for (const std::string& file : {good, cut, junk}) {
        program.Send("add " + file);
    }
    program.WaitFor([](const State& s) { return Rows(s).size() == 3; });
    program.Send("command 32776");
    State state = program.WaitFor([](const State& s) {
        return Status(s, 0) == kCompleted && Status(s, 1) == -1 &&
               Field(s, "statustext").rfind("Finished", 0) == 0;
    }, 60s);
    EXPECT_EQ(Field(state, "statustext"), "Finished: 1 completed, 1 failed");
    EXPECT_NE(Field(state, "tabs").find("Rip+"), std::string::npos) << Field(state, "tabs");
    EXPECT_NE(Field(state, "tabs").find("Burn+"), std::string::npos) << Field(state, "tabs");

    program.Send("select 1");
    state = program.WaitFor([](const State& s) { return Field(s, "statustext").find("Finished") == std::string::npos; });
    EXPECT_NE(Field(state, "statustext"), "");
    EXPECT_NE(Field(state, "log").find(Field(state, "statustext")), std::string::npos) << Field(state, "log");

    program.Send("select 2");
    state = program.WaitFor([](const State& s) { return Field(s, "statustext").find("junk.mp3") != std::string::npos; });
    EXPECT_EQ(Field(state, "statustext"), "not a media file that can be read: " + junk);
    EXPECT_NE(Field(state, "log").find("not a media file"), std::string::npos);
}

TEST_F(ConvertWindowTest, UnreadableFilesAndCueSheetsBecomeRows) {
    const std::string junk = m_home / "in/not audio.mp3";
    std::ofstream(junk) << "this is no MPEG stream";
    const std::string album = Wav("album.wav", 9.0, 3);
    const std::string cue = m_home / "in/album.cue";
    std::ofstream(cue) << "TITLE \"Album\"\nFILE \"album.wav\" WAVE\n"
                          "  TRACK 01 AUDIO\n    TITLE \"One\"\n    INDEX 01 00:00:00\n"
                          "  TRACK 02 AUDIO\n    TITLE \"Two\"\n    INDEX 01 00:03:00\n"
                          "  TRACK 03 AUDIO\n    TITLE \"Three\"\n    INDEX 01 00:06:00\n";
    Program program(m_home);
    program.WaitShown();
    program.Send("outdir " + (m_home / "out"));
    program.Send("add " + junk);
    program.Send("add " + cue);
    const State state = program.WaitFor([](const State& s) { return Rows(s).size() == 4; });
    const auto rows = Rows(state);
    ASSERT_EQ(rows.size(), 4u);
    EXPECT_EQ(rows[0][4], "Unknown file");
    EXPECT_EQ(Status(state, 0), kUnknownFile);
    EXPECT_EQ(rows[1][2], "cue|1");
    EXPECT_EQ(rows[1][0], "One");
    EXPECT_EQ(rows[3][0], "Three");
    EXPECT_EQ(rows[1][7], cue + "|1");
    EXPECT_EQ(rows[3][7], cue + "|3");

    // The cue tracks encode to the parts of the one file they cut.
    program.Send("command 33056");
    program.Send("command 32776");
    const State done = program.WaitFor(
        [](const State& s) { return Status(s, 3) == kCompleted && Status(s, 1) == kCompleted; },
        60s);
    EXPECT_EQ(Status(done, 3), kCompleted);
    EXPECT_NEAR(ProbedSeconds(m_home / "out/Three.mp3"), 3.0, 0.2);
}

TEST_F(ConvertWindowTest, PauseResumesAndTheMenuStopSkipsTheAfterRunAction) {
    UseSlowTool();
    ac::test::WriteSettings(m_home, "afterconvert=dword:0\n");
    const std::string a = Wav("a.wav", 1.0, 4);
    const std::string b = Wav("b.wav", 1.0, 5);
    Program program(m_home);
    program.WaitShown();
    program.Send("outdir " + (m_home / "out"));
    program.Send("add " + a);
    program.Send("add " + b);
    program.WaitFor([](const State& s) { return Rows(s).size() == 2; });
    program.Send("command 32776");
    State state = program.WaitFor([](const State& s) { return Status(s, 0) == kRunning; });
    ASSERT_EQ(Status(state, 0), kRunning);
    EXPECT_EQ(Status(state, 1), kWaiting) << "one child runs at a time";

    program.Send("command 32777");
    state = program.WaitFor([](const State& s) { return Status(s, 0) == kPaused; });
    EXPECT_EQ(Status(state, 0), kPaused);
    program.Send("command 32776");
    state = program.WaitFor([](const State& s) { return Status(s, 0) == kRunning; });
    EXPECT_EQ(Status(state, 0), kRunning);

    program.Send("answer yes");
    program.Send("command 32778");
    state = program.WaitFor([](const State& s) { return Status(s, 0) == kAborted; });
    EXPECT_EQ(Status(state, 0), kAborted);
    std::this_thread::sleep_for(2s);
    EXPECT_EQ(program.ReadState()["countdown"], "0") << "the menu's stop forgets the run";
    EXPECT_EQ(PowerLog(), "");
}

TEST_F(ConvertWindowTest, TheStopButtonEndsTheRunWithTheCountdownWhichCanBeCancelled) {
    UseSlowTool();
    ac::test::WriteSettings(m_home, "afterconvert=dword:0\n");
    const std::string a = Wav("a.wav", 1.0, 6);
    Program program(m_home);
    program.WaitShown();
    program.Send("outdir " + (m_home / "out"));
    program.Send("add " + a);
    program.WaitFor([](const State& s) { return Rows(s).size() == 1; });

    for (const char* ending : {"cancel", "ok"}) {
        program.Send("command 32776");
        program.WaitFor([](const State& s) { return Status(s, 0) == kRunning; });
        program.Send("answer yes");
        program.Send("command 1012");
        State state = program.WaitFor([](const State& s) { return Field(s, "countdown") == "1"; });
        ASSERT_EQ(state["countdown"], "1") << "the button's stop keeps the after-run step";
        program.Send(std::string("dialog ") + ending);
        program.WaitFor([](const State& s) { return Field(s, "countdown") == "0"; });
        if (std::string(ending) == "cancel") {
            std::this_thread::sleep_for(500ms);
            EXPECT_EQ(PowerLog(), "");
        }
    }
    program.WaitFor([this](const State&) { return !PowerLog().empty(); });
    EXPECT_EQ(PowerLog(), "poweroff\n");
}

TEST_F(ConvertWindowTest, AGridEditReachesEverySelectedRowAndIsEncodedWithIt) {
    Program program(m_home);
    program.WaitShown();
    program.Send("outdir " + (m_home / "out"));
    for (int i = 0; i < 3; ++i) {
        program.Send("add " + Wav("r" + std::to_string(i) + ".wav", 1.0, 20 + i));
    }
    program.WaitFor([](const State& s) { return Rows(s).size() == 3; });
    program.Send("command 33055");  // Select All: the sets reach the grid after the 500 ms timer
    std::this_thread::sleep_for(1s);
    program.Send("grid ab 96");
    const State state = program.WaitFor([](const State& s) {
        return Field(s, "set0").find("ab:96;") != std::string::npos &&
               Field(s, "set2").find("ab:96;") != std::string::npos;
    });
    for (const char* key : {"set0", "set1", "set2"}) {
        EXPECT_NE(Field(state, key).find("ab:96;"), std::string::npos) << Field(state, key);
    }
    program.Send("command 32776");
    program.WaitFor([](const State& s) { return AllRowsAre(s, kCompleted, 3); }, 60s);
    const ac::test::ToolResult probe =
        ac::test::RunTool(AC_BIN_DIR "/acprobe", {m_home / "out/r1.mp3"});
    EXPECT_NE(probe.out.find("\"bitRate\":96000"), std::string::npos) << probe.out;
}

bool HasProfile(const State& state, const std::string& name) {
    return Field(state, "profiles_list").find("|" + name + "  (*.") != std::string::npos;
}

TEST_F(ConvertWindowTest, UserProfilesSavedRenamedAndDeletedStayThatWayAfterARestart) {
    {
        Program program(m_home);
        program.WaitFor([](const State& s) { return Field(s, "profiles") > "0"; });
        program.Send("saveas");
        program.Send("dialogtext Night Drive");
        program.Send("dialog ok");
        const State saved =
            program.WaitFor([](const State& s) { return HasProfile(s, "Night Drive"); });
        ASSERT_TRUE(HasProfile(saved, "Night Drive")) << Field(saved, "profiles_list");
        program.Send("close");
        ASSERT_TRUE(program.WaitForExit());
    }
    {
        Program program(m_home);
        const State loaded =
            program.WaitFor([](const State& s) { return HasProfile(s, "Night Drive"); });
        ASSERT_TRUE(HasProfile(loaded, "Night Drive")) << "saved in user.pkg";
        const std::string list = Field(loaded, "profiles_list");
        const int index = static_cast<int>(std::count(list.begin(), list.begin() +
                                                      static_cast<long>(list.find("|Night Drive")),
                                                      '|'));
        program.Send("profile " + std::to_string(index));
        program.Send("rename");
        program.Send("dialogtext Long Drive");
        program.Send("dialog ok");
        const State renamed =
            program.WaitFor([](const State& s) { return HasProfile(s, "Long Drive"); });
        ASSERT_TRUE(HasProfile(renamed, "Long Drive"));
        program.Send("close");
        ASSERT_TRUE(program.WaitForExit());
    }
    {
        Program program(m_home);
        const State loaded =
            program.WaitFor([](const State& s) { return HasProfile(s, "Long Drive"); });
        ASSERT_TRUE(HasProfile(loaded, "Long Drive"));
        EXPECT_FALSE(HasProfile(loaded, "Night Drive"));
        const std::string list = Field(loaded, "profiles_list");
        const int index = static_cast<int>(std::count(list.begin(), list.begin() +
                                                      static_cast<long>(list.find("|Long Drive")),
                                                      '|'));
        program.Send("profile " + std::to_string(index));
        program.Send("answer yes");
        program.Send("delete");
        program.WaitFor([](const State& s) { return !HasProfile(s, "Long Drive"); });
        program.Send("close");
        ASSERT_TRUE(program.WaitForExit());
    }
    Program program(m_home);
    program.WaitFor([](const State& s) { return Field(s, "profiles") > "0"; });
    std::this_thread::sleep_for(500ms);
    EXPECT_FALSE(HasProfile(program.ReadState(), "Long Drive"));
}

TEST_F(ConvertWindowTest, ACrashingToolFailsOnlyItsRow) {
    // A tool that dies by a signal on one input and finishes the others.
    const std::string tool = m_home / "crashing-ctt";
    std::ofstream(tool) << "#!/bin/sh\ncase \"$*\" in *crash*) kill -SEGV $$ ;; esac\n"
                           "echo \"|Time>>> 1\"\nexit 0\n";
    ::chmod(tool.c_str(), 0755);
    ::setenv("AC_CTT_PATH", tool.c_str(), 1);
    const std::string bad = Wav("crash.wav", 1.0, 7);
    const std::string good = Wav("fine.wav", 1.0, 8);
    Program program(m_home);
    program.WaitShown();
    program.Send("outdir " + (m_home / "out"));
    program.Send("add " + bad);
    program.Send("add " + good);
    program.WaitFor([](const State& s) { return Rows(s).size() == 2; });
    program.Send("command 32776");
    const State state = program.WaitFor(
        [](const State& s) { return Status(s, 1) == kCompleted && Status(s, 0) != kRunning; });
    EXPECT_EQ(Status(state, 0), -1) << "failed";
    EXPECT_EQ(Status(state, 1), kCompleted);
    EXPECT_TRUE(program.Running());
}

TEST_F(ConvertWindowTest, ClosingDuringARunAsksAndNoKeepsItRunning) {
    UseSlowTool();
    const std::string a = Wav("a.wav", 1.0, 9);
    Program program(m_home);
    program.WaitShown();
    program.Send("outdir " + (m_home / "out"));
    program.Send("add " + a);
    program.WaitFor([](const State& s) { return Rows(s).size() == 1; });
    program.Send("command 32776");
    program.WaitFor([](const State& s) { return Status(s, 0) == kRunning; });

    program.Send("answer no");
    program.Send("command 32785");
    State state = program.WaitFor([](const State& s) {
        return Field(s, "boxes").find("Are you sure to stop encoding?") != std::string::npos;
    });
    std::this_thread::sleep_for(500ms);
    ASSERT_TRUE(program.Running());
    EXPECT_EQ(Status(program.ReadState(), 0), kRunning);

    program.Send("answer yes");
    program.Send("command 32785");
    EXPECT_TRUE(program.WaitForExit());
}

}  // namespace
