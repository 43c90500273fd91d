#include "resources/IniFile.h"

#include "resources/Package.h"
#include "resources/PackageWriter.h"

#include <gtest/gtest.h>

#include <climits>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <sstream>

namespace {

namespace fs = std::filesystem;

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
    EXPECT_EQ(Value("Main", "leftmargin"), "12");
    EXPECT_EQ(Value("Main", "Font"), "\"Arial\"");
    EXPECT_EQ(Value("Main", "Formula"), "a=b=c");
    EXPECT_EQ(Value("Main", "Empty"), "");
    EXPECT_EQ(Value("Main", ";Comment"), "still a key");
    EXPECT_EQ(Value("main", "LeftMargin"), "99");
    // "[Trailing] " is no header, so its key belongs to [main] and [Trailing] does not exist.
    EXPECT_EQ(Value("Trailing", "Hidden"), "<missing>");
    EXPECT_EQ(Value("main", "Hidden"), "1");
    EXPECT_EQ(Value("Main", "Second"), "<missing>");
    EXPECT_EQ(Value("Main", "Orphan"), "<missing>");
    EXPECT_EQ(Value("Main", "Missing"), "<missing>");
    EXPECT_EQ(Value("Absent", "LeftMargin"), "<missing>");
    // "[]" is no header either: what follows it stays in the section above.
    EXPECT_EQ(Value("main", "AfterEmpty"), "x");
    EXPECT_FALSE(m_ini.IsSectionLine(m_ini.FindSection("")));
    EXPECT_EQ(m_ini.FindSection(nullptr), -1);
    std::string ignored;
    EXPECT_EQ(m_ini.FindKey(0, nullptr, ignored), -1);
}

TEST_F(IniText, BlanksAreTrimmedBeforeTabs) {
    m_ini.LoadFromText("[S]\r\nA \t= 1\r\nB\t = 2\r\n");
    EXPECT_EQ(Value("S", "A"), "<missing>");  // "A \t" loses the tab only: "A "
    EXPECT_EQ(Value("S", "A "), "1");
    EXPECT_EQ(Value("S", "B"), "2");
}

struct IntCase {
    const char* text;
    int expected;
};

class IniInt : public ::testing::TestWithParam<IntCase> {};

TEST_P(IniInt, ParsesLikeTheOriginalReader) {
    ac::ImIniFile ini;
    ini.LoadFromText(std::string("[S]\r\nK = ") + GetParam().text + "\r\n");
    int value = 12345;
    ASSERT_TRUE(ini.GetIntValue("S", "K", value));
    EXPECT_EQ(value, GetParam().expected);
}

INSTANTIATE_TEST_SUITE_P(
    Values, IniInt,
    ::testing::Values(IntCase{"0x10", 16}, IntCase{"0X1f", 31}, IntCase{"010", 10},
                      IntCase{"12px", 12}, IntCase{"px", 0}, IntCase{"", 0}, IntCase{"-7", -7},
                      IntCase{"+3", 3}, IntCase{"0xFFFFFFFF", -1}, IntCase{"0x80000000", INT_MIN},
                      IntCase{"0x123456789", -1}, IntCase{"99999999999", INT_MAX},
                      IntCase{"-99999999999", INT_MIN}, IntCase{"0xZZ", 0}, IntCase{"\"5\"", 0}));

TEST_F(IniText, SetValueEditsInPlaceAndInsertsBehindHeader) {
    const std::size_t before = m_ini.Lines().size();
    ASSERT_TRUE(m_ini.SetValue("Main", "LEFTMARGIN", "3"));
    ASSERT_TRUE(m_ini.SetValue("Main", "LeftMargin", "4"));
    EXPECT_EQ(m_ini.Lines().size(), before);
    EXPECT_EQ(m_ini.Lines()[2], "LeftMargin = 4");

    ASSERT_TRUE(m_ini.SetValue("Main", "First", "a"));
    ASSERT_TRUE(m_ini.SetValue("Main", "Newest", "b"));
    EXPECT_EQ(m_ini.Lines()[2], "Newest = b");
    EXPECT_EQ(m_ini.Lines()[3], "First = a");

    ASSERT_TRUE(m_ini.SetValue("Fresh", "Key", "v"));
    ASSERT_GE(m_ini.Lines().size(), 2u);
    EXPECT_EQ(m_ini.Lines()[m_ini.Lines().size() - 2], "[Fresh]");
    EXPECT_EQ(m_ini.Lines().back(), "Key = v");
    EXPECT_EQ(Value("Fresh", "key"), "v");

    EXPECT_FALSE(m_ini.SetValue(nullptr, "Key", "v"));
    EXPECT_FALSE(m_ini.SetValue("Main", nullptr, "v"));
}

