#pragma once
// A disc's table of contents as CDDB sees it, and the disc id computed from it. Pure values: no
// device, no network. Any thread.

#include <cstdint>
#include <string>
#include <vector>

namespace cddb {

inline constexpr int kFramesPerSecond = 75;
// The 2-second lead-in before track 1 of an ordinary disc: absolute positions include it.
inline constexpr int kLeadInFrames = 150;

// One absolute disc position in minutes, seconds and frames (75 to the second), lead-in included.
struct TocPosition {
  int minute = 0;
  int second = 0;
  int frame = 0;

  int Seconds() const { return minute * 60 + second; }
  int Frames() const { return Seconds() * kFramesPerSecond + frame; }
  static TocPosition FromFrames(int frames);
  bool operator==(const TocPosition&) const = default;
};

// Entry i is the start of track i+1; the last entry is the lead-out, so a disc of n tracks has
// n + 1 entries. Empty means the table could not be read.
using DiscToc = std::vector<TocPosition>;

inline int TrackCount(const DiscToc& toc) { return toc.empty() ? 0 : static_cast<int>(toc.size()) - 1; }

// The standard CDDB disc id; 0 for a table with no track.
uint32_t ComputeDiscId(const DiscToc& toc);

// Length in whole seconds from track 1 to the lead-out, the last field of a query.
int DiscLengthSeconds(const DiscToc& toc);

// The four query fields "%08x+%d+OFFSETS+%d": the id, the track count, every track's frame
// offset joined by '+', the length in seconds. It is also the record of the batch file.
std::string QueryFields(const DiscToc& toc);

}  // namespace cddb
