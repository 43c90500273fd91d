#pragma once
// CMediaListWnd: the conversion list of work mode 0 with its six buttons, and the list that
// the encoding driver walks.
//
// Thread contract: the IMediaList calls run on any thread; everything else on the UI thread.
// Rows live in a model guarded by a short-held model mutex, so the driver can read rows while
// the UI thread draws. The list lock (TryLock/Unlock) is a real mutex: the driver holds it for
// a pass, and the UI thread takes it around every insert, delete and write to a row's set.
// Lock order: list lock, then model mutex. Nothing calls out while holding the model mutex,
// and removed rows are destroyed after both are released (a row's destructor joins the
// threads of its child, whose exit callback reads the model).

#include "convert/EncodingDriver.h"
#include "convert/MediaItem.h"
#include "skin/SkinDialog.h"

#include <wx/timer.h>

#include <array>
#include <atomic>
#include <functional>
#include <memory>
#include <mutex>
#include <string>
#include <vector>

namespace ac {

class ImButton;
class ImPicture;
class ParameterSet;
class Profile;
class XListCtrl;

inline constexpr int kMediaListDialogId = 132;
inline constexpr int kMediaListContextMenuId = 130;

// Columns of the list.
enum MediaListColumn { kColCheck, kColName, kColDuration, kColType, kColTarget, kColStatus };

class CMediaListWnd : public ImSkinPanel, public IMediaList {
public:
    explicit CMediaListWnd(wxWindow* parent);
    ~CMediaListWnd() override;

    // ---- IMediaList (any thread) ----
    int GetRowCount() override;
    MediaItem* GetItem(int row) override;
    bool IsChecked(int row) override;
    bool IsSelected(int row) override;
    void SelectOnly(int row) override;
    void RefreshRow(int row) override;
    bool TryLock() override;
    void Unlock() override;
    std::string GetOutputDirectory() override;
    void EnableChecking(bool enable) override;

    // ---- File intake ----
    void AddFiles();
    void AddFolder(const std::string& path, int position);
    // The row made, or for a cue sheet the row of its first track; -1 when none was made.
    int AddFile(const std::string& path, int position);
    // 0, or -1 when the row could not be made.
    int AddCueTrack(const std::string& trackPath, const std::string& title, int position);
    void OnDropFiles(const std::vector<std::string>& paths);

    // ---- Commands of the list ----
    void Remove();
    void Clear();
    void CheckAll(bool check);
    void CheckSelected(bool check);
    void SelectAll(bool select);
    void ConfigureToAll();
    // The rules of Add, Remove, Clear, the Check and Select commands, Configure To All and
    // Show File Information; false for any other id.
    bool IsCommandEnabled(int commandId);

    // ---- Profiles and parameters ----
    // A profile chosen in the side bar: new rows clone it, selected rows of another profile
    // take it.
    void ApplyProfile(const Profile& profile);
    void SetCurrentProfile(const Profile* profile) { m_currentProfile = profile; }
    const Profile* GetCurrentProfile() const { return m_currentProfile; }
    std::vector<ParameterSet*> SelectedSets();
    // Runs `edit` under the list lock, then lets the selected rows read their cut again.
    // `edit` writes sets only: a call back into the list from it would wait on its own lock.
    void EditSets(const std::function<void()>& edit);
    void SetSelectedVolume(int volume, bool firstOnly);
    int GetFirstSelected();
    // Writes the Target column and the output name of a row from its set.
    void RefreshTarget(int row);

    // ---- Mode switches ----
    void OnHidePanel();
    void OnShowPanel();

    // ---- Inspection (UI thread) ----
    std::vector<MediaItem*> Items();
    // One line per row: "row=NAME|DURATION|TYPE|TARGET|STATUS|checked|selected|SOURCE".
    std::string DescribeRows() const;
    XListCtrl* List() const { return m_list; }

    // ---- Skinned window ----
    void OnLanguageChanged() override;
    void DoRecalcLayout() override;
    bool OnSkinChanged(const std::string& skinDir) override;

private:
    struct Row {
        std::unique_ptr<MediaItem> item;
        std::atomic<bool> checked{true};
        std::atomic<bool> selected{false};
    };
    using RowList = std::vector<std::unique_ptr<Row>>;

    void CreateControls();
    void BindEvents();
    // Model changes; each takes the list lock and the model mutex.
    int InsertRow(int position, std::unique_ptr<MediaItem> item, const std::string& name,
                  const std::string& type);
    RowList TakeRows(const std::vector<int>& rows);
    std::unique_ptr<MediaItem> MakeItem(const std::string& sourcePath) const;
    int AddCueSheet(const std::string& sheetPath, int position);

    // UI-thread halves of the cross-thread calls.
    void DrawStatus(int row);
    void ApplySelectOnly(int row);
    void ApplyCheckingEnabled(bool enable);
    void PostToUi(std::function<void(CMediaListWnd&)> call);

    // The set of a row with the list lock held by the caller.
    void WriteTarget(int row);
    void SetRowChecked(int row, bool check);
    void SetRowSelected(int row, bool select);
    // Mirrors the list control's selection into the model and runs the notifications.
    void SyncSelection();
    void NotifySelection(int becameSelected, bool lostAny);
    void ApplyBitRateRule();
    void FitColumns();
    void OnTimer();
    void UpdateButtons();
    void OnButton(int id);
    void OnBodyLeftDown(wxMouseEvent& event);
    void OnHeaderLeftDown(wxMouseEvent& event);
    bool AnyRowActive() const;

    XListCtrl* m_list = nullptr;
    std::array<ImButton*, 6> m_buttons{};
    ImPicture* m_leftEnd = nullptr;
    ImPicture* m_rightEnd = nullptr;
    wxTimer m_timer;
    const Profile* m_currentProfile = nullptr;
    bool m_checkingEnabled = true;
    int m_endSpacing = 2;
    wxColour m_cellText;

    RowList m_rows;  // written on the UI thread under both locks
    mutable std::mutex m_modelMutex;
    std::mutex m_listLock;
    // Calls posted from workers hold this weakly; the window clears it when it goes.
    std::shared_ptr<CMediaListWnd*> m_alive;
};

extern CMediaListWnd* g_MediaList;

}  // namespace ac
