#pragma once
// The wx side of translation: a menu bar of the skinned kind and a wx menu seen through the
// interfaces that ImLanguage translates.
//
// Thread contract: UI thread only.

#include "resources/LanguageUi.h"
#include "skin/SkinMenu.h"

#include <memory>
#include <vector>

namespace ac {

class WxMenuAdapter : public ITranslatableMenu {
public:
    explicit WxMenuAdapter(wxMenu* menu) : m_menu(menu) {}
    int GetItemCount() const override;
    TranslatableMenuItemKind GetItemKind(int position) const override;
    int GetCommandId(int position) const override;
    std::string GetItemText(int position) const override;
    void SetItemText(int position, const std::string& text) override;
    ITranslatableMenu* GetSubMenu(int position) override;

private:
    wxMenuItem* Item(int position) const;
    wxMenu* m_menu;
    std::vector<std::unique_ptr<WxMenuAdapter>> m_children;
};

class WxMenuBarAdapter : public ITranslatableMenu {
public:
    explicit WxMenuBarAdapter(ImMenu& menu) : m_menu(menu) {}
    int GetItemCount() const override;
    TranslatableMenuItemKind GetItemKind(int position) const override;
    int GetCommandId(int position) const override;
    std::string GetItemText(int position) const override;
    void SetItemText(int position, const std::string& text) override;
    ITranslatableMenu* GetSubMenu(int position) override;

private:
    ImMenu& m_menu;
    std::vector<std::unique_ptr<WxMenuAdapter>> m_children;
};

// Translates a whole bar (top flag set) or a context menu.
void TranslateMenuBar(ImMenu& menu);
void TranslatePopupMenu(wxMenu& menu, int menuId);

}  // namespace ac
