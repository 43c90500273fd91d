#pragma once
// PropertiesCtrl: a tree of named values in two columns (label, value), with an in-place editor
// for the selected value and a help pane at its foot. It knows nothing of parameters: its client
// adds categories and items, reads and writes value texts, and overrides the notifications.
//
// Thread contract: UI thread only.

#include <wx/colour.h>
#include <wx/window.h>

#include <memory>
#include <string>
#include <vector>

namespace ac {

class PropertyTree;
class PropertyEditor;
struct PropertyNode;

// Kinds of a value; the text forms are those of PropertyValue.
enum class PropertyKind { Text, Bool, Int, UInt, Short, UShort, Char, Float, Double };

// A position in the tree. Equal on tree and node; valid until its node is removed.
class PropertyIterator {
public:
    PropertyIterator() = default;
    PropertyIterator(PropertyTree* tree, PropertyNode* node) : m_tree(tree), m_node(node) {}
    bool IsValid() const { return m_tree != nullptr && m_node != nullptr; }
    PropertyNode* Node() const { return m_node; }
    PropertyTree* Tree() const { return m_tree; }
    bool operator==(const PropertyIterator& other) const = default;

private:
    PropertyTree* m_tree = nullptr;
    PropertyNode* m_node = nullptr;
};

class PropertiesCtrl : public wxWindow {
public:
    static constexpr int kButtonStripHeight = 28;
    static constexpr int kMinCommentHeight = 25;
    static constexpr int kGripHeight = 6;

    PropertiesCtrl(wxWindow* parent, int id);
    ~PropertiesCtrl() override;

    void ShowComment(bool show);
    bool IsCommentShown() const;
    // Applies the limits (at least 25; at most the client height less 25) and answers the
    // height in force.
    int SetCommentHeight(int height);
    int GetCommentHeight() const;
    // At least 20; at most the width less the gutter less 20 once the window has a width.
    int SetLabelColumnWidth(int width);
    int GetLabelColumnWidth() const;
    void EnableToolTips(bool enable);
    // exact false: keeps the hue and saturation and sets the lightness to 192/255.
    void SetGridLineColor(const wxColour& colour, bool exact);
    wxColour GetGridLineColor() const;
    void SetBackgroundColour2(const wxColour& background, const wxColour& commentBackground);
    void SetTextColour2(const wxColour& text);
    void SetTreeFont(const wxFont& font);
    // Lines the drop-down list of a list editor shows before it scrolls; at least 2.
    void SetListLines(int lines);

    PropertyIterator AddCategory(int id, const std::string& label, const std::string& help);
    // `parent` is a category or an item; `editorName` names a registered editor ("edit",
    // "list", "editlist", ...), empty for none.
    PropertyIterator AddItem(const PropertyIterator& parent, int id, const std::string& label,
                             PropertyKind kind, const std::string& value,
                             const std::string& help, const std::string& editorName = {});
    void Remove(const PropertyIterator& item);
    void RemoveAll();
    int ChildCount(const PropertyIterator& item) const;
    // Registered editor of that name; null for an unknown name.
    PropertyEditor* FindEditor(const std::string& name) const;
    void SetEditor(const PropertyIterator& item, PropertyEditor* editor);
    void SetExpanded(const PropertyIterator& item, bool expanded);
    void SetLabel(const PropertyIterator& item, const std::string& label);
    void SetHelp(const PropertyIterator& item, const std::string& help);
    // A disabled row shows its value and opens no editor.
    void SetEnabled(const PropertyIterator& item, bool enabled);
    bool IsEnabled(const PropertyIterator& item) const;
    std::string GetValueText(const PropertyIterator& item) const;
    void SetValueText(const PropertyIterator& item, const std::string& text);
    void AddOption(const PropertyIterator& item, const std::string& text);
    void RemoveOptions(const PropertyIterator& item);
    std::vector<std::string> GetOptions(const PropertyIterator& item) const;
    int GetId(const PropertyIterator& item) const;
    std::string GetLabel(const PropertyIterator& item) const;
    // Rows in display order (categories and items, folded children left out).
    std::vector<PropertyIterator> VisibleRows() const;
    // Every row, depth first.
    std::vector<PropertyIterator> AllRows() const;
    PropertyIterator FindById(int id) const;
    void SelectFirst();
    void Select(const PropertyIterator& item);
    PropertyIterator GetSelection() const;

    // The in-place editor of the selected row, for tests and keyboard handling: sets its text
    // and commits as a loss of focus would (true when the value changed).
    bool CommitEditText(const std::string& text);
    // Up/Down/Home/End stepping of a list editor on the selected row.
    bool StepListValue(int keyCode);

    // Notifications, in this order; they do nothing by default.
    virtual void OnPropertyChanged(const PropertyIterator& item);
    virtual void OnPropertyButtonClicked(const PropertyIterator& item);
    virtual void OnPropertyButtonBackgroundClicked(const PropertyIterator& item);
    virtual void OnTreeRebuilt();
    virtual void OnSelectionChanged(const PropertyIterator& item);
    virtual void OnInPlaceShown(wxWindow* window, const PropertyIterator& item);
    virtual void OnHotLinkClicked(const PropertyIterator& item);
    virtual void OnRequestListBox(const PropertyIterator& item);

    PropertyTree* Tree() const { return m_tree; }

private:
    void LayoutBands();
    wxRect HelpPaneRect() const;
    void PaintHelpPane();
    void OnGripMouse(wxMouseEvent& event);
    // The node behind an iterator of this control's tree; null for any other.
    PropertyNode* NodeOf(const PropertyIterator& item) const;

    PropertyTree* m_tree = nullptr;
    // The implementation keeps the rest (editors, help pane, grip drag) out of this header.
    struct Impl;
    std::unique_ptr<Impl> m_impl;
};

}  // namespace ac
