#include "platform/Paths.h"

#include <sys/stat.h>
#include <sys/statvfs.h>
#include <unistd.h>

#include <cerrno>
#include <cstdlib>
#include <fstream>
#include <string_view>

namespace ac::platform {
namespace {

std::string Environment(const char* name) {
    const char* value = std::getenv(name);
    return value ? std::string(value) : std::string();
}

std::string HomeDirectory() {
    std::string home = Environment("HOME");
    return home.empty() ? std::string("/tmp") : home;
}

// XDG says a relative value in these variables is invalid and must be ignored.
std::string XdgDirectory(const char* variable, const char* fallbackBelowHome) {
    std::string value = Environment(variable);
    if (value.empty() || value[0] != '/') {
        value = HomeDirectory() + "/" + fallbackBelowHome;
    }
    return value;
}

bool FileExists(const std::string& path) {
    struct stat st {};
    return ::stat(path.c_str(), &st) == 0;
}

std::string ParentOf(const std::string& path) {
    auto slash = path.find_last_of('/');
    if (slash == std::string::npos) {
        return ".";
    }
    return slash == 0 ? std::string("/") : path.substr(0, slash);
}

// Reads MUSIC from ~/.config/user-dirs.dirs, a line such as
//   XDG_MUSIC_DIR="$HOME/Music"
std::string MusicFromUserDirs() {
    std::ifstream in(XdgDirectory("XDG_CONFIG_HOME", ".config") + "/user-dirs.dirs");
    std::string line;
    constexpr std::string_view kPrefix = "XDG_MUSIC_DIR=\"";
    while (std::getline(in, line)) {
        if (line.rfind(kPrefix, 0) != 0) {
            continue;
        }
        auto end = line.find('"', kPrefix.size());
        if (end == std::string::npos) {
            return {};
        }
        std::string value = line.substr(kPrefix.size(), end - kPrefix.size());
        if (value.rfind("$HOME", 0) == 0) {
            value = HomeDirectory() + value.substr(5);
        }
        // A music folder that is the home folder itself means "not configured".
        if (value.empty() || value[0] != '/' || value == HomeDirectory() ||
            value == HomeDirectory() + "/") {
            return {};
        }
        return value;
    }
    return {};
}

}  // namespace

std::string ExecutableDirectory() {
    char buffer[4096];
    ssize_t length = ::readlink("/proc/self/exe", buffer, sizeof buffer - 1);
    if (length <= 0) {
        return ".";
    }
    return ParentOf(std::string(buffer, static_cast<size_t>(length)));
}

std::string FindConversionTool() {
    std::string forced = Environment("AC_CTT_PATH");
    if (!forced.empty()) {
        return forced;
    }
    const std::string here = ExecutableDirectory();
    for (const std::string& candidate : {here + "/ctt", here + "/../lib/audio-converter/ctt"}) {
        if (::access(candidate.c_str(), X_OK) == 0) {
            return candidate;
        }
    }
    return here + "/ctt";
}

std::string FindBaseDirectory() {
    std::string overridden = Environment("AUDIOCONV_BASEDIR");
    if (!overridden.empty()) {
        while (overridden.size() > 1 && (overridden.back() == '/' || overridden.back() == '\\')) {
            overridden.pop_back();
        }
        return overridden;
    }
    std::string exeDir = ExecutableDirectory();
    if (FileExists(exeDir + "/data.pkg")) {
        return exeDir;
    }
    // Installed: <prefix>/bin/audio-converter or <prefix>/lib/audio-converter/ctt.
    for (const char* relative : {"/../" AC_INSTALL_DATADIR "/audio-converter",
                                 "/../../" AC_INSTALL_DATADIR "/audio-converter"}) {
        std::string candidate = exeDir + relative;
        if (FileExists(candidate + "/data.pkg")) {
            char resolved[4096];
            if (::realpath(candidate.c_str(), resolved)) {
                return resolved;
            }
            return candidate;
        }
    }
    return exeDir;
}

std::string UserDataDirectory() {
    return XdgDirectory("XDG_DATA_HOME", ".local/share") + "/audio-converter";
}

std::string UserConfigDirectory() {
    return XdgDirectory("XDG_CONFIG_HOME", ".config") + "/audio-converter";
}

std::string MusicDirectory() {
    std::string music = MusicFromUserDirs();
    return music.empty() ? HomeDirectory() + "/Music" : music;
}

std::optional<std::uint64_t> FreeDiskBytes(const std::string& folder) {
    struct stat info;
    struct statvfs volume;
    if (::stat(folder.c_str(), &info) != 0 || !S_ISDIR(info.st_mode) ||
        ::statvfs(folder.c_str(), &volume) != 0) {
        return std::nullopt;
    }
    return static_cast<std::uint64_t>(volume.f_bavail) * volume.f_frsize;
}

bool EnsureDirectory(const std::string& path, unsigned mode) {
    if (path.empty()) {
        return false;
    }
    struct stat st {};
    if (::stat(path.c_str(), &st) == 0) {
        return S_ISDIR(st.st_mode);
    }
    std::string parent = ParentOf(path);
    if (parent != path && !EnsureDirectory(parent, mode)) {
        return false;
    }
    return ::mkdir(path.c_str(), static_cast<mode_t>(mode)) == 0 || errno == EEXIST;
}

}  // namespace ac::platform
