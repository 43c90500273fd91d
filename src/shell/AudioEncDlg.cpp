#include "shell/AudioEncDlg.h"

#include "medialist/ui/MediaListWnd.h"
#include "medialist/ui/OutputPanelWnd.h"
#include "panels/ProgramDialogs.h"
#include "panels/StatusWnd.h"
#include "platform/Paths.h"
#include "profile/ui/ParameterGrid.h"
#include "profile/ui/SaveProfileDlg.h"
#include "profile/ui/SideBarWnd.h"
#include "resources/Language.h"
#include "shell/AppConfig.h"
#include "shell/Check.h"
#include "shell/ConvertMode.h"
#include "shell/MenuTables.h"
#include "shell/MessageBoxes.h"
#include "convert/RowParameters.h"
#include "skin/ShutDownDlg.h"
#include "skin/ChooseSkinDlg.h"
#include "skin/ListCtrl.h"
#include "skin/SkinBars.h"
#include "skin/SkinMenu.h"
#include "skin/UiQueueWx.h"
#include "skin/WxTranslate.h"

#include <wx/dcmemory.h>
#include <wx/filename.h>
#include <wx/graphics.h>
#include <wx/msgdlg.h>
#include <wx/textctrl.h>
#include <wx/taskbar.h>
#include <wx/time.h>
#include <wx/utils.h>

#include <algorithm>
#include <sstream>

