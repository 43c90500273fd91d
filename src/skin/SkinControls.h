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

}  // namespace ac
