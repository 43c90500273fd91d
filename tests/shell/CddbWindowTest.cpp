// CDDB lookups in the real program against the loopback test server: a disc image made at test
// time stands in for the CD, CDDB is pressed, the second of three matches is chosen, and the
// names land in the list and the local record; a lookup that times out is kept and answered by
// a later batch query; renamed names are asked about; Cancel and closing the program mid-lookup
// leave nothing behind. Runs under xvfb-run.

#include "../support/CddbTestServer.h"
#include "../support/DiscImages.h"
#include "../support/ProgramHarness.h"

#include <gtest/gtest.h>

#include <cstdio>
#include <filesystem>
#include <fstream>
#include <sstream>

namespace {

using namespace std::chrono_literals;
using ac::test::CddbMisbehaviour;
using ac::test::Program;
using ac::test::State;
namespace fs = std::filesystem;

// The disc of ThreeTrackSpecs(150): tracks at 150, 676 and 1351 frames, lead-out 1652.
constexpr std::uint32_t kDiscId = 0x14001403;
const std::string kIdText = "14001403";

std::string Field(const State& state, const std::string& key) {
    auto found = state.find(key);
    return found == state.end() ? std::string() : found->second;
}

std::string RowName(const State& state, int row) {
    const std::string text = Field(state, "riprow" + std::to_string(row));
    return text.substr(0, text.find('\t'));
}

bool Has(const std::string& text, const std::string& part) {
    return text.find(part) != std::string::npos;
}

std::string Record(const std::string& artist, const std::vector<std::string>& titles) {
    std::string text =
        "# xmcd\r\n#\r\n# Track frame offsets:\r\n#\t150\r\n#\t676\r\n#\t1351\r\n#\r\n"
        "# Disc length: 22 seconds\r\n#\r\n# Submitted via: testsuite "
        "1.0\r\n#\r\nDISCID=14001403\r\n"
        "DTITLE=" +
        artist + " / Album\r\nDYEAR=2001\r\nDGENRE=Ska\r\n";
    for (std::size_t i = 0; i < titles.size(); ++i)
        text += "TTITLE" + std::to_string(i) + "=" + titles[i] + "\r\n";
    return text + "EXTD=\r\nPLAYORDER=\r\n";
}

std::string Slurp(const std::string& path) {
    return Program::Slurp(path);
}

class CddbWindowTest : public ::testing::Test {
protected:
    void SetUp() override {
        fs::create_directories(home / "cddb");
        image =
            ac::test::WriteDiscImage(home / "images", "disc", ac::test::ThreeTrackSpecs(150), {});
    }
    void Settings(int timeoutSeconds) {
        ac::test::WriteSettings(
            home, "last_run_function=dword:1\ncdimages=sz:" + image.cuePath + "\nlocalcddb=sz:" +
                      (home / "cddb") + "\nremotecddb=sz:" + server.HostSetting() +
                      "\ntimeout=dword:" + std::to_string(timeoutSeconds) +
                      "\ncddb_email=sz:tester@example.org\nafterconvert=dword:4\n");
    }
    State Loaded(Program& program) {
        return program.WaitFor([](const State& s) { return s.count("riprow2") > 0; });
    }

