#include "panels/LogWnd.h"

#include "resources/Language.h"
#include "skin/WindowTranslation.h"

#include <wx/textctrl.h>

namespace ac {

namespace {
constexpr std::uint32_t kLogTitle = 0xC160;
}

CLogWnd::CLogWnd(wxWindow* parent)
    : wxDialog(parent, wxID_ANY, wxString::FromUTF8(g_Language.GetString(kLogTitle)),
               wxDefaultPosition, wxSize(480, 300),
               wxDEFAULT_DIALOG_STYLE | wxRESIZE_BORDER | wxMAXIMIZE_BOX | wxMINIMIZE_BOX) {
    Bind(wxEVT_SIZE, [this](wxSizeEvent& event) {
        FitContent();
        event.Skip();
    });
    Bind(wxEVT_CLOSE_WINDOW, [this](wxCloseEvent& event) {
        // The text is the log of the selected row; it must outlive the window's being closed.
        if (event.CanVeto()) {
            event.Veto();
            Hide();
        } else {
            event.Skip();
        }
    });
    OnLanguageChanged();
}

void CLogWnd::Attach(wxTextCtrl* control) {
    m_content = control;
    m_contentParent = control != nullptr ? control->GetParent() : nullptr;
    if (control == nullptr) {
        return;
    }
    if (control->GetParent() != this) {
        control->Reparent(this);
    }
    control->Show();
    FitContent();
}

void CLogWnd::OnLanguageChanged() {
    SetTitle(wxString::FromUTF8(g_Language.GetString(kLogTitle)));
    TranslateWindow(*this, kDialogId);
}

void CLogWnd::FitContent() {
    if (m_content != nullptr && m_content->GetParent() == this) {
        m_content->SetSize(GetClientSize());
    }
}

}  // namespace ac
