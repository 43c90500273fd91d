// The burn mode end to end in the real program: three generated tracks go through the real
// panel and the real ctt onto the image recorder, and the .cue is read back through libcdio
// sample for sample, gaps included; an MP3 data disc is read back through libisofs; the refused
// file window and the tally follow the list. Runs under xvfb-run.

#include "../support/AudioFixtures.h"
#include "../support/ProgramHarness.h"

#include <gtest/gtest.h>

#include <cdio/cdio.h>
#include <cdio/logging.h>
#include <cstdint>
#include <libisofs/libisofs.h>

#include <cstdlib>
#include <filesystem>
#include <sstream>

namespace {

using namespace std::chrono_literals;
using ac::test::Program;
using ac::test::State;
namespace fs = std::filesystem;

std::string Field(const State& state, const std::string& key) {
    auto found = state.find(key);
    return found == state.end() ? std::string() : found->second;
}

// Number, name, duration, type, status, selected, source.
std::string RowField(const State& state, int row, std::size_t field) {
    std::istringstream in(Field(state, "burnrow" + std::to_string(row)));
    std::string text;
    for (std::size_t i = 0; std::getline(in, text, '\t'); ++i)
        if (i == field)
            return text;
    return {};
}

class BurnWindowTest : public ::testing::Test {
protected:
    void SetUp() override {
        cdio_loglevel_default = CDIO_LOG_ERROR;
        ::setenv("AC_NO_RECORDER_SCAN", "1", 1);
        fs::create_directories(home / "out");
        fs::create_directories(home / "tracks");
        const size_t frames[] = {44100 * 2 + 311, 44100 + 5, 3 * 588};
        for (int i = 0; i < 3; ++i) {
            pcm.push_back(ac::test::MakeNoise(frames[i], 21 + i));
            tracks.push_back(home / ("tracks/song" + std::to_string(i + 1) + ".wav"));
            ac::test::WriteWav(tracks.back(), pcm.back());
        }
    }
    void TearDown() override { ::unsetenv("AC_NO_RECORDER_SCAN"); }

    void WriteSettings(int copies) {
        ac::test::WriteSettings(home,
                                "last_run_function=dword:2\nburntemp=sz:" + (home / "burntemp") +
                                    "\nburnimage=sz:" + (home / "out/disc") +
                                    "\nburncopies=dword:" + std::to_string(copies) +
                                    "\nafterconvert=dword:4\nmax_running_processes=dword:2\n");
    }

    // Adds the three tracks once the burn list has its profile.
    State AddTracks(Program& program) {
        program.WaitFor([](const State& s) {
            return Field(s, "burnrecorders") == "1" &&
                   Field(s, "profile").find("WAV") != std::string::npos;
        });
        for (const std::string& track : tracks)
            program.Send("burnadd " + track);
        return program.WaitFor([](const State& s) { return s.count("burnrow2") > 0; });
    }

    bool TemporaryFolderEmpty() {
        std::error_code error;
        return !fs::exists(home / "burntemp", error) || fs::is_empty(home / "burntemp", error);
    }

