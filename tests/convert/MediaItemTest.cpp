#include "convert/MediaItem.h"

#include "DriverFakes.h"

#include <gtest/gtest.h>

namespace ac {
namespace {

struct DurationCase {
    const char* name;
    int minutes, seconds, microseconds;
    std::int64_t durationUs, startUs;
    double expected;
};

class EffectiveDurationTest : public ::testing::TestWithParam<DurationCase> {};

TEST_P(EffectiveDurationTest, CutsTheFileByDurationAndStart) {
    const auto& c = GetParam();
    MediaFileInfo info;
    info.hours = 1;
    info.minutes = c.minutes;
    info.seconds = c.seconds;
    info.microseconds = c.microseconds;
    EXPECT_DOUBLE_EQ(EffectiveDurationSeconds(info, c.durationUs, c.startUs), c.expected);
}

INSTANTIATE_TEST_SUITE_P(
    Cuts, EffectiveDurationTest,
    ::testing::Values(
        DurationCase{"Full", 2, 3, 500000, 0, 0, 3723.5},
        // ss only counts when t is set.
        DurationCase{"FullIgnoresStart", 0, 0, 0, 0, 60000000, 3600},
        DurationCase{"CutShorterThanRest", 0, 0, 0, 90900000, 60000000, 90},
        DurationCase{"CutLongerThanRest", 0, 0, 0, 7200000000, 1800000000, 1800},
        DurationCase{"StartBeyondEnd", 0, 0, 0, 10000000, 7200000000, 3600},
        // Fractions of a second in the cut are dropped.
        DurationCase{"SubSecondCutIsFull", 0, 0, 0, 999999, 0, 3600}),
    [](const auto& info) { return std::string(info.param.name); });

TEST(MediaItemTest, ExitCodesMapToStatuses) {
    EXPECT_EQ(StatusForExitCode(0), JobStatus::Completed);
    EXPECT_EQ(StatusForExitCode(65535), JobStatus::Aborted);
    EXPECT_EQ(StatusForExitCode(-100), JobStatus::Failed);
    EXPECT_EQ(StatusForExitCode(1), JobStatus::Failed);
    EXPECT_EQ(StatusForExitCode(128 + 9), JobStatus::Failed);
}

TEST(MediaItemTest, ZeroDurationGivesNoPercentInsteadOfInfinity) {
    MediaItem item;
    item.AdoptProcess(std::make_unique<CEncodeProcess>());
    EXPECT_EQ(ProgressPercent(item), 0);
    item.info.seconds = 10;
    item.parameters = std::make_unique<test::FakeParameters>(0, 0);
    EXPECT_EQ(ProgressPercent(item), 0);
}

TEST(MediaItemTest, StatusTextsUseTheLanguageIds) {
    EXPECT_EQ(StatusTextId(JobStatus::Failed), 123u);
    EXPECT_EQ(StatusTextId(JobStatus::Idle), 0u);
    EXPECT_EQ(StatusTextId(JobStatus::AbortedSuspended), 124u);
    EXPECT_EQ(StatusTextId(static_cast<JobStatus>(42)), 0u);
}

}  // namespace
}  // namespace ac
