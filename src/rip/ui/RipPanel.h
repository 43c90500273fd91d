#pragma once
// CDRipDlg: the panel of the rip work mode. It finds the drives and disc images, shows the
// tracks of the disc with their names from the local record, lets the user name the disc and
// its tracks, and runs the rip driver over the checked or selected rows.
//
// Each row owns a RipTrackItem and a clone of its profile's parameter set: the side bar and its
// grid edit the sets of the selected rows as they do in the convert mode, and the driver reads
// the numbers back from the set when the row's track starts.
//
// Thread contract: UI thread, except the drive poll, which runs on the panel's worker and posts
// its answer back.

#include "cddb/CddbLookup.h"
#include "cddb/DiscInfo.h"
#include "platform/DiscDevice.h"
#include "profile/ParameterSet.h"
#include "rip/DriveWatcher.h"
#include "rip/RipDriver.h"
#include "skin/SkinDialog.h"

#include <wx/timer.h>

#include <array>
#include <atomic>
#include <functional>
#include <memory>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

class wxTextCtrl;

namespace ac {

class ImButton;
class ImLabel;
class ParameterSet;
class Profile;
class XListCtrl;

inline constexpr int kRipDialogId = 161;
inline constexpr int kRipContextMenuId = 162;

namespace ripcmd {
inline constexpr int kCddb = 33064;
inline constexpr int kConfigureToAll = 33069;
inline constexpr int kFirstButtonDrive = 33093;  // the device button's menu: five drives
inline constexpr int kLastButtonDrive = 33097;
inline constexpr int kFirstMenuDrive = 33100;  // Select CD Rom: one entry per drive
inline constexpr int kLastMenuDrive = 33114;
inline constexpr int kRipChecked = 33115;
inline constexpr int kRipSelected = 33116;
inline constexpr int kStopSelected = 33118;
inline constexpr int kPauseSelected = 33120;
inline constexpr int kStopChecked = 33121;
inline constexpr int kPauseChecked = 33122;
inline constexpr int kUncheckSelect = 33123;
inline constexpr int kCheckSelect = 33124;
inline constexpr int kRenameKey = 33133;
inline constexpr int kRename = 33138;
inline constexpr int kReadLocal = 33088;
inline constexpr int kReadRemote = 33108;
inline constexpr int kReadWinamp = 33091;
inline constexpr int kBatchQuery = 33137;
// The Edit menu of mode 1.
inline constexpr int kCheckAll = 32782;
inline constexpr int kUncheckAll = 32783;
inline constexpr int kUncheckSelected = 33037;
inline constexpr int kCheckSelected = 33038;
inline constexpr int kSelectAll = 33055;
inline constexpr int kSelectNone = 33056;
// Our own: a disc image added as a drive, from the device button's menu and Select CD Rom.
inline constexpr int kAddDiscImage = 33210;
}  // namespace ripcmd

// What the panel asks of the main window around a run: questions, the tab strip, the message
// log, the end of a run. The shell's rip mode implements it.
class IRipModeHost {
public:
    virtual ~IRipModeHost() = default;
    virtual bool AskYesNo(const std::string& text) = 0;
    virtual void ShowError(const std::string& text) = 0;
    virtual void EnableTabs(bool enable) = 0;
    virtual void RunFinished(int completed, int failed) = 0;
    // The selection changed: the side bar follows the selected rows' sets.
    virtual void SelectionChanged(int firstSelectedProfileIndex) = 0;
    virtual IProcessLog* Log() = 0;
    virtual IStatusText* Status() = 0;
    // The profile new rows take, or null before the catalogue is in.
    virtual const Profile* CurrentProfile() = 0;
    virtual int CurrentProfileIndex() = 0;
};

class CDRipDlg : public ImSkinPanel, public IRipList, public IRipHost {
public:
    // The settings the panel keeps a copy of (the local record folder), read again after the
    // preferences changed them.
    void ReadSettings();
    // `device` is the drives' interface: the real one in the program, a fake in tests.
    CDRipDlg(wxWindow* parent, std::unique_ptr<platform::IDiscDevice> device);
    ~CDRipDlg() override;

    void SetModeHost(IRipModeHost* host) { m_modeHost = host; }
    RipDriver& Driver() { return m_driver; }

    // ---- Drives ----
    void ListDrives();
    const std::vector<std::string>& Drives() const { return m_drives; }
    int CurrentDrive() const { return m_currentDrive; }
    // Makes the drive current and loads its disc (a pick in the drive menus).
    void LoadDriveContents(int driveIndex);
    void LoadFirstDisc();
    // Empties the list and polls again (the disc or drive went).
    void EmptyList();
    // Asks for a .cue or .toc file, keeps it in `cdimages` and loads it.
    void AddDiscImage();
    bool AddDiscImagePath(const std::string& path);
    void ToggleTray();
    void StartPoll();
    // The drives as the menus list them: the text shown for each, and which is current.
    std::vector<std::string> DriveLabels() const;

    // ---- Commands of mode 1 ----
    bool OnCommand(int commandId);
    bool IsCommandEnabled(int commandId);
    bool IsDiscLoaded() const { return !m_rows.empty(); }

    // ---- Profiles and the side bar ----
    void ApplyProfile(const Profile& profile, int profileIndex);
    std::vector<ParameterSet*> SelectedSets();
    // Runs `edit` on the selected rows' sets, then reads their numbers and Target again.
    void EditSets(const std::function<void()>& edit);
    void SetSelectedVolume(int percent);

