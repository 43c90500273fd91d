#include "cddb/DiscToc.h"

#include <cstdio>

namespace cddb {

TocPosition TocPosition::FromFrames(int frames) {
  if (frames < 0) frames = 0;
  return TocPosition{frames / kFramesPerSecond / 60, frames / kFramesPerSecond % 60, frames % kFramesPerSecond};
}

static int DigitSum(int n) {
  int sum = 0;
  for (; n > 0; n /= 10) sum += n % 10;
  return sum;
}

uint32_t ComputeDiscId(const DiscToc& toc) {
  const int tracks = TrackCount(toc);
  if (tracks <= 0) return 0;
  uint32_t digits = 0;
  for (int i = 0; i < tracks; ++i) digits += static_cast<uint32_t>(DigitSum(toc[i].Seconds()));
  const auto length = static_cast<uint32_t>(DiscLengthSeconds(toc));
  return ((digits % 255) << 24) | (length << 8) | static_cast<uint32_t>(tracks & 0xFF);
}

int DiscLengthSeconds(const DiscToc& toc) {
  if (toc.size() < 2) return 0;
  return toc.back().Seconds() - toc.front().Seconds();
}

std::string QueryFields(const DiscToc& toc) {
  const int tracks = TrackCount(toc);
  char head[32];
  std::snprintf(head, sizeof head, "%08x+%d", ComputeDiscId(toc), tracks);
  std::string text = head;
  for (int i = 0; i < tracks; ++i) text += "+" + std::to_string(toc[i].Frames());
  text += "+" + std::to_string(DiscLengthSeconds(toc));
  return text;
}

}  // namespace cddb
