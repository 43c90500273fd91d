// The burn run: conversion workers on ctt, then the copy loop on the recorder.
#include "burn/BurnDriver.h"

#include "burn/BurnTexts.h"
#include "platform/CommandLine.h"
#include "platform/Paths.h"

#include <unistd.h>

#include <algorithm>
#include <chrono>
#include <cmath>
#include <cstdlib>
#include <filesystem>

namespace ac::burn {
namespace {

namespace fs = std::filesystem;
using namespace std::chrono_literals;

// A temporary folder that cannot be read has no room for the burn's files.
std::uint64_t FreeBytes(const std::string& folder) {
    return platform::FreeDiskBytes(folder).value_or(0);
}

bool IsFinal(JobStatus status) {
    return status != JobStatus::Running && status != JobStatus::Waiting;
}

Prompt Ask(std::uint32_t textId, std::uint32_t captionId, PromptIcon icon, bool defaultNo = false) {
    Prompt prompt;
    prompt.textId = textId;
    prompt.captionId = captionId;
    prompt.icon = icon;
    prompt.defaultNo = defaultNo;
    return prompt;
}

}  // namespace

int CheckDisc(ICdRecorder* recorder, std::int64_t sectors) {
    if (!recorder)
        return -99;
    const int media = recorder->MediaType();
    if (media == kMediaUnknown || media == kMediaNone)
        return -99;
    if (media == kMediaCdRom)
        return -90;
    if (media != kMediaCdR && media != kMediaCdRw)
        return -91;
    DiskInfoBlock info{};
    const bool haveInfo = recorder->ReadDiskInfo(info);
    const int state = haveInfo ? DiscState(info) : -1;
    if (media == kMediaCdR && state != kDiscStateBlank)
        return -88;
    std::int64_t total = 0, freeBlocks = 0;
    if (!recorder->Capacity(total, freeBlocks))
        return media == kMediaCdR ? -88 : -100;
    if (freeBlocks < sectors)
        return -89;
    return state == kDiscStateComplete ? 1 : 0;
}

std::uint32_t WaitMessageId(int code) {
    switch (code) {
        case -99:
            return text::kWaitInsertEmpty;
        case -91:
            return text::kWaitNotCd;
        case -90:
        case -88:
            return text::kWaitNotWritable;
        case -89:
            return text::kWaitNoSpace;
        case 1:
            return text::kWaitRewritableNotEmpty;
        default:
            return text::kWaitCheckFailed;
    }
}

std::string DefaultTemporaryFolder() {
    const char* tmp = std::getenv("TMPDIR");
    std::string base = tmp && *tmp ? tmp : "/tmp";
    while (base.size() > 1 && base.back() == '/')
        base.pop_back();
    return base + "/audio-converter-burn";
}

BurnDriver::BurnDriver(IBurnList& list, IBurnHost& host, BurnOutputNamer namer,
                       BurnCommandBuilder builder)
    : m_list(list),
      m_host(host),
      m_namer(std::move(namer)),
      m_builder(std::move(builder)),
      m_freeSpace(FreeBytes) {}

BurnDriver::~BurnDriver() {
    Abandon();
}

void BurnDriver::SetSettings(BurnSettings settings) {
    m_settings = std::move(settings);
}

void BurnDriver::SetFreeSpaceProbe(std::function<std::uint64_t(const std::string&)> probe) {
    m_freeSpace = std::move(probe);
}

bool BurnDriver::CanStop() const {
    return m_burnActive && !m_abort && !m_erasing && !m_closing;
}

double BurnDriver::BarPosition() const {
    std::lock_guard lock(m_progressLock);
    return m_barPosition;
}

std::vector<std::string> BurnDriver::TemporaryFiles() const {
    std::lock_guard lock(m_progressLock);
    std::vector<std::string> files;
    for (const std::string& path : m_rowOutputs) {
        std::error_code error;
        if (fs::exists(path, error))
            files.push_back(path);
    }
    return files;
}

void BurnDriver::SetBar(double percent) {
    int whole;
    {
        std::lock_guard lock(m_progressLock);
        m_barPosition = std::clamp(percent, 0.0, 100.0);
        whole = static_cast<int>(m_barPosition);
        if (whole == m_shownPercent)
            return;
        m_shownPercent = whole;
    }
    m_host.SetProgress(whole);
}

bool BurnDriver::StartBurn() {
    if (m_burnActive || m_thread.joinable()) {
        if (m_burnActive)
            return false;
        m_thread.join();
    }
    m_host.EnablePanels(false);
    if (PrepareBurn() != 0) {
        m_host.EnablePanels(true);
        return false;
    }
    const int rows = m_list.RowCount();
    for (int row = 0; row < rows; ++row) {
        MediaItem* item = m_list.Item(row);
        if (!item || item->Status() == JobStatus::UnknownFile)
            continue;
        item->SetStatus(JobStatus::Waiting);
        m_list.RefreshRow(row, 0);
    }
    m_host.SetStatusText(0);
    m_copiesDone = 0;
    m_settings.copies = std::max(1, m_settings.copies);
    m_conversionShare = m_settings.copies == 1 ? 60 : m_settings.copies <= 3 ? 30 : 15;
    m_copyShare = (100 - m_conversionShare) / m_settings.copies;
    m_shownPercent = -1;
    SetBar(0);
    m_abort = 0;
    m_burnActive = 1;  // before the thread, so no second Burn slips in
    m_thread = std::thread([this] { RunBurn(); });
    return true;
}

int BurnDriver::PrepareBurn() {
    if (!m_recorder) {
        m_host.Tell(Ask(text::kNoRecorder, 0, PromptIcon::Error));
        return 1;
    }
    if (const std::string why = m_recorder->UnavailableReason(); !why.empty()) {
        Prompt prompt = Ask(text::kImageUnavailable, 0, PromptIcon::Error);
        prompt.argument = why;
        m_host.Tell(prompt);
        return 1;
    }
    const std::int64_t sectors = m_settings.discType == DiscType::Audio
                                     ? CountAudioSector(m_compilationSeconds)
                                     : (static_cast<std::int64_t>(m_compilationMinutes) + 10) * 512;
    m_discChecked = 0;
    // A source on the recorder's own disc: the disc is checked once the sources are read.
    const std::string drive = m_recorder->DriveText();
    const int rows = m_list.RowCount();
    for (int row = 0; row < rows && !m_recorder->IsImage(); ++row) {
        MediaItem* item = m_list.Item(row);
        if (item && !drive.empty() && item->sourcePath.starts_with(drive)) {
            m_discChecked = 1;
            return 0;
        }
    }
    bool ignored = false;
    int code = CheckDisc(m_recorder, sectors);
    if (code == 1 &&
        !m_host.Ask(Ask(text::kEraseNonEmpty, text::kWarningCaption, PromptIcon::Warning))) {
        if (!m_host.WaitForDisc(m_recorder, 1, sectors, true, ignored))
            return 1;
    } else if (code != 0 && code != 1) {
        if (!m_host.WaitForDisc(m_recorder, code, sectors, true, ignored))
            return 1;
    }
    if (ignored)
        m_discChecked = 1;
    else
        m_recorder->BeforeWrite();
    return 0;
}

bool BurnDriver::EnsureTemporaryFolder() {
    std::string folder =
        m_settings.temporaryFolder.empty() ? DefaultTemporaryFolder() : m_settings.temporaryFolder;
    while (folder.size() > 1 && folder.back() == '/')
        folder.pop_back();
    std::error_code error;
    if (!platform::EnsureDirectory(folder, 0700) || !fs::is_directory(folder, error) ||
        ::access(folder.c_str(), W_OK) != 0)
        return false;
    std::lock_guard lock(m_progressLock);
    m_folder = folder;
    return true;
}

void BurnDriver::RunBurn() {
    m_burnActive = 1;
    auto endWith = [&](bool written) { EndRun(written); };
    if (!EnsureTemporaryFolder()) {
        m_host.Tell(Ask(text::kTempFolderFailed, 0, PromptIcon::Error));
        endWith(false);
        return;
    }

    // Stage one: every row to a temporary file.
    const auto conversionStart = std::chrono::steady_clock::now();
    m_conversionSeconds = 0;
    m_writeSeconds = 0;
    m_converting = 1;
    m_rowCursor = -1;
    m_secondsDone = 0;
    m_secondsTotal = 0;
    const int rows = m_list.RowCount();
    for (int row = 0; row < rows; ++row) {
        if (MediaItem* item = m_list.Item(row))
            m_secondsTotal += GetEffectiveDuration(*item);
    }
    for (Slot& slot : m_slots)
        slot = Slot{};
    const int workers = std::clamp(m_settings.maxProcesses, 1, kMaxWorkers);
    // The stage ends when every worker has returned. Reading the row cursor and the slots
    // instead saw a worker between taking its row and taking its slot as "all done": the
    // timers stopped for the rest of the stage, disk check and progress included.
    m_workersLeft = workers;
    std::vector<std::thread> threads;
    for (int i = 0; i < workers; ++i)
        threads.emplace_back([this] {
            ConvertWorker();
            --m_workersLeft;
        });
    // The driver's own timers while the workers run: progress each tick, disk space each third.
    for (int tick = 0;; ++tick) {
        const bool finished = m_workersLeft.load() == 0;
        ProgressTick();
        if (tick % 3 == 2)
            CheckDiskSpace();
        if (finished)
            break;
        // In steps of 100 ms, so the last worker's end is seen at once.
        for (int waited = 0; waited < m_tickPeriodMs && m_workersLeft.load() > 0; waited += 100)
            std::this_thread::sleep_for(std::chrono::milliseconds(std::min(100, m_tickPeriodMs)));
    }
    for (std::thread& thread : threads)
        thread.join();
    m_conversionSeconds = std::chrono::duration<double>(std::chrono::steady_clock::now() - conversionStart).count();
    ProgressTick();
    {
        std::lock_guard lock(m_slotLock);
        for (Slot& slot : m_slots)
            slot = Slot{};
    }
    if (m_abort) {
        m_converting = 0;
        if (m_diskFull)
            m_host.Tell(Ask(text::kDiskFull, 0, PromptIcon::Error));
        endWith(false);
        return;
    }

    // A source read from the recorder's own disc: it goes out for the blank one.
    if (m_recorder && m_discChecked && !m_recorder->IsImage()) {
        for (int row = 0; row < rows; ++row) {
            MediaItem* item = m_list.Item(row);
            if (item && item->sourcePath.starts_with(m_recorder->DriveText())) {
                m_recorder->Eject();
                break;
            }
        }
    }

    int failures = 0;
    for (int row = 0; row < rows; ++row) {
        MediaItem* item = m_list.Item(row);
        if (!item)
            continue;
        while (!IsFinal(item->Status()))
            std::this_thread::sleep_for(100ms);
        if (item->Status() == JobStatus::Completed) {
            std::lock_guard lock(m_progressLock);
            if (m_settings.discType == DiscType::Audio) {
                std::string title = fs::path(item->outputPath).filename().string();
                std::string path = item->outputPath;
                m_tracks.push_back({path, title.substr(0, 259)});
            } else {
                m_dataFiles.push_back(item->outputPath);
            }
        } else {
            ++failures;
        }
    }
    if (failures > 0 && failures == rows) {
        m_converting = 0;
        m_host.Tell(Ask(text::kAllFailed, 0, PromptIcon::Error));
        endWith(false);
        return;
    }
    if (failures > 0 &&
        !m_host.Ask(Ask(text::kSomeFailed, text::kInformationCaption, PromptIcon::Information))) {
        m_converting = 0;
        endWith(false);
        return;
    }
    m_converting = 0;
    if (!m_abort)
        SetBar(m_conversionShare);

    if (m_abort || !m_recorder) {
        if (m_recorder && !m_discChecked)
            m_recorder->AfterWrite();
        endWith(false);
        return;
    }

    std::int64_t sectors = 0;
    if (m_settings.discType == DiscType::Audio) {
        if (m_tracks.size() > static_cast<std::size_t>(kMaxAudioTracks)) {
            m_host.PostTracksUnavailable();
            endWith(false);
            return;
        }
        for (const AudioTrack& track : m_tracks) {
            const std::int64_t trackSectors = CountWavSectors(track.path);
            if (trackSectors <= 0) {
                sectors = 0;
                break;
            }
            sectors += trackSectors;
        }
        if (sectors <= 0) {
            if (!m_discChecked)
                m_recorder->AfterWrite();
            m_host.PostTracksUnavailable();
            endWith(false);
            return;
        }
        sectors += static_cast<std::int64_t>(m_tracks.size() > 1 ? m_tracks.size() - 1 : 0) *
                   std::max(0, m_settings.pauseSeconds) * 75;
    } else {
        m_tree.Clear();
        for (const std::string& path : m_dataFiles) {
            const std::string name = fs::path(path).filename().string();
            if (auto item = CreateFileItem(name, path))
                m_tree.AddChild(name, std::move(item));
        }
        SetItemFileName(*DiscTree::Item(m_tree.Root()), m_settings.volumeLabel);
        const std::int64_t bytes = CountISOLength(m_tree);
        sectors = bytes < 0 ? 0 : bytes / kDataBlockBytes + 1;
    }
    RunCopies(sectors);
}

void BurnDriver::RunCopies(std::int64_t sectors) {
    std::int64_t total = 0, freeBlocks = 0;
    if (m_recorder->Capacity(total, freeBlocks) && freeBlocks <= sectors)
        Eject(false);
    {
        std::lock_guard lock(m_writeLock);
        if (!m_abort)
            m_writing = 1;
        m_cancelled = 0;
    }
    bool allWritten = false;
    ICdRecorder* recorder = m_recorder;
    while (m_writing && !m_abort && m_copiesDone < m_settings.copies) {
        const bool lastCopy = m_copiesDone + 1 >= m_settings.copies;
        m_host.SetStatusText(text::kCheckingDiscLoop);
        const int code = CheckDisc(recorder, sectors);
        if (code == 1 && m_discChecked) {
            if (!m_host.Ask(
                    Ask(text::kEraseNonEmpty, text::kWarningCaption, PromptIcon::Warning))) {
                recorder->AfterWrite();
                Eject();
                continue;
            }
        } else if (code != 0 && code != 1) {
            recorder->AfterWrite();
            Eject();
            m_host.SetStatusText(text::kWaitingDisc);
            bool ignored = false;
            if (!m_host.WaitForDisc(recorder, code, sectors, false, ignored)) {
                recorder->AfterWrite();
                recorder = nullptr;
                break;
            }
            continue;  // the disc that came is checked again
        }
        recorder->BeforeWrite();
        m_writeFailed = 0;
        m_discChecked = 1;
        m_host.SetStatusText(text::kBurnDiscStarting);
        BurnOneCopy();
        ++m_copiesDone;

        if (m_abort && m_ejectRequested) {
            const bool eject = m_host.Ask(Ask(text::kCancelledEject, 0, PromptIcon::Error, true));
            recorder->AfterWrite();
            if (eject)
                Eject();
            break;
        }
        if (m_writeFailed) {
            m_host.SetStatusText(text::kWriteFailedStatus);
            if (!lastCopy) {
                if (!m_host.Ask(Ask(text::kWriteFailedEject, text::kWarningCaption,
                                    PromptIcon::Warning, true)))
                    m_writing = 0;
                recorder->AfterWrite();
                Eject();
            } else {
                const bool eject =
                    m_host.Ask(Ask(text::kWriteFailedEject, 0, PromptIcon::Error, true));
                recorder->AfterWrite();
                if (eject)
                    Eject();
            }
            continue;
        }
        if (m_cancelled) {
            const bool eject = m_host.Ask(Ask(text::kCancelledEject, 0, PromptIcon::Error, true));
            recorder->AfterWrite();
            if (eject)
                Eject();
            break;
        }
        if (!lastCopy) {
            m_host.SetStatusText(text::kWaitingNextCopy);
            if (!m_host.Ask(Ask(text::kAnotherCopy, 0, PromptIcon::Information)))
                m_writing = 0;
            recorder->AfterWrite();
            Eject();
            continue;
        }
        m_host.SetStatusText(text::kBurnSuccessful);
        allWritten = true;
        const bool eject = m_host.Ask(Ask(text::kSuccessEject, 0, PromptIcon::Information, true));
        recorder->AfterWrite();
        if (eject)
            Eject();
        m_host.PostCapacityRefresh();
    }
    EndRun(allWritten);
}

bool BurnDriver::BurnOneCopy() {
    BurnJob job;
    job.audio = m_settings.discType == DiscType::Audio;
    job.speed = m_settings.speed;
    job.pauseSeconds = m_settings.pauseSeconds;
    job.copyIndex = m_copiesDone;
    if (job.audio) {
        if (m_tracks.empty() || m_tracks.size() > static_cast<std::size_t>(kMaxAudioTracks))
            return false;
        job.tracks = m_tracks;
    } else {
        if (m_tree.Empty())
            return false;
        job.tree = &m_tree;
    }
    const auto start = std::chrono::steady_clock::now();
    const bool written = m_recorder->Burn(job, *this);
    m_writeSeconds = m_writeSeconds + std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count();
    return written;
}

void BurnDriver::Eject(bool showText) {
    if (!m_recorder)
        return;
    if (showText)
        m_host.SetStatusText(text::kEjectingDisc);
    m_recorder->Eject();
}

void BurnDriver::EndRun(bool allCopiesWritten) {
    m_tree.Clear();
    DeleteTemporaryFiles();
    {
        std::lock_guard lock(m_writeLock);
        m_writing = 0;
        m_converting = 0;
    }
    m_erasing = 0;
    m_closing = 0;
    m_ejectRequested = 0;
    m_host.SetStatusText(0);
    m_host.SetProgress(0);
    m_host.EnablePanels(true);
    m_host.PostCapacityRefresh();
    m_burnActive = 0;
    m_host.RunEnded(allCopiesWritten);
}

void BurnDriver::DeleteTemporaryFiles() {
    std::vector<std::string> files;
    {
        std::lock_guard lock(m_progressLock);
        for (const AudioTrack& track : m_tracks)
            files.push_back(track.path);
        files.insert(files.end(), m_dataFiles.begin(), m_dataFiles.end());
        files.insert(files.end(), m_rowOutputs.begin(), m_rowOutputs.end());
        m_tracks.clear();
        m_dataFiles.clear();
        m_rowOutputs.clear();
    }
    for (const std::string& path : files)
        ::unlink(path.c_str());
    const int rows = m_list.RowCount();
    for (int row = 0; row < rows; ++row) {
        if (MediaItem* item = m_list.Item(row))
            item->outputHold.Release();
    }
}

void BurnDriver::ConvertWorker() {
    for (;;) {
        if (m_abort)
            return;
        int row;
        {
            std::lock_guard lock(m_cursorLock);
            if (m_rowCursor + 1 >= m_list.RowCount())
                return;
            row = ++m_rowCursor;
        }
        MediaItem* item = m_list.Item(row);
        if (!item || item->Status() == JobStatus::UnknownFile)
            continue;
        m_list.SelectOnly(row);
        if (!EnsureTemporaryFolder()) {
            m_host.Tell(Ask(text::kTempFolderFailed, 0, PromptIcon::Error));
            item->SetStatus(JobStatus::Aborted);
            m_list.RefreshRow(row, 0);
            return;
        }
        ConvertRow(row, *item);
    }
}

void BurnDriver::ConvertRow(int row, MediaItem& item) {
    if (!item.process.load())
        item.AdoptProcess(std::make_unique<CEncodeProcess>());
    CEncodeProcess* process = item.process.load();
    item.SetStatus(JobStatus::Running);
    int slotIndex = -1;
    {
        std::lock_guard lock(m_slotLock);
        for (int i = 0; i < kMaxWorkers && slotIndex < 0; ++i) {
            if (m_slots[i].row < 0) {
                slotIndex = i;
                m_slots[i] = Slot{row, 0};
            }
        }
    }
    std::string folder;
    {
        std::lock_guard lock(m_progressLock);
        folder = m_folder;
    }
    item.outputHold = m_namer(row, item, folder);
    item.outputPath = item.outputHold.Path();
    {
        std::lock_guard lock(m_progressLock);
        m_rowOutputs.push_back(item.outputPath);
    }
    ::unlink(item.outputPath.c_str());  // an old file of that name
    const std::string command =
        platform::QuoteCommandValue(m_settings.toolPath) + m_builder(item, item.outputPath);
    m_list.RefreshRow(row, 0);

    {
        std::unique_lock lock(m_runningLock);
        m_runningChanged.wait(lock, [&] {
            return m_abort || m_runningChildren < std::max(1, m_settings.maxRunningProcesses);
        });
        ++m_runningChildren;
    }
    bool launched = false;
    if (!m_abort) {
        process->SetCurrentDirectory(m_settings.toolDirectory);
        process->SetOutputPath(item.outputPath);
        launched = process->Launch(command);
        while (launched && process->IsRunning() && !m_abort)
            std::this_thread::sleep_for(100ms);
        if (launched && m_abort && process->IsRunning())
            process->Kill(kStoppedExitCode);
        if (launched)
            process->WaitForExit();
    }
    {
        std::lock_guard lock(m_runningLock);
        --m_runningChildren;
    }
    m_runningChanged.notify_all();

    JobStatus status;
    if (!launched) {
        status = m_abort ? JobStatus::Aborted : JobStatus::Failed;
    } else {
        status = StatusForExitCode(process->ExitCode());
        std::error_code error;
        // The tool said it finished, yet no file came: nothing to put on the disc.
        if (status == JobStatus::Completed && !fs::exists(item.outputPath, error))
            status = JobStatus::Failed;
    }
    if (status != JobStatus::Completed)
        ::unlink(item.outputPath.c_str());
    item.SetStatus(status);
    m_list.RefreshRow(row, status == JobStatus::Completed ? 100 : 0);
    std::lock_guard lock(m_slotLock);
    if (slotIndex >= 0) {
        const double length = GetEffectiveDuration(item);
        // What the last tick did not count of a row that ended.
        if (status == JobStatus::Completed) {
            std::lock_guard progress(m_progressLock);
            m_secondsDone = std::min(
                m_secondsTotal, m_secondsDone + std::max(0.0, length - m_slots[slotIndex].seconds));
        }
        m_slots[slotIndex] = Slot{};
    }
}

void BurnDriver::ProgressTick() {
    double shown;
    {
        std::lock_guard lock(m_slotLock);
        for (Slot& slot : m_slots) {
            if (slot.row < 0)
                continue;
            MediaItem* item = m_list.Item(slot.row);
            CEncodeProcess* process = item ? item->process.load() : nullptr;
            if (!process || item->Status() != JobStatus::Running)
                continue;
            const double length = GetEffectiveDuration(*item);
            const double seconds = std::min(process->TimeSeconds(), length);
            const int percent =
                length > 0 ? std::min(100, static_cast<int>(seconds / length * 100)) : 0;
            m_list.RefreshRow(slot.row, percent);
            std::lock_guard progress(m_progressLock);
            m_secondsDone =
                std::min(m_secondsTotal, m_secondsDone + std::max(0.0, seconds - slot.seconds));
            slot.seconds = std::max(slot.seconds, seconds);
        }
        std::lock_guard progress(m_progressLock);
        shown = m_secondsTotal < 0.1 ? 0 : m_secondsDone / m_secondsTotal * m_conversionShare;
    }
    if (m_converting)
        SetBar(shown);
}

void BurnDriver::CheckDiskSpace() {
    if (!m_converting && !m_writing)
        return;
    std::string folder;
    {
        std::lock_guard lock(m_progressLock);
        folder = m_folder;
    }
    if (folder.empty() || m_freeSpace(folder) >= kMinFreeBytes)
        return;
    std::lock_guard lock(m_writeLock);
    if (m_abort)
        return;
    m_diskFull = 1;
    m_abort = 1;
    m_runningChanged.notify_all();
    if (m_writing && m_recorder)
        m_recorder->AbortWrite();
}

void BurnDriver::StopBurn() {
    std::lock_guard lock(m_writeLock);
    if (m_converting) {
        if (!m_host.Ask(Ask(text::kStopEncoding, text::kWarningCaption, PromptIcon::Question)))
            return;
        m_abort = 1;
        m_runningChanged.notify_all();
        const int rows = m_list.RowCount();
        for (int row = 0; row < rows; ++row) {
            MediaItem* item = m_list.Item(row);
            if (!item)
                continue;
            if (item->Status() == JobStatus::Running)
                item->SetStatus(JobStatus::Aborted);
            else if (item->Status() == JobStatus::Waiting)
                item->SetStatus(JobStatus::Idle);
            if (CEncodeProcess* process = item->process.load(); process && process->IsRunning())
                process->RequestStop(kStoppedExitCode);
            m_list.RefreshRow(row, 0);
        }
        return;
    }
    if (!m_writing)
        return;
    if (m_settings.discType != DiscType::Audio) {
        m_host.Tell(Ask(text::kCannotStopData, text::kWarningCaption, PromptIcon::Warning));
        return;
    }
    if (!m_host.Ask(Ask(text::kStopAudioWrite, text::kWarningCaption, PromptIcon::Warning)))
        return;
    m_abort = 1;
    if (!m_cancelled && m_recorder)
        m_recorder->AbortWrite();
    m_ejectRequested = 1;
}

void BurnDriver::Join() {
    if (m_thread.joinable())
        m_thread.join();
}

void BurnDriver::Abandon() {
    {
        std::lock_guard lock(m_writeLock);
        m_abort = 1;
    }
    m_runningChanged.notify_all();
    if (m_recorder && m_writing)
        m_recorder->AbortWrite();
    const int rows = m_list.RowCount();
    for (int row = 0; row < rows; ++row) {
        MediaItem* item = m_list.Item(row);
        CEncodeProcess* process = item ? item->process.load() : nullptr;
        if (process && process->IsRunning())
            process->RequestStop(kStoppedExitCode);
    }
    Join();
    DeleteTemporaryFiles();
}

int BurnDriver::OnBurnEvent(int event, int value) {
    switch (event) {
        case kEventPoll:
            return m_abort ? 1 : 0;
        case kEventTotalUnits: {
            double position;
            {
                std::lock_guard lock(m_progressLock);
                position = m_copiesDone * m_copyShare + m_conversionShare;
                m_tickStep = m_copyShare * kUnitsPerTick / std::max(1, value);
                m_shownPercent = -1;
            }
            SetBar(position);
            return 0;
        }
        case kEventUnit: {
            double position;
            {
                std::lock_guard lock(m_progressLock);
                position = std::min(m_barPosition + m_tickStep,
                                    (m_copiesDone + 1) * m_copyShare + m_conversionShare);
            }
            SetBar(position);
            return 0;
        }
        case kEventClosingDone:
            m_closing = 0;
            return 0;
        case kEventCheckingDisc:
            m_host.SetStatusText(text::kCheckingDiscEvent);
            return 0;
        case 9:
            return 1;
        case kEventErasing:
            m_erasing = 1;
            m_host.SetStatusText(text::kErasing);
            return 0;
        case kEventErased:
            m_erasing = 0;
            m_host.SetStatusText(text::kErased);
            return 0;
        case kEventNoDisc:
            return m_host.Tell(Ask(text::kNoDiscRetry, text::kWarningCaption, PromptIcon::Warning),
                               true)
                       ? 1
                       : 0;
        case kEventDiscNotEmpty:
            m_host.SetStatusText(text::kDiscNotEmpty);
            return 0;
        case kEventNoSpace:
            return m_host.Tell(Ask(text::kNoSpaceRetry, text::kWarningCaption, PromptIcon::Warning),
                               true)
                       ? 1
                       : 0;
        case kEventCancelled:
            m_cancelled = 1;
            return 0;
        case kEventStarting:
            m_host.SetStatusText(text::kBurnStarting);
            return 0;
        case kEventLeadIn:
            m_host.SetStatusText(text::kWritingLeadIn);
            return 0;
        case kEventWritingData:
            m_host.SetStatusText(text::kWritingData);
            return 0;
        case kEventClosingData:
            m_host.SetStatusText(text::kClosingData);
            return 0;
        case kEventWritingAudio:
            m_host.SetStatusText(text::kWritingAudio);
            return 0;
        case kEventAudioTrack:
            m_host.SetStatusText(text::kWritingTrack, std::to_string(value));
            return 0;
        case kEventClosingTrack:
            m_closing = 1;
            m_host.SetStatusText(text::kClosingTrack);
            return 0;
        case kEventWriteFailed:
            m_writeFailed = 1;
            return 0;
        default:
            return 0;
    }
}

}  // namespace ac::burn
