#include "profile/grid/InPlaceEditors.h"

#include "profile/grid/PropertyTree.h"

#include <wx/dcbuffer.h>
#include <wx/display.h>
#include <wx/listbox.h>
#include <wx/renderer.h>
#include <wx/settings.h>
#include <wx/time.h>

#include <algorithm>

namespace ac {

namespace {

// A click on the drop button while the list is open first closes the list as a click outside;
// the press that follows at once must not open it again.
constexpr long kReopenGuardMs = 250;

bool IsStepKey(int keyCode) {
    return keyCode == WXK_UP || keyCode == WXK_DOWN || keyCode == WXK_HOME || keyCode == WXK_END;
}

}  // namespace

// --- InPlaceEdit

InPlaceEdit::InPlaceEdit(wxWindow* parent, PropertyTree* tree)
    : wxTextCtrl(parent, wxID_ANY, wxString(), wxDefaultPosition, wxDefaultSize,
                 wxBORDER_NONE | wxTE_PROCESS_ENTER),
      m_tree(tree) {
    Hide();
    Bind(wxEVT_KILL_FOCUS, &InPlaceEdit::OnKillFocus, this);
    Bind(wxEVT_TEXT_ENTER, &InPlaceEdit::OnEnter, this);
    Bind(wxEVT_KEY_DOWN, &InPlaceEdit::OnKeyDown, this);
}

void InPlaceEdit::OnKillFocus(wxFocusEvent& event) {
    event.Skip();
    if (m_tree->OpenEditText() == this) {
        m_tree->CommitOpenEdit();
    }
}

void InPlaceEdit::OnEnter(wxCommandEvent&) {
    if (m_tree->OpenEditText() == this) {
        m_tree->CommitOpenEdit();
        SelectAll();
    }
}

void InPlaceEdit::OnKeyDown(wxKeyEvent& event) {
    if (auto* list = dynamic_cast<InPlaceList*>(GetParent())) {
        if (list->HandleKey(event)) {
            return;
        }
        event.Skip();
        return;
    }
    switch (event.GetKeyCode()) {
        case WXK_UP:
        case WXK_DOWN:
            // The arrows leave the row as in the tree itself, and the next row's edit takes over.
            m_tree->CommitOpenEdit();
            m_tree->MoveSelection(event.GetKeyCode() == WXK_UP ? -1 : 1);
            if (m_tree->OpenEditText() != nullptr) {
                m_tree->FocusEditor();
            }
            return;
        case WXK_ESCAPE:
            if (m_tree->EditorNode() != nullptr) {
                ChangeValue(wxString::FromUTF8(m_tree->EditorNode()->item->value.GetText()));
            }
            m_tree->SetFocus();
            return;
        case WXK_TAB:
            Navigate(event.ShiftDown() ? wxNavigationKeyEvent::IsBackward
                                       : wxNavigationKeyEvent::IsForward);
            return;
        default:
            event.Skip();
    }
}

// --- InPlaceList

InPlaceList::InPlaceList(PropertyTree* tree)
    : wxWindow(tree, wxID_ANY, wxDefaultPosition, wxDefaultSize, wxBORDER_NONE | wxWANTS_CHARS),
      m_tree(tree),
      m_edit(new InPlaceEdit(this, tree)) {
    Hide();
    SetBackgroundStyle(wxBG_STYLE_PAINT);
    Bind(wxEVT_PAINT, &InPlaceList::OnPaint, this);
    Bind(wxEVT_SIZE, &InPlaceList::OnSize, this);
    Bind(wxEVT_LEFT_DOWN, &InPlaceList::OnMouseDown, this);
    Bind(wxEVT_LEFT_DCLICK, &InPlaceList::OnMouseDown, this);
    Bind(wxEVT_KEY_DOWN, &InPlaceList::OnKeyDown, this);
    Bind(wxEVT_SET_FOCUS, &InPlaceList::OnFocus, this);
    Bind(wxEVT_KILL_FOCUS, &InPlaceList::OnFocus, this);
}

void InPlaceList::Attach(bool withEdit, const std::string& text) {
    m_withEdit = withEdit;
    m_text = text;
    m_edit->SetFont(GetFont());
    m_edit->ChangeValue(wxString::FromUTF8(text));
    m_edit->Show(withEdit);
    LayoutParts();
    Refresh();
}

void InPlaceList::SetText(const std::string& text) {
    m_text = text;
    Refresh();
}

int InPlaceList::ButtonWidth() const {
    return std::max(wxSystemSettings::GetMetric(wxSYS_HSCROLL_Y, this), 18);
}

void InPlaceList::LayoutParts() {
    const wxSize size = GetClientSize();
    if (m_withEdit) {
        const int inset = PropertyTree::kEditTextInset;
        m_edit->SetSize(inset, 0, std::max(0, size.GetWidth() - ButtonWidth() - inset),
                        size.GetHeight());
    }
}

void InPlaceList::OnSize(wxSizeEvent& event) {
    LayoutParts();
    Refresh();
    event.Skip();
}

void InPlaceList::OnPaint(wxPaintEvent&) {
    wxAutoBufferedPaintDC dc(this);
    const wxSize size = GetClientSize();
    dc.SetBackground(wxBrush(m_tree->RowBackground()));
    dc.Clear();
    const wxRect button(size.GetWidth() - ButtonWidth(), 0, ButtonWidth(), size.GetHeight());
    if (!m_withEdit) {
        const bool focused = HasFocus();
        if (focused) {
            dc.SetPen(*wxTRANSPARENT_PEN);
            dc.SetBrush(wxBrush(wxSystemSettings::GetColour(wxSYS_COLOUR_HIGHLIGHT)));
            dc.DrawRectangle(1, 2, button.GetLeft() - 3, size.GetHeight() - 4);
        }
        dc.SetFont(GetFont());
        dc.SetTextForeground(wxSystemSettings::GetColour(focused ? wxSYS_COLOUR_HIGHLIGHTTEXT
                                                                 : wxSYS_COLOUR_WINDOWTEXT));
        const wxString text = wxString::FromUTF8(m_text);
        wxDCClipper clip(dc, wxRect(0, 0, button.GetLeft(), size.GetHeight()));
        dc.DrawText(text, PropertyTree::kEditTextInset, (size.GetHeight() - dc.GetCharHeight()) / 2);
    }
    wxRendererNative::Get().DrawDropArrow(this, dc, button,
                                          IsDropped() ? int{wxCONTROL_PRESSED} : 0);
}

void InPlaceList::OnMouseDown(wxMouseEvent& event) {
    if (event.GetX() >= GetClientSize().GetWidth() - ButtonWidth()) {
        ToggleList();
    } else if (m_withEdit) {
        m_edit->SetFocus();
    } else {
        SetFocus();
    }
}

void InPlaceList::OnFocus(wxFocusEvent& event) {
    Refresh();
    event.Skip();
}

void InPlaceList::OnKeyDown(wxKeyEvent& event) {
    if (!HandleKey(event)) {
        event.Skip();
    }
}

bool InPlaceList::HandleKey(const wxKeyEvent& event) {
    const int keyCode = event.GetKeyCode();
    if (IsDropped()) {
        if (IsStepKey(keyCode)) {
            m_popup->MoveSelection(keyCode);
        } else if (keyCode == WXK_RETURN || keyCode == WXK_NUMPAD_ENTER || keyCode == WXK_F4) {
            CloseList(true);
        } else if (keyCode == WXK_ESCAPE) {
            CloseList(false);
        } else {
            return false;
        }
        return true;
    }
    if ((keyCode == WXK_DOWN && event.AltDown()) || keyCode == WXK_F4) {
        ToggleList();
    } else if (IsStepKey(keyCode)) {
        m_tree->StepListValue(keyCode);
    } else if (keyCode == WXK_ESCAPE) {
        m_tree->SetFocus();
    } else if (keyCode == WXK_TAB) {
        Navigate(event.ShiftDown() ? wxNavigationKeyEvent::IsBackward
                                   : wxNavigationKeyEvent::IsForward);
    } else if (keyCode == WXK_RETURN || keyCode == WXK_NUMPAD_ENTER) {
        if (m_withEdit) {
            m_tree->CommitOpenEdit();
            m_edit->SelectAll();
        }
    } else {
        return false;
    }
    return true;
}

void InPlaceList::ToggleList() {
    if (IsDropped()) {
        CloseList(true);
        return;
    }
    if (wxGetLocalTimeMillis() - m_dismissedAt < kReopenGuardMs) {
        return;
    }
    const PropertyNode* node = m_tree->EditorNode();
    if (node != nullptr) {
        OpenList(node->item->value.ChoiceTexts(), node->item->value.GetText());
    }
}

bool InPlaceList::IsDropped() const {
    return m_popup != nullptr && m_popup->IsShown();
}

void InPlaceList::OpenList(const std::vector<std::string>& options, const std::string& current) {
    if (m_popup == nullptr) {
        m_popup = new ListPopup(this);
    }
    m_popup->SetFont(GetFont());
    m_popup->Fill(options, current);
    const int lines = std::clamp(m_popup->LineCount(), 2, std::max(2, m_listLines));
    // Room for the lines, the pop-up's border and the list's own frame, so no scroll bar shows
    // while every option fits.
    const wxSize size(GetSize().GetWidth(), lines * m_popup->LineHeight() + 6);
    wxPoint origin = ClientToScreen(wxPoint(0, GetSize().GetHeight()));
    const int display = wxDisplay::GetFromWindow(this);
    const wxRect area = wxDisplay(display == wxNOT_FOUND ? 0u : static_cast<unsigned>(display))
                            .GetClientArea();
    if (origin.y + size.GetHeight() > area.GetBottom()) {
        origin.y -= GetSize().GetHeight() + size.GetHeight();
    }
    m_popup->SetSize(wxRect(origin, size));
    m_popup->Popup(m_popup->ListBox());
    Refresh();
}

void InPlaceList::CloseList(bool commit) {
    if (!IsDropped()) {
        return;
    }
    const std::string chosen = m_popup->SelectedText();
    m_popup->Dismiss();
    Refresh();
    if (m_withEdit) {
        m_edit->SetFocus();
    } else {
        SetFocus();
    }
    if (commit && !chosen.empty()) {
        m_tree->ChooseOption(chosen);
    }
}

void InPlaceList::SetListLines(int lines) {
    m_listLines = std::max(lines, 2);
}

void InPlaceList::PopupDismissed() {
    m_dismissedAt = wxGetLocalTimeMillis();
    Refresh();
}

// --- ListPopup

ListPopup::ListPopup(InPlaceList* owner)
    : wxPopupTransientWindow(owner, wxBORDER_NONE),
      m_owner(owner),
      m_box(new wxListBox(this, wxID_ANY, wxDefaultPosition, wxSize(100, 100), 0, nullptr,
                          wxLB_SINGLE | wxBORDER_NONE)) {
    // A one-pixel frame round the list, drawn by the pop-up's own background.
    SetBackgroundColour(wxSystemSettings::GetColour(wxSYS_COLOUR_BTNSHADOW));
    Bind(wxEVT_SIZE, [this](wxSizeEvent&) {
        const wxSize size = GetClientSize();
        m_box->SetSize(1, 1, std::max(0, size.GetWidth() - 2), std::max(0, size.GetHeight() - 2));
    });
    m_box->Bind(wxEVT_KEY_DOWN, &ListPopup::OnListKey, this);
    m_box->Bind(wxEVT_LEFT_DOWN, [this](wxMouseEvent& event) {
        m_pressed = true;
        event.Skip();
    });
    // The selection moves before the release arrives, so the line under the mouse is taken.
    auto choose = [this](wxEvent& event) {
        event.Skip();
        if (m_pressed) {
            m_pressed = false;
            CallAfter([this] { m_owner->CloseList(true); });
        }
    };
    m_box->Bind(wxEVT_LEFT_UP, choose);
    m_box->Bind(wxEVT_LISTBOX, choose);
}

void ListPopup::Fill(const std::vector<std::string>& options, const std::string& current) {
    m_box->SetFont(GetFont());
    m_box->Clear();
    for (const std::string& option : options) {
        m_box->Append(wxString::FromUTF8(option));
    }
    const auto found = std::find(options.begin(), options.end(), current);
    if (found != options.end()) {
        m_box->SetSelection(static_cast<int>(found - options.begin()));
    }
    m_box->InvalidateBestSize();
    m_pressed = false;
}

void ListPopup::MoveSelection(int keyCode) {
    const int count = static_cast<int>(m_box->GetCount());
    if (count == 0) {
        return;
    }
    const int current = m_box->GetSelection();
    int next = current;
    if (keyCode == WXK_UP) {
        next = std::max(current - 1, 0);
    } else if (keyCode == WXK_DOWN) {
        next = std::min(current + 1, count - 1);
    } else if (keyCode == WXK_HOME) {
        next = 0;
    } else if (keyCode == WXK_END) {
        next = count - 1;
    }
    m_box->SetSelection(next);
    m_box->EnsureVisible(next);
}

std::string ListPopup::SelectedText() const {
    const int selection = m_box->GetSelection();
    return selection == wxNOT_FOUND ? std::string() : m_box->GetString(selection).utf8_string();
}

int ListPopup::LineHeight() const {
    const int count = std::max(1, LineCount());
    return std::max(m_box->GetCharHeight() + 4, m_box->GetBestSize().GetHeight() / count);
}

int ListPopup::LineCount() const {
    return static_cast<int>(m_box->GetCount());
}

void ListPopup::OnDismiss() {
    m_owner->PopupDismissed();
}

void ListPopup::OnListKey(wxKeyEvent& event) {
    if (event.GetKeyCode() == WXK_RETURN || event.GetKeyCode() == WXK_NUMPAD_ENTER) {
        m_owner->CloseList(true);
    } else if (event.GetKeyCode() == WXK_ESCAPE) {
        m_owner->CloseList(false);
    } else {
        event.Skip();
    }
}

}  // namespace ac
