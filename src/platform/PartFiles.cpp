#include "platform/PartFiles.h"

#include <cerrno>
#include <csignal>
#include <cstdlib>
#include <fstream>
#include <dirent.h>
#include <unistd.h>

namespace ac::platform {
namespace {

constexpr std::size_t kOutputNameRoom = 200;
constexpr const char* kToolTag = ".ctt";
constexpr const char* kSuffix = ".part";

std::string FileName(const std::string& path) {
    const std::size_t slash = path.rfind('/');
    return slash == std::string::npos ? path : path.substr(slash + 1);
}

std::string Folder(const std::string& path) {
    const std::size_t slash = path.rfind('/');
    if (slash == std::string::npos) return ".";
    return slash == 0 ? "/" : path.substr(0, slash);
}

// The writer's pid from ".NAME.cttPID.part", or 0 when the name is no part file.
pid_t WriterOf(const std::string& name) {
    if (name.size() < 12 || name[0] != '.' || !name.ends_with(kSuffix)) return 0;
    const std::string stem = name.substr(0, name.size() - 5);
    const std::size_t tag = stem.rfind(kToolTag);
    if (tag == std::string::npos || tag + 4 >= stem.size()) return 0;
    long pid = 0;
    for (std::size_t i = tag + 4; i < stem.size(); ++i) {
        if (stem[i] < '0' || stem[i] > '9' || pid > 4'194'304) return 0;
        pid = pid * 10 + (stem[i] - '0');
    }
    return static_cast<pid_t>(pid);
}

// A pid may have been reused by now: only a live process that is the tool counts as a writer.
bool ToolStillRuns(pid_t pid) {
    if (::kill(pid, 0) != 0 && errno == ESRCH) return false;
    std::ifstream comm("/proc/" + std::to_string(pid) + "/comm");
    std::string name;
    if (!std::getline(comm, name)) return true;  // no /proc: assume it is ours and keep the file
    return name.rfind("ctt", 0) == 0;
}

}  // namespace

std::string PartFilePath(const std::string& outputPath, pid_t pid) {
    std::string name = FileName(outputPath);
    if (name.size() > kOutputNameRoom) name.resize(kOutputNameRoom);
    return Folder(outputPath) + "/." + name + kToolTag + std::to_string(pid) + kSuffix;
}

void RemovePartFile(const std::string& outputPath, pid_t pid) {
    if (outputPath.empty() || pid <= 0) return;
    ::unlink(PartFilePath(outputPath, pid).c_str());
}

int SweepStalePartFiles(const std::string& directory) {
    DIR* dir = ::opendir(directory.c_str());
    if (dir == nullptr) return 0;
    int removed = 0;
    while (const dirent* entry = ::readdir(dir)) {
        const std::string name = entry->d_name;
        const pid_t pid = WriterOf(name);
        if (pid <= 0 || pid == ::getpid() || ToolStillRuns(pid)) continue;
        if (::unlinkat(::dirfd(dir), name.c_str(), 0) == 0) ++removed;
    }
    ::closedir(dir);
    return removed;
}

}  // namespace ac::platform
