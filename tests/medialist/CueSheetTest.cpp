#include "medialist/CueSheet.h"

#include "medialist/TextDecoding.h"

#include <gtest/gtest.h>

#include <filesystem>

#include "support/AudioFixtures.h"
#include "support/TempDir.h"

namespace ac {
namespace {

using test::ReadFile;
using test::TempDir;
using test::WriteFile;

CueSheetData ParseCorpus(const std::string& name) {
    return ParseCueSheet(ReadFile(std::string(AC_CORPUS_DIR) + "/" + name));
}

struct CorpusCase {
    const char* file;
    size_t files;
    size_t tracks;
    const char* title;
    const char* firstTrackTitle;
    std::int64_t lastIndex01;
};

class CueCorpus : public ::testing::TestWithParam<CorpusCase> {};

TEST_P(CueCorpus, ReadsRealSheets) {
    const CorpusCase& c = GetParam();
    const CueSheetData sheet = ParseCorpus(c.file);
    EXPECT_EQ(sheet.files.size(), c.files);
    ASSERT_EQ(sheet.tracks.size(), c.tracks);
    EXPECT_EQ(sheet.title, c.title);
    EXPECT_EQ(sheet.tracks.front().title, c.firstTrackTitle);
    EXPECT_EQ(sheet.tracks.back().index01, c.lastIndex01);
}

INSTANTIATE_TEST_SUITE_P(
    Table, CueCorpus,
    ::testing::Values(
        CorpusCase{"cue/cuelib_Bom_Test.cue", 1, 4, "BOM title", "BOM title 1", 223797},
        CorpusCase{"cue/cuelib_My_Test.cue", 3, 13, "Some title", "Title 1", 275761},
        CorpusCase{"cue/cuesheetnet_MinimalFoobarCue.cue", 1, 1, "", "", -1},  // CR line ends only
        CorpusCase{"cue/cuesheetnet_MultiFile.cue", 3, 3, "MultiFile", "Uno", 0},
        CorpusCase{"cue/cuebreaker_shift_jis.cue", 1, 2, "テストアルバム", "最初のトラック", 16895},
        CorpusCase{"cue/deflacue_vys2_cp1251.cue", 2, 5, "Пять песен", "01. Песня о погибшем лётчике", 19057},
        CorpusCase{"cue/cueparser_Paco_de_Lucia_-_Fuente_y_Caudal.eac.cue", 8, 8, "Fuente y Caudal",
                   "Entre Dos Aguas (Rumba)", 0},
        CorpusCase{"cue/flacon_02_dragonattack.cue", 1, 11, "Dragon Attack - A Tribute to Queen",
                   "McAuley, Impellitteri, Kulick, Roth, Phillips, Schellen / I Want It All", 164089},
        CorpusCase{"cue/rcue_unicode.cue", 1, 1, "マジコカタストロフィ", "雲がくれにし夜半の月かな", 0},
        CorpusCase{"cue/whipper_surferrosa.eac.single.cue", 1, 21, "Surfer Rosa & Come on Pilgrim",
                   "Bone Machine", 231307},
        CorpusCase{"discimg/libcdio_cdda.cue", 1, 1, "Join us now we have the software", "Soft", 0}));

// The same sheet written in different ways must read the same.
struct SamePair {
    const char* a;
    const char* b;
};

class CueSpellings : public ::testing::TestWithParam<SamePair> {};

TEST_P(CueSpellings, ReadAlike) {
    const CueSheetData a = ParseCorpus(GetParam().a);
    const CueSheetData b = ParseCorpus(GetParam().b);
    EXPECT_EQ(a.title, b.title);
    EXPECT_EQ(a.performer, b.performer);
    ASSERT_EQ(a.tracks.size(), b.tracks.size());
    for (size_t i = 0; i < a.tracks.size(); ++i) {
        EXPECT_EQ(a.tracks[i].title, b.tracks[i].title) << i;
        EXPECT_EQ(a.tracks[i].performer, b.tracks[i].performer) << i;
        EXPECT_EQ(a.tracks[i].index01, b.tracks[i].index01) << i;
    }
}

INSTANTIATE_TEST_SUITE_P(
    Table, CueSpellings,
    ::testing::Values(SamePair{"cue/flacon_ru_cp1251.cue", "cue/flacon_ru_utf8_BOM.cue"},
                      SamePair{"cue/flacon_01_lower_case.cue", "cue/flacon_07_issue_119_mixed_eol.cue"},
                      SamePair{"cue/rcue_good.cue", "cue/rcue_case_sensitivity.cue"},
                      SamePair{"cue/rcue_good.cue", "cue/rcue_bad_indentation.cue"},
                      SamePair{"cue/rcue_good.cue", "cue/rcue_empty_lines.cue"}));

TEST(CueSheet, Utf16WithBomAndUnquotedNames) {
    const std::string ascii =
        "PERFORMER Solo Artist\r\nFILE My Album.flac WAVE\r\nTRACK 01 AUDIO\r\nTITLE \"Open\r\n"
        "INDEX 01 00:00:00\r\nTRACK 02 AUDIO\r\nINDEX 01 01:02:03\r\n";
    std::string utf16 = "\xFF\xFE";
    for (char c : ascii) {
        utf16 += c;
        utf16 += '\0';
    }
    const CueSheetData sheet = ParseCueSheet(utf16);
    EXPECT_EQ(sheet.performer, "Solo Artist");
    ASSERT_EQ(sheet.files.size(), 1u);
    EXPECT_EQ(sheet.files[0], "My Album.flac");
    ASSERT_EQ(sheet.tracks.size(), 2u);
    EXPECT_EQ(sheet.tracks[0].title, "Open");  // the missing quote runs to the line end
    EXPECT_EQ(sheet.tracks[1].index01, (62 * 75) + 3);
}

TEST(CueSheet, BadIndexTimesAreSkippedNotGuessed) {
    const CueSheetData sheet = ParseCueSheet(
        "FILE a.wav WAVE\nTRACK 01 AUDIO\nINDEX 01 00:61:00\nINDEX 01 00:00:75\nINDEX 01 1:2\n"
        "TRACK 02 AUDIO\nINDEX 01 120:00:00\n");
    ASSERT_EQ(sheet.tracks.size(), 2u);
    EXPECT_EQ(sheet.tracks[0].index01, -1);
    EXPECT_EQ(sheet.tracks[1].index01, 120 * 60 * 75);
}

struct PathCase {
    const char* path;
    const char* sheet;  // nullptr: not a cue track path
    int track;
};

class CueTrackPaths : public ::testing::TestWithParam<PathCase> {};

TEST_P(CueTrackPaths, Split) {
    const auto split = SplitCueTrackPath(GetParam().path);
    if (!GetParam().sheet) {
        EXPECT_FALSE(split) << GetParam().path;
        return;
    }
    ASSERT_TRUE(split) << GetParam().path;
    EXPECT_EQ(split->sheet, GetParam().sheet);
    EXPECT_EQ(split->track, GetParam().track);
}

INSTANTIATE_TEST_SUITE_P(Table, CueTrackPaths,
                         ::testing::Values(PathCase{"/m/a.cue|3", "/m/a.cue", 3},
                                           PathCase{"/m/a|b.cue|12", "/m/a|b.cue", 12},
                                           PathCase{"/m/a.cue|0", nullptr, 0},
                                           PathCase{"/m/a.cue|", nullptr, 0},
                                           PathCase{"|3", nullptr, 0},
                                           PathCase{"/m/a.cue|3x", nullptr, 0},
                                           PathCase{"/m/a.cue|9999999", nullptr, 0},
                                           PathCase{"/m/a.wav", nullptr, 0}));

class CueResolve : public ::testing::Test {
protected:
    std::string Sheet(const std::string& name, const std::string& text) {
        WriteFile(m_dir / name, text);
        return m_dir / name;
    }
    TempDir m_dir;
};

TEST_F(CueResolve, GapsAcrossFilesAndWindowsPaths) {
    const std::string sheet = m_dir / "rush.cue";
    WriteFile(sheet, ReadFile(std::string(AC_CORPUS_DIR) + "/cue/flacon_Multiple_WAV_Files_With_Gaps_Noncompliant.cue"));
    for (const char* name : {"Rush - Signals - 01 - Subdivisions.wav", "Rush - Signals - 02 - The Analog Kid.wav"}) {
        WriteFile(m_dir / name, "x");
    }
    CueTrackSpan span;
    std::string error;
    ASSERT_TRUE(ResolveCueTrack(sheet, 1, span, error)) << error;
    EXPECT_EQ(std::filesystem::path(span.audioPath).filename(), "Rush - Signals - 01 - Subdivisions.wav");
    EXPECT_EQ(span.endFrame, -1);  // its gap belongs to it: the next INDEX 01 is in another file
    ASSERT_TRUE(ResolveCueTrack(sheet, 2, span, error)) << error;
    EXPECT_EQ(std::filesystem::path(span.audioPath).filename(), "Rush - Signals - 02 - The Analog Kid.wav");
    EXPECT_EQ(span.startFrame, 0);
    EXPECT_FALSE(ResolveCueTrack(sheet, 3, span, error));
    EXPECT_NE(error.find("03 - Chemistry.wav"), std::string::npos) << error;
    EXPECT_FALSE(ResolveCueTrack(sheet, 9, span, error));
    EXPECT_NE(error.find("track 9"), std::string::npos);
}

TEST_F(CueResolve, FindsTheAudioUnderAnotherCaseOrExtension) {
    WriteFile(m_dir / "Album.FLAC", "x");
    EXPECT_EQ(FindCueAudioFile(m_dir.Path(), "album.flac"), m_dir / "Album.FLAC");
    EXPECT_EQ(FindCueAudioFile(m_dir.Path(), "D:\\rips\\Album.wav"), m_dir / "Album.FLAC");
    WriteFile(m_dir / "Album.cue", "x");
    EXPECT_EQ(FindCueAudioFile(m_dir.Path(), "album.ape"), m_dir / "Album.FLAC");
    EXPECT_EQ(FindCueAudioFile(m_dir.Path(), "other.wav"), "");
}

TEST_F(CueResolve, TitlesFallBackToTheSheet) {
    WriteFile(m_dir / "a.wav", "x");
    const std::string sheet = Sheet("s.cue", "PERFORMER \"Band\"\nTITLE \"Record\"\nREM DATE 1999\nFILE \"a.wav\" WAVE\n"
                                             "TRACK 01 AUDIO\nTITLE \"First\"\nINDEX 01 00:00:00\n"
                                             "TRACK 02 AUDIO\nINDEX 01 00:10:00\n");
    CueTrackSpan span;
    std::string error;
    ASSERT_TRUE(ResolveCueTrack(sheet, 1, span, error)) << error;
    EXPECT_EQ(span.title, "First");
    EXPECT_EQ(span.performer, "Band");
    EXPECT_EQ(span.album, "Record");
    EXPECT_EQ(span.date, "1999");
    EXPECT_EQ(span.endFrame, 750);
    EXPECT_FALSE(ResolveCueTrack(m_dir / "none.cue", 1, span, error));
}

// Sheets in the code page their file names give read as that code page. Windows-1252 is the
// case that went wrong: its curly apostrophe was taken for a Shift-JIS lead byte.
struct CodePageCase {
    const char* file;
    const char* codePage;
    const char* sample;  // a text the decoded sheet must hold
};

class CueCodePages : public ::testing::TestWithParam<CodePageCase> {};

TEST_P(CueCodePages, DecodeAsTheirCodePage) {
    const CodePageCase& c = GetParam();
    const std::string bytes = ReadFile(std::string(AC_CORPUS_DIR) + "/cue/" + c.file);
    const std::string text = DecodeCueText(bytes);
    EXPECT_EQ(text, ConvertToUtf8(bytes, c.codePage));
    EXPECT_NE(text.find(c.sample), std::string::npos);
}

INSTANTIATE_TEST_SUITE_P(
    Corpus, CueCodePages,
    ::testing::Values(CodePageCase{"cuebreaker_shift_jis.cue", "SHIFT_JIS", "テストアルバム"},
                      CodePageCase{"cuesheetnet_1252.cue", "WINDOWS-1252", "Wond’ring Aloud"},
                      CodePageCase{"deflacue_vys2_cp1251.cue", "WINDOWS-1251", "Высоцкий"},
                      CodePageCase{"flacon_ru_cp1251.cue", "WINDOWS-1251", "Супер группа"},
                      CodePageCase{"ffcuesplitter_Three_Samples_ISO-8859-1.cue", "ISO-8859-1", "300 Hz"}));

TEST(TextDecoding, TagsWithoutACodePage) {
    EXPECT_EQ(DecodeUnlabelledText("plain"), "plain");
    EXPECT_EQ(DecodeUnlabelledText("Ærø – ok"), "Ærø – ok");  // valid UTF-8 stays
    EXPECT_EQ(DecodeUnlabelledText("caf\xe9 \x93quoted\x94"), "café “quoted”");
    // Not a single byte is lost or left invalid, whatever the guess.
    EXPECT_TRUE(IsValidUtf8(DecodeUnlabelledText(std::string("\x80\x81\xfe\xff\x00z", 6))));
}

}  // namespace
}  // namespace ac
