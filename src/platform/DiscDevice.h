#pragma once
// Optical drives and disc images as the rip code sees them: a list of drive texts, the table of
// contents of the disc in one of them, and the tray. A drive text is a device path (/dev/sr0) or
// the path of a disc image (.cue with its .bin, or a cdrdao .toc) named in the setting
// `cdimages`; images are listed after the devices and behave as drives that never eject.
//
// Thread contract: MakeDiscDevice's object keeps no libcdio handle between calls (each call opens
// and closes its own), so one object may serve the panel's worker and the window's thread at
// once. A call on a real drive may block while the drive spins up: never call it on the UI
// thread of a window that must stay responsive.

#include <memory>
#include <string>
#include <string_view>
#include <vector>

namespace ac::platform {

// lba: absolute position in frames (75 a second), the 150-frame lead-in included, the way a
// drive's table reports minutes, seconds and frames. Track 1 of an ordinary disc is at 150.
struct TocTrack {
    int number = 0;
    bool isData = false;
    int lba = 0;
};

// firstTrack 0 and no tracks: nothing could be read.
struct DiscTable {
    int firstTrack = 0;
    int lastTrack = 0;
    std::vector<TocTrack> tracks;
    int leadOutLba = 0;
    // The disc's CD-Text, when it carries any (a pressed CD's, or TITLE and PERFORMER lines of
    // a cue sheet): the album's title and performer, and one title per entry of `tracks`.
    std::string cdTextAlbum;
    std::string cdTextArtist;
    std::vector<std::string> cdTextTitles;
    bool HasCdText() const;
};

class IDiscDevice {
public:
    virtual ~IDiscDevice() = default;
    // Every CD/DVD device the system has, then every image of `images` that exists as a file,
    // in that order. A missing image is left out, not an error.
    virtual std::vector<std::string> ListDrives(const std::vector<std::string>& images) = 0;
    // False, with an empty table, when the drive cannot be opened, holds no disc, or reports a
    // table that cannot be a disc's (tracks out of order, a lead-out before the last track).
    virtual bool ReadToc(const std::string& drive, DiscTable& table) = 0;
    // PREVENT ALLOW MEDIUM REMOVAL. True once the command was sent to an opened drive, whatever
    // the drive answered; false when it could not be opened, and always for an image.
    virtual bool LockTray(const std::string& drive, bool lock) = 0;
    // Opens or closes the tray of a real drive. An image has none: nothing happens, false.
    virtual bool SetTrayOpen(const std::string& drive, bool open) = 0;
    // A disc image rather than a device: by its extension, or because it is a plain file.
    virtual bool IsImage(const std::string& drive) const = 0;
};

// The libcdio one.
std::unique_ptr<IDiscDevice> MakeDiscDevice();

// The setting `cdimages`: paths separated by ';', blanks round each trimmed, empty ones dropped.
// A path that itself holds ';' cannot be named there.
std::vector<std::string> SplitImageList(std::string_view cdimages);
std::string JoinImageList(const std::vector<std::string>& images);

}  // namespace ac::platform
