// The preview panel on a real window with the real library (SDL's dummy sound driver) and files
// made at test time: the rules of the play, stop, previous and next buttons, pause and seek,
// the stops that a lost selection, a change of work mode or a rip ask for, the slider in rip
// mode, and a video's picture on the screen.

#include "WindowTestSupport.h"
#include "panels/PlayerWnd.h"
#include "shell/MainHub.h"

#include "../support/AudioFixtures.h"
#include "../support/DiscImages.h"
#include "../support/QuietHub.h"

#include <wx/frame.h>

#include <chrono>
#include <thread>

namespace ac {
namespace {

using namespace std::chrono_literals;

using ModeHub = test::QuietHub;

// A list with one selected row at most, as the panels' single clicks leave them.
class FakeList : public IPreviewList {
public:
    int RowCount() override { return static_cast<int>(paths.size()); }
    int FirstSelected() override { return selected; }
    void MarkRow(int row, bool select) override {
        if (select && row >= 0 && row < RowCount()) {
            selected = row;
        } else if (!select && row == selected) {
            selected = -1;
        }
    }
    std::string RowPath(int row) override {
        return row >= 0 && row < RowCount() ? paths[std::size_t(row)] : std::string();
    }
    bool CanPlay(int row) override { return row >= 0 && row < RowCount() && playable; }
    double RowSeconds(int) override { return 0; }

    std::vector<std::string> paths;
    int selected = -1;
    bool playable = true;
};

class PlayerWndTest : public ::testing::Test {
protected:
    void SetUp() override {
        SetMainHub(&m_hub);
        m_frame = new wxFrame(nullptr, wxID_ANY, "preview", wxPoint(30, 30), wxSize(230, 300));
        m_panel = new CPlayerWnd(m_frame);
        g_Skin.SetSkin("Default");
        m_panel->SetSize(0, 0, 220, 280);
        m_panel->SetModeList(0, &m_list);
        m_frame->Show();
        test::Pump();
    }
    void TearDown() override {
        if (m_frame != nullptr) {
            m_frame->Destroy();
        }
        test::Pump();
        SetMainHub(nullptr);
        const std::string root = g_Skin.GetRoot();
        g_Skin.Reset();
        g_Skin.SetRoot(root);
    }

    std::string Wav(const std::string& name, double seconds) {
        const std::string path = m_dir / name;
        test::WriteWav(path, test::MakeNoise(static_cast<std::size_t>(seconds * 44100), 7));
        return path;
    }
    // Waits on the event loop, as the user's clicks would, until `done` or about three seconds.
    bool Await(const std::function<bool()>& done) {
        for (int i = 0; i < 300; ++i) {
            m_panel->UpdateCommands();
            if (test::PumpUntil(done, 5)) {
                return true;
            }
            std::this_thread::sleep_for(10ms);
        }
        return done();
    }
    static double Position() { return avp_get_cur_pos(); }

