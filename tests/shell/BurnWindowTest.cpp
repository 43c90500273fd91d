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
#include <fstream>
#include <iterator>
#include <sstream>
#include <thread>

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

namespace {

std::string ReadText(const std::string& path) {
    std::ifstream in(path);
    return std::string((std::istreambuf_iterator<char>(in)), {});
}

TEST_F(BurnWindowTest, ListRulesMovesRemovalAndRefusedNames) {
    WriteSettings(1);
    Program program(home);
    State state = program.WaitFor(
        [](const State& s) { return Field(s, "profile").find("WAV") != std::string::npos; });
    // An empty list: only Add.
    EXPECT_EQ(Field(state, "burnenabled"), "1000000");
    EXPECT_EQ(Field(state, "gauge"), "75|80|90") << "the audio disc's scale from the start";
    // The convert and rip modes have a plain bar; a disc edited behind them leaves it so.
    program.Send("tab 0");
    state = program.WaitFor([](const State& s) { return Field(s, "gauge") == "0|0|0"; });
    program.Send("tab 2");
    state = program.WaitFor([](const State& s) { return Field(s, "gauge") == "75|80|90"; });
    state = AddTracks(program);
    // A name of 104 characters is taken, one of 105 refused.
    const std::string longer = home / ("tracks/" + std::string(105, 'n') + ".wav");
    const std::string fits = home / ("tracks/" + std::string(104, 'm') + ".wav");
    fs::copy_file(tracks[0], longer);
    fs::copy_file(tracks[0], fits);
    program.Send("burnadd " + longer);
    program.Send("burnadd " + fits);
    state = program.WaitFor([](const State& s) {
        return s.count("burnrow3") > 0 && Field(s, "refused").find("too long") != std::string::npos;
    });
    EXPECT_EQ(state.count("burnrow4"), 0u);
    EXPECT_EQ(RowField(state, 3, 1), std::string(104, 'm'));

    // Rows 0 and 2 selected: the button is off (row 0 cannot go up), yet Move up from the menu
    // moves only row 2, and the numbers run on.
    program.Send("burnselect 0 2");
    state = program.WaitFor([](const State& s) { return RowField(s, 2, 5) == "1"; });
    EXPECT_EQ(Field(state, "burnenabled"), "1111001");
    program.Send("command 1187");
    state = program.WaitFor([](const State& s) { return RowField(s, 1, 1) == "song3"; });
    EXPECT_EQ(RowField(state, 0, 1), "song1");
    EXPECT_EQ(RowField(state, 2, 1), "song2");
    EXPECT_EQ(RowField(state, 2, 0), "03");
    EXPECT_EQ(Field(state, "burnenabled"), "1111001") << "row 0 is selected: no Move up";

    // Removing the track of 2 seconds takes it and its gap off the tally (2, 1, 0 and 2 seconds
    // and four gaps before).
    const std::string before = Field(state, "burntally");
    program.Send("burnselect 0");
    program.Send("command 32772");
    state = program.WaitFor(
        [](const State& s) { return s.count("burnrow3") == 0 && RowField(s, 0, 1) == "song3"; });
    EXPECT_EQ(before, "0:13");
    EXPECT_EQ(Field(state, "burntally"), "0:9");
    EXPECT_EQ(RowField(state, 0, 0), "01");
    program.Send("command 32773");
    state = program.WaitFor([](const State& s) { return s.count("burnrow0") == 0; });
    EXPECT_EQ(Field(state, "burntally"), "0:0");
}

class ScriptedDiscTest : public BurnWindowTest {
protected:
    void SetUp() override {
        BurnWindowTest::SetUp();
        ::setenv("AC_FAKE_RECORDER", (home / "fake.ini").c_str(), 1);
    }
    void TearDown() override {
        ::unsetenv("AC_FAKE_RECORDER");
        BurnWindowTest::TearDown();
    }
    void Disc(const std::string& lines) { std::ofstream(home / "fake.ini") << lines; }
    std::string RecorderLog() { return ReadText(home / "fake.ini.log"); }
};

TEST_F(ScriptedDiscTest, WaitingDialogOpensTheTrayAndEndsWhenABlankDiscComes) {
    WriteSettings(1);
    Disc("media=8\nstate=2\nfree=300000\n");
    Program program(home);
    program.WaitFor([](const State& s) {
        return Field(s, "burnrecorders") == "2" &&
               Field(s, "profile").find("WAV") != std::string::npos;
    });
    program.Send("burnadd " + tracks[0]);
    program.WaitFor([](const State& s) { return s.count("burnrow0") > 0; });
    program.Send("command 33136");
    State state = program.WaitFor([](const State& s) { return s.count("waitingdisc") > 0; });
    // Title, message of code -90, disc type, free space, data size, Ignore shown.
    const std::string dialog = Field(state, "waitingdisc");
    EXPECT_EQ(dialog.rfind("[fake0] Unknown:Waiting for disc|This disc is not writable.", 0), 0u)
        << dialog;
    EXPECT_NE(dialog.find("|CD-ROM|585.94 MB|"), std::string::npos) << dialog;
    EXPECT_TRUE(dialog.ends_with("|1"));
    for (int i = 0; i < 50 && RecorderLog().find("eject") == std::string::npos; ++i)
        std::this_thread::sleep_for(100ms);
    EXPECT_NE(RecorderLog().find("eject"), std::string::npos) << "the tray opens first";

    // A blank CD-R goes in: the next check ends the dialog and the run writes.
    Disc("media=9\nstate=0\nfree=300000\nname=FAKE RW\n");
    program.Send("waitcheck");
    state = program.WaitFor(
        [](const State& s) {
            return s.count("waitingdisc") == 0 && Field(s, "burnactive") == "0" &&
                   Field(s, "boxes").find("Burning successful") != std::string::npos;
        },
        60s);
    EXPECT_TRUE(fs::exists(home / "fake.cue")) << Field(state, "boxes");
    EXPECT_NE(RecorderLog().find("before"), std::string::npos);
}

TEST_F(ScriptedDiscTest, EraseDialogErasesARewritableAndAsksAboutEjecting) {
    WriteSettings(1);
    Disc("media=10\nstate=2\nfree=0\nerasable=1\nerasems=1500\n");
    Program program(home);
    program.WaitFor([](const State& s) { return Field(s, "burnrecorders") == "2"; });
    program.Send("command 33082");
    State state = program.WaitFor([](const State& s) { return s.count("erasedisc") > 0; });
    EXPECT_EQ(Field(state, "erasedisc"), "0|1|0|0");
    program.Send("answer yes");
    program.Send("erase quick");
    state = program.WaitFor([](const State& s) { return Field(s, "erasedisc").ends_with("|1"); });
    state = program.WaitFor([](const State& s) {
        return Field(s, "boxes").find("Erase complete!") != std::string::npos;
    });
    EXPECT_NE(RecorderLog().find("erase quick"), std::string::npos);
    for (int i = 0; i < 20 && RecorderLog().find("eject") == std::string::npos; ++i)
        std::this_thread::sleep_for(100ms);
    EXPECT_NE(RecorderLog().find("eject"), std::string::npos);
    // The dialog stays open for a further erase, its controls enabled again.
    state = program.WaitFor([](const State& s) { return Field(s, "erasedisc") == "0|1|0|0"; });
    program.Send("dialog cancel");
    state = program.WaitFor([](const State& s) { return s.count("erasedisc") == 0; });
    EXPECT_EQ(state.count("erasedisc"), 0u);
}

}  // namespace

