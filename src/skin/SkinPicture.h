#pragma once
// Skin pictures and the drawing of split and tiled backgrounds on wx devices. Pictures come out
// of the packages only: PNG keeps its alpha channel, everything else decodes as a plain bitmap.
//
// Thread contract: UI thread only.

#include "skin/SkinConfig.h"
#include "skin/SkinGeometry.h"

#include <wx/bitmap.h>
#include <wx/colour.h>
#include <wx/dc.h>
#include <wx/font.h>
#include <wx/image.h>
#include <wx/region.h>

#include <string>

namespace ac {

struct SkinPicture {
    wxBitmap bitmap;
    wxImage image;  // kept for PNG pictures, whose cells are cut with their alpha
    bool fromPng = false;

    bool IsOk() const { return bitmap.IsOk(); }
    int Width() const { return bitmap.IsOk() ? bitmap.GetWidth() : 0; }
    int Height() const { return bitmap.IsOk() ? bitmap.GetHeight() : 0; }
    void Reset() { *this = SkinPicture(); }
};

// Package loaders on wx types; a missing or damaged entry answers an invalid object.
wxImage LoadImageResource(const std::string& path);
wxBitmap LoadBitmapResource(const std::string& path);
// The runs of a 24-bit BMP corner shape; empty for any other file.
std::vector<SkinRect> LoadRegionResource(const std::string& path);

// The image rule: a name ending in "png" (any case) keeps alpha, every other is a bitmap. The
// name is relative to the current skin's directory and goes through the language's variant.
SkinPicture LoadSkinPicture(const std::string& fileName);
// Decodes the 24-bit BMPs of a skin folder on a thread of their own while the window is being
// made; LoadSkinPicture takes them from there (waiting for the thread on its first call).
// Only a head start: a picture the thread did not decode is decoded as ever.
void PrefetchSkinPictures(const std::string& skinDir);
// Waits for the prefetch thread; LoadSkinPicture's first call and the program's end do.
void FinishSkinPrefetch();

void DrawSplitPicture(wxDC& dc, const wxRect& target, const SkinPicture& picture, int splitRow,
                      int splitCol);
void DrawTiledPicture(wxDC& dc, const wxRect& target, const SkinPicture& picture);
// One cell of a picture cut into equal parts stacked top to bottom (buttons) or a grid cell.
void DrawPictureCell(wxDC& dc, int x, int y, const SkinPicture& picture, const wxRect& cell);
// The same cell drawn `width` wide: both halves as they are, the middle column stretched, so a
// face can grow for a longer translation without distorting its rounded ends.
void DrawWidenedCell(wxDC& dc, int x, int y, int width, const SkinPicture& picture,
                     const wxRect& cell);

inline wxColour NativeColour(std::uint32_t native) {
    return wxColour(native & 0xFF, (native >> 8) & 0xFF, (native >> 16) & 0xFF);
}
wxFont MakeSkinFont(const SkinFont& font);

}  // namespace ac
