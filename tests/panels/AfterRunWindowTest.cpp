// The after-run countdown and the About box on real windows. Power actions go to a dry-run file
// of each test; countdowns that must run out tick every millisecond.

#include "WindowTestSupport.h"
#include "panels/ProgramDialogs.h"
#include "skin/AboutDlg.h"
#include "skin/ShutDownDlg.h"

#include <wx/frame.h>

#include <fstream>
#include <sstream>

namespace ac {
namespace {

template <typename Dialog>
Dialog* FindOpen() {
    for (wxWindow* window : wxTopLevelWindows) {
        if (auto* dialog = dynamic_cast<Dialog*>(window); dialog && dialog->IsModal()) {
            return dialog;
        }
    }
    return nullptr;
}

class AfterRunTest : public ::testing::Test {
protected:
    void SetUp() override {
        ::setenv("AUDIOCONV_POWER_DRYRUN", m_power.c_str(), 1);
        m_frame = new wxFrame(nullptr, wxID_ANY, "main", wxPoint(10, 10), wxSize(300, 200));
        m_frame->Bind(wxEVT_CLOSE_WINDOW, [this](wxCloseEvent& event) {
            ++m_closeRequests;
            event.Veto();
        });
        m_frame->Show();
    }
    void TearDown() override {
        ImShutDownDlg::SetTickPeriodForTests(0);
        ::setenv("AUDIOCONV_POWER_DRYRUN", "/dev/null", 1);
        m_frame->Destroy();
        test::Pump();
    }
    std::string PowerLog() const {
        std::ostringstream out;
        out << std::ifstream(m_power).rdbuf();
        return out.str();
    }
    // Cancels the countdown that the next call opens, after noting what it shows.
    void CancelNextCountdown() {
        m_frame->CallAfter([this] {
            ImShutDownDlg* dialog = FindOpen<ImShutDownDlg>();
            ASSERT_NE(dialog, nullptr);
            m_seen = dialog->Message() + "|" + dialog->TimeLabel() + "|" +
                     dialog->GetTitle().utf8_string() + "|" +
                     dialog->FindWindow(ImShutDownDlg::kTimeId)->GetLabel().utf8_string();
            test::Screenshot(dialog, "countdown");
            wxCommandEvent cancel(wxEVT_BUTTON, ImShutDownDlg::kCancelId);
            dialog->ProcessWindowEvent(cancel);
        });
    }

