// The shipped German.lang must load in its code page, name only ids the program knows, translate
// every menu text, and keep each format's conversions so that a translated text never breaks
// the printf call it is handed to.

#include "resources/BuiltinStrings.h"
#include "resources/Language.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <sstream>
#include <string_view>

#include "../support/PackageDir.h"

namespace ac {
namespace {

// The string that the play button shows while playing has no built-in text on purpose: only a
// language file may give it one.
constexpr std::uint32_t kPauseFaceString = 1009;

// The printf conversions in order, and the control characters that the file escapes.
// (A hand scan: gcc 12's std::regex trips -Wmaybe-uninitialized in sanitizer builds.)
std::vector<std::string> FormatSkeleton(const std::string& text) {
    std::vector<std::string> skeleton;
    for (std::size_t i = text.find('%'); i != std::string::npos; i = text.find('%', i)) {
        std::size_t end = text.find_first_not_of("-+ #0", i + 1);
        end = text.find_first_not_of("0123456789.", end == std::string::npos ? text.size() : end);
        while (end < text.size() && (text[end] == 'h' || text[end] == 'l'))
            ++end;
        if (end < text.size() &&
            std::string_view("diouxXcsfeEgG%").find(text[end]) != std::string_view::npos) {
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
        s_raw.clear();
        s_tables = {};
        std::istringstream file(test::ReadFile(AC_SOURCE_DIR "/data/lang/German.lang"));
        for (std::string line; std::getline(file, line);)
            s_raw.push_back(line);
        ParseLanguageFile(s_raw, s_tables);
    }
    static inline std::vector<std::string> s_raw;
    static inline LanguageTables s_tables;
};

TEST_F(GermanLanguageFile, IsReadInCp1252AndMatchesTheBuiltInTables) {
    // The file holds single-byte umlauts; saved as UTF-8 by mistake it would read as
    // two Latin-1 characters per umlaut under CODEPAGE=1252.
    ASSERT_EQ(s_tables.codePage, 1252);
    EXPECT_EQ(*FindLanguageText(s_tables.strings, 276), "\xC3\x84ndern");  // "Ändern"
    // A line that starts like an entry but fails to parse would silently become a comment.
    const auto entryLines = std::count_if(s_raw.begin(), s_raw.end(),
                                          [](const std::string& l) { return l.starts_with('#'); });
    EXPECT_EQ(static_cast<std::size_t>(entryLines),
              s_tables.strings.size() + s_tables.menuTexts.size() + s_tables.dialogTexts.size());
    // Only ids the program knows, and every menu text.
    for (const LanguageEntry& entry : s_tables.strings) {
        EXPECT_TRUE(!BuiltinString(entry.id).empty() || entry.id == kPauseFaceString ||
                    entry.id == 99)
            << "string " << entry.id;
    }
    for (const LanguageEntry& entry : s_tables.menuTexts) {
        EXPECT_FALSE(BuiltinMenuText(entry.id).empty()) << "menu key " << entry.id;
    }
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
        if (english.starts_with('#')) {
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

}  // namespace
}  // namespace ac
