#pragma once
// Skinned controls drawn from skin pictures.
//
// Thread contract: UI thread only.

#include "skin/SkinPicture.h"

#include <wx/window.h>

namespace ac {

// A button whose picture holds four cells stacked top to bottom: hover, up, down, disabled.
// A click sends wxEVT_BUTTON with the button's id.
class ImButton : public wxWindow {
public:
    ImButton(wxWindow* parent, int id, const wxString& text = {});
    void SetPicture(SkinPicture picture);
    void SetTextShown(bool shown) {
        m_bText = shown;
        Refresh(false);
    }
    // Up, down, active (under the mouse), disabled.
    void SetTextColours(const wxColour colours[4]);
    void SetTextOffset(const wxPoint& offset) {
        m_textOffset = offset;
        Refresh(false);
    }
    void SetLabel(const wxString& label) override;
    bool Enable(bool enable = true) override;
    // The cell height of the picture, 0 without one.
    int CellHeight() const { return m_picture.Height() / 4; }
    wxSize CellSize() const { return {m_picture.Width(), CellHeight()}; }
    // The size that shows the picture and the whole label: an icon (a face no wider than twice
    // its height) gets its label beside it; a wide face grows to hold a longer label.
    wxSize FitSize() const;
    bool IsIconFace() const { return CellHeight() > 0 && m_picture.Width() <= 2 * CellHeight(); }

private:
    void OnPaint(wxPaintEvent& event);
    void OnMouse(wxMouseEvent& event);

    SkinPicture m_picture;
    bool m_bText = true;
    bool m_bHover = false;
    bool m_bPushed = false;
    wxColour m_colours[4];
    wxPoint m_textOffset{0, 0};
};

void DrawSliderTrack(wxDC& dc, const SkinPicture& picture, int y, int fromX, int toX);

// The preview slider: track, played part and thumb from four pictures. A click or drag moves
// the thumb and sends wxEVT_SLIDER.
class ImSlider : public wxWindow {
public:
    ImSlider(wxWindow* parent, int id);
    void SetRange(int minimum, int maximum);
    void SetPos(int position);
    int GetPos() const { return m_pos; }
    void SetTotal(int seconds);
    // "Video Converter" draws the bands and the time text; empty draws the bare slider.
    void SetMode(const wxString& mode) {
        m_mode = mode;
        Refresh(false);
    }
    void SetPictures(SkinPicture fore, SkinPicture gone, SkinPicture block, SkinPicture bg);
    void SetColours(const wxColour& background, const wxColour& text);

private:
    void OnPaint(wxPaintEvent& event);
    void OnMouse(wxMouseEvent& event);
    void DrawTrack(wxDC& dc, const SkinPicture& picture, int y, int fromX, int toX) const;

    int m_min = 0;
    int m_max = 100;
    int m_pos = 0;
    int m_total = 0;
    wxString m_mode;
    SkinPicture m_fore, m_gone, m_block, m_bg;
    wxColour m_bgColour;
    wxColour m_textColour;
};

// The burn panel's capacity bar: the filled part in up to three colours, with a scale.
class ImCapacityBar : public wxWindow {
public:
    ImCapacityBar(wxWindow* parent, int id);
    void SetRange(long long range) {
        m_range = range;
        Refresh(false);
    }
    void SetPos(long long position) {
        m_pos = position;
        Refresh(false);
    }
    void SetMarks(long long nearOverflow, long long overflow, long long maximum);
    void SetScale(long long step, const wxString& unit);
    void SetPictures(SkinPicture fore, SkinPicture nearFore, SkinPicture overFore, SkinPicture bg);
    void SetColours(const wxColour& tickPen, const wxColour& tickText);

private:
    void OnPaint(wxPaintEvent& event);

    long long m_range = 100;
    long long m_pos = 0;
    long long m_near = 0;
    long long m_over = 0;
    long long m_maximum = 0;
    long long m_step = 0;
    wxString m_unit;
    SkinPicture m_fore, m_nearFore, m_overFore, m_bg;
    wxColour m_tickPen{0x80, 0x80, 0x80};
    wxColour m_tickText{0x50, 0x50, 0x50};
    int m_leftMargin = 0;
};

}  // namespace ac
