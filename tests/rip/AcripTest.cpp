// acrip end to end: the built program with the real ctt over disc images made at test time,
// a fake tool for a failing track, and settings, records and outputs in a temp folder.
// Skipped while acrip or ctt is not built.

#include "platform/SettingsStore.h"
#include "support/CddbTestServer.h"
#include "support/DiscImages.h"
#include "support/RunTool.h"
#include "support/TempDir.h"

#include <gtest/gtest.h>

#include <fcntl.h>
#include <signal.h>
#include <spawn.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include <chrono>
#include <filesystem>
#include <fstream>
#include <thread>

namespace ac {
namespace {

namespace fs = std::filesystem;

const std::string kAcrip = std::string(AC_BIN_DIR) + "/acrip";
const std::string kCtt = std::string(AC_BIN_DIR) + "/ctt";
constexpr const char* kSettingsKey = "Software\\Velmorant\\Audio Converter\\Settings";

bool Contains(const std::string& text, const std::string& part) {
    return text.find(part) != std::string::npos;
}

// Every regular file below `folder`, as paths relative to it, sorted.
std::vector<std::string> FilesBelow(const std::string& folder) {
    std::vector<std::string> files;
    std::error_code error;
    for (fs::recursive_directory_iterator it(folder, error), end; !error && it != end;
         it.increment(error)) {
        if (it->is_regular_file())
            files.push_back(fs::relative(it->path(), folder).string());
    }
    std::sort(files.begin(), files.end());
    return files;
}

// acrip as a user's shell starts it, so the test can signal it mid-run.
class RunningAcrip {
public:
    RunningAcrip(const std::vector<std::string>& args, const std::string& logPath) {
        std::vector<char*> argv{const_cast<char*>(kAcrip.c_str())};
        for (const std::string& arg : args)
            argv.push_back(const_cast<char*>(arg.c_str()));
        argv.push_back(nullptr);
        posix_spawn_file_actions_t actions;
        posix_spawn_file_actions_init(&actions);
        posix_spawn_file_actions_addopen(&actions, 0, "/dev/null", O_RDONLY, 0);
        posix_spawn_file_actions_addopen(&actions, 1, logPath.c_str(), O_WRONLY | O_CREAT | O_TRUNC,
                                         0644);
        posix_spawn_file_actions_adddup2(&actions, 1, 2);
        if (posix_spawn(&m_pid, kAcrip.c_str(), &actions, nullptr, argv.data(), environ) != 0)
            m_pid = -1;
        posix_spawn_file_actions_destroy(&actions);
    }
    ~RunningAcrip() {
        if (m_pid > 0 && !m_reaped) {
            ::kill(m_pid, SIGKILL);
            Wait();
        }
    }
    pid_t Pid() const { return m_pid; }
    // The exit code, -1 for a death by signal.
    int Wait() {
        int status = 0;
        ::waitpid(m_pid, &status, 0);
        m_reaped = true;
        return WIFEXITED(status) ? WEXITSTATUS(status) : -1;
    }

private:
    pid_t m_pid = -1;
    bool m_reaped = false;
};

class AcripTest : public ::testing::Test {
protected:
    void SetUp() override {
        if (::access(kAcrip.c_str(), X_OK) != 0 || ::access(kCtt.c_str(), X_OK) != 0)
            GTEST_SKIP() << "acrip or ctt is not built";
        // Settings, records and the default output folder of the run stay in the temp folder.
        ::setenv("XDG_CONFIG_HOME", (dir / "config").c_str(), 1);
        ::setenv("XDG_DATA_HOME", (dir / "data").c_str(), 1);
        ::unsetenv("AC_CTT_PATH");
        fs::create_directories(dir / "config/audio-converter");
        fs::create_directories(dir / "records");
        SetString("localcddb", dir / "records");
        // "ABE": 01-Artist-Title, so a file named so proves the scheme setting was read.
        SetString("allscheme", "E,AE,AEB,ABE,AHE,AEH");
        SetInt("scheme", 3);
        test::ImageOptions withToc;
        withToc.writeToc = true;
        image = test::WriteDiscImage(dir.Path(), "disc", test::ThreeTrackSpecs(), withToc);
        std::ofstream(dir / "records/0e001003.cddb")
            << "[CDINFO]\r\nARITIST=The Testers\r\nALBUM=Test Album\r\nGENRE=rock\r\nYEAR=2004\r\n"
               "[MUSIC]\r\nTotal=3\r\nTrack00=First Light\r\nTrack01=Second\r\nTrack02=Third\r\n";
    }
    void TearDown() override { ::unsetenv("AC_CTT_PATH"); }

