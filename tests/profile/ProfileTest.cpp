// Loading, saving and cloning .pf profiles through the package layer.
#include "profile/ParameterSet.h"

#include <gtest/gtest.h>

#include "../support/ProfileFiles.h"
#include "resources/Package.h"

namespace {

using ac::test::PfText;
using Strings = std::vector<std::string>;

Strings ListOf(const ac::ParameterSet& set, const std::string& key) {
    Strings items;
    set.GetValueList(key, items);
    return items;
}

class ProfileLoad : public ac::test::ProfileFiles {
protected:
    // One profile "p.pf" with these Parameter entries.
    std::unique_ptr<ac::Profile> Load(const std::vector<std::string>& entries) {
        WriteProfiles({{"p.pf", PfText("P", "mp3", "mp3", entries)}});
        auto profile = std::make_unique<ac::Profile>(SystemPath("p.pf"));
        EXPECT_TRUE(profile->IsLoaded());
        return profile;
    }
};

TEST_F(ProfileLoad, FileWinsOverTableAndUnknownKeysVanish) {
    auto profile = Load({"bogus = 0, \"x\", \"y\"", "ab = 0, \"Auto\", \"128\"", "t = 0, \"\", \"\"",
                         "ar = 0, \"\", \"\", {\"8000\"}", "title = 0, \"\", \"\""});
    EXPECT_FALSE(profile->HasKey("bogus"));
    EXPECT_EQ(profile->GetDefault("ab"), "Auto");
    EXPECT_EQ(profile->GetValue("ab"), "128");
    EXPECT_EQ(ListOf(*profile, "ab").size(), 14u);  // the table's list
    EXPECT_EQ(profile->GetValue("t"), "Full");      // default and value filled from the table
    EXPECT_EQ(ListOf(*profile, "ar"), Strings{"8000"});
    // A parameter whose table gives no default still exists, empty.
    ASSERT_TRUE(profile->HasKey("title"));
    EXPECT_EQ(profile->GetValue("title"), "");
    // Table order, whatever the file's order; ab is not in the file, so it is not in the set.
    Strings names;
    for (const auto& record : profile->Records()) names.emplace_back(record.name);
    EXPECT_EQ(names, (Strings{"t", "title", "ab", "ar"}));
    // What the file said stays apart from what the table filled in.
    EXPECT_EQ(profile->FileRecords()[0].defaultValue, "");
}

TEST_F(ProfileLoad, StartTimeBringsTheOutputNameAlong) {
    auto profile = Load({"ss = 0, \"\", \"00:00:05\""});
    ASSERT_EQ(profile->Records().size(), 2u);
    EXPECT_EQ(profile->Records()[1].name, "outfilename");
    EXPECT_EQ(profile->GetValue("outfilename"), "");
}

TEST_F(ProfileLoad, MissingKeysReadEmptyAndCannotBeSet) {
    auto profile = Load({"ab = 0, \"Auto\", \"128\""});
    EXPECT_EQ(profile->GetValue("ar"), "");
    EXPECT_FALSE(profile->SetValue("ar", "44100"));
    EXPECT_FALSE(profile->HasKey("ar"));
    EXPECT_TRUE(profile->SetValue("ab", "256"));
    EXPECT_EQ(profile->GetValue("ab"), "256");
    EXPECT_FALSE(profile->HasKey("AB"));  // keys compare exactly
}

struct EntryCase {
    const char* name;
    std::string entry;  // for key ab
    bool present;
    std::uint32_t flags;
    std::string defaultValue;
    std::string value;
    std::size_t listSize;
};

class ProfileEntry : public ProfileLoad, public ::testing::WithParamInterface<EntryCase> {};

TEST_P(ProfileEntry, Reads) {
    const EntryCase& c = GetParam();
    auto profile = Load({"ab = " + c.entry});
    ASSERT_EQ(profile->HasKey("ab"), c.present);
    if (!c.present) return;
    EXPECT_EQ(profile->GetFlags("ab"), c.flags);
    EXPECT_EQ(profile->GetDefault("ab"), c.defaultValue);
    EXPECT_EQ(profile->GetValue("ab"), c.value);
    EXPECT_EQ(ListOf(*profile, "ab").size(), c.listSize);
}

std::string ListOfItems(int count) {
    std::string list = "{";
    for (int i = 0; i < count; ++i) list += (i ? "," : "") + std::to_string(i % 10);
    return list + "}";
}

INSTANTIATE_TEST_SUITE_P(
    Entries, ProfileEntry,
    ::testing::Values(
        EntryCase{"ReadOnly", "READONLY, \"1\", \"2\"", true, ac::PARAM_READONLY, "1", "2", 14},
        EntryCase{"ReadOnlyLowerCase", "readonly, \"1\", \"2\"", true, ac::PARAM_READONLY, "1", "2", 14},
        EntryCase{"ReadOnlyAmongWords", "0 | ReadOnly, \"1\", \"2\"", true, ac::PARAM_READONLY, "1", "2", 14},
        EntryCase{"EmptyDefaultFromTable", "0, \"\", \"\"", true, 0, "Auto", "Auto", 14},
        EntryCase{"CommaAfterBlankEndsField", "0, \"\", \"a, b\"", true, 0, "Auto", "a", 14},
        EntryCase{"BraceInValueStartsList", "0, \"\", \"x{y\"", true, 0, "Auto", "x", 1},
        EntryCase{"FileList", "0, \"Auto\", \"64\", {\"64\", \"128\"}", true, 0, "Auto", "64", 2},
        EntryCase{"ListKeepsTwoHundred", "0, \"\", \"\", " + ListOfItems(201), true, 0, "Auto", "Auto", 200},
        EntryCase{"EntryOf511Characters", "0, \"\", \"" + std::string(511 - 8, 'x'), true, 0, "Auto",
                  std::string(511 - 8, 'x'), 14},
        EntryCase{"EntryOf512Characters", "0, \"\", \"" + std::string(512 - 8, 'x'), false, 0, "", "", 0},
        EntryCase{"EmptyEntry", "", false, 0, "", "", 0}),
    [](const auto& info) { return std::string(info.param.name); });

class ProfileMain : public ac::test::ProfileFiles {};

TEST_F(ProfileMain, NamesFormatsAndFailures) {
    WriteProfiles({{"a.pf", PfText("Alpha", "ogg", "ogg", {}, "IsSysProfile = TRUE\r\n")},
                   {"b.pf", PfText("Beta", "asf", "wma", {}, "SName = Windows\r\n")},
                   {"none.pf", PfText("", "mp3", "mp3", {"ab = 0, \"\", \"128\""})}});
    ac::Profile alpha(SystemPath("a.pf"));
    EXPECT_EQ(alpha.GetName(), "Alpha");
    EXPECT_EQ(alpha.GetSName(), "OGG");
    EXPECT_TRUE(alpha.IsSysProfile());
    EXPECT_EQ(alpha.GetPath(), SystemPath("a.pf"));
    ac::Profile beta(SystemPath("b.pf"));
    EXPECT_EQ(beta.GetSName(), "Windows");
    EXPECT_EQ(beta.GetFormat(), "asf");
    EXPECT_EQ(beta.GetExtName(), "wma");
    EXPECT_FALSE(beta.IsSysProfile());

    ac::Profile nameless;
    EXPECT_FALSE(nameless.Load(SystemPath("none.pf")));
    EXPECT_TRUE(nameless.Records().empty());
    EXPECT_FALSE(nameless.Load(SystemPath("missing.pf")));
}

TEST_F(ProfileMain, CloneReadsTheFileAfresh) {
    WriteProfiles({{"a.pf", PfText("Alpha", "mp3", "mp3", {"ab = 0, \"Auto\", \"128\""})}});
    ac::Profile original(SystemPath("a.pf"));
    original.SetValue("ab", "320");
    std::unique_ptr<ac::ParameterSet> clone = original.Clone();
    EXPECT_EQ(clone->GetValue("ab"), "128");
    EXPECT_EQ(clone->GetPath(), original.GetPath());
    // The clone lives on its own: the row owns it after the catalogue entry is gone.
    clone->SetValue("ab", "64");
    EXPECT_EQ(original.GetValue("ab"), "320");
}

TEST_F(ProfileMain, SaveWritesWhatTheFileSaidWithTheWorkingValues) {
    WriteProfiles({{"mp3.pf", PfText("Stock", "mp3", "mp3",
                                     {"ab = READONLY, \"\", \"128\", {\"64\", \"128\"}",
                                      "ss = 0, \"\", \"\"", "title = 0, \"\", \"\"",
                                      "stray = 0, \"\", \"\""})}});
    ac::Profile stock(SystemPath("mp3.pf"));
    ac::Profile working(SystemPath("mp3.pf"));
    working.SetValue("ab", " 64 ");
    working.SetValue("title", "Live");
    ASSERT_TRUE(ac::SaveProfile(stock, working, "Mine", UserPath("Mine.pf")));

    EXPECT_EQ(ac::ReadIniText("Parameter", "ab", "", UserPath("Mine.pf"), 512),
              "READONLY, \"\", \"64\", {\"64\", \"128\"}");
    ac::Profile mine(UserPath("Mine.pf"));
    ASSERT_TRUE(mine.IsLoaded());
    EXPECT_EQ(mine.GetName(), "Mine");
    EXPECT_EQ(mine.GetSName(), "MP3");
    EXPECT_FALSE(mine.IsSysProfile());
    EXPECT_EQ(mine.GetValue("ab"), "64");
    EXPECT_EQ(mine.GetDefault("ab"), "Auto");  // the file keeps its empty default
    EXPECT_EQ(mine.GetFlags("ab"), ac::PARAM_READONLY);
    EXPECT_EQ(ListOf(mine, "ab"), (Strings{"64", "128"}));
    EXPECT_EQ(mine.GetValue("title"), "Live");
    EXPECT_FALSE(mine.HasKey("stray"));

    // A Save writes over the same file and a Reload shows it.
    mine.SetValue("title", "Studio");
    ASSERT_TRUE(ac::SaveProfile(mine, mine, "Mine", mine.GetPath()));
    mine.SetValue("title", "unsaved");
    ASSERT_TRUE(mine.Reload());
    EXPECT_EQ(mine.GetValue("title"), "Studio");
}

}  // namespace
