#include "shell/AppConfig.h"

#include "platform/AtomicFile.h"
#include "../support/TempDir.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <set>
#include <string>

namespace ac {
namespace {

class AppConfigTest : public ::testing::Test {
protected:
    test::TempDir dir;
    std::string file = dir / "settings.ini";
    AppConfig config{file};
    platform::SettingsStore raw{file};
    const std::string settingsKey = config.GetProductStrings().settingsKey;
};

TEST_F(AppConfigTest, AMissingValueIsCreatedWithTheCallersDefault) {
    EXPECT_EQ(config.GetInt("max_processes", nullptr, 10), 10);
    auto stored = raw.Read(settingsKey, "max_processes");
    ASSERT_TRUE(stored);
    EXPECT_EQ(stored->number, 10);
    // Once stored, another default does not win.
    EXPECT_EQ(config.GetInt("max_processes", nullptr, 3), 10);

    EXPECT_EQ(config.GetString("allscheme", nullptr, nullptr), "");
    EXPECT_EQ(raw.Read(settingsKey, "allscheme")->type, platform::SettingType::String);
}

TEST_F(AppConfigTest, AValueOfTheWrongTypeIsOverwrittenWithTheDefault) {
    ASSERT_TRUE(config.SetString("max_processes", "ten"));
    EXPECT_EQ(config.GetInt("max_processes", nullptr, 10), 10);
    EXPECT_EQ(raw.Read(settingsKey, "max_processes")->type, platform::SettingType::Int);

    ASSERT_TRUE(config.SetInt("OutputDir", 5));
    EXPECT_EQ(config.GetString("OutputDir", nullptr, "/music"), "/music");
    EXPECT_EQ(raw.Read(settingsKey, "OutputDir")->text, "/music");
}

TEST_F(AppConfigTest, AStringMustFitTheBufferWithItsTerminatingNul) {
    const std::string fits(AppConfig::kStringBufferSize - 1, 'a');
    const std::string tooLong(AppConfig::kStringBufferSize, 'b');
    ASSERT_TRUE(config.SetString("last_openpath", fits.c_str()));
    EXPECT_EQ(config.GetString("last_openpath", nullptr, "dflt"), fits);
    ASSERT_TRUE(config.SetString("last_openpath", tooLong.c_str()));
    EXPECT_EQ(config.GetString("last_openpath", nullptr, "dflt"), "dflt");
    EXPECT_EQ(raw.Read(settingsKey, "last_openpath")->text, "dflt");

    // The disc images are a list of paths that may grow past any one buffer: never cut.
    std::string images;
    for (int i = 0; i < 20; ++i) images += "/home/me/Music/Images/Some Album " + std::to_string(i) + "/disc.cue;";
    ASSERT_TRUE(config.SetString("cdimages", images.c_str()));
    EXPECT_EQ(config.GetString("cdimages"), images);
}

TEST_F(AppConfigTest, SubkeysLieBelowTheSettingsKey) {
    ASSERT_TRUE(config.SetInt("width", 7, "Columns"));
    EXPECT_EQ(raw.Read(settingsKey + "\\Columns", "width")->number, 7);
    EXPECT_FALSE(raw.Read(settingsKey, "width"));
    EXPECT_EQ(config.GetInt("width", "Columns", 1), 7);
}

TEST_F(AppConfigTest, ProductNameIsReadOneLevelUpAndNeedsTwoBytes) {
    const std::string productKey = config.GetProductStrings().productKey;
    ASSERT_TRUE(raw.WriteString(productKey, "product_name", "X"));
    EXPECT_EQ(AppConfig(file).GetProductStrings().productName, "Velmorant Audio Converter");
    ASSERT_TRUE(raw.WriteString(productKey, "product_name", "My Converter"));
    EXPECT_EQ(AppConfig(file).GetProductStrings().productName, "My Converter");
    EXPECT_EQ(AppConfig(file).GetProductStrings().productFullName, "Velmorant Audio Converter");
    // Reading the product name must not create it.
    EXPECT_FALSE(raw.Read(settingsKey, "product_name"));
}

TEST_F(AppConfigTest, TableDefaultsServeTheShortReads) {
    EXPECT_EQ(config.GetInt("max_running_processes"), 1);
    EXPECT_EQ(config.GetInt("afterconvert"), 4);
    EXPECT_EQ(config.GetInt("prop_second_column_width"), 90);
    EXPECT_EQ(config.GetString("allscheme"), "E,AE,AEB,ABE,AHE,AEH");
    ::setenv("HOME", dir.Path().c_str(), 1);
    ::setenv("XDG_CONFIG_HOME", dir.Path().c_str(), 1);
    EXPECT_EQ(config.GetString("OutputCDDir"), dir.Path() + "/Music");
}

// A first start writes every key the main window reads; an empty scheme list (which named
// outputs ".mp3", "-1.mp3") and an empty sound path are put back.
TEST_F(AppConfigTest, StartupWritesEveryKeyOfTheMainWindowAndMendsTwoEmptyOnes) {
    ASSERT_TRUE(config.SetString("allscheme", ""));
    ASSERT_TRUE(config.SetString("last_wavopenpath", ""));
    ReadStartupKeys(config);
    for (const char* name : {"max_processes", "max_running_processes", "output_file_overwrite",
                             "afterconvert", "playsound", "last_wavopenpath", "slowdown", "idle",
                             "OutputDir", "scheme", "allscheme", "illegal", "illegalreplace",
                             "spacereplace", "replace", "alsoconverter"}) {
        EXPECT_TRUE(raw.Read(settingsKey, name)) << name;
    }
    EXPECT_EQ(raw.Read(settingsKey, "allscheme")->text, "E,AE,AEB,ABE,AHE,AEH");
    EXPECT_TRUE(raw.Read(settingsKey, "last_wavopenpath")->text.ends_with("/wav/hint1.wav"));
    // A value the user chose stays.
    ASSERT_TRUE(config.SetString("allscheme", "AEH"));
    ReadStartupKeys(config);
    EXPECT_EQ(raw.Read(settingsKey, "allscheme")->text, "AEH");
}

TEST(ConfigKeyTableTest, NamesAreUniqueAndServerEntriesResolve) {
    std::set<std::string> names;
    for (const ConfigKey& key : ConfigKeys()) {
        EXPECT_TRUE(names.insert(key.name).second) << key.name;
    }
    // The forty of the settings key, the disc images, the CDDB identity (cddb_email and
    // cddb_proto) and the disc image recorder's files (burnimage).
    EXPECT_EQ(names.size(), 44u);
    ASSERT_NE(FindConfigKey("addr12"), nullptr);
    EXPECT_STREQ(FindConfigKey("addr12")->name, "addr");
    EXPECT_EQ(FindConfigKey("addrx"), nullptr);
    EXPECT_EQ(FindConfigKey("Max_Processes"), nullptr);  // names are spelled as the table has them
}

}  // namespace
}  // namespace ac
