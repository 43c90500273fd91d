#pragma once
// The countdown before an after-run action, and the privilege that the action needs.
//
// ImShutDownDlg counts 30 seconds down in tenths and then ends as if OK were pressed; Cancel or
// Esc end it with 2, Enter ends it at once with OK. The period of a tick is 100 ms; the
// environment variable AUDIOCONV_COUNTDOWN_MS, or SetTickPeriodForTests, shortens it so that
// window tests can let a countdown run out.
//
// Thread contract: UI thread only.

#include "skin/ChooseSkinDlg.h"

#include <wx/timer.h>

#include <string>

namespace ac {

class ImLabel;

// The shut-down privilege is held exactly while this object lives. On Linux there is nothing to
// ask for: logind decides at the moment of the request whether the seat's user may power off,
// so both ends do nothing but count, which lets tests see that the object was made.
class ImShutdownPrivilege {
public:
    ImShutdownPrivilege();
    ~ImShutdownPrivilege();
    ImShutdownPrivilege(const ImShutdownPrivilege&) = delete;
    ImShutdownPrivilege& operator=(const ImShutdownPrivilege&) = delete;

    static int Made();
    static int Alive();
};

class ImShutDownDlg : public ImDialog {
public:
    static constexpr int kDialogId = 10003;
    static constexpr int kCancelId = 2;
    static constexpr int kTimeId = 1000;
    static constexpr int kMessageId = 1001;
    static constexpr int kTimeLabelId = 1002;
    static constexpr int kStartTicks = 300;
    static constexpr std::uint32_t kBackground = 0xFCF1E6;  // native order: 0x00BBGGRR

    explicit ImShutDownDlg(wxWindow* parent);
    ~ImShutDownDlg() override;

    void SetShutdownTexts();
    void SetHibernateTexts();
    void SetStandbyTexts();
    void SetExitTexts();
    // The title the window takes when it starts; empty keeps "Shut down".
    void SetTitle(const wxString& title) override;
    // 2 when cancelled; any other answer lets the action run.
    int DoModal();
    // The start of the window: translation, then topmost, font, texts, colour and timer.
    void InitDialog() override;

    // One tick of the countdown.
    void Tick();
    const std::string& Message() const { return m_message; }
    const std::string& TimeLabel() const { return m_timeLabel; }
    const wxString& PendingTitle() const { return m_title; }
    int Ticks() const { return m_ticks; }
    wxString TimeText() const;

    // 0 restores the environment's or the built-in period.
    static void SetTickPeriodForTests(int milliseconds);
    static int TickPeriod();

private:
    void Start();
    void EndWith(int answer);
    void OnKey(wxKeyEvent& event);

    std::string m_message;
    std::string m_timeLabel;
    int m_ticks = kStartTicks;
    wxString m_title;
    wxColour m_bgColor;
    ImLabel* m_messageLabel;
    ImLabel* m_timeLabelLabel;
    ImLabel* m_time;
    wxTimer m_timer;
    bool m_started = false;
    bool m_ended = false;
};

}  // namespace ac
