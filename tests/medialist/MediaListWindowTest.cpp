// The conversion list and the output panel on real windows, with a fake main dialog: intake of
// files, folders and cue sheets, the check boxes, the commands' rules, profiles, and the list
// as the driver's thread sees it. Runs under xvfb-run.

#include "../support/QuietHub.h"
#include "../support/WxTestApp.h"
#include "medialist/ui/MediaListWnd.h"
#include "medialist/ui/OutputPanelWnd.h"

#include "convert/RowParameters.h"
#include "profile/ParameterSet.h"
#include "shell/AppConfig.h"
#include "shell/MainHub.h"
#include "resources/Language.h"
#include "skin/ListCtrl.h"
#include "skin/SkinManager.h"
#include "skin/UiQueueWx.h"

#include <wx/dcclient.h>
#include <wx/app.h>
#include <wx/frame.h>
#include <wx/image.h>
#include <wx/init.h>

#include <gtest/gtest.h>

#include <atomic>
#include <chrono>
#include <filesystem>
#include <map>
#include <sstream>
#include <thread>

#include "support/AudioFixtures.h"
#include "support/TempDir.h"

namespace ac {
namespace {

namespace fs = std::filesystem;

class FakeHub : public test::QuietHub {
public:
    void PostCommand(int id) override { posted.push_back(id); }
    bool IsCommandEnabled(int) override { return commandsEnabled; }
    void ShowContextMenu(wxWindow*, int id) override { menus.push_back(id); }
    void OnListSelectionChanged(int row) override { selections.push_back(row); }
    void SetStatusText(const std::string& text) override { statusTexts.push_back(text); }
    void SetBitRateAllowed(bool allowed) override { bitRate.push_back(allowed); }
    void ShowFileInfo(MediaItem* item) override { fileInfo.push_back(item); }

    bool commandsEnabled = true;
    std::vector<int> posted, menus, selections;
    std::vector<std::string> statusTexts;
    std::vector<bool> bitRate;
    std::vector<MediaItem*> fileInfo;
};

std::vector<std::string> Lines(const std::string& text) {
    std::vector<std::string> lines;
    std::istringstream in(text);
    for (std::string line; std::getline(in, line);) lines.push_back(line);
    return lines;
}

// The fields of one row of DescribeRows: name, duration, type, target, status, checked,
// selected, source.
std::vector<std::string> Fields(const std::string& line) {
    std::vector<std::string> fields;
    std::string rest = line.substr(line.find('=') + 1);
    for (int i = 0; i < 7; ++i) {
        const std::size_t bar = rest.find('|');
        fields.push_back(rest.substr(0, bar));
        rest = rest.substr(bar + 1);
    }
    fields.push_back(rest);
    return fields;
}

class MediaListWindowTest : public ::testing::Test {
protected:
    static void SetUpTestSuite() {
        // Settings and the default music folder land in a home of the suite's own.
        static test::TempDir home;
        ::setenv("HOME", home.Path().c_str(), 1);
        ::setenv("XDG_CONFIG_HOME", (home.Path() + "/config").c_str(), 1);
        ::unsetenv("XDG_MUSIC_DIR");
        s_home = home.Path();
        test::StartWx("medialist_window_tests");
        InstallWxUiQueue();
        wxInitAllImageHandlers();  // the skin's buttons are PNG pictures
    }
    static void TearDownTestSuite() { test::StopWx(); }

    void SetUp() override {
        // Panels register with the skin manager for good; each case starts with no listeners.
        g_Skin.Reset();
        SetMainHub(&m_hub);
        m_frame = new wxFrame(nullptr, wxID_ANY, "list", wxDefaultPosition, wxSize(700, 500));
        m_output = new COutputPanelWnd(m_frame);
        m_list = new CMediaListWnd(m_frame);
        m_list->SetSize(0, 0, 640, 380);
        m_output->SetSize(0, 390, 640, 40);
        m_frame->Show();
    }
    void TearDown() override {
        m_frame->Destroy();
        wxTheApp->ProcessPendingEvents();
        g_Skin.Reset();
        SetMainHub(nullptr);
    }

