#include "resources/CodePage.h"

#include <gtest/gtest.h>

#include <string>

namespace ac {
namespace {

const std::string kReplacement = "\xEF\xBF\xBD";

struct ConversionCase {
    const char* name;
    int codePage;
    std::string bytes;
    std::string utf8;
};

class CodePageConversionTest : public ::testing::TestWithParam<ConversionCase> {};

TEST_P(CodePageConversionTest, ToUtf8) {
    EXPECT_EQ(CodePageToUtf8(GetParam().bytes, GetParam().codePage), GetParam().utf8);
}

INSTANTIATE_TEST_SUITE_P(
    Pages, CodePageConversionTest,
    ::testing::Values(
        ConversionCase{"Cp1252", 1252, "Gr\xFC\xDF \x80", "Gr\xC3\xBC\xC3\x9F \xE2\x82\xAC"},
        ConversionCase{"Cp1252Undefined", 1252, "a\x81z", "a" + kReplacement + "z"},
        ConversionCase{"Cp1251", 1251, "\xCC\xE8\xF0", "\xD0\x9C\xD0\xB8\xD1\x80"},
        // U+4E57 is 0x81 0x5C in GBK: the backslash byte is half of the character.
        ConversionCase{"Cp936TrailBackslash", 936, "\x81\x5Cn", "\xE4\xB9\x97n"},
        ConversionCase{"Cp936BadTrail", 936, "\x81\x20x", kReplacement + " x"},
        ConversionCase{"Cp936LeadAtEnd", 936, "ab\xD6", "ab" + kReplacement},
        ConversionCase{"Cp932TrailBackslash", 932, "\x95\x5C", "\xE8\xA1\xA8"},
        ConversionCase{"Cp949", 949, "\xC7\xD1", "\xED\x95\x9C"},
        ConversionCase{"Utf8Valid", 65001, "\xF0\x9F\x8E\xB5 ok", "\xF0\x9F\x8E\xB5 ok"},
        ConversionCase{"Utf8Overlong", 65001, "\xC0\xAF", kReplacement + kReplacement},
        ConversionCase{"Utf8Surrogate", 65001, "\xED\xA0\x80",
                       kReplacement + kReplacement + kReplacement},
        ConversionCase{"Utf8Truncated", 65001, "x\xE2\x82", "x" + kReplacement + kReplacement},
        ConversionCase{"Utf8BeyondUnicode", 65001, "\xF4\x90\x80\x80",
                       kReplacement + kReplacement + kReplacement + kReplacement},
        // A number no table knows: read as UTF-8, as files saved on this platform are.
        ConversionCase{"UnknownReadAsUtf8", 12345, "\xC3\xA4\xFF", "\xC3\xA4" + kReplacement},
        ConversionCase{"Empty", 936, "", ""}),
    [](const auto& info) { return std::string(info.param.name); });

TEST(CodePageTest, CharsetNames) {
    EXPECT_EQ(CodePageCharsetName(936), "CP936");
    EXPECT_EQ(CodePageCharsetName(932), "CP932");
    EXPECT_EQ(CodePageCharsetName(1252), "CP1252");
    EXPECT_EQ(CodePageCharsetName(28591), "ISO-8859-1");
    EXPECT_EQ(CodePageCharsetName(65001), "UTF-8");
    // glibc knows CP930 as EBCDIC; Windows has no such code page.
    EXPECT_EQ(CodePageCharsetName(930), "");
    EXPECT_EQ(CodePageCharsetName(0), "");
}

// More output than one conversion buffer holds, with a bad byte in the middle.
TEST(CodePageTest, LongLinesConvertWhole) {
    std::string bytes(3000, '\xE4');
    bytes[1500] = '\x81';
    std::string expected;
    for (int i = 0; i < 3000; ++i) {
        expected += i == 1500 ? kReplacement : std::string("\xC3\xA4");
    }
    CodePageConverter converter(1252);
    EXPECT_EQ(converter.ToUtf8(bytes), expected);
    // The converter is reused line after line; an error in one line leaves no state behind.
    EXPECT_EQ(converter.ToUtf8("\xFC"), "\xC3\xBC");
}

TEST(CodePageTest, ShiftStatesAreClosedPerLine) {
    CodePageConverter converter(50220);  // ISO-2022-JP
    EXPECT_EQ(converter.ToUtf8("\x1B$B$\"\x1B(B!"), "\xE3\x81\x82!");
    EXPECT_EQ(converter.ToUtf8("\x1B$B$\""), "\xE3\x81\x82");  // no return to ASCII
    EXPECT_EQ(converter.ToUtf8("A"), "A");
}

}  // namespace
}  // namespace ac
