#pragma once
// COutputPanelWnd: the strip under the list panels. In the convert and rip modes it holds the
// destination folder, in the burn mode the recorder, speed and copies.
//
// Thread contract: GetOutputDirectory from any thread (the driver and the disk check read it);
// everything else on the UI thread.

#include "skin/SkinDialog.h"

#include <functional>
#include <mutex>
#include <string>
#include <utility>

class wxChoice;
class wxSpinButton;
class wxTextCtrl;

namespace ac {

class ImButton;
class ImLabel;

inline constexpr int kOutputPanelDialogId = 133;

class COutputPanelWnd : public ImSkinPanel {
public:
    explicit COutputPanelWnd(wxWindow* parent);
    ~COutputPanelWnd() override;

    // The directory box's text as last left or changed.
    std::string GetOutputDirectory() const;
    // 0 convert, 1 rip, 2 burn: stores last_run_function, shows the mode's folder, lays out.
    void SetMode(int mode);
    int GetMode() const { return m_showType; }
    int GetNeededHeight() const;

    // The rip panel's artist and album boxes, for Open in rip mode (set by the main dialog).
    void SetRipFolderSource(std::function<std::pair<std::string, std::string>()> source) {
        m_ripFolder = std::move(source);
    }
    // What leaving the box does: trim, show, store for the mode, create the folder.
    void CommitDirectory();
    void SetDirectoryText(const std::string& text);
    void Browse();
    void OpenFolder();
    // The folder that Open shows in the current mode.
    std::string FolderToOpen() const;

    // The burn mode's lists, made on the first call.
    wxChoice* RecorderBox();
    wxChoice* SpeedBox();
    int GetCopies() const;

    void OnLanguageChanged() override;
    void DoRecalcLayout() override;
    bool OnSkinChanged(const std::string& skinDir) override;

private:
    void CreateControls();
    void MakeBurnControls();
    void TranslateBurnLabels();
    void DressBurnLabels();
    void ShowModeFolder();
    void UpdateDirectoryCopy();
    static const char* FolderKey(int mode);

    ImLabel* m_destinationLabel = nullptr;
    wxTextCtrl* m_directory = nullptr;
    ImButton* m_browse = nullptr;
    ImButton* m_open = nullptr;
    ImLabel* m_recorderLabel = nullptr;
    wxChoice* m_recorder = nullptr;
    ImLabel* m_speedLabel = nullptr;
    wxChoice* m_speed = nullptr;
    ImLabel* m_copiesLabel = nullptr;
    wxTextCtrl* m_copies = nullptr;
    wxSpinButton* m_spin = nullptr;  // made with the burn mode's first layout

    int m_showType = 0;
    int m_rowHeight = 0;
    std::function<std::pair<std::string, std::string>()> m_ripFolder;
    mutable std::mutex m_directoryMutex;
    std::string m_directoryCopy;
};

extern COutputPanelWnd* g_OutputPanel;

}  // namespace ac
