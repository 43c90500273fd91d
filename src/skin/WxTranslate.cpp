#include "skin/WxTranslate.h"

#include "resources/Language.h"

namespace ac {

wxMenuItem* WxMenuAdapter::Item(int position) const {
    if (position < 0 || position >= GetItemCount()) {
        return nullptr;
    }
    return m_menu->FindItemByPosition(static_cast<std::size_t>(position));
}

int WxMenuAdapter::GetItemCount() const {
    return static_cast<int>(m_menu->GetMenuItemCount());
}

TranslatableMenuItemKind WxMenuAdapter::GetItemKind(int position) const {
    const wxMenuItem* item = Item(position);
    if (item == nullptr || item->IsSeparator()) {
        return TranslatableMenuItemKind::Separator;
    }
    return item->IsSubMenu() ? TranslatableMenuItemKind::Popup : TranslatableMenuItemKind::Command;
}

int WxMenuAdapter::GetCommandId(int position) const {
    const wxMenuItem* item = Item(position);
    return item == nullptr ? 0 : item->GetId();
}

std::string WxMenuAdapter::GetItemText(int position) const {
    const wxMenuItem* item = Item(position);
    return item == nullptr ? std::string() : item->GetItemLabel().utf8_string();
}

void WxMenuAdapter::SetItemText(int position, const std::string& text) {
    if (wxMenuItem* item = Item(position)) {
        item->SetItemLabel(wxString::FromUTF8(text));
    }
}

ITranslatableMenu* WxMenuAdapter::GetSubMenu(int position) {
    wxMenuItem* item = Item(position);
    if (item == nullptr || !item->IsSubMenu()) {
        return nullptr;
    }
    m_children.push_back(std::make_unique<WxMenuAdapter>(item->GetSubMenu()));
    return m_children.back().get();
}

int WxMenuBarAdapter::GetItemCount() const {
    return static_cast<int>(m_menu.tops.size());
}

TranslatableMenuItemKind WxMenuBarAdapter::GetItemKind(int /*position*/) const {
    return TranslatableMenuItemKind::Popup;
}

int WxMenuBarAdapter::GetCommandId(int /*position*/) const {
    return 0;
}

std::string WxMenuBarAdapter::GetItemText(int position) const {
    return m_menu.tops[static_cast<std::size_t>(position)].first.utf8_string();
}

void WxMenuBarAdapter::SetItemText(int position, const std::string& text) {
    m_menu.tops[static_cast<std::size_t>(position)].first = wxString::FromUTF8(text);
}

ITranslatableMenu* WxMenuBarAdapter::GetSubMenu(int position) {
    m_children.push_back(std::make_unique<WxMenuAdapter>(
        m_menu.tops[static_cast<std::size_t>(position)].second.get()));
    return m_children.back().get();
}

void TranslateMenuBar(ImMenu& menu) {
    WxMenuBarAdapter adapter(menu);
    g_Language.TranslateMenu(adapter, menu.resourceId, true, 0);
}

void TranslatePopupMenu(wxMenu& menu, int menuId) {
    WxMenuAdapter adapter(&menu);
    g_Language.TranslateMenu(adapter, menuId, false, 0);
}

}  // namespace ac
