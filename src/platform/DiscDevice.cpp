#include "platform/DiscDevice.h"

#include "platform/TocFile.h"

#include <cdio/cdio.h>
#include <cdio/logging.h>
#include <cdio/mmc.h>
#include <cdio/mmc_cmds.h>

#include <algorithm>
#include <cctype>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <mutex>
#include <sstream>
#include <sys/stat.h>
#include <unistd.h>

namespace ac::platform {
namespace {

namespace fs = std::filesystem;

// PREVENT ALLOW MEDIUM REMOVAL has always been given 20 seconds.
constexpr unsigned kLockTimeoutMs = 20000;
constexpr int kLeadInFrames = 150;
constexpr int kMaxTrackNumber = 99;

// libcdio's cue and toc readers tokenise with strtok, whose position is one per process: two
// images read at once on two threads would cut each other's lines. Devices need no lock.
std::mutex s_imageMutex;

void InitLibcdio() {
    static std::once_flag once;
    std::call_once(once, [] {
        // The default handler writes every warning to stderr: a poll once a second of a drive
        // without a disc, or of an image whose .bin went, would fill the terminal. Failures
        // reach the caller as return values instead; only a broken assertion is told (and
        // ends the program, as libcdio's own handler does).
        cdio_log_set_handler([](cdio_log_level_t level, const char message[]) {
            if (level >= CDIO_LOG_ASSERT) {
                std::fprintf(stderr, "libcdio: %s\n", message);
                std::abort();
            }
        });
        cdio_init();
    });
}

struct HandleCloser {
    // Only ever cdio_destroy: eject on an image frees the image behind the handle's back.
    void operator()(CdIo_t* handle) const { cdio_destroy(handle); }
};
using Handle = std::unique_ptr<CdIo_t, HandleCloser>;

std::string LowerExtension(const std::string& path) {
    std::string extension = fs::path(path).extension().string();
    for (char& c : extension) {
        c = static_cast<char>(std::tolower(static_cast<unsigned char>(c)));
    }
    return extension;
}

// The same choice ctt makes when it opens a track, so both read a drive text alike.
driver_id_t DriverFor(const std::string& drive) {
    const std::string extension = LowerExtension(drive);
    if (extension == ".cue" || extension == ".bin") {
        return DRIVER_BINCUE;
    }
    if (extension == ".toc") {
        return DRIVER_CDRDAO;
    }
    if (extension == ".nrg") {
        return DRIVER_NRG;
    }
    return DRIVER_DEVICE;
}

bool IsPlainFile(const std::string& path) {
    struct stat st {};
    return ::stat(path.c_str(), &st) == 0 && S_ISREG(st.st_mode);
}

// A handle that libcdio serves from a file, whatever the drive text looked like.
bool IsFileBacked(const CdIo_t* handle) {
    const driver_id_t id = cdio_get_driver_id(handle);
    if (id == DRIVER_BINCUE || id == DRIVER_CDRDAO || id == DRIVER_NRG) {
        return true;
    }
    cdio_drive_read_cap_t read = 0;
    cdio_drive_write_cap_t write = 0;
    cdio_drive_misc_cap_t misc = 0;
    cdio_get_drive_cap(handle, &read, &write, &misc);
    return (misc & CDIO_DRIVE_CAP_MISC_FILE) != 0;
}

// Cue sheets and tocs are text of a few kilobytes (99 tracks with CD-Text stay far below this);
// a large file under such a name is no sheet and is not read whole.
constexpr std::uintmax_t kMaxSheetBytes = 1 << 20;

bool ReadSheet(const std::string& path, std::string& text) {
    std::error_code error;
    const std::uintmax_t size = fs::file_size(path, error);
    if (error || size > kMaxSheetBytes) {
        return false;
    }
    std::ifstream in(path, std::ios::binary);
    text.assign(std::istreambuf_iterator<char>(in), std::istreambuf_iterator<char>());
    return true;
}

// libcdio keeps the FILE name of a cue sheet that has no TRACK and never frees it; the poll reads
// every image once a second, so such a sheet is turned away before libcdio sees it.
bool CueHasTrack(const std::string& text) {
    std::istringstream lines(text);
    std::string word;
    std::string line;
    while (std::getline(lines, line)) {
        std::istringstream words(line);
        if (words >> word && word.size() == 5) {
            for (char& c : word) {
                c = static_cast<char>(std::toupper(static_cast<unsigned char>(c)));
            }
            if (word == "TRACK") {
                return true;
            }
        }
    }
    return false;
}

// libcdio's cdrdao reader puts the lead-out at the last track's INDEX 01 plus the length of its
// FILE statement, though with a START in the track that length includes the gap before INDEX
// 01. Such a gap shows as a pregap after the previous track's start; a PREGAP statement (gap
// not taken from the file, lead-out right) shows as 0 and is left alone.
int CorrectCdrdaoLeadOut(const CdIo_t* handle, track_t first, track_t last, int leadOutLba) {
    if (last <= first) {
        return leadOutLba;
    }
    const lsn_t gap = cdio_get_track_pregap_lsn(handle, last);
    const lsn_t start = cdio_get_track_lsn(handle, last);
    const lsn_t previous = cdio_get_track_lsn(handle, static_cast<track_t>(last - 1));
    if (gap != CDIO_INVALID_LSN && start != CDIO_INVALID_LSN && gap > previous && gap < start) {
        return leadOutLba - (start - gap);
    }
    return leadOutLba;
}

// Reads the table and refuses one that no disc could have: a broken image (a .bin shorter than
// its cue, a toc whose data file libcdio places at 0) must not reach the track list or the
// disc id as if it were a disc.
// CD-Text in the first language block that has any; a disc without it leaves the texts empty.
void ReadCdText(const CdIo_t* handle, DiscTable& table) {
    cdtext_t* text = cdio_get_cdtext(const_cast<CdIo_t*>(handle));
    if (text == nullptr) {
        return;
    }
    auto field = [text](cdtext_field_t which, track_t track) {
        const char* value = cdtext_get_const(text, which, track);
        return value == nullptr ? std::string() : std::string(value);
    };
    table.cdTextAlbum = field(CDTEXT_FIELD_TITLE, 0);
    table.cdTextArtist = field(CDTEXT_FIELD_PERFORMER, 0);
    for (const TocTrack& track : table.tracks) {
        table.cdTextTitles.push_back(field(CDTEXT_FIELD_TITLE, static_cast<track_t>(track.number)));
    }
}

bool ReadTable(const CdIo_t* handle, bool cdrdao, DiscTable& table) {
    const track_t first = cdio_get_first_track_num(handle);
    const track_t last = cdio_get_last_track_num(handle);
    if (first == CDIO_INVALID_TRACK || last == CDIO_INVALID_TRACK || first == 0 || last < first ||
        last > kMaxTrackNumber) {
        return false;
    }
    DiscTable read;
    read.firstTrack = first;
    read.lastTrack = last;
    int previousLba = kLeadInFrames - 1;
    for (track_t t = first; t <= last; ++t) {
        const lba_t lba = cdio_get_track_lba(handle, t);
        const track_format_t format = cdio_get_track_format(handle, t);
        if (lba == CDIO_INVALID_LBA || lba <= previousLba || format == TRACK_FORMAT_ERROR) {
            return false;
        }
        read.tracks.push_back(TocTrack{t, format != TRACK_FORMAT_AUDIO, lba});
        previousLba = lba;
    }
    int leadOut = cdio_get_track_lba(handle, CDIO_CDROM_LEADOUT_TRACK);
    if (cdrdao) {
        leadOut = CorrectCdrdaoLeadOut(handle, first, last, leadOut);
    }
    if (leadOut == CDIO_INVALID_LBA || leadOut <= previousLba) {
        return false;
    }
    read.leadOutLba = leadOut;
    ReadCdText(handle, read);
    table = std::move(read);
    return true;
}

Handle OpenDevice(const std::string& drive, bool forCommands) {
    CdIo_t* handle = nullptr;
    if (forCommands) {
        // Read and write access first, as commands to the drive want; read alone otherwise.
        handle = cdio_open_am(drive.c_str(), DRIVER_DEVICE, "MMC_RDWR");
    }
    if (!handle) {
        handle = cdio_open(drive.c_str(), DRIVER_DEVICE);
    }
    if (handle && IsFileBacked(handle)) {
        cdio_destroy(handle);
        handle = nullptr;
    }
    return Handle(handle);
}

class CdioDiscDevice final : public IDiscDevice {
public:
    CdioDiscDevice() { InitLibcdio(); }