    test::TempDir m_dir;
    ModeHub m_hub;
    FakeList m_list;
    wxFrame* m_frame = nullptr;
    CPlayerWnd* m_panel = nullptr;
};

TEST_F(PlayerWndTest, PlayWithoutSelectionOnlyInitialisesThenPressesPauseAndResume) {
    m_list.paths = {Wav("a.wav", 8)};
    m_panel->UpdateCommands();
    EXPECT_FALSE(m_panel->IsCommandEnabled(CPlayerWnd::kPlayId));
    m_panel->Play();
    EXPECT_TRUE(CPlayerWnd::IsLibraryInitialised());
    EXPECT_FALSE(m_panel->IsPlaying());
    EXPECT_EQ(m_panel->Current(), -1);

    m_list.selected = 0;
    m_panel->UpdateCommands();
    EXPECT_TRUE(m_panel->IsCommandEnabled(CPlayerWnd::kPlayId));
    EXPECT_TRUE(m_panel->OnCommand(CPlayerWnd::kPlayId));
    EXPECT_TRUE(m_panel->IsPlaying());
    ASSERT_TRUE(Await([] { return Position() > 0.3; }));
    ASSERT_TRUE(Await([this] { return m_panel->SliderPosition() > 0; }));

    m_panel->Play();  // second press: pause
    EXPECT_TRUE(m_panel->IsPaused());
    EXPECT_FALSE(m_panel->IsPlaying());
    const double held = Position();
    std::this_thread::sleep_for(300ms);
    test::Pump();
    EXPECT_DOUBLE_EQ(Position(), held);
    EXPECT_NE(m_panel->DescribeState().find("player_state=paused"), std::string::npos);

    m_panel->Play();  // third press: on from the same place
    EXPECT_TRUE(m_panel->IsPlaying());
    ASSERT_TRUE(Await([held] { return Position() > held + 0.1; }));
    EXPECT_LT(Position(), held + 1.0);
}

TEST_F(PlayerWndTest, SliderMovesAPausedFileWithoutResumingAndStopWaitsForResume) {
    m_list.paths = {Wav("b.wav", 10)};
    m_list.selected = 0;
    m_panel->Play();
    ASSERT_TRUE(Await([] { return Position() > 0.1; }));
    m_panel->Play();
    m_panel->UpdateCommands();
    EXPECT_TRUE(m_panel->IsCommandEnabled(CPlayerWnd::kSliderId));
    EXPECT_FALSE(m_panel->IsCommandEnabled(CPlayerWnd::kStopId));
    m_panel->SeekTo(6500);
    EXPECT_NEAR(Position(), 6.5, 0.001);
    EXPECT_EQ(m_panel->SliderToolTip(), "00:00:06");
    std::this_thread::sleep_for(200ms);
    EXPECT_NEAR(Position(), 6.5, 0.001);
    EXPECT_TRUE(m_panel->IsPaused());

    // Stop has no effect on a paused player; a lost selection ends it.
    m_panel->Stop();
    EXPECT_TRUE(m_panel->IsPaused());
    m_list.selected = -1;
    m_panel->UpdateCommands();
    EXPECT_FALSE(m_panel->IsPaused());
    EXPECT_FALSE(m_panel->IsPlaying());
    EXPECT_TRUE(Await([] { return !player::IsRunning(); }));
    EXPECT_EQ(m_panel->SliderPosition(), 0);
}

TEST_F(PlayerWndTest, ChangingTheWorkModeStopsAndRipModeKeepsTheSliderStill) {
    const test::DiscImage image =
        test::WriteDiscImage(m_dir.Path(), "disc", {{.frames = 44100 * 4, .seed = 2}});
    FakeList tracks;
    tracks.paths = {image.cuePath + "/Track01.cda"};
    tracks.selected = 0;
    m_panel->SetModeList(1, &tracks);
    m_list.paths = {Wav("c.wav", 6)};
    m_list.selected = 0;
    m_panel->Play();
    ASSERT_TRUE(Await([] { return Position() > 0.1; }));
    m_hub.mode = 1;
    m_panel->UpdateCommands();
    EXPECT_FALSE(m_panel->IsPlaying());
    ASSERT_TRUE(Await([] { return !player::IsRunning(); }));

    m_panel->Play();
    EXPECT_TRUE(m_panel->IsPlaying());
    ASSERT_TRUE(Await([] { return Position() > 0.1; }));
    m_panel->OnPlayerTimer();
    m_panel->UpdateCommands();
    EXPECT_FALSE(m_panel->IsCommandEnabled(CPlayerWnd::kSliderId));
    // A rip that starts takes the drive from the preview.
    tracks.playable = false;
    m_panel->UpdateCommands();
    EXPECT_FALSE(m_panel->IsPlaying());
    EXPECT_FALSE(m_panel->IsCommandEnabled(CPlayerWnd::kPlayId));
}

TEST_F(PlayerWndTest, PreviousAndNextMoveTheSelectionAndAPausedFileResumes) {
    m_list.paths = {Wav("r0.wav", 6), Wav("r1.wav", 6), Wav("r2.wav", 6)};
    m_list.selected = 1;
    m_panel->Play();
    ASSERT_TRUE(Await([] { return Position() > 0.2; }));
    m_panel->UpdateCommands();
    EXPECT_TRUE(m_panel->IsCommandEnabled(CPlayerWnd::kPreviousId));
    EXPECT_TRUE(m_panel->IsCommandEnabled(CPlayerWnd::kNextId));

    m_panel->Next();  // playing: stops and starts the next row from its start
    EXPECT_EQ(m_list.selected, 2);
    EXPECT_EQ(m_panel->Current(), 2);
    EXPECT_TRUE(m_panel->IsPlaying());
    EXPECT_LT(Position(), 0.2);
    m_panel->UpdateCommands();
    EXPECT_FALSE(m_panel->IsCommandEnabled(CPlayerWnd::kNextId));

    ASSERT_TRUE(Await([] { return Position() > 0.3; }));
    m_panel->Play();  // pause
    const double held = Position();
    m_panel->Previous();  // the selection moves; the press resumes the paused file
    EXPECT_EQ(m_list.selected, 1);
    EXPECT_TRUE(m_panel->IsPlaying());
    EXPECT_GE(Position(), held);
    EXPECT_TRUE(m_panel->OnCommand(CPlayerWnd::kStopId));
    EXPECT_FALSE(m_panel->IsPlaying());
    EXPECT_EQ(m_panel->Current(), -1);
}

TEST_F(PlayerWndTest, UnreadableRowStaysSilentlyIdle) {
    test::WriteFile(m_dir / "bad.mp3", "not a sound file at all");
    m_list.paths = {m_dir / "bad.mp3"};
    m_list.selected = 0;
    m_panel->Play();
    EXPECT_FALSE(m_panel->IsPlaying());
    EXPECT_FALSE(m_panel->IsPaused());
    EXPECT_NE(m_panel->DescribeState().find("player_state=stopped"), std::string::npos);
}

TEST_F(PlayerWndTest, PositionPastTheSliderEndStopsPlayback) {
    // A VBR MP3 without its Xing frame: the length is guessed from the loud first frames and
    // falls short of the real file, so the position runs past the slider's end.
    const std::string path = m_dir / "vbr.mp3";
    ASSERT_TRUE(
        test::RunFfmpeg("-f lavfi -i anoisesrc=d=1:a=0.9 -f lavfi -i anullsrc=d=3 "
                        "-filter_complex concat=n=2:v=0:a=1 -c:a libmp3lame -q:a 0 "
                        "-write_xing 0 '" +
                        path + "'"));
    m_list.paths = {path};
    m_list.selected = 0;
    m_panel->Play();
    ASSERT_TRUE(m_panel->IsPlaying());
    const double length = avp_get_length();
    if (length > 3.5) {
        GTEST_SKIP() << "this ffmpeg wrote a length of " << length << " s";
    }
    // Timer 124 sees the position pass the end and stops, though the file goes on.
    ASSERT_TRUE(Await([this] { return !m_panel->IsPlaying(); }));
    EXPECT_GT(Position(), length);
    EXPECT_LT(Position(), 3.8);
    EXPECT_EQ(m_panel->SliderPosition(), 0);
}

TEST_F(PlayerWndTest, VideoPictureIsPaintedIntoTheVideoArea) {
    // Red on the left half, blue on the right: a 4:3 picture in a wider area, with bars.
    const std::string path = m_dir / "pattern.mkv";
    ASSERT_TRUE(test::RunFfmpeg(
        "-f lavfi -i color=c=red:s=320x240:r=25:d=4 -f lavfi -i sine=d=4 -vf "
        "drawbox=x=160:y=0:w=160:h=240:color=blue:t=fill -c:v mpeg4 -q:v 2 -c:a flac '" +
        path + "'"));
    m_list.paths = {path};
    m_list.selected = 0;
    m_panel->Play();
    ASSERT_TRUE(Await([this] { return m_panel->VideoArea()->HasPicture(); }));
    test::Screenshot(m_frame, "player_video");
    CVideoArea* area = m_panel->VideoArea();
    area->Refresh();
    area->Update();
    test::Pump(50);
    const wxRect rect = area->GetScreenRect();
    const std::string shot = m_dir / "area.png";
    const std::string command = "import -window root -crop " + std::to_string(rect.width) + "x" +
                                std::to_string(rect.height) + "+" + std::to_string(rect.x) + "+" +
                                std::to_string(rect.y) + " +repage '" + shot + "'";
    ASSERT_EQ(std::system(command.c_str()), 0);
    wxImage image(wxString::FromUTF8(shot), wxBITMAP_TYPE_PNG);
    ASSERT_TRUE(image.IsOk());
    const int w = image.GetWidth();
    const int h = image.GetHeight();
    auto at = [&](int x, int y) {
        return std::array<int, 3>{image.GetRed(x, y), image.GetGreen(x, y), image.GetBlue(x, y)};
    };
    const auto left = at(w / 4, h / 2);
    const auto right = at(3 * w / 4, h / 2);
    EXPECT_GT(left[0], 200);
    EXPECT_LT(left[2], 60);
    EXPECT_GT(right[2], 200);
    EXPECT_LT(right[0], 60);
    // Bars above and below keep the picture's shape.
    const auto top = at(w / 2, 2);
    EXPECT_LT(top[0] + top[1] + top[2], 30);
    m_panel->Stop();
    EXPECT_FALSE(area->HasPicture());
}

}  // namespace
}  // namespace ac
