// The program's entry. Until the skinned main window lands, it opens a plain frame that shows
// the product name and where the program found its data and settings.

#include "shell/AppConfig.h"

#include <wx/wx.h>

namespace {

class CAudioEncApp : public wxApp {
public:
    bool OnInit() override {
        ac::AppConfig& config = ac::GetAppConfig();
        const std::string& title = config.GetProductStrings().productName;
        SetAppDisplayName(wxString::FromUTF8(title));

        auto* frame = new wxFrame(nullptr, wxID_ANY, wxString::FromUTF8(title), wxDefaultPosition,
                                  wxSize(840, 634));
        auto* panel = new wxPanel(frame);
        auto* sizer = new wxBoxSizer(wxVERTICAL);
        auto line = [&](const std::string& text) {
            sizer->Add(new wxStaticText(panel, wxID_ANY, wxString::FromUTF8(text)), 0,
                       wxALL, 8);
        };
        line(title);
        line("Program data: " + config.GetBaseDirectory());
        line("Settings: " + config.SettingsFile());
        panel->SetSizer(sizer);
        frame->Show();
        return true;
    }
};

}  // namespace

wxIMPLEMENT_APP(CAudioEncApp);
