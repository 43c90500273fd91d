#pragma once
// Starts wx once for a window test executable, on the display xvfb-run gives it, and ends it
// again. The name is the program name wx shows in its own messages.

#include <wx/app.h>
#include <wx/init.h>

#include <gtest/gtest.h>

namespace ac::test {

inline void StartWx(const char* programName) {
    static int argc = 1;
    static char name[64];
    snprintf(name, sizeof name, "%s", programName);
    static char* argv[] = {name, nullptr};
    wxApp::SetInstance(new wxApp);
    ASSERT_TRUE(wxEntryStart(argc, argv));
    ASSERT_TRUE(wxTheApp->CallOnInit());
}

inline void StopWx() { wxEntryCleanup(); }

}  // namespace ac::test
