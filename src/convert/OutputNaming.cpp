// Output names. The row's name is filtered for the file system; scheme letters then may rebuild
// it from tags, and a number is added until the name is free.
#include "convert/OutputNaming.h"

#include "profile/ParameterSet.h"
#include "profile/TextUtil.h"
#include "shell/AppConfig.h"

#include <sys/stat.h>

#include <cstdio>
#include <mutex>
#include <vector>

namespace ac {
namespace {

constexpr std::string_view kIllegalCharacters("*/:<>?\\|\0", 9);

// Linux refuses a name component above 255 bytes. Keep room for the extension and a "-NNNNNN"
// of the free-name search, so a long title still yields a name ctt can create.
constexpr std::size_t kNameMax = 255;
constexpr std::size_t kSearchSuffixRoom = 8;

bool IsIllegal(char c) { return kIllegalCharacters.find(c) != std::string_view::npos; }

// Cuts to at most `limit` bytes without splitting a UTF-8 sequence.
void CutUtf8(std::string& text, std::size_t limit) {
    if (text.size() <= limit) return;
    std::size_t cut = limit;
    while (cut > 0 && (static_cast<unsigned char>(text[cut]) & 0xC0) == 0x80) --cut;
    text.resize(cut);
}

// The part behind the last separator, up to the last dot.
std::string BaseName(std::string_view text) {
    const std::size_t slash = text.find_last_of("/\\");
    if (slash != std::string_view::npos) text.remove_prefix(slash + 1);
    const std::size_t dot = text.rfind('.');
    return std::string(dot == std::string_view::npos ? text : text.substr(0, dot));
}

// Tag texts enter the name without the user's character rules, but never as a path: a title
// such as "../../x" or "AC/DC" must stay inside the output folder.
std::string SafeLetterText(std::string text) {
    std::erase_if(text, [](char c) { return c == '/' || c == '\0'; });
    return text;
}

std::string ValueOr(ParameterSet& parameters, std::string_view key, const char* fallback) {
    std::string value = parameters.GetValue(key);
    return value.empty() ? fallback : value;
}

std::string LetterText(char letter, ParameterSet& parameters, int row, const std::string& base) {
    switch (letter) {
        case 'A': {
            char index[16];
            std::snprintf(index, sizeof index, "%02d", row + 1);
            return index;
        }
        case 'B': return ValueOr(parameters, "author", "unknownauthor");
        case 'C': return ValueOr(parameters, "year", "unknownyear");
        case 'D': return ValueOr(parameters, "composer", "unknowncomposer");
        case 'E':
        case 'F': return base;
        case 'G': return ValueOr(parameters, "genre", "unknowngenre");
        case 'H': return ValueOr(parameters, "album", "unknownalbum");
        default: return {};
    }
}

}  // namespace

std::string SchemePattern(std::string_view allScheme, int scheme) {
    for (int i = 0; i < scheme; ++i) {
        const std::size_t comma = allScheme.find(',');
        if (comma == std::string_view::npos) break;  // behind the end: the last pattern
        allScheme.remove_prefix(comma + 1);
    }
    return std::string(allScheme.substr(0, allScheme.find(',')));
}

namespace {

std::string JoinPath(std::string_view directory, const std::string& base, std::string_view extension) {
    std::string name = base + "." + std::string(extension);
    // A name of dots alone would climb out of the folder.
    if (name.find_first_not_of('.') == std::string::npos) name.insert(0, "_");
    return std::string(directory) + "/" + name;
}

// The names held by running jobs. Few at a time (one per running job), so a vector will do.
std::mutex s_heldMutex;
std::vector<std::string> s_held;

bool HeldLocked(std::string_view path) {
    for (const std::string& held : s_held)
        if (EqualsNoCase(held, path)) return true;
    return false;
}

// MakeOutputPath's body; the caller holds s_heldMutex.
std::string MakeOutputPathLocked(ParameterSet& parameters, const OutputNameRequest& request,
                                 const NamingSettings& settings, const FileExistsFn& exists);

}  // namespace

NamingSettings ReadNamingSettings(AppConfig& config) {
    NamingSettings settings;
    settings.alsoConverter = config.GetInt("alsoconverter");
    settings.scheme = config.GetInt("scheme");
    settings.allScheme = config.GetString("allscheme");
    settings.illegal = config.GetInt("illegal");
    settings.illegalReplace = config.GetString("illegalreplace");
    settings.spaceReplace = config.GetInt("spacereplace");
    settings.replace = config.GetString("replace");
    settings.outputFileOverwrite = config.GetInt("output_file_overwrite");
    return settings;
}

std::string FilterFileName(std::string_view text, const NamingSettings& settings) {
    std::string out;
    out.reserve(text.size());
    for (char c : text) {
        const bool illegal = IsIllegal(c);
        const bool blank = c == ' ';
        const bool replaced = (illegal && settings.illegal != 0) || (blank && settings.spaceReplace != 0);
        if (illegal && !replaced) continue;
        if (!replaced) {
            out += c;
            continue;
        }
        const std::string& replacement = illegal ? settings.illegalReplace : settings.replace;
        // No replacement character: the name ends here, as the zero the old buffer got did.
        if (replacement.empty()) break;
        // A replacement that is itself illegal would put a separator into the name.
        if (!IsIllegal(replacement.front())) out += replacement.front();
    }
    return out;
}

bool PathExistsOnDisk(const std::string& path) {
    struct stat info;
    return ::lstat(path.c_str(), &info) == 0;  // a dangling link is taken too: never overwrite it
}

std::string MakeOutputPath(ParameterSet& parameters, const OutputNameRequest& request,
                           const NamingSettings& settings, const FileExistsFn& exists) {
    std::lock_guard lock(s_heldMutex);
    return MakeOutputPathLocked(parameters, request, settings, exists);
}

OutputHold& OutputHold::operator=(OutputHold&& other) noexcept {
    if (this != &other) {
        Release();
        m_path = std::move(other.m_path);
        other.m_path.clear();
    }
    return *this;
}

void OutputHold::Release() {
    if (m_path.empty()) return;
    std::lock_guard lock(s_heldMutex);
    for (auto it = s_held.begin(); it != s_held.end(); ++it) {
        if (*it == m_path) {
            s_held.erase(it);
            break;
        }
    }
    m_path.clear();
}

bool IsOutputHeld(std::string_view path) {
    std::lock_guard lock(s_heldMutex);
    return HeldLocked(path);
}

OutputHold HoldOutputPath(std::string path) {
    std::lock_guard lock(s_heldMutex);
    OutputHold hold;
    hold.m_path = std::move(path);
    s_held.push_back(hold.m_path);
    return hold;
}

OutputHold ReserveFreePath(std::string_view directory, std::string base, std::string_view extension,
                           int firstSuffix, bool replaceExisting, const FileExistsFn& exists) {
    const std::size_t fixedPart = 1 + extension.size() + kSearchSuffixRoom;
    CutUtf8(base, fixedPart < kNameMax ? kNameMax - fixedPart : 0);
    while (!directory.empty() && directory.back() == '/') directory.remove_suffix(1);

    std::lock_guard lock(s_heldMutex);
    std::string path = JoinPath(directory, base, extension);
    auto taken = [&](const std::string& candidate) {
        return HeldLocked(candidate) || (!replaceExisting && exists(candidate));
    };
    for (int n = firstSuffix; n < firstSuffix + 1'000'000 && taken(path); ++n) {
        path = JoinPath(directory, base + "-" + std::to_string(n), extension);
    }
    OutputHold hold;
    hold.m_path = std::move(path);
    s_held.push_back(hold.m_path);
    return hold;
}

OutputHold ReserveOutputPath(ParameterSet& parameters, const OutputNameRequest& request,
                             const NamingSettings& settings, const FileExistsFn& exists) {
    std::lock_guard lock(s_heldMutex);
    OutputHold hold;
    hold.m_path = MakeOutputPathLocked(parameters, request, settings, exists);
    s_held.push_back(hold.m_path);
    return hold;
}

namespace {

std::string MakeOutputPathLocked(ParameterSet& parameters, const OutputNameRequest& request,
                                 const NamingSettings& settings, const FileExistsFn& exists) {
    const std::string filtered = FilterFileName(parameters.GetOutputFileName(), settings);
    std::string base = BaseName(filtered.empty() ? request.sourcePath : std::string_view(filtered));

    if (settings.alsoConverter != 0) {
        const std::string pattern = SchemePattern(settings.allScheme, settings.scheme);
        std::string named;
        for (std::size_t i = 0; i < pattern.size(); ++i) {
            if (i > 0) named += '-';
            named += SafeLetterText(LetterText(pattern[i], parameters, request.row, base));
        }
        base = std::move(named);
    }

    const std::string extension = parameters.GetExtName();
    const std::size_t fixedPart = 1 + extension.size() + kSearchSuffixRoom;
    CutUtf8(base, fixedPart < kNameMax ? kNameMax - fixedPart : 0);

    std::string_view directory = request.directory;
    while (!directory.empty() && directory.back() == '\\') directory.remove_suffix(1);
    while (!directory.empty() && directory.back() == '/') directory.remove_suffix(1);

    std::string path = JoinPath(directory, base, extension);
    const bool searchDisk = settings.outputFileOverwrite == 0 && !request.skipSearch;
    auto taken = [&](const std::string& candidate) {
        if (HeldLocked(candidate)) return true;
        return searchDisk && (exists(candidate) || EqualsNoCase(candidate, request.lastOutput));
    };
    // Bounded, so a check that always answers "exists" cannot hang the driver.
    for (int n = 1; n < 1'000'000 && taken(path); ++n) {
        path = JoinPath(directory, base + "-" + std::to_string(n), extension);
    }
    return path;
}

}  // namespace

}  // namespace ac
