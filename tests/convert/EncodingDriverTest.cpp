#include "convert/EncodingDriver.h"

#include "../support/TempDir.h"
#include "DriverFakes.h"
#include "FakeTool.h"

#include <gtest/gtest.h>

#include <chrono>
#include <csignal>
#include <filesystem>
#include <fstream>
#include <thread>

namespace ac {
namespace {

namespace fs = std::filesystem;
using test::FakeHost;
using test::FakeList;

// One fake ctt for every scenario: the input's name says how it behaves. Every kind first
// writes a partial output, as a real encoder would, so the tests see what is left behind.
// "gate" rows run until the test creates "<input>.go", then finish the file.
constexpr const char* kFakeCtt = R"sh(in="$4"; out="$5"
printf 'partial' > "$out"
case "$(basename "$in")" in
  ok*)    echo '|Time>>> 0.5'; echo '|Time>>> 1'; printf 'done' >> "$out"; exit 0 ;;
  fail*)  echo '|Error>>> cannot decode' >&2; exit 2 ;;
  crash*) kill -SEGV $$ ;;
  flood*) while :; do echo '|Error>>> noise' >&2; sleep 0.002; done ;;
  hang*)  exec sleep 600 ;;
  gate*)  echo '|Time>>> 0.25'
          while [ ! -e "$in.go" ]; do sleep 0.01; done
          printf 'done' >> "$out" || exit 1; exit 0 ;;
esac
exit 9
)sh";

class EncodingDriverTest : public ::testing::Test {
protected:
    void SetUp() override { MakeDriver(DriverConfig{}); }
    void TearDown() override {
        // Rows first: their children's exits call into the driver.
        list.Clear();
        driver.reset();
    }

    void MakeDriver(DriverConfig config) {
        list.SetOutputDirectory(out);
        config.toolPath = test::WriteScript(dir / "ctt", kFakeCtt);
        config.toolDirectory = dir.Path();
        driver = std::make_unique<EncodingDriver>(
            list, host, config,
            [this](int, const MediaItem& item, const std::string& directory,
                   const std::string& lastOutput) {
                lastOutputs.push_back(lastOutput);
                return HoldOutputPath(directory + "/" + fs::path(item.sourcePath).filename().string() + ".mp3");
            },
            [](const MediaItem& item) {
                return "-relk -y -i \"" + item.sourcePath + "\" \"" + item.outputPath + "\"";
            });
    }

    MediaItem& Add(const std::string& name, JobStatus status = JobStatus::Idle) {
        return list.Add(dir / name, status);
    }
    void OpenGate(const std::string& name) { std::ofstream(dir / (name + ".go")); }

    // Runs passes until the condition holds; the bound only keeps a broken run finite.
    template <typename Condition>
    bool Drive(Condition done) {
        for (int i = 0; i < 4000; ++i) {
            driver->RunPass();
            if (done())
                return true;
            std::this_thread::sleep_for(std::chrono::milliseconds(5));
        }
        return false;
    }
    bool DriveTo(MediaItem& item, JobStatus status) {
        return Drive([&] { return item.Status() == status; });
    }
    static bool Settled(const MediaItem& item) {
        CEncodeProcess* child = item.process.load();
        return !child || !child->IsRunning();
    }
    bool DriveToIdleCounters() {
        return Drive([&] { return driver->ProcessCount() == 0; });
    }

    test::TempDir dir;
    std::string out = dir / "out";
    FakeList list;
    FakeHost host;
    std::unique_ptr<EncodingDriver> driver;
    std::vector<std::string> lastOutputs;
};

