#include "skin/SkinPicture.h"

#include "resources/Language.h"
#include "resources/Package.h"
#include "resources/ZipArchive.h"
#include "skin/SkinManager.h"

#include <wx/dcmemory.h>
#include <wx/log.h>
#include <wx/mstream.h>

#include <algorithm>
#include <cctype>
#include <thread>
#include <unordered_map>
#include <vector>

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

std::string CacheKey(const std::string& path) {
    std::string key = path;
    std::transform(key.begin(), key.end(), key.begin(),
                   [](unsigned char c) { return static_cast<char>(std::tolower(c)); });
    return key;
}

bool EndsWithBmp(const std::string& name) {
    return name.size() > 4 && CacheKey(name.substr(name.size() - 4)) == ".bmp";
}

// The pictures a thread decoded ahead, by lower-case path; read after the thread is joined.
struct SkinPrefetch {
    std::thread worker;
    std::unordered_map<std::string, Bitmap24> pictures;
    std::unordered_map<std::string, wxImage> pngs;  // through wx's handler, alpha kept
    ~SkinPrefetch() {
        if (worker.joinable()) {
            worker.join();
        }
    }
};

SkinPrefetch& Prefetched() {
    static SkinPrefetch prefetch;
    return prefetch;
}

wxImage ImageOf(const Bitmap24& picture) {
    wxImage image(picture.width, picture.height, false);
    unsigned char* rgb = image.GetData();
    for (const std::uint32_t pixel : picture.pixels) {
        *rgb++ = static_cast<unsigned char>(pixel >> 16);
        *rgb++ = static_cast<unsigned char>(pixel >> 8);
        *rgb++ = static_cast<unsigned char>(pixel);
    }
    return image;
}

}  // namespace

void PrefetchSkinPictures(const std::string& skinDir) {
    SkinPrefetch& prefetch = Prefetched();
    if (prefetch.worker.joinable()) {
        return;
    }
    // The skin's own entries in its package; a skin in a plain folder gets no head start.
    const std::string mapped = MapResourcePath(skinDir + "\\skin.ini");
    const std::shared_ptr<ZipArchive> archive = OpenPackage(mapped);
    if (archive == nullptr) {
        return;
    }
    std::string prefix = CacheKey(GetEntryName(mapped));
    prefix.erase(prefix.size() - std::string_view("skin.ini").size());
    std::vector<std::string> paths;
    for (const ZipEntry& entry : archive->Entries()) {
        const std::string name = CacheKey(entry.name);
        if (name.size() > prefix.size() && name.compare(0, prefix.size(), prefix) == 0 &&
            name.find('\\', prefix.size()) == std::string::npos &&
            (EndsWithBmp(name) || EndsWithPng(name))) {
            paths.push_back(skinDir + "\\" + entry.name.substr(prefix.size()));
        }
    }
    prefetch.worker = std::thread([&prefetch, paths = std::move(paths)] {
        for (const std::string& path : paths) {
            if (EndsWithPng(path)) {
                // wx's image handlers may run on any thread; the image is handed over whole
                // when the thread is joined.
                wxImage image = LoadImageResource(path);
                if (image.IsOk()) {
                    prefetch.pngs.emplace(CacheKey(path), std::move(image));
                }
                continue;
            }
            std::vector<unsigned char> bytes;
            if (!ReadResource(path, bytes)) {
                continue;
            }
            if (std::optional<Bitmap24> picture = DecodeBmp24(bytes)) {
                prefetch.pictures.emplace(CacheKey(path), std::move(*picture));
            }
        }
    });
}

void FinishSkinPrefetch() {
    if (Prefetched().worker.joinable()) {
        Prefetched().worker.join();
    }
}

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
    FinishSkinPrefetch();
    std::unordered_map<std::string, Bitmap24>& prefetched = Prefetched().pictures;
    if (auto ahead = prefetched.find(CacheKey(path)); ahead != prefetched.end()) {
        picture.image = ImageOf(ahead->second);
        picture.bitmap = wxBitmap(picture.image);
        prefetched.erase(ahead);
    } else if (EndsWithPng(fileName)) {
        std::unordered_map<std::string, wxImage>& pngs = Prefetched().pngs;
        wxImage image;
        if (auto png = pngs.find(CacheKey(path)); png != pngs.end()) {
            image = png->second;
            pngs.erase(png);
        } else {
            image = LoadImageResource(path);
        }
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
