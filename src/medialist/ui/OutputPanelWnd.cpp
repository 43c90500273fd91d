#include "medialist/ui/OutputPanelWnd.h"

#include "convert/OutputNaming.h"
#include "medialist/MediaListRules.h"
#include "medialist/ui/IconButton.h"
#include "platform/Paths.h"
#include "resources/Language.h"
#include "resources/TextFormat.h"
#include "shell/AppConfig.h"
#include "skin/NativeControls.h"
#include "skin/SkinLabels.h"
#include "skin/WindowTranslation.h"

#include <wx/choice.h>
#include <wx/dirdlg.h>
#include <wx/msgdlg.h>
#include <wx/spinbutt.h>
#include <wx/textctrl.h>
#include <wx/utils.h>

#include <algorithm>

namespace ac {

COutputPanelWnd* g_OutputPanel = nullptr;

namespace {

// Output folders are the user's: made as any folder the user makes (0777 less the umask).
constexpr unsigned kUserFolderMode = 0777;
constexpr int kCopiesMin = 1;
constexpr int kCopiesMax = 100;

// A folder key that reads empty is set back to the default and kept.
std::string ReadFolderKey(AppConfig& config, const char* key) {
    std::string folder = config.GetString(key);
    if (folder.empty()) {
        folder = AppConfig::DefaultString(key);
        config.SetString(key, folder.c_str());
    }
    return folder;
}

void ShowBox(wxWindow* parent, const std::string& text, long style) {
    wxMessageBox(wxString::FromUTF8(text),
                 wxString::FromUTF8(GetAppConfig().GetProductStrings().productName), style,
                 parent);
}

// Labels are as wide as their text, so the directory box gets all that is left.
void FitLabel(ImLabel* label) {
    const wxSize text = label->GetTextExtent(label->GetLabel());
    label->SetSize(text.x + 4, label->GetSize().y);
}

}  // namespace

COutputPanelWnd::COutputPanelWnd(wxWindow* parent)
    : ImSkinPanel(parent, 1005, "OutputPanel", kOutputPanelDialogId) {
    AppConfig& config = GetAppConfig();
    m_showType = config.GetInt("last_run_function");
    CreateControls();
    FollowSkinColoursBelow(this);
    // A folder that cannot be made stays unmade: the driver reports it when a job starts.
    platform::EnsureDirectory(ReadFolderKey(config, "OutputDir"), kUserFolderMode);
    platform::EnsureDirectory(ReadFolderKey(config, "OutputCDDir"), kUserFolderMode);
    m_rowHeight = m_directory->GetSize().y;
    ShowModeFolder();
    g_OutputPanel = this;
    OnLanguageChanged();
}

COutputPanelWnd::~COutputPanelWnd() {
    if (g_OutputPanel == this) {
        g_OutputPanel = nullptr;
    }
}

void COutputPanelWnd::CreateControls() {
    m_destinationLabel = new ImLabel(this, 1033, "Destination:");
    m_directory = new wxTextCtrl(this, 1020, wxEmptyString);
    m_browse = new ImButton(this, 1021, "Browse...");
    m_open = new ImButton(this, 1023, "Open");

    m_directory->Bind(wxEVT_TEXT, [this](wxCommandEvent&) { UpdateDirectoryCopy(); });
    m_directory->Bind(wxEVT_KILL_FOCUS, [this](wxFocusEvent& event) {
        CommitDirectory();
        event.Skip();
    });
    m_browse->Bind(wxEVT_BUTTON, [this](wxCommandEvent&) { Browse(); });
    m_open->Bind(wxEVT_BUTTON, [this](wxCommandEvent&) { OpenFolder(); });
}

void COutputPanelWnd::MakeBurnControls() {
    // Native lists and GTK's spin button are among the dearest controls to make, and only the
    // burn mode shows them: made when that mode first needs them.
    if (m_spin != nullptr) {
        return;
    }
    m_recorderLabel = new ImLabel(this, 1179, "CD Recorder:");
    m_recorder = new wxChoice(this, 1180);
    m_speedLabel = new ImLabel(this, 1183, "Burn Speed:");
    m_speed = new wxChoice(this, 1181);
    m_copiesLabel = new ImLabel(this, 1182, "Burn Copies:");
    m_copies = new wxTextCtrl(this, 1102, wxEmptyString, wxDefaultPosition, wxSize(40, -1));
    m_spin = new wxSpinButton(this, 1184, wxDefaultPosition, wxDefaultSize, wxSP_VERTICAL);
    for (wxWindow* native : std::initializer_list<wxWindow*>{m_recorder, m_speed, m_copies, m_spin}) {
        FollowSkinColours(native);
        native->Hide();
    }
    for (ImLabel* label : {m_recorderLabel, m_speedLabel, m_copiesLabel}) {
        label->Hide();
    }
    const int copies =
        std::clamp(GetAppConfig().GetInt("burncopies"), kCopiesMin, kCopiesMax);
    m_copies->ChangeValue(std::to_string(copies));
    m_spin->SetRange(kCopiesMin, kCopiesMax);
    m_spin->SetValue(copies);
    m_spin->Bind(wxEVT_SPIN, [this](wxSpinEvent& event) {
        m_copies->ChangeValue(std::to_string(event.GetPosition()));
    });
    TranslateBurnLabels();
    TranslateWindow(*this, kOutputPanelDialogId);
    DressBurnLabels();
}

wxChoice* COutputPanelWnd::RecorderBox() {
    MakeBurnControls();
    return m_recorder;
}

wxChoice* COutputPanelWnd::SpeedBox() {
    MakeBurnControls();
    return m_speed;
}

const char* COutputPanelWnd::FolderKey(int mode) {
    return mode == 1 ? "OutputCDDir" : "OutputDir";
}

void COutputPanelWnd::ShowModeFolder() {
    if (m_showType == 0 || m_showType == 1) {
        m_directory->ChangeValue(wxString::FromUTF8(GetAppConfig().GetString(FolderKey(m_showType))));
    }
    UpdateDirectoryCopy();
}

void COutputPanelWnd::UpdateDirectoryCopy() {
    std::string text = m_directory->GetValue().utf8_string();
    std::lock_guard lock(m_directoryMutex);
    m_directoryCopy = std::move(text);
}

std::string COutputPanelWnd::GetOutputDirectory() const {
    std::lock_guard lock(m_directoryMutex);
    return m_directoryCopy;
}

void COutputPanelWnd::SetDirectoryText(const std::string& text) {
    m_directory->ChangeValue(wxString::FromUTF8(text));
    UpdateDirectoryCopy();
}

void COutputPanelWnd::CommitDirectory() {
    const std::string text = TrimOutputDirectory(m_directory->GetValue().utf8_string());
    SetDirectoryText(text);
    if (m_showType == 0 || m_showType == 1) {
        GetAppConfig().SetString(FolderKey(m_showType), text.c_str());
        if (!text.empty()) {
            platform::EnsureDirectory(text, kUserFolderMode);
        }
    }
}

void COutputPanelWnd::Browse() {
    wxDirDialog dialog(this, wxString::FromUTF8(g_Language.GetString(129)), m_directory->GetValue(),
                       wxDD_DEFAULT_STYLE | wxDD_DIR_MUST_EXIST);
    if (dialog.ShowModal() != wxID_OK || dialog.GetPath().empty()) {
        return;
    }
    SetDirectoryText(dialog.GetPath().utf8_string());
    CommitDirectory();
}

std::string COutputPanelWnd::FolderToOpen() const {
    std::string path = m_directory->GetValue().utf8_string();
    if (m_showType != 1 || !m_ripFolder) {
        return path;
    }
    const NamingSettings naming = ReadNamingSettings(GetAppConfig());
    const auto [artist, album] = m_ripFolder();
    for (const std::string& level : {FilterFileName(artist, naming), FilterFileName(album, naming)}) {
        // An empty level names no folder of its own.
        if (!level.empty()) {
            path += (path.ends_with('/') ? "" : "/") + level;
        }
    }
    return path;
}

void COutputPanelWnd::OpenFolder() {
    const std::string path = FolderToOpen();
    if (m_showType == 1) {
        platform::EnsureDirectory(path, kUserFolderMode);
    }
    if (!wxLaunchDefaultApplication(wxString::FromUTF8(path))) {
        ShowBox(this, FormatText(g_Language.GetString(0xC060), {path}), wxOK | wxICON_ERROR);
    }
}

int COutputPanelWnd::GetCopies() const {
    long copies = 0;
    if (m_copies == nullptr) {
        return std::clamp(GetAppConfig().GetInt("burncopies"), kCopiesMin, kCopiesMax);
    }
    if (!m_copies->GetValue().ToLong(&copies)) {
        return kCopiesMin;
    }
    return static_cast<int>(std::clamp<long>(copies, kCopiesMin, kCopiesMax));
}

void COutputPanelWnd::SetMode(int mode) {
    if (mode < 0 || mode > 2) {
        ShowBox(this, g_Language.GetString(0xC061), wxOK | wxICON_ERROR);
        return;
    }
    m_showType = mode;
    GetAppConfig().SetInt("last_run_function", mode);
    ShowModeFolder();
    RecalcLayout();
}

int COutputPanelWnd::GetNeededHeight() const {
    const wxSize tallest = MaxChildSize({1033, 1020, 1021, 1023});
    return m_metrics.TopMargin + m_metrics.BottomMargin + std::max(tallest.y, m_rowHeight);
}

void COutputPanelWnd::OnLanguageChanged() {
    // Back to the built-in words first, so a language without these texts shows English.
    m_destinationLabel->SetLabel("Destination:");
    m_browse->SetLabel("Browse...");
    m_open->SetLabel("Open");
    TranslateBurnLabels();
    TranslateWindow(*this, kOutputPanelDialogId);
    RecalcLayout();
}

void COutputPanelWnd::TranslateBurnLabels() {
    if (m_recorderLabel == nullptr) {
        return;
    }
    m_recorderLabel->SetLabel("CD Recorder:");
    m_speedLabel->SetLabel("Burn Speed:");
    m_copiesLabel->SetLabel("Burn Copies:");
}

void COutputPanelWnd::DressBurnLabels() {
    if (m_recorderLabel == nullptr || m_skin.GetDir().empty()) {
        return;
    }
    const wxFont font = MakeSkinFont(m_skin.GetFont(GetSkinSection()));
    const wxColour text = NativeColour(m_skin.GetRgbColour("TextColor", 0, GetSkinSection()));
    for (ImLabel* label : {m_recorderLabel, m_speedLabel, m_copiesLabel}) {
        label->SetFont(font);
        label->SetTextColour(text);
        label->SetBgColor(m_look.childBg);
    }
}

bool COutputPanelWnd::OnSkinChanged(const std::string& skinDir) {
    ImSkinPanel::OnSkinChanged(skinDir);
    const char* section = GetSkinSection();
    const wxFont font = MakeSkinFont(m_skin.GetFont(section));
    const wxColour text = NativeColour(m_skin.GetRgbColour("TextColor", 0, section));
    wxColour colours[4];
    static const char* const kColourKeys[4] = {"TextColorUp", "TextColorDown", "TextColorActive",
                                               "TextColorDisabled"};
    for (int i = 0; i < 4; ++i) {
        colours[i] = NativeColour(m_skin.GetRgbColour(kColourKeys[i], 0, section));
    }
    m_destinationLabel->SetFont(font);
    m_destinationLabel->SetTextColour(text);
    m_destinationLabel->SetBgColor(m_look.childBg);
    DressBurnLabels();
    for (ImButton* button : {m_browse, m_open}) {
        button->SetPicture(LoadSkinPicture("OutputBtn.bmp"));
        button->SetFont(font);
        button->SetTextColours(colours);
    }
    RecalcLayout();
    return true;
}

void COutputPanelWnd::DoRecalcLayout() {
    ImSkinDialog::DoRecalcLayout();
    if (m_directory == nullptr) {
        return;
    }
    const bool burn = m_showType == 2;
    if (burn) {
        MakeBurnControls();
    }
    const wxSize client = GetClientSize();
    const int height = m_rowHeight;
    const wxRect row(m_metrics.LeftMargin, std::max(0, (client.y - height) / 2),
                     std::max(0, client.x - m_metrics.LeftMargin - m_metrics.RightMargin), height);
    for (wxWindow* w : {static_cast<wxWindow*>(m_destinationLabel), static_cast<wxWindow*>(m_directory),
                        static_cast<wxWindow*>(m_browse), static_cast<wxWindow*>(m_open)}) {
        w->Show(!burn);
    }
    for (wxWindow* w : {static_cast<wxWindow*>(m_recorderLabel), static_cast<wxWindow*>(m_recorder),
                        static_cast<wxWindow*>(m_speedLabel), static_cast<wxWindow*>(m_speed),
                        static_cast<wxWindow*>(m_copiesLabel), static_cast<wxWindow*>(m_copies),
                        static_cast<wxWindow*>(m_spin)}) {
        if (w != nullptr) {
            w->Show(burn);
        }
    }
    for (ImLabel* label : {m_destinationLabel, m_recorderLabel, m_speedLabel, m_copiesLabel}) {
        if (label != nullptr) {
            FitLabel(label);
        }
    }
    for (ImButton* button : {m_browse, m_open}) {
        FitIconButton(*button, height);
    }
    const int gap = m_metrics.HSpacing;
    if (burn) {
        m_speed->SetSize(90, -1);
        LayoutRow(row, 0, gap, m_recorder,
                  {m_recorderLabel, m_recorder, m_speedLabel, m_speed, m_copiesLabel, m_copies, m_spin});
        // GTK's spin button is never shorter than its theme allows and warns at every layout
        // that tries: it keeps its own height, centred on the row.
        const int spinHeight = std::max(height, m_spin->GetBestSize().y);
        const wxRect spin = m_spin->GetRect();
        m_spin->SetSize(spin.x, spin.y + (spin.height - spinHeight) / 2, spin.width, spinHeight);
    } else {
        LayoutRow(row, 0, gap, m_directory, {m_destinationLabel, m_directory, m_browse, m_open});
    }
}

}  // namespace ac
