// The job around a set's options: input, volume, container and the per-format quirks that
// ctt has always needed.
#include "convert/CommandLine.h"

#include "platform/CommandLine.h"
#include "profile/ParameterSet.h"
#include "profile/TextUtil.h"

#include <cmath>

namespace ac {
namespace {

bool EndsWithNoCase(std::string_view text, std::string_view tail) {
    return text.size() >= tail.size() && EqualsNoCase(text.substr(text.size() - tail.size()), tail);
}

void ReplaceAll(std::string& text, std::string_view from, std::string_view to) {
    for (std::size_t at = text.find(from); at != std::string::npos; at = text.find(from, at + to.size())) {
        text.replace(at, from.size(), to);
    }
}

// The source's file name without folder and extension; cue track paths and Windows-style names
// keep working because both separators count.
std::string SourceTitle(std::string_view source) {
    const std::size_t slash = source.find_last_of("/\\");
    if (slash != std::string_view::npos) source.remove_prefix(slash + 1);
    const std::size_t dot = source.rfind('.');
    if (dot != std::string_view::npos) source = source.substr(0, dot);
    return std::string(source);
}

enum class JobKind { Conversion, Burn };

std::string BuildJobText(std::string_view source, std::string_view output, std::int32_t volume,
                         ParameterSet& parameters, JobKind kind) {
    std::string text = " -relk -y ";
    text += " -i ";
    text += platform::QuoteCommandValue(source);
    text += ' ';
    text += parameters.BuildCommandLine();
    // ctt picks the FLAC encoder through the container, not through a codec option.
    if (kind == JobKind::Conversion && EndsWithNoCase(output, "flac")) ReplaceAll(text, "-acodec", "-f");
    text += " -vol  " + std::to_string(VolumeToGain(volume)) + "  ";

    const std::string format = parameters.GetFormat();
    const std::string extension = parameters.GetExtName();
    if (format != extension) text += " -f " + format + " ";
    if (kind == JobKind::Burn) {
        text += " -vn ";
    } else {
        if (EqualsNoCase(extension, "aac")) text += " -ac " + platform::QuoteCommandValue(parameters.GetValue("ac"));
        if (EqualsNoCase(extension, "wma") || EqualsNoCase(extension, "m4a") ||
            EqualsNoCase(extension, "mp4")) {
            text += " -vn ";
        }
        if (format == "psp" && parameters.GetValue("title").empty()) {
            parameters.SetValue("title", SourceTitle(source));
        }
    }
    text += ' ';
    text += platform::QuoteCommandValue(output);
    return text;
}

}  // namespace

std::int32_t VolumeToGain(std::int32_t volume) {
    return static_cast<std::int32_t>(std::floor(std::pow(2.0, (volume - 50) * 0.02) * 256 + 0.5));
}

std::string BuildConversionCommandText(std::string_view source, std::string_view output,
                                       std::int32_t volume, ParameterSet& parameters) {
    return BuildJobText(source, output, volume, parameters, JobKind::Conversion);
}

std::string BuildBurnCommandText(std::string_view source, std::string_view output,
                                 std::int32_t volume, ParameterSet& parameters) {
    return BuildJobText(source, output, volume, parameters, JobKind::Burn);
}

}  // namespace ac
