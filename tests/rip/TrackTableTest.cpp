// From tables of contents to disc ids and rows: the length rule, the ids of images made at test
// time and of real discs' cue sheets, and the rows of a disc with a data track.

#include "rip/TrackTable.h"

#include "../support/DiscImages.h"
#include "../support/TempDir.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>
#include <random>
#include <regex>

namespace ac {
namespace {

namespace fs = std::filesystem;
using cddb::TocPosition;
using platform::DiscTable;

DiscTable ReadImage(const std::string& drive) {
    DiscTable table;
    EXPECT_TRUE(platform::MakeDiscDevice()->ReadToc(drive, table)) << drive;
    return table;
}

TEST(TrackTableTest, LengthDropsFramesByTheBorrowRule) {
    // 3:00 apart in minutes and seconds, frames 40 then 10: 2:59.
    EXPECT_EQ(TrackLengthSeconds(TocPosition{0, 2, 40}, TocPosition{3, 2, 10}), 179);
    EXPECT_EQ(TrackLengthSeconds(TocPosition{0, 2, 10}, TocPosition{3, 2, 40}), 180);
    EXPECT_EQ(TrackLengthSeconds(TocPosition{1, 50, 0}, TocPosition{2, 10, 0}), 20);
    // The rule is whole seconds of the frame distance, rounded down: any two positions.
    std::mt19937 random(5);
    for (int i = 0; i < 2000; ++i) {
        const int start = static_cast<int>(random() % 300000);
        const int next = start + static_cast<int>(random() % 40000);
        ASSERT_EQ(TrackLengthSeconds(TocPosition::FromFrames(start), TocPosition::FromFrames(next)),
                  (next - start) / 75)
            << start << " " << next;
    }
}

// The ids worked through by hand (and by libcddb) for the three-track layout of the notes.
TEST(TrackTableTest, DiscIdsOfGeneratedImagesWithAndWithoutGaps) {
    test::TempDir dir;
    const auto plain = test::WriteDiscImage(dir.Path(), "plain", test::ThreeTrackSpecs(0));
    const auto gapped = test::WriteDiscImage(dir.Path(), "gapped", test::ThreeTrackSpecs(150));
    EXPECT_EQ(DiscIdOf(ReadImage(plain.cuePath)), 0x0e001003u);
    EXPECT_EQ(DiscIdOf(ReadImage(gapped.cuePath)), 0x14001403u);
    EXPECT_EQ(DiscIdOf(DiscTable{}), kNoDiscId);

    const DiscTable table = ReadImage(gapped.cuePath);
    const cddb::DiscToc toc = ToDiscToc(table);
    ASSERT_EQ(toc.size(), 4u);
    EXPECT_EQ(toc[1], (TocPosition{0, 9, 1}));  // 676 frames
    EXPECT_EQ(toc[3].Frames(), 1652);
}

// Cue sheets of real discs that carry the id their ripping program computed (REM DISCID). The
// cue holds every track start but not the lead-out, so the .bin is made just long enough to end
// in the second the id's length field names: the digit sums and the track count are what is
// checked against the program's value.
TEST(TrackTableTest, DiscIdsOfRealDiscsCueSheets) {
    test::TempDir dir;
    for (const char* name : {"audiotools_freedb_test_discid-2", "audiotools_freedb_test_discid-3",
                             "audiotools_freedb_test_discid-5"}) {
        SCOPED_TRACE(name);
        const std::string source = std::string(AC_CORPUS_DIR "/discimg/") + name + ".cue";
        std::ifstream in(source);
        const std::string text((std::istreambuf_iterator<char>(in)),
                               std::istreambuf_iterator<char>());
        std::smatch match;
        ASSERT_TRUE(std::regex_search(text, match, std::regex("REM DISCID ([0-9A-F]{8})")));
        const auto expected = static_cast<std::uint32_t>(std::stoul(match[1], nullptr, 16));

        const std::string cue = dir / (std::string(name) + ".cue");
        fs::copy_file(source, cue);
        test::WriteFile(dir / (std::string(name) + ".bin"), "");
        fs::resize_file(dir / (std::string(name) + ".bin"), 2352u * 400000u);  // 88 minutes, sparse
        DiscTable table = ReadImage(cue);
        ASSERT_FALSE(table.tracks.empty());
        const int lengthSeconds = static_cast<int>((expected >> 8) & 0xFFFF);
        const int leadOutLba = (table.tracks[0].lba / 75 + lengthSeconds) * 75 + 37;
        fs::resize_file(dir / (std::string(name) + ".bin"),
                        2352u * static_cast<unsigned>(leadOutLba - 150));
        table = ReadImage(cue);
        EXPECT_EQ(table.tracks.size(), expected & 0xFF);
        EXPECT_EQ(DiscIdOf(table), expected);
    }
}

// A data track counts in the id as CDDB counts it, gets no row, and the audio track before it
// runs to its start.
TEST(TrackTableTest, RowsOfADiscWithADataTrackAtTheEnd) {
    test::TempDir dir;
    std::vector<test::TrackSpec> specs = test::ThreeTrackSpecs(0);
    specs.back() = test::TrackSpec{0, 150, true, 400};
    const auto image = test::WriteDiscImage(dir.Path(), "extra", specs);
    const DiscTable table = ReadImage(image.cuePath);
    ASSERT_TRUE(IsAudioDisc(table));
    EXPECT_EQ(DiscIdOf(table) & 0xFF, 3u);
    EXPECT_EQ(DiscIdOf(table),
              cddb::ComputeDiscId({TocPosition::FromFrames(150), TocPosition::FromFrames(526),
                                   TocPosition::FromFrames(1201), TocPosition::FromFrames(1601)}));

    cddb::CDDiscInfo record;
    record.trackCount = 3;
    record.titles = {"Opening", "", "Data"};
    const std::vector<TrackRow> rows = BuildTrackRows(table, image.cuePath, &record);
    ASSERT_EQ(rows.size(), 2u);
    EXPECT_EQ(rows[0].number, 1);
    EXPECT_EQ(rows[0].title, "Opening");
    EXPECT_EQ(rows[0].durationSeconds, 5);  // 376 frames
    EXPECT_EQ(rows[1].title, "Track02");    // the record's title is empty
    EXPECT_EQ(rows[1].durationSeconds, 9);  // 525 + 150 frames of the data track's gap
    EXPECT_EQ(rows[1].sourcePath, image.cuePath + "/Track02.cda");

    const std::vector<TrackRow> unnamed = BuildTrackRows(table, "/dev/sr1", nullptr);
    ASSERT_EQ(unnamed.size(), 2u);
    EXPECT_EQ(unnamed[0].title, "Track01");
    EXPECT_EQ(unnamed[0].sourcePath, "/dev/sr1/Track01.cda");
    EXPECT_EQ(DefaultTrackName(10), "Track10");
}

// A disc's CD-Text names it when no local record does, in the order cddborder gives; a data
// track gets no title, as it gets no row.
TEST(TrackTableTest, CdTextBecomesARecordOfTheAudioTracks) {
    test::TempDir dir;
    std::vector<test::TrackSpec> specs = test::ThreeTrackSpecs(150);
    test::TrackSpec data;
    data.data = true;
    data.dataSectors = 300;
    specs.push_back(data);
    test::ImageOptions options;
    options.cdTextAlbum = "Album";
    options.cdTextArtist = "Artist";
    const DiscTable table = ReadImage(test::WriteDiscImage(dir.Path(), "t", specs, options).cuePath);
    cddb::CDDiscInfo record;
    ASSERT_TRUE(RecordFromCdText(table, record));
    EXPECT_EQ(record.artist, "Artist");
    EXPECT_EQ(record.album, "Album");
    EXPECT_EQ(record.trackCount, 3);
    EXPECT_EQ(record.Title(2), "Song 3");
    EXPECT_FALSE(RecordFromCdText(ReadImage(test::WriteDiscImage(dir.Path(), "u", specs).cuePath), record));
    EXPECT_FALSE(CdTextBeforeLocalRecord(0));
    EXPECT_FALSE(CdTextBeforeLocalRecord(1));
    EXPECT_FALSE(CdTextBeforeLocalRecord(2));
    EXPECT_TRUE(CdTextBeforeLocalRecord(3)) << "Remote, then CD-Text, then Local";
    EXPECT_TRUE(CdTextBeforeLocalRecord(4));
}

}  // namespace
}  // namespace ac
