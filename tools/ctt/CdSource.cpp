#include <algorithm>
#include <cctype>
#include <sys/stat.h>
#include <cstring>

#include "Report.h"
#include "Sources.h"
#include "platform/TocFile.h"

#include <filesystem>
#include <fstream>
#include <iterator>
#include <memory>

#include <cdio/cdio.h>
#include <cdio/cdtext.h>
#include <cdio/paranoia/cdda.h>
#include <cdio/paranoia/paranoia.h>

namespace ac::ctt {
namespace {

constexpr int kSamplesPerSector = CDIO_CD_FRAMESIZE_RAW / 4;  // 588 stereo 16-bit samples
constexpr int kSectorsPerFrame = 16;

std::string Lower(std::string s) {
    for (char& c : s) {
        c = static_cast<char>(std::tolower(static_cast<unsigned char>(c)));
    }
    return s;
}

bool EndsWith(const std::string& s, const char* tail) {
    const size_t n = std::strlen(tail);
    return s.size() >= n && s.compare(s.size() - n, n, tail) == 0;
}

// Paranoia reports trouble through a callback without a user pointer; one track is read per
// process, so a file-level flag is enough.
bool s_readFailed = false;

void ParanoiaCallback(long, paranoia_cb_mode_t mode) {
    if (mode == PARANOIA_CB_READERR || mode == PARANOIA_CB_SKIP) {
        s_readFailed = true;
    }
}

class CdSource final : public AudioSource {
public:
    ~CdSource() override {
        if (m_paranoia) {
            cdio_paranoia_free(m_paranoia);
        }
        if (m_drive) {
            cdio_cddap_close_no_free_cdio(m_drive);
        }
        if (m_cdio) {
            cdio_destroy(m_cdio);  // never eject: on an image that frees the image twice
        }
    }

    bool Open(const std::string& drivePath, int track) {
        const std::string lower = Lower(drivePath);
        driver_id_t driver = DRIVER_UNKNOWN;
        if (EndsWith(lower, ".cue") || EndsWith(lower, ".bin")) {
            driver = DRIVER_BINCUE;
        } else if (EndsWith(lower, ".toc")) {
            driver = DRIVER_CDRDAO;
        } else if (EndsWith(lower, ".nrg")) {
            driver = DRIVER_NRG;
        } else {
            driver = DRIVER_DEVICE;
        }
        std::string openPath = drivePath;
        if (driver == DRIVER_CDRDAO) {
            // The program runs ctt in its own folder, not the image's: a .toc that names its
            // .bin relative to itself is read through a copy that names it absolutely.
            std::ifstream in(drivePath, std::ios::binary);
            const std::string text((std::istreambuf_iterator<char>(in)), std::istreambuf_iterator<char>());
            std::error_code error;
            const std::string folder = std::filesystem::absolute(drivePath, error).parent_path().string();
            std::string absolute;
            if (platform::AbsoluteTocText(text, folder, absolute)) {
                m_tocCopy = std::make_unique<platform::TocCopy>(absolute);
                if (!m_tocCopy->Path().empty()) openPath = m_tocCopy->Path();
            }
        }
        m_cdio = cdio_open(openPath.c_str(), driver);
        if (!m_cdio) {
            m_error = "cannot open the disc in \"" + drivePath + "\"";
            return false;
        }
        const track_t first = cdio_get_first_track_num(m_cdio);
        const track_t last = cdio_get_last_track_num(m_cdio);
        if (first == CDIO_INVALID_TRACK || track < first || track > last) {
            m_error = "track " + std::to_string(track) + " is not on the disc";
            return false;
        }
        const auto t = static_cast<track_t>(track);
        if (cdio_get_track_format(m_cdio, t) != TRACK_FORMAT_AUDIO) {
            m_error = "track " + std::to_string(track) + " is a data track";
            return false;
        }
        m_first = cdio_get_track_lsn(m_cdio, t);
        // The track's audio ends where the next track's gap (INDEX 00) begins.
        const track_t after = t == last ? static_cast<track_t>(CDIO_CDROM_LEADOUT_TRACK)
                                        : static_cast<track_t>(t + 1);
        lsn_t end = cdio_get_track_lsn(m_cdio, after);
        if (t != last) {
            lsn_t gap = cdio_get_track_pregap_lsn(m_cdio, static_cast<track_t>(t + 1));
            if (gap != CDIO_INVALID_LSN && gap > m_first && gap < end) {
                end = gap;
            }
        }
        if (m_first == CDIO_INVALID_LSN || end == CDIO_INVALID_LSN || end <= m_first) {
            m_error = "the disc's table of contents is unreadable";
            return false;
        }
        m_end = end;
        if (driver == DRIVER_BINCUE && !ImageHoldsTrack()) {
            return false;
        }
        ReadCdText(t);

        char* messages = nullptr;
        m_drive = cdio_cddap_identify_cdio(m_cdio, CDDA_MESSAGE_FORGETIT, &messages);
        cdio_cddap_free_messages(messages);
        if (!m_drive || cdio_cddap_open(m_drive) != 0) {
            m_error = "cannot read audio from \"" + drivePath + "\"";
            return false;
        }
        m_paranoia = cdio_paranoia_init(m_drive);
        if (!m_paranoia) {
            m_error = "cannot start the audio reader";
            return false;
        }
        // Verify and repair, but never retry a bad sector for ever: an unreadable sector
        // must end the job in bounded time.
        cdio_paranoia_modeset(m_paranoia, PARANOIA_MODE_FULL ^ PARANOIA_MODE_NEVERSKIP);
        m_next = m_first;
        cdio_paranoia_seek(m_paranoia, m_first, SEEK_SET);
        av_channel_layout_default(&m_layout, 2);
        return true;
    }

