#include "skin/ListCtrl.h"

#include "skin/SkinConfig.h"

#include <wx/dcbuffer.h>
#include <wx/settings.h>

#include <algorithm>
#include <cstdio>

namespace ac {

namespace {

// Cells show file names, and a name on disk may be any bytes: one that is not UTF-8 is shown as
// Latin-1, the old encoding such names usually come from, rather than as nothing at all.
wxString CellText(const std::string& text) {
    const wxString utf8 = wxString::FromUTF8(text);
    if (!utf8.empty() || text.empty()) {
        return utf8;
    }
    return wxString(text.c_str(), wxConvISO8859_1, text.size());
}

}  // namespace

wxDEFINE_EVENT(EVT_XLIST_HEADER_CHECK, wxCommandEvent);

namespace {

// Ellipsizing measures the text many times; most cells fit, and one measure tells.
wxString FitText(wxDC& dc, const wxString& text, int width) {
    if (dc.GetTextExtent(text).x <= width) {
        return text;
    }
    return wxControl::Ellipsize(text, dc, wxELLIPSIZE_END, std::max(0, width));
}

wxRect ToWx(const SkinRect& r) {
    return {r.x, r.y, r.w, r.h};
}

std::string ProgressText(const XListCell& cell) {
    char text[64];
    const std::string& format = cell.progressFormat;
    // A word in place of the percent ("Pause") stands as written.
    if (!format.empty() && format.find('%') == std::string::npos) {
        return format;
    }
    // A caller's format holds one %d at most; anything else falls back to the plain percent.
    if (!format.empty() && std::count(format.begin(), format.end(), '%') <= 3 &&
        format.find("%d") != std::string::npos && format.find("%s") == std::string::npos) {
        std::snprintf(text, sizeof text, "%d%%", cell.nProgressPercent);
        std::string out = format;
        out.replace(out.find("%d"), 2, std::to_string(cell.nProgressPercent));
        std::string cleaned;
        for (std::size_t i = 0; i < out.size(); ++i) {
            cleaned += out[i];
            if (out[i] == '%' && i + 1 < out.size() && out[i + 1] == '%') {
                ++i;
            }
        }
        return cleaned;
    }
    std::snprintf(text, sizeof text, "%d%%", cell.nProgressPercent);
    return text;
}

}  // namespace

// --- XListCtrl ----------------------------------------------------------------------------

XListCtrl::XListCtrl(wxWindow* parent, int id)
    : wxWindow(parent, id, wxDefaultPosition, wxSize(200, 100), wxBORDER_NONE),
      m_header(new ImHeaderCtrl(this)),
      m_body(new XListBody(this)) {
    m_textColour = wxSystemSettings::GetColour(wxSYS_COLOUR_WINDOWTEXT);
    m_bgColour = wxSystemSettings::GetColour(wxSYS_COLOUR_WINDOW);
    m_disabledColour = wxSystemSettings::GetColour(wxSYS_COLOUR_GRAYTEXT);
    m_progressColour = wxSystemSettings::GetColour(wxSYS_COLOUR_HIGHLIGHT);
    Bind(wxEVT_SIZE, [this](wxSizeEvent&) { PlaceParts(); });
}

void XListCtrl::PlaceParts() {
    const wxSize size = GetClientSize();
    m_header->SetSize(0, 0, size.x, m_headerHeight);
    m_body->SetSize(0, m_headerHeight, size.x, std::max(0, size.y - m_headerHeight));
}

int XListCtrl::InsertColumn(int index, const std::string& text, int width, bool headerCheck) {
    index = std::clamp(index, 0, GetColumnCount());
    m_columns.insert(m_columns.begin() + index, XListColumn{text, width, headerCheck ? 1 : 0});
    for (auto& row : m_rows) {
        row.insert(row.begin() + index, XListCell{});
    }
    m_header->Refresh();
    m_body->Refresh();
    return index;
}

int XListCtrl::InsertItem(int index, const std::string& text) {
    if (m_columns.empty()) {
        return -1;
    }
    index = std::clamp(index, 0, GetItemCount());
    std::vector<XListCell> row(m_columns.size());
    row[0].text = text;
    m_rows.insert(m_rows.begin() + index, std::move(row));
    m_selected.insert(m_selected.begin() + index, 0);
    ScheduleRowCount();
    return index;
}

void XListCtrl::ScheduleRowCount() {
    // Telling the scroll bars costs a GTK relayout; a batch of thousands of rows tells them once.
    if (m_rowCountPosted) {
        return;
    }
    m_rowCountPosted = true;
    CallAfter([this] { SyncRowCount(); });
}

void XListCtrl::SyncRowCount() {
    m_rowCountPosted = false;
    if (m_body->GetRowCount() != m_rows.size()) {
        m_body->SetRowCount(m_rows.size());
        // Rows filled before the count was known were refreshed outside the body's extent:
        // without this a row added to a quiet window stays unpainted until the next event.
        m_body->Refresh();
    }
}

bool XListCtrl::DeleteItem(int row) {
    if (row < 0 || row >= GetItemCount()) {
        return false;
    }
    m_rows.erase(m_rows.begin() + row);
    m_selected.erase(m_selected.begin() + row);
    ScheduleRowCount();
    if (m_rows.empty()) {
        for (XListColumn& column : m_columns) {
            column.headerCheck = column.headerCheck != 0 ? 1 : 0;
        }
        m_header->Refresh();
    }
    m_body->Refresh();
    return true;
}

void XListCtrl::DeleteAllItems() {
    while (!m_rows.empty()) {
        DeleteItem(GetItemCount() - 1);
    }
}

XListCell* XListCtrl::CellOf(int row, int column) {
    if (row < 0 || row >= GetItemCount() || column < 0 || column >= GetColumnCount()) {
        return nullptr;
    }
    return &m_rows[std::size_t(row)][std::size_t(column)];
}

const XListCell* XListCtrl::Cell(int row, int column) const {
    return const_cast<XListCtrl*>(this)->CellOf(row, column);
}

bool XListCtrl::SetItemText(int row, int column, const std::string& text,
                            const wxColour& textColour, const wxColour& background) {
    XListCell* cell = CellOf(row, column);
    if (cell == nullptr) {
        return false;
    }
    cell->text = text;
    if (textColour.IsOk()) {
        cell->crText = textColour;
    }
    if (background.IsOk()) {
        cell->crBackground = background;
    }
    RefreshRow(row);
    return true;
}

std::string XListCtrl::GetItemText(int row, int column) const {
    const XListCell* cell = Cell(row, column);
    return cell == nullptr ? std::string() : cell->text;
}

bool XListCtrl::SetCheckbox(int row, int column, int checkedState) {
    XListCell* cell = CellOf(row, column);
    if (cell == nullptr) {
        return false;
    }
    cell->nCheckedState = checkedState;
    UpdateHeaderCheckFromRows(column);
    RefreshRow(row);
    return true;
}

int XListCtrl::GetCheckbox(int row, int column) const {
    const XListCell* cell = Cell(row, column);
    return cell == nullptr ? -1 : cell->nCheckedState;
}

void XListCtrl::UpdateHeaderCheckFromRows(int column) {
    XListColumn& header = m_columns[std::size_t(column)];
    if (header.headerCheck == 0) {
        return;
    }
    bool all = !m_rows.empty();
    for (const auto& row : m_rows) {
        if (row[std::size_t(column)].nCheckedState == 0) {
            all = false;
            break;
        }
    }
    const int state = all ? 2 : 1;
    if (state != header.headerCheck) {
        header.headerCheck = state;
        m_header->Refresh();
    }
}

int XListCtrl::GetHeaderCheck(int column) const {
    if (column < 0 || column >= GetColumnCount()) {
        return -1;
    }
    return m_columns[std::size_t(column)].headerCheck;
}

void XListCtrl::ToggleHeaderCheck(int column) {
    if (column < 0 || column >= GetColumnCount() ||
        m_columns[std::size_t(column)].headerCheck == 0) {
        return;
    }
    const int state =
        NextHeaderCheckState(m_columns[std::size_t(column)].headerCheck, GetItemCount());
    m_columns[std::size_t(column)].headerCheck = state;
    wxCommandEvent notice(EVT_XLIST_HEADER_CHECK, GetId());
    notice.SetInt(column);
    notice.SetExtraLong(state);
    notice.SetEventObject(this);
    GetParent()->GetEventHandler()->ProcessEvent(notice);
    for (auto& row : m_rows) {
        XListCell& cell = row[std::size_t(column)];
        if (cell.nCheckedState >= 0) {
            cell.nCheckedState = state - 1;
        }
    }
    m_header->Refresh();
    m_body->Refresh();
}

bool XListCtrl::SetProgress(int row, int column, bool showText, const std::string& format) {
    XListCell* cell = CellOf(row, column);
    if (cell == nullptr) {
        return false;
    }
    cell->bProgress = true;
    cell->nProgressPercent = 0;
    cell->bShowProgressText = showText;
    cell->progressFormat = format;
    RefreshRow(row);
    return true;
}

bool XListCtrl::UpdateProgress(int row, int column, int percent) {
    XListCell* cell = CellOf(row, column);
    if (cell == nullptr || !cell->bProgress) {
        return false;
    }
    cell->nProgressPercent = std::clamp(percent, 0, 100);
    RefreshRow(row);
    return true;
}

bool XListCtrl::DeleteProgress(int row, int column) {
    XListCell* cell = CellOf(row, column);
    if (cell == nullptr) {
        return false;
    }
    cell->bProgress = false;
    RefreshRow(row);
    return true;
}

bool XListCtrl::SetEnabled(int row, bool enabled) {
    XListCell* cell = CellOf(row, 0);
    if (cell == nullptr) {
        return false;
    }
    cell->bEnabled = enabled;
    RefreshRow(row);
    return true;
}

int XListCtrl::GetCurSel() const {
    for (std::size_t i = 0; i < m_selected.size(); ++i) {
        if (m_selected[i]) {
            return static_cast<int>(i);
        }
    }
    return -1;
}

bool XListCtrl::IsSelected(int row) const {
    return row >= 0 && row < GetItemCount() && m_selected[std::size_t(row)] != 0;
}

void XListCtrl::SelectRow(int row, bool only) {
    if (only) {
        std::fill(m_selected.begin(), m_selected.end(), 0);
    }
    if (row >= 0 && row < GetItemCount()) {
        m_selected[std::size_t(row)] = 1;
    }
    m_body->Refresh(false);
}

void XListCtrl::RefreshRow(int row) {
    if (row < 0 || row >= GetItemCount()) {
        return;
    }
    const size_t first = m_body->GetVisibleRowsBegin();
    if (static_cast<size_t>(row) < first || static_cast<size_t>(row) >= m_body->GetVisibleRowsEnd()) {
        return;
    }
    // The scrolled window's own row refresh spans the client width, which GTK's overlay scroll
    // bar leaves a few pixels short of what a paint draws: the right edge of a progress frame
    // stayed on screen under the bar after its row had moved on. Refresh the window's width.
    const int top = static_cast<int>(static_cast<size_t>(row) - first) * m_rowHeight;
    m_body->RefreshRect(wxRect(0, top, m_body->GetSize().x, m_rowHeight), false);
}

void XListCtrl::SetRowHeight(int height) {
    m_rowHeight = std::max(8, height);
    m_body->RefreshAll();
}

void XListCtrl::SetColours(const wxColour& text, const wxColour& background,
                           const wxColour& disabled, const wxColour& progress) {
    m_textColour = text;
    m_bgColour = background;
    m_disabledColour = disabled;
    m_progressColour = progress;
    m_body->Refresh();
}

void XListCtrl::SetFontOfCells(const wxFont& font) {
    m_body->SetFont(font);
    m_header->SetFont(font);
    m_body->Refresh();
    m_header->Refresh();
}

void XListCtrl::SetHeaderPicture(SkinPicture picture, int mode, int top, int bottom) {
    if (picture.IsOk()) {
        m_headerHeight = picture.Height();
    }
    m_header->SetBackground(std::move(picture), mode, top, bottom);
    PlaceParts();
}

// --- ImHeaderCtrl -------------------------------------------------------------------------

ImHeaderCtrl::ImHeaderCtrl(XListCtrl* list)
    : wxWindow(list, wxID_ANY, wxDefaultPosition, wxSize(100, 24), wxBORDER_NONE), m_list(list) {
    SetBackgroundStyle(wxBG_STYLE_PAINT);
    m_high = wxSystemSettings::GetColour(wxSYS_COLOUR_3DHIGHLIGHT);
    m_shadow = wxSystemSettings::GetColour(wxSYS_COLOUR_3DSHADOW);
    m_background = wxSystemSettings::GetColour(wxSYS_COLOUR_BTNFACE);
    m_text = wxSystemSettings::GetColour(wxSYS_COLOUR_BTNTEXT);
    Bind(wxEVT_PAINT, &ImHeaderCtrl::OnPaint, this);
    Bind(wxEVT_LEFT_DOWN, &ImHeaderCtrl::OnLeftDown, this);
}

void ImHeaderCtrl::SetBackground(SkinPicture picture, int mode, int top, int bottom) {
    m_picture = std::move(picture);
    m_mode = mode;
    m_topSplitter = top;
    m_bottomSplitter = bottom;
    Refresh();
}

void ImHeaderCtrl::SetColors(const wxColour& high, const wxColour& shadow,
                             const wxColour& background, const wxColour& text) {
    m_high = high;
    m_shadow = shadow;
    m_background = background;
    m_text = text;
    Refresh();
}

void ImHeaderCtrl::SetSkinColors(const wxColour& background, const wxColour& text) {
    SetColors(background.ChangeLightness(130), background.ChangeLightness(72), background, text);
}

void ImHeaderCtrl::OnPaint(wxPaintEvent& /*event*/) {
    wxAutoBufferedPaintDC dc(this);
    const wxSize size = GetClientSize();
    dc.SetBackground(wxBrush(m_background));
    dc.Clear();
    if (m_picture.IsOk()) {
        if (m_mode == 2) {
            DrawTiledPicture(dc, wxRect(0, 0, size.x, m_picture.Height()), m_picture);
        } else {
            DrawSplitPicture(dc, wxRect(size), m_picture, m_topSplitter, 0);
        }
    }
    dc.SetFont(GetFont());
    dc.SetTextForeground(m_text);
    dc.SetBackgroundMode(wxTRANSPARENT);
    int x = 0;
    for (const XListColumn& column : m_list->Columns()) {
        wxRect text(x + 6, 0, column.width - 12, size.y);
        if (column.headerCheck != 0) {
            const SkinRect box = ListCheckBox({x, 0, column.width, size.y}, !column.text.empty());
            dc.SetPen(wxPen(wxColour(0xC0, 0xC0, 0xC0)));
            dc.SetBrush(*wxWHITE_BRUSH);
            dc.DrawRoundedRectangle(ToWx(box), 2);
            if (column.headerCheck == 2) {
                dc.SetPen(*wxBLACK_PEN);
                for (const SkinRect& stroke : ListTickStrokes(box)) {
                    dc.DrawLine(stroke.x, stroke.y, stroke.x, stroke.y + stroke.h);
                }
            }
            text.x = box.Right() + 4;
            text.width = x + column.width - 6 - text.x;
        }
        const wxString label = FitText(dc, wxString::FromUTF8(column.text), text.width);
        dc.DrawLabel(label, text, wxALIGN_LEFT | wxALIGN_CENTER_VERTICAL);
        x += column.width;
        dc.SetPen(wxPen(m_shadow));
        dc.DrawLine(x - 2, 2, x - 2, size.y - 2);
        dc.SetPen(wxPen(m_high));
        dc.DrawLine(x - 1, 2, x - 1, size.y - 2);
    }
}

void ImHeaderCtrl::OnLeftDown(wxMouseEvent& event) {
    int x = 0;
    int index = 0;
    for (const XListColumn& column : m_list->Columns()) {
        if (event.GetX() >= x && event.GetX() < x + column.width) {
            m_list->ToggleHeaderCheck(index);
            return;
        }
        x += column.width;
        ++index;
    }
}

// --- XListBody ----------------------------------------------------------------------------

XListBody::XListBody(XListCtrl* list)
    : wxVScrolledWindow(list, wxID_ANY, wxDefaultPosition, wxDefaultSize, wxWANTS_CHARS),
      m_list(list) {
    SetBackgroundStyle(wxBG_STYLE_PAINT);
    Bind(wxEVT_PAINT, &XListBody::OnPaint, this);
    Bind(wxEVT_LEFT_DOWN, &XListBody::OnLeftDown, this);
    Bind(wxEVT_KEY_DOWN, &XListBody::OnKey, this);
}

wxCoord XListBody::OnGetRowHeight(size_t /*row*/) const {
    return m_list->m_rowHeight;
}

void XListBody::DrawCell(wxDC& dc, const wxRect& rect, const XListCell& cell,
                         const XListCell& first, bool selected) const {
    const wxColour text = !first.bEnabled      ? m_list->m_disabledColour
                          : cell.crText.IsOk() ? cell.crText
                                               : m_list->m_textColour;
    wxColour background = cell.crBackground.IsOk() ? cell.crBackground : m_list->m_bgColour;
    if (selected) {
        background = wxSystemSettings::GetColour(wxSYS_COLOUR_HIGHLIGHT);
    }
    dc.SetPen(*wxTRANSPARENT_PEN);
    dc.SetBrush(wxBrush(background));
    dc.DrawRectangle(rect);
    if (cell.bProgress) {
        const wxRect frame = rect.Deflate(1, 2);
        dc.SetPen(wxPen(wxSystemSettings::GetColour(wxSYS_COLOUR_3DSHADOW)));
        dc.SetBrush(*wxTRANSPARENT_BRUSH);
        dc.DrawRectangle(frame);
        const int filled = ListProgressWidth(frame.width - 2, cell.nProgressPercent);
        const wxRect bar(frame.x + 1, frame.y + 1, filled, frame.height - 2);
        if (filled > 0) {
            dc.SetPen(*wxTRANSPARENT_PEN);
            dc.SetBrush(wxBrush(m_list->m_progressColour));
            dc.DrawRectangle(bar);
        }
        if (cell.bShowProgressText) {
            const std::string utf8 = ProgressText(cell);
            const wxString label = wxString::FromUTF8(utf8);
            const wxSize extent = MeasureText(dc, utf8, label);
            const wxPoint at(frame.x + (frame.width - extent.x) / 2,
                             frame.y + (frame.height - extent.y) / 2);
            // Drawn twice, clipped at the bar's end, so the letters invert over the filled part.
            {
                wxDCClipper clip(dc,
                                 wxRect(bar.GetRight() + 1, frame.y, frame.width, frame.height));
                dc.SetTextForeground(text);
                dc.DrawText(label, at);
            }
            if (filled > 0) {
                wxDCClipper clip(dc, bar);
                dc.SetTextForeground(*wxWHITE);
                dc.DrawText(label, at);
            }
        }
        return;
    }
    wxRect textRect = rect.Deflate(4, 0);
    if (cell.nCheckedState >= 0) {
        const SkinRect box =
            ListCheckBox({rect.x, rect.y, rect.width, rect.height}, !cell.text.empty());
        dc.SetPen(wxPen(wxColour(0xC0, 0xC0, 0xC0)));
        dc.SetBrush(wxBrush(wxSystemSettings::GetColour(wxSYS_COLOUR_WINDOW)));
        dc.DrawRoundedRectangle(ToWx(box), 2);
        if (cell.nCheckedState == 1) {
            dc.SetPen(first.bEnabled ? *wxBLACK_PEN
                                     : wxPen(wxSystemSettings::GetColour(wxSYS_COLOUR_GRAYTEXT)));
            for (const SkinRect& stroke : ListTickStrokes(box)) {
                dc.DrawLine(stroke.x, stroke.y, stroke.x, stroke.y + stroke.h);
            }
        }
        textRect.x = box.Right() + 4;
        textRect.width = rect.GetRight() - textRect.x;
    }
    if (cell.text.empty() || textRect.width <= 0) {
        return;
    }
    dc.SetTextForeground(selected ? wxSystemSettings::GetColour(wxSYS_COLOUR_HIGHLIGHTTEXT) : text);
    // One measure per cell: the fit test gives the height that centres the line as well.
    const wxString full = CellText(cell.text);
    const wxSize extent = MeasureText(dc, cell.text, full);
    const wxString label = extent.x <= textRect.width
                               ? full
                               : wxControl::Ellipsize(full, dc, wxELLIPSIZE_END, textRect.width);
    wxDCClipper clip(dc, textRect);
    dc.DrawText(label, textRect.x, textRect.y + (textRect.height - extent.y) / 2);
}

wxSize XListBody::MeasureText(wxDC& dc, const std::string& key, const wxString& text) const {
    // Measuring through pango is most of a frame's cost; a list repeats few distinct texts.
    if (m_measuredFont != GetFont()) {
        m_extents.clear();
        m_measuredFont = GetFont();
    }
    if (auto found = m_extents.find(key); found != m_extents.end()) {
        return found->second;
    }
    if (m_extents.size() >= kMaxMeasuredTexts) {
        m_extents.clear();
    }
    const wxSize extent = dc.GetTextExtent(text);
    m_extents.emplace(key, extent);
    return extent;
}

void XListBody::OnPaint(wxPaintEvent& /*event*/) {
    wxAutoBufferedPaintDC dc(this);
    const wxSize size = GetClientSize();
    dc.SetBackground(wxBrush(m_list->m_bgColour));
    dc.Clear();
    dc.SetFont(GetFont());
    dc.SetBackgroundMode(wxTRANSPARENT);
    const int height = m_list->m_rowHeight;
    const size_t begin = GetVisibleRowsBegin();
    const size_t end = std::min(GetVisibleRowsEnd(), m_list->m_rows.size());
    int y = 0;
    for (size_t row = begin; row < end; ++row) {
        const auto& cells = m_list->m_rows[row];
        int x = 0;
        for (std::size_t column = 0; column < cells.size(); ++column) {
            const int width = m_list->m_columns[column].width;
            if (x < size.x) {
                DrawCell(dc, wxRect(x, y, width, height), cells[column], cells[0],
                         m_list->m_selected[row] != 0);
            }
            x += width;
        }
        y += height;
    }
    if (m_list->m_rows.empty() && m_list->m_emptyPicture.IsOk()) {
        const SkinPicture& p = m_list->m_emptyPicture;
        dc.DrawBitmap(p.bitmap, size.x - p.Width(), size.y - p.Height(), true);
    }
}

void XListBody::OnLeftDown(wxMouseEvent& event) {
    SetFocus();
    const int row = VirtualHitTest(event.GetY());
    if (row == wxNOT_FOUND || row >= m_list->GetItemCount()) {
        m_list->SelectRow(-1);
        return;
    }
    if (event.ShiftDown() && m_anchor >= 0) {
        m_list->SelectRow(-1);
        for (int i = std::min(m_anchor, row); i <= std::max(m_anchor, row); ++i) {
            m_list->SelectRow(i, false);
        }
        return;
    }
    if (event.ControlDown()) {
        m_list->m_selected[std::size_t(row)] ^= 1;
        m_list->RefreshRow(row);
    } else {
        m_list->SelectRow(row);
    }
    m_anchor = row;
}

void XListBody::OnKey(wxKeyEvent& event) {
    const int count = m_list->GetItemCount();
    int row = m_list->GetCurSel();
    switch (event.GetKeyCode()) {
        case WXK_DOWN:
            row = std::min(count - 1, row + 1);
            break;
        case WXK_UP:
            row = std::max(0, row - 1);
            break;
        case WXK_PAGEDOWN:
            row = std::min(count - 1,
                           row + static_cast<int>(GetVisibleRowsEnd() - GetVisibleRowsBegin()));
            break;
        case WXK_PAGEUP:
            row = std::max(0, row - static_cast<int>(GetVisibleRowsEnd() - GetVisibleRowsBegin()));
            break;
        case WXK_HOME:
            row = 0;
            break;
        case WXK_END:
            row = count - 1;
            break;
        default:
            event.Skip();
            return;
    }
    if (row >= 0) {
        m_list->SelectRow(row);
        m_anchor = row;
        m_list->SyncRowCount();
        if (static_cast<size_t>(row) < GetVisibleRowsBegin() ||
            static_cast<size_t>(row) >= GetVisibleRowsEnd()) {
            ScrollToRow(static_cast<size_t>(row));
        }
    }
}

wxColour ApplyListSkin(XListCtrl& list, const ImSkinConfig& skin, const char* section,
                       const wxColour& background) {
    list.SetFontOfCells(MakeSkinFont(skin.GetFont(section)));
    list.SetRowHeight(skin.GetInt("GridHeight", 17, section));
    const wxColour text = NativeColour(skin.GetRgbColour("TextColor", 0, section));
    const auto colourOr = [&](const char* key, wxSystemColour fallback) {
        return skin.GetInt(key, -1, section) == -1
                   ? wxSystemSettings::GetColour(fallback)
                   : NativeColour(skin.GetRgbColour(key, 0, section));
    };
    list.SetColours(text, background, colourOr("TextColorDisabled", wxSYS_COLOUR_GRAYTEXT),
                    colourOr("TextColorDown", wxSYS_COLOUR_HIGHLIGHT));
    if (const int headerColour = skin.GetInt("HeaderBgColor", -1, section); headerColour != -1) {
        list.Header()->SetSkinColors(NativeColour(static_cast<std::uint32_t>(headerColour)), text);
    }
    list.SetHeaderPicture(LoadSkinPicture(skin.GetString("HeaderBack", "", section)),
                          skin.GetInt("HeaderBgMode", 0, section),
                          skin.GetInt("HeadBgTopSplitter", 0, section),
                          skin.GetInt("HeadBgBtmSplitter", 0, section));
    return text;
}

}  // namespace ac
