// The burn list's tally: two-second gaps, carries and borrows.
#include "burn/Compilation.h"

#include <gtest/gtest.h>

namespace ac::burn {
namespace {

MediaFileInfo Length(int minutes, int seconds, int hours = 0) {
    MediaFileInfo info;
    info.hours = hours;
    info.minutes = minutes;
    info.seconds = seconds;
    info.microseconds = 999999;  // never counts
    return info;
}

TEST(CompilationTallyTest, GapsOfTwoSecondsAndRemovalBorrow) {
    CompilationTally tally;
    tally.Add(Length(3, 40));
    tally.Add(Length(4, 30));
    EXPECT_EQ(tally.minutes, 8);
    EXPECT_EQ(tally.seconds, 14);
    tally.Remove(Length(4, 30));
    EXPECT_EQ(tally.minutes, 3);
    EXPECT_EQ(tally.seconds, 42);
    tally.Remove(Length(3, 40));
    EXPECT_EQ(tally.minutes, 0);
    EXPECT_EQ(tally.seconds, 0);
}

TEST(CompilationTallyTest, HoursCountAsMinutesAndHundredTracksAddUp) {
    CompilationTally tally;
    tally.Add(Length(1, 58, 1));
    EXPECT_EQ(tally.minutes, 62);
    EXPECT_EQ(tally.seconds, 0);
    tally.Clear();
    for (int i = 0; i < 100; ++i)
        tally.Add(Length(0, 58));
    EXPECT_EQ(tally.minutes, 100);
    EXPECT_EQ(tally.seconds, 0);
    EXPECT_EQ(ScaleForDisc(true).overMark, 80);
    EXPECT_EQ(ScaleForDisc(false).tickStep, 65);
}

}  // namespace
}  // namespace ac::burn
