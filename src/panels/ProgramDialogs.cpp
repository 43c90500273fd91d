#include "panels/ProgramDialogs.h"

#include "panels/Sound.h"
#include "platform/Power.h"
#include "resources/Language.h"
#include "shell/AppConfig.h"
#include "skin/AboutDlg.h"
#include "skin/ShutDownDlg.h"

#include <wx/msgdlg.h>
#include <wx/weakref.h>

namespace ac {

namespace {

constexpr std::uint32_t kAbnormalAction = 0xC009;
constexpr std::uint32_t kShutDownTitle = 250;
constexpr std::uint32_t kHibernateTitle = 251;
constexpr std::uint32_t kStandbyTitle = 252;
constexpr std::uint32_t kExitTitle = 253;
constexpr int kCancelled = 2;
constexpr const char* kWebsite = "https://www.velmorant.com/";

wxString Text(std::uint32_t id) {
    return wxString::FromUTF8(g_Language.GetString(id));
}

void SetActionTexts(ImShutDownDlg& dialog, int action) {
    switch (action) {
        case kActionShutDown:
            dialog.SetShutdownTexts();
            dialog.SetTitle(Text(kShutDownTitle));
            break;
        case kActionStandby:
            dialog.SetStandbyTexts();
            dialog.SetTitle(Text(kStandbyTitle));
            break;
        case kActionHibernate:
            dialog.SetHibernateTexts();
            dialog.SetTitle(Text(kHibernateTitle));
            break;
        default:
            dialog.SetExitTexts();
            dialog.SetTitle(Text(kExitTitle));
            break;
    }
}

void Act(int action, wxWindow* mainWindow) {
    switch (action) {
        case kActionShutDown:
            platform::ShutDownSystem(true);
            break;
        case kActionStandby:
            platform::SuspendSystem(true);
            break;
        case kActionHibernate:
            platform::HibernateSystem(true);
            break;
        default:
            if (mainWindow != nullptr) {
                // Posted, so that the countdown's modal loop has ended when the close path runs.
                mainWindow->CallAfter([window = wxWeakRef<wxWindow>(mainWindow)] {
                    if (window) {
                        window->Close();
                    }
                });
            }
            break;
    }
}

}  // namespace

void PlayEndOfRunSound() {
    AppConfig& config = GetAppConfig();
    if (config.GetInt("playsound") == 0) {
        return;
    }
    PlaySoundAsync(config.GetString("last_wavopenpath"));
}

void RunAfterRunAction(int action, wxWindow* mainWindow) {
    // Asked for first whatever the action, as the platform the program came from required.
    ImShutdownPrivilege privilege;
    if (action == kActionNone) {
        return;
    }
    if (action < kActionShutDown || action > kActionExit) {
        wxMessageBox(Text(kAbnormalAction),
                     wxString::FromUTF8(GetAppConfig().GetProductStrings().productName),
                     wxOK | wxICON_ERROR, mainWindow);
        return;
    }
    int answer = kCancelled;
    {
        ImShutDownDlg dialog(mainWindow);
        SetActionTexts(dialog, action);
        answer = dialog.DoModal();
    }
    if (answer != kCancelled) {
        Act(action, mainWindow);
    }
}

void ShowAboutDialog(wxWindow* parent, const std::string& imagePath) {
    AppConfig& config = GetAppConfig();
    const ProductStrings& product = config.GetProductStrings();
    AboutInfo info{product.productName, product.companyFullName, kWebsite,
                   config.GetString("version"), AC_VERSION};
    ImAboutDlg dialog(parent, std::move(info));
    dialog.m_imagePath = imagePath;
    dialog.DoModal();
}

}  // namespace ac
