// The burn run's stages, questions and codes with a fake ctt (a shell script run through the
// real launcher) and a fake recorder; every path must leave the temporary folder empty.
#include "BurnFakes.h"

#include "burn/BurnDriver.h"
#include "burn/BurnTexts.h"
#include "platform/CommandLine.h"
#include "support/AudioFixtures.h"
#include "support/TempDir.h"

#include <gtest/gtest.h>

#include <sys/mount.h>
#include <sys/stat.h>

#include <cerrno>
#include <chrono>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <thread>

namespace ac::burn {
namespace {

namespace fs = std::filesystem;
using namespace std::chrono_literals;
using test::FakeBurnHost;
using test::FakeBurnList;
using test::FakeRecorder;

class BurnDriverTest : public ::testing::Test {
protected:
    void SetUp() override {
        temporary = dir / "burntemp";
        log = dir / "tool.log";
        // Copies its input to its output; "bad" inputs fail, "slow" ones take half a minute.
        tool = dir / "ctt";
        std::ofstream(tool)
            << "#!/bin/sh\n"
               "echo start >> '"
            << log
            << "'\n"
               "case \"$1\" in *bad*) echo '|Error>>> cannot read' >&2; echo end >> '"
            << log
            << "'; exit 1;; esac\n"
               "case \"$1\" in *slow*) sleep 30;; esac\n"
               "echo '|Time>>> 1'\n"
               "sleep 0.05\n"
               "cp \"$1\" \"$2\" || exit 1\n"
               "echo end >> '"
            << log << "'\n";
        ::chmod(tool.c_str(), 0755);
        driver = std::make_unique<BurnDriver>(
            list, host,
            [](int, MediaItem& item, const std::string& folder) {
                return HoldOutputPath(folder + "/" + fs::path(item.sourcePath).stem().string() +
                                      ".wav");
            },
            [](MediaItem& item, const std::string& output) {
                return " " + platform::QuoteCommandValue(item.sourcePath) + " " +
                       platform::QuoteCommandValue(output);
            });
        driver->SetTickPeriodMs(100);
        driver->SetRecorder(&recorder);
        settings.temporaryFolder = temporary;
        settings.toolPath = tool;
        settings.toolDirectory = dir.Path();
        settings.maxProcesses = 4;
        settings.maxRunningProcesses = 2;
        driver->SetSettings(settings);
    }

    std::string AddWav(const std::string& name, size_t frames = 4410) {
        const std::string path = dir / name;
        test::WriteWav(path, test::MakeNoise(frames, static_cast<std::uint32_t>(name.size())));
        list.Add(path, 1);
        return path;
    }

    bool Run() {
        driver->SetSettings(settings);
        const bool started = driver->StartBurn();
        driver->Join();
        return started;
    }

    bool TemporaryFolderEmpty() {
        std::error_code error;
        return !fs::exists(temporary, error) || fs::is_empty(temporary, error);
    }

