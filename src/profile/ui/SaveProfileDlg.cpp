#include "profile/ui/SaveProfileDlg.h"

#include "profile/TextUtil.h"
#include "resources/Language.h"
#include "resources/Package.h"
#include "shell/AppConfig.h"
#include "skin/WindowTranslation.h"

#include <wx/button.h>
#include <wx/msgdlg.h>
#include <wx/sizer.h>
#include <wx/stattext.h>
#include <wx/textctrl.h>

namespace ac {

namespace {

constexpr std::uint32_t kRenameTitle = 0xC0A0;
constexpr std::uint32_t kAskOverwrite = 0xC0A1;
constexpr std::uint32_t kNameExists = 0xC0A2;
constexpr int kLabelId = 1064;
constexpr int kEditId = 1063;

ProfileMessageHook& MessageHook() {
    static ProfileMessageHook hook;
    return hook;
}

}  // namespace

void SetProfileMessageHook(ProfileMessageHook hook) {
    MessageHook() = std::move(hook);
}

int ProfileMessageBox(wxWindow* parent, const std::string& text, long style) {
    if (MessageHook())
        return MessageHook()(text, style);
    return wxMessageBox(wxString::FromUTF8(text),
                        wxString::FromUTF8(GetAppConfig().GetProductStrings().productName), style,
                        parent);
}

CSaveProfileDlg::CSaveProfileDlg(wxWindow* parent, const std::string& name,
                                 const std::string& saveDirectory,
                                 const ProfileCatalogue& catalogue, bool renameMode)
    : wxDialog(parent, wxID_ANY, "Save profile as"),
      m_name(name),
      m_saveDirectory(saveDirectory),
      m_catalogue(catalogue),
      m_renameMode(renameMode) {
    auto* label = new wxStaticText(this, kLabelId, "Please enter the name:");
    m_edit = new wxTextCtrl(this, kEditId, wxString::FromUTF8(name));
    auto* ok = new wxButton(this, wxID_OK, "OK");
    auto* cancel = new wxButton(this, wxID_CANCEL, "Cancel");
    TranslateWindow(*this, kSaveProfileDialogId);
    ok->SetLabel(wxString::FromUTF8(g_Language.GetString(1)));
    cancel->SetLabel(wxString::FromUTF8(g_Language.GetString(2)));
    if (renameMode)
        SetTitle(wxString::FromUTF8(g_Language.GetString(kRenameTitle)));

    auto* buttons = new wxBoxSizer(wxHORIZONTAL);
    buttons->Add(ok, 0, wxRIGHT, 8);
    buttons->Add(cancel);
    auto* column = new wxBoxSizer(wxVERTICAL);
    column->Add(label, 0, wxALL, 10);
    column->Add(m_edit, 0, wxEXPAND | wxLEFT | wxRIGHT, 10);
    column->Add(buttons, 0, wxALIGN_RIGHT | wxALL, 10);
    SetSizerAndFit(column);
    SetSize(wxSize(std::max(GetSize().x, 320), GetSize().y));
    m_edit->SetFocus();
    m_edit->SelectAll();
    Bind(wxEVT_BUTTON, &CSaveProfileDlg::OnOk, this, wxID_OK);
}

void CSaveProfileDlg::SetNameText(const std::string& text) {
    m_edit->ChangeValue(wxString::FromUTF8(text));
}

bool CSaveProfileDlg::TryAccept() {
    const std::string typed = m_edit->GetValue().utf8_string();
    m_name = std::string(TrimBlanks(typed));
    // An empty name would write a file that loads as no profile.
    if (m_name.empty())
        return false;
    if (!m_renameMode) {
        m_filePath = ProfileFilePath(m_saveDirectory, m_name);
        if (ResourceExists(m_filePath) &&
            ProfileMessageBox(this, g_Language.GetString(kAskOverwrite),
                              wxYES_NO | wxNO_DEFAULT | wxICON_QUESTION) != wxYES) {
            return false;
        }
    }
    if (m_catalogue.NameTaken(m_name)) {
        ProfileMessageBox(this, g_Language.GetString(kNameExists), wxOK | wxICON_STOP);
        return false;
    }
    return true;
}

void CSaveProfileDlg::OnOk(wxCommandEvent& /*event*/) {
    if (TryAccept())
        EndModal(wxID_OK);
}

}  // namespace ac
