// The side bar on a real window with a fake main dialog: the catalogue loads from a data.pkg of
// a test's own, user profiles saved, renamed and deleted survive a restart of the panel, and
// edits in the grid and on the simple controls reach every set handed in. Runs under xvfb-run.
#include "../../support/QuietHub.h"
#include "../../support/WxTestApp.h"
#include "profile/ui/SideBarWnd.h"

#include "profile/grid/PropertyTree.h"
#include "profile/ui/ParameterGrid.h"
#include "profile/ui/SaveProfileDlg.h"
#include "resources/Language.h"
#include "shell/AppConfig.h"
#include "shell/MainHub.h"
#include "skin/SkinLabels.h"
#include "skin/UiQueueWx.h"

#include <wx/app.h>
#include <wx/frame.h>
#include <wx/init.h>
#include <wx/utils.h>

#include <gtest/gtest.h>

#include <chrono>
#include <thread>

#include "../../support/ProfileFiles.h"

namespace ac {
namespace {

using test::PfText;

const std::vector<std::string> kEntries = {
    "title = 0, \"\", \"\"", "ab = 0, \"Auto\", \"128\", {\"64\", \"128\", \"256\"}",
    "ar = 0, \"\", \"44100\"", "ac = 0, \"\", \"2 (Stereo)\"",
    "vol_factor = 0, \"100%\", \"100%\""};

class FakeHub : public test::QuietHub {
public:
    void ApplyProfile(Profile& profile) override {
        applied.push_back(profile.GetName());
        if (g_SideBar != nullptr) {
            g_SideBar->SetCurrentProfile(&profile);
            g_SideBar->SetSets(selected);
        }
    }
    void OnProfileChosen(int index) override { chosen.push_back(index); }
    void OnCatalogueLoaded() override { ++loadedNotices; }
    std::vector<ParameterSet*> SelectedSets() override { return selected; }
    void EditSets(const std::function<void()>& edit) override {
        ++edits;
        edit();
    }
    void SetSelectedVolume(int volume, bool firstOnly) override {
        volumes.emplace_back(volume, firstOnly);
    }
    void RememberProfileIndex(int workMode, int index) override {
        remembered.emplace_back(workMode, index);
    }
    bool IsBurnRunActive() override { return burning; }

    bool burning = false;
    std::vector<ParameterSet*> selected;
    std::vector<std::string> applied;
    std::vector<int> chosen;
    int loadedNotices = 0;
    int edits = 0;
    std::vector<std::pair<int, int>> volumes;
    std::vector<std::pair<int, int>> remembered;
};

// One base folder for the whole run: the program reads its base directory once.
class SideBarTest : public test::ProfileFiles {
protected:
    static void SetUpTestSuite() {
        test::StartWx("sidebar_tests");
        InstallWxUiQueue();
    }
    static void TearDownTestSuite() { test::StopWx(); }

    void SetUp() override {
        static test::TempDir* shared = new test::TempDir;
        s_base = shared->Path() + "/Base";
        m_base = s_base;
        std::filesystem::create_directories(m_base);
        ::setenv("AUDIOCONV_BASEDIR", m_base.c_str(), 1);
        ::setenv("XDG_DATA_HOME", (*shared / "xdg").c_str(), 1);
        ::setenv("XDG_CONFIG_HOME", (*shared / "config").c_str(), 1);
        std::filesystem::remove_all(*shared / "xdg");
        ClosePackage(m_base + "\\profile\\user\\x.pf");
        WriteProfiles(
            {{"mp3.pf", PfText("MP3 Audio", "mp3", "mp3", kEntries, "IsSysProfile = yes\r\n")},
             {"ogg.pf", PfText("OGG Vorbis", "ogg", "ogg", kEntries, "IsSysProfile = yes\r\n")},
             {"wav.pf", PfText("WAV Audio", "wav", "wav", kEntries, "IsSysProfile = yes\r\n")},
             {"wma.pf", PfText("WMA Audio", "wma", "wma", kEntries, "IsSysProfile = yes\r\n")}});
        ASSERT_EQ(GetAppConfig().GetBaseDirectory(), m_base);
        GetAppConfig().SetInt("last_run_function", 0);
        GetAppConfig().SetString("last_profile_path", SystemPath("ogg.pf").c_str());
        SetMainHub(&m_hub);
        m_frame = new wxFrame(nullptr, wxID_ANY, "side bar", wxDefaultPosition, wxSize(260, 620));
        SetProfileMessageHook([this](const std::string& text, long) {
            m_messages.push_back(text);
            return m_answer;
        });
    }
    void TearDown() override {
        delete m_bar;
        m_bar = nullptr;
        m_frame->Destroy();
        wxTheApp->ProcessPendingEvents();
        SetMainHub(nullptr);
        SetProfileMessageHook(nullptr);
        CSideBarWnd::SetNameDialogRunner(nullptr);
    }

