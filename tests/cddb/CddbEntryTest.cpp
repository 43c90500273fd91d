#include "cddb/CddbEntry.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <fstream>
#include <sstream>

using cddb::CddbEntry;
using cddb::CDDiscInfo;
using cddb::EntryResult;

namespace {

std::string ReadCorpus(const std::string& name) {
    std::ifstream in(std::string(AC_CORPUS_DIR) + "/" + name, std::ios::binary);
    std::ostringstream bytes;
    bytes << in.rdbuf();
    return bytes.str();
}

// An xmcd file on disk is the body of a read reply without its status line.
std::string AsReadReply(const std::string& xmcd) {
    return "210 misc 00000000 CD database entry follows\r\n" + xmcd;
}

// A well-formed reply around the given lines behind the DISCID line.
std::string Reply(const std::string& tail) {
    return "210 rock 940aac0b\n"
           "# xmcd\n#\n# Track frame offsets:\n#\t150\n#\t15420\n#\n"
           "# Disc length: 2533 seconds\n#\n# Revision: 2\n"
           "# Submitted via: TestRipper 1.0 beta extra\n#\n"
           "DISCID=940aac0b\n" +
           tail;
}

struct CorpusCase {
    const char* file;
    EntryResult result;
    const char* artist;
    const char* album;
    int trackCount;
    std::vector<std::pair<int, const char*>> titles;
    const char* year;
    // DGENRE where the entry has one; without, the genre is the category.
    const char* genre = "misc";
};

class CorpusEntry : public testing::TestWithParam<CorpusCase> {};

TEST_P(CorpusEntry, ParsesAsTheLinesSay) {
    const CorpusCase& expected = GetParam();
    std::string body = ReadCorpus(expected.file);
    ASSERT_FALSE(body.empty()) << expected.file;
    if (std::string_view(expected.file).starts_with("xmcd/")) {
        body = AsReadReply(body);
    }
    CddbEntry entry;
    ASSERT_EQ(cddb::ParseEntry(body, entry), expected.result);
    if (expected.result != EntryResult::Ok) {
        return;
    }
    CDDiscInfo info;
    cddb::EntryToDiscInfo("misc", entry, info);
    EXPECT_EQ(info.artist, expected.artist);
    EXPECT_EQ(info.album, expected.album);
    EXPECT_EQ(info.trackCount, expected.trackCount);
    for (const auto& [index, title] : expected.titles) {
        EXPECT_EQ(info.Title(index), title) << "track " << index;
    }
    EXPECT_EQ(info.year, expected.year);
    EXPECT_EQ(info.genre, expected.genre);
}

// clang-format off
const CorpusCase kCorpus[] = {
    {"xmcd/freedbsample_840e160b.txt", EntryResult::Ok, "Nightwish", "Once", 11,
     {{0, "Dark Chest Of Wonders"}, {10, "Higher Than Hope"}}, "2004", "Symphonic Metal"},
    // Titles continued over two lines of the same number.
    {"xmcd/freedbsample_6f0c6509.txt", EntryResult::Ok, "Beethoven", "Beethoven Piano Sonatas", 9,
     {{0, "Sonata No. 14 in C-sharp Minor, Op. 27, No. 2 Moonlight - I. Adagio sostenuto"},
      {3, "Sonata No. 8 in C Minor, Op. 13 Pathetique - I. Grove; Allegro molto e con brio"},
      {6, "Sonata No. 23 in F Minor, Op. 57 Appassionata - I. Allegro assai"},
      {8, "III. Allegro ma non troppo; Presto"}}, "1998", "Classical"},
    // TTITLE7 is missing: titles go by line order, so "One And Only" is track 8 (index 7).
    {"xmcd/freedbsample_corrupt_song_7_missing.txt", EntryResult::Ok, "Adele", "21", 12,
     {{6, "Take It All"}, {7, "One And Only"}, {11, "Hiding My Heart"}}, "2011", "Pop"},
    // An empty comment between "Revision:" and "Submitted via:"; EXTD without YEAR.
    {"xmcd/freedbsample_9c0eac0c.txt", EntryResult::Ok, "Mozart", "The Classics: Mozart", 12,
     {{11, "Symphony No. 41 in C (Jupiter), 1st Movement"}}, "Unknown", "Classical"},
    // The year runs from the first digit to the end of the EXTD line; EXTD wins over DYEAR.
    {"xmcd/freedbsample_8608460b.txt", EntryResult::Ok, "Van Halen", "Van Halen", 11,
     {{2, "You Really Got Me"}}, "1978 ID3G: 17", "Rock"},
    // DTITLE without "/": all of it is the album.
    {"xmcd/freedbsample_12025d03.txt", EntryResult::Ok, "", "Ernest Ray Everett - Single CD", 3,
     {{2, "If You Don't Like Country"}}, "2009", "Country"},
    // Cut off in the EXTT lines, without PLAYORDER.
    {"xmcd/freedbsample_d1115d11.txt", EntryResult::Ok, "Madonna", "The Immaculate Collection",
     17, {{16, "Holiday"}}, "2005", "other"},
    {"xmcd/freedbsample_fd0b9912.txt", EntryResult::Ok, "Ray Charles",
     "Ray Charles Sings The Blues", 18, {{17, "Alone In The City Blues"}}, "1995", "Blues"},
    // The last line, PLAYORDER, has no line end.
    {"xmcd/netcddb_d50dd30f_ska_island.txt", EntryResult::Ok, "Various", "Ska Island", 15,
     {{5, "Honky tonk Parts 1 & 2"}}, "1997", "Reggae"},
    // ISO-8859-1 bytes arrive as UTF-8; the label before YEAR stays in the year.
    {"xmcd/rubyripper_38043805_latin1.xmcd", EntryResult::Ok, "Die \xC3\x84rzte",
     "Ein Schwein namens M\xC3\xA4nner", 5,
     {{3, "Ein L\xC3\xA4" "cheln (f\xC3\xBCr jeden Tag deines Lebens)"}},
     "1997WD360592 YEAR: 1998", "Deutsch"},
    {"xmcd/rubyripper_a10b600c_utf8_crlf.xmcd", EntryResult::Ok, "Mot\xC3\xB6rhead", "Inferno",
     12, {{0, "Terminal Show"}, {11, "Whorehouse Blues"}}, "2004", "Metal"},
    // libcddb's test records carry no "Submitted via:" comment, which an entry must have.
    {"xmcd/libcddb_12340000.xmcd", EntryResult::NoSubmittedVia, "", "", 0, {}, ""},
    {"xmcd/libcddb_12345675.xmcd", EntryResult::NoSubmittedVia, "", "", 0, {}, ""},
    {"xmcd/libcddb_12345678.xmcd", EntryResult::NoSubmittedVia, "", "", 0, {}, ""},
    {"xmcd/libcddb_1234567b.xmcd", EntryResult::NoSubmittedVia, "", "", 0, {}, ""},
    {"xmcd/libcddb_1234567e.xmcd", EntryResult::NoSubmittedVia, "", "", 0, {}, ""},
    // A real read reply of a protocol level 4 server: no DYEAR or DGENRE lines, "." at the end.
    {"cddb/cddbscala_read_210_misc_2f0d8939.txt", EntryResult::Ok, "Dan Levenson",
     "Old Time Festival Tunes For Clawhammer Banjo (Disc 2)", 57,
     {{0, "June Apple"}, {56, "Yellow Rose of Texas"}}, "2007"},
    // Other replies are no entries: wrong status, or a 21x list that is no xmcd text.
    {"cddb/cddbscala_query_200_misc_2f0d8939.txt", EntryResult::BadStatus, "", "", 0, {}, ""},
    {"cddb/freedb_CDDBPROTO.txt", EntryResult::BadStatus, "", "", 0, {}, ""},
    {"cddb/netcddb_banner_201.txt", EntryResult::BadStatus, "", "", 0, {}, ""},
    {"cddb/netcddb_cddbp_session_notes.txt", EntryResult::BadStatus, "", "", 0, {}, ""},
    {"cddb/netcddb_lscat_210.txt", EntryResult::NotXmcd, "", "", 0, {}, ""},
    {"cddb/netcddb_query_200_exact_820e770a.txt", EntryResult::BadStatus, "", "", 0, {}, ""},
    {"cddb/netcddb_query_211_inexact_d50dd30f.txt", EntryResult::NotXmcd, "", "", 0, {}, ""},
};
// clang-format on

INSTANTIATE_TEST_SUITE_P(Corpus, CorpusEntry, testing::ValuesIn(kCorpus));

TEST(CddbEntryTest, EveryCorpusFileIsInTheTable) {
    const std::string corpus = AC_CORPUS_DIR;
    using std::filesystem::directory_iterator;
    EXPECT_EQ(std::distance(directory_iterator(corpus + "/xmcd"), directory_iterator()) +
                  std::distance(directory_iterator(corpus + "/cddb"), directory_iterator()),
              std::ssize(kCorpus));
}

TEST(CddbEntryTest, FieldsOfTheCommentBlockAndDiscId) {
    CddbEntry entry;
    ASSERT_EQ(cddb::ParseEntry(AsReadReply(ReadCorpus("xmcd/freedbsample_8608460b.txt")), entry),
              EntryResult::Ok);
    EXPECT_EQ(entry.frameOffsets.size(), 11u);
    EXPECT_EQ(entry.frameOffsets.front(), 150);
    EXPECT_EQ(entry.frameOffsets.back(), 145517);
    EXPECT_EQ(entry.discLengthSeconds, 2120);
    EXPECT_EQ(entry.revision, 3);
    EXPECT_EQ(entry.clientName, "CDex");
    EXPECT_EQ(entry.clientVersion, "1.40Release");
    EXPECT_EQ(entry.discId, 0x8608460bu);
    EXPECT_EQ(entry.extendedTrackData.size(), 11u);

    std::string body = Reply("DTITLE=A / B\nPLAYORDER=2,0,,1\n");
    body.replace(body.find("DISCID=940aac0b"), 15, "DISCID=0940aac0b,940aad0b");
    ASSERT_EQ(cddb::ParseEntry(body, entry), EntryResult::Ok);
    EXPECT_EQ(entry.clientComments, "beta");
    EXPECT_EQ(entry.discId, 0x940aac0bu);
    EXPECT_EQ(entry.playOrder, (std::vector<int>{2, 0, 1}));
}

TEST(CddbEntryTest, FailuresNameTheMissingLine) {
    const std::string good = Reply("DTITLE=A / B\nTTITLE0=x\n");
    CddbEntry entry;
    ASSERT_EQ(cddb::ParseEntry(good, entry), EntryResult::Ok);
    auto without = [&](const std::string& from, const std::string& to) {
        std::string body = good;
        body.replace(body.find(from), from.size(), to);
        return cddb::ParseEntry(body, entry);
    };
    EXPECT_EQ(without("210", "200"), EntryResult::BadStatus);
    EXPECT_EQ(without("210", "219"), EntryResult::Ok);
    EXPECT_EQ(cddb::ParseEntry("21", entry), EntryResult::BadStatus);
    EXPECT_EQ(without("# xmcd", "# CD record"), EntryResult::NotXmcd);
    EXPECT_EQ(without("# Track frame", "# Frame"), EntryResult::NoFrameOffsets);
    EXPECT_EQ(without("# Disc length: 2533 seconds", "# Length: 2533"), EntryResult::NoDiscLength);
    EXPECT_EQ(without("# Disc length: 2533 seconds", "#Disc length:"), EntryResult::NoDiscLength);
    // "Revision:" without a "Submitted via:" behind it.
    EXPECT_EQ(without("# Submitted via", "# Processed by"), EntryResult::NoSubmittedVia);
    EXPECT_EQ(without("TestRipper 1.0 beta extra", "TestRipper"), EntryResult::BadSubmittedVia);
    EXPECT_EQ(without("DISCID=940aac0b", "DISCID=940aac"), EntryResult::BadDiscId);
    EXPECT_EQ(without("DISCID=940aac0b", "discid=940aac0b"), EntryResult::BadDiscId);
    EXPECT_EQ(without("DTITLE=", "DYEAR=1999\nDTITLE="), EntryResult::NoDiscTitle);
    EXPECT_EQ(without("TTITLE0=x", "TTITLE0 x"), EntryResult::BadTrackTitle);
    EXPECT_EQ(cddb::ParseEntry(good + "EXTD=a\nEXTTx\n", entry), EntryResult::BadExtendedTrackData);
    EXPECT_STRNE(cddb::EntryResultText(EntryResult::NoSubmittedVia), "");
}

TEST(CddbEntryTest, TrackTitlesGoByLineOrderNotByTheirNumbers) {
    CddbEntry entry;
    ASSERT_EQ(cddb::ParseEntry(Reply("DTITLE=A / B\nTTITLE0=Zero\nTTITLE3=Three \nTTITLE3=joined\n"
                                     "TTITLE9=Nine\nTTITLE0=Zero again\n"),
                               entry),
              EntryResult::Ok);
    EXPECT_EQ(entry.trackTitles,
              (std::vector<std::string>{"Zero", "Three joined", "Nine", "Zero again"}));
}

TEST(CddbEntryTest, DiscTitleIsJoinedFromAtMostTwoLinesAndSplitAtTheFirstSlash) {
    CddbEntry entry;
    ASSERT_EQ(
        cddb::ParseEntry(Reply("DTITLE= AC/DC /Live\nDTITLE= / Disc 1\nDTITLE=dropped\n"), entry),
        EntryResult::Ok);
    EXPECT_EQ(entry.artist, "AC");
    EXPECT_EQ(entry.title, "DC /Live / Disc 1");
    // The third DTITLE stays the current line, which no later step takes.
    EXPECT_TRUE(entry.trackTitles.empty());
}

TEST(CddbEntryTest, ValuesAreUnescapedLineFeedThenTabThenBackslash) {
    CddbEntry entry;
    ASSERT_EQ(cddb::ParseEntry(Reply("DTITLE=A / B\nTTITLE0=One\\tTwo\nTTITLE1=C:\\\\new\n"
                                     "TTITLE2=x\\\\\\\\y\n"),
                               entry),
              EntryResult::Ok);
    EXPECT_EQ(entry.trackTitles[0], "One\tTwo");
    EXPECT_EQ(entry.trackTitles[1], "C:\\\new") << "the doubled backslash before n";
    EXPECT_EQ(entry.trackTitles[2], "x\\\\y");
}

TEST(CddbEntryTest, YearAndGenreFromTheLastExtendedDiscDataLine) {
    auto yearAndGenre = [](const std::string& extd) {
        CddbEntry entry;
        EXPECT_EQ(cddb::ParseEntry(Reply("DTITLE=A / B\nTTITLE0=x\n" + extd), entry),
                  EntryResult::Ok);
        CDDiscInfo info;
        cddb::EntryToDiscInfo("rock", entry, info);
        return info.year + "|" + info.genre;
    };
    EXPECT_EQ(yearAndGenre(""), "Unknown|rock");
    EXPECT_EQ(yearAndGenre("EXTD=Remastered\\nYEAR: 1999\n"), "1999|rock");
    EXPECT_EQ(yearAndGenre("EXTD=YEAR: 1999\\nRemastered\n"), "Unknown|rock");
    EXPECT_EQ(yearAndGenre("EXTD=YEAR: 1999\\n\n"), "1999|rock")
        << "an empty last piece is dropped";
    EXPECT_EQ(yearAndGenre("EXTD= YEAR: \nEXTD=\nEXTD=\\n GENRE: Ska Punk\n"), "Unknown|Ska Punk");
    // The ninth character, not the ninth byte: the genre stays valid UTF-8.
    EXPECT_EQ(yearAndGenre("EXTD=GENRE: \xC3\x9C\xC3\x96\n"), "Unknown|\xC3\x96");
    // Split across two EXTD lines, the way long values arrive.
    EXPECT_EQ(yearAndGenre("EXTD= YE\nEXTD=AR: 1987\n"), "1987|rock");
}

TEST(CddbEntryTest, LineEndsNulAndServerDecorations) {
    CddbEntry entry;
    // Bare line feeds throughout: the ordinary Unix reply.
    ASSERT_EQ(cddb::ParseEntry(Reply("DTITLE=A / B\nTTITLE0=x\n"), entry), EntryResult::Ok);
    // A "\r\n" further on makes every bare "\n" before it part of one line.
    EXPECT_EQ(cddb::ParseEntry(Reply("DTITLE=A / B\nTTITLE0=x\r\n"), entry), EntryResult::NotXmcd);
    // Nothing behind a NUL byte counts.
    EXPECT_EQ(
        cddb::ParseEntry(Reply("DTITLE=A / B\n") + std::string(1, '\0') + "TTITLE0=x\n", entry),
        EntryResult::Ok);
    EXPECT_TRUE(entry.trackTitles.empty());
    // A level 5 server sends DYEAR and DGENRE between DTITLE and the titles.
    ASSERT_EQ(cddb::ParseEntry(Reply("DTITLE=A / B\nDYEAR=1999\nDGENRE=Ska\nTTITLE0=x\n"), entry),
              EntryResult::Ok);
    EXPECT_EQ(entry.trackTitles.size(), 1u);
}

// Cut at every line end, an entry parses once its DTITLE line is whole: EXTD, EXTT and
// PLAYORDER may all be missing. Cut at any byte it never crashes.
TEST(CddbEntryTest, CutOffEntriesFailOnlyWhereARequiredLineIsMissing) {
    const std::string body = AsReadReply(ReadCorpus("xmcd/freedbsample_840e160b.txt"));
    const std::size_t titleEnd = body.find('\n', body.find("DTITLE=")) + 1;
    CddbEntry entry;
    for (std::size_t cut = 0; cut <= body.size(); ++cut) {
        const EntryResult result = cddb::ParseEntry(std::string_view(body).substr(0, cut), entry);
        if (cut >= titleEnd && body[cut - 1] == '\n') {
            EXPECT_EQ(result, EntryResult::Ok) << "cut at " << cut;
        } else if (cut < body.find("DTITLE=")) {
            EXPECT_NE(result, EntryResult::Ok) << "cut at " << cut;
        }
    }
}

}  // namespace
