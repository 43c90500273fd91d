// The skin catalogue and typed lookups against a data.pkg built for each test.

#include "../support/PackageDir.h"
#include "skin/SkinConfig.h"
#include "skin/SkinManager.h"

#include <gtest/gtest.h>

namespace ac {
namespace {

class Recorder : public ImSkinListener {
public:
    Recorder(std::vector<std::string>& log, std::string name, bool accept = true)
        : m_log(log), m_name(std::move(name)), m_accept(accept) {}
    bool OnSkinChanged(const std::string& dir) override {
        m_log.push_back(m_name + ":" + dir);
        return m_accept;
    }
    bool DefersSkin() const override { return hidden; }
    bool hidden = false;

private:
    std::vector<std::string>& m_log;
    std::string m_name;
    bool m_accept;
};

class SkinCatalogueTest : public test::PackageDir {
protected:
    void SetUp() override {
        WritePackage({
            {"skin/", ""},
            {"skin/Default/", ""},
            {"skin/Default/skin.ini",
             "[Main]\r\nName=Plain\r\nLeftMargin=7\r\nBorderWidth=3\r\nTextColor=0xFF0000\r\n"
             "BgColor=-1\r\nLong=" +
                 std::string(1023, 'x') +
                 "\r\n"
                 "[Menu]\r\nFontName=Serif\r\nFontSize=120\r\nFontItalic=1\r\n"},
            {"skin/Blue/", ""},
            {"skin/Blue/skin.ini", "[Main]\r\nName=Blue sky\r\n"},
            {"skin/Nameless/", ""},
            {"skin/Nameless/skin.ini", "[Main]\r\nLeftMargin=1\r\n"},
            {"skin/TooLong/", ""},
            {"skin/TooLong/skin.ini", "[Main]\r\nName=" + std::string(256, 'n') + "\r\n"},
            {"skin/Broken/", ""},
        });
        g_Skin.Reset();
        g_Skin.SetRoot(Logical("Skin"));
    }
    void TearDown() override { g_Skin.Reset(); }
};

TEST_F(SkinCatalogueTest, LookupsFallBackToDefaultsAndMainSection) {
    ImSkinConfig config;
    ASSERT_TRUE(config.Load(Logical("Skin\\Default\\")));
    EXPECT_EQ(config.GetName(), "Plain");
    SkinMetrics metrics;
    config.GetMetrics(metrics, nullptr);
    EXPECT_EQ(metrics.LeftMargin, 7);
    EXPECT_EQ(metrics.RightMargin, 2);
    EXPECT_EQ(metrics.BorderWidth, 3);
    config.GetMetrics(metrics, "Menu");
    EXPECT_EQ(metrics.LeftMargin, 2) << "a section of its own has no Main fall-back";
    EXPECT_EQ(config.GetInt("BgColor", 5, ""), -1) << "an explicit -1 is read as written";
    EXPECT_EQ(config.GetString("Long", "", nullptr).size(), 1023u);
    EXPECT_FALSE(config.Load(""));
}

TEST_F(SkinCatalogueTest, RgbColoursSwapToNativeOrder) {
    ImSkinConfig config;
    config.Load(Logical("Skin\\Default"));
    // Red as a web colour is 0x0000FF natively; the same number read natively is blue.
    EXPECT_EQ(config.GetRgbColour("TextColor", 0, "Main"), 0x0000FFu);
    EXPECT_EQ(static_cast<std::uint32_t>(config.GetInt("TextColor", 0, "Main")), 0xFF0000u);
    EXPECT_EQ(config.GetRgbColour("Missing", 0x123456, "Main"), 0x123456u);
    EXPECT_EQ(SwapRedBlue(SwapRedBlue(0xABCDEF)), 0xABCDEFu);
}

TEST_F(SkinCatalogueTest, FontBlocksHaveTheirDefaults) {
    ImSkinConfig config;
    config.Load(Logical("Skin\\Default"));
    const SkinFont menu = config.GetFont("Menu");
    EXPECT_EQ(menu.name, "Serif");
    EXPECT_EQ(menu.size, 120);
    EXPECT_EQ(menu.weight, 400);
    EXPECT_TRUE(menu.italic);
    EXPECT_EQ(config.GetFont("Caption").name, "Tohama");
    EXPECT_EQ(config.GetFont("Main").name, "MS Shell Dlg");
}

TEST_F(SkinCatalogueTest, OnlyDirectoriesWithANameAreSkins) {
    EXPECT_EQ(g_Skin.Enumerate(), 5);
    std::vector<std::string> named;
    for (int i = 0; i < g_Skin.GetSkinCount(); ++i) {
        ImSkinConfig config;
        if (config.Load(g_Skin.GetSkinAt(i))) {
            named.push_back(config.GetName());
        }
    }
    EXPECT_EQ(named, (std::vector<std::string>{"Blue sky", "Plain"}));
    EXPECT_EQ(g_Skin.GetSkinAt(99), "");
}

TEST_F(SkinCatalogueTest, SetSkinByNameOrPathTellsListenersInOrder) {
    std::vector<std::string> log;
    Recorder first(log, "a");
    Recorder second(log, "b");
    EXPECT_TRUE(g_Skin.AddListener(&first));
    EXPECT_TRUE(g_Skin.AddListener(&second));
    EXPECT_FALSE(g_Skin.AddListener(&first));
    ASSERT_TRUE(g_Skin.SetSkin("Blue"));
    ASSERT_TRUE(g_Skin.SetSkin(Logical("Skin\\Blue")));
    ASSERT_TRUE(g_Skin.SetSkin("/somewhere/else/Blue/"));
    const std::string dir = Logical("Skin\\Blue");
    EXPECT_EQ(log, (std::vector<std::string>{"a:" + dir, "b:" + dir, "a:" + dir, "b:" + dir,
                                             "a:" + dir, "b:" + dir}));
    EXPECT_EQ(g_Skin.GetSkinName(), "Blue");
}

TEST_F(SkinCatalogueTest, ARefusingListenerStopsTheRound) {
    std::vector<std::string> log;
    Recorder refuser(log, "no", false);
    Recorder later(log, "later");
    g_Skin.AddListener(&refuser);
    g_Skin.AddListener(&later);
    EXPECT_FALSE(g_Skin.SetSkin("Default"));
    EXPECT_EQ(log.size(), 1u);
    EXPECT_EQ(g_Skin.GetSkinName(), "Default") << "the names move on even so";
}

// A panel out of sight takes the skin when shown, and then only the latest one, once.
TEST_F(SkinCatalogueTest, AHiddenListenerTakesTheLatestSkinWhenShown) {
    std::vector<std::string> log;
    Recorder shown(log, "shown");
    Recorder hidden(log, "hidden");
    hidden.hidden = true;
    g_Skin.AddListener(&shown);
    g_Skin.AddListener(&hidden);
    ASSERT_TRUE(g_Skin.SetSkin("Default"));
    ASSERT_TRUE(g_Skin.SetSkin("Blue"));
    const std::string blue = Logical("Skin\\Blue");
    EXPECT_EQ(log, (std::vector<std::string>{"shown:" + Logical("Skin\\Default"), "shown:" + blue}));
    log.clear();
    hidden.hidden = false;
    g_Skin.TakeDeferredSkin(&hidden);
    g_Skin.TakeDeferredSkin(&hidden);
    g_Skin.TakeDeferredSkin(&shown);
    EXPECT_EQ(log, std::vector<std::string>{"hidden:" + blue});
    ASSERT_TRUE(g_Skin.SetSkin("Default"));
    EXPECT_EQ(log.size(), 3u) << "a shown listener hears every change again";
}

// A window that goes leaves the round: the next change of skin does not reach it.
TEST_F(SkinCatalogueTest, AListenerThatGoesHearsNoMore) {
    std::vector<std::string> log;
    Recorder staying(log, "staying");
    g_Skin.AddListener(&staying);
    {
        Recorder going(log, "going");
        g_Skin.AddListener(&going);
        going.hidden = true;
        ASSERT_TRUE(g_Skin.SetSkin("Blue"));  // deferred: on the waiting list too
    }
    log.clear();
    ASSERT_TRUE(g_Skin.SetSkin("Default"));
    EXPECT_EQ(log, std::vector<std::string>{"staying:" + Logical("Skin\\Default")});
}

// A panel made after the start (a tab opened late) wears the skin chosen before it existed:
// at once when shown, when it first shows when hidden.
TEST_F(SkinCatalogueTest, AListenerMadeLateTakesTheCurrentSkin) {
    std::vector<std::string> log;
    Recorder early(log, "early");
    g_Skin.AddListener(&early);
    Recorder beforeAnySkin(log, "none");
    g_Skin.DressLateListener(&beforeAnySkin);
    EXPECT_TRUE(log.empty()) << "no skin yet: nothing to wear";
    ASSERT_TRUE(g_Skin.SetSkin("Blue"));
    const std::string blue = Logical("Skin\\Blue");
    log.clear();
    Recorder late(log, "late");
    g_Skin.DressLateListener(&late);
    Recorder hiddenLate(log, "hidden");
    hiddenLate.hidden = true;
    g_Skin.DressLateListener(&hiddenLate);
    EXPECT_EQ(log, std::vector<std::string>{"late:" + blue});
    hiddenLate.hidden = false;
    g_Skin.TakeDeferredSkin(&hiddenLate);
    EXPECT_EQ(log, (std::vector<std::string>{"late:" + blue, "hidden:" + blue}));
    log.clear();
    ASSERT_TRUE(g_Skin.SetSkin("Default"));
    EXPECT_EQ(log.size(), 4u) << "every one of them hears the next change";
}

TEST_F(SkinCatalogueTest, StartChoiceFallsBackToDefaultThenToAnyTakingSkin) {
    EXPECT_TRUE(g_Skin.ChooseStartSkin("Removed"));
    EXPECT_EQ(g_Skin.GetSkinName(), "Default");
    EXPECT_TRUE(g_Skin.ChooseStartSkin(""));
    EXPECT_EQ(g_Skin.GetSkinName(), "Default");
    // A skin without a Name is still selectable by name.
    EXPECT_TRUE(g_Skin.ChooseStartSkin("Nameless"));
    EXPECT_EQ(g_Skin.GetSkinName(), "Nameless");
    EXPECT_FALSE(g_Skin.SetSkin("Broken")) << "a directory without skin.ini";
}

TEST_F(SkinCatalogueTest, ANameBeyond255CharactersIsNoName) {
    ImSkinConfig config;
    EXPECT_FALSE(config.Load(Logical("Skin\\TooLong")));
}

TEST(SkinNameTest, LastComponentWhicheverSeparator) {
    EXPECT_EQ(SkinNameOf("Default"), "Default");
    EXPECT_EQ(SkinNameOf("C:\\base\\Skin\\Blue\\"), "Blue");
    EXPECT_EQ(SkinNameOf("/base/Skin/Blue"), "Blue");
    EXPECT_EQ(SkinNameOf(""), "");
}

}  // namespace
}  // namespace ac
