// The program's entry, in this order: product strings and the language, the single-instance
// check, then the main window. A second start hands the files of its command line to the first
// copy, which brings its window to the front, and ends.

#include "platform/InstanceChannel.h"
#include "platform/Paths.h"
#include "platform/UiQueue.h"
#include "resources/Language.h"
#include "resources/TextFormat.h"
#include "shell/AppConfig.h"
#include "shell/AudioEncDlg.h"
#include "shell/TestHook.h"
#include "skin/SkinManager.h"
#include "skin/SkinPicture.h"

#include <wx/snglinst.h>
#include <wx/wx.h>

#include <cstdio>
#include <cstring>
#include <memory>
#include <string>
#include <utility>
#include <sys/stat.h>
#include <unistd.h>
#include <vector>

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

// The command line as bytes: wx would turn it into wide text through the locale and lose the
// bytes of names that are not UTF-8.
std::vector<std::string> g_openPaths;
bool g_handedOver = false;

// Every argument is a file to open; the program takes no switches, so a word starting with '-'
// that names no file is refused. Relative names are made absolute here: the first copy that
// may receive them runs in another folder.
void TakeCommandLine(int argc, char** argv) {
    std::string cwd;
    if (char* here = ::getcwd(nullptr, 0)) {
        cwd = here;
        std::free(here);
    }
    for (int i = 1; i < argc; ++i) {
        std::string path = argv[i];
        struct stat info;
        if (path.empty() || (path[0] == '-' && ::stat(path.c_str(), &info) != 0)) {
            std::fprintf(stderr,
                         "audio-converter: %s is not a file; the program takes no options\n",
                         path.c_str());
            continue;
        }
        if (path[0] != '/' && !cwd.empty()) {
            path = cwd + "/" + path;
        }
        g_openPaths.push_back(std::move(path));
    }
}

class CAudioEncApp : public wxApp {
public:
    bool OnInit() override {
        s_defaultAssertHandler = wxSetAssertHandler(IgnoreMenuIdAssert);
        ac::AppConfig& config = ac::GetAppConfig();
        // The first start creates some thirty keys, each of which would replace and sync the
        // settings file before the window shows: they reach the file in one write once the
        // window has painted (or when a start that shows no window ends).
        config.HoldWrites();
        m_writesHeld = true;
        const ac::ProductStrings& product = config.GetProductStrings();
        SetAppDisplayName(wxString::FromUTF8(product.productName));
        ChooseLanguage(config);

        // The lock lives in the user's data folder, so each user runs one copy.
        const std::string lockDir = ac::platform::UserDataDirectory();
        ac::platform::EnsureDirectory(lockDir);
        m_instance = std::make_unique<wxSingleInstanceChecker>();
        const std::string socketPath = ac::platform::InstanceSocketPath();
        if (!m_instance->Create("cd-burner", wxString::FromUTF8(lockDir))) {
            ReleaseSettingsWrites();
            return false;
        }
        if (m_instance->IsAnotherRunning()) {
            g_handedOver = ac::platform::SendPaths(socketPath, g_openPaths);
            if (!g_handedOver) {
                std::fprintf(stderr,
                             "audio-converter: another copy is running but did not take "
                             "the files\n");
            }
            ReleaseSettingsWrites();
            return false;
        }

        std::string setAside = config.TakeSetAsideNotice();
        if (!setAside.empty()) {
            wxMessageBox(Text(kSettingsSetAside, {setAside}),
                         wxString::FromUTF8(product.productFullName), wxOK | wxICON_WARNING);
        }

        // The start skin's pictures are decoded on a second core while the window is made.
        wxInitAllImageHandlers();
        std::string skin = config.GetString("last_skin");
        ac::PrefetchSkinPictures(ac::g_Language.GetBaseDir() + "\\Skin\\" +
                                 ac::SkinNameOf(skin.empty() ? std::string("Default") : skin));
        auto* dialog = new ac::CAudioEncDlg();
        SetTopWindow(dialog);
        dialog->OnInitDialog();
        dialog->Show();
        dialog->AfterFirstPaint([this] { ReleaseSettingsWrites(); });
        ac::StartTestHook(dialog);
        dialog->OpenFiles(g_openPaths);
        m_listener.Start(socketPath, [dialog](std::vector<std::string> paths) {
            ac::UiQueue::Post([dialog, paths = std::move(paths)] {
                // A hand-over that arrives while the window closes finds no window to open in.
                if (wxTheApp->GetTopWindow() == dialog && !dialog->IsBeingDeleted()) {
                    dialog->OpenFiles(paths);
                }
            });
        });
        return true;
    }

    int OnExit() override {
        ac::FinishSkinPrefetch();
        ReleaseSettingsWrites();
        m_listener.Stop();
        m_instance.reset();
        return wxApp::OnExit();
    }

private:
    void ReleaseSettingsWrites() {
        if (std::exchange(m_writesHeld, false)) {
            ac::GetAppConfig().ReleaseWrites();
        }
    }

    bool m_writesHeld = false;
    std::unique_ptr<wxSingleInstanceChecker> m_instance;
    ac::platform::InstanceListener m_listener;
};

}  // namespace

wxIMPLEMENT_APP_NO_MAIN(CAudioEncApp);

int main(int argc, char** argv) {
    TakeCommandLine(argc, argv);
    // The arguments are files, taken above as bytes; wx and GTK would try to read them as text
    // and as their own switches.
    int wxArgc = 1;
    const int code = wxEntry(wxArgc, argv);
    // A start that handed its files to the running copy did what was asked of it.
    return g_handedOver ? 0 : code;
}
