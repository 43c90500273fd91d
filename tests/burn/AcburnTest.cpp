// acburn end to end: the built program with the real ctt writing disc images that are read back
// through libcdio and libisofs; usage errors, a stop by signal and a temporary folder that cannot
// be made. Skipped while acburn or ctt is not built.
#include "support/AudioFixtures.h"
#include "support/RunTool.h"
#include "support/TempDir.h"

#include <gtest/gtest.h>

#include <cdio/cdio.h>
#include <cdio/logging.h>
#include <cstdint>
#include <libisofs/libisofs.h>
#include <signal.h>
#include <sys/stat.h>
#include <unistd.h>

#include <chrono>
#include <filesystem>
#include <fstream>
#include <thread>

namespace ac {
namespace {

namespace fs = std::filesystem;

const std::string kAcburn = std::string(AC_BIN_DIR) + "/acburn";
const std::string kCtt = std::string(AC_BIN_DIR) + "/ctt";

bool Contains(const std::string& text, const std::string& part) {
    return text.find(part) != std::string::npos;
}

class AcburnTest : public ::testing::Test {
protected:
    void SetUp() override {
        if (!fs::exists(kAcburn) || !fs::exists(kCtt))
            GTEST_SKIP() << "acburn or ctt not built";
        cdio_loglevel_default = CDIO_LOG_ERROR;
        ::setenv("XDG_CONFIG_HOME", (dir / "config").c_str(), 1);
        ::setenv("XDG_DATA_HOME", (dir / "data").c_str(), 1);
        ::setenv("TMPDIR", (dir / "tmp").c_str(), 1);
        ::setenv("AC_NO_RECORDER_SCAN", "1", 1);
        ::unsetenv("AC_CTT_PATH");
        fs::create_directories(dir / "tmp");
        fs::create_directories(dir / "out");
    }
    void TearDown() override {
        ::unsetenv("AC_CTT_PATH");
        ::unsetenv("TMPDIR");
    }

    std::string Track(const std::string& name, size_t frames, std::uint32_t seed) {
        const std::string path = dir / name;
        pcm.push_back(test::MakeNoise(frames, seed));
        test::WriteWav(path, pcm.back());
        return path;
    }

    bool TemporaryFolderEmpty() {
        std::error_code error;
        const std::string folder = dir / "tmp/audio-converter-burn";
        return !fs::exists(folder, error) || fs::is_empty(folder, error);
    }

