// The status bar's arithmetic: run percentages, the runs of the three fills, the scale, and the
// names of refused files.

#include "panels/StatusLogic.h"

#include <gtest/gtest.h>

#include <cmath>
#include <limits>

namespace ac {
namespace {

TEST(PercentTest, CutsToWholeNumbersAndGuardsTheTotal) {
    EXPECT_EQ(Percent(50, 200), 25);
    EXPECT_EQ(Percent(99.9, 100), 99) << "cut, not rounded";
    EXPECT_EQ(Percent(5, 0.09), 0) << "a total below 0.1 leaves the bar at 0";
    EXPECT_EQ(Percent(5, 0.1), 5000);
    EXPECT_EQ(Percent(5, 0), 0);
    EXPECT_EQ(Percent(5, -3), 0);
    EXPECT_EQ(Percent(5, std::nan("")), 0);
    EXPECT_EQ(Percent(std::nan(""), 10), 0);
    EXPECT_EQ(Percent(1e300, 1), std::numeric_limits<int>::max());
}

TEST(PercentTest, RipBarShowsEmptyOnceTheSumsReachTheTotal) {
    EXPECT_EQ(RipPercent(99.99, 100), 99);
    EXPECT_EQ(RipPercent(100, 100), 0);
    EXPECT_EQ(RipPercent(250, 100), 0);
    EXPECT_EQ(RipPercent(10, 0.05), 0);
}

// The audio disc on a bar 900 pixels wide: a mark every 10 pixels per minute.
CapacityBarState AudioDisc(long long position) {
    CapacityBarState state;
    state.high = 90;
    state.nearMark = 75;
    state.overMark = 80;
    state.maxMark = 90;
    state.tileOffsetX = 1;
    state.width = 900;
    state.position = position;
    return state;
}

TEST(CapacityBarRunsTest, ColoursFollowThePositionAgainstTheMarks) {
    using F = CapacityFill;
    EXPECT_EQ(CapacityBarRuns(AudioDisc(70)), (std::vector<CapacityRun>{{1, 700, F::Normal}}));
    EXPECT_EQ(CapacityBarRuns(AudioDisc(75)), (std::vector<CapacityRun>{{1, 750, F::Normal}}))
        << "at the near mark the bar is still one colour";
    EXPECT_EQ(CapacityBarRuns(AudioDisc(80)),
              (std::vector<CapacityRun>{{1, 751, F::Normal}, {751, 800, F::NearOverflow}}))
        << "at the over mark exactly: two colours";
    EXPECT_EQ(CapacityBarRuns(AudioDisc(85)),
              (std::vector<CapacityRun>{
                  {1, 751, F::Normal}, {751, 801, F::NearOverflow}, {801, 849, F::Overflow}}))
        << "beyond it: three, the last ending a pixel short of the filled part";
    EXPECT_EQ(CapacityBarRuns(AudioDisc(81)).size(), 3u)
        << "just beyond the mark the third run exists even while it paints nothing yet";
}

TEST(CapacityBarRunsTest, PlainRangeDropsTheMarks) {
    CapacityBarState state = AudioDisc(85);
    state.nearMark = state.overMark = state.maxMark = 0;
    state.low = 0;
    state.high = 100;
    EXPECT_FALSE(HasCapacityMarks(state));
    EXPECT_EQ(CapacityBarRuns(state), (std::vector<CapacityRun>{{1, 765, CapacityFill::Normal}}));
    EXPECT_TRUE(CapacityBarScale(state, 10).empty());
    state.high = state.low;
    EXPECT_EQ(FilledWidth(state), 0) << "an empty range fills nothing";
    state.low = 50;
    state.high = 150;
    state.position = 100;
    EXPECT_EQ(FilledWidth(state), 450) << "measured from the low end";
}

TEST(CapacityBarRunsTest, ScaleStopsBelowTheMaximum) {
    const auto audio = CapacityBarScale(AudioDisc(0), 10);
    ASSERT_EQ(audio.size(), 8u);
    EXPECT_EQ(audio.front().value, 10);
    EXPECT_EQ(audio.front().x, 99) << "(900 - 1) x 10 / 90, cut";
    EXPECT_EQ(audio.back().value, 80) << "the last mark, which carries the unit";
    EXPECT_TRUE(CapacityBarScale(AudioDisc(0), 90).empty()) << "a step at the maximum";
    EXPECT_TRUE(CapacityBarScale(AudioDisc(0), 200).empty()) << "a step beyond it";

    CapacityBarState data = AudioDisc(0);
    data.nearMark = 665;
    data.overMark = 690;
    data.maxMark = data.high = 715;
    const auto ticks = CapacityBarScale(data, 65);
    ASSERT_EQ(ticks.size(), 10u);
    EXPECT_EQ(ticks.back().value, 650);
}

TEST(CapacityBarRunsTest, TilesAreWholeCopiesFromTheRunsStart) {
    EXPECT_EQ(TileStarts(1, 20, 8), (std::vector<int>{1, 9, 17}));
    EXPECT_EQ(TileStarts(1, 17, 8), (std::vector<int>{1, 9}));
    EXPECT_TRUE(TileStarts(20, 20, 8).empty());
    EXPECT_TRUE(TileStarts(30, 20, 8).empty()) << "an empty run paints nothing";
    EXPECT_TRUE(TileStarts(0, 20, 0).empty()) << "a picture without width";
}

TEST(RefusedFileTitleTest, ExtensionsAreShortSuffixesOfTheNameOnly) {
    EXPECT_EQ(RefusedFileTitle("/music/album/song.flac"), "song");
    EXPECT_EQ(RefusedFileTitle("/music/a.wav"), "a");
    EXPECT_EQ(RefusedFileTitle("C:\\music\\track.mp3"), "track");
    EXPECT_EQ(RefusedFileTitle("/music/notes.backup"), "notes.backup");
    EXPECT_EQ(RefusedFileTitle("/music.d/name"), "name") << "a dot in a folder is no extension";
    EXPECT_EQ(RefusedFileTitle("/music/.hidden"), ".hidden");
    EXPECT_EQ(RefusedFileTitle("/music/a.b.ogg"), "a.b");
    EXPECT_EQ(RefusedFileTitle("plain"), "plain");
}

}  // namespace
}  // namespace ac
