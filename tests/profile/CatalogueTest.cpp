// The catalogue's rules: which profiles enter, which comes first, the entry text, the name
// dialog's file and name checks, and Save as, Rename and Delete on user.pkg.
#include "profile/Catalogue.h"

#include <gtest/gtest.h>

#include "../support/ProfileFiles.h"

namespace {

const std::vector<std::string> kEntries = {"ab = 0, \"Auto\", \"128\"", "ar = 0, \"\", \"44100\""};

TEST(CatalogueRules, AdmittedFormatsAndEntryText) {
    EXPECT_TRUE(ac::IsAdmittedFormat("MP3"));
    EXPECT_TRUE(ac::IsAdmittedFormat("xwmv"));
    EXPECT_FALSE(ac::IsAdmittedFormat("wma"));
    EXPECT_FALSE(ac::IsAdmittedFormat(""));
    EXPECT_FALSE(ac::IsAdmittedFormat("mp3 "));
}

TEST(CatalogueRules, BitRateByExtensionAndMode) {
    EXPECT_FALSE(ac::BitRateAllowed(0, "WAV"));
    EXPECT_FALSE(ac::BitRateAllowed(1, "flac"));
    EXPECT_TRUE(ac::BitRateAllowed(0, "mp3"));
    EXPECT_FALSE(ac::BitRateAllowed(2, "wav"));
    EXPECT_TRUE(ac::BitRateAllowed(2, "flac"));
}

TEST(CatalogueRules, FirstProfileByLastMode) {
    auto convert = ac::ChooseFirstProfile(0, "/b\\profile\\ogg.pf", "", "/b");
    EXPECT_EQ(convert.path, "/b\\profile\\ogg.pf");
    EXPECT_FALSE(convert.storeLastCdPath);
    auto rip = ac::ChooseFirstProfile(1, "/b\\profile\\ogg.pf", "", "/b");
    EXPECT_EQ(rip.path, "/b\\profile\\mp3.pf");
    EXPECT_TRUE(rip.storeLastCdPath);
    EXPECT_EQ(ac::ChooseFirstProfile(1, "", "/b\\x.pf", "/b").path, "/b\\x.pf");
    EXPECT_TRUE(ac::ChooseFirstProfile(2, "/b\\x.pf", "/b\\y.pf", "/b").path.empty());
}

TEST(CatalogueRules, NameDialogFileNames) {
    EXPECT_EQ(ac::ProfileFilePath("/b\\profile\\user", "abc"), "/b\\profile\\user\\abc.pf");
    EXPECT_EQ(ac::ProfileFileName("abc.pf"), ac::ProfileFileName("abc"));
    EXPECT_EQ(ac::ProfileFileName("abc.PF"), "abc.PF");
    EXPECT_EQ(ac::ProfileFileName("abc.txt"), "abc.txt.pf");
    EXPECT_EQ(ac::ProfileFileName("a.pf.x"), "a.pf.x.pf");
}

class CatalogueFiles : public ac::test::ProfileFiles {
protected:
    void SetUp() override {
        WriteProfiles(
            {{"mp3.pf",
              ac::test::PfText("MP3 Audio", "mp3", "mp3", kEntries, "IsSysProfile = yes\r\n")},
             {"wav.pf", ac::test::PfText("WAV", "wav", "wav", kEntries, "IsSysProfile = yes\r\n")},
             {"wma.pf", ac::test::PfText("WMA", "wma", "wma", kEntries)},
             {"blank.pf", ac::test::PfText("No format", "", "x", kEntries)},
             {"noname.pf", ac::test::PfText("", "ogg", "ogg", kEntries)}});
    }
    std::vector<std::string> LoadNames(const std::string& directory, const std::string& first) {
        std::vector<std::string> names;
        std::atomic<bool> stop{false};
        ac::LoadProfilesOf(
            directory, first,
            [&](std::unique_ptr<ac::Profile> profile) { names.push_back(profile->GetName()); },
            stop);
        return names;
    }
    std::string Base() const { return m_base; }
};

TEST_F(CatalogueFiles, WalkLeavesOutUnadmittedNamelessAndTheFirst) {
    const std::string system = ac::SystemProfileDirectory(Base());
    EXPECT_EQ(LoadNames(system, ""), (std::vector<std::string>{"MP3 Audio", "WAV"}));
    // The first path, in another case, is not loaded twice.
    EXPECT_EQ(LoadNames(system, Base() + "\\PROFILE\\MP3.PF"), (std::vector<std::string>{"WAV"}));
    // The first profile enters untested, but only if it has a name.
    auto first = ac::LoadFirstProfile(SystemPath("wma.pf"));
    ASSERT_NE(first, nullptr);
    EXPECT_EQ(ac::SelectorEntryText(*first), "WMA  (*.wma)");
    EXPECT_EQ(ac::LoadFirstProfile(SystemPath("noname.pf")), nullptr);
    EXPECT_EQ(ac::LoadFirstProfile(SystemPath("missing.pf")), nullptr);
    // No user profiles yet.
    EXPECT_TRUE(LoadNames(ac::UserProfileDirectory(Base()), "").empty());
}

TEST_F(CatalogueFiles, SaveAsRenameDeleteOnUserPackage) {
    ac::ProfileCatalogue catalogue;
    catalogue.Add(std::make_unique<ac::Profile>(SystemPath("mp3.pf")));
    catalogue.Add(std::make_unique<ac::Profile>(SystemPath("wav.pf")));
    ac::Profile* system = catalogue.At(0);
    ASSERT_TRUE(system->IsLoaded());
    system->SetValue("ab", "320");

    const std::string path = ac::ProfileFilePath(ac::SaveDirectory(Base()), "Mine");
    EXPECT_FALSE(ac::ResourceExists(path));
    ASSERT_EQ(catalogue.SaveAs(0, *system, "Mine", path), ac::CatalogueResult::Ok);
    EXPECT_TRUE(ac::ResourceExists(path));
    ASSERT_EQ(catalogue.Count(), 3);
    ac::Profile* mine = catalogue.At(2);
    EXPECT_EQ(mine->GetValue("ab"), "320");
    EXPECT_EQ(mine->GetFormat(), "mp3");
    EXPECT_FALSE(mine->IsSysProfile());
    EXPECT_TRUE(catalogue.NameTaken("MINE"));
    EXPECT_TRUE(catalogue.NameTaken("mp3 audio"));
    EXPECT_EQ(catalogue.FindByPath(path), 2);
    EXPECT_EQ(LoadNames(ac::UserProfileDirectory(Base()), ""), (std::vector<std::string>{"Mine"}));
    EXPECT_EQ(ac::LoadFirstProfile(path)->GetName(), "Mine");

    // Rename keeps the file and moves the entry to the end; data.pkg cannot be renamed in.
    const std::string otherPath = ac::ProfileFilePath(ac::SaveDirectory(Base()), "Other.pf");
    ASSERT_EQ(catalogue.SaveAs(1, *catalogue.At(1), "Other", otherPath), ac::CatalogueResult::Ok);
    int renamed = -1;
    EXPECT_EQ(catalogue.Rename(0, "System renamed", renamed), ac::CatalogueResult::WriteFailed);
    ASSERT_EQ(catalogue.Rename(2, "Yours", renamed), ac::CatalogueResult::Ok);
    EXPECT_EQ(renamed, 3);
    EXPECT_EQ(catalogue.At(3), mine);
    EXPECT_EQ(catalogue.At(2)->GetName(), "Other");
    EXPECT_EQ(mine->GetPath(), path);
    EXPECT_EQ(ac::Profile(path).GetName(), "Yours");

    // Save writes the working values into the entry's own file.
    ac::Profile working(path);
    working.SetValue("ar", "22050");
    ASSERT_EQ(catalogue.Save(3, working), ac::CatalogueResult::Ok);
    EXPECT_EQ(mine->GetValue("ar"), "22050");
    EXPECT_EQ(mine->GetName(), "Yours");

    // Deleting the last entry selects entry 0; the object lives on for rows that cloned it.
    int next = -1;
    ASSERT_EQ(catalogue.Delete(3, next), ac::CatalogueResult::Ok);
    EXPECT_EQ(next, 0);
    EXPECT_EQ(catalogue.Count(), 3);
    EXPECT_FALSE(ac::ResourceExists(path));
    EXPECT_EQ(mine->GetValue("ar"), "22050");
    EXPECT_EQ(catalogue.Delete(1, next), ac::CatalogueResult::DeleteFailed);  // data.pkg
    EXPECT_EQ(catalogue.Delete(5, next), ac::CatalogueResult::NoSelection);
}

TEST_F(CatalogueFiles, RememberedIndicesFromPaths) {
    ac::ProfileCatalogue catalogue;
    catalogue.Add(std::make_unique<ac::Profile>(SystemPath("mp3.pf")));
    catalogue.Add(std::make_unique<ac::Profile>(SystemPath("wav.pf")));
    auto found = ac::FindRememberedIndices(catalogue, Base() + "\\profile\\WAV.pf", "");
    EXPECT_EQ(found.convert, 1);
    EXPECT_EQ(found.rip, 1);  // an empty rip path counts as the convert one
    found = ac::FindRememberedIndices(catalogue, "x", SystemPath("mp3.pf"));
    EXPECT_EQ(found.convert, -1);
    EXPECT_EQ(found.rip, 0);
    EXPECT_EQ(catalogue.FindSystemByExt("WAV"), 1);
    EXPECT_EQ(catalogue.FindByName("WAV"), 1);
    EXPECT_EQ(catalogue.FindByName("wav"), -1);
}

}  // namespace
