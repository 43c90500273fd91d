#include "cddb/DiscFile.h"

#include "cddb/PrivateProfile.h"
#include "cddb/RecordText.h"
#include "platform/AtomicFile.h"
#include "platform/Paths.h"

#include <algorithm>
#include <cstdio>

namespace cddb {
namespace {

constexpr std::string_view kInfoSection = "CDINFO";
constexpr std::string_view kMusicSection = "MUSIC";

std::string TrackKey(int index) {
    char key[24];
    std::snprintf(key, sizeof key, "Track%02d", index);
    return key;
}

// A value cut to its capacity may end in a blank that the next read would drop: drop it now,
// so that a record read, saved and read again stays the same.
std::string FitValue(std::string_view value, std::size_t capacity) {
    return std::string(TrimAsciiSpace(FitText(value, capacity)));
}

void ReadRecord(const PrivateProfile& profile, CDDiscInfo& info) {
    info.Clear();
    info.artist = FitValue(profile.GetString(kInfoSection, "ARITIST"), kArtistCapacity);
    info.album = FitValue(profile.GetString(kInfoSection, "ALBUM"), kAlbumCapacity);
    info.genre = FitValue(profile.GetString(kInfoSection, "GENRE"), kGenreCapacity);
    info.year = FitValue(profile.GetString(kInfoSection, "YEAR"), kYearCapacity);
    info.trackCount = std::clamp(profile.GetInt(kMusicSection, "Total"), 0, kMaxTracks);
    for (int index = 0; index < info.trackCount; ++index) {
        info.titles.push_back(
            FitValue(profile.GetString(kMusicSection, TrackKey(index)), kTitleCapacity));
    }
}

}  // namespace

std::string FormatDiscId(std::uint32_t discId) {
    char text[9];
    std::snprintf(text, sizeof text, "%08x", discId);
    return text;
}

std::optional<std::uint32_t> ParseDiscIdText(std::string_view text) {
    text = TrimAsciiSpace(text);
    if (text.empty() || text.size() > 8 ||
        !std::all_of(text.begin(), text.end(), [](char c) { return ac::HexDigitValue(c) >= 0; })) {
        return std::nullopt;
    }
    return ReadHex(text);
}

std::string DiscFilePath(std::string_view folder, std::uint32_t discId) {
    std::string path(folder);
    if (!path.empty() && path.back() != '/') {
        path += '/';
    }
    return path + FormatDiscId(discId) + ".cddb";
}

void ParseDiscFileText(std::string_view bytes, CDDiscInfo& info) {
    PrivateProfile profile;
    profile.LoadText(bytes);
    ReadRecord(profile, info);
}

std::string DiscFileText(const CDDiscInfo& info, int format) {
    CDDiscInfo fitted = info;
    fitted.Fit();
    PrivateProfileWriter writer;
    writer.Section(kInfoSection);
    writer.Key("ARITIST", fitted.artist);
    writer.Key("ALBUM", fitted.album);
    writer.Key("GENRE", fitted.genre);
    writer.Key("YEAR", fitted.year);
    writer.Section(kMusicSection);
    writer.Key("Total", std::to_string(fitted.trackCount));
    for (int index = 0; index < fitted.trackCount; ++index) {
        writer.Key(TrackKey(index), fitted.Title(index));
    }
    std::string text = writer.Text();
    if (format == kUnixDiscFileFormat) {
        std::replace(text.begin(), text.end(), '\r', '\0');
    }
    return text;
}

bool LoadDiscFile(const std::string& folder, std::uint32_t discId, CDDiscInfo& info) {
    PrivateProfile profile;
    const bool found = profile.LoadFile(DiscFilePath(folder, discId));
    ReadRecord(profile, info);
    return found;
}

bool SaveDiscFile(const std::string& folder, std::string_view idText, const CDDiscInfo& info,
                  int format) {
    const std::optional<std::uint32_t> discId = ParseDiscIdText(idText);
    if (!discId) {
        return false;
    }
    return ac::platform::WriteFileAtomically(DiscFilePath(folder, *discId),
                                             DiscFileText(info, format));
}

std::string LocalCddbFolder(std::string_view setting) {
    std::string folder(setting);
    if (TrimAsciiSpace(setting).empty()) {
        folder = ac::platform::UserDataDirectory() + "/CDDB";
        ac::platform::EnsureDirectory(folder, 0700);
    } else {
        // A folder the user chose looks like any other folder the user makes.
        ac::platform::EnsureDirectory(folder, 0777);
    }
    return folder;
}

}  // namespace cddb
