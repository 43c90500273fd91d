// The side bar's profile selector: loading the catalogue at start, choosing a profile, and the
// profile menu's Save, Save as, Rename and Delete.
#include "profile/ui/ParameterGrid.h"
#include "profile/ui/SaveProfileDlg.h"
#include "profile/ui/SideBarWnd.h"

#include "platform/UiQueue.h"
#include "profile/TextUtil.h"
#include "resources/Language.h"
#include "shell/AppConfig.h"
#include "shell/MainHub.h"
#include "skin/SkinControls.h"
#include "skin/SkinLabels.h"

#include <wx/choice.h>
#include <wx/dcclient.h>
#include <wx/menu.h>
#include <wx/settings.h>

#include <sstream>

namespace ac {

using namespace sidebar;

namespace {

constexpr std::uint32_t kSaveFailed = 0xC0A3;
constexpr std::uint32_t kLoadFailed = 0xC0A4;
constexpr std::uint32_t kAskDelete = 0xC0A5;
constexpr std::uint32_t kDeleteFailed = 0xC0A6;

CSideBarWnd::NameDialogRunner& NameRunner() {
    static CSideBarWnd::NameDialogRunner runner;
    return runner;
}

std::string Base() {
    return GetAppConfig().GetBaseDirectory();
}

// A loaded profile on its way to the UI thread: std::function wants a copyable call.
using ProfileBox = std::shared_ptr<std::unique_ptr<Profile>>;

}  // namespace

void CSideBarWnd::SetNameDialogRunner(NameDialogRunner runner) {
    NameRunner() = std::move(runner);
}

// ---- Loading ----

void CSideBarWnd::StartCatalogueLoad() {
    AppConfig& config = GetAppConfig();
    const std::string base = Base();
    if (config.GetString("last_profile_path", nullptr, "").empty()) {
        config.SetString("last_profile_path", FallbackProfilePath(base).c_str());
    }
    const FirstProfileChoice first =
        ChooseFirstProfile(config.GetInt("last_run_function", nullptr, 0),
                           config.GetString("last_profile_path", nullptr, ""),
                           config.GetString("lastcd_profile_path", nullptr, ""), base);
    if (first.storeLastCdPath)
        config.SetString("lastcd_profile_path", first.path.c_str());

    std::shared_ptr<CSideBarWnd*> self = m_self;
    auto post = [self](std::function<void(CSideBarWnd&)> call) {
        UiQueue::Post([self, call = std::move(call)] {
            if (*self != nullptr)
                call(**self);
        });
    };
    auto deliver = [post](std::unique_ptr<Profile> profile) {
        ProfileBox box = std::make_shared<std::unique_ptr<Profile>>(std::move(profile));
        post([box](CSideBarWnd& bar) { bar.AddLoadedProfile(std::move(*box)); });
    };
    m_systemLoader = std::thread([this, post, deliver, first, base] {
        m_ready.wait();
        ProfileBox box = std::make_shared<std::unique_ptr<Profile>>(LoadFirstProfile(first.path));
        post([box](CSideBarWnd& bar) { bar.OnFirstProfile(std::move(*box)); });
        m_firstPosted.count_down();
        LoadProfilesOf(SystemProfileDirectory(base), first.path, deliver, m_stopLoading);
        post([](CSideBarWnd& bar) { bar.OnLoaderDone(true); });
    });
    m_userLoader = std::thread([this, post, first, base] {
        // User entries stand behind the first profile, which the system loader posts first.
        m_firstPosted.wait();
        auto added = std::make_shared<std::atomic<int>>(0);
        LoadProfilesOf(
            UserProfileDirectory(base), first.path,
            [post, added](std::unique_ptr<Profile> profile) {
                ++*added;
                ProfileBox box = std::make_shared<std::unique_ptr<Profile>>(std::move(profile));
                post([box](CSideBarWnd& bar) { bar.AddLoadedProfile(std::move(*box)); });
            },
            m_stopLoading);
        const bool any = added->load() > 0;
        post([any](CSideBarWnd& bar) { bar.OnLoaderDone(any); });
    });
    m_ready.count_down();
}

void CSideBarWnd::StopCatalogueLoad() {
    m_stopLoading = true;
    *m_self = nullptr;
    if (m_systemLoader.joinable())
        m_systemLoader.join();
    if (m_userLoader.joinable())
        m_userLoader.join();
}

void CSideBarWnd::AddLoadedProfile(std::unique_ptr<Profile> profile) {
    if (profile == nullptr)
        return;
    const std::string text = SelectorEntryText(*profile);
    m_catalogue.Add(std::move(profile));
    m_profileSelector->Append(wxString::FromUTF8(text));
    m_selectorBest = wxDefaultSize;
}

void CSideBarWnd::OnFirstProfile(std::unique_ptr<Profile> profile) {
    if (profile != nullptr) {
        Profile* first = profile.get();
        AddLoadedProfile(std::move(profile));
        m_profileSelector->SetSelection(m_catalogue.IndexOf(first));
        m_grid->SetCurrentProfile(first);
    }
    if (IMainHub* hub = GetMainHub())
        hub->OnProfileChosen(0);
}

void CSideBarWnd::OnLoaderDone(bool adjustWidth) {
    if (adjustWidth)
        AdjustDropDownWidth();
    if (++m_loadersDone == 2) {
        if (IMainHub* hub = GetMainHub())
            hub->OnCatalogueLoaded();
    }
}

// The widest entry plus an average character, a scroll bar and both edges. GTK sizes the
// open list to its entries by itself; the width is kept for the layout and the test hook.
void CSideBarWnd::AdjustDropDownWidth() {
    wxClientDC dc(m_profileSelector);
    dc.SetFont(m_profileSelector->GetFont());
    int widest = 0;
    for (unsigned i = 0; i < m_profileSelector->GetCount(); ++i) {
        widest = std::max(widest, dc.GetTextExtent(m_profileSelector->GetString(i)).x);
    }
    m_dropDownWidth = widest + dc.GetCharWidth() + wxSystemSettings::GetMetric(wxSYS_VSCROLL_X) +
                      2 * std::max(0, wxSystemSettings::GetMetric(wxSYS_EDGE_X));
}

// wxChoice measures every entry each time it is asked its best size; the main window asks at
// every layout, so the answer is kept until the entries change.
wxSize CSideBarWnd::SelectorBestSize() const {
    if (m_selectorBest == wxDefaultSize) {
        m_selectorBest = m_profileSelector->GetBestSize();
    }
    return m_selectorBest;
}

int CSideBarWnd::NeededWidth() const {
    const wxSize save = m_saveButton->FitSize();
    return m_metrics.LeftMargin + SelectorBestSize().x + m_metrics.HSpacing +
           std::max(save.x, 28) + m_metrics.RightMargin;
}

void CSideBarWnd::RebuildSelectorTexts() {
    const int selected = m_profileSelector->GetSelection();
    m_profileSelector->Clear();
    for (const std::string& text : m_catalogue.EntryTexts()) {
        m_profileSelector->Append(wxString::FromUTF8(text));
    }
    m_selectorBest = wxDefaultSize;
    if (selected != wxNOT_FOUND && selected < static_cast<int>(m_profileSelector->GetCount())) {
        m_profileSelector->SetSelection(selected);
    }
}

// ---- Choosing ----

int CSideBarWnd::GetSelectedIndex() const {
    const int selected = m_profileSelector->GetSelection();
    return selected == wxNOT_FOUND ? -1 : selected;
}

void CSideBarWnd::SelectIndex(int index, bool runHandler) {
    if (index < 0 || index >= m_catalogue.Count())
        return;
    m_profileSelector->SetSelection(index);
    if (runHandler)
        OnProfileSelected(index);
}

Profile* CSideBarWnd::GetCurrentProfile() const {
    return m_grid->GetCurrentProfile();
}

void CSideBarWnd::SetCurrentProfile(Profile* profile) {
    m_grid->SetCurrentProfile(profile);
}

void CSideBarWnd::SetSets(const std::vector<ParameterSet*>& sets) {
    m_grid->SetSets(sets);
    RefreshTexts();
}

void CSideBarWnd::FollowSelection(const std::vector<ParameterSet*>& sets) {
    if (sets.empty())
        return;
    const std::string name = sets.front()->GetName();
    for (const ParameterSet* set : sets) {
        if (set->GetName() != name)
            return;
    }
    const Profile* selected = m_catalogue.At(GetSelectedIndex());
    if (selected != nullptr && selected->GetName() == name)
        return;
    const int index = m_catalogue.FindByName(name);
    if (index >= 0)
        SelectIndex(index, false);
}

void CSideBarWnd::OnProfileSelected(int index) {
    const int mode = CurrentWorkMode();
    if (Profile* profile = m_catalogue.At(index)) {
        if (IMainHub* hub = GetMainHub()) {
            hub->ApplyProfile(*profile);
        } else {
            m_grid->SetCurrentProfile(profile);
        }
        StoreChoice(index);
        m_bitRateAllowed = BitRateAllowed(mode, profile->GetExtName());
        UpdateEnabling();
    }
    ReadProfileIntoControls();
    m_grid->Rebuild();
    RefreshTexts();
    m_grid->Refresh();
}

void CSideBarWnd::StoreChoice(int index) {
    const int mode = CurrentWorkMode();
    const std::string path = m_catalogue.At(index)->GetPath();
    if (IMainHub* hub = GetMainHub())
        hub->RememberProfileIndex(mode, index);
    if (mode == 1) {
        const std::string stored = path.empty() ? FallbackProfilePath(Base()) : path;
        GetAppConfig().SetString("lastcd_profile_path", stored.c_str());
    } else {
        GetAppConfig().SetString("last_profile_path", path.c_str());
    }
}

void CSideBarWnd::ReadProfileIntoControls() {
    const Profile* current = m_grid->GetCurrentProfile();
    if (current == nullptr)
        return;
    m_values.sampleRate = current->GetValue("ar");
    m_values.bitRate = current->GetValue("ab");
    if (m_values.bitRate.empty())
        m_values.bitRate = "Auto";
    m_values.channels = current->GetValue("ac");
    m_values.volume = current->GetValue("vol_factor");
    OnSimpleValueMapped("ar", m_values.sampleRate);
    OnSimpleValueMapped("ab", m_values.bitRate);
    OnSimpleValueMapped("ac", m_values.channels);
    OnSimpleValueMapped("vol_factor", m_values.volume);
    if (CurrentWorkMode() == 1 && !m_bitRateAllowed)
        SetBitRateLabel("Auto");
}

// ---- The profile menu ----

void CSideBarWnd::ShowProfileMenu() {
    const Profile* selected = m_catalogue.At(GetSelectedIndex());
    if (selected == nullptr)
        return;
    wxMenu menu;
    auto add = [&](int id) {
        menu.Append(id, wxString::FromUTF8(g_Language.GetMenuText(static_cast<std::uint32_t>(id))));
    };
    const bool system = selected->IsSysProfile();
    if (!system)
        add(kCmdSave);
    for (int id : {kCmdSaveAs, kCmdRename, kCmdDelete})
        add(id);
    menu.Enable(kCmdRename, !system);
    menu.Enable(kCmdDelete, !system);
    // The menu's right edge goes to the button's lower right corner. A menu tells no width
    // before it opens, so it is estimated from its widest text and the usual item padding.
    wxClientDC dc(this);
    dc.SetFont(wxSystemSettings::GetFont(wxSYS_DEFAULT_GUI_FONT));
    int widest = 0;
    for (const wxMenuItem* item : menu.GetMenuItems()) {
        widest = std::max(widest, dc.GetTextExtent(item->GetItemLabelText()).x);
    }
    const wxRect button = m_saveButton->GetRect();
    PopupMenu(&menu, wxPoint(button.GetRight() + 1 - (widest + 4 * dc.GetCharWidth()),
                             button.GetBottom() + 1));
}

bool CSideBarWnd::RunNameDialog(CSaveProfileDlg& dialog) {
    if (NameRunner())
        return NameRunner()(dialog);
    return dialog.ShowModal() == wxID_OK;
}

void CSideBarWnd::SaveProfile(bool saveAs) {
    const int index = GetSelectedIndex();
    Profile* selected = m_catalogue.At(index);
    if (selected == nullptr)
        return;
    const ParameterSet* working = m_grid->GetCurrentProfile();
    if (working == nullptr)
        working = selected;
    CatalogueResult result = CatalogueResult::Ok;
    if (saveAs) {
        CSaveProfileDlg dialog(this, selected->GetName(), SaveDirectory(Base()), m_catalogue,
                               false);
        if (!RunNameDialog(dialog))
            return;
        result = m_catalogue.SaveAs(index, *working, dialog.Name(), dialog.FilePath());
        if (result == CatalogueResult::Ok) {
            m_profileSelector->Append(
                wxString::FromUTF8(SelectorEntryText(*m_catalogue.At(m_catalogue.Count() - 1))));
            m_selectorBest = wxDefaultSize;
        }
    } else {
        result = m_catalogue.Save(index, *working);
    }
    if (result == CatalogueResult::WriteFailed) {
        ProfileMessageBox(this, g_Language.GetString(kSaveFailed), wxOK | wxICON_STOP);
    } else if (result == CatalogueResult::LoadFailed) {
        ProfileMessageBox(this, g_Language.GetString(kLoadFailed), wxOK | wxICON_STOP);
    }
}

void CSideBarWnd::RenameProfile() {
    const int index = GetSelectedIndex();
    Profile* selected = m_catalogue.At(index);
    if (selected == nullptr)
        return;
    CSaveProfileDlg dialog(this, selected->GetName(), SaveDirectory(Base()), m_catalogue, true);
    if (!RunNameDialog(dialog))
        return;
    int newIndex = -1;
    if (m_catalogue.Rename(index, dialog.Name(), newIndex) != CatalogueResult::Ok) {
        ProfileMessageBox(this, g_Language.GetString(kSaveFailed), wxOK | wxICON_STOP);
        return;
    }
    m_profileSelector->Delete(static_cast<unsigned>(index));
    m_profileSelector->Append(wxString::FromUTF8(SelectorEntryText(*selected)));
    m_selectorBest = wxDefaultSize;
    SelectIndex(newIndex, true);
}

void CSideBarWnd::DeleteProfile() {
    const int index = GetSelectedIndex();
    if (m_catalogue.At(index) == nullptr)
        return;
    if (ProfileMessageBox(this, g_Language.GetString(kAskDelete),
                          wxYES_NO | wxNO_DEFAULT | wxICON_QUESTION) != wxYES) {
        return;
    }
    int next = 0;
    if (m_catalogue.Delete(index, next) != CatalogueResult::Ok) {
        ProfileMessageBox(this, g_Language.GetString(kDeleteFailed), wxOK | wxICON_STOP);
        return;
    }
    m_profileSelector->Delete(static_cast<unsigned>(index));
    m_selectorBest = wxDefaultSize;
    SelectIndex(next, true);
}

// ---- The test hook's view ----

std::string CSideBarWnd::DescribeState() const {
    std::ostringstream out;
    const int selected = GetSelectedIndex();
    out << "profile="
        << (selected >= 0
                ? m_profileSelector->GetString(static_cast<unsigned>(selected)).utf8_string()
                : std::string())
        << "\n";
    out << "profiles=" << m_catalogue.Count() << "\n";
    // 1 when the closed selector shows its longest entry whole.
    out << "selectorfits="
        << (m_profileSelector->GetSize().x >= SelectorBestSize().x ? 1 : 0) << "\n";
    out << "profiles_list=";
    for (unsigned i = 0; i < m_profileSelector->GetCount(); ++i) {
        out << "|" << m_profileSelector->GetString(i).utf8_string();
    }
    out << "\n";
    out << "grid=" << m_grid->Describe() << "\n";
    auto control = [&](const char* name, const ImLabel* label, const wxWindow* slider) {
        out << name << "=" << label->GetLabel().utf8_string() << "|"
            << (slider->IsThisEnabled() ? 1 : 0) << "\n";
    };
    control("bitrate", m_bitRateLabel, m_bitRateSlider);
    control("samplerate", m_sampleRateLabel, m_sampleRateSlider);
    control("volume", m_volumeLabel, m_volumeSlider);
    out << "channels=" << m_channels->GetSelection() << "\n";
    out << "advanced=" << (m_advanced ? 1 : 0) << "\n";
    return out.str();
}

}  // namespace ac
