#pragma once
// The convert mode's side of the main window: the encoding driver, the commands of work mode 0
// and their enable rules, the driver's questions and messages, the end of a run and the disk
// check. CAudioEncDlg routes to it; the rows themselves belong to CMediaListWnd.
//
// Thread contract: UI thread, except the IDriverHost calls the driver makes from its own thread
// (ShowMessage, PostRunFinished) and from a child's waiter (IsConvertMode): those post or read
// atomics only.

#include "convert/EncodingDriver.h"

#include <atomic>
#include <cstdint>
#include <memory>
#include <string>

class wxWindow;

namespace ac {

class CConvertMode : public IDriverHost {
public:
    explicit CConvertMode(wxWindow* mainWindow);
    ~CConvertMode() override;

    // Starts the driver thread; the media list must exist.
    void Start();
    // Ends the driver thread and cuts the rows' children off from it, before the panels go.
    void Shutdown();

    // A command of work mode 0 (menu, context menu or panel button); false when it is not one.
    bool OnCommand(int commandId);
    // The enable rule of a command of work mode 0; true for commands that are not its own.
    bool IsCommandEnabled(int commandId);
    bool IsOwnCommand(int commandId) const;

    // The close request in mode 0: false when the user refused to stop the run.
    bool StopForClose();
    // Timer 111 in mode 0: stops the run when the output volume runs low.
    void CheckDiskSpace();
    void SetWorkMode(int mode) { m_workMode = mode; }
    void SetAfterConvertAction(int action);
    // The limits and the end-of-run sound as the settings now say, for a run under way too.
    void ReloadSettings();

    EncodingDriver* Driver() { return m_driver.get(); }
    // "12 of 40 files converted", for the status bar while a run goes on.
    std::string RunProgressText();
    // "Finished: 38 completed, 2 failed", for the status bar when a run has ended.
    std::string RunSummaryText();

    // IDriverHost
    bool AskYesNo(std::uint32_t textId) override;
    void ShowMessage(const std::string& text, bool isError) override;
    void PostRunFinished() override;
    bool IsConvertMode() override { return m_workMode.load() == 0; }
    void EnableTabStrip(bool enable) override;
    void PlaySound(const std::string& path) override;
    void StartAfterRunAction(int action) override;

private:
    void AddFolderFromDialog();

    wxWindow* m_mainWindow;
    std::unique_ptr<EncodingDriver> m_driver;
    std::atomic<int> m_workMode{0};
    // A liveness token for calls posted from the driver thread.
    std::shared_ptr<CConvertMode*> m_alive;
};

}  // namespace ac
