#include "resources/Language.h"

#include "resources/BuiltinStrings.h"
#include "resources/LanguageUi.h"
#include "resources/PackageWriter.h"

#include <gtest/gtest.h>

#include <clocale>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <map>
#include <memory>
#include <sstream>
#include <thread>

namespace ac {
namespace {

namespace fs = std::filesystem;

// --- one line at a time ----------------------------------------------------------------------

struct LineCase {
    const char* name;
    std::string line;
    // Expected entry; kind irrelevant when stored is false.
    bool stored;
    LanguageTextKind kind;
    std::uint32_t id;
    std::string text;
};

class ParseLineTest : public ::testing::TestWithParam<LineCase> {};

TEST_P(ParseLineTest, StoresExactlyTheExpectedEntry) {
    const LineCase& c = GetParam();
    LanguageTables tables;
    ParseLanguageLine(c.line, tables);
    const std::size_t total =
        tables.strings.size() + tables.menuTexts.size() + tables.dialogTexts.size();
    if (!c.stored) {
        EXPECT_EQ(total, 0u);
        return;
    }
    ASSERT_EQ(total, 1u);
    const auto& table = c.kind == LanguageTextKind::String ? tables.strings
                        : c.kind == LanguageTextKind::Menu ? tables.menuTexts
                                                           : tables.dialogTexts;
    ASSERT_EQ(table.size(), 1u);
    EXPECT_EQ(table[0].id, c.id);
    EXPECT_EQ(table[0].text, c.text);
}

using K = LanguageTextKind;
INSTANTIATE_TEST_SUITE_P(
    Forms, ParseLineTest,
    ::testing::Values(
        LineCase{"String", "#0001# \"OK\"", true, K::String, 1, "OK"},
        LineCase{"Menu", "#M8004# \"&File\"", true, K::Menu, 0x8004, "&File"},
        LineCase{"Dialog", "#D00660401# \"Output\"", true, K::Dialog, 0x00660401, "Output"},
        LineCase{"MInTextStaysString", "#0010# \"Make Music\"", true, K::String, 0x10,
                 "Make Music"},
        LineCase{"LowerCaseHex", "#M00ab# \"x\"", true, K::Menu, 0xAB, "x"},
        LineCase{"ShortMenuId", "#M1# \"x\"", true, K::Menu, 1, "x"},
        LineCase{"EmptyTextIsStored", "#0002# \"\"", true, K::String, 2, ""},
        LineCase{"TextEndsAtSecondQuote", "#0003# \"say \"hi\"\"", true, K::String, 3, "say "},
        LineCase{"CarriageReturnOutsideQuotes", "#0004# \"abc\"\r", true, K::String, 4, "abc"},
        LineCase{"Escapes", "#0005# \"a\\tb\\nc\\rd\\x\"", true, K::String, 5, "a\tb\nc\rd\\x"},
        LineCase{"NoClosingHash", "#0006 \"text\"", false, K::String, 0, ""},
        LineCase{"ClosingHashBelowIndexThree", "#1# \"text\"", false, K::String, 0, ""},
        LineCase{"MenuClosingHashBelowIndexThree", "#M# \"text\"", false, K::String, 0, ""},
        LineCase{"NoText", "#0007#", false, K::String, 0, ""},
        LineCase{"OneQuote", "#0008# \"open", false, K::String, 0, ""},
        LineCase{"Comment", "// #0009 is not here", false, K::String, 0, ""}),
    [](const auto& info) { return std::string(info.param.name); });

TEST(ParseHeaderTest, SetsOnlyTheValuesTheLinesName) {
    LanguageTables tables;
    tables.subLang = 5;
    for (const char* line :
         {"CODEPAGE=936\r", "LANGUAGE= 7", "LANGCODE=  de \r", "CHARSET=134", "REVISION=$Id: 12 $",
          "CODEPAGE=1250 #not a header", "codepage=65001"}) {
        ParseLanguageLine(line, tables);
    }
    EXPECT_EQ(tables.codePage, 936);
    EXPECT_EQ(tables.language, 7);
    EXPECT_EQ(tables.subLang, 5);
    EXPECT_EQ(tables.langCode, "de");
    EXPECT_EQ(tables.charset, 134);
    EXPECT_TRUE(tables.strings.empty());
}

TEST(ParseFileTest, DuplicateIdFirstLineWins) {
    LanguageTables tables;
    ParseLanguageFile({"#0001# \"\"", "#0001# \"second\""}, tables);
    ASSERT_NE(FindLanguageText(tables.strings, 1), nullptr);
    EXPECT_EQ(*FindLanguageText(tables.strings, 1), "");
}

// --- whole files and their code pages --------------------------------------------------------

TEST(ParseFileTest, ConvertsCp1252Umlauts) {
    LanguageTables tables;
    ParseLanguageFile({"CODEPAGE=1252\r",
                       "#0001# \"M\xFC"
                       "nchen \x80\"\r"},
                      tables);
    EXPECT_EQ(*FindLanguageText(tables.strings, 1), "M\xC3\xBCnchen \xE2\x82\xAC");
}

// In GBK the character U+4E57 is 0x81 0x5C: its trail byte is a backslash. Unescaped before
// conversion, the pair with the following 'n' would turn into a line break.
TEST(ParseFileTest, Cp936TrailByteIsNoEscape) {
    LanguageTables tables;
    ParseLanguageFile({"#0001# \"\x81\x5Cn\\n\"", "CODEPAGE=936"}, tables);
    EXPECT_EQ(*FindLanguageText(tables.strings, 1), "\xE4\xB9\x97n\n");
    EXPECT_EQ(tables.codePage, 936);
}

TEST(ParseFileTest, ByteOrderMarkIsDroppedAndMeansUtf8) {
    LanguageTables tables;
    ParseLanguageFile({"\xEF\xBB\xBFLANGCODE=fr", "#0001# \"\xC3\xA9t\xC3\xA9\""}, tables);
    EXPECT_EQ(tables.langCode, "fr");
    EXPECT_EQ(*FindLanguageText(tables.strings, 1), "\xC3\xA9t\xC3\xA9");
}

TEST(FormatTest, LinesInLanguageFileForm) {
    EXPECT_EQ(FormatLanguageLine(K::String, 0x63, "a\tb\r\n"), "#0063# \"a\\tb\\r\\n\"");
    EXPECT_EQ(FormatLanguageLine(K::Menu, 0x810002, "x"), "#M810002# \"x\"");
    EXPECT_EQ(FormatLanguageLine(K::Dialog, 0x660000, "x"), "#D00660000# \"x\"");
}

// --- menu bar pieces -------------------------------------------------------------------------

struct PieceCase {
    std::string text;
    int index;
    std::string expected;
};

class MenuPieceTest : public ::testing::TestWithParam<PieceCase> {};

TEST_P(MenuPieceTest, Piece) {
    EXPECT_EQ(MenuTextPiece(GetParam().text, GetParam().index), GetParam().expected);
}

INSTANTIATE_TEST_SUITE_P(
    Bar, MenuPieceTest,
    ::testing::Values(PieceCase{"#&File#&Edit#&View#", 0, "&File"},
                      PieceCase{"#&File#&Edit#&View#", 1, "&Edit"},
                      PieceCase{"#&File#&Edit#&View#", 2, "&View"},
                      // Behind the last '#' there is nothing: the whole text.
                      PieceCase{"#&File#&Edit#&View#", 3, "#&File#&Edit#&View#"},
                      PieceCase{"#&File#&Edit#&View#", 7, "#&File#&Edit#&View#"},
                      PieceCase{"#A#&Edit#", 0, "#A#&Edit#"}, PieceCase{"#&File#&Edit", 1, "&Edit"},
                      PieceCase{"No list", 0, "No list"}, PieceCase{"", 0, ""}));

// --- the user's locale -----------------------------------------------------------------------

TEST(LocaleNameTest, EnglishNamesOfLocales) {
    EXPECT_EQ(LanguageNameFromLocale("de_DE.UTF-8"), "German");
    EXPECT_EQ(LanguageNameFromLocale("pt_BR"), "Portuguese");
    EXPECT_EQ(LanguageNameFromLocale("zh_CN.GB18030"), "Chinese(Simplified)");
    EXPECT_EQ(LanguageNameFromLocale("zh_SG"), "Chinese(Simplified)");
    EXPECT_EQ(LanguageNameFromLocale("zh_TW.UTF-8"), "Chinese(Traditional)");
    EXPECT_EQ(LanguageNameFromLocale("zh_HK"), "Chinese(Traditional)");
    EXPECT_EQ(LanguageNameFromLocale("sr_RS@latin"), "Serbian");
    EXPECT_EQ(LanguageNameFromLocale("C.UTF-8"), "English");
    EXPECT_EQ(LanguageNameFromLocale("POSIX"), "English");
    EXPECT_EQ(LanguageNameFromLocale("xx_YY"), "English");
    EXPECT_EQ(LanguageNameFromLocale(""), "English");
}

// --- fakes of the window side ----------------------------------------------------------------

struct FakeControl {
    int id;
    TranslatableControlKind kind;
    std::string text;
    std::vector<std::string> items;
};

class FakeDialog : public ITranslatableDialog {
public:
    std::string caption;
    std::vector<FakeControl> controls;

