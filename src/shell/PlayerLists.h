#pragma once
// The preview panel's view of the lists of the three work modes.
//
// Thread contract: UI thread only.

#include "panels/PlayerWnd.h"

namespace ac {

// Mode 0: rows of g_MediaList. Mode 1: tracks of g_RipDlg. They hold nothing but reach the
// panels through their global pointers, so one of each serves the program's whole run.
IPreviewList& ConvertPreviewList();
IPreviewList& RipPreviewList();
// Mode 2: rows of g_CreatorPanel.
IPreviewList& BurnPreviewList();

}  // namespace ac
