#pragma once
// ImDialog, the base of plain dialogs that carry no skin, and ImChooseSkinDlg, which lists the
// skins with a preview and applies one.
//
// Thread contract: UI thread only.

#include "skin/SkinConfig.h"

#include <wx/dialog.h>

#include <memory>
#include <vector>

class wxListCtrl;
class wxListEvent;
class wxStaticBitmap;
class wxButton;

namespace ac {

class ImDialog : public wxDialog {
public:
    ImDialog(wxWindow* parent, int dialogId, const wxString& title);
    // Translates the dialog; derived dialogs call it once their controls exist.
    void InitDialog() override;

protected:
    int m_nDialogId;
};

class ImChooseSkinDlg : public ImDialog {
public:
    static constexpr int kDialogId = 10002;
    explicit ImChooseSkinDlg(wxWindow* parent);

private:
    void OnSelected(wxListEvent& event);
    void Apply();
    void ShowPreview(int index);

    wxListCtrl* m_list;
    wxStaticBitmap* m_preview;
    wxButton* m_apply;
    // Each list item owns the config of its skin.
    std::vector<std::unique_ptr<ImSkinConfig>> m_skins;
    std::string m_currentDir;
};

}  // namespace ac
