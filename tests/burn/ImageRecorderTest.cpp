// The image recorder end to end: audio discs read back through libcdio sample for sample, gaps
// included; data discs read back through libisofs; nothing left under a final name when a
// write stops or fails.
#include "burn/DiscTree.h"
#include "burn/ImageRecorder.h"
#include "burn/IsoSession.h"
#include "burn/WavFile.h"
#include "support/AudioFixtures.h"
#include "support/TempDir.h"

#include <gtest/gtest.h>

#include <cdio/cdio.h>
#include <cdio/logging.h>
#include <cstdint>
#include <libisofs/libisofs.h>

#include <filesystem>

namespace ac::burn {
namespace {

namespace fs = std::filesystem;
using test::Pcm;
using test::TempDir;

class CountingEvents : public IBurnEvents {
public:
    int stopAfterUnits = -1;
    int units = 0, total = 0, cancelled = 0, failed = 0;
    std::vector<int> trackNumbers;
    int OnBurnEvent(int event, int value) override {
        switch (event) {
            case kEventPoll:
                return stopAfterUnits >= 0 && units >= stopAfterUnits;
            case kEventTotalUnits:
                total = value;
                break;
            case kEventUnit:
                ++units;
                break;
            case kEventAudioTrack:
                trackNumbers.push_back(value);
                break;
            case kEventCancelled:
                ++cancelled;
                break;
            case kEventWriteFailed:
                ++failed;
                break;
            default:
                break;
        }
        return 0;
    }
};

// A WAV as FFmpeg writes it with tags: a LIST chunk between "fmt " and "data".
std::string WavWithList(const Pcm& pcm) {
    std::string plain = test::WavBytes(pcm);
    const std::string list = std::string("LIST\x0c\0\0\0INFOISFT\0\0\0\0", 20);
    plain.insert(36, list);
    const std::uint32_t riff = static_cast<std::uint32_t>(plain.size() - 8);
    for (int i = 0; i < 4; ++i)
        plain[4 + i] = static_cast<char>(riff >> (8 * i));
    return plain;
}

std::vector<std::int16_t> ReadSectors(CdIo_t* cd, int lsn, int count) {
    std::vector<std::int16_t> samples(static_cast<size_t>(count) * kAudioSectorBytes / 2);
    if (count > 0 && cdio_read_audio_sectors(cd, samples.data(), lsn, count) != DRIVER_OP_SUCCESS)
        samples.clear();
    return samples;
}

class AudioImageTest : public ::testing::Test {
protected:
    void SetUp() override {
        cdio_loglevel_default = CDIO_LOG_ERROR;
        // Lengths that are not whole sectors, so padding shows.
        const size_t frames[] = {44100 + 313, 2 * 588, 30000};
        for (int i = 0; i < 3; ++i) {
            pcm.push_back(test::MakeNoise(frames[i], 11 + i));
            const std::string path = dir / ("t" + std::to_string(i + 1) + ".wav");
            test::WriteFile(path, i == 1 ? WavWithList(pcm[i]) : test::WavBytes(pcm[i]));
            job.tracks.push_back({path, "Track \"" + std::to_string(i + 1) + "\""});
        }
    }