namespace ac {

CAudioEncDlg* g_MainDlg = nullptr;

namespace {

// Free space below which a burn stops: 200 MB.
constexpr long long kLowDiskBytes = 209715200LL;
constexpr int kPlayerHeight = 280;

// afterconvert keeps 0 shut down, 1 standby, 2 hibernate, 3 exit, 4 none; the menu lists
// No action, Shut Down, Hibernate, Standby, Kill me.
constexpr int kAfterConvertOfCommand[5] = {4, 0, 2, 1, 3};

class CTrayIcon : public wxTaskBarIcon {
public:
    explicit CTrayIcon(CAudioEncDlg* owner) : m_owner(owner) {
        Bind(wxEVT_TASKBAR_LEFT_DCLICK, [this](wxTaskBarIconEvent&) {
            wxCommandEvent open(wxEVT_MENU, cmd::kTrayOpen);
            wxPostEvent(m_owner, open);
        });
        Bind(wxEVT_MENU, [this](wxCommandEvent& event) {
            wxCommandEvent forward(wxEVT_MENU, event.GetId());
            wxPostEvent(m_owner, forward);
        });
    }

protected:
    wxMenu* CreatePopupMenu() override {
        std::unique_ptr<wxMenu> menu = BuildContextMenu(kTrayMenu);
        TranslatePopupMenu(*menu, kTrayMenu);
        return menu.release();
    }

private:
    CAudioEncDlg* m_owner;
};

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
    if (GetMainHub() == this) {
        SetMainHub(nullptr);
    }
    if (g_MainDlg == this) {
        g_MainDlg = nullptr;
    }
}

wxBitmap CAudioEncDlg::MakeIcon(int size) const {
    wxImage image(size, size);
    image.InitAlpha();
    for (int y = 0; y < size; ++y) {
        for (int x = 0; x < size; ++x) {
            image.SetAlpha(x, y, 0);
        }
    }
    wxBitmap bitmap(image);
    wxMemoryDC dc(bitmap);
    std::unique_ptr<wxGraphicsContext> gc(wxGraphicsContext::Create(dc));
    if (gc) {
        const double s = size;
        gc->SetBrush(gc->CreateLinearGradientBrush(0, 0, 0, s, wxColour(0x3B, 0x82, 0xF6),
                                                   wxColour(0x1E, 0x40, 0xAF)));
        gc->SetPen(*wxTRANSPARENT_PEN);
        gc->DrawRoundedRectangle(0, 0, s, s, s * 0.22);
        gc->SetBrush(*wxWHITE_BRUSH);
        gc->DrawEllipse(s * 0.22, s * 0.58, s * 0.26, s * 0.2);
        gc->DrawRectangle(s * 0.42, s * 0.2, s * 0.07, s * 0.48);
        gc->DrawRectangle(s * 0.42, s * 0.2, s * 0.34, s * 0.08);
        gc->DrawRectangle(s * 0.69, s * 0.2, s * 0.07, s * 0.42);
        gc->DrawEllipse(s * 0.5, s * 0.52, s * 0.26, s * 0.2);
    }
    dc.SelectObject(wxNullBitmap);
    return bitmap;
}

void CAudioEncDlg::OnInitDialog() {
    InitialPlacement();
    g_MainDlg = this;
    InstallWxUiQueue();
    if (BoxesAreScripted()) {
        SetProfileMessageHook(
            [this](const std::string& text, long style) { return AppMessageBox(text, style, this); });
    }
    SetMainHub(this);
    wxIconBundle icons;
    for (int size : {16, 32, 48}) {
        wxIcon icon;
        icon.CopyFromBitmap(MakeIcon(size));
        icons.AddIcon(icon);
    }
    SetIcons(icons);
    ShowCaption(true);
    GetSkinMenuBar(true);
    CreatePanels();

    g_Skin.ChooseStartSkin(GetAppConfig().GetString("last_skin"));
    if (ImCaptionBar* caption = GetCaptionBar()) {
        caption->SetSmallIcon(MakeIcon(16));
    }
    int mode = GetAppConfig().GetInt("last_run_function");
    if (mode < 0 || mode > 2) {
        mode = 0;
    }
    LoadModeMenu(mode);
    m_convert = std::make_unique<CConvertMode>(this);
    m_convert->SetWorkMode(mode);
    m_convert->Start();
    ShowModePanel(mode);
    if (g_SideBar != nullptr) {
        g_SideBar->OnWorkModeChanged(mode);
    }
    m_diskTimer.Start(3000);
    RecalcLayout();
}

void CAudioEncDlg::CreatePanels() {
    // Order of creation is the order of skin notices.
    m_check = new CCheck(this);
    m_panels[Status] = new CStatusWnd(this);
    m_panels[Creator] = new ImSkinPanel(this, 1001, "CDCreatorPanel");
    m_panels[SideBar] = new CSideBarWnd(this);
    m_panels[MediaList] = new CMediaListWnd(this);
    m_panels[Output] = new COutputPanelWnd(this);
    m_panels[Player] = new ImSkinPanel(this, 1008, "PlayerPanel");
    m_panels[Rip] = new ImSkinPanel(this, 1063, "CDRip");
    // The context menus of the lists still to come; the media list opens its own.
    const std::pair<Panel, int> contextMenus[] = {{Rip, kRipListContextMenu},
                                                  {Creator, kBurnListContextMenu}};
    for (const auto& [panel, menuId] : contextMenus) {
        m_panels[panel]->Bind(wxEVT_CONTEXT_MENU, [this, menuId = menuId](wxContextMenuEvent&) {
            std::unique_ptr<wxMenu> menu = BuildContextMenu(menuId);
            TranslatePopupMenu(*menu, menuId);
            PopupMenu(menu.get());
        });
    }
    m_panels[Player]->SetSize(-1, kPlayerHeight);
}

int CAudioEncDlg::GetWorkMode() const {
    return m_check != nullptr ? m_check->m_iWork : 0;
}

void CAudioEncDlg::ShowModePanel(int mode) {
    if (g_MediaList != nullptr && mode != 0 && g_MediaList->IsShown()) {
        g_MediaList->OnHidePanel();
    }
    m_panels[MediaList]->Show(mode == 0);
    m_panels[Rip]->Show(mode == 1);
    m_panels[Creator]->Show(mode == 2);
    m_check->ShowMode(mode);
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

void CAudioEncDlg::LoadModeMenu(int mode) {
    std::unique_ptr<ImMenu> menu = BuildModeMenu(mode);
    if (wxMenu* options = OptionsPopup(*menu)) {
        FillSkinMenu(*options->FindItemByPosition(0)->GetSubMenu());
        FillLanguageMenu(*options->FindItemByPosition(1)->GetSubMenu());
    }
    TranslateMenuBar(*menu);
    GetSkinMenuBar(true)->SetMenu(std::move(menu));
    RecalcLayout();
}

void CAudioEncDlg::FillSkinMenu(wxMenu& popup) {
    m_skinCommands.clear();
    g_Skin.Enumerate();
    int id = cmd::kFirstSkin;
    for (int i = 0; i < g_Skin.GetSkinCount() && id <= cmd::kLastSkin; ++i) {
        const std::string dir = g_Skin.GetSkinAt(i);
        ImSkinConfig config(&g_Language);
        if (!config.Load(dir)) {
            continue;
        }
        wxMenuItem* item = popup.AppendCheckItem(id, wxString::FromUTF8(config.GetName()));
        item->Check(wxString::FromUTF8(SkinNameOf(dir))
                        .IsSameAs(wxString::FromUTF8(g_Skin.GetSkinName()), false));
        m_skinCommands[id++] = dir;
    }
}

void CAudioEncDlg::FillLanguageMenu(wxMenu& popup) {
    m_languageCommands.clear();
    for (int i = 0; i < g_Language.GetLanguageCount(); ++i) {
        const std::string name = g_Language.GetLanguageAt(i);
        const int id = cmd::kFirstLanguage + i;
        wxMenuItem* item = popup.AppendCheckItem(id, wxString::FromUTF8(name));
        item->Check(wxString::FromUTF8(name).IsSameAs(
            wxString::FromUTF8(g_Language.GetLanguageName()), false));
        m_languageCommands[id] = name;
    }
}

void CAudioEncDlg::OnInitMenuPopup(wxMenu* menu) {
    ApplyEnableRules(*menu);
    for (int id = cmd::kAfterFirst; id <= cmd::kAfterLast; ++id) {
        if (wxMenuItem* item = menu->FindChildItem(id)) {
            item->Check(kAfterConvertOfCommand[id - cmd::kAfterFirst] == m_afterConvert);
        }
    }
}

void CAudioEncDlg::OnLanguageChanged() {
    m_check->OnLanguageChanged();
    for (ImSkinPanel* panel : m_panels) {
        panel->OnLanguageChanged();
    }
}

void CAudioEncDlg::OnLanguageCommand() {
    LoadModeMenu(GetWorkMode());
    OnLanguageChanged();
    // Skins may carry language variants of their pictures and keys.
    g_Skin.SetSkin(g_Skin.GetSkinName());
    Refresh();
}

bool CAudioEncDlg::OnSkinChanged(const std::string& skinDir) {
    ImSkinConfig skin(&g_Language);
    skin.Load(skinDir);
    m_sideBarWidth = skin.GetInt("Width", 200, "SideBar");
    m_checkRightMargin = skin.GetInt("RightMargin", 5, "Check");
    m_checkGapHeight = skin.GetInt("GapHeight", 27, "Check");
    const bool taken = ImSkinFrame::OnSkinChanged(skinDir);
    m_fileInfoBodyColour = m_skin.GetString("BodyBgColor", "#F3F6FA", "FileInfo");
    return taken;
}

void CAudioEncDlg::RecalcLayout() {
    ImSkinFrame::RecalcLayout();
    if (m_check == nullptr || m_panels[Status] == nullptr) {
        return;
    }
    if (g_OutputPanel != nullptr) {
        m_panels[Output]->SetSize(-1, g_OutputPanel->GetNeededHeight() + 10);
    }
    if (g_StatusWnd != nullptr) {
        m_panels[Status]->SetSize(-1, g_StatusWnd->GetNeededHeight());
    }
    const int sideWidth = m_sideBarWidth;
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
        LayoutRow(column, 1, 0, m_panels[list],
                  {m_panels[list], m_panels[Output], m_panels[Status]});
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
    const int mode = GetWorkMode();
    if (mode == 0) {
        if (m_convert) {
            m_convert->CheckDiskSpace();
        }
        return;
    }
    const std::string path = GetAppConfig().GetString(mode == 2 ? "burntemp" : "OutputCDDir");
    wxLongLong freeBytes;
    if (!path.empty() && wxDirExists(wxString::FromUTF8(path)) &&
        wxGetDiskSpace(wxString::FromUTF8(path), nullptr, &freeBytes) &&
        freeBytes.GetValue() < kLowDiskBytes) {
        // Stopping a run belongs to the mode's panel; with no run there is nothing to stop.
        if (mode == 2) {
            m_diskTimer.Stop();
        }
    }
}

void CAudioEncDlg::ToTray() {
    if (!m_tray) {
        m_tray = std::make_unique<CTrayIcon>(this);
    }
    wxIcon icon;
    icon.CopyFromBitmap(MakeIcon(32));
    m_tray->SetIcon(icon, m_check->Tab(GetWorkMode())->GetLabel());
    m_bInTray = true;
    Hide();
}

void CAudioEncDlg::FromTray() {
    Show();
    Raise();
    if (m_tray) {
        m_tray->RemoveIcon();
    }
    m_bInTray = false;
}

bool CAudioEncDlg::RunStopLogic() {
    // Rip and burn runs come with their panels; only the convert mode can refuse yet.
    m_bCloseAccepted = GetWorkMode() != 0 || !m_convert || m_convert->StopForClose();
    return m_bCloseAccepted;
}

void CAudioEncDlg::OnClose(wxCloseEvent& event) {
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
    if (auto skin = m_skinCommands.find(id); skin != m_skinCommands.end()) {
        g_Skin.SetSkin(skin->second);
        LoadModeMenu(GetWorkMode());
        return;
    }
    if (auto language = m_languageCommands.find(id); language != m_languageCommands.end()) {
        if (g_Language.SelectLanguage(language->second)) {
            GetAppConfig().SetString("language", g_Language.GetLanguageName().c_str());
        }
        OnLanguageCommand();
        return;
    }
    if (id >= cmd::kAfterFirst && id <= cmd::kAfterLast) {
        m_afterConvert = kAfterConvertOfCommand[id - cmd::kAfterFirst];
        GetAppConfig().SetInt("afterconvert", m_afterConvert);
        if (m_convert) {
            m_convert->SetAfterConvertAction(m_afterConvert);
        }
        return;
    }
    // Commands of another mode do nothing when they arrive anyway.
    if (m_convert && m_convert->IsOwnCommand(id)) {
        if (GetWorkMode() == 0) {
            m_convert->OnCommand(id);
        }
        return;
    }
    switch (id) {
        case cmd::kExit:
            Close();
            return;
        case cmd::kBackground:
            ToTray();
            return;
        case cmd::kTrayOpen:
            FromTray();
            return;
        case cmd::kTrayExit:
            Close();
            return;
        case cmd::kChooseSkinDialog: {
            ImChooseSkinDlg dialog(this);
            dialog.ShowModal();
            LoadModeMenu(GetWorkMode());
            return;
        }
        case cmd::kSupport:
            wxLaunchDefaultBrowser("https://velmorant.example/support");
            return;
        case cmd::kAbout: {
            ShowAboutDialog(this, GetAppConfig().GetBaseDirectory() + "/help/velmorantabout.jpg");
            return;
        }
        default:
            // Commands of the list panels arrive here once those panels exist.
            event.Skip();
            return;
    }
}

std::string CAudioEncDlg::DescribeState() const {
    std::ostringstream out;
    const wxRect r = GetRect();
    out << "title=" << GetTitle().utf8_string() << "\n";
    out << "rect=" << r.x << "," << r.y << "," << r.width << "," << r.height << "\n";
    out << "mode=" << GetWorkMode() << "\n";
    static const char* const kNames[PanelCount] = {"MediaList",   "CDCreatorPanel", "OutputPanel",
                                                   "PlayerPanel", "CDRip",          "SideBar",
                                                   "StatusBar"};
    out << "visible=";
    for (int i = 0; i < PanelCount; ++i) {
        if (m_panels[std::size_t(i)] != nullptr && m_panels[std::size_t(i)]->IsShown()) {
            out << kNames[i] << ";";
        }
    }
    out << "\n";
    if (ImMenuBar* bar = const_cast<CAudioEncDlg*>(this)->GetSkinMenuBar(false);
        bar != nullptr && bar->GetMenu() != nullptr) {
        ImMenu* menu = bar->GetMenu();
        out << "menu=" << menu->resourceId << "\n";
        out << "captions=";
        for (const auto& [caption, popup] : menu->tops) {
            out << caption.utf8_string() << "|";
        }
        out << "\n";
        if (wxMenuItem* exit = menu->tops[0].second->FindChildItem(cmd::kExit)) {
            out << "exit=" << exit->GetItemLabel().utf8_string() << "\n";
        }
    }
    out << "tabs=";
    for (int i = 0; i < 3; ++i) {
        out << m_check->Tab(i)->GetLabel().utf8_string()
            << (m_check->Tab(i)->IsEnabled() ? "+" : "-") << "|";
    }
    out << "\n";
    out << "skin=" << g_Skin.GetSkinName() << "\n";
    out << "language=" << g_Language.GetLanguageName() << "\n";
    out << "corners=" << (HasFlag(wxFRAME_SHAPED) ? 1 : 0) << "\n";
    DescribePanels(out);
    out << "firstpaint_ms=" << m_firstPaintMs << "\n";
    out << "resize_ms=" << m_lastBench << "\n";
    return out.str();
}

void CAudioEncDlg::DescribePanels(std::ostream& out) const {
    if (g_MediaList != nullptr) {
        // Tab-separated: a cue track's type and source hold a '|' of their own.
        XListCtrl* list = g_MediaList->List();
        const std::vector<MediaItem*> items = g_MediaList->Items();
        for (int row = 0; row < list->GetItemCount() && row < static_cast<int>(items.size());
             ++row) {
            MediaItem& item = *items[std::size_t(row)];
            out << "row" << row << "=";
            for (int column = 1; column <= 5; ++column) {
                out << list->GetItemText(row, column) << "\t";
            }
            out << (list->GetCheckbox(row, 0) == 1 ? 1 : 0) << "\t"
                << (list->IsSelected(row) ? 1 : 0) << "\t" << item.sourcePath << "\t"
                << static_cast<int>(item.Status()) << "\n";
            if (ParameterSet* set = SetOf(item)) {
                out << "set" << row << "=";
                for (const char* key : {"ab", "ar", "ac", "vol_factor", "acodec"}) {
                    out << key << ":" << set->GetValue(key) << ";";
                }
                out << "volume:" << item.volume.load() << "\n";
            }
        }
    }
    if (g_OutputPanel != nullptr) {
        out << "outdir=" << g_OutputPanel->GetOutputDirectory() << "\n";
    }
    if (g_SideBar != nullptr) {
        out << g_SideBar->DescribeState() << "\n";
    }
    if (g_StatusWnd != nullptr) {
        out << g_StatusWnd->DescribeState() << "\n";
    }
    std::string boxes;
    for (std::string text : ShownBoxes()) {
        std::replace(text.begin(), text.end(), '\n', ' ');
        boxes += text + "|";
    }
    out << "boxes=" << boxes << "\n";
    bool countdown = false;
    for (wxWindow* window : wxTopLevelWindows) {
        if (dynamic_cast<ImShutDownDlg*>(window) != nullptr && window->IsShown()) {
            countdown = true;
        }
    }
    out << "countdown=" << (countdown ? 1 : 0) << "\n";
    out << "running=" << (m_convert && m_convert->Driver() ? m_convert->Driver()->ProcessCount() : 0)
        << "\n";
}

void CAudioEncDlg::RunScriptCommand(const std::string& line) {
    std::istringstream in(line);
    std::string verb;
    in >> verb;
    std::string rest;
    std::getline(in >> std::ws, rest);
    in.clear();
    in.str(rest);
    if (verb == "add" && g_MediaList != nullptr) {
        g_MediaList->AddFile(rest, -1);
    } else if (verb == "addfolder" && g_MediaList != nullptr) {
        g_MediaList->AddFolder(rest, -1);
    } else if (verb == "outdir" && g_OutputPanel != nullptr) {
        g_OutputPanel->SetDirectoryText(rest);
        g_OutputPanel->CommitDirectory();
    } else if (verb == "answer") {
        QueueBoxAnswer(rest == "no" ? wxNO : wxYES);
    } else if (verb == "dialog") {
        // Presses OK or Cancel of the modal dialog in front; the program's own dialogs keep
        // the resource ids 1 and 2 for them.
        const bool ok = rest == "ok";
        for (wxWindow* window : wxTopLevelWindows) {
            auto* dialog = dynamic_cast<wxDialog*>(window);
            if (dialog == nullptr || !dialog->IsModal()) {
                continue;
            }
            const int okIds[] = {1, wxID_OK};
            const int cancelIds[] = {2, wxID_CANCEL};
            for (int id : ok ? okIds : cancelIds) {
                if (wxWindow* button = dialog->FindWindow(id)) {
                    wxCommandEvent press(wxEVT_BUTTON, id);
                    press.SetEventObject(button);
                    button->GetEventHandler()->ProcessEvent(press);
                    return;
                }
            }
            dialog->EndModal(ok ? wxID_OK : wxID_CANCEL);
            return;
        }
    } else if (verb == "select" && g_MediaList != nullptr) {
        int row = -1;
        in >> row;
        g_MediaList->SelectOnly(row);
    } else if (verb == "grid" && g_SideBar != nullptr) {
        // An edit in the advanced grid, committed as the grid's own editor commits it.
        std::string key;
        std::string value;
        in >> key;
        std::getline(in >> std::ws, value);
        ParameterGrid* grid = g_SideBar->Grid();
        const PropertyIterator item = grid->FindById(FindParameterIndex(key));
        if (item.IsValid()) {
            grid->Select(item);
            grid->CommitEditText(value);
        }
    } else if (verb == "dialogtext") {
        // Types into the first edit field of the modal dialog in front.
        for (wxWindow* window : wxTopLevelWindows) {
            auto* dialog = dynamic_cast<wxDialog*>(window);
            if (dialog == nullptr || !dialog->IsModal()) {
                continue;
            }
            for (wxWindow* child : dialog->GetChildren()) {
                if (auto* edit = dynamic_cast<wxTextCtrl*>(child)) {
                    edit->SetValue(wxString::FromUTF8(rest));
                    break;
                }
            }
            break;
        }
    } else if (verb == "saveas" && g_SideBar != nullptr) {
        g_SideBar->SaveProfile(true);
    } else if (verb == "rename" && g_SideBar != nullptr) {
        g_SideBar->RenameProfile();
    } else if (verb == "delete" && g_SideBar != nullptr) {
        g_SideBar->DeleteProfile();
    } else if (verb == "profile" && g_SideBar != nullptr) {
        int index = 0;
        in >> index;
        g_SideBar->SelectIndex(index, true);
    } else if (verb == "tab") {
        int mode = 0;
        in >> mode;
        SwitchMode(mode);
    } else if (verb == "command") {
        int id = 0;
        in >> id;
        wxCommandEvent command(wxEVT_MENU, id);
        OnCommand(command);
    } else if (verb == "skin") {
        std::string name;
        in >> name;
        for (const auto& [id, dir] : m_skinCommands) {
            if (SkinNameOf(dir) == name) {
                // The command rebuilds the menu and this map: leave the loop first.
                wxCommandEvent command(wxEVT_MENU, id);
                OnCommand(command);
                break;
            }
        }
    } else if (verb == "language") {
        std::string name;
        in >> name;
        for (const auto& [id, language] : m_languageCommands) {
            if (language == name) {
                wxCommandEvent command(wxEVT_MENU, id);
                OnCommand(command);
                break;
            }
        }
    } else if (verb == "move") {
        int x = 0, y = 0, w = 0, h = 0;
        in >> x >> y >> w >> h;
        SetSize(x, y, w, h);
    } else if (verb == "menu") {
        int index = 0;
        std::string key;
        in >> index >> key;
        if (ImMenuBar* bar = GetSkinMenuBar(false)) {
            bar->OpenByIndex(index);
            if (!key.empty() && bar->Popup() != nullptr) {
                // "down" and "right" walk the open popup as the keyboard does.
                for (char c : key) {
                    bar->Popup()->OnKey(c == 'd' ? WXK_DOWN : c == 'r' ? WXK_RIGHT : WXK_UP);
                }
            }
        }
    } else if (verb == "benchresize") {
        // Repaint time after a resize, for bench/skin_bench.sh: each step resizes and paints.
        int steps = 50;
        in >> steps;
        const wxRect start = GetRect();
        const wxLongLong begin = wxGetUTCTimeUSec();
        for (int i = 0; i < steps; ++i) {
            SetSize(start.width + (i % 10) * 12, start.height + (i % 7) * 9);
            Update();
        }
        const double perStep = (wxGetUTCTimeUSec() - begin).ToDouble() / 1000.0 / steps;
        SetSize(start);
        m_lastBench = perStep;
    } else if (verb == "close") {
        Close();
    }
}

}  // namespace ac
