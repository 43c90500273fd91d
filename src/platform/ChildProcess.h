#pragma once
// One child process with its three standard streams on pipes: a reader thread on each output
// pipe, a waiter thread that reports the end, and stop, continue and forced end on demand.
//
// The child runs in a process group of its own, and every signal goes to the whole group, so a
// tool that is a shell script with children of its own stops, continues and dies as one.
//
// Thread contract: Launch, Kill, Suspend, Resume and IsRunning may be called from any thread,
// also from inside OnStdout/OnStderr (the error-stream watchdog kills from its reader).
// OnStdout runs on the output reader, OnStderr on the error reader, OnExit on the waiter, after
// both readers have delivered everything they read. A class that overrides the hooks must call
// StopAndJoin() in its own destructor, so no hook runs on a half-destroyed object.

#include <atomic>
#include <chrono>
#include <condition_variable>
#include <mutex>
#include <string>
#include <string_view>
#include <thread>
#include <sys/types.h>

namespace ac::platform {

class ImChildProcess {
public:
    static constexpr std::chrono::milliseconds kTerminateGrace{2000};

    ImChildProcess() = default;
    virtual ~ImChildProcess();
    ImChildProcess(const ImChildProcess&) = delete;
    ImChildProcess& operator=(const ImChildProcess&) = delete;

    // commandLine: the program path as first word, split like the tool splits its own text.
    // Returns false when the child could not be started; the reason then reaches OnStdout.
    bool Launch(const std::string& commandLine, bool showWindow = false);

    // True from a successful Launch until the child has ended (a stopped child still runs).
    bool IsRunning() const;
    // Both answer true also for a child that has already ended, false only when there never was
    // one or the signal could not be sent.
    virtual bool Suspend();
    virtual bool Resume();
    // Ending a child, the one way every driver does it: a paused child is continued, asked to
    // end with SIGTERM (so the tool removes its part file itself) and killed only when it has
    // not gone after kTerminateGrace. The exit reported afterwards is exitCode, not the signal.
    // Both do nothing for a child that is no longer running: its own exit code stays.
    // RequestStop only asks and returns at once; Kill waits for the end, killing when it must.
    // A driver that stops many children asks them all first, then Kills each.
    void RequestStop(int exitCode);
    void Kill(int exitCode);

    // The output the child writes: once it has been reaped, whatever part file it left for
    // that output is removed (PartFiles.h), also after a SIGKILL.
    void SetOutputPath(std::string path);

    // Waits until the last run's waiter has called OnExit and all its threads are gone.
    void WaitForExit();

    int ExitCode() const { return m_exitCode.load(); }
    pid_t ProcessId() const;
    void SetCurrentDirectory(std::string directory) { m_currentDirectory = std::move(directory); }
    // Conversions as background work, as the settings "Slowdown Priority" and "Idle Convert"
    // ask: `slowdown` runs the child's process group at nice 10, `idle` under SCHED_IDLE, so
    // a desktop stays responsive while every core converts.
    void SetBackgroundPriority(bool slowdown, bool idle) {
        m_slowdown = slowdown;
        m_idle = idle;
    }

protected:
    virtual void OnStart(const std::string& /*commandLine*/) {}
    virtual void OnStdout(std::string_view /*text*/) {}
    virtual void OnStderr(std::string_view /*text*/) {}
    virtual void OnExit(int /*exitCode*/) {}
    // The line reported through OnStdout when the child could not be started.
    virtual std::string LaunchFailureText(const std::string& commandLine);

    // Kills a live child with 65535 and joins every thread of the last run.
    void StopAndJoin();

private:
    void ReaderLoop(int fd, bool isError);
    void WaiterLoop();
    void JoinThreads();
    void CloseWakePipe();

    bool m_slowdown = false;
    bool m_idle = false;
    std::string m_currentDirectory;
    std::string m_outputPath;  // guarded by m_mutex

    mutable std::mutex m_mutex;  // guards m_pid, m_exited, m_killed against pid reuse
    pid_t m_pid = -1;
    bool m_exited = true;
    bool m_killed = false;
    std::condition_variable m_exitedChanged;

    std::atomic<int> m_running{0};
    std::atomic<int> m_exitCode{0};
    std::atomic<int> m_readersLeft{0};
    // Readers wait on their pipe and on this one: the waiter writes to it when a grandchild
    // keeps the pipes open after the child itself has gone.
    int m_wakeRead = -1;
    int m_wakeWrite = -1;

    std::thread m_stdoutThread;
    std::thread m_stderrThread;
    std::thread m_waitThread;
    std::mutex m_joinMutex;  // one joiner at a time
};

}  // namespace ac::platform
