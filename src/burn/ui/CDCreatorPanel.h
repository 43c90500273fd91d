#pragma once
// CCDCreatorPanel: the panel of the burn mode. The list of what goes on the disc, the commands
// that fill and order it, the tally of its length on the status panel's gauge, the recorders
// and their speeds, and the burn run (BurnDriver) over its rows.
//
// Thread contract: the IBurnList calls come from the burn thread and the conversion workers as
// well; rows live in a model under a short-held mutex, as in the conversion list. The IBurnHost
// calls come from the burn thread: a question waits for its answer on the UI thread, and once
// the panel is closing it is answered "No" without asking. The recorder poll runs on the
// panel's worker and posts what it read. Everything else on the UI thread.

#include "burn/BurnDriver.h"
#include "burn/Compilation.h"
#include "burn/Recorder.h"
#include "convert/MediaItem.h"
#include "skin/SkinDialog.h"

#include <wx/timer.h>

#include <array>
#include <atomic>
#include <condition_variable>
#include <functional>
#include <memory>
#include <mutex>
#include <string>
#include <thread>
#include <vector>

namespace ac {

class CFileAddErrorWnd;
class CapacityBar;
class ImButton;
class ImPicture;
class ParameterSet;
class Profile;
class XListCtrl;

inline constexpr int kCreatorDialogId = 173;
inline constexpr int kCreatorContextMenuId = 182;

namespace burncmd {
inline constexpr int kAdd = 32771;
inline constexpr int kRemove = 32772;
inline constexpr int kClear = 32773;
inline constexpr int kAddFolder = 33053;
inline constexpr int kSelectAll = 33055;
inline constexpr int kSelectNone = 33056;
inline constexpr int kFileInfo = 33045;
inline constexpr int kBurn = 33136;
inline constexpr int kStop = 33077;
inline constexpr int kErase = 33082;
inline constexpr int kShowMessage = 33139;
// The buttons' own ids.
inline constexpr int kMoveUp = 1187;
inline constexpr int kMoveDown = 1186;
}  // namespace burncmd

// What the panel asks of the main window: boxes with their captions, the waiting dialog, the
// side bar's disc fields, the tab strip, the status panel, the end of a run.
class ICreatorModeHost {
public:
    virtual ~ICreatorModeHost() = default;
    // wx message box styles; answers wxYES, wxNO, wxOK or wxCANCEL.
    virtual int MessageBox(const std::string& text, const std::string& caption, long style) = 0;
    virtual burn::ICdRecorder* WaitForDisc(burn::ICdRecorder* recorder, int code,
                                           std::int64_t sectors, bool showIgnore,
                                           bool& ignored) = 0;
    virtual void EnablePanels(bool enable) = 0;
    virtual void RunEnded(bool allCopiesWritten) = 0;
    virtual void SelectionChanged() = 0;
    virtual const Profile* CurrentProfile() = 0;
    // The side bar's disc type item: 0 audio, 1 MP3, 2 WMA.
    virtual int DiscTypeItem() = 0;
    virtual std::string VolumeLabel() = 0;
    // Seconds of the "Interval:" list.
    virtual int PauseSeconds() = 0;
    virtual CapacityBar* Gauge() = 0;
    virtual void SetStatusText(const std::string& text) = 0;
};

class CCDCreatorPanel : public ImSkinPanel, public burn::IBurnList, public burn::IBurnHost {
public:
    explicit CCDCreatorPanel(wxWindow* parent);
    ~CCDCreatorPanel() override;

    void SetModeHost(ICreatorModeHost* host) { m_modeHost = host; }
    burn::BurnDriver& Driver() { return *m_driver; }

    // ---- Intake ----
    void AddFiles();
    void AddFolder(const std::string& path);
    // The row made, or -1 when the file was refused.
    int AddFile(const std::string& path, int position);
    int AddCueTrack(const std::string& trackPath, const std::string& title, int position);
    void OnDropFiles(const std::vector<std::string>& paths);

    // ---- Commands ----
    void Remove();
    void Clear();
    void MoveUp();
    void MoveDown();
    void SelectAll(bool select);
    void SelectRows(const std::vector<int>& rows);
    // -1 when nothing is selected.
    int FirstSelectedRow() const;
    void StartBurn();
    void StopBurn();
    bool IsOwnCommand(int commandId) const;
    bool IsCommandEnabled(int commandId);
    bool OnCommand(int commandId);
    // The close request: false while a run is active ("Please stop burning first!").
    bool StopForClose();

    // ---- Profiles ----
    void ApplyProfile(const Profile& profile);
    std::vector<ParameterSet*> SelectedSets();
    // The side bar's grid edits the selection: some row selected and none of them converting.
    bool SelectionEditable() const;

