// The conversion list's window side: controls, skin, layout, the status cells, the mouse and
// the one-second timer.
#include "convert/RowParameters.h"
#include "medialist/MediaListRules.h"
#include "medialist/ui/IconButton.h"
#include "medialist/ui/MediaListWnd.h"
#include "profile/ParameterSet.h"
#include "resources/Language.h"
#include "shell/MainHub.h"
#include "skin/ListCtrl.h"
#include "skin/SkinGeometry.h"
#include "skin/SkinLabels.h"
#include "skin/WindowTranslation.h"

#include <wx/dcclient.h>
#include <wx/dnd.h>
#include <wx/settings.h>

#include <algorithm>

namespace ac {

namespace {

constexpr int kListId = 1001;
// Left to right as they stand in the row.
constexpr std::array<IconButtonDef, 6> kButtons = {{{1002, "Add", "add.png"},
                                                {1003, "Remove", "remove.png"},
                                                {1004, "Clear", "clear.png"},
                                                {1034, "Encode", "encode.png"},
                                                {1009, "Pause", "pause.png"},
                                                {1012, "Stop", "stop.png"}}};
constexpr int kEncode = 3;

struct ColumnDef {
    std::uint32_t textId;
    const char* text;
    int width;
};
constexpr std::array<ColumnDef, 6> kColumns = {{{0, "", 32},
                                                {106, "Name", 200},
                                                {107, "Duration", 76},
                                                {108, "Type", 40},
                                                {109, "Target", 96},
                                                {110, "Status", 72}}};

// XListCtrl offers no setter for a column once inserted; its columns are plain records.
XListColumn& ColumnOf(XListCtrl& list, int column) {
    return const_cast<std::vector<XListColumn>&>(list.Columns())[std::size_t(column)];
}

wxColour StatusColour(JobStatus status, const wxColour& normal) {
    switch (status) {
        case JobStatus::Failed:
        case JobStatus::Aborted: return {128, 0, 0};
        case JobStatus::Completed: return {0, 128, 0};
        case JobStatus::UnknownFile: return {128, 128, 128};
        default: return normal;
    }
}

std::string StatusText(JobStatus status) {
    if (status == JobStatus::Idle) {
        return "-";
    }
    const std::uint32_t id = StatusTextId(status);
    return id != 0 ? g_Language.GetString(id) : std::string();
}

class ListDropTarget : public wxFileDropTarget {
public:
    explicit ListDropTarget(CMediaListWnd& list) : m_list(list) {}
    bool OnDropFiles(wxCoord, wxCoord, const wxArrayString& names) override {
        std::vector<std::string> paths;
        for (const wxString& name : names) {
            paths.push_back(name.utf8_string());
        }
        m_list.OnDropFiles(paths);
        return true;
    }

private:
    CMediaListWnd& m_list;
};

}  // namespace

void CMediaListWnd::CreateControls() {
    m_list = new XListCtrl(this, kListId);
    for (std::size_t i = 0; i < kColumns.size(); ++i) {
        m_list->InsertColumn(static_cast<int>(i), kColumns[i].text, kColumns[i].width, i == 0);
    }
    for (std::size_t i = 0; i < kButtons.size(); ++i) {
        m_buttons[i] = new ImButton(this, kButtons[i].id, kButtons[i].text);
    }
    m_leftEnd = new ImPicture(this, 1225);
    m_rightEnd = new ImPicture(this, 1226);
    m_cellText = wxSystemSettings::GetColour(wxSYS_COLOUR_WINDOWTEXT);
    SetDropTarget(new ListDropTarget(*this));
    m_list->Body()->SetDropTarget(new ListDropTarget(*this));
}

void CMediaListWnd::BindEvents() {
    Bind(wxEVT_TIMER, [this](wxTimerEvent&) { OnTimer(); }, 1);
    Bind(wxEVT_BUTTON, [this](wxCommandEvent& event) { OnButton(event.GetId()); });
    Bind(EVT_XLIST_HEADER_CHECK, [this](wxCommandEvent& event) {
        if (event.GetInt() != kColCheck) {
            return;
        }
        const bool check = event.GetExtraLong() == 2;
        std::lock_guard model(m_modelMutex);
        for (auto& row : m_rows) {
            row->checked = check;
        }
    });
    wxWindow* body = m_list->Body();
    body->Bind(wxEVT_LEFT_DOWN, &CMediaListWnd::OnBodyLeftDown, this);
    body->Bind(wxEVT_KEY_DOWN, [this](wxKeyEvent& event) {
        event.Skip();
        CallAfter([this] { SyncSelection(); });
    });
    body->Bind(wxEVT_LEFT_DCLICK, [](wxMouseEvent&) {
        if (IMainHub* hub = GetMainHub()) {
            hub->PostCommand(33045);
        }
    });
    body->Bind(wxEVT_RIGHT_DOWN, [this](wxMouseEvent& event) {
        const int row = m_list->Body()->VirtualHitTest(event.GetY());
        if (row != wxNOT_FOUND && row < m_list->GetItemCount() && !m_list->IsSelected(row)) {
            m_list->SelectRow(row);
            SyncSelection();
        }
        if (IMainHub* hub = GetMainHub()) {
            hub->ShowContextMenu(this, kMediaListContextMenuId);
        }
    });
    if (wxWindow* header = m_list->Header()) {
        header->Bind(wxEVT_LEFT_DOWN, &CMediaListWnd::OnHeaderLeftDown, this);
    }
}

void CMediaListWnd::OnBodyLeftDown(wxMouseEvent& event) {
    const int row = m_list->Body()->VirtualHitTest(event.GetY());
    if (row != wxNOT_FOUND && row < m_list->GetItemCount() &&
        event.GetX() < m_list->Columns()[kColCheck].width) {
        // The box is centred in its cell; across the row's height any point of its span counts.
        const SkinRect box = ListCheckBox({0, 0, m_list->Columns()[kColCheck].width, 17}, false);
        const XListCell* cell = m_list->Cell(row, kColCheck);
        if (event.GetX() >= box.x && event.GetX() < box.x + box.w) {
            if (cell->bEnabled) {
                SetRowChecked(row, cell->nCheckedState != 1);
            }
            return;
        }
    }
    event.Skip();
    // The list changes its selection in its own handler, which runs after this one.
    CallAfter([this] { SyncSelection(); });
}

void CMediaListWnd::OnHeaderLeftDown(wxMouseEvent& event) {
    if (m_checkingEnabled) {
        event.Skip();
    }
}

void CMediaListWnd::SyncSelection() {
    int becameSelected = -1;
    bool lostAny = false;
    {
        std::lock_guard model(m_modelMutex);
        for (std::size_t i = 0; i < m_rows.size(); ++i) {
            const bool now = m_list->IsSelected(static_cast<int>(i));
            if (now != m_rows[i]->selected.exchange(now)) {
                if (now) {
                    becameSelected = static_cast<int>(i);
                } else {
                    lostAny = true;
                }
            }
        }
    }
    NotifySelection(becameSelected, lostAny);
}

void CMediaListWnd::NotifySelection(int becameSelected, bool lostAny) {
    IMainHub* hub = GetMainHub();
    if (hub == nullptr || (becameSelected < 0 && !lostAny)) {
        return;
    }
    hub->OnListSelectionChanged(becameSelected);
    if (becameSelected >= 0) {
        ApplyBitRateRule();
    }
    UpdateButtons();
}

void CMediaListWnd::ApplyBitRateRule() {
    IMainHub* hub = GetMainHub();
    MediaItem* item = GetItem(GetFirstSelected());
    ParameterSet* set = item != nullptr ? SetOf(*item) : nullptr;
    if (hub != nullptr && set != nullptr) {
        hub->SetBitRateAllowed(BitRateAllowedFor(set->GetExtName()));
    }
}

void CMediaListWnd::DrawStatus(int row) {
    MediaItem* item = GetItem(row);
    if (item == nullptr || row >= m_list->GetItemCount()) {
        return;
    }
    const JobStatus status = item->Status();
    const XListCell* cell = m_list->Cell(row, kColStatus);
    if (status == JobStatus::Running) {
        if (!cell->bProgress || !cell->progressFormat.empty()) {
            m_list->SetProgress(row, kColStatus, true);
        }
        m_list->UpdateProgress(row, kColStatus, std::clamp(ProgressPercent(*item), 0, 100));
    } else if (status == JobStatus::Paused || status == JobStatus::Pending) {
        m_list->SetProgress(row, kColStatus, true, StatusText(status));
        if (item->process.load() != nullptr) {
            m_list->UpdateProgress(row, kColStatus, ProgressPercent(*item));
        }
    } else {
        m_list->DeleteProgress(row, kColStatus);
        m_list->SetItemText(row, kColStatus, StatusText(status), StatusColour(status, m_cellText));
    }
}

void CMediaListWnd::OnTimer() {
    for (int row = 0; row < m_list->GetItemCount(); ++row) {
        MediaItem* item = GetItem(row);
        if (item == nullptr || item->process.load() == nullptr ||
            item->Status() != JobStatus::Running) {
            continue;
        }
        if (!m_list->Cell(row, kColStatus)->bProgress) {
            DrawStatus(row);
        }
        m_list->UpdateProgress(row, kColStatus, std::clamp(ProgressPercent(*item), 0, 100));
    }
    UpdateButtons();
}

void CMediaListWnd::UpdateButtons() {
    IMainHub* hub = GetMainHub();
    static constexpr std::array<int, 6> kCommands = {32771, 32772, 32773, 32776, 32777, 32778};
    for (std::size_t i = 0; i < kButtons.size(); ++i) {
        const bool enable = i < kEncode ? IsCommandEnabled(kCommands[i])
                                        : hub != nullptr && hub->IsCommandEnabled(kCommands[i]);
        if (m_buttons[i]->IsEnabled() != enable) {
            m_buttons[i]->Enable(enable);
        }
    }
}

void CMediaListWnd::OnButton(int id) {
    switch (id) {
        case 1002: AddFiles(); break;
        case 1003: Remove(); break;
        case 1004: Clear(); break;
        case 1034:
        case 1009:
        case 1012:
            // The main dialog runs them: the Stop button, unlike the menu entry, keeps the run's
            // end-of-run step, so the button's own id travels.
            if (IMainHub* hub = GetMainHub()) {
                hub->PostCommand(id);
            }
            break;
        default: break;
    }
}

void CMediaListWnd::FitColumns() {
    // Status words and the duration are as wide as the language and the font make them
    // ("Abgeschlossen" in German): measured, so none is cut. The name takes the rest.
    wxClientDC dc(m_list->Body());
    dc.SetFont(m_list->Body()->GetFont());
    constexpr int kPadding = 14;
    auto widest = [&](int column, std::initializer_list<std::string> texts) {
        int best = dc.GetTextExtent(wxString::FromUTF8(ColumnOf(*m_list, column).text)).x;
        for (const std::string& text : texts) {
            best = std::max(best, dc.GetTextExtent(wxString::FromUTF8(text)).x);
        }
        return best + kPadding;
    };
    std::initializer_list<std::string> noTexts = {};
    std::vector<std::string> statusWords;
    for (int status = -1; status <= 8; ++status) {
        if (const std::uint32_t id = StatusTextId(static_cast<JobStatus>(status))) {
            statusWords.push_back(g_Language.GetString(id));
        }
    }
    int statusWidth = widest(kColStatus, noTexts);
    for (const std::string& word : statusWords) {
        statusWidth = std::max(statusWidth, dc.GetTextExtent(wxString::FromUTF8(word)).x + kPadding);
    }
    ColumnOf(*m_list, kColStatus).width = std::max(kColumns[kColStatus].width, statusWidth);
    ColumnOf(*m_list, kColDuration).width = std::max(kColumns[kColDuration].width, widest(kColDuration, {"00:00:00"}));
    int fixed = 0;
    for (int column = 0; column < static_cast<int>(kColumns.size()); ++column) {
        if (column != kColName) {
            fixed += ColumnOf(*m_list, column).width;
        }
    }
    const int width = m_list->Body()->GetClientSize().x;
    ColumnOf(*m_list, kColName).width = std::max(60, width - fixed);
    m_list->Refresh();
}

void CMediaListWnd::OnLanguageChanged() {
    for (std::size_t i = 1; i < kColumns.size(); ++i) {
        ColumnOf(*m_list, static_cast<int>(i)).text = g_Language.GetString(kColumns[i].textId);
    }
    for (std::size_t i = 0; i < kButtons.size(); ++i) {
        m_buttons[i]->SetLabel(kButtons[i].text);
    }
    TranslateWindow(*this, kMediaListDialogId);
    for (int row = 0; row < m_list->GetItemCount(); ++row) {
        DrawStatus(row);
    }
    m_list->Refresh();
}

bool CMediaListWnd::OnSkinChanged(const std::string& skinDir) {
    ImSkinPanel::OnSkinChanged(skinDir);
    const char* section = GetSkinSection();
    const wxFont font = MakeSkinFont(m_skin.GetFont(section));
    m_cellText = ApplyListSkin(*m_list, m_skin, section, Look().childBg);
    wxColour colours[4];
    static const char* const kColourKeys[4] = {"TextColorUp", "TextColorDown", "TextColorActive",
                                               "TextColorDisabled"};
    for (int i = 0; i < 4; ++i) {
        colours[i] = NativeColour(m_skin.GetRgbColour(kColourKeys[i], 0, section));
    }
    for (std::size_t i = 0; i < kButtons.size(); ++i) {
        m_buttons[i]->SetPicture(LoadSkinPicture(kButtons[i].picture));
        m_buttons[i]->SetFont(font);
        m_buttons[i]->SetTextColours(colours);
    }
    m_leftEnd->SetPicture(LoadSkinPicture("RipLeft.bmp"));
    m_leftEnd->FitToPicture();
    m_rightEnd->SetPicture(LoadSkinPicture("RipRight.png"));
    m_rightEnd->FitToPicture();
    m_endSpacing = m_skin.GetInt("EncodeButtonHSpacing", m_metrics.HSpacing, section);
    for (int row = 0; row < m_list->GetItemCount(); ++row) {
        DrawStatus(row);
    }
    RecalcLayout();
    return true;
}

void CMediaListWnd::DoRecalcLayout() {
    ImSkinDialog::DoRecalcLayout();
    if (m_list == nullptr) {
        return;
    }
    const wxSize client = GetClientSize();
    // Add, Remove and Clear go without their words first when a translation is too long for
    // the row, then Encode, Pause and Stop too.
    static constexpr int kWordlessFrom[6] = {1, 1, 1, 2, 2, 2};
    const int room = client.x - 2 * m_endSpacing - m_leftEnd->GetSize().x -
                     m_rightEnd->GetSize().x - 8;
    const std::vector<wxSize> sizes = FitButtonRowWords(m_buttons, kWordlessFrom, room, 6, 24);
    int rowHeight = std::max(m_leftEnd->GetSize().y, m_rightEnd->GetSize().y);
    for (const wxSize& size : sizes) {
        rowHeight = std::max(rowHeight, size.y);
    }
    const int rowTop = client.y - m_metrics.BottomMargin - rowHeight;
    const wxSize left = m_leftEnd->GetSize();
    const wxSize right = m_rightEnd->GetSize();
    m_leftEnd->SetSize(m_endSpacing, rowTop + (rowHeight - left.y) / 2, left.x, left.y);
    m_rightEnd->SetSize(client.x - m_endSpacing - right.x, rowTop + (rowHeight - right.y) / 2,
                        right.x, right.y);
    m_list->SetSize(2, 2, std::max(0, client.x - 4), std::max(0, rowTop - 4));

    const int rowLeft = m_endSpacing + left.x;
    const int rowRight = client.x - m_endSpacing - right.x;
    // The gaps are 25 pixels (10 between Pause and Stop) while the row fits; a narrow window or
    // long words close them up evenly.
    int buttonsWidth = 0;
    for (const wxSize& size : sizes) {
        buttonsWidth += size.x;
    }
    int gap = 25;
    int lastGap = 10;
    if (const int room = rowRight - rowLeft - buttonsWidth - 8; room < 4 * gap + lastGap) {
        gap = std::max(2, room / 5);
        lastGap = std::min(lastGap, gap);
    }
    std::array<int, 6> x{};
    x[kEncode] = (rowLeft + rowRight) / 2 + 30 - sizes[kEncode].x / 2;
    for (int i = kEncode - 1; i >= 0; --i) {
        x[std::size_t(i)] = x[std::size_t(i) + 1] - gap - sizes[std::size_t(i)].x;
    }
    x[4] = x[3] + sizes[3].x + gap;
    x[5] = x[4] + sizes[4].x + lastGap;
    // Words beside the glyphs make the row wider than the skin's pictures alone; a translation
    // can push it past an end picture, so the row moves back inside, Encode off centre.
    int shift = 0;
    if (x[0] < rowLeft) {
        shift = rowLeft - x[0];
    } else if (x[5] + sizes[5].x > rowRight) {
        shift = std::max(rowLeft - x[0], rowRight - (x[5] + sizes[5].x));
    }
    for (int& left : x) {
        left += shift;
    }
    for (std::size_t i = 0; i < kButtons.size(); ++i) {
        m_buttons[i]->SetSize(x[i], rowTop + (rowHeight - sizes[i].y) / 2, sizes[i].x,
                              sizes[i].y);
    }
    FitColumns();
}

}  // namespace ac
