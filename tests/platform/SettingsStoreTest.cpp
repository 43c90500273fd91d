#include "platform/SettingsStore.h"

#include "platform/AtomicFile.h"
#include "../support/TempDir.h"

#include <gtest/gtest.h>
#include <signal.h>
#include <sys/wait.h>
#include <unistd.h>

#include <filesystem>
#include <fstream>
#include <random>
#include <thread>

namespace ac::platform {
namespace {

constexpr const char* kKey = "Software\\Velmorant\\Audio Converter\\Settings";

std::string FileText(const std::string& path) {
    std::string text;
    ReadWholeFile(path, text, 1 << 24);
    return text;
}

void WriteText(const std::string& path, const std::string& text) {
    std::ofstream(path, std::ios::binary) << text;
}

class SettingsStoreTest : public ::testing::Test {
protected:
    test::TempDir dir;
    std::string file = dir / "cfg/settings.ini";
};

TEST_F(SettingsStoreTest, ValuesSurviveAReopenWithTheirTypesAndEveryCharacter) {
    // Control characters, UTF-8, and Latin-1 bytes that are no UTF-8 (a file name from disk).
    const std::string awkward =
        "C:\\Temp\\a\tb\nc\rd \x01 end \xC3\xA4\xE2\x82\xAC M\xFCsik \xC3";
    {
        SettingsStore store(file);
        ASSERT_TRUE(store.WriteInt(kKey, "max_processes", -7));
        ASSERT_TRUE(store.WriteString(kKey, "OutputDir", awkward));
        ASSERT_TRUE(store.WriteString(kKey, "empty", ""));
    }
    SettingsStore reopened(file);
    auto number = reopened.Read(kKey, "MAX_PROCESSES");  // names ignore case
    ASSERT_TRUE(number);
    EXPECT_EQ(number->type, SettingType::Int);
    EXPECT_EQ(number->number, -7);
    auto text = reopened.Read(kKey, "OutputDir");
    ASSERT_TRUE(text);
    EXPECT_EQ(text->type, SettingType::String);
    EXPECT_EQ(text->text, awkward);
    EXPECT_EQ(reopened.Read(kKey, "empty")->text, "");
    EXPECT_FALSE(reopened.Read(kKey, "missing"));
    EXPECT_FALSE(reopened.Read("Software\\Other", "OutputDir"));
    // One line per value, and the file stays valid text that the next start will accept.
    EXPECT_EQ(FileText(file).find("\nc\r"), std::string::npos);
    EXPECT_TRUE(reopened.TakeSetAsideNotice().empty());
}

TEST_F(SettingsStoreTest, UnreadableEntriesAreOtherTypeAndForeignLinesAreKept) {
    std::filesystem::create_directories(dir / "cfg");
    WriteText(file, std::string("; my notes\r\n[") + kKey +
                        "]\r\nbad_int=dword:12x\r\nhuge=dword:99999999999\r\n"
                        "bin=hex:00,01\r\nescape=sz:ab\\q\r\nno equals here\r\n");
    SettingsStore store(file);
    for (const char* name : {"bad_int", "huge", "bin", "escape"}) {
        auto value = store.Read(kKey, name);
        ASSERT_TRUE(value) << name;
        EXPECT_EQ(value->type, SettingType::Other) << name;
    }
    ASSERT_TRUE(store.WriteInt(kKey, "bad_int", 3));
    std::string text = FileText(file);
    EXPECT_NE(text.find("; my notes"), std::string::npos);
    EXPECT_NE(text.find("no equals here"), std::string::npos);
    EXPECT_NE(text.find("bin=hex:00,01"), std::string::npos);
    EXPECT_NE(text.find("bad_int=dword:3"), std::string::npos);
    EXPECT_EQ(text.find("12x"), std::string::npos);
}

TEST_F(SettingsStoreTest, JunkFilesAreSetAsideAndDefaultsServe) {
    std::filesystem::create_directories(dir / "cfg");
    struct Junk {
        const char* what;
        std::string bytes;
    };
    std::string binary(4096, '\0');
    std::mt19937 random(7);
    for (char& c : binary) c = static_cast<char>(random());
    const Junk junk[] = {{"binary", binary},
                         {"latin-1", std::string("[") + kKey + "]\nOutputDir=sz:M\xFCsik\n"},
                         {"nul", std::string("[a]\nx=dword:1\n\0\n", 15)}};
    for (const Junk& item : junk) {
        WriteText(file, item.bytes);
        SettingsStore store(file);
        EXPECT_FALSE(store.Read(kKey, "OutputDir")) << item.what;
        std::string aside = store.TakeSetAsideNotice();
        ASSERT_FALSE(aside.empty()) << item.what;
        EXPECT_EQ(FileText(aside), item.bytes) << item.what;  // nothing of the user's is lost
        ASSERT_TRUE(store.WriteInt(kKey, "x", 1)) << item.what;
        EXPECT_EQ(store.Read(kKey, "x")->number, 1) << item.what;
        std::filesystem::remove(aside);
    }
    // 50 MB: refused by its size without being read (a sparse file costs no disk).
    {
        std::ofstream(file, std::ios::binary | std::ios::trunc);
    }
    std::filesystem::resize_file(file, 50u * 1024 * 1024);
    SettingsStore store(file);
    EXPECT_FALSE(store.Read(kKey, "x"));
    EXPECT_FALSE(store.TakeSetAsideNotice().empty());
}

TEST_F(SettingsStoreTest, ChangesMadeByAnotherProgramAreSeen) {
    SettingsStore mine(file);
    SettingsStore theirs(file);
    ASSERT_TRUE(mine.WriteInt(kKey, "a", 1));
    EXPECT_EQ(theirs.Read(kKey, "a")->number, 1);
    ASSERT_TRUE(theirs.WriteInt(kKey, "b", 2));
    ASSERT_TRUE(mine.WriteInt(kKey, "a", 3));  // must not drop b written behind its back
    EXPECT_EQ(mine.Read(kKey, "b")->number, 2);
    EXPECT_EQ(theirs.Read(kKey, "a")->number, 3);
}

TEST_F(SettingsStoreTest, HeldWritesAreReadAtOnceAndReachTheFileInOneWriteOverOthers) {
    SettingsStore mine(file);
    SettingsStore theirs(file);
    ASSERT_TRUE(theirs.WriteInt(kKey, "shared", 1));
    mine.HoldWrites();
    mine.HoldWrites();  // nested: the inner release writes nothing yet
    ASSERT_TRUE(mine.WriteInt(kKey, "shared", 2));
    ASSERT_TRUE(mine.WriteString(kKey, "language", "Deutsch"));
    ASSERT_TRUE(mine.WriteInt(kKey, "shared", 3));
    EXPECT_EQ(mine.Read(kKey, "shared")->number, 3);
    EXPECT_FALSE(theirs.Read(kKey, "language"));
    // Another program writes meanwhile: this store's reads see it under the held values.
    ASSERT_TRUE(theirs.WriteInt(kKey, "theirs", 9));
    ASSERT_TRUE(theirs.WriteInt(kKey, "shared", 5));
    EXPECT_EQ(mine.Read(kKey, "theirs")->number, 9);
    EXPECT_EQ(mine.Read(kKey, "shared")->number, 3);
    const auto before = std::filesystem::last_write_time(file);
    ASSERT_TRUE(mine.ReleaseWrites());
    EXPECT_EQ(std::filesystem::last_write_time(file), before);
    EXPECT_FALSE(theirs.Read(kKey, "language"));
    ASSERT_TRUE(mine.ReleaseWrites());
    SettingsStore reopened(file);
    EXPECT_EQ(reopened.Read(kKey, "shared")->number, 3);
    EXPECT_EQ(reopened.Read(kKey, "language")->text, "Deutsch");
    EXPECT_EQ(reopened.Read(kKey, "theirs")->number, 9);
    // Released, writes go to the file at once again.
    ASSERT_TRUE(mine.WriteInt(kKey, "after", 1));
    EXPECT_EQ(SettingsStore(file).Read(kKey, "after")->number, 1);
}

TEST_F(SettingsStoreTest, ConcurrentWritersOfDifferentKeysLoseNothing) {
    SettingsStore shared(file);
    constexpr int kRounds = 40;
    auto writer = [&](const std::string& prefix) {
        for (int i = 0; i < kRounds; ++i) {
            ASSERT_TRUE(shared.WriteInt(kKey, prefix + std::to_string(i), i));
        }
    };
    // Two threads on one store, and a second process on its own store of the same file.
    pid_t child = ::fork();
    if (child == 0) {
        SettingsStore other(file);
        for (int i = 0; i < kRounds; ++i) {
            if (!other.WriteInt(kKey, "p" + std::to_string(i), i)) ::_exit(1);
        }
        ::_exit(0);
    }
    std::thread first(writer, "t");
    std::thread second(writer, "u");
    first.join();
    second.join();
    int status = 0;
    ASSERT_EQ(::waitpid(child, &status, 0), child);
    ASSERT_TRUE(WIFEXITED(status) && WEXITSTATUS(status) == 0);

    SettingsStore check(file);
    for (const char* prefix : {"t", "u", "p"}) {
        for (int i = 0; i < kRounds; ++i) {
            auto value = check.Read(kKey, prefix + std::to_string(i));
            ASSERT_TRUE(value) << prefix << i;
            EXPECT_EQ(value->number, i);
        }
    }
}

TEST_F(SettingsStoreTest, AWriterKilledAtAnyMomentLeavesAWholeFile) {
    {
        SettingsStore seed(file);
        ASSERT_TRUE(seed.WriteString(kKey, "keep", "precious"));
    }
    std::mt19937 random(42);
    for (int round = 0; round < 25; ++round) {
        pid_t child = ::fork();
        if (child == 0) {
            SettingsStore store(file);
            for (int i = 0;; ++i) store.WriteString(kKey, "churn", std::string(i % 5000, 'x'));
        }
        ::usleep(200 + random() % 5000);
        ::kill(child, SIGKILL);
        ::waitpid(child, nullptr, 0);
        SettingsStore check(file);
        auto keep = check.Read(kKey, "keep");
        ASSERT_TRUE(keep) << "round " << round;
        EXPECT_EQ(keep->text, "precious");
        EXPECT_TRUE(check.TakeSetAsideNotice().empty());
    }
    // The next writer sweeps what the killed ones left half-written.
    SettingsStore sweeper(file);
    ASSERT_TRUE(sweeper.WriteInt(kKey, "done", 1));
    for (const auto& entry : std::filesystem::directory_iterator(dir / "cfg")) {
        EXPECT_EQ(entry.path().filename().string().find(".tmp-"), std::string::npos)
            << entry.path();
    }
}

TEST_F(SettingsStoreTest, AFolderThatCannotBeMadeFailsTheWriteQuietly) {
    WriteText(dir / "plain-file", "x");
    SettingsStore store(dir / "plain-file/settings.ini");
    EXPECT_FALSE(store.WriteInt(kKey, "a", 1));
    EXPECT_FALSE(store.Read(kKey, "a"));
}

TEST(SettingTextTest, EscapesRoundTripAndBadEscapesAreRejected) {
    for (std::string text : {"", "plain", "\\\\server\\share", "tab\there", "\x7F\x1F", "\\x"}) {
        EXPECT_EQ(UnescapeSettingText(EscapeSettingText(text)), text);
    }
    for (const char* bad : {"trailing\\", "\\q", "\\x4", "\\x00", "\\xZZ"}) {
        EXPECT_FALSE(UnescapeSettingText(bad)) << bad;
    }
    EXPECT_EQ(ParseSettingValue("dword: 42 ")->number, 42);
    EXPECT_EQ(ParseSettingValue("dword:-2147483648")->number, INT32_MIN);
    EXPECT_FALSE(ParseSettingValue("dword:2147483648"));
    EXPECT_FALSE(ParseSettingValue("dword:"));
    EXPECT_EQ(ParseSettingValue("expand_sz:%HOME%")->text, "%HOME%");
}

}  // namespace
}  // namespace ac::platform
