// The creator panel's window side: controls, skin, layout, the status cells, the gauge, the
// mouse and the one-second timer.
#include "burn/BurnTexts.h"
#include "burn/ui/CDCreatorPanel.h"
#include "convert/CommandLine.h"
#include "convert/RowParameters.h"
#include "medialist/MediaListRules.h"
#include "shell/AppConfig.h"
#include "medialist/ui/IconButton.h"
#include "panels/CapacityBar.h"
#include "panels/FileAddErrorWnd.h"
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
constexpr int kTimerId = 1;

// Left to right as they stand in the row.
constexpr std::array<IconButtonDef, 7> kButtons = {{{1002, "Add", "Add.png"},
                                                {1003, "Remove", "Remove.png"},
                                                {1004, "Clear", "Clear.png"},
                                                {1135, "Burn", "Burn.png"},
                                                {1012, "Stop", "Stop.png"},
                                                {burncmd::kMoveUp, "Move up", "Moveup.png"},
                                                {burncmd::kMoveDown, "Move down", "Movedown.png"}}};
constexpr int kBurnButton = 3;
// The commands the buttons stand for.
constexpr std::array<int, 7> kButtonCommands = {
    burncmd::kAdd,  burncmd::kRemove, burncmd::kClear,   burncmd::kBurn,
    burncmd::kStop, burncmd::kMoveUp, burncmd::kMoveDown};

struct ColumnDef {
    std::uint32_t textId;
    const char* text;
    int width;
};
constexpr std::array<ColumnDef, 6> kColumns = {{{0, "", 32},
                                                {106, "Name", 200},
                                                {107, "Duration", 100},
                                                {108, "Type", 64},
                                                {109, "Target", 0},
                                                {110, "Status", 96}}};
constexpr int kColStatus = 5;

XListColumn& ColumnOf(XListCtrl& list, int column) {
    return const_cast<std::vector<XListColumn>&>(list.Columns())[std::size_t(column)];
}

wxColour StatusColour(JobStatus status, const wxColour& normal) {
    switch (status) {
        case JobStatus::Failed:
        case JobStatus::Aborted:
            return {128, 0, 0};
        case JobStatus::Completed:
            return {0, 128, 0};
        case JobStatus::UnknownFile:
            return {128, 128, 128};
        default:
            return normal;
    }
}

class CreatorDropTarget : public wxFileDropTarget {
public:
    explicit CreatorDropTarget(CCDCreatorPanel& panel) : m_panel(panel) {}
    bool OnDropFiles(wxCoord, wxCoord, const wxArrayString& names) override {
        std::vector<std::string> paths;
        for (const wxString& name : names)
            paths.push_back(name.utf8_string());
        m_panel.OnDropFiles(paths);
        return true;
    }

private:
    CCDCreatorPanel& m_panel;
};

}  // namespace

CCDCreatorPanel::CCDCreatorPanel(wxWindow* parent)
    : ImSkinPanel(parent, 1001, "CDCreatorPanel", kCreatorDialogId),
      m_timer(this, kTimerId),
      m_alive(std::make_shared<CCDCreatorPanel*>(this)) {
    m_driver = std::make_unique<burn::BurnDriver>(
        *this, *this,
        [](int row, MediaItem& item, const std::string& folder) {
            OutputNameRequest request;
            request.sourcePath = item.sourcePath;
            request.row = row;
            request.directory = folder;
            request.skipSearch = true;
            ParameterSet* set = SetOf(item);
            return set != nullptr
                       ? ReserveOutputPath(*set, request, ReadNamingSettings(GetAppConfig()))
                       : HoldOutputPath(folder + "/track" + std::to_string(row + 1) + ".wav");
        },
        [](MediaItem& item, const std::string& output) {
            ParameterSet* set = SetOf(item);
            return set != nullptr ? BuildBurnCommandText(item.sourcePath, output, item.volume, *set)
                                  : std::string();
        });
    CreateControls();
    BindEvents();
    g_CreatorPanel = this;
    OnLanguageChanged();
    SettleTemporaryFolder();
    ListRecorders();
    StartPoll();
    m_timer.Start(1000);
    UpdateButtons();
}

