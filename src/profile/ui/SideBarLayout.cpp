// The side bar's look and place: the skin's pictures, fonts and colours, the stacking of the
// controls, and which group shows in which mode.
#include "profile/ui/ParameterGrid.h"
#include "profile/ui/SideBarWnd.h"

#include "shell/AppConfig.h"
#include "shell/MainHub.h"
#include "skin/SkinControls.h"
#include "skin/SkinLabels.h"
#include "skin/SkinPicture.h"

#include <wx/choice.h>
#include <wx/textctrl.h>

#include <algorithm>

namespace ac {

using namespace sidebar;

namespace {

constexpr int kLabelHeight = 18;
constexpr int kSliderHeight = 24;
constexpr int kCompactSliderHeight = 20;
constexpr int kEditHeight = 26;
constexpr int kSkinColourNotSet = 255;

}  // namespace

bool CSideBarWnd::OnSkinChanged(const std::string& skinDir) {
    ImSkinPanel::OnSkinChanged(skinDir);
    const char* section = GetSkinSection();
    const wxColour panelBg = Look().childBg;
    // These three are native colours where 255 means "not set": a skin cannot ask for pure red.
    auto nativeOr = [&](const char* key, const wxColour& fallback) {
        const int value = m_skin.GetInt(key, kSkinColourNotSet, section);
        return value == kSkinColourNotSet ? fallback : NativeColour(static_cast<std::uint32_t>(value));
    };
    const wxColour propertyBg = nativeOr("PropertyBgColor", *wxWHITE);
    const wxColour commentBg = nativeOr("CommentBgColor", panelBg);
    m_grid->SetBackgroundColour2(propertyBg, commentBg);
    const int gridLine = m_skin.GetInt("GridLineColor", kSkinColourNotSet, section);
    if (gridLine == kSkinColourNotSet) {
        m_grid->SetGridLineColor(wxColour(125, 156, 197), false);
    } else {
        m_grid->SetGridLineColor(NativeColour(static_cast<std::uint32_t>(gridLine)), true);
    }
    auto picture = [&](const char* key) {
        return LoadSkinPicture(m_skin.GetString(key, "", section));
    };
    const wxFont titleFont = MakeSkinFont(m_skin.GetFont(section, "Title"));
    const wxFont font = MakeSkinFont(m_skin.GetFont(section));
    const wxColour titleColour = NativeColour(m_skin.GetRgbColour("TitleTextColor", 0, section));
    const wxColour textColour = NativeColour(m_skin.GetRgbColour("TextColor", 0, section));
    m_grid->SetTextColour2(textColour);
    m_profileLabel->SetFont(titleFont);
    m_profileLabel->SetTextColour(titleColour);
    for (ImLabel* label : {m_bitRateLabel, m_sampleRateLabel, m_channelsLabel, m_volumeLabel}) {
        label->SetFont(font);
        label->SetTextColour(textColour);
    }
    for (ImLabel* label :
         {m_profileLabel, m_bitRateLabel, m_sampleRateLabel, m_channelsLabel, m_volumeLabel}) {
        label->SetBgColor(panelBg);
    }
    for (ImTickSlider* slider : {m_bitRateSlider, m_sampleRateSlider, m_volumeSlider}) {
        slider->SetPictures(picture("SliderFore"), picture("SliderGone"), picture("SliderBlock"),
                            picture("SliderBlockDisable"), picture("SliderBg"));
        slider->SetColours(panelBg, textColour);
        slider->SetFont(font);
    }
    DressDiscControls();
    m_advancedButton->SetPicture(LoadSkinPicture("mode_nor.bmp"));
    m_simpleButton->SetPicture(LoadSkinPicture("mode_adv.bmp"));
    m_saveButton->SetPicture(LoadSkinPicture("ProfileMenu.bmp"));
    for (ImButton* button : {m_advancedButton, m_simpleButton, m_saveButton}) {
        // Bitmap buttons: the picture says it, the text is only the fall-back.
        button->SetTextShown(button->CellHeight() == 0);
        // The words stay reachable under the mouse, in the current language.
        button->SetToolTip(button->GetLabel());
        button->SetTextColours(Look().buttonText);
        button->SetFont(font);
    }
    RecalcLayout();
    Refresh();
    return true;
}

void CSideBarWnd::DressDiscControls() {
    if (m_discType == nullptr || m_skin.GetDir().empty())
        return;
    const char* section = GetSkinSection();
    const wxFont font = MakeSkinFont(m_skin.GetFont(section));
    const wxColour textColour = NativeColour(m_skin.GetRgbColour("TextColor", 0, section));
    std::vector<ImLabel*> labels = m_discLabels;
    labels.push_back(m_volumeNameLabel);
    for (ImLabel* label : labels) {
        label->SetFont(font);
        label->SetTextColour(textColour);
        label->SetBgColor(Look().childBg);
    }
    m_balance->SetFaces(LoadSkinPicture(m_skin.GetString("CheckBox_Unchecked", "", section)),
                        LoadSkinPicture(m_skin.GetString("CheckBox_Checked", "", section)));
    m_balance->SetColours(textColour, wxColour(0x80, 0x80, 0x80));
    m_balance->SetFont(font);
}

// ---- Layout ----

void CSideBarWnd::DoRecalcLayout() {
    ImSkinDialog::DoRecalcLayout();
    if (m_grid == nullptr)
        return;
    const wxSize client = GetClientSize();
    const int left = m_metrics.LeftMargin;
    const int width = std::max(40, client.x - left - m_metrics.RightMargin);
    int y = m_metrics.TopMargin;

    auto buttonSize = [](ImButton* button, wxSize fallback) {
        const wxSize fit = button->FitSize();
        return fit.x > 0 && fit.y > 0 ? fit : fallback;
    };
    const wxSize simpleSize = buttonSize(m_simpleButton, wxSize(56, 20));
    const wxSize advancedSize = buttonSize(m_advancedButton, wxSize(64, 20));
    const int rowHeight = std::max({kLabelHeight, simpleSize.y, advancedSize.y});
    int x = left + width - simpleSize.x;
    m_simpleButton->SetSize(x, y, simpleSize.x, simpleSize.y);
    x -= m_metrics.HSpacing + advancedSize.x;
    m_advancedButton->SetSize(x, y, advancedSize.x, advancedSize.y);
    m_profileLabel->SetSize(left, y, std::max(20, x - left - m_metrics.HSpacing), rowHeight);
    y += rowHeight + m_metrics.VSpacing;

    const wxSize saveSize = buttonSize(m_saveButton, wxSize(28, 26));
    const int selectorHeight = std::max(saveSize.y, SelectorBestSize().y);
    const int selectorWidth = std::max(20, width - saveSize.x - m_metrics.HSpacing);
    m_profileSelector->SetSize(left, y, selectorWidth, selectorHeight);
    if (m_discType != nullptr)
        m_discType->SetSize(left, y, selectorWidth, selectorHeight);
    m_saveButton->SetSize(left + width - saveSize.x, y + (selectorHeight - saveSize.y) / 2,
                          saveSize.x, saveSize.y);
    y += selectorHeight + m_metrics.VSpacing;

    const int rightMargin = m_skin.GetInt("PropertyRightMargin", 0, GetSkinSection());
    m_grid->SetSize(left, y, std::max(40, client.x - left - rightMargin),
                    std::max(40, client.y - y - m_metrics.BottomMargin));
    LayoutSimpleGroup(left, y, width);
    LayoutDiscGroup(left, y, width);
}

void CSideBarWnd::LayoutSimpleGroup(int x, int y, int width) {
    const std::pair<ImLabel*, ImTickSlider*> rows[] = {{m_bitRateLabel, m_bitRateSlider},
                                                       {m_sampleRateLabel, m_sampleRateSlider},
                                                       {m_volumeLabel, m_volumeSlider}};
    if (m_channelsHeight == 0) {
        m_channelsHeight = std::max(kEditHeight, m_channels->GetBestSize().y);
    }
    // The column under the player is short: the rows keep a third of the skin's spacing. A data
    // disc's name below the channels does not fit at the design size: then the two labels go
    // beside their boxes, as the audio disc's do, and the sliders close up, so the name stays
    // in sight.
    int gap = m_metrics.VSpacing / 3;
    int sliderHeight = kSliderHeight;
    const int room = GetClientSize().y - m_metrics.BottomMargin - y;
    const int stacked = 3 * (kLabelHeight + kSliderHeight + gap) + 2 * kLabelHeight +
                        m_channelsHeight + 2 * gap + kEditHeight;
    const bool compact = m_volumeName != nullptr && m_volumeName->IsShown() && stacked > room;
    if (compact) {
        gap = 1;
        sliderHeight = kCompactSliderHeight;
    }
    for (const auto& [label, slider] : rows) {
        label->SetSize(x, y, width, kLabelHeight);
        y += kLabelHeight;
        slider->SetSize(x, y, width, sliderHeight);
        y += sliderHeight + gap;
    }
    if (!compact) {
        m_channelsLabel->SetSize(x, y, width, kLabelHeight);
        y += kLabelHeight;
        m_channels->SetSize(x, y, width, m_channelsHeight);
        y += m_channelsHeight + 2 * gap;
        if (m_volumeName != nullptr) {
            m_volumeNameLabel->SetSize(x, y, width, kLabelHeight);
            y += kLabelHeight;
            m_volumeName->SetSize(x, y, width, kEditHeight);
        }
        return;
    }
    int labelWidth = 0;
    for (ImLabel* label : {m_channelsLabel, m_volumeNameLabel}) {
        labelWidth = std::max(labelWidth, label->GetTextExtent(label->GetLabel()).x);
    }
    labelWidth = std::min(labelWidth + m_metrics.HSpacing, width / 2);
    const int boxWidth = std::max(20, width - labelWidth);
    m_channelsLabel->SetSize(x, y + (m_channelsHeight - kLabelHeight) / 2, labelWidth,
                             kLabelHeight);
    m_channels->SetSize(x + labelWidth, y, boxWidth, m_channelsHeight);
    y += m_channelsHeight + gap;
    m_volumeNameLabel->SetSize(x, y + (kEditHeight - kLabelHeight) / 2, labelWidth, kLabelHeight);
    m_volumeName->SetSize(x + labelWidth, y, boxWidth, kEditHeight);
}

void CSideBarWnd::LayoutDiscGroup(int x, int y, int width) {
    const auto heightOf = [](wxWindow* window) {
        return dynamic_cast<ImLabel*>(window) != nullptr
                   ? kLabelHeight
                   : std::max(kEditHeight, window->GetBestSize().y);
    };
    int stacked = 0;
    for (wxWindow* window : m_discGroup) {
        stacked += heightOf(window) + (dynamic_cast<ImLabel*>(window) ? 0 : m_metrics.VSpacing);
    }
    const int room = GetClientSize().y - y - m_metrics.BottomMargin;
    if (stacked <= room) {
        for (wxWindow* window : m_discGroup) {
            const bool isLabel = dynamic_cast<ImLabel*>(window) != nullptr;
            const int height = heightOf(window);
            window->SetSize(x, y, width, height);
            y += height + (isLabel ? 0 : m_metrics.VSpacing);
        }
        return;
    }
    // Labels over boxes do not fit under the player at the design size: each label goes
    // beside its box instead, in a column as wide as the longest label, so every box stays
    // visible. A box without a label (the Balance check box) keeps a row of its own.
    int labelWidth = 0;
    int rowsHeight = 0;
    int rows = 0;
    for (std::size_t i = 0; i < m_discGroup.size(); ++i) {
        wxWindow* window = m_discGroup[i];
        if (dynamic_cast<ImLabel*>(window) != nullptr && i + 1 < m_discGroup.size()) {
            labelWidth = std::max(labelWidth, window->GetTextExtent(window->GetLabel()).x);
            window = m_discGroup[++i];
        }
        rowsHeight += heightOf(window);
        ++rows;
    }
    labelWidth = std::min(labelWidth + m_metrics.HSpacing, width / 2);
    const int gap = std::clamp((room - rowsHeight) / std::max(1, rows), 0, m_metrics.VSpacing);
    for (std::size_t i = 0; i < m_discGroup.size(); ++i) {
        wxWindow* window = m_discGroup[i];
        if (dynamic_cast<ImLabel*>(window) != nullptr && i + 1 < m_discGroup.size()) {
            wxWindow* box = m_discGroup[++i];
            const int height = heightOf(box);
            window->SetSize(x, y + (height - kLabelHeight) / 2, labelWidth, kLabelHeight);
            box->SetSize(x + labelWidth, y, std::max(20, width - labelWidth), height);
            y += height + gap;
            continue;
        }
        const int height = heightOf(window);
        window->SetSize(x, y, width, height);
        y += height + gap;
    }
}

// ---- Modes ----

void CSideBarWnd::ShowGroup(const std::vector<wxWindow*>& group, bool show) {
    for (wxWindow* window : group)
        window->Show(show);
}

void CSideBarWnd::ShowVolumeName(bool show) {
    if (m_volumeName != nullptr && m_volumeName->IsShown() != show) {
        m_volumeNameLabel->Show(show);
        m_volumeName->Show(show);
        RecalcLayout();  // the simple group closes up around it
    }
}

void CSideBarWnd::ApplyMode(bool advanced) {
    const bool audioCd = [&] {
        if (m_firstShow) {
            m_firstShow = false;
            m_workMode = GetAppConfig().GetInt("last_run_function", nullptr, 0);
        } else {
            m_workMode = CurrentWorkMode();
        }
        return m_workMode == 2 && GetDiscType() == 0;
    }();
    if (advanced) {
        ShowGroup(m_simpleGroup, false);
        ShowGroup(m_discGroup, false);
        ShowVolumeName(false);
        m_grid->Show();
        return;
    }
    m_grid->Hide();
    if (audioCd) {
        EnsureDiscControls();
        ShowGroup(m_discGroup, true);
        ShowGroup(m_simpleGroup, false);
        ShowVolumeName(false);
        m_advancedButton->Enable(false);
        m_simpleButton->Enable(false);
        return;
    }
    ShowGroup(m_simpleGroup, true);
    ShowGroup(m_discGroup, false);
    ShowVolumeName(false);
    m_advancedButton->Enable(!m_advanced);
    m_simpleButton->Enable(m_advanced);
}

void CSideBarWnd::OnAdvancedPressed(bool advanced) {
    m_advanced = advanced;
    ApplyMode(advanced);
    m_advancedButton->Enable(!advanced);
    m_simpleButton->Enable(advanced);
    if (!advanced) {
        const bool discName = m_workMode == 2 && GetDiscType() != 0;
        ShowVolumeName(discName);
    }
}

void CSideBarWnd::OnWorkModeChanged(int mode) {
    m_firstShow = false;
    m_workMode = mode;
    const bool burn = mode == 2;
    if (burn)
        EnsureDiscControls();
    m_profileSelector->Show(!burn);
    if (m_discType != nullptr)
        m_discType->Show(burn);
    m_profileSelector->Enable(!burn);
    // A burn disc type stands for a fixed system profile: there is nothing of the user's to save.
    m_saveButton->Enable(!burn);
    if (burn) {
        SelectDiscType(GetDiscType());
    } else {
        ApplyMode(m_advanced);
    }
    m_grid->Rebuild();
    RefreshTexts();
}

int CSideBarWnd::GetDiscType() const {
    if (m_discType == nullptr)
        return 0;
    const int type = m_discType->GetSelection();
    return type == wxNOT_FOUND ? 0 : type;
}

void CSideBarWnd::SelectDiscType(int type) {
    EnsureDiscControls();
    m_discType->SetSelection(std::clamp(type, 0, 2));
    type = GetDiscType();
    if (type == 0 || !m_advanced) {
        ApplyMode(false);
        if (type != 0) {
            ShowVolumeName(true);
        }
    } else {
        ApplyMode(true);
    }
    static const char* const kFormats[] = {"wav", "mp3", "wma"};
    const int index = m_catalogue.FindSystemByExt(kFormats[type]);
    if (index >= 0)
        SelectIndex(index, true);
}

}  // namespace ac
