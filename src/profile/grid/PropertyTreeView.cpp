// PropertyTree: painting, mouse, keyboard and scrolling.

#include "profile/grid/PropertyTree.h"

#include "profile/grid/InPlaceEditors.h"

#include <wx/dcbuffer.h>
#include <wx/renderer.h>
#include <wx/settings.h>
#include <wx/tooltip.h>

#include <algorithm>
#include <cstdlib>

namespace ac {

namespace {

// The label of a nested row moves right by an edit control's left margin plus 11 pixels.
constexpr int kLevelIndent = 3 + 11;
constexpr int kTextMargin = 5;
constexpr int kFoldSignSize = 12;
constexpr int kColumnGrab = 3;
constexpr int kWheelRows = 3;

wxColour Blend(const wxColour& from, const wxColour& to, double share) {
    auto mix = [share](unsigned char a, unsigned char b) {
        return static_cast<unsigned char>(a + (b - a) * share + 0.5);
    };
    return wxColour(mix(from.Red(), to.Red()), mix(from.Green(), to.Green()),
                    mix(from.Blue(), to.Blue()));
}

void DrawTextCentred(wxDC& dc, const std::string& text, int left, const wxRect& row) {
    const wxString shown = wxString::FromUTF8(text);
    const int height = dc.GetTextExtent(shown.empty() ? wxString("Ag") : shown).GetHeight();
    dc.DrawText(shown, left, row.GetTop() + (row.GetHeight() - 1 - height) / 2);
}

}  // namespace

void PropertyTree::BindViewEvents() {
    Bind(wxEVT_PAINT, &PropertyTree::OnPaint, this);
    Bind(wxEVT_LEFT_DOWN, &PropertyTree::OnMouseDown, this);
    Bind(wxEVT_LEFT_DCLICK, &PropertyTree::OnMouseDouble, this);
    Bind(wxEVT_LEFT_UP, &PropertyTree::OnMouseUp, this);
    Bind(wxEVT_MOTION, &PropertyTree::OnMouseMove, this);
    Bind(wxEVT_MOUSEWHEEL, &PropertyTree::OnMouseWheel, this);
    Bind(wxEVT_KEY_DOWN, &PropertyTree::OnKeyDown, this);
    Bind(wxEVT_SIZE, &PropertyTree::OnSize, this);
    Bind(wxEVT_SET_FOCUS, [this](wxFocusEvent&) { Refresh(); });
    Bind(wxEVT_KILL_FOCUS, [this](wxFocusEvent&) { Refresh(); });
    Bind(wxEVT_MOUSE_CAPTURE_LOST, [this](wxMouseCaptureLostEvent&) { m_draggingColumn = false; });
    Bind(wxEVT_LEAVE_WINDOW, [this](wxMouseEvent& event) {
        if (!m_draggingColumn) {
            SetCursor(wxNullCursor);
        }
        event.Skip();
    });
    for (const auto type : {wxEVT_SCROLLWIN_TOP, wxEVT_SCROLLWIN_BOTTOM, wxEVT_SCROLLWIN_LINEUP,
                            wxEVT_SCROLLWIN_LINEDOWN, wxEVT_SCROLLWIN_PAGEUP,
                            wxEVT_SCROLLWIN_PAGEDOWN, wxEVT_SCROLLWIN_THUMBTRACK,
                            wxEVT_SCROLLWIN_THUMBRELEASE}) {
        Bind(type, &PropertyTree::OnScroll, this);
    }
}

// --- geometry

int PropertyTree::PageRows() const {
    return std::max(1, GetClientSize().GetHeight() / RowHeight());
}

wxRect PropertyTree::RowRect(int visibleIndex) const {
    const int height = RowHeight();
    return wxRect(0, (visibleIndex - m_topRow) * height, GetClientSize().GetWidth(), height);
}

int PropertyTree::RowAt(int y) const {
    if (y < 0) {
        return -1;
    }
    const int index = m_topRow + y / RowHeight();
    return index < static_cast<int>(VisibleNodes().size()) ? index : -1;
}

int PropertyTree::VisibleIndexOf(const PropertyNode* node) const {
    const auto& rows = VisibleNodes();
    const auto found = std::find(rows.begin(), rows.end(), node);
    return found == rows.end() ? -1 : static_cast<int>(found - rows.begin());
}

int PropertyTree::LabelLeft(const PropertyNode* node) const {
    if (node->item->IsCategory()) {
        return m_gutterWidth + kTextMargin;
    }
    const int level = std::max(node->Level(), 1);
    return m_gutterWidth + 1 + kTextMargin + (level - 1) * kLevelIndent;
}

wxRect PropertyTree::FoldSignRect(const PropertyNode* node, const wxRect& row) const {
    const int level = node->item->IsCategory() ? 0 : std::max(node->Level(), 1);
    const int left = level <= 1 ? 0 : LabelLeft(node) - kLevelIndent;
    const int width = level <= 1 ? m_gutterWidth : kLevelIndent;
    return wxRect(left + (width - kFoldSignSize) / 2,
                  row.GetTop() + (row.GetHeight() - 1 - kFoldSignSize) / 2, kFoldSignSize,
                  kFoldSignSize);
}

// --- painting

void PropertyTree::OnPaint(wxPaintEvent&) {
    if (m_scrollBarStale) {
        m_scrollBarStale = false;
        CallAfter([this] { UpdateScrollBar(); });  // not from inside a paint
    }
    wxAutoBufferedPaintDC dc(this);
    dc.SetBackground(wxBrush(m_background));
    dc.Clear();
    const auto& rows = VisibleNodes();
    // Only the rows in the damaged band: a changed value repaints one row, not the page.
    const wxRect damaged = GetUpdateRegion().GetBox();
    const int first = std::max(m_topRow, RowAt(damaged.GetTop()));
    const int height = std::min(GetClientSize().GetHeight(), damaged.GetBottom() + 1);
    for (int index = first; index < static_cast<int>(rows.size()); ++index) {
        const wxRect row = RowRect(index);
        if (row.GetTop() >= height) {
            break;
        }
        PaintRow(dc, rows[static_cast<std::size_t>(index)], row);
    }
    if (m_rebuiltSincePaint) {
        m_rebuiltSincePaint = false;
        CallAfter([this] { m_owner->OnTreeRebuilt(); });
    }
}

void PropertyTree::PaintRow(wxDC& dc, const PropertyNode* node, const wxRect& row) {
    const GWCPropertyItem& item = *node->item;
    const wxColour shade = Blend(m_background, m_gridLineColor, 0.28);
    bool focused = false;
    for (const wxWindow* focus = FindFocus(); focus != nullptr && !focused;
         focus = focus->GetParent()) {
        focused = focus == this;
    }
    const bool selected = node == m_selection;
    const wxColour highlight = focused ? wxSystemSettings::GetColour(wxSYS_COLOUR_HIGHLIGHT)
                                       : Blend(m_background, m_gridLineColor, 0.55);
    const wxColour text = m_textColour;
    const wxColour selectedText = focused
                                      ? wxSystemSettings::GetColour(wxSYS_COLOUR_HIGHLIGHTTEXT)
                                      : text;
    const int right = row.GetRight() + 1;
    const int bottom = row.GetBottom();
    const int divider = m_gutterWidth + 1 + m_labelColumnWidth;

    dc.SetPen(*wxTRANSPARENT_PEN);
    dc.SetBrush(wxBrush(shade));
    dc.DrawRectangle(0, row.GetTop(), item.IsCategory() ? right : m_gutterWidth, row.GetHeight());
    if (selected) {
        dc.SetBrush(wxBrush(highlight));
        dc.DrawRectangle(m_gutterWidth + 1, row.GetTop(),
                         item.IsCategory() ? right : m_labelColumnWidth, row.GetHeight() - 1);
    }
    if (!node->children.empty()) {
        PaintFoldSign(dc, node, FoldSignRect(node, row));
    }

    dc.SetPen(wxPen(m_gridLineColor));
    dc.DrawLine(item.IsCategory() ? 0 : m_gutterWidth, bottom, right, bottom);

    wxFont font = TreeFont();
    if (item.IsCategory()) {
        font.MakeBold();
    }
    dc.SetFont(font);
    dc.SetTextForeground(selected ? selectedText : text);
    if (!item.enabled) {
        dc.SetTextForeground(wxSystemSettings::GetColour(wxSYS_COLOUR_GRAYTEXT));
    }
    if (item.IsCategory()) {
        DrawTextCentred(dc, item.label, LabelLeft(node), row);
        return;
    }
    dc.DrawLine(divider, row.GetTop(), divider, bottom);
    {
        wxDCClipper clip(dc, wxRect(m_gutterWidth + 1, row.GetTop(), m_labelColumnWidth,
                                    row.GetHeight()));
        DrawTextCentred(dc, item.label, LabelLeft(node), row);
    }
    const wxRect valueArea(ValueLeft(), row.GetTop(), std::max(0, right - ValueLeft()),
                           row.GetHeight());
    wxDCClipper clip(dc, valueArea);
    dc.SetTextForeground(item.enabled ? text
                                      : wxSystemSettings::GetColour(wxSYS_COLOUR_GRAYTEXT));
    if (item.IsHotLink()) {
        dc.SetTextForeground(wxSystemSettings::GetColour(wxSYS_COLOUR_HOTLIGHT));
        wxFont link = TreeFont();
        dc.SetFont(link.MakeUnderlined());
    }
    DrawTextCentred(dc, item.value.GetText(), ValueLeft() + kTextMargin - 1, row);
}

void PropertyTree::PaintFoldSign(wxDC& dc, const PropertyNode* node, const wxRect& sign) {
    wxRendererNative::Get().DrawTreeItemButton(this, dc, sign,
                                               node->item->expanded ? int{wxCONTROL_EXPANDED} : 0);
}

// --- mouse

void PropertyTree::OnMouseDown(wxMouseEvent& event) {
    const int index = RowAt(event.GetY());
    if (index < 0) {
        SetFocus();
        return;
    }
    PropertyNode* node = VisibleNodes()[static_cast<std::size_t>(index)];
    const int divider = m_gutterWidth + 1 + m_labelColumnWidth;
    if (!node->item->IsCategory() && std::abs(event.GetX() - divider) <= kColumnGrab) {
        m_draggingColumn = true;
        CaptureMouse();
        return;
    }
    const bool onSign = FoldSignRect(node, RowRect(index)).Inflate(2).Contains(event.GetPosition());
    SetFocus();
    SelectNode(node);
    // Leaving the previous row commits its edit, and the client may have rebuilt the rows.
    if (!Contains(node)) {
        return;
    }
    if (!node->children.empty() && (node->item->IsCategory() || onSign)) {
        SetExpanded(node, !node->item->expanded);
        return;
    }
    if (event.GetX() >= ValueLeft()) {
        if (node->item->IsHotLink()) {
            m_owner->OnHotLinkClicked(IteratorOf(node));
            return;
        }
        FocusEditor();
        // The press that selects a list row may already be on its drop button.
        if (m_editorNode == node && IsListOpen() && m_list->IsOnButton(event.GetX() - ValueLeft())) {
            m_list->ToggleList();
        }
    }
}

void PropertyTree::OnMouseDouble(wxMouseEvent& event) {
    const int index = RowAt(event.GetY());
    if (index < 0) {
        return;
    }
    PropertyNode* node = VisibleNodes()[static_cast<std::size_t>(index)];
    if (!node->item->IsCategory() && !node->children.empty()) {
        SetExpanded(node, !node->item->expanded);
    } else if (node->item->IsCategory()) {
        OnMouseDown(event);
    }
}

void PropertyTree::OnMouseUp(wxMouseEvent& event) {
    if (m_draggingColumn) {
        m_draggingColumn = false;
        if (HasCapture()) {
            ReleaseMouse();
        }
    }
    event.Skip();
}

void PropertyTree::OnMouseMove(wxMouseEvent& event) {
    const int divider = m_gutterWidth + 1 + m_labelColumnWidth;
    if (m_draggingColumn) {
        m_owner->SetLabelColumnWidth(event.GetX() - m_gutterWidth - 1);
        return;
    }
    const int index = RowAt(event.GetY());
    const bool onDivider = index >= 0 &&
                           !VisibleNodes()[static_cast<std::size_t>(index)]->item->IsCategory() &&
                           std::abs(event.GetX() - divider) <= kColumnGrab;
    SetCursor(onDivider ? wxCursor(wxCURSOR_SIZEWE) : wxNullCursor);
    UpdateToolTip(index);
    event.Skip();
}

void PropertyTree::OnMouseWheel(wxMouseEvent& event) {
    const int notches = event.GetWheelRotation() / std::max(1, event.GetWheelDelta());
    ScrollToRow(m_topRow - notches * kWheelRows);
}

void PropertyTree::UpdateToolTip(int row) {
    if (!m_toolTipsEnabled || row == m_toolTipRow) {
        return;
    }
    m_toolTipRow = row;
    if (row < 0) {
        UnsetToolTip();
        return;
    }
    const GWCPropertyItem& item = *VisibleNodes()[static_cast<std::size_t>(row)]->item;
    std::string tip = item.label;
    if (!item.IsCategory()) {
        tip += ": " + item.value.GetText();
    }
    SetToolTip(wxString::FromUTF8(tip));
}

// --- keyboard

void PropertyTree::OnKeyDown(wxKeyEvent& event) {
    PropertyNode* node = m_selection;
    const auto& rows = VisibleNodes();
    switch (event.GetKeyCode()) {
        case WXK_UP:
            MoveSelection(-1);
            return;
        case WXK_DOWN:
            MoveSelection(1);
            return;
        case WXK_PAGEUP:
            MoveSelection(-PageRows());
            return;
        case WXK_PAGEDOWN:
            MoveSelection(PageRows());
            return;
        case WXK_HOME:
            if (!rows.empty()) {
                SelectNode(rows.front());
            }
            return;
        case WXK_END:
            if (!rows.empty()) {
                SelectNode(rows.back());
            }
            return;
        case WXK_LEFT:
        case WXK_NUMPAD_SUBTRACT:
            if (node != nullptr && !node->children.empty() && node->item->expanded) {
                SetExpanded(node, false);
            } else if (node != nullptr && node->parent != &m_root) {
                SelectNode(node->parent);
            }
            return;
        case WXK_RIGHT:
        case WXK_NUMPAD_ADD:
            if (node != nullptr && !node->children.empty()) {
                SetExpanded(node, true);
            }
            return;
        case WXK_RETURN:
        case WXK_NUMPAD_ENTER:
        case WXK_F2:
            FocusEditor();
            return;
        case WXK_TAB:
            Navigate(event.ShiftDown() ? wxNavigationKeyEvent::IsBackward
                                       : wxNavigationKeyEvent::IsForward);
            return;
        default:
            event.Skip();
    }
}

// --- scrolling

void PropertyTree::OnScroll(wxScrollWinEvent& event) {
    const wxEventType type = event.GetEventType();
    int top = m_topRow;
    if (type == wxEVT_SCROLLWIN_TOP) {
        top = 0;
    } else if (type == wxEVT_SCROLLWIN_BOTTOM) {
        top = static_cast<int>(VisibleNodes().size());
    } else if (type == wxEVT_SCROLLWIN_LINEUP) {
        --top;
    } else if (type == wxEVT_SCROLLWIN_LINEDOWN) {
        ++top;
    } else if (type == wxEVT_SCROLLWIN_PAGEUP) {
        top -= PageRows();
    } else if (type == wxEVT_SCROLLWIN_PAGEDOWN) {
        top += PageRows();
    } else {
        top = event.GetPosition();
    }
    ScrollToRow(top);
}

void PropertyTree::ScrollToRow(int topRow) {
    const int count = static_cast<int>(VisibleNodes().size());
    topRow = std::clamp(topRow, 0, std::max(0, count - PageRows()));
    if (topRow == m_topRow) {
        return;
    }
    m_topRow = topRow;
    UpdateScrollBar();
    PlaceEditor();
    Refresh();
}

void PropertyTree::EnsureVisible(const PropertyNode* node) {
    const int index = VisibleIndexOf(node);
    if (index < 0) {
        return;
    }
    if (index < m_topRow) {
        ScrollToRow(index);
    } else if (index >= m_topRow + PageRows()) {
        ScrollToRow(index - PageRows() + 1);
    }
}

void PropertyTree::UpdateScrollBar() {
    const int count = static_cast<int>(VisibleNodes().size());
    const int page = PageRows();
    m_topRow = std::clamp(m_topRow, 0, std::max(0, count - page));
    // GTK's scroll bar is dear to set, and a profile fills the grid a row at a time: out of
    // sight (the simple side bar, the start) it is set once, when the grid next paints.
    if (!IsShownOnScreen()) {
        m_scrollBarStale = true;
        return;
    }
    m_scrollBarStale = false;
    // GTK complains about a scroll bar laid out in less than a row before the first layout.
    if (GetClientSize().GetHeight() < RowHeight()) {
        SetScrollbar(wxVERTICAL, 0, 0, 0);
        return;
    }
    SetScrollbar(wxVERTICAL, m_topRow, page, count);
}

void PropertyTree::OnSize(wxSizeEvent& event) {
    UpdateScrollBar();
    const int width = GetClientSize().GetWidth();
    if (width > 0 && m_labelColumnWidth > width - m_gutterWidth - kMinColumnWidth) {
        SetLabelColumnWidth(m_labelColumnWidth);
    }
    PlaceEditor();
    Refresh();
    event.Skip();
}

}  // namespace ac