TEST(IniSplit, OnlyCrLfEndsALine) {
    ac::ImIniFile ini;
    ini.LoadFromText("[S]\nK=1\n");
    EXPECT_EQ(ini.Lines().size(), 1u);
    std::string value;
    EXPECT_FALSE(ini.GetValue("S", "K", value));

    ini.LoadFromText("a\r\n\r\nb\rc\r\nlast");
    EXPECT_EQ(ini.Lines(), (std::vector<std::string>{"a", "", "b\rc", "last"}));
    ini.LoadFromText("a\r\n");
    EXPECT_EQ(ini.Lines(), (std::vector<std::string>{"a"}));
    using namespace std::string_literals;
    ini.LoadFromText("[S]\r\nK=1\r\n\0[T]\r\nK=2\r\n"s);
    EXPECT_EQ(ini.Lines().size(), 2u);
    ini.LoadFromText("");
    EXPECT_TRUE(ini.Lines().empty());
    EXPECT_EQ(ini.SaveText(), "");
}

TEST(IniSplit, CleanValueStripsWhiteSpaceThenQuotes) {
    EXPECT_EQ(ac::CleanIniValue(" \t\"Arial\" "), "Arial");
    EXPECT_EQ(ac::CleanIniValue("a\"b"), "a\"b");
    EXPECT_EQ(ac::CleanIniValue("\"\""), "");
    EXPECT_EQ(ac::CleanIniValue("\" padded \""), " padded ");
}

TEST(IniSplit, HugeTextsStayLinear) {
    ac::ImIniFile ini;
    std::string text = "[S]\r\n";
    while (text.size() < 10u * 1024u * 1024u) {
        text += "key=value with some length to it\r\n";
    }
    text += "Wanted = yes\r\n";
    ini.LoadFromText(text);
    std::string value;
    EXPECT_TRUE(ini.GetValue("S", "wanted", value));
    EXPECT_FALSE(ini.GetValue("S", "absent", value));

    std::string longLine(100000, 'k');
    ini.LoadFromText("[S]\r\n" + longLine + "=" + longLine + "\r\n[" + longLine + "]\r\n");
    EXPECT_TRUE(ini.GetValue("S", longLine.c_str(), value));
    EXPECT_EQ(value.size(), longLine.size());
    EXPECT_EQ(ini.FindSection(longLine.c_str()), 2);
    EXPECT_TRUE(ini.SetValue(longLine.c_str(), "k", longLine.c_str()));
}

// The real-world corpus: mostly LF texts, which must read as single lines without keys.
class IniCorpus : public ::testing::TestWithParam<std::string> {
protected:
    std::string ReadCorpus() {
        std::ifstream in(fs::path(AC_CORPUS_DIR) / "ini" / GetParam(), std::ios::binary);
        std::ostringstream out;
        out << in.rdbuf();
        return out.str();
    }
};

TEST_P(IniCorpus, WritesBackUnchangedAndAcceptsEdits) {
    const std::string raw = ReadCorpus();
    ASSERT_FALSE(raw.empty());
    ac::ImIniFile ini;
    ini.LoadFromText(raw);
    const bool crlf = raw.find("\r\n") != std::string::npos;
    if (!crlf) {
        EXPECT_EQ(ini.Lines().size(), 1u);
    }
    const std::string saved = ini.SaveText();
    EXPECT_TRUE(saved == raw || saved == raw + "\r\n");

    const auto lines = ini.Lines();
    ASSERT_TRUE(ini.SetValue("Added", "Key", "value"));
    std::string value;
    EXPECT_TRUE(ini.GetValue("Added", "key", value));
    EXPECT_EQ(value, "value");
    ASSERT_EQ(ini.Lines().size(), lines.size() + 2);
    EXPECT_TRUE(std::equal(lines.begin(), lines.end(), ini.Lines().begin()));
}

INSTANTIATE_TEST_SUITE_P(Files, IniCorpus,
                         ::testing::Values("inih_bad_section.ini", "inih_bom.ini",
                                           "inih_duplicate_sections.ini", "inih_multi_line.ini",
                                           "inih_no_value_crlf.ini", "inih_normal.ini",
                                           "iniparser_quotes.ini", "iniparser_spaced2.ini",
                                           "iniparser_twisted.ini", "simpleini_tests_utf8_bom.ini",
                                           "twin_win.ini", "windows-sys-backup_system.ini"),
                         [](const auto& info) {
                             std::string name = info.param.substr(0, info.param.find('.'));
                             std::replace(name.begin(), name.end(), '-', '_');
                             return name;
                         });

