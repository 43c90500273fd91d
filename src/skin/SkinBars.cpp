#include "skin/SkinBars.h"
#include "skin/SkinMenu.h"

#include "resources/Language.h"

#include <wx/dcbuffer.h>
#include <wx/settings.h>
#include <wx/toplevel.h>

namespace ac {

// --- ImSysButtons -------------------------------------------------------------------------

ImSysButtons::ImSysButtons(wxWindow* captionBar)
    : wxWindow(captionBar, wxID_ANY, wxDefaultPosition, wxSize(1, 1), wxBORDER_NONE),
      ImSkinObject(this, "SysMenu.bmp") {
    SetBackgroundStyle(wxBG_STYLE_PAINT);
    Bind(wxEVT_PAINT, &ImSysButtons::OnPaint, this);
    Bind(wxEVT_MOTION, &ImSysButtons::OnMouse, this);
    Bind(wxEVT_LEAVE_WINDOW, &ImSysButtons::OnMouse, this);
    Bind(wxEVT_LEFT_DOWN, &ImSysButtons::OnMouse, this);
    Bind(wxEVT_LEFT_UP, &ImSysButtons::OnMouse, this);
}

bool ImSysButtons::OnSkinChanged(const std::string& skinDir) {
    ImSkinConfig skin(&g_Language);
    skin.Load(skinDir);
    m_indent = skin.GetInt("SysMenuIndent", 0, "Caption");
    m_topIndent = skin.GetInt("SysMenuTopIndent", -1, "Caption");
    ImSkinObject::OnSkinChanged(skinDir);
    m_layout = LayoutSysButtons(m_picture.Width(), m_picture.Height(), m_bHasMaximize);
    return true;
}

void ImSysButtons::Place(int barWidth, int barHeight) {
    if (!m_picture.IsOk()) {
        // Without faces the buttons still work: three plain squares at the right.
        m_layout = SysButtonLayout{};
        const int side = std::max(12, barHeight - 4);
        m_layout.rects[0] = {0, 0, side, side};
        m_layout.rects[2] = {side, 0, side, side};
        m_layout.groupWidth = 2 * side;
        m_layout.height = side;
    }
    const int y = m_topIndent == -1 ? (barHeight - m_layout.height) / 2 : m_topIndent;
    SetSize(barWidth - m_layout.groupWidth - m_indent, y, m_layout.groupWidth, m_layout.height);
}

int ImSysButtons::HitTest(const wxPoint& point) const {
    for (int i = 0; i < 3; ++i) {
        if (m_layout.rects[i].Contains(point.x, point.y)) {
            return i;
        }
    }
    return -1;
}

void ImSysButtons::OnPaint(wxPaintEvent& /*event*/) {
    wxAutoBufferedPaintDC dc(this);
    if (!m_picture.IsOk()) {
        dc.SetBackground(wxBrush(wxSystemSettings::GetColour(wxSYS_COLOUR_ACTIVECAPTION)));
        dc.Clear();
        return;
    }
    const int cw = m_picture.Width() / 3;
    const int ch = m_picture.Height() / 3;
    for (int i = 0; i < 3; ++i) {
        const SkinRect& r = m_layout.rects[i];
        if (r.Empty()) {
            continue;
        }
        const int row = i == m_hot ? m_state : 0;
        // Faces keep their own column; a wider rectangle (no maximise) aligns them right.
        DrawPictureCell(dc, r.Right() - cw, r.y, m_picture, wxRect(i * cw, row * ch, cw, ch));
    }
}

void ImSysButtons::OnMouse(wxMouseEvent& event) {
    const int hit = HitTest(event.GetPosition());
    if (event.Leaving()) {
        m_state = 0;
        m_hot = -1;
    } else if (event.LeftDown()) {
        m_state = 2;
        m_pressed = m_hot = hit;
    } else if (event.LeftUp()) {
        const int pressed = m_pressed;
        m_pressed = -1;
        m_state = hit >= 0 ? 1 : 0;
        if (hit >= 0 && hit == pressed) {
            // After the call the window may be gone; touch nothing of this object.
            CallAfter([this, hit] { Press(hit); });
        }
    } else if (event.Dragging() && m_pressed >= 0) {
        m_hot = hit == m_pressed ? hit : -1;
        m_state = m_hot >= 0 ? 2 : 0;
    } else {
        m_hot = hit;
        m_state = hit >= 0 ? 1 : 0;
    }
    Refresh(false);
}

void ImSysButtons::Press(int button) {
    auto* top = dynamic_cast<wxTopLevelWindow*>(wxGetTopLevelParent(this));
    if (top == nullptr) {
        return;
    }
    if (button == 0) {
        top->Iconize(true);
    } else if (button == 1) {
        top->Maximize(!top->IsMaximized());
    } else if (button == 2) {
        top->Close();
    }
}

// --- ImCaptionBar -------------------------------------------------------------------------

ImCaptionBar::ImCaptionBar(wxWindow* parent)
    : wxWindow(parent, wxID_ANY, wxDefaultPosition, wxSize(100, 21), wxBORDER_NONE),
      ImSkinObject(this, "TitleBar.bmp"),
      m_sysButtons(new ImSysButtons(this)) {
    SetBackgroundStyle(wxBG_STYLE_PAINT);
    Bind(wxEVT_PAINT, &ImCaptionBar::OnPaint, this);
    Bind(wxEVT_SIZE, &ImCaptionBar::OnSize, this);
    Bind(wxEVT_LEFT_DOWN, &ImCaptionBar::OnMouse, this);
    Bind(wxEVT_LEFT_UP, &ImCaptionBar::OnMouse, this);
    Bind(wxEVT_MOTION, &ImCaptionBar::OnMouse, this);
    Bind(wxEVT_RIGHT_DOWN, &ImCaptionBar::OnMouse, this);
    Bind(wxEVT_LEFT_DCLICK, &ImCaptionBar::OnMouse, this);
    Bind(wxEVT_MOUSE_CAPTURE_LOST, [this](wxMouseCaptureLostEvent&) { m_bMoving = false; });
}

bool ImCaptionBar::OnSkinChanged(const std::string& skinDir) {
    ImSkinObject::OnSkinChanged(skinDir);
    if (m_picture.IsOk()) {
        m_height = m_picture.Height();
    }
    ImSkinConfig skin(&g_Language);
    skin.Load(skinDir);
    m_splitRow = skin.GetInt("BgHSplitter", 10, "Caption");
    m_splitCol = skin.GetInt("BgVSplitter", 21, "Caption");
    m_textOffset = skin.GetInt("TextOffset", 0, "Caption");
    m_textVOffset = skin.GetInt("TextVOffset", 0, "Caption");
    m_iconOffset = skin.GetInt("IconOffset", 0, "Caption");
    m_iconVOffset = skin.GetInt("IconVOffset", 0, "Caption");
    m_noText = skin.GetInt("NoText", 0, "Caption") != 0;
    m_font = MakeSkinFont(skin.GetFont("Caption"));
    m_textColour = NativeColour(skin.GetRgbColour("TextColor", 0, "Caption"));
    m_sysButtons->OnSkinChanged(skinDir);
    m_sysButtons->Place(GetClientSize().x, m_height);
    Refresh();
    return true;
}

void ImCaptionBar::OnSize(wxSizeEvent& event) {
    m_sysButtons->Place(event.GetSize().x, m_height);
    Refresh(false);
}

void ImCaptionBar::OnPaint(wxPaintEvent& /*event*/) {
    wxAutoBufferedPaintDC dc(this);
    const wxSize size = GetClientSize();
    if (!m_picture.IsOk()) {
        dc.SetBackground(wxBrush(wxSystemSettings::GetColour(wxSYS_COLOUR_ACTIVECAPTION)));
        dc.Clear();
    } else {
        DrawSplitPicture(dc, wxRect(size), m_picture, m_splitRow, m_splitCol);
    }
    if (!m_noText) {
        const wxString title = wxGetTopLevelParent(this)->GetLabel();
        dc.SetFont(m_font);
        dc.SetTextForeground(m_textColour);
        dc.SetBackgroundMode(wxTRANSPARENT);
        const wxSize text = dc.GetTextExtent(title);
        dc.DrawText(title, m_textOffset, (size.y - text.y) / 2 + 2 * m_textVOffset);
    }
    if (m_icon.IsOk()) {
        dc.DrawBitmap(m_icon, m_iconOffset, (size.y - 16) / 2 + m_iconVOffset, true);
    }
}

void ImCaptionBar::OnMouse(wxMouseEvent& event) {
    wxWindow* top = wxGetTopLevelParent(this);
    const wxPoint screen = ClientToScreen(event.GetPosition());
    if (event.LeftDClick()) {
        // As on any caption: a double click maximises or restores a window that may resize.
        auto* frame = dynamic_cast<wxTopLevelWindow*>(top);
        auto* skinned = dynamic_cast<ImSkinDialog*>(top);
        if (frame != nullptr && skinned != nullptr && skinned->CanResize() && m_sysButtons->HasMaximize()) {
            frame->Maximize(!frame->IsMaximized());
        }
        return;
    }
    if (event.RightDown()) {
        if (m_menu != nullptr) {
            PopupMenu(m_menu, event.GetPosition());
        }
        return;
    }
    if (event.LeftDown()) {
        if (auto* skinned = dynamic_cast<ImSkinDialog*>(top)) {
            if (ImMenuBar* bar = skinned->GetSkinMenuBar(false)) {
                bar->CloseMenus();
            }
        }
        m_bMoving = true;
        m_movePoint = screen;
        if (!HasCapture()) {
            CaptureMouse();
        }
    } else if (event.LeftUp()) {
        if (HasCapture()) {
            ReleaseMouse();
        }
        m_bMoving = false;
    } else if (event.Dragging() && m_bMoving && top != nullptr) {
        top->Move(top->GetPosition() + (screen - m_movePoint));
        m_movePoint = screen;
    }
}

// --- ImStatusBarCtrl ----------------------------------------------------------------------

ImStatusBarCtrl::ImStatusBarCtrl(wxWindow* parent)
    : wxWindow(parent, wxID_ANY, wxDefaultPosition, wxSize(100, 21), wxBORDER_NONE) {
    SetBackgroundStyle(wxBG_STYLE_PAINT);
    Bind(wxEVT_PAINT, &ImStatusBarCtrl::OnPaint, this);
}

void ImStatusBarCtrl::OnPaint(wxPaintEvent& /*event*/) {
    wxAutoBufferedPaintDC dc(this);
    const wxSize size = GetClientSize();
    if (m_picture.IsOk()) {
        DrawSplitPicture(dc, wxRect(size), m_picture, -1, -1);
    } else {
        dc.SetBackground(wxBrush(wxSystemSettings::GetColour(wxSYS_COLOUR_BTNFACE)));
        dc.Clear();
    }
    dc.SetFont(GetFont());
    dc.SetBackgroundMode(wxTRANSPARENT);
    const wxSize text = dc.GetTextExtent(m_text);
    dc.DrawText(m_text, 5, (size.y - text.y) / 2);
}

}  // namespace ac
