#pragma once
// The preview panel's view of the convert and rip lists. The burn list brings its own when its
// panel comes: CPlayerWnd::SetModeList(2, ...) with an IPreviewList over its rows.
//
// Thread contract: UI thread only.

#include "panels/PlayerWnd.h"

namespace ac {

// Mode 0: rows of g_MediaList. Mode 1: tracks of g_RipDlg. They hold nothing but reach the
// panels through their global pointers, so one of each serves the program's whole run.
IPreviewList& ConvertPreviewList();
IPreviewList& RipPreviewList();

}  // namespace ac
