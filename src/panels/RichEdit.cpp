#include "panels/RichEdit.h"

#include <wx/font.h>
#include <wx/textctrl.h>

namespace ac {

namespace {

std::string OneKindOfLineEnd(const std::string& text) {
    std::string out;
    out.reserve(text.size());
    for (std::size_t i = 0; i < text.size(); ++i) {
        if (text[i] == '\r') {
            out += '\n';
            if (i + 1 < text.size() && text[i + 1] == '\n') {
                ++i;
            }
        } else {
            out += text[i];
        }
    }
    return out;
}

}  // namespace

wxTextCtrl* CreateRichEdit(wxWindow* parent, int id) {
    return new wxTextCtrl(parent, id, wxEmptyString, wxDefaultPosition, wxDefaultSize,
                          wxTE_RICH2 | wxTE_MULTILINE | wxTE_READONLY | wxTE_WORDWRAP);
}

void AppendRun(wxTextCtrl& edit, const std::string& text, const RunStyle& style) {
    if (text.empty()) {
        return;
    }
    // Tahoma 8 pt on the platform the program came from; the desktop's sans face stands in.
    wxFont font(wxFontInfo(8).Family(wxFONTFAMILY_SWISS));
    font.SetWeight(style.bold ? wxFONTWEIGHT_BOLD : wxFONTWEIGHT_NORMAL);
    font.SetStyle(style.italic ? wxFONTSTYLE_ITALIC : wxFONTSTYLE_NORMAL);
    font.SetUnderlined(style.underline);
    const long start = edit.GetLastPosition();
    edit.AppendText(wxString::FromUTF8(OneKindOfLineEnd(text)));
    edit.SetStyle(start, edit.GetLastPosition(), wxTextAttr(style.colour, wxNullColour, font));
    edit.SetInsertionPointEnd();
    edit.ShowPosition(edit.GetLastPosition());
}

std::string RichEditText(const wxTextCtrl& edit) {
    return edit.GetValue().utf8_string();
}

}  // namespace ac
