#pragma once
// The skinned bases of every window: ImSkinObject ties a window to a skin picture,
// ImSkinDialog paints the section's background, places its caption and menu bar and moves or
// resizes the window by hand; ImSkinPanel and ImSkinFrame put it on a wx panel and on the
// frameless top-level window.
//
// Thread contract: UI thread only.

#include "skin/SkinConfig.h"
#include "skin/SkinManager.h"
#include "skin/SkinPicture.h"

#include <wx/frame.h>
#include <wx/panel.h>
#include <wx/window.h>

#include <functional>
#include <initializer_list>
#include <memory>
#include <string>

namespace ac {

class ImMenuBar;
class ImCaptionBar;
class ImStatusBarCtrl;

class ImSkinObject : public ImSkinListener {
public:
    explicit ImSkinObject(wxWindow* window, std::string picture = {})
        : m_strPicture(std::move(picture)), m_hWnd(window) {}
    bool OnSkinChanged(const std::string& skinDir) override;

protected:
    std::string m_strPicture;
    SkinPicture m_picture;
    wxWindow* m_hWnd;
};

// What a skinned window keeps of its section after each change of skin.
struct SkinLook {
    int bgMode = 0;
    int bgHSplitter = -1;
    int bgVSplitter = -1;
    wxColour fillBg;
    wxColour childBg;
    wxColour buttonText[4];  // up, down, active, disabled
};

class ImSkinDialog : public ImSkinObject {
public:
    ImSkinDialog(wxWindow* self, int dialogId);
    ~ImSkinDialog() override;

    virtual void OnLanguageChanged() {}
    // Places the window's parts now, or, while layouts are held, once the hold ends.
    void RecalcLayout();
    // While a window of many panels is built, every panel's skin, text and size change asks
    // for a layout; held, each window is laid out once, at its final size, on release (the
    // top-level windows first, which sizes the panels in them). Nests; UI thread only.
    static void HoldLayouts();
    static void ReleaseLayouts();
    virtual const char* GetSkinSection() const { return ""; }
    virtual void DoRecalcLayout();
    virtual bool CanResize() const { return false; }
    // Before a popup of the menu bar opens: the window sets check marks and enable states.
    virtual void OnInitMenuPopup(class wxMenu* /*menu*/) {}

    bool OnSkinChanged(const std::string& skinDir) override;

    wxRect GetContentRect() const { return m_contentRect; }
    void ShowCaption(bool show);
    ImMenuBar* GetSkinMenuBar(bool create);
    ImCaptionBar* GetCaptionBar() const { return m_pCaptionBar; }
    const ImSkinConfig& Skin() const { return m_skin; }
    const SkinMetrics& Metrics() const { return m_metrics; }
    const SkinLook& Look() const { return m_look; }
    wxWindow* Window() const { return m_hWnd; }

    // Windows in a row (0) or column (1) inside rect; `rest` takes what the others leave.
    static void LayoutRow(const wxRect& rect, int direction, int gap, wxWindow* rest,
                          std::initializer_list<wxWindow*> windows);
    wxSize MaxChildSize(std::initializer_list<int> ids) const;

protected:
    // Binds paint and mouse handling; the derived constructor calls it once its wx base exists.
    void InitSkinDialog();
    virtual void PaintBackground(wxDC& dc);
    wxWindow* TopWindow() const { return wxGetTopLevelParent(m_hWnd); }

    ImCaptionBar* m_pCaptionBar = nullptr;
    ImMenuBar* m_menuBar = nullptr;
    bool m_bCaptionShown = true;
    int m_menuBarAlignment = 1;
    bool m_bDragging = false;
    wxPoint m_dragPoint;
    bool m_bResizing = false;
    wxRect m_trackRect;
    wxSize m_defaultSize{640, 480};
    wxSize m_minSize{0, 0};
    wxSize m_maxSize{-1, -1};
    wxRect m_contentRect;
    ImSkinConfig m_skin;
    SkinMetrics m_metrics;
    SkinLook m_look;
    int m_nDialogId;
    int m_menuBarTopSpacing = 0;
    bool m_titleBarBorder = true;
    bool m_menuBarBorder = true;

private:
    void OnPaint(class wxPaintEvent& event);
    void OnLeftDown(class wxMouseEvent& event);
    void OnMotion(class wxMouseEvent& event);
    void OnLeftUp(class wxMouseEvent& event);
    bool InGrip(const wxPoint& screenPoint) const;
};

// A skinned child panel; also what the other subsystems' panels derive from.
class ImSkinPanel : public wxPanel, public ImSkinDialog {
public:
    ImSkinPanel(wxWindow* parent, int id, const char* section, int dialogId = 0);
    const char* GetSkinSection() const override { return m_section.c_str(); }
    // A work mode's panel behind another tab: it takes a skin when it is next shown (the
    // owner calls g_Skin.TakeDeferredSkin then), so the start does not dress hidden panels.
    void DeferSkinWhileHidden() { m_deferSkin = true; }
    bool DefersSkin() const override { return m_deferSkin && !IsShown(); }

private:
    std::string m_section;
    bool m_deferSkin = false;
};

// The top-level skinned window: no system frame, shaped corners, a status strip, and the place
// it was left in.
class ImSkinFrame : public wxFrame, public ImSkinDialog {
public:
    ImSkinFrame(const wxString& title, int dialogId);
    ~ImSkinFrame() override;

    virtual void OnLanguageCommand() {}
    virtual void OnSkinCommand() {}

    bool OnSkinChanged(const std::string& skinDir) override;
    void DoRecalcLayout() override;

    // Restores the remembered rectangle or centres the window at its default size.
    void InitialPlacement();
    // Stores window_rect and last_skin; the caller then destroys the window.
    void SaveState();
    void ApplyCorners();
    ImStatusBarCtrl* GetStatusStrip() const { return m_statusStrip; }
    // The skin engine knows no settings store: the program hands in how to read and write one.
    void SetSettingsAccess(std::function<std::string(const char*)> read,
                           std::function<void(const char*, const std::string&)> write) {
        m_readSetting = std::move(read);
        m_writeSetting = std::move(write);
    }

protected:
    ImStatusBarCtrl* m_statusStrip = nullptr;
    int m_statusHeight = 21;
    bool m_bStatusShown = true;

private:
    std::vector<SkinRect> m_cornerRuns[4];
    std::function<std::string(const char*)> m_readSetting;
    std::function<void(const char*, const std::string&)> m_writeSetting;
};

}  // namespace ac