    test::TempDir m_dir;
    std::string m_power = m_dir / "power.log";
    wxFrame* m_frame = nullptr;
    int m_closeRequests = 0;
    std::string m_seen;
};

TEST_F(AfterRunTest, CountdownShowsTheTextsOfEachActionAndCancelDropsIt) {
    const char* const expected[] = {
        "This system is shutting down. Please save all work in progress and log off. Any "
        "unsaved changes will be lost.|Time before shutdown:|Shut down|00:00:30",
        "This system will be standby. |Time before standby:|Standby|00:00:30",
        "This system will be hibernate. |Time before hibernate:|Hibernate|00:00:30",
        "The program will be exit. |Time before kill me:|Kill me|00:00:30",
    };
    // No tick comes while the test looks: the time shown is the starting one.
    ImShutDownDlg::SetTickPeriodForTests(3600 * 1000);
    for (int action = 0; action <= 3; ++action) {
        m_seen.clear();
        CancelNextCountdown();
        RunAfterRunAction(action, m_frame);
        EXPECT_EQ(m_seen, expected[action]) << "action " << action;
    }
    test::Pump();
    EXPECT_EQ(PowerLog(), "") << "a cancelled countdown acts on nothing";
    EXPECT_EQ(m_closeRequests, 0);
}

TEST_F(AfterRunTest, CountdownThatRunsOutActs) {
    ImShutDownDlg::SetTickPeriodForTests(1);
    const int made = ImShutdownPrivilege::Made();
    RunAfterRunAction(kActionShutDown, m_frame);
    RunAfterRunAction(kActionStandby, m_frame);
    RunAfterRunAction(kActionHibernate, m_frame);
    EXPECT_EQ(PowerLog(), "poweroff\nsuspend\nhibernate\n");
    EXPECT_EQ(ImShutdownPrivilege::Made(), made + 3);
    EXPECT_EQ(ImShutdownPrivilege::Alive(), 0);

    RunAfterRunAction(kActionExit, m_frame);
    EXPECT_EQ(m_closeRequests, 0) << "the close request is posted, not sent";
    ASSERT_TRUE(test::PumpUntil([&] { return m_closeRequests == 1; }));
    EXPECT_EQ(PowerLog(), "poweroff\nsuspend\nhibernate\n");
}

TEST_F(AfterRunTest, NoActionShowsNothingYetTakesThePrivilege) {
    const int made = ImShutdownPrivilege::Made();
    bool loopRan = false;
    m_frame->CallAfter([&loopRan] { loopRan = true; });
    RunAfterRunAction(kActionNone, m_frame);
    EXPECT_FALSE(loopRan) << "no modal countdown ran its event loop";
    EXPECT_EQ(ImShutdownPrivilege::Made(), made + 1);
    EXPECT_EQ(ImShutdownPrivilege::Alive(), 0);
    test::Pump();
    EXPECT_TRUE(loopRan);
    EXPECT_EQ(PowerLog(), "");
}

TEST_F(AfterRunTest, CancelAtTheLastTickWinsAndTheDisplayStepsBySeconds) {
    auto* dialog = new ImShutDownDlg(m_frame);
    dialog->SetShutdownTexts();
    dialog->SetTitle("Standby");
    dialog->InitDialog();
    EXPECT_TRUE(dialog->HasFlag(wxSTAY_ON_TOP));
    EXPECT_EQ(dialog->GetTitle(), "Standby");
    EXPECT_EQ(dialog->TimeText(), "00:00:30");
    dialog->Tick();
    EXPECT_EQ(dialog->TimeText(), "00:00:29") << "the first tick shows 29";
    for (int i = 0; i < 9; ++i) {
        dialog->Tick();
    }
    EXPECT_EQ(dialog->TimeText(), "00:00:29");
    dialog->Tick();
    EXPECT_EQ(dialog->TimeText(), "00:00:28");
    while (dialog->Ticks() > 1) {
        dialog->Tick();
    }
    wxCommandEvent cancel(wxEVT_BUTTON, ImShutDownDlg::kCancelId);
    dialog->ProcessWindowEvent(cancel);
    dialog->Tick();
    EXPECT_EQ(dialog->GetReturnCode(), 2);
    EXPECT_EQ(dialog->Ticks(), 1) << "a tick after the answer changes nothing";
    dialog->Destroy();

    dialog = new ImShutDownDlg(m_frame);
    dialog->InitDialog();
    wxKeyEvent enter(wxEVT_CHAR_HOOK);
    enter.m_keyCode = WXK_RETURN;
    dialog->ProcessWindowEvent(enter);
    EXPECT_NE(dialog->GetReturnCode(), 2) << "Enter counts as OK";
    dialog->Destroy();

    dialog = new ImShutDownDlg(m_frame);
    dialog->InitDialog();
    wxKeyEvent escape(wxEVT_CHAR_HOOK);
    escape.m_keyCode = WXK_ESCAPE;
    dialog->ProcessWindowEvent(escape);
    EXPECT_EQ(dialog->GetReturnCode(), 2);
    dialog->Destroy();
}

TEST(AboutTest, VersionTextFromTheSettingOrTheFileVersion) {
    EXPECT_EQ(AboutVersionText("2.5.1.300", "0.1.0"), "2.5.1  build-300");
    EXPECT_EQ(AboutVersionText("beta", "0.1.0"), "beta");
    EXPECT_EQ(AboutVersionText("", "0.1.0"), "Version. 0.1.0  build-0 ");
    EXPECT_EQ(AboutVersionText("", "1.2.3.70000"), "Version. 1.2.3  build-4464 ")
        << "four 16-bit numbers";
}

TEST(AboutTest, AMissingPictureLeavesTheLinesAtTheFoot) {
    std::string title, version, link;
    bool okShown = true;
    int pictureWidth = 0;
    int plainWidth = 0;
    wxPoint versionAt, linkAt;
    wxTheApp->CallAfter([&] {
        ImAboutDlg* dialog = FindOpen<ImAboutDlg>();
        ASSERT_NE(dialog, nullptr);
        title = dialog->GetTitle().utf8_string();
        version = dialog->FindWindow(ImAboutDlg::kVersionId)->GetLabel().utf8_string();
        link = dialog->FindWindow(ImAboutDlg::kLinkId)->GetLabel().utf8_string();
        okShown = dialog->FindWindow(ImAboutDlg::kOkId)->IsShown();
        pictureWidth = dialog->GetClientSize().x;
        versionAt = dialog->FindWindow(ImAboutDlg::kVersionId)->GetPosition();
        linkAt = dialog->FindWindow(ImAboutDlg::kLinkId)->GetPosition();
        test::Screenshot(dialog, "about_missing_picture");
        dialog->EndModal(1);
    });
    ShowAboutDialog(nullptr, "/nonexistent/help/about.jpg");
    EXPECT_EQ(title, "About Velmorant Audio Converter");
    EXPECT_EQ(version, "Version Version. 0.1.0  build-0 ");
    EXPECT_EQ(link, "Velmorant Corporation");
    EXPECT_FALSE(okShown);
    EXPECT_EQ(versionAt, wxPoint(10, 120));
    EXPECT_EQ(linkAt.x, 10);
    EXPECT_GT(linkAt.y, versionAt.y);

    wxTheApp->CallAfter([&plainWidth] {
        ImAboutDlg* dialog = FindOpen<ImAboutDlg>();
        ASSERT_NE(dialog, nullptr);
        EXPECT_TRUE(dialog->FindWindow(ImAboutDlg::kOkId)->IsShown());
        plainWidth = dialog->GetClientSize().x;
        test::Screenshot(dialog, "about_plain");
        dialog->EndModal(1);
    });
    ShowAboutDialog(nullptr, "");
    EXPECT_EQ(pictureWidth, plainWidth - 8) << "a picture makes the window 8 pixels narrower";
}

}  // namespace
}  // namespace ac
