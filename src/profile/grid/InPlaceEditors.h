#pragma once
// The windows an editor opens in the selected row's value area: a one-line edit, and the list
// window (text part, drop button, pop-up list) shared by "list", "editlist" and "customlist".
// Both stay alive for the tree's lifetime and are only hidden, so a commit that runs inside the
// edit's own focus handler never deletes the window it runs in.
//
// Thread contract: UI thread only.

#include <wx/longlong.h>
#include <wx/popupwin.h>
#include <wx/textctrl.h>
#include <wx/window.h>

#include <string>
#include <vector>

class wxListBox;

namespace ac {

class PropertyTree;

class InPlaceEdit : public wxTextCtrl {
public:
    InPlaceEdit(wxWindow* parent, PropertyTree* tree);

private:
    void OnKillFocus(wxFocusEvent& event);
    void OnEnter(wxCommandEvent& event);
    void OnKeyDown(wxKeyEvent& event);

    PropertyTree* m_tree;
};

class ListPopup;

class InPlaceList : public wxWindow {
public:
    explicit InPlaceList(PropertyTree* tree);

    // `withEdit` for "editlist": free text goes in through an edit in the text part.
    void Attach(bool withEdit, const std::string& text);
    void SetText(const std::string& text);
    wxTextCtrl* Edit() const { return m_withEdit ? m_edit : nullptr; }
    wxTextCtrl* EditWindow() const { return m_edit; }
    bool IsDropped() const;
    void OpenList(const std::vector<std::string>& options, const std::string& current);
    void CloseList(bool commit);
    void SetListLines(int lines);
    void PopupDismissed();
    // The drop button's work: opens the list, or closes it with commit when it is open.
    void ToggleList();
    bool IsOnButton(int x) const { return x >= GetClientSize().GetWidth() - ButtonWidth(); }
    // Keys shared by the window and the edit inside it; true when handled.
    bool HandleKey(const wxKeyEvent& event);

private:
    int ButtonWidth() const;
    void LayoutParts();
    void OnPaint(wxPaintEvent& event);
    void OnSize(wxSizeEvent& event);
    void OnMouseDown(wxMouseEvent& event);
    void OnKeyDown(wxKeyEvent& event);
    void OnFocus(wxFocusEvent& event);

    PropertyTree* m_tree;
    InPlaceEdit* m_edit;
    ListPopup* m_popup = nullptr;
    std::string m_text;
    bool m_withEdit = false;
    int m_listLines = 8;
    wxLongLong m_dismissedAt = 0;
};

// The drop-down: a transient pop-up round one list box, closed by a click outside.
class ListPopup : public wxPopupTransientWindow {
public:
    explicit ListPopup(InPlaceList* owner);
    void Fill(const std::vector<std::string>& options, const std::string& current);
    void MoveSelection(int keyCode);
    std::string SelectedText() const;
    int LineHeight() const;
    int LineCount() const;
    wxListBox* ListBox() const { return m_box; }

private:
    void OnDismiss() override;
    void OnListKey(wxKeyEvent& event);

    InPlaceList* m_owner;
    wxListBox* m_box;
    bool m_pressed = false;
};

}  // namespace ac