    ac::test::TempDir home;
    std::vector<ac::test::Pcm> pcm;
    std::vector<std::string> tracks;
};

TEST_F(BurnWindowTest, ThreeTracksBurnToTwoAudioImagesThatReadBackSampleForSample) {
    WriteSettings(2);
    Program program(home);
    State state = AddTracks(program);
    ASSERT_EQ(RowField(state, 0, 0), "01");
    EXPECT_EQ(RowField(state, 2, 1), "song3");
    EXPECT_EQ(RowField(state, 0, 3), "wav");
    // 2 + 1 + 0 seconds and a gap of two seconds after each.
    EXPECT_EQ(Field(state, "burntally"), "0:9");

    // The same name again is refused into the message window; the list stays.
    program.Send("burnadd " + tracks[0]);
    state = program.WaitFor([](const State& s) {
        return Field(s, "refused").find("has been added") != std::string::npos;
    });
    EXPECT_NE(Field(state, "refused").find("song1"), std::string::npos) << Field(state, "refused");
    EXPECT_EQ(state.count("burnrow3"), 0u);

    program.Send("command 33136");
    state = program.WaitFor([](const State& s) { return Field(s, "burnactive") == "1"; }, 10s);
    state = program.WaitFor([](const State& s) { return Field(s, "burnactive") == "0"; }, 120s);
    ASSERT_EQ(Field(state, "burnactive"), "0");
    EXPECT_EQ(RowField(state, 0, 4), "Completed") << Field(state, "boxes");
    ASSERT_TRUE(fs::exists(home / "out/disc.cue"))
        << Field(state, "boxes") << Field(state, "statustext");
    ASSERT_TRUE(fs::exists(home / "out/disc-2.cue"));
    EXPECT_NE(Field(state, "boxes").find("Burning successful"), std::string::npos)
        << Field(state, "boxes");
    EXPECT_TRUE(TemporaryFolderEmpty());

    for (const char* cue : {"out/disc.cue", "out/disc-2.cue"}) {
        CdIo_t* cd = cdio_open((home / cue).c_str(), DRIVER_BINCUE);
        ASSERT_NE(cd, nullptr) << cue;
        ASSERT_EQ(cdio_get_num_tracks(cd), 3);
        for (int t = 1; t <= 3; ++t) {
            const int lsn = cdio_get_track_lsn(cd, t);
            if (t > 1) {
                // The side bar's interval stands as silence before the track.
                const int gapStart = cdio_get_track_pregap_lsn(cd, t);
                if (gapStart >= 0 && gapStart < lsn) {
                    std::vector<std::int16_t> gap(static_cast<size_t>(lsn - gapStart) * 2352 / 2,
                                                  1);
                    ASSERT_EQ(cdio_read_audio_sectors(cd, gap.data(), gapStart, lsn - gapStart),
                              DRIVER_OP_SUCCESS);
                    EXPECT_TRUE(
                        std::all_of(gap.begin(), gap.end(), [](std::int16_t s) { return s == 0; }));
                }
            }
            const auto& source = pcm[std::size_t(t - 1)].samples;
            const int sectors = static_cast<int>((source.size() * 2 + 2351) / 2352);
            std::vector<std::int16_t> read(static_cast<size_t>(sectors) * 2352 / 2);
            ASSERT_EQ(cdio_read_audio_sectors(cd, read.data(), lsn, sectors), DRIVER_OP_SUCCESS);
            EXPECT_TRUE(std::equal(source.begin(), source.end(), read.begin()))
                << cue << " track " << t;
        }
        cdio_destroy(cd);
    }
}

TEST_F(BurnWindowTest, MpThreeDiscIsAnIsoWithTheConvertedFiles) {
    WriteSettings(1);
    Program program(home);
    program.WaitFor([](const State& s) {
        return Field(s, "burnrecorders") == "1" &&
               Field(s, "profile").find("WAV") != std::string::npos;
    });
    program.Send("disctype 1");
    program.WaitFor(
        [](const State& s) { return Field(s, "profile").find("MP3") != std::string::npos; });
    for (const std::string& track : tracks)
        program.Send("burnadd " + track);
    State state = program.WaitFor([](const State& s) { return s.count("burnrow2") > 0; });
    program.Send("command 33136");
    program.WaitFor([](const State& s) { return Field(s, "burnactive") == "1"; }, 10s);
    state = program.WaitFor([](const State& s) { return Field(s, "burnactive") == "0"; }, 120s);
    ASSERT_TRUE(fs::exists(home / "out/disc.iso"))
        << Field(state, "boxes") << Field(state, "statustext");
    EXPECT_TRUE(TemporaryFolderEmpty());

    iso_init();
    IsoDataSource* source = nullptr;
    ASSERT_EQ(iso_data_source_new_from_file((home / "out/disc.iso").c_str(), &source), 1);
    IsoReadOpts* options = nullptr;
    iso_read_opts_new(&options, 0);
    iso_read_opts_set_no_rockridge(options, 1);
    iso_read_opts_set_preferjoliet(options, 1);
    IsoImage* image = nullptr;
    iso_image_new("check", &image);
    ASSERT_GE(iso_image_import(image, source, options, nullptr), 0);
    for (const char* name : {"/song1.mp3", "/song2.mp3", "/song3.mp3"}) {
        IsoNode* node = nullptr;
        ASSERT_EQ(iso_tree_path_to_node(image, name, &node), 1) << name;
        EXPECT_GT(iso_stream_get_size(iso_file_get_stream(reinterpret_cast<IsoFile*>(node))), 100)
            << name;
    }
    iso_image_unref(image);
    iso_read_opts_free(options);
    iso_data_source_unref(source);
}

}  // namespace
