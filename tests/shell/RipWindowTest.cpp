// The rip mode end to end in the real program: a disc image made at test time stands in for a
// CD, the tab finds it by itself, names come from a local disc record, and the real ctt rips the
// checked tracks, whose audio must equal the image's samples exactly. Runs under xvfb-run.

#include "../support/DiscImages.h"
#include "../support/ProgramHarness.h"
#include "../support/RunTool.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <fstream>
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

// Name, track, duration, target, status text, checked, selected, source.
std::vector<std::string> RipRow(const State& state, int row) {
    std::vector<std::string> fields;
    std::istringstream in(Field(state, "riprow" + std::to_string(row)));
    for (std::string field; std::getline(in, field, '\t');) fields.push_back(field);
    return fields;
}

std::string RowField(const State& state, int row, std::size_t field) {
    const auto fields = RipRow(state, row);
    return field < fields.size() ? fields[field] : std::string();
}

// The samples of an audio file as ffmpeg decodes them, 16-bit stereo at 44.1 kHz.
std::vector<std::int16_t> Decode(const std::string& path) {
    const ac::test::ToolResult decoded = ac::test::RunTool(
        "/usr/bin/ffmpeg", {"-v", "error", "-i", path, "-f", "s16le", "-acodec", "pcm_s16le", "-"});
    std::vector<std::int16_t> samples(decoded.out.size() / 2);
    std::memcpy(samples.data(), decoded.out.data(), samples.size() * 2);
    return samples;
}

std::string Metadata(const std::string& path) {
    return ac::test::RunTool("/usr/bin/ffmpeg", {"-v", "error", "-i", path, "-f", "ffmetadata", "-"}).out;
}

int ProfileIndex(const State& state, const std::string& word) {
    std::istringstream in(Field(state, "profiles_list"));
    std::string name;
    std::getline(in, name, '|');  // the list starts with its separator
    for (int index = 0; std::getline(in, name, '|'); ++index) {
        if (name.find(word) != std::string::npos) return index;
    }
    return -1;
}

class RipWindowTest : public ::testing::Test {
protected:
    void SetUp() override {
        out = home / "Music";
        fs::create_directories(out);
        fs::create_directories(home / "cddb");
        // Tracks of odd lengths with a gap before the second, and a data track behind them: the
        // data track gets no row and the last audio track stops where it starts.
        std::vector<ac::test::TrackSpec> specs = ac::test::ThreeTrackSpecs(150);
        ac::test::TrackSpec data;
        data.data = true;
        data.dataSectors = 300;
        specs.push_back(data);
        image = ac::test::WriteDiscImage(home / "images", "disc", specs, {});
        ac::test::WriteSettings(home, "last_run_function=dword:1\nOutputCDDir=sz:" + out +
                                          "\ncdimages=sz:" + image.cuePath + "\nlocalcddb=sz:" +
                                          (home / "cddb") + "\nafterconvert=dword:0\n");
    }

    ac::test::TempDir home;
    std::string out;
    ac::test::DiscImage image;
};

