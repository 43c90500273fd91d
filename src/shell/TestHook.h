#pragma once
// A small hook for the window tests: with AUDIOCONV_TEST_DIR set, the program writes what it
// shows to state.txt in that folder and runs the lines it finds in command.txt there. Without
// the variable nothing of this runs.
//
// Thread contract: UI thread only.

namespace ac {

class CAudioEncDlg;

void StartTestHook(CAudioEncDlg* dialog);

}  // namespace ac
