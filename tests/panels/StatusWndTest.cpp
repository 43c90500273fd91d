// The status panel on a real window: the log written from reader threads, the log window that
// keeps its text, timer 102 against a fake hub, the scales of the work modes; and the window of
// refused files.

#include "WindowTestSupport.h"
#include "panels/FileAddErrorWnd.h"
#include "panels/LogWnd.h"
#include "panels/RichEdit.h"
#include "panels/StatusWnd.h"
#include "shell/AppConfig.h"
#include "shell/MainHub.h"

#include "../support/QuietHub.h"

#include <wx/frame.h>
#include <wx/textctrl.h>

#include <thread>

namespace ac {
namespace {

class FakeHub : public test::QuietHub {
public:
    bool IsConvertRunActive() override { return running; }
    double RunDoneSeconds() override { return done; }
    double RunTotalSeconds() override { return total; }
    std::string RunProgressText() override { return progressText; }

    bool running = false;
    double done = 0;
    double total = 0;
    std::string progressText;
};

class StatusWndTest : public ::testing::Test {
protected:
    void SetUp() override {
        m_frame = new wxFrame(nullptr, wxID_ANY, "status", wxPoint(20, 20), wxSize(620, 120));
        m_panel = new CStatusWnd(m_frame);
        g_Skin.SetSkin("Default");
        m_frame->Show();
        m_panel->SetSize(0, 0, 600, m_panel->GetNeededHeight());
        test::Pump();
    }
    void TearDown() override {
        SetMainHub(nullptr);
        if (m_frame != nullptr) {
            m_frame->Destroy();
        }
        test::Pump();
        // The panel goes with the frame; the catalogue must not call a dead listener.
        const std::string root = g_Skin.GetRoot();
        g_Skin.Reset();
        g_Skin.SetRoot(root);
    }
    std::string State() const { return m_panel->DescribeState(); }