    std::vector<std::string> ListDrives(const std::vector<std::string>& images) override {
        std::vector<std::string> drives;
        auto add = [&drives](const std::string& drive) {
            if (std::find(drives.begin(), drives.end(), drive) == drives.end()) {
                drives.push_back(drive);
            }
        };
        // NULL and an empty list both mean no drive, depending on the driver asked.
        if (char** devices = cdio_get_devices(DRIVER_DEVICE)) {
            for (char** device = devices; *device; ++device) {
                // /dev/cdrom and /dev/sr0 are one drive: list it once, by its real name.
                std::error_code error;
                const fs::path real = fs::canonical(*device, error);
                add(error ? std::string(*device) : real.string());
            }
            cdio_free_device_list(devices);
        }
        for (const std::string& image : images) {
            if (IsPlainFile(image)) {
                add(image);
            }
        }
        return drives;
    }

    bool ReadToc(const std::string& drive, DiscTable& table) override {
        table = DiscTable{};
        const driver_id_t driver = DriverFor(drive);
        if (driver == DRIVER_DEVICE && !IsPlainFile(drive)) {
            const Handle handle = OpenDevice(drive, false);
            return handle && ReadTable(handle.get(), false, table);
        }
        std::lock_guard lock(s_imageMutex);
        const std::string extension = LowerExtension(drive);
        if (extension == ".cue" || extension == ".toc") {
            std::string text;
            if (!ReadSheet(drive, text) || (extension == ".cue" && !CueHasTrack(text))) {
                return false;
            }
            std::string absolute;
            std::error_code error;
            const fs::path folder = fs::absolute(fs::path(drive), error).parent_path();
            if (extension == ".toc" && AbsoluteTocText(text, folder.string(), absolute)) {
                const TocCopy copy(absolute);
                return !copy.Path().empty() && ReadImage(copy.Path(), driver, table);
            }
        }
        return ReadImage(drive, driver == DRIVER_DEVICE ? DRIVER_UNKNOWN : driver, table);
    }

