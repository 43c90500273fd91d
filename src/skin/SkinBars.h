#pragma once
// The drawn title bar with its minimise, maximise and close buttons, and the frame's status
// strip.
//
// Thread contract: UI thread only.

#include "skin/SkinDialog.h"

#include <wx/icon.h>

namespace ac {

class ImSysButtons : public wxWindow, public ImSkinObject {
public:
    explicit ImSysButtons(wxWindow* captionBar);
    bool OnSkinChanged(const std::string& skinDir) override;
    // Places the group inside a caption bar of the given width and height.
    void Place(int barWidth, int barHeight);
    int HitTest(const wxPoint& point) const;

private:
    void OnPaint(wxPaintEvent& event);
    void OnMouse(wxMouseEvent& event);
    void Press(int button);

public:
    bool HasMaximize() const { return m_bHasMaximize; }

private:

    SysButtonLayout m_layout;
    int m_state = 0;
    int m_hot = -1;
    int m_pressed = -1;
    // The main window resizes, so it offers maximise too.
    bool m_bHasMaximize = true;
    int m_indent = 0;
    int m_topIndent = -1;
};

class ImCaptionBar : public wxWindow, public ImSkinObject {
public:
    explicit ImCaptionBar(wxWindow* parent);
    bool OnSkinChanged(const std::string& skinDir) override;
    int GetBarHeight() const { return m_height; }
    void SetSmallIcon(const wxBitmap& icon) {
        m_icon = icon;
        Refresh();
    }
    void SetMenu(class wxMenu* menu) { m_menu = menu; }

private:
    void OnPaint(wxPaintEvent& event);
    void OnSize(wxSizeEvent& event);
    void OnMouse(wxMouseEvent& event);

    int m_height = 21;
    bool m_bMoving = false;
    wxPoint m_movePoint;
    ImSysButtons* m_sysButtons;
    wxMenu* m_menu = nullptr;
    wxBitmap m_icon;
    // Read at each change of skin, so that painting needs no lookups.
    int m_splitRow = 10;
    int m_splitCol = 21;
    int m_textOffset = 0;
    int m_textVOffset = 0;
    int m_iconOffset = 0;
    int m_iconVOffset = 0;
    bool m_noText = false;
    wxFont m_font;
    wxColour m_textColour;
};

class ImStatusBarCtrl : public wxWindow {
public:
    explicit ImStatusBarCtrl(wxWindow* parent);
    void SetPicture(SkinPicture picture) {
        m_picture = std::move(picture);
        Refresh();
    }
    void SetText(const wxString& text) {
        m_text = text;
        Refresh();
    }

private:
    void OnPaint(wxPaintEvent& event);
    SkinPicture m_picture;
    wxString m_text;
};

}  // namespace ac
