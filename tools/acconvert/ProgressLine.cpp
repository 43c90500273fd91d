#include "ProgressLine.h"

#include <algorithm>

namespace ac::console {
namespace {

constexpr int kBarWidth = 30;
constexpr std::size_t kNameWidth = 28;

}  // namespace

std::string ProgressBar(int percent) {
    int filled = std::clamp(percent, 0, 100) * kBarWidth / 100;
    return std::string(filled, '#') + std::string(kBarWidth - filled, '-');
}

void DrawProgressLine(std::FILE* out, std::string name, int percent, int overall) {
    if (name.size() > kNameWidth) {
        // Never inside a UTF-8 sequence: a cut character would show as garbage.
        std::size_t cut = kNameWidth - 3;
        while (cut > 0 && (static_cast<unsigned char>(name[cut]) & 0xC0) == 0x80)
            --cut;
        name = name.substr(0, cut) + "...";
    }
    percent = std::clamp(percent, 0, 100);
    std::fprintf(out, "\r\033[K%-28s %3d%% [%s] all %3d%%", name.c_str(), percent,
                 ProgressBar(percent).c_str(), std::clamp(overall, 0, 100));
}

void ClearProgressLine(std::FILE* out) {
    std::fputs("\r\033[K", out);
}

}  // namespace ac::console
