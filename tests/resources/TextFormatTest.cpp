#include "resources/TextFormat.h"

#include <gtest/gtest.h>

namespace ac {
namespace {

TEST(TextFormatTest, ArgumentsInOrderAndNothingBeyondThem) {
    EXPECT_EQ(FormatText("%s: %s", {"a.mp3", "failed"}), "a.mp3: failed");
    EXPECT_EQ(FormatText("%d of %ld files, %5.1f%%", {"3", "7", "42.0"}), "3 of 7 files, 42.0%");
    // A translator's text with more conversions than arguments, or printf's dangerous ones.
    EXPECT_EQ(FormatText("%s %s %s", {"one"}), "one %s %s");
    EXPECT_EQ(FormatText("%n%s", {"x"}), "%nx");
    EXPECT_EQ(FormatText("100%", {}), "100%");
    EXPECT_EQ(FormatText("%-", {"x"}), "%-");
}

}  // namespace
}  // namespace ac
