#include "Report.h"

#include <cerrno>
#include <cstdio>
#include <unistd.h>

namespace ac::ctt {
namespace {

bool s_outputGone = false;

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

}  // namespace ac::ctt
