// The libraries' own log text, kept apart from the tool's output lines: the readers of media
// files and CDs (which the preview player shares) ask for the last error through it.
#include "Report.h"

#include <mutex>

extern "C" {
#include <libavutil/log.h>
}
#include <cdio/logging.h>

namespace ac::ctt {
namespace {

std::mutex s_logMutex;
std::string s_lastLibraryError;

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

void InstallLibraryLogHooks() {
    av_log_set_callback(FfmpegLog);
    cdio_log_set_handler(CdioLog);
}

std::string LastLibraryError() {
    std::lock_guard<std::mutex> lock(s_logMutex);
    return s_lastLibraryError;
}

}  // namespace ac::ctt
