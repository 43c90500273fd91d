// The ctt command text of a job: the option walk of a set and the job around it.
#include "convert/CommandLine.h"

#include <gtest/gtest.h>

#include "../support/ProfileFiles.h"
#include "platform/CommandLine.h"
#include "profile/ParameterSet.h"

namespace {

using ac::test::PfText;

// Entries of the worked example's mp3 profile, in the file order a user would write them.
const std::vector<std::string> kExampleEntries = {
    "t = 0, \"\", \"\"",
    "ss = 0, \"\", \"\"",
    "title = 0, \"\", \"My Song\"",
    "author = 0, \"\", \"\"",
    "id3v1 = 0, \"\", \"true\"",
    "id3v2 = 0, \"\", \"true\"",
    "acodec = 0, \"\", \"mp3\"",
    "ab = 0, \"Auto\", \"192\"",
    "ar = 0, \"\", \"44100\"",
    "ac = 0, \"\", \"2 (Stereo)\"",
    "vol_factor = 0, \"100%\", \"100%\"",
};

class CommandText : public ac::test::ProfileFiles {
protected:
    ac::Profile& Make(const std::string& format, const std::string& extension,
                      const std::vector<std::string>& entries = kExampleEntries) {
        WriteProfiles({{"p.pf", PfText("P", format, extension, entries)}});
        m_profile = std::make_unique<ac::Profile>(SystemPath("p.pf"));
        EXPECT_TRUE(m_profile->IsLoaded());
        return *m_profile;
    }
    std::unique_ptr<ac::Profile> m_profile;
};

TEST_F(CommandText, WorkedExampleExactly) {
    ac::Profile& profile = Make("mp3", "mp3");
    EXPECT_EQ("ctt.exe" + ac::BuildConversionCommandText("C:\\Music\\song.wav", "C:\\Temp\\Song.mp3", 50, profile),
              "ctt.exe -relk -y  -i \"C:\\Music\\song.wav\" -title \"My Song\"     -acodec \"mp3\"  -ab \"192\""
              "  -ar \"44100\"  -ac \"2 (stereo)\"  -id3v1 -id3v2  -vol  256   \"C:\\Temp\\Song.mp3\"");
}

TEST_F(CommandText, FlacOutputNamesTheCodecAsFormat) {
    std::vector<std::string> entries = kExampleEntries;
    entries[6] = "acodec = 0, \"\", \"flac\"";
    ac::Profile& profile = Make("flac", "flac", entries);
    const std::string text = ac::BuildConversionCommandText("/in.wav", "/out/a.FLAC", 50, profile);
    EXPECT_NE(text.find(" -f \"flac\" "), std::string::npos) << text;
    EXPECT_EQ(text.find("-acodec"), std::string::npos);
    // An output that merely ends in the letters counts as well.
    EXPECT_EQ(ac::BuildConversionCommandText("/in.wav", "/out/myflac", 50, profile).find("-acodec"),
              std::string::npos);
}

TEST_F(CommandText, FormatQuirksOfAacWmaAndPsp) {
    ac::Profile& aac = Make("aac", "aac");
    const std::string aacText = ac::BuildConversionCommandText("/in.wav", "/o.aac", 50, aac);
    // Once lowered by the option walk, once raw from the job.
    EXPECT_NE(aacText.find("-ac \"2 (stereo)\""), std::string::npos);
    EXPECT_NE(aacText.find(" -ac \"2 (Stereo)\" \"/o.aac\""), std::string::npos) << aacText;

    ac::Profile& wma = Make("asf", "wma");
    const std::string wmaText = ac::BuildConversionCommandText("/in.wav", "/o.wma", 50, wma);
    EXPECT_NE(wmaText.find("  -f asf  -vn  \"/o.wma\""), std::string::npos) << wmaText;
    // The burn list converts the same set without the per-format quirks.
    const std::string burnText = ac::BuildBurnCommandText("/in.wav", "/t.wav", 50, wma);
    EXPECT_NE(burnText.find("  -f asf  -vn  \"/t.wav\""), std::string::npos) << burnText;

    std::vector<std::string> entries = kExampleEntries;
    entries[2] = "title = 0, \"\", \"\"";
    ac::Profile& psp = Make("psp", "mp4", entries);
    const std::string first = ac::BuildConversionCommandText("/music/My.Clip.avi", "/o.mp4", 50, psp);
    EXPECT_EQ(first.find("-title"), std::string::npos);  // the title arrives at the next start
    EXPECT_EQ(psp.GetValue("title"), "My.Clip");
    EXPECT_NE(ac::BuildConversionCommandText("/music/My.Clip.avi", "/o.mp4", 50, psp).find("-title \"My.Clip\""),
              std::string::npos);
    ac::BuildBurnCommandText("/music/Other.avi", "/o.wav", 50, psp);
    EXPECT_EQ(psp.GetValue("title"), "My.Clip");
}

TEST_F(CommandText, ValuesTravelSafelyToTheTool) {
    ac::Profile& profile = Make("mp3", "mp3");
    profile.SetValue("author", "Say \"Hi\" Now");
    profile.SetValue("acodec", "MP3");
    profile.SetValue("ab", "AUTO");  // its default in another case
    const std::string text = ac::BuildConversionCommandText("/in put.wav", "/out put.mp3", 100, profile);
    const auto words = ac::platform::SplitCommandLine(text);
    const std::vector<std::string> expected = {
        "-relk", "-y", "-i", "/in put.wav", "-title", "My Song", "-author", "Say \x0BHi\x0B Now",
        "-acodec", "mp3", "-ar", "44100", "-ac", "2 (stereo)", "-id3v1", "-id3v2", "-vol", "512",
        "/out put.mp3"};
    EXPECT_EQ(words, expected) << text;
}

TEST_F(CommandText, TagSwitchesNeedATagValue) {
    std::vector<std::string> entries = kExampleEntries;
    entries[2] = "title = 0, \"\", \"\"";
    ac::Profile& profile = Make("mp3", "mp3", entries);
    const std::string text = profile.BuildCommandLine();
    EXPECT_EQ(text.find("-id3v"), std::string::npos) << text;
    profile.SetValue("id3v1", "no");
    profile.SetValue("author", "A");
    EXPECT_EQ(profile.BuildCommandLine().substr(profile.BuildCommandLine().size() - 8), " -id3v2 ");
}

TEST_F(CommandText, CommandLineRefreshesTimesAndOutputName) {
    ac::Profile& profile = Make("mp3", "mp3",
                                {"t = 0, \"\", \"00:01:30\"", "ss = 0, \"\", \"-5.25\"",
                                 "s = 0, \"Auto\", \"352x288 (cif)\""});
    profile.SetValue("outfilename", "Name.mp3");
    EXPECT_EQ(profile.GetDuration(), 90'000'000);
    EXPECT_EQ(profile.GetStartTime(), -5'250'000);
    EXPECT_EQ(profile.GetOutputFileName(), "Name.mp3");
    EXPECT_EQ(profile.GetFrameSize().width, 352);
    EXPECT_EQ(profile.GetFrameSize().height, 288);
    const std::string text = profile.BuildCommandLine();
    EXPECT_EQ(text.find("Name.mp3"), std::string::npos);
    EXPECT_EQ(text.find("-s "), std::string::npos);
    EXPECT_NE(text.find("-t \"00:01:30\""), std::string::npos);
}

TEST(VolumeToGain, Points) {
    EXPECT_EQ(ac::VolumeToGain(0), 128);
    EXPECT_EQ(ac::VolumeToGain(50), 256);
    EXPECT_EQ(ac::VolumeToGain(100), 512);
    EXPECT_EQ(ac::VolumeToGain(75), 362);
}

struct DurationCase {
    const char* text;
    std::int64_t micros;
};

class ParseDurationOf : public ::testing::TestWithParam<DurationCase> {};

TEST_P(ParseDurationOf, Text) { EXPECT_EQ(ac::ParseDuration(GetParam().text), GetParam().micros); }

INSTANTIATE_TEST_SUITE_P(
    Texts, ParseDurationOf,
    ::testing::Values(DurationCase{"Full", 0}, DurationCase{"", 0}, DurationCase{"00:00:00", 0},
                      DurationCase{"1:02:03", 3'723'000'000}, DurationCase{"23:59:59", 86'399'000'000},
                      DurationCase{"24:00:00", 24'000'000}, DurationCase{"00:60:00", 0},
                      DurationCase{"90", 90'000'000}, DurationCase{"-90", -90'000'000},
                      DurationCase{"00:00:01.5", 1'500'000}, DurationCase{"2.1234567", 2'123'456},
                      DurationCase{"-00:01:00.000001", -60'000'001}, DurationCase{"1:30", 1'000'000}));

TEST(ParseDuration, AbsurdDigitRunsDoNotWrap) {
    EXPECT_GT(ac::ParseDuration(std::string(40, '9')), 0);
    EXPECT_LT(ac::ParseDuration("-" + std::string(40, '9')), 0);
}

}  // namespace
