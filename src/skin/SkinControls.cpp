#include "skin/SkinControls.h"

#include <wx/dcbuffer.h>
#include <wx/settings.h>

#include <algorithm>

namespace ac {

namespace {
constexpr int kIconTextGap = 4;
}  // namespace

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

wxSize ImButton::FitSize() const {
    const wxSize cell = CellSize();
    if (!m_bText || GetLabel().empty() || cell.y <= 0) {
        return cell;
    }
    const int textWidth = GetTextExtent(GetLabel()).x;
    if (IsIconFace()) {
        return {cell.x + kIconTextGap + textWidth + kIconTextGap, cell.y};
    }
    return {std::max(cell.x, textWidth + 2 * std::max(8, m_textOffset.x)), cell.y};
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
    const bool iconBeside = IsIconFace() && size.x > m_picture.Width() && m_bText &&
                            !GetLabel().empty();
    if (ch > 0 && iconBeside) {
        DrawPictureCell(dc, 0, (size.y - ch) / 2, m_picture,
                        wxRect(0, cell * ch, m_picture.Width(), ch));
    } else if (ch > 0) {
        DrawWidenedCell(dc, 0, 0, size.x, m_picture, wxRect(0, cell * ch, m_picture.Width(), ch));
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
        if (iconBeside) {
            const int left = m_picture.Width() + kIconTextGap;
            textRect = wxRect(left, 0, size.x - left, size.y);
        }
        // A translation longer than the face starts at the text position instead of spilling
        // over the picture's left part.
        const bool fits = dc.GetTextExtent(GetLabel()).x <= textRect.width;
        wxDCClipper clip(dc, textRect);
        dc.DrawLabel(GetLabel(), textRect,
                     fits && !iconBeside ? wxALIGN_CENTER
                                         : (wxALIGN_LEFT | wxALIGN_CENTER_VERTICAL));
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

// --- ImSlider -----------------------------------------------------------------------------

ImSlider::ImSlider(wxWindow* parent, int id)
    : wxWindow(parent, id, wxDefaultPosition, wxSize(200, 28), wxBORDER_NONE) {
    SetBackgroundStyle(wxBG_STYLE_PAINT);
    m_bgColour = wxSystemSettings::GetColour(wxSYS_COLOUR_BTNFACE);
    m_textColour = wxSystemSettings::GetColour(wxSYS_COLOUR_BTNTEXT);
    Bind(wxEVT_PAINT, &ImSlider::OnPaint, this);
    Bind(wxEVT_LEFT_DOWN, &ImSlider::OnMouse, this);
    Bind(wxEVT_MOTION, &ImSlider::OnMouse, this);
    Bind(wxEVT_LEFT_UP, &ImSlider::OnMouse, this);
}

void ImSlider::SetRange(int minimum, int maximum) {
    m_min = minimum;
    m_max = maximum;
    Refresh(false);
}

void ImSlider::SetPos(int position) {
    m_pos = position;
    Refresh(false);
}

void ImSlider::SetTotal(int seconds) {
    m_total = seconds;
    Refresh(false);
}

void ImSlider::SetPictures(SkinPicture fore, SkinPicture gone, SkinPicture block, SkinPicture bg) {
    m_fore = std::move(fore);
    m_gone = std::move(gone);
    m_block = std::move(block);
    m_bg = std::move(bg);
    Refresh(false);
}

void ImSlider::SetColours(const wxColour& background, const wxColour& text) {
    m_bgColour = background;
    m_textColour = text;
    Refresh(false);
}

void ImSlider::DrawTrack(wxDC& dc, const SkinPicture& picture, int y, int fromX, int toX) const {
    DrawSliderTrack(dc, picture, y, fromX, toX);
}

// A track picture: its first columns at the left end, its last at the right end, and columns 2
// and 3 repeated between them.
void DrawSliderTrack(wxDC& dc, const SkinPicture& picture, int y, int fromX, int toX) {
    const int pw = picture.Width();
    const int ph = picture.Height();
    if (pw < 4 || toX <= fromX) {
        return;
    }
    wxDCClipper clip(dc, wxRect(fromX, y, toX - fromX, ph));
    DrawPictureCell(dc, fromX, y, picture, wxRect(0, 0, pw - 2, ph));
    // The middle repeats the picture's columns 2 and 3. Tiled into one strip first and drawn
    // once: a blit per two pixels made the sliders the dearest part of the first paint.
    const int middleFrom = fromX + pw - 2;
    const int middleTo = toX - (pw - 2);
    if (middleTo > middleFrom) {
        const wxRect cellRect(2, 0, 2, ph);
        const wxImage cell = picture.fromPng ? picture.image.GetSubImage(cellRect)
                                             : picture.bitmap.GetSubBitmap(cellRect).ConvertToImage();
        const int width = (middleTo - middleFrom + 1) / 2 * 2;
        wxImage strip(width, ph, false);
        if (cell.HasAlpha()) {
            strip.InitAlpha();
        }
        for (int x = 0; x < width; x += 2) {
            strip.Paste(cell, x, 0);
        }
        // As the cells were drawn: with their alpha for a PNG, a BMP's pixels as they are.
        dc.DrawBitmap(wxBitmap(strip), middleFrom, y, picture.fromPng);
    }
    if (toX - fromX >= 2 * (pw - 2)) {
        DrawPictureCell(dc, toX - (pw - 2), y, picture, wxRect(2, 0, pw - 2, ph));
    }
}

void ImSlider::OnPaint(wxPaintEvent& /*event*/) {
    wxAutoBufferedPaintDC dc(this);
    const wxSize size = GetClientSize();
    const int w = size.x;
    const int h = size.y;
    const bool text = m_mode == "Video Converter";
    const int trackY = text ? 13 : 0;
    const int thumb = SliderThumbX(m_pos, m_min, m_max, w);
    dc.SetBackground(wxBrush(m_bgColour));
    dc.Clear();
    if (text) {
        // The time band is a shade of the panel's own colour towards its text, so the time
        // reads on a light skin and a dark one alike (fixed greys left light text unreadable).
        const auto towardText = [this](int percent) {
            const auto mix = [percent](unsigned char from, unsigned char to) {
                return static_cast<unsigned char>(from + (to - from) * percent / 100);
            };
            return wxColour(mix(m_bgColour.Red(), m_textColour.Red()),
                            mix(m_bgColour.Green(), m_textColour.Green()),
                            mix(m_bgColour.Blue(), m_textColour.Blue()));
        };
        dc.SetPen(*wxTRANSPARENT_PEN);
        dc.SetBrush(wxBrush(towardText(10)));
        dc.DrawRectangle(0, 0, w, 11);
        dc.SetBrush(wxBrush(towardText(25)));
        dc.DrawRectangle(0, 11, w, 2);
        DrawTiledPicture(dc, wxRect(0, trackY, w, std::max(1, m_bg.Height())), m_bg);
    } else if (m_bg.IsOk()) {
        DrawTiledPicture(dc, wxRect(size), m_bg);
    }
    if (m_fore.IsOk()) {
        DrawTrack(dc, m_fore, trackY, 12, w - 10);
    } else {
        dc.SetPen(wxPen(m_textColour));
        dc.DrawLine(12, h - 6, w - 12, h - 6);
        dc.DrawLine(12, h - 5, w - 12, h - 5);
    }
    if (m_gone.IsOk()) {
        DrawTrack(dc, m_gone, trackY, 12, thumb);
    }
    if (m_block.IsOk()) {
        dc.DrawBitmap(m_block.bitmap, thumb - 5, trackY, true);
    } else {
        dc.SetPen(wxPen(m_textColour));
        dc.SetBrush(*wxTRANSPARENT_BRUSH);
        dc.DrawRectangle(thumb - 3, h - 9, 6, 6);
    }
    if (text) {
        auto clock = [](int seconds) {
            return wxString::Format("%02d:%02d:%02d", seconds / 3600, seconds / 60 % 60,
                                    seconds % 60);
        };
        dc.SetFont(GetFont());
        dc.SetTextForeground(m_textColour);
        // The preview's position runs in milliseconds, its total in seconds.
        const wxString label = clock(m_pos / 1000) + "/" + clock(m_total);
        dc.DrawText(label, (w - dc.GetTextExtent(label).x) / 2, 0);
    }
}

void ImSlider::OnMouse(wxMouseEvent& event) {
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
    SetPos(m_min + static_cast<int>(static_cast<long long>(at) * (m_max - m_min) / (w - 26)));
    wxCommandEvent moved(wxEVT_SLIDER, GetId());
    moved.SetInt(m_pos);
    moved.SetEventObject(this);
    ProcessWindowEvent(moved);
}

// --- ImCapacityBar ------------------------------------------------------------------------

ImCapacityBar::ImCapacityBar(wxWindow* parent, int id)
    : wxWindow(parent, id, wxDefaultPosition, wxSize(300, 36), wxBORDER_NONE) {
    SetBackgroundStyle(wxBG_STYLE_PAINT);
    Bind(wxEVT_PAINT, &ImCapacityBar::OnPaint, this);
}

void ImCapacityBar::SetMarks(long long nearOverflow, long long overflow, long long maximum) {
    m_near = nearOverflow;
    m_over = overflow;
    m_maximum = maximum;
    Refresh(false);
}

void ImCapacityBar::SetScale(long long step, const wxString& unit) {
    m_step = step;
    m_unit = unit;
    Refresh(false);
}

void ImCapacityBar::SetPictures(SkinPicture fore, SkinPicture nearFore, SkinPicture overFore,
                                SkinPicture bg) {
    m_fore = std::move(fore);
    m_nearFore = std::move(nearFore);
    m_overFore = std::move(overFore);
    m_bg = std::move(bg);
    Refresh(false);
}

void ImCapacityBar::SetColours(const wxColour& tickPen, const wxColour& tickText) {
    m_tickPen = tickPen;
    m_tickText = tickText;
    Refresh(false);
}

void ImCapacityBar::OnPaint(wxPaintEvent& /*event*/) {
    wxAutoBufferedPaintDC dc(this);
    const wxSize size = GetClientSize();
    dc.SetBackground(wxBrush(GetParent()->GetBackgroundColour()));
    dc.Clear();
    const int barHeight = std::max(8, m_bg.IsOk() ? m_bg.Height() : size.y / 2);
    const wxRect bar(0, size.y - barHeight, size.x, barHeight);
    if (m_bg.IsOk()) {
        DrawTiledPicture(dc, bar, m_bg);
    } else {
        dc.SetBrush(wxBrush(wxSystemSettings::GetColour(wxSYS_COLOUR_3DLIGHT)));
        dc.SetPen(*wxTRANSPARENT_PEN);
        dc.DrawRectangle(bar);
    }
    static const wxColour kFallback[3] = {wxColour(0x3B, 0x82, 0xF6), wxColour(0xF5, 0x9E, 0x0B),
                                          wxColour(0xE0, 0x44, 0x3E)};
    const SkinPicture* pictures[3] = {&m_fore, &m_nearFore, &m_overFore};
    for (const CapacityRun& run :
         CapacityRuns(m_pos, m_range, m_near, m_over, m_maximum, size.x, m_leftMargin)) {
        const int kind = static_cast<int>(run.fill);
        const wxRect part(run.x0, bar.y, run.x1 - run.x0, bar.height);
        if (pictures[kind]->IsOk()) {
            DrawTiledPicture(dc, part, *pictures[kind]);
        } else {
            dc.SetBrush(wxBrush(kFallback[kind]));
            dc.DrawRectangle(part);
        }
    }
    dc.SetFont(GetFont());
    dc.SetTextForeground(m_tickText);
    const auto ticks = CapacityScale(m_maximum, m_step, size.x, m_leftMargin);
    for (std::size_t i = 0; i < ticks.size(); ++i) {
        dc.SetPen(wxPen(m_tickPen));
        dc.DrawLine(ticks[i].x, 8, ticks[i].x, bar.y);
        const wxString label = i + 1 == ticks.size()
                                   ? wxString::Format("%lld %s", ticks[i].value, m_unit)
                                   : wxString::Format("%lld", ticks[i].value);
        dc.DrawText(label, ticks[i].x - 5 - dc.GetTextExtent(label).x, 0);
    }
}

}  // namespace ac
