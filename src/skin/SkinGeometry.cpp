#include "skin/SkinGeometry.h"

#include <algorithm>
#include <charconv>
#include <cctype>
#include <climits>
#include <cstdio>

namespace ac {

SplitPlan PlanSplitPicture(int W, int H, int w, int h, int splitRow, int splitCol) {
    SplitPlan plan;
    if (W <= 0 || H <= 0 || w <= 0 || h <= 0) {
        return plan;
    }
    const int y = std::clamp(splitRow < 0 ? H + splitRow : splitRow, 0, H - 1);
    const int x = std::clamp(splitCol < 0 ? W + splitCol : splitCol, 0, W - 1);
    const int rightW = W - x;
    const int bottomH = H - y;
    auto add = [&](SkinRect dst, SkinRect src) {
        if (!dst.Empty() && !src.Empty()) {
            plan.blits.push_back({dst, src});
        }
    };
    add({0, 0, x, y}, {0, 0, x, y});
    add({w - rightW, 0, rightW, y}, {x, 0, rightW, y});
    add({0, h - bottomH, x, bottomH}, {0, y, x, bottomH});
    add({w - rightW, h - bottomH, rightW, bottomH}, {x, y, rightW, bottomH});
    const int midW = w - W;
    const int midH = h - H;
    if (midW > 0) {
        add({x, 0, midW, y}, {x, 0, 1, y});
        add({x, h - bottomH, midW, bottomH}, {x, y, 1, bottomH});
    }
    if (midH > 0) {
        add({0, y, x, midH}, {0, y, x, 1});
        add({w - rightW, y, rightW, midH}, {x, y, rightW, 1});
    }
    if (midW > 0 && midH > 0) {
        plan.fill = {x, y, midW, midH};
        plan.fillSourceX = x;
        plan.fillSourceY = y;
    }
    return plan;
}

std::vector<std::pair<int, int>> PlanTiles(int W, int H, int w, int h) {
    std::vector<std::pair<int, int>> tiles;
    if (W <= 0 || H <= 0 || w <= 0 || h <= 0) {
        return tiles;
    }
    const int columns = w / W + 1;
    const int rows = h / H + 1;
    tiles.reserve(static_cast<std::size_t>(columns) * static_cast<std::size_t>(rows));
    for (int r = 0; r < rows; ++r) {
        for (int c = 0; c < columns; ++c) {
            tiles.emplace_back(c * W, r * H);
        }
    }
    return tiles;
}

std::vector<SkinRect> LayoutRowRects(const SkinRect& area, int direction, int gap,
                                     const std::vector<int>& sizes, int restIndex) {
    const int length = direction == 0 ? area.w : area.h;
    int used = 0;
    for (std::size_t i = 0; i < sizes.size(); ++i) {
        used += static_cast<int>(i) == restIndex ? 0 : std::max(0, sizes[i]);
    }
    if (!sizes.empty()) {
        used += gap * static_cast<int>(sizes.size() - 1);
    }
    const int rest = std::max(0, length - used);
    std::vector<SkinRect> rects;
    int at = direction == 0 ? area.x : area.y;
    for (std::size_t i = 0; i < sizes.size(); ++i) {
        const int size = static_cast<int>(i) == restIndex ? rest : std::max(0, sizes[i]);
        rects.push_back(direction == 0 ? SkinRect{at, area.y, size, area.h}
                                       : SkinRect{area.x, at, area.w, size});
        at += size + gap;
    }
    return rects;
}

namespace {

std::uint32_t Le32(const std::vector<unsigned char>& b, std::size_t at) {
    return static_cast<std::uint32_t>(b[at]) | (static_cast<std::uint32_t>(b[at + 1]) << 8) |
           (static_cast<std::uint32_t>(b[at + 2]) << 16) |
           (static_cast<std::uint32_t>(b[at + 3]) << 24);
}

}  // namespace

std::optional<Bitmap24> DecodeBmp24(const std::vector<unsigned char>& bytes) {
    if (bytes.size() < 54 || bytes[0] != 'B' || bytes[1] != 'M') {
        return std::nullopt;
    }
    const std::uint32_t dataOffset = Le32(bytes, 10);
    const std::uint32_t headerSize = Le32(bytes, 14);
    const auto width = static_cast<std::int32_t>(Le32(bytes, 18));
    const auto rawHeight = static_cast<std::int32_t>(Le32(bytes, 22));
    const unsigned bits = bytes[28] | (bytes[29] << 8);
    const std::uint32_t compression = Le32(bytes, 30);
    if (headerSize < 40 || bits != 24 || compression != 0 || width <= 0 || rawHeight == 0 ||
        rawHeight == INT32_MIN || width > 16384 || std::abs(rawHeight) > 16384) {
        return std::nullopt;
    }
    const int height = std::abs(rawHeight);
    const std::size_t stride = (static_cast<std::size_t>(width) * 3 + 3) & ~std::size_t{3};
    if (dataOffset > bytes.size() || (bytes.size() - dataOffset) / stride < std::size_t(height)) {
        return std::nullopt;
    }
    Bitmap24 picture;
    picture.width = width;
    picture.height = height;
    picture.pixels.resize(static_cast<std::size_t>(width) * static_cast<std::size_t>(height));
    for (int row = 0; row < height; ++row) {
        // Positive heights store the bottom row first.
        const int fileRow = rawHeight > 0 ? height - 1 - row : row;
        const unsigned char* line = bytes.data() + dataOffset + stride * std::size_t(fileRow);
        for (int col = 0; col < width; ++col) {
            const unsigned char* p = line + col * 3;
            picture.pixels[std::size_t(row) * std::size_t(width) + std::size_t(col)] =
                (std::uint32_t(p[2]) << 16) | (std::uint32_t(p[1]) << 8) | p[0];
        }
    }
    return picture;
}

std::vector<SkinRect> RegionRuns(const Bitmap24& picture, std::uint32_t transparent) {
    std::vector<SkinRect> runs;
    runs.reserve(500);
    for (int y = 0; y < picture.height; ++y) {
        const std::uint32_t* row = picture.pixels.data() + std::size_t(y) * picture.width;
        int x = 0;
        while (x < picture.width) {
            while (x < picture.width && row[x] == transparent) {
                ++x;
            }
            const int start = x;
            while (x < picture.width && row[x] != transparent) {
                ++x;
            }
            if (x > start) {
                runs.push_back({start, y, x - start, 1});
            }
        }
    }
    return runs;
}

std::vector<SkinRect> PlaceCorner(const std::vector<SkinRect>& runs, Corner corner, int windowW,
                                  int windowH) {
    if (runs.empty()) {
        return {};
    }
    int right = 0;
    int bottom = 0;
    for (const SkinRect& r : runs) {
        right = std::max(right, r.Right());
        bottom = std::max(bottom, r.Bottom());
    }
    const bool atRight = corner == Corner::RightTop || corner == Corner::RightBottom;
    const bool atBottom = corner == Corner::LeftBottom || corner == Corner::RightBottom;
    const int dx = atRight ? windowW - right : 0;
    const int dy = atBottom ? windowH - bottom : 0;
    std::vector<SkinRect> placed;
    placed.reserve(runs.size());
    for (const SkinRect& r : runs) {
        placed.push_back({r.x + dx, r.y + dy, r.w, r.h});
    }
    return placed;
}

int SliderThumbX(int position, int minimum, int maximum, int width) {
    if (maximum <= minimum) {
        return 13;
    }
    const long long span = maximum - minimum;
    const long long at = std::clamp<long long>(position - minimum, 0, span);
    return static_cast<int>(at * (width - 26) / span) + 13;
}

std::vector<CapacityRun> CapacityRuns(long long position, long long range, long long nearMark,
                                      long long overMark, long long maximum, int width,
                                      int leftMargin) {
    std::vector<CapacityRun> runs;
    if (range <= 0 || width <= 0 || position <= 0) {
        return runs;
    }
    const int filled =
        static_cast<int>(std::min<long long>(position, range) * width / range) + leftMargin;
    const bool marks =
        maximum > 0 && nearMark > 0 && overMark > 0 && nearMark < maximum && overMark < maximum;
    auto add = [&](int x0, int x1, CapacityFill fill) {
        x1 = std::min(x1, filled);
        if (x1 > x0) {
            runs.push_back({x0, x1, fill});
        }
    };
    if (!marks) {
        add(leftMargin, filled, CapacityFill::Normal);
        return runs;
    }
    const int nearX = static_cast<int>(nearMark * width / maximum) + leftMargin;
    const int overX = static_cast<int>(overMark * width / maximum) + leftMargin;
    add(leftMargin, nearX, CapacityFill::Normal);
    add(nearX, overX, CapacityFill::NearOverflow);
    add(overX, filled, CapacityFill::Overflow);
    return runs;
}

std::vector<ScaleTick> CapacityScale(long long maximum, long long step, int width, int leftMargin) {
    std::vector<ScaleTick> ticks;
    if (maximum <= 0 || step <= 0) {
        return ticks;
    }
    for (long long value = step; value < maximum; value += step) {
        ticks.push_back({static_cast<int>((width - leftMargin) * value / maximum), value});
    }
    return ticks;
}

SysButtonLayout LayoutSysButtons(int W, int H, bool hasMaximize) {
    SysButtonLayout layout;
    if (W <= 0 || H <= 0) {
        return layout;
    }
    const int cw = W / 3;
    const int ch = H / 3;
    layout.rects[0] = {0, 0, cw, ch};
    if (hasMaximize) {
        layout.rects[1] = {cw, 0, cw, ch};
        layout.rects[2] = {2 * cw, 0, cw, ch};
        layout.groupWidth = W;
    } else {
        layout.rects[2] = {3 * cw / 2, 0, 3 * cw - 3 * cw / 2, ch};
        layout.groupWidth = 2 * ((W + 2) / 3);
    }
    layout.height = ch;
    return layout;
}

bool InResizeGrip(int px, int py, int windowW, int windowH, int rightMargin, int bottomMargin,
                  int borderWidth) {
    int m = rightMargin + borderWidth;
    int n = bottomMargin + borderWidth;
    m -= m >= 3 ? 1 : 0;
    n -= n >= 3 ? 1 : 0;
    const SkinRect bottom{windowW - m, windowH - 10, m, 10};
    const SkinRect right{windowW - 10, windowH - n, 10, n};
    return bottom.Contains(px, py) || right.Contains(px, py);
}

std::optional<SkinRect> ParseWindowRect(std::string_view text) {
    long long v[4];
    for (int i = 0; i < 4; ++i) {
        while (!text.empty() && text.front() == ' ') {
            text.remove_prefix(1);
        }
        auto [end, ec] = std::from_chars(text.data(), text.data() + text.size(), v[i]);
        if (ec != std::errc()) {
            return std::nullopt;
        }
        text.remove_prefix(static_cast<std::size_t>(end - text.data()));
        if (i < 3) {
            if (text.empty() || text.front() != ',') {
                return std::nullopt;
            }
            text.remove_prefix(1);
        }
    }
    for (long long value : v) {
        if (value < INT_MIN / 2 || value > INT_MAX / 2) {
            return std::nullopt;
        }
    }
    return SkinRect{int(v[0]), int(v[1]), int(v[2] - v[0]), int(v[3] - v[1])};
}

std::string FormatWindowRect(const SkinRect& r) {
    char text[64];
    std::snprintf(text, sizeof text, "%d,%d,%d,%d", r.x, r.y, r.Right(), r.Bottom());
    return text;
}

std::optional<SkinRect> SanitizeWindowRect(const SkinRect& rect, int minW, int minH, int screenW,
                                           int screenH) {
    if (rect.w > 4 * std::max(screenW, 1024) || rect.h > 4 * std::max(screenH, 768)) {
        return std::nullopt;
    }
    SkinRect r = rect;
    r.x = std::max(r.x, 0);
    r.y = std::max(r.y, 0);
    r.w = std::max(r.w, minW);
    r.h = std::max(r.h, minH);
    // A window left on a screen that has since shrunk comes back where it can be grabbed.
    if (screenW > 0 && r.x > screenW - 40) {
        r.x = std::max(0, screenW - r.w);
    }
    if (screenH > 0 && r.y > screenH - 40) {
        r.y = std::max(0, screenH - r.h);
    }
    return r;
}

SkinRect MenuEntryRect(int k, int itemLeft, int itemWidth, int itemHeight, int itemSpacing,
                       int marginTop) {
    return {itemLeft + k * (itemWidth + itemSpacing), marginTop, itemWidth, itemHeight};
}

std::pair<std::string, char> SplitMnemonic(std::string_view text) {
    std::string plain;
    char mnemonic = 0;
    for (std::size_t i = 0; i < text.size(); ++i) {
        if (text[i] == '&') {
            if (i + 1 < text.size()) {
                mnemonic = static_cast<char>(std::tolower(static_cast<unsigned char>(text[i + 1])));
            }
            continue;
        }
        plain += text[i];
    }
    return {plain, mnemonic};
}

PopupLayout LayoutPopupRows(const std::vector<std::pair<int, int>>& textSizes) {
    PopupLayout layout;
    int y = 0;
    int longest = 0;
    for (const auto& [cx, cy] : textSizes) {
        layout.rows.push_back({0, y + 4, 0, cy + 5});
        y += cy + 4;
        longest = std::max(longest, cx);
    }
    layout.width = longest + 40;
    layout.height = y + 10;
    for (SkinRect& row : layout.rows) {
        row.w = layout.width;
    }
    return layout;
}

std::pair<int, int> PlacePopupUnderBar(int x, int y, int w, int h, int barHeight, int screenW,
                                       int screenH) {
    const int originalX = x;
    if (y + h > screenH - 50) {
        y = y - barHeight - h - 2;
    }
    if (x + w > screenW) {
        x = screenW - w;
    }
    if (originalX < 0) {
        x = 0;
    }
    return {x, y};
}

std::pair<int, int> PlacePopupBeside(int parentX, int parentY, int parentW, int rowTop, int w,
                                     int h, int screenW, int screenH) {
    int x = parentX + parentW;
    int y = parentY + rowTop;
    const int originalX = x;
    if (y + h > screenH - 50) {
        y = screenH - 50 - h;
    }
    if (x + w > screenW) {
        x = x - parentW - w;
    }
    if (originalX < 0) {
        x = 0;
    }
    return {x, y};
}

SkinRect ListCheckBox(const SkinRect& cell, bool hasText) {
    constexpr int kSide = 13;
    const int x = hasText ? cell.x + 9 : cell.x + (cell.w - kSide) / 2;
    return {x, cell.y + (cell.h - kSide) / 2, kSide, kSide};
}

std::vector<SkinRect> ListTickStrokes(const SkinRect& box) {
    std::vector<SkinRect> strokes;
    int x = box.x + 10;
    int y = box.y + 4;
    for (int i = 0; i < 7; ++i) {
        strokes.push_back({x, y, 1, 3});
        --x;
        y += i < 3 ? 1 : -1;
    }
    return strokes;
}

int ListProgressWidth(int cellWidth, int percent) {
    if (percent <= 0 || cellWidth <= 0) {
        return 0;
    }
    return cellWidth * std::min(percent, 100) / 100;
}

int NextHeaderCheckState(int state, int rowCount) {
    return state == 1 && rowCount > 0 ? 2 : 1;
}

}  // namespace ac
