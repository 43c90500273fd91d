#include "resources/Language.h"

#include "resources/BuiltinStrings.h"
#include "resources/LanguageUi.h"

#include <gtest/gtest.h>

#include <atomic>
#include <clocale>
#include <memory>
#include <sstream>
#include <thread>

#include "../support/PackageDir.h"

namespace ac {
namespace {

// What one line stores, as kind, hex id and text ("M8004=&File"), or "" for nothing.
std::string Parsed(std::string_view line) {
    LanguageTables tables;
    ParseLanguageLine(line, tables);
    std::ostringstream out;
    int kind = 0;
    for (const auto* table : {&tables.strings, &tables.menuTexts, &tables.dialogTexts}) {
        for (const LanguageEntry& entry : *table) {
            out << "SMD"[kind] << std::hex << std::uppercase << entry.id << '=' << entry.text;
        }
        ++kind;
    }
    return out.str();
}

TEST(LanguageLine, FormsAndPitfalls) {
    const std::pair<const char*, const char*> cases[] = {
        {"#0001# \"OK\"", "S1=OK"},
        {"#M8004# \"&File\"", "M8004=&File"},
        {"#D00660401# \"Output\"", "D660401=Output"},
        {"#0010# \"Make Music\"", "S10=Make Music"},  // an M in the text is no menu line
        {"#0002# \"\"", "S2="},
        {"#0003# \"say \"hi\"\"", "S3=say "},
        {"#0004# \"abc\"\r", "S4=abc"},
        {"#0005# \"a\\tb\\nc\\rd\\x\"", "S5=a\tb\nc\rd\\x"},
        {"#0006 \"text\"", ""},  // no closing '#'
        {"#1# \"text\"", ""},    // closing '#' below index 3
        {"#0008# \"open", ""},
        {"// #0009 is not here", ""}};
    for (const auto& [line, expected] : cases) {
        EXPECT_EQ(Parsed(line), expected) << line;
    }
}

TEST(LanguageFile, ConvertsBeforeUnescapingAndFirstIdWins) {
    // In GBK the character U+4E57 is 0x81 0x5C: its trail byte is a backslash. Unescaped before
    // conversion, the pair with the following 'n' would turn into a line break. The code page
    // counts wherever the file sets it; a line with a '#' sets no header value.
    LanguageTables tables;
    ParseLanguageFile({"#0001# \"\x81\x5Cn\\n\"", "#0001# \"second\"", "CODEPAGE=936\r",
                       "CODEPAGE=1250 #not a header", "codepage=65001"},
                      tables);
    EXPECT_EQ(*FindLanguageText(tables.strings, 1), "\xE4\xB9\x97n\n");
    EXPECT_EQ(tables.codePage, 936);
    // A byte order mark is dropped and means UTF-8.
    LanguageTables bom;
    ParseLanguageFile({"\xEF\xBB\xBFLANGCODE=  fr \r", "#0001# \"\xC3\xA9t\xC3\xA9\""}, bom);
    EXPECT_EQ(bom.langCode, "fr");
    EXPECT_EQ(*FindLanguageText(bom.strings, 1), "\xC3\xA9t\xC3\xA9");
}

TEST(LanguageText, MenuBarPieces) {
    const std::string bar = "#&File#&Edit#&View#";
    EXPECT_EQ(MenuTextPiece(bar, 0), "&File");
    EXPECT_EQ(MenuTextPiece(bar, 2), "&View");
    EXPECT_EQ(MenuTextPiece(bar, 3), bar);  // nothing behind the last '#': the whole text
    EXPECT_EQ(MenuTextPiece("#A#&Edit#", 0), "#A#&Edit#");  // shorter than two bytes
    EXPECT_EQ(MenuTextPiece("#&File#&Edit", 1), "&Edit");
    EXPECT_EQ(MenuTextPiece("No list", 0), "No list");
}

TEST(LanguageText, EnglishNamesOfLocales) {
    // The country decides between the two Chinese; codeset and modifier are not part of it.
    EXPECT_EQ(LanguageNameFromLocale("zh_SG.GB18030"), "Chinese(Simplified)");
    EXPECT_EQ(LanguageNameFromLocale("zh_HK"), "Chinese(Traditional)");
    EXPECT_EQ(LanguageNameFromLocale("sr_RS@latin"), "Serbian");
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

    int GetItemCount() const override { return static_cast<int>(items.size()); }
    TranslatableMenuItemKind GetItemKind(int p) const override { return items.at(p).kind; }
    int GetCommandId(int p) const override { return items.at(p).command; }
    std::string GetItemText(int p) const override { return items.at(p).text; }
    void SetItemText(int p, const std::string& text) override { items.at(p).text = text; }
    ITranslatableMenu* GetSubMenu(int p) override { return items.at(p).subMenu.get(); }
};

// --- a language in a package -----------------------------------------------------------------

class LanguagePackage : public test::PackageDir {
protected:
    LanguagePackage() {
        m_language.SetLanguageKeyWriter(
            [this](const std::string& name) { m_keyWrites.push_back(name); });
    }
    ~LanguagePackage() override { SetLanguageMissLog(false); }

