#pragma once
// CSideBarWnd: the panel beside the lists where encoder parameters are chosen. On top the
// profile selector (the catalogue of profiles) or, in the burn mode, the disc type; below it
// either the four simple controls (normal mode), the property grid (advanced mode) or, for an
// audio CD, the fields of the disc.
//
// It reaches the rows and the main dialog only through IMainHub: edits of the rows' sets go
// through EditSets, a chosen profile through ApplyProfile.
//
// Thread contract: UI thread only. The two catalogue loader threads it starts never touch a
// window: they post each loaded profile to the UI thread, and the panel joins them on
// destruction.

#include "profile/Catalogue.h"
#include "profile/SideBarLogic.h"
#include "skin/SkinDialog.h"

#include <atomic>
#include <functional>
#include <latch>
#include <memory>
#include <string>
#include <thread>
#include <vector>

class wxChoice;
class wxTextCtrl;

namespace ac {

class ImButton;
class ImCheckBox;
class ImLabel;
class ImTickSlider;
class ParameterGrid;
class CSaveProfileDlg;

inline constexpr int kSideBarPanelId = 1011;
inline constexpr int kSideBarDialogId = 136;

namespace sidebar {
inline constexpr int kProfileLabel = 1060;
inline constexpr int kAdvanced = 1135;
inline constexpr int kSimple = 1141;
inline constexpr int kProfileSelector = 1062;
inline constexpr int kDiscType = 1214;
inline constexpr int kSaveProfile = 1061;
inline constexpr int kGrid = 1036;
inline constexpr int kBitRateLabel = 1136, kBitRateSlider = 1040;
inline constexpr int kSampleRateLabel = 1137, kSampleRateSlider = 1139;
inline constexpr int kVolumeLabel = 1146, kVolumeSlider = 1148;
inline constexpr int kChannelsLabel = 1138, kChannels = 1140;
inline constexpr int kVolumeNameLabel = 1221, kVolumeName = 1222;
inline constexpr int kAlbumLabel = 1205, kAlbum = 1102;
inline constexpr int kArtistLabel = 1206, kArtist = 1202;
inline constexpr int kTitleLabel = 1209, kTitle = 1203;
inline constexpr int kIntervalLabel = 1207, kInterval = 1208;
inline constexpr int kBalance = 1204;
// The profile menu: 132 for a user profile, 4 for a system one.
inline constexpr int kCmdSave = 33201, kCmdSaveAs = 33202, kCmdRename = 33203, kCmdDelete = 33204;
}  // namespace sidebar

class CSideBarWnd : public ImSkinPanel {
public:
    explicit CSideBarWnd(wxWindow* parent);
    ~CSideBarWnd() override;

    void OnLanguageChanged() override;
    void DoRecalcLayout() override;
    bool OnSkinChanged(const std::string& skinDir) override;

    // ---- What the main dialog calls ----
    void SetSets(const std::vector<ParameterSet*>& sets);
    // The selector follows the rows' common profile, without running the selection handler.
    void FollowSelection(const std::vector<ParameterSet*>& sets);
    void ApplyMode(bool advanced);
    void RefreshTexts();
    // Disabled shows "Auto" on the bit rate.
    void SetBitRateAllowed(bool allowed);
    void OnWorkModeChanged(int mode);
    void SetGridEditable(bool editable);
    // One row of the rip list into the grid's sets (the rip panel passes the row's fields).
    void ShowRipRow(const RipRowValues& row);

    int GetProfileCount() const { return m_catalogue.Count(); }
    Profile* GetProfileAt(int index) const { return m_catalogue.At(index); }
    int GetSelectedIndex() const;
    void SelectIndex(int index, bool runHandler);
    Profile* GetCurrentProfile() const;
    void SetCurrentProfile(Profile* profile);
    // Path compared without regard to case; -1 if none.
    int FindProfileByPath(const std::string& path) const { return m_catalogue.FindByPath(path); }
    // Both loaders are through.
    bool IsLoaded() const { return m_loadersDone == 2; }
    std::string DescribeState() const;

    void SetBitRateLabel(const std::string& value);
    void SetSampleRateLabel(const std::string& value);
    void SetVolumeLabel(const std::string& value);