    wxFrame* m_frame = nullptr;
    CStatusWnd* m_panel = nullptr;
};

TEST_F(StatusWndTest, LinesFromAReaderThreadArriveInOrderInTheirColours) {
    EXPECT_EQ(g_StatusWnd, m_panel);
    std::thread reader(
        [panel = static_cast<IProcessLog*>(m_panel), status = static_cast<IStatusText*>(m_panel)] {
            panel->Clear();
            for (int i = 0; i < 40; ++i) {
                panel->Append("line " + std::to_string(i) + "\n", LogLineKind::Normal);
            }
            panel->Append("|Error>>> broken\n", LogLineKind::Error);
            panel->Append("|Warning>>> odd\n", LogLineKind::Warning);
            panel->Append("", LogLineKind::Error);
            status->SetStatusText("Encoding song.flac");
        });
    reader.join();
    ASSERT_TRUE(test::PumpUntil([&] { return State().find("odd") != std::string::npos; }));
    const std::string state = State();
    EXPECT_NE(state.find("statustext=Encoding song.flac\n"), std::string::npos) << state;
    EXPECT_NE(state.find("log=line 0|line 1|line 2|"), std::string::npos) << state;
    EXPECT_NE(state.find("line 39||Error>>> broken||Warning>>> odd|\n"), std::string::npos)
        << state;

    wxTextCtrl* log = m_panel->GetLogControl();
    ASSERT_NE(log, nullptr);
    const long errorAt = log->GetValue().Find("broken");
    const long warningAt = log->GetValue().Find("odd");
    wxTextAttr error, warning, normal;
    ASSERT_TRUE(log->GetStyle(errorAt, error));
    ASSERT_TRUE(log->GetStyle(warningAt, warning));
    ASSERT_TRUE(log->GetStyle(1, normal));
    EXPECT_EQ(error.GetTextColour(), wxColour(0xFF, 0, 0));
    EXPECT_NE(warning.GetTextColour(), error.GetTextColour());
    EXPECT_NE(warning.GetTextColour(), normal.GetTextColour());
    EXPECT_EQ(normal.GetTextColour(), wxColour(0, 0, 0));
    EXPECT_EQ(log->GetInsertionPoint(), log->GetLastPosition()) << "the caret ends at the end";
    test::Screenshot(m_frame, "status_panel");
}

TEST_F(StatusWndTest, PostsForAPanelThatIsGoneAreDropped) {
    std::thread reader([panel = static_cast<IProcessLog*>(m_panel)] {
        for (int i = 0; i < 20; ++i) {
            panel->Append("late\n", LogLineKind::Error);
        }
    });
    reader.join();
    m_frame->Destroy();
    m_frame = nullptr;
    test::Pump(50);
    EXPECT_EQ(g_StatusWnd, nullptr);
}

TEST_F(StatusWndTest, LogTextStaysWhenTheLogWindowIsClosedAndOpenedAgain) {
    EXPECT_EQ(m_panel->FindWindow(CStatusWnd::kRichEditId), nullptr)
        << "the log is made when it is first needed, not with the panel";
    m_panel->ClearLog();
    EXPECT_EQ(m_panel->FindWindow(CStatusWnd::kRichEditId), nullptr);
    wxTextCtrl* control = m_panel->GetLogControl();
    ASSERT_NE(control, nullptr);
    EXPECT_EQ(control->GetParent(), m_panel);
    EXPECT_FALSE(control->IsShown()) << "the rich edit starts hidden in the panel";
    m_panel->Append("first\n", LogLineKind::Warning);
    ASSERT_TRUE(test::PumpUntil([&] { return !control->IsEmpty(); }));

    // The button has no words of its own; its tip says what it opens, in the language.
    wxWindow* button = m_panel->FindWindow(CStatusWnd::kLogButtonId);
    ASSERT_NE(button, nullptr);
    EXPECT_EQ(button->GetToolTipText(), "Errors and warnings of the selected file");

    wxCommandEvent click(wxEVT_BUTTON, CStatusWnd::kLogButtonId);
    m_panel->ProcessWindowEvent(click);
    CLogWnd* window = m_panel->LogWindow();
    EXPECT_TRUE(window->IsShown());
    EXPECT_EQ(control->GetParent(), window);
    EXPECT_EQ(window->ContentParent(), m_panel);
    EXPECT_EQ(m_panel->GetLogControl(), control) << "found in the log window now";
    test::Pump();
    EXPECT_EQ(control->GetSize(), window->GetClientSize()) << "the text fills the window";
    test::Screenshot(window, "log_window");

    window->Close();
    test::Pump();
    EXPECT_FALSE(window->IsShown());
    m_panel->Append("second\n", LogLineKind::Normal);
    ASSERT_TRUE(test::PumpUntil([&] { return control->GetValue().Contains("second"); }));
    m_panel->ShowLog();
    EXPECT_TRUE(window->IsShown());
    EXPECT_EQ(control->GetParent(), window);
    EXPECT_EQ(RichEditText(*control), "first\nsecond\n");
    m_panel->ClearLog();
    EXPECT_TRUE(control->IsEmpty());
}

TEST_F(StatusWndTest, TimerFollowsTheConvertRunOfTheHub) {
    CapacityBar* bar = m_panel->Bar();
    bar->SetPosition(40);
    m_panel->OnStatusTimer();
    EXPECT_EQ(bar->Position(), 40) << "without the main dialog nothing happens";

    FakeHub hub;
    SetMainHub(&hub);
    hub.running = true;
    hub.done = 30;
    hub.total = 120;
    hub.progressText = "3 of 40 files converted";
    bar->SetText("Done.");
    m_panel->OnStatusTimer();
    EXPECT_EQ(bar->Position(), 25);
    EXPECT_EQ(bar->Text(), "3 of 40 files converted") << "a run's words, not a tool's last line";
    test::Screenshot(m_frame, "status_panel_convert");

    hub.total = 0.05;
    m_panel->OnStatusTimer();
    EXPECT_EQ(bar->Position(), 0) << "a total below 0.1 keeps the bar at 0";

    hub.running = false;
    hub.total = 120;
    bar->SetText("Finished: 38 completed, 2 failed");
    m_panel->OnStatusTimer();
    EXPECT_EQ(bar->Position(), 0);
    EXPECT_EQ(bar->Text(), "Finished: 38 completed, 2 failed") << "the tally stays after the run";

    hub.mode = 2;
    bar->SetPosition(77);
    m_panel->OnStatusTimer();
    EXPECT_EQ(bar->Position(), 77) << "the creator panel moves the gauge itself";
}

TEST_F(StatusWndTest, WorkModesSetTheirScales) {
    CapacityBar* bar = m_panel->Bar();
    m_panel->OnModeChanged(2);
    CapacityBarState state = bar->State();
    EXPECT_EQ(state.nearMark, 75);
    EXPECT_EQ(state.overMark, 80);
    EXPECT_EQ(state.maxMark, 90);
    EXPECT_EQ(bar->TickStep(), 10);
    EXPECT_EQ(bar->UnitText(), "Minute");
    bar->SetPosition(85);
    test::Screenshot(m_frame, "status_panel_disc");

    m_panel->OnModeChanged(0);
    state = bar->State();
    EXPECT_FALSE(HasCapacityMarks(state)) << "a plain bar after a creator run";
    EXPECT_EQ(state.high, 100);
    EXPECT_TRUE(CapacityBarScale(state, bar->TickStep()).empty());
}

TEST_F(StatusWndTest, APanelStartedInTheCreatorModeShowsTheDiscScale) {
    GetAppConfig().SetInt("last_run_function", 2);
    auto* creator = new CStatusWnd(m_frame);
    GetAppConfig().SetInt("last_run_function", 0);
    EXPECT_EQ(creator->Bar()->State().maxMark, 90);
    EXPECT_EQ(creator->Bar()->UnitText(), "Minute");
    EXPECT_EQ(g_StatusWnd, creator) << "the newest panel is the one published";
    creator->Destroy();
    EXPECT_FALSE(HasCapacityMarks(m_panel->Bar()->State()));
}

TEST_F(StatusWndTest, NeededHeightIsTheGapsAndTheTallerControl) {
    // The Default skin: gaps of 8, a bar of 14 and a button cell of 24.
    EXPECT_EQ(m_panel->GetNeededHeight(), 8 + 8 + 24);
    EXPECT_EQ(m_panel->Bar()->PictureHeight(), 14);
    EXPECT_EQ(m_panel->Bar()->GetSize().y, 24) << "bar and button share the strip's height";
    EXPECT_GT(m_panel->Bar()->GetSize().x, 400) << "the bar takes what the button leaves";
}

TEST(FileAddErrorWndTest, BlocksOfRefusedFilesStayUntilCleared) {
    auto* window = new CFileAddErrorWnd();
    EXPECT_FALSE(window->IsShown());
    window->AddRefusedFile("/music/album/song.flac", CFileAddErrorWnd::Reason::AlreadyAdded);
    EXPECT_TRUE(window->IsShown());
    EXPECT_EQ(window->GetTitle(), "Message");
    window->AddRefusedFile("/video/clip.backup", CFileAddErrorWnd::Reason::Unreadable);
    EXPECT_EQ(RichEditText(*window->RichEdit()),
              "The file has been added.\n\tFile name:song\n\tFile path:/music/album/song.flac\n"
              "\nThe file is a  invalid file. Please try to use \"Add DirectShow\" from file "
              "menu.\n\tFile name:clip.backup\n\tFile path:/video/clip.backup\n");
    wxTextAttr name;
    ASSERT_TRUE(window->RichEdit()->GetStyle(window->RichEdit()->GetValue().Find("song"), name));
    EXPECT_EQ(name.GetTextColour(), wxColour(0xFF, 0, 0));
    test::Screenshot(window, "file_add_error");

    wxCommandEvent close(wxEVT_BUTTON, CFileAddErrorWnd::kCloseId);
    window->ProcessWindowEvent(close);
    EXPECT_FALSE(window->IsShown());
    EXPECT_FALSE(window->RichEdit()->IsEmpty()) << "closing only hides";
    wxCommandEvent clear(wxEVT_BUTTON, CFileAddErrorWnd::kClearId);
    window->ProcessWindowEvent(clear);
    EXPECT_TRUE(window->RichEdit()->IsEmpty());
    window->Destroy();
    test::Pump();
}

// wx starts once for the whole executable.
[[maybe_unused]] ::testing::Environment* const g_wx =
    ::testing::AddGlobalTestEnvironment(new test::WxEnvironment);

}  // namespace
}  // namespace ac
