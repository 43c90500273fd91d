#include "profile/ui/ParameterGrid.h"

#include "profile/SideBarLogic.h"
#include "resources/Language.h"
#include "shell/MainHub.h"

#include <sstream>

namespace ac {

namespace {

constexpr GridCategory kTopCategories[] = {GridCategory::General, GridCategory::Video,
                                           GridCategory::Audio, GridCategory::Summary,
                                           GridCategory::Expert};
// Empty categories go in this order.
constexpr GridCategory kRemovalOrder[] = {GridCategory::Video, GridCategory::Audio,
                                          GridCategory::General, GridCategory::Summary,
                                          GridCategory::Expert};

std::size_t Slot(GridCategory category) {
    return static_cast<std::size_t>(category);
}

std::string Text(std::uint32_t id) {
    return g_Language.GetString(id);
}

const char* EditorName(GridEditorKind kind) {
    switch (kind) {
        case GridEditorKind::List:
            return "list";
        case GridEditorKind::EditList:
            return "editlist";
        case GridEditorKind::Edit:
            break;
    }
    return "edit";
}

int WorkMode() {
    IMainHub* hub = GetMainHub();
    return hub != nullptr ? hub->WorkMode() : 0;
}

}  // namespace

ParameterGrid::ParameterGrid(wxWindow* parent, int id) : PropertiesCtrl(parent, id) {}

void ParameterGrid::SetSets(const std::vector<ParameterSet*>& sets) {
    m_sets = sets;
    m_showingCurrent = false;
    Rebuild();
}

bool ParameterGrid::IsSimpleKey(const std::string& key) {
    return key == "ar" || key == "ab" || key == "ac" || key == "vol_factor";
}

void ParameterGrid::NotifyValue(const std::string& key, const std::string& value) {
    if (m_valueListener && IsSimpleKey(key))
        m_valueListener(key, value);
}

PropertyIterator ParameterGrid::ParentFor(GridCategory category) {
    if (category != GridCategory::Crop && category != GridCategory::Pad) {
        return m_categories[Slot(category)];
    }
    // Crop and Pad are made under Video when their first key comes.
    PropertyIterator& node = m_categories[Slot(category)];
    if (!node.IsValid()) {
        node = AddItem(m_categories[Slot(GridCategory::Video)], kCategoryIds[Slot(category)],
                       Text(CategoryLabelId(category)), PropertyKind::Text, "",
                       Text(CategoryHelpId(category)));
        SetExpanded(node, false);
    }
    return node;
}

void ParameterGrid::Rebuild() {
    RemoveAll();
    m_entries.clear();
    m_categories = {};
    for (GridCategory category : kTopCategories) {
        m_categories[Slot(category)] =
            AddCategory(kCategoryIds[Slot(category)], Text(CategoryLabelId(category)),
                        Text(CategoryHelpId(category)));
    }
    SetExpanded(m_categories[Slot(GridCategory::Expert)], false);

    // Without rows the grid shows the current profile, which may have changed since.
    if (m_showingCurrent)
        m_sets.clear();
    m_showingCurrent = m_sets.empty() && m_current != nullptr;
    if (m_showingCurrent)
        m_sets.push_back(m_current);
    const bool disableAll = m_showingCurrent;
    for (const GridItemPlan& plan : PlanGridItems(m_sets, WorkMode() == 1, disableAll)) {
        const ParameterDef& def = ParameterTable()[static_cast<std::size_t>(plan.id)];
        const PropertyIterator item =
            AddItem(ParentFor(plan.parent), plan.id, Text(def.labelId),
                    plan.boolean ? PropertyKind::Bool : PropertyKind::Text, plan.value,
                    Text(def.helpId), EditorName(plan.editor));
        for (const std::string& option : plan.options)
            AddOption(item, option);
        m_entries.emplace_back(plan.key, item);
        NotifyValue(plan.key, plan.value);
        SetEnabled(item, plan.enabled);
    }
    for (GridCategory category : kRemovalOrder) {
        if (ChildCount(m_categories[Slot(category)]) == 0) {
            Remove(m_categories[Slot(category)]);
            m_categories[Slot(category)] = {};
        }
    }
}

void ParameterGrid::RefreshTexts() {
    for (std::size_t slot = 0; slot < m_categories.size(); ++slot) {
        if (!m_categories[slot].IsValid())
            continue;
        const auto category = static_cast<GridCategory>(slot);
        SetLabel(m_categories[slot], Text(CategoryLabelId(category)));
        SetHelp(m_categories[slot], Text(CategoryHelpId(category)));
    }
    for (const auto& [key, item] : m_entries) {
        if (const ParameterDef* def = FindParameterDef(key)) {
            SetLabel(item, Text(def->labelId));
            SetHelp(item, Text(def->helpId));
        }
    }
}

std::string ParameterGrid::Describe() const {
    std::ostringstream out;
    for (const auto& [key, item] : m_entries)
        out << key << ':' << GetValueText(item) << ';';
    return out.str();
}

void ParameterGrid::OnPropertyChanged(const PropertyIterator& item) {
    const std::string key(GetParameterKey(GetId(item)));
    if (key.empty())
        return;
    const std::string value = GetValueText(item);
    auto write = [&] {
        SetValueOnSets(m_sets, key, value);
        if (m_current != nullptr)
            m_current->SetValue(key, value);
    };
    IMainHub* hub = GetMainHub();
    if (hub != nullptr) {
        hub->EditSets(write);
    } else {
        write();
    }
    for (const auto& [entryKey, entryItem] : m_entries) {
        SetValueText(entryItem, CommonValue(m_sets, entryKey));
    }
    NotifyValue(key, CommonValue(m_sets, key));
    if (hub != nullptr && hub->WorkMode() == 0 && key == "vol_factor") {
        hub->SetSelectedVolume(LeadingNumber(value) / 2, false);
    }
}

}  // namespace ac
