#include "convert/EncodeProcess.h"

#include "../support/TempDir.h"
#include "FakeTool.h"

#include <gtest/gtest.h>

#include <condition_variable>
#include <mutex>

namespace ac {
namespace {

using Lines = std::vector<std::string>;

struct SplitCase {
    const char* name;
    std::vector<std::string> reads;
    Lines lines;
    std::string rest;
};

class LineSplitterTest : public ::testing::TestWithParam<SplitCase> {};

TEST_P(LineSplitterTest, JoinsReadsIntoLines) {
    LineSplitter splitter;
    Lines got;
    for (const auto& read : GetParam().reads)
        splitter.Feed(read, [&](std::string_view line) { got.emplace_back(line); });
    EXPECT_EQ(got, GetParam().lines);
    EXPECT_EQ(splitter.Rest(), GetParam().rest);
}

INSTANTIATE_TEST_SUITE_P(
    Reads, LineSplitterTest,
    ::testing::Values(
        SplitCase{"CutLine", {"|Ti", "me>>> 12.5\n"}, {"|Time>>> 12.5"}, ""},
        SplitCase{"AllEnds", {"a\nb\r\nc\rd"}, {"a", "b", "c"}, "d"},
        // A CR LF that two reads cut apart gives one empty line more.
        SplitCase{"SplitCrLf", {"a\r", "\nb\n"}, {"a", "", "b"}, ""},
        SplitCase{"EmptyLines", {"\n\n"}, {"", ""}, ""},
        SplitCase{"NoEndStays", {"no end", " at all"}, {}, "no end at all"}),
    [](const auto& info) { return std::string(info.param.name); });

TEST(ParseTimeLineTest, PrefixIsExactAndNumbersAreLenient) {
    EXPECT_EQ(ParseTimeLine("|Time>>> 12.5"), 12.5);
    EXPECT_EQ(ParseTimeLine("|Time>>> 7abc"), 7.0);
    EXPECT_EQ(ParseTimeLine("|Time>>> soon"), 0.0);
    EXPECT_EQ(ParseTimeLine("|Time>>> "), 0.0);
    EXPECT_FALSE(ParseTimeLine("|time>>> 3"));
    EXPECT_FALSE(ParseTimeLine("|Time>>>3"));
    EXPECT_FALSE(ParseTimeLine(" |Time>>> 3"));
}

// Records what the process shows, and when its exit arrives.
struct Recorder : IProcessLog, IStatusText {
    std::mutex mutex;
    std::condition_variable exited;
    int exits = 0;
    std::vector<std::pair<std::string, LogLineKind>> log;
    Lines status;

