#include "platform/CommandLine.h"

#include <gtest/gtest.h>

namespace ac::platform {
namespace {

using Words = std::vector<std::string>;

TEST(SplitCommandLineTest, QuotesGroupBlanksSeparate) {
    // The form the conversion list builds, with its runs of blanks.
    EXPECT_EQ(SplitCommandLine(" -relk -y  -i \"C:\\Music\\a b.wav\" -title \"My Song\"     "
                               "-acodec \"mp3\"  -vol  256   \"/out/a b.mp3\""),
              (Words{"-relk", "-y", "-i", "C:\\Music\\a b.wav", "-title", "My Song", "-acodec",
                     "mp3", "-vol", "256", "/out/a b.mp3"}));
    EXPECT_EQ(SplitCommandLine("-comment \"\" -x"), (Words{"-comment", "", "-x"}));
    EXPECT_EQ(SplitCommandLine("a\"b c\"d e"), (Words{"ab cd", "e"}));
    EXPECT_EQ(SplitCommandLine("   "), Words{});
    // An unclosed quote runs to the end; the stand-in for a quote is left to the tool.
    EXPECT_EQ(SplitCommandLine("-title \"say \x0Bhi\x0B"), (Words{"-title", "say \x0Bhi\x0B"}));
}

}  // namespace
}  // namespace ac::platform
