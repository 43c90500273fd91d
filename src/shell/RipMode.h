#pragma once
// The rip mode's side of the main window: the commands of work mode 1 and their enable rules,
// the questions and messages of a rip, the side bar following the rip list, the status bar's
// rip progress, the end of a run, and the Select CD Rom menu. CAudioEncDlg routes to it; the
// rows, drives and the driver belong to CDRipDlg.
//
// Thread contract: UI thread only. The log and status sinks it hands out are the status
// panel's, which copy and post.

#include "rip/ui/RipPanel.h"

class wxMenu;
class wxWindow;

namespace ac {

class CRipMode : public IRipModeHost {
public:
    CRipMode(wxWindow* mainWindow, CDRipDlg& panel);

    bool IsOwnCommand(int commandId) const;
    bool OnCommand(int commandId);
    bool IsCommandEnabled(int commandId);
    // The close request in mode 1, and any time a run exists: false when the user refused.
    bool StopForClose();
    // Stops a rip, and says why, when the output folder is down to its last 200 MB.
    void CheckDiskSpace();
    void SetAfterRunAction(int action) { m_afterRunAction = action; }
    // Select CD Rom: one entry per drive, the current one checked, then Add Disc Image.
    void FillDriveMenu(wxMenu& popup);

    bool IsRunActive() const { return m_panel.Driver().IsRunning(); }
    double DoneSeconds() const;
    double TotalSeconds() const { return m_panel.CheckedSeconds(); }

    // IRipModeHost
    bool AskYesNo(const std::string& text) override;
    void ShowError(const std::string& text) override;
    void EnableTabs(bool enable) override;
    void RunFinished(int completed, int failed) override;
    void SelectionChanged(int firstSelectedProfileIndex) override;
    IProcessLog* Log() override;
    IStatusText* Status() override;
    const Profile* CurrentProfile() override;
    int CurrentProfileIndex() override;

private:
    wxWindow* m_mainWindow;
    CDRipDlg& m_panel;
    int m_afterRunAction = 4;
};

}  // namespace ac
