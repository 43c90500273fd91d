// The poll and the load of the first disc against drives whose discs the test puts in and takes
// out, and once against real disc images.

#include "rip/DriveWatcher.h"
#include "rip/TrackTable.h"

#include "../support/DiscImages.h"
#include "../support/TempDir.h"

#include <gtest/gtest.h>

#include <map>
#include <optional>

namespace ac {
namespace {

using platform::DiscTable;

DiscTable Table(int first, int last, std::vector<platform::TocTrack> tracks, int leadOut) {
    DiscTable table;
    table.firstTrack = first;
    table.lastTrack = last;
    table.tracks = std::move(tracks);
    table.leadOutLba = leadOut;
    return table;
}

DiscTable ThreeTracks() {
    return Table(1, 3, {{1, false, 150}, {2, false, 9000}, {3, false, 20000}}, 30000);
}

class FakeDiscDevice final : public platform::IDiscDevice {
public:
    std::map<std::string, DiscTable> discs;  // a drive not here is empty
    int reads = 0;

    std::vector<std::string> ListDrives(const std::vector<std::string>&) override { return {}; }
    bool ReadToc(const std::string& drive, DiscTable& table) override {
        ++reads;
        const auto found = discs.find(drive);
        table = found == discs.end() ? DiscTable{} : found->second;
        return found != discs.end();
    }
    bool LockTray(const std::string&, bool) override { return false; }
    bool SetTrayOpen(const std::string&, bool) override { return false; }
    bool IsImage(const std::string&) const override { return false; }
};

// The panel's side: the load timer fires on the tick after a poll started it.
struct Panel {
    DriveWatcher watcher;
    FakeDiscDevice device;
    std::vector<std::string> drives;
    int selected = 0;
    bool timerRunning = false;
    bool listFilled = false;

    DriveWatcher::PollResult Tick() {
        if (timerRunning) {
            timerRunning = false;
            const DriveWatcher::FirstDisc first = watcher.LoadFirstDisc(device, drives);
            if (first.driveIndex >= 0) {
                selected = first.driveIndex;
                listFilled = true;
            }
        }
        const DriveWatcher::PollResult result =
            watcher.PollDrives(device, drives, selected, !listFilled);
        timerRunning = timerRunning || result.startLoadTimer;
        if (result.emptySelected) {
            listFilled = false;
        }
        return result;
    }
};

TEST(DriveWatcherTest, DiscChangedByHandInOneDriveEmptiesThenLoadsWithinTwoTicks) {
    Panel panel;
    panel.drives = {"/dev/sr0"};
    panel.device.discs["/dev/sr0"] = ThreeTracks();

    EXPECT_TRUE(panel.Tick().startLoadTimer);
    EXPECT_TRUE(panel.watcher.DiscSeen());
    panel.Tick();
    EXPECT_TRUE(panel.listFilled);
    EXPECT_TRUE(panel.watcher.DiscLoaded());
    EXPECT_FALSE(panel.Tick().startLoadTimer);  // the same disc is not loaded again

    panel.device.discs.clear();  // ejected
    const auto ejected = panel.Tick();
    EXPECT_TRUE(ejected.emptySelected);
    EXPECT_FALSE(panel.listFilled);
    EXPECT_TRUE(panel.Tick().disableRipButtons);
    EXPECT_FALSE(panel.watcher.DiscSeen());
    EXPECT_FALSE(panel.watcher.DiscLoaded());

    panel.device.discs["/dev/sr0"] = ThreeTracks();  // the next disc
    panel.Tick();
    panel.Tick();
    EXPECT_TRUE(panel.listFilled);
}

TEST(DriveWatcherTest, TheSelectedDriveIsFollowedBehindAnotherDiscAndThroughASwap) {
    DriveWatcher watcher;
    FakeDiscDevice device;
    const std::vector<std::string> drives = {"/dev/sr0", "/dev/sr1"};
    device.discs["/dev/sr0"] = ThreeTracks();
    device.discs["/dev/sr1"] = ThreeTracks();
    EXPECT_EQ(watcher.PollDrives(device, drives, 1, false).selectedDiscId, DiscIdOf(ThreeTracks()));

    // Swapped between two polls: another id, which the panel loads.
    DiscTable other = ThreeTracks();
    other.leadOutLba += 750;
    ASSERT_NE(DiscIdOf(other), DiscIdOf(ThreeTracks()));
    device.discs["/dev/sr1"] = other;
    EXPECT_EQ(watcher.PollDrives(device, drives, 1, false).selectedDiscId, DiscIdOf(other));

    // Emptied while the first drive still holds its disc.
    device.discs.erase("/dev/sr1");
    const auto emptied = watcher.PollDrives(device, drives, 1, false);
    EXPECT_TRUE(emptied.emptySelected);
    EXPECT_EQ(emptied.selectedDiscId, kNoDiscId);
}

TEST(DriveWatcherTest, DiscInTheSecondDriveOnlyIsFoundThoughTheFirstIsSelected) {
    Panel panel;
    panel.drives = {"/dev/sr0", "/dev/sr1"};
    panel.device.discs["/dev/sr1"] = ThreeTracks();
    const auto first = panel.Tick();
    EXPECT_TRUE(first.emptySelected);
    EXPECT_TRUE(first.startLoadTimer);
    panel.Tick();
    EXPECT_EQ(panel.selected, 1);
    EXPECT_TRUE(panel.listFilled);
    EXPECT_FALSE(panel.Tick().emptySelected);
}

TEST(DriveWatcherTest, SingleTrackDiscsAndNoDrivesStartNothing) {
    Panel panel;
    panel.drives = {"/dev/sr0"};
    panel.device.discs["/dev/sr0"] = Table(1, 1, {{1, false, 150}}, 30000);
    EXPECT_FALSE(panel.Tick().startLoadTimer);
    EXPECT_FALSE(panel.watcher.DiscSeen());

    Panel empty;
    const auto result = empty.Tick();
    EXPECT_FALSE(result.startLoadTimer || result.emptySelected);
    EXPECT_EQ(empty.watcher.LoadFirstDisc(empty.device, empty.drives).driveIndex, -1);
}

TEST(DriveWatcherTest, PollAfterALoadByHandReadsNothing) {
    Panel panel;
    panel.drives = {"/dev/sr0"};
    panel.watcher.SkipNextPoll();
    EXPECT_TRUE(panel.Tick().skipped);
    EXPECT_EQ(panel.device.reads, 0);
    EXPECT_TRUE(panel.Tick().emptySelected);
    EXPECT_EQ(panel.device.reads, 1);
}

// Real images as drives: a one-track image is passed over for the three-track one behind it.
TEST(DriveWatcherTest, FirstAudioDiscAmongImages) {
    test::TempDir dir;
    const auto single =
        test::WriteDiscImage(dir.Path(), "single", {test::TrackSpec{44100, 0, false, 0, 300.0, 4}});
    const auto three = test::WriteDiscImage(dir.Path(), "three", test::ThreeTrackSpecs(150));
    const auto device = platform::MakeDiscDevice();
    const std::vector<std::string> drives =
        device->ListDrives({dir / "gone.cue", single.cuePath, three.cuePath});
    DiscTable table;
    const int found = FindFirstAudioDisc(*device, drives, table);
    ASSERT_GE(found, 0);
    EXPECT_EQ(drives[static_cast<size_t>(found)], three.cuePath);
    EXPECT_EQ(table.leadOutLba, three.LeadOutLba());
}

}  // namespace
}  // namespace ac
