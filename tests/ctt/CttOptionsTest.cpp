#include "CttOptions.h"

#include <gtest/gtest.h>

#include "platform/CommandLine.h"

namespace ac::ctt {
namespace {

ParseResult Parse(const std::string& commandText) {
    return ParseArguments(ac::platform::SplitCommandLine(commandText));
}

TEST(CttOptions, WorkedExampleOfTheCommandLineAssembly) {
    const ParseResult r = Parse(
        " -relk -y  -i \"/music/song.wav\" -title \"My Song\"     -acodec \"mp3\"  -ab \"192\""
        "  -ar \"44100\"  -ac \"2 (stereo)\"  -id3v1 -id3v2  -vol  256   \"/tmp/Song.mp3\"");
    ASSERT_TRUE(r.options) << r.error;
    const CttOptions& o = *r.options;
    EXPECT_EQ(o.input, "/music/song.wav");
    EXPECT_EQ(o.output, "/tmp/Song.mp3");
    EXPECT_TRUE(o.overwrite);
    EXPECT_EQ(o.codec, "libmp3lame");
    EXPECT_EQ(o.bitRate, 192000);
    EXPECT_EQ(o.sampleRate, 44100);
    EXPECT_EQ(o.channels, 2);
    EXPECT_EQ(o.volume, 256);
    EXPECT_TRUE(o.id3v1);
    EXPECT_TRUE(o.id3v2);
    EXPECT_EQ(o.tags.at("title"), "My Song");
    EXPECT_TRUE(o.ignored.empty());
}

TEST(CttOptions, QuoteStandInAndLastValueWins) {
    // An "aac" profile has -ac twice; the job-level copy comes last, raw.
    const ParseResult r = Parse("-i \"a\x0B" "b.wav\" -title \"say \x0Bhi\x0B\" -ac \"1\" -ac \"2 (Stereo)\" \"o.m4a\"");
    ASSERT_TRUE(r.options) << r.error;
    EXPECT_EQ(r.options->input, "a\"b.wav");
    EXPECT_EQ(r.options->tags.at("title"), "say \"hi\"");
    EXPECT_EQ(r.options->channels, 2);
}

TEST(CttOptions, VideoOptionsAreNamedOnceAndOtherKeysPassSilently) {
    const ParseResult r = Parse("-i in.avi -s \"640x480\" -b 300 -vcodec mpeg4 -b 400 -deinterlace "
                                "-threads 2 -v 1 -async 1 -copyts -vn out.mp3");
    ASSERT_TRUE(r.options) << r.error;
    EXPECT_EQ(r.options->ignored, (std::vector<std::string>{"b", "deinterlace", "s", "vcodec"}));
    EXPECT_EQ(r.options->threads, 2);
    EXPECT_TRUE(r.options->noVideo);
}

struct ValueCase {
    const char* args;  // between "-i in.wav" and the output
    const char* errorPart;  // nullptr: accepted
};

class CttOptionValues : public ::testing::TestWithParam<ValueCase> {};

TEST_P(CttOptionValues, AcceptOrRejectWithAReason) {
    const ParseResult r = Parse(std::string("-relk -y -i in.wav ") + GetParam().args + " out.mp3");
    if (GetParam().errorPart) {
        ASSERT_FALSE(r.options) << GetParam().args;
        EXPECT_NE(r.error.find(GetParam().errorPart), std::string::npos) << r.error;
    } else {
        EXPECT_TRUE(r.options) << GetParam().args << ": " << r.error;
    }
}

INSTANTIATE_TEST_SUITE_P(
    Table, CttOptionValues,
    ::testing::Values(ValueCase{"-ar banana", "-ar"}, ValueCase{"-ar 44100", nullptr},
                      ValueCase{"-ar \"Auto\"", nullptr}, ValueCase{"-ar 12", "-ar"},
                      ValueCase{"-ac \"2 (Stereo)\"", nullptr}, ValueCase{"-ac 9", "-ac"},
                      ValueCase{"-ac stereo", "-ac"}, ValueCase{"-ab 128k", nullptr},
                      ValueCase{"-ab fast", "-ab"}, ValueCase{"-vol 512", nullptr},
                      ValueCase{"-vol -3", "-vol"}, ValueCase{"-vol 1.5", "-vol"},
                      ValueCase{"-t 00:01:02.5", nullptr}, ValueCase{"-t Full", nullptr},
                      ValueCase{"-t 1:99:00", "-t"}, ValueCase{"-ss -1", "-ss"},
                      ValueCase{"-itsoffset -0.5", nullptr}, ValueCase{"-acodec \"pcm_s16le\"", nullptr},
                      ValueCase{"-acodec opus2", "codec"}, ValueCase{"-acodec copy", "copy"},
                      ValueCase{"-f m4a", nullptr}, ValueCase{"-f avi", "format"},
                      ValueCase{"-frobnicate 1", "unknown option"}, ValueCase{"stray", "unexpected"},
                      ValueCase{"-an", "-an"}, ValueCase{"-threads many", "-threads"},
                      ValueCase{"-title \"\"", nullptr}));

TEST(CttOptions, RipDriverLineWithEmptyCodecAndZeroRate) {
    // What the rip driver sends for a row whose profile lacks a codec and a sample rate.
    const ParseResult r = Parse("-relk -y -i \"/dev/sr0/Track03.cda\" -acodec  -title \"-Intro-\" "
                                "-album \"\"  -author \"\"  -genre \"\"  -year \"\"  -id3v1 -id3v2  "
                                "-ar 0 -ac 0 -ab 192  -vol 256 \"/music/a/b/03.mp3\"");
    ASSERT_TRUE(r.options) << r.error;
    EXPECT_EQ(r.options->codec, "");
    EXPECT_EQ(r.options->tags.at("title"), "-Intro-");
    EXPECT_EQ(r.options->sampleRate, 0);
    EXPECT_EQ(r.options->channels, 0);
    EXPECT_EQ(r.options->bitRate, 192000);
}

TEST(CttOptions, MissingPiecesAreErrors) {
    EXPECT_FALSE(ParseArguments({}).options);
    EXPECT_FALSE(Parse("-relk -y out.mp3").options);          // no input
    EXPECT_FALSE(Parse("-i in.wav -title").options);           // the value would be the output
    EXPECT_FALSE(Parse("-i in.wav out.mp3 -y").options);       // the output must come last
}

TEST(CttOptions, DurationsInBothForms) {
    EXPECT_EQ(ParseDurationUs("90"), 90000000);
    EXPECT_EQ(ParseDurationUs("1:30"), 90000000);
    EXPECT_EQ(ParseDurationUs("00:01:30.25"), 90250000);
    EXPECT_EQ(ParseDurationUs("2.000001"), 2000001);
    EXPECT_EQ(ParseDurationUs("-0.5"), -500000);
    EXPECT_EQ(ParseDurationUs("Full"), 0);
    EXPECT_FALSE(ParseDurationUs("1:2:3:4"));
    EXPECT_FALSE(ParseDurationUs("12s"));
    EXPECT_FALSE(ParseDurationUs("."));
}

}  // namespace
}  // namespace ac::ctt
