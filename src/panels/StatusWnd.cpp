#include "panels/StatusWnd.h"

#include "panels/LogWnd.h"
#include "panels/RichEdit.h"
#include "platform/UiQueue.h"
#include "resources/Language.h"
#include "shell/AppConfig.h"
#include "shell/MainHub.h"
#include "skin/SkinControls.h"
#include "skin/WindowTranslation.h"

#include <wx/msgdlg.h>
#include <wx/textctrl.h>

#include <algorithm>

namespace ac {

CStatusWnd* g_StatusWnd = nullptr;

namespace {

constexpr std::uint32_t kMinuteText = 243;
constexpr std::uint32_t kBadWorkMode = 0xC002;
constexpr std::uint32_t kLogButtonTipId = 0xC183;

// The audio disc's scale in minutes: 75 nearly full, 80 full, 90 the end of the gauge.
constexpr long long kAudioNear = 75;
constexpr long long kAudioOver = 80;
constexpr long long kAudioMax = 90;
constexpr long long kAudioTickStep = 10;

RunStyle StyleOf(LogLineKind kind) {
    RunStyle style;
    if (kind == LogLineKind::Error) {
        style.colour = wxColour(0xFF, 0x00, 0x00);
    } else if (kind == LogLineKind::Warning) {
        style.colour = wxColour(0xB8, 0x60, 0x00);
    }
    return style;
}

// An image key holds a name; the file is that name plus ".bmp", unless the skin wrote it whole.
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

}  // namespace

CStatusWnd::CStatusWnd(wxWindow* parent)
    : ImSkinPanel(parent, kPanelId, "StatusBar", kDialogId),
      m_bar(new CapacityBar(this, kBarId)),
      m_logButton(new ImButton(this, kLogButtonId)),
      m_timer(this, kTimerId),
      m_self(std::make_shared<const wxWeakRef<CStatusWnd>>(this)) {
    if (GetAppConfig().GetInt("last_run_function") == 2) {
        SetAudioDiscScale();
    } else {
        m_bar->SetPlainRange(0, 100);
    }
    m_bar->SetFramed(false);
    m_bar->SetTileOffset(1, 1);
    m_bar->Show();
    m_logButton->SetTextShown(false);
    TranslateToolTips();
    Bind(
        wxEVT_BUTTON, [this](wxCommandEvent&) { ShowLog(); }, kLogButtonId);
    Bind(
        wxEVT_TIMER, [this](wxTimerEvent&) { OnStatusTimer(); }, kTimerId);
    m_timer.Start(1000);
    g_StatusWnd = this;
    TranslateWindow(*this, kDialogId);
    // A panel made after the skin was chosen takes it at once.
    if (!g_Skin.GetSkinDir().empty()) {
        OnSkinChanged(g_Skin.GetSkinDir());
    }
}

CStatusWnd::~CStatusWnd() {
    m_timer.Stop();
    if (g_StatusWnd == this) {
        g_StatusWnd = nullptr;
    }
}

// A rich edit and a dialog of its own cost the start a tenth of its time: they are made with
// the first line of a log or the first look at it.
wxTextCtrl* CStatusWnd::GetLogControl() {
    if (m_richEdit == nullptr) {
        m_richEdit = CreateRichEdit(this, kRichEditId);
        m_richEdit->Hide();
        m_logWnd = new CLogWnd(this);
    }
    return m_richEdit->GetParent() == this ? m_richEdit : m_logWnd->Content();
}

const wxTextCtrl* CStatusWnd::ExistingLogControl() const {
    if (m_richEdit == nullptr) {
        return nullptr;
    }
    return m_richEdit->GetParent() == this ? m_richEdit : m_logWnd->Content();
}

void CStatusWnd::ShowLog() {
    GetLogControl();
    if (m_richEdit->GetParent() == this) {
        m_logWnd->Attach(m_richEdit);
    }
    m_logWnd->Show();
    m_logWnd->Raise();
}

void CStatusWnd::ClearLog() {
    if (m_richEdit != nullptr) {
        GetLogControl()->Clear();
    }
}

void CStatusWnd::SetAudioDiscScale() {
    m_bar->SetMarks(kAudioNear, kAudioOver, kAudioMax);
    m_bar->SetTickStep(kAudioTickStep);
    m_bar->SetUnitText(wxString::FromUTF8(g_Language.GetString(kMinuteText)));
}

void CStatusWnd::OnModeChanged(int mode) {
    if (mode == 2) {
        SetAudioDiscScale();
    } else {
        m_bar->SetPlainRange(0, 100);
    }
    m_bar->Refresh(false);
}

int CStatusWnd::GetNeededHeight() const {
    const int tallest = std::max(m_bar->PictureHeight(), m_logButton->CellHeight());
    return m_metrics.TopMargin + m_metrics.BottomMargin + tallest;
}

std::string CStatusWnd::DescribeState() const {
    std::string log;
    if (const wxTextCtrl* control = ExistingLogControl()) {
        log = RichEditText(*control);
    }
    std::replace(log.begin(), log.end(), '\n', '|');
    const CapacityBarState bar = m_bar->State();
    return "statustext=" + m_bar->Text().utf8_string() +
           "\nprogress=" + std::to_string(m_bar->Position()) +
           "\ngauge=" + std::to_string(bar.nearMark) + "|" + std::to_string(bar.overMark) + "|" +
           std::to_string(bar.maxMark) + "\nlog=" + log + "\n";
}

void CStatusWnd::OnStatusTimer() {
    IMainHub* hub = GetMainHub();
    if (hub == nullptr) {
        return;
    }
    switch (hub->WorkMode()) {
        case 0:
            // Between runs the text keeps the last run's tally or the selected row's reason.
            if (!hub->IsConvertRunActive()) {
                m_bar->SetPosition(0);
            } else {
                m_bar->SetPosition(Percent(hub->RunDoneSeconds(), hub->RunTotalSeconds()));
                m_bar->SetText(wxString::FromUTF8(hub->RunProgressText()));
            }
            break;
        case 1:
            m_bar->SetPosition(hub->IsRipRunActive()
                                   ? RipPercent(hub->RipDoneSeconds(), hub->RipTotalSeconds())
                                   : 0);
            break;
        case 2:
            break;  // the creator panel moves the gauge itself
        default:
            wxMessageBox(wxString::FromUTF8(g_Language.GetString(kBadWorkMode)),
                         wxString::FromUTF8(GetAppConfig().GetProductStrings().productName),
                         wxOK | wxICON_ERROR, this);
            break;
    }
}

void CStatusWnd::SetStatusText(const std::string& text) {
    UiQueue::Post([self = m_self, text] {
        if (CStatusWnd* panel = self->get()) {
            panel->m_bar->SetText(wxString::FromUTF8(text));
        }
    });
}

void CStatusWnd::Clear() {
    UiQueue::Post([self = m_self] {
        if (CStatusWnd* panel = self->get()) {
            panel->ClearLog();
        }
    });
}

void CStatusWnd::Append(const std::string& text, LogLineKind kind) {
    UiQueue::Post([self = m_self, text, kind] {
        if (CStatusWnd* panel = self->get()) {
            panel->AppendOnUi(text, kind);
        }
    });
}

void CStatusWnd::AppendOnUi(const std::string& text, LogLineKind kind) {
    if (wxTextCtrl* log = GetLogControl()) {
        AppendRun(*log, text, StyleOf(kind));
    }
}

void CStatusWnd::TranslateToolTips() {
    m_logButton->SetToolTip(wxString::FromUTF8(g_Language.GetString(kLogButtonTipId)));
}

void CStatusWnd::OnLanguageChanged() {
    TranslateToolTips();
    TranslateWindow(*this, kDialogId);
    m_bar->SetUnitText(wxString::FromUTF8(g_Language.GetString(kMinuteText)));
    m_bar->Refresh(false);
    if (m_logWnd != nullptr) {
        m_logWnd->OnLanguageChanged();
    }
}

void CStatusWnd::DoRecalcLayout() {
    ImSkinDialog::DoRecalcLayout();
    if (m_bar == nullptr || m_logButton == nullptr) {
        return;
    }
    const wxSize client = GetClientSize();
    const wxRect area(m_metrics.LeftMargin, m_metrics.TopMargin,
                      std::max(0, client.x - m_metrics.LeftMargin - m_metrics.RightMargin),
                      std::max(0, client.y - m_metrics.TopMargin - m_metrics.BottomMargin));
    m_logButton->SetSize(m_logButton->CellSize());
    // Both take the strip's height: the bar's text stands below its picture's top edge.
    LayoutRow(area, 0, m_metrics.HSpacing, m_bar, {m_bar, m_logButton});
}

bool CStatusWnd::OnSkinChanged(const std::string& skinDir) {
    ImSkinDialog::OnSkinChanged(skinDir);
    const char* section = GetSkinSection();
    m_bar->SetBackgroundPicture(LoadKeyedPicture(m_skin, "ProgressBg", section), m_look.bgMode,
                                m_look.bgHSplitter, m_look.bgVSplitter);
    m_bar->SetForePictures(LoadKeyedPicture(m_skin, "ProgressFore", section),
                           LoadKeyedPicture(m_skin, "NearOverflowFore", section),
                           LoadKeyedPicture(m_skin, "OverflowFore", section));
    m_bar->SetTextOffset(m_skin.GetInt("TextOffsetX", 0, section),
                         m_skin.GetInt("TextOffsetY", 0, section));
    m_bar->SetColours(NativeColour(m_skin.GetRgbColour("TextColor", 0, section)),
                      NativeColour(m_skin.GetRgbColour("TrickTextColor", 0, section)),
                      NativeColour(m_skin.GetRgbColour("TrickPenColor", 0, section)));
    SkinFont font = m_skin.GetFont(section);
    if (font.name.empty()) {
        font.name = "MS Shell Dlg";
    }
    m_bar->SetBarFont(MakeSkinFont(font));
    m_logButton->SetPicture(LoadSkinPicture("ShowLog.bmp"));
    m_logButton->SetSize(m_logButton->CellSize());
    RecalcLayout();
    return true;
}

}  // namespace ac