    // ---- Recorders and the gauge ----
    void ListRecorders();
    // The output panel's recorder box, once that panel exists.
    void FillRecorderBox();
    burn::ICdRecorder* SelectedRecorder();
    const std::vector<std::unique_ptr<burn::ICdRecorder>>& Recorders() const { return m_recorders; }
    // Message 2126: the gauge's marks and position for the disc type.
    void RefreshCapacity();
    // The speed box from the speeds read of the selected recorder.
    void ShowSpeeds(const std::vector<int>& speeds);
    const burn::CompilationTally& Tally() const { return m_tally; }
    CFileAddErrorWnd* RefusedWindow() const { return m_refused; }

    // ---- Inspection (UI thread) ----
    // One line per row: number|name|duration|type|status|selected|source.
    std::string DescribeRows() const;
    XListCtrl* List() const { return m_list; }

    // ---- IBurnList (any thread) ----
    int RowCount() override;
    MediaItem* Item(int row) override;
    void SelectOnly(int row) override;
    void RefreshRow(int row, int percent) override;

    // ---- IBurnHost (burn thread, or the UI thread before a run) ----
    bool Ask(const burn::Prompt& prompt) override;
    bool Tell(const burn::Prompt& prompt, bool okCancel) override;
    burn::ICdRecorder* WaitForDisc(burn::ICdRecorder* recorder, int code, std::int64_t sectors,
                                   bool showIgnore, bool& ignored) override;
    void SetStatusText(std::uint32_t textId, const std::string& argument) override;
    void SetProgress(int percent) override;
    void EnablePanels(bool enable) override;
    void PostCapacityRefresh() override;
    void PostTracksUnavailable() override;
    void RunEnded(bool allCopiesWritten) override;

    // ---- Skinned window ----
    void OnLanguageChanged() override;
    void DoRecalcLayout() override;
    bool OnSkinChanged(const std::string& skinDir) override;

private:
    struct Row {
        std::unique_ptr<MediaItem> item;
        std::string name;  // GetDisplayName, for the duplicate test
        std::string type;
        bool selected = false;
    };

    void CreateControls();
    void BindEvents();
    int InsertRow(int position, std::unique_ptr<MediaItem> item, const std::string& name,
                  const std::string& shownName, const std::string& type);
    void WriteRow(int row);
    void Renumber();
    void SwapRows(int first, int second);
    void Refuse(const std::string& path, int reason);
    CFileAddErrorWnd& Refused();
    bool HasName(const std::string& name) const;
    std::unique_ptr<MediaItem> MakeItem(const std::string& sourcePath) const;
    void SyncSelection();
    std::vector<int> SelectedRows() const;
    void UpdateButtons();
    void OnButton(int id);
    void FitColumns();
    void DrawStatus(int row, int percent);
    void PostToUi(std::function<void(CCDCreatorPanel&)> call);
    // Runs `call` on the UI thread and waits for it; `fallback` once the panel is closing.
    template <typename T>
    T OnUi(std::function<T()> call, T fallback);
    void StartPoll();
    void StopPoll();
    void PollLoop();
    void SettleTemporaryFolder();
    burn::BurnSettings CollectSettings();
    std::string PromptText(const burn::Prompt& prompt) const;
    int ShowPrompt(const burn::Prompt& prompt, long buttons);

    ICreatorModeHost* m_modeHost = nullptr;
    XListCtrl* m_list = nullptr;
    std::array<ImButton*, 7> m_buttons{};
    ImPicture* m_leftEnd = nullptr;
    ImPicture* m_rightEnd = nullptr;
    CFileAddErrorWnd* m_refused = nullptr;
    wxTimer m_timer;
    int m_endSpacing = 2;
    int m_buttonRowHeight = 69;
    wxColour m_cellText;

    std::vector<std::unique_ptr<Row>> m_rows;  // written on the UI thread under m_modelMutex
    mutable std::mutex m_modelMutex;
    const Profile* m_currentProfile = nullptr;
    burn::CompilationTally m_tally;
    bool m_panelsEnabled = true;
    bool m_gaugeShowsRun = false;

    std::vector<std::unique_ptr<burn::ICdRecorder>> m_recorders;
    std::atomic<int> m_selectedRecorder{-1};
    bool m_recorderBoxFilled = false;
    std::unique_ptr<burn::BurnDriver> m_driver;

    // The recorder poll.
    std::thread m_poll;
    std::mutex m_pollMutex;
    std::condition_variable m_pollWake;
    bool m_pollStop = false;

    std::atomic<bool> m_closing{false};
    std::shared_ptr<CCDCreatorPanel*> m_alive;
};

extern CCDCreatorPanel* g_CreatorPanel;

}  // namespace ac
