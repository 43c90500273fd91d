#include "resources/IniFile.h"

#include "resources/Package.h"

#include <gtest/gtest.h>

#include <climits>

#include "../support/PackageDir.h"

namespace {

using Lines = std::vector<std::string>;

// A skin.ini written the way skin authors write them, with the oddities the reader must
// tolerate: spacing round '=', a lower-case section, a header with a trailing blank.
constexpr const char* kSkinText =
    "Orphan=before any header\r\n"
    "[Main]\r\n"
    "  LeftMargin\t = \t12\r\n"
    "Font = \"Arial\"\r\n"
    "Formula = a=b=c\r\n"
    "Empty =\r\n"
    ";Comment = still a key\r\n"
    "Colour = 0x80FF0000\r\n"
    "\r\n"
    "[main]\r\n"
    "LeftMargin = 99\r\n"
    "[]\r\n"
    "AfterEmpty = x\r\n"
    "[Trailing] \r\n"
    "Hidden = 1\r\n"
    "[Main]\r\n"
    "Second = unreachable\r\n";

class IniText : public ::testing::Test {
protected:
    void SetUp() override { m_ini.LoadFromText(kSkinText); }

    std::string Value(const char* section, const char* key) {
        std::string value = "<missing>";
        m_ini.GetValue(section, key, value);
        return value;
    }

