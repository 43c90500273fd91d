// The cue sheet reader: its strict dialect on made-up sheets and on real ones from other
// programs, the growth of the track array, and its diagnostics.
#include "rip/CueSheet.h"

#include <gtest/gtest.h>

#include <string>

#include "../support/TempDir.h"

namespace {

struct Outcome {
    int result = 0;
    std::string errors;
    std::string output;
};

class CueSheetReader : public ::testing::Test {
protected:
    ~CueSheetReader() override { ac::FreeCueSheet(); }

    Outcome Parse(const std::string& text, const std::string& path = "/music/sheet.cue") {
        Outcome outcome;
        outcome.result = ac::ParseCueSheetText(text, path, {&outcome.errors, &outcome.output});
        return outcome;
    }
    Outcome ParseFile(const std::string& path) {
        Outcome outcome;
        outcome.result = ac::ParseCueSheet(path, {&outcome.errors, &outcome.output});
        return outcome;
    }
    const ac::CueSheet& Sheet() const { return *ac::g_CueSheet; }

    static std::string Track(int number, const std::string& title, const std::string& index = "00:00:00") {
        return "  TRACK " + std::to_string(number) + " AUDIO\n    TITLE \"" + title +
               "\"\n    INDEX 01 " + index + "\n";
    }
};

const std::string kHeader = "PERFORMER \"Artist\"\nTITLE \"Album\"\nFILE \"album.wav\" WAVE\n";

TEST_F(CueSheetReader, ReadsHeaderTracksAndTrackEnds) {
    const Outcome outcome =
        Parse(kHeader + Track(1, "One") + Track(2, "Two", "03:20:40") +
              "  TRACK 3 AUDIO\n    TITLE \"Three\"\n    PERFORMER Guest\n    INDEX 00 07:00:00\n"
              "    INDEX 01 07:01:02\n");
    ASSERT_EQ(outcome.result, 0) << outcome.errors;
    EXPECT_EQ(outcome.output, "yyparse() completed successfully!\n");
    EXPECT_STREQ(Sheet().performer, "Artist");
    EXPECT_STREQ(Sheet().title, "Album");
    EXPECT_STREQ(Sheet().file, "album.wav");
    EXPECT_STREQ(Sheet().fileType, "WAVE");
    ASSERT_EQ(Sheet().trackCount, 3u);
    EXPECT_STREQ(Sheet().tracks[0].title, "One");
    EXPECT_STREQ(Sheet().tracks[1].title, "Two");
    EXPECT_STREQ(Sheet().tracks[2].title, "Three");
    EXPECT_STREQ(Sheet().tracks[2].performer, "Guest");
    EXPECT_EQ(Sheet().tracks[2].number, 3);
    // A track ends where the next one's INDEX 01 stands; INDEX 00 changes nothing.
    EXPECT_EQ(Sheet().tracks[0].endMinute, 3);
    EXPECT_EQ(Sheet().tracks[0].endSecond, 20);
    EXPECT_EQ(Sheet().tracks[0].endFrame, 40);
    EXPECT_EQ(Sheet().tracks[1].endMinute, 7);
    EXPECT_EQ(Sheet().tracks[1].endFrame, 2);
    EXPECT_EQ(Sheet().tracks[2].endMinute, 0);
}

TEST_F(CueSheetReader, TwentyOneTracksGrowTheArrayKeepingTitles) {
    std::string text = kHeader;
    for (int number = 1; number <= 21; ++number) text += Track(number, "T" + std::to_string(number));
    ASSERT_EQ(Parse(text).result, 0);
    EXPECT_EQ(Sheet().trackCount, 21u);
    EXPECT_EQ(Sheet().capacity, 40u);
    for (int i = 0; i < 21; ++i) {
        EXPECT_EQ(Sheet().tracks[i].title, "T" + std::to_string(i + 1));
    }
}

TEST_F(CueSheetReader, TextsKeepSixtyFourCharacters) {
    const std::string longTitle(70, 'x');
    const std::string longPath = "/" + std::string(80, 'p') + ".cue";
    ASSERT_EQ(Parse("TITLE \"" + longTitle + "\"\n" + Track(1, longTitle)).result, 0);
    EXPECT_EQ(std::string(Sheet().title), longTitle.substr(0, 64));
    EXPECT_EQ(std::string(Sheet().tracks[0].title), longTitle.substr(0, 64));
    // Without a TITLE line the sheet's title is the start of its own path.
    ASSERT_EQ(Parse("PERFORMER \"A\"\n" + Track(1, "x"), longPath).result, 0);
    EXPECT_EQ(std::string(Sheet().title), longPath.substr(0, 64));
}

TEST_F(CueSheetReader, ParseErrorNamesTheLineEndsReadSoFar) {
    const Outcome outcome = Parse(kHeader + "REM DATE 1999\n" + Track(1, "x"));
    EXPECT_EQ(outcome.result, 1);
    EXPECT_EQ(outcome.errors, "Parse error on line 3: parse error\n");
    EXPECT_EQ(outcome.output, "");
}

TEST_F(CueSheetReader, DeepSheetOverflowsTheParserStack) {
    // Every line of a track stays on the stack until the track ends: 5,000 lines pass 10,000.
    std::string text = kHeader + "  TRACK 1 AUDIO\n";
    for (int i = 0; i < 5000; ++i) text += "    REM x\n";
    const Outcome outcome = Parse(text);
    EXPECT_EQ(outcome.result, 1);
    EXPECT_NE(outcome.errors.find("parser stack overflow"), std::string::npos) << outcome.errors;
    // Many short tracks stay far below it.
    std::string tracks = kHeader;
    for (int number = 1; number <= 500; ++number) tracks += Track(number, "t");
    EXPECT_EQ(Parse(tracks).result, 0);
    EXPECT_EQ(Sheet().trackCount, 500u);
    EXPECT_EQ(Sheet().capacity, 640u);
}

TEST_F(CueSheetReader, UnopenableFileLeavesAnEmptyRecord) {
    ac::test::TempDir dir;
    const Outcome outcome = ParseFile(dir / "missing.cue");
    EXPECT_EQ(outcome.result, 1);
    EXPECT_EQ(outcome.errors, "Could not open cuefile " + (dir / "missing.cue") + "\n");
    ASSERT_NE(ac::g_CueSheet, nullptr);
    EXPECT_EQ(Sheet().trackCount, 0u);
    ac::FreeCueSheet();
    EXPECT_EQ(ac::g_CueSheet, nullptr);
    ac::FreeCueSheet();  // nothing to free: no harm
}

TEST_F(CueSheetReader, StrayBytesAreEchoed) {
    const Outcome outcome = Parse("TITLE \"A\"\n" + std::string("  TRACK 1 AUDIO\n    REM a-b.c\n"));
    EXPECT_EQ(outcome.result, 0);
    EXPECT_EQ(outcome.output, "-.yyparse() completed successfully!\n");
}

// ---- The dialect, line by line ----

struct DialectCase {
    const char* name;
    std::string text;
    int result;
    unsigned trackCount;
    const char* firstTitle;  // null: not checked
};

class CueDialect : public CueSheetReader, public ::testing::WithParamInterface<DialectCase> {};

TEST_P(CueDialect, AcceptsOrRefuses) {
    const DialectCase& c = GetParam();
    const Outcome outcome = Parse(c.text);
    EXPECT_EQ(outcome.result, c.result) << outcome.errors;
    EXPECT_EQ(Sheet().trackCount, c.trackCount);
    if (c.firstTitle != nullptr) {
        EXPECT_STREQ(Sheet().tracks[0].title, c.firstTitle);
    }
}

const std::string kTrack = "  TRACK 01 AUDIO\n    TITLE \"t\"\n    INDEX 01 00:00:00\n";

INSTANTIATE_TEST_SUITE_P(
    Lines, CueDialect,
    ::testing::Values(
        DialectCase{"CommentOfWordsAndQuote", "REM COMMENT \"x y\"\n" + kTrack, 0, 1, "t"},
        DialectCase{"CommentWithBareNumber", "REM DATE 1999\n" + kTrack, 1, 0, nullptr},
        DialectCase{"CatalogNumber", "CATALOG 0000010271955\n" + kTrack, 0, 1, "t"},
        DialectCase{"TitleOfBareDigits", "TITLE 1999\n" + kTrack, 1, 0, nullptr},
        DialectCase{"TitleOfQuotedDigits", "TITLE \"A\"\n  TRACK 1 AUDIO\n    TITLE \"1999\"\n", 0, 1, "1999"},
        DialectCase{"PerformerOfTwoBareWords", "PERFORMER Big Band\n" + kTrack, 1, 0, nullptr},
        DialectCase{"PerformerOfOneBareWord", "PERFORMER Band\n" + kTrack, 0, 1, "t"},
        DialectCase{"TrackLineOfWords", "TITLE \"A\"\n  TRACK 1 AUDIO\n    FLAGS DCP\n", 0, 1, ""},
        DialectCase{"WordFollowedByTime", "TITLE \"A\"\n  TRACK 1 AUDIO\n    PREGAP 00:02:00\n", 1, 0, nullptr},
        DialectCase{"FileAfterFirstTrack", "TITLE \"A\"\n" + kTrack + "FILE \"b.wav\" WAVE\n" + kTrack, 1, 1, "t"},
        DialectCase{"TrackNotAudio", "TITLE \"A\"\n  TRACK 1 MODE1/2352\n    INDEX 01 00:00:00\n", 1, 0, nullptr},
        DialectCase{"BlankLineAtEnd", "TITLE \"A\"\n" + kTrack + "\n\n", 0, 1, "t"},
        DialectCase{"BlankLineAtStart", "\nTITLE \"A\"\n" + kTrack, 1, 0, nullptr},
        DialectCase{"BlankLineInHeader", "TITLE \"A\"\n\nPERFORMER \"B\"\n" + kTrack, 1, 0, nullptr},
        DialectCase{"BlankLineInTrack", "TITLE \"A\"\n  TRACK 1 AUDIO\n\n    TITLE \"t\"\n", 1, 0, nullptr},
        DialectCase{"BlankLineBetweenTracks", "TITLE \"A\"\n" + kTrack + "\n" + kTrack, 1, 1, "t"},
        DialectCase{"NoFinalLineEnd", "TITLE \"A\"\n  TRACK 1 AUDIO\n    INDEX 01 00:00:00", 1, 0, nullptr},
        DialectCase{"EmptyFile", "", 1, 0, nullptr},
        DialectCase{"HeaderWithoutTracks", "TITLE \"A\"\n", 1, 0, nullptr},
        DialectCase{"TrackWithoutLines", "TITLE \"A\"\n  TRACK 1 AUDIO\n", 1, 0, nullptr},
        DialectCase{"LowerCaseKeywordIsWords", "TITLE \"A\"\n  TRACK 1 AUDIO\n    title Lost\n", 0, 1, ""},
        DialectCase{"KeywordPrefixIsWord", "TITLES x\n" + kTrack, 0, 1, "t"},
        DialectCase{"CrLfLineEnds", "TITLE \"A\"\r\n  TRACK 1 AUDIO\r\n    TITLE \"t\"\r\n", 0, 1, "t"},
        DialectCase{"LoneCarriageReturnsJoinLines", "TITLE \"A\"\r  TRACK 1 AUDIO\r    TITLE \"t\"\r", 1, 0, nullptr},
        DialectCase{"UnpairedQuoteIsSkipped", "TITLE \"A\"\n  TRACK 1 AUDIO\n    TITLE \"t\n", 0, 1, "t"}),
    [](const ::testing::TestParamInfo<DialectCase>& info) { return std::string(info.param.name); });

// ---- Sheets written by other programs ----

struct CorpusCase {
    const char* file;
    int result;
    unsigned trackCount;
    const char* error;  // the diagnostic on failure
};

class CueCorpus : public CueSheetReader, public ::testing::WithParamInterface<CorpusCase> {};

TEST_P(CueCorpus, MatchesTheDialect) {
    const CorpusCase& c = GetParam();
    const Outcome outcome = ParseFile(std::string(AC_CORPUS_DIR "/cue/") + c.file);
    EXPECT_EQ(outcome.result, c.result);
    EXPECT_EQ(Sheet().trackCount, c.trackCount);
    EXPECT_EQ(outcome.errors, c.error);
}

INSTANTIATE_TEST_SUITE_P(
    Sheets, CueCorpus,
    ::testing::Values(
        // Header lines in any order, commas and slashes inside quotes.
        CorpusCase{"flacon_02_dragonattack.cue", 0, 11, ""},
        // CRLF, CATALOG, FLAGS passing as words.
        CorpusCase{"libcdio_p1.cue", 0, 2, ""},
        CorpusCase{"whipper_breeders.cue", 0, 13, ""},
        // Shift-JIS titles are bytes between quotes.
        CorpusCase{"cuebreaker_shift_jis.cue", 0, 2, ""},
        // What most rippers write is refused: REM DATE with a bare year...
        CorpusCase{"rcue_good.cue", 1, 0, "Parse error on line 1: parse error\n"},
        // ...a PREGAP time inside a track...
        CorpusCase{"whipper_bloc.cue", 1, 0, "Parse error on line 4: parse error\n"},
        // ...blank lines, lower-case keywords, and CR-only line ends.
        CorpusCase{"rcue_empty_lines.cue", 1, 0, "Parse error on line 1: parse error\n"},
        CorpusCase{"flacon_01_lower_case.cue", 1, 0, "Parse error on line 1: parse error\n"},
        CorpusCase{"cuesheetnet_MinimalFoobarCue.cue", 1, 0, "Parse error on line 0: parse error\n"}));

}  // namespace