TEST_F(EncodingDriverTest, EveryBadToolEndsItsOwnRowAndTheOthersCarryOn) {
    int threadsBefore = test::CountThreads();
    int fdsBefore = test::CountOpenFds();
    MediaItem& ok1 = Add("ok1.wav");
    MediaItem& fail = Add("fail.wav");
    MediaItem& crash = Add("crash.wav");
    MediaItem& flood = Add("flood.wav");
    MediaItem& ok2 = Add("ok2.wav");
    driver->EncodeChecked();
    ASSERT_TRUE(Drive([&] { return host.RunFinished() == 1; }));

    EXPECT_EQ(ok1.Status(), JobStatus::Completed);
    EXPECT_EQ(fail.Status(), JobStatus::Failed);
    EXPECT_EQ(crash.Status(), JobStatus::Failed);
    EXPECT_EQ(flood.Status(), JobStatus::Failed);
    EXPECT_EQ(ok2.Status(), JobStatus::Completed);
    EXPECT_EQ(flood.process.load()->ExitCode(), CEncodeProcess::kFloodExitCode);
    EXPECT_EQ(driver->ProcessCount(), 0);
    EXPECT_EQ(driver->RunningCount(), 0);
    // Finished files stay whole; nothing a failed child wrote stands under a final name.
    EXPECT_EQ(test::ReadFile(ok1.outputPath), "partialdone");
    for (MediaItem* failed : {&fail, &crash, &flood})
        EXPECT_FALSE(fs::exists(failed->outputPath));
    // Failed rows count whole, completed ones by their last time line.
    EXPECT_DOUBLE_EQ(driver->GetRunTotalSeconds(), 5.0);
    EXPECT_DOUBLE_EQ(driver->GetRunDoneSeconds(), 5.0);
    // The end of the run is posted once, however many passes saw it.
    driver->RunPass();
    EXPECT_EQ(host.RunFinished(), 1);
    // Every reader and waiter is gone once the rows are, and so is every pipe.
    list.Clear();
    EXPECT_EQ(test::CountThreads(), threadsBefore);
    EXPECT_EQ(test::CountOpenFds(), fdsBefore);
}

TEST_F(EncodingDriverTest, LaunchFailureFailsTheRowWithoutTouchingTheCounters) {
    DriverConfig config;
    MakeDriver(config);
    std::error_code ignored;
    fs::remove(dir / "ctt", ignored);
    MediaItem& item = Add("ok.wav");
    driver->EncodeChecked();
    driver->RunPass();
    EXPECT_EQ(item.Status(), JobStatus::Failed);
    EXPECT_EQ(driver->ProcessCount(), 0);
    EXPECT_EQ(driver->RunningCount(), 0);
}

TEST_F(EncodingDriverTest, HangingAndExternallyKilledChildrenEndTheirRowsOnly) {
    DriverConfig config;
    config.maxRunningProcesses = 3;
    MakeDriver(config);
    MediaItem& hang = Add("hang.wav");
    MediaItem& victim = Add("gate-victim.wav");
    MediaItem& ok = Add("ok.wav");
    driver->EncodeChecked();
    ASSERT_TRUE(DriveTo(ok, JobStatus::Completed));
    EXPECT_EQ(hang.Status(), JobStatus::Running);

    ::kill(victim.process.load()->ProcessId(), SIGKILL);
    ASSERT_TRUE(DriveTo(victim, JobStatus::Failed));

    list.Select(0);
    driver->StopSelected();
    ASSERT_TRUE(DriveTo(hang, JobStatus::Aborted));
    ASSERT_TRUE(DriveToIdleCounters());
    EXPECT_EQ(driver->RunningCount(), 0);
    EXPECT_FALSE(fs::exists(hang.outputPath));
    EXPECT_FALSE(fs::exists(victim.outputPath));
}

// The preferences change the limits of a run already under way: its next pass starts more.
TEST_F(EncodingDriverTest, NewLimitsReachARunUnderWay) {
    MediaItem& first = Add("gate-a.wav");
    MediaItem& second = Add("gate-b.wav");
    MediaItem& third = Add("gate-c.wav");
    driver->EncodeChecked();
    ASSERT_TRUE(DriveTo(first, JobStatus::Running));
    driver->RunPass();
    EXPECT_EQ(driver->RunningCount(), 1) << "one at a time, as configured";
    EXPECT_NE(second.Status(), JobStatus::Running);
    driver->UpdateSettings(10, 3, 0, "");
    ASSERT_TRUE(Drive([&] { return driver->RunningCount() == 3; }));
    EXPECT_EQ(third.Status(), JobStatus::Running);
    for (const char* gate : {"gate-a.wav", "gate-b.wav", "gate-c.wav"}) OpenGate(gate);
    ASSERT_TRUE(DriveTo(third, JobStatus::Completed));
}

TEST_F(EncodingDriverTest, PausingFreesTheRunningSlotAndResumeWaitsAsPending) {
    MediaItem& first = Add("gate-a.wav");
    MediaItem& second = Add("gate-b.wav");
    driver->EncodeChecked();
    ASSERT_TRUE(DriveTo(first, JobStatus::Running));
    list.Select(0);
    driver->PauseSelected();
    EXPECT_EQ(first.Status(), JobStatus::Paused);
    EXPECT_EQ(driver->RunningCount(), 0);
    ASSERT_TRUE(DriveTo(second, JobStatus::Running));
    EXPECT_EQ(driver->ProcessCount(), 2);

    list.Select(0);
    driver->EncodeSelected();
    EXPECT_EQ(first.Status(), JobStatus::Pending);
    driver->RunPass();
    EXPECT_EQ(first.Status(), JobStatus::Pending);  // one running slot, and it is taken

    OpenGate("gate-b.wav");
    ASSERT_TRUE(DriveTo(first, JobStatus::Running));
    EXPECT_EQ(second.Status(), JobStatus::Completed);
    OpenGate("gate-a.wav");
    ASSERT_TRUE(DriveTo(first, JobStatus::Completed));
    EXPECT_EQ(driver->RunningCount(), 0);
}

