#pragma once
// A small hook for the window tests: with AUDIOCONV_TEST_DIR set, the program writes what it
// shows to state.txt in that folder and runs the lines it finds in command.txt there. Without
// the variable nothing of this runs.
//
// Thread contract: UI thread only.

#include <iosfwd>
#include <string>

namespace ac {

class CAudioEncDlg;

void StartTestHook(CAudioEncDlg* dialog);

// What the tests read and how they drive the window, from outside it: the main window only
// routes commands, and this class looks at it as a friend.
class CTestHook {
public:
    // One line per fact.
    static std::string DescribeState(const CAudioEncDlg& dlg);
    static void RunScriptCommand(CAudioEncDlg& dlg, const std::string& line);

private:
    static void DescribePanels(const CAudioEncDlg& dlg, std::ostream& out);
};

}  // namespace ac
