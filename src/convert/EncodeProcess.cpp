#include "convert/EncodeProcess.h"

#include "resources/Language.h"
#include "resources/TextFormat.h"

#include <charconv>
#include <cstdlib>

namespace ac {
namespace {

constexpr std::string_view kTimePrefix = "|Time>>> ";
constexpr std::string_view kErrorPrefix = "|Error>>> ";
constexpr std::string_view kWarningPrefix = "|Warning>>> ";
constexpr std::uint32_t kUnableToStartId = 0xC008;

}  // namespace

std::string LineSplitter::Normalise(std::string text) {
    std::string out;
    out.reserve(text.size());
    for (std::size_t i = 0; i < text.size(); ++i) {
        if (text[i] == '\r') {
            out.push_back('\n');
            if (i + 1 < text.size() && text[i + 1] == '\n')
                ++i;
        } else {
            out.push_back(text[i]);
        }
    }
    return out;
}

// |Time>>> 73.48
std::optional<double> ParseTimeLine(std::string_view line) {
    if (!line.starts_with(kTimePrefix))
        return std::nullopt;
    std::string_view number = line.substr(kTimePrefix.size());
    double value = 0.0;
    auto [end, error] = std::from_chars(number.data(), number.data() + number.size(), value);
    if (error != std::errc())
        return 0.0;
    return value;
}

CEncodeProcess::CEncodeProcess(ExitCallback callback) : m_callback(std::move(callback)) {}

CEncodeProcess::~CEncodeProcess() {
    StopAndJoin();
}

std::vector<std::string> CEncodeProcess::ErrorLines() const {
    std::lock_guard lock(m_mutex);
    return m_errorLines;
}

std::string CEncodeProcess::FailureReason() const {
    const std::vector<std::string> lines = ErrorLines();
    for (const std::string& line : lines) {
        if (std::string_view(line).starts_with(kErrorPrefix)) {
            return line.substr(kErrorPrefix.size());
        }
    }
    if (!lines.empty()) {
        std::string_view first = lines.front();
        if (first.starts_with(kWarningPrefix)) first.remove_prefix(kWarningPrefix.size());
        return std::string(first);
    }
    return "the conversion tool ended with exit code " + std::to_string(ExitCode());
}

void CEncodeProcess::Link(IProcessLog* log, IStatusText* status) {
    std::lock_guard lock(m_mutex);
    m_log = log;
    m_status = status;
}

void CEncodeProcess::ClearCallback() {
    std::lock_guard lock(m_mutex);
    m_callback = nullptr;
}

void CEncodeProcess::ReplayErrorLines() {
    std::vector<std::string> lines = ErrorLines();
    {
        std::lock_guard lock(m_mutex);
        if (m_log)
            m_log->Clear();
    }
    for (const auto& line : lines)
        ShowLine(line);
}

void CEncodeProcess::OnStart(const std::string& /*commandLine*/) {
    m_stdoutRest.Clear();
    m_stderrRest.Clear();
    std::lock_guard lock(m_mutex);
    m_errorLines.clear();
    if (m_log)
        m_log->Clear();
    if (m_status)
        m_status->SetStatusText("");
}

void CEncodeProcess::OnStdout(std::string_view text) {
    m_stdoutRest.Feed(text, [this](std::string_view line) {
        if (auto seconds = ParseTimeLine(line)) {
            m_timeSeconds = *seconds;
            return;
        }
        std::lock_guard lock(m_mutex);
        if (m_status)
            m_status->SetStatusText(std::string(line));
    });
}

void CEncodeProcess::OnStderr(std::string_view text) {
    m_stderrRest.Feed(text, [this](std::string_view line) {
        {
            std::lock_guard lock(m_mutex);
            m_errorLines.emplace_back(line);
        }
        ShowLine(line);
    });
    // Counted by reads, not lines, and never reset: a row that flooded before is closer to
    // the limit on its next run.
    if (++m_errorReads > kMaxErrorReads && IsRunning()) {
        m_errorReads = 0;
        Kill(kFloodExitCode);
    }
}

void CEncodeProcess::ShowLine(std::string_view line) {
    LogLineKind kind = LogLineKind::Normal;
    if (line.starts_with(kErrorPrefix)) {
        kind = LogLineKind::Error;
        line.remove_prefix(kErrorPrefix.size());
    } else if (line.starts_with(kWarningPrefix)) {
        kind = LogLineKind::Warning;
        line.remove_prefix(kWarningPrefix.size());
    }
    std::lock_guard lock(m_mutex);
    if (m_log)
        m_log->Append(std::string(line) + "\n", kind);
}

void CEncodeProcess::OnExit(int /*exitCode*/) {
    ExitCallback callback;
    {
        std::lock_guard lock(m_mutex);
        callback = m_callback;
    }
    if (callback)
        callback(this);
}

std::string CEncodeProcess::LaunchFailureText(const std::string& commandLine) {
    return FormatText(g_Language.GetString(kUnableToStartId), {commandLine});
}

}  // namespace ac
