#include "platform/Power.h"

#include <cerrno>
#include <cstdlib>
#include <cstring>
#include <fcntl.h>
#include <spawn.h>
#include <string>
#include <sys/wait.h>
#include <unistd.h>

extern char** environ;

namespace ac::platform {

namespace {

bool AppendDryRun(const char* file, const char* action) {
    const int fd = ::open(file, O_WRONLY | O_CREAT | O_APPEND | O_CLOEXEC, 0644);
    if (fd < 0) {
        return false;
    }
    const std::string line = std::string(action) + "\n";
    const bool written = ::write(fd, line.data(), line.size()) == static_cast<ssize_t>(line.size());
    ::close(fd);
    return written;
}

bool RunSystemctl(const char* action, bool force) {
    if (const char* dryRun = std::getenv("AUDIOCONV_POWER_DRYRUN"); dryRun && *dryRun) {
        return AppendDryRun(dryRun, action);
    }
    // Inhibitor locks are how programs ask to delay the end; a forced action overrides them as
    // the forced Windows exit overrides programs that refuse to close.
    char program[] = "systemctl";
    char verb[32];
    std::strncpy(verb, action, sizeof verb - 1);
    verb[sizeof verb - 1] = '\0';
    char ignore[] = "--check-inhibitors=no";
    char* argv[] = {program, verb, force ? ignore : nullptr, nullptr};
    pid_t pid = -1;
    if (::posix_spawnp(&pid, program, nullptr, nullptr, argv, environ) != 0) {
        return false;
    }
    int status = 0;
    while (::waitpid(pid, &status, 0) < 0) {
        if (errno != EINTR) {
            return false;
        }
    }
    return WIFEXITED(status) && WEXITSTATUS(status) == 0;
}

}  // namespace

bool ShutDownSystem(bool force) {
    return RunSystemctl("poweroff", force);
}
bool SuspendSystem(bool force) {
    return RunSystemctl("suspend", force);
}
bool HibernateSystem(bool force) {
    return RunSystemctl("hibernate", force);
}

}  // namespace ac::platform
