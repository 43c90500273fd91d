#include "shell/Check.h"

#include "resources/Language.h"
#include "skin/WindowTranslation.h"

namespace ac {

CCheck* g_Check = nullptr;

namespace {

constexpr int kTabIds[3] = {kTabConvert, kTabRip, kTabBurn};
const char* const kTabTexts[3] = {"Convert", "Rip", "Burn"};
const char* const kTabPictures[3] = {"TabConverterBg", "TabRipperBg", "TabCreatorBg"};

}  // namespace

CCheck::CCheck(wxWindow* parent) : ImSkinPanel(parent, 1057, "Check", kCheckDialogId) {
    for (int i = 0; i < 3; ++i) {
        m_tabs[std::size_t(i)] = new ImButton(this, kTabIds[i], kTabTexts[i]);
    }
    g_Check = this;
    OnLanguageChanged();
}

void CCheck::OnLanguageChanged() {
    // Back to the built-in words first, so a language without these texts shows English.
    for (int i = 0; i < 3; ++i) {
        m_tabs[std::size_t(i)]->SetLabel(kTabTexts[i]);
    }
    TranslateWindow(*this, m_nDialogId);
    RecalcLayout();
}

bool CCheck::OnSkinChanged(const std::string& skinDir) {
    ImSkinPanel::OnSkinChanged(skinDir);
    const char* section = GetSkinSection();
    const wxFont font = MakeSkinFont(m_skin.GetFont(section));
    const wxPoint textOffset(m_skin.GetInt("BtnTextPosX", 0, section),
                             m_skin.GetInt("BtnTextPosY", 0, section));
    m_textOffsetX = textOffset.x;
    wxColour colours[4];
    static const char* const kColourKeys[4] = {"TextColorUp", "TextColorDown", "TextColorActive",
                                               "TextColorDisabled"};
    for (int i = 0; i < 4; ++i) {
        colours[i] = NativeColour(m_skin.GetRgbColour(kColourKeys[i], 0, section));
    }
    for (int i = 0; i < 3; ++i) {
        ImButton* tab = m_tabs[std::size_t(i)];
        tab->SetPicture(LoadSkinPicture(m_skin.GetString(kTabPictures[i], "", section)));
        tab->SetFont(font);
        tab->SetTextOffset(textOffset);
        tab->SetTextColours(colours);
    }
    RecalcLayout();
    return true;
}

void CCheck::DoRecalcLayout() {
    ImSkinDialog::DoRecalcLayout();
    const wxSize client = GetClientSize();
    int x = m_metrics.LeftMargin;
    for (ImButton* tab : m_tabs) {
        if (tab == nullptr) {
            return;
        }
        wxSize size = tab->CellSize();
        if (size.x <= 0 || size.y <= 0) {
            size = wxSize(90, std::max(18, client.y - 2));
        }
        // A longer translation ("Konvertieren") widens the face instead of being clipped.
        const int textWidth = tab->GetTextExtent(tab->GetLabel()).x;
        size.x = std::max(size.x, textWidth + 2 * std::max(8, m_textOffsetX));
        tab->SetSize(x, client.y - size.y, size.x, size.y);
        x += size.x + m_metrics.HSpacing;
    }
}

void CCheck::ShowMode(int mode) {
    m_iWork = mode;
    for (int i = 0; i < 3; ++i) {
        m_tabs[std::size_t(i)]->Enable(i != mode);
    }
}

}  // namespace ac
