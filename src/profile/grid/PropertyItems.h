#pragma once
// The rows of the property grid and the tree nodes that own them, and the registered editors the
// rows point at.
//
// Thread contract: UI thread only.

#include "profile/grid/PropertiesCtrl.h"
#include "profile/grid/PropertyValue.h"

#include <memory>
#include <string>
#include <utility>
#include <vector>

namespace ac {

// What an editor opens in a row's value area. Editors whose own window this grid does not have
// open a plain edit when the value can be typed, or nothing.
enum class InPlaceStyle { None, Edit, List, EditList, CustomList };

// One registered editor kind; the control owns one object per name, rows only point at it.
class PropertyEditor {
public:
    PropertyEditor(std::string name, InPlaceStyle style)
        : m_name(std::move(name)), m_style(style) {}
    virtual ~PropertyEditor() = default;
    PropertyEditor(const PropertyEditor&) = delete;
    PropertyEditor& operator=(const PropertyEditor&) = delete;

    const std::string& Name() const { return m_name; }
    InPlaceStyle Style() const { return m_style; }

private:
    std::string m_name;
    InPlaceStyle m_style;
};

class GWCPropertyItem {
public:
    GWCPropertyItem(int itemId, std::string itemLabel, std::string itemHelp, PropertyKind kind)
        : id(itemId),
          label(std::move(itemLabel)),
          help(std::move(itemHelp)),
          valueKind(kind),
          value(kind) {}
    virtual ~GWCPropertyItem() = default;
    virtual bool IsCategory() const { return false; }
    virtual bool IsHotLink() const { return false; }

    int id;
    std::string label;
    std::string help;
    PropertyKind valueKind;
    PropertyEditor* editor = nullptr;
    PropertyValue value;
    bool expanded = true;
    bool enabled = true;
};

// A heading row that spans both columns and folds its children.
class GWCCategoryItem : public GWCPropertyItem {
public:
    GWCCategoryItem(int itemId, std::string itemLabel, std::string itemHelp)
        : GWCPropertyItem(itemId, std::move(itemLabel), std::move(itemHelp), PropertyKind::Text) {}
    bool IsCategory() const override { return true; }
};

// A row whose value is a link; a click raises OnHotLinkClicked.
class GWCHotLinkItem : public GWCPropertyItem {
public:
    using GWCPropertyItem::GWCPropertyItem;
    bool IsHotLink() const override { return true; }
};

struct PropertyNode {
    std::unique_ptr<GWCPropertyItem> item;  // null on the hidden root only
    PropertyNode* parent = nullptr;
    std::vector<std::unique_ptr<PropertyNode>> children;

    // 0 for the rows under the hidden root.
    int Level() const {
        int level = -1;
        for (const PropertyNode* up = parent; up != nullptr; up = up->parent) {
            ++level;
        }
        return level;
    }
};

}  // namespace ac
