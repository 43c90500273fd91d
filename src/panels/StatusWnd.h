#pragma once
// CStatusWnd: the strip at the foot of the main dialog's right column. Its bar shows the run's
// progress and the running tool's last line in the convert and rip modes, and the disc's
// capacity gauge in the creator mode; its button opens the log window, which shows the rich
// edit that every writer of the log reaches through GetLogControl.
//
// Thread contract: UI thread only, except SetStatusText, Clear and Append (the IStatusText and
// IProcessLog side), which the child's reader threads call: they copy the text and post it.

#include "convert/EncodeProcess.h"
#include "panels/CapacityBar.h"
#include "skin/SkinDialog.h"

#include <wx/timer.h>
#include <wx/weakref.h>

#include <memory>
#include <string>

class wxTextCtrl;

namespace ac {

class CLogWnd;
class ImButton;

class CStatusWnd : public ImSkinPanel, public IProcessLog, public IStatusText {
public:
    static constexpr int kPanelId = 1031;
    static constexpr int kDialogId = 138;
    static constexpr int kBarId = 1176;
    static constexpr int kLogButtonId = 1028;
    static constexpr int kRichEditId = 1030;
    static constexpr int kTimerId = 102;

    explicit CStatusWnd(wxWindow* parent);
    ~CStatusWnd() override;

    // The log's rich edit: still here, or already handed to the log window; made on the first
    // call.
    wxTextCtrl* GetLogControl();
    // Hands the rich edit to the log window the first time, then shows the window in front.
    void ShowLog();
    void ClearLog();
    CapacityBar* Bar() const { return m_bar; }
    CLogWnd* LogWindow() const { return m_logWnd; }

    // The scale of a work mode: plain 0 to 100 in convert and rip, the audio disc in creator.
    void OnModeChanged(int mode);
    // Top and bottom gaps of the skin plus the taller of bar and button.
    int GetNeededHeight() const;
    // "statustext=...", "progress=N", "log=..." (line breaks of the log as '|'), one a line.
    std::string DescribeState() const;
    // One tick of timer 102: the bar follows the run of the current mode.
    void OnStatusTimer();

    // IStatusText and IProcessLog: any thread.
    void SetStatusText(const std::string& text) override;
    void Clear() override;
    void Append(const std::string& text, LogLineKind kind) override;

    void OnLanguageChanged() override;
    void DoRecalcLayout() override;
    bool OnSkinChanged(const std::string& skinDir) override;

private:
    void AppendOnUi(const std::string& text, LogLineKind kind);
    const wxTextCtrl* ExistingLogControl() const;
    void TranslateToolTips();
    void SetAudioDiscScale();

    CapacityBar* m_bar;
    ImButton* m_logButton;
    wxTextCtrl* m_richEdit = nullptr;
    CLogWnd* m_logWnd = nullptr;
    wxTimer m_timer;
    // Copied by reader threads into their posts; read and cleared on the UI thread only.
    std::shared_ptr<const wxWeakRef<CStatusWnd>> m_self;
};

// Published when the panel starts, cleared when it goes.
extern CStatusWnd* g_StatusWnd;

}  // namespace ac
