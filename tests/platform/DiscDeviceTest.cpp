// Tables of contents read through libcdio from disc images made at test time (BIN/CUE and cdrdao
// TOC over the same .bin), broken images, the tray and lock refused on images, and the drive list
// of a machine without an optical drive.

#include "platform/DiscDevice.h"

#include "../support/DiscImages.h"
#include "../support/TempDir.h"

#include <gtest/gtest.h>

#include <chrono>
#include <filesystem>
#include <fstream>

namespace ac::platform {
namespace {

namespace fs = std::filesystem;
using test::DiscImage;
using test::TrackSpec;

bool MachineHasOpticalDrive() {
    for (const char* path : {"/dev/sr0", "/dev/sr1", "/dev/cdrom", "/dev/dvd"}) {
        if (fs::exists(path)) {
            return true;
        }
    }
    return false;
}

void ExpectTableOf(const DiscImage& image, const DiscTable& table) {
    ASSERT_EQ(table.tracks.size(), image.tracks.size());
    EXPECT_EQ(table.firstTrack, 1);
    EXPECT_EQ(table.lastTrack, static_cast<int>(image.tracks.size()));
    for (size_t i = 0; i < image.tracks.size(); ++i) {
        SCOPED_TRACE("track " + std::to_string(i + 1));
        EXPECT_EQ(table.tracks[i].number, image.tracks[i].number);
        EXPECT_EQ(table.tracks[i].lba, image.tracks[i].StartLba());
        EXPECT_EQ(table.tracks[i].isData, image.tracks[i].data);
    }
    EXPECT_EQ(table.leadOutLba, image.LeadOutLba());
}

struct Layout {
    const char* name;
    std::vector<TrackSpec> specs;
};

std::vector<Layout> Layouts() {
    std::vector<TrackSpec> dataAtEnd = test::ThreeTrackSpecs(0);
    dataAtEnd.back() = TrackSpec{0, 150, true, 300};
    return {
        {"NoGaps", test::ThreeTrackSpecs(0)},
        {"Gaps", test::ThreeTrackSpecs(150)},
        {"OddGaps", test::ThreeTrackSpecs(33)},
        {"DataTrackAtEnd", dataAtEnd},
        {"SingleTrack", {TrackSpec{44100 * 3 + 5, 0, false, 0, 500.0, 7}}},
        {"NinetyNineTracks", test::ManyTrackSpecs(99)},
    };
}

enum class Form { Cue, TocPregap, TocStart };

class ImageTableTest : public ::testing::TestWithParam<std::tuple<size_t, Form>> {};

// The toc forms name the .bin relative to the .toc while the test runs elsewhere, and the START
// form puts a gap inside the last track's FILE: both are read as the cue is.
TEST_P(ImageTableTest, TableMatchesTheLayoutWritten) {
    const auto [index, form] = GetParam();
    const Layout layout = Layouts()[index];
    test::TempDir dir;
    test::ImageOptions options;
    options.writeToc = form != Form::Cue;
    options.tocGaps = form == Form::TocStart ? test::TocGaps::Start : test::TocGaps::Pregap;
    const DiscImage image = test::WriteDiscImage(dir.Path(), "disc", layout.specs, options);
    ASSERT_NE(fs::current_path(), fs::path(dir.Path()));

    const auto device = MakeDiscDevice();
    DiscTable table;
    ASSERT_TRUE(device->ReadToc(form == Form::Cue ? image.cuePath : image.tocPath, table));
    ExpectTableOf(image, table);
}

INSTANTIATE_TEST_SUITE_P(Images, ImageTableTest,
                         ::testing::Combine(::testing::Range<size_t>(0, Layouts().size()),
                                            ::testing::Values(Form::Cue, Form::TocPregap,
                                                              Form::TocStart)),
                         [](const auto& info) {
                             const Form form = std::get<1>(info.param);
                             return std::string(Layouts()[std::get<0>(info.param)].name) +
                                    (form == Form::Cue         ? "Cue"
                                     : form == Form::TocPregap ? "TocPregap"
                                                               : "TocStart");
                         });

TEST(DiscDeviceTest, NinetyNineTrackTableReadsFast) {
    test::TempDir dir;
    const DiscImage image = test::WriteDiscImage(dir.Path(), "many", test::ManyTrackSpecs(99));
    const auto device = MakeDiscDevice();
    DiscTable table;
    ASSERT_TRUE(device->ReadToc(image.cuePath, table));  // warm: the first call starts libcdio
    const auto start = std::chrono::steady_clock::now();
    constexpr int kReads = 10;
    for (int i = 0; i < kReads; ++i) {
        ASSERT_TRUE(device->ReadToc(image.cuePath, table));
    }
    const auto each = (std::chrono::steady_clock::now() - start) / kReads;
    RecordProperty(
        "microseconds_per_read",
        static_cast<int>(std::chrono::duration_cast<std::chrono::microseconds>(each).count()));
    EXPECT_LT(each, std::chrono::milliseconds(200));
}

// A real one-track image of the corpus: 710304 bytes are 302 sectors, so the lead-out is at 452.
TEST(DiscDeviceTest, CorpusOneTrackImage) {
    const auto device = MakeDiscDevice();
    DiscTable table;
    ASSERT_TRUE(device->ReadToc(AC_CORPUS_DIR "/discimg/libcdio_cdda.cue", table));
    ASSERT_EQ(table.tracks.size(), 1u);
    EXPECT_EQ(table.tracks[0].lba, 150);
    EXPECT_EQ(table.leadOutLba, 452);
}

// Whatever is wrong with an image, the answer is false and an empty table, never a crash and
// never a table that no disc could have.
TEST(DiscDeviceTest, BrokenImagesAreNoDisc) {
    test::TempDir dir;
    const auto device = MakeDiscDevice();
    auto expectNoDisc = [&](const std::string& drive) {
        SCOPED_TRACE(drive);
        DiscTable table;
        table.firstTrack = 9;
        table.tracks.resize(3);
        EXPECT_FALSE(device->ReadToc(drive, table));
        EXPECT_EQ(table.firstTrack, 0);
        EXPECT_TRUE(table.tracks.empty());
    };

    const DiscImage missing = test::WriteDiscImage(dir.Path(), "missing", test::ThreeTrackSpecs());
    fs::remove(missing.binPath);
    expectNoDisc(missing.cuePath);

    // Ends before track 3 starts: libcdio itself reports a lead-out before the last track.
    const DiscImage shortBin = test::WriteDiscImage(dir.Path(), "short", test::ThreeTrackSpecs());
    fs::resize_file(shortBin.binPath, 100 * test::kSectorBytes);
    expectNoDisc(shortBin.cuePath);

    test::WriteFile(dir / "junk.cue", "This is no cue sheet.\n");
    test::WriteFile(dir / "junk.bin", std::string(10 * test::kSectorBytes, '\0'));
    expectNoDisc(dir / "junk.cue");

    test::WriteFile(dir / "notracks.cue", "FILE \"notracks.bin\" BINARY\n");
    test::WriteFile(dir / "notracks.bin", std::string(10 * test::kSectorBytes, '\0'));
    expectNoDisc(dir / "notracks.cue");  // libcdio would keep a string of it for ever

    test::WriteFile(dir / "large.cue", "");
    fs::resize_file(dir / "large.cue", 4u << 20);
    expectNoDisc(dir / "large.cue");

    // A toc of only SILENCE: libcdio places its track before the disc's start.
    expectNoDisc(AC_CORPUS_DIR "/discimg/libcdio_cdtext.toc");
    // Real tocs libcdio cannot read right: one it refuses (CD-Text with SIZE_INFO), and one whose
    // data track in a file of its own it places at sector 3279 after audio up to 207106.
    for (const char* name : {"whipper_breeders", "whipper_ladyhawke"}) {
        fs::copy_file(std::string(AC_CORPUS_DIR "/discimg/") + name + ".toc",
                      dir / (std::string(name) + ".toc"));
    }
    for (const char* data : {"data.wav", "data_13"}) {
        std::ofstream(dir / data).close();
        fs::resize_file(dir / data, 600u << 20);  // sparse: only the sizes matter
    }
    expectNoDisc(dir / "whipper_breeders.toc");
    expectNoDisc(dir / "whipper_ladyhawke.toc");

    expectNoDisc(dir / "nothing-here.cue");
    expectNoDisc("/dev/ac-test-no-such-drive");
}

// A .bin cut inside the last track is still a disc, one whose last track is shorter.
// CD-Text of a cue sheet (TITLE and PERFORMER) comes with the table, and a disc without any
// has none.
TEST(DiscDeviceTest, CdTextOfACueSheetComesWithTheTable) {
    test::TempDir dir;
    test::ImageOptions options;
    options.cdTextAlbum = "Harbour Lights";
    options.cdTextArtist = "The Night Train Trio";
    const test::DiscImage image = test::WriteDiscImage(dir.Path(), "texts", test::ThreeTrackSpecs(150), options);
    const auto device = MakeDiscDevice();
    DiscTable table;
    ASSERT_TRUE(device->ReadToc(image.cuePath, table));
    EXPECT_EQ(table.cdTextAlbum, "Harbour Lights");
    EXPECT_EQ(table.cdTextArtist, "The Night Train Trio");
    EXPECT_EQ(table.cdTextTitles, (std::vector<std::string>{"Song 1", "Song 2", "Song 3"}));
    EXPECT_TRUE(table.HasCdText());

    const test::DiscImage plain = test::WriteDiscImage(dir.Path(), "plain", test::ThreeTrackSpecs(150));
    ASSERT_TRUE(device->ReadToc(plain.cuePath, table));
    EXPECT_FALSE(table.HasCdText());
}

TEST(DiscDeviceTest, BinCutInsideTheLastTrackShortensIt) {
    test::TempDir dir;
    const DiscImage image = test::WriteDiscImage(dir.Path(), "cut", test::ThreeTrackSpecs());
    fs::resize_file(image.binPath, (image.tracks[2].startLsn + 100) * test::kSectorBytes + 1000);
    DiscTable table;
    ASSERT_TRUE(MakeDiscDevice()->ReadToc(image.cuePath, table));
    EXPECT_EQ(table.tracks.size(), 3u);
    EXPECT_EQ(table.leadOutLba, image.tracks[2].StartLba() + 100);
}

// libcdio frees an image inside its eject call and then leaves the handle to be freed again:
// the tray and lock must never reach an image. Run under AddressSanitizer to see it.
TEST(DiscDeviceTest, TrayAndLockOnImagesAreRefusedAndHarmless) {
    test::TempDir dir;
    test::ImageOptions options;
    options.writeToc = true;
    const DiscImage image =
        test::WriteDiscImage(dir.Path(), "disc", test::ThreeTrackSpecs(), options);
    const auto device = MakeDiscDevice();
    for (const std::string& drive : {image.cuePath, image.tocPath, image.binPath}) {
        SCOPED_TRACE(drive);
        EXPECT_TRUE(device->IsImage(drive));
        EXPECT_FALSE(device->LockTray(drive, true));
        EXPECT_FALSE(device->LockTray(drive, false));
        EXPECT_FALSE(device->SetTrayOpen(drive, true));
        EXPECT_FALSE(device->SetTrayOpen(drive, false));
        DiscTable table;
        EXPECT_TRUE(device->ReadToc(drive, table));
        EXPECT_EQ(table.tracks.size(), 3u);
    }
    // An image under any name is still a file, not a drive with a tray.
    fs::copy_file(image.binPath, dir / "disc.img");
    EXPECT_TRUE(device->IsImage(dir / "disc.img"));
    EXPECT_FALSE(device->SetTrayOpen(dir / "disc.img", true));
    EXPECT_FALSE(device->IsImage("/dev/sr0"));
    EXPECT_FALSE(device->SetTrayOpen("/dev/ac-test-no-such-drive", true));
    EXPECT_FALSE(device->LockTray("/dev/ac-test-no-such-drive", true));
}

TEST(DiscDeviceTest, DrivesAreTheDevicesThenTheImagesThatExist) {
    test::TempDir dir;
    const DiscImage a = test::WriteDiscImage(dir.Path(), "a", test::ThreeTrackSpecs());
    test::ImageOptions options;
    options.writeToc = true;
    const DiscImage b = test::WriteDiscImage(dir.Path(), "b", test::ThreeTrackSpecs(), options);
    const std::vector<std::string> images =
        SplitImageList(" " + a.cuePath + " ;" + dir / "gone.cue" + ";;" + b.tocPath + ";");
    ASSERT_EQ(images.size(), 3u);
    EXPECT_EQ(JoinImageList(images), a.cuePath + ";" + dir / "gone.cue" + ";" + b.tocPath);

    const std::vector<std::string> drives = MakeDiscDevice()->ListDrives(images);
    const std::vector<std::string> expected{a.cuePath, b.tocPath};
    if (MachineHasOpticalDrive()) {
        ASSERT_GE(drives.size(), 2u);
        EXPECT_EQ(std::vector<std::string>(drives.end() - 2, drives.end()), expected);
    } else {
        EXPECT_EQ(drives, expected);
        EXPECT_TRUE(MakeDiscDevice()->ListDrives({}).empty());
    }
    EXPECT_TRUE(SplitImageList(" ; \t;").empty());
}

}  // namespace
}  // namespace ac::platform
