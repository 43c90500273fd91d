// PropertiesCtrl: the operations on rows, values and the selection.

#include "profile/grid/PropertiesCtrl.h"

#include "profile/grid/PropertyTree.h"

#include <wx/textctrl.h>

namespace ac {

namespace {

void CollectRows(PropertyTree* tree, PropertyNode& node, std::vector<PropertyIterator>& rows) {
    for (const auto& child : node.children) {
        rows.emplace_back(tree, child.get());
        CollectRows(tree, *child, rows);
    }
}

PropertyNode* FindNode(PropertyNode& node, int id) {
    for (const auto& child : node.children) {
        if (child->item->id == id) {
            return child.get();
        }
        if (PropertyNode* found = FindNode(*child, id)) {
            return found;
        }
    }
    return nullptr;
}

}  // namespace

PropertyNode* PropertiesCtrl::NodeOf(const PropertyIterator& item) const {
    if (!item.IsValid() || item.Tree() != m_tree || item.Node()->item == nullptr) {
        return nullptr;
    }
    return item.Node();
}

PropertyIterator PropertiesCtrl::AddCategory(int id, const std::string& label,
                                             const std::string& help) {
    return PropertyIterator(
        m_tree, m_tree->AddNode(nullptr, std::make_unique<GWCCategoryItem>(id, label, help)));
}

PropertyIterator PropertiesCtrl::AddItem(const PropertyIterator& parent, int id,
                                         const std::string& label, PropertyKind kind,
                                         const std::string& value, const std::string& help,
                                         const std::string& editorName) {
    auto item = std::make_unique<GWCPropertyItem>(id, label, help, kind);
    item->value.SetText(value);
    item->editor = FindEditor(editorName);
    return PropertyIterator(m_tree, m_tree->AddNode(NodeOf(parent), std::move(item)));
}

void PropertiesCtrl::Remove(const PropertyIterator& item) {
    m_tree->RemoveNode(NodeOf(item));
    Refresh(false);
}

void PropertiesCtrl::RemoveAll() {
    m_tree->RemoveAllNodes();
    Refresh(false);
}

int PropertiesCtrl::ChildCount(const PropertyIterator& item) const {
    const PropertyNode* node = item.IsValid() ? NodeOf(item) : m_tree->Root();
    return node == nullptr ? 0 : static_cast<int>(node->children.size());
}

void PropertiesCtrl::SetEditor(const PropertyIterator& item, PropertyEditor* editor) {
    if (PropertyNode* node = NodeOf(item)) {
        node->item->editor = editor;
        if (node == m_tree->Selection()) {
            m_tree->ReopenEditor();
        }
    }
}

void PropertiesCtrl::SetExpanded(const PropertyIterator& item, bool expanded) {
    m_tree->SetExpanded(NodeOf(item), expanded);
}

void PropertiesCtrl::SetLabel(const PropertyIterator& item, const std::string& label) {
    if (PropertyNode* node = NodeOf(item)) {
        node->item->label = label;
        m_tree->RefreshNode(node);
        Refresh(false);
    }
}

void PropertiesCtrl::SetHelp(const PropertyIterator& item, const std::string& help) {
    if (PropertyNode* node = NodeOf(item)) {
        node->item->help = help;
        Refresh(false);
    }
}

void PropertiesCtrl::SetEnabled(const PropertyIterator& item, bool enabled) {
    PropertyNode* node = NodeOf(item);
    if (node == nullptr || node->item->enabled == enabled) {
        return;
    }
    node->item->enabled = enabled;
    if (node == m_tree->Selection()) {
        m_tree->ReopenEditor();
    }
    m_tree->RefreshNode(node);
}

bool PropertiesCtrl::IsEnabled(const PropertyIterator& item) const {
    const PropertyNode* node = NodeOf(item);
    return node != nullptr && node->item->enabled;
}

std::string PropertiesCtrl::GetValueText(const PropertyIterator& item) const {
    const PropertyNode* node = NodeOf(item);
    return node == nullptr ? std::string() : node->item->value.GetText();
}

void PropertiesCtrl::SetValueText(const PropertyIterator& item, const std::string& text) {
    if (PropertyNode* node = NodeOf(item)) {
        node->item->value.SetText(text);
        m_tree->NodeChanged(node);
    }
}

void PropertiesCtrl::AddOption(const PropertyIterator& item, const std::string& text) {
    if (PropertyNode* node = NodeOf(item)) {
        node->item->value.AddOption(text);
        m_tree->NodeChanged(node);
    }
}

void PropertiesCtrl::RemoveOptions(const PropertyIterator& item) {
    if (PropertyNode* node = NodeOf(item)) {
        node->item->value.RemoveOptions();
        m_tree->NodeChanged(node);
    }
}

std::vector<std::string> PropertiesCtrl::GetOptions(const PropertyIterator& item) const {
    const PropertyNode* node = NodeOf(item);
    return node == nullptr ? std::vector<std::string>() : node->item->value.Options();
}

int PropertiesCtrl::GetId(const PropertyIterator& item) const {
    const PropertyNode* node = NodeOf(item);
    return node == nullptr ? -1 : node->item->id;
}

std::string PropertiesCtrl::GetLabel(const PropertyIterator& item) const {
    const PropertyNode* node = NodeOf(item);
    return node == nullptr ? std::string() : node->item->label;
}

std::vector<PropertyIterator> PropertiesCtrl::VisibleRows() const {
    std::vector<PropertyIterator> rows;
    for (PropertyNode* node : m_tree->VisibleNodes()) {
        rows.emplace_back(m_tree, node);
    }
    return rows;
}

std::vector<PropertyIterator> PropertiesCtrl::AllRows() const {
    std::vector<PropertyIterator> rows;
    CollectRows(m_tree, *m_tree->Root(), rows);
    return rows;
}

PropertyIterator PropertiesCtrl::FindById(int id) const {
    PropertyNode* node = FindNode(*m_tree->Root(), id);
    return node == nullptr ? PropertyIterator() : PropertyIterator(m_tree, node);
}

void PropertiesCtrl::SelectFirst() {
    const auto& rows = m_tree->VisibleNodes();
    if (!rows.empty()) {
        m_tree->SelectNode(rows.front());
    }
}

void PropertiesCtrl::Select(const PropertyIterator& item) {
    m_tree->SelectNode(NodeOf(item));
}

PropertyIterator PropertiesCtrl::GetSelection() const {
    PropertyNode* node = m_tree->Selection();
    return node == nullptr ? PropertyIterator() : PropertyIterator(m_tree, node);
}

bool PropertiesCtrl::CommitEditText(const std::string& text) {
    wxTextCtrl* edit = m_tree->OpenEditText();
    if (edit == nullptr) {
        return false;
    }
    edit->ChangeValue(wxString::FromUTF8(text));
    return m_tree->CommitOpenEdit();
}

bool PropertiesCtrl::StepListValue(int keyCode) {
    return m_tree->StepListValue(keyCode);
}

}  // namespace ac
