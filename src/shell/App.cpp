// The program's entry: product strings, the language, then the window. Until the skinned main
// window lands, the window is a plain frame that shows where the program found its data and
// settings.

#include "resources/Language.h"
#include "resources/TextFormat.h"
#include "shell/AppConfig.h"

#include <wx/wx.h>

namespace {

// Ids of the main dialog's help contents and about commands, which the language decorates with
// the product name.
constexpr int kContentsCommand = 32900;
constexpr int kAboutCommand = 32903;

constexpr std::uint32_t kSettingsSetAside = 0xC0C0;
constexpr std::uint32_t kProgramDataLine = 0xC0C1;
constexpr std::uint32_t kSettingsLine = 0xC0C2;

wxString Text(std::uint32_t id, std::initializer_list<std::string_view> args = {}) {
    return wxString::FromUTF8(ac::FormatText(ac::g_Language.GetString(id), args));
}

void ChooseLanguage(ac::AppConfig& config) {
    std::string name = config.GetString("language");
    if (name.empty()) {
        name = ac::SystemLanguageName();
    }
    ac::g_Language.SetProductName(config.GetProductStrings().productName);
    ac::g_Language.SetContentsCommand(kContentsCommand);
    ac::g_Language.SetAboutCommand(kAboutCommand);
    // A language whose file is gone falls back to English; remember that, so the next start
    // does not try the missing one again.
    ac::g_Language.SetLanguageKeyWriter([](const std::string& chosen) {
        ac::GetAppConfig().SetString("language", chosen.c_str());
    });
    ac::g_Language.Init(config.GetBaseDirectory(), name);
}

class CAudioEncApp : public wxApp {
public:
    bool OnInit() override {
        ac::AppConfig& config = ac::GetAppConfig();
        const ac::ProductStrings& product = config.GetProductStrings();
        SetAppDisplayName(wxString::FromUTF8(product.productName));
        ChooseLanguage(config);

        std::string setAside = config.TakeSetAsideNotice();
        if (!setAside.empty()) {
            wxMessageBox(Text(kSettingsSetAside, {setAside}),
                         wxString::FromUTF8(product.productFullName), wxOK | wxICON_WARNING);
        }

        auto* frame = new wxFrame(nullptr, wxID_ANY, wxString::FromUTF8(product.productName),
                                  wxDefaultPosition, wxSize(840, 634));
        auto* panel = new wxPanel(frame);
        auto* sizer = new wxBoxSizer(wxVERTICAL);
        auto line = [&](const wxString& text) {
            sizer->Add(new wxStaticText(panel, wxID_ANY, text), 0, wxALL, 8);
        };
        line(wxString::FromUTF8(product.productName));
        line(Text(kProgramDataLine, {config.GetBaseDirectory()}));
        line(Text(kSettingsLine, {config.SettingsFile()}));
        panel->SetSizer(sizer);
        frame->Show();
        return true;
    }
};

}  // namespace

wxIMPLEMENT_APP(CAudioEncApp);
