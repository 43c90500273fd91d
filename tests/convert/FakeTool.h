#pragma once
// Fake ctt tools: small shell scripts a test writes into its temp folder and runs through the
// real launcher, so pipes, signals and exits are the real ones.

#include <filesystem>
#include <fstream>
#include <string>
#include <sys/stat.h>
#include <unistd.h>

namespace ac::test {

inline std::string WriteScript(const std::string& path, const std::string& body) {
    std::ofstream(path) << "#!/bin/sh\n" << body;
    ::chmod(path.c_str(), 0755);
    return path;
}

// The one-letter state of a process from /proc ('T' stopped, 'Z' zombie...), '?' when gone.
inline char ProcessState(int pid) {
    std::ifstream stat("/proc/" + std::to_string(pid) + "/stat");
    std::string text((std::istreambuf_iterator<char>(stat)), {});
    auto close = text.rfind(')');
    return close == std::string::npos || close + 2 >= text.size() ? '?' : text[close + 2];
}

// Signals arrive a moment after they are sent; the bound only keeps a broken run finite.
inline bool WaitForProcessState(int pid, char state) {
    for (int i = 0; i < 2000; ++i) {
        if (ProcessState(pid) == state)
            return true;
        ::usleep(5000);
    }
    return false;
}

inline int CountThreads() {
    int count = 0;
    for ([[maybe_unused]] auto& entry : std::filesystem::directory_iterator("/proc/self/task"))
        ++count;
    return count;
}

inline int CountOpenFds() {
    int count = 0;
    for ([[maybe_unused]] auto& entry : std::filesystem::directory_iterator("/proc/self/fd"))
        ++count;
    return count;
}

}  // namespace ac::test

#include "../support/Files.h"
