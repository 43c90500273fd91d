// The rip driver against a stand-in tool: a shell script that behaves like ctt where it matters
// (part file, rename when complete, time lines, errors, SIGTERM), driven through the UI queue
// the way the program drives it.
#include "rip/RipDriver.h"

#include "platform/CommandLine.h"
#include "platform/UiQueue.h"
#include "support/TempDir.h"

#include <gtest/gtest.h>

#include <sys/stat.h>

#include <chrono>
#include <condition_variable>
#include <deque>
#include <filesystem>
#include <fstream>
#include <mutex>
#include <thread>

namespace ac {
namespace {

namespace fs = std::filesystem;

// The UI thread of the test: posted calls wait here until the test pumps them.
class TestQueue {
public:
    TestQueue() {
        UiQueue::SetPoster([this](UiQueue::Call call) {
            std::lock_guard lock(m_mutex);
            m_calls.push_back(std::move(call));
            m_changed.notify_all();
        });
    }
    ~TestQueue() { UiQueue::SetPoster(nullptr); }

    // Runs posted calls until `done` holds or 20 s pass.
    template <typename Done>
    bool PumpUntil(Done done) {
        const auto deadline = std::chrono::steady_clock::now() + std::chrono::seconds(20);
        while (!done()) {
            UiQueue::Call call;
            {
                std::unique_lock lock(m_mutex);
                if (!m_changed.wait_until(lock, deadline, [&] { return !m_calls.empty(); })) return false;
                call = std::move(m_calls.front());
                m_calls.pop_front();
            }
            call();
        }
        return true;
    }

private:
    std::mutex m_mutex;
    std::condition_variable m_changed;
    std::deque<UiQueue::Call> m_calls;
};

struct Row {
    RipTrackItem item;
    std::string title;
    bool checked = true;
    bool selected = false;
    RipStatus status = RipStatus::None;
};

class FakeList : public IRipList {
public:
    std::vector<Row> rows;
    int RowCount() override { return static_cast<int>(rows.size()); }
    bool IsChecked(int row) override { return rows.at(row).checked; }
    void SetChecked(int row, bool checked) override { rows.at(row).checked = checked; }
    bool IsSelected(int row) override { return rows.at(row).selected; }
    RipTrackItem* Item(int row) override {
        return row >= 0 && row < RowCount() ? &rows[static_cast<std::size_t>(row)].item : nullptr;
    }
    std::string Title(int row) override { return rows.at(row).title; }
    void SetStatus(int row, RipStatus status, int) override { rows.at(row).status = status; }
};

class FakeHost : public IRipHost {
public:
    bool reRipAnswer = false;
    bool stopAnswer = true;
    int reRipAsked = 0;
    std::vector<std::string> tray;  // "lock", "unlock", "open" in order
    int finishedRuns = 0;
    int lastCompleted = -1;
    int lastFailed = -1;
    RipDiscTexts disc{"Artist", "Album", "Rock", "1999"};

    bool AskReRip() override {
        ++reRipAsked;
        return reRipAnswer;
    }
    bool AskStopRun() override { return stopAnswer; }
    void LockTray(bool lock) override {
        if (tray.empty() || tray.back() != (lock ? "lock" : "unlock")) tray.push_back(lock ? "lock" : "unlock");
    }
    void OpenTray() override { tray.push_back("open"); }
    void RunStateChanged(bool, bool) override {}
    void RunFinished(int completed, int failed) override {
        ++finishedRuns;
        lastCompleted = completed;
        lastFailed = failed;
    }
    void RefreshRowParameters(int, RipTrackItem&) override {}
    RipDiscTexts DiscTexts() override { return disc; }
    IProcessLog* Log() override { return nullptr; }
    IStatusText* Status() override { return nullptr; }
};

// Writes its part file beside the output like ctt, reports time, renames when complete. The
// source path steers it: "fail" errors out, "slow" runs for ten seconds and cleans up on SIGTERM.
// It also records the words it was given, one per line, in ARGS beside itself.
constexpr const char* kFakeTool = R"(#!/bin/bash
out="${@: -1}"; src=""; prev=""
for a in "$@"; do printf '%s\n' "$a" >> "$(dirname "$0")/args"; [ "$prev" = "-i" ] && src="$a"; prev="$a"; done
part="$(dirname "$out")/.$(basename "$out").ctt$$.part"
case "$src" in
  *fail*) echo "|Error>>> cannot read the track" >&2; exit 1 ;;
  *slow*) trap 'rm -f "$part"; exit 143' TERM
          echo partial > "$part"
          for i in $(seq 1 100); do echo "|Time>>> $i"; sleep 0.1; done ;;
