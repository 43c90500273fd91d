#pragma once
// The encoding driver: one thread that walks the conversion list, starts a child for each
// checked row that waits, resumes rows queued for resume and reports the end of a run; and the
// user's commands, which only change statuses and wake the driver.
//
// A pass runs at least every 500 ms, and at once when a child ends or a command changed a
// status, so a short job never leaves its slot idle for a whole period.
//
// Thread contract: RunPass runs on the driver thread (or a test's thread); commands, enable
// rules, OnRunFinished and the disk-space check on the UI thread; OnProcessExit on each child's
// waiter. The counters, flags and statuses they share are atomic; the list lock is taken only
// by RunPass, with a try. The list and host interfaces must be callable from all three.

#include "convert/MediaItem.h"

#include <atomic>
#include <condition_variable>
#include <cstdint>
#include <functional>
#include <mutex>
#include <set>
#include <string>
#include <thread>

namespace ac {

// The conversion list as the driver sees it (CMediaListWnd in the program). Calls from worker
// threads are carried to the UI thread by the implementation.
class IMediaList {
public:
    virtual ~IMediaList() = default;
    virtual int GetRowCount() = 0;
    virtual MediaItem* GetItem(int row) = 0;  // null for a row out of range
    virtual bool IsChecked(int row) = 0;
    virtual bool IsSelected(int row) = 0;
    virtual void SelectOnly(int row) = 0;
    virtual void RefreshRow(int row) = 0;
    virtual bool TryLock() = 0;
    virtual void Unlock() = 0;
    virtual std::string GetOutputDirectory() = 0;
    // The header's check box and the row boxes of all rows not in status 3.
    virtual void EnableChecking(bool enable) = 0;
};

// The main dialog's side: questions, message boxes, the tab strip and the end of a run.
class IDriverHost {
public:
    virtual ~IDriverHost() = default;
    virtual bool AskYesNo(std::uint32_t textId) = 0;
    virtual void ShowMessage(const std::string& text, bool isError) = 0;
    // Message 0x466: the host calls OnRunFinished on the UI thread when it arrives.
    virtual void PostRunFinished() = 0;
    virtual bool IsConvertMode() = 0;
    virtual void EnableTabStrip(bool enable) = 0;
    virtual void PlaySound(const std::string& path) = 0;
    // 0 shut down, 1 standby, 2 hibernate, 3 close the program, each after its countdown.
    virtual void StartAfterRunAction(int action) = 0;
};

struct DriverConfig {
    int maxProcesses = 10;
    int maxRunningProcesses = 1;
    int afterConvertAction = 4;
    int playSound = 0;
    std::string soundPath;
    // Children as background work: nice 10, SCHED_IDLE (the settings slowdown and idle).
    bool slowdown = false;
    bool idle = false;
    std::string toolPath;       // the ctt to run; tests put a fake here
    std::string toolDirectory;  // the child's current directory
    // The longest wait between passes; a child's exit or a command starts a pass sooner.
    int passPeriodMs = 500;
};

// Names the output of a row from the directory and the name chosen last in this pass, and
// holds the name (ReserveOutputPath) until the row's job has ended.
using OutputNamer = std::function<OutputHold(
    int row, MediaItem& item, const std::string& directory, const std::string& lastOutput)>;
// The text after the tool's name, for a row whose outputPath is set. May change the row's
// parameters (a profile keeps what its last command line made of it).
using CommandBuilder = std::function<std::string(MediaItem& item)>;

// A directory passes if it exists, else if it can be created level by level.
bool EnsureOutputDirectory(const std::string& directory);

class EncodingDriver {
public:
    static constexpr int kBusyListRetryMs = 100;
    static constexpr std::uint64_t kMinFreeBytes = 209715200;  // 200 MiB

    EncodingDriver(IMediaList& list, IDriverHost& host, DriverConfig config, OutputNamer namer,
                   CommandBuilder builder);
    ~EncodingDriver();
    EncodingDriver(const EncodingDriver&) = delete;
    EncodingDriver& operator=(const EncodingDriver&) = delete;

    void Start();
    // Sets driverStop, wakes the thread and joins it. Children keep running.
    void Stop();
    // One pass over the list; false when the list lock was taken and nothing was done.
    bool RunPass();
    void Wake();

