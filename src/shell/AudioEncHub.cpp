// CAudioEncDlg as the panels' hub: the selection step, the profile setter, the catalogue's
// messages and the routing of panel calls to the panel of the mode.

#include "convert/RowParameters.h"
#include "medialist/ui/MediaListWnd.h"
#include "panels/FileInfoWnd.h"
#include "panels/StatusWnd.h"
#include "profile/ParameterSet.h"
#include "profile/ui/SideBarWnd.h"
#include "shell/AppConfig.h"
#include "shell/AudioEncDlg.h"
#include "shell/BurnMode.h"
#include "shell/Check.h"
#include "shell/ConvertMode.h"
#include "shell/MenuTables.h"
#include "shell/RipMode.h"
#include "skin/WxTranslate.h"

#include <wx/menu.h>

#include <strings.h>
#include <utility>

namespace ac {

void CAudioEncDlg::PostCommand(int commandId) {
    CallAfter([this, commandId] { DispatchCommand(commandId); });
}

void CAudioEncDlg::DispatchCommand(int id) {
    wxCommandEvent command(wxEVT_MENU, id);
    OnCommand(command);
}

bool CAudioEncDlg::IsCommandEnabled(int commandId) {
    if (GetWorkMode() == 1 && m_rip && m_rip->IsOwnCommand(commandId)) {
        return m_rip->IsCommandEnabled(commandId);
    }
    if (GetWorkMode() == 0 && m_convert && m_convert->IsOwnCommand(commandId)) {
        return m_convert->IsCommandEnabled(commandId);
    }
    if (GetWorkMode() == 2 && m_burn && m_burn->IsOwnCommand(commandId)) {
        return m_burn->IsCommandEnabled(commandId);
    }
    return true;
}

void CAudioEncDlg::ApplyEnableRules(wxMenu& menu) {
    for (wxMenuItem* item : menu.GetMenuItems()) {
        if (item->IsSubMenu()) {
            ApplyEnableRules(*item->GetSubMenu());
        } else if (!item->IsSeparator()) {
            item->Enable(IsCommandEnabled(item->GetId()));
        }
    }
}

void CAudioEncDlg::ShowContextMenu(wxWindow* owner, int menuId) {
    std::unique_ptr<wxMenu> menu = BuildContextMenu(menuId);
    TranslatePopupMenu(*menu, menuId);
    ApplyEnableRules(*menu);
    // The menu's commands travel up from the owner to this window like the bar's do.
    (owner != nullptr ? owner : this)->PopupMenu(menu.get());
}

void CAudioEncDlg::OnListSelectionChanged(int row) {
    const int mode = GetWorkMode();
    if (mode == 0 && g_MediaList != nullptr) {
        // The file information follows the selection: the row that became selected, or with
        // none left the empty page.
        const int shown = row >= 0 ? row : g_MediaList->GetFirstSelected();
        ShowFileInfo(shown >= 0 ? g_MediaList->GetItem(shown) : nullptr);
    } else if (mode == 1) {
        ShowFileInfo(nullptr);  // tracks of a disc carry no probed details
    }
    if (mode != 0 || g_MediaList == nullptr) {
        return;
    }
    if (row < 0) {
        return;
    }
    MediaItem* selected = g_MediaList->GetItem(row);
    // Only the selected row's child talks to the status panel and the log.
    for (MediaItem* item : g_MediaList->Items()) {
        if (CEncodeProcess* process = item->process.load()) {
            process->Link(nullptr, nullptr);
        }
    }
    if (g_StatusWnd != nullptr) {
        g_StatusWnd->SetStatusText(std::string());
        g_StatusWnd->ClearLog();
    }
    if (selected != nullptr) {
        CEncodeProcess* process = selected->process.load();
        const JobStatus status = selected->Status();
        if (process != nullptr && g_StatusWnd != nullptr) {
            if (status != JobStatus::Idle && status != JobStatus::Waiting &&
                status != JobStatus::UnknownFile) {
                process->Link(g_StatusWnd, g_StatusWnd);
            }
            process->ReplayErrorLines();
        }
        ShowRowReason(*selected);
    }
    if (g_MediaList->SelectedSets().size() < 2) {
        HandOverSelectedSets();
    } else if (!m_selectionTimer.IsRunning()) {
        m_selectionTimer.StartOnce(500);
    }
}

// A failed or unreadable row says why where the user looks first: the status text, and the log
// behind the button beside it.
void CAudioEncDlg::ShowRowReason(MediaItem& item) {
    if (g_StatusWnd == nullptr) {
        return;
    }
    const JobStatus status = item.Status();
    if (status == JobStatus::UnknownFile && !item.info.probeError.empty()) {
        g_StatusWnd->Append(item.info.probeError + "\n", LogLineKind::Error);
        g_StatusWnd->SetStatusText(item.info.probeError);
    } else if (status == JobStatus::Failed) {
        if (CEncodeProcess* process = item.process.load()) {
            g_StatusWnd->SetStatusText(process->FailureReason());
        }
    }
}

void CAudioEncDlg::HandOverSelectedSets() {
    if (g_SideBar != nullptr) {
        g_SideBar->SetSets(SelectedSets());
    }
}

void CAudioEncDlg::UpdateGridEditable() {
    if (g_SideBar == nullptr || g_MediaList == nullptr) {
        return;
    }
    // Convert mode: something selected and none of it running, paused or pending.
    bool editable = false;
    if (GetWorkMode() == 0) {
        const std::vector<MediaItem*> items = g_MediaList->Items();
        for (int row = 0; row < static_cast<int>(items.size()); ++row) {
            if (!g_MediaList->IsSelected(row)) {
                continue;
            }
            const JobStatus status = items[std::size_t(row)]->Status();
            if (status == JobStatus::Running || status == JobStatus::Paused ||
                status == JobStatus::Pending) {
                editable = false;
                break;
            }
            editable = true;
        }
    } else if (GetWorkMode() == 1) {
        editable = g_RipDlg != nullptr && g_RipDlg->IsDiscLoaded() && !g_RipDlg->Driver().IsRunning();
    } else {
        editable = g_CreatorPanel != nullptr && g_CreatorPanel->SelectionEditable();
    }
    if (editable != m_gridEditable) {
        m_gridEditable = editable;
        g_SideBar->SetGridEditable(editable);
    }
}

void CAudioEncDlg::SetStatusText(const std::string& text) {
    if (g_StatusWnd != nullptr) {
        g_StatusWnd->SetStatusText(text);
    }
}

void CAudioEncDlg::SetBitRateAllowed(bool allowed) {
    if (g_SideBar != nullptr) {
        g_SideBar->SetBitRateAllowed(allowed);
    }
}

void CAudioEncDlg::ShowFileInfo(MediaItem* item) {
    if (g_FileInfoWnd != nullptr) {
        g_FileInfoWnd->SetItem(item != nullptr ? &item->info : nullptr);
    } else if (item != nullptr) {
        m_fileInfo = item->info;
    } else {
        m_fileInfo.reset();
    }
}

bool CAudioEncDlg::IsBitRateFree(const std::string& extension) {
    for (const char* lossless : {"wav", "flac", "ape", "au"}) {
        if (strcasecmp(extension.c_str(), lossless) == 0) {
            return true;
        }
    }
    return false;
}

void CAudioEncDlg::ApplyProfile(Profile& profile) {
    if (GetWorkMode() == 1) {
        if (g_RipDlg != nullptr && g_SideBar != nullptr) {
            g_RipDlg->ApplyProfile(profile, g_SideBar->GetSelectedIndex());
        }
    } else if (GetWorkMode() == 2) {
        if (g_CreatorPanel != nullptr) {
            g_CreatorPanel->ApplyProfile(profile);
        }
    } else if (g_MediaList != nullptr) {
        g_MediaList->ApplyProfile(profile);
    }
    if (g_SideBar == nullptr) {
        return;
    }
    g_SideBar->SetCurrentProfile(&profile);
    const std::vector<ParameterSet*> sets = SelectedSets();
    g_SideBar->SetSets(sets);
    g_SideBar->FollowSelection(sets);
}

void CAudioEncDlg::OnProfileChosen(int index) {
    if (g_SideBar == nullptr) {
        return;
    }
    Profile* profile = g_SideBar->GetProfileAt(index);
    if (profile == nullptr) {
        return;
    }
    ApplyProfile(*profile);
    if (IsBitRateFree(profile->GetExtName())) {
        g_SideBar->SetBitRateAllowed(false);
    }
}

void CAudioEncDlg::OnCatalogueLoaded() {
    if (g_SideBar == nullptr || m_check == nullptr) {
        return;
    }
    const int mode = GetWorkMode();
    if (mode == 2) {
        for (int i = 0; i < g_SideBar->GetProfileCount(); ++i) {
            Profile* profile = g_SideBar->GetProfileAt(i);
            if (profile != nullptr && profile->IsSysProfile() &&
                strcasecmp(profile->GetExtName().c_str(), "wav") == 0) {
                g_SideBar->SelectIndex(i, true);
                break;
            }
        }
    }
    AppConfig& config = GetAppConfig();
    const std::string convertPath = config.GetString("last_profile_path");
    std::string ripPath = config.GetString("lastcd_profile_path");
    if (ripPath.empty()) {
        ripPath = convertPath;
    }
    if (const int index = g_SideBar->FindProfileByPath(convertPath); index >= 0) {
        m_check->m_profileIndex[0] = index;
    }
    if (const int index = g_SideBar->FindProfileByPath(ripPath); index >= 0) {
        m_check->m_profileIndex[1] = index;
    }
    if (mode == 0 || mode == 1) {
        g_SideBar->SelectIndex(m_check->m_profileIndex[static_cast<std::size_t>(mode)], false);
    }
    // The side bar may now want more room for its longest profile name.
    RecalcLayout();
    if (!m_pendingOpen.empty()) {
        OpenFiles(std::exchange(m_pendingOpen, {}));
    }
}

std::vector<ParameterSet*> CAudioEncDlg::SelectedSets() {
    if (GetWorkMode() == 0 && g_MediaList != nullptr) {
        return g_MediaList->SelectedSets();
    }
    if (GetWorkMode() == 1 && g_RipDlg != nullptr) {
        return g_RipDlg->SelectedSets();
    }
    if (GetWorkMode() == 2 && g_CreatorPanel != nullptr) {
        return g_CreatorPanel->SelectedSets();
    }
    return {};
}

void CAudioEncDlg::EditSets(const std::function<void()>& edit) {
    if (GetWorkMode() == 0 && g_MediaList != nullptr) {
        g_MediaList->EditSets(edit);
    } else if (GetWorkMode() == 1 && g_RipDlg != nullptr) {
        g_RipDlg->EditSets(edit);
    } else if (edit) {
        edit();
    }
}

void CAudioEncDlg::SetSelectedVolume(int volume, bool firstOnly) {
    if (GetWorkMode() == 0 && g_MediaList != nullptr) {
        g_MediaList->SetSelectedVolume(volume, firstOnly);
    } else if (GetWorkMode() == 1 && g_RipDlg != nullptr) {
        g_RipDlg->SetSelectedVolume(volume);  // the rip list keeps the percent itself
    }
}

int CAudioEncDlg::RememberedProfileIndex(int mode) {
    if (m_check == nullptr || mode < 0 || mode > 2) {
        return 0;
    }
    return m_check->m_profileIndex[static_cast<std::size_t>(mode)];
}

void CAudioEncDlg::RememberProfileIndex(int mode, int index) {
    if (m_check != nullptr && mode >= 0 && mode <= 2) {
        m_check->m_profileIndex[static_cast<std::size_t>(mode)] = index;
    }
}

bool CAudioEncDlg::IsConvertRunActive() {
    return m_convert && m_convert->Driver() != nullptr && m_convert->Driver()->RunPending();
}

double CAudioEncDlg::RunDoneSeconds() {
    return m_convert && m_convert->Driver() ? m_convert->Driver()->GetRunDoneSeconds() : 0.0;
}

double CAudioEncDlg::RunTotalSeconds() {
    return m_convert && m_convert->Driver() ? m_convert->Driver()->GetRunTotalSeconds() : 0.0;
}

bool CAudioEncDlg::IsRipRunActive() { return m_rip && m_rip->IsRunActive(); }

bool CAudioEncDlg::IsBurnRunActive() { return m_burn && m_burn->IsRunActive(); }

double CAudioEncDlg::RipDoneSeconds() { return m_rip ? m_rip->DoneSeconds() : 0.0; }

double CAudioEncDlg::RipTotalSeconds() { return m_rip ? m_rip->TotalSeconds() : 0.0; }

std::string CAudioEncDlg::RunProgressText() {
    return m_convert ? m_convert->RunProgressText() : std::string();
}

}  // namespace ac