    bool LockTray(const std::string& drive, bool lock) override {
        if (IsImage(drive)) {
            return false;
        }
        const Handle handle = OpenDevice(drive, true);
        if (!handle) {
            return false;
        }
        // A drive that refuses the command still counts as locked: that has always been so,
        // and the rip goes on either way.
        mmc_prevent_allow_medium_removal(handle.get(), false, lock, kLockTimeoutMs);
        return true;
    }

    bool SetTrayOpen(const std::string& drive, bool open) override {
        if (IsImage(drive)) {
            return false;
        }
        Handle handle = OpenDevice(drive, true);
        if (!handle) {
            return false;
        }
        driver_return_code_t result =
            open ? mmc_eject_media(handle.get()) : mmc_close_tray(handle.get());
        if (result == DRIVER_OP_SUCCESS) {
            return true;
        }
        // Some drives take the tray commands only through the kernel's own ioctls. The handle
        // is a device's (OpenDevice refuses images), so libcdio's eject may take it.
        if (open) {
            CdIo_t* raw = handle.release();
            result = cdio_eject_media(&raw);
            if (raw) {
                cdio_destroy(raw);
            }
        } else {
            handle.reset();
            driver_id_t driver = DRIVER_DEVICE;
            result = cdio_close_tray(drive.c_str(), &driver);
        }
        return result == DRIVER_OP_SUCCESS;
    }

    bool IsImage(const std::string& drive) const override {
        return DriverFor(drive) != DRIVER_DEVICE || IsPlainFile(drive);
    }

private:
    static bool ReadImage(const std::string& path, driver_id_t driver, DiscTable& table) {
        const Handle handle(cdio_open(path.c_str(), driver));
        return handle && ReadTable(handle.get(), driver == DRIVER_CDRDAO, table);
    }
};

std::string_view Trim(std::string_view text) {
    const size_t first = text.find_first_not_of(" \t\r\n");
    if (first == std::string_view::npos) {
        return {};
    }
    const size_t last = text.find_last_not_of(" \t\r\n");
    return text.substr(first, last - first + 1);
}

}  // namespace

std::unique_ptr<IDiscDevice> MakeDiscDevice() {
    return std::make_unique<CdioDiscDevice>();
}

std::vector<std::string> SplitImageList(std::string_view cdimages) {
    std::vector<std::string> images;
    while (!cdimages.empty()) {
        const size_t semicolon = cdimages.find(';');
        const std::string_view item = Trim(cdimages.substr(0, semicolon));
        if (!item.empty()) {
            images.emplace_back(item);
        }
        if (semicolon == std::string_view::npos) {
            break;
        }
        cdimages.remove_prefix(semicolon + 1);
    }
    return images;
}

std::string JoinImageList(const std::vector<std::string>& images) {
    std::string text;
    for (const std::string& image : images) {
        if (!text.empty()) {
            text += ';';
        }
        text += image;
    }
    return text;
}

bool DiscTable::HasCdText() const {
    if (!cdTextAlbum.empty() || !cdTextArtist.empty()) {
        return true;
    }
    for (const std::string& title : cdTextTitles) {
        if (!title.empty())
            return true;
    }
    return false;
}

}  // namespace ac::platform