// The user's Pause lands while the driver is launching the row: before the child exists, or
// after it exists but before the driver has looked at the status again.
class PauseDuringLaunchTest : public EncodingDriverTest,
                              public ::testing::WithParamInterface<bool> {};

TEST_P(PauseDuringLaunchTest, EndsPausedWithASuspendedChild) {
    bool beforeSpawn = GetParam();
    auto pause = [this](int) { driver->PauseChecked(); };
    driver->SetLaunchHooks(beforeSpawn ? std::function<void(int)>(pause) : nullptr,
                           beforeSpawn ? nullptr : std::function<void(int)>(pause));
    MediaItem& item = Add("gate.wav");
    driver->EncodeChecked();
    driver->RunPass();
    EXPECT_EQ(item.Status(), JobStatus::Paused);
    EXPECT_EQ(driver->ProcessCount(), 1);
    EXPECT_EQ(driver->RunningCount(), 0);
    EXPECT_TRUE(test::WaitForProcessState(item.process.load()->ProcessId(), 'T'));
}

INSTANTIATE_TEST_SUITE_P(Moments, PauseDuringLaunchTest, ::testing::Bool(), [](const auto& info) {
    return info.param ? "BeforeSpawn" : "AfterSpawn";
});

TEST_F(EncodingDriverTest, StopBetweenNamingAndLaunchStartsNothingAndKeepsTheOldFile) {
    fs::create_directories(out);
    std::ofstream(out + "/ok.wav.mp3") << "old";
    driver->SetLaunchHooks([this](int) { driver->StopChecked(); }, nullptr);
    MediaItem& item = Add("ok.wav");
    driver->EncodeChecked();
    driver->RunPass();
    EXPECT_EQ(item.Status(), JobStatus::Aborted);
    EXPECT_EQ(item.process.load()->ProcessId(), -1);
    EXPECT_EQ(test::ReadFile(out + "/ok.wav.mp3"), "old");
    EXPECT_EQ(driver->ProcessCount(), 0);
}

TEST_F(EncodingDriverTest, StoppingAPausedRowAbortsAtOnceAndSettlesAtTheExit) {
    MediaItem& item = Add("gate.wav");
    driver->EncodeChecked();
    ASSERT_TRUE(DriveTo(item, JobStatus::Running));
    driver->PauseChecked();
    ASSERT_EQ(item.Status(), JobStatus::Paused);
    // Kill waits for the end, so the exit may already have settled the row.
    list.Select(0);
    driver->StopSelected();
    ASSERT_TRUE(DriveTo(item, JobStatus::Aborted));
    EXPECT_EQ(driver->ProcessCount(), 0);
    EXPECT_EQ(driver->RunningCount(), 0);
}

TEST_F(EncodingDriverTest, StopQuestionAnsweredNoChangesNothing) {
    MediaItem& running = Add("gate.wav");
    MediaItem& waiting = Add("ok.wav");
    driver->EncodeChecked();
    ASSERT_TRUE(DriveTo(running, JobStatus::Running));
    host.answer = false;
    EXPECT_FALSE(driver->StopChecked());
    EXPECT_EQ(running.Status(), JobStatus::Running);
    EXPECT_EQ(waiting.Status(), JobStatus::Waiting);
    host.answer = true;
    EXPECT_TRUE(driver->StopChecked());
    EXPECT_EQ(waiting.Status(), JobStatus::Idle);
    ASSERT_TRUE(DriveTo(running, JobStatus::Aborted));
    EXPECT_EQ(host.Questions(), (std::vector<std::uint32_t>{0xC004, 0xC004}));
}

class StopEndsRunTest : public EncodingDriverTest, public ::testing::WithParamInterface<bool> {};

