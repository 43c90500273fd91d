// Starts the real program on its own X display and waits for its window. Runs under xvfb-run.

#include "../support/TempDir.h"

#include <gtest/gtest.h>
#include <signal.h>
#include <sys/wait.h>
#include <unistd.h>

#include <array>
#include <chrono>
#include <cstdio>
#include <string>
#include <thread>

namespace {

std::string RunAndCapture(const std::string& command) {
    std::string output;
    if (FILE* pipe = ::popen(command.c_str(), "r")) {
        std::array<char, 4096> buffer;
        std::size_t got;
        while ((got = std::fread(buffer.data(), 1, buffer.size(), pipe)) > 0) {
            output.append(buffer.data(), got);
        }
        ::pclose(pipe);
    }
    return output;
}

bool WindowTitled(const std::string& title) {
    return RunAndCapture("xwininfo -root -tree 2>/dev/null").find("\"" + title + "\"") !=
           std::string::npos;
}

TEST(StartWindowTest, TheProgramOpensAWindowTitledWithTheProductName) {
    ASSERT_NE(::getenv("DISPLAY"), nullptr) << "run under xvfb-run";
    ac::test::TempDir home;
    pid_t child = ::fork();
    if (child == 0) {
        ::setenv("HOME", home.Path().c_str(), 1);
        ::setenv("XDG_CONFIG_HOME", (home / ".config").c_str(), 1);
        ::setenv("XDG_DATA_HOME", (home / ".local/share").c_str(), 1);
        std::string program = std::string(AC_BIN_DIR) + "/audio-converter";
        ::execl(program.c_str(), program.c_str(), static_cast<char*>(nullptr));
        ::_exit(127);
    }
    bool shown = false;
    auto deadline = std::chrono::steady_clock::now() + std::chrono::seconds(20);
    while (!shown && std::chrono::steady_clock::now() < deadline) {
        std::this_thread::sleep_for(std::chrono::milliseconds(100));
        shown = WindowTitled("Velmorant Audio Converter");
        int status = 0;
        ASSERT_EQ(::waitpid(child, &status, WNOHANG), 0) << "the program ended early";
    }
    ::kill(child, SIGTERM);
    ::waitpid(child, nullptr, 0);
    EXPECT_TRUE(shown);
}

}  // namespace
