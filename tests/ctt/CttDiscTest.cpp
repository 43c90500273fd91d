// Cue track paths and CD tracks: each output compared sample by sample with its source.

#include <unistd.h>

#include <algorithm>
#include <cstdio>

#include "CttHarness.h"

namespace ac::test {
namespace {

constexpr size_t kSectorFrames = 588;  // stereo samples in one 2352-byte CD sector

std::string Msf(size_t cdFrames) {
    char text[64];
    std::snprintf(text, sizeof text, "%02zu:%02zu:%02zu", cdFrames / 75 / 60, cdFrames / 75 % 60, cdFrames % 75);
    return text;
}

Pcm Slice(const Pcm& pcm, size_t fromFrame, size_t toFrame) {
    Pcm out = pcm;
    out.samples.assign(pcm.samples.begin() + static_cast<long>(fromFrame * 2),
                       pcm.samples.begin() + static_cast<long>(toFrame * 2));
    return out;
}

Pcm Concat(const std::vector<Pcm>& parts) {
    Pcm out = parts.front();
    out.samples.clear();
    for (const Pcm& p : parts) {
        out.samples.insert(out.samples.end(), p.samples.begin(), p.samples.end());
    }
    return out;
}

class CttCueTracks : public ::testing::Test {
protected:
    static void SetUpTestSuite() {
        s_dir = new TempDir;
        // Track starts on CD frames; the last track ends off the frame grid.
        s_album = Concat({MakeNoise(167 * kSectorFrames, 11), MakeNoise(115 * kSectorFrames, 12),
                          MakeNoise(40000, 13)});
        WriteWav(*s_dir / "Album.wav", s_album);
        // As sheets come from Windows rippers: CRLF, a Windows path, lower-case keywords.
        WriteFile(*s_dir / "album.cue",
                  "\xEF\xBB\xBFREM GENRE Rock\r\nPERFORMER \"The Band\"\r\nTITLE \"The Album\"\r\n"
                  "FILE \"C:\\Rips\\album.wav\" WAVE\r\n  TRACK 01 AUDIO\r\n    TITLE \"One\"\r\n"
                  "    INDEX 01 00:00:00\r\n  track 02 audio\r\n    title \"Two\"\r\n    performer \"Guest\"\r\n"
                  "    index 00 " + Msf(160) + "\r\n    index 01 " + Msf(167) + "\r\n  TRACK 03 AUDIO\r\n"
                  "    TITLE \"Three\"\n    INDEX 01 " + Msf(282) + "\r\n");
        // Two files, with the gap of track 2 at the end of the first file.
        s_first = MakeNoise(50000, 14);
        s_second = MakeNoise(30000, 15);
        WriteWav(*s_dir / "a.wav", s_first);
        WriteWav(*s_dir / "b.wav", s_second);
        WriteFile(*s_dir / "multi.cue", "FILE \"a.wav\" WAVE\n TRACK 01 AUDIO\n  INDEX 01 00:00:00\n"
                                        " TRACK 02 AUDIO\n  INDEX 00 00:01:00\nFILE \"b.wav\" WAVE\n"
                                        "  INDEX 01 00:00:00\n");
    }
    static void TearDownTestSuite() {
        delete s_dir;
        s_dir = nullptr;
    }

    Pcm Convert(const std::string& input, const std::vector<std::string>& options = {}) {
        const std::string out = m_out / "track.wav";
        const ToolResult r = RunCtt(input, options, out);
        EXPECT_EQ(r.exitCode, 0) << input << ": " << r.err;
        Pcm pcm;
        EXPECT_TRUE(ReadWav(out, pcm)) << input;
        return pcm;
    }

