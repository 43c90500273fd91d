// The image recorder: BIN/CUE written here, ISO through libburn's stdio: drive.
#include "burn/ImageRecorder.h"

#include "burn/DiscTree.h"
#include "burn/LibburnRecorder.h"
#include "burn/WavFile.h"

#include <fcntl.h>
#include <sys/statvfs.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstdio>
#include <cstring>
#include <filesystem>
#include <vector>

namespace ac::burn {
namespace {

namespace fs = std::filesystem;

std::string StripExtension(std::string path) {
    for (const char* extension : {".cue", ".bin", ".iso"}) {
        const std::size_t length = std::strlen(extension);
        if (path.size() > length) {
            std::string tail = path.substr(path.size() - length);
            std::transform(tail.begin(), tail.end(), tail.begin(),
                           [](unsigned char c) { return std::tolower(c); });
            if (tail == extension)
                return path.substr(0, path.size() - length);
        }
    }
    return path;
}

std::string HiddenTemporary(const std::string& finalPath) {
    const fs::path path(finalPath);
    return (path.parent_path() /
            ("." + path.filename().string() + ".burn" + std::to_string(::getpid()) + ".part"))
        .string();
}

// A quote ends the cue's text, and control characters have no place in it.
std::string CueText(std::string text) {
    std::erase_if(text, [](char c) { return c == '"' || static_cast<unsigned char>(c) < 0x20; });
    if (text.size() > 80)
        text.resize(80);
    return text;
}

bool WriteAll(int fd, const char* data, std::size_t size) {
    while (size > 0) {
        const ssize_t written = ::write(fd, data, size);
        if (written < 0) {
            if (errno == EINTR)
                continue;
            return false;
        }
        data += written;
        size -= static_cast<std::size_t>(written);
    }
    return true;
}

// Moves the progress on by whole ticks of 22 sectors and asks whether to stop.
class TickCounter {
public:
    explicit TickCounter(IBurnEvents& events) : m_events(events) {}
    // False when the user asked to stop.
    bool Advance(std::int64_t sectors) {
        m_pending += sectors;
        while (m_pending >= kUnitsPerTick) {
            m_pending -= kUnitsPerTick;
            m_events.OnBurnEvent(kEventUnit, 0);
            if (m_events.OnBurnEvent(kEventPoll, 0) != 0)
                return false;
        }
        return true;
    }

private:
    IBurnEvents& m_events;
    std::int64_t m_pending = 0;
};

}  // namespace

std::string CueTime(std::int64_t sectors) {
    char text[32];
    std::snprintf(text, sizeof text, "%02lld:%02lld:%02lld",
                  static_cast<long long>(sectors / (75 * 60)),
                  static_cast<long long>(sectors / 75 % 60), static_cast<long long>(sectors % 75));
    return text;
}

std::string MakeCueText(const std::string& binName, const std::vector<std::string>& titles,
                        const std::vector<std::int64_t>& gapStarts,
                        const std::vector<std::int64_t>& trackStarts) {
    std::string cue = "FILE \"" + CueText(binName) + "\" BINARY\n";
    for (std::size_t i = 0; i < trackStarts.size(); ++i) {
        char line[48];
        std::snprintf(line, sizeof line, "  TRACK %02zu AUDIO\n", i + 1);
        cue += line;
        if (i < titles.size() && !CueText(titles[i]).empty())
            cue += "    TITLE \"" + CueText(titles[i]) + "\"\n";
        if (gapStarts[i] >= 0)
            cue += "    INDEX 00 " + CueTime(gapStarts[i]) + "\n";
        cue += "    INDEX 01 " + CueTime(trackStarts[i]) + "\n";
    }
    return cue;
}

ImageRecorder::ImageRecorder(std::string base) : m_base(StripExtension(std::move(base))) {}

std::string ImageRecorder::CopyBase(int copyIndex) const {
    return copyIndex <= 0 ? m_base : m_base + "-" + std::to_string(copyIndex + 1);
}

std::string ImageRecorder::UnavailableReason() {
    if (m_base.empty())
        return "No file name was given for the disc image.";
    const fs::path folder =
        fs::path(m_base).parent_path().empty() ? fs::path(".") : fs::path(m_base).parent_path();
    std::error_code error;
    if (!fs::is_directory(folder, error))
        return "The folder of the disc image does not exist: " + folder.string();
    if (::access(folder.c_str(), W_OK) != 0)
        return "The folder of the disc image is not writable: " + folder.string();
    if (fs::is_directory(m_base, error))
        return "The disc image's name is a folder: " + m_base;
    return {};
}

int ImageRecorder::MediaType() {
    return UnavailableReason().empty() ? kMediaCdR : kMediaNone;
}

bool ImageRecorder::Capacity(std::int64_t& totalBlocks, std::int64_t& freeBlocks) {
    totalBlocks = kDiscBlocks;
    freeBlocks = 0;
    const fs::path folder =
        fs::path(m_base).parent_path().empty() ? fs::path(".") : fs::path(m_base).parent_path();
    struct statvfs volume;
    if (::statvfs(folder.c_str(), &volume) != 0)
        return false;
    const std::int64_t hostBlocks = static_cast<std::int64_t>(volume.f_bavail) *
                                    static_cast<std::int64_t>(volume.f_frsize) / kAudioSectorBytes;
    freeBlocks = std::min(kDiscBlocks, hostBlocks);
    return true;
}

bool ImageRecorder::ReadDiskInfo(DiskInfoBlock& info) {
    info.fill(0);
    // Every copy is a new file: the "disc" is always blank.
    info[2] = kDiscStateBlank;
    return UnavailableReason().empty();
}

bool ImageRecorder::Burn(const BurnJob& job, IBurnEvents& events) {
    m_abort = false;
    events.OnBurnEvent(kEventStarting, 0);
    const bool written = job.audio ? BurnAudio(job, events) : BurnData(job, events);
    if (!written) {
        if (m_abort || events.OnBurnEvent(kEventPoll, 0) != 0)
            events.OnBurnEvent(kEventCancelled, 0);
        else
            events.OnBurnEvent(kEventWriteFailed, 0);
    }
    return written;
}

bool ImageRecorder::BurnAudio(const BurnJob& job, IBurnEvents& events) {
    const std::string base = CopyBase(job.copyIndex);
    const std::string binPath = base + ".bin";
    const std::string cuePath = base + ".cue";
    const std::string binTemporary = HiddenTemporary(binPath);
    const std::string cueTemporary = HiddenTemporary(cuePath);

    std::vector<WavLayout> layouts(job.tracks.size());
    const std::int64_t gapSectors = std::max(0, job.pauseSeconds) * 75;
    std::int64_t totalSectors = 0;
    for (std::size_t i = 0; i < job.tracks.size(); ++i) {
        std::string reason;
        if (!ReadWavLayout(job.tracks[i].path, layouts[i], reason) || !layouts[i].IsCdAudio())
            return false;
        totalSectors += (layouts[i].dataBytes + kAudioSectorBytes - 1) / kAudioSectorBytes +
                        (i > 0 ? gapSectors : 0);
    }

    const int out = ::open(binTemporary.c_str(), O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC, 0644);
    if (out < 0)
        return false;
    auto discard = [&] {
        ::close(out);
        ::unlink(binTemporary.c_str());
        ::unlink(cueTemporary.c_str());
        return false;
    };

    events.OnBurnEvent(kEventTotalUnits, static_cast<int>(std::max<std::int64_t>(totalSectors, 1)));
    events.OnBurnEvent(kEventWritingAudio, 0);
    TickCounter ticks(events);
    std::vector<std::int64_t> gapStarts, trackStarts;
    std::vector<std::string> titles;
    std::int64_t sector = 0;
    std::vector<char> buffer(kAudioSectorBytes * 64);
    for (std::size_t i = 0; i < job.tracks.size(); ++i) {
        events.OnBurnEvent(kEventAudioTrack, static_cast<int>(i + 1));
        if (i > 0 && gapSectors > 0) {
            gapStarts.push_back(sector);
            std::fill(buffer.begin(), buffer.end(), 0);
            for (std::int64_t left = gapSectors; left > 0;) {
                const std::int64_t now = std::min<std::int64_t>(left, 64);
                if (!WriteAll(out, buffer.data(),
                              static_cast<std::size_t>(now * kAudioSectorBytes)))
                    return discard();
                left -= now;
                if (!ticks.Advance(now))
                    return discard();
            }
            sector += gapSectors;
        } else {
            gapStarts.push_back(-1);
        }
        trackStarts.push_back(sector);
        titles.push_back(job.tracks[i].title);

        const int in = ::open(job.tracks[i].path.c_str(), O_RDONLY | O_CLOEXEC);
        if (in < 0 || ::lseek(in, layouts[i].dataOffset, SEEK_SET) < 0) {
            if (in >= 0)
                ::close(in);
            return discard();
        }
        std::int64_t left = layouts[i].dataBytes;
        std::int64_t trackBytes = 0;
        bool ok = true;
        while (left > 0 && ok) {
            const ssize_t got =
                ::read(in, buffer.data(),
                       static_cast<std::size_t>(std::min<std::int64_t>(left, buffer.size())));
            if (got < 0 && errno == EINTR)
                continue;
            if (got <= 0)
                break;  // a file cut short: what is there goes on the disc
            ok = WriteAll(out, buffer.data(), static_cast<std::size_t>(got));
            const std::int64_t sectorsBefore = trackBytes / kAudioSectorBytes;
            trackBytes += got;
            left -= got;
            if (ok && !ticks.Advance(trackBytes / kAudioSectorBytes - sectorsBefore))
                ok = false;
        }
        ::close(in);
        if (!ok)
            return discard();
        // Whole sectors: readers drop a partial last one.
        const std::int64_t rest =
            (kAudioSectorBytes - trackBytes % kAudioSectorBytes) % kAudioSectorBytes;
        if (rest > 0) {
            std::fill(buffer.begin(), buffer.end(), 0);
            if (!WriteAll(out, buffer.data(), static_cast<std::size_t>(rest)))
                return discard();
            if (!ticks.Advance(1))
                return discard();
        }
        sector += (trackBytes + rest) / kAudioSectorBytes;
        events.OnBurnEvent(kEventClosingTrack, 0);
        events.OnBurnEvent(kEventClosingDone, 0);
    }
    if (::fsync(out) != 0)
        return discard();
    ::close(out);

    // Readers find the .bin by the cue's own name, so the FILE line names it the same way.
    const std::string cue =
        MakeCueText(fs::path(binPath).filename().string(), titles, gapStarts, trackStarts);
    const int cueFile =
        ::open(cueTemporary.c_str(), O_WRONLY | O_CREAT | O_TRUNC | O_CLOEXEC, 0644);
    const bool cueWritten =
        cueFile >= 0 && WriteAll(cueFile, cue.data(), cue.size()) && ::fsync(cueFile) == 0;
    if (cueFile >= 0)
        ::close(cueFile);
    if (!cueWritten || ::rename(binTemporary.c_str(), binPath.c_str()) != 0) {
        ::unlink(binTemporary.c_str());
        ::unlink(cueTemporary.c_str());
        return false;
    }
    if (::rename(cueTemporary.c_str(), cuePath.c_str()) != 0) {
        ::unlink(cueTemporary.c_str());
        return false;
    }
    m_lastWritten = cuePath;
    return true;
}

bool ImageRecorder::BurnData(const BurnJob& job, IBurnEvents& events) {
    if (!job.tree || job.tree->Empty())
        return false;
    const std::string isoPath = CopyBase(job.copyIndex) + ".iso";
    const std::string temporary = HiddenTemporary(isoPath);
    std::string reason;
    const bool written =
        WriteDataThroughLibburn("stdio:" + temporary, *job.tree, -1, events, m_abort, reason);
    if (!written || ::rename(temporary.c_str(), isoPath.c_str()) != 0) {
        ::unlink(temporary.c_str());
        return false;
    }
    m_lastWritten = isoPath;
    return true;
}

}  // namespace ac::burn
