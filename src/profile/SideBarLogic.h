#pragma once
// What the side bar decides without a window: where the four simple controls stand for a set's
// values and what their labels read, what a moved control writes into the sets, what a row of
// the rip list puts into them, and which items the parameter grid is built from.
//
// The slider tables are fixed: no rate depends on the codec. What a codec offers is the value
// list of its profile, which only the grid shows.
//
// Thread contract: UI thread only (the sets belong to the rows, written under the hub's edit).

#include "profile/ParameterSet.h"

#include <array>
#include <string>
#include <string_view>
#include <vector>

namespace ac {

inline constexpr std::array<int, 14> kBitRates = {32,  40,  48,  56,  64,  80,  96,
                                                  112, 128, 160, 192, 224, 256, 320};
inline constexpr std::array<int, 4> kSampleRates = {22050, 32000, 44100, 48000};
inline constexpr int kVolumePositions = 8;  // 25% to 200%

inline constexpr int kBitRateStart = 10;
inline constexpr int kSampleRateStart = 2;
inline constexpr int kVolumeStart = 3;
inline constexpr int kChannelsStart = 1;

// The number at the start of a text ("128 kb/s" gives 128, "Auto" 0).
int LeadingNumber(std::string_view text);

// Slider positions for a value text. "Auto" counts as 192 and 44100; a rate outside the table
// takes the last position.
int BitRatePosition(std::string_view value);
int SampleRatePosition(std::string_view value);
// Number / 25 - 1, kept inside the slider.
int VolumePosition(std::string_view value);
// 0 "1 (Mono)", 1 "2 (Stereo)", -1 for anything else.
int ChannelsIndex(std::string_view value);

// Texts a moved control writes: "192", "44100", "150%", "2 (Stereo)".
std::string BitRateText(int position);
std::string SampleRateText(int position);
std::string VolumeText(int position);
std::string ChannelsText(int index);

// Labels from the value as it stands ("Bit Rate: 128 kb/s", "Bit Rate: Auto ",
// "Sample Rate: 8000 Hz", "Volume: 150%").
std::string BitRateLabel(std::string_view value);
std::string SampleRateLabel(std::string_view value);
std::string VolumeLabel(std::string_view value);

// The panel's last values of the simple controls.
struct SimpleValues {
    std::string bitRate = "192";
    std::string sampleRate = "44100";
    std::string channels = "2 (Stereo)";
    std::string volume = "100%";
};
// Every record ab, ar, ac, vol_factor of every set takes the panel's text (an empty one its
// start value).
void ApplySimpleValues(SetList sets, const SimpleValues& values);

// One row of the rip list as the grid takes it.
struct RipRowValues {
    std::string codec;
    int bitRate = 0;
    int sampleRate = 0;
    int channels = 2;
    std::string volumePercent;  // digits only; empty counts as 100
    long long length = -1;      // -1: the whole track
    long long start = 0;
};
// Every record of every set takes the row's value for its key, and every other key empty text.
void ApplyRipRow(SetList sets, const RipRowValues& row);

// ---- The grid's rebuild, as data ----
enum class GridCategory { General, Video, Audio, Summary, Expert, Crop, Pad };
inline constexpr int kCategoryIds[] = {600, 601, 602, 603, 604, 500, 501};
enum class GridEditorKind { Edit, List, EditList };

struct GridItemPlan {
    int id = 0;  // the key's row in the parameter table
    std::string key;
    GridCategory parent = GridCategory::General;
    GridEditorKind editor = GridEditorKind::Edit;
    bool boolean = false;
    std::string value;
    std::vector<std::string> options;
    bool enabled = true;
};

// Items in table order for the keys every set has; the rip mode leaves out General and Summary
// keys. `disableAll` disables every item (the grid shows the current profile, no row).
std::vector<GridItemPlan> PlanGridItems(SetList sets, bool ripMode, bool disableAll);
GridCategory ParentOfKey(std::string_view key);
// The category rows in the order they are made, and their texts.
std::uint32_t CategoryLabelId(GridCategory category);
std::uint32_t CategoryHelpId(GridCategory category);

}  // namespace ac
