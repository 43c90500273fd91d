// The file information window in the real program: command 33045 shows it for the selected
// row, its page follows the selection while it is shown, and the page file lies in the user's
// data folder. Runs under xvfb-run.

#include "../support/AudioFixtures.h"
#include "../support/ProgramHarness.h"

#include <gtest/gtest.h>

#include <cstdlib>

namespace {

using ac::test::Program;
using ac::test::State;

std::string Field(const State& state, const std::string& key) {
    auto found = state.find(key);
    return found == state.end() ? std::string() : found->second;
}

TEST(FileInfoWindowTest, ShowFileInformationFollowsTheSelectedRow) {
    ac::test::TempDir home;
    ac::test::TempDir files;
    ac::test::WriteWav(files / "first.wav", ac::test::MakeNoise(44100, 1));
    ac::test::WriteWav(files / "second <b>.wav", ac::test::MakeNoise(44100 * 2, 2, 22050, 1));
    Program program(home);
    ASSERT_FALSE(program.WaitShown().empty());
    EXPECT_EQ(Field(program.ReadState(), "fileinfo_shown"), "0");
    program.Send("add " + files / "first.wav");
    program.Send("add " + files / "second <b>.wav");
    program.Send("select 0");
    program.Send("command 33045");
    State state = program.WaitFor([](const State& s) { return Field(s, "fileinfo_shown") == "1"; });
    ASSERT_EQ(Field(state, "fileinfo_shown"), "1");
    const std::string page = home / ".local/share/audio-converter/help/tempfile.htm";
    EXPECT_NE(Program::Slurp(page).find(">first</font>"), std::string::npos);
    EXPECT_NE(Program::Slurp(page).find("2 (Stereo)"), std::string::npos);

    program.Send("select 1");
    program.WaitFor([&page](const State&) {
        return Program::Slurp(page).find("second &lt;b&gt;") != std::string::npos;
    });
    const std::string second = Program::Slurp(page);
    EXPECT_NE(second.find(">second &lt;b&gt;</font>"), std::string::npos);
    EXPECT_NE(second.find("1 (Mono)"), std::string::npos);
    EXPECT_NE(second.find("22050Hz"), std::string::npos);
    program.Send("close");
    EXPECT_TRUE(program.WaitForExit());
}

}  // namespace