    std::string GetCaption() const override { return caption; }
    void SetCaption(const std::string& text) override { caption = text; }
    int GetChildCount() const override { return static_cast<int>(controls.size()); }
    int GetChildId(int i) const override { return controls.at(i).id; }
    TranslatableControlKind GetChildKind(int i) const override { return controls.at(i).kind; }
    std::string GetChildText(int i) const override { return controls.at(i).text; }
    void SetChildText(int i, const std::string& text) override { controls.at(i).text = text; }
    std::vector<std::string> GetComboItems(int i) const override { return controls.at(i).items; }
    void SetComboItems(int i, const std::vector<std::string>& items) override {
        controls.at(i).items = items;
    }
};

class FakeMenu : public ITranslatableMenu {
public:
    struct Item {
        TranslatableMenuItemKind kind;
        int command;
        std::string text;
        std::unique_ptr<FakeMenu> subMenu;
    };
    std::vector<Item> items;

    FakeMenu& Command(int command, std::string text) {
        items.push_back({TranslatableMenuItemKind::Command, command, std::move(text), nullptr});
        return *this;
    }
    FakeMenu& Separator() {
        items.push_back({TranslatableMenuItemKind::Separator, 0, "", nullptr});
        return *this;
    }
    FakeMenu& Popup(std::string text) {
        items.push_back(
            {TranslatableMenuItemKind::Popup, 0, std::move(text), std::make_unique<FakeMenu>()});
        return *items.back().subMenu;
    }
    const std::string& Text(int position) const { return items.at(position).text; }
    FakeMenu& Sub(int position) { return *items.at(position).subMenu; }

