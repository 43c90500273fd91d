#pragma once
// CSaveProfileDlg: asks for a profile name for Save as and Rename. On OK it builds the file path
// in the save directory, asks before overwriting a file, and refuses a name the catalogue
// already shows (any case), staying open.
//
// Thread contract: UI thread only.

#include "profile/Catalogue.h"

#include <wx/dialog.h>

#include <functional>
#include <string>

class wxTextCtrl;

namespace ac {

inline constexpr int kSaveProfileDialogId = 143;

// A message box with the product name as caption; tests answer it through the hook instead.
using ProfileMessageHook = std::function<int(const std::string& text, long style)>;
void SetProfileMessageHook(ProfileMessageHook hook);
int ProfileMessageBox(wxWindow* parent, const std::string& text, long style);

class CSaveProfileDlg : public wxDialog {
public:
    CSaveProfileDlg(wxWindow* parent, const std::string& name, const std::string& saveDirectory,
                    const ProfileCatalogue& catalogue, bool renameMode);

    // The checks of OK: true when the dialog may close.
    bool TryAccept();
    void SetNameText(const std::string& text);

    const std::string& Name() const { return m_name; }
    const std::string& FilePath() const { return m_filePath; }

private:
    void OnOk(wxCommandEvent& event);

    std::string m_name;
    std::string m_saveDirectory;
    std::string m_filePath;
    const ProfileCatalogue& m_catalogue;
    bool m_renameMode;
    wxTextCtrl* m_edit = nullptr;
};

}  // namespace ac
