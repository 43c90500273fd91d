#include "skin/ShutDownDlg.h"

#include "resources/Language.h"
#include "skin/SkinLabels.h"
#include "skin/SkinPicture.h"

#include <wx/button.h>
#include <wx/dcclient.h>
#include <wx/statbox.h>

#include <cstdlib>
#include <string>

namespace ac {

namespace {

constexpr std::uint32_t kShutDownTitle = 250;
constexpr std::uint32_t kCancelText = 2;
constexpr std::uint32_t kShutdownMessage = 0xC020;
constexpr std::uint32_t kShutdownTime = 0xC021;
constexpr std::uint32_t kStandbyMessage = 0xC022;
constexpr std::uint32_t kStandbyTime = 0xC023;
constexpr std::uint32_t kHibernateMessage = 0xC024;
constexpr std::uint32_t kHibernateTime = 0xC025;
constexpr std::uint32_t kExitMessage = 0xC026;
constexpr std::uint32_t kExitTime = 0xC027;
constexpr int kDefaultTickMs = 100;
constexpr int kOkAnswer = 1;

int s_privilegesMade = 0;
int s_privilegesAlive = 0;
int s_testTickMs = 0;

wxString Text(std::uint32_t id) {
    return wxString::FromUTF8(g_Language.GetString(id));
}

// ImLabel keeps lines as given: break the message at blanks to the label's width.
wxString WrapToWidth(const wxWindow& window, const wxString& text, int width) {
    wxClientDC dc(const_cast<wxWindow*>(&window));
    dc.SetFont(window.GetFont());
    wxString wrapped;
    wxString line;
    for (const wxString& word : wxSplit(text, ' ', '\0')) {
        const wxString candidate = line.empty() ? word : line + " " + word;
        if (!line.empty() && dc.GetTextExtent(candidate).x > width) {
            wrapped += line + "\n";
            line = word;
        } else {
            line = candidate;
        }
    }
    return wrapped + line;
}

}  // namespace

ImShutdownPrivilege::ImShutdownPrivilege() {
    ++s_privilegesMade;
    ++s_privilegesAlive;
}

ImShutdownPrivilege::~ImShutdownPrivilege() {
    --s_privilegesAlive;
}

int ImShutdownPrivilege::Made() {
    return s_privilegesMade;
}
int ImShutdownPrivilege::Alive() {
    return s_privilegesAlive;
}

ImShutDownDlg::ImShutDownDlg(wxWindow* parent)
    : ImDialog(parent, kDialogId, Text(kShutDownTitle)),
      m_bgColor(NativeColour(kBackground)),
      m_timer(this, 1) {
    SetClientSize(ConvertDialogToPixels(wxSize(200, 140)));
    auto* frame =
        new wxStaticBox(this, wxID_ANY, wxEmptyString, ConvertDialogToPixels(wxPoint(7, 5)),
                        ConvertDialogToPixels(wxSize(186, 66)));
    frame->SetBackgroundColour(m_bgColor);
    m_messageLabel = new ImLabel(this, kMessageId, wxEmptyString);
    m_messageLabel->SetSize(
        wxRect(ConvertDialogToPixels(wxPoint(14, 14)), ConvertDialogToPixels(wxSize(172, 52))));
    m_timeLabelLabel = new ImLabel(this, kTimeLabelId, wxEmptyString);
    m_timeLabelLabel->SetSize(
        wxRect(ConvertDialogToPixels(wxPoint(14, 78)), ConvertDialogToPixels(wxSize(172, 10))));
    m_time = new ImLabel(this, kTimeId, "00:00:30", wxALIGN_CENTER_HORIZONTAL);
    m_time->SetSize(
        wxRect(ConvertDialogToPixels(wxPoint(14, 92)), ConvertDialogToPixels(wxSize(172, 16))));
    new wxButton(this, kCancelId, Text(kCancelText), ConvertDialogToPixels(wxPoint(75, 118)),
                 ConvertDialogToPixels(wxSize(50, 14)));
    SetBackgroundColour(m_bgColor);
    Bind(
        wxEVT_BUTTON, [this](wxCommandEvent&) { EndWith(kCancelId); }, kCancelId);
    Bind(
        wxEVT_TIMER, [this](wxTimerEvent&) { Tick(); }, 1);
    Bind(wxEVT_CHAR_HOOK, &ImShutDownDlg::OnKey, this);
    Bind(wxEVT_CLOSE_WINDOW, [this](wxCloseEvent&) { EndWith(kCancelId); });
}

ImShutDownDlg::~ImShutDownDlg() {
    m_timer.Stop();
}

void ImShutDownDlg::SetShutdownTexts() {
    m_message = g_Language.GetString(kShutdownMessage);
    m_timeLabel = g_Language.GetString(kShutdownTime);
}

void ImShutDownDlg::SetHibernateTexts() {
    m_message = g_Language.GetString(kHibernateMessage);
    m_timeLabel = g_Language.GetString(kHibernateTime);
}

void ImShutDownDlg::SetStandbyTexts() {
    m_message = g_Language.GetString(kStandbyMessage);
    m_timeLabel = g_Language.GetString(kStandbyTime);
}

void ImShutDownDlg::SetExitTexts() {
    m_message = g_Language.GetString(kExitMessage);
    m_timeLabel = g_Language.GetString(kExitTime);
}

void ImShutDownDlg::SetTitle(const wxString& title) {
    m_title = title;
    if (m_started && !title.empty()) {
        ImDialog::SetTitle(title);
    }
}

void ImShutDownDlg::InitDialog() {
    if (m_started) {
        return;
    }
    m_started = true;
    // A translated caption reaches SetTitle too; the action's title set before must win.
    const wxString title = m_title;
    ImDialog::InitDialog();
    m_title = title;
    Start();
}

void ImShutDownDlg::Start() {
    SetWindowStyleFlag(GetWindowStyleFlag() | wxSTAY_ON_TOP);
    wxFont timeFont = m_time->GetFont();
    timeFont.SetPointSize(12);
    m_time->SetFont(timeFont);
    m_messageLabel->SetLabel(WrapToWidth(*m_messageLabel, wxString::FromUTF8(m_message),
                                         m_messageLabel->GetClientSize().x - 4));
    m_timeLabelLabel->SetLabel(wxString::FromUTF8(m_timeLabel));
    if (!m_title.empty()) {
        ImDialog::SetTitle(m_title);
    }
    m_time->SetBgColor(m_bgColor);
    m_time->SetLabel(TimeText());
    m_timer.Start(TickPeriod());
}

int ImShutDownDlg::DoModal() {
    InitDialog();
    return ShowModal();
}

void ImShutDownDlg::Tick() {
    if (m_ended) {
        return;
    }
    --m_ticks;
    if (m_ticks <= 0) {
        m_ticks = 0;
        m_time->SetLabel(TimeText());
        EndWith(kOkAnswer);
        return;
    }
    m_time->SetLabel(TimeText());
}

wxString ImShutDownDlg::TimeText() const {
    const int seconds = m_ticks / 10;
    return wxString::Format("%02d:%02d:%02d", seconds / 3600, (seconds % 3600) / 60, seconds % 60);
}

void ImShutDownDlg::EndWith(int answer) {
    // The first answer wins: a tick that was already queued cannot undo a cancel.
    if (m_ended) {
        return;
    }
    m_ended = true;
    m_timer.Stop();
    SetReturnCode(answer);
    if (IsModal()) {
        EndModal(answer);
    } else {
        Hide();
    }
}

void ImShutDownDlg::OnKey(wxKeyEvent& event) {
    switch (event.GetKeyCode()) {
        case WXK_ESCAPE:
            EndWith(kCancelId);
            break;
        case WXK_RETURN:
        case WXK_NUMPAD_ENTER:
            EndWith(kOkAnswer);
            break;
        default:
            event.Skip();
            break;
    }
}

void ImShutDownDlg::SetTickPeriodForTests(int milliseconds) {
    s_testTickMs = milliseconds;
}

int ImShutDownDlg::TickPeriod() {
    if (s_testTickMs > 0) {
        return s_testTickMs;
    }
    if (const char* fromEnvironment = std::getenv("AUDIOCONV_COUNTDOWN_MS")) {
        const int period = std::atoi(fromEnvironment);
        if (period > 0) {
            return period;
        }
    }
    return kDefaultTickMs;
}

}  // namespace ac
