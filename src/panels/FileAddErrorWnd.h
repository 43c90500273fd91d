#pragma once
// CFileAddErrorWnd: the list of files the creator panel refused, one block of four runs for
// each. It is made once, with the desktop as its parent; "Close" and the close box only hide it,
// so the list grows over a session until the user clears it.
//
// Thread contract: UI thread only.

#include <wx/dialog.h>

#include <string>

class wxButton;
class wxTextCtrl;

namespace ac {

class CFileAddErrorWnd : public wxDialog {
public:
    static constexpr int kDialogId = 189;
    static constexpr int kRichEditId = 1223;
    static constexpr int kClearId = 1004;
    static constexpr int kCloseId = 1186;

    enum class Reason { AlreadyAdded, Unreadable, NameTooLong };

    CFileAddErrorWnd();

    // Adds the block of one refused file, sets the title and shows the window.
    void AddRefusedFile(const std::string& path, Reason reason);
    void ClearList();
    wxTextCtrl* RichEdit() const { return m_richEdit; }
    void OnLanguageChanged();

private:
    void LayoutControls();

    wxTextCtrl* m_richEdit;
    wxButton* m_clear;
    wxButton* m_close;
};

}  // namespace ac