    void Clear() override {
        std::lock_guard lock(mutex);
        log.clear();
    }
    void Append(const std::string& text, LogLineKind kind) override {
        std::lock_guard lock(mutex);
        log.emplace_back(text, kind);
    }
    void SetStatusText(const std::string& line) override {
        std::lock_guard lock(mutex);
        status.push_back(line);
    }
    CEncodeProcess::ExitCallback Callback() {
        return [this](CEncodeProcess*) {
            std::lock_guard lock(mutex);
            ++exits;
            exited.notify_all();
        };
    }
    bool WaitExits(int count) {
        std::unique_lock lock(mutex);
        return exited.wait_for(lock, std::chrono::seconds(20), [&] { return exits >= count; });
    }
};

class EncodeProcessTest : public ::testing::Test {
protected:
    std::string Tool(const std::string& body) {
        return "\"" + test::WriteScript(dir / "tool.sh", body) + "\"";
    }
    test::TempDir dir;
    Recorder recorder;
};

TEST_F(EncodeProcessTest, ReadsTimeStatusAndErrorLinesOfBothStreams) {
    CEncodeProcess process(recorder.Callback());
    process.Link(&recorder, &recorder);
    ASSERT_TRUE(process.Launch(Tool("printf '|Ti'; sleep 0.05; printf 'me>>> 3.25\\rOpening\\r\\n'\n"
                                    "echo '|Error>>> bad frame' >&2\n"
                                    "echo '|Warning>>> clipped' >&2\n"
                                    "echo plain >&2\n"
                                    "printf 'tail without end'\n"
                                    "exit 3\n")));
    ASSERT_TRUE(recorder.WaitExits(1));
    process.WaitForExit();
    EXPECT_EQ(process.ExitCode(), 3);
    EXPECT_EQ(process.TimeSeconds(), 3.25);
    EXPECT_EQ(process.ErrorLines(), (Lines{"|Error>>> bad frame", "|Warning>>> clipped", "plain"}));
    std::lock_guard lock(recorder.mutex);
    // The first status text is the empty one of the start; the tail never arrives.
    EXPECT_EQ(recorder.status, (Lines{"", "Opening"}));
    ASSERT_EQ(recorder.log.size(), 3u);
    EXPECT_EQ(recorder.log[0], std::make_pair(std::string("bad frame\n"), LogLineKind::Error));
    EXPECT_EQ(recorder.log[1], std::make_pair(std::string("clipped\n"), LogLineKind::Warning));
    EXPECT_EQ(recorder.log[2].second, LogLineKind::Normal);
}

TEST_F(EncodeProcessTest, ReplayShowsTheStoredLinesAgain) {
    CEncodeProcess process(recorder.Callback());
    ASSERT_TRUE(process.Launch(Tool("echo '|Error>>> one' >&2; echo two >&2\n")));
    ASSERT_TRUE(recorder.WaitExits(1));
    process.WaitForExit();
    process.Link(&recorder, nullptr);
    process.ReplayErrorLines();
    std::lock_guard lock(recorder.mutex);
    ASSERT_EQ(recorder.log.size(), 2u);
    EXPECT_EQ(recorder.log[0].first, "one\n");
}

TEST_F(EncodeProcessTest, FloodOfErrorReadsKillsTheChildWithMinus100) {
    CEncodeProcess process(recorder.Callback());
    // Each write lands in a read of its own because the writer pauses in between.
    ASSERT_TRUE(process.Launch(Tool("while :; do echo noise >&2; sleep 0.002; done\n")));
    ASSERT_TRUE(recorder.WaitExits(1));
    process.WaitForExit();
    EXPECT_EQ(process.ExitCode(), CEncodeProcess::kFloodExitCode);
    EXPECT_EQ(process.ErrorReads(), 0);
    EXPECT_GT(process.ErrorLines().size(), 100u);
}

TEST_F(EncodeProcessTest, ErrorReadsCarryOverToTheNextRun) {
    CEncodeProcess process(recorder.Callback());
    std::string tool = Tool("i=0; while [ $i -lt 60 ]; do echo x >&2; sleep 0.002; i=$((i+1)); done\n");
    ASSERT_TRUE(process.Launch(tool));
    ASSERT_TRUE(recorder.WaitExits(1));
    process.WaitForExit();
    EXPECT_EQ(process.ExitCode(), 0);
    int firstRun = process.ErrorReads();
    ASSERT_GT(firstRun, 40);
    ASSERT_TRUE(process.Launch(tool));
    ASSERT_TRUE(recorder.WaitExits(2));
    process.WaitForExit();
    // 60 more reads push the count past the limit in the second run.
    EXPECT_EQ(process.ExitCode(), CEncodeProcess::kFloodExitCode);
    EXPECT_EQ(process.ErrorLines().size() < 60u, true);
}

TEST_F(EncodeProcessTest, FailedLaunchReportsThroughTheStatusLine) {
    CEncodeProcess process(recorder.Callback());
    process.Link(nullptr, &recorder);
    EXPECT_FALSE(process.Launch("\"" + dir / "missing-ctt" + "\" -relk -y"));
    EXPECT_FALSE(process.IsRunning());
    std::lock_guard lock(recorder.mutex);
    ASSERT_EQ(recorder.status.size(), 1u);  // the text ends in "\n" and so is a line
    EXPECT_NE(recorder.status[0].find("missing-ctt"), std::string::npos);
    EXPECT_EQ(recorder.exits, 0);
}

}  // namespace
}  // namespace ac
