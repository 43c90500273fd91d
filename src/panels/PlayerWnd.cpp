#include "panels/PlayerWnd.h"

#include "platform/UiQueue.h"
#include "resources/Language.h"
#include "shell/MainHub.h"
#include "skin/SkinControls.h"
#include "skin/SkinLabels.h"
#include "skin/WindowTranslation.h"

#include <wx/dcbuffer.h>

#include <algorithm>
#include <cstdio>

namespace ac {

CPlayerWnd* g_PlayerWnd = nullptr;

namespace {

constexpr std::uint32_t kPlayText = 445;
constexpr std::uint32_t kPauseText = 1009;
constexpr std::uint32_t kPreviousTip = 0xC300;
constexpr std::uint32_t kNextTip = 0xC301;
constexpr std::uint32_t kStopTip = 0xC302;
constexpr int kTimerPeriodMs = 300;
constexpr int kSliderRange = 100000;
constexpr int kVideoHeight = 182;
constexpr int kSliderTop = 183;
constexpr int kSliderBottom = 215;

// The library is initialised at the first play, once for the program; the first run repaints
// the panel once, so the video area's idle face gives way.
bool s_libraryUninitialised = true;
std::atomic<bool> s_firstRunUnpainted{true};

// An image key holds a name; without an extension the file is that name plus ".bmp".
SkinPicture LoadKeyedPicture(const ImSkinConfig& skin, const char* key, const char* section) {
    std::string name = skin.GetString(key, "", section);
    if (name.empty()) {
        return {};
    }
    if (name.find('.') == std::string::npos) {
        name += ".bmp";
    }
    return LoadSkinPicture(name);
}

wxString Text(std::uint32_t id) {
    return wxString::FromUTF8(g_Language.GetString(id));
}

}  // namespace

// ---- CVideoArea ------------------------------------------------------------------------------

CVideoArea::CVideoArea(wxWindow* parent, int id)
    : wxWindow(parent, id, wxDefaultPosition, wxSize(200, kVideoHeight), wxBORDER_NONE) {
    SetBackgroundStyle(wxBG_STYLE_PAINT);
    Bind(wxEVT_PAINT, &CVideoArea::OnPaint, this);
    Bind(wxEVT_SIZE, [this](wxSizeEvent& event) {
        m_scaled = wxBitmap();
        Refresh(false);
        event.Skip();
    });
}

void CVideoArea::SetIdlePicture(SkinPicture picture) {
    m_idle = std::move(picture);
    Refresh(false);
}

void CVideoArea::SetPicture(const player::Picture& picture) {
    wxImage image(picture.width, picture.height, false);
    std::copy(picture.rgb.begin(), picture.rgb.end(), image.GetData());
    m_image = std::move(image);
    m_scaled = wxBitmap();
    Refresh(false);
}

void CVideoArea::ClearPicture() {
    m_image = wxImage();
    m_scaled = wxBitmap();
    Refresh(false);
}

void CVideoArea::OnPaint(wxPaintEvent& /*event*/) {
    wxAutoBufferedPaintDC dc(this);
    const wxSize size = GetClientSize();
    if (!m_image.IsOk()) {
        dc.SetBackground(wxBrush(GetParent()->GetBackgroundColour()));
        dc.Clear();
        if (m_idle.IsOk()) {
            dc.DrawBitmap(m_idle.bitmap, (size.x - m_idle.Width()) / 2,
                          (size.y - m_idle.Height()) / 2, true);
        }
        return;
    }
    dc.SetBackground(*wxBLACK_BRUSH);
    dc.Clear();
    // The library already made the picture the shape of the area it was given; a panel that
    // has been resized since scales it again, its aspect ratio kept.
    const double scale = std::min(static_cast<double>(size.x) / m_image.GetWidth(),
                                  static_cast<double>(size.y) / m_image.GetHeight());
    const int width = std::max(1, static_cast<int>(m_image.GetWidth() * scale));
    const int height = std::max(1, static_cast<int>(m_image.GetHeight() * scale));
    if (!m_scaled.IsOk() || m_scaled.GetWidth() != width || m_scaled.GetHeight() != height) {
        m_scaled = width == m_image.GetWidth() && height == m_image.GetHeight()
                       ? wxBitmap(m_image)
                       : wxBitmap(m_image.Scale(width, height, wxIMAGE_QUALITY_BILINEAR));
    }
    dc.DrawBitmap(m_scaled, (size.x - width) / 2, (size.y - height) / 2);
}

// ---- CPlayerWnd ------------------------------------------------------------------------------

CPlayerWnd::CPlayerWnd(wxWindow* parent)
    : ImSkinPanel(parent, kPanelId, "PlayerPanel", kDialogId),
      m_timer(this, kTimerId),
      m_self(std::make_shared<std::atomic<CPlayerWnd*>>(this)) {
    CreateControls();
    char window[32];
    std::snprintf(window, sizeof window, "SDL_WINDOWID=0x%X",
                  static_cast<unsigned>(reinterpret_cast<std::uintptr_t>(m_video->GetHandle())));
    avp_putenv(window);
    m_video->SetLabel(wxString());
    m_slider->SetRange(0, kSliderRange);
    SetSliderPosition(1);
    m_slider->SetMode("Video Converter");
    player::SetPictureSink([self = m_self](const player::Picture& picture) {
        if (CPlayerWnd* panel = self->load()) {
            panel->OnPicture(picture);
        }
    });
    Bind(wxEVT_BUTTON, [this](wxCommandEvent& event) {
        // Handled here: the ids are the list panel's too (1012 is its Stop).
        if (!OnCommand(event.GetId())) {
            event.Skip();
        }
    });
    Bind(
        wxEVT_SLIDER, [this](wxCommandEvent& event) { SeekTo(event.GetInt()); }, kSliderId);
    Bind(
        wxEVT_TIMER, [this](wxTimerEvent&) { OnPlayerTimer(); }, kTimerId);
    Bind(wxEVT_IDLE, [this](wxIdleEvent& event) {
        UpdateCommands();
        event.Skip();
    });
    g_PlayerWnd = this;
    OnLanguageChanged();
    if (!g_Skin.GetSkinDir().empty()) {
        OnSkinChanged(g_Skin.GetSkinDir());
    }
}

CPlayerWnd::~CPlayerWnd() {
    EndPlayback();
    m_timer.Stop();
    m_self->store(nullptr);
    player::SetPictureSink({});
    JoinWorker();
    avp_deinit();
    s_libraryUninitialised = true;
    if (g_PlayerWnd == this) {
        g_PlayerWnd = nullptr;
    }
}

void CPlayerWnd::CreateControls() {
    m_video = new CVideoArea(this, kVideoId);
    m_slider = new ImSlider(this, kSliderId);
    m_previous = new ImButton(this, kPreviousId);
    m_play = new ImButton(this, kPlayId, Text(kPlayText));
    m_stop = new ImButton(this, kStopId);
    m_next = new ImButton(this, kNextId);
    m_left = new ImPicture(this, kLeftPictureId);
    m_right = new ImPicture(this, kRightPictureId);
    for (ImButton* button : {m_previous, m_play, m_stop, m_next}) {
        // The faces are pictures; the label serves as the tool tip.
        button->SetTextShown(false);
        button->Enable(false);
    }
}

void CPlayerWnd::SetModeList(int mode, IPreviewList* list) {
    if (mode >= 0 && mode < static_cast<int>(m_lists.size())) {
        m_lists[static_cast<std::size_t>(mode)] = list;
    }
}

int CPlayerWnd::WorkMode() const {
    IMainHub* hub = GetMainHub();
    return hub != nullptr ? hub->WorkMode() : 0;
}

IPreviewList* CPlayerWnd::ActiveList() const {
    const int mode = WorkMode();
    return mode >= 0 && mode < static_cast<int>(m_lists.size())
               ? m_lists[static_cast<std::size_t>(mode)]
               : nullptr;
}

bool CPlayerWnd::OnCommand(int commandId) {
    switch (commandId) {
        case kPlayId:
            Play();
            return true;
        case kStopId:
            Stop();
            return true;
        case kNextId:
            Next();
            return true;
        case kPreviousId:
            Previous();
            return true;
        default:
            return false;
    }
}

void CPlayerWnd::SetPlayFace(bool pauseFace) {
    m_playFace = pauseFace;
    m_play->SetPicture(LoadSkinPicture(pauseFace ? "PausePlay.png" : "Play.png"));
    m_play->SetLabel(Text(pauseFace ? kPauseText : kPlayText));
    m_play->SetToolTip(m_play->GetLabel());
    m_play->Refresh(false);
}

void CPlayerWnd::Play() {
    if (m_bPlaying) {
        avp_toggle_pause();
        m_bPlaying = 0;
        m_bPaused = 1;
        SetPlayFace(false);
        return;
    }
    if (m_bPaused) {
        avp_toggle_pause();
        m_bPaused = 0;
        m_bPlaying = 1;
        SetPlayFace(true);
        return;
    }
    if (s_libraryUninitialised) {
        s_libraryUninitialised = false;
        const wxSize area = m_video->GetClientSize();
        avp_init_size(area.x, area.y);
        avp_init();
    }
    StartRow();
}

void CPlayerWnd::StartRow() {
    IPreviewList* list = ActiveList();
    if (list == nullptr) {
        return;
    }
    if (m_nCurrent < 0 || m_nCurrent >= list->RowCount()) {
        m_nCurrent = list->FirstSelected();
    }
    if (m_nCurrent < 0) {
        return;
    }
    // The last run has returned or is returning from avp_stop; its thread is joined first.
    JoinWorker();
    const std::string path = list->RowPath(m_nCurrent);
    if (avp_open(path.c_str()) == 0) {
        return;
    }
    const auto length = static_cast<int>(avp_get_length() * 1000);
    if (length > 0) {
        m_sliderMax = length;
        m_slider->SetRange(0, length);
        SetSliderPosition(0);
    }
    m_video->ClearPicture();
    SetPlayFace(true);
    m_timer.Start(kTimerPeriodMs);
    // Playing from here on, before the worker says so: a second press pauses at once.
    m_bPlaying = 1;
    m_bPaused = 0;
    m_worker = std::thread([this, self = m_self] {
        if (s_firstRunUnpainted.exchange(false)) {
            UiQueue::Post([self] {
                if (CPlayerWnd* panel = self->load()) {
                    panel->Refresh();
                }
            });
        }
        avp_run();
        m_bPlaying = 0;
        m_bPaused = 0;
    });
}

void CPlayerWnd::Stop() {
    if (!m_bPlaying) {
        return;
    }
    SetPlayFace(false);
    avp_stop();
    // Idle from here on, though the worker may need a moment to return: the next start waits
    // for it before it writes the flags again.
    m_bPlaying = 0;
    m_bPaused = 0;
    m_timer.Stop();
    SetSliderPosition(0);
    m_nCurrent = -1;
    m_video->ClearPicture();
}

void CPlayerWnd::EndPlayback() {
    if (m_bPaused) {
        avp_toggle_pause();
        m_bPaused = 0;
        m_bPlaying = 1;
    }
    Stop();
}

void CPlayerWnd::JoinWorker() {
    if (m_worker.joinable()) {
        m_worker.join();
    }
}

void CPlayerWnd::Previous() {
    const int row = m_nCurrent;
    Stop();
    IPreviewList* list = ActiveList();
    if (list == nullptr) {
        return;
    }
    list->MarkRow(row, false);
    m_nCurrent = row - 1;
    list->MarkRow(m_nCurrent, true);
    Play();
}

void CPlayerWnd::Next() {
    IPreviewList* list = ActiveList();
    if (list == nullptr) {
        return;
    }
    m_nCurrent = std::max(0, list->FirstSelected());
    const int row = m_nCurrent;
    Stop();
    list->MarkRow(row, false);
    m_nCurrent = row + 1;
    list->MarkRow(m_nCurrent, true);
    Play();
}

void CPlayerWnd::SetDuration(double seconds) {
    m_slider->SetTotal(static_cast<int>(seconds));
}

void CPlayerWnd::SetSliderPosition(int milliseconds) {
    m_slider->SetPos(milliseconds);
    m_slider->SetToolTip(wxString::FromUTF8(SliderToolTip()));
}

bool CPlayerWnd::IsLibraryInitialised() {
    return !s_libraryUninitialised;
}

int CPlayerWnd::SliderPosition() const {
    return m_slider->GetPos();
}

std::string CPlayerWnd::SliderToolTip() const {
    int seconds = m_slider->GetPos() / 1000;
    const int hours = seconds / 3600;
    seconds %= 3600;
    char text[32];
    std::snprintf(text, sizeof text, "%02d:%02d:%02d", hours, seconds / 60, seconds % 60);
    return text;
}

void CPlayerWnd::OnPlayerTimer() {
    if (m_bPlaying && !m_bPaused) {
        const auto position = static_cast<int>(avp_get_cur_pos() * 1000);
        SetSliderPosition(position);
        if (position > m_sliderMax) {
            Stop();
        }
    }
    m_slider->Enable(WorkMode() != 1 && (m_bPlaying || m_bPaused));
}

void CPlayerWnd::SeekTo(int milliseconds) {
    SetSliderPosition(milliseconds);
    // The player holds still during the jump, and a paused player stays paused.
    const bool paused = m_bPaused != 0;
    if (!paused) {
        avp_toggle_pause();
    }
    avp_set_cur_pos(milliseconds * 0.001);
    if (!paused) {
        avp_toggle_pause();
    }
}

bool CPlayerWnd::IsCommandEnabled(int commandId) const {
    IPreviewList* list = ActiveList();
    const int rows = list != nullptr ? list->RowCount() : 0;
    switch (commandId) {
        case kPlayId: {
            const int selected = list != nullptr ? list->FirstSelected() : -1;
            return selected >= 0 && list->CanPlay(selected);
        }
        case kStopId:
            return m_bPlaying != 0;
        case kSliderId:
            // Also while paused: the slider moves a paused file without resuming it.
            return (m_bPlaying || m_bPaused) && WorkMode() != 1;
        case kPreviousId:
            return m_nCurrent > 0 && rows > 0;
        case kNextId:
            return m_nCurrent >= 0 && m_nCurrent < rows - 1;
        default:
            return false;
    }
}

void CPlayerWnd::UpdateCommands() {
    IPreviewList* list = ActiveList();
    const int mode = WorkMode();
    const bool modeChanged = m_lastMode >= 0 && mode != m_lastMode;
    m_lastMode = mode;
    const int selected = list != nullptr ? list->FirstSelected() : -1;
    const bool noSelection = selected < 0;
    if (selected != m_lastSelected || modeChanged) {
        m_lastSelected = selected;
        SetDuration(selected >= 0 ? list->RowSeconds(selected) : 0.0);
    }
    if ((modeChanged || noSelection) && (m_bPlaying || m_bPaused)) {
        EndPlayback();
        Refresh();
    }
    // A row removed or moved under the playing file: what plays is no longer what the row says.
    if ((m_bPlaying || m_bPaused) && list != nullptr &&
        (m_nCurrent >= list->RowCount() || m_nCurrent < 0)) {
        EndPlayback();
    }
    // A rip that starts takes the drive: the track that plays from it stops.
    if ((m_bPlaying || m_bPaused) && list != nullptr && !list->CanPlay(m_nCurrent)) {
        EndPlayback();
    }
    const std::pair<ImButton*, int> buttons[] = {
        {m_play, kPlayId}, {m_stop, kStopId}, {m_previous, kPreviousId}, {m_next, kNextId}};
    for (const auto& [button, id] : buttons) {
        const bool enable = IsCommandEnabled(id);
        if (button->IsEnabled() != enable) {
            button->Enable(enable);
        }
    }
    const bool slider = IsCommandEnabled(kSliderId);
    if (m_slider->IsEnabled() != slider) {
        m_slider->Enable(slider);
    }
}

void CPlayerWnd::OnPicture(const player::Picture& picture) {
    {
        std::lock_guard lock(m_pictureMutex);
        m_pendingPicture = std::make_unique<player::Picture>(picture);
    }
    // One post at a time: a UI thread that falls behind shows the newest picture, not a queue.
    if (!m_picturePosted.exchange(true)) {
        UiQueue::Post([self = m_self] {
            if (CPlayerWnd* panel = self->load()) {
                panel->ShowPendingPicture();
            }
        });
    }
}

void CPlayerWnd::ShowPendingPicture() {
    std::unique_ptr<player::Picture> picture;
    {
        std::lock_guard lock(m_pictureMutex);
        picture = std::move(m_pendingPicture);
        m_picturePosted = false;
    }
    if (picture && (m_bPlaying || m_bPaused)) {
        m_video->SetPicture(*picture);
    }
}

std::string CPlayerWnd::DescribeState() const {
    const char* state = m_bPaused ? "paused" : m_bPlaying ? "playing" : "stopped";
    const auto position = static_cast<long>(avp_get_cur_pos() * 1000);
    return std::string("player_state=") + state +
           "\nplayer_pos_ms=" + std::to_string(m_bPlaying || m_bPaused ? position : 0) +
           "\nplayer_row=" + std::to_string(m_nCurrent) +
           "\nplayer_slider=" + std::to_string(m_slider->GetPos()) + "\n";
}

void CPlayerWnd::OnLanguageChanged() {
    TranslateWindow(*this, kDialogId);
    SetPlayFace(m_playFace);
    m_previous->SetToolTip(Text(kPreviousTip));
    m_next->SetToolTip(Text(kNextTip));
    m_stop->SetToolTip(Text(kStopTip));
}

void CPlayerWnd::DoRecalcLayout() {
    ImSkinDialog::DoRecalcLayout();
    if (m_play == nullptr) {
        return;
    }
    const wxSize client = GetClientSize();
    const int l = 0;
    const int t = 0;
    const int r = client.x;
    const int b = client.y;
    for (ImButton* button : {m_previous, m_play, m_stop, m_next}) {
        button->SetSize(button->CellSize());
    }
    const wxSize play = m_play->GetSize();
    const wxSize stop = m_stop->GetSize();
    // The other buttons stand on the play button's middle line, 4 pixels higher.
    auto bottomBeside = [&](const wxSize& own) { return b + own.y / 2 - play.y / 2 - 4; };
    m_play->Move(l + 94, b - 7 - play.y);
    m_stop->Move(l + 94 + play.x + 8, bottomBeside(stop) - stop.y);
    const wxSize previous = m_previous->GetSize();
    m_previous->Move(l + 82 - previous.x, bottomBeside(previous) - previous.y);
    const wxSize next = m_next->GetSize();
    m_next->Move(l + 110 + stop.x + play.x, bottomBeside(next) - next.y);
    m_slider->SetSize(l + 5, t + kSliderTop, std::max(0, r - 5 - (l + 5)),
                      kSliderBottom - kSliderTop);
    m_video->SetSize(l, t, r - l, kVideoHeight);
    m_left->FitToPicture();
    m_right->FitToPicture();
    m_left->Move(l, b - m_left->GetSize().y);
    m_right->Move(r - m_right->GetSize().x, b - m_right->GetSize().y);
}

bool CPlayerWnd::OnSkinChanged(const std::string& skinDir) {
    ImSkinDialog::OnSkinChanged(skinDir);
    const char* section = GetSkinSection();
    SkinFont font = m_skin.GetFont(section);
    if (font.name.empty()) {
        font.name = "Arial";
    }
    m_slider->SetFont(MakeSkinFont(font));
    m_slider->SetColours(m_look.fillBg.IsOk() ? m_look.fillBg : GetBackgroundColour(),
                         NativeColour(m_skin.GetRgbColour("TextColor", 0, section)));
    m_stop->SetPicture(LoadSkinPicture("StopPlay.png"));
    m_next->SetPicture(LoadSkinPicture("PlayNext.png"));
    m_previous->SetPicture(LoadSkinPicture("PlayPrevious.png"));
    SetPlayFace(m_bPlaying != 0);
    for (ImButton* button : {m_previous, m_play, m_stop, m_next}) {
        button->SetTextColours(m_look.buttonText);
        button->Enable(false);
    }
    m_left->SetPicture(LoadSkinPicture("PreviewLeft.bmp"));
    m_right->SetPicture(LoadSkinPicture("PreviewRight.bmp"));
    m_slider->SetPictures(LoadKeyedPicture(m_skin, "SliderFore", "SliderBar"),
                          LoadKeyedPicture(m_skin, "SliderGone", "SliderBar"),
                          LoadKeyedPicture(m_skin, "SliderBlock", "SliderBar"),
                          LoadKeyedPicture(m_skin, "SliderBg", "SliderBar"));
    m_video->SetIdlePicture(LoadKeyedPicture(m_skin, "ProviewBmp", section));
    RecalcLayout();
    return true;
}

}  // namespace ac
