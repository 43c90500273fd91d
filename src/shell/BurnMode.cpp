#include "shell/BurnMode.h"

#include "burn/ui/DiscDialogs.h"
#include "medialist/ui/OutputPanelWnd.h"
#include "panels/FileAddErrorWnd.h"
#include "panels/ProgramDialogs.h"
#include "panels/StatusWnd.h"
#include "platform/Paths.h"
#include "platform/UiQueue.h"
#include "profile/ui/SideBarWnd.h"
#include "shell/AppConfig.h"
#include "shell/Check.h"
#include "shell/MainHub.h"
#include "shell/MessageBoxes.h"

#include <wx/choice.h>
#include <wx/dirdlg.h>
#include <wx/msgdlg.h>
#include <wx/textctrl.h>

#include <cstdlib>

namespace ac {

CBurnMode::CBurnMode(wxWindow* mainWindow, CCDCreatorPanel& panel)
    : m_mainWindow(mainWindow), m_panel(panel) {
    m_panel.SetModeHost(this);
    m_panel.FillRecorderBox();
    m_afterRunAction = GetAppConfig().GetInt("afterconvert");
    m_panel.RefreshCapacity();
}

bool CBurnMode::CheckDiskSpace() {
    return !platform::IsLowOnDiskSpace(GetAppConfig().GetString("burntemp"));
}

bool CBurnMode::IsOwnCommand(int commandId) const {
    return m_panel.IsOwnCommand(commandId);
}

bool CBurnMode::IsCommandEnabled(int commandId) {
    return m_panel.IsCommandEnabled(commandId);
}

bool CBurnMode::OnCommand(int commandId) {
    if (commandId == burncmd::kAddFolder) {
        if (!m_panel.IsCommandEnabled(commandId))
            return false;
        wxDirDialog dialog(m_mainWindow, "Please select folder", wxEmptyString,
                           wxDD_DIR_MUST_EXIST);
        if (dialog.ShowModal() == wxID_OK)
            m_panel.AddFolder(dialog.GetPath().utf8_string());
        return true;
    }
    if (commandId == burncmd::kErase) {
        if (m_panel.IsCommandEnabled(commandId))
            Erase();
        return true;
    }
    return m_panel.OnCommand(commandId);
}

void CBurnMode::Erase() {
    std::vector<std::pair<std::string, burn::ICdRecorder*>> recorders;
    int selected = 0;
    if (g_OutputPanel != nullptr) {
        wxChoice* box = g_OutputPanel->RecorderBox();
        for (unsigned int i = 0; i < box->GetCount(); ++i) {
            const auto index = reinterpret_cast<std::intptr_t>(box->GetClientData(i));
            const auto& all = m_panel.Recorders();
            recorders.emplace_back(box->GetString(i).utf8_string(),
                                   index >= 0 && index < static_cast<std::intptr_t>(all.size())
                                       ? all[std::size_t(index)].get()
                                       : nullptr);
        }
        selected = box->GetSelection();
    }
    CEraseRewritableDiscDlg dialog(m_mainWindow, std::move(recorders), selected,
                                   [this](const std::string& text, const std::string& caption,
                                          long style) { return MessageBox(text, caption, style); });
    dialog.ShowModal();
}

int CBurnMode::MessageBox(const std::string& text, const std::string& caption, long style) {
    if (BoxesAreScripted() || caption.empty())
        return AppMessageBox(text, style, m_mainWindow);
    return wxMessageBox(wxString::FromUTF8(text), wxString::FromUTF8(caption), style, m_mainWindow);
}

burn::ICdRecorder* CBurnMode::WaitForDisc(burn::ICdRecorder* recorder, int code,
                                          std::int64_t sectors, bool showIgnore, bool& ignored) {
    return ac::WaitForDisc(recorder, code, sectors, showIgnore, m_mainWindow, ignored,
                           [this](const std::string& text, const std::string& caption, long style) {
                               return MessageBox(text, caption, style);
                           });
}

void CBurnMode::EnablePanels(bool enable) {
    // The four locks of a run: the tabs, the side bar's disc controls, the recorder and speed
    // lists; the erase command and dropping follow the panel's own flag.
    if (g_Check != nullptr)
        g_Check->Enable(enable);
    if (g_SideBar != nullptr) {
        for (int id : {sidebar::kDiscType, sidebar::kVolumeName, sidebar::kInterval})
            if (wxWindow* control = g_SideBar->FindWindow(id))
                control->Enable(enable);
    }
    if (g_OutputPanel != nullptr) {
        g_OutputPanel->RecorderBox()->Enable(enable);
        g_OutputPanel->SpeedBox()->Enable(enable);
    }
}

void CBurnMode::RunEnded(bool allCopiesWritten) {
    if (!allCopiesWritten)
        return;
    if (GetAppConfig().GetInt("playsound") != 0)
        PlayEndOfRunSound();
    const int action = m_afterRunAction;
    if (action < 0 || action > 3)
        return;
    wxWindow* window = m_mainWindow;
    UiQueue::Post([window, action] { RunAfterRunAction(action, window); });
}

void CBurnMode::SelectionChanged() {
    if (g_SideBar != nullptr) {
        const std::vector<ParameterSet*> sets = m_panel.SelectedSets();
        g_SideBar->SetSets(sets);
        g_SideBar->FollowSelection(sets);
    }
    // The file information follows the burn list's selection as it follows the convert list's.
    if (IMainHub* hub = GetMainHub()) {
        const int row = m_panel.FirstSelectedRow();
        hub->ShowFileInfo(row >= 0 ? m_panel.Item(row) : nullptr);
    }
    if (g_StatusWnd == nullptr || m_panel.Driver().BurnActive())
        return;
    // Between runs only the selected row's child talks to the status panel and the log, and a
    // failed row says why.
    for (int row = 0; row < m_panel.RowCount(); ++row) {
        if (CEncodeProcess* process = m_panel.Item(row)->process.load())
            process->Link(nullptr, nullptr);
    }
    MediaItem* selected = m_panel.Item(m_panel.FirstSelectedRow());
    if (selected == nullptr)
        return;
    g_StatusWnd->ClearLog();
    const JobStatus status = selected->Status();
    CEncodeProcess* process = selected->process.load();
    if (process != nullptr && status != JobStatus::Idle && status != JobStatus::Waiting &&
        status != JobStatus::UnknownFile) {
        process->Link(g_StatusWnd, g_StatusWnd);
        process->ReplayErrorLines();
        if (status == JobStatus::Failed)
            g_StatusWnd->SetStatusText(process->FailureReason());
    }
    if (status == JobStatus::UnknownFile && !selected->info.probeError.empty())
        g_StatusWnd->SetStatusText(selected->info.probeError);
}

const Profile* CBurnMode::CurrentProfile() {
    return g_SideBar != nullptr ? g_SideBar->GetCurrentProfile() : nullptr;
}

int CBurnMode::DiscTypeItem() {
    return g_SideBar != nullptr ? g_SideBar->GetDiscType() : 0;
}

std::string CBurnMode::VolumeLabel() {
    if (g_SideBar == nullptr)
        return {};
    auto* box = dynamic_cast<wxTextCtrl*>(g_SideBar->FindWindow(sidebar::kVolumeName));
    return box != nullptr ? box->GetValue().utf8_string() : std::string();
}

int CBurnMode::PauseSeconds() {
    auto* list = g_SideBar != nullptr
                     ? dynamic_cast<wxChoice*>(g_SideBar->FindWindow(sidebar::kInterval))
                     : nullptr;
    if (list == nullptr || list->GetSelection() == wxNOT_FOUND)
        return 2;
    return std::atoi(list->GetStringSelection().utf8_string().c_str());
}

CapacityBar* CBurnMode::Gauge() {
    // The bar is the convert and rip modes' progress bar while they are shown: a list edited
    // or a disc type chosen behind them must not paint a disc's scale into it.
    IMainHub* hub = GetMainHub();
    if (hub == nullptr || hub->WorkMode() != 2)
        return nullptr;
    return g_StatusWnd != nullptr ? g_StatusWnd->Bar() : nullptr;
}

void CBurnMode::SetStatusText(const std::string& text) {
    if (g_StatusWnd != nullptr)
        g_StatusWnd->SetStatusText(text);
}

}  // namespace ac
