#include "resources/Package.h"

#include "resources/PackageWriter.h"
#include "resources/ZipArchive.h"

#include <gtest/gtest.h>

#include <sys/resource.h>

#include <atomic>
#include <csignal>
#include <thread>

#include "../support/PackageDir.h"

namespace {

namespace fs = std::filesystem;
using ac::test::ReadFile;
using ac::test::WriteFile;
using Names = std::vector<std::string>;

void PutU32(std::string& bytes, std::size_t offset, std::uint32_t value) {
    for (std::size_t i = 0; i < 4; ++i) {
        bytes[offset + i] = static_cast<char>((value >> (8 * i)) & 0xFF);
    }
}

// Forges the uncompressed size of the first entry in its local and its central header.
std::string ForgeSize(std::string bytes, std::uint32_t size) {
    const std::size_t central = bytes.find("PK\x01\x02");
    EXPECT_NE(central, std::string::npos);
    PutU32(bytes, 22, size);
    PutU32(bytes, central + 24, size);
    return bytes;
}

// Every read maps its path twice, so mapping a mapped path is covered by all tests below.
TEST(PackagePaths, MappingIsByTextAlone) {
    EXPECT_EQ(ac::MapResourcePath("/b\\skin\\Default\\x"), "/b\\skin\\Default\\x");
    EXPECT_EQ(ac::MapResourcePath("/b\\Skin\\lang\\Skin\\x"),
              "/b\\data.pkg\\skin\\data.pkg\\lang\\data.pkg\\skin\\x");
    EXPECT_EQ(ac::MapResourcePath("/b\\profile\\mp3.pf"), "/b\\data.pkg\\profile\\mp3.pf");
    EXPECT_EQ(ac::GetPackageFile("/b\\data.pkg\\skin\\a.pkg\\x"), "/b\\data.pkg");
    EXPECT_EQ(ac::GetEntryName("/b\\data.pkg\\skin\\a.pkg\\x"), "skin\\a.pkg\\x");
}

class Package : public ac::test::PackageDir {
protected:
    // Blue has no directory entry of its own; Upper is spelt with a capital in the archive.
    void WriteDataPackage() {
        WritePackage({{"skin/", ""},
                      {"skin/Default/", ""},
                      {"skin/Zed/", ""},
                      {"skin/Default/skin.ini", "[Main]\r\nLeftMargin=4\r\n"},
                      {"skin/Default/bg.bmp", std::string(3000, 'b')},
                      {"skin/Default/sub/deep.png", "p"},
                      {"skin/Blue/skin.ini", "[Main]\r\n"},
                      {"skin/Zed/skin.ini", "[Main]\r\n"},
                      {"Skin/Upper/skin.ini", "[Main]\r\n"},
                      {"lang/English.lang", "a\r\nb\nc\n"},
                      {"lang/German.lang", "no final line end"},
                      {"lang/readme.txt", "x"},
                      {"lang/empty.lang", ""}});
    }

    // The names of a listing; details gets each path, marked when it is a directory.
    Names Walk(const std::string& pattern, Names* details = nullptr) {
        ac::ImPackageFinder finder;
        Names names;
        for (bool more = finder.FindFile(pattern); more;) {
            more = finder.FindNextFile();
            names.push_back(finder.GetFileName());
            if (details != nullptr) {
                details->push_back(finder.GetFilePath() + (finder.IsDirectory() ? " dir" : ""));
            }
        }
        return names;
    }

