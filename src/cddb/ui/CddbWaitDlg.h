#pragma once
// CCddbWaitDlg: "CDDB Response", the modal dialog that watches a lookup. It starts
// LookupWorker when it opens; the worker talks to the server and reaches the dialog only
// through the UI queue: the current action, each raw reply or failure text for the Message box,
// the choice among several matches (asked here, answered back), and the end. OK is enabled when
// the worker ends; the user reads the message and presses OK. In batch mode a failed record
// ends the pass with OK left disabled, and the user leaves by Cancel.
//
// Cancel closes the dialog at once. The worker is tripped (its connect, its reading and its
// wait for a choice all wake), is never touched again by the closed dialog, and is joined by
// JoinAbandonedLookups, which the rip panel calls when it goes.
//
// Thread contract: UI thread only; the worker's side lives in the .cpp and shares nothing with
// the dialog but a cancel token and the choice, each under its own guard.

#include "cddb/CddbLookup.h"
#include "cddb/DiscInfo.h"
#include "skin/ChooseSkinDlg.h"

#include <chrono>
#include <functional>
#include <memory>
#include <string>
#include <thread>

class wxButton;
class wxStaticText;
class wxTextCtrl;

namespace ac {

struct LookupJob {
    cddb::LookupSettings settings;
    // Reads the disc's table on the worker: a drive may take seconds to answer.
    std::function<bool(cddb::DiscToc&)> readToc;
    bool batchMode = false;
    std::string batchText;    // the whole batch file
    std::string batchFolder;  // where the answers are written
};

class CCddbWaitDlg : public ImDialog {
public:
    static constexpr int kDialogId = 1000;
    static constexpr int kMessageId = 1000;
    static constexpr int kActionId = 1002;
    static constexpr int kActionLabelId = 1219;
    static constexpr int kMessageLabelId = 1220;

    CCddbWaitDlg(wxWindow* parent, LookupJob job);
    ~CCddbWaitDlg() override;

    int ShowModal() override;
    // The lookup's answer; empty unless the worker found a disc.
    const cddb::CDDiscInfo& Record() const { return m_record; }
    bool WorkerDone() const { return m_done; }

    // The open dialog, or null.
    static CCddbWaitDlg* Shown();
    // For the close of the program: ends the open lookup (a choice first, then the lookup
    // itself, cancelled). True when one was open: the close is then refused, and asked for
    // again by the lookup once its dialogs have unwound.
    static bool EndOpenLookup();

    // For the test hook: what the dialog shows, and its buttons pressed.
    std::string Describe() const;
    void PressOk();
    void PressCancel();

    struct Channel;

private:
    void StartWorker();
    void SetAction(const std::string& text);
    void SetMessage(const std::string& text);
    int AskChoice(const std::vector<std::string>& rows);
    void WorkerEnded(bool found, const cddb::CDDiscInfo& record, bool enableOk);

    LookupJob m_job;
    wxStaticText* m_action;
    wxTextCtrl* m_message;
    wxButton* m_ok;
    cddb::CDDiscInfo m_record;
    bool m_done = false;
    // From the dialog's opening to the worker's end, for the benchmarks.
    std::chrono::steady_clock::time_point m_opened;
    double m_lookupMs = 0;
    std::shared_ptr<CCddbWaitDlg*> m_alive;
    std::shared_ptr<Channel> m_channel;
    std::thread m_worker;
};

// Runs the dialog modally: the record on OK, an empty one on Cancel.
void RunLookupDialog(wxWindow* parent, LookupJob job, cddb::CDDiscInfo& out);

// Joins the workers of closed dialogs; with `wait` false only those that have ended.
void JoinAbandonedLookups(bool wait = true);

}  // namespace ac
