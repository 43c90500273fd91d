#include "shell/Preferences.h"
#include "shell/TestHook.h"

#include "burn/ui/CDCreatorPanel.h"
#include "burn/ui/DiscDialogs.h"
#include "cddb/ui/CddbSelectDlg.h"
#include "cddb/ui/CddbWaitDlg.h"
#include "rip/ui/RipPanel.h"

#include "shell/AudioEncDlg.h"

#include "convert/RowParameters.h"
#include "medialist/ui/MediaListWnd.h"
#include "medialist/ui/OutputPanelWnd.h"
#include "panels/FileAddErrorWnd.h"
#include "panels/FileInfoWnd.h"
#include "panels/PlayerWnd.h"
#include "panels/StatusWnd.h"
#include "profile/ParameterSet.h"
#include "profile/ui/ParameterGrid.h"
#include "profile/ui/SideBarWnd.h"
#include "resources/Language.h"
#include "shell/Check.h"
#include "shell/ConvertMode.h"
#include "shell/MenuTables.h"
#include "shell/MessageBoxes.h"
#include "skin/NativeControls.h"
#include "skin/ChooseSkinDlg.h"
#include "skin/ListCtrl.h"
#include "skin/ShutDownDlg.h"
#include "skin/SkinManager.h"
#include "skin/SkinMenu.h"

#include <wx/dialog.h>
#include <wx/textctrl.h>
#include <wx/time.h>
#include <wx/timer.h>
#include <wx/weakref.h>

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <fstream>
#include <sstream>
#include <string>

namespace ac {

namespace {

class TestHookTimer : public wxTimer {
public:
    TestHookTimer(CAudioEncDlg* dialog, std::string dir)
        : m_dialog(dialog), m_dir(std::move(dir)) {}

