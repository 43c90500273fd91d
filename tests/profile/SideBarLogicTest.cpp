// Where the side bar's simple controls stand for a value, what their labels read, what a moved
// control or a rip row writes into the sets, and the plan the grid is rebuilt from.
#include "profile/SideBarLogic.h"

#include <gtest/gtest.h>

#include <algorithm>

namespace {

// A set made of records directly, as a row's set would be after loading.
class FakeSet : public ac::ParameterSet {
public:
    // Names are literals, as table keys are: a record keeps only a view of its name.
    FakeSet& Add(std::string_view name, std::string value, std::uint32_t flags = 0,
                 ac::ValueList values = {}) {
        m_records.push_back({name, flags, "", std::move(value), values});
        return *this;
    }
    std::string GetName() const override { return "fake"; }
    std::string GetFormat() const override { return "mp3"; }
    std::string GetExtName() const override { return "mp3"; }
    std::unique_ptr<ac::ParameterSet> Clone() const override { return nullptr; }
};

const ac::GridItemPlan* FindItem(const std::vector<ac::GridItemPlan>& items,
                                 const std::string& key) {
    const auto found = std::find_if(items.begin(), items.end(),
                                    [&](const ac::GridItemPlan& item) { return item.key == key; });
    return found == items.end() ? nullptr : &*found;
}

TEST(SimpleControls, BitRateAutoSitsAt192WithABlankBehindTheLabel) {
    EXPECT_EQ(ac::BitRatePosition("Auto"), 10);
    EXPECT_EQ(ac::BitRatePosition("auto"), 10);
    EXPECT_EQ(ac::BitRateLabel("Auto"), "Bit Rate: Auto ");
    EXPECT_EQ(ac::BitRateLabel("128"), "Bit Rate: 128 kb/s");
    EXPECT_EQ(ac::BitRatePosition("128"), 8);
    EXPECT_EQ(ac::BitRatePosition("32 kbit"), 0);
    // Not in the table, or no common value: the last position, and the label shows no number.
    EXPECT_EQ(ac::BitRatePosition("100"), 13);
    EXPECT_EQ(ac::BitRatePosition(""), 13);
    EXPECT_EQ(ac::BitRateLabel(""), "Bit Rate:  kb/s");
}

TEST(SimpleControls, FreeTypedSampleRateGoesToTheEndAndKeepsItsText) {
    EXPECT_EQ(ac::SampleRatePosition("8000"), 3);
    EXPECT_EQ(ac::SampleRateLabel("8000"), "Sample Rate: 8000 Hz");
    EXPECT_EQ(ac::SampleRatePosition("Auto"), 2);
    EXPECT_EQ(ac::SampleRatePosition("22050"), 0);
    EXPECT_EQ(ac::SampleRatePosition("48000"), 3);
}

TEST(SimpleControls, VolumeLabelShowsTheValueAsItStands) {
    // The format's lone % prints nothing: the slider's value brings its sign, a typed one not.
    EXPECT_EQ(ac::VolumeLabel(ac::VolumeText(5)), "Volume: 150%");
    EXPECT_EQ(ac::VolumeLabel("150"), "Volume: 150");
    EXPECT_EQ(ac::VolumePosition("150"), 5);
    EXPECT_EQ(ac::VolumePosition("100%"), 3);
    EXPECT_EQ(ac::VolumePosition("110%"), 3);  // 4.4 drops its fraction
    EXPECT_EQ(ac::VolumePosition("10%"), 0);
    EXPECT_EQ(ac::VolumePosition("900%"), 7);
    EXPECT_EQ(ac::VolumeText(0), "25%");
    EXPECT_EQ(ac::VolumeText(7), "200%");
}

TEST(SimpleControls, ChannelsIndexOnlyForTheTwoListTexts) {
    EXPECT_EQ(ac::ChannelsIndex("1 (Mono)"), 0);
    EXPECT_EQ(ac::ChannelsIndex("2 (Stereo)"), 1);
    EXPECT_EQ(ac::ChannelsIndex("2"), -1);
    EXPECT_EQ(ac::ChannelsIndex(""), -1);
    EXPECT_EQ(ac::ChannelsText(0), "1 (Mono)");
    EXPECT_EQ(ac::ChannelsText(1), "2 (Stereo)");
}

TEST(SimpleControls, ApplySimpleValuesWritesOnlyTheKeysASetHas) {
    FakeSet full, partial;
    full.Add("ab", "128").Add("ar", "22050").Add("ac", "1 (Mono)").Add("vol_factor", "50%");
    full.Add("title", "keep");
    partial.Add("ab", "64");
    ac::SimpleValues values;
    values.bitRate = "256";
    values.sampleRate = "";  // an empty text falls back to the start value
    values.volume = "150%";
    std::vector<ac::ParameterSet*> sets{&full, &partial};
    ac::ApplySimpleValues(sets, values);
    EXPECT_EQ(full.GetValue("ab"), "256");
    EXPECT_EQ(full.GetValue("ar"), "44100");
    EXPECT_EQ(full.GetValue("ac"), "2 (Stereo)");
    EXPECT_EQ(full.GetValue("vol_factor"), "150%");
    EXPECT_EQ(full.GetValue("title"), "keep");
    EXPECT_EQ(partial.GetValue("ab"), "256");
    EXPECT_FALSE(partial.HasKey("ar"));
}

TEST(SimpleControls, RipRowEmptiesEveryKeyItDoesNotName) {
    FakeSet set;
    set.Add("acodec", "mp3").Add("ab", "1").Add("ac", "1").Add("vol_factor", "1");
    set.Add("t", "1").Add("ss", "1").Add("title", "x");
    ac::RipRowValues row;
    row.codec = "vorbis";
    row.bitRate = 160;
    row.channels = 1;
    row.length = -1;
    std::vector<ac::ParameterSet*> sets{&set};
    ac::ApplyRipRow(sets, row);
    EXPECT_EQ(set.GetValue("acodec"), "vorbis");
    EXPECT_EQ(set.GetValue("ab"), "160");
    EXPECT_EQ(set.GetValue("ac"), "1 (Mono)");
    EXPECT_EQ(set.GetValue("vol_factor"), "100%");
    EXPECT_EQ(set.GetValue("t"), "Full");
    EXPECT_EQ(set.GetValue("ss"), "00:00:00");
    EXPECT_EQ(set.GetValue("title"), "");
    row.length = 90;
    row.start = 12;
    row.volumePercent = "75";
    ac::ApplyRipRow(sets, row);
    EXPECT_EQ(set.GetValue("t"), "90");
    EXPECT_EQ(set.GetValue("ss"), "12");
    EXPECT_EQ(set.GetValue("vol_factor"), "75%");
}

class GridPlan : public ::testing::Test {
protected:
    std::vector<ac::ParameterSet*> Both() { return {&m_a, &m_b}; }
    FakeSet m_a, m_b;
};

TEST_F(GridPlan, DifferingValuesShowEmptyAndAMissingKeyIsLeftOut) {
    m_a.Add("ab", "128").Add("ar", "44100").Add("title", "x");
    m_b.Add("ab", "192").Add("ar", "44100");
    const auto items = ac::PlanGridItems(Both(), false, false);
    ASSERT_NE(FindItem(items, "ab"), nullptr);
    EXPECT_EQ(FindItem(items, "ab")->value, "");
    EXPECT_EQ(FindItem(items, "ar")->value, "44100");
    EXPECT_EQ(FindItem(items, "title"), nullptr);
    // The sets themselves keep what they had.
    EXPECT_EQ(m_a.GetValue("ab"), "128");
    EXPECT_EQ(m_b.GetValue("ab"), "192");
}

TEST_F(GridPlan, ReadOnlyInOneSetDisablesTheItemForAll) {
    m_a.Add("acodec", "mp3", ac::PARAM_READONLY).Add("ab", "128");
    m_b.Add("acodec", "mp3").Add("ab", "128");
    const auto items = ac::PlanGridItems(Both(), false, false);
    EXPECT_FALSE(FindItem(items, "acodec")->enabled);
    EXPECT_TRUE(FindItem(items, "ab")->enabled);
    // The current profile shown without rows: everything disabled.
    for (const auto& item : ac::PlanGridItems(Both(), false, true))
        EXPECT_FALSE(item.enabled);
}

TEST_F(GridPlan, RipModeHidesGeneralAndSummaryKeys) {
    for (const char* key : {"t", "ss", "outfilename", "timestamp", "itsoffset", "title", "id3v1",
                            "ab", "acodec", "threads"}) {
        m_a.Add(key, "1");
    }
    std::vector<ac::ParameterSet*> sets{&m_a};
    std::vector<std::string> keys;
    for (const auto& item : ac::PlanGridItems(sets, true, false))
        keys.push_back(item.key);
    EXPECT_EQ(keys, (std::vector<std::string>{"threads", "acodec", "ab"}));
    EXPECT_EQ(ac::PlanGridItems(sets, false, false).size(), 10u);
}

TEST_F(GridPlan, ParentsEditorsAndOptionsFollowTheTable) {
    m_a.Add("croptop", "0").Add("padcolor", "000000").Add("b", "Auto").Add("threads", "1");
    m_a.Add("hq", "").Add("standard", "Auto").Add("title", "").Add("id3v1", "");
    m_a.Add("ab", "128", 0, ac::GetParameterValueList("ab"));
    m_a.Add("deinterlace", "");
    std::vector<ac::ParameterSet*> sets{&m_a};
    const auto items = ac::PlanGridItems(sets, false, false);
    using C = ac::GridCategory;
    using E = ac::GridEditorKind;
    EXPECT_EQ(FindItem(items, "croptop")->parent, C::Crop);
    EXPECT_EQ(FindItem(items, "padcolor")->parent, C::Pad);
    EXPECT_EQ(FindItem(items, "b")->parent, C::Video);
    EXPECT_EQ(FindItem(items, "threads")->parent, C::Expert);
    EXPECT_EQ(FindItem(items, "deinterlace")->parent, C::Expert);  // expert wins over video
    EXPECT_EQ(FindItem(items, "hq")->parent, C::General);          // no category flag
    EXPECT_EQ(FindItem(items, "id3v1")->parent, C::Summary);
    EXPECT_TRUE(FindItem(items, "hq")->boolean);
    EXPECT_EQ(FindItem(items, "hq")->editor, E::List);
    EXPECT_EQ(FindItem(items, "standard")->editor, E::List);
    EXPECT_EQ(FindItem(items, "ab")->editor, E::EditList);
    EXPECT_EQ(FindItem(items, "title")->editor, E::Edit);
    EXPECT_EQ(FindItem(items, "ab")->options.size(), 14u);
    EXPECT_EQ(FindItem(items, "ab")->options.front(), "32");
    EXPECT_EQ(FindItem(items, "ab")->id, ac::FindParameterIndex("ab"));
}

}  // namespace