    int GetItemCount() const override { return static_cast<int>(items.size()); }
    TranslatableMenuItemKind GetItemKind(int p) const override { return items.at(p).kind; }
    int GetCommandId(int p) const override { return items.at(p).command; }
    std::string GetItemText(int p) const override { return items.at(p).text; }
    void SetItemText(int p, const std::string& text) override { items.at(p).text = text; }
    ITranslatableMenu* GetSubMenu(int p) override { return items.at(p).subMenu.get(); }
};

// --- a language in a package -----------------------------------------------------------------

class LanguagePackageTest : public ::testing::Test {
protected:
    void SetUp() override {
        char pattern[] = "/tmp/ac-lang-XXXXXX";
        ASSERT_NE(::mkdtemp(pattern), nullptr);
        // The base folder's last component in lower case: named package lookups fold case
        // behind the last '/'.
        m_root = pattern;
        m_dir = m_root + "/base";
        fs::create_directory(m_dir);
        ::setenv("XDG_DATA_HOME", (m_dir + "/userdata").c_str(), 1);
        m_language.SetLanguageKeyWriter(
            [this](const std::string& name) { m_keyWrites.push_back(name); });
    }
    void TearDown() override {
        SetLanguageMissLog(false);
        fs::remove_all(m_root);
    }