    // ---- The profile menu's operations ----
    void SaveProfile(bool saveAs);
    void RenameProfile();
    void DeleteProfile();
    // Disc type of the burn mode: 0 audio CD, 1 MP3 CD, 2 WMA CD.
    void SelectDiscType(int type);
    int GetDiscType() const;
    bool IsAdvanced() const { return m_advanced; }
    ParameterGrid* Grid() const { return m_grid; }
    // The width the selector's drop-down needs for its widest entry.
    int DropDownWidth() const { return m_dropDownWidth; }
    // The width that shows the longest profile name whole in the closed selector; the main
    // window grants it when it has room to spare.
    int NeededWidth() const;

    // Tests answer the name dialog here instead of a modal loop (true for OK).
    using NameDialogRunner = std::function<bool(CSaveProfileDlg&)>;
    static void SetNameDialogRunner(NameDialogRunner runner);

private:
    void CreateControls();
    void BindEvents();
    void StartCatalogueLoad();
    void StopCatalogueLoad();
    void AddLoadedProfile(std::unique_ptr<Profile> profile);
    void OnFirstProfile(std::unique_ptr<Profile> profile);
    void OnLoaderDone(bool adjustWidth);
    void AdjustDropDownWidth();
    void RebuildSelectorTexts();
    void OnProfileSelected(int index);
    void StoreChoice(int index);
    void ReadProfileIntoControls();
    void OnSliderReleased(int id);
    void OnChannelsChosen();
    void OnSimpleValueMapped(const std::string& key, const std::string& value);
    void ShowProfileMenu();
    void OnAdvancedPressed(bool advanced);
    void UpdateEnabling();
    void LayoutSimpleGroup(int x, int y, int width);
    void LayoutDiscGroup(int x, int y, int width);
    wxSize SelectorBestSize() const;
    void EnsureDiscControls();
    void TranslateLabels();
    void TranslateDiscControls();
    void DressDiscControls();
    void ShowVolumeName(bool show);
    void ShowGroup(const std::vector<wxWindow*>& group, bool show);
    bool RunNameDialog(CSaveProfileDlg& dialog);
    int CurrentWorkMode() const;

    ProfileCatalogue m_catalogue;
    ImLabel* m_profileLabel = nullptr;
    ImButton* m_advancedButton = nullptr;
    ImButton* m_simpleButton = nullptr;
    wxChoice* m_profileSelector = nullptr;
    wxChoice* m_discType = nullptr;
    ImButton* m_saveButton = nullptr;
    ParameterGrid* m_grid = nullptr;
    ImLabel* m_bitRateLabel = nullptr;
    ImTickSlider* m_bitRateSlider = nullptr;
    ImLabel* m_sampleRateLabel = nullptr;
    ImTickSlider* m_sampleRateSlider = nullptr;
    ImLabel* m_volumeLabel = nullptr;
    ImTickSlider* m_volumeSlider = nullptr;
    ImLabel* m_channelsLabel = nullptr;
    wxChoice* m_channels = nullptr;
    ImLabel* m_volumeNameLabel = nullptr;
    wxTextCtrl* m_volumeName = nullptr;
    std::vector<wxWindow*> m_simpleGroup;
    std::vector<wxWindow*> m_discGroup;
    std::vector<ImLabel*> m_discLabels;
    wxChoice* m_interval = nullptr;
    mutable wxSize m_selectorBest = wxDefaultSize;  // SelectorBestSize
    int m_channelsHeight = 0;
    ImCheckBox* m_balance = nullptr;

    bool m_advanced = false;
    bool m_bitRateAllowed = true;
    bool m_firstShow = true;
    bool m_gridEditable = true;
    bool m_firstUpdatePass = true;
    int m_workMode = 0;
    SimpleValues m_values;
    std::string m_bitRateShown = "192";
    std::string m_sampleRateShown = "44100";
    std::string m_volumeShown = "100%";
    int m_dropDownWidth = 0;
    int m_pressedSlider = 0;

    // Loading: the threads, a stop flag they read, and a token the posted calls check, cleared
    // when the panel goes.
    std::thread m_systemLoader;
    std::thread m_userLoader;
    std::atomic<bool> m_stopLoading{false};
    std::latch m_ready{1};
    std::latch m_firstPosted{1};
    std::shared_ptr<CSideBarWnd*> m_self;
    int m_loadersDone = 0;
};

extern CSideBarWnd* g_SideBar;

}  // namespace ac
