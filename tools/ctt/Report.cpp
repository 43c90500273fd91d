#include "Report.h"

#include <cerrno>
#include <cstdio>
#include <mutex>
#include <unistd.h>

extern "C" {
#include <libavutil/log.h>
}
#include <cdio/logging.h>

namespace ac::ctt {
namespace {

bool s_outputGone = false;
std::mutex s_logMutex;
std::string s_lastLibraryError;

void WriteLine(int fd, const std::string& line) {
    const char* p = line.data();
    size_t left = line.size();
    while (left > 0) {
        ssize_t n = ::write(fd, p, left);
        if (n < 0) {
            if (errno == EINTR) {
                continue;
            }
            if (fd == STDOUT_FILENO) {
                s_outputGone = true;
            }
            return;
        }
        p += n;
        left -= static_cast<size_t>(n);
    }
}

void FfmpegLog(void* avcl, int level, const char* fmt, va_list args) {
    if (level > AV_LOG_ERROR) {
        return;
    }
    char text[512];
    int prefix = 1;
    av_log_format_line2(avcl, level, fmt, args, text, sizeof text, &prefix);
    std::string message(text);
    while (!message.empty() && (message.back() == '\n' || message.back() == '\r')) {
        message.pop_back();
    }
    std::lock_guard<std::mutex> lock(s_logMutex);
    s_lastLibraryError = message;
}

void CdioLog(cdio_log_level_t level, const char* message) {
    if (level < CDIO_LOG_ERROR || !message) {
        return;
    }
    std::lock_guard<std::mutex> lock(s_logMutex);
    s_lastLibraryError = message;
}

}  // namespace

void ReportTime(double seconds) {
    char line[64];
    std::snprintf(line, sizeof line, "|Time>>> %.3f\n", seconds < 0 ? 0.0 : seconds);
    WriteLine(STDOUT_FILENO, line);
}

void ReportStatus(const std::string& text) { WriteLine(STDOUT_FILENO, text + "\n"); }

void ReportError(const std::string& text) { WriteLine(STDERR_FILENO, "|Error>>> " + text + "\n"); }

void ReportWarning(const std::string& text) {
    WriteLine(STDERR_FILENO, "|Warning>>> " + text + "\n");
}

bool OutputGone() { return s_outputGone; }

void InstallLibraryLogHooks() {
    av_log_set_callback(FfmpegLog);
    cdio_log_set_handler(CdioLog);
}

std::string LastLibraryError() {
    std::lock_guard<std::mutex> lock(s_logMutex);
    return s_lastLibraryError;
}

}  // namespace ac::ctt