    static TempDir* s_dir;
    static Pcm s_album, s_first, s_second;
    TempDir m_out;
};

TempDir* CttCueTracks::s_dir = nullptr;
Pcm CttCueTracks::s_album, CttCueTracks::s_first, CttCueTracks::s_second;

TEST_F(CttCueTracks, EachTrackIsExactlyItsSpan) {
    const size_t bounds[] = {0, 167 * kSectorFrames, 282 * kSectorFrames, s_album.frames()};
    for (int track = 1; track <= 3; ++track) {
        const Pcm got = Convert(*s_dir / "album.cue|" + std::to_string(track));
        const Pcm want = Slice(s_album, bounds[track - 1], bounds[track]);
        ASSERT_EQ(got.frames(), want.frames()) << "track " << track;
        EXPECT_TRUE(got.samples == want.samples) << "track " << track;
    }
}

TEST_F(CttCueTracks, SheetTitlesAreTagsUnlessTheCommandLineGivesThem) {
    const std::string out = m_out / "tagged.flac";
    ASSERT_EQ(RunCtt(*s_dir / "album.cue|2", {}, out).exitCode, 0);
    MediaFileInfo info = Probe(out);
    EXPECT_EQ(info.title, "Two");
    EXPECT_EQ(info.author, "Guest");
    EXPECT_EQ(info.album, "The Album");

    ASSERT_EQ(RunCtt(*s_dir / "album.cue|1", {"-title", "Mine"}, out).exitCode, 0);
    info = Probe(out);
    EXPECT_EQ(info.title, "Mine");
    EXPECT_EQ(info.author, "The Band");
}

TEST_F(CttCueTracks, StartAndDurationCountWithinTheTrack) {
    const Pcm got = Convert(*s_dir / "album.cue|2", {"-ss", "0.5", "-t", "0.25"});
    const size_t from = 167 * kSectorFrames + 22050;
    EXPECT_TRUE(got.samples == Slice(s_album, from, from + 11025).samples);
}

TEST_F(CttCueTracks, TracksAcrossFilesEndWithTheirFile) {
    EXPECT_TRUE(Convert(*s_dir / "multi.cue|1").samples == s_first.samples);
    EXPECT_TRUE(Convert(*s_dir / "multi.cue|2").samples == s_second.samples);
}

TEST_F(CttCueTracks, ProbeGivesTheTrackNotTheFile) {
    MediaFileInfo info;
    ASSERT_EQ(ProbeFile(*s_dir / "album.cue|2", info), 1);
    EXPECT_EQ(info.title, "Two");
    EXPECT_EQ(info.genre, "Rock");
    EXPECT_EQ(info.seconds, 1);
    EXPECT_EQ(info.microseconds, 533333);  // 115 CD frames
    ASSERT_EQ(info.audioStreams.size(), 1u);
    EXPECT_EQ(info.audioStreams[0].bitRate, 1411200);
    EXPECT_EQ(ProbeFile(*s_dir / "album.cue|4", info), 0);
}

// A disc image as our burner writes it: one .bin, every track padded to whole sectors, and
// a gap (INDEX 00) of silence before track 3.
class CttCdTracks : public ::testing::Test {
protected:
    static void SetUpTestSuite() {
        s_dir = new TempDir;
        s_tracks = {MakeNoise(66250, 21), MakeNoise(300 * kSectorFrames, 22), MakeNoise(33108, 23)};
        std::string bin;
        std::string cue = "FILE \"disc.bin\" BINARY\n";
        size_t sector = 0;
        for (size_t t = 0; t < s_tracks.size(); ++t) {
            cue += "  TRACK 0" + std::to_string(t + 1) + " AUDIO\n";
            if (t == 2) {
                cue += "    INDEX 00 " + Msf(sector) + "\n";
                bin.append(75 * 2352, '\0');
                sector += 75;
            }
            cue += "    INDEX 01 " + Msf(sector) + "\n";
            const Pcm& pcm = s_tracks[t];
            bin.append(reinterpret_cast<const char*>(pcm.samples.data()), pcm.samples.size() * 2);
            const size_t sectors = (pcm.frames() + kSectorFrames - 1) / kSectorFrames;
            bin.append(sectors * 2352 - pcm.samples.size() * 2, '\0');
            sector += sectors;
        }
        WriteFile(*s_dir / "disc.bin", bin);
        WriteFile(*s_dir / "disc.cue", cue);
        // The first two tracks as a cdrdao TOC in MSF, naming its .bin relative to itself as
        // cdrdao writes it: ctt runs in another folder and must still find it.
        const size_t first = (s_tracks[0].frames() + kSectorFrames - 1) / kSectorFrames;
        WriteFile(*s_dir / "disc.toc", "CD_DA\nTRACK AUDIO\nFILE \"disc.bin\" 0 " + Msf(first) +
                                           "\nTRACK AUDIO\nFILE \"disc.bin\" " + Msf(first) + " " +
                                           Msf(300) + "\n");
        // The same image, cut off in the middle of track 2.
        ASSERT_EQ(mkdir((*s_dir / "cut").c_str(), 0755), 0);
        WriteFile(*s_dir / "cut/disc.cue", cue);
        WriteFile(*s_dir / "cut/disc.bin", bin.substr(0, (113 + 150) * 2352));
    }
    static void TearDownTestSuite() {
        delete s_dir;
        s_dir = nullptr;
    }

