#pragma once
// Entries and drop-down lists are GTK's own widgets: GTK3 draws them from the desktop theme and
// ignores wx's colour setters on their inner parts, so a dark skin would show white boxes. Those
// controls carry a style class of the program's, restyled at each change of skin.
//
// Thread contract: UI thread only.

#include <wx/colour.h>
#include <wx/window.h>

namespace ac {

struct NativeControlColours {
    wxColour background;
    wxColour text;
    wxColour border;
    wxColour disabledText;
};

// Marks the control (and so its inner parts) as one that follows the skin.
void FollowSkinColours(wxWindow* control);
// Marks every entry, drop-down list and spin control among the window's descendants.
void FollowSkinColoursBelow(wxWindow* parent);
// The colours every marked control takes from now on; derived from a skin section's field and
// text colours by NativeColoursFor.
void SetNativeControlColours(const NativeControlColours& colours);
NativeControlColours NativeColoursFor(const wxColour& field, const wxColour& text);
// The style sheet the colours turn into; kept apart so tests can read it without a display.
wxString NativeControlCss(const NativeControlColours& colours);
// The colours in force (for tests and the hook).
const NativeControlColours& CurrentNativeControlColours();

}  // namespace ac
