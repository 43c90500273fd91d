#pragma once
// The arithmetic behind skinned drawing and layout, free of any window so that it can be tested
// on its own: where the pieces of a split or tiled picture go, how a row of windows shares a
// rectangle, the window shape from corner pictures, slider and capacity bar positions, and where
// menus open.
//
// Thread contract: pure functions, any thread.

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace ac {

struct SkinRect {
    int x = 0;
    int y = 0;
    int w = 0;
    int h = 0;
    int Right() const { return x + w; }
    int Bottom() const { return y + h; }
    bool Contains(int px, int py) const { return px >= x && px < x + w && py >= y && py < y + h; }
    bool Empty() const { return w <= 0 || h <= 0; }
    friend bool operator==(const SkinRect&, const SkinRect&) = default;
};

// One copy from the source picture; the source is stretched when the sizes differ (an edge of one
// pixel repeated is the same as that pixel stretched).
struct SkinBlit {
    SkinRect dst;
    SkinRect src;
};

struct SplitPlan {
    std::vector<SkinBlit> blits;
    SkinRect fill;        // the middle: one colour,
    int fillSourceX = 0;  // taken from this source pixel
    int fillSourceY = 0;
};

// A W x H picture over a w x h target, split at row splitRow and column splitCol (negative counts
// from the far edge): corners unstretched, one row and one column of edge repeated, the middle in
// one colour. A target smaller than the picture makes the corners overlap.
SplitPlan PlanSplitPicture(int pictureW, int pictureH, int targetW, int targetH, int splitRow,
                           int splitCol);

// Top-left corners of the tiles that cover a w x h target, one row and column more than needed.
std::vector<std::pair<int, int>> PlanTiles(int pictureW, int pictureH, int targetW, int targetH);

// Windows in a row (direction 0) or a column (1) inside area, each with `gap` behind it; the one
// at restIndex takes what the others leave, at least 0. sizes are along the row or column.
std::vector<SkinRect> LayoutRowRects(const SkinRect& area, int direction, int gap,
                                     const std::vector<int>& sizes, int restIndex);

// A decoded 24-bit BMP, rows top first, pixels 0x00RRGGBB.
struct Bitmap24 {
    int width = 0;
    int height = 0;
    std::vector<std::uint32_t> pixels;
};
// Only uncompressed 24-bit BMPs are corner shapes; anything else answers nothing.
std::optional<Bitmap24> DecodeBmp24(const std::vector<unsigned char>& bytes);

// Horizontal runs of pixels that are not the transparent colour, one rectangle per run.
std::vector<SkinRect> RegionRuns(const Bitmap24& picture, std::uint32_t transparent);

enum class Corner { LeftTop, RightTop, LeftBottom, RightBottom };
// Moves a corner's runs so that their bounding box meets the window's edges of that corner.
std::vector<SkinRect> PlaceCorner(const std::vector<SkinRect>& runs, Corner corner, int windowW,
                                  int windowH);

// x of the slider thumb's centre for position in [minimum, maximum] across width w.
int SliderThumbX(int position, int minimum, int maximum, int width);

enum class CapacityFill { Normal, NearOverflow, Overflow };
struct CapacityRun {
    int x0 = 0;
    int x1 = 0;
    CapacityFill fill = CapacityFill::Normal;
    friend bool operator==(const CapacityRun&, const CapacityRun&) = default;
};
// The filled part of a capacity bar in up to three colours. Marks at 0 or at/over the maximum
// turn the thresholds off.
std::vector<CapacityRun> CapacityRuns(long long position, long long range, long long nearMark,
                                      long long overMark, long long maximum, int width,
                                      int leftMargin);
struct ScaleTick {
    int x = 0;
    long long value = 0;
};
std::vector<ScaleTick> CapacityScale(long long maximum, long long step, int width, int leftMargin);

// The three system buttons in a 3 x 3 grid picture: minimise, maximise, close.
struct SysButtonLayout {
    SkinRect rects[3];
    int groupWidth = 0;
    int height = 0;
};
SysButtonLayout LayoutSysButtons(int pictureW, int pictureH, bool hasMaximize);

// The L-shaped resize grip at the bottom right of a window of size w x h.
bool InResizeGrip(int px, int py, int windowW, int windowH, int rightMargin, int bottomMargin,
                  int borderWidth);

// "left,top,right,bottom" as settings store it.
std::optional<SkinRect> ParseWindowRect(std::string_view text);
std::string FormatWindowRect(const SkinRect& rect);
// Brings a remembered rectangle back on screen and up to the minimum size. Sizes beyond any
// screen are taken for a damaged setting: nothing answers, and the window is centred.
std::optional<SkinRect> SanitizeWindowRect(const SkinRect& rect, int minW, int minH, int screenW,
                                           int screenH);

// Menu bar entry k from the skin's Menu section.
SkinRect MenuEntryRect(int k, int itemLeft, int itemWidth, int itemHeight, int itemSpacing,
                       int marginTop);
// Text without '&' and the mnemonic (the character after the last '&', lower case, or 0).
std::pair<std::string, char> SplitMnemonic(std::string_view text);

struct PopupLayout {
    std::vector<SkinRect> rows;
    int width = 0;
    int height = 0;
};
// Rows of a popup from the text size of each row.
PopupLayout LayoutPopupRows(const std::vector<std::pair<int, int>>& textSizes);
// A popup of w x h opened under a bar entry at (x, y) on a screen of screenW x screenH.
std::pair<int, int> PlacePopupUnderBar(int x, int y, int w, int h, int barHeight, int screenW,
                                       int screenH);
// A submenu beside row rowTop of a parent popup at (parentX, parentY), parentW wide.
std::pair<int, int> PlacePopupBeside(int parentX, int parentY, int parentW, int rowTop, int w,
                                     int h, int screenW, int screenH);

// List cells. The 13 x 13 check box stands 9 pixels in from the cell's left, vertically
// centred, or centred both ways in a cell without text.
SkinRect ListCheckBox(const SkinRect& cell, bool hasText);
// The tick: seven vertical strokes of 3 pixels, right to left from 10 right and 4 down of the
// box's corner; the first four step down a pixel each, the last three back up.
std::vector<SkinRect> ListTickStrokes(const SkinRect& box);
// Width of the filled part of a progress cell; 0 percent draws no bar at all.
int ListProgressWidth(int cellWidth, int percent);
// A header check box click: unchecked with rows becomes checked, anything else unchecked.
int NextHeaderCheckState(int state, int rowCount);

}  // namespace ac