CCDCreatorPanel::~CCDCreatorPanel() {
    m_closing = true;
    m_timer.Stop();
    StopPoll();
    // A run still under way ends here: its questions answer No, its children go, its
    // temporary files are deleted.
    m_driver->Abandon();
    m_alive.reset();
    if (g_CreatorPanel == this)
        g_CreatorPanel = nullptr;
    std::vector<std::unique_ptr<Row>> doomed;
    {
        std::lock_guard model(m_modelMutex);
        doomed.swap(m_rows);
    }
    doomed.clear();
    if (m_refused)
        m_refused->Destroy();
}

void CCDCreatorPanel::CreateControls() {
    m_list = new XListCtrl(this, kListId);
    for (std::size_t i = 0; i < kColumns.size(); ++i)
        m_list->InsertColumn(static_cast<int>(i), kColumns[i].text, kColumns[i].width);
    for (std::size_t i = 0; i < kButtons.size(); ++i)
        m_buttons[i] = new ImButton(this, kButtons[i].id, kButtons[i].text);
    m_leftEnd = new ImPicture(this, 1225);
    m_rightEnd = new ImPicture(this, 1226);
    m_cellText = wxSystemSettings::GetColour(wxSYS_COLOUR_WINDOWTEXT);
    SetDropTarget(new CreatorDropTarget(*this));
    m_list->Body()->SetDropTarget(new CreatorDropTarget(*this));
}

void CCDCreatorPanel::BindEvents() {
    Bind(
        wxEVT_TIMER, [this](wxTimerEvent&) { UpdateButtons(); }, kTimerId);
    Bind(wxEVT_BUTTON, [this](wxCommandEvent& event) { OnButton(event.GetId()); });
    wxWindow* body = m_list->Body();
    body->Bind(wxEVT_LEFT_DOWN, [this](wxMouseEvent& event) {
        event.Skip();
        CallAfter([this] { SyncSelection(); });
    });
    body->Bind(wxEVT_KEY_DOWN, [this](wxKeyEvent& event) {
        event.Skip();
        CallAfter([this] { SyncSelection(); });
    });
    body->Bind(wxEVT_LEFT_DCLICK, [](wxMouseEvent&) {
        if (IMainHub* hub = GetMainHub())
            hub->PostCommand(burncmd::kFileInfo);
    });
    body->Bind(wxEVT_RIGHT_DOWN, [this](wxMouseEvent& event) {
        const int row = m_list->Body()->VirtualHitTest(event.GetY());
        if (row != wxNOT_FOUND && row < m_list->GetItemCount() && !m_list->IsSelected(row)) {
            m_list->SelectRow(row);
            SyncSelection();
        }
        if (IMainHub* hub = GetMainHub())
            hub->ShowContextMenu(this, kCreatorContextMenuId);
    });
}

void CCDCreatorPanel::SyncSelection() {
    bool changed = false;
    {
        std::lock_guard model(m_modelMutex);
        for (std::size_t i = 0; i < m_rows.size(); ++i) {
            const bool now = m_list->IsSelected(static_cast<int>(i));
            changed |= now != m_rows[i]->selected;
            m_rows[i]->selected = now;
        }
    }
    if (changed && m_modeHost)
        m_modeHost->SelectionChanged();
    UpdateButtons();
}

void CCDCreatorPanel::UpdateButtons() {
    for (std::size_t i = 0; i < kButtons.size(); ++i) {
        const bool enable = IsCommandEnabled(kButtonCommands[i]);
        if (m_buttons[i]->IsEnabled() != enable)
            m_buttons[i]->Enable(enable);
    }
}

void CCDCreatorPanel::OnButton(int id) {
    for (std::size_t i = 0; i < kButtons.size(); ++i)
        if (kButtons[i].id == id)
            OnCommand(kButtonCommands[i]);
}

void CCDCreatorPanel::DrawStatus(int row, int percent) {
    MediaItem* item = Item(row);
    if (item == nullptr || row >= m_list->GetItemCount())
        return;
    const JobStatus status = item->Status();
    if (status == JobStatus::Running) {
        if (!m_list->Cell(row, kColStatus)->bProgress)
            m_list->SetProgress(row, kColStatus, true);
        m_list->UpdateProgress(row, kColStatus, std::clamp(percent, 0, 100));
        return;
    }
    m_list->DeleteProgress(row, kColStatus);
    const std::uint32_t id = status == JobStatus::Idle ? 0 : StatusTextId(status);
    m_list->SetItemText(row, kColStatus, id != 0 ? g_Language.GetString(id) : std::string("-"),
                        StatusColour(status, m_cellText));
}

