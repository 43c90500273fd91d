#include "cddb/ui/CddbWaitDlg.h"

#include "cddb/ui/CddbSelectDlg.h"
#include "platform/UiQueue.h"

#include <wx/button.h>
#include <wx/sizer.h>
#include <wx/stattext.h>
#include <wx/textctrl.h>
#include <wx/toplevel.h>

#include <atomic>
#include <condition_variable>
#include <mutex>
#include <vector>

namespace ac {

// What the dialog and its worker share: the cancel token, the answer to a choice, and whether
// the worker has ended.
struct CCddbWaitDlg::Channel {
    cddb::CddbCancel cancel;
    std::atomic<bool> ended{false};
    std::mutex mutex;
    std::condition_variable answered;
    bool hasChoice = false;
    int choice = 0;

    void Answer(int value) {
        {
            std::lock_guard lock(mutex);
            hasChoice = true;
            choice = value;
        }
        answered.notify_all();
    }
    void Cancel() {
        cancel.Cancel();
        std::lock_guard lock(mutex);
        answered.notify_all();
    }
    // The user's row, or the first when the lookup was cancelled meanwhile.
    int Wait() {
        std::unique_lock lock(mutex);
        answered.wait(lock, [this] { return hasChoice || cancel.IsCancelled(); });
        const int value = hasChoice ? choice : 0;
        hasChoice = false;
        return value;
    }
};

namespace {

constexpr int kOkId = 1;
constexpr int kCancelId = 2;
CCddbWaitDlg* s_shown = nullptr;
// The program asked to close while a lookup was open: it closes again once the lookup's
// nested event loops have unwound.
bool s_closeRequested = false;

std::mutex s_abandonedMutex;
struct Abandoned {
    std::thread thread;
    std::shared_ptr<CCddbWaitDlg::Channel> channel;
};
std::vector<Abandoned> s_abandoned;

// The worker's view of the dialog: every call is posted, and dropped when the dialog is gone.
class PostingObserver : public cddb::ILookupObserver {
public:
    PostingObserver(std::weak_ptr<CCddbWaitDlg*> alive,
                    std::shared_ptr<CCddbWaitDlg::Channel> channel,
                    std::function<void(CCddbWaitDlg&, const std::string&)> setAction,
                    std::function<void(CCddbWaitDlg&, const std::string&)> setMessage,
                    std::function<int(CCddbWaitDlg&, const std::vector<std::string>&)> ask)
        : m_alive(std::move(alive)),
          m_channel(std::move(channel)),
          m_setAction(std::move(setAction)),
          m_setMessage(std::move(setMessage)),
          m_ask(std::move(ask)) {}

    void ShowAction(const std::string& text) override { Post(m_setAction, text); }
    void ShowMessage(const std::string& text) override { Post(m_setMessage, text); }
    int ChooseMatch(const std::vector<std::string>& rows) override {
        UiQueue::Post([alive = m_alive, channel = m_channel, ask = m_ask, rows] {
            int choice = 0;
            if (auto dialog = alive.lock(); dialog && *dialog && !channel->cancel.IsCancelled()) {
                choice = ask(**dialog, rows);
            }
            channel->Answer(choice);
        });
        return m_channel->Wait();
    }

private:
    void Post(const std::function<void(CCddbWaitDlg&, const std::string&)>& call,
              const std::string& text) {
        UiQueue::Post([alive = m_alive, call, text] {
            if (auto dialog = alive.lock(); dialog && *dialog)
                call(**dialog, text);
        });
    }

