#include "shell/MessageBoxes.h"

#include "shell/AppConfig.h"

#include <wx/filename.h>
#include <wx/utils.h>
#include <wx/msgdlg.h>

#include <cstdlib>
#include <deque>

namespace ac {

namespace {

std::deque<int> s_answers;
std::vector<std::string> s_shown;

}  // namespace

bool BoxesAreScripted() {
    const char* dir = std::getenv("AUDIOCONV_TEST_DIR");
    return dir != nullptr && *dir != '\0';
}

int AppMessageBox(const std::string& text, long style, wxWindow* parent) {
    if (BoxesAreScripted()) {
        s_shown.push_back(text);
        if (!s_answers.empty()) {
            const int answer = s_answers.front();
            s_answers.pop_front();
            return answer;
        }
        return (style & wxYES_NO) != 0 ? wxYES : wxOK;
    }
    const std::string& caption = GetAppConfig().GetProductStrings().productName;
    return wxMessageBox(wxString::FromUTF8(text), wxString::FromUTF8(caption), style, parent);
}

void QueueBoxAnswer(int answer) {
    s_answers.push_back(answer);
}

const std::vector<std::string>& ShownBoxes() {
    return s_shown;
}

void OpenHelpPage(const std::string& path, wxWindow* parent) {
    if (!wxFileName::FileExists(wxString::FromUTF8(path))) {
        AppMessageBox("The help page " + path + " is missing.", wxOK | wxICON_ERROR, parent);
        return;
    }
    const wxString url = wxFileName::FileNameToURL(wxFileName(wxString::FromUTF8(path)));
    wxString browser;
    if (wxGetEnv("BROWSER", &browser) && !browser.empty()) {
        const char* argv[] = {nullptr, nullptr, nullptr};
        const wxScopedCharBuffer program = browser.utf8_str();
        const wxScopedCharBuffer address = url.utf8_str();
        argv[0] = program.data();
        argv[1] = address.data();
        wxExecute(argv, wxEXEC_ASYNC);
        return;
    }
    wxLaunchDefaultBrowser(url);
}

}  // namespace ac
