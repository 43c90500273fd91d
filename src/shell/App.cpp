// The program's entry, in this order: product strings and the language, the single-instance
// check, then the main window. A second start ends here silently.

#include "platform/Paths.h"
#include "resources/Language.h"
#include "resources/TextFormat.h"
#include "shell/AppConfig.h"
#include "shell/AudioEncDlg.h"
#include "shell/TestHook.h"

extern "C" {
#include <libavutil/log.h>
}

#include <wx/snglinst.h>
#include <wx/wx.h>

#include <memory>

namespace {

// Ids of the main dialog's help contents and about commands, which the language decorates with
// the product name.
constexpr int kContentsCommand = 32900;
constexpr int kAboutCommand = 32903;

constexpr std::uint32_t kSettingsSetAside = 0xC0C0;

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

// The program's command ids come from its menu resources and run up to 33210, beyond the
// 0x7FFF that wx's menus check for; they work all the same, so only that check is silenced.
wxAssertHandler_t s_defaultAssertHandler = nullptr;

void IgnoreMenuIdAssert(const wxString& file, int line, const wxString& function,
                        const wxString& condition, const wxString& message) {
    if (message == "invalid itemid value") {
        return;
    }
    if (s_defaultAssertHandler != nullptr) {
        s_defaultAssertHandler(file, line, function, condition, message);
    }
}

class CAudioEncApp : public wxApp {
public:
    bool OnInit() override {
        s_defaultAssertHandler = wxSetAssertHandler(IgnoreMenuIdAssert);
        // Probing runs in this process; a row's reason says in words why a file cannot be read,
        // so FFmpeg's own complaints stay off the terminal the program was started from.
        av_log_set_level(AV_LOG_QUIET);
        ac::AppConfig& config = ac::GetAppConfig();
        const ac::ProductStrings& product = config.GetProductStrings();
        SetAppDisplayName(wxString::FromUTF8(product.productName));
        ChooseLanguage(config);

        // The lock lives in the user's data folder, so each user runs one copy.
        const std::string lockDir = ac::platform::UserDataDirectory();
        ac::platform::EnsureDirectory(lockDir);
        m_instance = std::make_unique<wxSingleInstanceChecker>();
        if (!m_instance->Create("cd-burner", wxString::FromUTF8(lockDir)) ||
            m_instance->IsAnotherRunning()) {
            return false;
        }

        std::string setAside = config.TakeSetAsideNotice();
        if (!setAside.empty()) {
            wxMessageBox(Text(kSettingsSetAside, {setAside}),
                         wxString::FromUTF8(product.productFullName), wxOK | wxICON_WARNING);
        }

        wxInitAllImageHandlers();
        auto* dialog = new ac::CAudioEncDlg();
        SetTopWindow(dialog);
        dialog->OnInitDialog();
        dialog->Show();
        ac::StartTestHook(dialog);
        return true;
    }

    int OnExit() override {
        m_instance.reset();
        return wxApp::OnExit();
    }

private:
    std::unique_ptr<wxSingleInstanceChecker> m_instance;
};

}  // namespace

wxIMPLEMENT_APP(CAudioEncApp);