// The package doors: buffer rules of ReadIniString, the cache, and CR LF texts from a real
// system.ini served out of a package.
class IniThroughPackage : public ::testing::Test {
protected:
    void SetUp() override {
        char pattern[] = "/tmp/ac-ini-XXXXXX";
        ASSERT_NE(::mkdtemp(pattern), nullptr);
        m_base = pattern;
        ::setenv("XDG_DATA_HOME", (m_base + "/xdg").c_str(), 1);
        std::ifstream in(fs::path(AC_CORPUS_DIR) / "ini" / "windows-sys-backup_system.ini",
                         std::ios::binary);
        std::ostringstream system;
        system << in.rdbuf();
        ac::PackageWriter writer;
        ASSERT_TRUE(writer.Create());
        ASSERT_TRUE(writer.Put("skin/Default/skin.ini", kSkinText));
        ASSERT_TRUE(writer.Put("skin/Default/system.ini", system.str()));
        ASSERT_TRUE(writer.Put("skin/Other/skin.ini", "[Main]\r\nLeftMargin=7\r\n"));
        ASSERT_TRUE(writer.Commit(m_base + "/data.pkg"));
    }
    void TearDown() override { fs::remove_all(m_base); }

    std::string Skin(const char* name = "Default") {
        return m_base + "\\Skin\\" + name + "\\skin.ini";
    }

    std::string m_base;
};

TEST_F(IniThroughPackage, BufferRules) {
    char buffer[6];
    EXPECT_EQ(ac::ReadIniString("Main", "Font", "dflt", buffer, sizeof buffer, Skin()), 5u);
    EXPECT_STREQ(buffer, "Arial");
    // "a=b=c" plus its NUL needs six bytes: it fits exactly; a five-byte buffer keeps the default.
    EXPECT_EQ(ac::ReadIniString("Main", "Formula", "d", buffer, 6, Skin()), 5u);
    EXPECT_STREQ(buffer, "a=b=c");
    EXPECT_EQ(ac::ReadIniString("Main", "Formula", "d", buffer, 5, Skin()), 5u);
    EXPECT_STREQ(buffer, "d");
    EXPECT_EQ(ac::ReadIniString("Main", "Empty", "dflt", buffer, sizeof buffer, Skin()), 0u);
    EXPECT_STREQ(buffer, "");
    EXPECT_EQ(ac::ReadIniString("Main", "Missing", "dflt", buffer, sizeof buffer, Skin()), 0u);
    EXPECT_STREQ(buffer, "dflt");
    EXPECT_EQ(ac::ReadIniString("Main", "Missing", nullptr, buffer, sizeof buffer, Skin()), 0u);
    EXPECT_STREQ(buffer, "");
    EXPECT_EQ(ac::ReadIniString("Main", "Missing", "too long", buffer, sizeof buffer, Skin()), 0u);
    EXPECT_STREQ(buffer, "too l");

    EXPECT_EQ(ac::ReadIniInt("Main", "LeftMargin", -1, Skin()), 12);
    EXPECT_EQ(ac::ReadIniInt("Main", "Empty", -1, Skin()), 0);
    EXPECT_EQ(ac::ReadIniInt("Main", "Font", -1, Skin()), 0);
    EXPECT_EQ(ac::ReadIniInt("Main", "Colour", 0, Skin()), static_cast<int>(0x80FF0000u));
    EXPECT_EQ(ac::ReadIniInt("Main", "Missing", -1, Skin()), -1);
    EXPECT_EQ(ac::ReadIniInt("Main", "LeftMargin", -1, Skin("Absent")), -1);
    EXPECT_EQ(ac::ReadIniText("Main", "Missing", "x", m_base + "\\no\\such.ini"), "x");
    EXPECT_EQ(ac::ReadIniText("Main", "Font", "x", m_base + "\\Skin\\Default\\skin.ini"), "Arial");
}

TEST_F(IniThroughPackage, RealCrLfTextWithBom) {
    const std::string path = m_base + "\\Skin\\Default\\system.ini";
    EXPECT_EQ(ac::ReadIniText("386Enh", "woafont", "", path), "dosapp.fon");
    EXPECT_EQ(ac::ReadIniText("386Enh", "ega80woa.fon", "", path), "EGA80WOA.FON");
    EXPECT_EQ(ac::ReadIniInt("vcache", "MaxFileCache", 0, path), 8096);  // no final CR LF
    EXPECT_EQ(ac::ReadIniText("mci", "anything", "dflt", path), "dflt");
}

TEST_F(IniThroughPackage, BurstOfLookupsParsesOnce) {
    ac::ReadIniInt("Main", "LeftMargin", 0, Skin());
    const std::size_t loads = ac::IniLoadCount();
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
}

}  // namespace