    // Opens the cue as a drive and compares every track, and every gap, with what went in.
    void ExpectDiscMatches(const std::string& cue, int gapSeconds) {
        CdIo_t* cd = cdio_open(cue.c_str(), DRIVER_BINCUE);
        ASSERT_NE(cd, nullptr);
        ASSERT_EQ(cdio_get_num_tracks(cd), 3);
        int expectedLsn = 0;
        for (int t = 1; t <= 3; ++t) {
            const Pcm& source = pcm[t - 1];
            const int sectors = static_cast<int>(
                (source.samples.size() * 2 + kAudioSectorBytes - 1) / kAudioSectorBytes);
            if (t > 1 && gapSeconds > 0) {
                EXPECT_EQ(cdio_get_track_pregap_lsn(cd, t), expectedLsn);
                const auto gap = ReadSectors(cd, expectedLsn, gapSeconds * 75);
                ASSERT_FALSE(gap.empty());
                EXPECT_TRUE(
                    std::all_of(gap.begin(), gap.end(), [](std::int16_t s) { return s == 0; }));
                expectedLsn += gapSeconds * 75;
            }
            ASSERT_EQ(cdio_get_track_lsn(cd, t), expectedLsn) << "track " << t;
            auto read = ReadSectors(cd, expectedLsn, sectors);
            ASSERT_EQ(read.size(), static_cast<size_t>(sectors) * kAudioSectorBytes / 2);
            EXPECT_TRUE(std::equal(source.samples.begin(), source.samples.end(), read.begin()))
                << "track " << t;
            EXPECT_TRUE(std::all_of(read.begin() + static_cast<long>(source.samples.size()),
                                    read.end(), [](std::int16_t s) { return s == 0; }));
            expectedLsn += sectors;
        }
        EXPECT_EQ(cdio_get_track_lsn(cd, CDIO_CDROM_LEADOUT_TRACK), expectedLsn);
        cdio_destroy(cd);
    }

    std::vector<std::string> Leftovers() {
        std::vector<std::string> hidden;
        for (const auto& entry : fs::directory_iterator(dir.Path()))
            if (entry.path().filename().string().starts_with("."))
                hidden.push_back(entry.path().string());
        return hidden;
    }

