#include "resources/Package.h"

#include "resources/PackageWriter.h"
#include "resources/ZipArchive.h"

#include <gtest/gtest.h>

#include <sys/resource.h>
#include <unistd.h>

#include <csignal>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <sstream>
#include <thread>

namespace {

namespace fs = std::filesystem;

std::string ReadFile(const fs::path& path) {
    std::ifstream in(path, std::ios::binary);
    std::ostringstream out;
    out << in.rdbuf();
    return out.str();
}

void WriteFile(const fs::path& path, const std::string& bytes) {
    std::ofstream(path, std::ios::binary) << bytes;
}

void PutU32(std::string& bytes, std::size_t offset, std::uint32_t value) {
    for (int i = 0; i < 4; ++i) {
        bytes[offset + static_cast<std::size_t>(i)] = static_cast<char>((value >> (8 * i)) & 0xFF);
    }
}

// ---------------------------------------------------------------------------------------------
// Path mapping: pure text rules.

struct MapCase {
    const char* path;
    const char* mapped;
};

class MapResourcePathTest : public ::testing::TestWithParam<MapCase> {};

TEST_P(MapResourcePathTest, MapsByTextAloneAndOnlyOnce) {
    const std::string mapped = ac::MapResourcePath(GetParam().path);
    EXPECT_EQ(mapped, GetParam().mapped);
    EXPECT_EQ(ac::MapResourcePath(mapped), mapped);
}

INSTANTIATE_TEST_SUITE_P(
    Table, MapResourcePathTest,
    ::testing::Values(MapCase{"/b\\Skin\\Default\\skin.ini",
                              "/b\\data.pkg\\skin\\Default\\skin.ini"},
                      MapCase{"/b\\lang\\English.lang", "/b\\data.pkg\\lang\\English.lang"},
                      MapCase{"/b\\profile\\mp3.pf", "/b\\data.pkg\\profile\\mp3.pf"},
                      MapCase{"/b\\profile\\user\\mine.pf", "/b\\user.pkg\\profile\\user\\mine.pf"},
                      MapCase{"/b\\data.pkg\\Skin\\x", "/b\\data.pkg\\Skin\\x"},
                      MapCase{"/b\\user.pkg\\profile\\x.pf", "/b\\user.pkg\\profile\\x.pf"},
                      MapCase{"/b\\skin\\Default\\skin.ini", "/b\\skin\\Default\\skin.ini"},
                      MapCase{"/b\\help\\tempfile.htm", "/b\\help\\tempfile.htm"},
                      MapCase{"/home/me/music.mp3", "/home/me/music.mp3"},
                      // The words are matched anywhere, and every occurrence is replaced.
                      MapCase{"/my\\Skin\\b\\Skin\\x", "/my\\data.pkg\\skin\\b\\data.pkg\\skin\\x"},
                      MapCase{"/b\\Skin\\lang\\x", "/b\\data.pkg\\skin\\data.pkg\\lang\\x"}));

TEST(PackagePathParts, SplitAtTheFirstPackage) {
    EXPECT_EQ(ac::GetPackageFile("/b\\data.pkg\\skin\\a.pkg\\x"), "/b\\data.pkg");
    EXPECT_EQ(ac::GetEntryName("/b\\data.pkg\\skin\\a.pkg\\x"), "skin\\a.pkg\\x");
    EXPECT_EQ(ac::GetPackageFile("/b\\plain\\x"), "");
    EXPECT_EQ(ac::GetEntryName("/b\\plain\\x"), "");
    EXPECT_EQ(ac::GetEntryName("/b\\data.pkg"), "");
}

// ---------------------------------------------------------------------------------------------
// A data.pkg and a user data folder of our own in a temporary directory, per test.

class PackageFixture : public ::testing::Test {
protected:
    void SetUp() override {
        char pattern[] = "/tmp/ac-pkg-XXXXXX";
        ASSERT_NE(::mkdtemp(pattern), nullptr);
        m_base = pattern;
        m_xdg = m_base + "/xdg";
        ::setenv("XDG_DATA_HOME", m_xdg.c_str(), 1);
        m_userPkg = m_xdg + "/audio-converter/user.pkg";
    }
    void TearDown() override { fs::remove_all(m_base); }

