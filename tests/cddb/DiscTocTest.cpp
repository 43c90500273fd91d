#include "cddb/DiscToc.h"

#include <gtest/gtest.h>

using cddb::DiscToc;
using cddb::TocPosition;

namespace {

DiscToc FromFrameOffsets(std::initializer_list<int> frames) {
  DiscToc toc;
  for (int f : frames) toc.push_back(TocPosition::FromFrames(f));
  return toc;
}

}  // namespace

// Real discs are checked against the ids of the corpus records in the record parser's tests.
TEST(DiscTocTest, ElevenTracksFromTwoSecondsGiveTheTrackCountInTheLowByteAndTheOffsets) {
  DiscToc toc = FromFrameOffsets({150, 15420, 32942, 48877, 67890, 80015, 98456, 112233, 130000,
                                  150111, 170222, 190000});
  const uint32_t id = cddb::ComputeDiscId(toc);
  EXPECT_EQ(id & 0xFF, 11u);
  EXPECT_EQ((id >> 8) & 0xFFFF, static_cast<uint32_t>(190000 / 75 - 2));
  const std::string fields = cddb::QueryFields(toc);
  EXPECT_EQ(fields.substr(9, 7), "11+150+");
  EXPECT_EQ(fields.substr(fields.rfind('+') + 1), std::to_string(190000 / 75 - 2));
}

TEST(DiscTocTest, KnownDiscIdsFromTheirTables) {
  // 2 tracks: digit sums of 2 s and 185 s are 2 and 14; length 183 s.
  DiscToc toc = FromFrameOffsets({150, 185 * 75, 185 * 75 + 2 * 75});
  EXPECT_EQ(cddb::ComputeDiscId(toc), (16u << 24) | (185u << 8) | 2u);
  EXPECT_EQ(cddb::ComputeDiscId({}), 0u);
}

TEST(DiscTocTest, PositionsRoundTripThroughFrames) {
  for (int f : {0, 74, 75, 4499, 4500, 333000}) EXPECT_EQ(TocPosition::FromFrames(f).Frames(), f);
  EXPECT_EQ(TocPosition::FromFrames(150), (TocPosition{0, 2, 0}));
}
