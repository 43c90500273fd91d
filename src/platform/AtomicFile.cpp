#include "platform/AtomicFile.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <dirent.h>
#include <signal.h>

#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <ctime>
#include <random>

namespace ac::platform {
namespace {

class FileDescriptor {
public:
    explicit FileDescriptor(int fd) : m_fd(fd) {}
    ~FileDescriptor() {
        if (m_fd >= 0) {
            ::close(m_fd);
        }
    }
    FileDescriptor(const FileDescriptor&) = delete;
    FileDescriptor& operator=(const FileDescriptor&) = delete;
    int Get() const { return m_fd; }
    // Closing can report a delayed write error (NFS, full disk): the caller must see it.
    bool Close() {
        int fd = m_fd;
        m_fd = -1;
        return ::close(fd) == 0;
    }

private:
    int m_fd;
};

bool WriteAll(int fd, std::string_view data) {
    while (!data.empty()) {
        ssize_t written = ::write(fd, data.data(), data.size());
        if (written < 0) {
            if (errno == EINTR) {
                continue;
            }
            return false;
        }
        data.remove_prefix(static_cast<size_t>(written));
    }
    return true;
}

std::string DirectoryOf(const std::string& path) {
    auto slash = path.find_last_of('/');
    if (slash == std::string::npos) {
        return ".";
    }
    return slash == 0 ? std::string("/") : path.substr(0, slash);
}

}  // namespace

ReadResult ReadWholeFile(const std::string& path, std::string& contents, std::size_t maxSize) {
    contents.clear();
    FileDescriptor fd(::open(path.c_str(), O_RDONLY | O_CLOEXEC));
    if (fd.Get() < 0) {
        return errno == ENOENT ? ReadResult::Missing : ReadResult::Failed;
    }
    struct stat st {};
    if (::fstat(fd.Get(), &st) != 0 || !S_ISREG(st.st_mode)) {
        return ReadResult::Failed;
    }
    if (static_cast<std::size_t>(st.st_size) > maxSize) {
        return ReadResult::TooLarge;
    }
    contents.resize(static_cast<std::size_t>(st.st_size));
    std::size_t done = 0;
    while (done < contents.size()) {
        ssize_t got = ::read(fd.Get(), contents.data() + done, contents.size() - done);
        if (got < 0 && errno == EINTR) {
            continue;
        }
        if (got <= 0) {
            break;
        }
        done += static_cast<std::size_t>(got);
    }
    // The file may have shrunk while we read; what we have is all there is.
    contents.resize(done);
    return ReadResult::Ok;
}

bool WriteFileAtomically(const std::string& path, std::string_view contents) {
    mode_t mode = 0644;
    struct stat st {};
    if (::stat(path.c_str(), &st) == 0) {
        mode = st.st_mode & 07777;
    }
    std::string temp = path + ".tmp-" + std::to_string(::getpid()) + "-" +
                       std::to_string(std::random_device{}() & 0xFFFFFF);
    FileDescriptor fd(::open(temp.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_CLOEXEC, mode));
    if (fd.Get() < 0) {
        return false;
    }
    bool ok = WriteAll(fd.Get(), contents) && ::fsync(fd.Get()) == 0;
    ok = fd.Close() && ok;
    if (!ok || ::rename(temp.c_str(), path.c_str()) != 0) {
        ::unlink(temp.c_str());
        return false;
    }
    // The rename is durable only once the directory entry is on disk.
    FileDescriptor dir(::open(DirectoryOf(path).c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC));
    if (dir.Get() >= 0) {
        ::fsync(dir.Get());
    }
    return true;
}

void RemoveStaleTemporaries(const std::string& path) {
    std::string directory = DirectoryOf(path);
    std::string prefix = path.substr(path.find_last_of('/') + 1) + ".tmp-";
    DIR* folder = ::opendir(directory.c_str());
    if (folder == nullptr) {
        return;
    }
    while (dirent* entry = ::readdir(folder)) {
        std::string_view name(entry->d_name);
        if (name.substr(0, prefix.size()) != prefix) {
            continue;
        }
        // "<name>.tmp-<pid>-<random>": remove it only when that process is gone.
        long pid = std::strtol(entry->d_name + prefix.size(), nullptr, 10);
        if (pid > 0 && ::kill(static_cast<pid_t>(pid), 0) != 0 && errno == ESRCH) {
            ::unlink((directory + "/" + std::string(name)).c_str());
        }
    }
    ::closedir(folder);
}

std::string SetAsideDamagedFile(const std::string& path) {
    std::time_t now = std::time(nullptr);
    std::tm local {};
    ::localtime_r(&now, &local);
    char stamp[32];
    std::strftime(stamp, sizeof stamp, "%Y%m%d-%H%M%S", &local);
    std::string base = path + ".damaged-" + stamp;
    std::string target = base;
    for (int n = 1; ::access(target.c_str(), F_OK) == 0 && n < 1000; ++n) {
        target = base + "-" + std::to_string(n);
    }
    if (::rename(path.c_str(), target.c_str()) != 0) {
        return {};
    }
    return target;
}

}  // namespace ac::platform
