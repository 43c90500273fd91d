#pragma once
// CPlayerWnd: the preview panel in the side bar's column. It plays the selected row of the
// active work mode's list through the preview library (panels/Player.h): a video area that
// paints the library's pictures, a position slider in milliseconds with a time tool tip, and
// the buttons previous, play/pause, stop and next.
//
// The lists reach the panel through IPreviewList, one for each work mode, handed in by the
// main dialog: the panel knows no list panel, and a mode without a list plays nothing.
//
// Thread contract: UI thread only, but for the worker that runs avp_run (it writes the two
// flags and posts to the UI thread) and the library's picture callback (it stores the picture
// under a lock and posts a repaint).

#include "panels/Player.h"
#include "skin/SkinDialog.h"

#include <wx/timer.h>

#include <array>
#include <atomic>
#include <memory>
#include <mutex>
#include <string>
#include <thread>

namespace ac {

class ImButton;
class ImPicture;
class ImSlider;

// What the preview needs of one work mode's list.
class IPreviewList {
public:
    virtual ~IPreviewList() = default;
    virtual int RowCount() = 0;
    // The first selected row, or -1.
    virtual int FirstSelected() = 0;
    // Selects or deselects one row, as a click would, so the panels that follow the selection
    // hear of it.
    virtual void MarkRow(int row, bool selected) = 0;
    // What the player opens for the row: a file, or DRIVE/TrackNN.cda.
    virtual std::string RowPath(int row) = 0;
    // The play command's rule for a selected row: the convert and burn lists refuse a row of
    // an unknown file, the rip list any row while a rip runs.
    virtual bool CanPlay(int row) = 0;
    // The row's duration in seconds, 0 when unknown: the total the slider's text shows.
    virtual double RowSeconds(int row) = 0;
};

// The video area, control 1039: the newest picture, scaled to fit with its aspect ratio kept,
// or the skin's idle picture.
class CVideoArea : public wxWindow {
public:
    CVideoArea(wxWindow* parent, int id);
    void SetIdlePicture(SkinPicture picture);
    void SetPicture(const player::Picture& picture);
    void ClearPicture();
    bool HasPicture() const { return m_image.IsOk(); }
    // The colour at a point of the shown picture's own pixels, for the tests.
    const wxImage& Image() const { return m_image; }

private:
    void OnPaint(wxPaintEvent& event);
    SkinPicture m_idle;
    wxImage m_image;
    wxBitmap m_scaled;
};

class CPlayerWnd : public ImSkinPanel {
public:
    static constexpr int kPanelId = 1008;
    static constexpr int kDialogId = 135;
    static constexpr int kPlayId = 1006;
    static constexpr int kUnusedPauseId = 1009;
    static constexpr int kStopId = 1012;
    static constexpr int kNextId = 1014;
    static constexpr int kPreviousId = 1015;
    static constexpr int kVideoId = 1039;
    static constexpr int kSliderId = 1040;
    static constexpr int kLeftPictureId = 1045;
    static constexpr int kRightPictureId = 1046;
    static constexpr int kTimerId = 124;

    explicit CPlayerWnd(wxWindow* parent);
    ~CPlayerWnd() override;

    // The list of a work mode (0 convert, 1 rip, 2 burn); null: the mode has none yet.
    void SetModeList(int mode, IPreviewList* list);

    // The panel's commands: 1006 play/pause, 1012 stop, 1014 next, 1015 previous. False for
    // any other id.
    bool OnCommand(int commandId);
    void Play();
    // Does nothing while paused, as the stop button is disabled then.
    void Stop();
    void Next();
    void Previous();
    // The total the slider's text shows, seconds; the selected row's duration, or 0.
    void SetDuration(double seconds);
    // The enable rules of the buttons and the slider, and the stop that a lost selection or a
    // change of work mode asks for; run while idle.
    void UpdateCommands();
    // One tick of timer 124.
    void OnPlayerTimer();
    // The slider moved to `milliseconds` by the user.
    void SeekTo(int milliseconds);

    bool IsPlaying() const { return m_bPlaying.load() != 0; }
    bool IsPaused() const { return m_bPaused.load() != 0; }
    int Current() const { return m_nCurrent; }
    bool IsCommandEnabled(int commandId) const;
    // False until the first press of play has initialised the library.
    static bool IsLibraryInitialised();
    int SliderPosition() const;
    std::string SliderToolTip() const;
    CVideoArea* VideoArea() const { return m_video; }
    // "player_state=stopped|playing|paused", "player_pos_ms=N", "player_row=N", one a line.
    std::string DescribeState() const;

    void OnLanguageChanged() override;
    void DoRecalcLayout() override;
    bool OnSkinChanged(const std::string& skinDir) override;

private:
    void CreateControls();
    void StartRow();
    // Stop also from pause: a lost selection and a change of work mode end any playback.
    void EndPlayback();
    void SetPlayFace(bool pauseFace);
    void SetSliderPosition(int milliseconds);
    IPreviewList* ActiveList() const;
    int WorkMode() const;
    void JoinWorker();
    void OnPicture(const player::Picture& picture);
    void ShowPendingPicture();

    ImButton* m_play = nullptr;
    ImButton* m_stop = nullptr;
    ImButton* m_next = nullptr;
    ImButton* m_previous = nullptr;
    CVideoArea* m_video = nullptr;
    ImSlider* m_slider = nullptr;
    ImPicture* m_left = nullptr;
    ImPicture* m_right = nullptr;
    wxTimer m_timer;

    // Written by the worker at the start and end of avp_run and by the UI thread on pause.
    std::atomic<int> m_bPlaying{0};
    std::atomic<int> m_bPaused{0};
    int m_nCurrent = -1;
    int m_sliderMax = 100000;
    bool m_playFace = false;
    int m_lastMode = -1;
    int m_lastSelected = -2;
    std::array<IPreviewList*, 3> m_lists{};
    std::thread m_worker;

    std::mutex m_pictureMutex;
    std::unique_ptr<player::Picture> m_pendingPicture;
    std::atomic<bool> m_picturePosted{false};
    // Copied into posts from the worker; cleared when the panel goes.
    std::shared_ptr<std::atomic<CPlayerWnd*>> m_self;
};

// Published when the panel exists, cleared when it goes.
extern CPlayerWnd* g_PlayerWnd;

}  // namespace ac
