#include "ConsoleRun.h"

#include "ProgressLine.h"

#include <algorithm>
#include <chrono>
#include <filesystem>

namespace ac::console {
namespace {

constexpr auto kDrawPeriod = std::chrono::milliseconds(200);

bool IsEnded(JobStatus s) {
    return s == JobStatus::Completed || s == JobStatus::Failed || s == JobStatus::Aborted ||
           s == JobStatus::UnknownFile || s == JobStatus::Idle;
}

const char* StatusWord(JobStatus s) {
    switch (s) {
        case JobStatus::Completed:
            return "done";
        case JobStatus::Failed:
            return "FAILED";
        case JobStatus::Aborted:
        case JobStatus::AbortedSuspended:
            return "stopped";
        case JobStatus::UnknownFile:
            return "unknown file";
        default:
            return "";
    }
}

}  // namespace

ConsoleRun::ConsoleRun(std::string outputDirectory, bool drawBar, std::FILE* out)
    : m_outputDirectory(std::move(outputDirectory)), m_drawBar(drawBar), m_out(out) {}

// Rows go before anything they call back into; their destructors end any child still alive.
ConsoleRun::~ConsoleRun() {
    std::vector<std::unique_ptr<MediaItem>> rows;
    {
        std::lock_guard lock(m_mutex);
        rows.swap(m_rows);
    }
}

void ConsoleRun::AddRow(std::unique_ptr<MediaItem> item) {
    std::lock_guard lock(m_mutex);
    m_rows.push_back(std::move(item));
    m_selected.push_back(0);
}

int ConsoleRun::GetRowCount() {
    std::lock_guard lock(m_mutex);
    return static_cast<int>(m_rows.size());
}

MediaItem* ConsoleRun::GetItem(int row) {
    std::lock_guard lock(m_mutex);
    return row < 0 || row >= static_cast<int>(m_rows.size()) ? nullptr : m_rows[row].get();
}

bool ConsoleRun::IsSelected(int row) {
    std::lock_guard lock(m_mutex);
    return row >= 0 && row < static_cast<int>(m_selected.size()) && m_selected[row];
}

void ConsoleRun::SelectOnly(int row) {
    std::lock_guard lock(m_mutex);
    for (std::size_t i = 0; i < m_selected.size(); ++i)
        m_selected[i] = static_cast<int>(i) == row;
}

void ConsoleRun::RefreshRow(int) {
    std::lock_guard lock(m_mutex);
    m_changeSeen = true;
    m_changed.notify_all();
}

void ConsoleRun::ShowMessage(const std::string& text, bool) {
    std::fprintf(stderr, "\nacconvert: %s\n", text.c_str());
}

void ConsoleRun::PostRunFinished() {
    RefreshRow(-1);
}

bool ConsoleRun::AllEnded() {
    for (int row = 0; row < GetRowCount(); ++row)
        if (!IsEnded(GetItem(row)->Status()))
            return false;
    return true;
}

void ConsoleRun::ReportEnded(int row, JobStatus status, int overall) {
    MediaItem* item = GetItem(row);
    if (m_drawBar)
        ClearProgressLine(m_out);
    std::fprintf(m_out, "[%d/%d] %s: %s", row + 1, GetRowCount(), StatusWord(status),
                 item->sourcePath.c_str());
    if (status == JobStatus::Completed)
        std::fprintf(m_out, " -> %s", item->outputPath.c_str());
    std::fprintf(m_out, " (all %d%%)\n", overall);
    if (status == JobStatus::Failed) {
        if (CEncodeProcess* child = item->process.load()) {
            const std::vector<std::string> lines = child->ErrorLines();
            for (const auto& line : lines)
                std::fprintf(stderr, "    %s\n", line.c_str());
            if (lines.empty())
                std::fprintf(stderr, "    %s\n", child->FailureReason().c_str());
        }
    } else if (status == JobStatus::UnknownFile && !item->info.probeError.empty()) {
        std::fprintf(stderr, "    %s\n", item->info.probeError.c_str());
    }
}

void ConsoleRun::Draw(EncodingDriver& driver, bool final) {
    double total = driver.GetRunTotalSeconds();
    int overall = total > 0 ? static_cast<int>(driver.GetRunDoneSeconds() / total * 100) : 0;
    overall = std::clamp(overall, 0, 100);
    for (int row = 0; row < GetRowCount(); ++row) {
        MediaItem* item = GetItem(row);
        JobStatus status = item->Status();
        JobStatus& reported = m_reported[row];
        if (status == reported)
            continue;
        if (status == JobStatus::Running && !m_drawBar)
            std::fprintf(m_out, "[%d/%d] converting: %s\n", row + 1, GetRowCount(),
                         item->sourcePath.c_str());
        if (IsEnded(status) && status != JobStatus::Idle)
            ReportEnded(row, status, overall);
        reported = status;
    }
    if (m_drawBar && !final) {
        std::string current;
        int percent = 0;
        for (int row = 0; row < GetRowCount(); ++row) {
            MediaItem* item = GetItem(row);
            if (item->Status() == JobStatus::Running) {
                current = std::filesystem::path(item->sourcePath).filename().string();
                percent = std::clamp(ProgressPercent(*item), 0, 100);
                break;
            }
        }
        DrawProgressLine(m_out, current, percent, overall);
    }
    std::fflush(m_out);
}

int ConsoleRun::Run(DriverConfig config, OutputNamer namer, CommandBuilder builder,
                    const std::atomic<int>& stopRequested) {
    EncodingDriver driver(*this, *this, std::move(config), std::move(namer), std::move(builder));
    m_reported.assign(GetRowCount(), JobStatus::Idle);
    for (int row = 0; row < GetRowCount(); ++row)
        m_reported[row] =
            GetItem(row)->Status() == JobStatus::UnknownFile ? JobStatus::Idle : JobStatus::Waiting;
    driver.EncodeChecked();
    driver.Start();
    bool stopped = false;
    while (!AllEnded()) {
        if (stopRequested && !stopped) {
            // The driver goes first, so no child can start behind the stop.
            driver.Stop();
            driver.StopChecked(false);
            stopped = true;
        }
        std::unique_lock lock(m_mutex);
        m_changed.wait_for(lock, kDrawPeriod, [this] { return m_changeSeen; });
        m_changeSeen = false;
        lock.unlock();
        Draw(driver, false);
    }
    driver.Stop();
    // Exits that are still under way reach the driver; wait for them before it goes.
    for (int row = 0; row < GetRowCount(); ++row)
        if (CEncodeProcess* child = GetItem(row)->process.load())
            child->WaitForExit();
    Draw(driver, true);
    if (m_drawBar)
        ClearProgressLine(m_out);

    int completed = 0;
    for (int row = 0; row < GetRowCount(); ++row)
        completed += GetItem(row)->Status() == JobStatus::Completed;
    std::fprintf(m_out, "%d of %d converted%s\n", completed, GetRowCount(),
                 stopped ? " (stopped)" : "");
    std::fflush(m_out);
    if (stopped)
        return 130;
    return completed == GetRowCount() ? 0 : 1;
}

}  // namespace ac::console