    AVSampleFormat SampleFormat() const override { return AV_SAMPLE_FMT_S16; }
    int SampleRate() const override { return 44100; }
    const AVChannelLayout& Layout() const override { return m_layout; }
    std::int64_t SpanLength() const override {
        return static_cast<std::int64_t>(m_end - m_first) * kSamplesPerSector;
    }

    void SeekTo(std::int64_t sample) override {
        lsn_t sector = m_first + static_cast<lsn_t>(sample / kSamplesPerSector);
        if (sector >= m_end) {
            sector = m_end;
        }
        m_next = sector;
        cdio_paranoia_seek(m_paranoia, sector, SEEK_SET);
    }

    int Next(AVFrame* frame, std::int64_t& position) override {
        if (m_next >= m_end) {
            return 0;
        }
        const int sectors = std::min<int>(kSectorsPerFrame, m_end - m_next);
        frame->format = AV_SAMPLE_FMT_S16;
        frame->sample_rate = 44100;
        frame->nb_samples = sectors * kSamplesPerSector;
        av_channel_layout_copy(&frame->ch_layout, &m_layout);
        if (av_frame_get_buffer(frame, 0) < 0) {
            m_error = "out of memory";
            return -1;
        }
        for (int k = 0; k < sectors; ++k) {
            s_readFailed = false;
            int16_t* data = cdio_paranoia_read_limited(m_paranoia, ParanoiaCallback, 5);
            if (!data || s_readFailed) {
                m_error = "cannot read sector " + std::to_string(m_next + k) + " of the disc";
                return -1;
            }
            std::memcpy(frame->data[0] + static_cast<size_t>(k) * CDIO_CD_FRAMESIZE_RAW, data,
                        CDIO_CD_FRAMESIZE_RAW);
        }
        position = static_cast<std::int64_t>(m_next - m_first) * kSamplesPerSector;
        m_next += sectors;
        return 1;
    }

private:
    // A .toc read through a copy: removed after the destructor body has closed m_cdio.
    std::unique_ptr<platform::TocCopy> m_tocCopy;
    // libcdio reads past the end of a cut-off .bin without complaint; a real drive would
    // report those sectors unreadable, so say so before a short track goes out as complete.
    bool ImageHoldsTrack() {
        const char* bin = cdio_get_arg(m_cdio, "source");
        struct stat st {};
        if (!bin || ::stat(bin, &st) != 0) {
            return true;
        }
        const auto sectors = static_cast<lsn_t>(st.st_size / CDIO_CD_FRAMESIZE_RAW);
        if (sectors < m_end) {
            m_error = "cannot read sector " + std::to_string(std::max(sectors, m_first)) +
                      " of the disc: the image \"" + bin + "\" ends there";
            return false;
        }
        return true;
    }

    void ReadCdText(track_t t) {
        cdtext_t* text = cdio_get_cdtext(m_cdio);
        if (!text) {
            return;
        }
        if (const char* title = cdtext_get_const(text, CDTEXT_FIELD_TITLE, t); title && *title) {
            m_tags["title"] = title;
        }
        const char* performer = cdtext_get_const(text, CDTEXT_FIELD_PERFORMER, t);
        if (!performer || !*performer) {
            performer = cdtext_get_const(text, CDTEXT_FIELD_PERFORMER, 0);
        }
        if (performer && *performer) {
            m_tags["author"] = performer;
        }
        if (const char* album = cdtext_get_const(text, CDTEXT_FIELD_TITLE, 0); album && *album) {
            m_tags["album"] = album;
        }
    }

    CdIo_t* m_cdio = nullptr;
    cdrom_drive_t* m_drive = nullptr;
    cdrom_paranoia_t* m_paranoia = nullptr;
    lsn_t m_first = 0;
    lsn_t m_end = 0;
    lsn_t m_next = 0;
    AVChannelLayout m_layout{};
};

}  // namespace

bool IsCdaPath(const std::string& path) {
    const size_t slash = path.find_last_of('/');
    if (slash == std::string::npos || slash == 0) {
        return false;
    }
    const std::string name = Lower(path.substr(slash + 1));
    if (name.size() < 10 || name.compare(0, 5, "track") != 0 || !EndsWith(name, ".cda")) {
        return false;
    }
    const std::string digits = name.substr(5, name.size() - 9);
    return !digits.empty() && digits.size() <= 2 &&
           std::all_of(digits.begin(), digits.end(),
                       [](char c) { return std::isdigit(static_cast<unsigned char>(c)); });
}

std::unique_ptr<AudioSource> OpenCdSource(const std::string& path, std::string& error) {
    const size_t slash = path.find_last_of('/');
    const std::string name = path.substr(slash + 1);
    const int track = std::atoi(name.c_str() + 5);
    auto source = std::make_unique<CdSource>();
    if (!source->Open(path.substr(0, slash), track)) {
        error = source->Error();
        return nullptr;
    }
    return source;
}

}  // namespace ac::ctt
