#pragma once
// The program's icon, drawn at any size (title bar, task bar, tray), and the tray icon whose
// menu sends its commands to the main window.
//
// Thread contract: UI thread only.

#include <wx/bitmap.h>
#include <wx/taskbar.h>

#include <memory>

class wxWindow;

namespace ac {

wxBitmap MakeProgramIcon(int size);
std::unique_ptr<wxTaskBarIcon> MakeTrayIcon(wxWindow* owner);

}  // namespace ac