void CCDCreatorPanel::FitColumns() {
    const int width = m_list->Body()->GetClientSize().x;
    ColumnOf(*m_list, 1).width = std::max(60, width - 292);
    m_list->Refresh();
}

void CCDCreatorPanel::ApplyProfile(const Profile& profile) {
    m_currentProfile = &profile;
    // A disc type stands for a format: a change of it reaches every row; a profile of the same
    // format only the selected ones.
    for (int row = 0; row < m_list->GetItemCount(); ++row) {
        MediaItem* item = Item(row);
        ParameterSet* set = item != nullptr ? SetOf(*item) : nullptr;
        if (item == nullptr || (set != nullptr && set->GetName() == profile.GetName()))
            continue;
        const bool otherFormat = set == nullptr || set->GetExtName() != profile.GetExtName();
        if (!otherFormat && !m_list->IsSelected(row))
            continue;
        if (RowParameters* params = RowParametersOf(*item)) {
            params->Replace(profile.Clone());
        } else {
            item->parameters = std::make_unique<RowParameters>(profile.Clone());
        }
        ApplyTags(*SetOf(*item), &item->info);
        RowParametersOf(*item)->Refresh();
        m_list->SetItemText(row, 4, TargetColumnText(SetOf(*item)->GetSName()));
    }
    RefreshCapacity();
}

std::vector<ParameterSet*> CCDCreatorPanel::SelectedSets() {
    std::vector<ParameterSet*> sets;
    for (int row = 0; row < m_list->GetItemCount(); ++row) {
        MediaItem* item = m_list->IsSelected(row) ? Item(row) : nullptr;
        if (ParameterSet* set = item != nullptr ? SetOf(*item) : nullptr)
            sets.push_back(set);
    }
    return sets;
}

void CCDCreatorPanel::RefreshCapacity() {
    CapacityBar* gauge = m_modeHost ? m_modeHost->Gauge() : nullptr;
    if (gauge == nullptr || m_driver->BurnActive())
        return;
    m_gaugeShowsRun = false;
    const bool audio = m_modeHost->DiscTypeItem() == 0;
    const burn::CapacityScale scale = burn::ScaleForDisc(audio);
    if (audio) {
        gauge->SetText(wxEmptyString);
        gauge->SetPosition(m_tally.minutes);
    }
    gauge->SetMarks(scale.nearMark, scale.overMark, scale.maxMark);
    gauge->SetTickStep(scale.tickStep);
    gauge->SetUnitText(wxString::FromUTF8(g_Language.GetString(burn::text::kMinuteUnit)));
    if (!audio)
        gauge->SetPosition(m_tally.minutes);
    gauge->Refresh(false);
}

std::string CCDCreatorPanel::DescribeRows() const {
    std::string out;
    std::lock_guard model(m_modelMutex);
    for (int row = 0; row < m_list->GetItemCount() && row < static_cast<int>(m_rows.size());
         ++row) {
        const XListCell* status = m_list->Cell(row, kColStatus);
        const std::string statusText =
            status->bProgress ? std::to_string(status->nProgressPercent) + "%" : status->text;
        out += m_list->GetItemText(row, 0) + "\t" + m_list->GetItemText(row, 1) + "\t" +
               m_list->GetItemText(row, 2) + "\t" + m_list->GetItemText(row, 3) + "\t" +
               statusText + "\t" + (m_list->IsSelected(row) ? "1" : "0") + "\t" +
               m_rows[std::size_t(row)]->item->sourcePath + "\n";
    }
    return out;
}

void CCDCreatorPanel::OnLanguageChanged() {
    for (std::size_t i = 1; i < kColumns.size(); ++i)
        ColumnOf(*m_list, static_cast<int>(i)).text = g_Language.GetString(kColumns[i].textId);
    for (std::size_t i = 0; i < kButtons.size(); ++i)
        m_buttons[i]->SetLabel(kButtons[i].text);
    TranslateWindow(*this, kCreatorDialogId);
    if (m_refused)
        m_refused->OnLanguageChanged();
    for (int row = 0; row < m_list->GetItemCount(); ++row)
        DrawStatus(row, 0);
    m_list->Refresh();
}

