// Options > Preferences in the real program: each page opens with the stored settings, refuses
// what the rules refuse and writes nothing then, writes its keys on Apply, and the running
// program follows (the next output is named by the new scheme). Runs under xvfb-run.

#include "../support/ProgramHarness.h"
#include "../support/RunTool.h"

#include <gtest/gtest.h>

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

// The value of control `id` on page `page`, as the hook reports it.
std::string Control(const State& state, int page, int id) {
    std::istringstream in(Field(state, "pref" + std::to_string(page)));
    const std::string key = std::to_string(id) + "=";
    for (std::string item; std::getline(in, item, ';');) {
        if (!item.empty() && item[0] == '*')
            item.erase(0, 1);
        if (item.rfind(key, 0) == 0)
            return item.substr(key.size());
    }
    return "<none>";
}

bool Has(const std::string& text, const std::string& part) {
    return text.find(part) != std::string::npos;
}

class PreferencesWindowTest : public ::testing::Test {
protected:
    void SetUp() override { ASSERT_NE(::getenv("DISPLAY"), nullptr) << "run under xvfb-run"; }
    State Open(Program& program) {
        program.Send("command 33003");
        return program.WaitFor([](const State& s) { return s.count("pref0") > 0; });
    }
    State Close(Program& program, const char* how) {
        program.Send(std::string("dialog ") + how);
        return program.WaitFor([](const State& s) { return s.count("pref0") == 0; });
    }
    ac::test::TempDir m_home;
};

TEST_F(PreferencesWindowTest, GeneralPageRefusesWhatTheRulesRefuseAndWritesOnApply) {
    Program program(m_home);
    program.WaitShown();
    State state = Open(program);
    EXPECT_EQ(Control(state, 0, 1019), "10");
    EXPECT_EQ(Control(state, 0, 1020), "1");
    EXPECT_EQ(Field(state, "prefapply"), "0") << "nothing changed yet";

    // More running than allowed at all: refused with its text, nothing written.
    program.Send("prefset 0 1019 2");
    program.Send("prefset 0 1020 3");
    program.Send("prefapply");
    state =
        program.WaitFor([](const State& s) { return Has(Field(s, "boxes"), "can't more than"); });
    EXPECT_TRUE(Has(Field(state, "boxes"), "can't more than")) << Field(state, "boxes");
    EXPECT_FALSE(Has(program.Settings(), "max_processes=dword:2"));

    // Five running: the question; No brings the old number back.
    program.Send("prefset 0 1019 10");
    program.Send("prefset 0 1020 5");
    program.Send("answer no");
    program.Send("prefapply");
    state = program.WaitFor([](const State& s) { return Control(s, 0, 1020) == "1"; });
    EXPECT_EQ(Control(state, 0, 1020), "1");
    EXPECT_TRUE(Has(Field(state, "boxes"), "Too many simultaneous running"))
        << Field(state, "boxes");

    // Clearing the last of the two background boxes is refused.
    program.Send("prefset 0 1099 0");
    state = program.WaitFor([](const State& s) { return Has(Field(s, "boxes"), "at least one"); });
    EXPECT_EQ(Control(state, 0, 1099), "1");
    program.Send("prefset 0 1100 1");
    program.Send("prefset 0 1099 0");
    state = program.WaitFor([](const State& s) { return Control(s, 0, 1099) == "0"; });
    EXPECT_EQ(Control(state, 0, 1100), "1");

    // Four running, overwrite, quit after a run: no question, all written.
    program.Send("prefset 0 1020 4");
    program.Send("prefset 0 1052 1");
    program.Send("prefset 0 1093 1");
    program.Send("prefset 0 1019 abc");
    program.Send("prefapply");
    state = program.WaitFor([](const State& s) { return Has(Field(s, "boxes"), "whole number"); });
    EXPECT_TRUE(Has(Field(state, "boxes"), "from 1 to 100")) << "not a number";
    program.Send("prefset 0 1019 8");
    program.Send("prefapply");
    state = program.WaitFor([](const State& s) { return Field(s, "prefapply") == "0"; });
    const std::string settings = program.Settings();
    EXPECT_TRUE(Has(settings, "max_processes=dword:8")) << settings;
    EXPECT_TRUE(Has(settings, "max_running_processes=dword:4"));
    EXPECT_TRUE(Has(settings, "output_file_overwrite=dword:1"));
    EXPECT_TRUE(Has(settings, "afterconvert=dword:3"));
    EXPECT_TRUE(Has(settings, "slowdown=dword:0"));
    EXPECT_TRUE(Has(settings, "idle=dword:1"));

    // Cancel writes nothing; reopening shows what was stored.
    program.Send("prefset 0 1019 9");
    Close(program, "cancel");
    EXPECT_FALSE(Has(program.Settings(), "max_processes=dword:9"));
    state = Open(program);
    EXPECT_EQ(Control(state, 0, 1019), "8");
    EXPECT_EQ(Control(state, 0, 1093), "1");
    Close(program, "cancel");
}

