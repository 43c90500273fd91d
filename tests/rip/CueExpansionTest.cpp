#include "rip/CueExpansion.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>

namespace ac {
namespace {

struct SheetCase {
    const char* file;
    std::size_t rows;
    const char* firstTitle;
};

class CueExpansionCorpus : public ::testing::TestWithParam<SheetCase> {};

// Every sheet of the corpus gives its tracks, whether the strict reader takes it or not; the
// window and acconvert both read sheets through this one function.
TEST_P(CueExpansionCorpus, EverySheetGivesItsTracks) {
    const SheetCase& c = GetParam();
    const std::string path = std::string(AC_CORPUS_DIR) + "/cue/" + c.file;
    const CueExpansion sheet = ExpandCueSheet(path);
    EXPECT_TRUE(sheet.error.empty()) << sheet.error;
    ASSERT_EQ(sheet.rows.size(), c.rows);
    EXPECT_EQ(sheet.rows.front().trackPath, path + "|1");
    EXPECT_EQ(sheet.rows.back().trackPath, path + "|" + std::to_string(c.rows));
    EXPECT_EQ(sheet.rows.front().title, c.firstTitle);
}

INSTANTIATE_TEST_SUITE_P(
    Corpus, CueExpansionCorpus,
    ::testing::Values(
        SheetCase{"cuebreaker_shift_jis.cue", 2, "最初のトラック"}, SheetCase{"cuelib_Bom_Test.cue", 4, "BOM title 1"},
        SheetCase{"cuelib_My_Test.cue", 13, "Title 1"}, SheetCase{"cuelib_TC_Test.cue", 2, "Title 1"},
        SheetCase{"cueparser_Paco_de_Lucia_-_Fuente_y_Caudal.eac.cue", 8, "Entre Dos Aguas (Rumba)"},
        SheetCase{"cueparser_Putumayo_Yoga_Lounge.xld.cue", 12, "Dreamcatcher"},
        SheetCase{"cueparser_sample-win.cue", 2, "Sample track 1"}, SheetCase{"cuesheetnet_1252.cue", 11, "Aqualung"},
        SheetCase{"cuesheetnet_MinimalFoobarCue.cue", 1, ""}, SheetCase{"cuesheetnet_MultiFile.cue", 3, "Uno"},
        SheetCase{"deflacue_vys1_utf8.cue", 4, "ЯК-Истребитель"},
        SheetCase{"deflacue_vys2_cp1251.cue", 5, "01. Песня о погибшем лётчике"},
        SheetCase{"ffcuesplitter_Street_Legal.cue", 9, "Changing of the Guards"},
        SheetCase{"ffcuesplitter_Three_Samples_ISO-8859-1.cue", 3, "300 Hz, ISO-8859-1"},
        SheetCase{"flacon_01_Meat_Loaf_-_Bat_Out_Of_Hell.cue", 7, "1.1 Bat Out Of Hell"},
        SheetCase{"flacon_01_lower_case.cue", 4, "Short track 1"},
        // Accepted by the strict reader, which keeps 64 bytes: the title comes whole all the same.
        SheetCase{"flacon_02_dragonattack.cue", 11,
                  "McAuley, Impellitteri, Kulick, Roth, Phillips, Schellen / I Want It All"},
        SheetCase{"flacon_07_issue_119_mixed_eol.cue", 4, "Short track 1"},
        SheetCase{"flacon_Multiple_WAV_Files_With_Gaps_Noncompliant.cue", 8, ""},
        SheetCase{"flacon_ru_cp1251.cue", 4, "Трек 01"}, SheetCase{"flacon_ru_utf8_BOM.cue", 4, "Трек 01"},
        SheetCase{"libcdio_bad-cat3.cue", 1, ""}, SheetCase{"libcdio_bad-mode1.cue", 1, ""},
        SheetCase{"libcdio_bad-msf-1.cue", 1, ""}, SheetCase{"libcdio_cdda_4_5.cue", 2, ""},
        SheetCase{"libcdio_isofs-m1.cue", 1, ""}, SheetCase{"libcdio_p1.cue", 2, ""},
        SheetCase{"rcue_bad_indentation.cue", 2, "Only Shallow"}, SheetCase{"rcue_case_sensitivity.cue", 2, "Only Shallow"},
        SheetCase{"rcue_empty_lines.cue", 2, "Only Shallow"}, SheetCase{"rcue_good.cue", 2, "Only Shallow"},
        SheetCase{"rcue_pregap.cue", 2, "Only Shallow"}, SheetCase{"rcue_unicode.cue", 1, "雲がくれにし夜半の月かな"},
        SheetCase{"rcue_unknown_field.cue", 2, "Only Shallow"}, SheetCase{"whipper_bloc.cue", 13, ""},
        SheetCase{"whipper_breeders.cue", 13, "OVERGLAZED"}, SheetCase{"whipper_kanye.cue", 13, "Say You Will"},
        SheetCase{"whipper_kings-separate.cue", 11, "Closer"}, SheetCase{"whipper_strokes-someday.eac.cue", 1, "Someday"},
        SheetCase{"whipper_surferrosa.eac.single.cue", 21, "Bone Machine"}));

TEST(CueExpansion, ASheetNeitherReaderReadsNamesItselfAndTheLine) {
    const std::string path = std::filesystem::temp_directory_path() / "ac-cue-expansion-junk.cue";
    std::ofstream(path) << "TRACK\nINDEX\n\"\n";
    const CueExpansion sheet = ExpandCueSheet(path);
    EXPECT_TRUE(sheet.rows.empty());
    EXPECT_EQ(sheet.error.rfind(path + ": Parse error on line ", 0), 0u) << sheet.error;
    std::filesystem::remove(path);
    EXPECT_EQ(ExpandCueSheet(path).error, path + ": cannot be read");
}

}  // namespace
}  // namespace ac
