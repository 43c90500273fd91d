#pragma once
// What ImLanguage needs of a dialog and of a menu to translate them in place. The window code
// adapts its wx dialogs and menus to these; the translation rules stay here, window-free.
//
// Thread contract: UI thread only, like the windows behind them.

#include <string>
#include <vector>

namespace ac {

// Kinds of control that translation tells apart. Edits, lists and spin buttons show the user's
// data, not program text, so they are never translated.
enum class TranslatableControlKind { Edit, List, Spin, Combo, Other };

class ITranslatableDialog {
public:
    virtual ~ITranslatableDialog() = default;

    virtual std::string GetCaption() const = 0;
    virtual void SetCaption(const std::string& text) = 0;

    // Children in z-order, first to last.
    virtual int GetChildCount() const = 0;
    // The control id as the window has it; translation reads it as a signed 16-bit number.
    virtual int GetChildId(int index) const = 0;
    virtual TranslatableControlKind GetChildKind(int index) const = 0;
    virtual std::string GetChildText(int index) const = 0;
    virtual void SetChildText(int index, const std::string& text) = 0;
    // Items of a combo box child.
    virtual std::vector<std::string> GetComboItems(int index) const = 0;
    virtual void SetComboItems(int index, const std::vector<std::string>& items) = 0;
};

enum class TranslatableMenuItemKind { Separator, Command, Popup };

class ITranslatableMenu {
public:
    virtual ~ITranslatableMenu() = default;

    // Asked anew at each position: an adapter may see items come and go during a walk.
    virtual int GetItemCount() const = 0;
    virtual TranslatableMenuItemKind GetItemKind(int position) const = 0;
    virtual int GetCommandId(int position) const = 0;
    virtual std::string GetItemText(int position) const = 0;
    // Replaces the text only: the item keeps its enabled and checked states.
    virtual void SetItemText(int position, const std::string& text) = 0;
    // The menu of a popup item, or null.
    virtual ITranslatableMenu* GetSubMenu(int position) = 0;
};

}  // namespace ac