    // A new panel, as at a start of the program, loaded through.
    CSideBarWnd* Start() {
        delete m_bar;
        m_bar = new CSideBarWnd(m_frame);
        m_bar->SetSize(m_frame->GetClientSize());
        // Shown, so the sliders can capture the mouse as a press makes them do.
        m_frame->Show();
        for (int i = 0; i < 2000 && !m_bar->IsLoaded(); ++i) {
            wxTheApp->ProcessPendingEvents();
            std::this_thread::sleep_for(std::chrono::milliseconds(5));
        }
        EXPECT_TRUE(m_bar->IsLoaded());
        return m_bar;
    }
    std::vector<std::string> EntryNames() const {
        std::vector<std::string> names;
        for (int i = 0; i < m_bar->GetProfileCount(); ++i)
            names.push_back(m_bar->GetProfileAt(i)->GetName());
        return names;
    }
    // The name dialog answered with `typed`.
    void Answer(const std::string& typed) {
        CSideBarWnd::SetNameDialogRunner([this, typed](CSaveProfileDlg& dialog) {
            dialog.SetNameText(typed);
            m_dialogAccepted = dialog.TryAccept();
            return m_dialogAccepted;
        });
    }
    std::string StateLine(const std::string& key) const {
        std::istringstream lines(m_bar->DescribeState());
        for (std::string line; std::getline(lines, line);) {
            if (line.rfind(key + "=", 0) == 0)
                return line.substr(key.size() + 1);
        }
        return "<none>";
    }

