#pragma once
// The list and output buttons of a skin are small glyph pictures; their words stand to the right
// of the glyph rather than over it, and the button grows to hold both.
//
// Thread contract: UI thread only.

#include "skin/SkinControls.h"

#include <algorithm>

namespace ac {

// Sizes a button for its picture and label; without a picture, for the label alone.
inline void FitIconButton(ImButton& button, int minimumHeight) {
    const wxSize cell = button.CellSize();
    const wxSize text = button.GetTextExtent(button.GetLabel());
    if (cell.x <= 0 || cell.y <= 0) {
        button.SetTextOffset(wxPoint(0, 0));
        button.SetSize(text.x + 16, std::max(minimumHeight, text.y + 8));
        return;
    }
    constexpr int kGap = 3;
    button.SetTextOffset(wxPoint(cell.x + kGap, 0));
    button.SetSize(cell.x + kGap + text.x + 4, std::max(cell.y, minimumHeight));
}

}  // namespace ac
