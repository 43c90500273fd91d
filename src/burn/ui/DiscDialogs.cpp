// The waiting and erasing dialogs.
#include "burn/ui/DiscDialogs.h"

#include "burn/BurnDriver.h"
#include "burn/BurnTexts.h"
#include "platform/UiQueue.h"
#include "resources/Language.h"
#include "skin/WindowTranslation.h"

#include <wx/button.h>
#include <wx/choice.h>
#include <wx/gauge.h>
#include <wx/radiobut.h>
#include <wx/sizer.h>
#include <wx/stattext.h>

#include <cstdio>
#include <cstring>

namespace ac {

namespace {

CWaitingDiscDlg* s_waiting = nullptr;
CEraseRewritableDiscDlg* s_erasing = nullptr;

constexpr int kEjectTimerId = 100;
constexpr int kCheckTimerId = 1000;

std::string Text(std::uint32_t id) {
    return g_Language.GetString(id);
}

std::string Megabytes(double bytes) {
    char text[32];
    std::snprintf(text, sizeof text, "%.2f MB", bytes / 1048576.0);
    return text;
}

wxStaticText* Label(wxWindow* parent, int id, const std::string& text) {
    return new wxStaticText(parent, id, wxString::FromUTF8(text));
}

}  // namespace

std::string RecorderLabel(const burn::ICdRecorder& recorder) {
    const std::string name = recorder.Name();
    return "[" + recorder.DriveText() + "] " +
           (name.empty() ? Text(burn::text::kUnknownRecorder) : name);
}

std::string MediaTypeText(int mediaType) {
    switch (mediaType) {
        case burn::kMediaNone:
            return Text(burn::text::kMediaEmpty);
        case burn::kMediaCdRom:
            return "CD-ROM";
        case burn::kMediaCdR:
            return "CD-R";
        case burn::kMediaCdRw:
            return "CD-RW";
        case burn::kMediaDvdR:
            return "DVD-R";
        case burn::kMediaDvdRwSequential:
        case burn::kMediaDvdRwRestricted:
            return "DVD-RW";
        case burn::kMediaDvdPlusRw:
            return "DVD+RW";
        case burn::kMediaDvdPlusR:
            return "DVD+R";
        default:
            return Text(burn::text::kMediaUnsupported);
    }
}

// ---- Waiting --------------------------------------------------------------------------------

CWaitingDiscDlg::CWaitingDiscDlg(wxWindow* parent, burn::ICdRecorder* recorder, int code,
                                 std::int64_t sectors, bool showIgnore, DiscMessageBox messageBox)
    : wxDialog(parent, kDialogId, "Disc waiting..."),
      m_recorder(recorder),
      m_code(code),
      m_sectors(sectors),
      m_showIgnore(showIgnore),
      m_messageBox(std::move(messageBox)),
      m_ejectTimer(this, kEjectTimerId),
      m_checkTimer(this, kCheckTimerId) {
    auto* top = new wxBoxSizer(wxVERTICAL);
    m_message = Label(this, 1054, "");
    m_message->SetMinSize(wxSize(420, 60));
    top->Add(m_message, 0, wxALL | wxEXPAND, 10);
    auto* grid = new wxFlexGridSizer(2, 6, 12);
    grid->Add(Label(this, 1055, "Disc required for the compilation:"));
    grid->Add(Label(this, 1056, "CD-R/RW"));
    grid->Add(Label(this, 1057, "Disc type in the recorder:"));
    grid->Add(m_discType = Label(this, 1058, ""));
    grid->Add(Label(this, 1061, "Data to be writen:"));
    grid->Add(m_dataSize = Label(
                  this, 1062, Megabytes(static_cast<double>(sectors) * burn::kAudioSectorBytes)));
    grid->Add(Label(this, 1059, "Space available on the disc:"));
    grid->Add(m_free = Label(this, 1060, ""));
    top->Add(grid, 0, wxLEFT | wxRIGHT, 10);
    auto* note = Label(
        this, 1064,
        "Click 'Ignore' to cancel disc checking, and prompt it again when disc burning starts.");
    note->Wrap(420);
    top->Add(note, 0, wxALL, 10);
    auto* buttons = new wxBoxSizer(wxHORIZONTAL);
    auto* ignore = new wxButton(this, kIgnoreResult, "&Ignore");
    buttons->Add(ignore, 0, wxRIGHT, 8);
    buttons->Add(new wxButton(this, 2, "Cancel"));
    top->Add(buttons, 0, wxALL | wxALIGN_RIGHT, 10);
    SetSizerAndFit(top);
    TranslateWindow(*this, kDialogId);
    if (!m_showIgnore) {
        ignore->Hide();
        note->Hide();
        Fit();
    }
    if (m_recorder)
        SetTitle(wxString::FromUTF8(RecorderLabel(*m_recorder) + ":" +
                                    Text(burn::text::kWaitingForDisc)));
    Bind(
        wxEVT_BUTTON, [this](wxCommandEvent&) { EndModal(kIgnoreResult); }, kIgnoreResult);
    Bind(
        wxEVT_BUTTON, [this](wxCommandEvent&) { EndModal(wxID_CANCEL); }, 2);
    Bind(wxEVT_TIMER, &CWaitingDiscDlg::OnTimer, this);
    SetCode(code);
    m_ejectTimer.StartOnce(100);
    m_checkTimer.Start(2000);
    s_waiting = this;
}

CWaitingDiscDlg::~CWaitingDiscDlg() {
    m_ejectTimer.Stop();
    m_checkTimer.Stop();
    if (s_waiting == this)
        s_waiting = nullptr;
}

CWaitingDiscDlg* CWaitingDiscDlg::Shown() {
    return s_waiting;
}

void CWaitingDiscDlg::SetCode(int code) {
    m_code = code;
    m_message->SetLabel(wxString::FromUTF8(Text(burn::WaitMessageId(code))));
    // Messages run to three lines and more in other languages: the dialog grows with them.
    m_message->Wrap(420);
    RefreshFields();
    if (GetSizer() != nullptr)
        GetSizer()->SetSizeHints(this);
}

void CWaitingDiscDlg::RefreshFields() {
    if (!m_recorder)
        return;
    m_mediaType = m_recorder->MediaType();
    m_discType->SetLabel(wxString::FromUTF8(MediaTypeText(m_mediaType)));
    std::int64_t total = 0, freeBlocks = 0;
    m_free->SetLabel(
        wxString::FromUTF8(m_recorder->Capacity(total, freeBlocks)
                               ? Megabytes(static_cast<double>(freeBlocks) * burn::kDataBlockBytes)
                               : Text(burn::text::kNotAvailable)));
    m_discInfo.fill(0);
    m_recorder->ReadDiskInfo(m_discInfo);
    Layout();
}

void CWaitingDiscDlg::OnTimer(wxTimerEvent& event) {
    if (event.GetId() == kEjectTimerId) {
        // The tray opens first, so the user finds it open; the next read differs from this one.
        std::memset(m_discInfo.data(), 0, 40);
        if (m_recorder)
            m_recorder->Eject();
        return;
    }
    CheckNow();
}

void CWaitingDiscDlg::CheckNow() {
    if (!m_recorder || !IsModal())
        return;
    burn::DiskInfoBlock block{};
    m_recorder->ReadDiskInfo(block);
    if (block == m_discInfo)
        return;
    m_recorder->WaitReady(1500);
    SetCode(burn::CheckDisc(m_recorder, m_sectors));
    if (m_code == 1) {
        m_checkTimer.Stop();
        const bool erase =
            m_messageBox(Text(burn::text::kEraseNonEmpty), Text(burn::text::kWarningCaption),
                         wxYES_NO | wxICON_WARNING) == wxYES;
        if (erase) {
            EndModal(wxID_OK);
            return;
        }
        m_checkTimer.Start(2000);
    } else if (m_code == 0) {
        EndModal(wxID_OK);
        return;
    }
    m_recorder->Eject();
}

std::string CWaitingDiscDlg::Describe() const {
    return GetTitle().utf8_string() + "|" + m_message->GetLabel().utf8_string() + "|" +
           m_discType->GetLabel().utf8_string() + "|" + m_free->GetLabel().utf8_string() + "|" +
           m_dataSize->GetLabel().utf8_string() + "|" + (m_showIgnore ? "1" : "0");
}

burn::ICdRecorder* WaitForDisc(burn::ICdRecorder* recorder, int code, std::int64_t sectors,
                               bool showIgnore, wxWindow* owner, bool& ignored,
                               DiscMessageBox messageBox) {
    CWaitingDiscDlg dialog(owner, recorder, code, sectors, showIgnore, std::move(messageBox));
    const int result = dialog.ShowModal();
    if (result == CWaitingDiscDlg::kIgnoreResult) {
        ignored = true;
        return recorder;
    }
    if (result == wxID_OK)
        return recorder;
    if (recorder)
        recorder->AfterWrite();
    return nullptr;
}

// ---- Erasing --------------------------------------------------------------------------------

CEraseRewritableDiscDlg::CEraseRewritableDiscDlg(
    wxWindow* parent, std::vector<std::pair<std::string, burn::ICdRecorder*>> recorders,
    int selected, DiscMessageBox messageBox)
    : wxDialog(parent, kDialogId, "Erase rewitable disc"),
      m_recorders(std::move(recorders)),
      m_messageBox(std::move(messageBox)),
      m_stepTimer(this, 100),
      m_alive(std::make_shared<CEraseRewritableDiscDlg*>(this)) {
    auto* top = new wxBoxSizer(wxVERTICAL);
    top->Add(Label(this, 1215, "Choose &recorder"), 0, wxLEFT | wxTOP | wxRIGHT, 10);
    m_box = new wxChoice(this, 1022);
    for (const auto& [text, recorder] : m_recorders)
        m_box->Append(wxString::FromUTF8(text));
    top->Add(m_box, 0, wxALL | wxEXPAND, 10);
    m_quick = new wxRadioButton(this, 1216, "&Quick-erase rewritable disc", wxDefaultPosition,
                                wxDefaultSize, wxRB_GROUP);
    m_full = new wxRadioButton(this, 1217, "&Full-erase rewritable disc");
    top->Add(m_quick, 0, wxLEFT | wxRIGHT, 10);
    top->Add(m_full, 0, wxALL, 10);
    m_bar = new wxGauge(this, 1218, 100, wxDefaultPosition, wxSize(360, 18));
    top->Add(m_bar, 0, wxALL | wxEXPAND, 10);
    auto* buttons = new wxBoxSizer(wxHORIZONTAL);
    m_erase = new wxButton(this, 1041, "&Erase");
    m_cancel = new wxButton(this, 2, "&Cancel");
    buttons->Add(m_erase, 0, wxRIGHT, 8);
    buttons->Add(m_cancel);
    top->Add(buttons, 0, wxALL | wxALIGN_RIGHT, 10);
    SetSizerAndFit(top);
    TranslateWindow(*this, kDialogId);
    m_quick->SetValue(true);
    if (!m_recorders.empty())
        m_box->SetSelection(
            selected >= 0 && selected < static_cast<int>(m_recorders.size()) ? selected : 0);
    Bind(
        wxEVT_CHOICE, [this](wxCommandEvent&) { OnSelection(); }, 1022);
    Bind(
        wxEVT_BUTTON, [this](wxCommandEvent&) { OnErase(); }, 1041);
    Bind(
        wxEVT_BUTTON,
        [this](wxCommandEvent&) {
            if (!Erasing())
                EndModal(wxID_CANCEL);
        },
        2);
    Bind(
        wxEVT_TIMER,
        [this](wxTimerEvent&) { m_bar->SetValue(std::min(100, m_bar->GetValue() + 1)); }, 100);
    OnSelection();
    s_erasing = this;
}

CEraseRewritableDiscDlg::~CEraseRewritableDiscDlg() {
    m_stepTimer.Stop();
    m_alive.reset();
    if (m_worker.joinable())
        m_worker.join();
    if (s_erasing == this)
        s_erasing = nullptr;
}

CEraseRewritableDiscDlg* CEraseRewritableDiscDlg::Shown() {
    return s_erasing;
}

void CEraseRewritableDiscDlg::OnSelection() {
    const int index = m_box->GetSelection();
    m_recorder = index >= 0 && index < static_cast<int>(m_recorders.size())
                     ? m_recorders[std::size_t(index)].second
                     : nullptr;
    m_erase->Enable(m_recorder != nullptr && m_recorder->CanErase());
}

void CEraseRewritableDiscDlg::PressErase(bool full) {
    m_full->SetValue(full);
    m_quick->SetValue(!full);
    OnErase();
}

void CEraseRewritableDiscDlg::OnErase() {
    if (Erasing() || m_recorder == nullptr || !m_erase->IsEnabled())
        return;
    if (m_worker.joinable())
        m_worker.join();
    for (wxWindow* control : {static_cast<wxWindow*>(m_erase), static_cast<wxWindow*>(m_cancel),
                              static_cast<wxWindow*>(m_quick), static_cast<wxWindow*>(m_full),
                              static_cast<wxWindow*>(m_box)})
        control->Disable();
    const bool quick = !m_full->GetValue();
    m_bar->SetValue(0);
    // An estimate of 30 or 600 seconds for the hundred steps of the bar.
    m_stepTimer.Start(quick ? 300 : 6000);
    m_done = false;
    burn::ICdRecorder* recorder = m_recorder;
    std::weak_ptr<CEraseRewritableDiscDlg*> alive = m_alive;
    m_worker = std::thread([this, recorder, quick, alive] {
        recorder->PreventRemoval(true);
        recorder->Erase(quick);
        recorder->WaitReady(400);
        recorder->PreventRemoval(false);
        recorder->WaitReady(400);
        m_done = true;
        UiQueue::Post([alive] {
            if (auto self = alive.lock(); self && *self)
                (*self)->OnEraseDone();
        });
    });
}

void CEraseRewritableDiscDlg::OnEraseDone() {
    m_stepTimer.Stop();
    m_bar->SetValue(0);
    for (wxWindow* control : {static_cast<wxWindow*>(m_erase), static_cast<wxWindow*>(m_cancel),
                              static_cast<wxWindow*>(m_quick), static_cast<wxWindow*>(m_full),
                              static_cast<wxWindow*>(m_box)})
        control->Enable();
    OnSelection();
    if (m_messageBox(Text(burn::text::kEraseComplete), "",
                     wxYES_NO | wxNO_DEFAULT | wxICON_QUESTION) == wxYES &&
        m_recorder != nullptr)
        m_recorder->Eject();
}

std::string CEraseRewritableDiscDlg::Describe() const {
    return std::to_string(m_box->GetSelection()) + "|" + (m_erase->IsEnabled() ? "1" : "0") + "|" +
           std::to_string(m_bar->GetValue()) + "|" + (Erasing() ? "1" : "0");
}

}  // namespace ac
