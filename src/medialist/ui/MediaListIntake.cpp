// File intake of the conversion list: the file dialog, folders, dropped files and cue sheets.
// Probing runs here on the UI thread, one file after the other.
#include "convert/RowParameters.h"
#include "medialist/CueSheet.h"
#include "rip/CueExpansion.h"
#include "medialist/MediaListRules.h"
#include "medialist/MediaProbe.h"
#include "medialist/ui/MediaListWnd.h"
#include "profile/ParameterSet.h"
#include "resources/Language.h"
#include "resources/TextFormat.h"
#include "shell/AppConfig.h"
#include "shell/MainHub.h"
#include "skin/ListCtrl.h"

#include <wx/evtloop.h>
#include <wx/filedlg.h>

#include <algorithm>
#include <cctype>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <sstream>

namespace ac {

namespace {

namespace fs = std::filesystem;

std::string LowerText(std::string text) {
    std::transform(text.begin(), text.end(), text.begin(),
                   [](unsigned char c) { return static_cast<char>(std::tolower(c)); });
    return text;
}

// Lets paint and size events through so a long sheet keeps the window alive, but no input:
// a click on Remove in the middle of an add would move the rows under it.
void LetWindowBreathe() {
    if (wxEventLoopBase* loop = wxEventLoopBase::GetActive()) {
        loop->YieldFor(wxEVT_CATEGORY_UI);
    }
}

}  // namespace

std::unique_ptr<MediaItem> CMediaListWnd::MakeItem(const std::string& sourcePath) const {
    auto item = std::make_unique<MediaItem>();
    item->sourcePath = sourcePath;
    if (m_currentProfile != nullptr) {
        item->parameters = std::make_unique<RowParameters>(m_currentProfile->Clone());
    }
    return item;
}

namespace {
constexpr std::uint32_t kAddFilesTitleId = 0xC184;
}  // namespace

void CMediaListWnd::AddFiles() {
    AppConfig& config = GetAppConfig();
    // Computed once: the demuxers of the linked FFmpeg do not change while the program runs.
    static const std::vector<std::string> s_ffmpegExtensions = DemuxerExtensions();
    const std::string filter = OpenDialogFilter(
        [](std::uint32_t id) { return g_Language.GetString(id); }, s_ffmpegExtensions);
    wxFileDialog dialog(this, wxString::FromUTF8(g_Language.GetString(kAddFilesTitleId)), wxString::FromUTF8(config.GetString("last_openpath")),
                        wxEmptyString, wxString::FromUTF8(filter),
                        wxFD_OPEN | wxFD_MULTIPLE | wxFD_FILE_MUST_EXIST);
    if (dialog.ShowModal() != wxID_OK) {
        return;
    }
    wxArrayString paths;
    dialog.GetPaths(paths);
    for (const wxString& path : paths) {
        AddFile(path.utf8_string(), -1);
    }
    FitColumns();
    config.SetString("last_openpath", dialog.GetDirectory().utf8_string().c_str());
    UpdateButtons();
}

void CMediaListWnd::AddFolder(const std::string& path, int position) {
    std::error_code error;
    fs::directory_iterator entries(path, error);
    if (error) {
        return;
    }
    // Directory order is the file system's; the list shows a folder sorted by name.
    std::vector<std::string> names;
    for (const fs::directory_entry& entry : entries) {
        const std::string name = entry.path().filename().string();
        if (!entry.is_directory(error) && IsFolderMediaName(name)) {
            names.push_back(name);
        }
    }
    std::sort(names.begin(), names.end());
    const std::string folder = path.ends_with('/') ? path : path + "/";
    for (const std::string& name : names) {
        const int row = AddFile(folder + name, position);
        if (position >= 0 && row >= 0) {
            position = row + 1;
        }
    }
    FitColumns();
    UpdateButtons();
}

int CMediaListWnd::AddFile(const std::string& path, int position) {
    position = ClampAddPosition(position, m_list->GetItemCount());
    if (LowerText(GetExtension(path)) == "cue") {
        return AddCueSheet(path, position);
    }
    std::unique_ptr<MediaItem> item = MakeItem(path);
    const bool probed = ProbeFile(path, item->info) != 0;
    item->SetStatus(probed ? JobStatus::Idle : JobStatus::UnknownFile);
    if (ParameterSet* set = SetOf(*item)) {
        ApplyTags(*set, &item->info);
        RowParametersOf(*item)->Refresh();
    }
    return InsertRow(position, std::move(item), GetDisplayName(path),
                     LowerText(GetExtension(path)));
}

int CMediaListWnd::AddCueTrack(const std::string& trackPath, const std::string& title,
                               int position) {
    std::unique_ptr<MediaItem> item = MakeItem(trackPath);
    const bool probed = ProbeFile(trackPath, item->info) != 0;
    item->SetStatus(probed ? JobStatus::Idle : JobStatus::UnknownFile);
    ParameterSet* set = SetOf(*item);
    if (probed && set != nullptr) {
        ApplyTags(*set, &item->info);
        RowParametersOf(*item)->Refresh();
    }
    const std::string name = title.empty() ? GetDisplayName(trackPath) : title;
    return InsertRow(position, std::move(item), name, LowerText(GetExtension(trackPath))) >= 0
               ? 0
               : -1;
}

int CMediaListWnd::AddCueSheet(const std::string& sheetPath, int position) {
    const CueExpansion sheet = ExpandCueSheet(sheetPath);
    IMainHub* hub = GetMainHub();
    if (sheet.rows.empty()) {
        // No track, no row; the status text names the sheet and the line that stopped it.
        if (hub != nullptr) {
            hub->SetStatusText(sheet.error);
        }
        return -1;
    }
    const int first = position;
    for (const CueRow& row : sheet.rows) {
        if (hub != nullptr) {
            hub->SetStatusText(FormatText(g_Language.GetString(0xC040), {row.trackPath}));
        }
        if (AddCueTrack(row.trackPath, row.title, position) < 0) {
            break;
        }
        ++position;
        LetWindowBreathe();
    }
    if (hub != nullptr) {
        hub->SetStatusText(g_Language.GetString(0xC041));
    }
    return first;
}

void CMediaListWnd::OnDropFiles(const std::vector<std::string>& paths) {
    for (const std::string& path : paths) {
        std::error_code error;
        if (fs::exists(path, error) && !fs::is_directory(path, error)) {
            AddFile(path, -1);
        }
    }
    FitColumns();
    UpdateButtons();
}

}  // namespace ac