    ac::ImIniFile m_ini;
};

TEST_F(IniText, LookupRules) {
    EXPECT_EQ(Value("Main", "leftmargin"), "12");  // keys ignore case, sections do not
    EXPECT_EQ(Value("main", "LeftMargin"), "99");
    EXPECT_EQ(Value("Main", "Formula"), "a=b=c");
    EXPECT_EQ(Value("Main", "Empty"), "");
    EXPECT_EQ(Value("Main", ";Comment"), "still a key");
    EXPECT_EQ(Value("Main", "Orphan"), "<missing>");
    EXPECT_EQ(Value("Main", "Second"), "<missing>");  // only the first header counts
    // "[Trailing] " and "[]" are no headers: what follows them stays in [main].
    EXPECT_EQ(Value("Trailing", "Hidden"), "<missing>");
    EXPECT_EQ(Value("main", "Hidden"), "1");
    EXPECT_EQ(Value("main", "AfterEmpty"), "x");
    // Blanks are trimmed before tabs: "A \t" keeps "A ".
    m_ini.LoadFromText("[S]\r\nA \t= 1\r\nB\t = 2\r\n");
    EXPECT_EQ(Value("S", "A"), "<missing>");
    EXPECT_EQ(Value("S", "A "), "1");
    EXPECT_EQ(Value("S", "B"), "2");
}

TEST(IniInt, HexIn32BitsOtherwiseAtoi) {
    auto intOf = [](const std::string& text) {
        ac::ImIniFile ini;
        ini.LoadFromText("[S]\r\nK = " + text + "\r\n");
        int value = 12345;
        return ini.GetIntValue("S", "K", value) ? value : 12345;
    };
    EXPECT_EQ(intOf("0X1f"), 31);
    EXPECT_EQ(intOf("010"), 10);
    EXPECT_EQ(intOf("12px"), 12);
    EXPECT_EQ(intOf("\"5\""), 0);
    EXPECT_EQ(intOf("0x80000000"), INT_MIN);  // colours keep their top bit
    EXPECT_EQ(intOf("0x123456789"), -1);
    EXPECT_EQ(intOf("99999999999"), INT_MAX);
    EXPECT_EQ(intOf("-99999999999"), INT_MIN);
}

TEST_F(IniText, SetReplacesInPlaceOrInsertsBehindTheHeader) {
    const std::size_t before = m_ini.Lines().size();
    ASSERT_TRUE(m_ini.SetValue("Main", "LEFTMARGIN", "3"));
    EXPECT_EQ(m_ini.Lines().size(), before);
    EXPECT_EQ(m_ini.Lines()[2], "LEFTMARGIN = 3");

    ASSERT_TRUE(m_ini.SetValue("Main", "First", "a"));
    ASSERT_TRUE(m_ini.SetValue("Main", "Newest", "b"));
    EXPECT_EQ(m_ini.Lines()[2], "Newest = b");
    EXPECT_EQ(m_ini.Lines()[3], "First = a");

    ASSERT_TRUE(m_ini.SetValue("Fresh", "Key", "v"));
    EXPECT_EQ(Lines(m_ini.Lines().end() - 2, m_ini.Lines().end()), (Lines{"[Fresh]", "Key = v"}));
}

TEST(IniSplit, OnlyCrLfEndsALineAndNulEndsTheText) {
    using namespace std::string_literals;
    ac::ImIniFile ini;
    ini.LoadFromText("[S]\nK=1\n");
    std::string value;
    EXPECT_FALSE(ini.GetValue("S", "K", value));
    ini.LoadFromText("a\r\n\r\nb\rc\r\nlast");
    EXPECT_EQ(ini.Lines(), (Lines{"a", "", "b\rc", "last"}));
    ini.LoadFromText("[S]\r\nK=1\r\n\0[T]\r\nK=2\r\n"s);
    EXPECT_EQ(ini.Lines(), (Lines{"[S]", "K=1"}));
    // White space comes off before the quotes, and only at the ends.
    EXPECT_EQ(ac::CleanIniValue(" \"a\"b\" "), "a\"b");
    EXPECT_EQ(ac::CleanIniValue("\" padded \""), " padded ");
}

// Real-world files, mostly LF texts, which must read as single lines without keys.
class IniCorpus : public ::testing::TestWithParam<const char*> {};

TEST_P(IniCorpus, WritesBackUnchanged) {
    const std::string raw = ac::test::ReadFile(std::string(AC_CORPUS_DIR) + "/ini/" + GetParam());
    ASSERT_FALSE(raw.empty());
    ac::ImIniFile ini;
    ini.LoadFromText(raw);
    if (raw.find("\r\n") == std::string::npos) {
        EXPECT_EQ(ini.Lines().size(), 1u);
    }
    const std::string saved = ini.SaveText();
    EXPECT_TRUE(saved == raw || saved == raw + "\r\n");
}

INSTANTIATE_TEST_SUITE_P(Files, IniCorpus,
                         ::testing::Values("inih_bad_section.ini", "inih_bom.ini",
                                           "inih_duplicate_sections.ini", "inih_multi_line.ini",
                                           "inih_no_value_crlf.ini", "inih_normal.ini",
                                           "iniparser_quotes.ini", "iniparser_spaced2.ini",
                                           "iniparser_twisted.ini", "simpleini_tests_utf8_bom.ini",
                                           "twin_win.ini", "windows-sys-backup_system.ini"));

// The package doors: buffer rules of ReadIniString, the cache, and a real system.ini.
class IniThroughPackage : public ac::test::PackageDir {
protected:
    void SetUp() override {
        WritePackage(
            {{"skin/Default/skin.ini", kSkinText},
             {"skin/Default/system.ini", ac::test::ReadFile(std::string(AC_CORPUS_DIR) +
                                                            "/ini/windows-sys-backup_system.ini")},
             {"skin/Other/skin.ini", "[Main]\r\nLeftMargin=7\r\n"}});
    }
    std::string Skin(const char* name = "Default") {
        return Logical(std::string("Skin\\") + name + "\\skin.ini");
    }
};

TEST_F(IniThroughPackage, BufferRules) {
    char buffer[6];
    // "a=b=c" plus its NUL needs six bytes: it fits exactly; a five-byte buffer keeps the default.
    EXPECT_EQ(ac::ReadIniString("Main", "Formula", "d", buffer, 6, Skin()), 5u);
    EXPECT_STREQ(buffer, "a=b=c");
    EXPECT_EQ(ac::ReadIniString("Main", "Formula", "d", buffer, 5, Skin()), 5u);
    EXPECT_STREQ(buffer, "d");
    EXPECT_EQ(ac::ReadIniString("Main", "Empty", "dflt", buffer, sizeof buffer, Skin()), 0u);
    EXPECT_STREQ(buffer, "");
    EXPECT_EQ(ac::ReadIniString("Main", "Missing", "too long", buffer, sizeof buffer, Skin()), 0u);
    EXPECT_STREQ(buffer, "too l");

    EXPECT_EQ(ac::ReadIniInt("Main", "Colour", 0, Skin()), static_cast<int>(0x80FF0000u));
    EXPECT_EQ(ac::ReadIniInt("Main", "Empty", -1, Skin()), 0);
    EXPECT_EQ(ac::ReadIniInt("Main", "Missing", -1, Skin()), -1);
    EXPECT_EQ(ac::ReadIniInt("Main", "LeftMargin", -1, Skin("Absent")), -1);

    // A real CR LF text with a byte order mark.
    const std::string path = Logical("Skin\\Default\\system.ini");
    EXPECT_EQ(ac::ReadIniText("386Enh", "woafont", "", path), "dosapp.fon");
    EXPECT_EQ(ac::ReadIniText("386Enh", "ega80woa.fon", "", path), "EGA80WOA.FON");
    EXPECT_EQ(ac::ReadIniInt("vcache", "MaxFileCache", 0, path), 8096);  // no final CR LF
}

TEST_F(IniThroughPackage, AHugeTextWithAHugeLineServesItsValues) {
    std::string text = "[Main]\r\nLong=" + std::string(100000, 'x') + "\r\n";
    while (text.size() < 10u * 1024 * 1024) {
        text += "Filler=0123456789012345678901234567890123456789\r\n";
    }
    WritePackage({{"skin/Big/skin.ini", text + "Last=42\r\n"}});
    char buffer[260];
    EXPECT_EQ(ac::ReadIniInt("Main", "Last", 0, Skin("Big")), 42);
    EXPECT_EQ(ac::ReadIniString("Main", "Long", "dflt", buffer, sizeof buffer, Skin("Big")),
              100000u);
    EXPECT_STREQ(buffer, "dflt");
}

TEST_F(IniThroughPackage, OneFileCache) {
    ac::ReadIniInt("Main", "LeftMargin", 0, Skin());
    std::size_t loads = ac::IniLoadCount();
    for (int i = 0; i < 50; ++i) {
        EXPECT_EQ(ac::ReadIniInt("Main", "LeftMargin", 0, Skin()), 12);
        EXPECT_EQ(ac::ReadIniText("Main", "Font", "", Skin()), "Arial");
    }
    EXPECT_EQ(ac::IniLoadCount(), loads);
    // Two files in turn reload at every call, and stay correct.
    for (int i = 0; i < 5; ++i) {
        EXPECT_EQ(ac::ReadIniInt("Main", "LeftMargin", 0, Skin("Other")), 7);
        EXPECT_EQ(ac::ReadIniInt("Main", "LeftMargin", 0, Skin()), 12);
    }
    EXPECT_EQ(ac::IniLoadCount(), loads + 10);
    // A package that was closed is read again: its file may have been replaced meanwhile.
    ac::ClosePackage(Skin());
    EXPECT_EQ(ac::ReadIniInt("Main", "LeftMargin", 0, Skin()), 12);
    EXPECT_EQ(ac::IniLoadCount(), loads + 11);
    // Texts of user.pkg are read at every call.
    const std::string profile = Logical("profile\\user\\mine.pf");
    ASSERT_TRUE(ac::WriteIniString("General", "A", "1", profile));
    loads = ac::IniLoadCount();
    EXPECT_EQ(ac::ReadIniInt("General", "A", 0, profile), 1);
    EXPECT_EQ(ac::ReadIniInt("General", "A", 0, profile), 1);
    EXPECT_EQ(ac::IniLoadCount(), loads + 2);
}

}  // namespace
