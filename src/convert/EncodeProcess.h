#pragma once
// CEncodeProcess: the child that converts one row. It splits both streams of the tool into
// lines, takes the position out of "|Time>>> " lines, keeps the error lines of the run for the
// message log, and kills a tool that floods its error stream.
//
// Thread contract: the line handling runs on the two reader threads, the exit callback on the
// waiter. Links to the log and status sinks are changed by the UI thread under a lock; the
// sinks are called under that lock and must not block on the UI thread (they post).

#include "platform/ChildProcess.h"

#include <atomic>
#include <cstdint>
#include <functional>
#include <mutex>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace ac {

enum class LogLineKind { Normal, Error, Warning };

// The message log of the selected row (a rich text window in the program).
class IProcessLog {
public:
    virtual ~IProcessLog() = default;
    virtual void Clear() = 0;
    virtual void Append(const std::string& text, LogLineKind kind) = 0;
};

// The status panel: receives every output line that is not a time position (message 0x465).
class IStatusText {
public:
    virtual ~IStatusText() = default;
    virtual void SetStatusText(const std::string& line) = 0;
};

// Puts lines together across reads. A line ends at LF, CR LF or CR; text after the last end
// waits for the next read and is never delivered on its own.
class LineSplitter {
public:
    template <typename Handler>
    void Feed(std::string_view text, Handler&& handler) {
        m_rest.append(text);
        std::string joined = Normalise(std::move(m_rest));
        std::size_t start = 0;
        for (std::size_t end; (end = joined.find('\n', start)) != std::string::npos;
             start = end + 1)
            handler(std::string_view(joined).substr(start, end - start));
        m_rest = joined.substr(start);
    }
    void Clear() { m_rest.clear(); }
    const std::string& Rest() const { return m_rest; }

private:
    static std::string Normalise(std::string text);
    std::string m_rest;
};

// "|Time>>> 12.5" gives 12.5; a line with the prefix and no number gives 0.0; any other line
// gives nothing.
std::optional<double> ParseTimeLine(std::string_view line);

class CEncodeProcess : public platform::ImChildProcess {
public:
    using ExitCallback = std::function<void(CEncodeProcess*)>;
    // More reads than this from the error stream of a live child end it with kFloodExitCode.
    static constexpr int kMaxErrorReads = 100;
    static constexpr int kFloodExitCode = -100;

    explicit CEncodeProcess(ExitCallback callback = {});
    ~CEncodeProcess() override;

    // Seconds of the input done, from the last time line; kept across runs.
    double TimeSeconds() const { return m_timeSeconds.load(); }
    int ErrorReads() const { return m_errorReads.load(); }
    std::vector<std::string> ErrorLines() const;
    // Why the last run failed, in one line: its first error without the tool's prefix, else
    // its first line on the error stream, else the exit code.
    std::string FailureReason() const;

    void Link(IProcessLog* log, IStatusText* status);
    // Shows the stored error lines of the last run again in the linked log.
    void ReplayErrorLines();
    // The owner drops the callback before it goes away, so a late exit reaches nobody.
    void ClearCallback();

protected:
    void OnStart(const std::string& commandLine) override;
    void OnStdout(std::string_view text) override;
    void OnStderr(std::string_view text) override;
    void OnExit(int exitCode) override;
    std::string LaunchFailureText(const std::string& commandLine) override;

private:
    void ShowLine(std::string_view line);

    LineSplitter m_stdoutRest;  // output reader only (and OnStart, before the readers exist)
    LineSplitter m_stderrRest;  // error reader only
    std::atomic<double> m_timeSeconds{0.0};
    std::atomic<int> m_errorReads{0};

    mutable std::mutex m_mutex;  // guards the links, the stored lines and the callback
    IProcessLog* m_log = nullptr;
    IStatusText* m_status = nullptr;
    std::vector<std::string> m_errorLines;
    ExitCallback m_callback;
};

}  // namespace ac
