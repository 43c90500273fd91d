// Output names: the character rules, the naming scheme, the free-name search, and names made
// from hostile titles.
#include "convert/OutputNaming.h"

#include <gtest/gtest.h>

#include <set>
#include <thread>
#include <vector>

#include "../support/TempDir.h"
#include "profile/ParameterSet.h"

namespace {

// A row's set with the keys naming reads.
class RowSet : public ac::ParameterSet {
public:
    explicit RowSet(std::string extension = "mp3") : m_extension(std::move(extension)) {
        for (const char* key : {"ss", "outfilename", "author", "year", "composer", "genre", "album"}) {
            m_records.push_back({key, 0, "", "", {}});
        }
    }
    std::string GetName() const override { return "row"; }
    std::string GetFormat() const override { return m_extension; }
    std::string GetExtName() const override { return m_extension; }
    std::unique_ptr<ac::ParameterSet> Clone() const override { return nullptr; }

private:
    std::string m_extension;
};

ac::NamingSettings Replacing(std::string illegal, std::string blank) {
    ac::NamingSettings settings;
    settings.illegal = 1;
    settings.illegalReplace = std::move(illegal);
    settings.spaceReplace = 1;
    settings.replace = std::move(blank);
    return settings;
}

struct FilterCase {
    const char* name;
    std::string text;
    ac::NamingSettings settings;
    std::string expected;
};

class FilterFileNameOf : public ::testing::TestWithParam<FilterCase> {};

TEST_P(FilterFileNameOf, Text) {
    EXPECT_EQ(ac::FilterFileName(GetParam().text, GetParam().settings), GetParam().expected);
}

INSTANTIATE_TEST_SUITE_P(
    Rules, FilterFileNameOf,
    ::testing::Values(
        FilterCase{"Dropped", "a:b?c", {}, "abc"},
        FilterCase{"Replaced", "a:b?c", Replacing("_", ""), "a_b_c"},
        FilterCase{"EveryIllegal", "*/:<>?\\|x", {}, "x"},
        FilterCase{"QuoteIsLegal", "say \"hi\"", {}, "say \"hi\""},
        FilterCase{"BlanksReplacedByFirstCharacter", "my song", Replacing("_", "_-"), "my_song"},
        FilterCase{"EmptyReplacementEndsTheName", "ab:cd", Replacing("", "_"), "ab"},
        FilterCase{"NulIsIllegal", std::string("a\0b", 3), {}, "ab"},
        FilterCase{"SeparatorAsReplacementIsDropped", "a:b", Replacing("/", "_"), "ab"},
        FilterCase{"ControlCharactersStay", "a\tb\x01", {}, "a\tb\x01"}),
    [](const auto& info) { return std::string(info.param.name); });

class OutputPath : public ::testing::Test {
protected:
    std::string Make(const std::string& name, int row = 0, std::string_view last = {},
                     std::string_view source = "/music/source.flac") {
        m_set.SetValue("outfilename", name);
        ac::OutputNameRequest request;
        request.sourcePath = source;
        request.row = row;
        request.lastOutput = last;
        request.directory = "/out/";
        return ac::MakeOutputPath(m_set, request, m_settings,
                                  [this](const std::string& path) { return m_existing.count(path) > 0; });
    }

