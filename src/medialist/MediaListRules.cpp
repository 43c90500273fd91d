#include "medialist/MediaListRules.h"

#include <algorithm>
#include <array>
#include <cctype>

namespace ac {

namespace {

std::string Lower(std::string_view text) {
    std::string out(text);
    std::transform(out.begin(), out.end(), out.begin(),
                   [](unsigned char c) { return static_cast<char>(std::tolower(c)); });
    return out;
}

bool EqualNoCase(std::string_view a, std::string_view b) {
    return a.size() == b.size() && Lower(a) == Lower(b);
}

// Patterns of the filter entries, in the order of their label ids.
constexpr std::array<const char*, kFilterEntryCount> kFilterPatterns = {
    // "*m4v" lacks its dot on purpose: the list has always taken any name ending so.
    "*.wav;*.au;*.aiff;*.wmv;*.wma;*.asf;*.mp1;*.mp2;*.mp3;*.mp4;*.m4a;*m4v;*.avi;*.mpg;*.mpa;"
    "*.dat;*.mpeg;*.mjpg;*.mjpeg;*.vob;*.h261;*.h264;*.ac3;*.yuv;*.mov;*.qt;*.dv;*.dif;*.nut;"
    "*.3gp;*.3g2;*.gif;*.swf;*.rm;*.ra;*.ram;*.rmvb;*.ogg;*.aac;*.ape;*.cue;*.flac;*.cda",
    "*.3gp",
    "*.3g2",
    "*.gif",
    "*.avi",
    "*.dv;*.dif",
    "*.mov;*.qt",
    "*.swf",
    "*.mjpg;*.mjpeg",
    "*.mp2",
    "*.mp3",
    "*.ogg",
    "*.aac",
    "*.m4a;*.mp4",
    "*.mp4",
    "*.nut",
    "*.ac3",
    "*.h261",
    "*.h261;*.h264",
    "*.m4v",
    "*.yuv",
    "*.rm;*.ra;*.ram;*.rmvb",
    // GTK takes each pattern as written, so the blanks that once stood here are gone.
    "*.wma;*.wmv;*.asf",
    "*.mpg;*.mpeg;*.mpa;*.dat;*.vob",
    "*.ape;*.cue",
    "*.wav;*.au;*.aiff",
    "*.flac",
    "*.cda",
    // Linux names need no dot, so "All Files" asks for everything.
    "*",
};

}  // namespace

std::string GetDisplayName(std::string_view path) {
    // A backslash is an ordinary character of a Linux file name; it separates folders only in
    // a Windows path, as cue sheets written there name their audio files.
    const bool windowsPath = path.find('/') == std::string_view::npos;
    const std::size_t slash = path.find_last_of(windowsPath ? "\\" : "/");
    std::string_view name = slash == std::string_view::npos ? path : path.substr(slash + 1);
    const std::size_t dot = name.rfind('.');
    if (dot == std::string_view::npos || name.size() - dot > 5) {
        return std::string(name);
    }
    return std::string(name.substr(0, dot));
}

std::string GetExtension(std::string_view path) {
    const std::size_t dot = path.rfind('.');
    return std::string(dot == std::string_view::npos ? path : path.substr(dot + 1));
}

bool IsFolderMediaName(std::string_view name) {
    static constexpr std::array<std::string_view, 28> kTypes = {
        "avi", "wma", "wmv", "asf", "wav", "ra",  "rm",  "rmvb", "mpg", "mpeg",
        "ape", "flac", "m4a", "mp3", "mp2", "mp4", "aac", "3gp", "3g2", "ac3",
        "cda", "ogg", "mov", "au",  "cue", "vob", "ram", "mpa"};
    const std::size_t dot = name.rfind('.');
    if (dot == std::string_view::npos) {
        return false;
    }
    const std::string_view extension = name.substr(dot + 1);
    return std::any_of(kTypes.begin(), kTypes.end(),
                       [&](std::string_view type) { return EqualNoCase(type, extension); });
}

int ClampAddPosition(int position, int count) {
    return position < 0 || position > count ? count : position;
}

std::string VolumePercentText(int volume) {
    int percent = volume * 2;
    if (percent % 25 != 0) {
        // Up, also for a negative value: the next multiple of 25 above it.
        percent = percent > 0 ? (percent / 25 + 1) * 25 : (percent / 25) * 25;
    }
    return std::to_string(percent) + "%";
}

std::string TargetColumnText(std::string_view shortName) {
    static constexpr std::string_view kSuffix = " Format";
    if (shortName.size() >= kSuffix.size() &&
        EqualNoCase(shortName.substr(shortName.size() - kSuffix.size()), kSuffix)) {
        shortName.remove_suffix(kSuffix.size());
    }
    return std::string(shortName);
}

std::string RowOutputFileName(std::string_view nameColumn, std::string_view extension) {
    const std::size_t first = nameColumn.find_first_not_of('.');
    if (first == std::string_view::npos) {
        nameColumn = {};
    } else {
        nameColumn = nameColumn.substr(first, nameColumn.find_last_not_of('.') - first + 1);
    }
    return std::string(nameColumn) + "." + std::string(extension);
}

bool BitRateAllowedFor(std::string_view extension) {
    for (std::string_view lossless : {"wav", "ape", "flac", "au"}) {
        if (EqualNoCase(lossless, extension)) {
            return false;
        }
    }
    return true;
}

std::string TrimOutputDirectory(std::string_view text) {
    if (text.size() >= 4) {
        while (!text.empty() && (text.back() == '/' || text.back() == '\\')) {
            text.remove_suffix(1);
        }
    }
    return std::string(text);
}

std::string OpenDialogFilter(const std::function<std::string(std::uint32_t)>& text,
                             const std::vector<std::string>& more) {
    std::string all = kFilterPatterns[0];
    for (const std::string& extension : more) {
        const std::string pattern = "*." + Lower(extension);
        const bool clean = !extension.empty() &&
                           extension.find_first_of("|;*?/ ") == std::string::npos;
        if (clean && (";" + all + ";").find(";" + pattern + ";") == std::string::npos) {
            all += ";" + pattern;
        }
    }
    std::string filter;
    for (int i = 0; i < kFilterEntryCount; ++i) {
        if (i > 0) {
            filter += '|';
        }
        std::string label = text(kFilterLabelFirstId + static_cast<std::uint32_t>(i));
        // A bar in a translated label would split the entry in two.
        std::replace(label.begin(), label.end(), '|', '/');
        filter += label + "|" + (i == 0 ? all : std::string(kFilterPatterns[std::size_t(i)]));
    }
    return filter;
}

}  // namespace ac
