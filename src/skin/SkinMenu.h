#pragma once
// The drawn menu bar of the main window and its popups. The wx menus stay the one source of
// texts, check marks, enable states and command ids: bar and popups read them at each paint,
// so translation and the enable rules reach them without further steps. A chosen row ends as an
// ordinary wxEVT_MENU command to the owner, posted so that the popups close first.
//
// Thread contract: UI thread only.

#include "skin/SkinDialog.h"

#include <wx/menu.h>
#include <wx/popupwin.h>

#include <memory>
#include <vector>

namespace ac {

// A menu bar's data: the top-level captions and their popups, owned.
struct ImMenu {
    int resourceId = 0;
    std::vector<std::pair<wxString, std::unique_ptr<wxMenu>>> tops;
};

class ImMenuBar;
class ImMenuPopup;

// Popups are top-level windows: wx frees them at idle time, never inside their own handlers.
struct PopupDestroyer {
    void operator()(ImMenuPopup* popup) const;
};
using PopupPtr = std::unique_ptr<ImMenuPopup, PopupDestroyer>;

class ImMenuPopup : public wxPopupWindow {
public:
    ImMenuPopup(wxWindow* owner, ImMenuBar* bar, const wxFont& font);
    ~ImMenuPopup() override;
    void SetMenu(wxMenu* menu) { m_pMenu = menu; }
    void SetPopupFont(const wxFont& font) { m_font = font; }
    wxMenu* GetMenu() const { return m_pMenu; }
    void Measure();
    void ShowAt(int x, int y);
    void ClosePopup();
    bool IsPopupShown() const { return m_bShown; }
    // Key handling; answers whether the key was used.
    bool OnKey(int key);
    bool HasHotRow() const { return m_hot >= 0; }
    ImMenuPopup* Child() const { return m_pChild.get(); }
    int PopupWidth() const { return m_width; }

private:
    void OnPaint(wxPaintEvent& event);
    void OnMouse(wxMouseEvent& event);
    int RowAt(const wxPoint& client) const;
    void SetHot(int row);
    void OpenChild(int row);
    // A separator or a dead row does nothing; a command posts itself to the owner.
    bool Activate(int row);
    bool IsDead(int row) const;

    PopupPtr m_pChild;
    int m_hot = -1;
    bool m_bShown = false;
    wxWindow* m_pOwner;
    ImMenuBar* m_pBar;
    wxMenu* m_pMenu;
    wxFont m_font;
    std::vector<SkinRect> m_rects;
    std::vector<char> m_hotKeys;
    int m_width = 0;
    int m_height = 0;
    int m_ignoreMoves = 0;
};

struct MenuColours {
    bool useColours = true;
    wxColour itemBg{0xBA, 0xC2, 0xCE};
    wxColour menuBorder{0x9D, 0x9D, 0xA1};
    wxColour groupLine{0xFF, 0xFF, 0xFF};
    wxColour selectBg{0xF2, 0xF4, 0xF7};
    wxColour subMenuBg{0xDF, 0xE4, 0xEA};
    wxColour normalText;
    wxColour disableText;
    wxColour selectedText;
    wxColour mainMenuBorder{0x90, 0x90, 0x90};
};

class ImMenuBar : public wxWindow, public ImSkinObject {
public:
    ImMenuBar(wxWindow* parent, ImSkinDialog* owner);
    ~ImMenuBar() override;

    void SetMenu(std::unique_ptr<ImMenu> menu);
    ImMenu* GetMenu() const { return m_menu.get(); }
    void Measure();
    void SetUseColors(bool use) { m_colours.useColours = use; }
    void SetColours(const MenuColours& colours) {
        m_colours = colours;
        Refresh();
    }
    const MenuColours& Colours() const { return m_colours; }
    void CloseMenus();
    // Before the owner goes: the popups are freed while the bar can still reach them.
    void DestroyPopups();
    wxSize GetBarSize() const;
    bool OnSkinChanged(const std::string& skinDir) override;
    bool IsOpen() const { return m_bOpen; }
    // A row was chosen: leave open mode and close everything before the command runs.
    void CommandChosen();
    void AnnouncePopup(wxMenu* menu);
    ImMenuPopup* Popup() const { return m_popup.get(); }
    // Enters open mode on entry index, as a click on it does.
    void OpenByIndex(int index);

private:
    void OnPaint(wxPaintEvent& event);
    void OnMouse(wxMouseEvent& event);
    void OnKeyDown(wxKeyEvent& event);
    int EntryAt(const wxPoint& point) const;
    void OpenEntry(int index);
    wxString EntryText(int index) const;

    // Closes open menus on a click anywhere else and on Escape, wherever the focus is.
    class DismissFilter;
    bool OwnsWindow(const wxWindow* window) const;
    std::unique_ptr<DismissFilter> m_dismissFilter;

    MenuColours m_colours;
    std::unique_ptr<ImMenu> m_menu;
    int m_hot = -1;
    bool m_bOpen = false;
    std::vector<SkinRect> m_itemRects;
    std::vector<char> m_hotKeys;
    PopupPtr m_popup;
    int m_ignoreMoves = 0;
    bool m_bDragging = false;
    wxPoint m_dragPoint;
    int m_itemCount = 0;
    wxFont m_menuFont;
    wxFont m_popupFont;
    ImSkinDialog* m_owner;
    int m_splitCol = 0;
    wxColour m_textColour;
    // Entry rectangles come from the skin's Menu section.
    int m_itemLeft = 0, m_itemWidth = 66, m_itemHeight = 16, m_itemCountSkin = 4, m_itemSpacing = 3,
        m_marginTop = 3;
};

}  // namespace ac
