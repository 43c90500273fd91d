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

// Every byte a Linux file name can hold travels through the command text and back: quotes,
// backslashes, blanks and line ends, the stand-in and the escape themselves, bytes that are not
// UTF-8, and a leading dash.
TEST(SplitCommandLineTest, AnyFileNameSurvivesQuotingSplittingAndRestoring) {
    const Words names = {"12\" Mix.flac", "it's \"quoted\".ogg", "back\\slash.ogg", "new\nline\r.wav",
                         "-dash.wav",     "tab\there",          "bad\xff\xfe.mp3", "vt\x0B\x10v\x10.wav",
                         "\x10\x10\x0B",  "\"",                 "",               "/a b/c\"\"d/"};
    std::string text = "-relk -y ";
    for (const std::string& name : names) text += " -i " + QuoteCommandValue(name);
    const Words words = SplitCommandLine(text);
    ASSERT_EQ(words.size(), 2 + 2 * names.size());
    for (std::size_t i = 0; i < names.size(); ++i) {
        EXPECT_EQ(words[2 + 2 * i], "-i");
        EXPECT_EQ(RestoreCommandValue(words[3 + 2 * i]), names[i]) << i;
    }
    // A text without the escape byte reads as it always has: 0x0B is a quote, the rest stays.
    EXPECT_EQ(RestoreCommandValue("say \x0Bhi\x0B C:\\x"), "say \"hi\" C:\\x");
    EXPECT_EQ(QuoteCommandValue("My Song"), "\"My Song\"");
}

}  // namespace
}  // namespace ac::platform
