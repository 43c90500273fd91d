// The power actions in dry-run mode: the line each one leaves, and that nothing else happens.

#include "platform/Power.h"

#include "../support/TempDir.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <fstream>
#include <sstream>

namespace ac::platform {
namespace {

std::string ReadAll(const std::string& path) {
    std::ostringstream out;
    out << std::ifstream(path).rdbuf();
    return out.str();
}

TEST(PowerTest, DryRunAppendsOneLinePerActionAndKeepsEarlierLines) {
    test::TempDir dir;
    const std::string file = dir / "power.log";
    std::ofstream(file) << "earlier\n";
    ::setenv("AUDIOCONV_POWER_DRYRUN", file.c_str(), 1);
    EXPECT_TRUE(ShutDownSystem(true));
    EXPECT_TRUE(SuspendSystem(false));
    EXPECT_TRUE(HibernateSystem(true));
    EXPECT_TRUE(ShutDownSystem(false));
    ::unsetenv("AUDIOCONV_POWER_DRYRUN");
    EXPECT_EQ(ReadAll(file), "earlier\npoweroff\nsuspend\nhibernate\npoweroff\n");
}

TEST(PowerTest, DryRunIntoAnUnwritablePlaceFailsWithoutActing) {
    test::TempDir dir;
    const std::string file = dir / "missing-folder/power.log";
    ::setenv("AUDIOCONV_POWER_DRYRUN", file.c_str(), 1);
    EXPECT_FALSE(SuspendSystem(true));
    ::unsetenv("AUDIOCONV_POWER_DRYRUN");
}

}  // namespace
}  // namespace ac::platform
