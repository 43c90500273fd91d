#pragma once
// The burn mode's side of the main window: the commands of work mode 2 and their enable rules,
// the message boxes with their captions, the waiting and erasing dialogs, the side bar's disc
// fields, the locks of a run, the status panel's gauge and the end of a run. CAudioEncDlg
// routes to it; the rows, the recorders and the driver belong to CCDCreatorPanel.
//
// Thread contract: UI thread only.

#include "burn/ui/CDCreatorPanel.h"

class wxWindow;

namespace ac {

class CBurnMode : public ICreatorModeHost {
public:
    CBurnMode(wxWindow* mainWindow, CCDCreatorPanel& panel);

    bool IsOwnCommand(int commandId) const;
    bool OnCommand(int commandId);
    bool IsCommandEnabled(int commandId);
    bool StopForClose() { return m_panel.StopForClose(); }
    // False once the folder of the burn's temporary files is down to its last 200 MB.
    bool CheckDiskSpace();
    bool IsRunActive() { return m_panel.Driver().BurnActive(); }
    // The tab has come to the front: the status bar becomes the disc's gauge.
    void RefreshGauge() { m_panel.RefreshCapacity(); }
    void SetAfterRunAction(int action) { m_afterRunAction = action; }
    void Erase();

    // ICreatorModeHost
    int MessageBox(const std::string& text, const std::string& caption, long style) override;
    burn::ICdRecorder* WaitForDisc(burn::ICdRecorder* recorder, int code, std::int64_t sectors,
                                   bool showIgnore, bool& ignored) override;
    void EnablePanels(bool enable) override;
    void RunEnded(bool allCopiesWritten) override;
    void SelectionChanged() override;
    const Profile* CurrentProfile() override;
    int DiscTypeItem() override;
    std::string VolumeLabel() override;
    int PauseSeconds() override;
    CapacityBar* Gauge() override;
    void SetStatusText(const std::string& text) override;

private:
    wxWindow* m_mainWindow;
    CCDCreatorPanel& m_panel;
    int m_afterRunAction = 4;
};

}  // namespace ac
