#include "skin/WindowTranslation.h"

#include "resources/Language.h"
#include "resources/LanguageUi.h"

#include <wx/combobox.h>
#include <wx/listbase.h>
#include <wx/spinctrl.h>
#include <wx/textctrl.h>

namespace ac {

namespace {

class WxDialogAdapter : public ITranslatableDialog {
public:
    explicit WxDialogAdapter(wxWindow& window) : m_window(window) {
        for (wxWindow* child : window.GetChildren()) {
            m_children.push_back(child);
        }
    }
    std::string GetCaption() const override { return m_window.GetLabel().utf8_string(); }
    void SetCaption(const std::string& text) override {
        // Panels have no caption of their own; only top-level windows show one.
        if (m_window.IsTopLevel()) {
            m_window.SetLabel(wxString::FromUTF8(text));
        }
    }
    int GetChildCount() const override { return static_cast<int>(m_children.size()); }
    int GetChildId(int index) const override { return Child(index)->GetId(); }
    TranslatableControlKind GetChildKind(int index) const override {
        wxWindow* child = Child(index);
        if (dynamic_cast<wxComboBox*>(child) != nullptr) {
            return TranslatableControlKind::Combo;
        }
        if (dynamic_cast<wxTextCtrl*>(child) != nullptr) {
            return TranslatableControlKind::Edit;
        }
        if (dynamic_cast<wxSpinCtrl*>(child) != nullptr) {
            return TranslatableControlKind::Spin;
        }
        return TranslatableControlKind::Other;
    }
    std::string GetChildText(int index) const override {
        return Child(index)->GetLabel().utf8_string();
    }
    void SetChildText(int index, const std::string& text) override {
        Child(index)->SetLabel(wxString::FromUTF8(text));
    }
    std::vector<std::string> GetComboItems(int index) const override {
        std::vector<std::string> items;
        if (auto* combo = dynamic_cast<wxComboBox*>(Child(index))) {
            for (const wxString& item : combo->GetStrings()) {
                items.push_back(item.utf8_string());
            }
        }
        return items;
    }
    void SetComboItems(int index, const std::vector<std::string>& items) override {
        if (auto* combo = dynamic_cast<wxComboBox*>(Child(index))) {
            const int selection = combo->GetSelection();
            combo->Clear();
            for (const std::string& item : items) {
                combo->Append(wxString::FromUTF8(item));
            }
            if (selection >= 0 && selection < static_cast<int>(combo->GetCount())) {
                combo->SetSelection(selection);
            }
        }
    }

private:
    wxWindow* Child(int index) const { return m_children[static_cast<std::size_t>(index)]; }
    wxWindow& m_window;
    std::vector<wxWindow*> m_children;
};

}  // namespace

void TranslateWindow(wxWindow& window, int dialogId) {
    WxDialogAdapter adapter(window);
    g_Language.TranslateDialog(adapter, dialogId);
}

}  // namespace ac