    // Commands.
    void EncodeChecked();
    void EncodeSelected();
    void PauseChecked();
    void PauseSelected();
    // fromCommand: the menu entry or the button (they enable the tab strip). False when the
    // user answered No to the question.
    bool StopChecked(bool fromCommand = true);
    // The menu entry also forgets the run, so no end-of-run step follows.
    bool StopCheckedFromMenu();
    void StopSelected();

    // Enable rules.
    bool CanEncodeChecked();
    bool CanEncodeSelected();
    bool CanPauseChecked();
    bool CanPauseSelected();
    bool CanStopChecked();
    bool CanStopSelected();
    // Evaluates CanEncodeChecked and applies it to the check boxes and the tab strip.
    bool UpdateCheckingEnabled();

    // The rows of the current run by how they stand; the status bar words them.
    struct RunCounts {
        int total = 0;
        int completed = 0;
        int failed = 0;
        int stopped = 0;
        int Ended() const { return completed + failed + stopped; }
    };
    RunCounts GetRunCounts();

    bool AnyActive(bool includeWaiting);
    bool AnySelectedActive();
    double GetRunDoneSeconds();
    double GetRunTotalSeconds();

    void OnProcessExit(CEncodeProcess* process);
    void OnRunFinished();
    // The after-run action chosen in the menu while the program runs.
    void SetAfterConvertAction(int action) { m_afterConvertAction = action; }
    // New limits and end-of-run sound from the preferences, taken by the next pass of a run
    // already under way; the tool and its folder stay as they were.
    void UpdateSettings(int maxProcesses, int maxRunningProcesses, int playSound,
                        const std::string& soundPath, bool slowdown = false, bool idle = false);
    // The 3-second timer of the main dialog: stops the run when the output volume runs low.
    void CheckDiskSpace();

    int ProcessCount() const { return m_processCount.load(); }
    int RunningCount() const { return m_runningCount.load(); }
    bool RunPending() const { return m_runPending.load() != 0; }

    // Test seams: the free bytes of a directory's volume, and calls right before and right after
    // a child is spawned, where a command of the user may land.
    void SetFreeSpaceProbe(std::function<std::uint64_t(const std::string&)> probe);
    void SetLaunchHooks(std::function<void(int row)> beforeLaunch,
                        std::function<void(int row)> afterLaunch);

private:
    enum class RowSet { Checked, Selected };
    bool InSet(RowSet set, int row);
    void ThreadMain();
    void StartRow(int row, MediaItem& item, bool& proceed, std::string& lastOutput);
    void ResumeRow(int row, MediaItem& item);
    void Encode(RowSet set);
    void Pause(RowSet set);
    void StopRows(RowSet set);
    bool AnyInSet(RowSet set, bool (*match)(JobStatus));
    int FindRowOfProcess(const CEncodeProcess* process);

    IMediaList& m_list;
    IDriverHost& m_host;
    DriverConfig m_config;
    OutputNamer m_namer;
    CommandBuilder m_builder;
    std::function<std::uint64_t(const std::string&)> m_freeSpace;
    std::function<void(int)> m_beforeLaunch;
    std::function<void(int)> m_afterLaunch;

    std::atomic<int> m_processCount{0};
    std::atomic<int> m_runningCount{0};
    std::atomic<int> m_runPending{0};
    std::atomic<int> m_driverStop{0};
    std::atomic<int> m_afterConvertAction{4};
    std::atomic<int> m_maxProcesses{10};
    std::atomic<int> m_maxRunningProcesses{1};
    std::atomic<bool> m_slowdown{false};
    std::atomic<bool> m_idle{false};
    std::mutex m_soundMutex;  // guards m_config.playSound and m_config.soundPath
    // One 0x466 per run end, however many passes see the end before the UI thread handles it.
    std::atomic<int> m_finishPosted{0};

    // Folders written in this run, swept once for part files of tools that died with an
    // earlier program. Driver thread only.
    std::set<std::string> m_sweptDirectories;

    std::mutex m_wakeMutex;
    std::condition_variable m_wakeCondition;
    bool m_wakeRequested = false;
    std::thread m_thread;
};

}  // namespace ac
