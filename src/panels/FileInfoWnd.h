#pragma once
// CFileInfoWnd: the floating, resizable window that describes the selected row: summary,
// streams and tags, written as an HTML page into help/tempfile.htm under the user's data
// directory and shown by a wxHtmlWindow, which runs no scripts and here loads nothing but that
// local page. The skin gives its frame picture, its top corners, its close button and the
// page's background colour. One instance, made hidden by the main dialog.
//
// Thread contract: UI thread only.

#include "medialist/MediaFileInfo.h"
#include "skin/SkinConfig.h"
#include "skin/SkinManager.h"
#include "skin/SkinPicture.h"

#include <wx/frame.h>

#include <optional>
#include <string>
#include <vector>

class wxHtmlWindow;

namespace ac {

class ImButton;

class CFileInfoWnd : public wxFrame, public ImSkinListener {
public:
    static constexpr int kBrowserId = 10010;
    static constexpr int kCloseId = 10011;
    static constexpr int kCommandId = 33045;

    explicit CFileInfoWnd(wxWindow* parent);
    ~CFileInfoWnd() override;

    // False hides a shown window. True shows a hidden one, writes the page and reloads it.
    void ShowInfo(bool show);
    // What the page describes (a copy: the row may go while the window keeps it), or null for
    // the empty page; rewritten at once only while the window is shown.
    void SetItem(const MediaFileInfo* info);
    void OnLanguageChanged();
    bool OnSkinChanged(const std::string& skinDir) override;

    const std::string& PagePath() const { return m_path; }
    // The page as last written; how long its last writing and loading took, for the benchmarks.
    const std::string& PageText() const { return m_page; }
    double LastShowMs() const { return m_lastShowMs; }
    wxHtmlWindow* Browser() const { return m_browser; }
    const std::string& BackgroundColour() const { return m_bgColor; }

private:
    void WritePage();
    void ApplyPictures();
    void OnPaint(wxPaintEvent& event);
    void OnSize(wxSizeEvent& event);
    void OnMouse(wxMouseEvent& event);
    void ApplyShape();
    // Which edges a point lies on (within 3 pixels): bits 1 left, 2 right, 4 top, 8 bottom.
    int EdgesAt(const wxPoint& point) const;

    wxHtmlWindow* m_browser = nullptr;
    ImButton* m_closeButton = nullptr;
    std::string m_path;
    std::string m_bgColor = "#F3F6FA";
    std::optional<MediaFileInfo> m_info;
    std::string m_page;
    double m_lastShowMs = 0;
    ImSkinConfig m_skin;
    SkinPicture m_frame;
    std::vector<SkinRect> m_cornerLeft;
    std::vector<SkinRect> m_cornerRight;
    bool m_picturesPending = false;
    wxFont m_titleFont;
    wxColour m_titleColour{0x80, 0x80, 0x80};
    // A drag in progress: which edges move (0: the whole window), from where.
    int m_dragEdges = -1;
    wxPoint m_dragStart;
    wxRect m_startRect;
};

extern CFileInfoWnd* g_FileInfoWnd;

}  // namespace ac