    TempDir dir;
    std::vector<Pcm> pcm;
    BurnJob job;
};

TEST_F(AudioImageTest, TracksAndTwoSecondGapsReadBackSampleForSample) {
    ImageRecorder recorder(dir / "disc.cue");
    CountingEvents events;
    job.pauseSeconds = 2;
    ASSERT_TRUE(recorder.Burn(job, events));
    EXPECT_EQ(recorder.LastWritten(), dir / "disc.cue");
    ExpectDiscMatches(dir / "disc.cue", 2);
    EXPECT_EQ(events.trackNumbers, (std::vector<int>{1, 2, 3}));
    // One tick per 22 sectors of the whole disc.
    EXPECT_EQ(events.units, events.total / kUnitsPerTick);
    EXPECT_TRUE(Leftovers().empty());
    // The title's quote cannot end the cue's text early.
    EXPECT_NE(test::ReadFile(dir / "disc.cue").find("TITLE \"Track 1\""), std::string::npos);
}

TEST_F(AudioImageTest, WithoutPauseTheTracksFollowEachOther) {
    ImageRecorder recorder(dir / "nogap");
    CountingEvents events;
    job.pauseSeconds = 0;
    ASSERT_TRUE(recorder.Burn(job, events));
    ExpectDiscMatches(dir / "nogap.cue", 0);
}

TEST_F(AudioImageTest, SecondCopyIsASecondImage) {
    ImageRecorder recorder(dir / "disc");
    CountingEvents events;
    job.copyIndex = 1;
    ASSERT_TRUE(recorder.Burn(job, events));
    EXPECT_TRUE(fs::exists(dir / "disc-2.cue"));
    EXPECT_TRUE(fs::exists(dir / "disc-2.bin"));
    EXPECT_FALSE(fs::exists(dir / "disc.cue"));
}

TEST_F(AudioImageTest, StopMidwayLeavesNoFileAndKeepsAnOlderImage) {
    test::WriteFile(dir / "disc.cue", "older");
    ImageRecorder recorder(dir / "disc");
    CountingEvents events;
    events.stopAfterUnits = 3;
    EXPECT_FALSE(recorder.Burn(job, events));
    EXPECT_EQ(events.cancelled, 1);
    EXPECT_EQ(events.failed, 0);
    EXPECT_FALSE(fs::exists(dir / "disc.bin"));
    EXPECT_EQ(test::ReadFile(dir / "disc.cue"), "older");
    EXPECT_TRUE(Leftovers().empty());
}

TEST_F(AudioImageTest, TrackThatIsNotCdAudioFailsTheWrite) {
    test::WriteFile(job.tracks[1].path, test::WavBytes(test::MakeNoise(1000, 3, 48000, 1)));
    ImageRecorder recorder(dir / "disc");
    CountingEvents events;
    EXPECT_FALSE(recorder.Burn(job, events));
    EXPECT_EQ(events.failed, 1);
    EXPECT_FALSE(fs::exists(dir / "disc.bin"));
    EXPECT_TRUE(Leftovers().empty());
}

TEST(ImageRecorderState, MissingFolderIsReportedNotWritten) {
    TempDir dir;
    ImageRecorder recorder(dir / "gone/disc");
    EXPECT_NE(recorder.UnavailableReason().find("does not exist"), std::string::npos);
    EXPECT_EQ(recorder.MediaType(), kMediaNone);
    ImageRecorder fine(dir / "disc.iso");
    EXPECT_EQ(fine.UnavailableReason(), "");
    EXPECT_EQ(fine.DriveText(), dir / "disc");
    EXPECT_EQ(fine.MediaType(), kMediaCdR);
    std::int64_t total = 0, freeBlocks = 0;
    EXPECT_TRUE(fine.Capacity(total, freeBlocks));
    EXPECT_LE(freeBlocks, ImageRecorder::kDiscBlocks);
    EXPECT_TRUE(fine.WriteSpeeds().empty());
}

TEST(CueText, TimesAreMinutesSecondsFrames) {
    EXPECT_EQ(CueTime(0), "00:00:00");
    EXPECT_EQ(CueTime(75 * 61 + 74), "01:01:74");
    EXPECT_EQ(CountAudioSector(0), 150);
    EXPECT_EQ(CountAudioSector(60), 60 * 75 + 150);
}

TEST(WavLayoutTest, ChunksAreWalkedAndOddSizesRefused) {
    const Pcm pcm = test::MakeNoise(100, 1);
    WavLayout layout;
    std::string reason;
    const std::string listed = WavWithList(pcm);
    ASSERT_TRUE(ParseWavLayout(listed, static_cast<std::int64_t>(listed.size()), layout, reason));
    EXPECT_EQ(layout.dataOffset, 44 + 20);
    EXPECT_EQ(layout.dataBytes, 400);
    EXPECT_TRUE(layout.IsCdAudio());

    // A size never fixed up runs to the end of the file.
    std::string open = test::WavBytes(pcm, 0xFFFFFFFFu);
    ASSERT_TRUE(ParseWavLayout(open, static_cast<std::int64_t>(open.size()), layout, reason));
    EXPECT_EQ(layout.dataBytes, 400);

    EXPECT_FALSE(ParseWavLayout("RIFF", 4, layout, reason));
    EXPECT_FALSE(ParseWavLayout(listed.substr(0, 30), 30, layout, reason));
    EXPECT_FALSE(ParseWavLayout(std::string(58, '\0'), 58, layout, reason));
    const std::string mono = test::WavBytes(test::MakeNoise(10, 1, 44100, 1));
    ASSERT_TRUE(ParseWavLayout(mono, static_cast<std::int64_t>(mono.size()), layout, reason));
    EXPECT_FALSE(layout.IsCdAudio());
}

// Reads a file of the image through libisofs by its Joliet path.
std::string ReadIsoFile(IsoImage* image, const std::string& path) {
    IsoNode* node = nullptr;
    if (iso_tree_path_to_node(image, path.c_str(), &node) != 1 ||
        iso_node_get_type(node) != LIBISO_FILE)
        return "<missing>";
    IsoStream* stream = iso_file_get_stream(reinterpret_cast<IsoFile*>(node));
    std::string bytes;
    if (iso_stream_open(stream) < 0)
        return "<unreadable>";
    char buffer[65536];
    for (int got; (got = iso_stream_read(stream, buffer, sizeof buffer)) > 0;)
        bytes.append(buffer, got);
    iso_stream_close(stream);
    return bytes;
}

TEST(DataImage, FilesComeBackByTheirJolietNamesByteForByte) {
    TempDir dir;
    // A name ISO 9660 cannot hold as it is: long, with blanks, a colon, umlauts.
    const std::string longName = "Ein Lied: Größe " + std::string(80, 'x') + ".mp3";
    test::WriteFile(dir / "a.mp3", std::string(300000, 'a') + "end");
    std::string random;
    for (int i = 0; i < 70001; ++i)
        random += static_cast<char>((i * 7919) >> 3);
    test::WriteFile(dir / "long.mp3", random);

    DiscTree tree;
    tree.AddChild("a.mp3", CreateFileItem("a.mp3", dir / "a.mp3"));
    tree.AddChild(longName, CreateFileItem(longName, dir / "long.mp3"));
    EXPECT_EQ(CreateFileItem("missing", dir / "missing.mp3"), nullptr);
    SetItemFileName(*DiscTree::Item(tree.Root()), "My Disc");

    const std::int64_t predicted = CountISOLength(tree);
    ImageRecorder recorder(dir / "data");
    CountingEvents events;
    BurnJob job;
    job.audio = false;
    job.tree = &tree;
    ASSERT_TRUE(recorder.Burn(job, events));
    ASSERT_TRUE(fs::exists(dir / "data.iso"));
    EXPECT_EQ(static_cast<std::int64_t>(fs::file_size(dir / "data.iso")), predicted);
    EXPECT_GT(events.units, 0);

    iso_init();
    IsoDataSource* source = nullptr;
    ASSERT_EQ(iso_data_source_new_from_file((dir / "data.iso").c_str(), &source), 1);
    IsoReadOpts* options = nullptr;
    iso_read_opts_new(&options, 0);
    iso_read_opts_set_no_rockridge(options, 1);
    iso_read_opts_set_preferjoliet(options, 1);
    IsoImage* image = nullptr;
    iso_image_new("check", &image);
    IsoReadImageFeatures* features = nullptr;
    ASSERT_GE(iso_image_import(image, source, options, &features), 0);
    EXPECT_TRUE(iso_read_image_features_has_joliet(features));
    EXPECT_EQ(std::string(iso_image_get_volume_id(image)), "MY_DISC");
    EXPECT_EQ(ReadIsoFile(image, "/a.mp3"), test::ReadFile(dir / "a.mp3"));
    IsoDir* root = iso_image_get_root(image);
    IsoDirIter* iterator = nullptr;
    iso_dir_get_children(root, &iterator);
    std::vector<std::string> names;
    for (IsoNode* node; iso_dir_iter_next(iterator, &node) == 1;)
        names.push_back(iso_node_get_name(node));
    iso_dir_iter_free(iterator);
    ASSERT_EQ(names.size(), 2u);
    std::string longFound;
    for (const auto& name : names)
        if (name != "a.mp3")
            longFound = name;
    // Joliet takes the whole name, umlauts and blanks too; only the colon is not allowed.
    std::string expected = longName;
    std::replace(expected.begin(), expected.end(), ':', '_');
    EXPECT_EQ(longFound, expected);
    EXPECT_EQ(ReadIsoFile(image, "/" + longFound), random);
    iso_read_image_features_destroy(features);
    iso_image_unref(image);
    iso_read_opts_free(options);
    iso_data_source_unref(source);
}

TEST(DiscTreeTest, NodesLinkAndFree) {
    DiscTree tree;
    EXPECT_TRUE(tree.Empty());
    auto* folder = tree.AddChild("dir", CreateDirItem("dir"));
    TempDir dir;
    test::WriteFile(dir / "f", "x");
    tree.AddChild("f", CreateFileItem("f", dir / "f"), folder);
    tree.AddChild("g", CreateFileItem("g", dir / "f"));
    ASSERT_EQ(tree.Files().size(), 2u);
    EXPECT_EQ(tree.Files()[0].first, "dir/f");
    EXPECT_EQ(DiscTree::Parent(DiscTree::FirstChild(folder)), folder);
    tree.FreeNode(folder);
    ASSERT_EQ(tree.Files().size(), 1u);
    EXPECT_EQ(tree.Files()[0].first, "g");
    tree.Clear();
    EXPECT_TRUE(tree.Empty());
}

}  // namespace
}  // namespace ac::burn