    void SetString(const char* name, const std::string& value) {
        platform::SettingsStore(dir / "config/audio-converter/settings.ini")
            .WriteString(kSettingsKey, name, value);
    }
    void SetInt(const char* name, int value) {
        platform::SettingsStore(dir / "config/audio-converter/settings.ini")
            .WriteInt(kSettingsKey, name, value);
    }
    test::ToolResult Acrip(const std::vector<std::string>& args) {
        return test::RunTool(kAcrip, args, 120);
    }

    // The samples of a ripped file, decoded by the ffmpeg command for anything but WAV.
    test::Pcm Decoded(const std::string& path) {
        std::string wav = path;
        if (!path.ends_with(".wav")) {
            wav = dir / "decoded.wav";
            EXPECT_TRUE(test::RunFfmpeg("-i \"" + path + "\" -c:a pcm_s16le \"" + wav + "\""))
                << path;
        }
        test::Pcm pcm;
        EXPECT_TRUE(test::ReadWav(wav, pcm)) << path;
        return pcm;
    }

    test::TempDir dir;
    test::DiscImage image;
};

TEST_F(AcripTest, ListShowsTheDiscIdTracksAndRecordOfTheFirstImageThatHoldsADisc) {
    // No --device: the images of the setting, the missing one passed over.
    SetString("cdimages", dir / "gone.cue" + " ; " + image.cuePath);
    const test::ToolResult list = Acrip({"--list"});
    EXPECT_EQ(list.exitCode, 0) << list.out << list.err;
    EXPECT_EQ(list.err, "") << "libcdio must print nothing";
    EXPECT_TRUE(Contains(list.out, "Drive:   " + image.cuePath + "\n")) << list.out;
    EXPECT_TRUE(Contains(list.out, "Disc id: 0e001003\n")) << list.out;
    EXPECT_TRUE(Contains(list.out,
                         "Artist:  The Testers\nAlbum:   Test Album\nYear:    2004\n"
                         "Genre:   rock\n"))
        << list.out;
    EXPECT_TRUE(
        Contains(list.out, "  1  00:05  First Light\n  2  00:07  Second\n  3  00:04  Third\n"))
        << list.out;

    // A disc without a record: default names, and where the record would be. A track runs to
    // the next track's start, so the gaps count to the tracks before them.
    const test::DiscImage gapped =
        test::WriteDiscImage(dir.Path(), "gapped", test::ThreeTrackSpecs(150));
    const test::ToolResult unknown = Acrip({"--device", gapped.cuePath, "--list"});
    EXPECT_EQ(unknown.exitCode, 0) << unknown.err;
    EXPECT_TRUE(Contains(unknown.out, "Disc id: 14001403\n")) << unknown.out;
    EXPECT_TRUE(Contains(unknown.out, "Record:  none (" + dir / "records/14001403.cddb)"))
        << unknown.out;
    EXPECT_TRUE(
        Contains(unknown.out, "  1  00:07  Track01\n  2  00:09  Track02\n  3  00:04  Track03\n"))
        << unknown.out;
}

// A record as a CDDB server keeps it, for the disc of the gapped image (14001403).
std::string ServerRecord(const std::string& artist, const std::string& album,
                         const std::vector<std::string>& titles) {
    std::string text =
        "# xmcd\r\n#\r\n# Track frame offsets:\r\n#\t150\r\n#\r\n# Disc length: 20 seconds\r\n"
        "#\r\n# Submitted via: testsuite 1.0\r\n#\r\nDISCID=14001403\r\nDTITLE=" +
        artist + " / " + album + "\r\nDYEAR=2001\r\n";
    for (std::size_t i = 0; i < titles.size(); ++i)
        text += "TTITLE" + std::to_string(i) + "=" + titles[i] + "\r\n";
    return text + "EXTD=\r\n";
}

TEST_F(AcripTest, CddbLooksTheDiscUpTakesTheChosenMatchAndNamesItOfflineLater) {
    const test::DiscImage gapped =
        test::WriteDiscImage(dir.Path(), "gapped", test::ThreeTrackSpecs(150));
    {
        test::CddbTestServer server;
        int n = 0;
        for (const char* category : {"rock", "misc", "jazz"}) {
            const std::string artist = "Band " + std::to_string(++n);
            server.AddRecord(category, 0x14001403, artist + " / Album",
                             ServerRecord(artist, "Album", {"One", "Two / Too", "Three"}));
        }
        const test::ToolResult found =
            Acrip({"--device", gapped.cuePath, "--cddb", "--server",
                   "127.0.0.1:" + std::to_string(server.Port()), "--choose", "2"});
        ASSERT_EQ(found.exitCode, 0) << found.out << found.err;
        EXPECT_TRUE(Contains(found.out, "211 Found inexact matches")) << found.out;
        EXPECT_TRUE(Contains(found.out, "*2: misc 14001403 Band 2 / Album")) << found.out;
        EXPECT_TRUE(Contains(found.out, "Artist:  Band 2\nAlbum:   Album\nYear:    2001\n"))
            << found.out;
        EXPECT_TRUE(Contains(found.out, "  2  00:09  Two / Too\n")) << found.out;
        ASSERT_EQ(server.Requests().size(), 2u);
        EXPECT_TRUE(Contains(server.Requests()[1], "cmd=cddb+read+misc+14001403&hello="));

        // An entry the server sends without the comments every xmcd entry carries is no
        // record: exit 1 and the reason, not only "did not name".
        test::CddbTestServer broken;
        broken.AddRecord("rock", 0x14001403, "Band / Album",
                         "DISCID=14001403\r\nDTITLE=Band / Album\r\nTTITLE0=One\r\n");
        const test::ToolResult bare = Acrip({"--device", gapped.cuePath, "--cddb", "--server",
                                             "127.0.0.1:" + std::to_string(broken.Port())});
        EXPECT_EQ(bare.exitCode, 1);
        EXPECT_TRUE(Contains(bare.err, "acrip: The disc entry")) << bare.err;

        // A match number past the list takes the first, and says so.
        const test::ToolResult past =
            Acrip({"--device", gapped.cuePath, "--cddb", "--server",
                   "127.0.0.1:" + std::to_string(server.Port()), "--choose", "7"});
        EXPECT_EQ(past.exitCode, 0) << past.err;
        EXPECT_TRUE(Contains(past.err, "only 3 matches")) << past.err;
        // Back to the second, which the offline listing below must show.
        EXPECT_EQ(Acrip({"--device", gapped.cuePath, "--cddb", "--server",
                         "127.0.0.1:" + std::to_string(server.Port()), "--choose", "2"})
                      .exitCode,
                  0);
    }
    // The server is gone: the record keeps the names.
    const test::ToolResult list = Acrip({"--device", gapped.cuePath, "--list"});
    EXPECT_TRUE(Contains(list.out, "Artist:  Band 2\n")) << list.out;
    EXPECT_TRUE(Contains(list.out, "  1  00:07  One\n")) << list.out;

    // A server that refuses: exit 1, the connect text, and the disc kept for the batch.
    const test::ToolResult refused =
        Acrip({"--device", gapped.cuePath, "--cddb", "--server", "127.0.0.1:1"});
    EXPECT_EQ(refused.exitCode, 1);
    EXPECT_TRUE(Contains(refused.out, "Could not connect to the CDDB HTTP server 127.0.0.1"))
        << refused.out;
    EXPECT_TRUE(fs::exists(dir / "records/CDDB_Batch.txt"));
    EXPECT_EQ(Acrip({"--choose", "2"}).exitCode, 2) << "--choose goes with --cddb";
}

TEST_F(AcripTest, AskedTracksRipSampleExactToWavAndFlacIntoArtistAndAlbumFolders) {
    const std::string folder = "The Testers/Test Album/";
    const test::ToolResult wav = Acrip(
        {"--device", image.cuePath, "--tracks", "1,3", "--profile", "wav", "--out", dir / "wav"});
    ASSERT_EQ(wav.exitCode, 0) << wav.out << wav.err;
    EXPECT_TRUE(Contains(wav.out, "2 of 2 tracks ripped")) << wav.out;
    // Track 3 keeps its number though track 2 was not asked for.
    ASSERT_EQ(FilesBelow(dir / "wav"),
              (std::vector<std::string>{folder + "01-The Testers-First Light.wav",
                                        folder + "03-The Testers-Third.wav"}));
    EXPECT_EQ(Decoded(dir / "wav/" + folder + "01-The Testers-First Light.wav").samples,
              test::PaddedPcm(image.tracks[0]).samples);
    EXPECT_EQ(Decoded(dir / "wav/" + folder + "03-The Testers-Third.wav").samples,
              test::PaddedPcm(image.tracks[2]).samples);

    // Without --out the setting OutputCDDir decides.
    SetString("OutputCDDir", dir / "flac");
    fs::create_directories(dir / "flac");
    const test::ToolResult flac =
        Acrip({"--device", image.cuePath, "--tracks", "3,1", "--profile", "flac"});
    ASSERT_EQ(flac.exitCode, 0) << flac.out << flac.err;
    ASSERT_EQ(FilesBelow(dir / "flac"),
              (std::vector<std::string>{folder + "01-The Testers-First Light.flac",
                                        folder + "03-The Testers-Third.flac"}));
    EXPECT_EQ(Decoded(dir / "flac/" + folder + "01-The Testers-First Light.flac").samples,
              test::PaddedPcm(image.tracks[0]).samples);
    EXPECT_EQ(Decoded(dir / "flac/" + folder + "03-The Testers-Third.flac").samples,
              test::PaddedPcm(image.tracks[2]).samples);

    // A .toc names its .bin relative to itself; the reader must find it from anywhere.
    const test::ToolResult toc = Acrip(
        {"--device", image.tocPath, "--tracks", "2", "--profile", "wav", "--out", dir / "toc"});
    ASSERT_EQ(toc.exitCode, 0) << toc.out << toc.err;
    EXPECT_EQ(Decoded(dir / "toc/" + folder + "02-The Testers-Second.wav").samples,
              test::PaddedPcm(image.tracks[1]).samples);
}

// Stopped by SIGTERM or Ctrl-C in the middle of a long track: the tool ends, nothing stays
// under a final name and no part file is left.
TEST_F(AcripTest, AStoppedRipLeavesNoFileAndExits130) {
    const test::DiscImage longDisc =
        test::WriteDiscImage(dir.Path(), "long",
                             {test::TrackSpec{44100 * 240, 0, false, 0, 440.0, 7},
                              test::TrackSpec{44100, 0, false, 0, 220.0, 8}});
    for (int signal : {SIGTERM, SIGINT}) {
        const std::string out = dir / ("out" + std::to_string(signal));
        RunningAcrip acrip({"--device", longDisc.cuePath, "--profile", "mp3", "--out", out},
                           dir / "log");
        ASSERT_GT(acrip.Pid(), 0);
        int writer = 0;
        for (int i = 0; i < 3000 && writer == 0; ++i) {
            for (const std::string& file : FilesBelow(out)) {
                const std::size_t tag = file.rfind(".ctt");
                if (file.ends_with(".part") && tag != std::string::npos)
                    writer = std::atoi(file.c_str() + tag + 4);
            }
            std::this_thread::sleep_for(std::chrono::milliseconds(10));
        }
        ASSERT_NE(writer, 0) << test::ReadFile(dir / "log");
        ::kill(acrip.Pid(), signal);
        EXPECT_EQ(acrip.Wait(), 130) << test::ReadFile(dir / "log");
        EXPECT_EQ(FilesBelow(out), std::vector<std::string>{}) << signal;
        EXPECT_FALSE(fs::exists("/proc/" + std::to_string(writer))) << "ctt still runs";
        EXPECT_TRUE(Contains(test::ReadFile(dir / "log"), "0 of 2 tracks ripped (stopped)"))
            << test::ReadFile(dir / "log");
    }
}

TEST_F(AcripTest, AFailedTrackSaysWhyAndTheOthersStillRip) {
    const std::string tool = dir / "fake-ctt";
    std::ofstream(tool) << "#!/bin/sh\nfor last; do :; done\n"
                           "case \"$*\" in *Track02.cda*) echo '|Error>>> cannot read sector 42' "
                           ">&2; exit 1;; esac\n"
                           "echo '|Time>>> 1'; printf audio > \"$last\"\n";
    ::chmod(tool.c_str(), 0755);
    ::setenv("AC_CTT_PATH", tool.c_str(), 1);
    const test::ToolResult run =
        Acrip({"--device", image.cuePath, "--profile", "wav", "--out", dir / "out"});
    EXPECT_EQ(run.exitCode, 1) << run.out << run.err;
    EXPECT_TRUE(Contains(run.out, "FAILED: 02 Second")) << run.out;
    EXPECT_TRUE(Contains(run.err, "    cannot read sector 42\n")) << run.err;
    EXPECT_TRUE(Contains(run.out, "2 of 3 tracks ripped")) << run.out;
    EXPECT_EQ(FilesBelow(dir / "out").size(), 2u);
}

TEST_F(AcripTest, UsageErrorsAndDiscsThatCannotBeRippedExit2WithAReason) {
    const test::ToolResult help = Acrip({"--help"});
    EXPECT_EQ(help.exitCode, 0);
    EXPECT_EQ(help.out.rfind("usage: acrip", 0), 0u) << help.out;
    EXPECT_TRUE(Contains(help.out, "  flac ")) << "the profiles are listed";
    EXPECT_EQ(help.err, "");

    struct Case {
        std::vector<std::string> args;
        std::string reason;
    };
    fs::copy_file(image.cuePath, dir / "lost.cue");  // its lost.bin was never there
    const std::vector<Case> cases = {
        {{"--device", image.cuePath, "--tracks", "9"}, "track 9 is not an audio track of the disc"},
        {{"--device", image.cuePath, "--tracks", "1,x"}, "--tracks 1,x: not a list of tracks"},
        {{"--device", image.cuePath, "--tracks", "3-1"}, "--tracks 3-1: not a list of tracks"},
        {{"--device", dir / "lost.cue"},
         "the image's audio file " + dir / "lost.bin" + " is missing"},
        {{"--device", dir / "nowhere.cue"}, "no such drive or disc image"},
        {{"--device", dir / "records/0e001003.cddb"}, "holds no audio disc"},
        {{"--device", image.cuePath, "--profile", "no such profile"},
         "no profile named no such profile"},
        {{"--server", "localhost"}, "--server and --choose go with --cddb"},
        {{"--cddb", "--choose", "0"}, "--choose 0: not a match number"},
        {{"--out"}, "--out needs a value"},
    };
    for (const Case& c : cases) {
        const test::ToolResult run = Acrip(c.args);
        EXPECT_EQ(run.exitCode, 2) << c.reason << "\n" << run.out << run.err;
        EXPECT_TRUE(Contains(run.err, c.reason)) << run.err;
    }
    EXPECT_TRUE(
        Contains(Acrip({"--device", image.cuePath, "--tracks", "9"}).err, "(audio tracks: 1-3)"));
}

}  // namespace
}  // namespace ac
