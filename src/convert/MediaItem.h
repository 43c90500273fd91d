#pragma once
// One row of the conversion list (and of the burn list's pre-conversion): the source, the
// parameters it is converted with, its child process and the state of that work.
//
// Thread contract: status, inRun, volume and the process pointer are written by the UI thread
// (commands), the driver thread and the child's waiter, without a lock: each is an atomic
// word and nothing relies on more. outputPath is written by the driver only while it starts
// the row; others read it after they have seen a status that the start or the exit wrote.

#include "convert/EncodeProcess.h"
#include "convert/OutputNaming.h"
#include "medialist/MediaFileInfo.h"

#include <atomic>
#include <cstdint>
#include <memory>
#include <string>

namespace ac {

// The numbers are fixed: the enable rules of the commands compare them.
enum class JobStatus : std::int32_t {
    Failed = -1,
    Idle = 0,
    Running = 1,
    Waiting = 2,
    Paused = 3,
    Pending = 4,
    Completed = 5,
    Aborted = 6,
    UnknownFile = 7,
    AbortedSuspended = 8,
};

// What the engine needs of a row's parameter set: the cut it asks for, in microseconds
// ("t" and "ss"; 0 for "Full"). The profile code supplies the real set behind it.
class JobParameters {
public:
    virtual ~JobParameters() = default;
    virtual std::int64_t GetDuration() const = 0;
    virtual std::int64_t GetStartTime() const = 0;
};

struct MediaItem {
    MediaItem() = default;
    // A live child is killed with 65535 first; its exit reaches nobody any more.
    ~MediaItem();
    MediaItem(const MediaItem&) = delete;
    MediaItem& operator=(const MediaItem&) = delete;

    std::atomic<std::int32_t> inRun{0};
    std::string sourcePath;  // a file, or a cue track "SHEET|N"
    std::string outputPath;
    // Held from naming until the job has ended, so no other job takes the name meanwhile.
    OutputHold outputHold;
    MediaFileInfo info;
    std::atomic<std::int32_t> volume{50};
    // Created by the driver at the first start and kept: its time and error lines outlive a run.
    std::atomic<CEncodeProcess*> process{nullptr};
    std::unique_ptr<JobParameters> parameters;
    std::atomic<JobStatus> status{JobStatus::Idle};
    std::atomic<std::int32_t> reselect{0};

    JobStatus Status() const { return status.load(); }
    void SetStatus(JobStatus value) { status.store(value); }
    // Hands the process to the row, which deletes it.
    void AdoptProcess(std::unique_ptr<CEncodeProcess> child);
};

// Seconds that a conversion of the row will cover: the file, or the cut of t and ss. Both cut
// values count in whole seconds, and ss only counts when t is set.
double EffectiveDurationSeconds(const MediaFileInfo& info, std::int64_t durationUs,
                                std::int64_t startTimeUs);
double GetEffectiveDuration(const MediaItem& item);

// Percent of a row, not clamped: the time of its child against its effective duration. A zero
// duration gives 0.
int ProgressPercent(const MediaItem& item);

// Status a child's exit code leads to: 0 completed, 65535 stopped by the user, all else failed.
JobStatus StatusForExitCode(int exitCode);

// The language text id of a status, 0 for "-" and for values outside the table.
std::uint32_t StatusTextId(JobStatus status);

}  // namespace ac
