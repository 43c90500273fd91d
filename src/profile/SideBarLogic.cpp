#include "profile/SideBarLogic.h"

#include "profile/TextUtil.h"
#include "resources/Language.h"
#include "resources/TextFormat.h"

#include <algorithm>
#include <cstdint>

namespace ac {

namespace {

constexpr std::uint32_t kBitRateFormat = 0xC140;
constexpr std::uint32_t kAutoBitRateFormat = 0xC141;
constexpr std::uint32_t kSampleRateFormat = 0xC142;
constexpr std::uint32_t kVolumeFormat = 0xC143;
constexpr std::uint32_t kBitRateName = 350;
constexpr std::uint32_t kSampleRateName = 351;
constexpr std::uint32_t kVolumeName = 183;
constexpr std::uint32_t kMonoText = 142;
constexpr std::uint32_t kStereoText = 143;

template <std::size_t N>
int PositionIn(const std::array<int, N>& table, int value) {
    const auto found = std::find(table.begin(), table.end(), value);
    return found == table.end() ? static_cast<int>(N) - 1 : static_cast<int>(found - table.begin());
}

int RateOrAuto(std::string_view value, int autoRate) {
    return EqualsNoCase(TrimBlanks(value), "auto") ? autoRate : LeadingNumber(value);
}

}  // namespace

int LeadingNumber(std::string_view text) {
    text = TrimBlanks(text);
    bool negative = false;
    if (!text.empty() && (text.front() == '-' || text.front() == '+')) {
        negative = text.front() == '-';
        text.remove_prefix(1);
    }
    long long number = 0;
    for (char c : text) {
        if (c < '0' || c > '9')
            break;
        number = std::min(number * 10 + (c - '0'), 0x7FFFFFFFLL);
    }
    return static_cast<int>(negative ? -number : number);
}

int BitRatePosition(std::string_view value) {
    return PositionIn(kBitRates, RateOrAuto(value, 192));
}

int SampleRatePosition(std::string_view value) {
    return PositionIn(kSampleRates, RateOrAuto(value, 44100));
}

int VolumePosition(std::string_view value) {
    return std::clamp(LeadingNumber(value) / 25 - 1, 0, kVolumePositions - 1);
}

int ChannelsIndex(std::string_view value) {
    if (value == "1 (Mono)")
        return 0;
    if (value == "2 (Stereo)")
        return 1;
    return -1;
}

std::string BitRateText(int position) {
    return std::to_string(kBitRates[static_cast<std::size_t>(std::clamp(position, 0, 13))]);
}

std::string SampleRateText(int position) {
    return std::to_string(kSampleRates[static_cast<std::size_t>(std::clamp(position, 0, 3))]);
}

std::string VolumeText(int position) {
    return std::to_string((position + 1) * 25) + "%";
}

std::string ChannelsText(int index) {
    return index == 0 ? "1 (Mono)" : "2 (Stereo)";
}

std::string BitRateLabel(std::string_view value) {
    const bool automatic = EqualsNoCase(value, "auto");
    return FormatText(g_Language.GetString(automatic ? kAutoBitRateFormat : kBitRateFormat),
                      {g_Language.GetString(kBitRateName), value});
}

std::string SampleRateLabel(std::string_view value) {
    return FormatText(g_Language.GetString(kSampleRateFormat),
                      {g_Language.GetString(kSampleRateName), value});
}

std::string VolumeLabel(std::string_view value) {
    std::string format = g_Language.GetString(kVolumeFormat);
    // The format's lone trailing % is no conversion and prints nothing.
    if (format.ends_with('%') && !format.ends_with("%%"))
        format.pop_back();
    return FormatText(format, {g_Language.GetString(kVolumeName), value});
}

void ApplySimpleValues(SetList sets, const SimpleValues& values) {
    const SimpleValues starts;
    auto orStart = [](const std::string& text, const std::string& start) {
        return text.empty() ? start : text;
    };
    for (ParameterSet* set : sets) {
        set->SetValue("ab", orStart(values.bitRate, starts.bitRate));
        set->SetValue("ar", orStart(values.sampleRate, starts.sampleRate));
        set->SetValue("ac", orStart(values.channels, starts.channels));
        set->SetValue("vol_factor", orStart(values.volume, starts.volume));
    }
}

void ApplyRipRow(SetList sets, const RipRowValues& row) {
    for (ParameterSet* set : sets) {
        std::vector<std::string> keys;
        for (const ParameterRecord& record : set->Records())
            keys.emplace_back(record.name);
        for (const std::string& key : keys) {
            std::string value;
            if (key == "acodec") {
                value = row.codec;
            } else if (key == "ab") {
                value = std::to_string(row.bitRate);
            } else if (key == "ar") {
                value = std::to_string(row.sampleRate);
            } else if (key == "ac") {
                value = ChannelsText(row.channels == 1 ? 0 : 1);
            } else if (key == "vol_factor") {
                value = row.volumePercent.empty() ? "100%" : row.volumePercent + "%";
            } else if (key == "t") {
                value = row.length == -1 ? "Full" : std::to_string(row.length);
            } else if (key == "ss") {
                value = row.start != 0 ? std::to_string(row.start) : "00:00:00";
            }
            set->SetValue(key, value);
        }
    }
}

GridCategory ParentOfKey(std::string_view key) {
    for (std::string_view crop : {"croptop", "cropbottom", "cropleft", "cropright"}) {
        if (key == crop)
            return GridCategory::Crop;
    }
    for (std::string_view pad : {"padtop", "padbottom", "padleft", "padright", "padcolor"}) {
        if (key == pad)
            return GridCategory::Pad;
    }
    const std::uint32_t flags = TestParameterFlags(key, 0xFFFFFFFFu);
    if ((flags & PARAM_VIDEO) != 0 && (flags & PARAM_EXPERT) == 0)
        return GridCategory::Video;
    if ((flags & PARAM_AUDIO) != 0)
        return GridCategory::Audio;
    if ((flags & PARAM_GENERAL) != 0)
        return GridCategory::General;
    if ((flags & PARAM_SUMMARY) != 0)
        return GridCategory::Summary;
    if ((flags & PARAM_EXPERT) != 0)
        return GridCategory::Expert;
    return GridCategory::General;
}

std::vector<GridItemPlan> PlanGridItems(SetList sets, bool ripMode, bool disableAll) {
    std::vector<GridItemPlan> items;
    const auto table = ParameterTable();
    for (std::size_t row = 0; row < table.size(); ++row) {
        const ParameterDef& def = table[row];
        if (!AllHaveKey(sets, def.key))
            continue;
        if (ripMode && (def.flags & (PARAM_GENERAL | PARAM_SUMMARY)) != 0)
            continue;
        GridItemPlan item;
        item.id = static_cast<int>(row);
        item.key = def.key;
        item.parent = ParentOfKey(def.key);
        if ((def.flags & PARAM_SWITCH) != 0) {
            item.boolean = true;
            item.editor = GridEditorKind::List;
        } else if ((def.flags & (PARAM_FIXED_LIST | PARAM_HAS_LIST)) != 0) {
            item.editor = (def.flags & PARAM_FIXED_LIST) != 0 ? GridEditorKind::List
                                                              : GridEditorKind::EditList;
            CommonValueList(sets, def.key, item.options);
        }
        item.value = CommonValue(sets, def.key);
        item.enabled = !disableAll && !TestFlagOnSets(sets, def.key, PARAM_READONLY, false);
        items.push_back(std::move(item));
    }
    return items;
}

std::uint32_t CategoryLabelId(GridCategory category) {
    return 0xC080 + 2 * static_cast<std::uint32_t>(category);
}

std::uint32_t CategoryHelpId(GridCategory category) {
    return CategoryLabelId(category) + 1;
}

}  // namespace ac
