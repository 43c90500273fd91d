#pragma once
// The burn driver: a run of two stages on one burn thread. First every row of the burn list is
// converted by ctt into a temporary file, by up to ten worker threads of which at most the
// running limit have a live child at once; then the temporary files go to the recorder, once
// for every copy asked for: WAV files as the tracks of an audio disc, MP3 or WMA files as the
// files of a data disc. The temporary files are deleted on every way out of a run.
//
// Thread contract: StartBurn, PrepareBurn, StopBurn and the enable rules run on the UI thread;
// RunBurn is the burn thread (a test may call it on its own thread); ConvertWorker runs on the
// workers; OnBurnEvent on the thread that writes. The host's questions and boxes are asked
// from the burn thread and block it until answered: the host carries them to the UI thread
// and must answer "No" / Cancel by itself once its window is closing. The flags are atomic;
// the row cursor and the progress slots have locks of their own.

#include "burn/DiscTree.h"
#include "burn/Recorder.h"
#include "convert/MediaItem.h"
#include "convert/OutputNaming.h"

#include <atomic>
#include <condition_variable>
#include <cstdint>
#include <functional>
#include <memory>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

namespace ac::burn {

enum class DiscType : int { Audio = 0, Mp3 = 3, Wma = 4 };

// The burn list as the driver sees it. Called from the workers too.
class IBurnList {
public:
    virtual ~IBurnList() = default;
    virtual int RowCount() = 0;
    virtual MediaItem* Item(int row) = 0;
    virtual void SelectOnly(int row) = 0;
    // percent: the row's bar while it converts.
    virtual void RefreshRow(int row, int percent) = 0;
};

enum class PromptIcon { Information, Warning, Error, Question };

struct Prompt {
    std::uint32_t textId = 0;
    std::uint32_t captionId = 0;  // 0: the product's name
    PromptIcon icon = PromptIcon::Warning;
    bool defaultNo = false;
    std::string argument;  // for a text with "%s" or "%d"
};

// The panel and main window, or acburn.
class IBurnHost {
public:
    virtual ~IBurnHost() = default;
    // Yes/No; true for Yes. Blocks the calling thread.
    virtual bool Ask(const Prompt& prompt) = 0;
    // An OK box (okCancel: OK and Cancel, true for OK). Blocks the calling thread.
    virtual bool Tell(const Prompt& prompt, bool okCancel = false) = 0;
    // The waiting dialog: the recorder once a fitting disc is in (ignored set when the user
    // chose Ignore), null after Cancel.
    virtual ICdRecorder* WaitForDisc(ICdRecorder* recorder, int code, std::int64_t sectors,
                                     bool showIgnore, bool& ignored) = 0;
    // The status panel. Both must only post.
    virtual void SetStatusText(std::uint32_t textId, const std::string& argument = {}) = 0;
    virtual void SetProgress(int percent) = 0;
    // The mode tabs, side bar disc controls, recorder and speed lists, erase, dropping.
    virtual void EnablePanels(bool enable) = 0;
    // Message 2126: the capacity marks of the status panel.
    virtual void PostCapacityRefresh() = 0;
    // Message 2125 with 1: "Some of the tracks are unavailable..."
    virtual void PostTracksUnavailable() = 0;
    // The run is over (any way): the after-run action of a finished burn, the commands' states.
    virtual void RunEnded(bool allCopiesWritten) = 0;
};

struct BurnSettings {
    std::string temporaryFolder;  // burntemp; empty: $TMPDIR/audio-converter-burn
    int maxProcesses = 10;        // workers, at most 10
    int maxRunningProcesses = 1;  // children converting at once
    std::string toolPath;
    std::string toolDirectory;
    DiscType discType = DiscType::Audio;
    int copies = 1;
    int speed = -1;  // multiple of 1x, -1 the recorder's best
    int pauseSeconds = 2;
    std::string volumeLabel;
    NamingSettings naming;
};

// Names a row's temporary output in the folder and holds the name while the row converts.
using BurnOutputNamer =
    std::function<OutputHold(int row, MediaItem& item, const std::string& folder)>;
// The tool's command text after its name, for the row and its output path.
using BurnCommandBuilder = std::function<std::string(MediaItem& item, const std::string& output)>;

// The disc check of a run: 0 blank and big enough, 1 a CD-RW with content, else the codes of the
// waiting dialog (-99 no disc, -91 not a CD, -90 CD-ROM, -89 too small, -88 / -100 unreadable
// or a used CD-R).
int CheckDisc(ICdRecorder* recorder, std::int64_t sectors);

// The waiting dialog's message for a code.
std::uint32_t WaitMessageId(int code);

// The temporary folder that an empty burntemp stands for.
std::string DefaultTemporaryFolder();

class BurnDriver : public IBurnEvents {
public:
    static constexpr int kMaxWorkers = 10;
    static constexpr std::uint64_t kMinFreeBytes = 209715200;  // 200 MiB, as the disk check
    static constexpr int kStoppedExitCode = 65535;

