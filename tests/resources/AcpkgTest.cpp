// Runs the built acpkg as authors and the build run it.

#include "resources/ZipArchive.h"

#include <gtest/gtest.h>

#include <sys/wait.h>
#include <unistd.h>

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <sstream>

namespace {

namespace fs = std::filesystem;

std::string ReadFile(const fs::path& path) {
    std::ifstream in(path, std::ios::binary);
    std::ostringstream out;
    out << in.rdbuf();
    return out.str();
}

void WriteFile(const fs::path& path, const std::string& bytes) {
    fs::create_directories(path.parent_path());
    std::ofstream(path, std::ios::binary) << bytes;
}

std::string ShellQuote(const std::string& text) {
    std::string quoted = "'";
    for (char c : text) {
        quoted += c == '\'' ? std::string("'\\''") : std::string(1, c);
    }
    return quoted + "'";
}

struct RunResult {
    int exitCode = -1;
    std::string out;
    std::string err;
};

class Acpkg : public ::testing::Test {
protected:
    void SetUp() override {
        char pattern[] = "/tmp/ac-acpkg-XXXXXX";
        ASSERT_NE(::mkdtemp(pattern), nullptr);
        m_dir = pattern;
        ASSERT_TRUE(fs::exists(Tool())) << "build acpkg first: " << Tool();
    }
    void TearDown() override { fs::remove_all(m_dir); }

    static std::string Tool() { return std::string(AC_BIN_DIR) + "/acpkg"; }

    RunResult Run(const std::vector<std::string>& args, const std::string& env = "") {
        std::string command = env + " " + ShellQuote(Tool());
        for (const std::string& arg : args) {
            command += " " + ShellQuote(arg);
        }
        const std::string out = m_dir + "/stdout";
        const std::string err = m_dir + "/stderr";
        command += " >" + ShellQuote(out) + " 2>" + ShellQuote(err);
        int status = std::system(command.c_str());
        RunResult result;
        result.exitCode = WIFEXITED(status) ? WEXITSTATUS(status) : -1;
        result.out = ReadFile(out);
        result.err = ReadFile(err);
        return result;
    }

    // Failures say one line on stderr and nothing on stdout.
    void ExpectFailure(const RunResult& result, const std::string& message) {
        EXPECT_EQ(result.exitCode, 1);
        EXPECT_EQ(result.err, "acpkg: " + message + "\n");
        EXPECT_EQ(result.out, "");
    }

    void MakeTree() {
        WriteFile(m_dir + "/src/skin/Default/skin.ini", "[Main]\r\nLeftMargin = 4\r\n");
        WriteFile(m_dir + "/src/skin/Default/bg.bmp", std::string(2000, 'b'));
        WriteFile(m_dir + "/src/lang/English.lang", "#0001# \"x\"\r\n");
        WriteFile(m_dir + "/src/profile/mp3.pf", "");
        fs::create_directories(m_dir + "/src/empty");
    }

