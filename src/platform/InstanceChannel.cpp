#include "platform/InstanceChannel.h"

#include "platform/Paths.h"

#include <cerrno>
#include <chrono>
#include <cstdlib>
#include <cstring>
#include <fcntl.h>
#include <poll.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/un.h>
#include <unistd.h>

namespace ac::platform {

namespace {

// A hand-over is a few paths; a peer that sends more than this is not a copy of the program.
constexpr std::size_t kMaxMessage = 4 * 1024 * 1024;
constexpr int kReadTimeoutMs = 2000;

bool FillAddress(const std::string& path, sockaddr_un& address) {
    std::memset(&address, 0, sizeof address);
    address.sun_family = AF_UNIX;
    if (path.size() >= sizeof address.sun_path) {
        return false;
    }
    std::memcpy(address.sun_path, path.c_str(), path.size() + 1);
    return true;
}

std::vector<std::string> SplitAtNul(const std::string& bytes) {
    std::vector<std::string> paths;
    std::size_t start = 0;
    for (std::size_t nul; (nul = bytes.find('\0', start)) != std::string::npos; start = nul + 1) {
        if (nul > start) {
            paths.push_back(bytes.substr(start, nul - start));
        }
    }
    return paths;
}

// Everything the peer sends until it closes, or nothing when it stalls or sends too much.
bool ReadAll(int fd, std::string& out) {
    char buffer[4096];
    for (;;) {
        pollfd waiter{fd, POLLIN, 0};
        if (::poll(&waiter, 1, kReadTimeoutMs) <= 0) {
            return false;
        }
        const ssize_t got = ::read(fd, buffer, sizeof buffer);
        if (got == 0) {
            return true;
        }
        if (got < 0) {
            if (errno == EINTR)
                continue;
            return false;
        }
        out.append(buffer, static_cast<std::size_t>(got));
        if (out.size() > kMaxMessage) {
            return false;
        }
    }
}

}  // namespace

std::string InstanceSocketPath() {
    const char* runtime = std::getenv("XDG_RUNTIME_DIR");
    if (runtime != nullptr && *runtime == '/' && ::access(runtime, W_OK) == 0) {
        return std::string(runtime) + "/audio-converter.sock";
    }
    return UserDataDirectory() + "/audio-converter.sock";
}

InstanceListener::~InstanceListener() {
    Stop();
}

bool InstanceListener::Start(const std::string& socketPath, Handler handler) {
    sockaddr_un address;
    if (!FillAddress(socketPath, address)) {
        return false;
    }
    const int fd = ::socket(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC, 0);
    if (fd < 0) {
        return false;
    }
    ::unlink(socketPath.c_str());
    if (::bind(fd, reinterpret_cast<sockaddr*>(&address), sizeof address) != 0 ||
        ::listen(fd, 8) != 0 || ::pipe2(m_wake, O_CLOEXEC) != 0) {
        ::close(fd);
        return false;
    }
    // Only this user may hand files to this user's program.
    ::chmod(socketPath.c_str(), 0600);
    m_socket = fd;
    m_path = socketPath;
    m_handler = std::move(handler);
    m_thread = std::thread([this] { Run(); });
    return true;
}

void InstanceListener::Stop() {
    if (!m_thread.joinable()) {
        return;
    }
    const char wake = 1;
    [[maybe_unused]] const ssize_t written = ::write(m_wake[1], &wake, 1);
    m_thread.join();
    ::close(m_socket);
    ::close(m_wake[0]);
    ::close(m_wake[1]);
    m_socket = m_wake[0] = m_wake[1] = -1;
    ::unlink(m_path.c_str());
}

void InstanceListener::Run() {
    for (;;) {
        pollfd waiters[2] = {{m_socket, POLLIN, 0}, {m_wake[0], POLLIN, 0}};
        if (::poll(waiters, 2, -1) < 0) {
            if (errno == EINTR)
                continue;
            return;
        }
        if (waiters[1].revents != 0) {
            return;
        }
        const int peer = ::accept4(m_socket, nullptr, nullptr, SOCK_CLOEXEC);
        if (peer < 0) {
            continue;
        }
        std::string bytes;
        const bool complete = ReadAll(peer, bytes);
        // One byte back tells the second start its files were taken.
        if (complete) {
            const char taken = 1;
            [[maybe_unused]] const ssize_t sent = ::send(peer, &taken, 1, MSG_NOSIGNAL);
        }
        ::close(peer);
        if (complete) {
            m_handler(SplitAtNul(bytes));
        }
    }
}

bool SendPaths(const std::string& socketPath, const std::vector<std::string>& paths, int waitMs) {
    sockaddr_un address;
    if (!FillAddress(socketPath, address)) {
        return false;
    }
    std::string message;
    for (const std::string& path : paths) {
        message += path;
        message += '\0';
    }
    const auto deadline = std::chrono::steady_clock::now() + std::chrono::milliseconds(waitMs);
    for (;;) {
        const int fd = ::socket(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC, 0);
        if (fd < 0) {
            return false;
        }
        if (::connect(fd, reinterpret_cast<sockaddr*>(&address), sizeof address) == 0) {
            bool sent = true;
            for (std::size_t done = 0; done < message.size() && sent;) {
                const ssize_t n =
                    ::send(fd, message.data() + done, message.size() - done, MSG_NOSIGNAL);
                if (n < 0 && errno == EINTR)
                    continue;
                sent = n > 0;
                done += sent ? static_cast<std::size_t>(n) : 0;
            }
            ::shutdown(fd, SHUT_WR);
            char taken = 0;
            pollfd waiter{fd, POLLIN, 0};
            const bool acknowledged = sent && ::poll(&waiter, 1, kReadTimeoutMs) > 0 &&
                                      ::read(fd, &taken, 1) == 1 && taken == 1;
            ::close(fd);
            return acknowledged;
        }
        ::close(fd);
        // The first copy holds the lock but may not listen yet: two starts at one moment.
        if (std::chrono::steady_clock::now() >= deadline) {
            return false;
        }
        std::this_thread::sleep_for(std::chrono::milliseconds(50));
    }
}

}  // namespace ac::platform