    BurnDriver(IBurnList& list, IBurnHost& host, BurnOutputNamer namer, BurnCommandBuilder builder);
    ~BurnDriver() override;
    BurnDriver(const BurnDriver&) = delete;
    BurnDriver& operator=(const BurnDriver&) = delete;

    void SetSettings(BurnSettings settings);
    const BurnSettings& Settings() const { return m_settings; }
    void SetRecorder(ICdRecorder* recorder) { m_recorder = recorder; }
    // Seconds of the compilation (effective durations), for the required size of an audio
    // disc; minutes of a data disc's tally count as megabytes.
    void SetCompilation(double seconds, int minutes) {
        m_compilationSeconds = seconds;
        m_compilationMinutes = minutes;
    }

    // The Burn command: checks, then the burn thread. False when the run did not start.
    bool StartBurn();
    // 0 to go on: the checks before a run, on the UI thread.
    int PrepareBurn();
    void StopBurn();
    // The burn thread's body; StartBurn runs it on a thread of its own.
    void RunBurn();
    // Waits for the burn thread (tests, close).
    void Join();
    // Ends a run for good: abort, children killed, thread joined (closing the program).
    void Abandon();

    int OnBurnEvent(int event, int value) override;
    // The disk check: stops a conversion or write when burntemp's volume runs low.
    void CheckDiskSpace();

    // Enable rules of Stop; the others are the panel's (burn active clear).
    bool CanStop() const;
    bool BurnActive() const { return m_burnActive.load() != 0; }
    bool Converting() const { return m_converting.load() != 0; }
    bool Writing() const { return m_writing.load() != 0; }
    bool Aborted() const { return m_abort.load() != 0; }
    int CopiesDone() const { return m_copiesDone.load(); }
    double BarPosition() const;
    // Wall seconds of the last run's conversion stage and of its copies' writes, for the
    // benchmarks and acburn --times.
    double ConversionSeconds() const { return m_conversionSeconds.load(); }
    double WriteSeconds() const { return m_writeSeconds.load(); }
    // The temporary files of this run still on disk (nothing once the run has ended).
    std::vector<std::string> TemporaryFiles() const;

    // Test seams: the free bytes of a folder's volume; the period of the progress tick.
    void SetFreeSpaceProbe(std::function<std::uint64_t(const std::string&)> probe);
    void SetTickPeriodMs(int milliseconds) { m_tickPeriodMs = milliseconds; }

private:
    void ConvertWorker();
    void ConvertRow(int row, MediaItem& item);
    void ProgressTick();
    bool EnsureTemporaryFolder();
    void RunCopies(std::int64_t sectors);
    bool BurnOneCopy();
    void EndRun(bool allCopiesWritten);
    void DeleteTemporaryFiles();
    void Eject(bool showText = true);
    void SetBar(double percent);

    IBurnList& m_list;
    IBurnHost& m_host;
    BurnOutputNamer m_namer;
    BurnCommandBuilder m_builder;
    BurnSettings m_settings;
    std::function<std::uint64_t(const std::string&)> m_freeSpace;
    int m_tickPeriodMs = 1000;

    ICdRecorder* m_recorder = nullptr;
    double m_compilationSeconds = 0;
    int m_compilationMinutes = 0;

    std::atomic<int> m_burnActive{0};
    std::atomic<int> m_abort{0};
    std::atomic<int> m_converting{0};
    std::atomic<int> m_workersLeft{0};  // conversion workers not yet returned
    std::atomic<int> m_writing{0};
    std::atomic<int> m_ejectRequested{0};
    std::atomic<int> m_discChecked{0};
    std::atomic<int> m_writeFailed{0};
    std::atomic<int> m_cancelled{0};
    std::atomic<int> m_erasing{0};
    std::atomic<int> m_closing{0};
    std::atomic<int> m_copiesDone{0};
    std::atomic<int> m_diskFull{0};
    std::atomic<double> m_conversionSeconds{0};
    std::atomic<double> m_writeSeconds{0};

    std::mutex m_writeLock;  // writing and abort against StopBurn
    std::mutex m_cursorLock;
    int m_rowCursor = -1;
    std::mutex m_slotLock;
    struct Slot {
        int row = -1;
        double seconds = 0;
    };
    Slot m_slots[kMaxWorkers];
    std::mutex m_runningLock;  // the running limit
    std::condition_variable m_runningChanged;
    int m_runningChildren = 0;

    mutable std::mutex m_progressLock;  // the bar and the temporary files
    double m_conversionShare = 60;
    double m_copyShare = 40;
    double m_barPosition = 0;
    double m_tickStep = 0;
    int m_shownPercent = -1;
    double m_secondsDone = 0;
    double m_secondsTotal = 0;
    std::string m_folder;
    std::vector<AudioTrack> m_tracks;
    std::vector<std::string> m_dataFiles;
    std::vector<std::string> m_rowOutputs;  // every output named in this run
    DiscTree m_tree;

    std::thread m_thread;
};

}  // namespace ac::burn