TEST_F(PreferencesWindowTest, FileRipAndBurnPagesAndANewSchemeNamesTheNextOutput) {
    const std::string out = m_home / "out";
    ac::test::WriteSettings(m_home, "OutputDir=sz:" + out + "\n");
    ac::test::TempDir media;
    ASSERT_EQ(
        ac::test::RunTool("/usr/bin/ffmpeg", {"-v", "error", "-f", "lavfi", "-i", "sine=duration=1",
                                              "-metadata", "date=1999", media / "song.wav"})
            .exitCode,
        0);
    Program program(m_home);
    program.WaitShown();
    State state = Open(program);
    EXPECT_EQ(Control(state, 1, 1150), "<Index>-<FileName>");
    EXPECT_EQ(Control(state, 1, 1152), "01-filename.mp3");
    program.Send("prefset 1 1150 2");
    state =
        program.WaitFor([](const State& s) { return Control(s, 1, 1152) != "01-filename.mp3"; });
    EXPECT_EQ(Control(state, 1, 1150), "<Index>-<FileName>-<Artist>");
    EXPECT_EQ(Control(state, 1, 1152), "01-filename-author.mp3");
    program.Send("prefset 1 1158 1");
    program.Send("prefset 1 1154 _");
    // The scheme names conversions too only when asked; the box warns that tags may be missing.
    program.Send("prefset 1 1214 1");
    state = program.WaitFor([](const State& s) { return Has(Field(s, "boxes"), "infomation"); });
    EXPECT_TRUE(Has(Field(state, "boxes"), "Some of infomation maybe cann't find."));

    // The lock box never clears; eject is kept.
    program.Send("prefset 3 1119 0");
    state = program.WaitFor([](const State& s) { return Has(Field(s, "boxes"), "must select"); });
    EXPECT_EQ(Control(state, 3, 1119), "1");
    program.Send("prefset 3 1118 1");

    // A folder that cannot hold a burn's temporary files is refused on Apply.
    program.Send("prefset 4 1190 " + std::string(m_home / "no such folder"));
    program.Send("prefapply");
    state = program.WaitFor(
        [](const State& s) { return Has(Field(s, "boxes"), "Invalid temp folder"); });
    EXPECT_EQ(Field(state, "prefpage"), "4") << "the page that refused comes to the front";
    EXPECT_FALSE(Has(program.Settings(), "no such folder"));
    const std::string settings = program.Settings();
    EXPECT_TRUE(Has(settings, "scheme=dword:2")) << "pages before the refusal keep their result";
    EXPECT_TRUE(Has(settings, "illegal=dword:1"));
    EXPECT_TRUE(Has(settings, "alsoconverter=dword:1"));
    EXPECT_TRUE(Has(settings, "ejectcd=dword:1"));
    fs::create_directories(m_home / "tmp");
    program.Send("prefset 4 1190 " + std::string(m_home / "tmp"));
    program.Send("prefapply");
    state = program.WaitFor([](const State& s) { return Field(s, "prefapply") == "0"; });
    EXPECT_TRUE(Has(program.Settings(), "burntemp=sz:" + std::string(m_home / "tmp")));
    Close(program, "ok");

    // The running program names the next output by the new scheme, without a restart.
    program.Send("add " + std::string(media / "song.wav"));
    program.WaitFor([](const State& s) { return s.count("row0") > 0; });
    program.Send("command 32776");
    program.WaitFor(
        [](const State& s) {
            return Field(s, "running") == "0" && Has(Field(s, "row0"), "Completed");
        },
        30s);
    bool named = false;
    for (const auto& entry : fs::directory_iterator(out)) {
        named = named || entry.path().filename().string().rfind("01-song", 0) == 0;
    }
    std::string names;
    for (const auto& entry : fs::directory_iterator(out))
        names += entry.path().filename().string() + " ";
    EXPECT_TRUE(named) << "the scheme's index and file name lead the output's name: " << names;
}

// The CDDB page: the default server when none is kept, a time-out that is no number refused,
// the hello's e-mail and protocol level and the order written on Apply.
TEST_F(PreferencesWindowTest, CddbPageWritesTheServerTimeOutHelloAndOrder) {
    Program program(m_home);
    program.WaitShown();
    State state = Open(program);
    EXPECT_EQ(Control(state, 2, 1114), "gnudb.gnudb.org & 80") << "addrcount 0: the default";
    EXPECT_EQ(Control(state, 2, 1178), "Local CDDB->Remote CDDB->CD-Text");
    EXPECT_EQ(Control(state, 2, 1108), "Choose|1") << "no WinampDB path yet";
    program.Send("prefset 2 1117 soon");
    program.Send("prefapply");
    state = program.WaitFor([](const State& s) { return Has(Field(s, "boxes"), "whole number"); });
    EXPECT_EQ(Field(state, "prefpage"), "2");
    program.Send("prefset 2 1117 45");
    program.Send("prefset 2 1231 me@example.org");
    program.Send("prefset 2 1233 2");
    program.Send("prefset 2 1178 4");
    program.Send("prefset 2 1111 1");
    program.Send("prefapply");
    state = program.WaitFor([](const State& s) { return Field(s, "prefapply") == "0"; });
    const std::string settings = program.Settings();
    EXPECT_TRUE(Has(settings, "timeout=dword:45")) << settings;
    EXPECT_TRUE(Has(settings, "remotecddb=sz:gnudb.gnudb.org & 80"));
    EXPECT_TRUE(Has(settings, "cddb_email=sz:me@example.org"));
    EXPECT_TRUE(Has(settings, "cddb_proto=dword:6"));
    EXPECT_TRUE(Has(settings, "cddborder=dword:4"));
    EXPECT_TRUE(Has(settings, "format=dword:1"));
    Close(program, "ok");
}

}  // namespace
