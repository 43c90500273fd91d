#include "panels/CapacityBar.h"

#include <wx/dcbuffer.h>
#include <wx/settings.h>

namespace ac {

CapacityBar::CapacityBar(wxWindow* parent, int id)
    : wxWindow(parent, id, wxDefaultPosition, wxSize(200, 16), wxBORDER_NONE),
      m_font(wxFontInfo(9).FaceName(wxEmptyString)) {
    SetBackgroundStyle(wxBG_STYLE_PAINT);
    Bind(wxEVT_PAINT, &CapacityBar::OnPaint, this);
}

void CapacityBar::SetMarks(long long nearMark, long long overMark, long long maxMark) {
    m_state.low = 0;
    m_state.high = maxMark;
    m_state.nearMark = nearMark;
    m_state.overMark = overMark;
    m_state.maxMark = maxMark;
    Refresh(false);
}

void CapacityBar::SetPlainRange(long long low, long long high) {
    m_state.low = low;
    m_state.high = high;
    m_state.nearMark = m_state.overMark = m_state.maxMark = 0;
    Refresh(false);
}

void CapacityBar::SetPosition(long long value) {
    m_state.position = value;
    Refresh(false);
}

void CapacityBar::SetText(const wxString& text) {
    m_text = text;
    Refresh(false);
}

void CapacityBar::SetUnitText(const wxString& text) {
    m_unitText = text;
}

void CapacityBar::SetTickStep(long long step) {
    m_tickStep = step;
}

void CapacityBar::SetBackgroundPicture(SkinPicture picture, int bgMode, int hSplitter,
                                       int vSplitter) {
    m_background = std::move(picture);
    m_bgMode = bgMode;
    m_bgHSplitter = hSplitter;
    m_bgVSplitter = vSplitter;
    if (m_background.IsOk()) {
        SetSize(-1, m_background.Height());
    }
    Refresh(false);
}

void CapacityBar::SetForePictures(SkinPicture fore, SkinPicture nearOverflowFore,
                                  SkinPicture overflowFore) {
    m_fore = std::move(fore);
    m_nearOverflowFore = std::move(nearOverflowFore);
    m_overflowFore = std::move(overflowFore);
    Refresh(false);
}

void CapacityBar::SetFramed(bool framed) {
    m_framed = framed;
    Refresh(false);
}

void CapacityBar::SetTileOffset(int x, int y) {
    m_tileOffsetX = x;
    m_tileOffsetY = y;
    Refresh(false);
}

void CapacityBar::SetTextOffset(int x, int y) {
    m_textX = x;
    m_textY = y;
    Refresh(false);
}

void CapacityBar::SetColours(const wxColour& text, const wxColour& trickText,
                             const wxColour& trickPen) {
    m_textColor = text;
    m_trickTextColor = trickText;
    m_trickPenColor = trickPen;
    Refresh(false);
}

void CapacityBar::SetBarFont(const wxFont& font) {
    m_font = font;
    Refresh(false);
}

CapacityBarState CapacityBar::State() const {
    CapacityBarState state = m_state;
    state.tileOffsetX = m_tileOffsetX;
    state.width = GetClientSize().x;
    return state;
}

void CapacityBar::PaintBackground(wxDC& dc, const wxSize& size) const {
    const wxRect all(0, 0, size.x, size.y);
    dc.SetPen(*wxTRANSPARENT_PEN);
    dc.SetBrush(wxBrush(GetParent()->GetBackgroundColour()));
    dc.DrawRectangle(all);
    if (m_framed) {
        dc.SetBrush(wxBrush(wxSystemSettings::GetColour(wxSYS_COLOUR_WINDOW)));
        dc.SetPen(wxPen(wxSystemSettings::GetColour(wxSYS_COLOUR_3DSHADOW)));
        dc.DrawRectangle(all);
    }
    if (!m_background.IsOk()) {
        return;
    }
    if (m_bgMode == 0) {
        DrawSplitPicture(dc, all, m_background, m_bgHSplitter, m_bgVSplitter);
    } else if (m_bgMode == 2) {
        DrawTiledPicture(dc, all, m_background);
    }
}

void CapacityBar::PaintRuns(wxDC& dc) const {
    if (!m_fore.IsOk()) {
        return;
    }
    const CapacityBarState state = State();
    std::vector<CapacityRun> runs{{m_tileOffsetX, FilledWidth(state), CapacityFill::Normal}};
    if (HasCapacityMarks(state)) {
        runs = CapacityBarRuns(state);
    }
    const SkinPicture* pictures[3] = {&m_fore, &m_nearOverflowFore, &m_overflowFore};
    for (const CapacityRun& run : runs) {
        const SkinPicture& picture = *pictures[static_cast<int>(run.fill)];
        if (!picture.IsOk()) {
            continue;
        }
        // Whole copies of the tile, as the skins were drawn for: the last may reach past the
        // run's end and is then covered by the next run.
        for (int x : TileStarts(run.x0, run.x1, picture.Width())) {
            dc.DrawBitmap(picture.bitmap, x, m_tileOffsetY, true);
        }
    }
}

void CapacityBar::PaintScale(wxDC& dc) const {
    const auto ticks = CapacityBarScale(State(), m_tickStep);
    dc.SetFont(m_font);
    dc.SetTextForeground(m_trickTextColor);
    dc.SetBackgroundMode(wxTRANSPARENT);
    dc.SetPen(wxPen(m_trickPenColor));
    for (std::size_t i = 0; i < ticks.size(); ++i) {
        dc.DrawLine(ticks[i].x, 0, ticks[i].x, 8);
        const wxString label = i + 1 == ticks.size()
                                   ? wxString::Format("%lld %s", ticks[i].value, m_unitText)
                                   : wxString::Format("%lld", ticks[i].value);
        dc.DrawText(label, ticks[i].x - 5, 10);
    }
}

void CapacityBar::OnPaint(wxPaintEvent& /*event*/) {
    wxAutoBufferedPaintDC dc(this);
    const wxSize size = GetClientSize();
    PaintBackground(dc, size);
    PaintRuns(dc);
    PaintScale(dc);
    if (!m_text.empty()) {
        dc.SetFont(m_font);
        dc.SetTextForeground(m_textColor);
        dc.SetBackgroundMode(wxTRANSPARENT);
        dc.DrawText(m_text, m_textX, m_textY);
    }
}

}  // namespace ac
