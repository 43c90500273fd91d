#include "shell/AudioEncDlg.h"

#include "burn/ui/CDCreatorPanel.h"
#include "cddb/ui/CddbWaitDlg.h"
#include "medialist/ui/MediaListWnd.h"
#include "medialist/ui/OutputPanelWnd.h"
#include "panels/FileInfoWnd.h"
#include "panels/PlayerWnd.h"
#include "panels/StatusWnd.h"
#include "platform/DiscDevice.h"
#include "profile/ui/SaveProfileDlg.h"
#include "profile/ui/SideBarWnd.h"
#include "resources/Language.h"
#include "rip/ui/RipPanel.h"
#include "shell/AppConfig.h"
#include "shell/BurnMode.h"
#include "shell/Check.h"
#include "shell/ConvertMode.h"
#include "shell/MessageBoxes.h"
#include "shell/PlayerLists.h"
#include "shell/ProgramIcon.h"
#include "shell/RipMode.h"
#include "skin/NativeControls.h"
#include "skin/SkinBars.h"
#include "skin/SkinMenu.h"
#include "skin/UiQueueWx.h"

#include <wx/taskbar.h>
#include <wx/time.h>

#include <algorithm>
#include <sys/stat.h>

namespace ac {

CAudioEncDlg* g_MainDlg = nullptr;

namespace {

constexpr int kPlayerHeight = 280;
constexpr std::uint32_t kFilesRefusedDuringRunId = 0xC185;

}  // namespace

CAudioEncDlg::CAudioEncDlg()
    : ImSkinFrame(wxString::FromUTF8(GetAppConfig().GetProductStrings().productName),
                  kMainDialogId),
      m_diskTimer(this, kDiskTimer),
      m_selectionTimer(this, kSelectionTimer) {
    m_defaultSize = wxSize(840, 634);
    m_minSize = wxSize(840, 634);
    SetSettingsAccess([](const char* key) { return GetAppConfig().GetString(key); },
                      [](const char* key, const std::string& value) {
                          GetAppConfig().SetString(key, value.c_str());
                      });
    AppConfig& config = GetAppConfig();
    ReadStartupKeys(config);
    m_afterConvert = config.GetInt("afterconvert");
    Bind(wxEVT_MENU, &CAudioEncDlg::OnCommand, this);
    Bind(wxEVT_BUTTON, [this](wxCommandEvent& event) {
        if (event.GetId() >= kTabConvert && event.GetId() <= kTabBurn) {
            SwitchMode(event.GetId() - kTabConvert);
        } else {
            event.Skip();
        }
    });
    Bind(wxEVT_CLOSE_WINDOW, &CAudioEncDlg::OnClose, this);
    Bind(wxEVT_TIMER, &CAudioEncDlg::OnTimer, this);
    Bind(wxEVT_PAINT, [this](wxPaintEvent& event) {
        if (m_firstPaintMs == 0) {
            m_firstPaintMs = wxGetUTCTimeMillis().GetValue();
            if (m_afterFirstPaint) {
                CallAfter(std::exchange(m_afterFirstPaint, nullptr));
            }
        }
        event.Skip();
    });
    Bind(wxEVT_IDLE, [this](wxIdleEvent& event) {
        UpdateGridEditable();
        event.Skip();
    });
    Bind(wxEVT_ICONIZE, [this](wxIconizeEvent& event) {
        if (!event.IsIconized()) {
            RecalcLayout();
        }
        event.Skip();
    });
}

CAudioEncDlg::~CAudioEncDlg() {
    if (m_convert) {
        m_convert->Shutdown();
    }
    if (g_RipDlg != nullptr) {
        g_RipDlg->SetModeHost(nullptr);
    }
    if (g_CreatorPanel != nullptr) {
        g_CreatorPanel->SetModeHost(nullptr);
    }
    if (GetMainHub() == this) {
        SetMainHub(nullptr);
    }
    if (g_MainDlg == this) {
        g_MainDlg = nullptr;
    }
}

void CAudioEncDlg::OnInitDialog() {
    ImSkinDialog::HoldLayouts();
    InitialPlacement();
    g_MainDlg = this;
    InstallWxUiQueue();
    if (BoxesAreScripted()) {
        SetProfileMessageHook([this](const std::string& text, long style) {
            return AppMessageBox(text, style, this);
        });
    }
    SetMainHub(this);
    {
        // The boxes' colours are in force before the boxes are made: a style sheet that comes
        // later makes GTK restyle every widget already there.
        const std::string last = GetAppConfig().GetString("last_skin");
        ImSkinConfig start(&g_Language);
        if (start.Load(g_Skin.GetRoot() + "\\" + SkinNameOf(last.empty() ? "Default" : last))) {
            ApplyNativeColours(start);
        }
    }
    ShowCaption(true);
    GetSkinMenuBar(true);
    CreatePanels();

    g_Skin.ChooseStartSkin(GetAppConfig().GetString("last_skin"));
    const wxBitmap smallIcon = MakeProgramIcon(16);
    if (ImCaptionBar* caption = GetCaptionBar()) {
        caption->SetSmallIcon(smallIcon);
    }
    // The window manager's larger icons are not needed to paint the window: they follow it.
    CallAfter([this, smallIcon] {
        wxIconBundle icons;
        for (int size : {16, 32, 48}) {
            wxIcon icon;
            icon.CopyFromBitmap(size == 16 ? smallIcon : MakeProgramIcon(size));
            icons.AddIcon(icon);
        }
        SetIcons(icons);
    });
    int mode = GetAppConfig().GetInt("last_run_function");
    if (mode < 0 || mode > 2) {
        mode = 0;
    }
    EnsureModePanel(mode);  // before the menu: the Rip menu lists the drives
    LoadModeMenu(mode);
    m_convert = std::make_unique<CConvertMode>(this);
    m_convert->SetWorkMode(mode);
    m_convert->Start();
    ShowModePanel(mode);
    if (g_SideBar != nullptr) {
        g_SideBar->OnWorkModeChanged(mode);
    }
    if (g_StatusWnd != nullptr) {
        g_StatusWnd->OnModeChanged(mode);
    }
    if (mode == 2) {
        m_burn->RefreshGauge();
    }
    m_diskTimer.Start(3000);
    RecalcLayout();
    ImSkinDialog::ReleaseLayouts();
}

void CAudioEncDlg::CreatePanels() {
    // Order of creation is the order of skin notices.
    m_check = new CCheck(this);
    m_panels[Status] = new CStatusWnd(this);
    m_panels[SideBar] = new CSideBarWnd(this);
    m_panels[MediaList] = new CMediaListWnd(this);
    m_panels[Output] = new COutputPanelWnd(this);
    auto* player = new CPlayerWnd(this);
    player->SetModeList(0, &ConvertPreviewList());
    player->SetModeList(1, &RipPreviewList());
    player->SetModeList(2, &BurnPreviewList());
    m_panels[Player] = player;
    m_panels[Player]->SetSize(-1, kPlayerHeight);
    // The rip and burn panels and the file information window are made when first needed.
}

// A fifth of the start went into the panels of the two tabs most starts never open, their
// drive and recorder scans included.
void CAudioEncDlg::EnsureModePanel(int mode) {
    ImSkinPanel* made = nullptr;
    if (mode == 1 && m_panels[Rip] == nullptr) {
        auto* rip = new CDRipDlg(this, platform::MakeDiscDevice());
        m_panels[Rip] = made = rip;
        m_rip = std::make_unique<CRipMode>(this, *rip);
        m_rip->SetAfterRunAction(m_afterConvert);
    } else if (mode == 2 && m_panels[Creator] == nullptr) {
        auto* creator = new CCDCreatorPanel(this);
        m_panels[Creator] = made = creator;
        m_burn = std::make_unique<CBurnMode>(this, *creator);
        m_burn->SetAfterRunAction(m_afterConvert);
    }
    if (made == nullptr) {
        return;
    }
    // Behind another tab the panel takes a change of skin when it shows again.
    made->Hide();
    made->DeferSkinWhileHidden();
    g_Skin.DressLateListener(made);
    RecalcLayout();
}

void CAudioEncDlg::EnsureFileInfoWindow() {
    if (g_FileInfoWnd == nullptr) {
        new CFileInfoWnd(this);  // goes with this window
        g_FileInfoWnd->SetItem(m_fileInfo ? &*m_fileInfo : nullptr);
        m_fileInfo.reset();
    }
}

int CAudioEncDlg::GetWorkMode() const {
    return m_check != nullptr ? m_check->m_iWork : 0;
}

void CAudioEncDlg::ShowModePanel(int mode) {
    if (g_MediaList != nullptr && mode != 0 && g_MediaList->IsShown()) {
        g_MediaList->OnHidePanel();
    }
    if (g_RipDlg != nullptr && mode != 1 && g_RipDlg->IsShown()) {
        g_RipDlg->OnHidePanel();
    }
    EnsureModePanel(mode);
    for (Panel list : {MediaList, Rip, Creator}) {
        if (m_panels[list] != nullptr) {
            m_panels[list]->Show(list == (mode == 0 ? MediaList : mode == 1 ? Rip : Creator));
        }
    }
    if (mode != 0) {
        g_Skin.TakeDeferredSkin(m_panels[mode == 1 ? Rip : Creator]);
    }
    m_check->ShowMode(mode);
    if (g_RipDlg != nullptr && mode == 1) {
        g_RipDlg->OnShowPanel();
    }
}

void CAudioEncDlg::SwitchMode(int mode) {
    if (mode < 0 || mode > 2 || mode == GetWorkMode()) {
        return;
    }
    ShowModePanel(mode);
    if (m_convert) {
        m_convert->SetWorkMode(mode);
    }
    OnListSelectionChanged(mode == 0 && g_MediaList != nullptr ? g_MediaList->GetFirstSelected()
                                                               : -1);
    if (g_StatusWnd != nullptr) {
        g_StatusWnd->OnModeChanged(mode);
    }
    if (mode == 2 && m_burn) {
        m_burn->RefreshGauge();
    }
    if (g_SideBar != nullptr && g_SideBar->GetProfileCount() > 0) {
        const int index = m_check->m_profileIndex[static_cast<std::size_t>(mode)];
        if (mode != 2 || g_SideBar->GetSelectedIndex() != index) {
            g_SideBar->SelectIndex(index, true);
        }
    }
    LoadModeMenu(mode);
    if (g_OutputPanel != nullptr) {
        g_OutputPanel->SetMode(mode);  // stores last_run_function
    }
    if (g_SideBar != nullptr) {
        g_SideBar->OnWorkModeChanged(mode);
    }
    if (g_StatusWnd != nullptr) {
        g_StatusWnd->ClearLog();
    }
    if (mode == 0 && g_MediaList != nullptr) {
        g_MediaList->OnShowPanel();
    }
    RecalcLayout();
}

// Entry fields and drop-down lists take the side bar's field and text colours, the ones its
// property grid shows, wherever they stand.
void CAudioEncDlg::ApplyNativeColours(const ImSkinConfig& skin) {
    const int field = skin.GetInt("PropertyBgColor", 255, "SideBar");
    SetNativeControlColours(
        NativeColoursFor(field == 255 ? *wxWHITE : NativeColour(static_cast<std::uint32_t>(field)),
                         NativeColour(skin.GetRgbColour("TextColor", 0, "SideBar"))));
}

bool CAudioEncDlg::OnSkinChanged(const std::string& skinDir) {
    ImSkinConfig skin(&g_Language);
    skin.Load(skinDir);
    m_sideBarWidth = skin.GetInt("Width", 200, "SideBar");
    m_checkRightMargin = skin.GetInt("RightMargin", 5, "Check");
    m_checkGapHeight = skin.GetInt("GapHeight", 27, "Check");
    ApplyNativeColours(skin);
    const bool taken = ImSkinFrame::OnSkinChanged(skinDir);
    m_fileInfoBodyColour = m_skin.GetString("BodyBgColor", "#F3F6FA", "FileInfo");
    return taken;
}

void CAudioEncDlg::DoRecalcLayout() {
    ImSkinFrame::DoRecalcLayout();
    if (m_check == nullptr || m_panels[Status] == nullptr) {
        return;
    }
    if (g_OutputPanel != nullptr) {
        m_panels[Output]->SetSize(-1, g_OutputPanel->GetNeededHeight() + 10);
    }
    if (g_StatusWnd != nullptr) {
        m_panels[Status]->SetSize(-1, g_StatusWnd->GetNeededHeight());
    }
    int sideWidth = m_sideBarWidth;
    if (g_SideBar != nullptr) {
        // A window wider than its smallest size gives the side bar up to half of what it has
        // to spare, enough to show the longest profile name whole.
        const int spare = std::max(0, GetSize().x - GetMinWidth());
        sideWidth =
            std::clamp(g_SideBar->NeededWidth(), m_sideBarWidth, m_sideBarWidth + spare / 2);
    }
    const int rightMargin = m_checkRightMargin;
    const int gapHeight = m_checkGapHeight;
    const wxRect content = GetContentRect();
    const int left = content.x + m_metrics.LeftMargin;
    const int rightX = left + sideWidth + m_metrics.HSpacing;
    const int rightW = std::max(0, content.GetRight() + 1 - rightMargin - rightX);
    m_check->SetSize(rightX, content.y, rightW, gapHeight);
    const wxRect column(rightX, content.y + gapHeight, rightW,
                        std::max(0, content.height - gapHeight - m_metrics.BottomMargin));
    for (Panel list : {MediaList, Rip, Creator}) {
        if (m_panels[list] != nullptr) {
            LayoutRow(column, 1, 0, m_panels[list],
                      {m_panels[list], m_panels[Output], m_panels[Status]});
        }
    }
    const wxRect side(left, content.y + 4, sideWidth,
                      std::max(0, content.height - 4 - m_metrics.BottomMargin));
    LayoutRow(side, 1, 4, m_panels[SideBar], {m_panels[Player], m_panels[SideBar]});
}

void CAudioEncDlg::OnTimer(wxTimerEvent& event) {
    if (event.GetId() == kSelectionTimer) {
        m_selectionTimer.Stop();
        HandOverSelectedSets();
        return;
    }
    if (event.GetId() != kDiskTimer) {
        return;
    }
    // Each mode watches the folder it writes to.
    switch (GetWorkMode()) {
        case 0:
            if (m_convert) {
                m_convert->CheckDiskSpace();
            }
            break;
        case 1:
            if (m_rip) {
                m_rip->CheckDiskSpace();
            }
            break;
        default:
            if (m_burn && !m_burn->CheckDiskSpace()) {
                m_diskTimer.Stop();
            }
            break;
    }
}

bool CAudioEncDlg::RunStopLogic() {
    // A rip keeps running in the background of another tab, so its question comes in any mode.
    m_bCloseAccepted = (GetWorkMode() != 0 || !m_convert || m_convert->StopForClose()) &&
                       (!m_rip || m_rip->StopForClose()) && (!m_burn || m_burn->StopForClose());
    return m_bCloseAccepted;
}

void CAudioEncDlg::OnClose(wxCloseEvent& event) {
    // A lookup's dialogs run nested event loops over this window: they end first, and the
    // lookup asks for the close again once they have unwound.
    if (CCddbWaitDlg::EndOpenLookup() && event.CanVeto()) {
        event.Veto();
        return;
    }
    if (!RunStopLogic() && event.CanVeto()) {
        event.Veto();
        return;
    }
    m_diskTimer.Stop();
    m_selectionTimer.Stop();
    if (m_convert) {
        m_convert->Shutdown();
    }
    if (!IsShown()) {
        Show();
    }
    SaveState();
    if (ImMenuBar* bar = GetSkinMenuBar(false)) {
        bar->DestroyPopups();
    }
    if (m_tray) {
        m_tray->RemoveIcon();
        m_tray.reset();
    }
    Destroy();
}

void CAudioEncDlg::OnCommand(wxCommandEvent& event) {
    const int id = event.GetId();
    if (OnProgramCommand(id)) {
        return;
    }
    // Show File Information serves every mode: the window shows whatever row it was given.
    if (id == CFileInfoWnd::kCommandId) {
        if (IsCommandEnabled(id)) {
            EnsureFileInfoWindow();
            g_FileInfoWnd->ShowInfo(true);
        }
        return;
    }
    if (m_rip && GetWorkMode() == 1 && m_rip->IsOwnCommand(id)) {
        m_rip->OnCommand(id);
        return;
    }
    if (m_burn && GetWorkMode() == 2 && m_burn->IsOwnCommand(id)) {
        m_burn->OnCommand(id);
        return;
    }
    // Commands of another mode do nothing when they arrive anyway.
    if (m_convert && m_convert->IsOwnCommand(id)) {
        if (GetWorkMode() == 0) {
            m_convert->OnCommand(id);
        }
        return;
    }
    if (g_PlayerWnd != nullptr && g_PlayerWnd->OnCommand(id)) {
        return;
    }
    // Commands of the list panels arrive here once those panels exist.
    event.Skip();
}

void CAudioEncDlg::OpenFiles(const std::vector<std::string>& paths) {
    if (IsIconized()) {
        Iconize(false);
    }
    Show();
    Raise();
    if (paths.empty() || g_MediaList == nullptr) {
        return;
    }
    // Rows take the selected profile, which the side bar loads after the window shows.
    if (g_SideBar == nullptr || !g_SideBar->IsLoaded()) {
        m_pendingOpen.insert(m_pendingOpen.end(), paths.begin(), paths.end());
        return;
    }
    if (IsConvertRunActive()) {
        // Rows added under a running driver would change the run the user started.
        SetStatusText(g_Language.GetString(kFilesRefusedDuringRunId));
        return;
    }
    if (GetWorkMode() != 0) {
        SwitchMode(0);
    }
    for (const std::string& path : paths) {
        struct stat info;
        // A folder opens as the Add Folder button opens one: its media files, one level deep.
        if (::stat(path.c_str(), &info) == 0 && S_ISDIR(info.st_mode)) {
            g_MediaList->AddFolder(path, -1);
        } else {
            g_MediaList->AddFile(path, -1);
        }
    }
}

}  // namespace ac
