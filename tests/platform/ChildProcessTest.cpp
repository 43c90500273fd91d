#include "platform/ChildProcess.h"

#include "platform/PartFiles.h"

#include "../convert/FakeTool.h"
#include "../support/TempDir.h"

#include <gtest/gtest.h>

#include <chrono>
#include <filesystem>
#include <fstream>
#include <mutex>
#include <thread>
#include <sched.h>
#include <sstream>
#include <sys/resource.h>
#include <sys/wait.h>

namespace ac::platform {
namespace {

// Collects the raw output, and the exits with the code each one reported.
class Capture : public ImChildProcess {
public:
    ~Capture() override { StopAndJoin(); }
    std::string Out() {
        std::lock_guard lock(m_mutex);
        return m_out;
    }
    std::vector<int> Exits() {
        std::lock_guard lock(m_mutex);
        return m_exits;
    }

protected:
    void OnStdout(std::string_view text) override {
        std::lock_guard lock(m_mutex);
        m_out.append(text);
    }
    void OnExit(int code) override {
        std::lock_guard lock(m_mutex);
        m_exits.push_back(code);
    }

private:
    std::mutex m_mutex;
    std::string m_out;
    std::vector<int> m_exits;
};

class ChildProcessTest : public ::testing::Test {
protected:
    std::string Tool(const std::string& body) {
        return "\"" + test::WriteScript(dir / "child tool.sh", body) + "\"";
    }
    // Waits for a state without a timed assertion: the bound only keeps a broken run finite.
    template <typename Match>
    static bool WaitFor(int pid, Match match) {
        for (int i = 0; i < 2000; ++i) {
            if (match(test::ProcessState(pid)))
                return true;
            std::this_thread::sleep_for(std::chrono::milliseconds(5));
        }
        return false;
    }
    test::TempDir dir;
};

TEST_F(ChildProcessTest, WordsDirectoryAndExitCodeReachTheChild) {
    Capture child;
    child.SetCurrentDirectory(dir.Path());
    ASSERT_TRUE(
        child.Launch(Tool("printf '[%s]' \"$@\"; pwd; exit 7\n") + "  -i \"a b.wav\" \"\" last"));
    child.WaitForExit();
    EXPECT_EQ(child.Out(), "[-i][a b.wav][][last]" + dir.Path() + "\n");
    EXPECT_EQ(child.Exits(), std::vector<int>{7});
    EXPECT_FALSE(child.IsRunning());
}

// Fields of /proc/PID/stat behind the command's closing parenthesis, counted from 3 (the state).
std::vector<std::string> StatFields(int pid) {
    std::ifstream in("/proc/" + std::to_string(pid) + "/stat");
    std::string text((std::istreambuf_iterator<char>(in)), std::istreambuf_iterator<char>());
    std::istringstream rest(text.substr(text.rfind(')') + 2));
    std::vector<std::string> fields{"", "", ""};
    for (std::string field; rest >> field;) fields.push_back(field);
    return fields;
}

TEST_F(ChildProcessTest, BackgroundWorkRunsNicedAndIdleAndOrdinaryWorkDoesNot) {
    for (const bool background : {true, false}) {
        Capture child;
        child.SetBackgroundPriority(background, background);
        ASSERT_TRUE(child.Launch(Tool("exec sleep 60\n")));
        const std::vector<std::string> fields = StatFields(child.ProcessId());
        ASSERT_GT(fields.size(), 41u);
        const int own = ::getpriority(PRIO_PROCESS, 0);
        EXPECT_EQ(std::stoi(fields[19]), background ? std::max(own, 10) : own) << "nice";
        EXPECT_EQ(std::stoi(fields[41]), background ? SCHED_IDLE : SCHED_OTHER) << "policy";
        child.Kill(65535);
        child.WaitForExit();
    }
}

TEST_F(ChildProcessTest, KillReportsTheGivenCodeAndEndsTheWholeGroup) {
    Capture child;
    std::string marker = dir / "grandchild.pid";
    ASSERT_TRUE(child.Launch(Tool("sleep 60 & echo $! > '" + marker + "'; wait\n")));
    while (!std::ifstream(marker).good() || std::ifstream(marker).peek() == EOF)
        std::this_thread::sleep_for(std::chrono::milliseconds(5));
    int grandchild = 0;
    std::ifstream(marker) >> grandchild;
    child.Kill(65535);
    child.WaitForExit();
    EXPECT_EQ(child.Exits(), std::vector<int>{65535});
    EXPECT_TRUE(WaitFor(grandchild, [](char s) { return s == '?' || s == 'Z'; }))
        << "the sleeping grandchild survived";
}

TEST_F(ChildProcessTest, KillAfterTheEndKeepsTheRealCode) {
    Capture child;
    ASSERT_TRUE(child.Launch(Tool("exit 4\n")));
    child.WaitForExit();
    child.Kill(65535);
    EXPECT_EQ(child.ExitCode(), 4);
    EXPECT_EQ(child.Exits(), std::vector<int>{4});
}

TEST_F(ChildProcessTest, SuspendStopsAndResumeContinues) {
    Capture child;
    ASSERT_TRUE(child.Launch(Tool("exec sleep 600\n")));
    int pid = child.ProcessId();
    ASSERT_TRUE(child.Suspend());
    EXPECT_TRUE(WaitFor(pid, [](char s) { return s == 'T'; }));
    EXPECT_TRUE(child.IsRunning());
    ASSERT_TRUE(child.Resume());
    EXPECT_TRUE(WaitFor(pid, [](char s) { return s == 'S' || s == 'R'; }));
    // A stopped child still dies at once when killed.
    ASSERT_TRUE(child.Suspend());
    child.Kill(65535);
    child.WaitForExit();
    EXPECT_EQ(child.ExitCode(), 65535);
    // Nothing is left to stop, and that is no failure.
    EXPECT_TRUE(child.Suspend());
}

TEST_F(ChildProcessTest, GrandchildHoldingThePipesDoesNotHoldTheExit) {
    Capture child;
    ASSERT_TRUE(child.Launch(Tool("echo started; sleep 60 &\nexit 0\n")));
    child.WaitForExit();
    EXPECT_EQ(child.Exits(), std::vector<int>{0});
    EXPECT_EQ(child.Out(), "started\n");
}

TEST_F(ChildProcessTest, RelaunchesLeaveNoDescriptorsOrZombies) {
    Capture child;
    std::string tool = Tool("echo x; echo y >&2\n");
    ASSERT_TRUE(child.Launch(tool));
    child.WaitForExit();
    int before = test::CountOpenFds();
    for (int i = 0; i < 20; ++i) {
        ASSERT_TRUE(child.Launch(tool));
        child.WaitForExit();
    }
    EXPECT_EQ(test::CountOpenFds(), before);
    EXPECT_EQ(child.Exits().size(), 21u);
    // Every child was reaped by its waiter.
    EXPECT_EQ(::waitpid(-1, nullptr, WNOHANG), -1);
}

// The tool's own way out: asked with SIGTERM, it removes its part file and ends. A paused
// tool must be continued first, or it would never see the request.
TEST_F(ChildProcessTest, APausedChildIsAskedToEndAndCleansUpItself) {
    Capture child;
    const std::string part = dir / "part";
    const std::string cleaned = dir / "cleaned";
    ASSERT_TRUE(child.Launch(Tool(": > '" + part + "'; trap \"rm -f '" + part + "'; : > '" + cleaned +
                                  "'; exit 1\" TERM\nwhile :; do sleep 0.05; done\n")));
    const int pid = child.ProcessId();
    while (!std::ifstream(part).good()) std::this_thread::sleep_for(std::chrono::milliseconds(5));
    ASSERT_TRUE(child.Suspend());
    // Seen stopped nearly always; a shell that has not yet been seen so is asked all the same.
    test::WaitForProcessState(pid, 'T');
    child.Kill(65535);
    child.WaitForExit();
    EXPECT_EQ(child.Exits(), std::vector<int>{65535});
    EXPECT_TRUE(std::ifstream(cleaned).good()) << "the tool was killed, not asked";
    EXPECT_FALSE(std::ifstream(part).good());
}

// A tool that ignores the request is killed after the grace period, and the part file it left
// for its output is removed once it has been reaped.
TEST_F(ChildProcessTest, AToolThatIgnoresTheRequestIsKilledAndItsPartFileRemoved) {
    Capture child;
    const std::string output = dir / "Song.mp3";
    child.SetOutputPath(output);
    ASSERT_TRUE(child.Launch(Tool("trap '' TERM; : > \"" + dir.Path() +
                                  "/.Song.mp3.ctt$$.part\"; echo ready\nwhile :; do sleep 0.05; done\n")));
    while (child.Out().empty()) std::this_thread::sleep_for(std::chrono::milliseconds(5));
    const std::string part = PartFilePath(output, child.ProcessId());
    ASSERT_TRUE(std::ifstream(part).good());
    const auto started = std::chrono::steady_clock::now();
    child.Kill(65535);
    child.WaitForExit();
    EXPECT_GE(std::chrono::steady_clock::now() - started, ImChildProcess::kTerminateGrace / 2);
    EXPECT_EQ(child.Exits(), std::vector<int>{65535});
    EXPECT_FALSE(std::ifstream(part).good());
}

// Part files of tools that died with an earlier program go; those of a tool still writing stay,
// and so does everything that is no part file.
TEST_F(ChildProcessTest, StalePartFilesAreSweptAndLiveOnesKept) {
    namespace fs = std::filesystem;
    const std::string folder = dir / "out";
    fs::create_directories(folder);
    // A dead pid: a child that has been reaped.
    Capture dead;
    ASSERT_TRUE(dead.Launch(Tool("exit 0\n")));
    dead.WaitForExit();
    const int deadPid = dead.ProcessId();
    // A live process that is the tool (named ctt), and a live one that is not.
    // A link, not a copy: a copy still open for writing in some forked child cannot be run.
    fs::create_symlink("/bin/sleep", dir / "ctt");
    Capture tool, stranger;
    ASSERT_TRUE(tool.Launch("\"" + dir / "ctt" + "\" 60"));
    ASSERT_TRUE(stranger.Launch("/bin/sleep 60"));
    const std::string comm = "/proc/" + std::to_string(tool.ProcessId()) + "/comm";
    for (int i = 0; i < 400 && test::ReadFile(comm) != "ctt\n"; ++i)
        std::this_thread::sleep_for(std::chrono::milliseconds(5));
    ASSERT_EQ(test::ReadFile(comm), "ctt\n");
    const std::string a = PartFilePath(folder + "/a.mp3", deadPid);
    const std::string b = PartFilePath(folder + "/b.mp3", tool.ProcessId());
    const std::string c = PartFilePath(folder + "/c.mp3", stranger.ProcessId());
    for (const std::string& path : {a, b, c, folder + "/.x.ctt12.partial", folder + "/d.mp3"})
        std::ofstream(path) << "x";
    EXPECT_EQ(SweepStalePartFiles(folder), 2);
    EXPECT_FALSE(fs::exists(a));
    EXPECT_TRUE(fs::exists(b));
    EXPECT_FALSE(fs::exists(c));
    EXPECT_TRUE(fs::exists(folder + "/.x.ctt12.partial"));
    EXPECT_TRUE(fs::exists(folder + "/d.mp3"));
    tool.Kill(65535);
    stranger.Kill(65535);
}

}  // namespace
}  // namespace ac::platform