bool CCDCreatorPanel::OnSkinChanged(const std::string& skinDir) {
    ImSkinPanel::OnSkinChanged(skinDir);
    const char* section = GetSkinSection();
    const wxFont font = MakeSkinFont(m_skin.GetFont(section));
    m_cellText = ApplyListSkin(*m_list, m_skin, section, Look().childBg);
    wxColour colours[4];
    static const char* const kColourKeys[4] = {"TextColorUp", "TextColorDown", "TextColorActive",
                                               "TextColorDisabled"};
    for (int i = 0; i < 4; ++i)
        colours[i] = NativeColour(m_skin.GetRgbColour(kColourKeys[i], 0, section));
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
    m_buttonRowHeight = m_skin.GetInt("ButtonHeight", 69, section);
    for (int row = 0; row < m_list->GetItemCount(); ++row)
        DrawStatus(row, 0);
    RecalcLayout();
    return true;
}

void CCDCreatorPanel::DoRecalcLayout() {
    ImSkinDialog::DoRecalcLayout();
    if (m_list == nullptr)
        return;
    const wxSize client = GetClientSize();
    const int room =
        client.x - 2 * m_endSpacing - m_leftEnd->GetSize().x - m_rightEnd->GetSize().x - 8;
    // First the arrows of the two moves go without their words, then the list's own Add,
    // Remove and Clear, then Burn and Stop too.
    static constexpr int kWordlessFrom[7] = {2, 2, 2, 3, 3, 1, 1};
    const std::vector<wxSize> sizes = FitButtonRowWords(m_buttons, kWordlessFrom, room, 6, 24);
    int tallest = std::max(m_leftEnd->GetSize().y, m_rightEnd->GetSize().y);
    for (const wxSize& size : sizes)
        tallest = std::max(tallest, size.y);
    const int rowHeight = std::max(tallest, std::min(m_buttonRowHeight, tallest + 16));
    const int rowTop = client.y - m_metrics.BottomMargin - rowHeight;
    const int centre = rowTop + rowHeight / 2;
    const wxSize left = m_leftEnd->GetSize();
    const wxSize right = m_rightEnd->GetSize();
    m_leftEnd->SetSize(m_endSpacing, centre - left.y / 2, left.x, left.y);
    m_rightEnd->SetSize(client.x - m_endSpacing - right.x, centre - right.y / 2, right.x, right.y);
    m_list->SetSize(2, 2, std::max(0, client.x - 4), std::max(0, rowTop - 4));

    // Burn a little right of the middle; Clear, Remove, Add to its left 25 apart; Stop 15 to its
    // right, then the two moves 20 apart. A narrow row closes the gaps evenly.
    const int rowLeft = m_endSpacing + left.x;
    const int rowRight = client.x - m_endSpacing - right.x;
    int total = 0;
    for (const wxSize& size : sizes)
        total += size.x;
    double squeeze = 1.0;
    if (const int room = rowRight - rowLeft - total - 8; room < 3 * 25 + 15 + 2 * 20)
        squeeze = std::max(0.1, room / 130.0);
    auto gap = [&](int pixels) { return std::max(2, static_cast<int>(pixels * squeeze)); };
    std::array<int, 7> x{};
    x[kBurnButton] = rowLeft + 30 + (rowRight - rowLeft - 40) / 2 - sizes[kBurnButton].x / 2;
    for (int i = kBurnButton - 1; i >= 0; --i)
        x[std::size_t(i)] = x[std::size_t(i) + 1] - gap(25) - sizes[std::size_t(i)].x;
    x[4] = x[3] + sizes[3].x + gap(15);
    x[5] = x[4] + sizes[4].x + gap(20);
    x[6] = x[5] + sizes[5].x + gap(20);
    int shift = 0;
    if (x[0] < rowLeft)
        shift = rowLeft - x[0];
    else if (x[6] + sizes[6].x > rowRight)
        shift = std::max(rowLeft - x[0], rowRight - (x[6] + sizes[6].x));
    for (std::size_t i = 0; i < kButtons.size(); ++i)
        m_buttons[i]->SetSize(x[i] + shift, centre - sizes[i].y / 2, sizes[i].x, sizes[i].y);
    FitColumns();
}

}  // namespace ac
