#pragma once
// What the panels' window tests share: wx started once with the UI queue on it, the settings in
// a folder of their own, the real data.pkg of the build with its Default skin, event pumping
// without timing, and screenshots for a person to look at (AC_SCREENSHOT_DIR).

#include "../support/WxTestApp.h"
#include "../support/TempDir.h"
#include "resources/Language.h"
#include "skin/SkinManager.h"
#include "skin/UiQueueWx.h"

#include <wx/app.h>
#include <wx/image.h>
#include <wx/init.h>
#include <wx/utils.h>
#include <wx/window.h>

#include <gtest/gtest.h>

#include <cstdlib>
#include <functional>
#include <memory>
#include <string>

namespace ac::test {

class WxEnvironment : public ::testing::Environment {
public:
    void SetUp() override {
        ::setenv("XDG_CONFIG_HOME", (m_home / "config").c_str(), 1);
        ::setenv("XDG_DATA_HOME", (m_home / "data").c_str(), 1);
        StartWx("panels_window_tests");
        wxInitAllImageHandlers();
        InstallWxUiQueue();
        g_Language.Init(AC_BIN_DIR, "English");
        g_Skin.SetRoot(g_Language.GetBaseDir() + "\\Skin");
    }
    void TearDown() override { wxEntryCleanup(); }

private:
    TempDir m_home;
};

// Runs pending calls and events until done() holds, at most `rounds` times.
inline bool PumpUntil(const std::function<bool()>& done, int rounds = 2000) {
    for (int i = 0; i < rounds; ++i) {
        if (done()) {
            return true;
        }
        wxTheApp->ProcessPendingEvents();
        wxTheApp->Yield(true);
    }
    return done();
}

inline void Pump(int rounds = 20) {
    PumpUntil([] { return false; }, rounds);
}

// The window as it stands on the screen, into AC_SCREENSHOT_DIR/name.png when that is set.
inline void Screenshot(wxWindow* window, const std::string& name) {
    const char* dir = std::getenv("AC_SCREENSHOT_DIR");
    if (dir == nullptr || window == nullptr) {
        return;
    }
    window->Raise();
    window->Refresh();
    window->Update();
    // Only for a person's eyes: give the X server time to map and paint.
    for (int i = 0; i < 10; ++i) {
        Pump(10);
        wxMilliSleep(30);
    }
    const wxRect rect = window->GetScreenRect();
    const std::string command = "import -window root -crop " + std::to_string(rect.width) + "x" +
                                std::to_string(rect.height) + "+" + std::to_string(rect.x) + "+" +
                                std::to_string(rect.y) + " '" + dir + "/" + name + ".png'";
    if (std::system(command.c_str()) != 0) {
        ADD_FAILURE() << "screenshot failed: " << command;
    }
}

}  // namespace ac::test