    // ---- The run, for the status panel ----
    int CheckedSeconds() const { return m_checkedSeconds.load(); }
    std::string DescribeRows() const;

    // ---- Mode switches ----
    void OnShowPanel();
    void OnHidePanel();
    // Stop at close: false when the user wants the run to go on.
    bool StopForClose();

    // ---- Disc texts ----
    const cddb::CDDiscInfo& Record() const { return m_record; }
    std::uint32_t DiscId() const { return m_discId; }
    // Fills the boxes and the names from a record (a lookup's answer, or the local cache).
    void ApplyRecord(const cddb::CDDiscInfo& record);
    bool Renamed() const { return m_renamed; }
    // ---- CDDB ----
    // The CDDB button and command: the renamed-names question, then the "CDDB Response"
    // dialog over the lookup worker, then the names into the list and the .cddb record. It runs
    // on the UI thread, as every wx dialog must; the network work is the dialog's worker's.
    void LookupThread();
    void ReadLocalRecord();
    // "CDDB Batch Query": every record of CDDB_Batch.txt asked again, each answer stored.
    void OnBatchQuery();
    bool IsLookupOpen() const { return m_lookupOpen; }
    void BeginRename();
    XListCtrl* List() const { return m_list; }
    // What a user does with the keyboard, for the window tests: a box typed and left, a name
    // typed in place and Enter, a row clicked.
    void TypeInBox(int box, const std::string& text);
    void RenameRow(int row, const std::string& text);
    void ClickRow(int row);
    std::string DescribeBoxes() const;
    // How long the last disc took to reach the list (table, record, rows), for the benchmarks.
    double LastLoadMs() const { return m_lastLoadMs; }

    // ---- IRipList ----
    int RowCount() override;
    bool IsChecked(int row) override;
    void SetChecked(int row, bool checked) override;
    bool IsSelected(int row) override;
    RipTrackItem* Item(int row) override;
    std::string Title(int row) override;
    void SetStatus(int row, RipStatus status, int percent) override;

    // ---- IRipHost ----
    bool AskReRip() override;
    bool AskStopRun() override;
    void LockTray(bool lock) override;
    void OpenTray() override;
    void RunStateChanged(bool running, bool paused) override;
    void RunFinished(int completed, int failed) override;
    void RefreshRowParameters(int row, RipTrackItem& item) override;
    RipDiscTexts DiscTexts() override;
    IProcessLog* Log() override;
    IStatusText* Status() override;

    // ---- Skinned window ----
    void OnLanguageChanged() override;
    void DoRecalcLayout() override;
    bool OnSkinChanged(const std::string& skinDir) override;

private:
    struct Row {
        RipTrackItem item;
        std::unique_ptr<ParameterSet> set;
        RipStatus status = RipStatus::None;
    };

    void CreateControls();
    void BindEvents();
    void FillList(int driveIndex, const platform::DiscTable& table);
    void ClearDisc();
    void SetCurrentDrive(int driveIndex);
    void ApplySetToRow(Row& row);
    void WriteTarget(int row);
    void DrawStatus(int row);
    void RecountChecked();
    void UpdateButtons();
    void OnButton(int id);
    void OnPollDone(DriveWatcher::PollResult result);
    void OnBoxKillFocus(wxTextCtrl* box);
    void ShowDriveMenu();
    void CommitRename(bool moveOn);
    void CancelRename();
    void OnBodyLeftDown(wxMouseEvent& event);
    void SyncSelection();
    void CheckSelected(bool check);
    void CheckAll(bool check);
    void SelectAll(bool select);
    void ConfigureToAll();
    void FitColumns();
    void JoinWorker();
    void RefreshDriverSettings();
    cddb::LookupSettings ReadLookupSettings() const;

    std::unique_ptr<platform::IDiscDevice> m_device;
    IRipModeHost* m_modeHost = nullptr;
    RipDriver m_driver;
    DriveWatcher m_watcher;

    XListCtrl* m_list = nullptr;
    ImLabel* m_deviceLabel = nullptr;
    ImButton* m_deviceButton = nullptr;
    ImButton* m_trayButton = nullptr;
    std::array<ImLabel*, 4> m_boxLabels{};
    std::array<wxTextCtrl*, 4> m_boxes{};  // artist, album, genre, year
    std::array<ImButton*, 4> m_runButtons{};  // CDDB, Rip, Pause, Stop
    wxTextCtrl* m_renameEdit = nullptr;
    int m_renameRow = -1;
    long long m_lastRenameEnterMs = 0;

    wxTimer m_loadTimer;      // timer 1: one tick loads the first disc found
    wxTimer m_pollTimer;      // timer 2: a poll a second while the panel shows
    wxTimer m_progressTimer;  // the running row's bar

    std::vector<std::string> m_drives;
    int m_currentDrive = -1;
    std::vector<Row> m_rows;
    cddb::CDDiscInfo m_record;
    std::uint32_t m_discId = 0xFFFFFFFF;
    bool m_renamed = false;
    bool m_lookupOpen = false;
    bool m_trayOpen = false;
    bool m_running = false;
    bool m_paused = false;
    std::vector<int> m_reselect;
    std::atomic<int> m_checkedSeconds{0};
    std::string m_cddbFolder;
    wxColour m_cellText;
    double m_lastLoadMs = 0;

    std::thread m_worker;
    std::atomic<bool> m_workerBusy{false};
    std::shared_ptr<CDRipDlg*> m_alive;
};

extern CDRipDlg* g_RipDlg;

}  // namespace ac