    test::TempDir dir;
    std::vector<test::Pcm> pcm;
};

TEST_F(AcburnTest, AudioImageHoldsEveryTrackAndGapSampleForSample) {
    const std::vector<std::string> args = {"--image",
                                           dir / "out/disc",
                                           "--gap",
                                           "1",
                                           Track("a.wav", 44100 + 17, 1),
                                           Track("b.wav", 30000, 2),
                                           Track("c.wav", 2 * 588, 3)};
    const auto result = test::RunTool(kAcburn, args, 120);
    ASSERT_EQ(result.exitCode, 0) << result.err << result.out;
    EXPECT_TRUE(Contains(result.out, dir / "out/disc.cue"));
    EXPECT_TRUE(TemporaryFolderEmpty());

    CdIo_t* cd = cdio_open((dir / "out/disc.cue").c_str(), DRIVER_BINCUE);
    ASSERT_NE(cd, nullptr);
    ASSERT_EQ(cdio_get_num_tracks(cd), 3);
    int lsn = 0;
    for (int t = 1; t <= 3; ++t) {
        if (t > 1) {
            EXPECT_EQ(cdio_get_track_pregap_lsn(cd, t), lsn);
            std::vector<std::int16_t> gap(75 * 2352 / 2, 1);
            ASSERT_EQ(cdio_read_audio_sectors(cd, gap.data(), lsn, 75), DRIVER_OP_SUCCESS);
            EXPECT_TRUE(std::all_of(gap.begin(), gap.end(), [](std::int16_t s) { return s == 0; }));
            lsn += 75;
        }
        ASSERT_EQ(cdio_get_track_lsn(cd, t), lsn);
        const auto& source = pcm[t - 1].samples;
        const int sectors = static_cast<int>((source.size() * 2 + 2351) / 2352);
        std::vector<std::int16_t> read(static_cast<size_t>(sectors) * 2352 / 2);
        ASSERT_EQ(cdio_read_audio_sectors(cd, read.data(), lsn, sectors), DRIVER_OP_SUCCESS);
        EXPECT_TRUE(std::equal(source.begin(), source.end(), read.begin())) << "track " << t;
        lsn += sectors;
    }
    cdio_destroy(cd);
}

TEST_F(AcburnTest, MpThreeDataImageWithTwoCopies) {
    const auto result = test::RunTool(
        kAcburn,
        {"--type", "mp3", "--copies", "2", "--label", "Road Trip", "--image", dir / "out/data.iso",
         Track("first song.wav", 44100, 4), Track("second.wav", 22050, 5)},
        120);
    ASSERT_EQ(result.exitCode, 0) << result.err << result.out;
    ASSERT_TRUE(fs::exists(dir / "out/data.iso"));
    ASSERT_TRUE(fs::exists(dir / "out/data-2.iso"));
    EXPECT_TRUE(TemporaryFolderEmpty());

    iso_init();
    IsoDataSource* source = nullptr;
    ASSERT_EQ(iso_data_source_new_from_file((dir / "out/data-2.iso").c_str(), &source), 1);
    IsoReadOpts* options = nullptr;
    iso_read_opts_new(&options, 0);
    iso_read_opts_set_no_rockridge(options, 1);
    iso_read_opts_set_preferjoliet(options, 1);
    IsoImage* image = nullptr;
    iso_image_new("check", &image);
    ASSERT_GE(iso_image_import(image, source, options, nullptr), 0);
    EXPECT_EQ(std::string(iso_image_get_volume_id(image)), "ROAD_TRIP");
    for (const char* name : {"/first song.mp3", "/second.mp3"}) {
        IsoNode* node = nullptr;
        ASSERT_EQ(iso_tree_path_to_node(image, name, &node), 1) << name;
        IsoStream* stream = iso_file_get_stream(reinterpret_cast<IsoFile*>(node));
        char head[3] = {};
        ASSERT_GE(iso_stream_open(stream), 0);
        EXPECT_EQ(iso_stream_read(stream, head, 3), 3);
        iso_stream_close(stream);
        // An MPEG audio frame's sync word: the disc holds MP3 files, not the WAVs of the list.
        EXPECT_EQ(static_cast<unsigned char>(head[0]), 0xFF) << name;
        EXPECT_EQ(static_cast<unsigned char>(head[1]) & 0xE0, 0xE0) << name;
        EXPECT_GT(iso_stream_get_size(stream), 1000) << name;
    }
    iso_image_unref(image);
    iso_read_opts_free(options);
    iso_data_source_unref(source);
}

TEST_F(AcburnTest, UsageErrorsAndBadInputSayWhyAndWriteNothing) {
    const std::string track = Track("a.wav", 1000, 1);
    for (const std::vector<std::string>& args :
         {std::vector<std::string>{},
          {"--copies", "0", track},
          {"--type", "flac", track},
          {"--recorder", "/dev/sr0", "--image", dir / "out/x", track},
          {"--gap", "x", track}}) {
        const auto result = test::RunTool(kAcburn, args);
        EXPECT_EQ(result.exitCode, 2) << args.size();
        EXPECT_TRUE(Contains(result.err, "usage: acburn"));
    }
    auto result = test::RunTool(kAcburn, {"--image", dir / "missing/disc", track});
    EXPECT_EQ(result.exitCode, 2);
    EXPECT_TRUE(Contains(result.err, "does not exist")) << result.err;

    test::WriteFile(dir / "text.wav", "not audio at all");
    result = test::RunTool(kAcburn, {"--image", dir / "out/disc", dir / "text.wav"});
    EXPECT_EQ(result.exitCode, 2);
    EXPECT_TRUE(Contains(result.err, "text.wav")) << result.err;

    result = test::RunTool(kAcburn, {"--image", dir / "out/disc", dir / "nowhere.wav"});
    EXPECT_EQ(result.exitCode, 2);
    EXPECT_TRUE(Contains(result.err, "no such file"));
    EXPECT_TRUE(fs::is_empty(dir / "out"));
}

TEST_F(AcburnTest, HundredTracksAreMoreThanAnAudioDiscHolds) {
    std::vector<std::string> args = {"--image", dir / "out/disc"};
    const std::string track = Track("one.wav", 588, 1);
    for (int i = 0; i < 100; ++i) {
        const std::string copy = dir / ("t" + std::to_string(i) + ".wav");
        fs::copy_file(track, copy);
        args.push_back(copy);
    }
    const auto result = test::RunTool(kAcburn, args, 120);
    EXPECT_EQ(result.exitCode, 2);
    EXPECT_TRUE(Contains(result.err, "at most 99 tracks")) << result.err;
}

TEST_F(AcburnTest, TemporaryFolderThatCannotBeMadeIsToldBeforeAnyConversion) {
    test::WriteFile(dir / "blocker", "a file where the folder should go");
    ::setenv("TMPDIR", (dir / "blocker").c_str(), 1);
    const auto result =
        test::RunTool(kAcburn, {"--image", dir / "out/disc", Track("a.wav", 1000, 1)});
    EXPECT_EQ(result.exitCode, 1);
    EXPECT_TRUE(Contains(result.out, "Create the temporary folder failed"))
        << result.out << result.err;
    EXPECT_TRUE(fs::is_empty(dir / "out"));
}

TEST_F(AcburnTest, CtrlCDuringConversionEndsWithNothingLeft) {
    // A tool that never finishes its file.
    const std::string tool = dir / "slow-ctt";
    std::ofstream(tool) << "#!/bin/sh\necho '|Time>>> 1'\nexec sleep 60\n";
    ::chmod(tool.c_str(), 0755);
    ::setenv("AC_CTT_PATH", tool.c_str(), 1);
    const std::string track = Track("a.wav", 1000, 1);
    const std::string log = dir / "log";
    pid_t pid = ::fork();
    if (pid == 0) {
        const int out = ::open(log.c_str(), O_WRONLY | O_CREAT | O_TRUNC, 0644);
        ::dup2(out, 1);
        ::dup2(out, 2);
        ::execl(kAcburn.c_str(), kAcburn.c_str(), "--image", (dir / "out/disc").c_str(),
                track.c_str(), static_cast<char*>(nullptr));
        ::_exit(127);
    }
    // Wait until the tool runs, then stop as a terminal would.
    for (int i = 0; i < 100 && TemporaryFolderEmpty(); ++i)
        std::this_thread::sleep_for(std::chrono::milliseconds(50));
    std::this_thread::sleep_for(std::chrono::milliseconds(300));
    ::kill(pid, SIGINT);
    int status = 0;
    ::waitpid(pid, &status, 0);
    ASSERT_TRUE(WIFEXITED(status));
    EXPECT_EQ(WEXITSTATUS(status), 130) << test::ReadFile(log);
    EXPECT_TRUE(TemporaryFolderEmpty());
    EXPECT_TRUE(fs::is_empty(dir / "out"));
}

}  // namespace
}  // namespace ac
