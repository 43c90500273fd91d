#include "profile/ui/SideBarWnd.h"

#include "profile/ui/ParameterGrid.h"
#include "resources/Language.h"
#include "shell/AppConfig.h"
#include "shell/MainHub.h"
#include "skin/NativeControls.h"
#include "skin/SkinControls.h"
#include "skin/SkinLabels.h"
#include "skin/SkinPicture.h"
#include "skin/WindowTranslation.h"

#include <wx/choice.h>
#include <wx/textctrl.h>

#include <algorithm>

namespace ac {

using namespace sidebar;

CSideBarWnd* g_SideBar = nullptr;

namespace {

constexpr std::uint32_t kMonoText = 142;
constexpr std::uint32_t kStereoText = 143;
constexpr std::uint32_t kDiscTypeTexts[] = {0xC08E, 0xC08F, 0xC090};
constexpr std::uint32_t kNewDiscText = 0xC091;

// Default texts of dialog 136; a language file may replace each by its control id.
struct DefaultText {
    int id;
    const char* text;
};
constexpr DefaultText kDefaultTexts[] = {
    {kProfileLabel, "Profile:"},
    {kAdvanced, "Advanced"},
    {kSimple, "Simple"},
    {kSaveProfile, "SaveProfile"},
    {kBitRateLabel, "Bit Rate:"},
    {kSampleRateLabel, "Sample Rate:"},
    {kVolumeLabel, "Volume:"},
    {kChannelsLabel, "Channels:"},
    {kVolumeNameLabel, "Juanbiao:"},
    {kAlbumLabel, "Album:"},
    {kArtistLabel, "Artist:"},
    {kTitleLabel, "Title:"},
    {kIntervalLabel, "Interval:"},
    {kBalance, "Balance"},
};

wxString Wx(const std::string& text) {
    return wxString::FromUTF8(text);
}

}  // namespace

CSideBarWnd::CSideBarWnd(wxWindow* parent)
    : ImSkinPanel(parent, kSideBarPanelId, "SideBar", kSideBarDialogId),
      m_self(std::make_shared<CSideBarWnd*>(this)) {
    g_SideBar = this;
    CreateControls();
    FollowSkinColoursBelow(this);
    BindEvents();
    m_grid->ShowComment(true);
    m_grid->EnableToolTips(true);
    m_grid->SetGridLineColor(wxColour(125, 156, 197), false);
    m_grid->SetCommentHeight(GetAppConfig().GetInt("prop_comments_height", nullptr, 52));
    m_grid->SetLabelColumnWidth(GetAppConfig().GetInt("prop_second_column_width", nullptr, 90));
    m_grid->SetValueListener([this](const std::string& key, const std::string& value) {
        OnSimpleValueMapped(key, value);
    });
    OnLanguageChanged();
    const bool burn = GetAppConfig().GetInt("last_run_function", nullptr, 0) == 2;
    m_profileSelector->Show(!burn);
    if (burn) {
        EnsureDiscControls();
        m_discType->Show();
    }
    m_grid->Hide();
    m_advancedButton->Enable(true);
    m_simpleButton->Enable(false);
    ApplyMode(false);
    StartCatalogueLoad();
}

CSideBarWnd::~CSideBarWnd() {
    StopCatalogueLoad();
    if (g_SideBar == this)
        g_SideBar = nullptr;
}

void CSideBarWnd::CreateControls() {
    m_profileLabel = new ImLabel(this, kProfileLabel, "Profile:");
    m_advancedButton = new ImButton(this, kAdvanced, "Advanced");
    m_simpleButton = new ImButton(this, kSimple, "Simple");
    // Sized at birth: a native list asked for its best size measures its every entry.
    m_profileSelector = new wxChoice(this, kProfileSelector, wxDefaultPosition, wxSize(40, 20));
    m_saveButton = new ImButton(this, kSaveProfile, "SaveProfile");
    // The skin draws this one as a menu glyph; its words would not fit beside the selector.
    m_saveButton->SetTextShown(false);
    m_grid = new ParameterGrid(this, kGrid);

    m_bitRateLabel = new ImLabel(this, kBitRateLabel, "Bit Rate:");
    m_bitRateSlider = new ImTickSlider(this, kBitRateSlider);
    m_sampleRateLabel = new ImLabel(this, kSampleRateLabel, "Sample Rate:");
    m_sampleRateSlider = new ImTickSlider(this, kSampleRateSlider);
    m_volumeLabel = new ImLabel(this, kVolumeLabel, "Volume:");
    m_volumeSlider = new ImTickSlider(this, kVolumeSlider);
    m_channelsLabel = new ImLabel(this, kChannelsLabel, "Channels:");
    m_channels = new wxChoice(this, kChannels, wxDefaultPosition, wxSize(40, 20));
    m_simpleGroup = {m_bitRateLabel, m_bitRateSlider, m_sampleRateLabel, m_sampleRateSlider,
                     m_volumeLabel,  m_volumeSlider,  m_channelsLabel,   m_channels};

    m_bitRateSlider->SetRange(0, static_cast<int>(kBitRates.size()) - 1);
    m_bitRateSlider->SetTicks(static_cast<int>(kBitRates.size()) - 1);
    m_bitRateSlider->SetPos(kBitRateStart);
    m_sampleRateSlider->SetRange(0, static_cast<int>(kSampleRates.size()) - 1);
    m_sampleRateSlider->SetTicks(static_cast<int>(kSampleRates.size()) - 1);
    m_sampleRateSlider->SetPos(kSampleRateStart);
    m_volumeSlider->SetRange(0, kVolumePositions - 1);
    m_volumeSlider->SetTicks(kVolumePositions - 1);
    m_volumeSlider->SetPos(kVolumeStart);
}

// The burn mode's controls (the disc type, the audio disc's boxes, the data disc's name) are
// made when that mode first shows: most starts never need them, and native boxes are dear.
void CSideBarWnd::EnsureDiscControls() {
    if (m_discType != nullptr)
        return;
    m_discType = new wxChoice(this, kDiscType);
    m_volumeNameLabel = new ImLabel(this, kVolumeNameLabel, "Juanbiao:");
    m_volumeName = new wxTextCtrl(this, kVolumeName, Wx(g_Language.GetString(kNewDiscText)));
    const std::pair<int, int> discRows[] = {
        {kAlbumLabel, kAlbum}, {kArtistLabel, kArtist}, {kTitleLabel, kTitle}};
    for (const auto& [labelId, editId] : discRows) {
        m_discLabels.push_back(new ImLabel(this, labelId, ""));
        m_discGroup.push_back(m_discLabels.back());
        m_discGroup.push_back(new wxTextCtrl(this, editId, ""));
    }
    m_discLabels.push_back(new ImLabel(this, kIntervalLabel, "Interval:"));
    m_discGroup.push_back(m_discLabels.back());
    m_interval = new wxChoice(this, kInterval);
    for (const char* seconds : {"0", "1", "2", "3", "5"})
        m_interval->Append(seconds);
    m_interval->SetSelection(1);
    m_discGroup.push_back(m_interval);
    m_balance = new ImCheckBox(this, kBalance, "Balance");
    m_discGroup.push_back(m_balance);
    for (wxWindow* control : std::initializer_list<wxWindow*>{m_discType, m_volumeName, m_interval})
        FollowSkinColours(control);
    for (wxWindow* control : m_discGroup)
        if (dynamic_cast<wxTextCtrl*>(control) != nullptr)
            FollowSkinColours(control);
    m_discType->Hide();
    m_volumeNameLabel->Hide();
    m_volumeName->Hide();
    ShowGroup(m_discGroup, false);
    TranslateLabels();
    TranslateDiscControls();
    DressDiscControls();
    RecalcLayout();
}

void CSideBarWnd::TranslateDiscControls() {
    if (m_discType == nullptr)
        return;
    const int discType = m_discType->GetSelection();
    m_discType->Clear();
    for (std::uint32_t id : kDiscTypeTexts)
        m_discType->Append(Wx(g_Language.GetString(id)));
    m_discType->SetSelection(discType == wxNOT_FOUND ? 0 : discType);
}

void CSideBarWnd::BindEvents() {
    Bind(
        wxEVT_BUTTON, [this](wxCommandEvent&) { OnAdvancedPressed(true); }, kAdvanced);
    Bind(
        wxEVT_BUTTON, [this](wxCommandEvent&) { OnAdvancedPressed(false); }, kSimple);
    Bind(
        wxEVT_BUTTON, [this](wxCommandEvent&) { ShowProfileMenu(); }, kSaveProfile);
    Bind(
        wxEVT_CHOICE, [this](wxCommandEvent&) { OnProfileSelected(GetSelectedIndex()); },
        kProfileSelector);
    Bind(
        wxEVT_CHOICE, [this](wxCommandEvent&) { SelectDiscType(GetDiscType()); }, kDiscType);
    Bind(
        wxEVT_CHOICE, [this](wxCommandEvent&) { OnChannelsChosen(); }, kChannels);
    Bind(
        wxEVT_MENU, [this](wxCommandEvent&) { SaveProfile(false); }, kCmdSave);
    Bind(
        wxEVT_MENU, [this](wxCommandEvent&) { SaveProfile(true); }, kCmdSaveAs);
    Bind(
        wxEVT_MENU, [this](wxCommandEvent&) { RenameProfile(); }, kCmdRename);
    Bind(
        wxEVT_MENU, [this](wxCommandEvent&) { DeleteProfile(); }, kCmdDelete);
    // A slider takes effect when the mouse lets it go, not while it moves.
    for (ImTickSlider* slider : {m_bitRateSlider, m_sampleRateSlider, m_volumeSlider}) {
        slider->Bind(wxEVT_LEFT_DOWN, [this, slider](wxMouseEvent& event) {
            m_pressedSlider = slider->GetId();
            event.Skip();
        });
        slider->Bind(wxEVT_LEFT_UP, [this, slider](wxMouseEvent& event) {
            event.Skip();
            if (m_pressedSlider == slider->GetId()) {
                m_pressedSlider = 0;
                OnSliderReleased(slider->GetId());
            }
        });
    }
    Bind(
        wxEVT_UPDATE_UI, [this](wxUpdateUIEvent&) { UpdateEnabling(); }, kSideBarPanelId);
}

void CSideBarWnd::TranslateLabels() {
    // Back to the built-in words first, so a language without these texts shows English.
    for (const DefaultText& entry : kDefaultTexts) {
        if (wxWindow* control = FindWindow(entry.id))
            control->SetLabel(entry.text);
    }
    TranslateWindow(*this, m_nDialogId);
}

void CSideBarWnd::OnLanguageChanged() {
    TranslateLabels();
    const int channels = m_channels->GetSelection();
    m_channels->Clear();
    m_channels->Append(Wx(g_Language.GetString(kMonoText)));
    m_channels->Append(Wx(g_Language.GetString(kStereoText)));
    m_channels->SetSelection(channels == wxNOT_FOUND ? kChannelsStart : channels);
    TranslateDiscControls();
    RebuildSelectorTexts();
    SetBitRateLabel(m_bitRateShown);
    SetSampleRateLabel(m_sampleRateShown);
    SetVolumeLabel(m_volumeShown);
    RefreshTexts();
}

void CSideBarWnd::RefreshTexts() {
    m_grid->RefreshTexts();
}

void CSideBarWnd::SetBitRateLabel(const std::string& value) {
    m_bitRateShown = value;
    m_bitRateLabel->SetLabel(Wx(BitRateLabel(value)));
}

void CSideBarWnd::SetSampleRateLabel(const std::string& value) {
    m_sampleRateShown = value;
    m_sampleRateLabel->SetLabel(Wx(SampleRateLabel(value)));
}

void CSideBarWnd::SetVolumeLabel(const std::string& value) {
    m_volumeShown = value;
    m_volumeLabel->SetLabel(Wx(VolumeLabel(value)));
}

// ---- Enabling ----

int CSideBarWnd::CurrentWorkMode() const {
    IMainHub* hub = GetMainHub();
    return hub != nullptr ? hub->WorkMode() : m_workMode;
}

void CSideBarWnd::SetGridEditable(bool editable) {
    m_gridEditable = editable;
    m_grid->Enable(editable);
}

void CSideBarWnd::SetBitRateAllowed(bool allowed) {
    m_bitRateAllowed = allowed;
    if (!allowed)
        SetBitRateLabel("Auto");
    UpdateEnabling();
}

void CSideBarWnd::UpdateEnabling() {
    IMainHub* hub = GetMainHub();
    const bool rowSelected = hub != nullptr && !hub->SelectedSets().empty();
    m_bitRateSlider->Enable(rowSelected && m_bitRateAllowed);
    const bool burning = hub != nullptr && hub->WorkMode() == 2 && hub->IsBurnRunActive();
    for (wxWindow* control :
         std::initializer_list<wxWindow*>{m_sampleRateSlider, m_volumeSlider, m_channels}) {
        control->Enable(rowSelected && !burning);
    }
    if (m_firstUpdatePass) {
        m_firstUpdatePass = false;
        m_grid->SelectFirst();
    }
}

// ---- Simple controls ----

void CSideBarWnd::OnSimpleValueMapped(const std::string& key, const std::string& value) {
    if (key == "ar") {
        m_sampleRateSlider->SetPos(SampleRatePosition(value));
        SetSampleRateLabel(value);
    } else if (key == "ab") {
        m_bitRateSlider->SetPos(BitRatePosition(value));
        SetBitRateLabel(value);
    } else if (key == "ac") {
        const int index = ChannelsIndex(value);
        m_channels->SetSelection(index < 0 ? wxNOT_FOUND : index);
    } else if (key == "vol_factor") {
        m_volumeSlider->SetPos(VolumePosition(value));
        SetVolumeLabel(value);
    }
}

void CSideBarWnd::OnSliderReleased(int id) {
    int volumePercent = 0;
    if (id == kBitRateSlider) {
        m_values.bitRate = BitRateText(m_bitRateSlider->GetPos());
        SetBitRateLabel(m_values.bitRate);
    } else if (id == kSampleRateSlider) {
        m_values.sampleRate = SampleRateText(m_sampleRateSlider->GetPos());
        SetSampleRateLabel(m_values.sampleRate);
    } else if (id == kVolumeSlider) {
        m_values.volume = VolumeText(m_volumeSlider->GetPos());
        volumePercent = LeadingNumber(m_values.volume);
        SetVolumeLabel(m_values.volume);
    }
    IMainHub* hub = GetMainHub();
    const std::vector<ParameterSet*> sets = m_grid->Sets();
    if (hub != nullptr) {
        hub->EditSets([&] { ApplySimpleValues(sets, m_values); });
    } else {
        ApplySimpleValues(sets, m_values);
    }
    RefreshTexts();
    m_grid->Rebuild();
    if (id == kVolumeSlider && hub != nullptr) {
        // The rip list keeps the percent itself; the other lists keep half of it.
        if (hub->WorkMode() == 1) {
            hub->SetSelectedVolume(volumePercent, false);
        } else {
            hub->SetSelectedVolume(volumePercent / 2, true);
        }
    }
}

void CSideBarWnd::ShowRipRow(const RipRowValues& row) {
    const std::vector<ParameterSet*> sets = m_grid->Sets();
    if (IMainHub* hub = GetMainHub()) {
        hub->EditSets([&] { ApplyRipRow(sets, row); });
    } else {
        ApplyRipRow(sets, row);
    }
    RefreshTexts();
    m_grid->Rebuild();
}

void CSideBarWnd::OnChannelsChosen() {
    m_values.channels = ChannelsText(m_channels->GetSelection());
    OnSliderReleased(kChannels);
}

}  // namespace ac
