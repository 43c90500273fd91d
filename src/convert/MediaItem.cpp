#include "convert/MediaItem.h"

#include <algorithm>
#include <cmath>

namespace ac {

MediaItem::~MediaItem() {
    CEncodeProcess* child = process.exchange(nullptr);
    if (!child) return;
    child->ClearCallback();
    delete child;  // kills with 65535 and joins its threads
}

void MediaItem::AdoptProcess(std::unique_ptr<CEncodeProcess> child) {
    CEncodeProcess* old = process.exchange(child.release());
    if (old) {
        old->ClearCallback();
        delete old;
    }
}

double EffectiveDurationSeconds(const MediaFileInfo& info, std::int64_t durationUs,
                                std::int64_t startTimeUs) {
    double total = info.hours * 3600.0 + info.minutes * 60.0 + info.seconds +
                   info.microseconds * 1e-6;
    // Whole seconds on purpose: a cut of 90.7 s converts 90 s of progress.
    auto cut = static_cast<double>(durationUs / 1000000);
    auto start = static_cast<double>(startTimeUs / 1000000);
    if (cut == 0) return total;
    if (start > total) return total;
    return std::min(total - start, cut);
}

double GetEffectiveDuration(const MediaItem& item) {
    if (!item.parameters) return EffectiveDurationSeconds(item.info, 0, 0);
    return EffectiveDurationSeconds(item.info, item.parameters->GetDuration(),
                                    item.parameters->GetStartTime());
}

int ProgressPercent(const MediaItem& item) {
    const CEncodeProcess* child = item.process.load();
    double duration = GetEffectiveDuration(item);
    if (!child || duration <= 0) return 0;
    double percent = child->TimeSeconds() / duration * 100.0;
    if (!std::isfinite(percent) || std::fabs(percent) > 1e9) return 0;
    return static_cast<int>(std::trunc(percent));
}

JobStatus StatusForExitCode(int exitCode) {
    if (exitCode == 0) return JobStatus::Completed;
    if (exitCode == 65535) return JobStatus::Aborted;
    return JobStatus::Failed;
}

std::uint32_t StatusTextId(JobStatus status) {
    switch (status) {
    case JobStatus::Failed: return 123;
    case JobStatus::Running: return 103;
    case JobStatus::Waiting: return 104;
    case JobStatus::Paused: return 105;
    case JobStatus::Pending: return 121;
    case JobStatus::Completed: return 122;
    case JobStatus::Aborted:
    case JobStatus::AbortedSuspended: return 124;
    case JobStatus::UnknownFile: return 125;
    default: return 0;
    }
}

}  // namespace ac
