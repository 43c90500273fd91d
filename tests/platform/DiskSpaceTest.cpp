// The free-space check the rip and burn tabs run every few seconds: a folder the user has not
// made yet, or a name that is a file, must not read as a full disk and stop a run.

#include "platform/Paths.h"

#include "../support/TempDir.h"

#include <gtest/gtest.h>

#include <fstream>

namespace ac::platform {
namespace {

TEST(DiskSpaceTest, OnlyAnExistingFolderHasFreeBytes) {
    test::TempDir dir;
    const std::optional<std::uint64_t> free = FreeDiskBytes(dir.Path());
    ASSERT_TRUE(free.has_value());
    EXPECT_GT(*free, 0u);

    std::ofstream(dir / "file") << "x";
    EXPECT_FALSE(FreeDiskBytes(dir / "file").has_value());
    EXPECT_FALSE(FreeDiskBytes(dir / "not made yet").has_value());
    EXPECT_FALSE(FreeDiskBytes("").has_value());

    EXPECT_FALSE(IsLowOnDiskSpace(""));
    EXPECT_FALSE(IsLowOnDiskSpace(dir / "not made yet"));
    EXPECT_FALSE(IsLowOnDiskSpace(dir / "file"));
    EXPECT_EQ(IsLowOnDiskSpace(dir.Path()), *free < 209715200u);
}

}  // namespace
}  // namespace ac::platform