namespace {

// A run in its conversion stage refuses the close; Stop ends it with nothing left behind.
TEST_F(BurnWindowTest, CloseIsRefusedDuringARunAndStopLeavesNothing) {
    const std::string tool = home / "slow-ctt";
    std::ofstream(tool) << "#!/bin/sh\necho '|Time>>> 1'\nexec sleep 60\n";
    fs::permissions(tool, fs::perms::owner_all);
    ::setenv("AC_CTT_PATH", tool.c_str(), 1);
    WriteSettings(1);
    Program program(home);
    ::unsetenv("AC_CTT_PATH");
    AddTracks(program);
    program.Send("command 33136");
    State state = program.WaitFor([](const State& s) { return RowField(s, 0, 4).ends_with("%"); });
    ASSERT_EQ(Field(state, "burnactive"), "1");
    EXPECT_EQ(Field(state, "tabs").find('+'), std::string::npos)
        << "the tabs are locked: " << Field(state, "tabs");
    EXPECT_EQ(Field(state, "burnenabled"), "0000100");

    program.Send("close");
    state = program.WaitFor([](const State& s) {
        return Field(s, "boxes").find("Please stop burning first!") != std::string::npos;
    });
    EXPECT_TRUE(program.Running());

    program.Send("answer yes");
    program.Send("command 33077");
    // The end of the run reaches the window as posted calls: the tabs come back with them.
    state = program.WaitFor(
        [](const State& s) {
            return Field(s, "burnactive") == "0" && Field(s, "tabs").find('+') != std::string::npos;
        },
        30s);
    EXPECT_NE(Field(state, "boxes").find("Are you sure to stop encoding?"), std::string::npos);
    EXPECT_EQ(RowField(state, 0, 4), "Abort") << Field(state, "burnrow0");
    EXPECT_TRUE(TemporaryFolderEmpty());
    EXPECT_FALSE(fs::exists(home / "out/disc.cue"));
    EXPECT_NE(Field(state, "tabs").find('+'), std::string::npos);
    program.Send("close");
    EXPECT_TRUE(program.WaitForExit());
}

}  // namespace
