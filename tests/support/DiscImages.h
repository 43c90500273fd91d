#pragma once
// Disc images made at test time, to stand in for an audio CD in a drive: NAME.bin with NAME.cue
// (libcdio's BIN/CUE driver finds the .bin by the cue's own name), and on request NAME.toc for
// the cdrdao driver over the same .bin. 44.1 kHz stereo s16le; the left channel a sine, the
// right seeded LCG noise, so a channel swap, a byte-order slip or a shift by one sample fails.
// Track lengths need not be whole sectors: each track is padded with zeros to whole 2352-byte
// sectors (libcdio drops a partial last sector). Gaps are real silence marked INDEX 00 (libcdio
// ignores the cue's PREGAP). A data track is MODE1/2352 sectors with a sync pattern, a header
// and a counting payload.
//
// Every track's exact PCM comes back, so a rip can be compared sample for sample: a rip of a
// track reads PaddedPcm(track), its PCM followed by the padding zeros.

#include "AudioFixtures.h"

#include <cmath>
#include <cstdint>
#include <cstdio>
#include <fstream>
#include <string>
#include <vector>

namespace ac::test {

inline constexpr int kSectorBytes = 2352;
inline constexpr int kFramesPerSector = kSectorBytes / 4;
inline constexpr int kLeadInSectors = 150;

struct TrackSpec {
    size_t frames = 0;   // audio sample frames; a data track uses dataSectors instead
    int gapSectors = 0;  // silence before the track, marked INDEX 00
    bool data = false;   // a MODE1/2352 data track
    int dataSectors = 0;
    double frequency = 440.0;
    std::uint32_t seed = 1;
};

struct ImageTrack {
    int number = 0;
    bool data = false;
    int gapLsn = -1;        // INDEX 00, -1 without a gap
    int startLsn = 0;       // INDEX 01
    int sectors = 0;        // from INDEX 01 to the end of the track's own sectors, padding included
    Pcm pcm;                // exactly the audio generated, without padding; empty for a data track
    std::string dataBytes;  // the sectors of a data track
    int StartLba() const { return startLsn + kLeadInSectors; }
};

struct DiscImage {
    std::string cuePath;
    std::string binPath;
    std::string tocPath;  // empty unless asked for
    std::vector<ImageTrack> tracks;
    int leadOutLsn = 0;
    int LeadOutLba() const { return leadOutLsn + kLeadInSectors; }
};

enum class TocGaps {
    Pregap,  // PREGAP: cdrdao makes the silence, the FILE starts at INDEX 01
    Start,   // the FILE covers the gap and START marks INDEX 01 (as cdrdao read-toc writes)
};

struct ImageOptions {
    bool writeToc = false;
    TocGaps tocGaps = TocGaps::Pregap;
    bool absoluteTocPaths = false;  // else the FILE names are relative to the .toc's folder
    // CD-Text in the cue sheet: the disc's TITLE and PERFORMER, and "Song N" for track N.
    std::string cdTextAlbum;
    std::string cdTextArtist;
};

// What a rip of an audio track reads: its PCM and then zeros to the end of its last sector.
inline Pcm PaddedPcm(const ImageTrack& track) {
    Pcm padded = track.pcm;
    padded.samples.resize(static_cast<size_t>(track.sectors) * kFramesPerSector * 2, 0);
    return padded;
}

inline Pcm MakeSineAndNoise(size_t frames, double frequency, std::uint32_t seed) {
    Pcm pcm;
    pcm.samples.resize(frames * 2);
    std::uint32_t state = seed * 2654435761u + 12345u;
    for (size_t i = 0; i < frames; ++i) {
        const double angle =
            2.0 * 3.14159265358979323846 * frequency * static_cast<double>(i) / 44100.0;
        pcm.samples[2 * i] = static_cast<std::int16_t>(std::lround(12000.0 * std::sin(angle)));
        state = state * 1664525u + 1013904223u;
        pcm.samples[2 * i + 1] = static_cast<std::int16_t>(static_cast<int>(state >> 16) - 32768);
    }
    return pcm;
}

// "mm:ss:ff" of a count of sectors, as cue sheets and cdrdao want positions.
inline std::string MsfText(int sectors) {
    char text[16];
    std::snprintf(text, sizeof text, "%02d:%02d:%02d", sectors / 75 / 60, sectors / 75 % 60,
                  sectors % 75);
    return text;
}

inline std::string DataSectors(int firstLba, int count) {
    auto bcd = [](int v) { return static_cast<char>(((v / 10) << 4) | (v % 10)); };
    std::string bytes;
    for (int s = 0; s < count; ++s) {
        std::string sector(kSectorBytes, '\0');
        for (int i = 1; i <= 10; ++i) {
            sector[static_cast<size_t>(i)] = '\xFF';
        }
        const int lba = firstLba + s;
        sector[12] = bcd(lba / 75 / 60);
        sector[13] = bcd(lba / 75 % 60);
        sector[14] = bcd(lba % 75);
        sector[15] = 1;
        for (int i = 0; i < 2048; ++i) {
            sector[static_cast<size_t>(16 + i)] = static_cast<char>((lba * 7 + i) & 0xFF);
        }
        bytes += sector;
    }
    return bytes;
}

// Writes folder/name.bin and folder/name.cue (and name.toc) and returns their layout.
inline DiscImage WriteDiscImage(const std::string& folder, const std::string& name,
                                const std::vector<TrackSpec>& specs,
                                const ImageOptions& options = {}) {
    DiscImage image;
    image.binPath = folder + "/" + name + ".bin";
    image.cuePath = folder + "/" + name + ".cue";
    std::string bin;
    std::string cue;
    if (!options.cdTextAlbum.empty()) {
        cue += "PERFORMER \"" + options.cdTextArtist + "\"\nTITLE \"" + options.cdTextAlbum + "\"\n";
    }
    cue += "FILE \"" + name + ".bin\" BINARY\n";
    bool anyData = false;
    int lsn = 0;
    for (size_t i = 0; i < specs.size(); ++i) {
        const TrackSpec& spec = specs[i];
        ImageTrack track;
        track.number = static_cast<int>(i) + 1;
        track.data = spec.data;
        anyData = anyData || spec.data;
        char head[48];
        std::snprintf(head, sizeof head, "  TRACK %02d %s\n", track.number,
                      spec.data ? "MODE1/2352" : "AUDIO");
        cue += head;
        if (!options.cdTextAlbum.empty() && !spec.data) {
            cue += "    TITLE \"Song " + std::to_string(track.number) + "\"\n";
        }
        if (spec.gapSectors > 0) {
            track.gapLsn = lsn;
            cue += "    INDEX 00 " + MsfText(lsn) + "\n";
            bin.append(static_cast<size_t>(spec.gapSectors) * kSectorBytes, '\0');
            lsn += spec.gapSectors;
        }
        track.startLsn = lsn;
        cue += "    INDEX 01 " + MsfText(lsn) + "\n";
        if (spec.data) {
            track.sectors = spec.dataSectors;
            track.dataBytes = DataSectors(lsn + kLeadInSectors, spec.dataSectors);
            bin += track.dataBytes;
        } else {
            track.pcm = MakeSineAndNoise(spec.frames, spec.frequency, spec.seed);
            track.sectors =
                static_cast<int>((spec.frames + kFramesPerSector - 1) / kFramesPerSector);
            bin.append(reinterpret_cast<const char*>(track.pcm.samples.data()),
                       track.pcm.samples.size() * 2);
            bin.append(
                static_cast<size_t>(track.sectors) * kSectorBytes - track.pcm.samples.size() * 2,
                '\0');
        }
        lsn += track.sectors;
        image.tracks.push_back(std::move(track));
    }
    image.leadOutLsn = lsn;
    WriteFile(image.binPath, bin);
    WriteFile(image.cuePath, cue);

    if (options.writeToc) {
        image.tocPath = folder + "/" + name + ".toc";
        const std::string file = options.absoluteTocPaths ? image.binPath : name + ".bin";
        std::string toc = anyData ? "CD_ROM\n" : "CD_DA\n";
        for (const ImageTrack& track : image.tracks) {
            toc += track.data ? "TRACK MODE1_RAW\n" : "TRACK AUDIO\n";
            const int gap = track.gapLsn < 0 ? 0 : track.startLsn - track.gapLsn;
            if (gap > 0 && options.tocGaps == TocGaps::Pregap) {
                toc += "PREGAP " + MsfText(gap) + "\n";
                toc += "FILE \"" + file + "\" " + MsfText(track.startLsn) + " " +
                       MsfText(track.sectors) + "\n";
            } else {
                toc += "FILE \"" + file + "\" " + MsfText(track.startLsn - gap) + " " +
                       MsfText(gap + track.sectors) + "\n";
                if (gap > 0) {
                    toc += "START " + MsfText(gap) + "\n";
                }
            }
        }
        WriteFile(image.tocPath, toc);
    }
    return image;
}

// The layout the library notes worked through: 5.003 s, 7 s and 4.01 s, so 376, 525 and 301
// sectors (the first and last not whole). Without gaps the disc id is 0e001003; with gaps of
// 150 sectors before tracks 2 and 3 it is 14001403.
inline std::vector<TrackSpec> ThreeTrackSpecs(int gapSectors = 0) {
    return {TrackSpec{220632, 0, false, 0, 440.0, 1},
            TrackSpec{308700, gapSectors, false, 0, 660.0, 2},
            TrackSpec{176841, gapSectors, false, 0, 880.0, 3}};
}

// count short audio tracks of a little over two sectors each, with different tones and seeds.
inline std::vector<TrackSpec> ManyTrackSpecs(int count) {
    std::vector<TrackSpec> specs;
    for (int i = 0; i < count; ++i) {
        specs.push_back(TrackSpec{static_cast<size_t>(2 * kFramesPerSector + 37 * (i + 1)), 0,
                                  false, 0, 220.0 + 10.0 * i, static_cast<std::uint32_t>(100 + i)});
    }
    return specs;
}

}  // namespace ac::test
