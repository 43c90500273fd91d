// The creator panel's model and logic: intake with the name rules, the tally, Remove, Clear,
// the moves, the commands and their enable rules, the recorders, and the burn run's host.
#include "burn/ui/CDCreatorPanel.h"

#include "burn/BurnTexts.h"
#include "convert/CommandLine.h"
#include "convert/RowParameters.h"
#include "medialist/MediaListRules.h"
#include "medialist/MediaProbe.h"
#include "medialist/ui/OutputPanelWnd.h"
#include "panels/CapacityBar.h"
#include "panels/FileAddErrorWnd.h"
#include "platform/Paths.h"
#include "platform/UiQueue.h"
#include "profile/ParameterSet.h"
#include "resources/Language.h"
#include "resources/TextFormat.h"
#include "rip/CueExpansion.h"
#include "shell/AppConfig.h"
#include "shell/MainHub.h"
#include "skin/ListCtrl.h"

#include <wx/app.h>
#include <wx/choice.h>
#include <wx/evtloop.h>
#include <wx/filedlg.h>
#include <wx/msgdlg.h>
#include <wx/thread.h>

#include <algorithm>
#include <cctype>
#include <chrono>
#include <filesystem>
#include <future>

namespace ac {

CCDCreatorPanel* g_CreatorPanel = nullptr;

namespace {

namespace fs = std::filesystem;

constexpr std::size_t kMaxNameLength = 104;
constexpr std::uint32_t kAddFilesTitleId = 0xC184;

std::string LowerText(std::string text) {
    std::transform(text.begin(), text.end(), text.begin(),
                   [](unsigned char c) { return static_cast<char>(std::tolower(c)); });
    return text;
}

bool SameName(const std::string& a, const std::string& b) {
    return LowerText(a) == LowerText(b);
}

long IconStyle(burn::PromptIcon icon) {
    switch (icon) {
        case burn::PromptIcon::Information:
            return wxICON_INFORMATION;
        case burn::PromptIcon::Warning:
            return wxICON_WARNING;
        case burn::PromptIcon::Error:
            return wxICON_ERROR;
        case burn::PromptIcon::Question:
            return wxICON_QUESTION;
    }
    return wxICON_INFORMATION;
}

}  // namespace

// ---- Model ----------------------------------------------------------------------------------

int CCDCreatorPanel::RowCount() {
    std::lock_guard model(m_modelMutex);
    return static_cast<int>(m_rows.size());
}

MediaItem* CCDCreatorPanel::Item(int row) {
    std::lock_guard model(m_modelMutex);
    return row >= 0 && row < static_cast<int>(m_rows.size()) ? m_rows[std::size_t(row)]->item.get()
                                                             : nullptr;
}

void CCDCreatorPanel::SelectOnly(int row) {
    PostToUi([row](CCDCreatorPanel& self) {
        if (row < 0 || row >= self.m_list->GetItemCount())
            return;
        self.m_list->SelectRow(row);
        self.SyncSelection();
    });
}

void CCDCreatorPanel::RefreshRow(int row, int percent) {
    PostToUi([row, percent](CCDCreatorPanel& self) { self.DrawStatus(row, percent); });
}

void CCDCreatorPanel::PostToUi(std::function<void(CCDCreatorPanel&)> call) {
    std::weak_ptr<CCDCreatorPanel*> alive = m_alive;
    auto arrive = [alive, call = std::move(call)] {
        if (auto self = alive.lock(); self && *self)
            call(**self);
    };
    if (wxThread::IsMain()) {
        arrive();
    } else if (UiQueue::HasPoster()) {
        UiQueue::Post(std::move(arrive));
    } else if (wxTheApp != nullptr) {
        wxTheApp->CallAfter(std::move(arrive));
    }
}

template <typename T>
T CCDCreatorPanel::OnUi(std::function<T()> call, T fallback) {
    if (wxThread::IsMain())
        return m_closing ? fallback : call();
    if (m_closing)
        return fallback;
    auto promise = std::make_shared<std::promise<T>>();
    std::future<T> answer = promise->get_future();
    std::weak_ptr<CCDCreatorPanel*> alive = m_alive;
    auto run = [alive, promise, call, fallback] {
        auto self = alive.lock();
        promise->set_value(self && *self && !(*self)->m_closing ? call() : fallback);
    };
    if (UiQueue::HasPoster())
        UiQueue::Post(run);
    else if (wxTheApp != nullptr)
        wxTheApp->CallAfter(run);
    else
        return fallback;
    // Closing must not wait on a worker that waits on the window: a closing panel answers for it.
    while (answer.wait_for(std::chrono::milliseconds(100)) != std::future_status::ready) {
        if (m_closing)
            return fallback;
    }
    return answer.get();
}

// ---- Intake ---------------------------------------------------------------------------------

std::unique_ptr<MediaItem> CCDCreatorPanel::MakeItem(const std::string& sourcePath) const {
    auto item = std::make_unique<MediaItem>();
    item->sourcePath = sourcePath;
    item->volume = 50;
    if (m_currentProfile != nullptr)
        item->parameters = std::make_unique<RowParameters>(m_currentProfile->Clone());
    return item;
}

bool CCDCreatorPanel::HasName(const std::string& name) const {
    std::lock_guard model(m_modelMutex);
    return std::any_of(m_rows.begin(), m_rows.end(),
                       [&](const auto& row) { return SameName(row->name, name); });
}

CFileAddErrorWnd& CCDCreatorPanel::Refused() {
    // Made at the first refusal: most sessions never need it, and it costs the start.
    if (m_refused == nullptr)
        m_refused = new CFileAddErrorWnd();
    return *m_refused;
}

void CCDCreatorPanel::Refuse(const std::string& path, int reason) {
    Refused().AddRefusedFile(path, static_cast<CFileAddErrorWnd::Reason>(reason));
}

void CCDCreatorPanel::AddFiles() {
    AppConfig& config = GetAppConfig();
    static const std::vector<std::string> s_ffmpegExtensions = DemuxerExtensions();
    const std::string filter = OpenDialogFilter(
        [](std::uint32_t id) { return g_Language.GetString(id); }, s_ffmpegExtensions);
    wxFileDialog dialog(this, wxString::FromUTF8(g_Language.GetString(kAddFilesTitleId)),
                        wxString::FromUTF8(config.GetString("last_openpath")), wxEmptyString,
                        wxString::FromUTF8(filter),
                        wxFD_OPEN | wxFD_MULTIPLE | wxFD_FILE_MUST_EXIST);
    if (dialog.ShowModal() != wxID_OK)
        return;
    wxArrayString paths;
    dialog.GetPaths(paths);
    for (const wxString& path : paths)
        AddFile(path.utf8_string(), -1);
    FitColumns();
    config.SetString("last_openpath", dialog.GetDirectory().utf8_string().c_str());
    UpdateButtons();
}

void CCDCreatorPanel::AddFolder(const std::string& path) {
    std::error_code error;
    std::vector<std::string> names;
    for (const fs::directory_entry& entry : fs::directory_iterator(path, error)) {
        const std::string name = entry.path().filename().string();
        const std::string extension = LowerText(GetExtension(name));
        // A disc takes no MPEG layer-2 or AC-3 tracks from a folder.
        if (!entry.is_directory(error) && IsFolderMediaName(name) && extension != "mp2" &&
            extension != "ac3")
            names.push_back(name);
    }
    std::sort(names.begin(), names.end());
    const std::string folder = path.ends_with('/') ? path : path + "/";
    for (const std::string& name : names)
        AddFile(folder + name, -1);
    FitColumns();
    UpdateButtons();
}

int CCDCreatorPanel::AddFile(const std::string& path, int position) {
    if (LowerText(GetExtension(path)) == "cue") {
        m_list->SetFocus();
        const CueExpansion sheet = ExpandCueSheet(path);
        int first = -1;
        for (const CueRow& row : sheet.rows) {
            if (m_modeHost)
                m_modeHost->SetStatusText(
                    FormatText(g_Language.GetString(burn::text::kAddingFile), {row.trackPath}));
            const int made = AddCueTrack(row.trackPath, row.title, -1);
            if (made < 0)
                break;
            if (first < 0)
                first = made;
            if (wxEventLoopBase* loop = wxEventLoopBase::GetActive())
                loop->YieldFor(wxEVT_CATEGORY_UI);
        }
        if (m_modeHost)
            m_modeHost->SetStatusText(
                sheet.rows.empty() ? sheet.error : g_Language.GetString(burn::text::kLoadFinished));
        return first;
    }
    std::unique_ptr<MediaItem> item = MakeItem(path);
    if (ProbeFile(path, item->info) == 0) {
        Refuse(path, static_cast<int>(CFileAddErrorWnd::Reason::Unreadable));
        return -1;
    }
    item->SetStatus(JobStatus::Idle);
    const std::string name = GetDisplayName(path);
    if (HasName(name)) {
        Refuse(path, static_cast<int>(CFileAddErrorWnd::Reason::AlreadyAdded));
        return -1;
    }
    if (name.size() > kMaxNameLength) {
        Refuse(path, static_cast<int>(CFileAddErrorWnd::Reason::NameTooLong));
        return -1;
    }
    if (ParameterSet* set = SetOf(*item)) {
        ApplyTags(*set, &item->info);
        RowParametersOf(*item)->Refresh();
    }
    return InsertRow(position, std::move(item), name, name, LowerText(GetExtension(path)));
}

int CCDCreatorPanel::AddCueTrack(const std::string& trackPath, const std::string& title,
                                 int position) {
    std::unique_ptr<MediaItem> item = MakeItem(trackPath);
    if (ProbeFile(trackPath, item->info) == 0)
        return -1;
    item->SetStatus(JobStatus::Idle);
    const std::string name = GetDisplayName(trackPath);
    if (HasName(name)) {
        Refuse(trackPath, static_cast<int>(CFileAddErrorWnd::Reason::AlreadyAdded));
        return -1;
    }
    if (ParameterSet* set = SetOf(*item)) {
        ApplyTags(*set, &item->info);
        RowParametersOf(*item)->Refresh();
    }
    return InsertRow(position, std::move(item), name, title.empty() ? name : title, "cue");
}

void CCDCreatorPanel::OnDropFiles(const std::vector<std::string>& paths) {
    if (m_driver->Writing() || m_driver->Converting() || m_driver->BurnActive())
        return;
    for (const std::string& path : paths) {
        std::error_code error;
        if (fs::exists(path, error) && !fs::is_directory(path, error))
            AddFile(path, -1);
    }
    FitColumns();
    UpdateButtons();
}

int CCDCreatorPanel::InsertRow(int position, std::unique_ptr<MediaItem> item,
                               const std::string& name, const std::string& shownName,
                               const std::string& type) {
    auto row = std::make_unique<Row>();
    row->name = name;
    row->type = type;
    m_tally.Add(item->info);
    row->item = std::move(item);
    {
        std::lock_guard model(m_modelMutex);
        position = ClampAddPosition(position, static_cast<int>(m_rows.size()));
        m_rows.insert(m_rows.begin() + position, std::move(row));
    }
    m_list->InsertItem(position, "");
    m_list->SetItemText(position, 1, shownName);
    WriteRow(position);
    Renumber();
    RefreshCapacity();
    return position;
}

void CCDCreatorPanel::WriteRow(int row) {
    MediaItem* item = Item(row);
    if (item == nullptr)
        return;
    char duration[32];
    std::snprintf(duration, sizeof duration, "%02d:%02d:%02d", item->info.hours, item->info.minutes,
                  item->info.seconds);
    m_list->SetItemText(row, 2, duration);
    {
        std::lock_guard model(m_modelMutex);
        m_list->SetItemText(row, 3, m_rows[std::size_t(row)]->type);
    }
    const ParameterSet* set = SetOf(*item);
    m_list->SetItemText(row, 4, set != nullptr ? TargetColumnText(set->GetSName()) : std::string());
    DrawStatus(row, 0);
}

void CCDCreatorPanel::Renumber() {
    for (int row = 0; row < m_list->GetItemCount(); ++row) {
        char number[16];
        std::snprintf(number, sizeof number, "%02d", row + 1);
        m_list->SetItemText(row, 0, number);
    }
}

// ---- Commands -------------------------------------------------------------------------------

bool CCDCreatorPanel::SelectionEditable() const {
    const std::vector<int> rows = SelectedRows();
    return !rows.empty() && std::none_of(rows.begin(), rows.end(), [this](int row) {
        return m_rows[std::size_t(row)]->item->Status() == JobStatus::Running;
    });
}

std::vector<int> CCDCreatorPanel::SelectedRows() const {
    std::vector<int> rows;
    for (int row = 0; row < m_list->GetItemCount(); ++row)
        if (m_list->IsSelected(row))
            rows.push_back(row);
    return rows;
}

void CCDCreatorPanel::Remove() {
    const std::vector<int> rows = SelectedRows();
    if (rows.empty())
        return;
    std::vector<std::unique_ptr<Row>> doomed;
    {
        std::lock_guard model(m_modelMutex);
        for (auto it = rows.rbegin(); it != rows.rend(); ++it) {
            m_tally.Remove(m_rows[std::size_t(*it)]->item->info);
            doomed.push_back(std::move(m_rows[std::size_t(*it)]));
            m_rows.erase(m_rows.begin() + *it);
        }
    }
    m_list->Freeze();
    for (auto it = rows.rbegin(); it != rows.rend(); ++it)
        m_list->DeleteItem(*it);
    m_list->Thaw();
    doomed.clear();  // a row's child is joined here, with no lock held
    RefreshCapacity();
    FitColumns();
    Renumber();
    if (IMainHub* hub = GetMainHub())
        hub->ShowFileInfo(nullptr);
    SyncSelection();
    UpdateButtons();
}

void CCDCreatorPanel::Clear() {
    std::vector<std::unique_ptr<Row>> doomed;
    {
        std::lock_guard model(m_modelMutex);
        doomed.swap(m_rows);
    }
    m_list->DeleteAllItems();
    doomed.clear();
    m_tally.Clear();
    RefreshCapacity();
    FitColumns();
    if (IMainHub* hub = GetMainHub())
        hub->ShowFileInfo(nullptr);
    if (m_modeHost)
        m_modeHost->SelectionChanged();
    UpdateButtons();
}

void CCDCreatorPanel::SwapRows(int first, int second) {
    {
        std::lock_guard model(m_modelMutex);
        std::swap(m_rows[std::size_t(first)], m_rows[std::size_t(second)]);
    }
    for (int column = 1; column < m_list->GetColumnCount(); ++column) {
        const std::string a = m_list->GetItemText(first, column).substr(0, 260);
        const std::string b = m_list->GetItemText(second, column).substr(0, 260);
        m_list->SetItemText(first, column, b);
        m_list->SetItemText(second, column, a);
    }
    DrawStatus(first, 0);
    DrawStatus(second, 0);
}

void CCDCreatorPanel::MoveUp() {
    std::vector<int> selected = SelectedRows();
    std::vector<int> now;
    for (int row : selected) {
        // A block at the top stays: a row only moves past a row that is not moving itself.
        if (row > 0 && std::find(now.begin(), now.end(), row - 1) == now.end()) {
            SwapRows(row, row - 1);
            now.push_back(row - 1);
        } else {
            now.push_back(row);
        }
    }
    SelectRows(now);
    Renumber();
    m_list->SetFocus();
}

void CCDCreatorPanel::MoveDown() {
    std::vector<int> selected = SelectedRows();
    std::vector<int> now;
    const int last = m_list->GetItemCount() - 1;
    for (auto it = selected.rbegin(); it != selected.rend(); ++it) {
        const int row = *it;
        if (row < last && std::find(now.begin(), now.end(), row + 1) == now.end()) {
            SwapRows(row, row + 1);
            now.push_back(row + 1);
        } else {
            now.push_back(row);
        }
    }
    SelectRows(now);
    Renumber();
    m_list->SetFocus();
}

int CCDCreatorPanel::FirstSelectedRow() const {
    const std::vector<int> rows = SelectedRows();
    return rows.empty() ? -1 : rows.front();
}

void CCDCreatorPanel::SelectRows(const std::vector<int>& rows) {
    m_list->SelectRow(-1);
    for (int row : rows)
        if (row >= 0 && row < m_list->GetItemCount())
            m_list->SelectRow(row, false);
    SyncSelection();
}

void CCDCreatorPanel::SelectAll(bool select) {
    std::vector<int> rows;
    if (select)
        for (int row = 0; row < m_list->GetItemCount(); ++row)
            rows.push_back(row);
    SelectRows(rows);
    m_list->SetFocus();
}

bool CCDCreatorPanel::IsOwnCommand(int id) const {
    using namespace burncmd;
    switch (id) {
        case kAdd:
        case kRemove:
        case kClear:
        case kAddFolder:
        case kSelectAll:
        case kSelectNone:
        case kBurn:
        case kStop:
        case kErase:
        case kShowMessage:
        case kMoveUp:
        case kMoveDown:
            return true;
        default:
            return false;
    }
}

bool CCDCreatorPanel::IsCommandEnabled(int id) {
    using namespace burncmd;
    const bool active = m_driver->BurnActive();
    const std::vector<int> selected = SelectedRows();
    const int rows = m_list->GetItemCount();
    switch (id) {
        case kAdd:
        case kAddFolder:
            return !active;
        case kRemove:
            return !active && !selected.empty();
        case kClear:
        case kBurn:
            return !active && rows > 0;
        case kStop:
            return m_driver->CanStop();
        case kMoveUp:
            return !active && !selected.empty() && selected.front() != 0;
        case kMoveDown:
            return !active && !selected.empty() && selected.back() != rows - 1;
        case kErase:
            return !active && m_panelsEnabled;
        default:
            return true;
    }
}

bool CCDCreatorPanel::OnCommand(int id) {
    using namespace burncmd;
    // The moves run whenever no burn is active: a block at the top simply stays.
    const bool move = id == kMoveUp || id == kMoveDown;
    if (move ? m_driver->BurnActive() : !IsCommandEnabled(id))
        return false;
    switch (id) {
        case kAdd:
            AddFiles();
            break;
        case kRemove:
            Remove();
            break;
        case kClear:
            Clear();
            break;
        case kSelectAll:
            SelectAll(true);
            break;
        case kSelectNone:
            SelectAll(false);
            break;
        case kBurn:
            StartBurn();
            break;
        case kStop:
            StopBurn();
            break;
        case kMoveUp:
            MoveUp();
            break;
        case kMoveDown:
            MoveDown();
            break;
        case kShowMessage:
            Refused().Show();
            break;
        default:
            return false;
    }
    UpdateButtons();
    return true;
}

bool CCDCreatorPanel::StopForClose() {
    if (!m_driver->BurnActive())
        return true;
    ShowPrompt({49153, 0, burn::PromptIcon::Warning, false, {}}, wxOK);
    return false;
}

// ---- The run --------------------------------------------------------------------------------

burn::BurnSettings CCDCreatorPanel::CollectSettings() {
    AppConfig& config = GetAppConfig();
    burn::BurnSettings settings;
    settings.temporaryFolder = config.GetString("burntemp");
    settings.maxProcesses = config.GetInt("max_processes");
    settings.maxRunningProcesses = config.GetInt("max_running_processes");
    settings.toolPath = platform::FindConversionTool();
    settings.toolDirectory = config.GetBaseDirectory();
    const int item = m_modeHost ? m_modeHost->DiscTypeItem() : 0;
    settings.discType = item == 1   ? burn::DiscType::Mp3
                        : item == 2 ? burn::DiscType::Wma
                                    : burn::DiscType::Audio;
    settings.copies = g_OutputPanel ? g_OutputPanel->GetCopies() : 1;
    settings.speed = -1;
    if (g_OutputPanel && g_OutputPanel->SpeedBox()->GetSelection() != wxNOT_FOUND) {
        const int selection = g_OutputPanel->SpeedBox()->GetSelection();
        settings.speed = static_cast<int>(
            reinterpret_cast<std::intptr_t>(g_OutputPanel->SpeedBox()->GetClientData(selection)));
    }
    settings.pauseSeconds = m_modeHost ? m_modeHost->PauseSeconds() : 2;
    settings.volumeLabel = m_modeHost ? m_modeHost->VolumeLabel() : std::string();
    settings.naming = ReadNamingSettings(config);
    return settings;
}

void CCDCreatorPanel::SettleTemporaryFolder() {
    AppConfig& config = GetAppConfig();
    if (config.GetString("burntemp").empty()) {
        const std::string folder = burn::DefaultTemporaryFolder();
        platform::EnsureDirectory(folder, 0700);
        config.SetString("burntemp", folder.c_str());
    }
}

void CCDCreatorPanel::StartBurn() {
    if (m_driver->BurnActive() || m_list->GetItemCount() == 0)
        return;
    m_driver->SetSettings(CollectSettings());
    m_driver->SetRecorder(SelectedRecorder());
    double seconds = 0;
    for (int row = 0; row < RowCount(); ++row)
        if (MediaItem* item = Item(row))
            seconds += GetEffectiveDuration(*item);
    m_driver->SetCompilation(seconds, m_tally.minutes);
    if (!m_driver->StartBurn())
        RefreshCapacity();
    UpdateButtons();
}

void CCDCreatorPanel::StopBurn() {
    m_driver->StopBurn();
    if (m_driver->Aborted())
        PostCapacityRefresh();
    UpdateButtons();
}

// ---- IBurnHost ------------------------------------------------------------------------------

std::string CCDCreatorPanel::PromptText(const burn::Prompt& prompt) const {
    std::string text = g_Language.GetString(prompt.textId);
    if (!prompt.argument.empty())
        text = FormatText(text, {prompt.argument});
    return text;
}

int CCDCreatorPanel::ShowPrompt(const burn::Prompt& prompt, long buttons) {
    if (m_modeHost == nullptr)
        return buttons & wxYES_NO ? wxNO : wxCANCEL;
    long style = buttons | IconStyle(prompt.icon);
    if (prompt.defaultNo)
        style |= wxNO_DEFAULT;
    const std::string caption = prompt.captionId ? g_Language.GetString(prompt.captionId)
                                                 : GetAppConfig().GetProductStrings().productName;
    return m_modeHost->MessageBox(PromptText(prompt), caption, style);
}

bool CCDCreatorPanel::Ask(const burn::Prompt& prompt) {
    return OnUi<bool>([this, prompt] { return ShowPrompt(prompt, wxYES_NO) == wxYES; }, false);
}

bool CCDCreatorPanel::Tell(const burn::Prompt& prompt, bool okCancel) {
    return OnUi<bool>(
        [this, prompt, okCancel] {
            return ShowPrompt(prompt, okCancel ? wxOK | wxCANCEL : wxOK) == wxOK;
        },
        false);
}

burn::ICdRecorder* CCDCreatorPanel::WaitForDisc(burn::ICdRecorder* recorder, int code,
                                                std::int64_t sectors, bool showIgnore,
                                                bool& ignored) {
    bool ignoredHere = false;
    burn::ICdRecorder* result = OnUi<burn::ICdRecorder*>(
        [&, this]() -> burn::ICdRecorder* {
            return m_modeHost
                       ? m_modeHost->WaitForDisc(recorder, code, sectors, showIgnore, ignoredHere)
                       : nullptr;
        },
        nullptr);
    ignored = ignoredHere;
    return result;
}

void CCDCreatorPanel::SetStatusText(std::uint32_t textId, const std::string& argument) {
    std::string text;
    if (textId != 0) {
        text = g_Language.GetString(textId);
        if (!argument.empty())
            text = FormatText(text, {argument});
    }
    PostToUi([text](CCDCreatorPanel& self) {
        if (self.m_modeHost)
            self.m_modeHost->SetStatusText(text);
    });
}

void CCDCreatorPanel::SetProgress(int percent) {
    PostToUi([percent](CCDCreatorPanel& self) {
        if (!self.m_modeHost || !self.m_driver->BurnActive())
            return;
        CapacityBar* gauge = self.m_modeHost->Gauge();
        if (gauge == nullptr)
            return;
        // The gauge serves as the run's bar from its first step until the run ends.
        if (!self.m_gaugeShowsRun) {
            gauge->SetPlainRange(0, 100);
            self.m_gaugeShowsRun = true;
        }
        gauge->SetPosition(percent);
    });
}

void CCDCreatorPanel::EnablePanels(bool enable) {
    PostToUi([enable](CCDCreatorPanel& self) {
        self.m_panelsEnabled = enable;
        if (self.m_modeHost)
            self.m_modeHost->EnablePanels(enable);
        self.UpdateButtons();
    });
}

void CCDCreatorPanel::PostCapacityRefresh() {
    PostToUi([](CCDCreatorPanel& self) {
        if (!self.m_driver->BurnActive())
            self.RefreshCapacity();
    });
}

void CCDCreatorPanel::PostTracksUnavailable() {
    PostToUi([](CCDCreatorPanel& self) {
        self.ShowPrompt({burn::text::kTracksUnavailable,
                         burn::text::kWarningCaption,
                         burn::PromptIcon::Warning,
                         false,
                         {}},
                        wxOK);
    });
}

void CCDCreatorPanel::RunEnded(bool allCopiesWritten) {
    PostToUi([allCopiesWritten](CCDCreatorPanel& self) {
        self.m_driver->Join();
        self.RefreshCapacity();
        self.UpdateButtons();
        if (self.m_modeHost)
            self.m_modeHost->RunEnded(allCopiesWritten);
    });
}

// ---- Recorders ------------------------------------------------------------------------------

void CCDCreatorPanel::ListRecorders() {
    std::string image = GetAppConfig().GetString("burnimage");
    if (image.empty())
        image = (fs::path(platform::MusicDirectory()) / "disc").string();
    m_recorders = burn::RetryRecorder(image);
    m_selectedRecorder = m_recorders.empty() ? -1 : 0;
    FillRecorderBox();
}

void CCDCreatorPanel::FillRecorderBox() {
    // The output panel may come after this panel: the main window calls this again then.
    if (g_OutputPanel == nullptr || m_recorderBoxFilled)
        return;
    m_recorderBoxFilled = true;
    wxChoice* box = g_OutputPanel->RecorderBox();
    box->Clear();
    for (std::size_t i = 0; i < m_recorders.size(); ++i) {
        const burn::ICdRecorder& recorder = *m_recorders[i];
        const std::string label =
            recorder.IsImage()
                ? g_Language.GetString(burn::text::kDiscImage) + " (" + recorder.DriveText() + ")"
                : "[" + recorder.DriveText() + "] " + recorder.Name();
        box->Append(wxString::FromUTF8(label),
                    reinterpret_cast<void*>(static_cast<std::intptr_t>(i)));
    }
    box->SetSelection(m_selectedRecorder);
    box->Bind(wxEVT_CHOICE, [this](wxCommandEvent&) {
        m_selectedRecorder = g_OutputPanel ? g_OutputPanel->RecorderBox()->GetSelection() : -1;
        std::lock_guard lock(m_pollMutex);
        m_pollWake.notify_all();
    });
}

burn::ICdRecorder* CCDCreatorPanel::SelectedRecorder() {
    const int index = m_selectedRecorder;
    return index >= 0 && index < static_cast<int>(m_recorders.size())
               ? m_recorders[std::size_t(index)].get()
               : nullptr;
}

void CCDCreatorPanel::ShowSpeeds(const std::vector<int>& speeds) {
    if (g_OutputPanel == nullptr)
        return;
    wxChoice* box = g_OutputPanel->SpeedBox();
    box->Clear();
    if (!speeds.empty() && speeds.size() <= 100) {
        for (int speed : speeds) {
            const int multiple = speed / burn::kSpeedUnitKBps;
            char text[16];
            std::snprintf(text, sizeof text, "%2dx", multiple);
            box->Append(text, reinterpret_cast<void*>(static_cast<std::intptr_t>(multiple)));
        }
        box->SetSelection(0);
    }
    g_OutputPanel->RecalcLayout();
}

void CCDCreatorPanel::StartPoll() {
    m_poll = std::thread([this] { PollLoop(); });
}

void CCDCreatorPanel::StopPoll() {
    {
        std::lock_guard lock(m_pollMutex);
        m_pollStop = true;
    }
    m_pollWake.notify_all();
    if (m_poll.joinable())
        m_poll.join();
}

void CCDCreatorPanel::PollLoop() {
    std::int64_t lastTotal = 0, lastFree = 0;
    int lastRecorder = -2;
    std::unique_lock lock(m_pollMutex);
    while (!m_pollStop) {
        const int index = m_selectedRecorder;
        burn::ICdRecorder* recorder = index >= 0 && index < static_cast<int>(m_recorders.size())
                                          ? m_recorders[std::size_t(index)].get()
                                          : nullptr;
        // A write holds the recorder: the poll reads nothing meanwhile.
        if (recorder != nullptr && !m_driver->BurnActive()) {
            lock.unlock();
            std::int64_t total = 0, freeBlocks = 0;
            recorder->Capacity(total, freeBlocks);
            std::vector<int> speeds;
            const bool changed =
                total != lastTotal || freeBlocks != lastFree || index != lastRecorder;
            if (changed)
                speeds = recorder->WriteSpeeds();
            lock.lock();
            if (changed) {
                lastTotal = total;
                lastFree = freeBlocks;
                lastRecorder = index;
                PostToUi([speeds](CCDCreatorPanel& self) { self.ShowSpeeds(speeds); });
            }
        }
        m_pollWake.wait_for(lock, std::chrono::seconds(1), [this] { return m_pollStop; });
    }
}

}  // namespace ac
