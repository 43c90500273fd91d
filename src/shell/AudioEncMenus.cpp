// CAudioEncDlg's menus: the mode's menu bar with its skin and language lists, the checks and
// enables of a menu about to open, and the commands that belong to the program rather than to
// a mode (skins, languages, the after-run action, the tray, preferences, help).

#include "panels/FileInfoWnd.h"
#include "panels/ProgramDialogs.h"
#include "resources/Language.h"
#include "rip/ui/RipPanel.h"
#include "shell/AppConfig.h"
#include "shell/AudioEncDlg.h"
#include "shell/BurnMode.h"
#include "shell/Check.h"
#include "shell/ConvertMode.h"
#include "shell/MenuTables.h"
#include "shell/MessageBoxes.h"
#include "shell/Preferences.h"
#include "shell/ProgramIcon.h"
#include "shell/RipMode.h"
#include "skin/ChooseSkinDlg.h"
#include "skin/SkinManager.h"
#include "skin/SkinMenu.h"
#include "skin/WxTranslate.h"

#include <wx/menu.h>
#include <wx/taskbar.h>
#include <wx/utils.h>

namespace ac {

namespace {

// afterconvert keeps 0 shut down, 1 standby, 2 hibernate, 3 exit, 4 none; the menu lists
// No action, Shut Down, Hibernate, Standby, Kill me.
constexpr int kAfterConvertOfCommand[5] = {4, 0, 2, 1, 3};

}  // namespace

void CAudioEncDlg::LoadModeMenu(int mode) {
    std::unique_ptr<ImMenu> menu = BuildModeMenu(mode);
    if (wxMenu* drives = SelectCdRomPopup(*menu); drives != nullptr && m_rip) {
        m_rip->FillDriveMenu(*drives);
    }
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
    // The drives change under the menu (an image added, a disc found in another drive).
    if (m_rip && GetWorkMode() == 1) {
        if (wxMenuItem* entry = menu->FindItem(ripcmd::kAddDiscImage); entry && entry->GetMenu()) {
            m_rip->FillDriveMenu(*entry->GetMenu());
        }
    }
    ApplyEnableRules(*menu);
    if (wxMenuItem* info = menu->FindChildItem(CFileInfoWnd::kCommandId);
        info != nullptr && info->IsCheckable() && g_FileInfoWnd != nullptr) {
        info->Check(g_FileInfoWnd->IsShown());
    }
    for (int id = cmd::kAfterFirst; id <= cmd::kAfterLast; ++id) {
        if (wxMenuItem* item = menu->FindChildItem(id)) {
            item->Check(kAfterConvertOfCommand[id - cmd::kAfterFirst] == m_afterConvert);
        }
    }
}

void CAudioEncDlg::OnLanguageChanged() {
    m_check->OnLanguageChanged();
    for (ImSkinPanel* panel : m_panels) {
        if (panel != nullptr) {
            panel->OnLanguageChanged();
        }
    }
}

void CAudioEncDlg::OnLanguageCommand() {
    LoadModeMenu(GetWorkMode());
    OnLanguageChanged();
    if (g_FileInfoWnd != nullptr) {
        g_FileInfoWnd->OnLanguageChanged();
    }
    // Skins may carry language variants of their pictures and keys.
    g_Skin.SetSkin(g_Skin.GetSkinName());
    Refresh();
}

bool CAudioEncDlg::OnProgramCommand(int id) {
    if (auto skin = m_skinCommands.find(id); skin != m_skinCommands.end()) {
        g_Skin.SetSkin(skin->second);
        LoadModeMenu(GetWorkMode());
        return true;
    }
    if (auto language = m_languageCommands.find(id); language != m_languageCommands.end()) {
        if (g_Language.SelectLanguage(language->second)) {
            GetAppConfig().SetString("language", g_Language.GetLanguageName().c_str());
        }
        OnLanguageCommand();
        return true;
    }
    if (id >= cmd::kAfterFirst && id <= cmd::kAfterLast) {
        m_afterConvert = kAfterConvertOfCommand[id - cmd::kAfterFirst];
        GetAppConfig().SetInt("afterconvert", m_afterConvert);
        if (m_convert) {
            m_convert->SetAfterConvertAction(m_afterConvert);
        }
        if (m_rip) {
            m_rip->SetAfterRunAction(m_afterConvert);
        }
        if (m_burn) {
            m_burn->SetAfterRunAction(m_afterConvert);
        }
        return true;
    }
    switch (id) {
        case cmd::kExit:
            Close();
            return true;
        case cmd::kBackground:
            ToTray();
            return true;
        case cmd::kTrayOpen:
            FromTray();
            return true;
        case cmd::kTrayExit:
            Close();
            return true;
        case cmd::kChooseSkinDialog: {
            ImChooseSkinDlg dialog(this);
            dialog.ShowModal();
            LoadModeMenu(GetWorkMode());
            return true;
        }
        case cmd::kPreferences: {
            CPreferencesSheet sheet(this, [this] { OnPreferencesApplied(); });
            sheet.ShowModal();
            return true;
        }
        case cmd::kContents:
            OpenHelpPage(GetAppConfig().GetBaseDirectory() + "/help/Default.htm", this);
            return true;
        case cmd::kSupport:
            wxLaunchDefaultBrowser("https://velmorant.example/support");
            return true;
        case cmd::kAbout: {
            ShowAboutDialog(this, GetAppConfig().GetBaseDirectory() + "/help/velmorantabout.jpg");
            return true;
        }
        default:
            return false;
    }
}

void CAudioEncDlg::OnPreferencesApplied() {
    m_afterConvert = GetAppConfig().GetInt("afterconvert");
    if (m_convert) {
        m_convert->SetAfterConvertAction(m_afterConvert);
        m_convert->ReloadSettings();
    }
    if (m_rip) {
        m_rip->SetAfterRunAction(m_afterConvert);
    }
    if (g_RipDlg != nullptr) {
        g_RipDlg->ReadSettings();
    }
}

void CAudioEncDlg::ToTray() {
    if (!m_tray) {
        m_tray = MakeTrayIcon(this);
    }
    wxIcon icon;
    icon.CopyFromBitmap(MakeProgramIcon(32));
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

}  // namespace ac
