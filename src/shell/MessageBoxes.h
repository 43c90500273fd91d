#pragma once
// The program's message boxes, titled with the product name. Under the window tests' hook
// (AUDIOCONV_TEST_DIR) no box is shown: the text is recorded for the hook's state and the answer
// comes from the answers the test queued (Yes/OK when none is queued), so a test never hangs
// on a modal box it cannot reach.
//
// Thread contract: UI thread only.

#include <string>
#include <vector>

class wxWindow;

namespace ac {

// style: wx message box flags (wxYES_NO, wxICON_QUESTION, wxNO_DEFAULT...). Answers wxYES,
// wxNO, wxOK or wxCANCEL.
int AppMessageBox(const std::string& text, long style, wxWindow* parent = nullptr);

// Opens a page of the program's help in the user's browser ($BROWSER when it is set, else the
// desktop's default through xdg-open); a missing page is said in a box.
void OpenHelpPage(const std::string& path, wxWindow* parent);

// For the test hook.
bool BoxesAreScripted();
void QueueBoxAnswer(int answer);
const std::vector<std::string>& ShownBoxes();

}  // namespace ac
