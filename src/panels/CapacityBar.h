#pragma once
// The bar of the status panel: the progress of a conversion or rip run, or in the creator mode
// the capacity gauge of the disc with its marks and scale. It paints itself from skin pictures;
// the status panel hands them in on each change of skin.
//
// Thread contract: UI thread only.

#include "panels/StatusLogic.h"
#include "skin/SkinPicture.h"

#include <wx/font.h>
#include <wx/window.h>

namespace ac {

class CapacityBar : public wxWindow {
public:
    CapacityBar(wxWindow* parent, int id);

    // Range 0 to maximum, with the three capacity marks.
    void SetMarks(long long nearMark, long long overMark, long long maxMark);
    // Range low to high as a plain progress bar: the marks and the scale go.
    void SetPlainRange(long long low, long long high);
    using wxWindow::SetPosition;
    void SetPosition(long long value);
    void SetText(const wxString& text);
    void SetUnitText(const wxString& text);
    void SetTickStep(long long step);

    // Setting the background gives the bar the picture's height.
    void SetBackgroundPicture(SkinPicture picture, int bgMode, int hSplitter, int vSplitter);
    void SetForePictures(SkinPicture fore, SkinPicture nearOverflowFore, SkinPicture overflowFore);
    void SetFramed(bool framed);
    void SetTileOffset(int x, int y);
    void SetTextOffset(int x, int y);
    void SetColours(const wxColour& text, const wxColour& trickText, const wxColour& trickPen);
    void SetBarFont(const wxFont& font);

    // The background's height, or the bar's own without one.
    int PictureHeight() const { return m_background.IsOk() ? m_background.Height() : GetSize().y; }
    long long Position() const { return m_state.position; }
    const wxString& Text() const { return m_text; }
    const wxString& UnitText() const { return m_unitText; }
    long long TickStep() const { return m_tickStep; }
    // The painting state at the present width.
    CapacityBarState State() const;

private:
    void OnPaint(wxPaintEvent& event);
    void PaintBackground(wxDC& dc, const wxSize& size) const;
    void PaintRuns(wxDC& dc) const;
    void PaintScale(wxDC& dc) const;

    SkinPicture m_background;
    int m_bgMode = 0;
    int m_bgHSplitter = -1;
    int m_bgVSplitter = -1;
    SkinPicture m_fore, m_nearOverflowFore, m_overflowFore;
    bool m_framed = true;
    int m_tileOffsetX = 0;
    int m_tileOffsetY = 0;
    int m_textX = 0;
    int m_textY = 0;
    wxColour m_textColor{0, 0, 0};
    wxColour m_trickTextColor{0, 0, 0};
    wxColour m_trickPenColor{0, 0, 0};
    wxFont m_font;
    wxString m_text;
    wxString m_unitText;
    long long m_tickStep = 10;
    CapacityBarState m_state;
};

}  // namespace ac