esac
echo "|Time>>> 1"; printf 'audio of %s' "$src" > "$part"; echo "|Time>>> 3"; mv "$part" "$out"
)";

class RipDriverTest : public ::testing::Test {
protected:
    void SetUp() override {
        tool = dir / "ctt";
        std::ofstream(tool) << kFakeTool;
        fs::permissions(tool, fs::perms::owner_all);
        out = dir / "out";
        fs::create_directory(out);
        settings.outputDirectory = out;
        settings.toolPath = tool;
        settings.toolDirectory = dir.Path();
        settings.naming.allScheme = "E,AE,AEB,ABE,AHE,AEH";
        settings.naming.scheme = 1;  // AE: 01-Title
        driver.SetSettings(settings);
    }

    void AddTrack(const std::string& title, const std::string& source = "/dev/sr0/Track01.cda") {
        Row row;
        row.title = title;
        row.item.sourcePath = source;
        row.item.extension = "mp3";
        row.item.codec = "libmp3lame";
        row.item.sampleRate = 44100;
        row.item.channels = 2;
        row.item.bitRate = 192;
        row.item.duration = 3;
        list.rows.push_back(row);
    }

    bool RunToEnd() {
        return queue.PumpUntil([&] { return !driver.IsRunning(); });
    }

    std::vector<std::string> PartFiles() {
        std::vector<std::string> found;
        for (auto& entry : fs::recursive_directory_iterator(out)) {
            if (entry.path().filename().string().ends_with(".part")) found.push_back(entry.path());
        }
        return found;
    }

    test::TempDir dir;
    std::string tool;
    std::string out;
    RipSettings settings;
    TestQueue queue;
    FakeList list;
    FakeHost host;
    RipDriver driver{list, host};
};

TEST_F(RipDriverTest, RipsCheckedTracksIntoArtistAndAlbumFoldersAndGoesOnPastAFailure) {
    AddTrack("First Song");
    AddTrack("Broken", "/dev/sr0/fail.cda");
    AddTrack("Skipped");
    list.rows[2].checked = false;
    AddTrack("Last Song");
    settings.ejectCd = true;
    driver.SetSettings(settings);

    driver.RipNextTrack();
    ASSERT_TRUE(RunToEnd());

    EXPECT_TRUE(fs::exists(out + "/Artist/Album/01-First Song.mp3"));
    EXPECT_FALSE(fs::exists(out + "/Artist/Album/02-Broken.mp3"));
    EXPECT_TRUE(fs::exists(out + "/Artist/Album/04-Last Song.mp3"));
    EXPECT_EQ(list.rows[0].status, RipStatus::Completed);
    EXPECT_EQ(list.rows[1].status, RipStatus::Failed);
    EXPECT_EQ(list.rows[2].status, RipStatus::None);
    EXPECT_EQ(list.rows[3].status, RipStatus::Completed);
    EXPECT_TRUE(list.rows[1].item.converted);  // a failed track counts as done for the re-rip rule
    EXPECT_EQ(host.finishedRuns, 1);
    EXPECT_EQ(host.lastCompleted, 2);
    EXPECT_EQ(host.lastFailed, 1);
    EXPECT_EQ(host.tray, (std::vector<std::string>{"lock", "unlock", "open"}));
    EXPECT_TRUE(PartFiles().empty());
}

TEST_F(RipDriverTest, NothingCheckedStillLocksUnlocksAndEndsTheRun) {
    AddTrack("Song");
    list.rows[0].checked = false;
    driver.RipNextTrack();
    EXPECT_FALSE(driver.IsRunning());
    EXPECT_EQ(host.tray, (std::vector<std::string>{"lock", "unlock"}));
    EXPECT_EQ(host.finishedRuns, 1);
}

