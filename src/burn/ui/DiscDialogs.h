#pragma once
// The two modal dialogs between the user and a recorder. CWaitingDiscDlg (dialog 145) appears
// when the disc in the recorder will not do: it opens the tray, watches the drive every two
// seconds and ends by itself once a fitting disc is in. CEraseRewritableDiscDlg (dialog 188)
// erases a CD-RW on a worker thread while its bar runs on an estimate.
//
// Thread contract: UI thread, except the erase worker, which reaches the dialog only through a
// posted call that checks the dialog is still there.

#include "burn/Recorder.h"

#include <wx/dialog.h>
#include <wx/timer.h>

#include <atomic>
#include <functional>
#include <memory>
#include <string>
#include <thread>
#include <vector>

class wxButton;
class wxChoice;
class wxGauge;
class wxRadioButton;
class wxStaticText;

namespace ac {

// Shows a message box: text, caption (empty: the product's), wx style; answers wxYES, wxNO...
using DiscMessageBox =
    std::function<int(const std::string& text, const std::string& caption, long style)>;

class CWaitingDiscDlg : public wxDialog {
public:
    static constexpr int kDialogId = 145;
    static constexpr int kIgnoreResult = 1063;

    CWaitingDiscDlg(wxWindow* parent, burn::ICdRecorder* recorder, int code, std::int64_t sectors,
                    bool showIgnore, DiscMessageBox messageBox);
    ~CWaitingDiscDlg() override;

    // The dialog in front, for the test hook; null when none is shown.
    static CWaitingDiscDlg* Shown();
    // title|message|disc type|free|data size|ignore shown
    std::string Describe() const;
    // One check of the drive, as the two-second timer runs it (tests call it at once).
    void CheckNow();

private:
    void SetCode(int code);
    void RefreshFields();
    void OnTimer(wxTimerEvent& event);

    burn::ICdRecorder* m_recorder;
    burn::DiskInfoBlock m_discInfo{};
    int m_mediaType = -1;
    int m_code;
    std::int64_t m_sectors;
    bool m_showIgnore;
    DiscMessageBox m_messageBox;
    wxStaticText* m_message = nullptr;
    wxStaticText* m_discType = nullptr;
    wxStaticText* m_free = nullptr;
    wxStaticText* m_dataSize = nullptr;
    wxTimer m_ejectTimer;
    wxTimer m_checkTimer;
};

// Runs the waiting dialog: the recorder once a fitting disc is in (ignored set after Ignore),
// null after Cancel, which runs the recorder's after-write operation first.
burn::ICdRecorder* WaitForDisc(burn::ICdRecorder* recorder, int code, std::int64_t sectors,
                               bool showIgnore, wxWindow* owner, bool& ignored,
                               DiscMessageBox messageBox);

// "[/dev/sr0] HL-DT-ST ...", "[/dev/sr0] Unknown" for a recorder without a name.
std::string RecorderLabel(const burn::ICdRecorder& recorder);
// "(Empty)", "CD-R" ... "Unsupport disc", in the language.
std::string MediaTypeText(int mediaType);

class CEraseRewritableDiscDlg : public wxDialog {
public:
    static constexpr int kDialogId = 188;

    // recorders: the texts and recorders of the output panel's box, selected: its selection.
    CEraseRewritableDiscDlg(wxWindow* parent,
                            std::vector<std::pair<std::string, burn::ICdRecorder*>> recorders,
                            int selected, DiscMessageBox messageBox);
    ~CEraseRewritableDiscDlg() override;

    static CEraseRewritableDiscDlg* Shown();
    void PressErase(bool full);
    bool Erasing() const { return m_worker.joinable() && !m_done; }
    // selected recorder|erase enabled|bar position|erasing
    std::string Describe() const;

private:
    void OnSelection();
    void OnErase();
    void OnEraseDone();

    std::vector<std::pair<std::string, burn::ICdRecorder*>> m_recorders;
    burn::ICdRecorder* m_recorder = nullptr;
    DiscMessageBox m_messageBox;
    wxChoice* m_box = nullptr;
    wxRadioButton* m_quick = nullptr;
    wxRadioButton* m_full = nullptr;
    wxButton* m_erase = nullptr;
    wxButton* m_cancel = nullptr;
    wxGauge* m_bar = nullptr;
    wxTimer m_stepTimer;
    std::thread m_worker;
    std::atomic<bool> m_done{false};
    std::shared_ptr<CEraseRewritableDiscDlg*> m_alive;
};

}  // namespace ac
