// The file information window on a real display: hidden at first with the empty page, a row
// only stored while hidden and written when shown, the selection followed while shown, the
// close button, the skins' background colour, tags shown as text, and no address outside the
// local page opened.

#include "WindowTestSupport.h"
#include "panels/FileInfoPage.h"
#include "panels/FileInfoWnd.h"
#include "platform/Paths.h"

#include "../support/AudioFixtures.h"

#include <wx/frame.h>
#include <wx/html/htmlwin.h>

namespace ac {
namespace {

MediaFileInfo Song(const std::string& title) {
    MediaFileInfo info;
    info.path = "/music/" + title + ".mp3";
    info.minutes = 3;
    info.seconds = 25;
    info.bitRate = 192000;
    info.title = title;
    info.comment = "<script>alert(1)</script><img src=\"http://example.com/x.png\">";
    info.audioStreams.push_back({"mp3", 2, 192000, 44100});
    return info;
}

class FileInfoWndTest : public ::testing::Test {
protected:
    void SetUp() override {
        m_main = new wxFrame(nullptr, wxID_ANY, "main", wxPoint(10, 10), wxSize(840, 634));
        m_main->Show();
        m_window = new CFileInfoWnd(m_main);
        g_Skin.SetSkin("Default");
        test::Pump();
    }
    void TearDown() override {
        m_main->Destroy();
        test::Pump();
        const std::string root = g_Skin.GetRoot();
        g_Skin.Reset();
        g_Skin.SetRoot(root);
    }
    std::string PageFile() const { return test::ReadFile(m_window->PagePath()); }
    std::string Shown() const { return m_window->Browser()->ToText().utf8_string(); }

    wxFrame* m_main = nullptr;
    CFileInfoWnd* m_window = nullptr;
};

TEST_F(FileInfoWndTest, HiddenWindowStoresTheRowAndShowingWritesItsPage) {
    EXPECT_EQ(g_FileInfoWnd, m_window);
    EXPECT_FALSE(m_window->IsShown());
    EXPECT_EQ(m_window->PagePath(), platform::UserDataDirectory() + "/help/tempfile.htm");
    EXPECT_EQ(PageFile(), "<body bgcolor='#F3F6FA'></body>");
    EXPECT_EQ(m_window->GetSize(), wxSize(300, 400));

    const MediaFileInfo first = Song("First");
    m_window->SetItem(&first);
    EXPECT_FALSE(m_window->IsShown());
    EXPECT_EQ(PageFile(), "<body bgcolor='#F3F6FA'></body>");

    m_window->ShowInfo(true);
    test::Pump();
    EXPECT_TRUE(m_window->IsShown());
    // The Default skin's BodyBgColor.
    EXPECT_EQ(PageFile(), BuildFileInfoPage(&first, "#FFFFFF", [](std::uint32_t id) {
                  return g_Language.GetString(id);
              }));
    EXPECT_NE(Shown().find("First"), std::string::npos);
    // Markup from a tag is text on the page, not markup.
    EXPECT_NE(Shown().find("<script>alert(1)</script><img src="), std::string::npos) << Shown();
    test::Screenshot(m_window, "fileinfo_default");

    // While shown the window follows the selection; without a row it shows the empty page.
    const MediaFileInfo second = Song("Second");
    m_window->SetItem(&second);
    EXPECT_NE(PageFile().find("Second</font></b></p>"), std::string::npos);
    m_window->SetItem(nullptr);
    EXPECT_EQ(PageFile(), "<body bgcolor='#FFFFFF'></body>");

    // The close button hides; nothing is destroyed and the page stays on disk.
    wxCommandEvent close(wxEVT_BUTTON, CFileInfoWnd::kCloseId);
    m_window->FindWindow(CFileInfoWnd::kCloseId)->GetEventHandler()->ProcessEvent(close);
    EXPECT_FALSE(m_window->IsShown());
    m_window->SetItem(&first);
    EXPECT_EQ(PageFile(), "<body bgcolor='#FFFFFF'></body>");
    m_window->ShowInfo(true);
    EXPECT_NE(PageFile().find("First</font></b></p>"), std::string::npos);
    m_window->ShowInfo(false);
    EXPECT_FALSE(m_window->IsShown());
}

TEST_F(FileInfoWndTest, SkinChangeRecoloursThePage) {
    const MediaFileInfo song = Song("Night");
    m_window->SetItem(&song);
    m_window->ShowInfo(true);
    g_Skin.SetSkin("Midnight");
    test::Pump();
    EXPECT_EQ(m_window->BackgroundColour(), "#E3E6EB");
    EXPECT_EQ(PageFile().rfind("<body bgcolor='#E3E6EB'>", 0), 0u);
    test::Screenshot(m_window, "fileinfo_midnight");
}

TEST_F(FileInfoWndTest, NothingButTheLocalPageIsOpened) {
    wxHtmlWindow* browser = m_window->Browser();
    EXPECT_EQ(browser->OnOpeningURL(wxHTML_URL_IMAGE, "http://example.com/x.png", nullptr),
              wxHTML_BLOCK);
    EXPECT_EQ(browser->OnOpeningURL(wxHTML_URL_PAGE, "https://example.com/", nullptr),
              wxHTML_BLOCK);
    EXPECT_EQ(browser->OnOpeningURL(wxHTML_URL_PAGE, "ftp://example.com/", nullptr), wxHTML_BLOCK);
    EXPECT_EQ(browser->OnOpeningURL(wxHTML_URL_PAGE, "file:" + m_window->PagePath(), nullptr),
              wxHTML_OPEN);
}

}  // namespace
}  // namespace ac
