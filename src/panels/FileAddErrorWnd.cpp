#include "panels/FileAddErrorWnd.h"

#include "panels/RichEdit.h"
#include "panels/StatusLogic.h"
#include "resources/Language.h"
#include "skin/WindowTranslation.h"

#include <wx/button.h>
#include <wx/textctrl.h>

#include <algorithm>

namespace ac {

namespace {

constexpr std::uint32_t kUnreadable = 439;
constexpr std::uint32_t kAlreadyAdded = 440;
constexpr std::uint32_t kNameTooLong = 0xC042;
constexpr std::uint32_t kTitle = 442;
constexpr std::uint32_t kFileName = 443;
constexpr std::uint32_t kFilePath = 444;
constexpr std::uint32_t kClearText = 0xC161;
constexpr std::uint32_t kCloseText = 0xC162;

wxString Text(std::uint32_t id) {
    return wxString::FromUTF8(g_Language.GetString(id));
}

}  // namespace

CFileAddErrorWnd::CFileAddErrorWnd()
    : wxDialog(nullptr, wxID_ANY, Text(kTitle), wxDefaultPosition, wxSize(460, 260),
               wxDEFAULT_DIALOG_STYLE | wxRESIZE_BORDER),
      m_richEdit(CreateRichEdit(this, kRichEditId)),
      m_clear(new wxButton(this, kClearId, Text(kClearText))),
      m_close(new wxButton(this, kCloseId, Text(kCloseText))) {
    SetBackgroundColour(wxColour(240, 240, 240));
    Bind(
        wxEVT_BUTTON, [this](wxCommandEvent&) { ClearList(); }, kClearId);
    Bind(
        wxEVT_BUTTON, [this](wxCommandEvent&) { Hide(); }, kCloseId);
    Bind(wxEVT_CLOSE_WINDOW, [this](wxCloseEvent& event) {
        if (event.CanVeto()) {
            event.Veto();
            Hide();
        } else {
            event.Skip();
        }
    });
    Bind(wxEVT_SIZE, [this](wxSizeEvent& event) {
        LayoutControls();
        event.Skip();
    });
    TranslateWindow(*this, kDialogId);
    LayoutControls();
}

void CFileAddErrorWnd::AddRefusedFile(const std::string& path, Reason reason) {
    const RunStyle plain;
    RunStyle bold;
    bold.bold = true;
    RunStyle red;
    red.colour = wxColour(0xFF, 0x00, 0x00);
    if (!m_richEdit->IsEmpty()) {
        AppendRun(*m_richEdit, "\r\n", plain);
    }
    const std::uint32_t reasonId = reason == Reason::AlreadyAdded  ? kAlreadyAdded
                                   : reason == Reason::NameTooLong ? kNameTooLong
                                                                   : kUnreadable;
    AppendRun(*m_richEdit, g_Language.GetString(reasonId) + "\r\n", bold);
    AppendRun(*m_richEdit, g_Language.GetString(kFileName), plain);
    AppendRun(*m_richEdit, RefusedFileTitle(path) + "\r\n", red);
    AppendRun(*m_richEdit, g_Language.GetString(kFilePath) + path + "\r\n", plain);
    SetTitle(Text(kTitle));
    Show();
}

void CFileAddErrorWnd::ClearList() {
    m_richEdit->Clear();
}

void CFileAddErrorWnd::OnLanguageChanged() {
    SetTitle(Text(kTitle));
    m_clear->SetLabel(Text(kClearText));
    m_close->SetLabel(Text(kCloseText));
    TranslateWindow(*this, kDialogId);
}

void CFileAddErrorWnd::LayoutControls() {
    const wxSize client = GetClientSize();
    m_richEdit->SetSize(0, 0, client.x, std::max(0, client.y - 25));
    m_clear->SetSize(2, client.y - 22, 40, 20);
    m_close->SetSize(client.x - 42, client.y - 22, 40, 20);
}

}  // namespace ac
