// .cddb records are files other programs wrote, in any code page, often damaged: any bytes
// must give a record within its capacities, and what was read must survive a save and a load
// through a real folder unchanged, in both line-end formats.
#include "cddb/DiscFile.h"
#include "cddb/PrivateProfile.h"
#include "resources/CodePage.h"

#include <fuzzer/FuzzedDataProvider.h>

#include <stdlib.h>
#include <unistd.h>

#include <cstdint>
#include <filesystem>
#include <string>

namespace {

// tmpfs where there is one: every save syncs its file and folder. Removed when the run ends.
class FuzzFolder {
public:
    FuzzFolder() {
        std::string pattern = access("/dev/shm", W_OK) == 0 ? "/dev/shm/ac-fuzz-cddb-XXXXXX"
                                                            : "/tmp/ac-fuzz-cddb-XXXXXX";
        const char* made = ::mkdtemp(pattern.data());
        m_path = made ? made : "";
    }
    ~FuzzFolder() {
        std::error_code ignored;
        std::filesystem::remove_all(m_path, ignored);
    }
    const std::string& Path() const { return m_path; }

private:
    std::string m_path;
};

bool Same(const cddb::CDDiscInfo& a, const cddb::CDDiscInfo& b) {
    return a.artist == b.artist && a.album == b.album && a.genre == b.genre && a.year == b.year &&
           a.trackCount == b.trackCount && a.titles == b.titles;
}

bool IsCleanText(const std::string& text, std::size_t capacity) {
    return text.size() < capacity && ac::SanitizeUtf8(text) == text;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* bytes, std::size_t size) {
    static const FuzzFolder fuzzFolder;
    const std::string& folder = fuzzFolder.Path();
    if (folder.empty()) {
        return 0;
    }
    FuzzedDataProvider data(bytes, size);
    const int format =
        data.ConsumeBool() ? cddb::kUnixDiscFileFormat : cddb::kWindowsDiscFileFormat;
    const std::string section = data.ConsumeRandomLengthString(16);
    const std::string key = data.ConsumeRandomLengthString(16);
    const std::string text = data.ConsumeRemainingBytesAsString();

    cddb::PrivateProfile profile;
    profile.LoadText(text);
    if (!IsCleanText(profile.GetString(section, key), SIZE_MAX))
        __builtin_trap();
    profile.GetInt(section, key, -1);

    cddb::CDDiscInfo read;
    cddb::ParseDiscFileText(text, read);
    if (read.trackCount < 0 || read.trackCount > cddb::kMaxTracks ||
        read.titles.size() != static_cast<std::size_t>(read.trackCount) ||
        !IsCleanText(read.artist, cddb::kArtistCapacity) ||
        !IsCleanText(read.album, cddb::kAlbumCapacity) ||
        !IsCleanText(read.genre, cddb::kGenreCapacity) ||
        !IsCleanText(read.year, cddb::kYearCapacity)) {
        __builtin_trap();
    }
    for (const std::string& title : read.titles) {
        if (!IsCleanText(title, cddb::kTitleCapacity))
            __builtin_trap();
    }

    if (!cddb::SaveDiscFile(folder, "0000abcd", read, format))
        __builtin_trap();
    cddb::CDDiscInfo loaded;
    if (!cddb::LoadDiscFile(folder, 0xabcd, loaded) || !Same(read, loaded))
        __builtin_trap();
    return 0;
}