TEST_F(RipDriverTest, TakenNamesGetTheNextFreeNumberFromZero) {
    fs::create_directories(out + "/Artist/Album");
    std::ofstream(out + "/Artist/Album/01-Song.mp3") << "old";
    std::ofstream(out + "/Artist/Album/01-Song-0.mp3") << "old";
    AddTrack("Song");
    driver.RipNextTrack();
    ASSERT_TRUE(RunToEnd());
    EXPECT_TRUE(fs::exists(out + "/Artist/Album/01-Song-1.mp3"));
    std::ifstream old(out + "/Artist/Album/01-Song.mp3");
    EXPECT_EQ(std::string(std::istreambuf_iterator<char>(old), {}), "old");
}

TEST_F(RipDriverTest, SecondRunAsksOnceAboutRippedTracksAndNoSkipsThem) {
    AddTrack("One");
    AddTrack("Two");
    driver.RipNextTrack();
    ASSERT_TRUE(RunToEnd());
    fs::remove_all(out + "/Artist");

    host.reRipAnswer = false;
    driver.RipNextTrack();
    ASSERT_TRUE(RunToEnd());
    EXPECT_EQ(host.reRipAsked, 1);
    EXPECT_FALSE(fs::exists(out + "/Artist/Album/01-One.mp3"));

    host.reRipAnswer = true;
    driver.RipNextTrack();
    ASSERT_TRUE(RunToEnd());
    EXPECT_EQ(host.reRipAsked, 2);
    EXPECT_TRUE(fs::exists(out + "/Artist/Album/01-One.mp3"));
    EXPECT_TRUE(fs::exists(out + "/Artist/Album/02-Two.mp3"));
}

TEST_F(RipDriverTest, StopWhilePausedOrRunningLeavesNoFileAndUnlocksTheTray) {
    AddTrack("Slow", "/dev/sr0/slow.cda");
    AddTrack("Next");
    driver.RipNextTrack();
    ASSERT_TRUE(driver.HasChild());
    // Wait until the tool has its part file open, then pause it mid-track.
    ASSERT_TRUE(queue.PumpUntil([&] {
        std::this_thread::sleep_for(std::chrono::milliseconds(20));
        UiQueue::Post([] {});
        return !PartFiles().empty();
    }));
    driver.PauseRip();
    EXPECT_EQ(list.rows[0].status, RipStatus::Paused);
    EXPECT_EQ(list.rows[1].status, RipStatus::None);

    host.stopAnswer = false;
    EXPECT_FALSE(driver.StopRip());
    EXPECT_TRUE(driver.HasChild());
    host.stopAnswer = true;
    EXPECT_TRUE(driver.StopRip());

    EXPECT_FALSE(driver.IsRunning());
    EXPECT_EQ(list.rows[0].status, RipStatus::Aborted);
    EXPECT_TRUE(PartFiles().empty());
    EXPECT_FALSE(fs::exists(out + "/Artist/Album/01-Slow.mp3"));
    EXPECT_EQ(host.tray.back(), "unlock");
    EXPECT_EQ(host.finishedRuns, 0);  // a stop is not the end of a run
}

TEST_F(RipDriverTest, RipSelectedRunsOnlyTheSelectedRows) {
    AddTrack("One");
    AddTrack("Two");
    AddTrack("Three");
    list.rows[1].selected = true;
    list.rows[1].checked = false;
    driver.RipSelected();
    ASSERT_TRUE(RunToEnd());
    EXPECT_FALSE(fs::exists(out + "/Artist/Album/01-One.mp3"));
    EXPECT_TRUE(fs::exists(out + "/Artist/Album/02-Two.mp3"));
    EXPECT_FALSE(fs::exists(out + "/Artist/Album/03-Three.mp3"));
    EXPECT_TRUE(list.rows[1].checked);
    EXPECT_FALSE(list.rows[1].item.queued);
}

