// Runs the built acpkg as authors and the build run it.

#include <gtest/gtest.h>

#include <sys/wait.h>

#include "../support/PackageDir.h"

namespace {

using ac::test::ReadFile;
using ac::test::WriteFile;
using Args = std::vector<std::string>;

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
    void SetUp() override { ASSERT_TRUE(std::filesystem::exists(kTool)) << "build " << kTool; }

    RunResult Run(const Args& args, const std::string& env = "") {
        std::string command = env + " " + ShellQuote(kTool);
        for (const std::string& arg : args) {
            command += " " + ShellQuote(arg);
        }
        command += " >" + ShellQuote(m_dir / "stdout") + " 2>" + ShellQuote(m_dir / "stderr");
        const int status = std::system(command.c_str());
        return {WIFEXITED(status) ? WEXITSTATUS(status) : -1, ReadFile(m_dir / "stdout"),
                ReadFile(m_dir / "stderr")};
    }

    // Failures say one line on stderr and nothing on stdout.
    void ExpectFailure(const Args& args, const std::string& message) {
        const RunResult result = Run(args);
        EXPECT_EQ(result.exitCode, 1);
        EXPECT_EQ(result.err, "acpkg: " + message + "\n");
        EXPECT_EQ(result.out, "");
    }

    static constexpr const char* kTool = AC_BIN_DIR "/acpkg";
    ac::test::TempDir m_dir;
};

TEST_F(Acpkg, EveryCommandRoundTrips) {
    WriteFile(m_dir / "src/skin/Default/skin.ini", "[Main]\r\nLeftMargin = 4\r\n");
    WriteFile(m_dir / "src/lang/English.lang", "#0001# \"x\"\r\n");
    std::filesystem::create_directories(m_dir / "src/empty");
    const std::string package = m_dir / "src/data.pkg";  // inside the tree: not packed itself
    ASSERT_EQ(Run({"pack", package, m_dir / "src"}, "SOURCE_DATE_EPOCH=1700000000").exitCode, 0);
    const std::string packed = ReadFile(package);
    ASSERT_EQ(Run({"pack", package, m_dir / "src"}, "SOURCE_DATE_EPOCH=1700000000").exitCode, 0);
    EXPECT_EQ(ReadFile(package), packed);
    EXPECT_NE(packed.find("skin/Default/skin.ini"), std::string::npos);  // '/' for unzip tools
    EXPECT_EQ(Run({"list", package}).out,
              "empty\\\nlang\\\nlang\\English.lang\nskin\\\nskin\\Default\\\n"
              "skin\\Default\\skin.ini\n");

    WriteFile(m_dir / "file.bin", std::string("bytes\0with nul", 14));
    Run({"add", package, "skin\\New\\file.bin", m_dir / "file.bin"});
    EXPECT_EQ(Run({"list", package, "skin/New"}).out, "skin\\New\\file.bin\n");
    EXPECT_EQ(Run({"cat", package, "SKIN/new/FILE.BIN"}).out, std::string("bytes\0with nul", 14));
    Run({"ini-set", package, "skin/Default/skin.ini", "Main", "Font", "\"Arial\""});
    EXPECT_EQ(Run({"ini-get", package, "skin\\Default\\skin.ini", "Main", "font"}).out, "Arial\n");
    EXPECT_EQ(Run({"cat", package, "skin/Default/skin.ini"}).out,
              "[Main]\r\nFont = \"Arial\"\r\nLeftMargin = 4\r\n");
    EXPECT_EQ(Run({"rm", package, "skin/New/file.bin"}).exitCode, 0);
    ExpectFailure({"rm", package, "skin/New/file.bin"},
                  "no entry 'skin/New/file.bin' in '" + package + "'");
    // Something that is no package is refused and left as it was.
    const std::string junk = m_dir / "junk.pkg";
    WriteFile(junk, "no archive here");
    ExpectFailure({"add", junk, "a", junk}, "'" + junk + "' is not a package");
    EXPECT_EQ(ReadFile(junk), "no archive here");
}

}  // namespace
