#pragma once
// The list and output buttons of a skin are small glyph pictures; their words stand to the right
// of the glyph rather than over it, and the button grows to hold both.
//
// Thread contract: UI thread only.

#include "skin/SkinControls.h"

#include <algorithm>
#include <span>
#include <vector>

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

// Words beside the glyphs while a button row has room for them: at step n every button whose
// wordlessFrom is at most n shows its glyph alone (its word stays as a tool tip), and the
// steps go on until the buttons and `spacing` between each fit `room`. Long translations
// (German's) lose the words of the least needed buttons first. Returns the buttons' sizes.
inline std::vector<wxSize> FitButtonRowWords(std::span<ImButton* const> buttons,
                                             std::span<const int> wordlessFrom, int room,
                                             int spacing, int minimumHeight) {
    const int lastStep = *std::max_element(wordlessFrom.begin(), wordlessFrom.end());
    std::vector<wxSize> sizes(buttons.size());
    for (int step = 0; step <= lastStep; ++step) {
        int total = spacing * static_cast<int>(buttons.size());
        for (std::size_t i = 0; i < buttons.size(); ++i) {
            const bool wordless = step > 0 && wordlessFrom[i] <= step;
            buttons[i]->SetTextShown(!wordless);
            buttons[i]->SetToolTip(wordless ? buttons[i]->GetLabel() : wxString());
            FitIconButton(*buttons[i], minimumHeight);
            sizes[i] = buttons[i]->GetSize();
            total += sizes[i].x;
        }
        if (total <= room) {
            break;
        }
    }
    return sizes;
}

}  // namespace ac