    std::string Wav(const std::string& name, double seconds = 1.0) {
        const std::string path = m_dir.Path() + "/" + name;
        fs::create_directories(fs::path(path).parent_path());
        test::WriteWav(path, test::MakeNoise(static_cast<size_t>(44100 * seconds), 7));
        return path;
    }
    std::vector<std::vector<std::string>> Rows() const {
        std::vector<std::vector<std::string>> rows;
        for (const std::string& line : Lines(m_list->DescribeRows())) rows.push_back(Fields(line));
        return rows;
    }
    static std::unique_ptr<Profile> ShippedProfile(const std::string& name) {
        auto profile = std::make_unique<Profile>(std::string(AC_BIN_DIR) + "\\profile\\" + name);
        EXPECT_TRUE(profile->IsLoaded()) << name << ": build data_pkg first";
        return profile;
    }

    static inline std::string s_home;
    FakeHub m_hub;
    test::TempDir m_dir;
    wxFrame* m_frame = nullptr;
    CMediaListWnd* m_list = nullptr;
    COutputPanelWnd* m_output = nullptr;
};

TEST_F(MediaListWindowTest, FilesMakeRowsWithNameDurationTypeAndStatus) {
    m_list->AddFile(Wav("my.song.wav", 2.0), -1);
    const std::string junk = m_dir.Path() + "/broken.mp3";
    test::WriteFile(junk, std::string(4096, 'x'));
    m_list->AddFile(junk, -1);
    m_list->AddFile(Wav("first.WAV"), 0);
    m_list->AddFile(Wav("last.wav"), 99);

    const auto rows = Rows();
    ASSERT_EQ(rows.size(), 4u);
    EXPECT_EQ(rows[0][0], "first");
    EXPECT_EQ(rows[0][2], "wav") << "the type is shown in lower case";
    EXPECT_EQ(rows[1][0], "my.song");
    EXPECT_EQ(rows[1][1], "00:00:02");
    EXPECT_EQ(rows[1][4], "-");
    EXPECT_EQ(rows[1][5], "1") << "a new row is checked";
    EXPECT_EQ(rows[2][0], "broken");
    EXPECT_EQ(rows[2][4], "Unknown file");
    EXPECT_EQ(m_list->GetItem(2)->Status(), JobStatus::UnknownFile);
    EXPECT_EQ(rows[3][0], "last") << "a position behind the end appends";
    EXPECT_EQ(m_list->GetItem(1)->volume.load(), 50);
    EXPECT_EQ(m_list->List()->GetHeaderCheck(kColCheck), 2) << "every row is checked";
}

TEST_F(MediaListWindowTest, FolderAddsItsOwnMediaFilesOnly) {
    Wav("folder/b.wav");
    Wav("folder/A.WAV");
    Wav("folder/sub/deep.wav");
    test::WriteFile(m_dir.Path() + "/folder/readme.txt", "text");
    fs::create_directories(m_dir.Path() + "/folder/looks.wav");
    m_list->AddFolder(m_dir.Path() + "/folder", -1);
    const auto rows = Rows();
    ASSERT_EQ(rows.size(), 2u);
    EXPECT_EQ(rows[0][0], "A");
    EXPECT_EQ(rows[1][0], "b");

    m_list->AddFolder(m_dir.Path() + "/missing", -1);
    EXPECT_EQ(m_list->GetRowCount(), 2);
    m_list->OnDropFiles({m_dir.Path() + "/folder", m_dir.Path() + "/folder/b.wav",
                         m_dir.Path() + "/gone.wav"});
    EXPECT_EQ(m_list->GetRowCount(), 3) << "only the existing file of the drop is added";
}

TEST_F(MediaListWindowTest, CueSheetExpandsIntoOneRowPerTrack) {
    const std::string sheet = m_dir.Path() + "/three.cue";
    fs::copy_file(AC_CORPUS_DIR "/cue/ffcuesplitter_Three_Samples_ISO-8859-1.cue", sheet);
    Wav("Three Samples.wav", 6.0);
    EXPECT_EQ(m_list->AddFile(sheet, -1), 0);

    // Type and source hold bars of their own here, so whole lines are compared.
    const auto lines = Lines(m_list->DescribeRows());
    ASSERT_EQ(lines.size(), 3u);
    EXPECT_EQ(lines[0], "row=300 Hz, ISO-8859-1|00:00:02|cue|1||-|1|0|" + sheet + "|1");
    EXPECT_EQ(lines[2].substr(lines[2].size() - sheet.size() - 2), sheet + "|3");
    for (int i = 0; i < 3; ++i) {
        EXPECT_EQ(m_list->GetItem(i)->sourcePath, sheet + "|" + std::to_string(i + 1));
        EXPECT_EQ(m_list->GetItem(i)->Status(), JobStatus::Idle) << "probed through its sheet";
    }
    ASSERT_FALSE(m_hub.statusTexts.empty());
    EXPECT_EQ(m_hub.statusTexts.front(), "Add " + sheet + "|1...");
    EXPECT_EQ(m_hub.statusTexts.back(), "Load Finished!");

    test::WriteFile(m_dir.Path() + "/empty.cue", "REM nothing\n");
    EXPECT_EQ(m_list->AddFile(m_dir.Path() + "/empty.cue", -1), -1);
    EXPECT_EQ(m_list->GetRowCount(), 3) << "a sheet without tracks adds nothing";
    EXPECT_EQ(m_hub.statusTexts.back().rfind(m_dir.Path() + "/empty.cue: Parse error on line ", 0), 0u)
        << m_hub.statusTexts.back();
}

TEST_F(MediaListWindowTest, CheckBoxesHeaderAndCommandRules) {
    for (const char* name : {"a.wav", "b.wav", "c.wav"}) m_list->AddFile(Wav(name), -1);
    XListCtrl* list = m_list->List();
    EXPECT_FALSE(m_list->IsCommandEnabled(32782)) << "nothing to check";
    EXPECT_FALSE(m_list->IsCommandEnabled(32772)) << "Remove needs a selection";
    EXPECT_FALSE(m_list->IsCommandEnabled(33045));

    list->ToggleHeaderCheck(kColCheck);
    EXPECT_EQ(list->GetHeaderCheck(kColCheck), 1);
    for (int row = 0; row < 3; ++row) EXPECT_FALSE(m_list->IsChecked(row)) << row;
    list->ToggleHeaderCheck(kColCheck);
    for (int row = 0; row < 3; ++row) EXPECT_TRUE(m_list->IsChecked(row)) << row;

    m_list->SelectOnly(1);
    EXPECT_EQ(m_hub.selections.back(), 1);
    m_list->CheckSelected(false);
    EXPECT_FALSE(m_list->IsChecked(1));
    EXPECT_EQ(list->GetHeaderCheck(kColCheck), 1) << "one row is unchecked";
    EXPECT_TRUE(m_list->IsCommandEnabled(33038));
    EXPECT_FALSE(m_list->IsCommandEnabled(33037));
    m_list->CheckAll(true);
    EXPECT_EQ(list->GetHeaderCheck(kColCheck), 2);
    EXPECT_FALSE(m_list->IsCommandEnabled(32782));

    m_list->GetItem(0)->SetStatus(JobStatus::Running);
    for (int id : {32771, 32772, 32773}) EXPECT_FALSE(m_list->IsCommandEnabled(id)) << id;
    m_list->GetItem(0)->SetStatus(JobStatus::Paused);
    for (int id : {32771, 32772, 32773}) EXPECT_FALSE(m_list->IsCommandEnabled(id)) << id;
    m_list->GetItem(0)->SetStatus(JobStatus::Completed);
    EXPECT_TRUE(m_list->IsCommandEnabled(32772));

    m_list->Remove();
    EXPECT_EQ(m_list->GetRowCount(), 2);
    EXPECT_EQ(Rows()[1][0], "c");
    EXPECT_EQ(m_hub.fileInfo.back(), nullptr);
    m_list->SelectAll(true);
    EXPECT_FALSE(m_list->IsCommandEnabled(33055));
    EXPECT_TRUE(m_list->IsSelected(0) && m_list->IsSelected(1));
    m_list->Clear();
    EXPECT_EQ(m_list->GetRowCount(), 0);
    EXPECT_EQ(list->GetHeaderCheck(kColCheck), 1) << "an empty list unchecks the header";
    EXPECT_FALSE(m_list->IsCommandEnabled(32773));
    EXPECT_EQ(m_list->GetItem(0), nullptr);
}

TEST_F(MediaListWindowTest, HiddenPanelRemembersSelectionFromTheSecondRowOn) {
    for (const char* name : {"a.wav", "b.wav", "c.wav"}) m_list->AddFile(Wav(name), -1);
    m_list->SelectAll(true);
    m_list->OnHidePanel();
    EXPECT_TRUE(m_list->IsSelected(0));
    EXPECT_FALSE(m_list->IsSelected(1));
    EXPECT_EQ(m_list->GetItem(2)->reselect.load(), 1);
    m_list->OnShowPanel();
    EXPECT_TRUE(m_list->IsSelected(1) && m_list->IsSelected(2));
    EXPECT_EQ(m_list->GetItem(2)->reselect.load(), 0);
}

TEST_F(MediaListWindowTest, ProfilesGiveTargetsAndConfigureToAllSpreadsTheFirstRow) {
    auto mp3 = ShippedProfile("mp3.pf");
    auto wav = ShippedProfile("wav.pf");
    m_list->SetCurrentProfile(mp3.get());
    for (const char* name : {"one.wav", "..two..wav", "three.wav"}) m_list->AddFile(Wav(name), -1);
    EXPECT_EQ(Rows()[0][3], "MP3");
    EXPECT_EQ(SetOf(*m_list->GetItem(1))->GetValue("outfilename"), "two.mp3");

    m_list->SelectOnly(0);
    m_list->ApplyProfile(*wav);
    EXPECT_EQ(Rows()[0][3], "WAV");
    EXPECT_EQ(Rows()[1][3], "MP3") << "only selected rows take the profile";
    EXPECT_EQ(SetOf(*m_list->GetItem(0))->GetValue("outfilename"), "one.wav");
    ASSERT_FALSE(m_hub.bitRate.empty());
    EXPECT_FALSE(m_hub.bitRate.back()) << "a WAV target has no bit rate";
    EXPECT_EQ(m_list->GetCurrentProfile(), wav.get());

    m_list->SelectOnly(1);
    m_list->GetItem(1)->volume = 60;
    m_list->EditSets([&] { SetOf(*m_list->GetItem(1))->SetValue("ar", "22050"); });
    m_list->ConfigureToAll();
    for (int row : {0, 2}) {
        ParameterSet* set = SetOf(*m_list->GetItem(row));
        EXPECT_EQ(set->GetExtName(), "mp3") << row;
        EXPECT_EQ(set->GetValue("ar"), "22050") << row;
        EXPECT_EQ(set->GetValue("vol_factor"), "125%") << row;
        EXPECT_EQ(m_list->GetItem(row)->volume.load(), 60) << row;
    }
    EXPECT_EQ(Rows()[0][3], "MP3");
    EXPECT_EQ(SetOf(*m_list->GetItem(0))->GetValue("outfilename"), "one.mp3");
}

TEST_F(MediaListWindowTest, ButtonsAndMouseGoThroughTheHub) {
    m_list->AddFile(Wav("a.wav"), -1);
    for (int id : {1034, 1009, 1012}) {
        wxCommandEvent click(wxEVT_BUTTON, id);
        m_list->FindWindow(id)->GetEventHandler()->ProcessEvent(click);
    }
    wxMouseEvent dclick(wxEVT_LEFT_DCLICK);
    dclick.SetY(300);  // below the last row: an empty part of the list
    m_list->List()->Body()->GetEventHandler()->ProcessEvent(dclick);
    EXPECT_EQ(m_hub.posted, (std::vector<int>{1034, 1009, 1012, 33045}));
    wxMouseEvent right(wxEVT_RIGHT_DOWN);
    m_list->List()->Body()->GetEventHandler()->ProcessEvent(right);
    EXPECT_EQ(m_hub.menus, std::vector<int>{kMediaListContextMenuId});
}

TEST_F(MediaListWindowTest, RunningRowShowsABarAndStoppedRowsTheirText) {
    m_list->AddFile(Wav("a.wav"), -1);
    MediaItem* item = m_list->GetItem(0);
    item->SetStatus(JobStatus::Running);
    m_list->RefreshRow(0);
    EXPECT_EQ(Rows()[0][4], "0%");
    item->SetStatus(JobStatus::Paused);
    m_list->RefreshRow(0);
    EXPECT_EQ(Rows()[0][4], "Pause");
    item->SetStatus(JobStatus::Aborted);
    m_list->RefreshRow(0);
    EXPECT_EQ(Rows()[0][4], "Abort");
    EXPECT_EQ(m_list->List()->Cell(0, kColStatus)->crText, wxColour(128, 0, 0));
    item->SetStatus(JobStatus::Completed);
    m_list->RefreshRow(0);
    EXPECT_EQ(m_list->List()->Cell(0, kColStatus)->crText, wxColour(0, 128, 0));
    m_list->RefreshRow(7);  // out of range: nothing
}

// The driver's side of the list from its own thread while the UI thread adds and removes rows.
TEST_F(MediaListWindowTest, DriverThreadReadsTheListWhileRowsComeAndGo) {
    const std::string file = Wav("a.wav");
    for (int i = 0; i < 4; ++i) m_list->AddFile(file, -1);
    std::atomic<bool> stop{false};
    std::atomic<int> passes{0};
    IMediaList& driverView = *m_list;
    std::thread driver([&] {
        while (!stop) {
            if (!driverView.TryLock()) {
                std::this_thread::yield();
                continue;
            }
            for (int row = 0; row < driverView.GetRowCount(); ++row) {
                MediaItem* item = driverView.GetItem(row);
                if (item == nullptr || !driverView.IsChecked(row)) continue;
                if (item->Status() == JobStatus::Idle) item->SetStatus(JobStatus::Completed);
                (void)item->parameters;
                driverView.IsSelected(row);
                driverView.RefreshRow(row);
                if (row == 1) driverView.SelectOnly(row);
            }
            driverView.Unlock();
            driverView.EnableChecking(passes % 2 == 0);
            EXPECT_FALSE(driverView.GetOutputDirectory().empty());
            ++passes;
            // The driver rests between passes; without a rest it posts faster than any UI
            // thread could redraw.
            std::this_thread::sleep_for(std::chrono::microseconds(300));
        }
    });
    for (int round = 0; round < 60; ++round) {
        m_list->AddFile(file, round % 3 == 0 ? 0 : -1);
        if (round % 2 == 1) {
            m_list->SelectOnly(0);
            m_list->Remove();
        }
        m_list->CheckAll(round % 4 != 0);
        m_list->EditSets([] {});
        wxTheApp->ProcessPendingEvents();
    }
    while (passes < 20) wxTheApp->ProcessPendingEvents();
    stop = true;
    driver.join();
    wxTheApp->ProcessPendingEvents();
    EXPECT_EQ(m_list->GetRowCount(), 34);
    EXPECT_EQ(Rows().size(), 34u);
    m_list->Clear();
    EXPECT_EQ(m_list->GetRowCount(), 0);
}

TEST_F(MediaListWindowTest, SkinnedButtonRowStandsAroundEncode) {
    ASSERT_TRUE(g_Language.Init(AC_BIN_DIR, "English"));
    g_Skin.SetRoot(std::string(AC_BIN_DIR) + "\\Skin");
    ASSERT_TRUE(g_Skin.SetSkin("Default"));
    m_list->AddFile(Wav("a.wav"), -1);
    m_list->SetSize(0, 0, 700, 400);
    std::map<int, wxRect> at;
    for (int id : {1002, 1003, 1004, 1034, 1009, 1012, 1225, 1226, 1001}) {
        wxWindow* child = id == 1001 ? m_list->List() : m_list->FindWindow(id);
        at[id] = child->GetRect();
    }
    ASSERT_GT(at[1034].width, 0);
    const int rowMiddle = (at[1225].GetRight() + 1 + at[1226].x) / 2;
    EXPECT_NEAR(at[1034].x + at[1034].width / 2, rowMiddle + 30, 1);
    EXPECT_EQ(at[1003].x, at[1002].GetRight() + 1 + 25);
    EXPECT_EQ(at[1004].x, at[1003].GetRight() + 1 + 25);
    EXPECT_EQ(at[1034].x, at[1004].GetRight() + 1 + 25);
    EXPECT_EQ(at[1009].x, at[1034].GetRight() + 1 + 25);
    EXPECT_EQ(at[1012].x, at[1009].GetRight() + 1 + 10);
    const int pictureMiddle = at[1225].y + at[1225].height / 2;
    for (int id : {1002, 1034, 1012}) {
        EXPECT_NEAR(at[id].y + at[id].height / 2, pictureMiddle, 1) << id;
    }
    EXPECT_EQ(at[1001].x, 2);
    EXPECT_EQ(at[1001].width, 700 - 4);
    EXPECT_LE(at[1001].GetBottom(), at[1225].y);
    // The name takes what the other columns leave, and they are as wide as their words.
    int others = 0;
    for (int column = 0; column < static_cast<int>(m_list->List()->Columns().size()); ++column) {
        if (column != kColName) {
            others += m_list->List()->Columns()[std::size_t(column)].width;
        }
    }
    EXPECT_EQ(m_list->List()->Columns()[kColName].width, m_list->List()->Body()->GetClientSize().x - others);
    wxClientDC dc(m_list->List()->Body());
    dc.SetFont(m_list->List()->Body()->GetFont());
    EXPECT_GT(m_list->List()->Columns()[kColStatus].width, dc.GetTextExtent("Unknown file").x);
}

// German's words are too long for the row at the design width: Add, Remove and Clear give up
// theirs first (keeping them as tool tips), Encode, Pause and Stop keep theirs, and no button
// runs past the row's ends. English at the same width keeps every word.
TEST_F(MediaListWindowTest, LongWordsLeaveTheRowAsToolTipsNotPastItsEnd) {
    g_Skin.SetRoot(std::string(AC_BIN_DIR) + "\\Skin");
    ASSERT_TRUE(g_Skin.SetSkin("Default"));
    for (const char* language : {"German", "English"}) {
        ASSERT_TRUE(g_Language.Init(AC_BIN_DIR, language));
        m_list->OnLanguageChanged();
        m_list->SetSize(0, 0, 600, 400);
        m_list->SetSize(0, 0, 601, 400);  // a size event for sure
        const int rowLeft = m_list->FindWindow(1225)->GetRect().GetRight();
        const int rowRight = m_list->FindWindow(1226)->GetRect().x;
        int previousRight = rowLeft;
        for (int id : {1002, 1003, 1004, 1034, 1009, 1012}) {
            const wxRect button = m_list->FindWindow(id)->GetRect();
            EXPECT_GT(button.x, previousRight) << language << " " << id;
            previousRight = button.GetRight();
        }
        EXPECT_LT(previousRight, rowRight) << language;
        const bool german = std::string(language) == "German";
        for (int id : {1002, 1003, 1004}) {
            wxWindow* button = m_list->FindWindow(id);
            EXPECT_EQ(button->GetToolTipText(), german ? button->GetLabel() : wxString())
                << language << " " << id;
        }
        for (int id : {1034, 1009, 1012}) {
            EXPECT_EQ(m_list->FindWindow(id)->GetToolTipText(), wxString()) << language << " " << id;
        }
    }
}

TEST_F(MediaListWindowTest, OutputPanelKeepsAFolderPerModeAndTrimsIt) {
    const std::string music = s_home + "/Music";
    EXPECT_TRUE(fs::is_directory(music)) << "the default folder is made at start";
    EXPECT_EQ(m_output->GetOutputDirectory(), GetAppConfig().GetString("OutputDir"));

    m_output->SetMode(0);
    m_output->SetDirectoryText(m_dir.Path() + "/convert//");
    m_output->CommitDirectory();
    EXPECT_EQ(m_output->GetOutputDirectory(), m_dir.Path() + "/convert");
    EXPECT_TRUE(fs::is_directory(m_dir.Path() + "/convert"));
    EXPECT_EQ(m_list->GetOutputDirectory(), m_dir.Path() + "/convert");

    m_output->SetMode(1);
    EXPECT_EQ(m_output->GetOutputDirectory(), GetAppConfig().GetString("OutputCDDir"));
    m_output->SetDirectoryText(m_dir.Path() + "/rip");
    m_output->CommitDirectory();
    m_output->SetRipFolderSource([] { return std::pair<std::string, std::string>("AC/DC", ""); });
    EXPECT_EQ(m_output->FolderToOpen(), m_dir.Path() + "/rip/ACDC");
    m_output->SetRipFolderSource([] { return std::pair<std::string, std::string>(); });
    EXPECT_EQ(m_output->FolderToOpen(), m_dir.Path() + "/rip") << "empty levels add nothing";

    m_output->SetMode(0);
    EXPECT_EQ(m_output->GetOutputDirectory(), m_dir.Path() + "/convert");
    EXPECT_EQ(GetAppConfig().GetInt("last_run_function"), 0);
    m_output->SetDirectoryText("");
    m_output->CommitDirectory();
    EXPECT_EQ(GetAppConfig().GetString("OutputDir"), "") << "an empty box is stored as it is";

    EXPECT_TRUE(m_output->FindWindow(1020)->IsShown());
    m_output->SetMode(2);
    EXPECT_FALSE(m_output->FindWindow(1020)->IsShown());
    EXPECT_TRUE(m_output->FindWindow(1180)->IsShown());
    EXPECT_GT(m_output->GetNeededHeight(), 10);
    EXPECT_EQ(m_output->GetCopies(), 1);
    m_output->SetMode(0);
}

}  // namespace
}  // namespace ac