    static TempDir* s_dir;
    static std::vector<Pcm> s_tracks;
    TempDir m_out;
};

TempDir* CttCdTracks::s_dir = nullptr;
std::vector<Pcm> CttCdTracks::s_tracks;

TEST_F(CttCdTracks, TracksReadSampleExactToTheirLastSector) {
    for (size_t t = 0; t < s_tracks.size(); ++t) {
        const std::string out = m_out / "cd.wav";
        const std::string input = *s_dir / "disc.cue/Track0" + std::to_string(t + 1) + ".cda";
        const ToolResult r = RunCtt(input, {}, out);
        ASSERT_EQ(r.exitCode, 0) << input << ": " << r.err;
        Pcm got;
        ASSERT_TRUE(ReadWav(out, got));
        const Pcm& want = s_tracks[t];
        const size_t sectors = (want.frames() + kSectorFrames - 1) / kSectorFrames;
        ASSERT_EQ(got.frames(), sectors * kSectorFrames) << "track " << t + 1;
        EXPECT_TRUE(std::equal(want.samples.begin(), want.samples.end(), got.samples.begin())) << t + 1;
        EXPECT_TRUE(std::all_of(got.samples.begin() + static_cast<long>(want.samples.size()), got.samples.end(),
                                [](std::int16_t s) { return s == 0; }));
        EXPECT_NEAR(TimeLines(r.out).back(), static_cast<double>(got.frames()) / 44100, 1e-3);
    }
}

TEST_F(CttCdTracks, TocImageReadsLikeTheCue) {
    const std::string out = m_out / "toc.wav";
    const ToolResult r = RunCtt(*s_dir / "disc.toc/Track02.cda", {}, out);
    ASSERT_EQ(r.exitCode, 0) << r.err;
    Pcm got;
    ASSERT_TRUE(ReadWav(out, got));
    EXPECT_TRUE(got.samples == s_tracks[1].samples);
}

TEST_F(CttCdTracks, MissingTrackAndUnreadableSectorFailCleanly) {
    const std::string out = m_out / "cd.mp3";
    ToolResult r = RunCtt(*s_dir / "disc.cue/Track09.cda", {}, out);
    EXPECT_GT(r.exitCode, 0);
    EXPECT_NE(r.err.find("|Error>>> track 9"), std::string::npos) << r.err;

    r = RunCtt(*s_dir / "cut/disc.cue/Track02.cda", {}, out);
    EXPECT_FALSE(r.timedOut);
    EXPECT_GT(r.exitCode, 0);
    EXPECT_NE(r.err.find("|Error>>> "), std::string::npos) << r.err;
    ExpectNothingLeft(m_out.Path(), out);
}

}  // namespace
}  // namespace ac::test
