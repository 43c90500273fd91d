#pragma once
// Translates a wx window and its labelled children through ImLanguage::TranslateDialog.
//
// Thread contract: UI thread only.

#include <wx/window.h>

namespace ac {

void TranslateWindow(wxWindow& window, int dialogId);

}  // namespace ac