    void WriteDataPackage() {
        ac::PackageWriter writer;
        ASSERT_TRUE(writer.Create());
        // Blue has no directory entry of its own; Upper is spelt with a capital in the archive.
        for (const char* directory : {"skin", "skin/Default", "skin/Zed", "lang", "profile"}) {
            ASSERT_TRUE(writer.AddDirectory(directory));
        }
        ASSERT_TRUE(writer.Put("skin/Default/skin.ini", "[Main]\r\nLeftMargin=4\r\n"));
        ASSERT_TRUE(writer.Put("skin/Default/bg.bmp", std::string(3000, 'b')));
        ASSERT_TRUE(writer.Put("skin/Default/sub/deep.png", "p"));
        ASSERT_TRUE(writer.Put("skin/Blue/skin.ini", "[Main]\r\n"));
        ASSERT_TRUE(writer.Put("skin/Zed/skin.ini", "[Main]\r\n"));
        ASSERT_TRUE(writer.Put("Skin/Upper/skin.ini", "[Main]\r\n"));
        ASSERT_TRUE(writer.Put("lang/English.lang", "a\r\nb\nc\n"));
        ASSERT_TRUE(writer.Put("lang/German.lang", "no final line end"));
        ASSERT_TRUE(writer.Put("lang/readme.txt", "x"));
        ASSERT_TRUE(writer.Put("lang/empty.lang", ""));
        ASSERT_TRUE(writer.Put("profile/mp3.pf", "[General]\r\nBitrate=128\r\n"));
        ASSERT_TRUE(writer.Commit(m_base + "/data.pkg"));
    }

    std::string Logical(const std::string& below) const { return m_base + "\\" + below; }

    std::vector<std::string> Walk(const std::string& pattern, std::vector<std::string>* paths) {
        std::vector<std::string> names;
        ac::ImPackageFinder finder;
        bool more = finder.FindFile(pattern);
        while (more) {
            more = finder.FindNextFile();
            names.push_back(finder.GetFileName());
            if (paths != nullptr) {
                paths->push_back(finder.GetFilePath());
            }
        }
        return names;
    }

