#pragma once
// The read-only rich text windows of the log and the refused-file list, and how runs of text are
// appended to them.
//
// Thread contract: UI thread only.

#include <wx/colour.h>

#include <string>

class wxTextCtrl;
class wxWindow;

namespace ac {

struct RunStyle {
    wxColour colour{0, 0, 0};
    bool bold = false;
    bool italic = false;
    bool underline = false;
};

// Multi-line, read-only, breaking lines at words.
wxTextCtrl* CreateRichEdit(wxWindow* parent, int id);

// Adds text at the end in the log font (the desktop's sans face at 8 points) with the run's
// colour and flags, and leaves the caret at the end. An empty text adds nothing. Line ends come
// as "\r\n", "\r" or "\n" and all become one line break.
void AppendRun(wxTextCtrl& edit, const std::string& text, const RunStyle& style);

// The whole text with its line breaks as "\n".
std::string RichEditText(const wxTextCtrl& edit);

}  // namespace ac
