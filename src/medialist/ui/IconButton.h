#pragma once
// The list and output buttons of a skin are small glyph pictures; their words stand to the right
// of the glyph rather than over it, and the button grows to hold both.
//
// Thread contract: UI thread only.

#include "skin/SkinControls.h"

#include <algorithm>

namespace ac {

// One button of a work mode's button row: its control id, built-in word and skin picture.
struct IconButtonDef {
    int id;
    const char* text;
    const char* picture;
};

// Sizes a button for its picture and label; without a picture, for the label alone.
inline void FitIconButton(ImButton& button, int minimumHeight) {
    const wxSize fit = button.FitSize();
    if (fit.x <= 0 || fit.y <= 0) {
        const wxSize text = button.GetTextExtent(button.GetLabel());
        button.SetSize(text.x + 16, std::max(minimumHeight, text.y + 8));
        return;
    }
    button.SetSize(fit.x, std::max(fit.y, minimumHeight));
}

}  // namespace ac