TEST_P(StopEndsRunTest, OnlyTheMenuEntryForgetsTheRun) {
    bool fromMenu = GetParam();
    MediaItem& item = Add("gate.wav");
    driver->EncodeChecked();
    ASSERT_TRUE(DriveTo(item, JobStatus::Running));
    fromMenu ? driver->StopCheckedFromMenu() : driver->StopChecked();
    ASSERT_TRUE(DriveToIdleCounters());
    for (int i = 0; i < 3; ++i)
        driver->RunPass();
    EXPECT_EQ(host.RunFinished(), fromMenu ? 0 : 1);
}

INSTANTIATE_TEST_SUITE_P(Stops, StopEndsRunTest, ::testing::Bool(),
                         [](const auto& info) { return info.param ? "Menu" : "Button"; });

TEST_F(EncodingDriverTest, UncheckedWaitingRowIsLeftOutAndTheRunEndsWithoutIt) {
    MediaItem& done = Add("ok.wav");
    MediaItem& left = Add("ok-left.wav");
    driver->EncodeChecked();
    list.SetChecked(1, false);
    ASSERT_TRUE(Drive([&] { return host.RunFinished() == 1; }));
    EXPECT_EQ(done.Status(), JobStatus::Completed);
    EXPECT_EQ(left.Status(), JobStatus::Waiting);
}

TEST_F(EncodingDriverTest, CompletedRowsAnsweredNoStartNothing) {
    MediaItem& item = Add("ok.wav", JobStatus::Completed);
    host.answer = false;
    driver->EncodeChecked();
    driver->RunPass();
    EXPECT_EQ(item.Status(), JobStatus::Completed);
    EXPECT_EQ(item.inRun.load(), 1);
    EXPECT_FALSE(driver->RunPending());
    EXPECT_EQ(host.Questions(), std::vector<std::uint32_t>{0xC003});
    host.answer = true;
    driver->EncodeChecked();
    EXPECT_EQ(item.Status(), JobStatus::Waiting);
}

TEST_F(EncodingDriverTest, UnusableOutputDirectoryAbortsEveryCheckedRowWithOneMessage) {
    std::ofstream(dir / "file") << "x";
    list.SetOutputDirectory(dir / "file/sub");
    MediaItem& a = Add("ok-a.wav");
    MediaItem& b = Add("ok-b.wav", JobStatus::Completed);
    MediaItem& c = Add("ok-c.wav");
    driver->EncodeChecked();  // b stays completed: the question is answered with yes below
    host.answer = true;
    driver->RunPass();
    EXPECT_EQ(a.Status(), JobStatus::Aborted);
    EXPECT_EQ(b.Status(), JobStatus::Aborted);
    EXPECT_EQ(c.Status(), JobStatus::Aborted);
    ASSERT_EQ(host.Messages().size(), 1u);
    EXPECT_NE(host.Messages()[0].find("Output directory is not valid.: " + dir / "file/sub"),
              std::string::npos);
}

TEST_F(EncodingDriverTest, OutputDirectoryRemovedMidRunIsMadeAgainForTheNextRow) {
    MediaItem& first = Add("gate.wav");
    MediaItem& second = Add("ok.wav");
    driver->EncodeChecked();
    ASSERT_TRUE(DriveTo(first, JobStatus::Running));
    // No pass may run (and make the folder again) until the first child has hit the hole.
    list.m_listLock.lock();
    // The running child may be writing into the folder while it goes; try until it is gone.
    std::error_code busy;
    for (int i = 0; i < 100 && (fs::remove_all(out, busy), fs::exists(out)); ++i)
        std::this_thread::sleep_for(std::chrono::milliseconds(5));
    OpenGate("gate.wav");
    for (int i = 0; i < 2000 && first.Status() == JobStatus::Running; ++i)
        std::this_thread::sleep_for(std::chrono::milliseconds(5));
    list.m_listLock.unlock();
    ASSERT_TRUE(DriveTo(second, JobStatus::Completed));
    EXPECT_EQ(first.Status(), JobStatus::Failed);
    EXPECT_EQ(test::ReadFile(second.outputPath), "partialdone");
}

TEST_F(EncodingDriverTest, LowDiskSpaceStopsTheRunAfterTheQuestion) {
    std::uint64_t freeBytes = EncodingDriver::kMinFreeBytes;
    driver->SetFreeSpaceProbe([&](const std::string&) { return freeBytes; });
    MediaItem& item = Add("gate.wav");
    driver->EncodeChecked();
    ASSERT_TRUE(DriveTo(item, JobStatus::Running));
    driver->CheckDiskSpace();
    EXPECT_TRUE(host.Messages().empty());

    freeBytes -= 1;
    host.answer = false;
    driver->CheckDiskSpace();
    EXPECT_EQ(item.Status(), JobStatus::Running);
    ASSERT_EQ(host.Messages().size(), 1u);  // told even when the user kept the run
    host.answer = true;
    driver->CheckDiskSpace();
    ASSERT_TRUE(DriveToIdleCounters());
    EXPECT_EQ(item.Status(), JobStatus::Aborted);
    EXPECT_FALSE(fs::exists(item.outputPath));
    EXPECT_EQ(host.Messages().size(), 2u);
}

