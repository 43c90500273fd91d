#include "cddb/ui/CddbSelectDlg.h"

#include <wx/button.h>
#include <wx/listbox.h>
#include <wx/sizer.h>

namespace ac {

namespace {

constexpr int kOkId = 1;
constexpr int kCancelId = 2;
CCddbSelectDlg* s_shown = nullptr;

// A server's line may carry control characters; the list shows them as blanks.
wxString RowText(const std::string& row) {
    std::string text = row;
    for (char& c : text) {
        if (static_cast<unsigned char>(c) < ' ')
            c = ' ';
    }
    return wxString::FromUTF8(text);
}

}  // namespace

CCddbSelectDlg::CCddbSelectDlg(wxWindow* parent, const std::vector<std::string>& rows)
    : ImDialog(parent, kDialogId, "Select Genre"),
      m_list(new wxListBox(this, kListId, wxDefaultPosition, wxSize(420, 160))),
      m_rows(rows) {
    for (const std::string& row : rows)
        m_list->Append(RowText(row));
    auto* buttons = new wxBoxSizer(wxHORIZONTAL);
    buttons->AddStretchSpacer();
    buttons->Add(new wxButton(this, kOkId, "OK"), 0, wxRIGHT, 6);
    buttons->Add(new wxButton(this, kCancelId, "Cancel"), 0);
    auto* all = new wxBoxSizer(wxVERTICAL);
    all->Add(m_list, 1, wxEXPAND | wxALL, 10);
    all->Add(buttons, 0, wxEXPAND | wxLEFT | wxRIGHT | wxBOTTOM, 10);
    SetSizerAndFit(all);
    SetEscapeId(kCancelId);
    Bind(
        wxEVT_BUTTON, [this](wxCommandEvent&) { TakeSelection(); }, kOkId);
    Bind(
        wxEVT_BUTTON,
        [this](wxCommandEvent&) {
            m_chosen = 0;
            EndModal(wxID_CANCEL);
        },
        kCancelId);
    m_list->Bind(wxEVT_LISTBOX_DCLICK, [this](wxCommandEvent&) { TakeSelection(); });
    InitDialog();
    CentreOnParent();
}

int CCddbSelectDlg::ShowModal() {
    CCddbSelectDlg* outer = s_shown;
    s_shown = this;
    const int answer = ImDialog::ShowModal();
    s_shown = outer;
    return answer;
}

CCddbSelectDlg* CCddbSelectDlg::Shown() {
    return s_shown;
}

void CCddbSelectDlg::TakeSelection() {
    const int selection = m_list->GetSelection();
    m_chosen = selection == wxNOT_FOUND ? 0 : selection;
    EndModal(wxID_OK);
}

void CCddbSelectDlg::ChooseRow(int row) {
    if (row >= 0 && row < static_cast<int>(m_list->GetCount()))
        m_list->SetSelection(row);
    TakeSelection();
}

}  // namespace ac
