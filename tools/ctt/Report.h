#pragma once
// The tool's output lines, as the program reads them:
//
//   |Time>>> 12.480           (stdout: seconds of input done)
//   |Error>>> cannot open ... (stderr)
//
// Lines go out with one write() each, so a reader never sees half a line. A closed stdout
// (the program went away) is remembered, and the conversion stops at its next check.
//
// Thread contract: the conversion thread only; the FFmpeg log hook may run on encoder threads
// and takes its own lock.

#include <string>

namespace ac::ctt {

void ReportTime(double seconds);
void ReportStatus(const std::string& text);
void ReportError(const std::string& text);
void ReportWarning(const std::string& text);

// True once a write to stdout failed with EPIPE.
bool OutputGone();

// Routes FFmpeg's and libcdio's own log text away from stderr: the program fails a job whose
// child writes too much there. The last error-level message is kept for our error lines.
void InstallLibraryLogHooks();
std::string LastLibraryError();

}  // namespace ac::ctt
