#include "convert/EncodingDriver.h"

#include "platform/PartFiles.h"
#include "resources/Language.h"
#include "resources/TextFormat.h"

#include <algorithm>
#include <chrono>
#include <filesystem>

namespace ac {
namespace {

namespace fs = std::filesystem;

constexpr std::uint32_t kNotEnoughSpaceId = 0xC000;
constexpr std::uint32_t kReencodeQuestionId = 0xC003;
constexpr std::uint32_t kStopQuestionId = 0xC004;
constexpr std::uint32_t kSuspendUnavailableId = 0xC005;
constexpr std::uint32_t kBadOutputDirectoryId = 0xC006;
constexpr std::uint32_t kTwoPartsId = 0xC007;
constexpr std::uint32_t kAbnormalActionId = 0xC009;
// The code a child is killed with when the user stops its row.
constexpr int kStoppedExitCode = 65535;

bool IsBusy(JobStatus s) {  // blocks Encode, allows Pause
    return s == JobStatus::Running || s == JobStatus::Waiting || s == JobStatus::Pending;
}
bool IsStoppable(JobStatus s) {
    return IsBusy(s) || s == JobStatus::Paused;
}

// Moves a status from one value to another unless a different thread changed it first.
bool Move(MediaItem& item, JobStatus from, JobStatus to) {
    return item.status.compare_exchange_strong(from, to);
}

std::uint64_t VolumeFreeBytes(const std::string& directory) {
    std::error_code error;
    fs::space_info space = fs::space(directory, error);
    return error ? UINT64_MAX : space.available;
}

}  // namespace

bool EnsureOutputDirectory(const std::string& directory) {
    if (directory.empty())
        return false;
    std::error_code error;
    bool endsInSeparator = directory.back() == '/' || directory.back() == '\\';
    if (endsInSeparator ? fs::is_directory(directory, error) : fs::exists(directory, error))
        return true;
    fs::create_directories(directory, error);
    return fs::is_directory(directory, error);
}

EncodingDriver::EncodingDriver(IMediaList& list, IDriverHost& host, DriverConfig config,
                               OutputNamer namer, CommandBuilder builder)
    : m_list(list),
      m_host(host),
      m_config(std::move(config)),
      m_namer(std::move(namer)),
      m_builder(std::move(builder)),
      m_freeSpace(VolumeFreeBytes),
      m_afterConvertAction(m_config.afterConvertAction),
      m_maxProcesses(m_config.maxProcesses),
      m_maxRunningProcesses(m_config.maxRunningProcesses),
      m_slowdown(m_config.slowdown),
      m_idle(m_config.idle) {}

void EncodingDriver::UpdateSettings(int maxProcesses, int maxRunningProcesses, int playSound,
                                    const std::string& soundPath, bool slowdown, bool idle) {
    m_slowdown = slowdown;
    m_idle = idle;
    m_maxProcesses = maxProcesses;
    m_maxRunningProcesses = maxRunningProcesses;
    {
        std::lock_guard lock(m_soundMutex);
        m_config.playSound = playSound;
        m_config.soundPath = soundPath;
    }
    Wake();
}

EncodingDriver::~EncodingDriver() {
    Stop();
}

void EncodingDriver::SetFreeSpaceProbe(std::function<std::uint64_t(const std::string&)> probe) {
    m_freeSpace = std::move(probe);
}

void EncodingDriver::SetLaunchHooks(std::function<void(int)> beforeLaunch,
                                    std::function<void(int)> afterLaunch) {
    m_beforeLaunch = std::move(beforeLaunch);
    m_afterLaunch = std::move(afterLaunch);
}

void EncodingDriver::Start() {
    if (m_thread.joinable())
        return;
    m_driverStop = 0;
    m_thread = std::thread(&EncodingDriver::ThreadMain, this);
}

void EncodingDriver::Stop() {
    {
        std::lock_guard lock(m_wakeMutex);
        m_driverStop = 1;
    }
    m_wakeCondition.notify_all();
    if (m_thread.joinable())
        m_thread.join();
}

void EncodingDriver::Wake() {
    {
        std::lock_guard lock(m_wakeMutex);
        m_wakeRequested = true;
    }
    m_wakeCondition.notify_all();
}

void EncodingDriver::ThreadMain() {
    std::unique_lock lock(m_wakeMutex);
    while (!m_driverStop) {
        lock.unlock();
        bool done = RunPass();
        lock.lock();
        auto wait = std::chrono::milliseconds(done ? m_config.passPeriodMs : kBusyListRetryMs);
        m_wakeCondition.wait_for(lock, wait, [this] { return m_wakeRequested || m_driverStop; });
        m_wakeRequested = false;
    }
}

bool EncodingDriver::RunPass() {
    bool proceed = true;
    std::string lastOutput;
    if (!m_list.TryLock())
        return false;
    for (int row = 0; row < m_list.GetRowCount(); ++row) {
        MediaItem* item = m_list.GetItem(row);
        if (!item || !m_list.IsChecked(row))
            continue;
        if (!proceed) {
            item->SetStatus(JobStatus::Aborted);
            m_list.RefreshRow(row);
            continue;
        }
        JobStatus status = item->Status();
        if (status == JobStatus::Waiting)
            StartRow(row, *item, proceed, lastOutput);
        else if (status == JobStatus::Pending && m_runningCount < m_maxRunningProcesses)
            ResumeRow(row, *item);
    }
    m_list.Unlock();

    // The driver selected the rows it started, so the selection test covers the last of them.
    if (m_processCount == 0 && m_runPending == 1 && !AnySelectedActive() &&
        m_finishPosted.exchange(1) == 0) {
        m_sweptDirectories.clear();
        m_host.PostRunFinished();
    }
    return true;
}

void EncodingDriver::StartRow(int row, MediaItem& item, bool& proceed, std::string& lastOutput) {
    std::string directory = m_list.GetOutputDirectory();
    if (!EnsureOutputDirectory(directory)) {
        m_host.ShowMessage(FormatText(g_Language.GetString(kTwoPartsId),
                                      {g_Language.GetString(kBadOutputDirectoryId), directory}),
                           true);
        proceed = false;
        item.SetStatus(JobStatus::Aborted);
        m_list.RefreshRow(row);
        return;
    }
    if (m_processCount >= m_maxProcesses || m_runningCount >= m_maxRunningProcesses)
        return;

    CEncodeProcess* child = item.process.load();
    if (child) {
        // A row stopped and encoded again may still have its last exit on the way; let it
        // settle first, or it would land on the new run.
        child->WaitForExit();
        if (item.Status() != JobStatus::Waiting)
            return;
    } else {
        item.AdoptProcess(std::make_unique<CEncodeProcess>(
            [this](CEncodeProcess* process) { OnProcessExit(process); }));
        child = item.process.load();
    }
    item.SetStatus(JobStatus::Running);
    m_list.SelectOnly(row);
    item.outputHold = m_namer(row, item, directory, lastOutput);
    item.outputPath = item.outputHold.Path();
    lastOutput = item.outputPath;
    if (m_beforeLaunch)
        m_beforeLaunch(row);
    // Stopped by the user while it was being named: no child, and the old output stays.
    if (item.Status() == JobStatus::Aborted) {
        item.outputHold.Release();
        return;
    }

    std::string commandText = m_builder(item);
    std::error_code ignored;
    fs::remove(item.outputPath, ignored);
    if (m_sweptDirectories.insert(directory).second)
        platform::SweepStalePartFiles(directory);
    child->SetCurrentDirectory(m_config.toolDirectory);
    child->SetBackgroundPriority(m_slowdown, m_idle);
    child->SetOutputPath(item.outputPath);
    if (!child->Launch("\"" + m_config.toolPath + "\" " + commandText)) {
        item.outputHold.Release();
        item.SetStatus(JobStatus::Failed);
        m_list.RefreshRow(row);
        return;
    }
    ++m_processCount;
    ++m_runningCount;
    m_runPending = 1;
    m_finishPosted = 0;
    if (m_afterLaunch)
        m_afterLaunch(row);
    // Paused while the launch was under way: the pause could not reach a child then, so the
    // driver completes it now.
    if (item.Status() == JobStatus::Idle && child->Suspend() &&
        Move(item, JobStatus::Idle, JobStatus::Paused))
        --m_runningCount;
    m_list.RefreshRow(row);
}

void EncodingDriver::ResumeRow(int row, MediaItem& item) {
    CEncodeProcess* child = item.process.load();
    if (!child || !child->Resume())
        return;
    if (Move(item, JobStatus::Pending, JobStatus::Running))
        ++m_runningCount;
    m_list.RefreshRow(row);
}

void EncodingDriver::OnProcessExit(CEncodeProcess* process) {
    if (!m_host.IsConvertMode())
        return;
    int row = FindRowOfProcess(process);
    MediaItem* item = row < 0 ? nullptr : m_list.GetItem(row);
    if (!item)
        return;
    JobStatus final = StatusForExitCode(process->ExitCode());
    // Whatever a failed or stopped child left is not a finished file; it must not stand under
    // the name a completed one would have.
    if (final != JobStatus::Completed && !item->outputPath.empty()) {
        std::error_code ignored;
        fs::remove(item->outputPath, ignored);
    }
    item->outputHold.Release();
    --m_processCount;
    JobStatus old = item->status.exchange(final);
    if (old != JobStatus::Paused && old != JobStatus::Pending && old != JobStatus::AbortedSuspended)
        --m_runningCount;
    m_list.RefreshRow(row);
    Wake();
}

int EncodingDriver::FindRowOfProcess(const CEncodeProcess* process) {
    for (int row = 0; row < m_list.GetRowCount(); ++row) {
        MediaItem* item = m_list.GetItem(row);
        if (item && item->process.load() == process)
            return row;
    }
    return -1;
}

bool EncodingDriver::InSet(RowSet set, int row) {
    return set == RowSet::Checked ? m_list.IsChecked(row) : m_list.IsSelected(row);
}

bool EncodingDriver::AnyInSet(RowSet set, bool (*match)(JobStatus)) {
    for (int row = 0; row < m_list.GetRowCount(); ++row) {
        MediaItem* item = m_list.GetItem(row);
        if (item && InSet(set, row) && match(item->Status()))
            return true;
    }
    return false;
}

void EncodingDriver::Encode(RowSet set) {
    bool reencode = false;
    for (int row = 0; row < m_list.GetRowCount(); ++row) {
        MediaItem* item = m_list.GetItem(row);
        bool asks = set == RowSet::Checked ? m_list.IsChecked(row)
                                           : m_list.IsSelected(row) && m_list.IsChecked(row);
        if (item && asks && item->Status() == JobStatus::Completed) {
            reencode = m_host.AskYesNo(kReencodeQuestionId);
            break;
        }
    }
    for (int row = 0; row < m_list.GetRowCount(); ++row)
        if (MediaItem* item = m_list.GetItem(row))
            item->inRun = 0;
    for (int row = 0; row < m_list.GetRowCount(); ++row) {
        MediaItem* item = m_list.GetItem(row);
        if (!item || !InSet(set, row))
            continue;
        switch (JobStatus status = item->Status()) {
            case JobStatus::Idle:
            case JobStatus::Failed:
            case JobStatus::Aborted:
            case JobStatus::AbortedSuspended:
                if (Move(*item, status, JobStatus::Waiting))
                    item->inRun = 1;
                break;
            case JobStatus::Paused:
                if (Move(*item, status, JobStatus::Pending))
                    item->inRun = 1;
                break;
            case JobStatus::Completed:
                if (reencode)
                    Move(*item, status, JobStatus::Waiting);
                item->inRun = 1;
                break;
            default:
                break;  // unknown files never start; busy rows keep their way
        }
        m_list.RefreshRow(row);
    }
    Wake();
}

void EncodingDriver::EncodeChecked() {
    m_host.EnableTabStrip(false);
    Encode(RowSet::Checked);
}

void EncodingDriver::EncodeSelected() {
    Encode(RowSet::Selected);
}

void EncodingDriver::Pause(RowSet set) {
    bool told = false;
    for (int row = 0; row < m_list.GetRowCount(); ++row) {
        MediaItem* item = m_list.GetItem(row);
        if (!item || !InSet(set, row))
            continue;
        CEncodeProcess* child = item->process.load();
        switch (item->Status()) {
            case JobStatus::Running:
                if (child && child->IsRunning()) {
                    if (child->Suspend()) {
                        if (Move(*item, JobStatus::Running, JobStatus::Paused))
                            --m_runningCount;
                    } else if (!told) {
                        told = true;
                        m_host.ShowMessage(g_Language.GetString(kSuspendUnavailableId), true);
                    }
                } else {
                    // The launch is under way; the driver suspends the child once it stands.
                    Move(*item, JobStatus::Running, JobStatus::Idle);
                }
                break;
            case JobStatus::Waiting:
                Move(*item, JobStatus::Waiting, JobStatus::Idle);
                break;
            case JobStatus::Pending:
                Move(*item, JobStatus::Pending, JobStatus::Paused);
                break;
            default:
                break;
        }
        m_list.RefreshRow(row);
    }
    Wake();
}

void EncodingDriver::PauseChecked() {
    m_host.EnableTabStrip(true);
    Pause(RowSet::Checked);
}

void EncodingDriver::PauseSelected() {
    Pause(RowSet::Selected);
}

void EncodingDriver::StopRows(RowSet set) {
    // Every row's status moves first, and only then are the children asked to end: a child
    // that ended at once would otherwise free its place for a waiting row of the same set,
    // which the driver thread could start before this loop reached it (a run the user had
    // just stopped went on, and its end started the after-run action).
    std::vector<int> rows;
    for (int row = 0; row < m_list.GetRowCount(); ++row) {
        MediaItem* item = m_list.GetItem(row);
        if (!item || !InSet(set, row))
            continue;
        rows.push_back(row);
        JobStatus status = item->Status();
        if (status == JobStatus::Running)
            Move(*item, status, JobStatus::Aborted);
        else if (status == JobStatus::Paused || status == JobStatus::Pending)
            Move(*item, status, JobStatus::AbortedSuspended);
        else if (status == JobStatus::Waiting)
            Move(*item, status, JobStatus::Idle);
    }
    // The counters follow when the exit arrives, through OnProcessExit.
    std::vector<CEncodeProcess*> asked;
    for (int row : rows) {
        MediaItem* item = m_list.GetItem(row);
        CEncodeProcess* child = item != nullptr ? item->process.load() : nullptr;
        if (child && child->IsRunning()) {
            child->RequestStop(kStoppedExitCode);
            asked.push_back(child);
        }
        m_list.RefreshRow(row);
    }
    // All were asked at once, so a run of tools that ignore the request costs one grace period.
    for (CEncodeProcess* child : asked)
        child->Kill(kStoppedExitCode);
    Wake();
}

bool EncodingDriver::StopChecked(bool fromCommand) {
    if (fromCommand)
        m_host.EnableTabStrip(true);
    if (AnyActive(false) && !m_host.AskYesNo(kStopQuestionId))
        return false;
    StopRows(RowSet::Checked);
    return true;
}

bool EncodingDriver::StopCheckedFromMenu() {
    m_runPending = 0;
    return StopChecked(true);
}

void EncodingDriver::StopSelected() {
    StopRows(RowSet::Selected);
}

bool EncodingDriver::CanEncodeChecked() {
    return m_list.GetRowCount() > 0 && !AnyInSet(RowSet::Checked, IsBusy);
}

bool EncodingDriver::CanEncodeSelected() {
    for (int row = 0; row < m_list.GetRowCount(); ++row)
        if (m_list.IsSelected(row))
            return !AnyInSet(RowSet::Selected, IsBusy);
    return false;
}

bool EncodingDriver::CanPauseChecked() {
    return AnyInSet(RowSet::Checked, IsBusy);
}
bool EncodingDriver::CanPauseSelected() {
    return AnyInSet(RowSet::Selected, IsBusy);
}
bool EncodingDriver::CanStopChecked() {
    return AnyInSet(RowSet::Checked, IsStoppable);
}
bool EncodingDriver::CanStopSelected() {
    return AnyInSet(RowSet::Selected, IsStoppable);
}

bool EncodingDriver::UpdateCheckingEnabled() {
    bool enabled = CanEncodeChecked();
    if (m_list.GetRowCount() > 0)
        m_list.EnableChecking(enabled);
    if (enabled || m_list.GetRowCount() == 0)
        m_host.EnableTabStrip(true);
    return enabled;
}

bool EncodingDriver::AnyActive(bool includeWaiting) {
    for (int row = 0; row < m_list.GetRowCount(); ++row) {
        MediaItem* item = m_list.GetItem(row);
        if (!item)
            continue;
        JobStatus s = item->Status();
        if (s == JobStatus::Running || s == JobStatus::Paused || s == JobStatus::Pending ||
            (includeWaiting && s == JobStatus::Waiting))
            return true;
    }
    return false;
}

bool EncodingDriver::AnySelectedActive() {
    return AnyInSet(RowSet::Selected, IsStoppable);
}

double EncodingDriver::GetRunDoneSeconds() {
    double done = 0;
    for (int row = 0; row < m_list.GetRowCount(); ++row) {
        MediaItem* item = m_list.GetItem(row);
        if (!item || item->inRun != 1)
            continue;
        const JobStatus s = item->Status();
        const double duration = GetEffectiveDuration(*item);
        CEncodeProcess* child = item->process.load();
        // A finished row counts whole: the tool's last time line may stop a frame short, and a
        // run that completed must read 100%. A paused row keeps what it has done.
        if (s == JobStatus::Failed || s == JobStatus::Completed)
            done += duration;
        else if ((s == JobStatus::Running || s == JobStatus::Paused || s == JobStatus::Pending) && child)
            done += std::min(child->TimeSeconds(), duration);
    }
    return done;
}

EncodingDriver::RunCounts EncodingDriver::GetRunCounts() {
    RunCounts counts;
    for (int row = 0; row < m_list.GetRowCount(); ++row) {
        MediaItem* item = m_list.GetItem(row);
        if (!item || item->inRun != 1)
            continue;
        ++counts.total;
        switch (item->Status()) {
            case JobStatus::Completed: ++counts.completed; break;
            case JobStatus::Failed: ++counts.failed; break;
            case JobStatus::Aborted:
            case JobStatus::AbortedSuspended: ++counts.stopped; break;
            default: break;
        }
    }
    return counts;
}

double EncodingDriver::GetRunTotalSeconds() {
    double total = 0;
    for (int row = 0; row < m_list.GetRowCount(); ++row) {
        MediaItem* item = m_list.GetItem(row);
        if (item && item->inRun == 1)
            total += GetEffectiveDuration(*item);
    }
    return total;
}

void EncodingDriver::OnRunFinished() {
    m_runPending = 0;
    int playSound = 0;
    std::string soundPath;
    {
        std::lock_guard lock(m_soundMutex);
        playSound = m_config.playSound;
        soundPath = m_config.soundPath;
    }
    if (playSound)
        m_host.PlaySound(soundPath);
    int action = m_afterConvertAction.load();
    if (action >= 0 && action <= 3)
        m_host.StartAfterRunAction(action);
    else if (action != 4)
        m_host.ShowMessage(g_Language.GetString(kAbnormalActionId), true);
}

void EncodingDriver::CheckDiskSpace() {
    if (!m_host.IsConvertMode() || !AnyActive(false))
        return;
    if (m_freeSpace(m_list.GetOutputDirectory()) >= kMinFreeBytes)
        return;
    StopChecked(false);
    m_host.ShowMessage(g_Language.GetString(kNotEnoughSpaceId), true);
}

}  // namespace ac
