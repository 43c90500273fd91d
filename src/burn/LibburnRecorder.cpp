// libburn: drive listing, media status, blanking, and the audio and data writes.
#include "burn/LibburnRecorder.h"

#include "burn/ImageRecorder.h"
#include "burn/ScriptedRecorder.h"
#include "burn/IsoSession.h"
#include "burn/WavFile.h"

#include <fcntl.h>
#include <unistd.h>

#include <libburn/libburn.h>

#include <algorithm>
#include <chrono>
#include <cmath>
#include <cstring>
#include <thread>

namespace ac::burn {
namespace {

namespace lb = ::burn;

void EnsureLibburn() {
    static std::once_flag once;
    std::call_once(once, [] {
        lb::burn_initialize();
        // Its messages stay in its queue; the program words failures itself.
        lb::burn_msgs_set_severities(const_cast<char*>("NEVER"), const_cast<char*>("NEVER"),
                                     const_cast<char*>("libburn: "));
    });
}

// A grabbed drive, released (and ejected when asked) at the end of the scope.
class GrabbedDrive {
public:
    explicit GrabbedDrive(const std::string& address) {
        EnsureLibburn();
        std::string text = address;
        if (lb::burn_drive_scan_and_grab(&m_info, text.data(), 1) != 1)
            m_info = nullptr;
    }
    ~GrabbedDrive() {
        if (m_info) {
            lb::burn_drive_release(m_info[0].drive, m_eject ? 1 : 0);
            lb::burn_drive_info_free(m_info);
        }
    }
    GrabbedDrive(const GrabbedDrive&) = delete;
    GrabbedDrive& operator=(const GrabbedDrive&) = delete;
    lb::burn_drive* Drive() const { return m_info ? m_info[0].drive : nullptr; }
    void EjectOnRelease() { m_eject = true; }

private:
    lb::burn_drive_info* m_info = nullptr;
    bool m_eject = false;
};

void WaitForDiscStatus(lb::burn_drive* drive) {
    while (lb::burn_disc_get_status(drive) == lb::BURN_DISC_UNREADY)
        std::this_thread::sleep_for(std::chrono::milliseconds(100));
}

// Polls a running write until the drive is idle, turning its progress into ticks of 22 units.
bool FollowWrite(lb::burn_drive* drive, IBurnEvents& events, std::atomic<bool>& abort, bool audio,
                 std::int64_t sectors) {
    lb::burn_progress progress{};
    std::int64_t ticked = 0;
    bool writingSent = false;
    int track = -1;
    events.OnBurnEvent(kEventTotalUnits, static_cast<int>(std::max<std::int64_t>(sectors, 1)));
    while (lb::burn_drive_get_status(drive, nullptr) == lb::BURN_DRIVE_SPAWNING)
        std::this_thread::sleep_for(std::chrono::milliseconds(50));
    for (;;) {
        const lb::burn_drive_status status = lb::burn_drive_get_status(drive, &progress);
        if (status == lb::BURN_DRIVE_IDLE)
            break;
        if (status == lb::BURN_DRIVE_WRITING_LEADIN || status == lb::BURN_DRIVE_WRITING_PREGAP)
            events.OnBurnEvent(kEventLeadIn, 0);
        if (status == lb::BURN_DRIVE_WRITING) {
            if (!writingSent) {
                events.OnBurnEvent(audio ? kEventWritingAudio : kEventWritingData, 0);
                writingSent = true;
            }
            if (audio && progress.track != track) {
                track = progress.track;
                events.OnBurnEvent(kEventAudioTrack, track + 1);
            }
            for (; ticked + kUnitsPerTick <= progress.sector; ticked += kUnitsPerTick)
                events.OnBurnEvent(kEventUnit, 0);
        }
        if (status == lb::BURN_DRIVE_CLOSING_TRACK)
            events.OnBurnEvent(kEventClosingTrack, 0);
        if (status == lb::BURN_DRIVE_CLOSING_SESSION)
            events.OnBurnEvent(audio ? kEventClosingTrack : kEventClosingData, 0);
        if (abort || events.OnBurnEvent(kEventPoll, 0) != 0) {
            abort = true;
            lb::burn_drive_cancel(drive);
        }
        std::this_thread::sleep_for(std::chrono::milliseconds(100));
    }
    events.OnBurnEvent(kEventClosingDone, 0);
    const bool wroteWell = lb::burn_drive_wrote_well(drive) == 1 && !abort;
    // A short write ends between two polls: the bar still runs to its end.
    for (; wroteWell && ticked + kUnitsPerTick <= sectors; ticked += kUnitsPerTick)
        events.OnBurnEvent(kEventUnit, 0);
    return wroteWell;
}

bool RunWrite(lb::burn_drive* drive, lb::burn_disc* disc, int speed, bool audio,
              IBurnEvents& events, std::atomic<bool>& abort, std::string& reason) {
    const std::int64_t sectors = lb::burn_disc_get_sectors(disc);
    lb::burn_write_opts* options = lb::burn_write_opts_new(drive);
    lb::burn_write_opts_set_perform_opc(options, 0);
    lb::burn_write_opts_set_underrun_proof(options, 1);
    char why[BURN_REASONS_LEN] = {};
    if (audio) {
        // Pauses and track marks of an audio disc need the whole layout at once.
        lb::burn_write_opts_set_write_type(options, lb::BURN_WRITE_SAO, lb::BURN_BLOCK_SAO);
    } else if (lb::burn_write_opts_auto_write_type(options, disc, why, 0) == lb::BURN_WRITE_NONE) {
        reason = why;
        lb::burn_write_opts_free(options);
        return false;
    }
    if (lb::burn_precheck_write(options, disc, why, 0) != 1) {
        reason = why;
        lb::burn_write_opts_free(options);
        return false;
    }
    lb::burn_drive_set_speed(drive, 0, speed > 0 ? speed * kSpeedUnitKBps : 0);
    lb::burn_disc_write(options, disc);
    lb::burn_write_opts_free(options);
    return FollowWrite(drive, events, abort, audio, sectors);
}

}  // namespace

int CountAudioSector(double seconds) {
    if (seconds <= 0)
        return 150;
    return static_cast<int>(std::ceil(seconds * 75.0)) + 150;
}

std::int64_t CountWavSectors(const std::string& path) {
    WavLayout layout;
    std::string reason;
    if (!ReadWavLayout(path, layout, reason) || layout.dataBytes <= 0)
        return 0;
    return (layout.dataBytes + kAudioSectorBytes - 1) / kAudioSectorBytes;
}

std::vector<std::unique_ptr<ICdRecorder>> RetryRecorder(const std::string& imageBase) {
    std::vector<std::unique_ptr<ICdRecorder>> recorders;
    // AC_NO_RECORDER_SCAN: tests and machines whose drives are not to be touched list the image
    // recorder alone.
    if (!std::getenv("AC_NO_RECORDER_SCAN")) {
        EnsureLibburn();
        lb::burn_drive_info* drives = nullptr;
        unsigned int count = 0;
        // The scan answers 0 ("not done yet") at first; it must be asked again.
        int done = 0;
        for (int round = 0; round < 100 && (done = lb::burn_drive_scan(&drives, &count)) == 0;
             ++round)
            std::this_thread::sleep_for(std::chrono::milliseconds(10));
        if (done > 0 && drives) {
            for (unsigned int i = 0; i < count; ++i) {
                char address[BURN_DRIVE_ADR_LEN] = {};
                if (lb::burn_drive_get_adr(&drives[i], address) <= 0)
                    continue;
                if (!drives[i].write_cdr && !drives[i].write_cdrw)
                    continue;
                std::string name = std::string(drives[i].vendor) + " " + drives[i].product;
                while (!name.empty() && name.back() == ' ')
                    name.pop_back();
                recorders.push_back(std::make_unique<LibburnRecorder>(address, name));
            }
            lb::burn_drive_info_free(drives);
        }
    }
    if (const char* fake = std::getenv("AC_FAKE_RECORDER"); fake && *fake)
        recorders.push_back(std::make_unique<ScriptedRecorder>(fake));
    recorders.push_back(std::make_unique<ImageRecorder>(imageBase));
    return recorders;
}

LibburnRecorder::LibburnRecorder(std::string address, std::string name)
    : m_address(std::move(address)), m_name(std::move(name)) {}

int LibburnRecorder::MediaType() {
    std::lock_guard lock(m_driveMutex);
    GrabbedDrive grabbed(m_address);
    if (!grabbed.Drive())
        return kMediaUnknown;
    WaitForDiscStatus(grabbed.Drive());
    if (lb::burn_disc_get_status(grabbed.Drive()) == lb::BURN_DISC_EMPTY)
        return kMediaNone;
    int profile = 0;
    char name[80] = {};
    if (lb::burn_disc_get_profile(grabbed.Drive(), &profile, name) != 1)
        return kMediaUnknown;
    // The codes are the MMC profile numbers (0x09 CD-R, 0x0A CD-RW, 0x1A DVD+RW ...).
    return profile;
}

bool LibburnRecorder::Capacity(std::int64_t& totalBlocks, std::int64_t& freeBlocks) {
    std::lock_guard lock(m_driveMutex);
    totalBlocks = freeBlocks = 0;
    GrabbedDrive grabbed(m_address);
    if (!grabbed.Drive())
        return false;
    WaitForDiscStatus(grabbed.Drive());
    if (lb::burn_disc_get_status(grabbed.Drive()) == lb::BURN_DISC_EMPTY)
        return false;
    freeBlocks = lb::burn_disc_available_space(grabbed.Drive(), nullptr) / kDataBlockBytes;
    int capacity = 0;
    if (lb::burn_get_read_capacity(grabbed.Drive(), &capacity, 0) == 1 && capacity > 0)
        totalBlocks = capacity;
    totalBlocks = std::max(totalBlocks, freeBlocks);
    return true;
}

bool LibburnRecorder::ReadDiskInfo(DiskInfoBlock& info) {
    std::lock_guard lock(m_driveMutex);
    info.fill(0);
    GrabbedDrive grabbed(m_address);
    if (!grabbed.Drive())
        return false;
    WaitForDiscStatus(grabbed.Drive());
    switch (lb::burn_disc_get_status(grabbed.Drive())) {
        case lb::BURN_DISC_BLANK:
            info[2] = kDiscStateBlank;
            break;
        case lb::BURN_DISC_APPENDABLE:
            info[2] = 1;
            break;
        case lb::BURN_DISC_FULL:
            info[2] = kDiscStateComplete;
            break;
        default:
            return false;
    }
    return true;
}

std::vector<int> LibburnRecorder::WriteSpeeds() {
    std::lock_guard lock(m_driveMutex);
    std::vector<int> speeds;
    GrabbedDrive grabbed(m_address);
    if (!grabbed.Drive())
        return speeds;
    lb::burn_speed_descriptor* list = nullptr;
    if (lb::burn_drive_get_speedlist(grabbed.Drive(), &list) == 1) {
        for (lb::burn_speed_descriptor* at = list; at && speeds.size() < 100; at = at->next) {
            if (at->write_speed > 0 &&
                std::find(speeds.begin(), speeds.end(), at->write_speed) == speeds.end())
                speeds.push_back(at->write_speed);
        }
        lb::burn_drive_free_speedlist(&list);
    }
    std::sort(speeds.rbegin(), speeds.rend());
    return speeds;
}

bool LibburnRecorder::CanErase() {
    std::lock_guard lock(m_driveMutex);
    GrabbedDrive grabbed(m_address);
    return grabbed.Drive() && lb::burn_disc_erasable(grabbed.Drive()) == 1;
}

bool LibburnRecorder::Erase(bool quick) {
    std::lock_guard lock(m_driveMutex);
    GrabbedDrive grabbed(m_address);
    if (!grabbed.Drive())
        return false;
    WaitForDiscStatus(grabbed.Drive());
    lb::burn_disc_erase(grabbed.Drive(), quick ? 1 : 0);
    lb::burn_progress progress{};
    while (lb::burn_drive_get_status(grabbed.Drive(), &progress) != lb::BURN_DRIVE_IDLE)
        std::this_thread::sleep_for(std::chrono::milliseconds(200));
    return lb::burn_drive_wrote_well(grabbed.Drive()) == 1;
}

void LibburnRecorder::Eject() {
    std::lock_guard lock(m_driveMutex);
    GrabbedDrive grabbed(m_address);
    grabbed.EjectOnRelease();
}

bool LibburnRecorder::WaitReady(int milliseconds) {
    const auto end = std::chrono::steady_clock::now() + std::chrono::milliseconds(milliseconds);
    do {
        {
            std::lock_guard lock(m_driveMutex);
            GrabbedDrive grabbed(m_address);
            if (grabbed.Drive() &&
                lb::burn_disc_get_status(grabbed.Drive()) != lb::BURN_DISC_UNREADY)
                return true;
        }
        std::this_thread::sleep_for(std::chrono::milliseconds(100));
    } while (std::chrono::steady_clock::now() < end);
    return false;
}

bool LibburnRecorder::Burn(const BurnJob& job, IBurnEvents& events) {
    m_abort = false;
    events.OnBurnEvent(kEventStarting, 0);
    std::string reason;
    bool written = false;
    if (!job.audio) {
        if (job.tree) {
            std::lock_guard lock(m_driveMutex);
            written =
                WriteDataThroughLibburn(m_address, *job.tree, job.speed, events, m_abort, reason);
        }
    } else {
        std::lock_guard lock(m_driveMutex);
        GrabbedDrive grabbed(m_address);
        if (grabbed.Drive()) {
            WaitForDiscStatus(grabbed.Drive());
            lb::burn_disc* disc = lb::burn_disc_create();
            lb::burn_session* session = lb::burn_session_create();
            lb::burn_disc_add_session(disc, session, BURN_POS_END);
            std::vector<lb::burn_track*> tracks;
            std::vector<lb::burn_source*> sources;
            bool ready = true;
            for (std::size_t i = 0; i < job.tracks.size() && ready; ++i) {
                WavLayout layout;
                const int fd =
                    ReadWavLayout(job.tracks[i].path, layout, reason) && layout.IsCdAudio()
                        ? ::open(job.tracks[i].path.c_str(), O_RDONLY | O_CLOEXEC)
                        : -1;
                if (fd < 0 || ::lseek(fd, layout.dataOffset, SEEK_SET) < 0) {
                    if (fd >= 0)
                        ::close(fd);
                    ready = false;
                    break;
                }
                lb::burn_track* track = lb::burn_track_create();
                lb::burn_track_define_data(track, 0, 0, 1, BURN_AUDIO);
                if (i > 0 && job.pauseSeconds > 0)
                    lb::burn_track_set_pregap_size(track, job.pauseSeconds * 75, 0);
                lb::burn_source* source = lb::burn_fd_source_new(fd, -1, layout.dataBytes);
                lb::burn_track_set_source(track, source);
                lb::burn_session_add_track(session, track, BURN_POS_END);
                tracks.push_back(track);
                sources.push_back(source);
            }
            if (ready && !tracks.empty())
                written = RunWrite(grabbed.Drive(), disc, job.speed, true, events, m_abort, reason);
            for (lb::burn_track* track : tracks)
                lb::burn_track_free(track);
            for (lb::burn_source* source : sources)
                lb::burn_source_free(source);
            lb::burn_session_free(session);
            lb::burn_disc_free(disc);
        }
    }
    if (!written)
        events.OnBurnEvent(m_abort ? kEventCancelled : kEventWriteFailed, 0);
    return written;
}

bool WriteDataThroughLibburn(const std::string& address, const DiscTree& tree, int speed,
                             IBurnEvents& events, std::atomic<bool>& abort, std::string& reason) {
    std::unique_ptr<IsoSession> iso = IsoSession::Make(tree, reason);
    if (!iso)
        return false;
    GrabbedDrive grabbed(address);
    if (!grabbed.Drive()) {
        reason = "cannot open " + address;
        return false;
    }
    lb::burn_disc* disc = lb::burn_disc_create();
    lb::burn_session* session = lb::burn_session_create();
    lb::burn_disc_add_session(disc, session, BURN_POS_END);
    lb::burn_track* track = lb::burn_track_create();
    lb::burn_track_define_data(track, 0, 0, 1, BURN_MODE1);
    // libisofs's burn_source and libburn's are one struct declared twice.
    lb::burn_track_set_source(track, static_cast<lb::burn_source*>(iso->Source()));
    lb::burn_session_add_track(session, track, BURN_POS_END);
    const bool written = RunWrite(grabbed.Drive(), disc, speed, false, events, abort, reason);
    lb::burn_track_free(track);
    lb::burn_session_free(session);
    lb::burn_disc_free(disc);
    return written;
}

}  // namespace ac::burn
