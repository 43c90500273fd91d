// A set's records as ctt options. A parameter at its default is left out, so "Auto" and friends
// never reach the tool and the tool's own defaults apply.
#include "platform/CommandLine.h"
#include "profile/Duration.h"
#include "profile/ParameterSet.h"
#include "profile/TextUtil.h"

#include <charconv>

namespace ac {
namespace {


bool IsDigit(char c) { return c >= '0' && c <= '9'; }

bool IsOn(std::string_view value) { return EqualsNoCase(value, "true") || EqualsNoCase(value, "yes"); }

// One or two digits up to `limit`, then `separator` unless it is 0.
bool ReadClockField(std::string_view& text, int limit, char separator, std::int64_t& out) {
    std::size_t digits = 0;
    int value = 0;
    while (digits < text.size() && digits < 2 && IsDigit(text[digits])) {
        value = value * 10 + (text[digits] - '0');
        ++digits;
    }
    if (digits == 0 || value > limit) return false;
    if (separator != '\0' && (digits >= text.size() || text[digits] != separator)) return false;
    out = value;
    text.remove_prefix(digits + (separator != '\0' ? 1 : 0));
    return true;
}

// Frame sizes as the grid lists them: "352x288 (cif)", or one of the names alone.
FrameSize ParseFrameSize(std::string_view value) {
    static constexpr struct {
        std::string_view name;
        FrameSize size;
    } kNamed[] = {{"sqcif", {128, 96}},  {"qcif", {176, 144}}, {"cif", {352, 288}},
                  {"4cif", {704, 576}},  {"qvga", {320, 240}}, {"vga", {640, 480}},
                  {"svga", {800, 600}}, {"pal", {720, 576}},  {"ntsc", {720, 480}}};
    value = TrimBlanks(value);
    FrameSize size;
    const char* end = value.data() + value.size();
    auto [afterWidth, widthError] = std::from_chars(value.data(), end, size.width);
    if (widthError == std::errc() && afterWidth != end && (*afterWidth == 'x' || *afterWidth == 'X')) {
        auto [afterHeight, heightError] = std::from_chars(afterWidth + 1, end, size.height);
        if (heightError == std::errc()) return size;
    }
    for (const auto& named : kNamed) {
        if (EqualsNoCase(value, named.name)) return named.size;
    }
    return {};
}

}  // namespace

std::int64_t ParseDuration(std::string_view text) {
    bool negative = false;
    if (!text.empty() && text.front() == '-') {
        negative = true;
        text.remove_prefix(1);
    }
    std::int64_t seconds = 0;
    std::string_view clock = text;
    std::int64_t hours = 0;
    std::int64_t minutes = 0;
    std::int64_t secs = 0;
    if (ReadClockField(clock, 23, ':', hours) && ReadClockField(clock, 59, ':', minutes) &&
        ReadClockField(clock, 59, '\0', secs)) {
        seconds = hours * 3600 + minutes * 60 + secs;
        text = clock;
    } else {
        // Plain seconds; saturate rather than wrap on absurd digit runs.
        std::size_t digits = 0;
        while (digits < text.size() && IsDigit(text[digits])) {
            if (seconds < INT64_MAX / 10'000'000) seconds = seconds * 10 + (text[digits] - '0');
            ++digits;
        }
        text.remove_prefix(digits);
    }
    std::int64_t micros = 0;
    if (!text.empty() && text.front() == '.') {
        text.remove_prefix(1);
        std::int64_t scale = 100000;
        for (std::size_t i = 0; i < text.size() && i < 6 && IsDigit(text[i]); ++i) {
            micros += (text[i] - '0') * scale;
            scale /= 10;
        }
    }
    const std::int64_t total = seconds * 1'000'000 + micros;
    return negative ? -total : total;
}

std::string ParameterSet::BuildCommandLine() {
    std::string text;
    bool tagsPresent = false;
    bool id3v1 = false;
    bool id3v2 = false;
    for (std::size_t index = 0; index < m_records.size(); ++index) {
        const ParameterRecord& record = m_records[index];
        if (EqualsNoCase(record.name, "vol_factor")) continue;  // the job passes -vol itself
        const std::uint32_t flags = TestParameterFlags(record.name, ~0u);
        const bool keepCase = (flags & PARAM_KEEP_CASE) != 0;

        if (!record.value.empty() && !(flags & PARAM_NOT_PASSED)) {
            if (flags & PARAM_TAG) tagsPresent = true;
            if (flags & PARAM_SWITCH) {
                if (IsOn(record.value)) {
                    if (record.name == "id3v1") {
                        id3v1 = true;
                    } else if (record.name == "id3v2") {
                        id3v2 = true;
                    } else {
                        text += '-';
                        text += record.name;
                    }
                }
            } else {
                if (record.name == "ss") m_startTime = ParseDuration(record.value);
                if (record.name == "t") m_duration = ParseDuration(record.value);
                if (record.name == "s") {
                    m_frameSize = ParseFrameSize(record.value);
                    continue;
                }
                if (record.name == "outfilename") {
                    m_outputFileName = record.value;
                    continue;
                }
                const bool atDefault = keepCase ? record.value == record.defaultValue
                                                : EqualsNoCase(record.value, record.defaultValue);
                if (!atDefault) {
                    std::string value(TrimBlanks(record.value));
                    if (!keepCase)
                        for (char& c : value) c = AsciiLower(c);
                    text += '-';
                    text += record.name;
                    text += ' ';
                    text += platform::QuoteCommandValue(value);
                    text += ' ';
                }
            }
        }
        if (!text.empty() && index + 1 < m_records.size()) text += ' ';
    }
    if (tagsPresent) {
        if (id3v1) text += "-id3v1 ";
        if (id3v2) text += "-id3v2 ";
    }
    return text;
}

}  // namespace ac
