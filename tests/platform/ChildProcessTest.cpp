#include "platform/ChildProcess.h"

#include "../convert/FakeTool.h"
#include "../support/TempDir.h"

#include <gtest/gtest.h>

#include <chrono>
#include <fstream>
#include <mutex>
#include <thread>
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
            if (match(test::ProcessState(pid))) return true;
            std::this_thread::sleep_for(std::chrono::milliseconds(5));
        }
        return false;
    }
    test::TempDir dir;
};

TEST_F(ChildProcessTest, WordsDirectoryAndExitCodeReachTheChild) {
    Capture child;
    child.SetCurrentDirectory(dir.Path());
    ASSERT_TRUE(child.Launch(Tool("printf '[%s]' \"$@\"; pwd; exit 7\n") +
                             "  -i \"a b.wav\" \"\" last"));
    child.WaitForExit();
    EXPECT_EQ(child.Out(), "[-i][a b.wav][][last]" + dir.Path() + "\n");
    EXPECT_EQ(child.Exits(), std::vector<int>{7});
    EXPECT_FALSE(child.IsRunning());
}

TEST_F(ChildProcessTest, CrashIsAFailureCode) {
    Capture child;
    ASSERT_TRUE(child.Launch(Tool("kill -SEGV $$\n")));
    child.WaitForExit();
    EXPECT_EQ(child.ExitCode(), 128 + SIGSEGV);
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
    ASSERT_TRUE(child.Launch(Tool("while :; do sleep 0.01; done\n")));
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

}  // namespace
}  // namespace ac::platform
