// The real program's main window: placement, single instance, tabs, skins and languages.
// Runs under xvfb-run.

#include "../support/AudioFixtures.h"
#include "../support/PackageDir.h"
#include "../support/ProgramHarness.h"
#include "../support/RunTool.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>
#include <thread>

namespace {

using namespace std::chrono_literals;
using ac::test::Program;
using ac::test::State;
using ac::test::WriteSettings;

class MainWindowTest : public ::testing::Test {
protected:
    void SetUp() override { ASSERT_NE(::getenv("DISPLAY"), nullptr) << "run under xvfb-run"; }
    ac::test::TempDir m_home;
};

// FFmpeg and SDL are loaded with the first file, not at the start: they are most of what the
// start would load, and a window that is only opened to be closed again never needs them.
TEST_F(MainWindowTest, TheMediaLibrariesComeWithTheFirstFileNotWithTheWindow) {
    const auto mapped = [](pid_t pid, const char* library) {
        const std::string maps = Program::Slurp("/proc/" + std::to_string(pid) + "/maps");
        return maps.find(library) != std::string::npos;
    };
    ac::test::TempDir media;
    ASSERT_TRUE(ac::test::RunFfmpeg("-f lavfi -i sine=duration=1 '" + (media / "b.wav") + "'"));
    Program program(m_home);
    ASSERT_FALSE(program.WaitShown().empty());
    EXPECT_FALSE(mapped(program.Pid(), "libavformat")) << "FFmpeg came with the window";
    EXPECT_FALSE(mapped(program.Pid(), "libSDL2")) << "SDL came with the window";
    EXPECT_FALSE(mapped(program.Pid(), "libac-media"));
    program.Send("add " + media / "b.wav");
    const State state = program.WaitFor([](const State& s) { return s.count("row0") > 0; });
    EXPECT_NE(state.at("row0").find("00:00:01"), std::string::npos) << state.at("row0");
    EXPECT_TRUE(mapped(program.Pid(), "libac-media"));
    EXPECT_TRUE(mapped(program.Pid(), "libavformat"));
    program.Send("close");
    EXPECT_TRUE(program.WaitForExit());
}

// The disc libraries come with the first call that needs them: the Rip tab reads the drives
// through libcdio, the Burn tab lists recorders through libburn.
TEST_F(MainWindowTest, TheDiscLibrariesComeWithTheirTabs) {
    const auto mapped = [](pid_t pid, const char* library) {
        const std::string maps = Program::Slurp("/proc/" + std::to_string(pid) + "/maps");
        return maps.find(library) != std::string::npos;
    };
    Program program(m_home);
    ASSERT_FALSE(program.WaitShown().empty());
    for (const char* library : {"libcdio", "libburn", "libisofs", "libuchardet"}) {
        EXPECT_FALSE(mapped(program.Pid(), library)) << library << " came with the window";
    }
    program.Send("tab 1");
    program.WaitFor([](const State& s) { return s.at("mode") == "1" && s.count("ripdrives") > 0; });
    EXPECT_TRUE(mapped(program.Pid(), "libcdio"));
    EXPECT_FALSE(mapped(program.Pid(), "libburn"));
    program.Send("tab 2");
    const State state = program.WaitFor([](const State& s) {
        return s.at("mode") == "2" && s.count("burnrecorders") > 0;
    });
    EXPECT_EQ(state.at("burnrecorders"), "1") << "the image recorder at least";
    EXPECT_TRUE(mapped(program.Pid(), "libburn"));
    program.Send("close");
    EXPECT_TRUE(program.WaitForExit());
}

TEST_F(MainWindowTest, FirstStartIsCentredAtItsDefaultSizeAndClosingRemembersThePlace) {
    {
        Program program(m_home);
        const State state = program.WaitShown();
        EXPECT_EQ(state.at("title"), "Velmorant Audio Converter");
        EXPECT_EQ(state.at("rect"), "220,195,840,634") << "centred on a 1280x1024 screen";
        EXPECT_EQ(state.at("skin"), "Default");
        program.Send("move 30 40 900 700");
        program.WaitFor([](const State& s) { return s.at("rect") == "30,40,900,700"; });
        program.Send("close");
        ASSERT_TRUE(program.WaitForExit());
        EXPECT_NE(program.Settings().find("window_rect=sz:30,40,930,740"), std::string::npos);
        EXPECT_NE(program.Settings().find("last_skin=sz:Default"), std::string::npos);
    }
    Program again(m_home);
    EXPECT_EQ(again.WaitShown().at("rect"), "30,40,900,700");
}

// The window tells the window manager its smallest size and no largest one, so it can be
// resized and maximised; an open menu closes on a click elsewhere and on Escape.
TEST_F(MainWindowTest, TheWindowResizesAndMaximisesAndMenusCloseWhenTheUserLooksElsewhere) {
    Program program(m_home);
    program.WaitShown();
    const ac::test::ToolResult hints =
        ac::test::RunTool("/usr/bin/xprop", {"-name", "Velmorant Audio Converter", "WM_NORMAL_HINTS"});
    EXPECT_NE(hints.out.find("minimum size: 840 by 634"), std::string::npos) << hints.out;
    // GTK states "no largest size" as a huge one; before, both ends were 840 by 634.
    EXPECT_EQ(hints.out.find("maximum size: 840 by 634"), std::string::npos) << hints.out;
    program.Send("move 10 10 1100 800");
    State state = program.WaitFor([](const State& s) { return s.at("rect") == "10,10,1100,800"; });
    EXPECT_EQ(state.at("rect"), "10,10,1100,800");
    EXPECT_EQ(state.at("selectorfits"), "0") << "too narrow for the longest profile";
    program.Send("move 10 10 1260 900");
    state = program.WaitFor([](const State& s) { return s.at("selectorfits") == "1"; });
    EXPECT_EQ(state.at("selectorfits"), "1") << "room to spare shows the longest profile whole";
    program.Send("move 10 10 300 200");
    state = program.WaitFor([](const State& s) { return s.at("rect") != "10,10,1260,900"; });
    EXPECT_EQ(state.at("rect"), "10,10,840,634") << "never smaller than the design size";

    for (const char* away : {"press", "key"}) {
        program.Send("menu 0");
        state = program.WaitFor([](const State& s) { return s.count("menuopen") && s.at("menuopen") == "1"; });
        ASSERT_EQ(state.at("menuopen"), "1");
        program.Send(away);
        state = program.WaitFor([](const State& s) { return s.at("menuopen") == "0"; });
        EXPECT_EQ(state.at("menuopen"), "0") << away;
    }
}

// Help > Contents opens the program's own pages, installed beside its data, in the browser.
TEST_F(MainWindowTest, HelpContentsOpensTheProgramsOwnPagesInTheBrowser) {
    const std::string opened = m_home / "opened.txt";
    const std::string browser = m_home / "browser.sh";
    std::ofstream(browser) << "#!/bin/sh\necho \"$1\" > '" << opened << "'\n";
    std::filesystem::permissions(browser, std::filesystem::perms::owner_all);
    ::setenv("BROWSER", browser.c_str(), 1);
    Program program(m_home);
    program.WaitShown();
    program.Send("command 32900");
    program.WaitFor([&](const State&) { return !Program::Slurp(opened).empty(); });
    ::unsetenv("BROWSER");
    const std::string url = Program::Slurp(opened);
    EXPECT_EQ(url.rfind("file://", 0), 0u) << url;
    EXPECT_NE(url.find("/help/Default.htm"), std::string::npos) << url;
    const std::string page = url.substr(7, url.size() - 8);
    EXPECT_NE(Program::Slurp(page).find("<h1>Velmorant Audio Converter</h1>"), std::string::npos) << page;
}

TEST_F(MainWindowTest, AbsurdRememberedRectanglesComeBackOnScreen) {
    WriteSettings(m_home, "window_rect=sz:-500,-300,300,0\n");
    {
        Program program(m_home);
        EXPECT_EQ(program.WaitShown().at("rect"), "0,0,840,634");
    }
    WriteSettings(m_home, "window_rect=sz:0,0,2000000000,5\n");
    {
        Program program(m_home);
        EXPECT_EQ(program.WaitShown().at("rect"), "220,195,840,634");
    }
    WriteSettings(m_home, "window_rect=sz:garbage\n");
    Program program(m_home);
    EXPECT_EQ(program.WaitShown().at("rect"), "220,195,840,634");
}

// Files named on the command line join the convert list; a later start hands its files to the
// running copy and ends, so one window holds them all.
TEST_F(MainWindowTest, FilesOfTheCommandLineAndOfALaterStartJoinOneList) {
    ac::test::TempDir media;
    for (const char* name : {"a.wav", "b.wav", "c.wav", "d.wav", "e.wav"}) {
        const ac::test::ToolResult made = ac::test::RunTool(
            "/usr/bin/ffmpeg", {"-v", "error", "-f", "lavfi", "-i", "sine=duration=1", media / name});
        ASSERT_EQ(made.exitCode, 0) << made.err;
    }
    Program first(m_home, AC_BIN_DIR "/audio-converter",
                  {media / "a.wav", media / "b.wav", media / "c.wav"});
    State state = first.WaitFor([](const State& s) { return s.count("row2") > 0; });
    ASSERT_EQ(state.count("row2"), 1u) << "three files of the command line";
    Program second(m_home, AC_BIN_DIR "/audio-converter",
                   {media / "d.wav", media / "e.wav", "--no-such-switch"});
    EXPECT_TRUE(second.WaitForExit(15s)) << "the second start hands over and ends";
    state = first.WaitFor([](const State& s) { return s.count("row4") > 0; });
    EXPECT_EQ(state.count("row4"), 1u) << "five rows in the first window";
    EXPECT_EQ(state.count("row5"), 0u) << "the refused switch is no row";
    EXPECT_NE(state.at("row4").find("e.wav"), std::string::npos);
}

TEST_F(MainWindowTest, ASecondStartEndsSilentlyWhileTheFirstRunsOn) {
    Program first(m_home);
    ASSERT_FALSE(first.WaitShown().empty());
    ac::test::TempDir hookOfSecond;
    Program second(m_home);
    EXPECT_TRUE(second.WaitForExit(15s)) << "the second instance must end by itself";
    EXPECT_TRUE(first.Running());
    first.Send("tab 1");
    EXPECT_EQ(first.WaitFor([](const State& s) { return s.at("mode") == "1"; }).at("mode"), "1");
}

TEST_F(MainWindowTest, SwitchingTabsSwitchesPanelMenuAndTheRememberedMode) {
    Program program(m_home);
    State state = program.WaitShown();
    EXPECT_EQ(state.at("mode"), "0");
    EXPECT_EQ(state.at("menu"), "129");
    EXPECT_NE(state.at("visible").find("MediaList;"), std::string::npos);
    EXPECT_EQ(state.at("tabs"), "Convert-|Rip+|Burn+|");
    EXPECT_EQ(state.at("gauge"), "0|0|0") << "a plain bar: no disc scale in the convert mode";
    // The rip and burn panels are made when their tabs first show them.
    EXPECT_EQ(state.at("made"), "MediaList;OutputPanel;PlayerPanel;SideBar;StatusBar;");

    program.Send("tab 2");
    state = program.WaitFor([](const State& s) { return s.at("mode") == "2"; });
    EXPECT_EQ(state.at("made"),
              "MediaList;CDCreatorPanel;OutputPanel;PlayerPanel;SideBar;StatusBar;");
    EXPECT_EQ(state.at("menu"), "170");
    EXPECT_EQ(state.at("captions"), "&File|&Edit|&Burn|&Options|&Help|");
    EXPECT_NE(state.at("visible").find("CDCreatorPanel;"), std::string::npos);
    EXPECT_EQ(state.at("visible").find("MediaList;"), std::string::npos);
    EXPECT_EQ(state.at("tabs"), "Convert+|Rip+|Burn-|");
    EXPECT_NE(program.Settings().find("last_run_function=dword:2"), std::string::npos);

    program.Send("tab 1");
    state = program.WaitFor([](const State& s) { return s.at("mode") == "1"; });
    EXPECT_EQ(state.at("menu"), "171");
    EXPECT_NE(state.at("visible").find("CDRip;"), std::string::npos);
    EXPECT_EQ(state.at("visible").find("CDCreatorPanel;"), std::string::npos);
    program.Send("close");
    ASSERT_TRUE(program.WaitForExit());

    Program again(m_home);
    state = again.WaitShown();
    EXPECT_EQ(state.at("mode"), "1");
    EXPECT_EQ(state.at("menu"), "171");
    EXPECT_EQ(state.at("made"), "MediaList;OutputPanel;PlayerPanel;CDRip;SideBar;StatusBar;");
    again.Send("close");
    ASSERT_TRUE(again.WaitForExit());
}

std::string Screenshot(const ac::test::TempDir& dir, const std::string& name) {
    const std::string path = dir / name;
    const std::string command = "import -window root " + path + " 2>/dev/null";
    EXPECT_EQ(std::system(command.c_str()), 0);
    return ac::test::ReadFile(path);
}

TEST_F(MainWindowTest, ChangesOfSkinAndLanguageReachEveryWindow) {
    Program program(m_home);
    program.WaitShown();
    std::this_thread::sleep_for(500ms);
    const std::string before = Screenshot(m_home, "before.png");

    EXPECT_EQ(program.WaitShown().at("fields"), "#FFFFFF/#2A3342");
    program.Send("skin Midnight");
    State state = program.WaitFor([](const State& s) { return s.at("skin") == "Midnight"; });
    EXPECT_EQ(state.at("skin"), "Midnight");
    EXPECT_EQ(state.at("fields"), "#21262F/#E3E6EB") << "entries and lists are dark too";
    std::this_thread::sleep_for(500ms);
    EXPECT_NE(Screenshot(m_home, "after.png"), before) << "the window looks different";

    program.Send("language German");
    state = program.WaitFor([](const State& s) { return s.at("language") == "German"; });
    EXPECT_EQ(state.at("captions"), "&Datei|&Bearbeiten|&Konvertieren|&Optionen|&Hilfe|");
    EXPECT_EQ(state.at("exit"), "&Beenden");
    EXPECT_EQ(state.at("tabs"), "Konvertieren-|Rippen+|Brennen+|");
    program.Send("tab 2");
    state = program.WaitFor([](const State& s) { return s.at("mode") == "2"; });
    EXPECT_EQ(state.at("captions"), "&Datei|&Bearbeiten|&Brennen|&Optionen|&Hilfe|")
        << "a menu loaded later is translated too";

    program.Send("language English");
    state = program.WaitFor([](const State& s) { return s.at("language") == "English"; });
    EXPECT_EQ(state.at("tabs"), "Convert+|Rip+|Burn-|");
    EXPECT_EQ(state.at("captions"), "&File|&Edit|&Burn|&Options|&Help|");
    program.Send("close");
    ASSERT_TRUE(program.WaitForExit());
    EXPECT_NE(program.Settings().find("last_skin=sz:Midnight"), std::string::npos);

    // The next start dresses the boxes dark from the first paint on.
    Program again(m_home);
    EXPECT_EQ(again.WaitShown().at("fields"), "#21262F/#E3E6EB");
    again.Send("close");
    ASSERT_TRUE(again.WaitForExit());
}

// A program folder of its own, with a data.pkg whose only skin is damaged in every way and
// whose only other language lacks nearly all texts.
TEST_F(MainWindowTest, DamagedSkinAndSparseLanguageFallBackWithoutACrash) {
    ac::test::TempDir folder;
    const std::string stage = folder / "stage";
    const std::string png = ac::test::ReadFile(AC_SOURCE_DIR "/data/skin/Default/Card.png");
    ac::test::WriteFile(stage + "/skin/Default/skin.ini",
                        "[Main]\r\nName=Damaged\r\nBackground=half.png\r\nRegionLT=png.bmp\r\n"
                        "RegionRB=missing.bmp\r\nMenuBarAlignment=7\r\nBorderWidth=-3\r\n"
                        "[Caption]\r\nFontSize=-20\r\n[Check]\r\nTabConverterBg=half.png\r\n");
    ac::test::WriteFile(stage + "/skin/Default/half.png", png.substr(0, png.size() / 2));
    ac::test::WriteFile(stage + "/skin/Default/png.bmp", png);
    ac::test::WriteFile(stage + "/skin/Default/SysMenu.bmp", "BM broken");
    ac::test::WriteFile(stage + "/lang/Sparse.lang",
                        "CODEPAGE=1252\r\nLANGCODE=xx\r\n#M8011# \"&Beenden\"\r\n");
    const std::string pack = std::string(AC_BIN_DIR) + "/acpkg pack " + folder.Path() +
                             "/data.pkg " + stage + " >/dev/null";
    ASSERT_EQ(std::system(pack.c_str()), 0);
    std::filesystem::copy_file(AC_BIN_DIR "/audio-converter", folder / "audio-converter");
    std::filesystem::permissions(folder / "audio-converter", std::filesystem::perms::owner_all);

    WriteSettings(m_home, "language=sz:Sparse\nlast_skin=sz:Gone\n");
    Program program(m_home, folder / "audio-converter");
    State state = program.WaitShown();
    ASSERT_FALSE(state.empty()) << "the program started and showed its window";
    EXPECT_EQ(state.at("skin"), "Default");
    EXPECT_EQ(state.at("captions"), "&File|&Edit|&Convert|&Options|&Help|")
        << "missing texts keep the built-in English";
    EXPECT_EQ(state.at("exit"), "&Beenden");
    EXPECT_EQ(state.at("tabs"), "Convert-|Rip+|Burn+|");
    program.Send("tab 2");
    EXPECT_EQ(program.WaitFor([](const State& s) { return s.at("mode") == "2"; }).at("menu"),
              "170");
    program.Send("close");
    EXPECT_TRUE(program.WaitForExit());
}

}  // namespace
