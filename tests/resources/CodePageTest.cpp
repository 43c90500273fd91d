#include "resources/CodePage.h"

#include <gtest/gtest.h>

#include <string>

namespace ac {
namespace {

const std::string kBad = "\xEF\xBF\xBD";  // U+FFFD

TEST(CodePageTest, ConvertsToUtf8WithAReplacementPerBadByte) {
    struct Case {
        int codePage;
        std::string bytes;
        std::string utf8;
    };
    const Case cases[] = {
        {1252, "Gr\xFC\xDF \x80", "Gr\xC3\xBC\xC3\x9F \xE2\x82\xAC"},
        {1252, "a\x81z", "a" + kBad + "z"},  // undefined in the page
        // U+4E57 is 0x81 0x5C in GBK: the backslash byte is half of the character.
        {936, "\x81\x5Cn", "\xE4\xB9\x97n"},
        {936, "\x81\x20x", kBad + " x"},
        {936, "ab\xD6", "ab" + kBad},
        {65001, "\xF0\x9F\x8E\xB5 ok", "\xF0\x9F\x8E\xB5 ok"},
        {65001, "\xC0\xAF", kBad + kBad},                        // overlong
        {65001, "\xED\xA0\x80", kBad + kBad + kBad},             // surrogate
        {65001, "x\xE2\x82", "x" + kBad + kBad},                 // cut short
        {65001, "\xF4\x90\x80\x80", kBad + kBad + kBad + kBad},  // beyond U+10FFFF
        // Numbers no table knows, and IBM's EBCDIC 930, are read as UTF-8 as files saved on
        // this platform are.
        {12345, "\xC3\xA4\xFF", "\xC3\xA4" + kBad},
        {930, "abc", "abc"}};
    for (const Case& c : cases) {
        EXPECT_EQ(CodePageToUtf8(c.bytes, c.codePage), c.utf8) << c.codePage << ": " << c.bytes;
    }
}

// More output than one conversion buffer holds, with a bad byte in the middle.
TEST(CodePageTest, LongLinesConvertWhole) {
    std::string bytes(3000, '\xE4');
    bytes[1500] = '\x81';
    CodePageConverter converter(1252);
    const std::string text = converter.ToUtf8(bytes);
    EXPECT_EQ(text.size(), 2 * 2999 + kBad.size());
    EXPECT_EQ(text.find(kBad), 3000u);
    EXPECT_EQ(text.substr(text.size() - 2), "\xC3\xA4");
    // The converter is reused line after line; an error in one line leaves no state behind.
    EXPECT_EQ(converter.ToUtf8("\xFC"), "\xC3\xBC");
}

}  // namespace
}  // namespace ac
