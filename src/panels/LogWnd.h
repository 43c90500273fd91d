#pragma once
// CLogWnd: the window that shows the tool's error and warning lines of the selected row. It is
// made once with the status panel and never shown modally; closing it only hides it, and the
// rich edit it was handed stays its child, text and all.
//
// Thread contract: UI thread only.

#include <wx/dialog.h>

class wxTextCtrl;

namespace ac {

class CLogWnd : public wxDialog {
public:
    static constexpr int kDialogId = 139;
    explicit CLogWnd(wxWindow* parent);

    // Takes the control over from its present parent, shows it and fits it to the client area.
    void Attach(wxTextCtrl* control);
    wxTextCtrl* Content() const { return m_content; }
    wxWindow* ContentParent() const { return m_contentParent; }
    void OnLanguageChanged();

private:
    void FitContent();

    wxTextCtrl* m_content = nullptr;
    wxWindow* m_contentParent = nullptr;
};

}  // namespace ac