    std::weak_ptr<CCddbWaitDlg*> m_alive;
    std::shared_ptr<CCddbWaitDlg::Channel> m_channel;
    std::function<void(CCddbWaitDlg&, const std::string&)> m_setAction;
    std::function<void(CCddbWaitDlg&, const std::string&)> m_setMessage;
    std::function<int(CCddbWaitDlg&, const std::vector<std::string>&)> m_ask;
};

// The box shows text: a NUL byte of a broken reply would cut it short.
wxString BoxText(std::string text) {
    for (char& c : text) {
        if (c == '\0')
            c = ' ';
    }
    return wxString::FromUTF8(text);
}

}  // namespace

CCddbWaitDlg::CCddbWaitDlg(wxWindow* parent, LookupJob job)
    : ImDialog(parent, kDialogId, "CDDB Response"),
      m_job(std::move(job)),
      m_alive(std::make_shared<CCddbWaitDlg*>(this)),
      m_channel(std::make_shared<Channel>()) {
    auto* actionRow = new wxBoxSizer(wxHORIZONTAL);
    actionRow->Add(new wxStaticText(this, kActionLabelId, "Current Action:"), 0,
                   wxRIGHT | wxALIGN_CENTER_VERTICAL, 6);
    m_action = new wxStaticText(this, kActionId, wxEmptyString, wxDefaultPosition, wxSize(300, -1),
                                wxST_NO_AUTORESIZE);
    actionRow->Add(m_action, 1, wxALIGN_CENTER_VERTICAL);
    m_message = new wxTextCtrl(this, kMessageId, wxEmptyString, wxDefaultPosition, wxSize(460, 220),
                               wxTE_MULTILINE | wxTE_READONLY | wxTE_DONTWRAP);
    m_ok = new wxButton(this, kOkId, "OK");
    auto* buttons = new wxBoxSizer(wxHORIZONTAL);
    buttons->AddStretchSpacer();
    buttons->Add(m_ok, 0, wxRIGHT, 6);
    buttons->Add(new wxButton(this, kCancelId, "Cancel"), 0);
    auto* all = new wxBoxSizer(wxVERTICAL);
    all->Add(actionRow, 0, wxEXPAND | wxALL, 10);
    all->Add(new wxStaticText(this, kMessageLabelId, "Message:"), 0, wxLEFT | wxRIGHT, 10);
    all->Add(m_message, 1, wxEXPAND | wxALL, 10);
    all->Add(buttons, 0, wxEXPAND | wxLEFT | wxRIGHT | wxBOTTOM, 10);
    SetSizerAndFit(all);
    SetEscapeId(kCancelId);
    m_ok->Disable();
    Bind(
        wxEVT_BUTTON, [this](wxCommandEvent&) { PressOk(); }, kOkId);
    Bind(
        wxEVT_BUTTON, [this](wxCommandEvent&) { PressCancel(); }, kCancelId);
    Bind(wxEVT_CLOSE_WINDOW, [this](wxCloseEvent&) { PressCancel(); });
    InitDialog();
    CentreOnParent();
}

CCddbWaitDlg::~CCddbWaitDlg() {
    // Posted calls that arrive from now on find no dialog.
    *m_alive = nullptr;
    m_channel->Cancel();
    if (s_shown == this)
        s_shown = nullptr;
    if (m_worker.joinable()) {
        std::lock_guard lock(s_abandonedMutex);
        s_abandoned.push_back({std::move(m_worker), m_channel});
    }
    JoinAbandonedLookups(false);
}

int CCddbWaitDlg::ShowModal() {
    m_record.Clear();
    m_ok->Disable();
    m_opened = std::chrono::steady_clock::now();
    StartWorker();
    CCddbWaitDlg* outer = s_shown;
    s_shown = this;
    const int answer = ImDialog::ShowModal();
    s_shown = outer;
    return answer;
}

CCddbWaitDlg* CCddbWaitDlg::Shown() {
    return s_shown;
}

bool CCddbWaitDlg::EndOpenLookup() {
    if (s_shown == nullptr)
        return false;
    s_closeRequested = true;
    // Only the innermost loop may end: a choice open over the dialog goes first, and the
    // dialog follows when the choice has returned.
    if (CCddbSelectDlg* select = CCddbSelectDlg::Shown()) {
        select->EndModal(wxID_CANCEL);
    } else {
        s_shown->PressCancel();
    }
    return true;
}

void CCddbWaitDlg::PressOk() {
    if (!m_ok->IsEnabled() || !IsModal())
        return;
    EndModal(wxID_OK);
}

void CCddbWaitDlg::PressCancel() {
    m_channel->Cancel();
    if (IsModal())
        EndModal(wxID_CANCEL);
}

void CCddbWaitDlg::SetAction(const std::string& text) {
    m_action->SetLabel(BoxText(text));
}

void CCddbWaitDlg::SetMessage(const std::string& text) {
    m_message->ChangeValue(BoxText(text));
}

int CCddbWaitDlg::AskChoice(const std::vector<std::string>& rows) {
    CCddbSelectDlg select(this, rows);
    select.ShowModal();
    if (s_closeRequested)
        PressCancel();
    return select.Chosen();
}

void CCddbWaitDlg::WorkerEnded(bool found, const cddb::CDDiscInfo& record, bool enableOk) {
    m_done = true;
    m_lookupMs =
        std::chrono::duration<double, std::milli>(std::chrono::steady_clock::now() - m_opened).count();
    if (found)
        m_record = record;
    if (m_worker.joinable())
        m_worker.join();
    m_ok->Enable(enableOk);
}

// LookupWorker: the lookup of the disc, or the batch pass over the records.
void CCddbWaitDlg::StartWorker() {
    JoinAbandonedLookups(false);
    m_done = false;
    std::weak_ptr<CCddbWaitDlg*> alive = m_alive;
    std::shared_ptr<Channel> channel = m_channel;
    m_worker = std::thread([alive, channel, job = m_job] {
        PostingObserver observer(
            alive, channel,
            [](CCddbWaitDlg& dialog, const std::string& text) { dialog.SetAction(text); },
            [](CCddbWaitDlg& dialog, const std::string& text) { dialog.SetMessage(text); },
            [](CCddbWaitDlg& dialog, const std::vector<std::string>& rows) {
                return dialog.AskChoice(rows);
            });
        cddb::CDDiscInfo record;
        bool found = false;
        bool enableOk = true;
        if (job.batchMode) {
            const cddb::BatchPassResult pass = cddb::RunBatchPass(
                job.settings, job.batchText, job.batchFolder, observer, &channel->cancel);
            enableOk = pass.complete;
        } else {
            cddb::DiscToc toc;
            // A table that cannot be read ends the lookup with no message.
            found = job.readToc && job.readToc(toc) &&
                    cddb::LookupDisc(job.settings, toc, observer, &channel->cancel, record);
        }
        channel->ended = true;
        UiQueue::Post([alive, found, record, enableOk] {
            if (auto dialog = alive.lock(); dialog && *dialog)
                (*dialog)->WorkerEnded(found, record, enableOk);
        });
    });
}

std::string CCddbWaitDlg::Describe() const {
    std::string message = m_message->GetValue().utf8_string();
    for (char& c : message) {
        if (c == '\n' || c == '\r')
            c = ' ';
    }
    return "cddbaction=" + m_action->GetLabel().utf8_string() + "\ncddbmessage=" + message +
           "\ncddbok=" + (m_ok->IsEnabled() ? "1" : "0") + "\ncddbdone=" + (m_done ? "1" : "0") +
           "\ncddbms=" + std::to_string(m_lookupMs) + "\n";
}

void RunLookupDialog(wxWindow* parent, LookupJob job, cddb::CDDiscInfo& out) {
    {
        CCddbWaitDlg dialog(parent, std::move(job));
        if (dialog.ShowModal() == wxID_OK) {
            out = dialog.Record();
            out.Fit();
        } else {
            out.Clear();
        }
    }
    if (s_closeRequested && s_shown == nullptr) {
        s_closeRequested = false;
        if (wxWindow* top = wxGetTopLevelParent(parent))
            top->CallAfter([top] { top->Close(); });
    }
}

void JoinAbandonedLookups(bool wait) {
    std::vector<Abandoned> joinable;
    {
        std::lock_guard lock(s_abandonedMutex);
        for (auto it = s_abandoned.begin(); it != s_abandoned.end();) {
            if (wait || it->channel->ended) {
                joinable.push_back(std::move(*it));
                it = s_abandoned.erase(it);
            } else {
                ++it;
            }
        }
    }
    for (Abandoned& abandoned : joinable) {
        abandoned.channel->Cancel();
        abandoned.thread.join();
    }
}

}  // namespace ac
