#pragma once
// The tally of the burn list: whole minutes and the seconds beyond, each row counted with its
// hours, minutes and seconds and two seconds more for the gap after it. Microseconds don't count.
// On a data disc the same minutes stand for megabytes.
//
// Thread contract: the owner's thread.

#include "medialist/MediaFileInfo.h"

namespace ac::burn {

struct CompilationTally {
    int minutes = 0;
    int seconds = 0;  // 0 to 59

    void Add(const MediaFileInfo& info) {
        minutes += info.hours * 60 + info.minutes;
        seconds += info.seconds + 2;
        minutes += seconds / 60;
        seconds %= 60;
    }
    void Remove(const MediaFileInfo& info) {
        minutes -= info.hours * 60 + info.minutes;
        seconds -= info.seconds + 2;
        // A row of 59 seconds can take more than one minute's worth back.
        while (seconds < 0) {
            seconds += 60;
            minutes -= 1;
        }
    }
    void Clear() { minutes = seconds = 0; }
};

// The capacity gauge's scale for a disc type: marks near, over and the end, and the tick step.
struct CapacityScale {
    int nearMark, overMark, maxMark, tickStep;
};
inline CapacityScale ScaleForDisc(bool audio) {
    return audio ? CapacityScale{75, 80, 90, 10} : CapacityScale{665, 690, 715, 65};
}

}  // namespace ac::burn
