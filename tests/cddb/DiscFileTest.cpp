#include "cddb/DiscFile.h"

#include "support/TempDir.h"

#include <gtest/gtest.h>

#include <sys/stat.h>

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <random>
#include <sstream>

using cddb::CDDiscInfo;

namespace {

std::string ReadBytes(const std::string& path) {
    std::ifstream in(path, std::ios::binary);
    std::ostringstream bytes;
    bytes << in.rdbuf();
    return bytes.str();
}

void WriteBytes(const std::string& path, const std::string& bytes) {
    std::ofstream(path, std::ios::binary) << bytes;
}

CDDiscInfo Nightwish() {
    CDDiscInfo info;
    info.artist = "Nightwish";
    info.album = "Once";
    info.genre = "Symphonic Metal";
    info.year = "2004";
    info.titles = {"Dark Chest Of Wonders", "Wish I Had An Angel", "Kuolema Tekee Taiteilijan"};
    info.trackCount = 3;
    return info;
}

void ExpectSameRecord(const CDDiscInfo& a, const CDDiscInfo& b) {
    EXPECT_EQ(a.artist, b.artist);
    EXPECT_EQ(a.album, b.album);
    EXPECT_EQ(a.genre, b.genre);
    EXPECT_EQ(a.year, b.year);
    EXPECT_EQ(a.trackCount, b.trackCount);
    EXPECT_EQ(a.titles, b.titles);
}

constexpr char kNightwishFile[] =
    "[CDINFO]\r\nARITIST=Nightwish\r\nALBUM=Once\r\nGENRE=Symphonic Metal\r\nYEAR=2004\r\n"
    "[MUSIC]\r\nTotal=3\r\nTrack00=Dark Chest Of Wonders\r\nTrack01=Wish I Had An Angel\r\n"
    "Track02=Kuolema Tekee Taiteilijan\r\n";

TEST(DiscFileTest, SavedInTheOrderOfTheTableAndReadBackInBothFormats) {
    ac::test::TempDir folder;
    ASSERT_TRUE(
        cddb::SaveDiscFile(folder.Path(), "840e160b", Nightwish(), cddb::kWindowsDiscFileFormat));
    const std::string path = folder / "840e160b.cddb";
    EXPECT_EQ(ReadBytes(path), kNightwishFile);
    CDDiscInfo loaded;
    ASSERT_TRUE(cddb::LoadDiscFile(folder.Path() + "/", 0x840e160b, loaded));
    ExpectSameRecord(loaded, Nightwish());

    // The Unix form: every CR is a NUL, the length stays.
    ASSERT_TRUE(
        cddb::SaveDiscFile(folder.Path(), "840e160b", Nightwish(), cddb::kUnixDiscFileFormat));
    std::string expected = kNightwishFile;
    std::replace(expected.begin(), expected.end(), '\r', '\0');
    EXPECT_EQ(ReadBytes(path), expected);
    ASSERT_TRUE(cddb::LoadDiscFile(folder.Path(), 0x840e160b, loaded));
    ExpectSameRecord(loaded, Nightwish());
    // Nothing is left beside it under a temporary name.
    EXPECT_EQ(std::distance(std::filesystem::directory_iterator(folder.Path()),
                            std::filesystem::directory_iterator()),
              1);
}

TEST(DiscFileTest, FileNamesHaveEightLowerCaseDigitsAndIdTextsCannotLeaveTheFolder) {
    EXPECT_EQ(cddb::DiscFilePath("/cache", 0x00ab12cd), "/cache/00ab12cd.cddb");
    EXPECT_EQ(cddb::DiscFilePath("/cache/", 0xFFFFFFFF), "/cache/ffffffff.cddb");
    ac::test::TempDir folder;
    ASSERT_TRUE(cddb::SaveDiscFile(folder.Path(), " AB12CD ", Nightwish(), 0));
    EXPECT_TRUE(std::filesystem::exists(folder / "00ab12cd.cddb"));
    for (const char* bad : {"", "../../x", "123456789", "+12", "12 34", "wxyz"}) {
        EXPECT_FALSE(cddb::SaveDiscFile(folder.Path(), bad, Nightwish(), 0)) << bad;
    }
    CDDiscInfo info = Nightwish();
    EXPECT_FALSE(cddb::LoadDiscFile(folder.Path(), 0x12345678, info));
    EXPECT_EQ(info.trackCount, 0);
    EXPECT_TRUE(info.artist.empty());
}

TEST(DiscFileTest, TitlesFromALookupAreCutAndKeptOnTheirLines) {
    CDDiscInfo info = Nightwish();
    info.titles[0] = "Line one\nLine two";
    info.titles[1] = std::string(300, 'x');
    info.titles.resize(120, "more");
    info.trackCount = 120;
    ac::test::TempDir folder;
    ASSERT_TRUE(cddb::SaveDiscFile(folder.Path(), "840e160b", info, 0));
    CDDiscInfo loaded;
    ASSERT_TRUE(cddb::LoadDiscFile(folder.Path(), 0x840e160b, loaded));
    EXPECT_EQ(loaded.trackCount, 99);
    EXPECT_EQ(loaded.Title(0), "Line one Line two");
    EXPECT_EQ(loaded.Title(1), std::string(259, 'x'));
    EXPECT_EQ(loaded.Title(98), "more");
}

TEST(DiscFileTest, TotalDecidesHowManyTitlesAreRead) {
    CDDiscInfo info;
    cddb::ParseDiscFileText("[CDINFO]\nARITIST=A\n[MUSIC]\nTrack00=lost\n", info);
    EXPECT_EQ(info.artist, "A");
    EXPECT_EQ(info.trackCount, 0);
    cddb::ParseDiscFileText("[MUSIC]\nTotal=2\nTrack01=second\nTrack05=beyond\n", info);
    EXPECT_EQ(info.titles, (std::vector<std::string>{"", "second"}));
    cddb::ParseDiscFileText("[MUSIC]\nTotal=-4\n", info);
    EXPECT_EQ(info.trackCount, 0);
    cddb::ParseDiscFileText("[MUSIC]\nTotal=99999999999\n", info);
    EXPECT_EQ(info.trackCount, 99);
}

// The Latin-1 record of the corpus, cached by a Windows program in its own code page.
TEST(DiscFileTest, RecordInLatin1IsReadAsUtf8) {
    std::ifstream in(std::string(AC_CORPUS_DIR) + "/xmcd/rubyripper_38043805_latin1.xmcd",
                     std::ios::binary);
    std::string line;
    std::string file = "[CDINFO]\r\n";
    int track = 0;
    while (std::getline(in, line)) {
        if (line.starts_with("DTITLE=")) {
            const std::size_t slash = line.find(" / ");
            file += "ARITIST=" + line.substr(7, slash - 7) + "\r\nALBUM=" + line.substr(slash + 3) +
                    "\r\n[MUSIC]\r\nTotal=5\r\n";
        } else if (line.starts_with("TTITLE")) {
            file +=
                "Track0" + std::to_string(track++) + "=" + line.substr(line.find('=') + 1) + "\r\n";
        }
    }
    ASSERT_EQ(track, 5);
    ac::test::TempDir folder;
    WriteBytes(folder / "38043805.cddb", file);
    CDDiscInfo info;
    ASSERT_TRUE(cddb::LoadDiscFile(folder.Path(), 0x38043805, info));
    EXPECT_EQ(info.artist, "Die \xC3\x84rzte");
    EXPECT_EQ(info.album, "Ein Schwein namens M\xC3\xA4nner");
    EXPECT_EQ(info.Title(3),
              "Ein L\xC3\xA4"
              "cheln (f\xC3\xBCr jeden Tag deines Lebens)");
    EXPECT_EQ(info.Title(4), "M\xC3\xA4nner sind Schweine (Jetzt noch k\xC3\xBCrzer!)");
}

TEST(DiscFileTest, HugeTruncatedAndDamagedFilesGiveARecord) {
    ac::test::TempDir folder;
    const std::string path = folder / "00000001.cddb";
    // A megabyte-long artist between good keys.
    WriteBytes(path, "[CDINFO]\r\nARITIST=" + std::string(1 << 20, 'a') +
                         "\r\nALBUM=Once\r\n[MUSIC]\r\nTotal=1\r\nTrack00=Nemo\r\n");
    CDDiscInfo info;
    ASSERT_TRUE(cddb::LoadDiscFile(folder.Path(), 1, info));
    EXPECT_EQ(info.artist, std::string(99, 'a'));
    EXPECT_EQ(info.album, "Once");
    EXPECT_EQ(info.Title(0), "Nemo");

    // A megabyte of random bytes, and a file past the size limit.
    std::mt19937 random(7);
    std::string noise(1 << 20, '\0');
    for (char& c : noise)
        c = static_cast<char>(random());
    WriteBytes(path, noise);
    EXPECT_TRUE(cddb::LoadDiscFile(folder.Path(), 1, info));
    WriteBytes(path, "[CDINFO]\nARITIST=A\n" + std::string(5 << 20, ' '));
    EXPECT_TRUE(cddb::LoadDiscFile(folder.Path(), 1, info));
    EXPECT_TRUE(info.artist.empty());

    // Cut anywhere, a record reads as the part of it that arrived.
    const std::string whole = kNightwishFile;
    for (std::size_t cut = 0; cut <= whole.size(); ++cut) {
        WriteBytes(path, whole.substr(0, cut));
        ASSERT_TRUE(cddb::LoadDiscFile(folder.Path(), 1, info));
        EXPECT_TRUE(std::string("Nightwish").starts_with(info.artist)) << cut;
        EXPECT_LE(info.trackCount, 3);
        EXPECT_EQ(info.titles.size(), static_cast<std::size_t>(info.trackCount));
    }

    // A folder where the file should be is no record.
    std::filesystem::remove(path);
    std::filesystem::create_directory(path);
    EXPECT_FALSE(cddb::LoadDiscFile(folder.Path(), 1, info));
}

TEST(DiscFileTest, LocalFolderDefaultsToTheUserDataFolderAndIsCreated) {
    ac::test::TempDir home;
    const char* old = std::getenv("XDG_DATA_HOME");
    const std::string saved = old ? old : "";
    setenv("XDG_DATA_HOME", home.Path().c_str(), 1);
    const std::string folder = cddb::LocalCddbFolder("");
    EXPECT_EQ(folder, home.Path() + "/audio-converter/CDDB");
    EXPECT_TRUE(std::filesystem::is_directory(folder));
    EXPECT_EQ(cddb::LocalCddbFolder(home / "mine/cddb"), home / "mine/cddb");
    EXPECT_TRUE(std::filesystem::is_directory(home / "mine/cddb"));
    if (old) {
        setenv("XDG_DATA_HOME", saved.c_str(), 1);
    } else {
        unsetenv("XDG_DATA_HOME");
    }
}

}  // namespace
