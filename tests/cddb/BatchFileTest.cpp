#include "cddb/BatchFile.h"

#include "cddb/DiscFile.h"
#include "cddb/DiscToc.h"
#include "support/TempDir.h"

#include <gtest/gtest.h>

#include <fstream>

namespace {

std::vector<std::string> Queries(const std::vector<cddb::BatchRecord>& records) {
    std::vector<std::string> queries;
    for (const auto& record : records)
        queries.push_back(record.query);
    return queries;
}

TEST(BatchFileTest, RecordsFollowEachOtherAndBlanksAreSkipped) {
    const auto records = cddb::ParseBatchText(
        " \r\n940aac0b+2+150+15420+2533*\n 0012abcd+1+150+60* ** lone*cut+off");
    ASSERT_EQ(records.size(), 3u);
    EXPECT_EQ(records[0].query, "940aac0b+2+150+15420+2533");
    EXPECT_EQ(records[0].idText, "940aac0b");
    EXPECT_EQ(records[1].idText, "0012abcd");
    EXPECT_EQ(records[2].query, "lone");
    EXPECT_EQ(records[2].idText, "lone");
    EXPECT_TRUE(cddb::ParseBatchText("").empty());
}

TEST(BatchFileTest, AppendsKeepEarlierRecordsAndNameTheirDiscFiles) {
    ac::test::TempDir folder;
    const std::string path = cddb::BatchFilePath(folder.Path());
    EXPECT_EQ(path, folder / "CDDB_Batch.txt");
    EXPECT_TRUE(cddb::ReadBatchFile(path).empty());

    cddb::DiscToc toc;
    for (int frames : {150, 15420, 190000})
        toc.push_back(cddb::TocPosition::FromFrames(frames));
    const std::string query = cddb::QueryFields(toc);
    ASSERT_TRUE(cddb::AppendBatchRecord(path, query));
    ASSERT_TRUE(cddb::AppendBatchRecord(path, "0012abcd+1+150+60"));
    EXPECT_FALSE(cddb::AppendBatchRecord(path, "a*b"));
    EXPECT_FALSE(cddb::AppendBatchRecord(path, ""));

    std::ifstream in(path, std::ios::binary);
    std::string text((std::istreambuf_iterator<char>(in)), std::istreambuf_iterator<char>());
    EXPECT_EQ(text, query + "*0012abcd+1+150+60*");

    const auto records = cddb::ReadBatchFile(path);
    EXPECT_EQ(Queries(records), (std::vector<std::string>{query, "0012abcd+1+150+60"}));
    EXPECT_EQ(records[0].idText, cddb::FormatDiscId(cddb::ComputeDiscId(toc)));
    EXPECT_EQ(cddb::ParseDiscIdText(records[1].idText), 0x0012abcdu);

    EXPECT_FALSE(cddb::AppendBatchRecord(folder / "no/such/folder/CDDB_Batch.txt", query));
}

}  // namespace
