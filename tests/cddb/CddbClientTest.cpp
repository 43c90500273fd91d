// The CDDB client against the loopback test server: the exact requests, each reply form, every
// misbehaviour of the server ending in the right text in bounded time, the batch record of an
// unanswered query, cancelling, and the real transcripts of the corpus.

#include "cddb/BatchFile.h"
#include "cddb/CddbClient.h"
#include "cddb/CddbLookup.h"
#include "cddb/DiscFile.h"

#include <gtest/gtest.h>

#include <chrono>
#include <filesystem>
#include <fstream>
#include <thread>

#include "support/CddbTestServer.h"
#include "support/TempDir.h"

namespace {

using namespace std::chrono_literals;
using ac::test::CddbMisbehaviour;
using cddb::CCddbClient;
using cddb::CddbMatch;
using Clock = std::chrono::steady_clock;

// Eleven tracks, the first at 0:02:00, as a pressed CD starts.
cddb::DiscToc ElevenTracks() {
    cddb::DiscToc toc;
    for (int track = 0; track <= 11; ++track) {
        toc.push_back(cddb::TocPosition::FromFrames(150 + track * 15000 + track * 37));
    }
    return toc;
}

std::string Xmcd(std::uint32_t id, const std::string& title, const std::vector<std::string>& tracks,
                 const std::string& extra = "") {
    std::string text =
        "# xmcd\r\n#\r\n# Track frame offsets:\r\n#\t150\r\n#\r\n# Disc length: 2000 seconds\r\n"
        "#\r\n# Revision: 2\r\n# Submitted via: testsuite 1.0\r\n#\r\nDISCID=" +
        cddb::FormatDiscId(id) + "\r\nDTITLE=" + title + "\r\n" + extra;
    for (std::size_t i = 0; i < tracks.size(); ++i) {
        text += "TTITLE" + std::to_string(i) + "=" + tracks[i] + "\r\n";
    }
    return text + "EXTD=\r\nPLAYORDER=\r\n";
}

std::string Corpus(const std::string& name) {
    return std::string(AC_CORPUS_DIR) + "/cddb/" + name;
}

class CddbClientTest : public ::testing::Test {
protected:
    void SetUp() override {
        host = cddb::ParseHostSetting(server.HostSetting());
        client.SetTimeout(2000);
        client.SetIdentity("joe@example.org", 4);
        client.SetBatchFile(cddb::BatchFilePath(folder.Path()));
        client.SetMessageSink([this](const std::string& text) { messages.push_back(text); });
        id = cddb::ComputeDiscId(toc);
    }

    std::string Hello() const { return "hello=joe+example.org+MfcCDDB+1.14&proto=4"; }

