#pragma once
// CAudioEncDlg: the one main window. It owns the panels of all three work modes, switches them
// with the tab strip, carries the mode's menu bar, and runs the orderly stop.
//
// Thread contract: UI thread only. Workers reach it through the UI-thread bridge.

#include "skin/SkinDialog.h"

#include <wx/timer.h>

#include <array>
#include <map>
#include <memory>
#include <string>

class wxTaskBarIcon;

namespace ac {

class CCheck;
class ImMenuBar;

inline constexpr int kMainDialogId = 102;
inline constexpr int kDiskTimer = 111;
inline constexpr int kSelectionTimer = 100;

class CAudioEncDlg : public ImSkinFrame {
public:
    CAudioEncDlg();
    ~CAudioEncDlg() override;

    // The initial dialog step: placement, panels, skin, the mode's menu, timers.
    void OnInitDialog();

    void OnLanguageChanged() override;
    void RecalcLayout() override;
    const char* GetSkinSection() const override { return "Main"; }
    bool CanResize() const override { return true; }
    void OnLanguageCommand() override;
    bool OnSkinChanged(const std::string& skinDir) override;
    void OnInitMenuPopup(wxMenu* menu) override;

    // Clicking a tab: the panel, the menu and last_run_function follow the mode.
    void SwitchMode(int mode);
    int GetWorkMode() const;

    // One line per fact, for the window tests' hook.
    std::string DescribeState() const;
    void RunScriptCommand(const std::string& line);

private:
    enum Panel { MediaList, Creator, Output, Player, Rip, SideBar, Status, PanelCount };

    void CreatePanels();
    void LoadModeMenu(int mode);
    void FillSkinMenu(wxMenu& popup);
    void FillLanguageMenu(wxMenu& popup);
    void ShowModePanel(int mode);
    void OnCommand(wxCommandEvent& event);
    void OnClose(wxCloseEvent& event);
    void OnTimer(wxTimerEvent& event);
    void ToTray();
    void FromTray();
    bool RunStopLogic();
    wxBitmap MakeIcon(int size) const;

    CCheck* m_check = nullptr;
    std::array<ImSkinPanel*, PanelCount> m_panels{};
    wxTimer m_diskTimer;
    wxTimer m_selectionTimer;
    std::unique_ptr<wxTaskBarIcon> m_tray;
    bool m_bInTray = false;
    bool m_bCloseAccepted = true;
    std::map<int, std::string> m_skinCommands;
    std::map<int, std::string> m_languageCommands;
    std::string m_fileInfoBodyColour;
    int m_afterConvert = 4;
    // Layout keys of other sections, read at each change of skin.
    int m_sideBarWidth = 200;
    int m_checkRightMargin = 5;
    int m_checkGapHeight = 27;
    // Measured for the benchmarks only.
    long long m_firstPaintMs = 0;
    double m_lastBench = 0;
};

extern CAudioEncDlg* g_MainDlg;

}  // namespace ac
