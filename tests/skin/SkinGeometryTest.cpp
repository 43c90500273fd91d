// Placement arithmetic of skinned drawing: split and tiled pictures, row layout, window shape,
// sliders, capacity bar, system buttons, the resize grip, remembered rectangles and menus.

#include "skin/SkinGeometry.h"

#include <gtest/gtest.h>

#include <cstring>

namespace ac {
namespace {

// Paints a plan into a target of w x h, recording for each target pixel the source pixel it
// came from (or the fill's source), so tests can read where every part of the picture lands.
std::vector<std::pair<int, int>> Render(const SplitPlan& plan, int w, int h) {
    std::vector<std::pair<int, int>> target(std::size_t(w * h), {-1, -1});
    auto put = [&](int x, int y, std::pair<int, int> source) {
        if (x >= 0 && y >= 0 && x < w && y < h) {
            target[std::size_t(y * w + x)] = source;
        }
    };
    for (int y = 0; y < plan.fill.h; ++y) {
        for (int x = 0; x < plan.fill.w; ++x) {
            put(plan.fill.x + x, plan.fill.y + y, {plan.fillSourceX, plan.fillSourceY});
        }
    }
    for (const SkinBlit& b : plan.blits) {
        for (int y = 0; y < b.dst.h; ++y) {
            for (int x = 0; x < b.dst.w; ++x) {
                put(b.dst.x + x, b.dst.y + y,
                    {b.src.x + x * b.src.w / b.dst.w, b.src.y + y * b.src.h / b.dst.h});
            }
        }
    }
    return target;
}

TEST(SplitPictureTest, CornersStayUnstretchedAndEdgesRepeatTheSplitRowAndColumn) {
    // 10 x 8 picture split at row 3, column 4, drawn at 30 x 20.
    const SplitPlan plan = PlanSplitPicture(10, 8, 30, 20, 3, 4);
    const auto t = Render(plan, 30, 20);
    auto at = [&](int x, int y) { return t[std::size_t(y * 30 + x)]; };
    EXPECT_EQ(at(0, 0), std::make_pair(0, 0));
    EXPECT_EQ(at(3, 2), std::make_pair(3, 2));
    EXPECT_EQ(at(29, 0), std::make_pair(9, 0));   // top right corner
    EXPECT_EQ(at(24, 0), std::make_pair(4, 0));   // first column of the right part
    EXPECT_EQ(at(0, 19), std::make_pair(0, 7));   // bottom left
    EXPECT_EQ(at(29, 19), std::make_pair(9, 7));  // bottom right
    EXPECT_EQ(at(15, 1), std::make_pair(4, 1));   // top edge: column 4 repeated
    EXPECT_EQ(at(2, 10), std::make_pair(2, 3));   // left edge: row 3 repeated
    EXPECT_EQ(at(15, 10), std::make_pair(4, 3));  // middle: the colour at the split
    for (const auto& source : t) {
        EXPECT_NE(source.first, -1) << "every target pixel is painted";
    }
}

TEST(SplitPictureTest, NegativeSplittersCountFromTheFarEdge) {
    const SplitPlan fromEnd = PlanSplitPicture(10, 8, 30, 20, -1, -1);
    const SplitPlan explicitLast = PlanSplitPicture(10, 8, 30, 20, 7, 9);
    ASSERT_EQ(fromEnd.blits.size(), explicitLast.blits.size());
    EXPECT_EQ(fromEnd.fill, explicitLast.fill);
    EXPECT_EQ(fromEnd.fillSourceX, 9);
    EXPECT_EQ(fromEnd.fillSourceY, 7);
}

TEST(SplitPictureTest, ATargetSmallerThanThePictureOnlyClipsTheCorners) {
    const SplitPlan plan = PlanSplitPicture(10, 8, 6, 5, 3, 4);
    EXPECT_TRUE(plan.fill.Empty());
    EXPECT_EQ(plan.blits.size(), 4u);  // the four corners, overlapping
    const auto t = Render(plan, 6, 5);
    EXPECT_EQ(t[std::size_t(4 * 6 + 5)], std::make_pair(9, 7));  // bottom right wins
}

TEST(SplitPictureTest, EmptyPictureOrTargetPlansNothing) {
    EXPECT_TRUE(PlanSplitPicture(0, 8, 30, 20, 3, 4).blits.empty());
    EXPECT_TRUE(PlanSplitPicture(10, 8, 0, 20, 3, 4).blits.empty());
    // A splitter beyond the picture is held inside it rather than reading outside.
    const SplitPlan plan = PlanSplitPicture(10, 8, 30, 20, 50, 50);
    EXPECT_EQ(plan.fillSourceX, 9);
    EXPECT_EQ(plan.fillSourceY, 7);
}

TEST(TiledPictureTest, CoversTheTargetWithOneSpareRowAndColumn) {
    const auto tiles = PlanTiles(16, 10, 40, 25);
    // 40 / 16 + 1 = 3 columns, 25 / 10 + 1 = 3 rows.
    ASSERT_EQ(tiles.size(), 9u);
    EXPECT_EQ(tiles.front(), std::make_pair(0, 0));
    EXPECT_EQ(tiles.back(), std::make_pair(32, 20));
    EXPECT_TRUE(PlanTiles(0, 10, 40, 25).empty());
}

TEST(LayoutRowTest, TheRestWindowTakesWhatTheOthersLeave) {
    const auto rects = LayoutRowRects({10, 20, 100, 300}, 1, 4, {50, 70, 30}, 0);
    ASSERT_EQ(rects.size(), 3u);
    // 300 - 70 - 30 - 2 gaps of 4 = 192.
    EXPECT_EQ(rects[0], (SkinRect{10, 20, 100, 192}));
    EXPECT_EQ(rects[1], (SkinRect{10, 216, 100, 70}));
    EXPECT_EQ(rects[2], (SkinRect{10, 290, 100, 30}));
    EXPECT_EQ(rects[2].Bottom(), 320);
}

TEST(LayoutRowTest, RowsAndShortAreas) {
    const auto row = LayoutRowRects({0, 0, 100, 20}, 0, 2, {30, 10, 30}, 1);
    EXPECT_EQ(row[1], (SkinRect{32, 0, 36, 20}));
    const auto tight = LayoutRowRects({0, 0, 50, 20}, 0, 2, {30, 10, 30}, 1);
    EXPECT_EQ(tight[1].w, 0) << "the rest window never gets a negative size";
}

std::vector<unsigned char> MakeBmp(int w, int h, int bits, bool topDown,
                                   const std::vector<std::uint32_t>& rgbRowsTopFirst) {
    const int stride = ((w * bits / 8) + 3) & ~3;
    std::vector<unsigned char> b(54 + std::size_t(stride * h), 0);
    auto le32 = [&](std::size_t at, std::uint32_t v) {
        for (int i = 0; i < 4; ++i) {
            b[at + i] = static_cast<unsigned char>(v >> (8 * i));
        }
    };
    b[0] = 'B';
    b[1] = 'M';
    le32(2, static_cast<std::uint32_t>(b.size()));
    le32(10, 54);
    le32(14, 40);
    le32(18, static_cast<std::uint32_t>(w));
    le32(22, static_cast<std::uint32_t>(topDown ? -h : h));
    b[26] = 1;
    b[28] = static_cast<unsigned char>(bits);
    if (bits == 24) {
        for (int y = 0; y < h; ++y) {
            const int fileRow = topDown ? y : h - 1 - y;
            for (int x = 0; x < w; ++x) {
                const std::uint32_t c = rgbRowsTopFirst[std::size_t(y * w + x)];
                unsigned char* p = &b[54 + std::size_t(fileRow * stride + x * 3)];
                p[0] = c & 0xFF;
                p[1] = (c >> 8) & 0xFF;
                p[2] = (c >> 16) & 0xFF;
            }
        }
    }
    return b;
}

TEST(CornerShapeTest, RunsOfNonBlackPixelsWithTheTopRowFirst) {
    const std::uint32_t W = 0xFFFFFF;
    // Row 0: two cut runs; row 1: one; row 2: none.
    const std::vector<std::uint32_t> pixels = {W, W, 0, W, 0, W, 0, 0, 0};
    for (bool topDown : {false, true}) {
        const auto picture = DecodeBmp24(MakeBmp(3, 3, 24, topDown, pixels));
        ASSERT_TRUE(picture.has_value());
        const auto runs = RegionRuns(*picture, 0);
        ASSERT_EQ(runs.size(), 3u);
        EXPECT_EQ(runs[0], (SkinRect{0, 0, 2, 1}));
        EXPECT_EQ(runs[1], (SkinRect{0, 1, 1, 1}));
        EXPECT_EQ(runs[2], (SkinRect{2, 1, 1, 1}));
    }
}

TEST(CornerShapeTest, OnlyUncompressed24BitBitmapsAreShapes) {
    const std::vector<std::uint32_t> pixels(4, 0xFFFFFF);
    EXPECT_TRUE(DecodeBmp24(MakeBmp(2, 2, 24, false, pixels)).has_value());
    EXPECT_FALSE(DecodeBmp24(MakeBmp(2, 2, 32, false, pixels)).has_value());
    EXPECT_FALSE(DecodeBmp24(MakeBmp(2, 2, 8, false, pixels)).has_value());
    auto png = MakeBmp(2, 2, 24, false, pixels);
    png[0] = 0x89;
    EXPECT_FALSE(DecodeBmp24(png).has_value());
    auto truncated = MakeBmp(2, 2, 24, false, pixels);
    truncated.resize(60);
    EXPECT_FALSE(DecodeBmp24(truncated).has_value());
    auto huge = MakeBmp(2, 2, 24, false, pixels);
    huge[21] = 0x7F;  // width beyond any picture
    EXPECT_FALSE(DecodeBmp24(huge).has_value());
    EXPECT_FALSE(DecodeBmp24({}).has_value());
}

TEST(CornerShapeTest, CornersMoveToTheirEdgesOfTheWindow) {
    const std::vector<SkinRect> runs = {{0, 0, 3, 1}, {0, 1, 1, 1}};
    EXPECT_EQ(PlaceCorner(runs, Corner::LeftTop, 100, 50), runs);
    const auto rightBottom = PlaceCorner(runs, Corner::RightBottom, 100, 50);
    EXPECT_EQ(rightBottom[0], (SkinRect{97, 48, 3, 1}));
    EXPECT_EQ(rightBottom[1], (SkinRect{97, 49, 1, 1}));
    EXPECT_EQ(PlaceCorner(runs, Corner::RightTop, 100, 50)[0], (SkinRect{97, 0, 3, 1}));
    EXPECT_EQ(PlaceCorner(runs, Corner::LeftBottom, 100, 50)[1], (SkinRect{0, 49, 1, 1}));
    EXPECT_TRUE(PlaceCorner({}, Corner::RightBottom, 100, 50).empty());
}

TEST(SliderTest, ThumbRunsFromThirteenToWidthLessThirteen) {
    EXPECT_EQ(SliderThumbX(0, 0, 100, 226), 13);
    EXPECT_EQ(SliderThumbX(100, 0, 100, 226), 213);
    EXPECT_EQ(SliderThumbX(50, 0, 100, 226), 113);
    EXPECT_EQ(SliderThumbX(150, 0, 100, 226), 213) << "beyond the maximum stays at the end";
    EXPECT_EQ(SliderThumbX(5, 0, 0, 226), 13) << "an empty range has no defined position";
}

TEST(CapacityBarTest, ThreeColoursStopAtTheFilledLength) {
    // 80 of 100 filled over 200 pixels, marks at 50 and 75 of 100.
    const auto runs = CapacityRuns(80, 100, 50, 75, 100, 200, 0);
    ASSERT_EQ(runs.size(), 3u);
    EXPECT_EQ(runs[0], (CapacityRun{0, 100, CapacityFill::Normal}));
    EXPECT_EQ(runs[1], (CapacityRun{100, 150, CapacityFill::NearOverflow}));
    EXPECT_EQ(runs[2], (CapacityRun{150, 160, CapacityFill::Overflow}));
    const auto short_ = CapacityRuns(30, 100, 50, 75, 100, 200, 0);
    ASSERT_EQ(short_.size(), 1u);
    EXPECT_EQ(short_[0].x1, 60);
}

TEST(CapacityBarTest, MarksAtZeroTurnTheThresholdsOff) {
    const auto runs = CapacityRuns(80, 100, 0, 75, 100, 200, 4);
    ASSERT_EQ(runs.size(), 1u);
    EXPECT_EQ(runs[0], (CapacityRun{4, 164, CapacityFill::Normal}));
    EXPECT_TRUE(CapacityRuns(0, 100, 50, 75, 100, 200, 0).empty());
    EXPECT_TRUE(CapacityRuns(10, 0, 50, 75, 100, 200, 0).empty());
}

TEST(CapacityBarTest, ScaleTicksAtEachStepBelowTheMaximum) {
    // An audio CD: 90 minutes across 450 pixels, a tick every 10.
    const auto ticks = CapacityScale(90, 10, 450, 0);
    ASSERT_EQ(ticks.size(), 8u);
    EXPECT_EQ(ticks[0].x, 50);
    EXPECT_EQ(ticks.back().value, 80);
    EXPECT_TRUE(CapacityScale(90, 0, 450, 0).empty());
}

TEST(SysButtonsTest, GridCellsAndGroupWidth) {
    const auto with = LayoutSysButtons(120, 90, true);
    EXPECT_EQ(with.rects[0], (SkinRect{0, 0, 40, 30}));
    EXPECT_EQ(with.rects[1], (SkinRect{40, 0, 40, 30}));
    EXPECT_EQ(with.rects[2], (SkinRect{80, 0, 40, 30}));
    EXPECT_EQ(with.groupWidth, 120);
    EXPECT_EQ(with.height, 30);
    const auto without = LayoutSysButtons(120, 90, false);
    EXPECT_TRUE(without.rects[1].Empty());
    EXPECT_EQ(without.rects[2].x, 60);
    EXPECT_EQ(without.groupWidth, 80);
}

TEST(ResizeGripTest, AnLAtTheBottomRight) {
    // Margins 2 + border 1 = 3, less 1: the strips are 2 pixels deep.
    EXPECT_TRUE(InResizeGrip(839, 633, 840, 634, 2, 2, 1));
    EXPECT_TRUE(InResizeGrip(838, 625, 840, 634, 2, 2, 1));
    EXPECT_TRUE(InResizeGrip(831, 632, 840, 634, 2, 2, 1));
    EXPECT_FALSE(InResizeGrip(837, 625, 840, 634, 2, 2, 1));
    EXPECT_FALSE(InResizeGrip(400, 300, 840, 634, 2, 2, 1));
}

TEST(WindowRectTest, ParsesAndFormatsTheStoredText) {
    const auto rect = ParseWindowRect("10,20,850,654");
    ASSERT_TRUE(rect.has_value());
    EXPECT_EQ(*rect, (SkinRect{10, 20, 840, 634}));
    EXPECT_EQ(FormatWindowRect(*rect), "10,20,850,654");
    for (const char* bad : {"", "1,2,3", "a,b,c,d", "1;2;3;4", "99999999999999,0,1,1"}) {
        EXPECT_FALSE(ParseWindowRect(bad).has_value()) << bad;
    }
}

TEST(WindowRectTest, AbsurdRectanglesComeBackOnScreenOrAreDropped) {
    const auto negative = SanitizeWindowRect({-300, -40, 900, 700}, 840, 634, 1280, 1024);
    EXPECT_EQ(*negative, (SkinRect{0, 0, 900, 700}));
    const auto small = SanitizeWindowRect({10, 10, 20, 20}, 840, 634, 1280, 1024);
    EXPECT_EQ(*small, (SkinRect{10, 10, 840, 634}));
    const auto offScreen = SanitizeWindowRect({5000, 4000, 840, 634}, 840, 634, 1280, 1024);
    EXPECT_EQ(*offScreen, (SkinRect{440, 390, 840, 634}));
    EXPECT_FALSE(SanitizeWindowRect({0, 0, 1000000, 634}, 840, 634, 1280, 1024).has_value());
    const auto inverted = SanitizeWindowRect({100, 100, -50, -50}, 840, 634, 1280, 1024);
    EXPECT_EQ(*inverted, (SkinRect{100, 100, 840, 634}));
}

TEST(MenuTest, EntryRectanglesComeFromTheSkin) {
    EXPECT_EQ(MenuEntryRect(0, 6, 64, 22, 2, 2), (SkinRect{6, 2, 64, 22}));
    EXPECT_EQ(MenuEntryRect(3, 6, 64, 22, 2, 2), (SkinRect{204, 2, 64, 22}));
}

TEST(MenuTest, MnemonicIsTheCharacterAfterTheLastAmpersand) {
    EXPECT_EQ(SplitMnemonic("E&xit"), std::make_pair(std::string("Exit"), 'x'));
    EXPECT_EQ(SplitMnemonic("&File"), std::make_pair(std::string("File"), 'f'));
    EXPECT_EQ(SplitMnemonic("Support"), std::make_pair(std::string("Support"), '\0'));
    EXPECT_EQ(SplitMnemonic("trailing&").second, '\0');
}

TEST(MenuTest, PopupRowsOverlapByOnePixel) {
    const auto layout = LayoutPopupRows({{50, 13}, {80, 13}, {20, 13}});
    ASSERT_EQ(layout.rows.size(), 3u);
    EXPECT_EQ(layout.width, 120);
    EXPECT_EQ(layout.height, 3 * 17 + 10);
    EXPECT_EQ(layout.rows[0], (SkinRect{0, 4, 120, 18}));
    EXPECT_EQ(layout.rows[1].y, 21);
    EXPECT_EQ(layout.rows[0].Bottom(), layout.rows[1].y + 1);
}

TEST(MenuTest, PopupsFlipAboveTheBarOrToTheLeftNearScreenEdges) {
    EXPECT_EQ(PlacePopupUnderBar(100, 60, 150, 200, 26, 1280, 1024), std::make_pair(100, 60));
    // Too low: above the bar.
    EXPECT_EQ(PlacePopupUnderBar(100, 900, 150, 200, 26, 1280, 1024), std::make_pair(100, 672));
    // Too far right: against the right edge; off the left: at 0.
    EXPECT_EQ(PlacePopupUnderBar(1200, 60, 150, 200, 26, 1280, 1024).first, 1130);
    EXPECT_EQ(PlacePopupUnderBar(-20, 60, 150, 200, 26, 1280, 1024).first, 0);

    EXPECT_EQ(PlacePopupBeside(100, 100, 150, 30, 120, 200, 1280, 1024), std::make_pair(250, 130));
    EXPECT_EQ(PlacePopupBeside(1100, 100, 150, 30, 120, 200, 1280, 1024).first, 980);
    EXPECT_EQ(PlacePopupBeside(100, 900, 150, 30, 120, 200, 1280, 1024).second, 774);
}

}  // namespace
}  // namespace ac

