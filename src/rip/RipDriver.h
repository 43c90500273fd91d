#pragma once
// The rip driver: the checked (or queued) rows of the rip list become files, one track at a
// time, each by one run of ctt that reads the track from the drive or disc image itself:
//
//   ctt -relk -y -i "/dev/sr0/Track03.cda" -acodec "libmp3lame" -title "Song" ... "/out/A/B/03-Song.mp3"
//
// Every decision runs on the UI thread: the child's exit is posted there (UiQueue) and the next
// track starts from that call, so the list, the questions and the tray are only ever touched
// from one thread. The child's position is an atomic the panel polls for its bars.
//
// Nothing lost: the tool writes a hidden part file and renames it only when complete; a stopped
// or failed track's part file is removed with its child; a name is held from naming until the
// track has ended, so no other job of this process can take it.
//
// Thread contract: UI thread, every call, except the progress getters (any thread).

#include "convert/EncodeProcess.h"
#include "convert/OutputNaming.h"
#include "rip/RipTrackItem.h"

#include <atomic>
#include <cstdint>
#include <memory>
#include <set>
#include <string>

namespace ac {

enum class RipStatus { None, Waiting, Running, Completed, Failed, Aborted, Paused };

// The rip list as the driver sees it.
class IRipList {
public:
    virtual ~IRipList() = default;
    virtual int RowCount() = 0;
    virtual bool IsChecked(int row) = 0;
    virtual void SetChecked(int row, bool checked) = 0;
    virtual bool IsSelected(int row) = 0;
    // Null for a row that is gone.
    virtual RipTrackItem* Item(int row) = 0;
    // The text of the name column, as the user left it.
    virtual std::string Title(int row) = 0;
    // percent is meaningful for Running only.
    virtual void SetStatus(int row, RipStatus status, int percent) = 0;
};

// The disc's four boxes, as typed.
struct RipDiscTexts {
    std::string artist;
    std::string album;
    std::string genre;
    std::string year;
};

// What the driver needs of the rest of the program (the panel and main window, or acrip).
class IRipHost {
public:
    virtual ~IRipHost() = default;
    // "Some of items had been ripped successfully. Do you want to re-rip them?"
    virtual bool AskReRip() = 0;
    // "Are you sure to stop encoding?"
    virtual bool AskStopRun() = 0;
    virtual void LockTray(bool lock) = 0;
    virtual void OpenTray() = 0;
    // The run's controls: frozen while a track runs; `paused` lets Rip resume and Stop end.
    virtual void RunStateChanged(bool running, bool paused) = 0;
    // A run went through its rows to the end (not a stop): the end-of-run action.
    virtual void RunFinished(int completed, int failed) = 0;
    // Reads the row's profile numbers again, so a change since the disc was loaded counts.
    virtual void RefreshRowParameters(int row, RipTrackItem& item) = 0;
    virtual RipDiscTexts DiscTexts() = 0;
    // Where the tool's lines go: the message log of the running track (cleared at each start)
    // and the status text (lines that are not positions, why a row failed). Both are called
    // from the child's reader threads too, so they must only copy and post; null for none.
    virtual IProcessLog* Log() = 0;
    virtual IStatusText* Status() = 0;
};

struct RipSettings {
    std::string outputDirectory;  // OutputCDDir: must exist; artist and album folders are made
    bool ejectCd = false;
    NamingSettings naming;
    std::string toolPath;
    std::string toolDirectory;  // the child's working directory
    bool slowdown = false;      // the tool at nice 10
    bool idle = false;          // the tool under SCHED_IDLE
};

// The exit code a stopped child reports: the row is stopped, not failed.
inline constexpr int kRipStoppedExitCode = 65535;

// One output's place, before its name is made free.
struct RipOutputName {
    std::string folder;  // OutputCDDir/artist/album
    std::string base;    // from the naming pattern
};

// The folder and base name of a row's file: titles and box texts cleaned by the file-name rules,
// an empty artist or album replaced by "unknown artist" / "unknown album", never a name that
// climbs out of OutputCDDir.
RipOutputName MakeRipOutputName(const RipSettings& settings, int row, const std::string& title,
                                const RipDiscTexts& disc);

// ctt's command text for one track (without the program): volume and bit-rate numbers, the
// tags of the disc, the .cda source and the output. Sets a bit rate of 0 to 192 in the item.
std::string BuildRipCommandText(RipTrackItem& item, const std::string& title,
                                const RipDiscTexts& disc, const std::string& outputPath);

// vol_factor (100 unchanged) as ctt's -vol number (256 = 1.0).
int RipVolumeNumber(int volumeFactor);

class RipDriver {
public:
    RipDriver(IRipList& list, IRipHost& host);
    ~RipDriver();
    RipDriver(const RipDriver&) = delete;
    RipDriver& operator=(const RipDriver&) = delete;

    void SetSettings(RipSettings settings) { m_settings = std::move(settings); }
    const RipSettings& Settings() const { return m_settings; }

    // Rip Checked (button 1080): starts a run, resumes a paused one, and is the step that ends
    // every track.
    void RipNextTrack();
    void RipSelected();
    void PauseRip();
    // False when the user refused to stop. `ask`: the question of a run over checked rows.
    bool StopRip(bool ask = true);
    void PauseSelected();
    void StopSelected();
    // The Stop button: stops the selected rows of a run over selected rows, else the run.
    void StopButton();
    // The list is about to be emptied (the disc went): the run ends without a question.
    void AbandonRun();

    bool IsRunning() const { return m_active; }
    bool IsPaused() const { return m_paused; }
    bool HasChild() const { return m_child != nullptr; }
    int CurrentRow() const { return m_currentRow; }
    // Polled by the panel: brings the running row's bar to the tool's position.
    void RefreshProgress();

    // For the status panel, any thread.
    int SecondsDone() const { return m_secondsDone.load(); }
    int SecondsInTrack() const { return m_secondsInTrack.load(); }
    bool ToolRunning() const { return m_toolRunning.load(); }
    int CompletedCount() const { return m_completed; }
    int FailedCount() const { return m_failed; }

private:
    bool StopRun(bool ask, bool endSelectedRun);
    void StopSelectedRow(RipStatus shown);
    void StartTrack(int row);
    void OnTrackExit(std::uint64_t generation);
    void Finish();
    void EndChild();
    void ResetRowsBehind(int row, bool keepQueued);
    int Percent() const;

    IRipList& m_list;
    IRipHost& m_host;
    RipSettings m_settings;

    int m_cursor = 0;
    int m_currentRow = -1;
    int m_mode = 0;  // 0 checked rows, 1 queued rows
    bool m_askReRip = true;
    bool m_reRip = false;
    bool m_waitingPassDone = false;
    bool m_active = false;
    bool m_paused = false;
    int m_trackLength = 0;
    int m_completed = 0;
    int m_failed = 0;

    std::unique_ptr<CEncodeProcess> m_child;
    OutputHold m_outputHold;
    std::uint64_t m_generation = 0;
    std::set<std::string> m_sweptFolders;
    std::atomic<int> m_secondsDone{0};
    std::atomic<int> m_secondsInTrack{0};
    std::atomic<bool> m_toolRunning{false};
    // A liveness token for the exit posted from the child's waiter.
    std::shared_ptr<RipDriver*> m_alive;
};

}  // namespace ac
