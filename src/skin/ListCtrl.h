#pragma once
// XListCtrl: the lists of the three work modes. It draws every cell itself: check boxes,
// progress bars and colours per cell, under a drawn header whose columns may carry a check box
// for the whole column. Only the visible rows are painted, so ten thousand rows scroll as
// smoothly as ten.
//
// Thread contract: UI thread only. Workers change a row through the UI-thread bridge and then
// ask for RefreshRow.

#include "skin/SkinPicture.h"

#include <wx/vscroll.h>
#include <wx/window.h>

#include <string>
#include <unordered_map>
#include <vector>

namespace ac {

// Sent to the parent when a header check box changes: GetInt() is the column, GetExtraLong()
// the new state (1 unchecked, 2 checked). The number is the list's private message.
inline constexpr int kListHeaderCheckMessage = 0x542;
wxDECLARE_EVENT(EVT_XLIST_HEADER_CHECK, wxCommandEvent);

// Members ordered by size: a list of 10,000 rows holds 60,000 of these.
struct XListCell {
    std::string text;
    std::string progressFormat;  // "%d%%" when empty
    wxColour crText;
    wxColour crBackground;
    int nCheckedState = -1;  // -1 no box, 0 unchecked, 1 checked
    int nProgressPercent = 0;
    int nImage = -1;
    bool bEnabled = true;
    bool bProgress = false;
    bool bShowProgressText = true;
};

struct XListColumn {
    std::string text;
    int width = 80;
    int headerCheck = 0;  // 0 none, 1 unchecked, 2 checked
};

class ImHeaderCtrl;
class ImSkinConfig;
class XListBody;

class XListCtrl : public wxWindow {
public:
    XListCtrl(wxWindow* parent, int id);

    int InsertColumn(int index, const std::string& text, int width, bool headerCheck = false);
    int InsertItem(int index, const std::string& text);
    bool DeleteItem(int row);
    void DeleteAllItems();
    int GetItemCount() const { return static_cast<int>(m_rows.size()); }
    int GetColumnCount() const { return static_cast<int>(m_columns.size()); }

    // Each answers false (or -1) for a row or column outside the list, changing nothing.
    bool SetItemText(int row, int column, const std::string& text,
                     const wxColour& textColour = wxNullColour,
                     const wxColour& background = wxNullColour);
    std::string GetItemText(int row, int column) const;
    bool SetCheckbox(int row, int column, int checkedState);
    int GetCheckbox(int row, int column) const;
    bool SetProgress(int row, int column, bool showText = true, const std::string& format = {});
    bool UpdateProgress(int row, int column, int percent);
    bool DeleteProgress(int row, int column);
    bool SetEnabled(int row, bool enabled);
    int GetCurSel() const;
    bool IsSelected(int row) const;
    void SelectRow(int row, bool only = true);
    void RefreshRow(int row);
    int GetHeaderCheck(int column) const;
    // A click on a header check box, as the mouse gives it.
    void ToggleHeaderCheck(int column);

    void SetRowHeight(int height);
    int RowHeight() const { return m_rowHeight; }
    void SetColours(const wxColour& text, const wxColour& background, const wxColour& disabled,
                    const wxColour& progress);
    void SetFontOfCells(const wxFont& font);
    void SetHeaderPicture(SkinPicture picture, int mode, int topSplitter, int bottomSplitter);
    void SetEmptyPicture(SkinPicture picture) { m_emptyPicture = std::move(picture); }

    const std::vector<XListColumn>& Columns() const { return m_columns; }
    const XListCell* Cell(int row, int column) const;
    XListBody* Body() const { return m_body; }
    ImHeaderCtrl* Header() const { return m_header; }
    // The scroll range follows inserts and deletes on the next turn of the event loop; callers
    // that scroll at once bring it up to date first.
    void SyncRowCount();

private:
    friend class XListBody;
    friend class ImHeaderCtrl;
    XListCell* CellOf(int row, int column);
    void UpdateHeaderCheckFromRows(int column);
    void PlaceParts();
    void ScheduleRowCount();

    std::vector<XListColumn> m_columns;
    std::vector<std::vector<XListCell>> m_rows;
    std::vector<char> m_selected;
    ImHeaderCtrl* m_header;
    XListBody* m_body;
    int m_rowHeight = 17;
    int m_headerHeight = 24;
    bool m_rowCountPosted = false;
    wxColour m_textColour;
    wxColour m_bgColour;
    wxColour m_disabledColour;
    wxColour m_progressColour;
    SkinPicture m_emptyPicture;
};

// Gives a work mode's list the skin's font, row height, colours and header, the same for the
// three modes; the rows stand on `background`, the panel's own colour, so a dark skin gets a
// dark list. Answers the cells' text colour.
wxColour ApplyListSkin(XListCtrl& list, const ImSkinConfig& skin, const char* section,
                       const wxColour& background);

class ImHeaderCtrl : public wxWindow {
public:
    explicit ImHeaderCtrl(XListCtrl* list);
    void SetBackground(SkinPicture picture, int mode, int topSplitter, int bottomSplitter);
    void SetColors(const wxColour& high, const wxColour& shadow, const wxColour& background,
                   const wxColour& text);
    // The desktop's 3D colours are white edges on any background; a skinned header draws its
    // column separators as a lighter and a darker shade of its own background instead.
    void SetSkinColors(const wxColour& background, const wxColour& text);

private:
    void OnPaint(wxPaintEvent& event);
    void OnLeftDown(wxMouseEvent& event);
    XListCtrl* m_list;
    SkinPicture m_picture;
    int m_mode = 0;
    int m_topSplitter = 0;
    int m_bottomSplitter = 0;
    wxColour m_high, m_shadow, m_background, m_text;
};

class XListBody : public wxVScrolledWindow {
public:
    explicit XListBody(XListCtrl* list);
    void DrawCell(wxDC& dc, const wxRect& rect, const XListCell& cell, const XListCell& first,
                  bool selected) const;

private:
    wxCoord OnGetRowHeight(size_t row) const override;
    void OnPaint(wxPaintEvent& event);
    void OnLeftDown(wxMouseEvent& event);
    void OnKey(wxKeyEvent& event);
    wxSize MeasureText(wxDC& dc, const std::string& key, const wxString& text) const;
    XListCtrl* m_list;
    int m_anchor = -1;
    static constexpr std::size_t kMaxMeasuredTexts = 8192;
    mutable std::unordered_map<std::string, wxSize> m_extents;
    mutable wxFont m_measuredFont;
};

}  // namespace ac
