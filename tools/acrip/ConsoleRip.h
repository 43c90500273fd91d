#pragma once
// The rip list of acrip and the run around the program's rip driver: the main thread plays the
// UI thread, pumping the calls the driver and its children post, drawing progress between
// them (a bar on a terminal, whole lines into a pipe or file) and printing why a track failed
// once it has ended.
//
// Thread contract: everything on the main thread, except the two sinks (LogSink, StatusSink),
// which the children's reader threads call: they only copy under their own lock and never
// print, so nothing lands in the middle of the progress line.

#include "platform/DiscDevice.h"
#include "platform/UiQueue.h"
#include "profile/ParameterSet.h"
#include "rip/RipDriver.h"

#include <atomic>
#include <chrono>
#include <condition_variable>
#include <cstdio>
#include <deque>
#include <functional>
#include <mutex>
#include <string>
#include <utility>
#include <vector>

namespace ac::console {

// The UI thread of a terminal program: posted calls wait in a queue until main runs them.
class MainThreadQueue {
public:
    MainThreadQueue();
    ~MainThreadQueue();
    MainThreadQueue(const MainThreadQueue&) = delete;
    MainThreadQueue& operator=(const MainThreadQueue&) = delete;

    // Runs the calls posted so far and those that arrive within `wait`; returns after the
    // first call that ran, or when the time is up.
    void RunFor(std::chrono::milliseconds wait);

private:
    std::mutex m_mutex;
    std::condition_variable m_changed;
    std::deque<UiQueue::Call> m_calls;
};

struct RipRow {
    RipTrackItem item;
    std::string title;
    bool checked = false;
    RipStatus status = RipStatus::None;
    int percent = 0;
    std::vector<std::string> reasons;  // why it failed, first the one to show
};

// Fills what the row's profile decides: extension, codec, and the numbers of ar, ac, ab and
// vol_factor ("2 (Stereo)" is 2, "100%" is 100; "Auto" bit rate is 0, which the driver makes 192).
void ApplyProfile(const ParameterSet& profile, RipTrackItem& item);

class ConsoleRip : public IRipList, public IRipHost {
public:
    ConsoleRip(platform::IDiscDevice& device, std::string drive, RipDiscTexts disc,
               const ParameterSet& profile, bool drawBar, std::FILE* out);

    void AddRow(RipTrackItem item, std::string title, bool checked);
    // Runs the checked rows to their end, or until `stopRequested` turns non-zero (then the
    // child is ended and its part file removed). The program's exit code: 0 when every checked
    // row ripped, 1 when some failed, 130 when stopped.
    int Run(const RipSettings& settings, const std::atomic<int>& stopRequested);

    // IRipList
    int RowCount() override { return static_cast<int>(m_rows.size()); }
    bool IsChecked(int row) override;
    void SetChecked(int row, bool checked) override;
    bool IsSelected(int) override { return false; }
    RipTrackItem* Item(int row) override;
    std::string Title(int row) override;
    void SetStatus(int row, RipStatus status, int percent) override;

    // IRipHost. Rows start unripped, so the re-rip question never comes; a stop is always meant.
    bool AskReRip() override { return false; }
    bool AskStopRun() override { return true; }
    void LockTray(bool lock) override { m_device.LockTray(m_drive, lock); }
    void OpenTray() override { m_device.SetTrayOpen(m_drive, true); }
    void RunStateChanged(bool, bool) override {}
    void RunFinished(int, int) override { m_finished = true; }
    void RefreshRowParameters(int, RipTrackItem& item) override { ApplyProfile(m_profile, item); }
    RipDiscTexts DiscTexts() override { return m_disc; }
    IProcessLog* Log() override { return &m_log; }
    IStatusText* Status() override { return &m_status; }

private:
    // The error lines of the running track (cleared when a track starts).
    class LogSink : public IProcessLog {
    public:
        void Clear() override;
        void Append(const std::string& text, LogLineKind kind) override;
        std::vector<std::string> Lines();

    private:
        std::mutex m_mutex;
        std::vector<std::string> m_lines;
    };
    // Takes the reason the driver gives right after a row failed with nothing in the log.
    class StatusSink : public IStatusText {
    public:
        void SetStatusText(const std::string& line) override;
        void Await(std::vector<std::string>* reasons);

    private:
        std::mutex m_mutex;
        std::vector<std::string>* m_awaiting = nullptr;
    };

    // A track began (Running) or ended, in the order the driver said so.
    struct Event {
        int row;
        RipStatus status;
    };

    void Draw();
    void PrintEvent(const Event& event);
    std::string RowName(int row) const;
    int OverallPercent() const;
    int CheckedCount() const;
    int CountOf(RipStatus status) const;

    platform::IDiscDevice& m_device;
    const std::string m_drive;
    const RipDiscTexts m_disc;
    const ParameterSet& m_profile;
    const bool m_drawBar;
    std::FILE* m_out;

    std::vector<RipRow> m_rows;
    std::vector<Event> m_events;  // not printed yet
    int m_startedCount = 0;
    int m_endedCount = 0;
    std::pair<int, int> m_lineShown{-1, -1};  // row and percent of the progress line
    bool m_finished = false;
    LogSink m_log;
    StatusSink m_status;
};

}  // namespace ac::console
