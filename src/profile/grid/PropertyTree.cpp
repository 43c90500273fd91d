#include "profile/grid/PropertyTree.h"

#include "profile/grid/InPlaceEditors.h"

#include <wx/dcclient.h>
#include <wx/settings.h>

#include <algorithm>

namespace ac {

PropertyTree::PropertyTree(PropertiesCtrl* owner, int id)
    : wxWindow(owner, id, wxDefaultPosition, wxDefaultSize,
               wxVSCROLL | wxWANTS_CHARS | wxBORDER_NONE | wxFULL_REPAINT_ON_RESIZE,
               "PropertyTree"),
      m_owner(owner),
      m_background(wxSystemSettings::GetColour(wxSYS_COLOUR_LISTBOX)),
      m_textColour(wxSystemSettings::GetColour(wxSYS_COLOUR_WINDOWTEXT)) {
    SetBackgroundStyle(wxBG_STYLE_PAINT);
    BindViewEvents();
}

// The in-place editors are native boxes, made with the first editor opened: the side bar's
// grid is hidden at the start and may never open one.
void PropertyTree::EnsureEditors() {
    if (m_edit != nullptr) {
        return;
    }
    m_edit = new InPlaceEdit(this, this);
    m_list = new InPlaceList(this);
    if (m_textColourSet) {
        m_edit->SetForegroundColour(m_textColour);
        m_list->EditWindow()->SetForegroundColour(m_textColour);
    }
    if (m_backgroundSet) {
        m_edit->SetBackgroundColour(m_background);
        m_list->EditWindow()->SetBackgroundColour(m_background);
    }
    m_edit->SetFont(TreeFont());
    m_list->SetFont(TreeFont());
    if (m_listLines > 0) {
        m_list->SetListLines(m_listLines);
    }
}

PropertyTree::~PropertyTree() {
    // The editors go while the tree is whole: a last focus event of theirs still asks it.
    Shutdown();
    DestroyChildren();
}

// --- rows

PropertyNode* PropertyTree::AddNode(PropertyNode* parent, std::unique_ptr<GWCPropertyItem> item) {
    if (parent == nullptr) {
        parent = &m_root;
    }
    auto node = std::make_unique<PropertyNode>();
    node->item = std::move(item);
    node->parent = parent;
    PropertyNode* added = node.get();
    parent->children.push_back(std::move(node));
    RowsChanged();
    return added;
}

namespace {

bool IsInside(const PropertyNode* node, const PropertyNode* subtree) {
    for (; node != nullptr; node = node->parent) {
        if (node == subtree) {
            return true;
        }
    }
    return false;
}

bool SubtreeHolds(const PropertyNode* subtree, const PropertyNode* node) {
    if (subtree == node) {
        return true;
    }
    return std::any_of(subtree->children.begin(), subtree->children.end(),
                       [node](const auto& child) { return SubtreeHolds(child.get(), node); });
}

}  // namespace

bool PropertyTree::Contains(const PropertyNode* node) const {
    return node != nullptr && node != &m_root && SubtreeHolds(&m_root, node);
}

void PropertyTree::RemoveNode(PropertyNode* node) {
    if (node == nullptr || node == &m_root || node->parent == nullptr) {
        return;
    }
    if (IsInside(m_editorNode, node)) {
        CloseEditor(false);
    }
    const bool selectionGoes = IsInside(m_selection, node);
    if (selectionGoes) {
        m_selection = nullptr;
    }
    auto& siblings = node->parent->children;
    siblings.erase(std::remove_if(siblings.begin(), siblings.end(),
                                  [node](const auto& child) { return child.get() == node; }),
                   siblings.end());
    RowsChanged();
    if (selectionGoes) {
        m_owner->OnSelectionChanged(PropertyIterator());
    }
}

void PropertyTree::RemoveAllNodes() {
    CloseEditor(false);
    const bool hadSelection = m_selection != nullptr;
    m_selection = nullptr;
    m_root.children.clear();
    m_topRow = 0;
    RowsChanged();
    if (hadSelection) {
        m_owner->OnSelectionChanged(PropertyIterator());
    }
}

const std::vector<PropertyNode*>& PropertyTree::VisibleNodes() const {
    if (m_rowsDirty) {
        RebuildRows();
    }
    return m_rows;
}

void PropertyTree::RebuildRows() const {
    m_rows.clear();
    struct Walker {
        std::vector<PropertyNode*>& rows;
        void Walk(const PropertyNode& node) {
            for (const auto& child : node.children) {
                rows.push_back(child.get());
                if (child->item->expanded) {
                    Walk(*child);
                }
            }
        }
    };
    Walker{m_rows}.Walk(m_root);
    m_rowsDirty = false;
}

void PropertyTree::RowsChanged() {
    m_rowsDirty = true;
    m_rebuiltSincePaint = true;
    UpdateScrollBar();
    PlaceEditor();
    Refresh();
}

void PropertyTree::SetExpanded(PropertyNode* node, bool expanded) {
    if (node == nullptr || node->item == nullptr || node->item->expanded == expanded) {
        return;
    }
    node->item->expanded = expanded;
    // A folded row keeps its selection only when it stays on screen.
    if (!expanded && m_selection != nullptr && m_selection != node &&
        IsInside(m_selection, node)) {
        SelectNode(node);
    }
    RowsChanged();
}

void PropertyTree::RefreshNode(const PropertyNode* node, bool now) {
    const int index = VisibleIndexOf(node);
    if (index >= 0) {
        RefreshRect(RowRect(index));
        if (now) {
            Update();
        }
    }
}

void PropertyTree::NodeChanged(PropertyNode* node) {
    if (node != nullptr && node == m_editorNode) {
        const std::string text = node->item->value.GetText();
        if (wxTextCtrl* edit = OpenEditText()) {
            edit->ChangeValue(wxString::FromUTF8(text));
        }
        m_list->SetText(text);
        if (!node->item->enabled) {
            CloseEditor(false);
        }
    } else if (node != nullptr && node == m_selection) {
        OpenEditor(node);
    }
    RefreshNode(node);
}

// --- selection and editors

void PropertyTree::SelectNode(PropertyNode* node) {
    if (node == m_selection) {
        return;
    }
    CloseEditor(true);
    // The commit may have reached a client that rebuilt the tree under us.
    if (node != nullptr && !Contains(node)) {
        node = nullptr;
    }
    m_selection = node;
    for (PropertyNode* up = node != nullptr ? node->parent : nullptr; up != nullptr && up != &m_root;
         up = up->parent) {
        if (!up->item->expanded) {
            up->item->expanded = true;
            RowsChanged();
        }
    }
    EnsureVisible(node);
    OpenEditor(node);
    Refresh();
    m_owner->Refresh(false);
    m_owner->OnSelectionChanged(PropertyIterator(this, node));
}

void PropertyTree::MoveSelection(int delta) {
    const auto& rows = VisibleNodes();
    if (rows.empty()) {
        return;
    }
    const int current = VisibleIndexOf(m_selection);
    int next = current < 0 ? 0 : current + delta;
    next = std::clamp(next, 0, static_cast<int>(rows.size()) - 1);
    SelectNode(rows[static_cast<std::size_t>(next)]);
}

void PropertyTree::OpenEditor(PropertyNode* node) {
    CloseEditor(true);
    EnsureEditors();
    if (node == nullptr || node->item->IsCategory() || !node->item->enabled ||
        node->item->editor == nullptr || !Contains(node)) {
        return;
    }
    const std::string text = node->item->value.GetText();
    m_openStyle = node->item->editor->Style();
    switch (m_openStyle) {
        case InPlaceStyle::None:
            return;
        case InPlaceStyle::Edit:
            m_editorNode = node;
            m_edit->ChangeValue(wxString::FromUTF8(text));
            m_edit->SetFont(TreeFont());
            break;
        case InPlaceStyle::CustomList:
            m_owner->OnRequestListBox(PropertyIterator(this, node));
            [[fallthrough]];
        case InPlaceStyle::List:
        case InPlaceStyle::EditList:
            m_editorNode = node;
            m_list->SetFont(TreeFont());
            m_list->Attach(m_openStyle == InPlaceStyle::EditList, text);
            break;
    }
    PlaceEditor();
    m_owner->OnInPlaceShown(m_openStyle == InPlaceStyle::Edit
                                ? static_cast<wxWindow*>(m_edit)
                                : static_cast<wxWindow*>(m_list),
                            PropertyIterator(this, node));
}

void PropertyTree::CloseEditor(bool commit) {
    if (m_editorNode == nullptr) {
        return;
    }
    if (commit && OpenEditText() != nullptr) {
        CommitOpenEdit();
    }
    if (m_list->IsDropped()) {
        m_list->CloseList(false);
    }
    const bool hadFocus = FindFocus() == m_edit || FindFocus() == m_list ||
                          (FindFocus() != nullptr && FindFocus()->GetParent() == m_list);
    m_editorNode = nullptr;
    m_edit->Hide();
    m_list->Hide();
    if (hadFocus) {
        SetFocus();
    }
}

void PropertyTree::PlaceEditor() {
    if (m_editorNode == nullptr) {
        return;
    }
    wxWindow* window = m_openStyle == InPlaceStyle::Edit
                           ? static_cast<wxWindow*>(m_edit)
                           : static_cast<wxWindow*>(m_list);
    const int index = VisibleIndexOf(m_editorNode);
    const int width = GetClientSize().GetWidth() - ValueLeft();
    if (index < 0 || index < m_topRow || index >= m_topRow + PageRows() || width < 4) {
        window->Hide();
        return;
    }
    // A frameless edit draws its text at its left edge; painted values start 4 pixels in.
    const int inset = window == m_edit ? kEditTextInset : 0;
    const wxRect row = RowRect(index);
    window->SetSize(ValueLeft() + inset, row.GetTop(), width - inset, row.GetHeight() - 1);
    window->Show();
}

wxTextCtrl* PropertyTree::OpenEditText() const {
    if (m_editorNode == nullptr) {
        return nullptr;
    }
    switch (m_openStyle) {
        case InPlaceStyle::Edit:
            return m_edit;
        case InPlaceStyle::EditList:
            return m_list->Edit();
        default:
            return nullptr;
    }
}

bool PropertyTree::IsListOpen() const {
    if (m_editorNode == nullptr) {
        return false;
    }
    const InPlaceStyle style = m_openStyle;
    return style == InPlaceStyle::List || style == InPlaceStyle::EditList ||
           style == InPlaceStyle::CustomList;
}

bool PropertyTree::CommitOpenEdit() {
    wxTextCtrl* edit = OpenEditText();
    if (edit == nullptr) {
        return false;
    }
    PropertyNode* node = m_editorNode;
    PropertyValue& value = node->item->value;
    const std::string before = value.GetText();
    value.SetText(edit->GetValue().utf8_string());
    const std::string after = value.GetText();
    edit->ChangeValue(wxString::FromUTF8(after));
    m_list->SetText(after);
    if (after == before) {
        RefreshNode(node);
        return false;
    }
    AnnounceChange(node);
    return true;
}

bool PropertyTree::StepListValue(int keyCode) {
    if (m_editorNode == nullptr || !IsListOpen()) {
        return false;
    }
    const std::vector<std::string> options = m_editorNode->item->value.ChoiceTexts();
    const int count = static_cast<int>(options.size());
    const auto found = std::find(options.begin(), options.end(), m_editorNode->item->value.GetText());
    const int current = found == options.end() ? -1 : static_cast<int>(found - options.begin());
    int next = -1;
    switch (keyCode) {
        case WXK_UP:
            next = current > 0 ? current - 1 : -1;
            break;
        case WXK_DOWN:
            next = current < 0 ? 0 : (current + 1 < count ? current + 1 : -1);
            break;
        case WXK_HOME:
            next = 0;
            break;
        case WXK_END:
            next = count - 1;
            break;
        default:
            break;
    }
    if (next < 0 || next >= count || next == current) {
        return false;
    }
    const bool changed = ChooseOption(options[static_cast<std::size_t>(next)]);
    if (wxTextCtrl* edit = OpenEditText()) {
        edit->SelectAll();
    }
    return changed;
}

bool PropertyTree::ChooseOption(const std::string& text) {
    PropertyNode* node = m_editorNode;
    if (node == nullptr) {
        return false;
    }
    PropertyValue& value = node->item->value;
    const std::string before = value.GetText();
    if (text == before) {
        return false;
    }
    value.SetText(text);
    const std::string after = value.GetText();
    if (wxTextCtrl* edit = OpenEditText()) {
        edit->ChangeValue(wxString::FromUTF8(after));
    }
    m_list->SetText(after);
    if (after == before) {
        return false;
    }
    AnnounceChange(node);
    return true;
}

void PropertyTree::AnnounceChange(PropertyNode* node) {
    // The row shows the new value before the client hears of it.
    RefreshNode(node, true);
    m_owner->OnPropertyChanged(PropertyIterator(this, node));
}

void PropertyTree::ReopenEditor() {
    OpenEditor(m_selection);
    Refresh();
}

void PropertyTree::Shutdown() {
    m_editorNode = nullptr;
    m_selection = nullptr;
}

void PropertyTree::FocusEditor() {
    if (m_editorNode == nullptr) {
        return;
    }
    if (wxTextCtrl* edit = OpenEditText()) {
        edit->SetFocus();
        edit->SelectAll();
    } else if (IsListOpen()) {
        m_list->SetFocus();
    }
}

// --- look

int PropertyTree::SetLabelColumnWidth(int width) {
    // The upper limit waits until the window has a real width: before its first layout a
    // client's stored width must not be cut to a placeholder size.
    const int widest = GetClientSize().GetWidth() - m_gutterWidth - kMinColumnWidth;
    if (widest >= kMinColumnWidth) {
        width = std::min(width, widest);
    }
    width = std::max(width, kMinColumnWidth);
    if (width != m_labelColumnWidth) {
        m_labelColumnWidth = width;
        PlaceEditor();
        Refresh();
    }
    return m_labelColumnWidth;
}

void PropertyTree::SetGridLineColor(const wxColour& colour) {
    m_gridLineColor = colour;
    Refresh();
}

void PropertyTree::SetTextColour(const wxColour& colour) {
    m_textColour = colour;
    m_textColourSet = true;
    if (m_edit != nullptr) {
        m_edit->SetForegroundColour(colour);
        m_list->EditWindow()->SetForegroundColour(colour);
    }
    Refresh();
}

void PropertyTree::SetRowBackground(const wxColour& colour) {
    m_background = colour;
    m_backgroundSet = true;
    if (m_edit != nullptr) {
        m_edit->SetBackgroundColour(colour);
        m_list->EditWindow()->SetBackgroundColour(colour);
    }
    Refresh();
}

const wxFont& PropertyTree::TreeFont() const {
    if (!m_font.IsOk()) {
        m_font = wxSystemSettings::GetFont(wxSYS_DEFAULT_GUI_FONT);
    }
    return m_font;
}

void PropertyTree::SetTreeFont(const wxFont& font) {
    m_font = font;
    m_rowHeight = 0;
    if (m_edit != nullptr) {
        m_edit->SetFont(TreeFont());
        m_list->SetFont(TreeFont());
    }
    RowsChanged();
}

int PropertyTree::RowHeight() const {
    if (m_rowHeight == 0) {
        wxClientDC dc(const_cast<PropertyTree*>(this));
        dc.SetFont(TreeFont());
        m_rowHeight = dc.GetCharHeight() + 8;
    }
    return m_rowHeight;
}

void PropertyTree::SetListLines(int lines) {
    m_listLines = lines;
    if (m_list != nullptr) {
        m_list->SetListLines(lines);
    }
}

void PropertyTree::EnableToolTips(bool enable) {
    m_toolTipsEnabled = enable;
    m_toolTipRow = -1;
    if (!enable) {
        UnsetToolTip();
    }
}

}  // namespace ac