TEST_F(EncodingDriverTest, UnknownFileNeverMoves) {
    MediaItem& item = Add("ok.wav", JobStatus::UnknownFile);
    for (auto command : {&EncodingDriver::EncodeChecked, &EncodingDriver::PauseChecked,
                         &EncodingDriver::StopSelected}) {
        list.Select(0);
        (driver.get()->*command)();
        driver->RunPass();
        EXPECT_EQ(item.Status(), JobStatus::UnknownFile);
    }
    EXPECT_EQ(item.inRun.load(), 0);
    EXPECT_EQ(item.process.load(), nullptr);
}

TEST_F(EncodingDriverTest, RowsOfOnePassSeeTheNameChosenBeforeThem) {
    DriverConfig config;
    config.maxRunningProcesses = 2;
    MakeDriver(config);
    MediaItem& a = Add("gate-a.wav");
    Add("gate-b.wav");
    driver->EncodeChecked();
    driver->RunPass();
    EXPECT_EQ(lastOutputs, (std::vector<std::string>{"", a.outputPath}));
}

// A pass starts as soon as a child ends: with a period of ten minutes the second and third
// rows could only start through that wake-up.
TEST_F(EncodingDriverTest, ChildExitWakesTheDriverThread) {
    DriverConfig config;
    config.passPeriodMs = 600000;
    MakeDriver(config);
    MediaItem& a = Add("ok-a.wav");
    MediaItem& b = Add("ok-b.wav");
    MediaItem& c = Add("ok-c.wav");
    driver->Start();
    driver->EncodeChecked();
    for (int i = 0; i < 2000 && c.Status() != JobStatus::Completed; ++i)
        std::this_thread::sleep_for(std::chrono::milliseconds(10));
    driver->Stop();
    EXPECT_EQ(a.Status(), JobStatus::Completed);
    EXPECT_EQ(b.Status(), JobStatus::Completed);
    EXPECT_EQ(c.Status(), JobStatus::Completed);
}

TEST_F(EncodingDriverTest, BusyListLockSkipsThePass) {
    MediaItem& item = Add("ok.wav");
    driver->EncodeChecked();
    list.m_listLock.lock();
    EXPECT_FALSE(driver->RunPass());
    list.m_listLock.unlock();
    EXPECT_EQ(item.Status(), JobStatus::Waiting);
}

struct EnableCase {
    const char* name;
    std::vector<JobStatus> checked;
    bool encode, pause, stop;
};

class EnableRulesTest : public EncodingDriverTest,
                        public ::testing::WithParamInterface<EnableCase> {};

TEST_P(EnableRulesTest, FollowTheStatusesOfTheCheckedRows) {
    for (JobStatus status : GetParam().checked)
        Add("row.wav", status);
    Add("unchecked.wav", JobStatus::Running);
    list.SetChecked(list.GetRowCount() - 1, false);
    EXPECT_EQ(driver->CanEncodeChecked(), GetParam().encode);
    EXPECT_EQ(driver->CanPauseChecked(), GetParam().pause);
    EXPECT_EQ(driver->CanStopChecked(), GetParam().stop);
    EXPECT_EQ(driver->UpdateCheckingEnabled(), GetParam().encode);
    EXPECT_EQ(list.CheckingEnabled(), GetParam().encode);
}

using S = JobStatus;
INSTANTIATE_TEST_SUITE_P(
    Statuses, EnableRulesTest,
    ::testing::Values(EnableCase{"Idle", {S::Idle, S::Completed, S::Failed}, true, false, false},
                      EnableCase{"Waiting", {S::Idle, S::Waiting}, false, true, true},
                      EnableCase{"Pending", {S::Pending}, false, true, true},
                      EnableCase{"Paused", {S::Paused, S::Aborted}, true, false, true},
                      EnableCase{
                          "Suspended", {S::AbortedSuspended, S::UnknownFile}, true, false, false}),
    [](const auto& info) { return std::string(info.param.name); });

}  // namespace
}  // namespace ac
