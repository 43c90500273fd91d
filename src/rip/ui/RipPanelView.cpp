// The rip panel's window side: controls, skin, layout, the status cells, renaming in place, the
// disc boxes, the mouse and the timers.
#include "cddb/ui/CddbWaitDlg.h"
#include "medialist/ui/IconButton.h"
#include "resources/Language.h"
#include "rip/TrackTable.h"
#include "rip/ui/RipPanel.h"
#include "rip/ui/RipTexts.h"
#include "shell/MainHub.h"
#include "skin/ListCtrl.h"
#include "skin/NativeControls.h"
#include "skin/SkinGeometry.h"
#include "skin/SkinLabels.h"
#include "skin/WindowTranslation.h"

#include <wx/dcclient.h>
#include <wx/menu.h>
#include <wx/settings.h>
#include <wx/textctrl.h>
#include <wx/time.h>

#include <algorithm>

namespace ac {

namespace {

constexpr int kListId = 1065;
constexpr int kColCheck = 0;
constexpr int kColName = 1;
constexpr int kColTrack = 2;
constexpr int kColDuration = 3;
constexpr int kColTarget = 4;
constexpr int kColStatus = 5;

enum TimerId { kLoadTimer = 1, kPollTimer = 2, kProgressTimer = 3 };

struct BoxDef {
    int labelId;
    const char* label;
    int boxId;
};
// Artist, album, genre, year: the order of the record's texts.
constexpr std::array<BoxDef, 4> kBoxes = {{{1069, "Artist:", 1070},
                                           {1071, "Album:", 1074},
                                           {1072, "Genre:", 1085},
                                           {1073, "Year:", 1076}}};

constexpr std::array<IconButtonDef, 4> kRunButtons = {{{1077, "CDDB", "freedb.png"},
                                                   {1080, "Rip", "Rip.png"},
                                                   {1081, "Pause", "Pause.png"},
                                                   {1082, "Stop", "Stop.png"}}};

// None of these may stand in a name that becomes a folder or file.
constexpr std::string_view kRefusedInBoxes = "/\\:*?<>|";

XListColumn& ColumnOf(XListCtrl& list, int column) {
    return const_cast<std::vector<XListColumn>&>(list.Columns())[std::size_t(column)];
}

std::uint32_t StatusTextId(RipStatus status) {
    switch (status) {
        case RipStatus::Waiting: return riptext::kWaiting;
        case RipStatus::Completed: return riptext::kCompleted;
        case RipStatus::Failed: return riptext::kFail;
        case RipStatus::Aborted: return riptext::kAbort;
        case RipStatus::Paused: return riptext::kPause;
        default: return 0;
    }
}

}  // namespace

CDRipDlg::CDRipDlg(wxWindow* parent, std::unique_ptr<platform::IDiscDevice> device)
    : ImSkinPanel(parent, 1063, "CDRip", kRipDialogId),
      m_device(std::move(device)),
      m_driver(*this, *this),
      m_loadTimer(this, kLoadTimer),
      m_pollTimer(this, kPollTimer),
      m_progressTimer(this, kProgressTimer),
      m_alive(std::make_shared<CDRipDlg*>(this)) {
    CreateControls();
    FollowSkinColoursBelow(this);
    BindEvents();
    g_RipDlg = this;
    ReadSettings();
    ListDrives();
    OnLanguageChanged();
    UpdateButtons();
}

CDRipDlg::~CDRipDlg() {
    m_loadTimer.Stop();
    m_pollTimer.Stop();
    m_progressTimer.Stop();
    *m_alive = nullptr;
    m_alive.reset();
    JoinWorker();
    JoinAbandonedLookups();
    m_driver.AbandonRun();
    if (g_RipDlg == this) g_RipDlg = nullptr;
}

void CDRipDlg::CreateControls() {
    m_list = new XListCtrl(this, kListId);
    const std::array<std::pair<const char*, int>, 6> columns = {
        {{"", 32}, {"Name", 200}, {"Track", 40}, {"Duration", 76}, {"Target", 96}, {"Status", 72}}};
    for (std::size_t i = 0; i < columns.size(); ++i) {
        m_list->InsertColumn(static_cast<int>(i), columns[i].first, columns[i].second, i == 0);
    }
    m_deviceLabel = new ImLabel(this, 1066, "Device:");
    m_deviceButton = new ImButton(this, 1083, "");
    m_trayButton = new ImButton(this, 1068, "");
    for (std::size_t i = 0; i < kBoxes.size(); ++i) {
        m_boxLabels[i] = new ImLabel(this, kBoxes[i].labelId, kBoxes[i].label);
        m_boxes[i] = new wxTextCtrl(this, kBoxes[i].boxId, wxEmptyString);
    }
    for (std::size_t i = 0; i < kRunButtons.size(); ++i) {
        m_runButtons[i] = new ImButton(this, kRunButtons[i].id, kRunButtons[i].text);
    }
    m_renameEdit = new wxTextCtrl(m_list->Body(), 1102, wxEmptyString, wxDefaultPosition, wxDefaultSize,
                                  wxTE_PROCESS_ENTER);
    m_renameEdit->Hide();
    m_cellText = wxSystemSettings::GetColour(wxSYS_COLOUR_WINDOWTEXT);
}

void CDRipDlg::BindEvents() {
    Bind(wxEVT_TIMER, [this](wxTimerEvent& event) {
        switch (event.GetId()) {
            case kLoadTimer: LoadFirstDisc(); break;
            case kPollTimer: StartPoll(); break;
            case kProgressTimer: m_driver.RefreshProgress(); break;
            default: break;
        }
    });
    Bind(wxEVT_BUTTON, [this](wxCommandEvent& event) { OnButton(event.GetId()); });
    Bind(EVT_XLIST_HEADER_CHECK, [this](wxCommandEvent& event) {
        if (event.GetInt() == kColCheck) RecountChecked();
    });
    for (wxTextCtrl* box : m_boxes) {
        box->Bind(wxEVT_KILL_FOCUS, [this, box](wxFocusEvent& event) {
            event.Skip();
            CallAfter([this, box] { OnBoxKillFocus(box); });
        });
    }
    wxWindow* body = m_list->Body();
    body->Bind(wxEVT_LEFT_DOWN, &CDRipDlg::OnBodyLeftDown, this);
    body->Bind(wxEVT_KEY_DOWN, [this](wxKeyEvent& event) {
        if (event.GetKeyCode() == WXK_F2) {
            BeginRename();
            return;
        }
        event.Skip();
        CallAfter([this] { SyncSelection(); });
    });
    body->Bind(wxEVT_RIGHT_DOWN, [this](wxMouseEvent& event) {
        const int row = m_list->Body()->VirtualHitTest(event.GetY());
        if (row != wxNOT_FOUND && row < m_list->GetItemCount() && !m_list->IsSelected(row)) {
            m_list->SelectRow(row);
            SyncSelection();
        }
        if (IMainHub* hub = GetMainHub()) hub->ShowContextMenu(this, kRipContextMenuId);
    });
    if (wxWindow* header = m_list->Header()) {
        header->Bind(wxEVT_LEFT_DOWN, [this](wxMouseEvent& event) {
            if (!m_running) event.Skip();
        });
    }
    m_renameEdit->Bind(wxEVT_TEXT_ENTER, [this](wxCommandEvent&) { CommitRename(true); });
    m_renameEdit->Bind(wxEVT_CHAR_HOOK, [this](wxKeyEvent& event) {
        if (event.GetKeyCode() == WXK_ESCAPE) {
            CancelRename();
            return;
        }
        event.Skip();
    });
    m_renameEdit->Bind(wxEVT_KILL_FOCUS, [this](wxFocusEvent& event) {
        event.Skip();
        CallAfter([this] {
            if (m_renameEdit->IsShown() && wxWindow::FindFocus() != m_renameEdit) CancelRename();
        });
    });
}

// ---- Status cells and buttons ----------------------------------------------------------------

void CDRipDlg::DrawStatus(int row) {
    if (row < 0 || row >= RowCount() || row >= m_list->GetItemCount()) return;
    const RipStatus status = m_rows[std::size_t(row)].status;
    if (status == RipStatus::Running) return;  // the bar stays; SetStatus moves it
    m_list->DeleteProgress(row, kColStatus);
    const std::uint32_t textId = StatusTextId(status);
    const std::string text = textId != 0 ? g_Language.GetString(textId) : std::string("-");
    // Waiting, Completed and Fail have always stood in dark green.
    const bool green = status == RipStatus::Waiting || status == RipStatus::Completed ||
                       status == RipStatus::Failed;
    m_list->SetItemText(row, kColStatus, text, green ? wxColour(0, 128, 0) : m_cellText);
}

void CDRipDlg::UpdateButtons() {
    const int commands[4] = {ripcmd::kCddb, ripcmd::kRipChecked, ripcmd::kPauseChecked, ripcmd::kStopChecked};
    for (std::size_t i = 0; i < m_runButtons.size(); ++i) {
        const bool enable = IsCommandEnabled(commands[i]);
        if (m_runButtons[i]->IsEnabled() != enable) m_runButtons[i]->Enable(enable);
    }
}

void CDRipDlg::OnButton(int id) {
    switch (id) {
        case 1077: OnCommand(ripcmd::kCddb); break;
        case 1080: OnCommand(ripcmd::kRipChecked); break;
        case 1081: OnCommand(ripcmd::kPauseChecked); break;
        case 1082:
            if (m_running) m_driver.StopButton();
            break;
        case 1083: ShowDriveMenu(); break;
        case 1068: ToggleTray(); break;
        default: break;
    }
    UpdateButtons();
}

void CDRipDlg::ShowDriveMenu() {
    wxMenu menu;
    const std::vector<std::string> labels = DriveLabels();
    for (std::size_t i = 0; i < labels.size(); ++i) {
        const int id = ripcmd::kFirstButtonDrive + static_cast<int>(i);
        // The button's menu has always served five drives; the top menu serves them all.
        if (id > ripcmd::kLastButtonDrive) break;
        wxMenuItem* item = menu.AppendCheckItem(id, wxString::FromUTF8(labels[i]));
        item->Check(static_cast<int>(i) == m_currentDrive);
    }
    if (labels.empty()) menu.Append(wxID_ANY, wxString::FromUTF8(g_Language.GetString(riptext::kNoDrive)))->Enable(false);
    menu.AppendSeparator();
    menu.Append(ripcmd::kAddDiscImage, wxString::FromUTF8(g_Language.GetString(riptext::kAddDiscImage) + "..."));
    menu.Bind(wxEVT_MENU, [this](wxCommandEvent& event) { OnCommand(event.GetId()); });
    const wxPoint corner = m_deviceButton->GetPosition() + wxPoint(0, m_deviceButton->GetSize().y);
    PopupMenu(&menu, corner);
}

void CDRipDlg::OnBoxKillFocus(wxTextCtrl* box) {
    const auto found = std::find(m_boxes.begin(), m_boxes.end(), box);
    if (found == m_boxes.end()) return;
    const std::size_t index = static_cast<std::size_t>(found - m_boxes.begin());
    const std::string text = box->GetValue().utf8_string();
    if (text.find_first_of(kRefusedInBoxes) != std::string::npos) {
        // The old value stays in the record; the box keeps the text for the user to mend.
        if (m_modeHost != nullptr) {
            m_modeHost->ShowError(g_Language.GetString(riptext::kInvalidArtist + static_cast<std::uint32_t>(index)));
        }
        box->SetFocus();
        box->SelectAll();
        return;
    }
    std::string* fields[4] = {&m_record.artist, &m_record.album, &m_record.genre, &m_record.year};
    *fields[index] = text;
    m_record.Fit();
}

// ---- Renaming in place ------------------------------------------------------------------------

void CDRipDlg::BeginRename() {
    const int row = m_list->GetCurSel();
    if (row < 0 || row >= RowCount() || m_running) return;
    int x = 0;
    for (int column = 0; column < kColName; ++column) x += m_list->Columns()[std::size_t(column)].width;
    m_list->Body()->ScrollToRow(static_cast<size_t>(row));
    const int top = (row - static_cast<int>(m_list->Body()->GetVisibleRowsBegin())) * m_list->RowHeight();
    m_renameRow = row;
    m_renameEdit->SetSize(x, top, m_list->Columns()[kColName].width,
                          m_list->RowHeight() + 4);
    m_renameEdit->ChangeValue(wxString::FromUTF8(m_list->GetItemText(row, kColName)));
    m_renameEdit->Show();
    m_renameEdit->SetFocus();
    m_renameEdit->SelectAll();
}

void CDRipDlg::CommitRename(bool moveOn) {
    if (m_renameRow < 0 || m_renameRow >= RowCount()) {
        CancelRename();
        return;
    }
    // A key held down would otherwise run through the whole disc in a moment.
    const long long now = wxGetLocalTimeMillis().GetValue();
    if (now - m_lastRenameEnterMs < 100) return;
    m_lastRenameEnterMs = now;
    m_renamed = true;
    const std::string text = m_renameEdit->GetValue().utf8_string();
    m_list->SetItemText(m_renameRow, kColName, cddb::FitText(text, cddb::kTitleCapacity));
    const int next = m_renameRow + 1;
    if (moveOn && next < RowCount()) {
        m_list->SelectRow(next);
        SyncSelection();
        BeginRename();
        return;
    }
    CancelRename();
}

void CDRipDlg::CancelRename() {
    m_renameEdit->Hide();
    m_renameRow = -1;
    m_list->Body()->SetFocus();
    m_list->Refresh();
}

// ---- Mouse and selection ---------------------------------------------------------------------

void CDRipDlg::OnBodyLeftDown(wxMouseEvent& event) {
    if (m_renameEdit->IsShown()) CancelRename();
    const int row = m_list->Body()->VirtualHitTest(event.GetY());
    if (row != wxNOT_FOUND && row < m_list->GetItemCount() && event.GetX() < m_list->Columns()[kColCheck].width) {
        const SkinRect box = ListCheckBox({0, 0, m_list->Columns()[kColCheck].width, 17}, false);
        const XListCell* cell = m_list->Cell(row, kColCheck);
        if (event.GetX() >= box.x && event.GetX() < box.x + box.w) {
            if (cell->bEnabled && !m_running) SetChecked(row, cell->nCheckedState != 1);
            m_list->Refresh();
            return;
        }
    }
    event.Skip();
    CallAfter([this] { SyncSelection(); });
}

void CDRipDlg::SyncSelection() {
    int first = -1;
    for (int row = 0; row < RowCount() && first < 0; ++row) {
        if (m_list->IsSelected(row)) first = row;
    }
    if (m_modeHost != nullptr) {
        m_modeHost->SelectionChanged(first >= 0 ? m_rows[std::size_t(first)].item.profileIndex : -1);
    }
    UpdateButtons();
}

// ---- Skin, texts, layout ----------------------------------------------------------------------

void CDRipDlg::FitColumns() {
    wxClientDC dc(m_list->Body());
    dc.SetFont(m_list->Body()->GetFont());
    constexpr int kPadding = 14;
    int statusWidth = 72;
    for (RipStatus status : {RipStatus::Waiting, RipStatus::Completed, RipStatus::Failed, RipStatus::Aborted,
                             RipStatus::Paused}) {
        statusWidth = std::max(statusWidth,
                               dc.GetTextExtent(wxString::FromUTF8(g_Language.GetString(StatusTextId(status)))).x +
                                   kPadding);
    }
    ColumnOf(*m_list, kColStatus).width = statusWidth;
    ColumnOf(*m_list, kColTrack).width =
        std::max(40, dc.GetTextExtent(wxString::FromUTF8(ColumnOf(*m_list, kColTrack).text)).x + kPadding);
    int fixed = 0;
    for (int column = 0; column < m_list->GetColumnCount(); ++column) {
        if (column != kColName) fixed += m_list->Columns()[std::size_t(column)].width;
    }
    ColumnOf(*m_list, kColName).width = std::max(60, m_list->Body()->GetClientSize().x - fixed);
    m_list->Refresh();
}

void CDRipDlg::OnLanguageChanged() {
    ColumnOf(*m_list, kColName).text = g_Language.GetString(riptext::kName);
    ColumnOf(*m_list, kColTrack).text = g_Language.GetString(riptext::kTrack);
    ColumnOf(*m_list, kColDuration).text = g_Language.GetString(riptext::kDuration);
    ColumnOf(*m_list, kColTarget).text = g_Language.GetString(riptext::kTarget);
    ColumnOf(*m_list, kColStatus).text = g_Language.GetString(riptext::kStatus);
    for (std::size_t i = 0; i < m_runButtons.size(); ++i) m_runButtons[i]->SetLabel(kRunButtons[i].text);
    m_deviceLabel->SetLabel("Device:");
    for (std::size_t i = 0; i < kBoxes.size(); ++i) m_boxLabels[i]->SetLabel(kBoxes[i].label);
    TranslateWindow(*this, kRipDialogId);
    for (int row = 0; row < m_list->GetItemCount(); ++row) DrawStatus(row);
    RecalcLayout();
}

bool CDRipDlg::OnSkinChanged(const std::string& skinDir) {
    ImSkinPanel::OnSkinChanged(skinDir);
    const char* section = GetSkinSection();
    const wxFont font = MakeSkinFont(m_skin.GetFont(section));
    m_cellText = ApplyListSkin(*m_list, m_skin, section, Look().childBg);
    wxColour colours[4];
    static const char* const kColourKeys[4] = {"TextColorUp", "TextColorDown", "TextColorActive", "TextColorDisabled"};
    for (int i = 0; i < 4; ++i) colours[i] = NativeColour(m_skin.GetRgbColour(kColourKeys[i], 0, section));
    for (std::size_t i = 0; i < m_runButtons.size(); ++i) {
        m_runButtons[i]->SetPicture(LoadSkinPicture(kRunButtons[i].picture));
        m_runButtons[i]->SetFont(font);
        m_runButtons[i]->SetTextColours(colours);
    }
    m_deviceButton->SetPicture(LoadSkinPicture("CD.png"));
    m_deviceButton->SetFont(font);
    m_deviceButton->SetTextColours(colours);
    m_trayButton->SetPicture(LoadSkinPicture(m_trayOpen ? "CDClose.bmp" : "CDOpen.bmp"));
    // The boxes stand on the panel's colours, so a dark skin gets dark boxes.
    for (ImLabel* label : m_boxLabels) {
        label->SetFont(font);
        label->SetTextColour(m_cellText);
        label->SetBgColor(Look().childBg);
    }
    m_deviceLabel->SetFont(font);
    m_deviceLabel->SetTextColour(m_cellText);
    m_deviceLabel->SetBgColor(Look().childBg);
    for (wxTextCtrl* box : m_boxes) {
        box->SetFont(font);
        box->SetForegroundColour(m_cellText);
        box->SetBackgroundColour(Look().childBg);
    }
    m_renameEdit->SetFont(font);
    for (int row = 0; row < m_list->GetItemCount(); ++row) DrawStatus(row);
    RecalcLayout();
    return true;
}

void CDRipDlg::DoRecalcLayout() {
    ImSkinDialog::DoRecalcLayout();
    if (m_list == nullptr) return;
    const wxSize client = GetClientSize();
    const int left = m_metrics.LeftMargin;
    const int right = client.x - m_metrics.RightMargin;
    const int gap = m_metrics.HSpacing;
    const int vgap = std::max(2, m_metrics.VSpacing / 2);
    auto fitLabel = [](ImLabel* label) {
        const wxSize text = label->GetTextExtent(label->GetLabel());
        label->SetSize(text.x + 4, text.y + 4);
    };

    // Row 1: the device and the tray.
    fitLabel(m_deviceLabel);
    FitIconButton(*m_deviceButton, 24);
    m_trayButton->SetSize(m_trayButton->FitSize());
    const int boxHeight = m_boxes[0]->GetBestSize().y;
    const int rowHeight = std::max({boxHeight, m_deviceButton->GetSize().y, m_trayButton->GetSize().y});
    int y = m_metrics.TopMargin;
    int x = left;
    m_deviceLabel->SetPosition({x, y + (rowHeight - m_deviceLabel->GetSize().y) / 2});
    x += m_deviceLabel->GetSize().x + gap;
    const int trayWidth = m_trayButton->GetSize().x;
    const int deviceWidth = std::clamp(m_deviceButton->GetSize().x, 120, std::max(120, right - x - trayWidth - gap));
    m_deviceButton->SetSize(x, y + (rowHeight - m_deviceButton->GetSize().y) / 2, deviceWidth, m_deviceButton->GetSize().y);
    x += deviceWidth + gap;
    m_trayButton->SetPosition({x, y + (rowHeight - m_trayButton->GetSize().y) / 2});
    y += rowHeight + vgap;

    // Rows 2 and 3: artist and album, genre and year, label columns as wide as their words.
    int labelWidth = 0;
    for (ImLabel* label : m_boxLabels) {
        fitLabel(label);
        labelWidth = std::max(labelWidth, label->GetSize().x);
    }
    const int half = (right - left - gap) / 2;
    for (std::size_t i = 0; i < m_boxes.size(); ++i) {
        const int column = static_cast<int>(i % 2);
        const int rowY = y + static_cast<int>(i / 2) * (boxHeight + vgap);
        const int cellX = left + column * (half + gap);
        m_boxLabels[i]->SetSize(cellX, rowY + (boxHeight - m_boxLabels[i]->GetSize().y) / 2, labelWidth,
                                m_boxLabels[i]->GetSize().y);
        m_boxes[i]->SetSize(cellX + labelWidth + gap, rowY, std::max(20, half - labelWidth - gap), boxHeight);
    }
    y += 2 * (boxHeight + vgap);

    // The button row at the bottom, centred.
    int buttonsHeight = 0;
    int buttonsWidth = 0;
    for (ImButton* button : m_runButtons) {
        FitIconButton(*button, 24);
        buttonsHeight = std::max(buttonsHeight, button->GetSize().y);
        buttonsWidth += button->GetSize().x;
    }
    const int buttonGap = std::clamp((right - left - buttonsWidth) / 5, 2, 25);
    const int rowTop = client.y - m_metrics.BottomMargin - buttonsHeight;
    x = (left + right - buttonsWidth - 3 * buttonGap) / 2;
    for (ImButton* button : m_runButtons) {
        button->SetPosition({x, rowTop + (buttonsHeight - button->GetSize().y) / 2});
        x += button->GetSize().x + buttonGap;
    }
    m_list->SetSize(2, y, std::max(0, client.x - 4), std::max(0, rowTop - y - vgap));
    FitColumns();
}

}  // namespace ac

namespace ac {

void CDRipDlg::TypeInBox(int box, const std::string& text) {
    if (box < 0 || box >= static_cast<int>(m_boxes.size())) return;
    m_boxes[std::size_t(box)]->ChangeValue(wxString::FromUTF8(text));
    OnBoxKillFocus(m_boxes[std::size_t(box)]);
}

void CDRipDlg::RenameRow(int row, const std::string& text) {
    ClickRow(row);
    BeginRename();
    if (!m_renameEdit->IsShown()) return;
    m_renameEdit->ChangeValue(wxString::FromUTF8(text));
    m_lastRenameEnterMs = 0;
    CommitRename(false);
}

void CDRipDlg::ClickRow(int row) {
    m_list->SelectRow(row, true);
    SyncSelection();
}

std::string CDRipDlg::DescribeBoxes() const {
    std::string out;
    for (wxTextCtrl* box : m_boxes) out += box->GetValue().utf8_string() + "|";
    out += "record=" + m_record.artist + "|" + m_record.album + "|" + m_record.genre + "|" + m_record.year;
    return out;
}

}  // namespace ac