    RowSet m_set;
    ac::NamingSettings m_settings;
    std::set<std::string> m_existing;
};

TEST_F(OutputPath, DefaultsUseTheRowNameAndAFreeNumber) {
    EXPECT_EQ(Make("Song.mp3"), "/out/Song.mp3");
    m_existing = {"/out/Song.mp3", "/out/Song-1.mp3"};
    EXPECT_EQ(Make("Song.mp3"), "/out/Song-2.mp3");
    // A second row of the same pass, before either file exists; case does not matter.
    m_existing.clear();
    EXPECT_EQ(Make("song.mp3", 1, "/out/Song.mp3"), "/out/song-1.mp3");
    // Overwriting, or a burn list's temporary files: the name stays.
    m_existing = {"/out/Song.mp3"};
    m_settings.outputFileOverwrite = 1;
    EXPECT_EQ(Make("Song.mp3"), "/out/Song.mp3");
}

// A name held by a job still writing is taken, whatever the disk says and also when the user
// allows overwriting: that replaces a file of an earlier run, never a sibling's output.
TEST_F(OutputPath, NamesHeldByRunningJobsAreTaken) {
    m_set.SetValue("outfilename", "Song.mp3");
    ac::OutputNameRequest request;
    request.directory = "/out";
    auto none = [](const std::string&) { return false; };
    ac::OutputHold first = ac::ReserveOutputPath(m_set, request, m_settings, none);
    ac::OutputHold second = ac::ReserveOutputPath(m_set, request, m_settings, none);
    EXPECT_EQ(first.Path(), "/out/Song.mp3");
    EXPECT_EQ(second.Path(), "/out/Song-1.mp3");
    EXPECT_TRUE(ac::IsOutputHeld("/out/SONG.mp3"));
    m_settings.outputFileOverwrite = 1;
    EXPECT_EQ(Make("Song.mp3"), "/out/Song-2.mp3");
    first.Release();
    EXPECT_EQ(Make("Song.mp3"), "/out/Song.mp3");
    {
        ac::OutputHold moved = std::move(second);
        EXPECT_TRUE(second.Empty());
    }
    EXPECT_FALSE(ac::IsOutputHeld("/out/Song-1.mp3"));
}

// Drivers on several threads (the burn list's workers) never take one name twice.
TEST(OutputHolds, ReservationsFromManyThreadsAreDistinct) {
    constexpr int kThreads = 8, kEach = 50;
    std::vector<std::vector<ac::OutputHold>> holds(kThreads);
    std::vector<std::thread> threads;
    for (int t = 0; t < kThreads; ++t) {
        threads.emplace_back([&holds, t] {
            RowSet set;
            set.SetValue("outfilename", "Same.wav");
            ac::OutputNameRequest request;
            request.directory = "/tmp/none";
            for (int i = 0; i < kEach; ++i)
                holds[t].push_back(ac::ReserveOutputPath(set, request, {}, [](const std::string&) { return false; }));
        });
    }
    for (auto& thread : threads) thread.join();
    std::set<std::string> names;
    for (const auto& list : holds)
        for (const auto& hold : list) names.insert(hold.Path());
    EXPECT_EQ(names.size(), static_cast<std::size_t>(kThreads * kEach));
}

TEST_F(OutputPath, EmptyNameFallsBackToTheSource) {
    EXPECT_EQ(Make(""), "/out/source.mp3");
    EXPECT_EQ(Make("???"), "/out/source.mp3");
    EXPECT_EQ(Make("", 0, {}, "/music/cd.cue|3"), "/out/cd.mp3");
    // Everything behind the last dot goes, even when nothing follows it.
    EXPECT_EQ(Make("Trailing."), "/out/Trailing.mp3");
    EXPECT_EQ(Make("a.b.c"), "/out/a.b.mp3");
}

TEST_F(OutputPath, SchemeLettersBuildTheName) {
    m_settings.alsoConverter = 1;
    m_settings.scheme = 5;  // "AEH"
    EXPECT_EQ(Make("name.wav", 2), "/out/03-name-unknownalbum.mp3");
    m_settings.scheme = 99;  // behind the end: the last pattern
    EXPECT_EQ(Make("name.wav", 2), "/out/03-name-unknownalbum.mp3");
    m_set.SetValue("author", "Band");
    m_set.SetValue("album", "Live");
    m_settings.allScheme = "BZF,H";
    m_settings.scheme = 0;
    EXPECT_EQ(Make("name.wav"), "/out/Band--name.mp3");  // an unknown letter still gets its dashes
    m_settings.allScheme = "CDG";
    EXPECT_EQ(Make("x"), "/out/unknownyear-unknowncomposer-unknowngenre.mp3");
}

TEST_F(OutputPath, HostileTitlesStayInsideTheOutputFolder) {
    m_settings.alsoConverter = 1;
    m_settings.allScheme = "BH";
    m_settings.scheme = 0;
    m_set.SetValue("author", "../../etc");
    m_set.SetValue("album", std::string("AC/DC\0x", 7));
    EXPECT_EQ(Make("x"), "/out/....etc-ACDCx.mp3");

    m_settings.alsoConverter = 0;
    // The separators go, and so does everything behind the last dot.
    EXPECT_EQ(Make("../../../../etc/passwd"), "/out/........mp3");
    EXPECT_EQ(Make("../../x/y.wav"), "/out/....xy.mp3");
    // A name of dots alone cannot become the folder or its parent.
    RowSet noExtension("");
    ac::OutputNameRequest request;
    request.directory = "/out";
    noExtension.SetValue("outfilename", "..");
    EXPECT_EQ(ac::MakeOutputPath(noExtension, request, m_settings, [](const std::string&) { return false; }),
              "/out/_..");
}

TEST_F(OutputPath, LongNamesFitTheFileSystem) {
    std::string title;
    for (int i = 0; i < 200; ++i) title += "\xC3\xA9";  // 400 bytes of two-byte characters
    m_existing = {};
    const std::string path = Make(title + ".wav");
    const std::string name = path.substr(5);
    EXPECT_LE(name.size() + 8, 255u);
    EXPECT_EQ(name.substr(name.size() - 4), ".mp3");
    EXPECT_EQ((name.size() - 4) % 2, 0u) << "a character was cut in half";
    // Room remains for the free-name search.
    m_existing = {path};
    EXPECT_LE(Make(title + ".wav").substr(5).size(), 255u);
}

TEST_F(OutputPath, RealFilesAreFoundOnDisk) {
    ac::test::TempDir dir;
    ac::test::TempDir other;
    std::FILE* file = std::fopen((dir / "Song.mp3").c_str(), "w");
    ASSERT_NE(file, nullptr);
    std::fclose(file);
    m_set.SetValue("outfilename", "Song.mp3");
    ac::OutputNameRequest request;
    const std::string folder = dir.Path() + "//";
    request.directory = folder;
    EXPECT_EQ(ac::MakeOutputPath(m_set, request, m_settings), dir / "Song-1.mp3");
}

}  // namespace
