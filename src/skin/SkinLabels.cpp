#include "skin/SkinLabels.h"

#include <wx/control.h>
#include <wx/dcbuffer.h>
#include <wx/msgdlg.h>
#include <wx/settings.h>
#include <wx/tokenzr.h>
#include <wx/utils.h>

#include <algorithm>

namespace ac {

namespace {

void DrawFrame(wxDC& dc, const wxSize& size) {
    dc.SetPen(wxPen(wxSystemSettings::GetColour(wxSYS_COLOUR_3DHIGHLIGHT)));
    dc.DrawLine(0, 0, size.x, 0);
    dc.DrawLine(0, 0, 0, size.y);
    dc.SetPen(wxPen(wxSystemSettings::GetColour(wxSYS_COLOUR_3DSHADOW)));
    dc.DrawLine(size.x - 1, 0, size.x - 1, size.y);
    dc.DrawLine(0, size.y - 1, size.x, size.y - 1);
}

}  // namespace

// --- ImPicture ----------------------------------------------------------------------------

ImPicture::ImPicture(wxWindow* parent, int id)
    : wxWindow(parent, id, wxDefaultPosition, wxSize(16, 16), wxBORDER_NONE) {
    SetBackgroundStyle(wxBG_STYLE_PAINT);
    Bind(wxEVT_PAINT, &ImPicture::OnPaint, this);
}

void ImPicture::SetPicture(SkinPicture picture, int mode, int splitRow, int splitCol) {
    m_picture = std::move(picture);
    m_mode = mode;
    m_splitRow = splitRow;
    m_splitCol = splitCol;
    Refresh(false);
}

void ImPicture::FitToPicture() {
    SetSize(m_picture.IsOk() ? wxSize(m_picture.Width(), m_picture.Height()) : wxSize(0, 0));
}

void ImPicture::OnPaint(wxPaintEvent& /*event*/) {
    wxAutoBufferedPaintDC dc(this);
    const wxSize size = GetClientSize();
    dc.SetBackground(wxBrush(wxSystemSettings::GetColour(wxSYS_COLOUR_BTNFACE)));
    dc.Clear();
    if (!m_picture.IsOk()) {
        return;
    }
    if (m_mode == 0) {
        DrawSplitPicture(dc, wxRect(size), m_picture, m_splitRow, m_splitCol);
    } else if (m_mode == 2) {
        DrawTiledPicture(dc, wxRect(size), m_picture);
    } else if (m_picture.fromPng) {
        dc.DrawBitmap(wxBitmap(m_picture.image.Scale(std::max(1, size.x), std::max(1, size.y),
                                                     wxIMAGE_QUALITY_HIGH)),
                      0, 0, true);
    } else {
        dc.DrawBitmap(m_picture.bitmap, (size.x - m_picture.Width()) / 2,
                      (size.y - m_picture.Height()) / 2, true);
    }
}

// --- ImLabel ------------------------------------------------------------------------------

ImLabel::ImLabel(wxWindow* parent, int id, const wxString& text, long alignment)
    : wxWindow(parent, id, wxDefaultPosition, wxSize(80, 18), wxBORDER_NONE),
      m_alignment(alignment) {
    SetBackgroundStyle(wxBG_STYLE_PAINT);
    m_textColour = wxSystemSettings::GetColour(wxSYS_COLOUR_BTNTEXT);
    Bind(wxEVT_PAINT, &ImLabel::OnPaint, this);
    SetLabel(text);
}

void ImLabel::SetBgColor(const wxColour& colour) {
    m_mode = 1;
    m_bg = colour;
    Refresh(false);
}

void ImLabel::SetBgPicture(SkinPicture picture) {
    m_mode = 2;
    m_picture = std::move(picture);
    Refresh(false);
}

void ImLabel::SetLabel(const wxString& text) {
    wxWindow::SetLabel(text);
    m_lines.clear();
    for (const wxString& line : wxSplit(text, '\n', '\0')) {
        m_lines.push_back(line);
    }
    if (IsShown()) {
        Refresh(false);
    }
}

void ImLabel::OnPaint(wxPaintEvent& /*event*/) {
    wxAutoBufferedPaintDC dc(this);
    const wxSize size = GetClientSize();
    dc.SetBackground(wxBrush(m_mode == 1 ? m_bg : GetParent()->GetBackgroundColour()));
    dc.Clear();
    if (m_mode == 2 && m_picture.IsOk()) {
        DrawTiledPicture(dc, wxRect(1, 1, size.x - 2, size.y - 2), m_picture);
    }
    if (m_framed && m_mode != 0) {
        DrawFrame(dc, size);
    }
    dc.SetFont(GetFont());
    dc.SetBackgroundMode(wxTRANSPARENT);
    wxDCClipper clip(dc, wxRect(1, 1, size.x - 1, size.y - 1));
    const int sampleHeight = dc.GetTextExtent("ZjgiIPq").y;
    int y = m_lines.size() == 1 ? (size.y - sampleHeight) / 2 : 1;
    for (const wxString& line : m_lines) {
        // Shortening measures the text a character at a time: only a line too long for the
        // label pays for it.
        wxString shown = line;
        int width = dc.GetTextExtent(line).x;
        if (m_lines.size() == 1 && width > size.x - 4) {
            shown = wxControl::Ellipsize(line, dc, wxELLIPSIZE_MIDDLE, size.x - 4);
            width = dc.GetTextExtent(shown).x;
        }
        int x = 2;
        if (m_alignment & wxALIGN_CENTER_HORIZONTAL) {
            x = (size.x - width) / 2;
        } else if (m_alignment & wxALIGN_RIGHT) {
            x = size.x - width - 2;
        }
        if (!IsThisEnabled()) {
            dc.SetTextForeground(wxSystemSettings::GetColour(wxSYS_COLOUR_GRAYTEXT));
            dc.DrawText(shown, x + 1, y + 1);
            dc.SetTextForeground(wxSystemSettings::GetColour(wxSYS_COLOUR_BTNTEXT));
        } else {
            dc.SetTextForeground(m_textColour);
        }
        dc.DrawText(shown, x, y);
        y += sampleHeight + 1;
    }
}

// --- ImCheckBox ---------------------------------------------------------------------------

ImCheckBox::ImCheckBox(wxWindow* parent, int id, const wxString& text, bool radio)
    : wxWindow(parent, id, wxDefaultPosition, wxSize(120, 20), wxBORDER_NONE | wxWANTS_CHARS),
      m_bRadio(radio) {
    SetBackgroundStyle(wxBG_STYLE_PAINT);
    wxWindow::SetLabel(text);
    m_text = wxSystemSettings::GetColour(wxSYS_COLOUR_BTNTEXT);
    m_disabled = wxSystemSettings::GetColour(wxSYS_COLOUR_GRAYTEXT);
    Bind(wxEVT_PAINT, &ImCheckBox::OnPaint, this);
    Bind(wxEVT_LEFT_DOWN, [this](wxMouseEvent&) { Toggle(); });
    Bind(wxEVT_LEFT_DCLICK, [this](wxMouseEvent&) { Toggle(); });
    Bind(wxEVT_KEY_DOWN, [this](wxKeyEvent& event) {
        const int key = event.GetKeyCode();
        if (key == WXK_TAB) {
            event.Skip();
        } else if (key == WXK_RETURN || key == WXK_SPACE) {
            Toggle();
        }
    });
}

void ImCheckBox::SetFaces(SkinPicture unchecked, SkinPicture checked) {
    m_faces[0] = std::move(unchecked);
    m_faces[1] = std::move(checked);
    RepaintWithMargin();
}

void ImCheckBox::SetColours(const wxColour& text, const wxColour& disabled) {
    m_text = text;
    m_disabled = disabled;
    Refresh(false);
}

void ImCheckBox::SetChecked(bool checked) {
    m_bChecked = checked;
    RepaintWithMargin();
}

bool ImCheckBox::Enable(bool enable) {
    const bool changed = wxWindow::Enable(enable);
    RepaintWithMargin();
    return changed;
}

void ImCheckBox::Toggle() {
    m_bChecked = m_bRadio ? true : !m_bChecked;
    SetFocus();
    RepaintWithMargin();
}

// The parent repaints round the box, so a transparent background stays right.
void ImCheckBox::RepaintWithMargin() {
    if (GetParent() != nullptr) {
        GetParent()->RefreshRect(GetRect().Inflate(3));
    }
    Refresh(false);
}

void ImCheckBox::OnPaint(wxPaintEvent& /*event*/) {
    wxAutoBufferedPaintDC dc(this);
    const wxSize size = GetClientSize();
    dc.SetBackground(wxBrush(GetParent()->GetBackgroundColour()));
    dc.Clear();
    dc.SetFont(GetFont());
    dc.SetBackgroundMode(wxTRANSPARENT);
    {
        wxDCClipper clip(dc, wxRect(1, 1, size.x - 1, size.y - 1));
        const bool enabled = IsThisEnabled();
        dc.SetTextForeground(enabled ? m_text : m_disabled);
        dc.DrawText(GetLabel(), enabled ? 20 : 21, enabled ? 3 : 4);
    }
    const SkinPicture& face = m_faces[m_bChecked ? 1 : 0];
    if (face.IsOk()) {
        dc.DrawBitmap(face.bitmap, 3, 1, true);
    } else {
        dc.SetPen(wxPen(m_text));
        dc.SetBrush(*wxWHITE_BRUSH);
        dc.DrawRectangle(3, 2, 13, 13);
        if (m_bChecked) {
            dc.DrawLine(6, 8, 9, 11);
            dc.DrawLine(9, 11, 14, 5);
        }
    }
}

// --- ImHyperLink --------------------------------------------------------------------------

ImHyperLink::ImHyperLink(wxWindow* parent, int id, const wxString& text, const wxString& url)
    : wxWindow(parent, id, wxDefaultPosition, wxDefaultSize, wxBORDER_NONE),
      m_url(url.empty() ? text : url) {
    SetBackgroundStyle(wxBG_STYLE_PAINT);
    // Native colours 0xFF0000, 0x808000, 0x800080, 0x0000FF, in red-green-blue order.
    m_colours[0] = wxColour(0, 0, 0xFF);
    m_colours[1] = wxColour(0, 0x80, 0x80);
    m_colours[2] = wxColour(0x80, 0, 0x80);
    m_colours[3] = wxColour(0xFF, 0, 0);
    SetCursor(wxCursor(wxCURSOR_HAND));
    SetToolTip(m_url);
    Bind(wxEVT_PAINT, &ImHyperLink::OnPaint, this);
    Bind(wxEVT_ENTER_WINDOW, [this](wxMouseEvent&) {
        m_hover = true;
        Refresh(false);
    });
    Bind(wxEVT_LEAVE_WINDOW, [this](wxMouseEvent&) {
        m_hover = false;
        Refresh(false);
    });
    Bind(wxEVT_LEFT_UP, [this](wxMouseEvent&) { FollowLink(); });
    SetLabel(text);
}

void ImHyperLink::SetColours(const wxColour& link, const wxColour& active, const wxColour& visited,
                             const wxColour& hover) {
    m_colours[0] = link;
    m_colours[1] = active;
    m_colours[2] = visited;
    m_colours[3] = hover.IsOk() ? hover : wxSystemSettings::GetColour(wxSYS_COLOUR_HIGHLIGHT);
    Refresh(false);
}

void ImHyperLink::SetLabel(const wxString& text) {
    wxWindow::SetLabel(text);
    wxClientDC dc(this);
    dc.SetFont(GetFont());
    // Sized to its text, keeping the place its alignment gives it.
    const wxSize size = dc.GetTextExtent(text);
    SetSize(size);
    SetMinSize(size);
    Refresh(false);
}

void ImHyperLink::OnPaint(wxPaintEvent& /*event*/) {
    wxAutoBufferedPaintDC dc(this);
    dc.SetBackground(wxBrush(GetParent()->GetBackgroundColour()));
    dc.Clear();
    wxFont font = GetFont();
    font.SetUnderlined(m_hover);
    dc.SetFont(font);
    dc.SetTextForeground(m_hover ? m_colours[3] : m_visited ? m_colours[2] : m_colours[0]);
    dc.DrawText(GetLabel(), 0, 0);
}

void ImHyperLink::FollowLink() {
    if (wxLaunchDefaultBrowser(m_url)) {
        m_visited = true;
        Refresh(false);
        return;
    }
    wxBell();
    wxMessageBox("Can't open link:\n\nThe specified file was not found.", GetLabel(),
                 wxOK | wxICON_EXCLAMATION, this);
}

// --- ImTickSlider -------------------------------------------------------------------------

ImTickSlider::ImTickSlider(wxWindow* parent, int id)
    : wxWindow(parent, id, wxDefaultPosition, wxSize(180, 28), wxBORDER_NONE) {
    SetBackgroundStyle(wxBG_STYLE_PAINT);
    m_bgColour = wxSystemSettings::GetColour(wxSYS_COLOUR_BTNFACE);
    m_pen = wxSystemSettings::GetColour(wxSYS_COLOUR_BTNSHADOW);
    Bind(wxEVT_PAINT, &ImTickSlider::OnPaint, this);
    Bind(wxEVT_LEFT_DOWN, &ImTickSlider::OnMouse, this);
    Bind(wxEVT_MOTION, &ImTickSlider::OnMouse, this);
    Bind(wxEVT_LEFT_UP, &ImTickSlider::OnMouse, this);
}

void ImTickSlider::SetRange(int minimum, int maximum) {
    m_min = minimum;
    m_max = maximum;
    Refresh(false);
}

void ImTickSlider::SetPos(int position) {
    m_pos = std::clamp(position, m_min, std::max(m_min, m_max));
    Refresh(false);
}

void ImTickSlider::SetPictures(SkinPicture fore, SkinPicture gone, SkinPicture block,
                               SkinPicture blockDisabled, SkinPicture bg) {
    m_fore = std::move(fore);
    m_gone = std::move(gone);
    m_block = std::move(block);
    m_blockDisabled = std::move(blockDisabled);
    m_bg = std::move(bg);
    Refresh(false);
}

void ImTickSlider::SetColours(const wxColour& background, const wxColour& pen) {
    m_bgColour = background;
    m_pen = pen;
    Refresh(false);
}

void ImTickSlider::OnPaint(wxPaintEvent& /*event*/) {
    wxAutoBufferedPaintDC dc(this);
    const wxSize size = GetClientSize();
    const int w = size.x;
    const int h = size.y;
    dc.SetBackground(wxBrush(m_bgColour));
    dc.Clear();
    DrawTiledPicture(dc, wxRect(size), m_bg);
    const int thumb = SliderThumbX(m_pos, m_min, m_max, w);
    DrawSliderTrack(dc, m_fore, h - 16, 12, w - 10);
    DrawSliderTrack(dc, m_gone, h - 16, 12, thumb);
    const SkinPicture& block =
        !IsThisEnabled() && m_blockDisabled.IsOk() ? m_blockDisabled : m_block;
    if (block.IsOk()) {
        dc.DrawBitmap(block.bitmap, thumb - 13 + 8 - block.Width() / 2 + 5, h - 20, true);
    }
    dc.SetPen(wxPen(m_pen));
    for (int i = 0; m_ticks > 0 && i <= m_ticks; ++i) {
        const int x = (w - 26) * i / m_ticks + 13;
        dc.DrawLine(x, h - 9, x, h - 6);
    }
}

void ImTickSlider::OnMouse(wxMouseEvent& event) {
    if (event.LeftDown()) {
        CaptureMouse();
    } else if (event.LeftUp()) {
        if (HasCapture()) {
            ReleaseMouse();
        }
        return;
    } else if (!event.Dragging() || !HasCapture()) {
        return;
    }
    const int w = GetClientSize().x;
    if (w <= 26 || m_max <= m_min) {
        return;
    }
    const int at = std::clamp(event.GetX() - 13, 0, w - 26);
    // Ticks are whole steps: the thumb snaps to the nearest.
    const int span = m_max - m_min;
    SetPos(m_min + (at * span + (w - 26) / 2) / (w - 26));
    wxCommandEvent moved(wxEVT_SLIDER, GetId());
    moved.SetInt(m_pos);
    moved.SetEventObject(this);
    ProcessWindowEvent(moved);
}

}  // namespace ac