    void WritePackage(const std::map<std::string, std::string>& entries) {
        PackageWriter writer;
        ASSERT_TRUE(writer.Create());
        for (const auto& [name, data] : entries) {
            ASSERT_TRUE(writer.AddParentDirectories(name));
            ASSERT_TRUE(writer.Put(name, data));
        }
        ASSERT_TRUE(writer.Commit(m_dir + "/data.pkg"));
    }

    std::string MissLog() const {
        std::ifstream in(m_dir + "/userdata/audio-converter/lang_miss.txt", std::ios::binary);
        std::stringstream text;
        text << in.rdbuf();
        return text.str();
    }

    std::string m_root;
    std::string m_dir;
    ImLanguage m_language;
    std::vector<std::string> m_keyWrites;
};

constexpr std::uint32_t kNotBuiltIn = 0xFFF0;

TEST_F(LanguagePackageTest, LoadsTextsAndFallsBackToBuiltIn) {
    ASSERT_TRUE(BuiltinString(kNotBuiltIn).empty());
    WritePackage({{"lang/German.lang",
                   "CODEPAGE=1252\r\nLANGCODE=de\r\n#0001# \"Gut\"\r\n#0002# \"\"\r\n"
                   "#D00660000# \"Einstellungen\"\r\n#M8004# \"&Datei\"\r\n"},
                  {"lang/English.lang", "#0001# \"OK\"\n"}});
    m_language.Init(m_dir, "German");

    EXPECT_EQ(m_language.GetLanguageName(), "German");
    EXPECT_EQ(m_language.GetString(1), "Gut");
    EXPECT_EQ(m_language.GetString(2), BuiltinString(2));  // empty text counts as a miss
    EXPECT_EQ(m_language.GetString(kNotBuiltIn), "");
    EXPECT_EQ(m_language.GetDialogText(0x00660000), "Einstellungen");
    EXPECT_EQ(m_language.GetMenuText(0x8004), "&Datei");
    EXPECT_EQ(m_language.GetMenuText(0x8005), "");
    EXPECT_EQ(m_language.GetLangCode(), "de");
    ASSERT_EQ(m_language.GetLanguageCount(), 2);
    EXPECT_EQ(m_language.GetLanguageAt(0), "English");
    EXPECT_EQ(m_language.GetLanguageAt(1), "German");
    EXPECT_TRUE(m_keyWrites.empty());
}

TEST_F(LanguagePackageTest, NameMatchesWithoutRegardToCaseAndKeepsItsSpelling) {
    WritePackage({{"lang/German.lang", "#0001# \"Gut\"\n"}});
    m_language.Init(m_dir, "gERMAN");
    EXPECT_EQ(m_language.GetLanguageName(), "gERMAN");
    EXPECT_EQ(m_language.GetString(1), "Gut");
}

TEST_F(LanguagePackageTest, FileOutsideTheListLoadsButIsNamedEnglish) {
    // The listing matches the folder with case; the read does not.
    WritePackage({{"LANG/Hidden.lang", "#0001# \"Versteckt\"\n"}});
    m_language.Init(m_dir, "Hidden");
    EXPECT_EQ(m_language.GetLanguageCount(), 0);
    EXPECT_EQ(m_language.GetString(1), "Versteckt");
    EXPECT_EQ(m_language.GetLanguageName(), "english");
    EXPECT_TRUE(m_keyWrites.empty());
}

TEST_F(LanguagePackageTest, MissingLanguageFallsBackToEnglishAndStoresTheKey) {
    WritePackage({{"lang/English.lang", "#0001# \"Okay\"\n"}});
    m_language.Init(m_dir, "Klingon");
    EXPECT_EQ(m_language.GetLanguageName(), "English");
    EXPECT_EQ(m_language.GetString(1), "Okay");
    EXPECT_EQ(m_keyWrites, std::vector<std::string>{"English"});
}

TEST_F(LanguagePackageTest, NoPackageAtAllGivesBuiltInTexts) {
    m_language.Init(m_dir, "German");
    EXPECT_EQ(m_language.GetString(1), BuiltinString(1));
    EXPECT_EQ(m_language.GetLanguageName(), "english");
    EXPECT_EQ(m_keyWrites, std::vector<std::string>{"english"});
}

TEST_F(LanguagePackageTest, HeaderValuesCarryOverButCharsetResets) {
    WritePackage({{"lang/Chinese.lang", "CODEPAGE=936\nLANGCODE=cn\nCHARSET=134\n"},
                  {"lang/Other.lang", "#0001# \"\x81\x5C\"\n"}});
    m_language.Init(m_dir, "Chinese");
    EXPECT_EQ(m_language.GetCharset(), 134);
    m_language.SelectLanguage("Other");
    EXPECT_EQ(m_language.GetCharset(), 1);
    EXPECT_EQ(m_language.GetCodePage(), 936);
    EXPECT_EQ(m_language.GetLangCode(), "cn");
    EXPECT_EQ(m_language.GetString(1), "\xE4\xB9\x97");  // read in the code page kept
}

TEST_F(LanguagePackageTest, LocaleFollowsStringNinetyNineButNumbersStayC) {
    WritePackage(
        {{"lang/Bad.lang", "#0063# \"no_SUCH.locale\"\n"}, {"lang/C.lang", "#0063# \"C\"\n"}});
    const std::string saved = std::setlocale(LC_ALL, nullptr);
    const char* savedEnv = std::getenv("LC_ALL");
    const std::string savedValue = savedEnv ? savedEnv : "";
    ::setenv("LC_ALL", "C.UTF-8", 1);  // the user's default for this test

    m_language.Init(m_dir, "C");
    EXPECT_STREQ(std::setlocale(LC_CTYPE, nullptr), "C");
    m_language.SelectLanguage("Bad");  // refused by the system: the user's default instead
    EXPECT_STREQ(std::setlocale(LC_CTYPE, nullptr), "C.UTF-8");
    EXPECT_STREQ(std::setlocale(LC_NUMERIC, nullptr), "C");

    if (savedEnv) {
        ::setenv("LC_ALL", savedValue.c_str(), 1);
    } else {
        ::unsetenv("LC_ALL");
    }
    std::setlocale(LC_ALL, saved.c_str());
}

TEST_F(LanguagePackageTest, MissLogWritesEachMissOnceInLanguageFileForm) {
    WritePackage({{"lang/English.lang", "#0001# \"OK\"\n"}});
    m_language.Init(m_dir, "English");
    SetLanguageMissLog(true);
    m_language.GetString(kNotBuiltIn);
    m_language.GetString(kNotBuiltIn);
    m_language.GetString(2);

    FakeDialog dialog;
    dialog.caption = "Two\nlines";
    dialog.controls = {{1000, TranslatableControlKind::Combo, "", {"a", "b"}}};
    m_language.TranslateDialog(dialog, 0x66);
    m_language.TranslateDialog(dialog, 0x66);

    FakeMenu bar;
    bar.Popup("&File").Command(0x8001, "E&xit");
    m_language.TranslateMenu(bar, 0x81, true, 0);

    EXPECT_EQ(MissLog(),
              "#FFF0# \"\"\n"
              "#0002# \"" +
                  std::string(BuiltinString(2)) +
                  "\"\n"
                  "#D00660000# \"Two\\nlines\"\n"
                  "#D006603E8# \"a\\nb\"\n"
                  "#M8001# \"E&xit\"\n"
                  "#M0081# \"#&File#\"\n");
}

TEST_F(LanguagePackageTest, LocalizeFileNameInsertsTheCodeAndChecksThePackage) {
    WritePackage({{"lang/German.lang", "LANGCODE=de\n"}, {"skin/default/bg_de.bmp", "x"}});
    EXPECT_EQ(LocalizeFileName(m_language, "bg.bmp", false), "bg.bmp");
    EXPECT_EQ(LocalizeKey(m_language, "Title"), "Title");
    m_language.Init(m_dir, "German");

    EXPECT_EQ(LocalizeKey(m_language, "Title"), "Title_de");
    EXPECT_EQ(LocalizeFileName(m_language, "a.b.png", false), "a.b_de.png");
    EXPECT_EQ(LocalizeFileName(m_language, "README", false), "README_de");
    EXPECT_EQ(LocalizeFileName(m_language, "x\\my.skin\\bg", false), "x\\my.skin\\bg_de");
    const std::string skin = m_dir + "\\Skin\\default\\";
    EXPECT_EQ(LocalizeFileName(m_language, skin + "bg.bmp", true), skin + "bg_de.bmp");
    EXPECT_EQ(LocalizeFileName(m_language, skin + "fg.bmp", true), skin + "fg.bmp");
}

// Readers on other threads see one language or the other, never a table half replaced (the
// sanitizer builds make the difference visible).
TEST_F(LanguagePackageTest, ReadersOnOtherThreadsDuringASwitch) {
    WritePackage({{"lang/A.lang", "#0001# \"alpha\"\n"}, {"lang/B.lang", "#0001# \"beta\"\n"}});
    m_language.Init(m_dir, "A");
    std::atomic<bool> stop{false};
    std::atomic<int> bad{0};
    std::vector<std::thread> readers;
    for (int t = 0; t < 2; ++t) {
        readers.emplace_back([&] {
            while (!stop) {
                std::string text = m_language.GetString(1);
                bad += text != "alpha" && text != "beta";
            }
        });
    }
    for (int i = 0; i < 50; ++i) {
        m_language.SelectLanguage(i % 2 ? "A" : "B");
    }
    stop = true;
    for (auto& reader : readers) {
        reader.join();
    }
    EXPECT_EQ(bad, 0);
}

// --- dialogs and menus -----------------------------------------------------------------------

class TranslateTest : public LanguagePackageTest {
protected:
    void SetUp() override {
        LanguagePackageTest::SetUp();
        WritePackage({{"lang/X.lang",
                       "CODEPAGE=65001\n"
                       "#0001# \"Jawohl\"\n"
                       "#D00660000# \"Optionen\"\n"
                       "#D00660064# \"Hundert\"\n"
                       "#D006603E8# \"Eins\\nZwei\\n\"\n"
                       "#D006603E9# \"Bearbeiten\"\n"
                       "#D006603EA# \"Liste\"\n"
                       "#D006603EB# \"Zahl\"\n"
                       "#M0081# \"#&Datei#&Hilfe#\"\n"
                       "#M8001# \"&Beenden\"\n"
                       "#M00810000# \"&Markieren\"\n"
                       "#M00810002# \"Kontext\"\n"
                       "#M8384# \"&Inhalt\"\n"
                       "#M8387# \"&Info (&I)...\"\n"
                       "#M8388# \"Ü&ber...\"\n"}});
        m_language.Init(m_dir, "X");
        m_language.SetProductName("Product");
        m_language.SetContentsCommand(0x8384);
        m_language.SetAboutCommand(0x8387);
    }
};

TEST_F(TranslateTest, DialogTranslatesCaptionAndNumberedControls) {
    using C = TranslatableControlKind;
    FakeDialog dialog;
    dialog.caption = "Options";
    dialog.controls = {
        {1, C::Other, "OK", {}},           // common button: string 1
        {2, C::Other, "Cancel", {}},       // string 2, not in the file: built in
        {100, C::Other, "Hundred", {}},    // first dialog-text id
        {1000, C::Combo, "", {"One"}},     // refilled, trailing LF gives an empty item
        {1001, C::Edit, "user text", {}},  // never translated, though the file has it
        {1002, C::List, "", {}},           {1003, C::Spin, "7", {}},
        {-1, C::Other, "label", {}},                                        // unnumbered
        {0, C::Other, "zero", {}},         {0xFFFF, C::Other, "ffff", {}},  // -1 as 16 bits
        {1004, C::Other, "untouched", {}},
    };
    EXPECT_TRUE(m_language.TranslateDialog(dialog, 0x66));
    EXPECT_EQ(dialog.caption, "Optionen");
    EXPECT_EQ(dialog.controls[0].text, "Jawohl");
    EXPECT_EQ(dialog.controls[1].text, BuiltinString(2));
    EXPECT_EQ(dialog.controls[2].text, "Hundert");
    EXPECT_EQ(dialog.controls[3].items, (std::vector<std::string>{"Eins", "Zwei", ""}));
    EXPECT_EQ(dialog.controls[4].text, "user text");
    EXPECT_EQ(dialog.controls[6].text, "7");
    EXPECT_EQ(dialog.controls[7].text, "label");
    EXPECT_EQ(dialog.controls[8].text, "zero");
    EXPECT_EQ(dialog.controls[9].text, "ffff");
    EXPECT_EQ(dialog.controls[10].text, "untouched");

    FakeDialog other;
    other.caption = "Keep";
    m_language.TranslateDialog(other, 0x67);
    EXPECT_EQ(other.caption, "Keep");
}

TEST_F(TranslateTest, MenuBarCaptionsCommandsAndNestedPopupNumbers) {
    FakeMenu bar;
    FakeMenu& file = bar.Popup("&File");
    file.Command(0x8001, "E&xit").Separator();
    file.Popup("&Check").Command(0x9000, "All");  // nested popup 0
    FakeMenu& help = bar.Popup("&Help");
    help.Popup("&Nested");  // nested popup 1: not in the file
    help.Command(0x8384, "&Contents").Command(0x8387, "&About...").Command(0x8388, "x");

    EXPECT_TRUE(m_language.TranslateMenu(bar, 0x81, true, 0));
    EXPECT_EQ(bar.Text(0), "&Datei");
    EXPECT_EQ(bar.Text(1), "&Hilfe");
    EXPECT_EQ(file.Text(0), "&Beenden");
    EXPECT_EQ(file.Text(2), "&Markieren");
    EXPECT_EQ(file.Sub(2).Text(0), "All");
    EXPECT_EQ(help.Text(0), "&Nested");
    EXPECT_EQ(help.Text(1), "&Inhalt Product");
    EXPECT_EQ(help.Text(2), "&Info  Product (&I)...");
    EXPECT_EQ(help.Text(3), "Ü&ber...");  // the about format is only for the about command

    // A context menu walked after the bar numbers its popups on from where the bar ended.
    FakeMenu context;
    context.Popup("Context");
    m_language.TranslateMenu(context, 0x82, false, 0);
    EXPECT_EQ(context.Text(0), "Kontext");
}

TEST_F(TranslateTest, AboutCutsInFrontOfEllipsisWithoutParenthesis) {
    m_language.SetAboutCommand(0x8388);
    FakeMenu menu;
    menu.Command(0x8388, "About...");
    m_language.TranslateMenu(menu, -1, false, 0);
    EXPECT_EQ(menu.Text(0), "Ü&ber Product ...");
}

}  // namespace
}  // namespace ac