TEST_F(RipDriverTest, AMissingOutputFolderFailsEachRowWithoutMakingIt) {
    settings.outputDirectory = out + "/gone";
    driver.SetSettings(settings);
    AddTrack("One");
    AddTrack("Two");
    driver.RipNextTrack();
    ASSERT_TRUE(RunToEnd());
    EXPECT_EQ(list.rows[0].status, RipStatus::Failed);
    EXPECT_EQ(list.rows[1].status, RipStatus::Failed);
    EXPECT_FALSE(fs::exists(out + "/gone"));
    EXPECT_EQ(host.lastFailed, 2);
}

TEST(RipNames, DiscTextsNeverLeaveTheOutputFolder) {
    RipSettings settings;
    settings.outputDirectory = "/music/";
    settings.naming.allScheme = "AEB";
    settings.naming.scheme = 0;

    RipOutputName name = MakeRipOutputName(settings, 2, "../../etc/passwd", {"..", "AC/DC", "", ""});
    EXPECT_EQ(name.folder, "/music/unknown artist/ACDC");
    EXPECT_EQ(name.base, "03-....etcpasswd");

    name = MakeRipOutputName(settings, 0, "Tab\there\nnewline", {"Art\x01ist", "", "", ""});
    EXPECT_EQ(name.folder, "/music/Artist/unknown album");
    EXPECT_EQ(name.base, "01-Tabherenewline-Artist");

    const std::string longText(300, 'x');
    name = MakeRipOutputName(settings, 0, "T", {longText, longText, "", ""});
    EXPECT_EQ(name.folder, "/music/" + std::string(255, 'x') + "/" + std::string(255, 'x'));

    // A pattern that names nothing still gives a visible file.
    settings.naming.allScheme = "D";
    EXPECT_EQ(MakeRipOutputName(settings, 4, "T", {}).base, "Track05");
    // Empty fields leave no '-' behind.
    settings.naming.allScheme = "ABEC";
    EXPECT_EQ(MakeRipOutputName(settings, 0, "T", {"", "", "", "1999"}).base, "01-T-1999");
}

TEST(RipCommandText, NumbersTagsAndEveryCharacterOfANameReachTheTool) {
    RipTrackItem item;
    item.sourcePath = "/home/me/disc \"live\".cue/Track03.cda";
    item.extension = "MP3";
    item.codec = "libmp3lame";
    item.sampleRate = 44100;
    item.channels = 2;
    item.bitRate = 0;
    item.volume = 200;
    const std::string text =
        BuildRipCommandText(item, "12\" Mix \\ back", {"A \"B\"", "Al", "Rock", "1999"}, "/o/x.mp3");
    EXPECT_EQ(item.bitRate, 192);

    const std::vector<std::string> words = platform::SplitCommandLine(text);
    auto valueOf = [&](const std::string& option) {
        for (std::size_t i = 0; i + 1 < words.size(); ++i) {
            if (words[i] == option) return platform::RestoreCommandValue(words[i + 1]);
        }
        return std::string("<none>");
    };
    EXPECT_EQ(valueOf("-i"), item.sourcePath);
    EXPECT_EQ(valueOf("-title"), "12\" Mix \\ back");
    EXPECT_EQ(valueOf("-author"), "A \"B\"");
    EXPECT_EQ(valueOf("-ab"), "192");
    EXPECT_EQ(valueOf("-vol"), "512");
    EXPECT_EQ(platform::RestoreCommandValue(words.back()), "/o/x.mp3");

    item.extension = "flac";
    item.volume = 0;
    const std::vector<std::string> flac = platform::SplitCommandLine(BuildRipCommandText(item, "T", {}, "/o/x.flac"));
    EXPECT_NE(std::find(flac.begin(), flac.end(), "flac"), flac.end());
    EXPECT_EQ(std::find(flac.begin(), flac.end(), "-vol"), flac.end());  // a disc's FLAC keeps its level

    EXPECT_EQ(RipVolumeNumber(100), 256);
    EXPECT_EQ(RipVolumeNumber(0), 128);
    EXPECT_EQ(RipVolumeNumber(101), 256);  // halved toward zero first
}

}  // namespace
}  // namespace ac
