#include "shell/TestHook.h"

#include "shell/AudioEncDlg.h"

#include <wx/timer.h>
#include <wx/weakref.h>

#include <cstdio>
#include <cstdlib>
#include <fstream>
#include <sstream>
#include <string>

namespace ac {

namespace {

class TestHookTimer : public wxTimer {
public:
    TestHookTimer(CAudioEncDlg* dialog, std::string dir)
        : m_dialog(dialog), m_dir(std::move(dir)) {}

    void Notify() override {
        if (!m_dialog) {
            Stop();
            return;
        }
        const std::string commands = m_dir + "/command.txt";
        std::ifstream in(commands);
        if (in) {
            std::string line;
            std::vector<std::string> lines;
            while (std::getline(in, line)) {
                lines.push_back(line);
            }
            in.close();
            std::remove(commands.c_str());
            // Each command runs from the event loop, not from this timer: a command that opens
            // a modal dialog must leave the timer free to deliver the next one to it.
            for (const std::string& command : lines) {
                if (!m_dialog) {
                    return;
                }
                wxWeakRef<CAudioEncDlg> dialog = m_dialog;
                m_dialog->CallAfter([dialog, command] {
                    if (dialog) {
                        dialog->RunScriptCommand(command);
                    }
                });
            }
        }
        if (!m_dialog) {
            return;
        }
        const std::string state = m_dialog->DescribeState();
        if (state != m_lastState) {
            m_lastState = state;
            std::ofstream out(m_dir + "/state.tmp", std::ios::trunc);
            out << state << "end\n";
            out.close();
            std::rename((m_dir + "/state.tmp").c_str(), (m_dir + "/state.txt").c_str());
        }
    }

private:
    wxWeakRef<CAudioEncDlg> m_dialog;
    std::string m_dir;
    std::string m_lastState;
};

}  // namespace

void StartTestHook(CAudioEncDlg* dialog) {
    const char* dir = std::getenv("AUDIOCONV_TEST_DIR");
    if (dir == nullptr || *dir == '\0') {
        return;
    }
    // Lives as long as the program; it stops itself when the window is gone.
    static TestHookTimer* timer = new TestHookTimer(dialog, dir);
    timer->Start(100);
}

}  // namespace ac