TEST_F(RipWindowTest, ADiscImageLoadsNamedFromItsRecordAndRipsCheckedTracksSampleExact) {
    Program program(home);
    State state = program.WaitFor([](const State& s) { return s.count("riprow2") > 0; });
    ASSERT_EQ(RowField(state, 0, 0), "Track01");
    EXPECT_EQ(state.count("riprow3"), 0u) << "the data track has no row";
    // A table of contents knows only where tracks start: a track's length runs to the next
    // start, the gap before it included (5.003 s and a 2 s gap; 7 s and a 2 s gap).
    EXPECT_EQ(RowField(state, 0, 2), "00:07");
    EXPECT_EQ(RowField(state, 1, 2), "00:09");
    EXPECT_EQ(Field(state, "ripdiscid").size(), 8u);

    // A record of this disc in the local folder names it the next time the drive is loaded.
    std::ofstream(home / ("cddb/" + Field(state, "ripdiscid") + ".cddb"))
        << "[CDINFO]\r\nARITIST=Test Artist\r\nALBUM=Test Album\r\nGENRE=Rock\r\nYEAR=2001\r\n"
        << "[MUSIC]\r\nTotal=3\r\nTrack00=First Song\r\nTrack01=Second \"Song\"\r\nTrack02=Third/Song\r\n";
    program.Send("command 33100");
    state = program.WaitFor([](const State& s) { return RowField(s, 0, 0) == "First Song"; });
    EXPECT_EQ(RowField(state, 1, 0), "Second \"Song\"");
    EXPECT_EQ(Field(state, "ripboxes").rfind("Test Artist|Test Album|Rock|2001|", 0), 0u);

    // A slash in the artist box is refused when the box is left; the record keeps its artist.
    program.Send("answer yes");
    program.Send("ripbox 0 AC/DC");
    state = program.WaitFor([](const State& s) { return Field(s, "ripboxes").find("AC/DC|") == 0; });
    EXPECT_NE(Field(state, "ripboxes").find("record=Test Artist|"), std::string::npos);
    program.Send("ripbox 0 Test Artist");

    // Every row to FLAC, the second unchecked, the third renamed in place.
    program.Send("command 33055");
    const int flac = ProfileIndex(state, "FLAC");
    ASSERT_GE(flac, 0);
    program.Send("profile " + std::to_string(flac));
    state = program.WaitFor([](const State& s) { return RowField(s, 2, 3) == "FLAC"; });
    program.Send("ripclick 1");
    program.Send("command 33123");
    program.Send("riprename 2 Third, Renamed");
    state = program.WaitFor([](const State& s) { return RowField(s, 1, 5) == "0" && RowField(s, 2, 0) == "Third, Renamed"; });

    program.Send("command 33115");
    state = program.WaitFor([](const State& s) {
        return Field(s, "riprunning") == "0" && RowField(s, 2, 4) == "Completed";
    }, 60s);
    EXPECT_EQ(RowField(state, 0, 4), "Completed") << Field(state, "statustext") << Field(state, "log");
    EXPECT_EQ(RowField(state, 1, 4), "-");

    const std::string folder = out + "/Test Artist/Test Album/";
    ASSERT_TRUE(fs::exists(folder + "01-First Song.flac"));
    ASSERT_TRUE(fs::exists(folder + "03-Third, Renamed.flac"));
    EXPECT_FALSE(fs::exists(folder + "02-Second \"Song\".flac"));
    EXPECT_EQ(Decode(folder + "01-First Song.flac"), ac::test::PaddedPcm(image.tracks[0]).samples);
    EXPECT_EQ(Decode(folder + "03-Third, Renamed.flac"), ac::test::PaddedPcm(image.tracks[2]).samples);
    const std::string tags = Metadata(folder + "01-First Song.flac");
    EXPECT_NE(tags.find("First Song"), std::string::npos) << tags;
    EXPECT_NE(tags.find("Test Album"), std::string::npos) << tags;
    for (const auto& entry : fs::recursive_directory_iterator(out)) {
        EXPECT_FALSE(entry.path().filename().string().ends_with(".part")) << entry.path();
    }
    EXPECT_NE(Field(state, "statustext").find("2"), std::string::npos);  // the run's tally

    // The end of a rip runs the after-run action: its countdown, cancelled here.
    state = program.WaitFor([](const State& s) { return Field(s, "countdown") == "1"; });
    ASSERT_EQ(Field(state, "countdown"), "1");
    program.Send("dialog cancel");
    program.WaitFor([](const State& s) { return Field(s, "countdown") == "0"; });
    EXPECT_FALSE(fs::exists(home / "power.txt"));

    // The disc goes (the image is renamed away): the list empties by itself.
    fs::rename(image.cuePath, image.cuePath + ".gone");
    state = program.WaitFor([](const State& s) { return s.count("riprow0") == 0; });
    EXPECT_EQ(state.count("riprow0"), 0u);
}

// The disc boxes keep what the user types at once after adding an image: no poll that was
// already under way loads "the first disc" over the list a second later.
TEST_F(RipWindowTest, WhatIsTypedRightAfterAddingAnImageStays) {
    ac::test::WriteSettings(home, "last_run_function=dword:1\nOutputCDDir=sz:" + out +
                                      "\nlocalcddb=sz:" + (home / "cddb") + "\n");
    Program program(home);
    program.WaitShown();
    program.Send("ripimage " + image.cuePath);
    program.Send("ripbox 0 Harbour Band");
    State state = program.WaitFor([](const State& s) { return Field(s, "ripboxes").rfind("Harbour Band|", 0) == 0; });
    ASSERT_EQ(Field(state, "ripboxes").rfind("Harbour Band|", 0), 0u) << Field(state, "ripboxes");
    std::this_thread::sleep_for(3s);
    state = program.WaitFor([](const State& s) { return s.count("riprow2") > 0; });
    EXPECT_EQ(Field(state, "ripboxes").rfind("Harbour Band|", 0), 0u) << Field(state, "ripboxes");
}

// A disc that carries CD-Text and has no local record is named from its CD-Text.
TEST_F(RipWindowTest, CdTextNamesADiscWithoutARecord) {
    ac::test::ImageOptions options;
    options.cdTextAlbum = "Lights at Night";
    options.cdTextArtist = "Harbour Band";
    const ac::test::DiscImage texts =
        ac::test::WriteDiscImage(home / "images", "texts", ac::test::ThreeTrackSpecs(150), options);
    ac::test::WriteSettings(home, "last_run_function=dword:1\ncdimages=sz:" + texts.cuePath +
                                      "\nlocalcddb=sz:" + (home / "cddb") + "\n");
    Program program(home);
    const State state = program.WaitFor([](const State& s) { return RowField(s, 2, 0) == "Song 3"; });
    EXPECT_EQ(RowField(state, 0, 0), "Song 1");
    EXPECT_EQ(Field(state, "ripboxes").rfind("Harbour Band|Lights at Night|", 0), 0u) << Field(state, "ripboxes");
}

}  // namespace
