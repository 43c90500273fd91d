#include "ConsoleRip.h"

#include "ProgressLine.h"

#include "profile/ParameterSet.h"
#include "profile/TextUtil.h"
#include "resources/TextScan.h"

#include <algorithm>
#include <utility>

namespace ac::console {
namespace {

// How long main waits for a posted call before it redraws and looks at the stop flag: the
// longest a Ctrl-C waits to be noticed.
constexpr auto kPumpPeriod = std::chrono::milliseconds(100);

bool HasEnded(RipStatus status) {
    return status == RipStatus::Completed || status == RipStatus::Failed ||
           status == RipStatus::Aborted;
}

const char* StatusWord(RipStatus status) {
    switch (status) {
        case RipStatus::Completed:
            return "done";
        case RipStatus::Failed:
            return "FAILED";
        case RipStatus::Aborted:
            return "stopped";
        default:
            return "";
    }
}

}  // namespace

MainThreadQueue::MainThreadQueue() {
    UiQueue::SetPoster([this](UiQueue::Call call) {
        std::lock_guard lock(m_mutex);
        m_calls.push_back(std::move(call));
        m_changed.notify_all();
    });
}

MainThreadQueue::~MainThreadQueue() {
    UiQueue::SetPoster(nullptr);
}

void MainThreadQueue::RunFor(std::chrono::milliseconds wait) {
    std::deque<UiQueue::Call> calls;
    {
        std::unique_lock lock(m_mutex);
        if (!m_changed.wait_for(lock, wait, [this] { return !m_calls.empty(); }))
            return;
        calls.swap(m_calls);
    }
    for (UiQueue::Call& call : calls)
        call();
}

void ApplyProfile(const ParameterSet& profile, RipTrackItem& item) {
    item.extension = AsciiLowerText(profile.GetExtName());
    item.codec = profile.GetValue("acodec");
    item.sampleRate = ReadAtoi(profile.GetValue("ar"));
    item.channels = ReadAtoi(profile.GetValue("ac"));
    item.bitRate = ReadAtoi(profile.GetValue("ab"));
    // An empty volume would be read as 0, which halves the level; the profiles mean "unchanged".
    const std::string volume = profile.GetValue("vol_factor");
    item.volume = volume.empty() ? 100 : ReadAtoi(volume);
}

ConsoleRip::ConsoleRip(platform::IDiscDevice& device, std::string drive, RipDiscTexts disc,
                       const ParameterSet& profile, bool drawBar, std::FILE* out)
    : m_device(device),
      m_drive(std::move(drive)),
      m_disc(std::move(disc)),
      m_profile(profile),
      m_drawBar(drawBar),
      m_out(out) {}

void ConsoleRip::AddRow(RipTrackItem item, std::string title, bool checked) {
    ApplyProfile(m_profile, item);
    RipRow row;
    row.item = std::move(item);
    row.title = std::move(title);
    row.checked = checked;
    m_rows.push_back(std::move(row));
}

bool ConsoleRip::IsChecked(int row) {
    return row >= 0 && row < RowCount() && m_rows[row].checked;
}

void ConsoleRip::SetChecked(int row, bool checked) {
    if (row >= 0 && row < RowCount())
        m_rows[row].checked = checked;
}

RipTrackItem* ConsoleRip::Item(int row) {
    return row >= 0 && row < RowCount() ? &m_rows[row].item : nullptr;
}

std::string ConsoleRip::Title(int row) {
    return row >= 0 && row < RowCount() ? m_rows[row].title : std::string();
}

void ConsoleRip::SetStatus(int row, RipStatus status, int percent) {
    if (row < 0 || row >= RowCount())
        return;
    RipRow& ripRow = m_rows[row];
    const RipStatus was = ripRow.status;
    ripRow.status = status;
    ripRow.percent = percent;
    if (status == RipStatus::Running && was != RipStatus::Running) {
        m_events.push_back({row, status});
    } else if (HasEnded(status) && !HasEnded(was)) {
        if (status == RipStatus::Failed) {
            // The tool's error lines are complete now (its readers have ended) and the next
            // track has not cleared them yet; without any, the driver names the reason next.
            ripRow.reasons = m_log.Lines();
            if (ripRow.reasons.empty())
                m_status.Await(&ripRow.reasons);
        }
        m_events.push_back({row, status});
    }
}

void ConsoleRip::LogSink::Clear() {
    std::lock_guard lock(m_mutex);
    m_lines.clear();
}

void ConsoleRip::LogSink::Append(const std::string& text, LogLineKind kind) {
    if (kind != LogLineKind::Error)
        return;
    std::string line = text;
    while (!line.empty() && (line.back() == '\n' || line.back() == '\r'))
        line.pop_back();
    std::lock_guard lock(m_mutex);
    if (!line.empty())
        m_lines.push_back(std::move(line));
}

std::vector<std::string> ConsoleRip::LogSink::Lines() {
    std::lock_guard lock(m_mutex);
    return m_lines;
}

void ConsoleRip::StatusSink::SetStatusText(const std::string& line) {
    std::lock_guard lock(m_mutex);
    if (m_awaiting && !line.empty()) {
        m_awaiting->push_back(line);
        m_awaiting = nullptr;
    }
}

void ConsoleRip::StatusSink::Await(std::vector<std::string>* reasons) {
    std::lock_guard lock(m_mutex);
    m_awaiting = reasons;
}

std::string ConsoleRip::RowName(int row) const {
    char number[16];
    std::snprintf(number, sizeof number, "%02d ", m_rows[row].item.trackNumber);
    return number + m_rows[row].title;
}

int ConsoleRip::CountOf(RipStatus status) const {
    return static_cast<int>(
        std::count_if(m_rows.begin(), m_rows.end(),
                      [status](const RipRow& row) { return row.status == status; }));
}

int ConsoleRip::CheckedCount() const {
    return static_cast<int>(
        std::count_if(m_rows.begin(), m_rows.end(), [](const RipRow& row) { return row.checked; }));
}

// By seconds of audio, so a long track weighs what it takes.
int ConsoleRip::OverallPercent() const {
    double total = 0;
    double done = 0;
    for (const RipRow& row : m_rows) {
        if (!row.checked)
            continue;
        total += row.item.duration;
        if (row.status == RipStatus::Completed || row.status == RipStatus::Failed)
            done += row.item.duration;
        else if (row.status == RipStatus::Running)
            done += row.item.duration * std::clamp(row.percent, 0, 100) / 100.0;
    }
    return total > 0 ? std::clamp(static_cast<int>(done / total * 100), 0, 100) : 0;
}

void ConsoleRip::PrintEvent(const Event& event) {
    if (event.status == RipStatus::Running) {
        ++m_startedCount;
        if (!m_drawBar)
            std::fprintf(m_out, "[%d/%d] ripping: %s\n", m_startedCount, CheckedCount(),
                         RowName(event.row).c_str());
        return;
    }
    RipRow& row = m_rows[event.row];
    if (m_drawBar)
        ClearProgressLine(m_out);
    m_lineShown = {-1, -1};
    ++m_endedCount;
    std::fprintf(m_out, "[%d/%d] %s: %s (all %d%%)\n", m_endedCount, CheckedCount(),
                 StatusWord(event.status), RowName(event.row).c_str(), OverallPercent());
    if (event.status != RipStatus::Failed)
        return;
    m_status.Await(nullptr);
    std::fflush(m_out);
    if (row.reasons.empty())
        row.reasons.push_back("no reason was given");
    for (const std::string& reason : row.reasons)
        std::fprintf(stderr, "    %s\n", reason.c_str());
}

void ConsoleRip::Draw() {
    for (const Event& event : m_events)
        PrintEvent(event);
    m_events.clear();
    if (m_drawBar) {
        for (int row = 0; row < RowCount(); ++row) {
            const RipRow& running = m_rows[row];
            const std::pair<int, int> shown{row, running.percent};
            if (running.status == RipStatus::Running && shown != m_lineShown) {
                DrawProgressLine(m_out, RowName(row), running.percent, OverallPercent());
                m_lineShown = shown;
                break;
            }
        }
    }
    std::fflush(m_out);
}

int ConsoleRip::Run(const RipSettings& settings, const std::atomic<int>& stopRequested) {
    if (stopRequested)
        return 130;
    // The queue goes after the driver: a child's last post must still find it.
    MainThreadQueue queue;
    RipDriver driver(*this, *this);
    driver.SetSettings(settings);
    driver.RipNextTrack();
    bool stopped = false;
    while (driver.IsRunning()) {
        if (stopRequested) {
            // Ends the child (a polite request first, then a kill) and removes its part file.
            driver.StopRip();
            stopped = true;
            break;
        }
        queue.RunFor(kPumpPeriod);
        driver.RefreshProgress();
        Draw();
    }
    Draw();
    if (m_drawBar)
        ClearProgressLine(m_out);
    const int asked = CheckedCount();
    const int completed = CountOf(RipStatus::Completed);
    std::fprintf(m_out, "%d of %d tracks ripped%s\n", completed, asked,
                 stopped ? " (stopped)" : "");
    std::fflush(m_out);
    if (stopped)
        return 130;
    return m_finished && completed == asked ? 0 : 1;
}

}  // namespace ac::console