    std::string m_dir;
};

TEST_F(Acpkg, PackIsSortedWithFolderEntriesAndReproducible) {
    MakeTree();
    const std::string package = m_dir + "/src/data.pkg";  // inside the tree: not packed itself
    RunResult packed = Run({"pack", package, m_dir + "/src"}, "SOURCE_DATE_EPOCH=1700000000");
    ASSERT_EQ(packed.exitCode, 0) << packed.err;
    const std::string first = ReadFile(package);

    auto archive = ac::ZipArchive::OpenFromMemory(first);
    ASSERT_NE(archive, nullptr);
    std::vector<std::string> names;
    for (const ac::ZipEntry& entry : archive->Entries()) {
        names.push_back(entry.name + (entry.IsDirectory() ? " dir" : ""));
    }
    EXPECT_EQ(names, (std::vector<std::string>{"empty\\ dir", "lang\\ dir", "lang\\English.lang",
                                               "profile\\ dir", "profile\\mp3.pf", "skin\\ dir",
                                               "skin\\Default\\ dir", "skin\\Default\\bg.bmp",
                                               "skin\\Default\\skin.ini"}));
    EXPECT_NE(first.find("skin/Default/skin.ini"), std::string::npos);

    ASSERT_EQ(Run({"pack", package, m_dir + "/src"}, "SOURCE_DATE_EPOCH=1700000000").exitCode, 0);
    EXPECT_EQ(ReadFile(package), first);

    RunResult listed = Run({"list", package, "skin/Default"});
    EXPECT_EQ(listed.exitCode, 0);
    EXPECT_EQ(listed.out, "skin\\Default\\bg.bmp\nskin\\Default\\skin.ini\n");
    ExpectFailure(Run({"list", package, "skin/default"}),
                  "nothing below 'skin/default' in '" + package + "'");
    ExpectFailure(Run({"pack", package, m_dir + "/none"}), "'" + m_dir + "/none' is not a folder");
}

TEST_F(Acpkg, EditsRoundTripWithEitherSeparator) {
    const std::string package = m_dir + "/p.pkg";
    WriteFile(m_dir + "/file.bin", std::string("bytes\0with nul", 14));
    ASSERT_EQ(Run({"add", package, "skin\\New\\file.bin", m_dir + "/file.bin"}).exitCode, 0);
    RunResult listed = Run({"list", package});
    EXPECT_EQ(listed.out, "skin\\\nskin\\New\\\nskin\\New\\file.bin\n");
    EXPECT_EQ(Run({"cat", package, "SKIN/new/FILE.BIN"}).out, std::string("bytes\0with nul", 14));

    ASSERT_EQ(Run({"ini-set", package, "skin/New/skin.ini", "Main", "Font", "\"Arial\""}).exitCode,
              0);
    ASSERT_EQ(Run({"ini-set", package, "skin/New/skin.ini", "Main", "Size", "9"}).exitCode, 0);
    EXPECT_EQ(Run({"ini-get", package, "skin\\New\\skin.ini", "Main", "font"}).out, "Arial\n");
    EXPECT_EQ(Run({"cat", package, "skin/New/skin.ini"}).out,
              "[Main]\r\nSize = 9\r\nFont = \"Arial\"\r\n");
    ExpectFailure(Run({"ini-get", package, "skin/New/skin.ini", "main", "Font"}),
                  "no key 'Font' in [main] of 'skin/New/skin.ini'");

    ASSERT_EQ(Run({"rm", package, "skin/New/file.bin"}).exitCode, 0);
    ExpectFailure(Run({"rm", package, "skin/New/file.bin"}),
                  "no entry 'skin/New/file.bin' in '" + package + "'");
    ExpectFailure(Run({"cat", package, "x"}), "no entry 'x' in '" + package + "'");
}

TEST_F(Acpkg, RefusesBadInputWithoutTouchingFiles) {
    const std::string junk = m_dir + "/junk.pkg";
    WriteFile(junk, "no archive here");
    ExpectFailure(Run({"add", junk, "a", junk}), "'" + junk + "' is not a package");
    ExpectFailure(Run({"list", junk}), "'" + junk + "' is not a package");
    EXPECT_EQ(ReadFile(junk), "no archive here");
    ExpectFailure(Run({"cat", m_dir + "/missing.pkg", "a"}),
                  "cannot open '" + m_dir + "/missing.pkg'");
    ExpectFailure(Run({"add", m_dir + "/p.pkg", "a", m_dir + "/missing"}),
                  "cannot read '" + m_dir + "/missing'");
    EXPECT_FALSE(fs::exists(m_dir + "/p.pkg"));
    for (const std::vector<std::string>& args :
         {std::vector<std::string>{}, {"frobnicate", "p.pkg"}, {"cat", "p.pkg"}}) {
        ExpectFailure(Run(args),
                      "usage: acpkg list|cat|add|rm|ini-get|ini-set|pack PACKAGE [ARGUMENTS...]");
    }
}

}  // namespace
