// The shipped text data: the built-in tables must survive the language-file form, and
// data/lang/German.lang must load in its code page, name only ids the program knows, translate
// every menu text, and keep each format's conversions so that a translated text never breaks
// the printf call it is handed to.

#include "resources/BuiltinStrings.h"
#include "resources/Language.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <fstream>
#include <string_view>
#include <sstream>
#include <string>
#include <vector>

namespace ac {
namespace {

// The string that the play button shows while playing has no built-in text on purpose: only a
// language file may give it one.
constexpr std::uint32_t kPauseFaceString = 1009;

std::vector<std::string> ReadRawLines(const std::string& path) {
    std::ifstream in(path, std::ios::binary);
    std::stringstream buffer;
    buffer << in.rdbuf();
    std::vector<std::string> lines;
    std::string line;
    std::istringstream split(buffer.str());
    while (std::getline(split, line))
        lines.push_back(line);
    return lines;
}

// The printf conversions in order, and the control characters that the file escapes.
// (A hand scan: gcc 12's std::regex trips -Wmaybe-uninitialized in sanitizer builds.)
std::vector<std::string> FormatSkeleton(const std::string& text) {
    std::vector<std::string> skeleton;
    for (std::size_t i = text.find('%'); i != std::string::npos; i = text.find('%', i)) {
        std::size_t end = text.find_first_not_of("-+ #0", i + 1);
        end = text.find_first_not_of("0123456789.", end == std::string::npos ? text.size() : end);
        while (end < text.size() && (text[end] == 'h' || text[end] == 'l')) ++end;
        if (end < text.size() && std::string_view("diouxXcsfeEgG%").find(text[end]) !=
                                     std::string_view::npos) {
            skeleton.push_back(text.substr(i, end - i + 1));
            i = end + 1;
        } else {
            ++i;
        }
    }
    for (char c : text) {
        if (c == '\t' || c == '\n' || c == '\r')
            skeleton.push_back(std::string(1, c));
    }
    return skeleton;
}

class GermanLanguageFile : public ::testing::Test {
protected:
    static void SetUpTestSuite() {
        s_raw = ReadRawLines(std::string(AC_SOURCE_DIR) + "/data/lang/German.lang");
        s_tables = LanguageTables{};
        ParseLanguageFile(s_raw, s_tables);
    }
    static std::vector<std::string> s_raw;
    static LanguageTables s_tables;
};
std::vector<std::string> GermanLanguageFile::s_raw;
LanguageTables GermanLanguageFile::s_tables;

TEST_F(GermanLanguageFile, HeaderAndLocale) {
    ASSERT_FALSE(s_raw.empty());
    EXPECT_EQ(s_tables.codePage, 1252);
    EXPECT_EQ(s_tables.language, 7);
    EXPECT_EQ(s_tables.subLang, 1);
    EXPECT_EQ(s_tables.langCode, "de");
    EXPECT_EQ(s_tables.charset, 0);
    const std::string* locale = FindLanguageText(s_tables.strings, 99);
    ASSERT_NE(locale, nullptr);
    EXPECT_EQ(*locale, "de_DE.UTF-8");
}

TEST_F(GermanLanguageFile, IsStoredInCp1252AndReadsAsUtf8) {
    // The file holds single-byte umlauts; saved as UTF-8 by mistake it would read as
    // two Latin-1 characters per umlaut under CODEPAGE=1252.
    const std::string* change = FindLanguageText(s_tables.strings, 276);
    ASSERT_NE(change, nullptr);
    EXPECT_EQ(*change, "\xC3\x84ndern");  // "Ändern"
    const std::string* quoted = FindLanguageText(s_tables.strings, 439);
    ASSERT_NE(quoted, nullptr);
    EXPECT_NE(quoted->find("\xE2\x80\x9E"), std::string::npos);  // „ in place of a quote
}

TEST_F(GermanLanguageFile, EveryLineWithAnIdIsUnderstood) {
    // A line that starts like an entry but fails to parse would silently become a comment.
    size_t entryLines = 0;
    for (const std::string& line : s_raw) {
        if (!line.empty() && line[0] == '#')
            ++entryLines;
    }
    EXPECT_EQ(entryLines,
              s_tables.strings.size() + s_tables.menuTexts.size() + s_tables.dialogTexts.size());
}

TEST_F(GermanLanguageFile, NamesOnlyIdsTheProgramKnows) {
    for (const LanguageEntry& entry : s_tables.strings) {
        EXPECT_TRUE(!BuiltinString(entry.id).empty() || entry.id == kPauseFaceString ||
                    entry.id == 99)
            << "string " << entry.id;
    }
    for (const LanguageEntry& entry : s_tables.menuTexts) {
        EXPECT_FALSE(BuiltinMenuText(entry.id).empty()) << "menu key " << entry.id;
    }
}

TEST_F(GermanLanguageFile, TranslatesEveryMenuText) {
    for (const BuiltinStringEntry& entry : BuiltinMenuTexts()) {
        EXPECT_NE(FindLanguageText(s_tables.menuTexts, entry.id), nullptr)
            << "menu key " << entry.id << " (" << entry.text << ")";
    }
}

TEST_F(GermanLanguageFile, KeepsFormatsEscapesAndBarCaptionCounts) {
    for (const LanguageEntry& entry : s_tables.strings) {
        const std::string english(BuiltinString(entry.id));
        if (english.empty())
            continue;
        EXPECT_EQ(FormatSkeleton(entry.text), FormatSkeleton(english)) << "string " << entry.id;
        EXPECT_FALSE(entry.text.empty()) << "string " << entry.id;
    }
    for (const LanguageEntry& entry : s_tables.menuTexts) {
        const std::string english(BuiltinMenuText(entry.id));
        EXPECT_EQ(FormatSkeleton(entry.text), FormatSkeleton(english)) << "menu key " << entry.id;
        if (!english.empty() && english[0] == '#') {
            EXPECT_EQ(std::count(entry.text.begin(), entry.text.end(), '#'),
                      std::count(english.begin(), english.end(), '#'))
                << "menu bar " << entry.id;
            for (int piece = 0; piece < 5; ++piece) {
                EXPECT_NE(MenuTextPiece(entry.text, piece), entry.text)
                    << "menu bar " << entry.id << " piece " << piece;
            }
        }
    }
}

TEST(BuiltinTextTables, EveryIdSurvivesTheLanguageFileForm) {
    // An id whose hex form begins with D would read back as a dialog line, and a string id
    // above 16 bits would not fit the four-digit form the template is written in.
    for (const BuiltinStringEntry& entry : BuiltinStrings()) {
        LanguageTables tables;
        ParseLanguageLine(FormatLanguageLine(LanguageTextKind::String, entry.id, "x"), tables);
        ASSERT_EQ(tables.strings.size(), 1u) << "string " << entry.id;
        EXPECT_EQ(tables.strings[0].id, entry.id);
        EXPECT_TRUE(tables.menuTexts.empty() && tables.dialogTexts.empty()) << entry.id;
    }
    for (const BuiltinStringEntry& entry : BuiltinMenuTexts()) {
        LanguageTables tables;
        ParseLanguageLine(FormatLanguageLine(LanguageTextKind::Menu, entry.id, "x"), tables);
        ASSERT_EQ(tables.menuTexts.size(), 1u) << "menu key " << entry.id;
        EXPECT_EQ(tables.menuTexts[0].id, entry.id);
    }
}

TEST(BuiltinTextTables, OwnTextsStayInTheirRange) {
    // Numbered texts lie below 0x1000; everything the program adds lies in 0xC000-0xCFFF.
    for (const BuiltinStringEntry& entry : BuiltinStrings()) {
        EXPECT_TRUE(entry.id < 0x1000 || (entry.id >= 0xC000 && entry.id <= 0xCFFF)) << entry.id;
    }
    EXPECT_EQ(BuiltinString(99), "");
    EXPECT_TRUE(BuiltinString(kPauseFaceString).empty());
}

}  // namespace
}  // namespace ac
