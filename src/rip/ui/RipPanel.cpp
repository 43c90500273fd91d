// The rip panel's logic: drives and discs, rows and their sets, the commands of mode 1, and the
// driver's list and host.
#include "rip/ui/RipPanel.h"

#include "cddb/DiscFile.h"
#include "platform/Paths.h"
#include "platform/UiQueue.h"
#include "profile/ParameterSet.h"
#include "profile/TextUtil.h"
#include "resources/Language.h"
#include "resources/TextFormat.h"
#include "rip/TrackTable.h"
#include "rip/ui/RipTexts.h"
#include "shell/AppConfig.h"
#include "skin/ListCtrl.h"
#include "skin/SkinControls.h"
#include "skin/SkinLabels.h"

#include <wx/filedlg.h>
#include <wx/filename.h>
#include <wx/textctrl.h>

#include <algorithm>
#include <chrono>
#include <cstdlib>
#include <sstream>

namespace ac {

CDRipDlg* g_RipDlg = nullptr;

namespace {

constexpr int kColCheck = 0;
constexpr int kColName = 1;
constexpr int kColTrack = 2;
constexpr int kColDuration = 3;
constexpr int kColTarget = 4;
constexpr int kColStatus = 5;

// The number a parameter's text starts with: "192", "44100", "2 (Stereo)", "100%".
int LeadingNumber(const std::string& text) { return std::atoi(text.c_str()); }

std::string DurationText(int seconds) {
    char text[32];
    std::snprintf(text, sizeof text, "%02d:%02d", seconds / 60, seconds % 60);
    return text;
}

}  // namespace

// ---- Drives -------------------------------------------------------------------------------

void CDRipDlg::ReadSettings() {
    AppConfig& config = GetAppConfig();
    m_cddbFolder = cddb::LocalCddbFolder(config.GetString("localcddb"));
    // The folder is the user's data: once chosen it stays where the settings say.
    if (config.GetString("localcddb").empty()) config.SetString("localcddb", m_cddbFolder.c_str());
    for (const char* key : {"ejectcd", "lockcd", "timeout", "format", "cddborder"}) {
        config.GetInt(key);
    }
    config.GetString("remotecddb");
    config.GetString("cdimages");
}

void CDRipDlg::ListDrives() {
    const std::vector<std::string> images = platform::SplitImageList(GetAppConfig().GetString("cdimages"));
    const std::string current = m_currentDrive >= 0 && m_currentDrive < static_cast<int>(m_drives.size())
                                    ? m_drives[std::size_t(m_currentDrive)]
                                    : std::string();
    JoinWorker();
    m_drives = m_device->ListDrives(images);
    m_currentDrive = -1;
    for (std::size_t i = 0; i < m_drives.size(); ++i) {
        if (m_drives[i] == current) m_currentDrive = static_cast<int>(i);
    }
    if (m_currentDrive < 0 && !m_drives.empty()) SetCurrentDrive(0);
    UpdateButtons();
}

std::vector<std::string> CDRipDlg::DriveLabels() const {
    std::vector<std::string> labels;
    for (const std::string& drive : m_drives) {
        labels.push_back(m_device->IsImage(drive) ? wxFileName(wxString::FromUTF8(drive)).GetFullName().utf8_string()
                                                  : drive);
    }
    return labels;
}

void CDRipDlg::SetCurrentDrive(int driveIndex) {
    m_currentDrive = driveIndex;
    const std::vector<std::string> labels = DriveLabels();
    const bool valid = driveIndex >= 0 && driveIndex < static_cast<int>(labels.size());
    m_deviceButton->SetLabel(valid ? wxString::FromUTF8(labels[std::size_t(driveIndex)]) : wxString());
    m_deviceButton->SetToolTip(valid ? wxString::FromUTF8(m_drives[std::size_t(driveIndex)]) : wxString());
    RecalcLayout();
}

void CDRipDlg::ClearDisc() {
    if (m_renameEdit->IsShown()) CancelRename();
    m_driver.AbandonRun();
    m_list->DeleteAllItems();
    m_rows.clear();
    for (wxTextCtrl* box : m_boxes) box->ChangeValue(wxString());
    m_record.Clear();
    m_discId = kNoDiscId;
    m_renamed = false;
    RecountChecked();
    UpdateButtons();
}

void CDRipDlg::LoadDriveContents(int driveIndex) {
    if (driveIndex < 0 || driveIndex >= static_cast<int>(m_drives.size()) || m_driver.IsRunning()) return;
    const auto started = std::chrono::steady_clock::now();
    m_watcher.SkipNextPoll();
    m_watcher.MarkLoaded();
    m_loadTimer.Stop();
    ClearDisc();
    SetCurrentDrive(driveIndex);
    platform::DiscTable table;
    m_device->ReadToc(m_drives[std::size_t(driveIndex)], table);
    FillList(driveIndex, table);
    m_lastLoadMs = std::chrono::duration<double, std::milli>(std::chrono::steady_clock::now() - started).count();
}

void CDRipDlg::LoadFirstDisc() {
    m_loadTimer.Stop();
    if (m_driver.IsRunning()) return;
    if (!m_rows.empty()) return;
    DriveWatcher::FirstDisc first = m_watcher.LoadFirstDisc(*m_device, m_drives);
    if (first.driveIndex < 0) return;
    ClearDisc();
    SetCurrentDrive(first.driveIndex);
    FillList(first.driveIndex, first.table);
}

void CDRipDlg::FillList(int driveIndex, const platform::DiscTable& table) {
    if (!IsAudioDisc(table)) {
        UpdateButtons();
        return;
    }
    const std::string& drive = m_drives[std::size_t(driveIndex)];
    m_discId = DiscIdOf(table);
    cddb::CDDiscInfo record;
    // Names from the local record and the disc's CD-Text, in the order the settings give.
    const bool textFirst = CdTextBeforeLocalRecord(GetAppConfig().GetInt("cddborder"));
    bool haveRecord = textFirst && RecordFromCdText(table, record);
    if (!haveRecord) haveRecord = cddb::LoadDiscFile(m_cddbFolder, m_discId, record);
    if (!haveRecord && !textFirst) haveRecord = RecordFromCdText(table, record);
    const std::vector<TrackRow> tracks = BuildTrackRows(table, drive, haveRecord ? &record : nullptr);

    const Profile* profile = m_modeHost != nullptr ? m_modeHost->CurrentProfile() : nullptr;
    const int profileIndex = m_modeHost != nullptr ? m_modeHost->CurrentProfileIndex() : 0;
    m_rows.reserve(tracks.size());
    for (const TrackRow& track : tracks) {
        Row row;
        row.item.sourcePath = track.sourcePath;
        row.item.duration = track.durationSeconds;
        row.item.trackNumber = track.number;
        row.item.profileIndex = profileIndex;
        if (profile != nullptr) row.set = profile->Clone();
        ApplySetToRow(row);
        const int index = m_list->InsertItem(m_list->GetItemCount(), "");
        m_list->SetCheckbox(index, kColCheck, 1);
        m_list->SetItemText(index, kColName, track.title);
        char number[16];
        std::snprintf(number, sizeof number, "%02d", track.number);
        m_list->SetItemText(index, kColTrack, number);
        m_list->SetItemText(index, kColDuration, DurationText(track.durationSeconds));
        m_rows.push_back(std::move(row));
        WriteTarget(index);
        DrawStatus(index);
    }
    if (haveRecord) ApplyRecord(record);
    m_list->SyncRowCount();
    RecountChecked();
    UpdateButtons();
}

void CDRipDlg::ApplyRecord(const cddb::CDDiscInfo& record) {
    m_record = record;
    m_record.Fit();
    const std::string texts[4] = {m_record.artist, m_record.album, m_record.genre, m_record.year};
    for (std::size_t i = 0; i < m_boxes.size(); ++i) m_boxes[i]->ChangeValue(wxString::FromUTF8(texts[i]));
    for (int row = 0; row < RowCount(); ++row) {
        const std::string title = m_record.Title(m_rows[std::size_t(row)].item.trackNumber - 1);
        if (!title.empty()) m_list->SetItemText(row, kColName, title);
    }
    m_list->Refresh();
}

void CDRipDlg::EmptyList() {
    ClearDisc();
    StartPoll();
}

bool CDRipDlg::AddDiscImagePath(const std::string& path) {
    platform::DiscTable table;
    if (!m_device->ReadToc(path, table) || !IsAudioDisc(table)) {
        if (m_modeHost) {
            m_modeHost->ShowError(FormatText(g_Language.GetString(riptext::kNoDiscImage), {path}));
        }
        return false;
    }
    AppConfig& config = GetAppConfig();
    std::vector<std::string> images = platform::SplitImageList(config.GetString("cdimages"));
    if (std::find(images.begin(), images.end(), path) == images.end()) {
        images.push_back(path);
        config.SetString("cdimages", platform::JoinImageList(images).c_str());
    }
    ListDrives();
    const auto found = std::find(m_drives.begin(), m_drives.end(), path);
    if (found != m_drives.end()) LoadDriveContents(static_cast<int>(found - m_drives.begin()));
    return true;
}

void CDRipDlg::AddDiscImage() {
    wxFileDialog dialog(this, wxString::FromUTF8(g_Language.GetString(riptext::kAddDiscImage)),
                        wxString(), wxString(), "Disc images (*.cue;*.toc)|*.cue;*.toc;*.CUE;*.TOC|All files|*",
                        wxFD_OPEN | wxFD_FILE_MUST_EXIST);
    if (dialog.ShowModal() == wxID_OK) AddDiscImagePath(dialog.GetPath().utf8_string());
}

void CDRipDlg::ToggleTray() {
    if (m_currentDrive < 0 || m_currentDrive >= static_cast<int>(m_drives.size())) return;
    m_trayOpen = !m_trayOpen;
    m_trayButton->SetPicture(LoadSkinPicture(m_trayOpen ? "CDClose.bmp" : "CDOpen.bmp"));
    m_device->SetTrayOpen(m_drives[std::size_t(m_currentDrive)], m_trayOpen);
}

void CDRipDlg::JoinWorker() {
    if (m_worker.joinable()) m_worker.join();
}

void CDRipDlg::StartPoll() {
    // One poll at a time: a tick while the last one still reads a slow drive does nothing.
    if (m_workerBusy.exchange(true)) return;
    if (m_worker.joinable()) m_worker.join();
    std::weak_ptr<CDRipDlg*> alive = m_alive;
    m_worker = std::thread([this, alive, drives = m_drives, selected = m_currentDrive, empty = m_rows.empty()] {
        DriveWatcher::PollResult result = m_watcher.PollDrives(*m_device, drives, selected, empty);
        m_workerBusy = false;
        UiQueue::Post([alive, result] {
            if (auto self = alive.lock(); self && *self) (*self)->OnPollDone(result);
        });
    });
}

void CDRipDlg::OnPollDone(DriveWatcher::PollResult result) {
    // A poll that began before the user loaded a drive by hand may still report a new disc; a
    // list that shows one already stays as it is.
    if (result.startLoadTimer && m_rows.empty() && !m_loadTimer.IsRunning()) m_loadTimer.StartOnce(1000);
    if (result.emptySelected && !m_rows.empty()) ClearDisc();
    // Another disc in the same drive since the last poll (swapped quickly, or an image file
    // replaced): its own tracks, not the old list.
    if (result.selectedDiscId != kNoDiscId && !m_rows.empty() && result.selectedDiscId != m_discId &&
        !m_driver.IsRunning()) {
        LoadDriveContents(m_currentDrive);
    }
    if (result.disableRipButtons) UpdateButtons();
}

// ---- Rows -----------------------------------------------------------------------------------

void CDRipDlg::ApplySetToRow(Row& row) {
    if (!row.set) return;
    ParameterSet& set = *row.set;
    row.item.extension = AsciiLowerText(set.GetExtName());
    row.item.codec = set.GetValue("acodec");
    row.item.sampleRate = LeadingNumber(set.GetValue("ar"));
    row.item.channels = LeadingNumber(set.GetValue("ac"));
    row.item.bitRate = LeadingNumber(set.GetValue("ab"));
    const std::string volume = set.GetValue("vol_factor");
    row.item.volume = volume.empty() ? 100 : LeadingNumber(volume);
}

void CDRipDlg::WriteTarget(int row) {
    if (row < 0 || row >= RowCount()) return;
    m_list->SetItemText(row, kColTarget, AsciiUpper(m_rows[std::size_t(row)].item.extension));
}

void CDRipDlg::RecountChecked() {
    int seconds = 0;
    for (int row = 0; row < RowCount(); ++row) {
        if (IsChecked(row)) seconds += m_rows[std::size_t(row)].item.duration;
    }
    m_checkedSeconds = seconds;
}

void CDRipDlg::ApplyProfile(const Profile& profile, int profileIndex) {
    for (int row = 0; row < RowCount(); ++row) {
        if (!m_list->IsSelected(row)) continue;
        Row& target = m_rows[std::size_t(row)];
        target.set = profile.Clone();
        target.item.profileIndex = profileIndex;
        ApplySetToRow(target);
        WriteTarget(row);
    }
    m_list->Refresh();
}

std::vector<ParameterSet*> CDRipDlg::SelectedSets() {
    std::vector<ParameterSet*> sets;
    for (int row = 0; row < RowCount(); ++row) {
        if (m_list->IsSelected(row) && m_rows[std::size_t(row)].set) sets.push_back(m_rows[std::size_t(row)].set.get());
    }
    return sets;
}

void CDRipDlg::EditSets(const std::function<void()>& edit) {
    if (edit) edit();
    for (int row = 0; row < RowCount(); ++row) {
        if (!m_list->IsSelected(row)) continue;
        ApplySetToRow(m_rows[std::size_t(row)]);
        WriteTarget(row);
    }
}

void CDRipDlg::SetSelectedVolume(int percent) {
    for (int row = 0; row < RowCount(); ++row) {
        if (m_list->IsSelected(row)) m_rows[std::size_t(row)].item.volume = percent;
    }
}

void CDRipDlg::CheckSelected(bool check) {
    for (int row = 0; row < RowCount(); ++row) {
        if (m_list->IsSelected(row)) m_list->SetCheckbox(row, kColCheck, check ? 1 : 0);
    }
    RecountChecked();
    m_list->Refresh();
}

void CDRipDlg::CheckAll(bool check) {
    for (int row = 0; row < RowCount(); ++row) m_list->SetCheckbox(row, kColCheck, check ? 1 : 0);
    RecountChecked();
    m_list->Refresh();
}

void CDRipDlg::SelectAll(bool select) {
    if (select) {
        for (int row = 0; row < RowCount(); ++row) m_list->SelectRow(row, false);
    } else {
        m_list->SelectRow(-1, true);
    }
    SyncSelection();
    m_list->Refresh();
}

void CDRipDlg::ConfigureToAll() {
    int first = -1;
    for (int row = 0; row < RowCount() && first < 0; ++row) {
        if (m_list->IsSelected(row)) first = row;
    }
    if (first < 0) return;
    const Row& source = m_rows[std::size_t(first)];
    for (int row = 0; row < RowCount(); ++row) {
        if (row == first) continue;
        Row& target = m_rows[std::size_t(row)];
        target.set = source.set ? source.set->Clone() : nullptr;
        target.item.profileIndex = source.item.profileIndex;
        target.item.codec = source.item.codec;
        target.item.extension = source.item.extension;
        target.item.bitRate = source.item.bitRate;
        target.item.channels = source.item.channels;
        target.item.sampleRate = source.item.sampleRate;
        target.item.volume = source.item.volume;
        WriteTarget(row);
    }
    m_list->Refresh();
}

std::string CDRipDlg::DescribeRows() const {
    std::ostringstream out;
    for (int row = 0; row < m_list->GetItemCount(); ++row) {
        const Row& r = m_rows[std::size_t(row)];
        out << "row=" << m_list->GetItemText(row, kColName) << '|' << m_list->GetItemText(row, kColTrack) << '|'
            << m_list->GetItemText(row, kColDuration) << '|' << m_list->GetItemText(row, kColTarget) << '|'
            << m_list->GetItemText(row, kColStatus) << '|' << (m_list->GetCheckbox(row, kColCheck) == 1 ? 1 : 0)
            << '|' << (m_list->IsSelected(row) ? 1 : 0) << '|' << r.item.sourcePath << '\n';
    }
    return out.str();
}

// ---- Commands -------------------------------------------------------------------------------

bool CDRipDlg::IsCommandEnabled(int commandId) {
    const bool rows = !m_rows.empty();
    bool selected = false;
    for (int row = 0; row < RowCount() && !selected; ++row) selected = m_list->IsSelected(row);
    switch (commandId) {
        case ripcmd::kCddb: return rows && !m_running && !m_lookupOpen;
        // The batch needs no disc: its records are in the file.
        case ripcmd::kBatchQuery: return !m_running && !m_lookupOpen;
        case ripcmd::kReadLocal:
        case ripcmd::kReadRemote:
        case ripcmd::kReadWinamp: return rows && !m_running;
        case ripcmd::kRipChecked: return rows && (!m_running || m_paused);
        case ripcmd::kPauseChecked: return rows && m_running && !m_paused;
        case ripcmd::kStopChecked: return rows && (m_running || m_paused);
        case ripcmd::kRipSelected: return selected && !m_running;
        case ripcmd::kPauseSelected:
        case ripcmd::kStopSelected: return selected && m_running;
        case ripcmd::kCheckSelect:
        case ripcmd::kUncheckSelect:
        case ripcmd::kCheckSelected:
        case ripcmd::kUncheckSelected: return rows && selected && !m_running;
        case ripcmd::kCheckAll:
        case ripcmd::kUncheckAll: return rows && !m_running;
        case ripcmd::kSelectAll:
        case ripcmd::kSelectNone: return rows;
        case ripcmd::kConfigureToAll: return selected && !m_running;
        case ripcmd::kAddDiscImage: return !m_running;
        default:
            if (commandId >= ripcmd::kFirstMenuDrive && commandId <= ripcmd::kLastMenuDrive) return !m_running;
            return true;
    }
}

bool CDRipDlg::OnCommand(int commandId) {
    if (!IsCommandEnabled(commandId)) return false;
    switch (commandId) {
        case ripcmd::kRipChecked:
            if (!m_driver.IsRunning()) RefreshDriverSettings();
            m_driver.RipNextTrack();
            return true;
        case ripcmd::kRipSelected:
            RefreshDriverSettings();
            m_driver.RipSelected();
            return true;
        case ripcmd::kPauseChecked: m_driver.PauseRip(); return true;
        case ripcmd::kStopChecked: m_driver.StopRip(); return true;
        case ripcmd::kPauseSelected: m_driver.PauseSelected(); return true;
        case ripcmd::kStopSelected: m_driver.StopSelected(); return true;
        case ripcmd::kCheckSelect:
        case ripcmd::kCheckSelected: CheckSelected(true); return true;
        case ripcmd::kUncheckSelect:
        case ripcmd::kUncheckSelected: CheckSelected(false); return true;
        case ripcmd::kCheckAll: CheckAll(true); return true;
        case ripcmd::kUncheckAll: CheckAll(false); return true;
        case ripcmd::kSelectAll: SelectAll(true); return true;
        case ripcmd::kSelectNone: SelectAll(false); return true;
        case ripcmd::kRename:
        case ripcmd::kRenameKey: BeginRename(); return true;
        case ripcmd::kConfigureToAll: ConfigureToAll(); return true;
        case ripcmd::kAddDiscImage: AddDiscImage(); return true;
        case ripcmd::kCddb: LookupThread(); return true;
        case ripcmd::kBatchQuery: OnBatchQuery(); return true;
        case ripcmd::kReadLocal:
        case ripcmd::kReadRemote:
        case ripcmd::kReadWinamp: return true;  // kept in the menus; no source behind them
        default: break;
    }
    if (commandId >= ripcmd::kFirstMenuDrive && commandId <= ripcmd::kLastMenuDrive) {
        LoadDriveContents(commandId - ripcmd::kFirstMenuDrive);
        return true;
    }
    if (commandId >= ripcmd::kFirstButtonDrive && commandId <= ripcmd::kLastButtonDrive) {
        LoadDriveContents(commandId - ripcmd::kFirstButtonDrive);
        return true;
    }
    return false;
}

void CDRipDlg::RefreshDriverSettings() {
    // Read at the start of every run, so the preferences and the output panel count at once.
    AppConfig& config = GetAppConfig();
    RipSettings settings;
    settings.outputDirectory = config.GetString("OutputCDDir");
    settings.ejectCd = config.GetInt("ejectcd") != 0;
    settings.slowdown = config.GetInt("slowdown") != 0;
    settings.idle = config.GetInt("idle") != 0;
    settings.naming = ReadNamingSettings(config);
    settings.toolPath = platform::FindConversionTool();
    settings.toolDirectory = wxFileName(wxString::FromUTF8(settings.toolPath)).GetPath().utf8_string();
    m_driver.SetSettings(std::move(settings));
}

bool CDRipDlg::StopForClose() {
    if (!m_driver.IsRunning()) return true;
    return m_driver.StopRip(true);
}

void CDRipDlg::OnShowPanel() {
    m_pollTimer.Start(1000);
    StartPoll();
    if (!m_reselect.empty()) {
        for (int row : m_reselect) {
            if (row < RowCount()) m_list->SelectRow(row, false);
        }
        m_reselect.clear();
        SyncSelection();
    }
}

void CDRipDlg::OnHidePanel() {
    m_pollTimer.Stop();
    if (m_renameEdit->IsShown()) CancelRename();
    m_reselect.clear();
    for (int row = 1; row < RowCount(); ++row) {
        if (m_list->IsSelected(row)) m_reselect.push_back(row);
    }
}

// ---- IRipList ---------------------------------------------------------------------------------

int CDRipDlg::RowCount() { return static_cast<int>(m_rows.size()); }

bool CDRipDlg::IsChecked(int row) {
    return row >= 0 && row < RowCount() && m_list->GetCheckbox(row, kColCheck) == 1;
}

void CDRipDlg::SetChecked(int row, bool checked) {
    m_list->SetCheckbox(row, kColCheck, checked ? 1 : 0);
    RecountChecked();
}

bool CDRipDlg::IsSelected(int row) { return m_list->IsSelected(row); }

RipTrackItem* CDRipDlg::Item(int row) {
    return row >= 0 && row < RowCount() ? &m_rows[std::size_t(row)].item : nullptr;
}

std::string CDRipDlg::Title(int row) { return m_list->GetItemText(row, kColName); }

void CDRipDlg::SetStatus(int row, RipStatus status, int percent) {
    if (row < 0 || row >= RowCount()) return;
    m_rows[std::size_t(row)].status = status;
    if (status == RipStatus::Running) {
        const XListCell* cell = m_list->Cell(row, kColStatus);
        if (!cell->bProgress) m_list->SetProgress(row, kColStatus, true);
        m_list->UpdateProgress(row, kColStatus, percent);
        return;
    }
    DrawStatus(row);
}

// ---- IRipHost ---------------------------------------------------------------------------------

bool CDRipDlg::AskReRip() {
    return m_modeHost != nullptr && m_modeHost->AskYesNo(g_Language.GetString(riptext::kReRipQuestion));
}

bool CDRipDlg::AskStopRun() {
    return m_modeHost == nullptr || m_modeHost->AskYesNo(g_Language.GetString(riptext::kStopEncoding));
}

void CDRipDlg::LockTray(bool lock) {
    if (m_currentDrive >= 0 && m_currentDrive < static_cast<int>(m_drives.size())) {
        m_device->LockTray(m_drives[std::size_t(m_currentDrive)], lock);
    }
}

void CDRipDlg::OpenTray() {
    if (m_currentDrive < 0 || m_currentDrive >= static_cast<int>(m_drives.size())) return;
    m_device->SetTrayOpen(m_drives[std::size_t(m_currentDrive)], true);
    m_trayOpen = true;
    m_trayButton->SetPicture(LoadSkinPicture("CDClose.bmp"));
}

void CDRipDlg::RunStateChanged(bool running, bool paused) {
    m_running = running || paused;
    m_paused = paused;
    const bool frozen = running && !paused;
    for (int row = 0; row < RowCount(); ++row) m_list->SetEnabled(row, !frozen);
    m_deviceButton->Enable(!m_running);
    if (m_modeHost != nullptr) m_modeHost->EnableTabs(!frozen);
    if (running && !paused) {
        if (!m_progressTimer.IsRunning()) m_progressTimer.Start(250);
    } else {
        m_progressTimer.Stop();
    }
    UpdateButtons();
}

void CDRipDlg::RunFinished(int completed, int failed) {
    m_progressTimer.Stop();
    if (m_modeHost != nullptr) m_modeHost->RunFinished(completed, failed);
}

void CDRipDlg::RefreshRowParameters(int row, RipTrackItem& item) {
    if (row < 0 || row >= RowCount()) return;
    Row& target = m_rows[std::size_t(row)];
    const int volume = item.volume;
    ApplySetToRow(target);
    // The side bar's volume slider sets the row's percent without a set behind it.
    if (!target.set || target.set->GetValue("vol_factor").empty()) item.volume = volume;
}

RipDiscTexts CDRipDlg::DiscTexts() {
    return {m_boxes[0]->GetValue().utf8_string(), m_boxes[1]->GetValue().utf8_string(),
            m_boxes[2]->GetValue().utf8_string(), m_boxes[3]->GetValue().utf8_string()};
}

IProcessLog* CDRipDlg::Log() { return m_modeHost != nullptr ? m_modeHost->Log() : nullptr; }

IStatusText* CDRipDlg::Status() { return m_modeHost != nullptr ? m_modeHost->Status() : nullptr; }

}  // namespace ac