    void Notify() override {
        if (!m_dialog) {
            Stop();
            return;
        }
        const std::string commands = m_dir + "/command.txt";
        std::ifstream in(commands);
        std::string text;
        if (in) {
            std::ostringstream whole;
            whole << in.rdbuf();
            text = whole.str();
            in.close();
        }
        // A shell's `echo close > command.txt` creates the file before it writes: a file that
        // does not end its last line yet is still being written and is read on the next tick.
        if (!text.empty() && text.back() == '\n') {
            std::remove(commands.c_str());
            std::istringstream lineStream(text);
            std::string line;
            std::vector<std::string> lines;
            while (std::getline(lineStream, line)) {
                lines.push_back(line);
            }
            // Each command runs from the event loop, not from this timer: a command that opens
            // a modal dialog must leave the timer free to deliver the next one to it.
            for (const std::string& command : lines) {
                if (!m_dialog) {
                    return;
                }
                wxWeakRef<CAudioEncDlg> dialog = m_dialog;
                m_dialog->CallAfter([dialog, command] {
                    if (dialog) {
                        CTestHook::RunScriptCommand(*dialog, command);
                    }
                });
            }
        }
        if (!m_dialog) {
            return;
        }
        const std::string state = CTestHook::DescribeState(*m_dialog);
        if (state != m_lastState) {
            m_lastState = state;
            std::ofstream out(m_dir + "/state.tmp", std::ios::trunc);
            out << state << "end\n";
            out.close();
            std::rename((m_dir + "/state.tmp").c_str(), (m_dir + "/state.txt").c_str());
        }
    }

private:
    wxWeakRef<CAudioEncDlg> m_dialog;
    std::string m_dir;
    std::string m_lastState;
};

}  // namespace

std::string CTestHook::DescribeState(const CAudioEncDlg& dlg) {
    std::ostringstream out;
    const wxRect r = dlg.GetRect();
    out << "title=" << dlg.GetTitle().utf8_string() << "\n";
    out << "rect=" << r.x << "," << r.y << "," << r.width << "," << r.height << "\n";
    out << "mode=" << dlg.GetWorkMode() << "\n";
    out << "fields=" << CurrentNativeControlColours().background.GetAsString(wxC2S_HTML_SYNTAX)
        << "/" << CurrentNativeControlColours().text.GetAsString(wxC2S_HTML_SYNTAX) << "\n";
    static const char* const kNames[CAudioEncDlg::PanelCount] = {"MediaList",   "CDCreatorPanel", "OutputPanel",
                                                   "PlayerPanel", "CDRip",          "SideBar",
                                                   "StatusBar"};
    out << "visible=";
    for (int i = 0; i < CAudioEncDlg::PanelCount; ++i) {
        if (dlg.m_panels[std::size_t(i)] != nullptr && dlg.m_panels[std::size_t(i)]->IsShown()) {
            out << kNames[i] << ";";
        }
    }
    out << "\nmade=";
    for (int i = 0; i < CAudioEncDlg::PanelCount; ++i) {
        if (dlg.m_panels[std::size_t(i)] != nullptr) {
            out << kNames[i] << ";";
        }
    }
    out << "\n";
    if (ImMenuBar* bar = const_cast<CAudioEncDlg&>(dlg).GetSkinMenuBar(false);
        bar != nullptr && bar->GetMenu() != nullptr) {
        ImMenu* menu = bar->GetMenu();
        out << "menu=" << menu->resourceId << "\n";
        out << "menuopen=" << (bar->Popup() != nullptr && bar->Popup()->IsPopupShown() ? 1 : 0) << "\n";
        out << "captions=";
        for (const auto& [caption, popup] : menu->tops) {
            out << caption.utf8_string() << "|";
        }
        out << "\n";
        if (wxMenuItem* exit = menu->tops[0].second->FindChildItem(cmd::kExit)) {
            out << "exit=" << exit->GetItemLabel().utf8_string() << "\n";
        }
    }
    out << "tabs=";
    for (int i = 0; i < 3; ++i) {
        out << dlg.m_check->Tab(i)->GetLabel().utf8_string()
            << (dlg.m_check->Tab(i)->IsEnabled() ? "+" : "-") << "|";
    }
    out << "\n";
    out << "skin=" << g_Skin.GetSkinName() << "\n";
    out << "language=" << g_Language.GetLanguageName() << "\n";
    out << "corners=" << (dlg.HasFlag(wxFRAME_SHAPED) ? 1 : 0) << "\n";
    out << "maximized=" << (dlg.IsMaximized() ? 1 : 0) << "\n";
    DescribePanels(dlg, out);
    if (const CPreferencesSheet* sheet = CPreferencesSheet::Shown()) {
        out << sheet->Describe();
    }
    out << "firstpaint_ms=" << dlg.m_firstPaintMs << "\n";
    out << "resize_ms=" << dlg.m_lastBench << "\n";
    return out.str();
}

void CTestHook::DescribePanels(const CAudioEncDlg& dlg, std::ostream& out) {
    if (g_MediaList != nullptr) {
        // Tab-separated: a cue track's type and source hold a '|' of their own.
        XListCtrl* list = g_MediaList->List();
        const std::vector<MediaItem*> items = g_MediaList->Items();
        for (int row = 0; row < list->GetItemCount() && row < static_cast<int>(items.size());
             ++row) {
            MediaItem& item = *items[std::size_t(row)];
            out << "row" << row << "=";
            for (int column = 1; column <= 5; ++column) {
                out << list->GetItemText(row, column) << "\t";
            }
            out << (list->GetCheckbox(row, 0) == 1 ? 1 : 0) << "\t"
                << (list->IsSelected(row) ? 1 : 0) << "\t" << item.sourcePath << "\t"
                << static_cast<int>(item.Status()) << "\n";
            if (ParameterSet* set = SetOf(item)) {
                out << "set" << row << "=";
                for (const char* key : {"ab", "ar", "ac", "vol_factor", "acodec"}) {
                    out << key << ":" << set->GetValue(key) << ";";
                }
                out << "volume:" << item.volume.load() << "\n";
            }
        }
    }
    if (g_RipDlg != nullptr) {
        // Tab-separated like the conversion rows: name, track, duration, target, status text,
        // checked, selected, source.
        std::istringstream rows(g_RipDlg->DescribeRows());
        std::string row;
        for (int index = 0; std::getline(rows, row); ++index) {
            std::replace(row.begin(), row.end(), '|', '\t');
            out << "riprow" << index << "=" << row.substr(4) << "\n";
        }
        const std::vector<std::string> drives = g_RipDlg->Drives();
        const int current = g_RipDlg->CurrentDrive();
        out << "ripdrive=" << (current >= 0 && current < static_cast<int>(drives.size()) ? drives[std::size_t(current)] : "")
            << "\n";
        out << "ripdrives=" << drives.size() << "\n";
        out << "ripboxes=" << g_RipDlg->DescribeBoxes() << "\n";
        out << "riprunning=" << (g_RipDlg->Driver().IsRunning() ? 1 : 0) << "\n";
        out << "riploadms=" << g_RipDlg->LastLoadMs() << "\n";
        out << "ripdiscid=" << std::hex << g_RipDlg->DiscId() << std::dec << "\n";
        out << "cddblookup=" << (g_RipDlg->IsLookupOpen() ? 1 : 0) << "\n";
    }
    if (g_CreatorPanel != nullptr) {
        // Tab-separated: number, name, duration, type, status, selected, source.
        std::istringstream rows(g_CreatorPanel->DescribeRows());
        std::string row;
        for (int index = 0; std::getline(rows, row); ++index) out << "burnrow" << index << "=" << row << "\n";
        out << "burntally=" << g_CreatorPanel->Tally().minutes << ":" << g_CreatorPanel->Tally().seconds << "\n";
        out << "burnactive=" << (g_CreatorPanel->Driver().BurnActive() ? 1 : 0) << "\n";
        out << "burnrecorders=" << g_CreatorPanel->Recorders().size() << "\n";
        // Add, Remove, Clear, Burn, Stop, Move up, Move down: 1 where the command is enabled.
        out << "burnenabled=";
        for (int id : {burncmd::kAdd, burncmd::kRemove, burncmd::kClear, burncmd::kBurn, burncmd::kStop,
                       burncmd::kMoveUp, burncmd::kMoveDown})
            out << (g_CreatorPanel->IsCommandEnabled(id) ? 1 : 0);
        out << "\n";
        if (CFileAddErrorWnd* refused = g_CreatorPanel->RefusedWindow()) {
            std::string text = refused->RichEdit()->GetValue().utf8_string();
            std::replace(text.begin(), text.end(), '\n', '|');
            std::erase(text, '\r');
            out << "refused=" << text << "\n";
        }
    }
    if (CWaitingDiscDlg* waiting = CWaitingDiscDlg::Shown()) {
        std::string text = waiting->Describe();
        std::replace(text.begin(), text.end(), '\n', ' ');
        out << "waitingdisc=" << text << "\n";
    }
    if (CEraseRewritableDiscDlg* erase = CEraseRewritableDiscDlg::Shown()) {
        out << "erasedisc=" << erase->Describe() << "\n";
    }
    if (CCddbWaitDlg* lookup = CCddbWaitDlg::Shown()) {
        out << lookup->Describe();
    }
    if (CCddbSelectDlg* select = CCddbSelectDlg::Shown()) {
        out << "cddbselect=";
        for (const std::string& row : select->Rows()) out << row << "|";
        out << "\n";
    }
    if (g_OutputPanel != nullptr) {
        out << "outdir=" << g_OutputPanel->GetOutputDirectory() << "\n";
    }
    if (g_SideBar != nullptr) {
        out << g_SideBar->DescribeState() << "\n";
    }
    if (g_StatusWnd != nullptr) {
        out << g_StatusWnd->DescribeState() << "\n";
    }
    if (g_PlayerWnd != nullptr) {
        out << g_PlayerWnd->DescribeState();
    }
    // The window is made the first time it is shown.
    out << "fileinfo_shown=" << (g_FileInfoWnd != nullptr && g_FileInfoWnd->IsShown() ? 1 : 0)
        << "\n";
    if (g_FileInfoWnd != nullptr) {
        out << "fileinfo_bytes=" << g_FileInfoWnd->PageText().size() << "\n";
        out << "fileinfo_ms=" << g_FileInfoWnd->LastShowMs() << "\n";
    }
    std::string boxes;
    for (std::string text : ShownBoxes()) {
        std::replace(text.begin(), text.end(), '\n', ' ');
        boxes += text + "|";
    }
    out << "boxes=" << boxes << "\n";
    bool countdown = false;
    for (wxWindow* window : wxTopLevelWindows) {
        if (dynamic_cast<ImShutDownDlg*>(window) != nullptr && window->IsShown()) {
            countdown = true;
        }
    }
    out << "countdown=" << (countdown ? 1 : 0) << "\n";
    out << "running=" << (dlg.m_convert && dlg.m_convert->Driver() ? dlg.m_convert->Driver()->ProcessCount() : 0)
        << "\n";
}

void CTestHook::RunScriptCommand(CAudioEncDlg& dlg, const std::string& line) {
    std::istringstream in(line);
    std::string verb;
    in >> verb;
    std::string rest;
    std::getline(in >> std::ws, rest);
    in.clear();
    in.str(rest);
    // A script may fill the rip or burn list before it opens the tab.
    if (verb.rfind("burn", 0) == 0) {
        dlg.EnsureModePanel(2);
    } else if (verb.rfind("rip", 0) == 0) {
        dlg.EnsureModePanel(1);
    }
    if (verb == "add" && g_MediaList != nullptr) {
        g_MediaList->AddFile(rest, -1);
    } else if (verb == "addfolder" && g_MediaList != nullptr) {
        g_MediaList->AddFolder(rest, -1);
    } else if (verb == "outdir" && g_OutputPanel != nullptr) {
        g_OutputPanel->SetDirectoryText(rest);
        g_OutputPanel->CommitDirectory();
    } else if (verb == "answer") {
        QueueBoxAnswer(rest == "no" ? wxNO : wxYES);
    } else if (verb == "dialog") {
        // Presses OK or Cancel of the modal dialog in front; the program's own dialogs keep
        // the resource ids 1 and 2 for them.
        const bool ok = rest == "ok";
        for (wxWindow* window : wxTopLevelWindows) {
            auto* dialog = dynamic_cast<wxDialog*>(window);
            if (dialog == nullptr || !dialog->IsModal()) {
                continue;
            }
            const int okIds[] = {1, wxID_OK};
            const int cancelIds[] = {2, wxID_CANCEL};
            for (int id : ok ? okIds : cancelIds) {
                if (wxWindow* button = dialog->FindWindow(id)) {
                    wxCommandEvent press(wxEVT_BUTTON, id);
                    press.SetEventObject(button);
                    button->GetEventHandler()->ProcessEvent(press);
                    return;
                }
            }
            dialog->EndModal(ok ? wxID_OK : wxID_CANCEL);
            return;
        }
    } else if (verb == "select" && g_MediaList != nullptr) {
        int row = -1;
        in >> row;
        g_MediaList->SelectOnly(row);
    } else if (verb == "grid" && g_SideBar != nullptr) {
        // An edit in the advanced grid, committed as the grid's own editor commits it.
        std::string key;
        std::string value;
        in >> key;
        std::getline(in >> std::ws, value);
        ParameterGrid* grid = g_SideBar->Grid();
        const PropertyIterator item = grid->FindById(FindParameterIndex(key));
        if (item.IsValid()) {
            grid->Select(item);
            grid->CommitEditText(value);
        }
    } else if (verb == "dialogtext") {
        // Types into the first edit field of the modal dialog in front.
        for (wxWindow* window : wxTopLevelWindows) {
            auto* dialog = dynamic_cast<wxDialog*>(window);
            if (dialog == nullptr || !dialog->IsModal()) {
                continue;
            }
            for (wxWindow* child : dialog->GetChildren()) {
                if (auto* edit = dynamic_cast<wxTextCtrl*>(child)) {
                    edit->SetValue(wxString::FromUTF8(rest));
                    break;
                }
            }
            break;
        }
    } else if (verb == "prefset" && CPreferencesSheet::Shown() != nullptr) {
        // prefset PAGE ID VALUE: a control of a preferences page set as a user would.
        std::size_t page = 0;
        int id = 0;
        in >> page >> id;
        std::string value;
        std::getline(in >> std::ws, value);
        const auto pages = CPreferencesSheet::Shown()->Pages();
        if (page < pages.size()) {
            pages[page]->SetControl(id, value);
        }
    } else if (verb == "prefapply" && CPreferencesSheet::Shown() != nullptr) {
        CPreferencesSheet::Shown()->ApplyAll();
    } else if (verb == "saveas" && g_SideBar != nullptr) {
        g_SideBar->SaveProfile(true);
    } else if (verb == "rename" && g_SideBar != nullptr) {
        g_SideBar->RenameProfile();
    } else if (verb == "delete" && g_SideBar != nullptr) {
        g_SideBar->DeleteProfile();
    } else if (verb == "profile" && g_SideBar != nullptr) {
        int index = 0;
        in >> index;
        g_SideBar->SelectIndex(index, true);
    } else if (verb == "burnadd" && g_CreatorPanel != nullptr) {
        g_CreatorPanel->AddFile(rest, -1);
    } else if (verb == "burnselect" && g_CreatorPanel != nullptr) {
        std::vector<int> rows;
        for (int row; in >> row;) rows.push_back(row);
        g_CreatorPanel->SelectRows(rows);
    } else if (verb == "disctype" && g_SideBar != nullptr) {
        int type = 0;
        in >> type;
        g_SideBar->SelectDiscType(type);
    } else if (verb == "waitcheck" && CWaitingDiscDlg::Shown() != nullptr) {
        CWaitingDiscDlg::Shown()->CheckNow();
    } else if (verb == "erase" && CEraseRewritableDiscDlg::Shown() != nullptr) {
        CEraseRewritableDiscDlg::Shown()->PressErase(rest == "full");
    } else if (verb == "ripimage" && g_RipDlg != nullptr) {
        g_RipDlg->AddDiscImagePath(rest);
    } else if (verb == "ripbox" && g_RipDlg != nullptr) {
        int box = 0;
        in >> box;
        std::string text;
        std::getline(in >> std::ws, text);
        g_RipDlg->TypeInBox(box, text);
    } else if (verb == "riprename" && g_RipDlg != nullptr) {
        int row = 0;
        in >> row;
        std::string text;
        std::getline(in >> std::ws, text);
        g_RipDlg->RenameRow(row, text);
    } else if (verb == "ripclick" && g_RipDlg != nullptr) {
        int row = 0;
        in >> row;
        g_RipDlg->ClickRow(row);
    } else if (verb == "cddbchoose" && CCddbSelectDlg::Shown() != nullptr) {
        int row = 0;
        in >> row;
        CCddbSelectDlg::Shown()->ChooseRow(row);
    } else if ((verb == "cddbok" || verb == "cddbcancel") && CCddbWaitDlg::Shown() != nullptr) {
        if (verb == "cddbok") {
            CCddbWaitDlg::Shown()->PressOk();
        } else {
            CCddbWaitDlg::Shown()->PressCancel();
        }
    } else if (verb == "tab") {
        int mode = 0;
        in >> mode;
        dlg.SwitchMode(mode);
    } else if (verb == "command") {
        int id = 0;
        in >> id;
        // 1012 is also the conversion list's Stop button: it goes to the player while that plays.
        if (g_PlayerWnd != nullptr && (id != CPlayerWnd::kStopId || g_PlayerWnd->IsPlaying()) &&
            g_PlayerWnd->OnCommand(id)) {
            return;
        }
        wxCommandEvent command(wxEVT_MENU, id);
        dlg.OnCommand(command);
    } else if (verb == "skin") {
        std::string name;
        in >> name;
        for (const auto& [id, dir] : dlg.m_skinCommands) {
            if (SkinNameOf(dir) == name) {
                // The command rebuilds the menu and this map: leave the loop first.
                wxCommandEvent command(wxEVT_MENU, id);
                dlg.OnCommand(command);
                break;
            }
        }
    } else if (verb == "language") {
        std::string name;
        in >> name;
        for (const auto& [id, language] : dlg.m_languageCommands) {
            if (language == name) {
                wxCommandEvent command(wxEVT_MENU, id);
                dlg.OnCommand(command);
                break;
            }
        }
    } else if (verb == "move") {
        int x = 0, y = 0, w = 0, h = 0;
        in >> x >> y >> w >> h;
        dlg.SetSize(x, y, w, h);
    } else if (verb == "menu") {
        int index = 0;
        std::string key;
        in >> index >> key;
        if (ImMenuBar* bar = dlg.GetSkinMenuBar(false)) {
            bar->OpenByIndex(index);
            if (!key.empty() && bar->Popup() != nullptr) {
                // "down" and "right" walk the open popup as the keyboard does.
                for (char c : key) {
                    bar->Popup()->OnKey(c == 'd' ? WXK_DOWN : c == 'r' ? WXK_RIGHT : WXK_UP);
                }
            }
        }
    } else if (verb == "press" || verb == "key") {
        // A mouse press on the list, or Escape with the list focused, sent as the toolkit sends
        // them, so application-wide filters see them too.
        wxWindow* target = g_MediaList != nullptr ? static_cast<wxWindow*>(g_MediaList->List()) : &dlg;
        if (verb == "press") {
            wxMouseEvent press(wxEVT_LEFT_DOWN);
            press.SetEventObject(target);
            press.SetId(target->GetId());
            target->GetEventHandler()->ProcessEvent(press);
        } else {
            wxKeyEvent escape(wxEVT_KEY_DOWN);
            escape.m_keyCode = WXK_ESCAPE;
            escape.SetEventObject(target);
            target->GetEventHandler()->ProcessEvent(escape);
        }
    } else if (verb == "advanced" && g_SideBar != nullptr) {
        g_SideBar->ApplyMode(rest != "off");
    } else if (verb == "maximize") {
        dlg.Maximize(rest != "off");
    } else if (verb == "benchresize") {
        // Repaint time after a resize, for bench/skin_bench.sh: each step resizes and paints.
        int steps = 50;
        in >> steps;
        const wxRect start = dlg.GetRect();
        const wxLongLong begin = wxGetUTCTimeUSec();
        for (int i = 0; i < steps; ++i) {
            dlg.SetSize(start.width + (i % 10) * 12, start.height + (i % 7) * 9);
            dlg.Update();
        }
        const double perStep = (wxGetUTCTimeUSec() - begin).ToDouble() / 1000.0 / steps;
        dlg.SetSize(start);
        dlg.m_lastBench = perStep;
    } else if (verb == "close") {
        dlg.Close();
    }
}


void StartTestHook(CAudioEncDlg* dialog) {
    const char* dir = std::getenv("AUDIOCONV_TEST_DIR");
    if (dir == nullptr || *dir == '\0') {
        return;
    }
    // Lives as long as the program; it stops itself when the window is gone.
    static TestHookTimer* timer = new TestHookTimer(dialog, dir);
    timer->Start(100);
}

}  // namespace ac