    std::string m_base;
    std::string m_xdg;
    std::string m_userPkg;
};

using Listing = PackageFixture;

TEST_F(Listing, SkinsListOnceEachSortedWithTheirPaths) {
    WriteDataPackage();
    std::vector<std::string> paths;
    EXPECT_EQ(Walk(Logical("Skin\\*.*"), &paths),
              (std::vector<std::string>{"Blue", "Default", "Zed"}));
    EXPECT_EQ(paths.front(), Logical("data.pkg\\skin\\Blue"));
    // A sub-directory lists as a name; the pattern's extension is never applied.
    EXPECT_EQ(Walk(Logical("data.pkg\\skin\\Default\\"), nullptr),
              (std::vector<std::string>{"bg.bmp", "skin.ini", "sub"}));
    EXPECT_EQ(
        Walk(Logical("lang\\*.lang"), nullptr),
        (std::vector<std::string>{"English.lang", "German.lang", "empty.lang", "readme.txt"}));
    EXPECT_EQ(Walk(Logical("profile\\*.pf"), nullptr), (std::vector<std::string>{"mp3.pf"}));
    EXPECT_TRUE(Walk(Logical("profile\\user\\*.pf"), nullptr).empty());
}

TEST_F(Listing, IsDirectoryNeedsADirectoryEntry) {
    WriteDataPackage();
    ac::ImPackageFinder finder;
    std::map<std::string, bool> directories;
    bool more = finder.FindFile(Logical("Skin\\*.*"));
    while (more) {
        more = finder.FindNextFile();
        directories[finder.GetFileName()] = finder.IsDirectory();
    }
    EXPECT_EQ(directories,
              (std::map<std::string, bool>{{"Blue", false}, {"Default", true}, {"Zed", true}}));
    finder.Close();
    EXPECT_EQ(finder.GetFileName(), "");
    EXPECT_FALSE(finder.IsDirectory());
}

TEST_F(Listing, NamedLookupIgnoresCaseOfTheNameButNotOfArchiveFolders) {
    WriteDataPackage();
    ac::ImPackageFinder finder;
    EXPECT_TRUE(finder.FindFile(Logical("Skin\\Default")));
    EXPECT_TRUE(finder.FindFile(Logical("Skin\\DEFAULT")));
    EXPECT_EQ(finder.Names(), (std::vector<std::string>{"Blue", "Default", "Zed"}));
    EXPECT_TRUE(finder.FindFile(Logical("data.pkg\\skin\\default")));
    EXPECT_FALSE(finder.FindFile(Logical("Skin\\Nope")));
    // The lookup folds the folders to lower case too, so names inside "skin/Default" or
    // "Skin/Upper" cannot be found this way.
    EXPECT_FALSE(finder.FindFile(Logical("Skin\\Default\\skin.ini")));
    EXPECT_FALSE(finder.FindFile(Logical("Skin\\Upper")));
    EXPECT_TRUE(finder.FindFile(Logical("lang\\ENGLISH.LANG")));
}

TEST_F(Listing, MissingOrPlainPackagesListNothing) {
    ac::ImPackageFinder finder;
    EXPECT_FALSE(finder.FindFile(Logical("Skin\\*.*")));
    EXPECT_FALSE(finder.FindFile(Logical("Skin\\Default")));
    WriteDataPackage();
    EXPECT_FALSE(finder.FindFile(Logical("Skin\\Default\\")));  // no package named: disk path
    EXPECT_FALSE(finder.FindFile(Logical("data.pkg\\nothing\\")));
    EXPECT_FALSE(finder.FindNextFile());
}

using Reading = PackageFixture;

TEST_F(Reading, ExistsAndReadFollowTheMappedPath) {
    WriteDataPackage();
    std::vector<unsigned char> block;
    EXPECT_TRUE(ac::ReadResource(Logical("Skin\\default\\BG.BMP"), block));
    EXPECT_EQ(block.size(), 3000u);
    EXPECT_LT(fs::file_size(m_base + "/data.pkg"), 3000u);  // entries are deflated
    EXPECT_TRUE(ac::ResourceExists(Logical("Skin\\Default\\skin.ini")));
    EXPECT_TRUE(ac::ResourceExists(Logical("Skin\\Default\\")));
    EXPECT_TRUE(ac::ResourceExists(Logical("data.pkg\\skin\\default\\sub\\deep.png")));
    EXPECT_FALSE(ac::ResourceExists(Logical("Skin\\Default\\none.bmp")));
    EXPECT_FALSE(ac::ReadResource(Logical("Skin\\Default\\none.bmp"), block));
    EXPECT_TRUE(block.empty());
    EXPECT_FALSE(ac::ResourceExists(Logical("profile\\user\\mine.pf")));

    // A path naming no package is a disk path: it may exist, but is never read.
    WriteFile(m_base + "/help.htm", "<html>");
    EXPECT_TRUE(ac::ResourceExists(Logical("help.htm")));
    EXPECT_TRUE(ac::ResourceExists(Logical("*.htm")));
    EXPECT_FALSE(ac::ResourceExists(Logical("*.nothing")));
    EXPECT_FALSE(ac::ReadResource(Logical("help.htm"), block));
}

TEST_F(Reading, LinesKeepTheirCarriageReturns) {
    WriteDataPackage();
    ac::ImPackageFinder finder;
    ASSERT_TRUE(finder.ReadLines(Logical("lang\\English.lang")));
    EXPECT_EQ(finder.Names(), (std::vector<std::string>{"a\r", "b", "c"}));
    std::string line;
    EXPECT_TRUE(finder.NextLine(line));
    EXPECT_EQ(line, "a\r");
    EXPECT_TRUE(finder.NextLine(line));
    EXPECT_TRUE(finder.NextLine(line));
    EXPECT_FALSE(finder.NextLine(line));

    ASSERT_TRUE(finder.ReadLines(Logical("lang\\German.lang")));
    EXPECT_EQ(finder.Names(), (std::vector<std::string>{"no final line end"}));
    EXPECT_TRUE(finder.ReadLines(Logical("lang\\empty.lang")));
    EXPECT_TRUE(finder.Names().empty());
    EXPECT_FALSE(finder.NextLine(line));
    EXPECT_FALSE(finder.ReadLines(Logical("lang\\French.lang")));
    EXPECT_FALSE(finder.ReadLines(Logical("help\\plain.txt")));
}

// ---------------------------------------------------------------------------------------------
// Damaged and hostile packages: every read answers "no", nothing crashes, nothing hangs.

using Hostile = PackageFixture;

TEST_F(Hostile, ReadsGiveDefaultsForAnythingThatIsNoArchive) {
    WriteDataPackage();
    const std::string good = ReadFile(m_base + "/data.pkg");
    const std::string cuts[] = {"not a zip archive at all\n", good.substr(0, good.size() / 2),
                                good.substr(0, good.size() - 10), good.substr(good.size() / 2),
                                std::string(1000, '\0')};
    for (const std::string& bytes : cuts) {
        ac::ClosePackage(Logical("data.pkg"));
        WriteFile(m_base + "/data.pkg", bytes);
        std::vector<unsigned char> block;
        ac::ImPackageFinder finder;
        EXPECT_EQ(ac::OpenPackage(Logical("data.pkg")), nullptr);
        EXPECT_FALSE(ac::ReadResource(Logical("Skin\\Default\\skin.ini"), block));
        EXPECT_FALSE(ac::ResourceExists(Logical("Skin\\Default\\skin.ini")));
        EXPECT_FALSE(finder.FindFile(Logical("Skin\\*.*")));
        EXPECT_FALSE(finder.ReadLines(Logical("lang\\English.lang")));
        EXPECT_EQ(ac::ReadIniInt("Main", "LeftMargin", -3, Logical("Skin\\Default\\skin.ini")), -3);
    }
}

TEST_F(Hostile, DeclaredSizesAreNotTrusted) {
    ac::PackageWriter writer;
    ASSERT_TRUE(writer.Create());
    ASSERT_TRUE(writer.Put("skin/Default/skin.ini", "[Main]\r\nLeftMargin=4\r\n"));
    std::string bytes;
    ASSERT_TRUE(writer.Finish(bytes));
    const std::size_t central = bytes.find("PK\x01\x02");
    ASSERT_NE(central, std::string::npos);

    // A zip bomb: the header claims far more than the layer will ever inflate.
    std::string bomb = bytes;
    PutU32(bomb, 22, 0xFFFFFFF0u);
    PutU32(bomb, central + 24, 0xFFFFFFF0u);
    WriteFile(m_base + "/data.pkg", bomb);
    std::vector<unsigned char> block;
    EXPECT_TRUE(ac::ResourceExists(Logical("Skin\\Default\\skin.ini")));
    EXPECT_FALSE(ac::ReadResource(Logical("Skin\\Default\\skin.ini"), block));
    EXPECT_EQ(ac::ReadIniInt("Main", "LeftMargin", -3, Logical("Skin\\Default\\skin.ini")), -3);

    // A size a little above the truth: the short read is a failure, not a padded text.
    std::string longer = bytes;
    PutU32(longer, 22, 40);
    PutU32(longer, central + 24, 40);
    ac::ClosePackage(Logical("data.pkg"));
    WriteFile(m_base + "/data.pkg", longer);
    EXPECT_FALSE(ac::ReadResource(Logical("Skin\\Default\\skin.ini"), block));
    ac::ImPackageFinder finder;
    EXPECT_FALSE(finder.ReadLines(Logical("Skin\\Default\\skin.ini")));
}

// ---------------------------------------------------------------------------------------------
// user.pkg: created by the first write, rewritten whole and atomically, never left damaged.

class UserPackage : public PackageFixture {
protected:
    std::string Profile(const char* name = "mine.pf") const {
        return Logical(std::string("profile\\user\\") + name);
    }
};

TEST_F(UserPackage, FirstWriteCreatesItAndReadsSeeEveryWrite) {
    EXPECT_EQ(ac::ReadIniText("General", "Bitrate", "dflt", Profile()), "dflt");
    EXPECT_FALSE(fs::exists(m_userPkg));

    ASSERT_TRUE(ac::WriteIniString("General", "Bitrate", "128", Profile()));
    ASSERT_TRUE(fs::exists(m_userPkg));
    EXPECT_EQ(ac::ReadIniInt("General", "Bitrate", 0, Profile()), 128);
    ASSERT_TRUE(ac::WriteIniString("General", "Bitrate", "192", Profile()));
    ASSERT_TRUE(ac::WriteIniString("General", "Mode", "joint", Profile()));
    EXPECT_EQ(ac::ReadIniInt("General", "Bitrate", 0, Profile()), 192);
    EXPECT_EQ(ac::ReadIniText("General", "Mode", "", Profile()), "joint");

    // The stored text is CR LF throughout, newest key first, one line per key.
    auto archive = ac::ZipArchive::Open(m_userPkg);
    ASSERT_NE(archive, nullptr);
    std::string text;
    ASSERT_EQ(archive->Read("profile/user/mine.pf", text, 1024), ac::ZipArchive::ReadStatus::Ok);
    EXPECT_EQ(text, "[General]\r\nMode = joint\r\nBitrate = 192\r\n");
    EXPECT_EQ(ReadFile(m_userPkg).find("profile\\"), std::string::npos);

    ac::ImPackageFinder finder;
    EXPECT_TRUE(finder.FindFile(Logical("profile\\user\\*.*")));
    EXPECT_EQ(finder.Names(), (std::vector<std::string>{"mine.pf"}));
}

TEST_F(UserPackage, RemoveResourceTakesOneEntry) {
    ASSERT_TRUE(ac::WriteIniString("General", "A", "1", Profile("a.pf")));
    ASSERT_TRUE(ac::WriteIniString("General", "B", "2", Profile("b.pf")));
    EXPECT_TRUE(ac::RemoveResource(Profile("A.PF")));
    EXPECT_FALSE(ac::RemoveResource(Profile("a.pf")));
    EXPECT_FALSE(ac::ResourceExists(Profile("a.pf")));
    EXPECT_EQ(ac::ReadIniInt("General", "B", 0, Profile("b.pf")), 2);
    EXPECT_TRUE(ac::RemoveResource(Profile("b.pf")));
    // An archive without entries stays a valid archive.
    EXPECT_NE(ac::ZipArchive::Open(m_userPkg), nullptr);
    EXPECT_FALSE(ac::RemoveResource(Logical("Skin\\Default\\skin.ini")));
}

TEST_F(UserPackage, ReplacementKeepsTheStoredSpelling) {
    ASSERT_TRUE(ac::WriteIniString("General", "A", "1", Profile("MyMP3.pf")));
    ASSERT_TRUE(ac::WriteIniString("General", "A", "2", Profile("mymp3.PF")));
    ac::ImPackageFinder finder;
    ASSERT_TRUE(finder.FindFile(Logical("profile\\user\\*.pf")));
    EXPECT_EQ(finder.Names(), (std::vector<std::string>{"MyMP3.pf"}));
    EXPECT_EQ(ac::ReadIniInt("General", "A", 0, Profile("MYMP3.pf")), 2);
}

TEST_F(UserPackage, OnlyUserPackageIsWritable) {
    WriteDataPackage();
    const std::string before = ReadFile(m_base + "/data.pkg");
    EXPECT_FALSE(ac::WriteIniString("Main", "LeftMargin", "9", Logical("Skin\\Default\\skin.ini")));
    EXPECT_FALSE(ac::WriteIniString("Main", "LeftMargin", "9", Logical("plain\\x.ini")));
    EXPECT_FALSE(ac::WriteIniString(nullptr, "K", "9", Profile()));
    EXPECT_EQ(ReadFile(m_base + "/data.pkg"), before);
}

TEST_F(UserPackage, DamagedPackageIsSetAsideAndSavingGoesOn) {
    ASSERT_TRUE(fs::create_directories(fs::path(m_userPkg).parent_path()));
    WriteFile(m_userPkg, "garbage, not an archive");
    EXPECT_EQ(ac::ReadIniText("General", "A", "dflt", Profile()), "dflt");
    ASSERT_TRUE(ac::WriteIniString("General", "A", "1", Profile()));
    EXPECT_EQ(ac::ReadIniInt("General", "A", 0, Profile()), 1);
    int setAside = 0;
    for (const auto& entry : fs::directory_iterator(fs::path(m_userPkg).parent_path())) {
        if (entry.path().filename().string().starts_with("user.pkg.damaged-")) {
            ++setAside;
            EXPECT_EQ(ReadFile(entry.path()), "garbage, not an archive");
        }
    }
    EXPECT_EQ(setAside, 1);
}

TEST_F(UserPackage, FailedWriteLeavesThePreviousFileByteIdentical) {
    ASSERT_TRUE(ac::WriteIniString("General", "Small", "1", Profile()));
    const std::string before = ReadFile(m_userPkg);

    // Cap file sizes below what the rewrite needs: the temporary file cannot be written, as on
    // a full disk. Works for root too, unlike a read-only folder.
    struct rlimit saved {};
    ASSERT_EQ(::getrlimit(RLIMIT_FSIZE, &saved), 0);
    auto oldHandler = std::signal(SIGXFSZ, SIG_IGN);
    struct rlimit capped = saved;
    capped.rlim_cur = before.size() + 64;
    ASSERT_EQ(::setrlimit(RLIMIT_FSIZE, &capped), 0);
    std::string big(200000, 'x');
    for (std::size_t i = 0; i < big.size(); i += 7) {
        big[i] = static_cast<char>('a' + (i * 31) % 26);  // keep deflate from hiding the size
    }
    const bool written = ac::WriteIniString("General", "Big", big.c_str(), Profile());
    ASSERT_EQ(::setrlimit(RLIMIT_FSIZE, &saved), 0);
    std::signal(SIGXFSZ, oldHandler);

    EXPECT_FALSE(written);
    EXPECT_EQ(ReadFile(m_userPkg), before);
    EXPECT_EQ(ac::ReadIniInt("General", "Small", 0, Profile()), 1);
    for (const auto& entry : fs::directory_iterator(fs::path(m_userPkg).parent_path())) {
        EXPECT_EQ(entry.path().filename(), "user.pkg") << "left behind: " << entry.path();
    }
}

TEST_F(UserPackage, UnreadableEntryIsNotOverwritten) {
    ASSERT_TRUE(ac::WriteIniString("General", "A", "1", Profile()));
    std::string bytes = ReadFile(m_userPkg);
    const std::size_t central = bytes.find("PK\x01\x02");
    ASSERT_NE(central, std::string::npos);
    PutU32(bytes, central + 24, 0xFFFFFFF0u);
    WriteFile(m_userPkg, bytes);
    EXPECT_FALSE(ac::WriteIniString("General", "B", "2", Profile()));
    EXPECT_EQ(ReadFile(m_userPkg), bytes);
}

TEST_F(UserPackage, ConcurrentWritersKeepEveryKey) {
    constexpr int kKeys = 15;
    auto writer = [this](const char* prefix) {
        for (int i = 0; i < kKeys; ++i) {
            std::string key = prefix + std::to_string(i);
            EXPECT_TRUE(ac::WriteIniString("General", key.c_str(), "v", Profile()));
        }
    };
    std::atomic<bool> done{false};
    std::thread reader([&] {
        while (!done) {
            ac::ReadIniInt("General", "A0", 0, Profile());
            std::vector<unsigned char> block;
            ac::ReadResource(Profile(), block);
            ac::ImPackageFinder finder;
            finder.FindFile(Logical("profile\\user\\*.*"));
        }
    });
    std::thread first(writer, "A");
    std::thread second(writer, "B");
    first.join();
    second.join();
    done = true;
    reader.join();
    for (const char* prefix : {"A", "B"}) {
        for (int i = 0; i < kKeys; ++i) {
            std::string key = prefix + std::to_string(i);
            EXPECT_EQ(ac::ReadIniText("General", key.c_str(), "", Profile()), "v") << key;
        }
    }
}

}  // namespace
