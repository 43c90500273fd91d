#pragma once
// How the panels reach each other: every panel talks to the main dialog through this one
// interface, and the main dialog routes to the panel that serves the call. A panel's tests hand
// it a fake hub that records the calls. Header only: the panels' libraries do not link the
// program.
//
// Thread contract: UI thread only, every call. Workers post to the UI thread first (UiQueue).

#include <cstdint>
#include <functional>
#include <string>
#include <vector>

class wxWindow;

namespace ac {

class ParameterSet;
class Profile;
struct MediaItem;

// The private messages of the main dialog, kept under their numbers.
inline constexpr int kMsgProfileChosen = 0x464;
inline constexpr int kMsgStatusText = 0x465;
inline constexpr int kMsgRunFinished = 0x466;
inline constexpr int kMsgCatalogueLoaded = 0x5b0;
inline constexpr int kMsgTray = 0x7d0;

class IMainHub {
public:
    virtual ~IMainHub() = default;

    // ---- Work mode and commands ----
    // g_Check->m_iWork: 0 convert, 1 rip, 2 burn.
    virtual int WorkMode() = 0;
    // Sends a menu command to the main dialog as if chosen from its menu (posted: the call
    // returns before the command runs).
    virtual void PostCommand(int commandId) = 0;
    // The enable rule of a main-dialog command in the current mode (Encode, Pause, Stop... of
    // the driver); the panels' buttons follow it.
    virtual bool IsCommandEnabled(int commandId) = 0;
    // Opens a context menu of the program's menu tables (130 list, 162 rip, 182 burn) at the
    // mouse, translated; its commands go to the main dialog.
    virtual void ShowContextMenu(wxWindow* owner, int menuId) = 0;

    // ---- Conversion list -> main dialog ----
    // The selection step: a row became selected (its index), or a row lost the selection (-1).
    virtual void OnListSelectionChanged(int row) = 0;
    // The status panel's text line ("Add ...", "Load Finished!").
    virtual void SetStatusText(const std::string& text) = 0;
    // The side bar's bit-rate slider: disabled and showing "Auto", or enabled.
    virtual void SetBitRateAllowed(bool allowed) = 0;
    // The file information window shows this row, or nothing (null).
    virtual void ShowFileInfo(MediaItem* item) = 0;

    // ---- Side bar -> main dialog ----
    // The main dialog's profile setter (the side bar's selection handler calls it).
    virtual void ApplyProfile(Profile& profile) = 0;
    // Message 0x464: the system loader made entry `index` current.
    virtual void OnProfileChosen(int index) = 0;
    // Message 0x5b0: both catalogue loaders are through.
    virtual void OnCatalogueLoaded() = 0;
    // The parameter sets of the selected rows of the current list.
    virtual std::vector<ParameterSet*> SelectedSets() = 0;
    // Runs `edit`, which writes the sets of the rows, under the list lock, then lets the rows
    // read their cut again and redraw. Every write to a row's set goes through here.
    virtual void EditSets(const std::function<void()>& edit) = 0;
    // The volume field of the selected rows of the current list (50 is unchanged); only the
    // first selected one when `firstOnly`.
    virtual void SetSelectedVolume(int volume, bool firstOnly) = 0;
    // The remembered profile selector index of each work mode (kept on CCheck).
    virtual int RememberedProfileIndex(int mode) = 0;
    virtual void RememberProfileIndex(int mode, int index) = 0;

    // ---- Status panel -> main dialog ----
    // The run flag of the conversion list and the driver's run totals (seconds).
    virtual bool IsConvertRunActive() = 0;
    virtual double RunDoneSeconds() = 0;
    virtual double RunTotalSeconds() = 0;
    // The bar's words while a conversion run goes on ("12 of 40 files converted").
    virtual std::string RunProgressText() { return {}; }
    // The rip run: whether a track is being ripped, the seconds done (finished tracks and the
    // running one's position) and the seconds of the checked tracks.
    virtual bool IsRipRunActive() { return false; }
    virtual double RipDoneSeconds() { return 0; }
    virtual double RipTotalSeconds() { return 0; }
    // A burn run is converting or writing: the side bar's sliders hold still under it.
    virtual bool IsBurnRunActive() { return false; }
};

// Set by the main dialog when it exists, cleared when it goes; the panels' tests set a fake.
// Panels check for null: a panel may outlive the dialog's hub by a few events at close.
inline IMainHub*& MainHubSlot() {
    static IMainHub* hub = nullptr;
    return hub;
}
inline IMainHub* GetMainHub() { return MainHubSlot(); }
inline void SetMainHub(IMainHub* hub) { MainHubSlot() = hub; }

}  // namespace ac
