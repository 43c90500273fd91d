#pragma once
// The conversion list's rules that need no window: names shown for a source, the folder
// filter of Add Folder, the file dialog's filter, the volume text that Configure To All hands
// on, the Target column's text and the output folder's trimming.
//
// Thread contract: any thread; no shared state.

#include <cstdint>
#include <functional>
#include <string>
#include <string_view>

namespace ac {

// The name behind the last separator ('/' or '\'), up to its last dot. A name without a dot,
// or whose dot and tail are longer than 5 characters ("track.backup"), is kept whole.
std::string GetDisplayName(std::string_view path);

// The text behind the last dot; the whole path when it has no dot.
std::string GetExtension(std::string_view path);

// True for a folder entry that Add Folder takes: a dotted name whose extension is one of the
// media types the list knows, in any case.
bool IsFolderMediaName(std::string_view name);

// A row position of an add: anything outside 0..count means the end.
int ClampAddPosition(int position, int count);

// Configure To All's vol_factor: twice the volume, rounded up to a multiple of 25, as "%d%".
std::string VolumePercentText(int volume);

// The Target column: a profile's short name without a trailing " Format" (any case).
std::string TargetColumnText(std::string_view shortName);

// The output file name a row asks of its profile: the Name column trimmed of dots at both
// ends, a dot and the profile's extension.
std::string RowOutputFileName(std::string_view nameColumn, std::string_view extension);

// The side bar's bit-rate box is meaningless for lossless and raw PCM targets.
bool BitRateAllowedFor(std::string_view extension);

// The output folder as typed, with trailing separators trimmed once it has 4 characters or
// more, so a root stays a root.
std::string TrimOutputDirectory(std::string_view text);

// The file dialog's filter in wx's "label|patterns|label|patterns" form; labels come through
// `text` (a language lookup by id).
// `more` are further extensions (without the dot) for the first, "all supported" entry: what
// the installed FFmpeg reads beyond the fixed list.
std::string OpenDialogFilter(const std::function<std::string(std::uint32_t)>& text,
                             const std::vector<std::string>& more = {});

// Text ids of the filter's labels: the first entry, then one per family, "All Files" last.
inline constexpr std::uint32_t kFilterLabelFirstId = 0xC100;
inline constexpr int kFilterEntryCount = 29;

}  // namespace ac
