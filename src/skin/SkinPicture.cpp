#include "skin/SkinPicture.h"

#include "resources/Language.h"
#include "resources/Package.h"
#include "skin/SkinManager.h"

#include <wx/dcmemory.h>
#include <wx/log.h>
#include <wx/mstream.h>

#include <algorithm>
#include <cctype>
#include <unordered_map>

namespace ac {

namespace {

bool EndsWithPng(const std::string& name) {
    if (name.size() < 3) {
        return false;
    }
    std::string tail = name.substr(name.size() - 3);
    std::transform(tail.begin(), tail.end(), tail.begin(),
                   [](unsigned char c) { return static_cast<char>(std::tolower(c)); });
    return tail == "png";
}

}  // namespace

wxImage LoadImageResource(const std::string& path) {
    std::vector<unsigned char> bytes;
    if (!ReadResource(path, bytes) || bytes.empty()) {
        return {};
    }
    // A damaged picture is a fall-back case, not something to tell the user about.
    wxLogNull quiet;
    wxMemoryInputStream stream(bytes.data(), bytes.size());
    wxImage image;
    if (!image.LoadFile(stream, wxBITMAP_TYPE_ANY) || !image.IsOk()) {
        return {};
    }
    return image;
}

wxBitmap LoadBitmapResource(const std::string& path) {
    wxImage image = LoadImageResource(path);
    if (!image.IsOk()) {
        return {};
    }
    // Plain bitmaps draw opaque, as the skins' BMP and GIF pictures always have.
    if (image.HasAlpha()) {
        image.ClearAlpha();
    }
    return wxBitmap(image);
}

std::vector<SkinRect> LoadRegionResource(const std::string& path) {
    std::vector<unsigned char> bytes;
    if (!ReadResource(path, bytes)) {
        return {};
    }
    std::optional<Bitmap24> picture = DecodeBmp24(bytes);
    if (!picture) {
        return {};
    }
    return RegionRuns(*picture, 0);
}

SkinPicture LoadSkinPicture(const std::string& fileName) {
    SkinPicture picture;
    if (fileName.empty()) {
        return picture;
    }
    const std::string path = g_Skin.GetImagePath(&g_Language, fileName);
    // Panels share many pictures (list ends, buttons, headers) and each loads its own at every
    // skin change: decoding each file once per skin halves the first paint's picture work.
    // Bitmaps and images share their pixels when copied, so a hit costs nothing.
    static std::string s_cachedSkin;
    static std::unordered_map<std::string, SkinPicture> s_cache;
    if (s_cachedSkin != g_Skin.GetSkinDir()) {
        s_cache.clear();
        s_cachedSkin = g_Skin.GetSkinDir();
    }
    if (auto found = s_cache.find(path); found != s_cache.end()) {
        return found->second;
    }
    if (EndsWithPng(fileName)) {
        wxImage image = LoadImageResource(path);
        if (image.IsOk()) {
            picture.image = image;
            picture.bitmap = wxBitmap(image);
            picture.fromPng = true;
        }
    } else {
        picture.bitmap = LoadBitmapResource(path);
        if (picture.bitmap.IsOk()) {
            picture.image = picture.bitmap.ConvertToImage();
        }
    }
    s_cache.emplace(path, picture);
    return picture;
}

void DrawSplitPicture(wxDC& dc, const wxRect& target, const SkinPicture& picture, int splitRow,
                      int splitCol) {
    if (!picture.IsOk() || target.IsEmpty()) {
        return;
    }
    const SplitPlan plan = PlanSplitPicture(picture.Width(), picture.Height(), target.width,
                                            target.height, splitRow, splitCol);
    wxMemoryDC source;
    source.SelectObjectAsSource(picture.bitmap);
    if (!plan.fill.Empty()) {
        const wxImage& image = picture.image;
        wxColour colour(image.GetRed(plan.fillSourceX, plan.fillSourceY),
                        image.GetGreen(plan.fillSourceX, plan.fillSourceY),
                        image.GetBlue(plan.fillSourceX, plan.fillSourceY));
        dc.SetPen(*wxTRANSPARENT_PEN);
        dc.SetBrush(wxBrush(colour));
        dc.DrawRectangle(target.x + plan.fill.x, target.y + plan.fill.y, plan.fill.w, plan.fill.h);
    }
    for (const SkinBlit& b : plan.blits) {
        const int x = target.x + b.dst.x;
        const int y = target.y + b.dst.y;
        if (b.dst.w == b.src.w && b.dst.h == b.src.h) {
            dc.Blit(x, y, b.dst.w, b.dst.h, &source, b.src.x, b.src.y, wxCOPY, true);
        } else {
            dc.StretchBlit(x, y, b.dst.w, b.dst.h, &source, b.src.x, b.src.y, b.src.w, b.src.h,
                           wxCOPY, true);
        }
    }
}

void DrawTiledPicture(wxDC& dc, const wxRect& target, const SkinPicture& picture) {
    if (!picture.IsOk() || target.IsEmpty()) {
        return;
    }
    wxDCClipper clip(dc, target);
    for (const auto& [x, y] :
         PlanTiles(picture.Width(), picture.Height(), target.width, target.height)) {
        dc.DrawBitmap(picture.bitmap, target.x + x, target.y + y, true);
    }
}

void DrawPictureCell(wxDC& dc, int x, int y, const SkinPicture& picture, const wxRect& cell) {
    if (!picture.IsOk() || cell.IsEmpty()) {
        return;
    }
    const wxRect inside = cell.Intersect(wxRect(0, 0, picture.Width(), picture.Height()));
    if (inside.IsEmpty()) {
        return;
    }
    if (picture.fromPng) {
        dc.DrawBitmap(wxBitmap(picture.image.GetSubImage(inside)), x, y, true);
        return;
    }
    wxMemoryDC source;
    source.SelectObjectAsSource(picture.bitmap);
    dc.Blit(x, y, inside.width, inside.height, &source, inside.x, inside.y);
}

void DrawWidenedCell(wxDC& dc, int x, int y, int width, const SkinPicture& picture,
                     const wxRect& cell) {
    const wxRect inside = cell.Intersect(wxRect(0, 0, picture.Width(), picture.Height()));
    if (!picture.IsOk() || inside.IsEmpty() || width <= inside.width) {
        DrawPictureCell(dc, x, y, picture, cell);
        return;
    }
    wxImage source = picture.fromPng ? picture.image.GetSubImage(inside)
                                     : picture.bitmap.GetSubBitmap(inside).ConvertToImage();
    const int half = inside.width / 2;
    const int rightWidth = inside.width - half;
    wxImage widened(width, inside.height);
    if (source.HasAlpha()) {
        widened.InitAlpha();
    }
    widened.Paste(source.GetSubImage(wxRect(0, 0, half, inside.height)), 0, 0);
    const wxImage middle = source.GetSubImage(wxRect(half, 0, 1, inside.height))
                               .Scale(width - inside.width + 1, inside.height);
    widened.Paste(middle, half, 0);
    widened.Paste(source.GetSubImage(wxRect(half, 0, rightWidth, inside.height)),
                  width - rightWidth, 0);
    dc.DrawBitmap(wxBitmap(widened), x, y, true);
}

wxFont MakeSkinFont(const SkinFont& font) {
    wxFontInfo info(std::max(1, font.size) / 10.0);
    // The Windows face names that skins carry have no meaning here: take the desktop's face.
    if (font.name != "MS Shell Dlg" && font.name != "Tohama" && font.name != "Tahoma" &&
        !font.name.empty()) {
        info.FaceName(wxString::FromUTF8(font.name));
    }
    info.Italic(font.italic).Underlined(font.underline);
    wxFont result(info);
    result.SetNumericWeight(std::clamp(font.weight, 1, 1000));
    return result;
}

}  // namespace ac
