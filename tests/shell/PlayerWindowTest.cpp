// The preview in the real program, driven as the end-to-end checks drive it: the player's
// commands through the test hook's command verb, its state and position read back from the
// hook's report; the stops that removing the row and switching the tab bring. Runs under
// xvfb-run with SDL's dummy sound driver.

#include "../support/AudioFixtures.h"
#include "../support/ProgramHarness.h"

#include <gtest/gtest.h>

#include <csignal>
#include <cstdlib>

namespace {

using namespace std::chrono_literals;
using ac::test::Program;
using ac::test::State;

std::string Field(const State& state, const std::string& key) {
    auto found = state.find(key);
    return found == state.end() ? std::string() : found->second;
}

long PositionMs(const State& state) {
    return std::atol(Field(state, "player_pos_ms").c_str());
}

auto Is(const char* playerState) {
    return [playerState](const State& s) { return Field(s, "player_state") == playerState; };
}

class PlayerWindowTest : public ::testing::Test {
protected:
    void SetUp() override {
        ::setenv("SDL_AUDIODRIVER", "dummy", 1);
        for (const char* name : {"one.wav", "two.wav"}) {
            ac::test::WriteWav(m_files / name, ac::test::MakeNoise(44100 * 8, 5));
        }
    }
    ac::test::TempDir m_home;
    ac::test::TempDir m_files;
};

TEST_F(PlayerWindowTest, CommandsPlayPauseStepAndStopTheSelectedRow) {
    Program program(m_home);
    ASSERT_FALSE(program.WaitShown().empty());
    EXPECT_EQ(Field(program.ReadState(), "player_state"), "stopped");
    program.Send("add " + m_files / "one.wav");
    program.Send("add " + m_files / "two.wav");
    program.Send("select 0");
    program.Send("command 1006");
    State state = program.WaitFor([](const State& s) {
        return Field(s, "player_state") == "playing" && PositionMs(s) > 300;
    });
    ASSERT_EQ(Field(state, "player_state"), "playing");
    EXPECT_EQ(Field(state, "player_row"), "0");

    program.Send("command 1006");
    state = program.WaitFor(Is("paused"));
    ASSERT_EQ(Field(state, "player_state"), "paused");
    const long held = PositionMs(state);
    // Stop is no command of a paused player: 1012 goes on to the list's own Stop.
    program.Send("command 1012");
    std::this_thread::sleep_for(400ms);
    state = program.ReadState();
    EXPECT_EQ(Field(state, "player_state"), "paused");
    EXPECT_EQ(PositionMs(state), held);

    program.Send("command 1006");
    state = program.WaitFor(
        [held](const State& s) { return Is("playing")(s) && PositionMs(s) > held + 100; });
    EXPECT_LT(PositionMs(state), held + 2000);

    program.Send("command 1014");
    state = program.WaitFor([](const State& s) { return Field(s, "player_row") == "1"; });
    EXPECT_EQ(Field(state, "player_state"), "playing");
    program.Send("command 1015");
    state = program.WaitFor([](const State& s) { return Field(s, "player_row") == "0"; });
    EXPECT_EQ(Field(state, "player_state"), "playing");

    program.Send("command 1012");
    state = program.WaitFor(Is("stopped"));
    EXPECT_EQ(Field(state, "player_state"), "stopped");
    EXPECT_EQ(Field(state, "player_slider"), "0");
    program.Send("close");
    EXPECT_TRUE(program.WaitForExit());
}

TEST_F(PlayerWindowTest, RemovingTheRowOrSwitchingTheTabStopsPlayback) {
    Program program(m_home);
    ASSERT_FALSE(program.WaitShown().empty());
    program.Send("add " + m_files / "one.wav");
    program.Send("add " + m_files / "two.wav");
    program.Send("select 1");
    program.Send("command 1006");
    ASSERT_EQ(Field(program.WaitFor(Is("playing")), "player_state"), "playing");
    program.Send("command 1006");
    ASSERT_EQ(Field(program.WaitFor(Is("paused")), "player_state"), "paused");
    program.Send("tab 1");
    EXPECT_EQ(Field(program.WaitFor(Is("stopped")), "player_state"), "stopped");

    program.Send("tab 0");
    program.Send("select 1");
    program.Send("command 1006");
    ASSERT_EQ(Field(program.WaitFor(Is("playing")), "player_state"), "playing");
    program.Send("command 32772");  // Remove the selected row
    const State state = program.WaitFor(Is("stopped"));
    EXPECT_EQ(Field(state, "player_state"), "stopped");
    EXPECT_EQ(state.count("row1"), 0u);
    program.Send("close");
    EXPECT_TRUE(program.WaitForExit());
}

TEST_F(PlayerWindowTest, TheBurnListPlaysItsRowsAndTheFileInformationFollowsIt) {
    Program program(m_home);
    ASSERT_FALSE(program.WaitShown().empty());
    program.Send("tab 2");
    program.WaitFor([](const State& s) { return Field(s, "mode") == "2"; });
    program.Send("burnadd " + m_files / "one.wav");
    program.Send("burnadd " + m_files / "two.wav");
    program.WaitFor([](const State& s) { return s.count("burnrow1") > 0; });
    program.Send("command 33045");  // Show File Information
    const auto emptyPage = std::atol(Field(program.WaitFor([](const State& s) {
        return Field(s, "fileinfo_shown") == "1";
    }), "fileinfo_bytes").c_str());
    program.Send("burnselect 1");
    State state = program.WaitFor([emptyPage](const State& s) {
        return std::atol(Field(s, "fileinfo_bytes").c_str()) > emptyPage;
    });
    EXPECT_GT(std::atol(Field(state, "fileinfo_bytes").c_str()), emptyPage)
        << "the selected burn row's details";

    program.Send("command 1006");
    state = program.WaitFor([](const State& s) { return Is("playing")(s) && PositionMs(s) > 200; });
    ASSERT_EQ(Field(state, "player_state"), "playing");
    EXPECT_EQ(Field(state, "player_row"), "1");
    program.Send("command 1015");  // the previous row
    state = program.WaitFor([](const State& s) { return Field(s, "player_row") == "0"; });
    EXPECT_EQ(Field(state, "player_state"), "playing");
    program.Send("command 32772");  // Remove the selected row
    EXPECT_EQ(Field(program.WaitFor(Is("stopped")), "player_state"), "stopped");
    // Once sound has played, SIGTERM still ends the program (the sound library would take it).
    program.Signal(SIGTERM);
    EXPECT_TRUE(program.WaitForExit());
}

}  // namespace
