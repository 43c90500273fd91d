#include "skin/SkinDialog.h"

#include "resources/Language.h"
#include "skin/SkinBars.h"
#include "skin/SkinMenu.h"

#include <wx/dcbuffer.h>
#include <wx/display.h>
#include <wx/settings.h>

#include <algorithm>
#include <vector>

namespace ac {

bool ImSkinObject::OnSkinChanged(const std::string& /*skinDir*/) {
    m_picture = LoadSkinPicture(m_strPicture);
    if (m_hWnd != nullptr) {
        m_hWnd->Refresh();
    }
    return true;
}

ImSkinDialog::ImSkinDialog(wxWindow* self, int dialogId)
    : ImSkinObject(self), m_skin(&g_Language), m_nDialogId(dialogId) {}

namespace {

int s_layoutHolds = 0;
std::vector<ImSkinDialog*> s_heldLayouts;

}  // namespace

ImSkinDialog::~ImSkinDialog() {
    std::erase(s_heldLayouts, this);
}

void ImSkinDialog::RecalcLayout() {
    if (s_layoutHolds > 0) {
        if (std::find(s_heldLayouts.begin(), s_heldLayouts.end(), this) == s_heldLayouts.end()) {
            s_heldLayouts.push_back(this);
        }
        return;
    }
    std::erase(s_heldLayouts, this);
    DoRecalcLayout();
}

void ImSkinDialog::HoldLayouts() {
    ++s_layoutHolds;
}

void ImSkinDialog::ReleaseLayouts() {
    if (s_layoutHolds == 0 || --s_layoutHolds > 0) {
        return;
    }
    std::stable_partition(s_heldLayouts.begin(), s_heldLayouts.end(),
                          [](ImSkinDialog* dialog) { return dialog->m_hWnd->IsTopLevel(); });
    // A window laid out here lays out the panels it resizes, which leave the list then.
    while (!s_heldLayouts.empty()) {
        ImSkinDialog* next = s_heldLayouts.front();
        s_heldLayouts.erase(s_heldLayouts.begin());
        next->DoRecalcLayout();
    }
}

void ImSkinDialog::InitSkinDialog() {
    m_hWnd->SetBackgroundStyle(wxBG_STYLE_PAINT);
    m_hWnd->Bind(wxEVT_PAINT, &ImSkinDialog::OnPaint, this);
    m_hWnd->Bind(wxEVT_LEFT_DOWN, &ImSkinDialog::OnLeftDown, this);
    m_hWnd->Bind(wxEVT_MOTION, &ImSkinDialog::OnMotion, this);
    m_hWnd->Bind(wxEVT_LEFT_UP, &ImSkinDialog::OnLeftUp, this);
    m_hWnd->Bind(wxEVT_MOUSE_CAPTURE_LOST, [this](wxMouseCaptureLostEvent&) {
        m_bDragging = false;
        m_bResizing = false;
    });
    m_hWnd->Bind(wxEVT_SIZE, [this](wxSizeEvent& event) {
        RecalcLayout();
        event.Skip();
    });
    g_Skin.AddListener(this);
}

bool ImSkinDialog::OnSkinChanged(const std::string& skinDir) {
    const char* section = GetSkinSection();
    m_skin.Load(skinDir);
    m_skin.GetMetrics(m_metrics, section);
    m_strPicture = m_skin.GetString("Background", "", section);

    int fill = m_skin.GetInt("FillBgColor", -1, section);
    if (fill == -1) {
        fill = m_skin.GetInt("FillChildBgColor", 0, "Main");
    }
    int bg = m_skin.GetInt("BgColor", -1, section);
    if (bg == -1) {
        bg = m_skin.GetInt("ChildBgColor", 0, "Main");
    }
    m_look.fillBg = NativeColour(static_cast<std::uint32_t>(fill));
    m_look.childBg = NativeColour(static_cast<std::uint32_t>(bg));
    // Children that paint their own transparent parts (buttons) show this colour behind them.
    m_hWnd->SetBackgroundColour(m_look.childBg);
    static const char* const kButtonKeys[4] = {"ButtonTextColor_Up", "ButtonTextColor_Down",
                                               "ButtonTextColor_Active",
                                               "ButtonTextColor_Disabled"};
    for (int i = 0; i < 4; ++i) {
        int colour = m_skin.GetInt(kButtonKeys[i], -1, section);
        if (colour == -1) {
            colour = m_skin.GetInt(kButtonKeys[i], -1, "Main");
        }
        m_look.buttonText[i] = colour != -1
                                   ? NativeColour(static_cast<std::uint32_t>(colour))
                                   : wxSystemSettings::GetColour(i == 3 ? wxSYS_COLOUR_GRAYTEXT
                                                                        : wxSYS_COLOUR_BTNTEXT);
    }
    m_look.bgMode = m_skin.GetInt("BgMode", 0, section);
    m_look.bgHSplitter = m_skin.GetInt("BgHSplitter", -1, section);
    m_look.bgVSplitter = m_skin.GetInt("BgVSplitter", -1, section);
    m_menuBarTopSpacing = m_skin.GetInt("MenuBarTopSpacing", 0, "Main");
    m_titleBarBorder = m_skin.GetInt("TitleBarBorder", 1, "Main") > 0;
    m_menuBarBorder = m_skin.GetInt("MenuBarBorder", 1, "Main") > 0;

    ImSkinObject::OnSkinChanged(skinDir);
    if (m_menuBar != nullptr) {
        m_menuBar->OnSkinChanged(skinDir);
    }
    RecalcLayout();
    return true;
}

void ImSkinDialog::DoRecalcLayout() {
    const int border = m_metrics.BorderWidth;
    const int t = m_titleBarBorder ? border : 0;
    const int m = m_menuBarBorder ? border : 0;
    const wxSize client = m_hWnd->GetClientSize();
    wxRect caption;
    if (m_pCaptionBar != nullptr && m_bCaptionShown) {
        caption = wxRect(t, t, std::max(0, client.x - 2 * t), m_pCaptionBar->GetBarHeight());
        m_pCaptionBar->SetSize(caption);
    }
    wxRect menu;
    if (m_menuBar != nullptr) {
        const wxSize size = m_menuBar->GetBarSize();
        const int y = (caption.IsEmpty() ? 0 : caption.GetBottom() + 1) + m_menuBarTopSpacing;
        if (m_menuBarAlignment == 0) {
            menu = wxRect(m, y, size.x, size.y);
        } else if (m_menuBarAlignment == 1) {
            menu = wxRect(client.x - m - size.x, y, size.x, size.y);
        } else {
            menu = wxRect(m, y, client.x - 2 * m, size.y);
        }
        m_menuBar->SetSize(menu);
    }
    m_contentRect = wxRect(0, 0, client.x, client.y);
    m_contentRect.x += border;
    m_contentRect.width -= 2 * border;
    const int top = t + menu.height + caption.height + m_menuBarTopSpacing;
    m_contentRect.y += top;
    m_contentRect.height -= top + border;
    m_contentRect.width = std::max(0, m_contentRect.width);
    m_contentRect.height = std::max(0, m_contentRect.height);
    m_hWnd->Refresh(false);
}

void ImSkinDialog::ShowCaption(bool show) {
    m_bCaptionShown = show;
    if (show && m_pCaptionBar == nullptr) {
        m_pCaptionBar = new ImCaptionBar(m_hWnd);
        g_Skin.AddListener(m_pCaptionBar);
    }
    if (m_pCaptionBar != nullptr) {
        m_pCaptionBar->Show(show);
    }
    RecalcLayout();
}

ImMenuBar* ImSkinDialog::GetSkinMenuBar(bool create) {
    if (m_menuBar == nullptr && create) {
        m_menuBar = new ImMenuBar(m_hWnd, this);
    }
    return m_menuBar;
}

void ImSkinDialog::LayoutRow(const wxRect& rect, int direction, int gap, wxWindow* rest,
                             std::initializer_list<wxWindow*> windows) {
    std::vector<int> sizes;
    int restIndex = -1;
    for (wxWindow* window : windows) {
        if (window == rest) {
            restIndex = static_cast<int>(sizes.size());
        }
        const wxSize size = window->GetSize();
        sizes.push_back(direction == 0 ? size.x : size.y);
    }
    const auto rects =
        LayoutRowRects({rect.x, rect.y, rect.width, rect.height}, direction, gap, sizes, restIndex);
    std::size_t i = 0;
    for (wxWindow* window : windows) {
        const SkinRect& r = rects[i++];
        window->SetSize(r.x, r.y, r.w, r.h);
    }
}

wxSize ImSkinDialog::MaxChildSize(std::initializer_list<int> ids) const {
    wxSize largest(0, 0);
    for (int id : ids) {
        if (wxWindow* child = m_hWnd->FindWindow(id)) {
            largest.IncTo(child->GetSize());
        }
    }
    return largest;
}

void ImSkinDialog::PaintBackground(wxDC& dc) {
    const wxSize size = m_hWnd->GetClientSize();
    const wxRect all(0, 0, size.x, size.y);
    dc.SetPen(*wxTRANSPARENT_PEN);
    dc.SetBrush(wxBrush(m_picture.IsOk() ? m_look.fillBg : m_look.childBg));
    dc.DrawRectangle(all);
    if (!m_picture.IsOk()) {
        return;
    }
    if (m_look.bgMode == 0) {
        DrawSplitPicture(dc, all, m_picture, m_look.bgHSplitter, m_look.bgVSplitter);
    } else if (m_look.bgMode == 2) {
        DrawTiledPicture(dc, all, m_picture);
    }
}

void ImSkinDialog::OnPaint(wxPaintEvent& /*event*/) {
    wxAutoBufferedPaintDC dc(m_hWnd);
    PaintBackground(dc);
}

bool ImSkinDialog::InGrip(const wxPoint& screenPoint) const {
    wxWindow* top = TopWindow();
    auto* skinned = dynamic_cast<ImSkinDialog*>(top);
    if (top == nullptr || skinned == nullptr || !skinned->CanResize()) {
        return false;
    }
    const wxRect r = top->GetScreenRect();
    const SkinMetrics& m = skinned->m_metrics;
    return InResizeGrip(screenPoint.x - r.x, screenPoint.y - r.y, r.width, r.height, m.RightMargin,
                        m.BottomMargin, m.BorderWidth);
}

void ImSkinDialog::OnLeftDown(wxMouseEvent& event) {
    wxWindow* top = TopWindow();
    if (auto* skinned = dynamic_cast<ImSkinDialog*>(top); skinned && skinned->m_menuBar) {
        skinned->m_menuBar->CloseMenus();
    }
    if (top == nullptr) {
        return;
    }
    m_dragPoint = m_hWnd->ClientToScreen(event.GetPosition());
    m_bDragging = true;
    m_bResizing = InGrip(m_dragPoint);
    m_trackRect = top->GetRect();
    if (!m_hWnd->HasCapture()) {
        m_hWnd->CaptureMouse();
    }
}

void ImSkinDialog::OnMotion(wxMouseEvent& event) {
    const wxPoint screen = m_hWnd->ClientToScreen(event.GetPosition());
    wxWindow* top = TopWindow();
    if (!m_bDragging || top == nullptr) {
        m_hWnd->SetCursor(InGrip(screen) ? wxCursor(wxCURSOR_SIZENWSE) : wxNullCursor);
        return;
    }
    const wxPoint delta = screen - m_dragPoint;
    if (!m_bResizing) {
        top->Move(top->GetPosition() + delta);
        m_dragPoint = screen;
        return;
    }
    auto* skinned = dynamic_cast<ImSkinDialog*>(top);
    wxSize size = m_trackRect.GetSize() + wxSize(delta.x, delta.y);
    if (skinned != nullptr) {
        size.IncTo(skinned->m_minSize);
        if (skinned->m_maxSize.x >= 1) {
            size.x = std::min(size.x, skinned->m_maxSize.x);
        }
        if (skinned->m_maxSize.y >= 1) {
            size.y = std::min(size.y, skinned->m_maxSize.y);
        }
    }
    // Resizing live instead of through a drag frame: composing off-screen keeps it smooth.
    top->SetSize(size);
}

void ImSkinDialog::OnLeftUp(wxMouseEvent& /*event*/) {
    if (m_hWnd->HasCapture()) {
        m_hWnd->ReleaseMouse();
    }
    m_bDragging = false;
    m_bResizing = false;
}

ImSkinPanel::ImSkinPanel(wxWindow* parent, int id, const char* section, int dialogId)
    : wxPanel(parent, id, wxDefaultPosition, wxSize(10, 10), wxTAB_TRAVERSAL | wxBORDER_NONE),
      ImSkinDialog(this, dialogId),
      m_section(section) {
    InitSkinDialog();
}

}  // namespace ac
