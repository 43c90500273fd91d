#pragma once
// Starts the real program on the test's X display with a home of its own and drives it through
// its test hook (AUDIOCONV_TEST_DIR): it reports what it shows in state.txt and runs the lines
// of command.txt. Power actions go to power.txt in the home (AUDIOCONV_POWER_DRYRUN).

#include "TempDir.h"

#include <signal.h>
#include <sys/wait.h>
#include <unistd.h>

#include <chrono>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <functional>
#include <map>
#include <sstream>
#include <string>
#include <vector>
#include <thread>

namespace ac::test {

using namespace std::chrono_literals;
using State = std::map<std::string, std::string>;

class Program {
public:
    Program(const TempDir& home, std::string executable = AC_BIN_DIR "/audio-converter",
            std::vector<std::string> args = {})
        : m_home(home.Path()), m_hook(home / "hook") {
        std::filesystem::create_directories(m_hook);
        std::filesystem::remove(m_hook + "/state.txt");
        m_pid = ::fork();
        if (m_pid == 0) {
            ::setenv("HOME", m_home.c_str(), 1);
            ::setenv("XDG_CONFIG_HOME", (m_home + "/.config").c_str(), 1);
            ::setenv("XDG_DATA_HOME", (m_home + "/.local/share").c_str(), 1);
            ::setenv("AUDIOCONV_TEST_DIR", m_hook.c_str(), 1);
            ::setenv("AUDIOCONV_POWER_DRYRUN", (m_home + "/power.txt").c_str(), 1);
            ::setenv("LANG", "C", 1);
            // The socket that takes a later start's files lives here, apart from other tests'.
            ::setenv("XDG_RUNTIME_DIR", m_home.c_str(), 1);
            std::vector<char*> argv{executable.data()};
            for (std::string& arg : args) argv.push_back(arg.data());
            argv.push_back(nullptr);
            ::execv(executable.c_str(), argv.data());
            ::_exit(127);
        }
    }
    ~Program() {
        if (Running()) {
            ::kill(m_pid, SIGKILL);
            ::waitpid(m_pid, nullptr, 0);
        }
    }

    bool Running() {
        if (m_exited) {
            return false;
        }
        int status = 0;
        if (::waitpid(m_pid, &status, WNOHANG) == m_pid) {
            m_exited = true;
            return false;
        }
        return true;
    }

    bool WaitForExit(std::chrono::seconds limit = 10s) {
        const auto deadline = std::chrono::steady_clock::now() + limit;
        while (std::chrono::steady_clock::now() < deadline) {
            if (!Running()) {
                return true;
            }
            std::this_thread::sleep_for(50ms);
        }
        return false;
    }

    State ReadState() const {
        State state;
        std::istringstream in(Slurp(m_hook + "/state.txt"));
        std::string line;
        while (std::getline(in, line)) {
            const auto eq = line.find('=');
            if (eq != std::string::npos) {
                state[line.substr(0, eq)] = line.substr(eq + 1);
            }
        }
        return state;
    }

    // Waits until the reported state satisfies the test; answers the last state seen.
    State WaitFor(const std::function<bool(const State&)>& test, std::chrono::seconds limit = 20s) {
        const auto deadline = std::chrono::steady_clock::now() + limit;
        State state;
        while (std::chrono::steady_clock::now() < deadline && Running()) {
            state = ReadState();
            if (!state.empty() && test(state)) {
                return state;
            }
            std::this_thread::sleep_for(50ms);
        }
        return state;
    }
    State WaitShown() {
        return WaitFor([](const State& s) { return s.count("title") > 0; });
    }

    // The program takes command.txt away when it has read it; a second command waits for that,
    // or it would replace the first unread.
    void Send(const std::string& command) {
        const auto deadline = std::chrono::steady_clock::now() + 10s;
        while (std::filesystem::exists(m_hook + "/command.txt") &&
               std::chrono::steady_clock::now() < deadline && Running()) {
            std::this_thread::sleep_for(20ms);
        }
        const std::string temp = m_hook + "/command.tmp";
        std::ofstream(temp) << command << "\n";
        std::filesystem::rename(temp, m_hook + "/command.txt");
    }

    pid_t Pid() const { return m_pid; }

    // A signal to the program, as kill(1) or the desktop's log-out sends it.
    void Signal(int number) {
        if (Running()) {
            ::kill(m_pid, number);
        }
    }

    std::string Settings() const {
        return Slurp(m_home + "/.config/audio-converter/settings.ini");
    }

    static std::string Slurp(const std::string& path) {
        std::ifstream in(path);
        return std::string((std::istreambuf_iterator<char>(in)), {});
    }

private:
    std::string m_home;
    std::string m_hook;
    pid_t m_pid = -1;
    bool m_exited = false;
};

inline void WriteSettings(const TempDir& home, const std::string& lines) {
    std::filesystem::create_directories(home / ".config/audio-converter");
    std::ofstream(home / ".config/audio-converter/settings.ini")
        << "[Software\\Velmorant\\Audio Converter\\Settings]\n" << lines;
}

}  // namespace ac::test
