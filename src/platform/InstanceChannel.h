#pragma once
// The one running copy of the program per user takes the files of later starts: a second start
// hands its paths over a UNIX socket in the user's runtime folder and ends. Paths travel as
// bytes, each ended by a NUL, so names that are not UTF-8 arrive as they were typed.
//
// Thread contract: the listener calls its handler on its own thread; the owner carries the
// paths to the window through the UI queue. SendPaths may be called from any thread.

#include <atomic>
#include <functional>
#include <string>
#include <thread>
#include <vector>

namespace ac::platform {

// $XDG_RUNTIME_DIR/audio-converter.sock, else audio-converter.sock in the user data folder
// (runtime folders are missing on some servers and in containers).
std::string InstanceSocketPath();

class InstanceListener {
public:
    using Handler = std::function<void(std::vector<std::string> paths)>;
    InstanceListener() = default;
    ~InstanceListener();
    InstanceListener(const InstanceListener&) = delete;
    InstanceListener& operator=(const InstanceListener&) = delete;

    // Binds the socket, replacing one left by a copy that died (the caller holds the
    // single-instance lock, so a socket file there is stale), and starts accepting.
    bool Start(const std::string& socketPath, Handler handler);
    void Stop();

private:
    void Run();

    std::string m_path;
    Handler m_handler;
    int m_socket = -1;
    int m_wake[2] = {-1, -1};
    std::thread m_thread;
};

// Hands the paths to the running copy; keeps trying for up to `waitMs` while the other copy is
// still starting (two starts at the same moment). False when nobody took them.
bool SendPaths(const std::string& socketPath, const std::vector<std::string>& paths,
               int waitMs = 5000);

}  // namespace ac::platform
