#pragma once
// PropertyTree: the child window of PropertiesCtrl that holds the rows, paints them in two
// columns, folds categories, keeps the selection and places the in-place editor of the selected
// row. Value changes made through an editor come back here, are painted, and then reach the
// owner's OnPropertyChanged, so the notification always sees the new value.
//
// Thread contract: UI thread only.

#include "profile/grid/PropertyItems.h"

#include <wx/colour.h>
#include <wx/font.h>
#include <wx/textctrl.h>
#include <wx/window.h>

#include <memory>
#include <string>
#include <vector>

namespace ac {

class InPlaceEdit;
class InPlaceList;

class PropertyTree : public wxWindow {
public:
    static constexpr int kDefaultGutterWidth = 16;
    static constexpr int kDefaultLabelColumnWidth = 150;
    static constexpr int kMinColumnWidth = 20;
    static constexpr int kEditTextInset = 4;

    PropertyTree(PropertiesCtrl* owner, int id);
    ~PropertyTree() override;

    // --- rows
    PropertyNode* Root() { return &m_root; }
    PropertyNode* AddNode(PropertyNode* parent, std::unique_ptr<GWCPropertyItem> item);
    void RemoveNode(PropertyNode* node);
    void RemoveAllNodes();
    bool Contains(const PropertyNode* node) const;
    const std::vector<PropertyNode*>& VisibleNodes() const;
    void SetExpanded(PropertyNode* node, bool expanded);
    // Repaints one row; `now` paints before returning, so that a notification that follows
    // finds the new value on screen too. Client writes wait for the next paint instead, since
    // one change may rewrite every row.
    void RefreshNode(const PropertyNode* node, bool now = false);
    // Rows, help or values changed: repaint, and the open editor follows the value.
    void NodeChanged(PropertyNode* node);

    // --- selection and editors
    PropertyNode* Selection() const { return m_selection; }
    void SelectNode(PropertyNode* node);
    void MoveSelection(int delta);
    PropertyNode* EditorNode() const { return m_editorNode; }
    // The edit of the open editor (the plain edit or the edit of an "editlist"); null for none.
    wxTextCtrl* OpenEditText() const;
    bool IsListOpen() const;
    // Steps 1 to 5 of a commit: the value parses the edit's text, the edit shows the value's
    // form, the row is repainted, and a changed text is announced. True when it changed.
    bool CommitOpenEdit();
    // Up, Down, Home and End on a list editor. True when the value changed.
    bool StepListValue(int keyCode);
    // A line of the drop-down list chosen: the value takes it when it differs.
    bool ChooseOption(const std::string& text);
    void FocusEditor();
    // The selected row's editor again, after its editor or state changed.
    void ReopenEditor();
    // The owner is going: forget rows that an editor's last focus event could reach.
    void Shutdown();

    // --- look
    int GutterWidth() const { return m_gutterWidth; }
    int LabelColumnWidth() const { return m_labelColumnWidth; }
    int SetLabelColumnWidth(int width);
    const wxColour& GridLineColor() const { return m_gridLineColor; }
    void SetGridLineColor(const wxColour& colour);
    const wxColour& RowBackground() const { return m_background; }
    void SetRowBackground(const wxColour& colour);
    // Text of labels, values and the help pane; a dark skin needs light text on its rows.
    const wxColour& TextColour() const { return m_textColour; }
    void SetTextColour(const wxColour& colour);
    const wxFont& TreeFont() const;
    void SetTreeFont(const wxFont& font);
    void EnableToolTips(bool enable);
    void SetListLines(int lines);
    bool ToolTipsEnabled() const { return m_toolTipsEnabled; }
    int RowHeight() const;
    int ValueLeft() const { return m_gutterWidth + m_labelColumnWidth + 2; }

    PropertiesCtrl* Owner() const { return m_owner; }
    PropertyIterator IteratorOf(PropertyNode* node) { return PropertyIterator(this, node); }

private:
    // PropertyTreeView.cpp: painting, mouse, keys, scrolling.
    void BindViewEvents();
    void OnPaint(wxPaintEvent& event);
    void PaintRow(wxDC& dc, const PropertyNode* node, const wxRect& row);
    void PaintFoldSign(wxDC& dc, const PropertyNode* node, const wxRect& sign);
    wxRect FoldSignRect(const PropertyNode* node, const wxRect& row) const;
    int LabelLeft(const PropertyNode* node) const;
    void OnMouseDown(wxMouseEvent& event);
    void OnMouseDouble(wxMouseEvent& event);
    void OnMouseUp(wxMouseEvent& event);
    void OnMouseMove(wxMouseEvent& event);
    void OnMouseWheel(wxMouseEvent& event);
    void OnKeyDown(wxKeyEvent& event);
    void OnScroll(wxScrollWinEvent& event);
    void OnSize(wxSizeEvent& event);
    int RowAt(int y) const;
    wxRect RowRect(int visibleIndex) const;
    int VisibleIndexOf(const PropertyNode* node) const;
    int PageRows() const;
    void ScrollToRow(int topRow);
    void EnsureVisible(const PropertyNode* node);
    void UpdateScrollBar();
    void UpdateToolTip(int row);

    // PropertyTree.cpp
    void RebuildRows() const;
    void RowsChanged();
    void OpenEditor(PropertyNode* node);
    void EnsureEditors();
    void CloseEditor(bool commit);
    void PlaceEditor();
    void AnnounceChange(PropertyNode* node);

    PropertiesCtrl* m_owner;
    PropertyNode m_root;
    mutable std::vector<PropertyNode*> m_rows;
    mutable bool m_rowsDirty = true;
    bool m_rebuiltSincePaint = false;
    bool m_scrollBarStale = false;
    int m_topRow = 0;

    PropertyNode* m_selection = nullptr;
    PropertyNode* m_editorNode = nullptr;
    // Kept apart from the row: a client may point the row at another editor while it is open.
    InPlaceStyle m_openStyle = InPlaceStyle::None;
    InPlaceEdit* m_edit = nullptr;  // both made by EnsureEditors
    InPlaceList* m_list = nullptr;
    bool m_textColourSet = false;
    bool m_backgroundSet = false;
    int m_listLines = 0;

    int m_gutterWidth = kDefaultGutterWidth;
    int m_labelColumnWidth = kDefaultLabelColumnWidth;
    wxColour m_gridLineColor{192, 192, 192};
    wxColour m_background;
    wxColour m_textColour;
    mutable wxFont m_font;
    mutable int m_rowHeight = 0;
    bool m_toolTipsEnabled = false;
    int m_toolTipRow = -1;
    bool m_draggingColumn = false;
};

}  // namespace ac