    ac::test::CddbTestServer server;
    ac::test::TempDir folder;
    cddb::CddbHost host;
    CCddbClient client;
    std::vector<std::string> messages;
    cddb::DiscToc toc = ElevenTracks();
    std::uint32_t id = 0;
    std::vector<CddbMatch> matches;
};

TEST_F(CddbClientTest, QueryAndReadSendExactlyTheRequestLinesOnTwoConnections) {
    server.AddRecord("rock", id, "Nightwish / Once",
                     Xmcd(id, "Nightwish / Once", {"Dark Chest", "Wish I Had"}));
    ASSERT_TRUE(client.Query(host, id, toc, matches));
    ASSERT_EQ(matches.size(), 1u);
    EXPECT_EQ(matches[0].category, "rock");
    EXPECT_EQ(matches[0].artist, "Nightwish");
    EXPECT_EQ(matches[0].title, "Once");
    cddb::CddbEntry entry;
    ASSERT_TRUE(client.ReadEntry(host, matches[0].discId, matches[0], entry));
    EXPECT_EQ(entry.trackTitles, (std::vector<std::string>{"Dark Chest", "Wish I Had"}));

    EXPECT_EQ(id & 0xFF, 11u);
    std::string offsets;
    for (int track = 0; track < 11; ++track)
        offsets += "+" + std::to_string(150 + track * 15037);
    const std::vector<std::string> requests = server.Requests();
    ASSERT_EQ(requests.size(), 2u);
    EXPECT_EQ(requests[0], "GET /~cddb/cddb.cgi?cmd=cddb+query+" + cddb::FormatDiscId(id) + "+11" +
                               offsets + "+" + std::to_string(cddb::DiscLengthSeconds(toc)) + "&" +
                               Hello() + " HTTP/1.0\r\n\r\n");
    EXPECT_EQ(requests[1], "GET /~cddb/cddb.cgi?cmd=cddb+read+rock+" + cddb::FormatDiscId(id) +
                               "&" + Hello() + " HTTP/1.0\r\n\r\n");
    EXPECT_EQ(server.Connections(), 2);
    // Each raw reply stood in the message box, headers and all.
    ASSERT_EQ(messages.size(), 2u);
    EXPECT_NE(messages[0].find("200 rock"), std::string::npos);
    EXPECT_NE(messages[1].find("TTITLE1=Wish I Had"), std::string::npos);
}

TEST_F(CddbClientTest, TheHelloFollowsTheIdentitySettings) {
    client.SetIdentity("", 6);
    EXPECT_EQ(client.BuildHello(), "hello=" + client.LocalUserName() + "+" +
                                       client.LocalHostName() + "+MfcCDDB+1.14&proto=6");
    client.SetIdentity("only-a-name", 9);
    EXPECT_EQ(client.BuildHello(),
              "hello=only-a-name+" + client.LocalHostName() + "+MfcCDDB+1.14&proto=4");
    // Nothing the user types may end the request line early.
    client.SetIdentity("a b@c\r\nd", 5);
    EXPECT_EQ(client.BuildHello(), "hello=a_b+c__d+MfcCDDB+1.14&proto=5");
}

TEST_F(CddbClientTest, SeveralMatchesComeAsAListAndNoMatchAsA202) {
    for (const char* category : {"rock", "misc", "blues"}) {
        server.AddRecord(category, id, std::string(category) + " Artist / Title",
                         Xmcd(id, "A / B", {"x"}));
    }
    ASSERT_TRUE(client.Query(host, id, toc, matches));
    ASSERT_EQ(matches.size(), 3u);
    EXPECT_EQ(matches[1].category, "misc");
    EXPECT_EQ(client.ReplyLines().size(), 3u);
    EXPECT_TRUE(client.LastResponse().empty());

    server.Next(CddbMisbehaviour::NoMatch);
    EXPECT_FALSE(client.Query(host, id, toc, matches));
    EXPECT_TRUE(matches.empty());
    EXPECT_NE(messages.back().find("202 No match"), std::string::npos)
        << "the 202 line stays readable";
    EXPECT_FALSE(std::filesystem::exists(cddb::BatchFilePath(folder.Path())))
        << "an answer is no failure";
}

TEST_F(CddbClientTest, ASilentServerTimesOutAndTheQueryIsKeptForTheBatchOnce) {
    client.SetTimeout(300);
    server.Next(CddbMisbehaviour::Silent);
    const auto started = Clock::now();
    EXPECT_FALSE(client.Query(host, id, toc, matches));
    EXPECT_LT(Clock::now() - started, 3s);
    ASSERT_EQ(messages.size(), 2u);
    EXPECT_EQ(messages[0], "Error:TimeOut");
    EXPECT_EQ(messages[1], "CDDB server did not respond correctly to the query command\n");
    EXPECT_EQ(client.LastError(), EPROTONOSUPPORT);

    server.Next(CddbMisbehaviour::Silent);
    EXPECT_FALSE(client.Query(host, id, toc, matches));
    const std::vector<cddb::BatchRecord> kept =
        cddb::ReadBatchFile(cddb::BatchFilePath(folder.Path()));
    ASSERT_EQ(kept.size(), 1u);
    EXPECT_EQ(kept[0].idText, cddb::FormatDiscId(id));
    EXPECT_EQ(kept[0].query, cddb::QueryFields(toc));

    // A batch query never keeps its own failures.
    server.Next(CddbMisbehaviour::Silent);
    EXPECT_FALSE(client.QueryText(host, "0000000b+1+150+2", matches));
    EXPECT_EQ(cddb::ReadBatchFile(cddb::BatchFilePath(folder.Path())).size(), 1u);
}

TEST_F(CddbClientTest, TheTimeOutCountsSilenceNotTheWholeReply) {
    server.AddRecord("rock", id, "A / B", Xmcd(id, "A / B", {"x"}));
    server.SetTrickleGap(25ms);
    client.SetTimeout(250);
    server.Next(CddbMisbehaviour::Trickle);
    const auto started = Clock::now();
    ASSERT_TRUE(client.Query(host, id, toc, matches)) << (messages.empty() ? "" : messages.back());
    EXPECT_GT(Clock::now() - started, 1s) << "the reply took longer than the time-out in all";
}

TEST_F(CddbClientTest, EveryMisbehaviourEndsWithItsTextInBoundedTime) {
    // Two records: the query's answer is a list, which only its "." line ends.
    server.AddRecord("rock", id, "A / B", Xmcd(id, "A / B", {"One", "Two"}));
    server.AddRecord("misc", id, "A / C", Xmcd(id, "A / C", {"Three"}));
    const CddbMatch match{"rock", id, "A", "B"};
    cddb::CddbEntry entry;
    struct Case {
        CddbMisbehaviour how;
        bool read;
        std::string text;  // the last message, or part of it
    };
    const std::vector<Case> cases = {
        {CddbMisbehaviour::CloseEarly, false, "did not respond correctly to the query command\n"},
        {CddbMisbehaviour::CloseEarly, true, "did not respond correctly to the stat command\n"},
        {CddbMisbehaviour::HtmlError, false, "<h1>Not Found</h1>"},
        {CddbMisbehaviour::HtmlError, true, "<h1>Not Found</h1>"},
        {CddbMisbehaviour::ServerError, false, "500 Command syntax error"},
        {CddbMisbehaviour::ServerError, true, "500 Command syntax error"},
        {CddbMisbehaviour::Huge, true, "did not respond correctly to the stat command\n"},
    };
    for (const Case& c : cases) {
        messages.clear();
        server.Next(c.how);
        const auto started = Clock::now();
        const bool ok = c.read ? client.ReadEntry(host, id, match, entry)
                               : client.Query(host, id, toc, matches);
        EXPECT_FALSE(ok) << static_cast<int>(c.how);
        EXPECT_LT(Clock::now() - started, 1500ms)
            << static_cast<int>(c.how) << " ends before the time-out";
        ASSERT_FALSE(messages.empty());
        EXPECT_NE(messages.back().find(c.text), std::string::npos) << messages.back();
    }
    EXPECT_LE(client.LastResponse().size(), cddb::kMaxReplyBytes);

    // A reply in pieces of three bytes is put together whole.
    server.Next(CddbMisbehaviour::Pieces);
    ASSERT_TRUE(client.Query(host, id, toc, matches));
    server.Next(CddbMisbehaviour::Pieces);
    ASSERT_TRUE(client.ReadEntry(host, id, matches[0], entry));
    EXPECT_EQ(entry.trackTitles.size(), 2u);
}

TEST_F(CddbClientTest, AServerThatRefusesGivesTheConnectText) {
    cddb::CddbHost closed = host;
    {
        ac::test::CddbTestServer gone;
        closed.port = gone.Port();
    }
    EXPECT_FALSE(client.Query(closed, id, toc, matches));
    EXPECT_EQ(messages.back(), "Could not connect to the CDDB HTTP server 127.0.0.1\n");
    EXPECT_EQ(cddb::ReadBatchFile(cddb::BatchFilePath(folder.Path())).size(), 1u)
        << "a server that is away today is asked again by the batch";
    cddb::CddbEntry entry;
    EXPECT_FALSE(client.ReadEntry(closed, id, CddbMatch{"rock", id, "", ""}, entry));
    EXPECT_EQ(messages.back(), "Could not connect to the CDDB HTTP server 127.0.0.1\n");
}

TEST_F(CddbClientTest, CancelEndsAWaitAtOnceWithoutTextOrBatchRecord) {
    cddb::CddbCancel cancel;
    client.SetCancel(&cancel);
    client.SetTimeout(30000);
    server.Next(CddbMisbehaviour::Silent);
    std::thread canceller([&] {
        std::this_thread::sleep_for(100ms);
        cancel.Cancel();
    });
    const auto started = Clock::now();
    EXPECT_FALSE(client.Query(host, id, toc, matches));
    canceller.join();
    EXPECT_LT(Clock::now() - started, 2s);
    EXPECT_TRUE(messages.empty());
    EXPECT_FALSE(std::filesystem::exists(cddb::BatchFilePath(folder.Path())));
}

TEST_F(CddbClientTest, TheCorpusTranscriptsReplayAsTheyCame) {
    server.Next(CddbMisbehaviour::Replay, Corpus("netcddb_query_211_inexact_d50dd30f.txt"));
    ASSERT_TRUE(client.Query(host, id, toc, matches));
    ASSERT_EQ(matches.size(), 2u);
    EXPECT_EQ(matches[0].category, "reggae");
    EXPECT_EQ(matches[1].discId, 0xd50dd30fu);
    EXPECT_EQ(matches[1].artist, "Various");
    EXPECT_EQ(matches[1].title, "Ska Island");

    server.Next(CddbMisbehaviour::Replay, Corpus("netcddb_query_200_exact_820e770a.txt"));
    ASSERT_TRUE(client.Query(host, id, toc, matches));
    EXPECT_EQ(matches[0].title, "Wish 1993");
    // No line end at all behind the match: the closed connection ends it.
    server.Next(CddbMisbehaviour::Replay, Corpus("cddbscala_query_200_misc_2f0d8939.txt"));
    ASSERT_TRUE(client.Query(host, id, toc, matches));
    EXPECT_EQ(matches[0].title, "Old Time Festival Tunes For Clawhammer Banjo (Disc 2)");

    server.Next(CddbMisbehaviour::Replay, Corpus("cddbscala_read_210_misc_2f0d8939.txt"));
    cddb::CddbEntry entry;
    ASSERT_TRUE(client.ReadEntry(host, 0x2f0d8939, matches[0], entry))
        << cddb::EntryResultText(client.LastEntryResult());
    EXPECT_EQ(entry.trackTitles.size(), 57u);

    // A banner and a category list are replies, but no matches.
    for (const char* name : {"netcddb_banner_201.txt", "netcddb_lscat_210.txt"}) {
        server.Next(CddbMisbehaviour::Replay, Corpus(name));
        EXPECT_FALSE(client.Query(host, id, toc, matches)) << name;
        EXPECT_EQ(client.LastError(), EPROTONOSUPPORT) << name;
    }
}

TEST(CddbMatchLineTest, FieldsIdsAndTitles) {
    struct Row {
        std::string line;
        bool parses;
        std::string category, artist, title;
        std::uint32_t id;
    };
    const std::vector<Row> rows = {
        {"rock 940aac0b Nightwish / Once", true, "rock", "Nightwish", "Once", 0x940aac0b},
        {"misc\t\t2f0d8939   Dan / Old / Time \r\nrest", true, "misc", "Dan", "Old / Time",
         0x2f0d8939},
        {"jazz 820e770a Wish", true, "jazz", "", "Wish", 0x820e770a},
        {"data 0b Only\n", true, "data", "", "Only", 0x0b},
        {"../.. 01 A/B", true, "../..", "A", "B", 1},  // a category only ever goes into a request
        {"rock 940aac0g Not hex", false, "", "", "", 0},
        {"rock 1940aac0b Nine digits", false, "", "", "", 0},
        {"rock 940aac0b", false, "", "", "", 0},
        {"rock 940aac0b    ", false, "", "", "", 0},
        {"rock", false, "", "", "", 0},
        {"", false, "", "", "", 0},
        {"rock 1 Caf\xE9 / Cr\xE8me", true, "rock", "Caf\xC3\xA9", "Cr\xC3\xA8me",
         1},                                                              // ISO-8859-1
        {"rock 1 Caf\xC3\xA9 / x", true, "rock", "Caf\xC3\xA9", "x", 1},  // UTF-8 stays
    };
    for (const Row& row : rows) {
        CddbMatch match;
        ASSERT_EQ(cddb::ParseMatchLine(row.line, match), row.parses) << row.line;
        if (!row.parses)
            continue;
        EXPECT_EQ(match.category, row.category) << row.line;
        EXPECT_EQ(match.artist, row.artist) << row.line;
        EXPECT_EQ(match.title, row.title) << row.line;
        EXPECT_EQ(match.discId, row.id) << row.line;
    }
}

TEST(CddbMatchListTest, StatusRangesDecide) {
    std::vector<CddbMatch> matches;
    std::vector<std::string> lines;
    using cddb::MatchResult;
    EXPECT_EQ(cddb::ParseMatchList("217 odd but a list\r\nrock 1 A / B\r\nbad line\r\n.\r\n",
                                   matches, lines),
              MatchResult::Matches);
    EXPECT_EQ(matches.size(), 1u);
    EXPECT_EQ(lines, (std::vector<std::string>{"rock 1 A / B", "bad line"}));
    EXPECT_EQ(cddb::ParseMatchList("211 list\r\nnothing here\r\n", matches, lines),
              MatchResult::ProtocolError);
    EXPECT_EQ(cddb::ParseMatchList("200 r", matches, lines), MatchResult::ProtocolError)
        << "too short";
    EXPECT_EQ(cddb::ParseMatchList("200 rock 2 T", matches, lines), MatchResult::Matches);
    EXPECT_EQ(cddb::ParseMatchList("202 No match", matches, lines), MatchResult::NoMatch);
    EXPECT_EQ(cddb::ParseMatchList("20", matches, lines), MatchResult::ProtocolError);
    EXPECT_EQ(cddb::ParseMatchList("403 Database entry is corrupt.", matches, lines),
              MatchResult::ProtocolError);
    EXPECT_TRUE(matches.empty());
}

TEST(CddbHostSettingTest, HostAndPort) {
    const cddb::CddbHost host = cddb::ParseHostSetting(" gnudb.gnudb.org & 8880 ");
    EXPECT_EQ(host.host, "gnudb.gnudb.org");
    EXPECT_EQ(host.port, 8880);
    EXPECT_EQ(host.script, "/~cddb/cddb.cgi");
    EXPECT_EQ(cddb::ParseHostSetting("example.org & x").port, 80);
    EXPECT_EQ(cddb::ParseHostSetting("").host, "");
    EXPECT_EQ(cddb::HostSettingText("h", 81), "h & 81");
}

// The observer of a lookup that records what it is told and answers the choice.
class RecordingObserver : public cddb::ILookupObserver {
public:
    void ShowAction(const std::string& text) override { actions.push_back(text); }
    void ShowMessage(const std::string& text) override { messages.push_back(text); }
    int ChooseMatch(const std::vector<std::string>& offered) override {
        rows = offered;
        return choice;
    }
    std::vector<std::string> actions, messages, rows;
    int choice = 0;
};

TEST_F(CddbClientTest, ALookupChoosesAmongMatchesAndReadsTheChosenOne) {
    for (int i = 0; i < 3; ++i) {
        const std::string category =
            std::vector<std::string>{"rock", "misc", "blues"}[std::size_t(i)];
        server.AddRecord(category, id, "Artist" + std::to_string(i) + " / Album",
                         Xmcd(id, "Artist" + std::to_string(i) + " / Album",
                              {"T" + std::to_string(i)}, "DYEAR=1999\r\nDGENRE=Ska Punk\r\n"));
    }
    cddb::LookupSettings settings;
    settings.host = host;
    RecordingObserver observer;
    observer.choice = 1;
    cddb::CDDiscInfo info;
    ASSERT_TRUE(cddb::LookupDisc(settings, toc, observer, nullptr, info));
    EXPECT_EQ(observer.rows.size(), 3u);
    EXPECT_EQ(info.artist, "Artist1");
    EXPECT_EQ(info.titles, (std::vector<std::string>{"T1"}));
    EXPECT_EQ(info.year, "1999") << "DYEAR where EXTD says nothing";
    EXPECT_EQ(info.genre, "Ska Punk") << "DGENRE over the category";
    EXPECT_EQ(observer.actions,
              (std::vector<std::string>{"Query CD's Info", "Get all track's name"}));
    EXPECT_NE(server.Requests().back().find("cddb+read+misc+"), std::string::npos);
}

TEST_F(CddbClientTest, ABatchPassAnswersEveryRecordAndStopsAtTheFirstFailure) {
    const cddb::DiscToc other = {cddb::TocPosition::FromFrames(150),
                                 cddb::TocPosition::FromFrames(30000)};
    const std::uint32_t otherId = cddb::ComputeDiscId(other);
    server.AddRecord("rock", id, "A / B", Xmcd(id, "A / B", {"One"}));
    server.AddRecord("jazz", otherId, "C / D", Xmcd(otherId, "C / D", {"Two"}));
    const std::string text =
        "  " + cddb::QueryFields(toc) + "*\n" + cddb::QueryFields(other) + "* \n";
    cddb::LookupSettings settings;
    settings.host = host;
    RecordingObserver observer;
    cddb::BatchPassResult result =
        cddb::RunBatchPass(settings, text, folder.Path(), observer, nullptr);
    EXPECT_TRUE(result.complete);
    EXPECT_EQ(result.answered, 2);
    cddb::CDDiscInfo info;
    ASSERT_TRUE(cddb::LoadDiscFile(folder.Path(), otherId, info));
    EXPECT_EQ(info.album, "D");
    EXPECT_EQ(info.genre, "jazz") << "the genre as it came";

    server.Next(CddbMisbehaviour::ServerError);
    result = cddb::RunBatchPass(settings, text, folder.Path(), observer, nullptr);
    EXPECT_FALSE(result.complete);
    EXPECT_EQ(result.answered, 0);
    EXPECT_NE(observer.messages.back().find("500"), std::string::npos)
        << "the failed record's reply stays";
}

}  // namespace