namespace ac {
namespace {

TEST(ListCellTest, CheckBoxSitsNinePixelsInOrCentredWithoutText) {
    EXPECT_EQ(ListCheckBox({100, 20, 80, 21}, true), (SkinRect{109, 24, 13, 13}));
    EXPECT_EQ(ListCheckBox({100, 20, 80, 21}, false), (SkinRect{133, 24, 13, 13}));
}

TEST(ListCellTest, TickGoesDownFourStrokesThenUpThree) {
    const auto strokes = ListTickStrokes({0, 0, 13, 13});
    ASSERT_EQ(strokes.size(), 7u);
    EXPECT_EQ(strokes[0], (SkinRect{10, 4, 1, 3}));
    EXPECT_EQ(strokes[3], (SkinRect{7, 7, 1, 3}));
    EXPECT_EQ(strokes[6], (SkinRect{4, 4, 1, 3}));
}

TEST(ListCellTest, ProgressAndHeaderStates) {
    EXPECT_EQ(ListProgressWidth(200, 0), 0);
    EXPECT_EQ(ListProgressWidth(200, 50), 100);
    EXPECT_EQ(ListProgressWidth(200, 250), 200);
    EXPECT_EQ(NextHeaderCheckState(1, 3), 2);
    EXPECT_EQ(NextHeaderCheckState(1, 0), 1) << "an empty list keeps its header unchecked";
    EXPECT_EQ(NextHeaderCheckState(2, 3), 1);
}

}  // namespace
}  // namespace ac