    ImLanguage m_language;
    std::vector<std::string> m_keyWrites;
};

constexpr std::uint32_t kNotBuiltIn = 0xFFF0;

TEST_F(LanguagePackage, LoadsTextsAndFallsBack) {
    ASSERT_TRUE(BuiltinString(kNotBuiltIn).empty());
    m_language.Init(m_base, "German");  // no package at all: the built-in texts
    EXPECT_EQ(m_language.GetString(1), BuiltinString(1));
    WritePackage({{"lang/German.lang",
                   "CODEPAGE=1252\r\n#0001# \"Gut\"\r\n#0002# \"\"\r\n"
                   "#D00660000# \"Einstellungen\"\r\n#M8004# \"&Datei\"\r\n"},
                  {"lang/English.lang", "#0001# \"OK\"\n"}});
    m_language.Init(m_base, "gERMAN");  // any case finds the file and keeps its spelling
    EXPECT_EQ(m_language.GetLanguageName(), "gERMAN");
    EXPECT_EQ(m_language.GetString(1), "Gut");
    EXPECT_EQ(m_language.GetString(2), BuiltinString(2));  // empty text counts as a miss
    EXPECT_EQ(m_language.GetString(kNotBuiltIn), "");
    EXPECT_EQ(m_language.GetDialogText(0x00660000), "Einstellungen");
    EXPECT_EQ(m_language.GetMenuText(0x8004), "&Datei");
    EXPECT_EQ(m_language.GetLanguageCount(), 2);
    // A missing language falls back to English and stores that, so it is not tried again.
    m_language.SelectLanguage("Klingon");
    EXPECT_EQ(m_language.GetLanguageName(), "English");
    EXPECT_EQ(m_language.GetString(1), "OK");
    EXPECT_EQ(m_keyWrites, (std::vector<std::string>{"english", "English"}));
}

TEST_F(LanguagePackage, LinesOfAHundredThousandCharactersDoNoHarm) {
    WritePackage({{"lang/German.lang", "CODEPAGE=1252\r\n#0001# \"" + std::string(100000, '\xE4') +
                                           "\"\r\n" + std::string(100000, '#') +
                                           "\r\n#0002# \"Nein\"\r\n"}});
    m_language.Init(m_base, "German");
    EXPECT_EQ(m_language.GetString(1).size(), 200000u);  // each CP1252 byte is two in UTF-8
    EXPECT_EQ(m_language.GetString(2), "Nein");
}

TEST_F(LanguagePackage, LocaleFollowsStringNinetyNineButNumbersStayC) {
    WritePackage({{"lang/U.lang", "#0063# \"C.UTF-8\"\n"}});
    const std::string saved = std::setlocale(LC_ALL, nullptr);
    m_language.Init(m_base, "U");
    EXPECT_STREQ(std::setlocale(LC_CTYPE, nullptr), "C.UTF-8");
    EXPECT_STREQ(std::setlocale(LC_NUMERIC, nullptr), "C");
    std::setlocale(LC_ALL, saved.c_str());
}

TEST_F(LanguagePackage, MissLogWritesEachMissOnceInLanguageFileForm) {
    WritePackage({{"lang/English.lang", "#0001# \"OK\"\n"}});
    m_language.Init(m_base, "English");
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

    const std::string expected = "#FFF0# \"\"\n#0002# \"" + std::string(BuiltinString(2)) +
                                 "\"\n#D00660000# \"Two\\nlines\"\n#D006603E8# \"a\\nb\"\n"
                                 "#M8001# \"E&xit\"\n#M0081# \"#&File#\"\n";
    EXPECT_EQ(test::ReadFile(UserData("lang_miss.txt")), expected);
}

TEST_F(LanguagePackage, LocalizeFileNameInsertsTheCodeAndChecksThePackage) {
    WritePackage({{"lang/German.lang", "LANGCODE=de\n"}, {"skin/default/bg_de.bmp", "x"}});
    EXPECT_EQ(LocalizeFileName(m_language, "bg.bmp", false), "bg.bmp");
    m_language.Init(m_base, "German");

    EXPECT_EQ(LocalizeKey(m_language, "Title"), "Title_de");
    EXPECT_EQ(LocalizeFileName(m_language, "a.b.png", false), "a.b_de.png");
    EXPECT_EQ(LocalizeFileName(m_language, "x\\my.skin\\bg", false), "x\\my.skin\\bg_de");
    const std::string skin = Logical("Skin\\default\\");
    EXPECT_EQ(LocalizeFileName(m_language, skin + "bg.bmp", true), skin + "bg_de.bmp");
    EXPECT_EQ(LocalizeFileName(m_language, skin + "fg.bmp", true), skin + "fg.bmp");
}

// Readers on other threads see one language or the other, never a table half replaced (the
// sanitizer builds make the difference visible).
TEST_F(LanguagePackage, ReadersOnOtherThreadsDuringASwitch) {
    WritePackage({{"lang/A.lang", "#0001# \"alpha\"\n"}, {"lang/B.lang", "#0001# \"beta\"\n"}});
    m_language.Init(m_base, "A");
    std::atomic<bool> stop{false};
    std::atomic<int> bad{0};
    std::thread reader([&] {
        while (!stop) {
            const std::string text = m_language.GetString(1);
            bad += text != "alpha" && text != "beta";
        }
    });
    for (int i = 0; i < 50; ++i) {
        m_language.SelectLanguage(i % 2 ? "A" : "B");
    }
    stop = true;
    reader.join();
    EXPECT_EQ(bad, 0);
}

// --- dialogs and menus -----------------------------------------------------------------------

class Translate : public LanguagePackage {
protected:
    Translate() {
        WritePackage({{"lang/X.lang",
                       "CODEPAGE=65001\n#0001# \"Jawohl\"\n"
                       "#D00660000# \"Optionen\"\n#D00660064# \"Hundert\"\n"
                       "#D006603E8# \"Eins\\nZwei\\n\"\n#D006603E9# \"Bearbeiten\"\n"
                       "#D006603EA# \"Liste\"\n#D006603EB# \"Zahl\"\n"
                       "#M0081# \"#&Datei#&Hilfe#\"\n#M8001# \"&Beenden\"\n"
                       "#M00810000# \"&Markieren\"\n#M00810002# \"Kontext\"\n"
                       "#M8384# \"&Inhalt\"\n#M8387# \"&Info (&I)...\"\n#M8388# \"Ü&ber...\"\n"}});
        m_language.Init(m_base, "X");
        m_language.SetProductName("Product");
        m_language.SetContentsCommand(0x8384);
        m_language.SetAboutCommand(0x8387);
    }
};

TEST_F(Translate, DialogTranslatesCaptionAndNumberedControls) {
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
        {-1, C::Other, "label", {}},        // unnumbered
        {0xFFFF, C::Other, "ffff", {}},     // -1 as 16 bits
        {1004, C::Other, "untouched", {}},  // no text: kept
    };
    EXPECT_TRUE(m_language.TranslateDialog(dialog, 0x66));
    EXPECT_EQ(dialog.caption, "Optionen");
    std::vector<std::string> texts;
    for (const FakeControl& control : dialog.controls) {
        texts.push_back(control.text);
    }
    EXPECT_EQ(texts,
              (std::vector<std::string>{"Jawohl", std::string(BuiltinString(2)), "Hundert", "",
                                        "user text", "", "7", "label", "ffff", "untouched"}));
    EXPECT_EQ(dialog.controls[3].items, (std::vector<std::string>{"Eins", "Zwei", ""}));
}

TEST_F(Translate, MenuBarCaptionsCommandsAndNestedPopupNumbers) {
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
    EXPECT_EQ(file.items[2].subMenu->Text(0), "All");
    EXPECT_EQ(help.Text(0), "&Nested");
    EXPECT_EQ(help.Text(1), "&Inhalt Product");
    EXPECT_EQ(help.Text(2), "&Info  Product (&I)...");
    EXPECT_EQ(help.Text(3), "Ü&ber...");  // the about format is only for the about command

    // A context menu walked after the bar numbers its popups on from where the bar ended.
    FakeMenu context;
    context.Popup("Context");
    m_language.TranslateMenu(context, 0x82, false, 0);
    EXPECT_EQ(context.Text(0), "Kontext");

    // Without a parenthesis the product goes in front of the ellipsis.
    m_language.SetAboutCommand(0x8388);
    FakeMenu menu;
    menu.Command(0x8388, "About...");
    m_language.TranslateMenu(menu, -1, false, 0);
    EXPECT_EQ(menu.Text(0), "Ü&ber Product ...");
}

}  // namespace
}  // namespace ac
