// The menus' layout must match the numbering of nested popups that language files key on: a
// popup in the wrong place picks up another popup's translation. Checked against the German
// file shipped in data.pkg. Runs under xvfb-run (wx menus need the toolkit).

#include "resources/Language.h"
#include "shell/MenuTables.h"
#include "skin/WxTranslate.h"

#include <wx/app.h>
#include <wx/init.h>

#include <gtest/gtest.h>

namespace ac {
namespace {

class MenuLayoutTest : public ::testing::Test {
protected:
    static void SetUpTestSuite() {
        static int argc = 1;
        static char name[] = "menu_tests";
        static char* argv[] = {name, nullptr};
        // An assertion fails the test instead of waiting in a dialog nobody answers.
        wxSetAssertHandler([](const wxString& file, int line, const wxString&, const wxString& cond,
                              const wxString& msg) {
            // Command ids above 0x7FFF are the program's own; wx only warns about them.
            if (msg == "invalid itemid value") {
                return;
            }
            ADD_FAILURE() << file << ":" << line << " " << cond << " " << msg;
        });
        wxApp::SetInstance(new wxApp);
        ASSERT_TRUE(wxEntryStart(argc, argv));
        ASSERT_TRUE(wxTheApp->CallOnInit());
        ASSERT_TRUE(g_Language.Init(AC_BIN_DIR, "German"));
    }
    static void TearDownTestSuite() { wxEntryCleanup(); }

    static std::string Label(wxMenu* menu, int position) {
        return menu->FindItemByPosition(static_cast<std::size_t>(position))
            ->GetItemLabel()
            .utf8_string();
    }
    static std::string German(std::uint32_t key) { return g_Language.GetMenuText(key); }
};

TEST_F(MenuLayoutTest, ConvertBarPopupsTakeTheirOwnTranslations) {
    auto menu = BuildModeMenu(0);
    TranslateMenuBar(*menu);
    ASSERT_EQ(menu->tops.size(), 5u);
    EXPECT_EQ(menu->tops[0].first.utf8_string(), "&Datei");
    wxMenu* edit = menu->tops[1].second.get();
    EXPECT_EQ(Label(edit, 0), German(0x810000));
    EXPECT_EQ(Label(edit, 1), German(0x810001));
    wxMenu* convert = menu->tops[2].second.get();
    EXPECT_EQ(Label(convert, static_cast<int>(convert->GetMenuItemCount()) - 1), German(0x810002));
    wxMenu* options = OptionsPopup(*menu);
    EXPECT_EQ(Label(options, 0), German(0x810003));
    EXPECT_EQ(Label(options, 1), German(0x810004));
    EXPECT_EQ(Label(menu->tops[0].second.get(), 8), German(32785)) << "Exit";
}

TEST_F(MenuLayoutTest, RipBarNumbersItsSevenPopups) {
    auto menu = BuildModeMenu(1);
    TranslateMenuBar(*menu);
    EXPECT_EQ(menu->tops[2].first.utf8_string(), "&Rippen");
    EXPECT_EQ(Label(menu->tops[1].second.get(), 0), German(0xAB0000));
    EXPECT_EQ(Label(menu->tops[1].second.get(), 1), German(0xAB0001));
    wxMenu* rip = menu->tops[2].second.get();
    EXPECT_EQ(Label(rip, 0), German(0xAB0002));
    EXPECT_EQ(Label(rip, 10), German(0xAB0003)) << "CDDB";
    EXPECT_EQ(Label(rip, 12), German(0xAB0004)) << "After Converting";
    EXPECT_EQ(Label(OptionsPopup(*menu), 0), German(0xAB0005));
    EXPECT_EQ(Label(OptionsPopup(*menu), 1), German(0xAB0006));
    ASSERT_NE(SelectCdRomPopup(*menu), nullptr);
}

TEST_F(MenuLayoutTest, BurnBarAndContextMenus) {
    auto menu = BuildModeMenu(2);
    TranslateMenuBar(*menu);
    EXPECT_EQ(menu->tops[2].first.utf8_string(), "&Brennen");
    EXPECT_EQ(Label(OptionsPopup(*menu), 0), German(0xAA0000));
    EXPECT_EQ(Label(OptionsPopup(*menu), 1), German(0xAA0001));
    EXPECT_EQ(SelectCdRomPopup(*menu), nullptr);
    for (int id : {kMediaListContextMenu, kRipListContextMenu, kBurnListContextMenu, kTrayMenu}) {
        auto context = BuildContextMenu(id);
        ASSERT_NE(context, nullptr) << id;
        TranslatePopupMenu(*context, id);
        for (wxMenuItem* item : context->GetMenuItems()) {
            const std::string german = German(static_cast<std::uint32_t>(item->GetId()));
            if (!german.empty()) {
                EXPECT_EQ(item->GetItemLabel().utf8_string(), german) << item->GetId();
            }
        }
    }
    EXPECT_EQ(BuildContextMenu(999), nullptr);
}

}  // namespace
}  // namespace ac
