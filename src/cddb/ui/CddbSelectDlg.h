#pragma once
// CCddbSelectDlg: "Select Genre", the choice among the matches a server offered. One row per
// match line, as the server sent it. OK or a double click takes the selected row, OK with none
// selected the first; Cancel also takes the first: the lookup never ends by this choice.
//
// Thread contract: UI thread only.

#include "skin/ChooseSkinDlg.h"

#include <string>
#include <vector>

class wxListBox;

namespace ac {

class CCddbSelectDlg : public ImDialog {
public:
    static constexpr int kDialogId = 1001;
    static constexpr int kListId = 1042;

    CCddbSelectDlg(wxWindow* parent, const std::vector<std::string>& rows);

    // The row taken, 0-based.
    int Chosen() const { return m_chosen; }
    // The test hook's hand: selects a row and presses OK.
    void ChooseRow(int row);
    const std::vector<std::string>& Rows() const { return m_rows; }
    // The dialog shown at the moment, or null.
    static CCddbSelectDlg* Shown();

    int ShowModal() override;

private:
    void TakeSelection();

    wxListBox* m_list;
    std::vector<std::string> m_rows;
    int m_chosen = 0;
};

}  // namespace ac
