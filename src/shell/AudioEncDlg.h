#pragma once
// CAudioEncDlg: the one main window. It owns the panels of all three work modes, switches them
// with the tab strip, carries the mode's menu bar, and runs the orderly stop.
//
// Thread contract: UI thread only. Workers reach it through the UI-thread bridge.

#include "medialist/MediaFileInfo.h"
#include "shell/MainHub.h"
#include "skin/SkinDialog.h"

#include <wx/timer.h>

#include <array>
#include <functional>
#include <iosfwd>
#include <map>
#include <memory>
#include <optional>
#include <string>
#include <vector>

class wxTaskBarIcon;

namespace ac {

class CCheck;
class CBurnMode;
class CConvertMode;
class CRipMode;
class ImMenuBar;

inline constexpr int kMainDialogId = 102;
inline constexpr int kDiskTimer = 111;
inline constexpr int kSelectionTimer = 100;

class CAudioEncDlg : public ImSkinFrame, public IMainHub {
public:
    CAudioEncDlg();
    ~CAudioEncDlg() override;

    // The initial dialog step: placement, panels, skin, the mode's menu, timers.
    void OnInitDialog();

    void OnLanguageChanged() override;
    void DoRecalcLayout() override;
    const char* GetSkinSection() const override { return "Main"; }
    bool CanResize() const override { return true; }
    void OnLanguageCommand() override;
    bool OnSkinChanged(const std::string& skinDir) override;
    void OnInitMenuPopup(wxMenu* menu) override;

    // Clicking a tab: the panel, the menu and last_run_function follow the mode.
    void SwitchMode(int mode);
    // Files named on the command line of this start or handed over by a later one: they join
    // the convert list, and the window comes to the front.
    void OpenFiles(const std::vector<std::string>& paths);
    // After the preferences wrote settings: every running copy reads them again.
    void OnPreferencesApplied();
    int GetWorkMode() const;
    // Runs once from the event loop after the window's first paint.
    void AfterFirstPaint(std::function<void()> then) { m_afterFirstPaint = std::move(then); }
    // The rip (1) and burn (2) panels, with their modes, are made when first needed.
    void EnsureModePanel(int mode);

    // IMainHub: how the panels reach each other (AudioEncHub.cpp).
    int WorkMode() override { return GetWorkMode(); }
    void PostCommand(int commandId) override;
    bool IsCommandEnabled(int commandId) override;
    void ShowContextMenu(wxWindow* owner, int menuId) override;
    void OnListSelectionChanged(int row) override;
    void ShowRowReason(MediaItem& item);
    void SetStatusText(const std::string& text) override;
    void SetBitRateAllowed(bool allowed) override;
    void ShowFileInfo(MediaItem* item) override;
    void ApplyProfile(Profile& profile) override;
    void OnProfileChosen(int index) override;
    void OnCatalogueLoaded() override;
    std::vector<ParameterSet*> SelectedSets() override;
    void EditSets(const std::function<void()>& edit) override;
    void SetSelectedVolume(int volume, bool firstOnly) override;
    int RememberedProfileIndex(int mode) override;
    void RememberProfileIndex(int mode, int index) override;
    bool IsConvertRunActive() override;
    double RunDoneSeconds() override;
    double RunTotalSeconds() override;
    std::string RunProgressText() override;
    bool IsRipRunActive() override;
    double RipDoneSeconds() override;
    double RipTotalSeconds() override;
    bool IsBurnRunActive() override;

private:
    std::vector<std::string> m_pendingOpen;  // files to open once the profiles are loaded
    friend class CTestHook;

    enum Panel { MediaList, Creator, Output, Player, Rip, SideBar, Status, PanelCount };

    void CreatePanels();
    void ApplyNativeColours(const class ImSkinConfig& skin);
    void EnsureFileInfoWindow();
    // The mode's menu bar (AudioEncMenus.cpp).
    void LoadModeMenu(int mode);
    void FillSkinMenu(wxMenu& popup);
    void FillLanguageMenu(wxMenu& popup);
    void ShowModePanel(int mode);
    void OnCommand(wxCommandEvent& event);
    // Skins, languages, the after-run action, the tray, preferences and help (AudioEncMenus.cpp).
    bool OnProgramCommand(int id);
    void DispatchCommand(int id);
    void ApplyEnableRules(wxMenu& menu);
    void HandOverSelectedSets();
    void UpdateGridEditable();
    static bool IsBitRateFree(const std::string& extension);
    void OnClose(wxCloseEvent& event);
    void OnTimer(wxTimerEvent& event);
    void ToTray();
    void FromTray();
    bool RunStopLogic();

    CCheck* m_check = nullptr;
    std::array<ImSkinPanel*, PanelCount> m_panels{};
    wxTimer m_diskTimer;
    wxTimer m_selectionTimer;
    std::unique_ptr<wxTaskBarIcon> m_tray;
    std::unique_ptr<CConvertMode> m_convert;
    std::unique_ptr<CRipMode> m_rip;
    std::unique_ptr<CBurnMode> m_burn;
    bool m_gridEditable = true;
    bool m_bInTray = false;
    bool m_bCloseAccepted = true;
    std::map<int, std::string> m_skinCommands;
    std::map<int, std::string> m_languageCommands;
    std::string m_fileInfoBodyColour;
    // What the file information window shows, kept until the window is first made.
    std::optional<MediaFileInfo> m_fileInfo;
    int m_afterConvert = 4;
    // Layout keys of other sections, read at each change of skin.
    int m_sideBarWidth = 200;
    int m_checkRightMargin = 5;
    int m_checkGapHeight = 27;
    // Measured for the benchmarks only.
    long long m_firstPaintMs = 0;
    std::function<void()> m_afterFirstPaint;
    double m_lastBench = 0;
};

extern CAudioEncDlg* g_MainDlg;

}  // namespace ac
