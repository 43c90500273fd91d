#pragma once
// What the main dialog does at the end of a run and on its About command, with the program's
// settings filled in: the end-of-run sound, the after-run action with its countdown, and the
// About box.
//
// Thread contract: UI thread only.

#include <string>

class wxWindow;

namespace ac {

// After-run actions, the values of the setting `afterconvert`.
enum AfterRunAction {
    kActionShutDown = 0,
    kActionStandby = 1,
    kActionHibernate = 2,
    kActionExit = 3,
    kActionNone = 4
};

// Plays the sound of the settings `playsound` and `last_wavopenpath` (empty: wav/hint1.wav of
// the program), if asked, without waiting.
void PlayEndOfRunSound();

// The countdown for actions 0 to 3 and, unless cancelled, the action: 3 asks mainWindow to close
// through its ordinary close path, posted. 4 does nothing; any other value is reported.
void RunAfterRunAction(int action, wxWindow* mainWindow);

// The About box; imagePath as ImAboutDlg takes it, empty for the plain box.
void ShowAboutDialog(wxWindow* parent, const std::string& imagePath);

}  // namespace ac
