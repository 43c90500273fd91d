#include "resources/Language.h"
#include "skin/SkinBars.h"
#include "skin/SkinDialog.h"
#include "skin/SkinMenu.h"

#include <wx/display.h>

namespace ac {

namespace {

// The status strip's child id and its text; the language may give the text another wording.
constexpr int kStatusStripId = 65535;

}  // namespace

ImSkinFrame::ImSkinFrame(const wxString& title, int dialogId)
    : wxFrame(nullptr, wxID_ANY, title, wxDefaultPosition, wxSize(640, 480),
              wxBORDER_NONE | wxFRAME_SHAPED | wxMINIMIZE_BOX | wxMAXIMIZE_BOX | wxRESIZE_BORDER |
                  wxCLIP_CHILDREN),
      ImSkinDialog(this, dialogId) {
    InitSkinDialog();
    m_statusStrip = new ImStatusBarCtrl(this);
    m_statusStrip->SetId(kStatusStripId);
    m_statusStrip->Show(m_bStatusShown);
}

ImSkinFrame::~ImSkinFrame() = default;

bool ImSkinFrame::OnSkinChanged(const std::string& skinDir) {
    m_skin.Load(skinDir);
    m_menuBarAlignment = m_skin.GetInt("MenuBarAlignment", 1, "Main");
    const std::string strip = m_skin.GetString("StatusBarBg", "", GetSkinSection());
    if (!strip.empty()) {
        m_statusStrip->SetPicture(LoadSkinPicture(strip));
    } else {
        m_statusStrip->SetPicture({});
    }
    m_statusHeight = m_skin.GetInt("StatusBarHeight", m_statusHeight, GetSkinSection());
    static const char* const kCornerKeys[4] = {"RegionLT", "RegionRT", "RegionLB", "RegionRB"};
    for (int i = 0; i < 4; ++i) {
        const std::string file = m_skin.GetString(kCornerKeys[i], "", "Main");
        m_cornerRuns[i] = file.empty() ? std::vector<SkinRect>{}
                                       : LoadRegionResource(g_Skin.GetImagePath(&g_Language, file));
    }
    const bool taken = ImSkinDialog::OnSkinChanged(skinDir);
    ApplyCorners();
    return taken;
}

void ImSkinFrame::DoRecalcLayout() {
    ImSkinDialog::DoRecalcLayout();
    if (m_statusStrip != nullptr && m_bStatusShown) {
        m_statusStrip->SetSize(m_contentRect.x, m_contentRect.GetBottom() + 1 - m_statusHeight,
                               m_contentRect.width, m_statusHeight);
        m_contentRect.height = std::max(0, m_contentRect.height - m_statusHeight);
    }
    ApplyCorners();
}

void ImSkinFrame::ApplyCorners() {
    const wxSize size = GetSize();
    if (size.x <= 0 || size.y <= 0) {
        return;
    }
    bool any = false;
    wxRegion shape(0, 0, size.x, size.y);
    static constexpr Corner kCorners[4] = {Corner::LeftTop, Corner::RightTop, Corner::LeftBottom,
                                           Corner::RightBottom};
    for (int i = 0; i < 4; ++i) {
        for (const SkinRect& run : PlaceCorner(m_cornerRuns[i], kCorners[i], size.x, size.y)) {
            shape.Subtract(wxRect(run.x, run.y, run.w, run.h));
            any = true;
        }
    }
    if (any || !m_cornerRuns[0].empty()) {
        SetShape(shape);
    } else {
        SetShape(wxRegion());
    }
}

void ImSkinFrame::InitialPlacement() {
    g_Skin.SetRoot(g_Language.GetBaseDir() + "\\Skin");
    // The window manager learns the smallest size; without a largest one it offers maximise,
    // and a window that cannot resize keeps its size at both ends.
    if (CanResize()) {
        SetSizeHints(m_minSize, m_maxSize.x >= 1 && m_maxSize.y >= 1 ? m_maxSize : wxDefaultSize);
    } else {
        SetSizeHints(GetSize(), GetSize());
    }
    const std::string text = m_readSetting ? m_readSetting("window_rect") : std::string();
    const wxRect screen = wxDisplay(0u).GetClientArea();
    std::optional<SkinRect> rect;
    if (auto parsed = ParseWindowRect(text)) {
        rect = SanitizeWindowRect(*parsed, m_minSize.x, m_minSize.y, screen.width, screen.height);
    }
    if (!rect) {
        SetSize(m_defaultSize);
        Centre(wxBOTH);
        return;
    }
    SetSize(rect->x, rect->y, rect->w, rect->h);
}

void ImSkinFrame::SaveState() {
    if (IsIconized()) {
        Iconize(false);
    }
    if (IsMaximized()) {
        Maximize(false);
    }
    const wxRect r = GetRect();
    if (m_writeSetting) {
        m_writeSetting("window_rect", FormatWindowRect({r.x, r.y, r.width, r.height}));
        m_writeSetting("last_skin", g_Skin.GetSkinName());
    }
}

}  // namespace ac
