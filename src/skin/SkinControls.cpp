#include "skin/SkinControls.h"

#include <wx/dcbuffer.h>
#include <wx/settings.h>

namespace ac {

ImButton::ImButton(wxWindow* parent, int id, const wxString& text)
    : wxWindow(parent, id, wxDefaultPosition, wxSize(60, 24), wxBORDER_NONE) {
    SetBackgroundStyle(wxBG_STYLE_PAINT);
    wxWindow::SetLabel(text);
    for (wxColour& colour : m_colours) {
        colour = wxSystemSettings::GetColour(wxSYS_COLOUR_BTNTEXT);
    }
    Bind(wxEVT_PAINT, &ImButton::OnPaint, this);
    for (auto type :
         {wxEVT_ENTER_WINDOW, wxEVT_LEAVE_WINDOW, wxEVT_MOTION, wxEVT_LEFT_DOWN, wxEVT_LEFT_UP}) {
        Bind(type, &ImButton::OnMouse, this);
    }
    Bind(wxEVT_MOUSE_CAPTURE_LOST, [this](wxMouseCaptureLostEvent&) { m_bPushed = false; });
}

void ImButton::SetPicture(SkinPicture picture) {
    m_picture = std::move(picture);
    Refresh(false);
}

void ImButton::SetTextColours(const wxColour colours[4]) {
    for (int i = 0; i < 4; ++i) {
        m_colours[i] = colours[i];
    }
    Refresh(false);
}

void ImButton::SetLabel(const wxString& label) {
    wxWindow::SetLabel(label);
    Refresh(false);
}

bool ImButton::Enable(bool enable) {
    m_bHover = false;
    m_bPushed = false;
    const bool changed = wxWindow::Enable(enable);
    Refresh(false);
    return changed;
}

void ImButton::OnPaint(wxPaintEvent& /*event*/) {
    wxAutoBufferedPaintDC dc(this);
    const wxSize size = GetClientSize();
    // Whatever lies behind shows through a PNG's transparent parts.
    dc.SetBackground(wxBrush(GetParent()->GetBackgroundColour()));
    dc.Clear();
    int cell = 1;
    if (!IsThisEnabled()) {
        cell = 3;
    } else if (m_bPushed) {
        cell = 2;
    } else if (m_bHover) {
        cell = 0;
    }
    const int ch = CellHeight();
    if (ch > 0) {
        DrawPictureCell(dc, 0, 0, m_picture, wxRect(0, cell * ch, m_picture.Width(), ch));
    }
    if (m_bText) {
        static constexpr int kColourOfCell[4] = {2, 0, 1, 3};
        dc.SetTextForeground(m_colours[kColourOfCell[cell]]);
        dc.SetFont(GetFont());
        dc.SetBackgroundMode(wxTRANSPARENT);
        wxRect textRect(m_textOffset.x, m_textOffset.y, size.x - m_textOffset.x,
                        size.y - m_textOffset.y);
        if (m_textOffset == wxPoint(0, 0)) {
            textRect = wxRect(size);
        }
        dc.DrawLabel(GetLabel(), textRect, wxALIGN_CENTER);
    }
}

void ImButton::OnMouse(wxMouseEvent& event) {
    if (!IsThisEnabled()) {
        return;
    }
    if (event.Entering() || event.Moving()) {
        m_bHover = true;
    } else if (event.Leaving()) {
        m_bHover = false;
    } else if (event.LeftDown()) {
        m_bPushed = true;
        m_bHover = false;
        CaptureMouse();
    } else if (event.LeftUp()) {
        if (HasCapture()) {
            ReleaseMouse();
        }
        const bool inside = wxRect(GetClientSize()).Contains(event.GetPosition());
        if (m_bPushed && inside) {
            wxCommandEvent click(wxEVT_BUTTON, GetId());
            click.SetEventObject(this);
            wxPostEvent(GetParent(), click);
        }
        m_bPushed = false;
        m_bHover = inside;
    }
    Refresh(false);
}

}  // namespace ac