    std::string Profile(const char* name = "mine.pf") const {
        return Logical(std::string("profile\\user\\") + name);
    }
    std::string UserPkg() const { return UserData("user.pkg"); }
};

TEST_F(Package, ListingsAreSortedOnceEachAndIgnoreTheExtension) {
    WriteDataPackage();
    Names details;
    EXPECT_EQ(Walk(Logical("Skin\\*.*"), &details), (Names{"Blue", "Default", "Zed"}));
    // IsDirectory needs a directory entry: Blue has none.
    const std::string skin = Logical("data.pkg\\skin\\");
    EXPECT_EQ(details, (Names{skin + "Blue", skin + "Default dir", skin + "Zed dir"}));
    // A sub-directory lists as a name.
    EXPECT_EQ(Walk(skin + "Default\\"), (Names{"bg.bmp", "skin.ini", "sub"}));
    EXPECT_EQ(Walk(Logical("lang\\*.lang")),
              (Names{"English.lang", "German.lang", "empty.lang", "readme.txt"}));
}

TEST_F(Package, NamedLookupIgnoresCaseOfTheNameButNotOfArchiveFolders) {
    ac::ImPackageFinder finder;
    EXPECT_FALSE(finder.FindFile(Logical("Skin\\Default")));  // no package yet
    WriteDataPackage();
    EXPECT_TRUE(finder.FindFile(Logical("Skin\\DEFAULT")));
    EXPECT_EQ(finder.Names(), (Names{"Blue", "Default", "Zed"}));
    EXPECT_TRUE(finder.FindFile(Logical("data.pkg\\skin\\default")));
    EXPECT_TRUE(finder.FindFile(Logical("lang\\ENGLISH.LANG")));
    // The folders are folded to lower case too, so names inside "skin/Default" or
    // "Skin/Upper" cannot be found this way.
    EXPECT_FALSE(finder.FindFile(Logical("Skin\\Default\\skin.ini")));
    EXPECT_FALSE(finder.FindFile(Logical("Skin\\Upper")));
    EXPECT_FALSE(finder.FindFile(Logical("Skin\\Default\\")));  // no package named: disk path
    EXPECT_FALSE(finder.FindFile(Logical("data.pkg\\nothing\\")));
}

TEST_F(Package, ReadsFollowTheMappedPath) {
    WriteDataPackage();
    std::vector<unsigned char> block;
    EXPECT_TRUE(ac::ReadResource(Logical("Skin\\default\\BG.BMP"), block));
    EXPECT_EQ(block.size(), 3000u);
    EXPECT_LT(fs::file_size(m_base + "/data.pkg"), 3000u);  // entries are deflated
    EXPECT_TRUE(ac::ResourceExists(Logical("Skin\\Default\\")));
    EXPECT_FALSE(ac::ReadResource(Logical("Skin\\Default\\none.bmp"), block));
    EXPECT_TRUE(block.empty());
    WriteFile(m_base + "/help.htm", "<html>");
    EXPECT_TRUE(ac::ResourceExists(Logical("*.htm")));
    EXPECT_FALSE(ac::ReadResource(Logical("help.htm"), block));

    // Lines split at LF and keep their CR.
    ac::ImPackageFinder finder;
    ASSERT_TRUE(finder.ReadLines(Logical("lang\\English.lang")));
    EXPECT_EQ(finder.Names(), (Names{"a\r", "b", "c"}));
    ASSERT_TRUE(finder.ReadLines(Logical("lang\\German.lang")));
    EXPECT_EQ(finder.Names(), (Names{"no final line end"}));
    EXPECT_TRUE(finder.ReadLines(Logical("lang\\empty.lang")));
    EXPECT_TRUE(finder.Names().empty());
    EXPECT_FALSE(finder.ReadLines(Logical("lang\\French.lang")));
}

// Damaged and hostile packages: every read answers "no", nothing crashes, nothing hangs.
TEST_F(Package, AnythingThatIsNoArchiveReadsAsMissing) {
    WriteDataPackage();
    const std::string good = ReadFile(m_base + "/data.pkg");
    for (const std::string& bytes :
         {std::string("not a zip archive at all\n"), good.substr(0, good.size() / 2),
          good.substr(0, good.size() - 10), good.substr(good.size() / 2),
          std::string(1000, '\0')}) {
        ac::ClosePackage(Logical("data.pkg"));
        WriteFile(m_base + "/data.pkg", bytes);
        std::vector<unsigned char> block;
        ac::ImPackageFinder finder;
        EXPECT_FALSE(ac::ReadResource(Logical("Skin\\Default\\skin.ini"), block));
        EXPECT_FALSE(finder.FindFile(Logical("Skin\\*.*")));
        EXPECT_FALSE(finder.ReadLines(Logical("lang\\English.lang")));
        EXPECT_EQ(ac::ReadIniInt("Main", "LeftMargin", -3, Logical("Skin\\Default\\skin.ini")), -3);
    }
}

TEST_F(Package, DeclaredSizesAreNotTrusted) {
    ac::PackageWriter writer;
    ASSERT_TRUE(writer.Create());
    ASSERT_TRUE(writer.Put("skin/Default/skin.ini", "[Main]\r\nLeftMargin=4\r\n"));
    std::string bytes;
    ASSERT_TRUE(writer.Finish(bytes));
    const std::string ini = Logical("Skin\\Default\\skin.ini");
    std::vector<unsigned char> block;
    ac::ImPackageFinder finder;

    // A zip bomb: the header claims far more than the layer will ever inflate.
    WriteFile(m_base + "/data.pkg", ForgeSize(bytes, 0xFFFFFFF0u));
    EXPECT_TRUE(ac::ResourceExists(ini));
    EXPECT_FALSE(ac::ReadResource(ini, block));
    EXPECT_EQ(ac::ReadIniInt("Main", "LeftMargin", -3, ini), -3);

    // A size a little above the truth: the short read is a failure, not a padded text.
    ac::ClosePackage(ini);
    WriteFile(m_base + "/data.pkg", ForgeSize(bytes, 40));
    EXPECT_FALSE(ac::ReadResource(ini, block));
    EXPECT_FALSE(finder.ReadLines(ini));
}

// user.pkg: created by the first write, rewritten whole and atomically, never left damaged.
TEST_F(Package, FirstWriteCreatesUserPackageAndReadsSeeEveryWrite) {
    EXPECT_EQ(ac::ReadIniText("General", "Bitrate", "dflt", Profile()), "dflt");
    ASSERT_TRUE(ac::WriteIniString("General", "Bitrate", "128", Profile()));
    ASSERT_TRUE(ac::WriteIniString("General", "Bitrate", "192", Profile()));
    ASSERT_TRUE(ac::WriteIniString("General", "Mode", "joint", Profile()));
    EXPECT_EQ(ac::ReadIniInt("General", "Bitrate", 0, Profile()), 192);

    // CR LF throughout, newest key first, and '/' in the stored names.
    auto archive = ac::ZipArchive::Open(UserPkg());
    ASSERT_NE(archive, nullptr);
    std::string text;
    ASSERT_EQ(archive->Read("profile/user/mine.pf", text, 1024), ac::ZipArchive::ReadStatus::Ok);
    EXPECT_EQ(text, "[General]\r\nMode = joint\r\nBitrate = 192\r\n");
    EXPECT_EQ(ReadFile(UserPkg()).find("profile\\"), std::string::npos);

    // A replacement keeps the spelling stored first.
    ASSERT_TRUE(ac::WriteIniString("General", "A", "2", Profile("MINE.PF")));
    EXPECT_EQ(Walk(Logical("profile\\user\\*.pf")), Names{"mine.pf"});
}

TEST_F(Package, RemoveAndWriteChangeOnlyUserPackage) {
    WriteDataPackage();
    const std::string data = ReadFile(m_base + "/data.pkg");
    ASSERT_TRUE(ac::WriteIniString("General", "A", "1", Profile("a.pf")));
    ASSERT_TRUE(ac::WriteIniString("General", "B", "2", Profile("b.pf")));
    EXPECT_TRUE(ac::RemoveResource(Profile("A.PF")));
    EXPECT_FALSE(ac::RemoveResource(Profile("a.pf")));
    EXPECT_EQ(ac::ReadIniInt("General", "B", 0, Profile("b.pf")), 2);
    EXPECT_TRUE(ac::RemoveResource(Profile("b.pf")));
    EXPECT_NE(ac::ZipArchive::Open(UserPkg()), nullptr);  // empty, and still an archive
    EXPECT_FALSE(ac::RemoveResource(Logical("Skin\\Default\\skin.ini")));
    EXPECT_FALSE(ac::WriteIniString("Main", "LeftMargin", "9", Logical("Skin\\Default\\skin.ini")));
    EXPECT_FALSE(ac::WriteIniString("Main", "LeftMargin", "9", Logical("plain\\x.ini")));
    EXPECT_EQ(ReadFile(m_base + "/data.pkg"), data);
}

TEST_F(Package, DamagedUserPackageIsSetAsideAndSavingGoesOn) {
    WriteFile(UserPkg(), "garbage, not an archive");
    EXPECT_EQ(ac::ReadIniText("General", "A", "dflt", Profile()), "dflt");
    ASSERT_TRUE(ac::WriteIniString("General", "A", "1", Profile()));
    EXPECT_EQ(ac::ReadIniInt("General", "A", 0, Profile()), 1);
    int setAside = 0;
    for (const auto& entry : fs::directory_iterator(fs::path(UserPkg()).parent_path())) {
        if (entry.path().filename().string().starts_with("user.pkg.damaged-")) {
            ++setAside;
            EXPECT_EQ(ReadFile(entry.path()), "garbage, not an archive");
        }
    }
    EXPECT_EQ(setAside, 1);
}

TEST_F(Package, FailedWriteLeavesThePreviousFileByteIdentical) {
    ASSERT_TRUE(ac::WriteIniString("General", "Small", "1", Profile()));
    const std::string before = ReadFile(UserPkg());

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
    EXPECT_EQ(ReadFile(UserPkg()), before);
    EXPECT_EQ(ac::ReadIniInt("General", "Small", 0, Profile()), 1);
    for (const auto& entry : fs::directory_iterator(fs::path(UserPkg()).parent_path())) {
        EXPECT_EQ(entry.path().filename(), "user.pkg") << "left behind: " << entry.path();
    }
}

TEST_F(Package, UnreadableEntryIsNotOverwritten) {
    ASSERT_TRUE(ac::WriteIniString("General", "A", "1", Profile()));
    const std::string bytes = ForgeSize(ReadFile(UserPkg()), 0xFFFFFFF0u);
    WriteFile(UserPkg(), bytes);
    EXPECT_FALSE(ac::WriteIniString("General", "B", "2", Profile()));
    EXPECT_EQ(ReadFile(UserPkg()), bytes);
}

TEST_F(Package, ConcurrentWritersKeepEveryKey) {
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
            Walk(Logical("profile\\user\\*.*"));
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
