#include "platform/ChildProcess.h"

#include <sched.h>
#include <sys/resource.h>

#include "platform/CommandLine.h"
#include "platform/PartFiles.h"

#include <cerrno>
#include <chrono>
#include <csignal>
#include <cstring>
#include <vector>
#include <fcntl.h>
#include <poll.h>
#include <spawn.h>
#include <sys/wait.h>
#include <unistd.h>

extern char** environ;

namespace ac::platform {
namespace {

// The reader's piece size: a long line arrives in several reads, which the line splitter of
// the caller puts together again.
constexpr std::size_t kReadSize = 256;
// How long the readers may still empty the pipes once the child has gone, before a grandchild
// that keeps them open is ended with the rest of the group.
constexpr auto kDrainGrace = std::chrono::milliseconds(100);
constexpr auto kKillWait = std::chrono::milliseconds(1000);

void CloseFd(int& fd) {
    if (fd >= 0) {
        ::close(fd);
        fd = -1;
    }
}

struct Pipe {
    int fds[2] = {-1, -1};
    bool Open() { return ::pipe2(fds, O_CLOEXEC) == 0; }
    void Close() {
        CloseFd(fds[0]);
        CloseFd(fds[1]);
    }
};

}  // namespace

ImChildProcess::~ImChildProcess() {
    StopAndJoin();
}

std::string ImChildProcess::LaunchFailureText(const std::string& commandLine) {
    return "Unable to start " + commandLine + "\n";
}

pid_t ImChildProcess::ProcessId() const {
    std::lock_guard lock(m_mutex);
    return m_pid;
}

constexpr int kSlowdownNice = 10;

bool ImChildProcess::Launch(const std::string& commandLine, bool /*showWindow*/) {
    JoinThreads();

    std::vector<std::string> words = SplitCommandLine(commandLine);
    Pipe in, out, err, wake;
    bool piped = in.Open() && out.Open() && err.Open() && wake.Open();
    int spawnError = EINVAL;
    pid_t pid = -1;
    if (piped && !words.empty()) {
        std::vector<char*> argv;
        for (auto& word : words)
            argv.push_back(word.data());
        argv.push_back(nullptr);

        posix_spawn_file_actions_t actions;
        posix_spawn_file_actions_init(&actions);
        posix_spawn_file_actions_adddup2(&actions, in.fds[0], 0);
        posix_spawn_file_actions_adddup2(&actions, out.fds[1], 1);
        posix_spawn_file_actions_adddup2(&actions, err.fds[1], 2);
        if (!m_currentDirectory.empty())
            posix_spawn_file_actions_addchdir_np(&actions, m_currentDirectory.c_str());

        posix_spawnattr_t attr;
        posix_spawnattr_init(&attr);
        sigset_t none, defaults;
        sigemptyset(&none);
        sigemptyset(&defaults);
        // The caller may ignore SIGPIPE or catch Ctrl-C; the tool must see the usual defaults.
        for (int sig : {SIGPIPE, SIGINT, SIGTERM, SIGHUP, SIGQUIT})
            sigaddset(&defaults, sig);
        posix_spawnattr_setsigmask(&attr, &none);
        posix_spawnattr_setsigdefault(&attr, &defaults);
        posix_spawnattr_setpgroup(&attr, 0);
        posix_spawnattr_setflags(
            &attr, POSIX_SPAWN_SETPGROUP | POSIX_SPAWN_SETSIGMASK | POSIX_SPAWN_SETSIGDEF);
        spawnError = ::posix_spawn(&pid, argv[0], &actions, &attr, argv.data(), environ);
        posix_spawnattr_destroy(&attr);
        posix_spawn_file_actions_destroy(&actions);
    }
    CloseFd(in.fds[0]);
    CloseFd(out.fds[1]);
    CloseFd(err.fds[1]);
    // Nothing is ever written to the tool's input: it sees an empty stream at once.
    CloseFd(in.fds[1]);

    if (!piped || words.empty() || spawnError != 0) {
        out.Close();
        err.Close();
        wake.Close();
        OnStdout(LaunchFailureText(commandLine));
        return false;
    }

    // Lowering one's own children needs no privilege; a refusal leaves the child at normal
    // priority, which is no reason to fail the job.
    if (m_slowdown)
        ::setpriority(PRIO_PGRP, static_cast<id_t>(pid), kSlowdownNice);
    if (m_idle) {
        sched_param param{};
        ::sched_setscheduler(pid, SCHED_IDLE, &param);
    }
    {
        std::lock_guard lock(m_mutex);
        m_pid = pid;
        m_exited = false;
        m_killed = false;
    }
    m_exitCode = 0;
    m_running = 1;
    m_readersLeft = 2;
    m_wakeRead = wake.fds[0];
    m_wakeWrite = wake.fds[1];
    // OnStart clears what the last run left; no reader exists yet, so no first line is lost.
    OnStart(commandLine);
    m_stdoutThread = std::thread(&ImChildProcess::ReaderLoop, this, out.fds[0], false);
    m_stderrThread = std::thread(&ImChildProcess::ReaderLoop, this, err.fds[0], true);
    m_waitThread = std::thread(&ImChildProcess::WaiterLoop, this);
    return true;
}

void ImChildProcess::ReaderLoop(int fd, bool isError) {
    char buffer[kReadSize + 1];
    pollfd fds[2] = {{fd, POLLIN, 0}, {m_wakeRead, POLLIN, 0}};
    for (;;) {
        int ready = ::poll(fds, 2, -1);
        if (ready < 0) {
            if (errno == EINTR)
                continue;
            break;
        }
        if (fds[0].revents != 0) {
            ssize_t got = ::read(fd, buffer, kReadSize);
            if (got < 0 && errno == EINTR)
                continue;
            if (got <= 0)
                break;  // end of stream: every writer has gone
            buffer[got] = '\0';
            std::string_view text(buffer, static_cast<std::size_t>(got));
            if (isError)
                OnStderr(text);
            else
                OnStdout(text);
            continue;
        }
        if (fds[1].revents != 0)
            break;
    }
    ::close(fd);
    std::lock_guard lock(m_mutex);
    --m_readersLeft;
    m_exitedChanged.notify_all();
}

void ImChildProcess::WaiterLoop() {
    pid_t pid;
    {
        std::lock_guard lock(m_mutex);
        pid = m_pid;
    }
    // Wait without reaping: while the zombie stands, its pid and group id cannot be reused, so
    // a Kill or Suspend racing with the end never reaches a stranger.
    siginfo_t info{};
    while (::waitid(P_PID, static_cast<id_t>(pid), &info, WEXITED | WNOWAIT) != 0 &&
           errno == EINTR) {
    }
    bool killed;
    {
        std::unique_lock lock(m_mutex);
        m_exited = true;
        m_exitedChanged.notify_all();
        m_exitedChanged.wait_for(lock, kDrainGrace, [this] { return m_readersLeft == 0; });
        killed = m_killed;
        if (m_readersLeft != 0)
            ::kill(-pid, SIGKILL);  // a grandchild holds the pipes open
    }
    m_running = 0;
    if (m_wakeWrite >= 0) {
        char byte = 1;
        [[maybe_unused]] ssize_t ignored = ::write(m_wakeWrite, &byte, 1);
    }
    m_stdoutThread.join();
    m_stderrThread.join();

    int status = 0;
    while (::waitpid(pid, &status, 0) < 0 && errno == EINTR) {
    }
    std::string outputPath;
    {
        std::lock_guard lock(m_mutex);
        outputPath = m_outputPath;
    }
    // A tool that ended on its own has renamed or removed its part file; one that was killed or
    // crashed has not. Removing before OnExit means the driver never sees the leftover.
    RemovePartFile(outputPath, pid);
    if (!killed) {
        int code = 0;
        if (WIFEXITED(status))
            code = WEXITSTATUS(status);
        else if (WIFSIGNALED(status))
            code = 128 + WTERMSIG(status);  // as a shell reports it: a crash is a failure
        m_exitCode = code;
    }
    OnExit(m_exitCode.load());
}

bool ImChildProcess::IsRunning() const {
    std::lock_guard lock(m_mutex);
    return m_pid > 0 && !m_exited;
}

bool ImChildProcess::Suspend() {
    std::lock_guard lock(m_mutex);
    if (m_pid <= 0)
        return false;
    if (m_exited)
        return true;
    return ::kill(-m_pid, SIGSTOP) == 0 || ::kill(m_pid, SIGSTOP) == 0;
}

bool ImChildProcess::Resume() {
    std::lock_guard lock(m_mutex);
    if (m_pid <= 0)
        return false;
    if (m_exited)
        return true;
    return ::kill(-m_pid, SIGCONT) == 0 || ::kill(m_pid, SIGCONT) == 0;
}

void ImChildProcess::SetOutputPath(std::string path) {
    std::lock_guard lock(m_mutex);
    m_outputPath = std::move(path);
}

void ImChildProcess::RequestStop(int exitCode) {
    std::lock_guard lock(m_mutex);
    if (m_pid <= 0 || m_exited)
        return;
    m_killed = true;
    m_exitCode = exitCode;
    // A stopped child would never see the request; continue it first. The group goes too, so a
    // tool that is a script with children ends as one.
    for (int sig : {SIGCONT, SIGTERM}) {
        ::kill(-m_pid, sig);
        ::kill(m_pid, sig);
    }
}

void ImChildProcess::Kill(int exitCode) {
    RequestStop(exitCode);
    std::unique_lock lock(m_mutex);
    if (m_pid <= 0 || m_exited)
        return;
    if (m_exitedChanged.wait_for(lock, kTerminateGrace, [this] { return m_exited; }))
        return;
    ::kill(-m_pid, SIGKILL);
    ::kill(m_pid, SIGKILL);
    m_exitedChanged.wait_for(lock, kKillWait, [this] { return m_exited; });
}

void ImChildProcess::JoinThreads() {
    std::lock_guard join(m_joinMutex);
    if (m_waitThread.joinable())
        m_waitThread.join();
    CloseWakePipe();
}

void ImChildProcess::CloseWakePipe() {
    CloseFd(m_wakeRead);
    CloseFd(m_wakeWrite);
}

void ImChildProcess::WaitForExit() {
    JoinThreads();
}

void ImChildProcess::StopAndJoin() {
    Kill(65535);
    JoinThreads();
}

}  // namespace ac::platform
