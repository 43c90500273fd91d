#include "shell/ConvertMode.h"

#include "convert/CommandLine.h"
#include "convert/OutputNaming.h"
#include "convert/RowParameters.h"
#include "medialist/ui/MediaListWnd.h"
#include "panels/ProgramDialogs.h"
#include "platform/Paths.h"
#include "platform/UiQueue.h"
#include "panels/StatusWnd.h"
#include "resources/Language.h"
#include "resources/TextFormat.h"
#include "shell/AppConfig.h"
#include "shell/Check.h"
#include "shell/MessageBoxes.h"

#include <wx/dirdlg.h>
#include <wx/msgdlg.h>
#include <wx/window.h>

namespace ac {

namespace {

// Command ids of work mode 0: menu entries and the list panel's buttons.
namespace id {
constexpr std::uint32_t kRunProgressId = 0xC180;
constexpr std::uint32_t kRunSummaryId = 0xC181;
constexpr std::uint32_t kRunSummaryStoppedId = 0xC182;
constexpr int kAdd = 32771;
constexpr int kRemove = 32772;
constexpr int kClear = 32773;
constexpr int kEncodeChecked = 32776;
constexpr int kPauseChecked = 32777;
constexpr int kStopChecked = 32778;
constexpr int kEncodeSelected = 32779;
constexpr int kStopSelected = 32780;
constexpr int kPauseSelected = 32781;
constexpr int kCheckAll = 32782;
constexpr int kUncheckAll = 32783;
constexpr int kUncheckSelected = 33037;
constexpr int kCheckSelected = 33038;
constexpr int kShowFileInfo = 33045;
constexpr int kAddFolder = 33053;
constexpr int kSelectAll = 33055;
constexpr int kSelectNone = 33056;
constexpr int kConfigureToAll = 33065;
// The panel's buttons: Stop there keeps the run pending, so its end-of-run step follows.
constexpr int kEncodeButton = 1034;
constexpr int kPauseButton = 1009;
constexpr int kStopButton = 1012;
}  // namespace id

constexpr std::uint32_t kSelectFolderTitleId = 129;

constexpr int kOwnCommands[] = {
    id::kAdd,          id::kRemove,         id::kClear,          id::kEncodeChecked,
    id::kPauseChecked, id::kStopChecked,    id::kEncodeSelected, id::kStopSelected,
    id::kPauseSelected, id::kCheckAll,      id::kUncheckAll,     id::kUncheckSelected,
    id::kCheckSelected, id::kShowFileInfo,  id::kAddFolder,      id::kSelectAll,
    id::kSelectNone,   id::kConfigureToAll, id::kEncodeButton,   id::kPauseButton,
    id::kStopButton};

DriverConfig ReadDriverConfig() {
    AppConfig& config = GetAppConfig();
    DriverConfig driver;
    driver.maxProcesses = config.GetInt("max_processes");
    driver.maxRunningProcesses = config.GetInt("max_running_processes");
    driver.afterConvertAction = config.GetInt("afterconvert");
    driver.playSound = config.GetInt("playsound");
    driver.soundPath = config.GetString("last_wavopenpath");
    driver.slowdown = config.GetInt("slowdown") != 0;
    driver.idle = config.GetInt("idle") != 0;
    driver.toolPath = platform::FindConversionTool();
    driver.toolDirectory = config.GetBaseDirectory();
    return driver;
}

}  // namespace

CConvertMode::CConvertMode(wxWindow* mainWindow)
    : m_mainWindow(mainWindow), m_alive(std::make_shared<CConvertMode*>(this)) {}

CConvertMode::~CConvertMode() {
    Shutdown();
}

void CConvertMode::Start() {
    if (m_driver || g_MediaList == nullptr) {
        return;
    }
    // Settings are read once per run of the program; the naming keys may change in the
    // preferences, so they are read again for each row.
    OutputNamer namer = MakeRowNamer([] { return ReadNamingSettings(GetAppConfig()); });
    CommandBuilder builder = [](MediaItem& item) {
        ParameterSet* set = SetOf(item);
        if (set == nullptr) {
            return std::string();
        }
        std::string text = BuildConversionCommandText(item.sourcePath, item.outputPath,
                                                      item.volume, *set);
        RowParametersOf(item)->Refresh();
        return text;
    };
    m_driver = std::make_unique<EncodingDriver>(*g_MediaList, *this, ReadDriverConfig(),
                                                std::move(namer), std::move(builder));
    m_driver->Start();
}

void CConvertMode::ReloadSettings() {
    if (m_driver) {
        const DriverConfig config = ReadDriverConfig();
        m_driver->UpdateSettings(config.maxProcesses, config.maxRunningProcesses, config.playSound,
                                 config.soundPath, config.slowdown, config.idle);
    }
}

void CConvertMode::Shutdown() {
    m_alive.reset();
    if (!m_driver) {
        return;
    }
    m_driver->Stop();
    // The rows outlive the driver by a moment while the windows go. A child's exit must not
    // call into a driver that is gone, and one already calling must have finished: cut the
    // callbacks, end what still runs, and join every child's threads before the driver goes.
    if (g_MediaList != nullptr) {
        const std::vector<MediaItem*> items = g_MediaList->Items();
        for (MediaItem* item : items) {
            if (CEncodeProcess* process = item->process.load()) {
                process->ClearCallback();
                process->RequestStop(65535);
            }
        }
        for (MediaItem* item : items) {
            if (CEncodeProcess* process = item->process.load()) {
                process->Kill(65535);
                process->WaitForExit();
            }
        }
    }
}

bool CConvertMode::IsOwnCommand(int commandId) const {
    for (int own : kOwnCommands) {
        if (own == commandId) {
            return true;
        }
    }
    return false;
}

bool CConvertMode::OnCommand(int commandId) {
    if (!IsOwnCommand(commandId) || g_MediaList == nullptr) {
        return false;
    }
    // A command that arrives while it is greyed (a button clicked as the state changed) is
    // dropped, as its menu entry would have been.
    if (!IsCommandEnabled(commandId)) {
        return true;
    }
    CMediaListWnd& list = *g_MediaList;
    switch (commandId) {
        case id::kAdd: list.AddFiles(); break;
        case id::kAddFolder: AddFolderFromDialog(); break;
        case id::kRemove: list.Remove(); break;
        case id::kClear: list.Clear(); break;
        case id::kEncodeChecked:
        case id::kEncodeButton: m_driver->EncodeChecked(); break;
        case id::kPauseChecked:
        case id::kPauseButton: m_driver->PauseChecked(); break;
        case id::kStopChecked: m_driver->StopCheckedFromMenu(); break;
        case id::kStopButton: m_driver->StopChecked(true); break;
        case id::kEncodeSelected: m_driver->EncodeSelected(); break;
        case id::kPauseSelected: m_driver->PauseSelected(); break;
        case id::kStopSelected: m_driver->StopSelected(); break;
        case id::kCheckAll: list.CheckAll(true); break;
        case id::kUncheckAll: list.CheckAll(false); break;
        case id::kCheckSelected: list.CheckSelected(true); break;
        case id::kUncheckSelected: list.CheckSelected(false); break;
        case id::kSelectAll: list.SelectAll(true); break;
        case id::kSelectNone: list.SelectAll(false); break;
        case id::kConfigureToAll: list.ConfigureToAll(); break;
        case id::kShowFileInfo: break;  // the main dialog shows the file information window
        default: return false;
    }
    m_driver->UpdateCheckingEnabled();
    return true;
}

bool CConvertMode::IsCommandEnabled(int commandId) {
    if (!m_driver || g_MediaList == nullptr) {
        return false;
    }
    switch (commandId) {
        case id::kEncodeChecked:
        case id::kEncodeButton: return m_driver->CanEncodeChecked();
        case id::kPauseChecked:
        case id::kPauseButton: return m_driver->CanPauseChecked();
        case id::kStopChecked:
        case id::kStopButton: return m_driver->CanStopChecked();
        case id::kEncodeSelected: return m_driver->CanEncodeSelected();
        case id::kPauseSelected: return m_driver->CanPauseSelected();
        case id::kStopSelected: return m_driver->CanStopSelected();
        // Add Folder follows Add: both change the rows under a run.
        case id::kAddFolder: return g_MediaList->IsCommandEnabled(id::kAdd);
        default: return IsOwnCommand(commandId) ? g_MediaList->IsCommandEnabled(commandId) : true;
    }
}

void CConvertMode::AddFolderFromDialog() {
    wxDirDialog dialog(m_mainWindow, wxString::FromUTF8(g_Language.GetString(kSelectFolderTitleId)),
                       wxEmptyString, wxDD_DEFAULT_STYLE | wxDD_DIR_MUST_EXIST);
    if (dialog.ShowModal() != wxID_OK || dialog.GetPath().empty()) {
        return;
    }
    g_MediaList->AddFolder(dialog.GetPath().utf8_string(), -1);
}

bool CConvertMode::StopForClose() {
    if (!m_driver) {
        return true;
    }
    return m_driver->StopChecked(false);
}

void CConvertMode::CheckDiskSpace() {
    if (m_driver) {
        m_driver->CheckDiskSpace();
    }
}

void CConvertMode::SetAfterConvertAction(int action) {
    if (m_driver) {
        m_driver->SetAfterConvertAction(action);
    }
}

bool CConvertMode::AskYesNo(std::uint32_t textId) {
    return AppMessageBox(g_Language.GetString(textId), wxYES_NO | wxNO_DEFAULT | wxICON_QUESTION,
                         m_mainWindow) == wxYES;
}

void CConvertMode::ShowMessage(const std::string& text, bool isError) {
    // The driver thread asks for this in the middle of a pass; the box waits for the UI thread.
    std::weak_ptr<CConvertMode*> alive = m_alive;
    UiQueue::Post([alive, text, isError] {
        if (std::shared_ptr<CConvertMode*> self = alive.lock()) {
            AppMessageBox(text, wxOK | (isError ? wxICON_ERROR : wxICON_INFORMATION),
                          (*self)->m_mainWindow);
        }
    });
}

void CConvertMode::PostRunFinished() {
    std::weak_ptr<CConvertMode*> alive = m_alive;
    UiQueue::Post([alive] {
        if (std::shared_ptr<CConvertMode*> self = alive.lock()) {
            CConvertMode& mode = **self;
            if (!mode.m_driver) {
                return;
            }
            if (g_StatusWnd != nullptr) {
                g_StatusWnd->SetStatusText(mode.RunSummaryText());
            }
            // A run that ended by itself gives the tabs and the check boxes back, as Stop does.
            mode.m_driver->UpdateCheckingEnabled();
            mode.EnableTabStrip(true);
            mode.m_driver->OnRunFinished();
        }
    });
}

std::string CConvertMode::RunProgressText() {
    if (!m_driver) {
        return {};
    }
    const EncodingDriver::RunCounts counts = m_driver->GetRunCounts();
    return FormatText(g_Language.GetString(id::kRunProgressId),
                      {std::to_string(counts.Ended()), std::to_string(counts.total)});
}

std::string CConvertMode::RunSummaryText() {
    if (!m_driver) {
        return {};
    }
    const EncodingDriver::RunCounts counts = m_driver->GetRunCounts();
    if (counts.stopped > 0) {
        return FormatText(g_Language.GetString(id::kRunSummaryStoppedId),
                          {std::to_string(counts.completed), std::to_string(counts.failed),
                           std::to_string(counts.stopped)});
    }
    return FormatText(g_Language.GetString(id::kRunSummaryId),
                      {std::to_string(counts.completed), std::to_string(counts.failed)});
}

void CConvertMode::EnableTabStrip(bool enable) {
    if (g_Check != nullptr) {
        g_Check->Enable(enable);
    }
}

void CConvertMode::PlaySound(const std::string& /*path*/) {
    // The settings name the file, and an empty one means the program's own hint sound.
    PlayEndOfRunSound();
}

void CConvertMode::StartAfterRunAction(int action) {
    // The countdown is modal; run it after the handler that finished the run has returned.
    std::weak_ptr<CConvertMode*> alive = m_alive;
    UiQueue::Post([alive, action] {
        if (std::shared_ptr<CConvertMode*> self = alive.lock()) {
            RunAfterRunAction(action, (*self)->m_mainWindow);
        }
    });
}

}  // namespace ac