    test::TempDir dir;
    std::string temporary, log, tool;
    FakeBurnList list;
    FakeBurnHost host;
    FakeRecorder recorder;
    BurnSettings settings;
    std::unique_ptr<BurnDriver> driver;
};

TEST_F(BurnDriverTest, AudioDiscGetsEveryRowAsATrackInOrder) {
    AddWav("one.wav");
    AddWav("two.wav");
    AddWav("three.wav");
    ASSERT_TRUE(Run());
    ASSERT_EQ(recorder.jobs.size(), 1u);
    const BurnJob& job = recorder.jobs[0];
    ASSERT_EQ(job.tracks.size(), 3u);
    EXPECT_EQ(job.tracks[0].path, temporary + "/one.wav");
    EXPECT_EQ(job.tracks[2].title, "three.wav");
    EXPECT_EQ(job.pauseSeconds, 2);
    EXPECT_TRUE(host.allWritten);
    EXPECT_TRUE(host.panelsEnabled);
    EXPECT_TRUE(host.Asked(text::kSuccessEject));
    EXPECT_EQ(recorder.beforeWrites, 2);  // before the run and before the copy
    EXPECT_TRUE(TemporaryFolderEmpty());
    for (int row = 0; row < 3; ++row)
        EXPECT_EQ(list.Item(row)->Status(), JobStatus::Completed);
}

TEST_F(BurnDriverTest, TwoCopiesSplitTheBarThirtyThirtyFiveThirtyFive) {
    AddWav("a.wav");
    settings.copies = 2;
    ASSERT_TRUE(Run());
    ASSERT_EQ(recorder.jobs.size(), 2u);
    EXPECT_EQ(recorder.jobs[1].copyIndex, 1);
    EXPECT_EQ(host.TimesAsked(text::kAnotherCopy), 1);
    const auto& bar = host.progress;
    EXPECT_NE(std::find(bar.begin(), bar.end(), 30), bar.end());
    EXPECT_NE(std::find(bar.begin(), bar.end(), 65), bar.end());
    EXPECT_NE(std::find(bar.begin(), bar.end(), 100), bar.end());
    EXPECT_TRUE(host.allWritten);
}

TEST_F(BurnDriverTest, NoMoreCopiesWhenTheUserSaysNo) {
    AddWav("a.wav");
    settings.copies = 3;
    host.answer = [](std::uint32_t id) { return id != text::kAnotherCopy; };
    ASSERT_TRUE(Run());
    EXPECT_EQ(recorder.jobs.size(), 1u);
    EXPECT_FALSE(host.allWritten);
    EXPECT_TRUE(TemporaryFolderEmpty());
}

TEST_F(BurnDriverTest, OneFailedRowOfTenIsAskedOnceAndLeftOff) {
    for (int i = 0; i < 10; ++i)
        AddWav(i == 4 ? "bad.wav" : "t" + std::to_string(i) + ".wav");
    ASSERT_TRUE(Run());
    EXPECT_EQ(host.TimesAsked(text::kSomeFailed), 1);
    ASSERT_EQ(recorder.jobs.size(), 1u);
    EXPECT_EQ(recorder.jobs[0].tracks.size(), 9u);
    EXPECT_EQ(list.Item(4)->Status(), JobStatus::Failed);
    EXPECT_TRUE(TemporaryFolderEmpty());
}

TEST_F(BurnDriverTest, NoToTheFailedRowsQuestionBurnsNothing) {
    AddWav("good.wav");
    AddWav("bad.wav");
    host.answer = [](std::uint32_t id) { return id != text::kSomeFailed; };
    ASSERT_TRUE(Run());
    EXPECT_TRUE(recorder.jobs.empty());
    EXPECT_TRUE(TemporaryFolderEmpty());
    EXPECT_FALSE(host.allWritten);
}

TEST_F(BurnDriverTest, AllRowsFailedIsToldAndNothingBurnt) {
    AddWav("bad1.wav");
    AddWav("bad2.wav");
    ASSERT_TRUE(Run());
    EXPECT_TRUE(host.Asked(text::kAllFailed));
    EXPECT_FALSE(host.Asked(text::kSomeFailed));
    EXPECT_TRUE(recorder.jobs.empty());
}

TEST_F(BurnDriverTest, TemporaryFolderThatCannotBeMadeStopsBeforeAnyConversion) {
    AddWav("a.wav");
    test::WriteFile(dir / "plainfile", "x");
    settings.temporaryFolder = dir / "plainfile/sub";
    ASSERT_TRUE(Run());
    EXPECT_TRUE(host.Asked(text::kTempFolderFailed));
    EXPECT_FALSE(fs::exists(log));
    EXPECT_TRUE(recorder.jobs.empty());
    EXPECT_TRUE(host.panelsEnabled);
}

TEST_F(BurnDriverTest, WavOfFiftyEightBytesStopsWithTheUnavailableWarning) {
    const std::string path = dir / "empty.wav";
    test::WriteWav(path, test::Pcm{});  // a header of 44 bytes, no samples
    list.Add(path, 1);
    ASSERT_TRUE(Run());
    EXPECT_TRUE(host.tracksUnavailable);
    EXPECT_TRUE(recorder.jobs.empty());
    EXPECT_TRUE(TemporaryFolderEmpty());
}

TEST_F(BurnDriverTest, UsedCdROpensTheWaitingDialogWithIgnoreAndCancelStopsTheRun) {
    AddWav("a.wav");
    recorder.state = kDiscStateComplete;
    EXPECT_FALSE(Run());
    ASSERT_EQ(host.waitCodes, (std::vector<int>{-88}));
    EXPECT_TRUE(host.waitShowedIgnore[0]);
    EXPECT_FALSE(fs::exists(log));
    EXPECT_TRUE(host.panelsEnabled);
}

TEST_F(BurnDriverTest, RewritableWithContentIsAskedBeforeTheConversion) {
    AddWav("a.wav");
    recorder.media = kMediaCdRw;
    recorder.state = kDiscStateComplete;
    ASSERT_TRUE(Run());
    EXPECT_EQ(host.prompts.front(), text::kEraseNonEmpty);
    EXPECT_EQ(recorder.jobs.size(), 1u);
}

TEST_F(BurnDriverTest, SourceOnTheRecordersDiscSkipsTheFirstCheckAndEjectsAfterConversion) {
    AddWav("a.wav");
    recorder.drive = dir.Path();  // the source lies "on" the recorder
    recorder.media = kMediaCdRom;
    // The blank disc comes in through the waiting dialog of the copy loop.
    host.waitForDisc = [&](ICdRecorder* r, int code) {
        EXPECT_EQ(code, -90);
        recorder.media = kMediaCdR;
        return r;
    };
    ASSERT_TRUE(Run());
    ASSERT_EQ(host.waitCodes, (std::vector<int>{-90}));
    EXPECT_FALSE(host.waitShowedIgnore[0]);
    EXPECT_GE(recorder.ejects, 1);
    EXPECT_EQ(recorder.jobs.size(), 1u);
}

TEST_F(BurnDriverTest, CompilationLongerThanTheDiscWaitsForABiggerOne) {
    AddWav("a.wav");
    recorder.freeBlocks = 10;
    driver->SetCompilation(3600, 60);
    EXPECT_FALSE(Run());
    EXPECT_EQ(host.waitCodes, (std::vector<int>{-89}));
}

TEST_F(BurnDriverTest, StopDuringConversionEndsChildrenAndLeavesNoTemporaryFile) {
    AddWav("slow1.wav");
    AddWav("slow2.wav");
    AddWav("a.wav");
    driver->SetSettings(settings);
    ASSERT_TRUE(driver->StartBurn());
    for (int i = 0; i < 200 && test::ReadFile(log).find("start") == std::string::npos; ++i)
        std::this_thread::sleep_for(20ms);
    EXPECT_TRUE(driver->CanStop());
    driver->StopBurn();
    EXPECT_TRUE(host.Asked(text::kStopEncoding));
    EXPECT_FALSE(driver->CanStop());
    driver->Join();
    EXPECT_TRUE(recorder.jobs.empty());
    EXPECT_FALSE(host.allWritten);
    EXPECT_EQ(list.Item(0)->Status(), JobStatus::Aborted);
    EXPECT_TRUE(TemporaryFolderEmpty());
}

TEST_F(BurnDriverTest, RunningLimitKeepsOneChildAtATime) {
    for (int i = 0; i < 5; ++i)
        AddWav("r" + std::to_string(i) + ".wav");
    settings.maxRunningProcesses = 1;
    ASSERT_TRUE(Run());
    const std::string lines = test::ReadFile(log);
    EXPECT_EQ(lines.find("start\nstart"), std::string::npos) << lines;
}

TEST_F(BurnDriverTest, StopDuringADataWriteOnlyWarns) {
    AddWav("a.wav");
    settings.discType = DiscType::Mp3;
    settings.volumeLabel = "Label";
    recorder.duringWrite = [&] { driver->StopBurn(); };
    ASSERT_TRUE(Run());
    EXPECT_TRUE(host.Asked(text::kCannotStopData));
    ASSERT_EQ(recorder.dataFiles.size(), 1u);
    EXPECT_EQ(recorder.dataFiles[0], (std::vector<std::string>{"a.wav"}));
    EXPECT_TRUE(host.allWritten);
}

TEST_F(BurnDriverTest, StopDuringAnAudioWriteAbortsAndAsksAboutEjecting) {
    AddWav("a.wav");
    recorder.duringWrite = [&] { driver->StopBurn(); };
    ASSERT_TRUE(Run());
    EXPECT_TRUE(host.Asked(text::kStopAudioWrite));
    EXPECT_EQ(recorder.aborts, 1);
    EXPECT_TRUE(host.Asked(text::kCancelledEject));
    EXPECT_FALSE(host.allWritten);
    EXPECT_TRUE(TemporaryFolderEmpty());
}

TEST_F(BurnDriverTest, FailedLastCopyAsksAboutEjecting) {
    AddWav("a.wav");
    recorder.failWrite = true;
    ASSERT_TRUE(Run());
    EXPECT_TRUE(host.Asked(text::kWriteFailedEject));
    EXPECT_FALSE(host.allWritten);
}

TEST_F(BurnDriverTest, LowDiskDuringConversionStopsTheRun) {
    AddWav("slow.wav");
    driver->SetFreeSpaceProbe([](const std::string&) { return std::uint64_t{1024}; });
    ASSERT_TRUE(Run());
    EXPECT_TRUE(host.Asked(text::kDiskFull));
    EXPECT_TRUE(recorder.jobs.empty());
    EXPECT_TRUE(TemporaryFolderEmpty());
}

// A tmpfs of 256 KiB under the test's folder as the temporary folder, unmounted at the end of
// the test; false (errno set) where mounting is not allowed.
class FullDiskTest : public BurnDriverTest {
protected:
    bool UseSmallTemporaryFileSystem() {
        const std::string small = dir / "small";
        fs::create_directories(small);
        if (::mount("tmpfs", small.c_str(), "tmpfs", MS_NOSUID | MS_NODEV, "size=256k") != 0)
            return false;
        m_mounted = small;
        temporary = small + "/burntemp";
        settings.temporaryFolder = temporary;
        return true;
    }
    void TearDown() override {
        if (!m_mounted.empty())
            ::umount2(m_mounted.c_str(), MNT_DETACH);
    }
    std::string m_mounted;
};

// A real file system that runs full: a tmpfs of 256 KiB the test mounts (root only; skipped
// where mounting is not allowed). The tool's writes fail and the disk check trips; either way
// the run ends with the disk-full message, writes nothing, and leaves no file behind.
TEST_F(FullDiskTest, TemporaryFolderOnAFullFileSystemStopsAndLeavesNothing) {
    if (!UseSmallTemporaryFileSystem())
        GTEST_SKIP() << "cannot mount a tmpfs here: " << std::strerror(errno);
    const std::string first = AddWav("slow one.wav", 44100);
    AddWav("two.wav", 44100);
    AddWav("three.wav", 44100);
    const auto before = fs::file_size(first);
    ASSERT_TRUE(Run());
    EXPECT_TRUE(host.Asked(text::kDiskFull));
    EXPECT_TRUE(recorder.jobs.empty());
    EXPECT_FALSE(host.allWritten);
    EXPECT_TRUE(TemporaryFolderEmpty());
    EXPECT_EQ(fs::file_size(first), before) << "the source is never touched";
}

// The same full file system with a disk check that sees room: the tool's failed writes fail
// their rows, the rows that fit are burnt, and the pieces of the others are gone.
TEST_F(FullDiskTest, RowsWhoseWavDoesNotFitFailAndTheRestAreBurnt) {
    if (!UseSmallTemporaryFileSystem())
        GTEST_SKIP() << "cannot mount a tmpfs here: " << std::strerror(errno);
    settings.maxProcesses = 1;  // one worker, in order: the first fits, the next two do not
    settings.maxRunningProcesses = 1;
    driver->SetFreeSpaceProbe([](const std::string&) { return std::uint64_t{1} << 40; });
    AddWav("one.wav", 44100);
    AddWav("two.wav", 44100);
    AddWav("three.wav", 44100);
    ASSERT_TRUE(Run());
    EXPECT_EQ(host.TimesAsked(text::kSomeFailed), 1);
    ASSERT_EQ(recorder.jobs.size(), 1u);
    EXPECT_EQ(recorder.jobs[0].tracks.size(), 1u);
    EXPECT_EQ(list.Item(0)->Status(), JobStatus::Completed);
    EXPECT_EQ(list.Item(1)->Status(), JobStatus::Failed);
    EXPECT_EQ(list.Item(2)->Status(), JobStatus::Failed);
    EXPECT_TRUE(TemporaryFolderEmpty());
}

TEST_F(BurnDriverTest, NoRecorderIsToldAndNothingStarts) {
    AddWav("a.wav");
    driver->SetRecorder(nullptr);
    EXPECT_FALSE(Run());
    EXPECT_TRUE(host.Asked(text::kNoRecorder));
}

TEST(CheckDiscTest, CodesFollowTheDiscInTheRecorder) {
    FakeRecorder recorder;
    EXPECT_EQ(CheckDisc(nullptr, 1), -99);
    recorder.media = kMediaNone;
    EXPECT_EQ(CheckDisc(&recorder, 1), -99);
    recorder.media = kMediaUnknown;
    EXPECT_EQ(CheckDisc(&recorder, 1), -99);
    recorder.media = kMediaCdRom;
    EXPECT_EQ(CheckDisc(&recorder, 1), -90);
    recorder.media = kMediaDvdPlusR;
    EXPECT_EQ(CheckDisc(&recorder, 1), -91);
    recorder.media = kMediaCdR;
    EXPECT_EQ(CheckDisc(&recorder, 1), 0);
    EXPECT_EQ(CheckDisc(&recorder, 400000), -89);
    recorder.capacityFails = true;
    EXPECT_EQ(CheckDisc(&recorder, 1), -88);
    recorder.media = kMediaCdRw;
    EXPECT_EQ(CheckDisc(&recorder, 1), -100);
    recorder.capacityFails = false;
    recorder.state = kDiscStateComplete;
    EXPECT_EQ(CheckDisc(&recorder, 1), 1);
    recorder.media = kMediaCdR;
    EXPECT_EQ(CheckDisc(&recorder, 1), -88);
    EXPECT_EQ(WaitMessageId(-88), text::kWaitNotWritable);
    EXPECT_EQ(WaitMessageId(-100), text::kWaitCheckFailed);
}

}  // namespace
}  // namespace ac::burn
