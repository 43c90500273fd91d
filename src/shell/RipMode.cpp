#include "shell/RipMode.h"

#include "panels/ProgramDialogs.h"
#include "panels/StatusWnd.h"
#include "platform/Paths.h"
#include "platform/UiQueue.h"
#include "profile/ui/SideBarWnd.h"
#include "resources/Language.h"
#include "resources/TextFormat.h"
#include "rip/ui/RipTexts.h"
#include "shell/AppConfig.h"
#include "shell/Check.h"
#include "shell/MessageBoxes.h"

#include <wx/menu.h>
#include <wx/msgdlg.h>

namespace ac {

namespace {

constexpr std::uint32_t kNotEnoughSpaceId = 0xC000;

}  // namespace

CRipMode::CRipMode(wxWindow* mainWindow, CDRipDlg& panel) : m_mainWindow(mainWindow), m_panel(panel) {
    m_panel.SetModeHost(this);
    m_afterRunAction = GetAppConfig().GetInt("afterconvert");
}

void CRipMode::CheckDiskSpace() {
    if (m_panel.Driver().IsRunning() &&
        platform::IsLowOnDiskSpace(GetAppConfig().GetString("OutputCDDir"))) {
        m_panel.Driver().StopRip(false);
        AppMessageBox(g_Language.GetString(kNotEnoughSpaceId), wxOK | wxICON_ERROR, m_mainWindow);
    }
}

bool CRipMode::IsOwnCommand(int commandId) const {
    switch (commandId) {
        case ripcmd::kCheckAll:
        case ripcmd::kUncheckAll:
        case ripcmd::kUncheckSelected:
        case ripcmd::kCheckSelected:
        case ripcmd::kSelectAll:
        case ripcmd::kSelectNone:
        case ripcmd::kCddb:
        case ripcmd::kConfigureToAll:
        case ripcmd::kReadLocal:
        case ripcmd::kReadRemote:
        case ripcmd::kReadWinamp:
        case ripcmd::kBatchQuery:
        case ripcmd::kRipChecked:
        case ripcmd::kRipSelected:
        case ripcmd::kStopSelected:
        case ripcmd::kPauseSelected:
        case ripcmd::kStopChecked:
        case ripcmd::kPauseChecked:
        case ripcmd::kUncheckSelect:
        case ripcmd::kCheckSelect:
        case ripcmd::kRenameKey:
        case ripcmd::kRename:
        case ripcmd::kAddDiscImage: return true;
        default:
            return (commandId >= ripcmd::kFirstButtonDrive && commandId <= ripcmd::kLastButtonDrive) ||
                   (commandId >= ripcmd::kFirstMenuDrive && commandId <= ripcmd::kLastMenuDrive);
    }
}

bool CRipMode::OnCommand(int commandId) { return m_panel.OnCommand(commandId); }

bool CRipMode::IsCommandEnabled(int commandId) { return m_panel.IsCommandEnabled(commandId); }

bool CRipMode::StopForClose() { return m_panel.StopForClose(); }

void CRipMode::FillDriveMenu(wxMenu& popup) {
    while (popup.GetMenuItemCount() > 0) popup.Destroy(popup.FindItemByPosition(0));
    const std::vector<std::string> labels = m_panel.DriveLabels();
    for (std::size_t i = 0; i < labels.size(); ++i) {
        const int id = ripcmd::kFirstMenuDrive + static_cast<int>(i);
        if (id > ripcmd::kLastMenuDrive) break;
        wxMenuItem* item = popup.AppendCheckItem(id, wxString::FromUTF8(labels[i]));
        item->Check(static_cast<int>(i) == m_panel.CurrentDrive());
    }
    if (!labels.empty()) popup.AppendSeparator();
    popup.Append(ripcmd::kAddDiscImage, wxString::FromUTF8(g_Language.GetString(riptext::kAddDiscImage) + "..."));
}

double CRipMode::DoneSeconds() const {
    return m_panel.Driver().SecondsDone() + m_panel.Driver().SecondsInTrack();
}

bool CRipMode::AskYesNo(const std::string& text) {
    return AppMessageBox(text, wxYES_NO | wxNO_DEFAULT | wxICON_QUESTION, m_mainWindow) == wxYES;
}

void CRipMode::ShowError(const std::string& text) {
    AppMessageBox(text, wxOK | wxICON_ERROR, m_mainWindow);
}

void CRipMode::EnableTabs(bool enable) {
    if (g_Check != nullptr) g_Check->Enable(enable);
}

void CRipMode::RunFinished(int completed, int failed) {
    if (g_StatusWnd != nullptr) {
        g_StatusWnd->SetStatusText(FormatText(g_Language.GetString(riptext::kRipSummary),
                                              {std::to_string(completed), std::to_string(failed)}));
    }
    AppConfig& config = GetAppConfig();
    if (config.GetInt("playsound") != 0) PlayEndOfRunSound();
    const int action = m_afterRunAction;
    if (action < 0 || action > 3) return;
    // The countdown is modal: it runs after the step that finished the run has returned.
    wxWindow* window = m_mainWindow;
    UiQueue::Post([window, action] { RunAfterRunAction(action, window); });
}

void CRipMode::SelectionChanged(int firstSelectedProfileIndex) {
    if (g_SideBar == nullptr) return;
    if (firstSelectedProfileIndex >= 0) g_SideBar->SelectIndex(firstSelectedProfileIndex, false);
    const std::vector<ParameterSet*> sets = m_panel.SelectedSets();
    g_SideBar->SetSets(sets);
    g_SideBar->FollowSelection(sets);
}

IProcessLog* CRipMode::Log() { return g_StatusWnd; }

IStatusText* CRipMode::Status() { return g_StatusWnd; }

const Profile* CRipMode::CurrentProfile() {
    if (g_SideBar == nullptr) return nullptr;
    const int index = g_SideBar->GetSelectedIndex();
    return index >= 0 ? g_SideBar->GetProfileAt(index) : nullptr;
}

int CRipMode::CurrentProfileIndex() { return g_SideBar != nullptr ? std::max(0, g_SideBar->GetSelectedIndex()) : 0; }

}  // namespace ac
