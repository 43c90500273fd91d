#pragma once
// The recorder adapter: every operation the burn code asks of a recorder, whatever writes the
// disc. Two kinds stand behind it: a real drive through libburn, and the image recorder, which
// writes the same disc into files (an audio disc as NAME.bin with NAME.cue, a data disc as an
// ISO 9660 image with Joliet names) and is always listed last.
//
// Burn() blocks its caller and reports through IBurnEvents, with the event numbers of the burn
// panel's message 2025; event 0 is the poll whose answer says whether to stop.
//
// Thread contract: one recorder object serves one thread at a time for writes; the status reads
// (MediaType, Capacity, ReadDiskInfo, WriteSpeeds) may come from the recorder poll's worker
// while the window's thread does nothing with the same recorder.

#include <array>
#include <cstdint>
#include <memory>
#include <string>
#include <vector>

namespace ac::burn {

class DiscTree;

// Media types as the recorder reports them; anything else is a disc the program cannot write.
enum MediaTypeCode : int {
    kMediaUnknown = -1,
    kMediaNone = 0,
    kMediaCdRom = 8,
    kMediaCdR = 9,
    kMediaCdRw = 10,
    kMediaDvdR = 17,
    kMediaDvdRwSequential = 19,
    kMediaDvdRwRestricted = 20,
    kMediaDvdPlusRw = 26,
    kMediaDvdPlusR = 27,
};

// ReadDiskInfo's block: the low two bits of byte 2 are the disc state.
using DiskInfoBlock = std::array<std::uint8_t, 42>;
inline constexpr int kDiscStateBlank = 0;
inline constexpr int kDiscStateComplete = 2;
inline int DiscState(const DiskInfoBlock& info) {
    return info[2] & 3;
}

// 1x of a CD in kB/s, as the write speed lists count.
inline constexpr int kSpeedUnitKBps = 176;
inline constexpr int kAudioSectorBytes = 2352;
inline constexpr int kDataBlockBytes = 2048;
inline constexpr int kMaxAudioTracks = 99;

// The events a write reports, and what the handler's answer means for the two that ask.
enum BurnEvent : int {
    kEventPoll = 0,        // answer: non-zero stops the write
    kEventTotalUnits = 3,  // value: units of the whole write; event 4 comes once per 22 units
    kEventUnit = 4,
    kEventClosingDone = 5,
    kEventCheckingDisc = 8,
    kEventErasing = 10,
    kEventErased = 11,
    kEventNoDisc = 12,  // answer: 1 to try again
    kEventDiscNotEmpty = 13,
    kEventNoSpace = 15,  // answer: 1 to try again
    kEventCancelled = 16,
    kEventStarting = 17,
    kEventLeadIn = 18,
    kEventWritingData = 19,
    kEventClosingData = 20,
    kEventWritingAudio = 21,
    kEventAudioTrack = 22,  // value: the track's number
    kEventClosingTrack = 23,
    kEventWriteFailed = 31,
};
inline constexpr int kUnitsPerTick = 22;

class IBurnEvents {
public:
    virtual ~IBurnEvents() = default;
    virtual int OnBurnEvent(int event, int value) = 0;
};

// One audio track: a WAV file of 44.1 kHz 16-bit stereo PCM.
struct AudioTrack {
    std::string path;
    std::string title;
};

struct BurnJob {
    bool audio = true;
    std::vector<AudioTrack> tracks;  // audio disc
    const DiscTree* tree = nullptr;  // data disc
    int speed = -1;                  // multiple of 1x; -1 the recorder's best
    int pauseSeconds = 2;            // silence before every track but the first
    int copyIndex = 0;               // 0 for the first copy; the image recorder names by it
};

class ICdRecorder {
public:
    virtual ~ICdRecorder() = default;
    // What the recorder calls itself ("HL-DT-ST DVDRAM GH24NSD1", "Disc image").
    virtual std::string Name() const = 0;
    // The device path, or the image's path without extension.
    virtual std::string DriveText() const = 0;
    virtual bool IsImage() const { return false; }
    // Why nothing can be written at all (an image folder that is missing); empty when it can.
    virtual std::string UnavailableReason() { return {}; }

    // kMediaUnknown when the read failed.
    virtual int MediaType() = 0;
    // Total and free 2048-byte blocks of the disc in the recorder.
    virtual bool Capacity(std::int64_t& totalBlocks, std::int64_t& freeBlocks) = 0;
    virtual bool ReadDiskInfo(DiskInfoBlock& info) = 0;
    // kB/s, fastest first; empty when the recorder names none.
    virtual std::vector<int> WriteSpeeds() = 0;
    virtual bool CanErase() = 0;
    virtual bool Erase(bool quick) = 0;
    virtual void Eject() = 0;
    virtual bool WaitReady(int milliseconds) = 0;
    virtual void PreventRemoval(bool prevent) = 0;
    virtual void BeforeWrite() {}
    virtual void AfterWrite() {}
    virtual void AbortWrite() = 0;
    // Writes one copy; false when the write failed or was stopped (the events tell which).
    virtual bool Burn(const BurnJob& job, IBurnEvents& events) = 0;
};

// Sectors of an audio disc of that many seconds, the two-second lead-in pregap included.
int CountAudioSector(double seconds);

// Sectors of one WAV file on an audio disc: its PCM rounded up to whole 2352-byte sectors; 0 for
// a file that cannot be read or holds no audio.
std::int64_t CountWavSectors(const std::string& path);

// The real recorders libburn finds, then the image recorder writing to imageBase (a path
// without extension), always last.
std::vector<std::unique_ptr<ICdRecorder>> RetryRecorder(const std::string& imageBase);

}  // namespace ac::burn