    ac::test::CddbTestServer server;
    ac::test::TempDir home;
    ac::test::DiscImage image;
};

TEST_F(CddbWindowTest, CddbChoosesTheSecondOfThreeMatchesAndNamesTheDisc) {
    server.AddRecord("rock", kDiscId, "Band 1 / Album", Record("Band 1", {"A1", "A2", "A3"}));
    server.AddRecord("misc", kDiscId, "Band 2 / Album", Record("Band 2", {"One", "Two", "Three"}));
    server.AddRecord("jazz", kDiscId, "Band 3 / Album", Record("Band 3", {"C1", "C2", "C3"}));
    Settings(5);
    Program program(home);
    State state = Loaded(program);
    ASSERT_EQ(Field(state, "ripdiscid"), kIdText);

    program.Send("command 33064");
    state = program.WaitFor([](const State& s) { return !Field(s, "cddbselect").empty(); });
    EXPECT_EQ(
        Field(state, "cddbselect"),
        "rock 14001403 Band 1 / Album|misc 14001403 Band 2 / Album|jazz 14001403 Band 3 / Album|");
    EXPECT_EQ(Field(state, "cddblookup"), "1");
    program.Send("cddbchoose 1");
    state = program.WaitFor([](const State& s) { return Field(s, "cddbok") == "1"; });
    EXPECT_TRUE(Has(Field(state, "cddbmessage"), "210 misc 14001403"))
        << Field(state, "cddbmessage");
    EXPECT_EQ(Field(state, "cddbaction"), "Get all track's name");
    std::printf("lookup from the CDDB command to OK enabled: %s ms\n",
                Field(state, "cddbms").c_str());
    program.Send("cddbok");
    state = program.WaitFor([](const State& s) { return RowName(s, 2) == "Three"; });
    EXPECT_EQ(RowName(state, 0), "One");
    EXPECT_EQ(RowName(state, 1), "Two");
    EXPECT_EQ(Field(state, "ripboxes").rfind("Band 2|Album|Ska|2001|", 0), 0u)
        << Field(state, "ripboxes");
    EXPECT_EQ(Field(state, "cddblookup"), "0");

    const std::string file = Slurp(home / ("cddb/" + kIdText + ".cddb"));
    EXPECT_TRUE(Has(file, "ARITIST=Band 2\r\n")) << file;
    EXPECT_TRUE(Has(file, "Total=3\r\nTrack00=One\r\nTrack01=Two\r\nTrack02=Three\r\n")) << file;
    for (const auto& entry : fs::directory_iterator(home / "cddb")) {
        EXPECT_TRUE(entry.path().extension() == ".cddb") << "no temporary left: " << entry.path();
    }
    const std::vector<std::string> requests = server.Requests();
    ASSERT_EQ(requests.size(), 2u);
    EXPECT_EQ(requests[0].rfind("GET /~cddb/cddb.cgi?cmd=cddb+query+14001403+3+150+", 0), 0u)
        << requests[0];
    EXPECT_TRUE(
        Has(requests[0], "&hello=tester+example.org+MfcCDDB+1.14&proto=4 HTTP/1.0\r\n\r\n"));
    EXPECT_EQ(
        requests[1],
        "GET /~cddb/cddb.cgi?cmd=cddb+read+misc+14001403&hello=tester+example.org+MfcCDDB+1.14"
        "&proto=4 HTTP/1.0\r\n\r\n");

    // A renamed track: the question comes first, and No asks no server.
    program.Send("riprename 0 My Own Name");
    state = program.WaitFor([](const State& s) { return RowName(s, 0) == "My Own Name"; });
    program.Send("answer no");
    program.Send("command 33064");
    state = program.WaitFor([](const State& s) { return Has(Field(s, "boxes"), "renamed"); });
    EXPECT_TRUE(
        Has(Field(state, "boxes"), "read cddb may cause the name you renamed unusable,continue?"));
    std::this_thread::sleep_for(300ms);
    EXPECT_EQ(server.Connections(), 2);
    EXPECT_EQ(RowName(program.ReadState(), 0), "My Own Name");

    // Cancel while the server is silent: the unknown texts, the record on disk unchanged.
    server.Next(CddbMisbehaviour::Silent);
    program.Send("answer yes");
    program.Send("command 33064");
    state =
        program.WaitFor([](const State& s) { return Field(s, "cddbaction") == "Query CD's Info"; });
    program.Send("cddbcancel");
    state = program.WaitFor(
        [](const State& s) { return Field(s, "cddblookup") == "0" && !s.count("cddbaction"); });
    EXPECT_EQ(Field(state, "ripboxes").rfind("unknown artist|unknown album|", 0), 0u)
        << Field(state, "ripboxes");
    EXPECT_EQ(Slurp(home / ("cddb/" + kIdText + ".cddb")), file);

    // Closing the program in the middle of a lookup ends it cleanly.
    server.Next(CddbMisbehaviour::Silent);
    program.Send("command 33064");
    program.WaitFor([](const State& s) { return Field(s, "cddbaction") == "Query CD's Info"; });
    program.Send("close");
    EXPECT_TRUE(program.WaitForExit(10s)) << "the program ends with a lookup open";
}

TEST_F(CddbWindowTest, ALookupThatTimesOutIsAnsweredByALaterBatchQuery) {
    server.AddRecord("rock", kDiscId, "Late Band / Album", Record("Late Band", {"L1", "L2", "L3"}));
    Settings(1);
    Program program(home);
    State state = Loaded(program);

    server.Next(CddbMisbehaviour::Silent);
    program.Send("command 33064");
    state = program.WaitFor([](const State& s) { return Field(s, "cddbok") == "1"; }, 15s);
    EXPECT_EQ(Field(state, "cddbmessage"),
              "CDDB server did not respond correctly to the query command ");
    program.Send("cddbok");
    state = program.WaitFor(
        [](const State& s) { return Field(s, "cddblookup") == "0" && !s.count("cddbok"); });
    EXPECT_EQ(Field(state, "ripboxes").rfind("unknown artist|unknown album|", 0), 0u);
    EXPECT_FALSE(fs::exists(home / ("cddb/" + kIdText + ".cddb")));
    const std::string batch = Slurp(home / "cddb/CDDB_Batch.txt");
    EXPECT_EQ(batch.rfind(kIdText + "+3+150+", 0), 0u) << batch;
    EXPECT_EQ(batch.back(), '*');

    program.Send("command 33137");
    state = program.WaitFor([](const State& s) { return Field(s, "cddbok") == "1"; }, 15s);
    EXPECT_TRUE(Has(Field(state, "cddbaction"), "1")) << Field(state, "cddbaction");
    program.Send("cddbok");
    program.WaitFor([](const State& s) { return Field(s, "cddblookup") == "0"; });
    const std::string file = Slurp(home / ("cddb/" + kIdText + ".cddb"));
    EXPECT_TRUE(Has(file, "ARITIST=Late Band\r\n")) << file;
    EXPECT_TRUE(Has(file, "GENRE=Ska\r\n")) << file;
    EXPECT_EQ(Slurp(home / "cddb/CDDB_Batch.txt"), batch) << "the batch file is never emptied";

    // Loaded again, the disc is named from the record the batch wrote, with no network.
    const int connections = server.Connections();
    program.Send("command 33100");
    state = program.WaitFor([](const State& s) { return RowName(s, 0) == "L1"; });
    EXPECT_EQ(RowName(state, 2), "L3");
    EXPECT_EQ(server.Connections(), connections);
}

}  // namespace
