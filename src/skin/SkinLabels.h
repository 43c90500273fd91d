#pragma once
// Small skinned controls: a picture, a label, a check box with picture faces, a hyperlink and
// the tick slider of the side bar.
//
// Thread contract: UI thread only.

#include "skin/SkinControls.h"

#include <wx/window.h>

#include <vector>

namespace ac {

class ImPicture : public wxWindow {
public:
    ImPicture(wxWindow* parent, int id);
    // Mode 0 split at the splitters, 2 tiled, anything else centred (PNG stretched).
    void SetPicture(SkinPicture picture, int mode = 1, int splitRow = -1, int splitCol = -1);
    void FitToPicture();

private:
    void OnPaint(wxPaintEvent& event);
    SkinPicture m_picture;
    int m_mode = 1;
    int m_splitRow = -1;
    int m_splitCol = -1;
};

class ImLabel : public wxWindow {
public:
    ImLabel(wxWindow* parent, int id, const wxString& text, long alignment = wxALIGN_LEFT);
    void SetBgColor(const wxColour& colour);
    void SetBgPicture(SkinPicture picture);
    void SetTextColour(const wxColour& colour) {
        m_textColour = colour;
        Refresh(false);
    }
    void SetLabel(const wxString& text) override;
    void SetFramed(bool framed) {
        m_framed = framed;
        Refresh(false);
    }

private:
    void OnPaint(wxPaintEvent& event);
    int m_mode = 0;
    wxColour m_bg;
    SkinPicture m_picture;
    wxColour m_textColour;
    long m_alignment;
    bool m_framed = false;
    std::vector<wxString> m_lines;
};

// Two picture faces (unchecked, checked); the owner reads IsChecked when it needs it.
class ImCheckBox : public wxWindow {
public:
    ImCheckBox(wxWindow* parent, int id, const wxString& text, bool radio = false);
    void SetFaces(SkinPicture unchecked, SkinPicture checked);
    void SetColours(const wxColour& text, const wxColour& disabled);
    bool IsChecked() const { return m_bChecked; }
    void SetChecked(bool checked);
    bool Enable(bool enable = true) override;

private:
    void OnPaint(wxPaintEvent& event);
    void Toggle();
    void RepaintWithMargin();
    bool m_bChecked = false;
    bool m_bRadio;
    SkinPicture m_faces[2];
    wxColour m_text;
    wxColour m_disabled;
};

class ImHyperLink : public wxWindow {
public:
    ImHyperLink(wxWindow* parent, int id, const wxString& text, const wxString& url = {});
    void SetURL(const wxString& url) { m_url = url; }
    // Normal, active, visited, hover; an invalid hover colour takes the system's highlight.
    void SetColours(const wxColour& link, const wxColour& active, const wxColour& visited,
                    const wxColour& hover);
    void SetLabel(const wxString& text) override;
    bool IsVisited() const { return m_visited; }

private:
    void OnPaint(wxPaintEvent& event);
    void FollowLink();
    wxString m_url;
    wxColour m_colours[4];
    bool m_hover = false;
    bool m_visited = false;
};

class ImTickSlider : public wxWindow {
public:
    ImTickSlider(wxWindow* parent, int id);
    void SetRange(int minimum, int maximum);
    void SetPos(int position);
    int GetPos() const { return m_pos; }
    void SetTicks(int ticks) {
        m_ticks = ticks;
        Refresh(false);
    }
    void SetPictures(SkinPicture fore, SkinPicture gone, SkinPicture block,
                     SkinPicture blockDisabled, SkinPicture bg);
    void SetColours(const wxColour& background, const wxColour& pen);

private:
    void OnPaint(wxPaintEvent& event);
    void OnMouse(wxMouseEvent& event);
    int m_min = 0, m_max = 100, m_pos = 0, m_ticks = 0;
    SkinPicture m_fore, m_gone, m_block, m_blockDisabled, m_bg;
    wxColour m_bgColour, m_pen;
};

}  // namespace ac