    static std::string s_base;
    FakeHub m_hub;
    wxFrame* m_frame = nullptr;
    CSideBarWnd* m_bar = nullptr;
    std::vector<std::string> m_messages;
    int m_answer = wxYES;
    bool m_dialogAccepted = false;
};
std::string SideBarTest::s_base;

TEST_F(SideBarTest, CatalogueLoadsTheLastProfileFirstAndLeavesOutUnadmittedFormats) {
    Start();
    ASSERT_EQ(m_bar->GetProfileCount(), 3);
    EXPECT_EQ(m_bar->GetProfileAt(0)->GetName(), "OGG Vorbis");
    EXPECT_EQ(m_bar->GetSelectedIndex(), 0);
    EXPECT_EQ(m_bar->GetCurrentProfile(), m_bar->GetProfileAt(0));
    EXPECT_EQ(StateLine("profile"), "OGG Vorbis  (*.ogg)");
    EXPECT_EQ(m_hub.chosen, std::vector<int>{0});
    EXPECT_EQ(m_hub.loadedNotices, 1);
    EXPECT_EQ(m_bar->FindProfileByPath(SystemPath("WAV.PF")),
              m_bar->FindProfileByPath(SystemPath("wav.pf")));
    EXPECT_GE(m_bar->FindProfileByPath(SystemPath("wav.pf")), 1);
    EXPECT_EQ(m_bar->FindProfileByPath(SystemPath("wma.pf")), -1);
    EXPECT_GT(m_bar->DropDownWidth(), 0);
}

TEST_F(SideBarTest, FirstStartTakesTheFallBackAndStoresIt) {
    GetAppConfig().SetString("last_profile_path", "");
    Start();
    EXPECT_EQ(GetAppConfig().GetString("last_profile_path", nullptr, "x"), SystemPath("mp3.pf"));
    EXPECT_EQ(m_bar->GetProfileAt(0)->GetName(), "MP3 Audio");

    // The rip mode has a path of its own; an empty one is the fall-back too, and is stored.
    GetAppConfig().SetInt("last_run_function", 1);
    GetAppConfig().SetString("last_profile_path", SystemPath("ogg.pf").c_str());
    GetAppConfig().SetString("lastcd_profile_path", "");
    Start();
    EXPECT_EQ(GetAppConfig().GetString("lastcd_profile_path", nullptr, "x"), SystemPath("mp3.pf"));
    EXPECT_EQ(m_bar->GetProfileAt(0)->GetName(), "MP3 Audio");
    EXPECT_EQ(m_bar->GetProfileCount(), 3);
}

TEST_F(SideBarTest, UserProfilesSurviveARestartThroughSaveAsRenameAndDelete) {
    Start();
    const int mp3 = m_bar->FindProfileByPath(SystemPath("mp3.pf"));
    m_bar->SelectIndex(mp3, true);
    EXPECT_EQ(m_hub.applied.back(), "MP3 Audio");
    m_bar->GetCurrentProfile()->SetValue("ab", "256");

    // A name the selector shows, in another case, is refused and nothing is written.
    Answer("mp3 AUDIO");
    m_bar->SaveProfile(true);
    EXPECT_FALSE(m_dialogAccepted);
    ASSERT_EQ(m_messages.size(), 1u);
    EXPECT_EQ(m_messages[0],
              "The profile name has already existed. Please change to another name.");
    EXPECT_EQ(m_bar->GetProfileCount(), 3);

    Answer("  Mine.pf ");
    m_bar->SaveProfile(true);
    ASSERT_EQ(m_bar->GetProfileCount(), 4);
    EXPECT_EQ(m_bar->GetSelectedIndex(), mp3) << "a Save as leaves the old entry selected";

    Start();
    ASSERT_EQ(EntryNames().size(), 4u);
    const std::string path = m_base + "\\profile\\user\\Mine.pf";
    const int mine = m_bar->FindProfileByPath(path);
    ASSERT_GE(mine, 0);
    EXPECT_EQ(m_bar->GetProfileAt(mine)->GetName(), "Mine.pf");
    EXPECT_EQ(m_bar->GetProfileAt(mine)->GetValue("ab"), "256");
    EXPECT_FALSE(m_bar->GetProfileAt(mine)->IsSysProfile());

    // Rename with the name unchanged matches the profile's own entry and is refused.
    m_bar->SelectIndex(mine, true);
    Answer("Mine.pf");
    m_bar->RenameProfile();
    EXPECT_FALSE(m_dialogAccepted);
    Answer("Yours");
    m_bar->RenameProfile();
    EXPECT_EQ(m_bar->GetSelectedIndex(), 3);
    EXPECT_EQ(StateLine("profile"), "Yours  (*.mp3)");

    Start();
    ASSERT_GE(m_bar->FindProfileByPath(path), 0) << "the file keeps its name";
    EXPECT_EQ(m_bar->GetProfileAt(m_bar->FindProfileByPath(path))->GetName(), "Yours");

    m_bar->SelectIndex(m_bar->FindProfileByPath(path), true);
    m_answer = wxNO;
    m_bar->DeleteProfile();
    EXPECT_EQ(m_bar->GetProfileCount(), 4);
    m_answer = wxYES;
    m_bar->DeleteProfile();
    EXPECT_EQ(m_bar->GetProfileCount(), 3);
    EXPECT_EQ(m_bar->GetSelectedIndex(), 0) << "deleting the last entry selects entry 0";

    Start();
    EXPECT_EQ(m_bar->GetProfileCount(), 3);
    EXPECT_EQ(m_bar->FindProfileByPath(path), -1);
}

TEST_F(SideBarTest, LanguageChangeRenamesEntriesAndKeepsTheSelection) {
    const std::string system = "IsSysProfile = yes\r\n";
    ClosePackage(SystemPath("x.pf"));
    WritePackage({{"profile/", ""},
                  {"profile/mp3.pf", PfText("MP3 Audio", "mp3", "mp3", kEntries,
                                            system + "name_de = MP3 Deutsch\r\n")},
                  {"profile/ogg.pf", PfText("OGG Vorbis", "ogg", "ogg", kEntries, system)},
                  {"lang/", ""},
                  {"lang/Deutsch.lang", "CODEPAGE=65001\nLANGCODE=de\n#015E# \"Bitrate\"\n"}});
    Start();
    const int mp3 = m_bar->FindProfileByPath(SystemPath("mp3.pf"));
    ASSERT_EQ(mp3, 1);
    m_bar->SelectIndex(mp3, true);
    EXPECT_EQ(StateLine("bitrate").substr(0, 18), "Bit Rate: 128 kb/s");

    ASSERT_TRUE(g_Language.Init(m_base, "Deutsch"));
    m_bar->OnLanguageChanged();
    EXPECT_EQ(StateLine("profile"), "MP3 Deutsch  (*.mp3)");
    EXPECT_EQ(m_bar->GetSelectedIndex(), mp3);
    EXPECT_EQ(StateLine("bitrate").substr(0, 17), "Bitrate: 128 kb/s");
    g_Language.Init(m_base, "English");
}

// The grid's three colours are native numbers in which 255 stands for "not set": a skin that
// sets one gets it byte for byte, one that writes 255 gets the built-in colour.
TEST_F(SideBarTest, GridColoursOfTheSkinAreNativeWith255AsNotSet) {
    std::vector<std::pair<std::string, std::string>> entries{
        {"profile/", ""},
        {"profile/mp3.pf", PfText("MP3 Audio", "mp3", "mp3", kEntries, "IsSysProfile = yes\r\n")},
        {"skin/", ""},
        {"skin/Dark/", ""},
        {"skin/Dark/skin.ini",
         "[Main]\r\nName=Dark\r\n[SideBar]\r\nPropertyBgColor=0x00332211\r\n"
         "GridLineColor=255\r\nCommentBgColor=0x00665544\r\n"},
        {"skin/Plain/", ""},
        {"skin/Plain/skin.ini",
         "[Main]\r\nName=Plain\r\n[SideBar]\r\nPropertyBgColor=255\r\n"
         "GridLineColor=0x00C59C7D\r\n"},
    };
    ClosePackage(SystemPath("x.pf"));
    WritePackage(entries);
    Start();
    PropertiesCtrl* grid = m_bar->Grid();
    m_bar->OnSkinChanged(Logical("Skin\\Dark"));
    EXPECT_EQ(grid->Tree()->RowBackground(), wxColour(0x11, 0x22, 0x33));
    grid->SetGridLineColor(wxColour(125, 156, 197), false);
    const wxColour builtIn = grid->GetGridLineColor();
    m_bar->OnSkinChanged(Logical("Skin\\Dark"));
    EXPECT_EQ(grid->GetGridLineColor(), builtIn) << "255: the built-in line colour";
    m_bar->OnSkinChanged(Logical("Skin\\Plain"));
    EXPECT_EQ(grid->Tree()->RowBackground(), *wxWHITE) << "255: white";
    EXPECT_EQ(grid->GetGridLineColor(), wxColour(0x7D, 0x9C, 0xC5)) << "set: taken exactly";
}

class SideBarSets : public SideBarTest {
protected:
    void SetUp() override {
        SideBarTest::SetUp();
        Start();
        m_first = m_bar->GetProfileAt(0)->CloneProfile();
        m_second = m_bar->GetProfileAt(0)->CloneProfile();
        m_second->SetValue("ab", "64");
        m_hub.selected = {m_first.get(), m_second.get()};
        m_bar->SetSets(m_hub.selected);
    }
    std::unique_ptr<Profile> m_first, m_second;
};

TEST_F(SideBarSets, GridShowsCommonValuesAndAnEditReachesEverySet) {
    EXPECT_NE(StateLine("grid").find("ab:;"), std::string::npos) << StateLine("grid");
    EXPECT_EQ(StateLine("bitrate"), "Bit Rate:  kb/s|1");
    ParameterGrid* grid = m_bar->Grid();
    const PropertyIterator ab = grid->FindById(FindParameterIndex("ab"));
    ASSERT_TRUE(ab.IsValid());
    // Typed into the row's editor in the advanced mode, committed as a loss of focus would.
    wxCommandEvent press(wxEVT_BUTTON, sidebar::kAdvanced);
    m_bar->GetEventHandler()->ProcessEvent(press);
    grid->Select(ab);
    ASSERT_TRUE(grid->CommitEditText("256"));
    EXPECT_EQ(m_first->GetValue("ab"), "256");
    EXPECT_EQ(m_second->GetValue("ab"), "256");
    EXPECT_EQ(m_bar->GetCurrentProfile()->GetValue("ab"), "256");
    EXPECT_GE(m_hub.edits, 1);
    EXPECT_EQ(StateLine("bitrate"), "Bit Rate: 256 kb/s|1");
    EXPECT_NE(StateLine("grid").find("ab:256;"), std::string::npos);

    const PropertyIterator volume = grid->FindById(FindParameterIndex("vol_factor"));
    grid->SetValueText(volume, "150");
    grid->OnPropertyChanged(volume);
    EXPECT_EQ(StateLine("volume"), "Volume: 150|1");
    ASSERT_FALSE(m_hub.volumes.empty());
    EXPECT_EQ(m_hub.volumes.back(), std::make_pair(75, 0));
}

TEST_F(SideBarSets, ASliderTakesEffectOnlyWhenReleased) {
    auto* slider = dynamic_cast<ImTickSlider*>(m_bar->FindWindow(sidebar::kVolumeSlider));
    ASSERT_NE(slider, nullptr);
    // Press and drag onto the sixth tick (150%), then let go.
    const int x = 13 + (slider->GetClientSize().x - 26) * 5 / 7;
    auto send = [&](wxEventType type) {
        wxMouseEvent event(type);
        event.SetEventObject(slider);
        event.SetId(slider->GetId());
        event.m_x = x;
        event.m_y = 10;
        event.m_leftDown = type != wxEVT_LEFT_UP;
        slider->GetEventHandler()->ProcessEvent(event);
    };
    send(wxEVT_LEFT_DOWN);
    send(wxEVT_MOTION);
    EXPECT_EQ(slider->GetPos(), 5);
    EXPECT_EQ(m_first->GetValue("vol_factor"), "100%") << "moving alone changes nothing";
    send(wxEVT_LEFT_UP);
    EXPECT_EQ(m_first->GetValue("vol_factor"), "150%");
    EXPECT_EQ(m_second->GetValue("vol_factor"), "150%");
    EXPECT_EQ(StateLine("volume"), "Volume: 150%|1");
    ASSERT_FALSE(m_hub.volumes.empty());
    EXPECT_EQ(m_hub.volumes.back(), std::make_pair(75, 1));
    EXPECT_NE(StateLine("grid").find("vol_factor:150%;"), std::string::npos);
}

TEST_F(SideBarSets, SelectorFollowsTheRowsCommonProfileAndNoRowsShowTheProfileDisabled) {
    const int wav = m_bar->FindProfileByPath(SystemPath("wav.pf"));
    m_bar->SelectIndex(wav, false);
    EXPECT_TRUE(m_hub.applied.empty()) << "no handler without being asked";
    m_bar->FollowSelection(m_hub.selected);
    EXPECT_EQ(m_bar->GetSelectedIndex(), 0);
    EXPECT_TRUE(m_hub.applied.empty());

    // No row: the grid shows the profile the selector shows, every item disabled.
    m_hub.selected.clear();
    m_bar->SelectIndex(wav, true);
    ParameterGrid* grid = m_bar->Grid();
    EXPECT_EQ(grid->Sets(), std::vector<ParameterSet*>{m_bar->GetProfileAt(wav)});
    const PropertyIterator ab = grid->FindById(FindParameterIndex("ab"));
    ASSERT_TRUE(ab.IsValid());
    EXPECT_FALSE(grid->IsEnabled(ab));
    m_bar->SetCurrentProfile(m_bar->GetProfileAt(0));
    grid->Rebuild();
    EXPECT_EQ(grid->Sets(), std::vector<ParameterSet*>{m_bar->GetProfileAt(0)});
}

TEST_F(SideBarSets, ModesAndTheBitRateOfLosslessFormats) {
    EXPECT_EQ(StateLine("advanced"), "0");
    wxCommandEvent press(wxEVT_BUTTON, sidebar::kAdvanced);
    m_bar->GetEventHandler()->ProcessEvent(press);
    EXPECT_EQ(StateLine("advanced"), "1");
    EXPECT_TRUE(m_bar->Grid()->IsShown());
    EXPECT_FALSE(m_bar->FindWindow(sidebar::kBitRateSlider)->IsShown());

    m_bar->SelectIndex(m_bar->FindProfileByPath(SystemPath("wav.pf")), true);
    m_bar->UpdateWindowUI();
    EXPECT_EQ(StateLine("bitrate").back(), '0') << "wav has no bit rate in the convert mode";
    m_hub.mode = 2;
    m_bar->OnWorkModeChanged(2);
    EXPECT_TRUE(m_bar->FindWindow(sidebar::kAlbum)->IsShown()) << "audio CD: the disc group";
    EXPECT_FALSE(m_bar->FindWindow(sidebar::kSaveProfile)->IsEnabled()) << "nothing to save";
    EXPECT_FALSE(m_bar->Grid()->IsShown());
    m_bar->SelectDiscType(1);
    EXPECT_TRUE(m_bar->Grid()->IsShown()) << "advanced again for an MP3 CD";
    EXPECT_EQ(StateLine("profile"), "MP3 Audio  (*.mp3)");
    m_hub.mode = 0;
    m_bar->OnWorkModeChanged(0);
    EXPECT_TRUE(m_bar->FindWindow(sidebar::kSaveProfile)->IsEnabled());
}

TEST_F(SideBarSets, TheDiscGroupFitsUnderThePlayerAndTheSlidersHoldStillDuringABurn) {
    m_hub.mode = 2;
    m_bar->OnWorkModeChanged(2);
    // The height the bar has under the player in a window of the design size.
    m_bar->SetSize(230, 250);
    const wxRect client(wxPoint(0, 0), m_bar->GetClientSize());
    for (int id : {sidebar::kAlbumLabel, sidebar::kAlbum, sidebar::kIntervalLabel,
                   sidebar::kInterval, sidebar::kBalance}) {
        wxWindow* control = m_bar->FindWindow(id);
        ASSERT_NE(control, nullptr);
        EXPECT_TRUE(control->IsShown()) << id;
        EXPECT_TRUE(client.Contains(control->GetRect())) << id << " lies outside the bar";
    }
    const wxRect album = m_bar->FindWindow(sidebar::kAlbum)->GetRect();
    EXPECT_FALSE(album.Intersects(m_bar->FindWindow(sidebar::kAlbumLabel)->GetRect()));
    // With room to spare the labels stand over their boxes again.
    m_bar->SetSize(230, 600);
    EXPECT_LT(m_bar->FindWindow(sidebar::kAlbumLabel)->GetRect().GetBottom(),
              m_bar->FindWindow(sidebar::kAlbum)->GetRect().GetTop());

    // An MP3 CD shows the disc's name under the profile's controls: at the design height the
    // sliders close up and the labels go beside their boxes, and the name stays in the bar.
    m_bar->SelectDiscType(1);
    m_bar->SetSize(230, 251);
    m_bar->SetSize(230, 250);
    ASSERT_FALSE(m_bar->IsAdvanced());
    const wxRect small(wxPoint(0, 0), m_bar->GetClientSize());
    for (int id : {sidebar::kVolumeNameLabel, sidebar::kVolumeName, sidebar::kChannels,
                   sidebar::kVolumeSlider}) {
        wxWindow* control = m_bar->FindWindow(id);
        EXPECT_TRUE(control->IsShown()) << id;
        EXPECT_TRUE(small.Contains(control->GetRect())) << id << " lies outside the bar";
    }
    EXPECT_FALSE(m_bar->FindWindow(sidebar::kVolumeName)
                     ->GetRect()
                     .Intersects(m_bar->FindWindow(sidebar::kVolumeNameLabel)->GetRect()));
    m_bar->SelectDiscType(0);
    m_bar->SetSize(230, 600);

    m_bar->UpdateWindowUI();
    EXPECT_TRUE(m_bar->FindWindow(sidebar::kSampleRateSlider)->IsEnabled());
    m_hub.burning = true;
    m_bar->UpdateWindowUI();
    for (int id : {sidebar::kSampleRateSlider, sidebar::kVolumeSlider, sidebar::kChannels})
        EXPECT_FALSE(m_bar->FindWindow(id)->IsEnabled()) << id;
    m_hub.mode = 0;
    m_bar->UpdateWindowUI();
    EXPECT_TRUE(m_bar->FindWindow(sidebar::kVolumeSlider)->IsEnabled())
        << "a burn holds only the burn mode's sliders";
}

}  // namespace
}  // namespace ac
