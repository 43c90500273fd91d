#pragma once
// Noticing discs come and go without a window: the rip panel's three detection flags and its
// once-a-second poll of every drive, and the walk that finds the first drive with an audio disc.
// The panel owns one DriveWatcher, runs PollDrives on its worker and LoadFirstDisc when its
// one-shot load timer fires, and does what the answers say on its window's thread.
//
//   disc seen  disc loaded  meaning                         what moves it
//   clear      clear        no disc known                   a poll finds a disc: start the load
//                                                           timer, set disc seen
//   set        clear        disc found, load pending        LoadFirstDisc: disc loaded set
//   set        set          disc in the list                the selected drive is empty: disc
//                                                           seen clears
//   clear      set          disc gone, others not yet known a poll that finds every drive empty
//                                                           clears disc loaded
//
// Thread contract: the flags are atomic, so PollDrives (worker) and LoadFirstDisc and
// SkipNextPoll (window's thread) may run at once. The IDiscDevice must allow that too.

#include "platform/DiscDevice.h"

#include <atomic>
#include <cstdint>
#include <string>
#include <vector>

namespace ac {

// The first drive, in list order, whose table is an audio disc: its index, with its table in
// `table`; -1 and an empty table when there is none.
int FindFirstAudioDisc(platform::IDiscDevice& device, const std::vector<std::string>& drives,
                       platform::DiscTable& table);

class DriveWatcher {
public:
    struct PollResult {
        bool disableRipButtons = false;  // the list is empty: Rip and CDDB have nothing to act on
        bool skipped = false;            // a drive was just loaded by hand; nothing was read
        bool startLoadTimer = false;     // a new disc: load the first one in a second
        bool emptySelected = false;      // the selected drive has no disc: empty record and list
        // The disc id of what the selected drive holds now (kNoDiscId for none): a disc swapped
        // between two polls shows as another id, and the panel loads it.
        std::uint32_t selectedDiscId = 0xFFFFFFFF;
    };

    // One poll. selected: the index of the current drive in `drives`, -1 for none.
    PollResult PollDrives(platform::IDiscDevice& device, const std::vector<std::string>& drives,
                          int selected, bool listEmpty);

    struct FirstDisc {
        int driveIndex = -1;  // -1: no drive holds an audio disc
        platform::DiscTable table;
    };
    // The load timer's tick: finds the disc to load and marks the disc loaded, found or not (a
    // poll that then finds nothing clears it again).
    FirstDisc LoadFirstDisc(platform::IDiscDevice& device, const std::vector<std::string>& drives);

    // A drive loaded by hand: the next poll must not undo it.
    void SkipNextPoll() { m_skipNextPoll = true; }
    // The list was filled by hand (a drive chosen, an image added): a disc is loaded, so no
    // later poll may load "the first disc" over it and wipe what the user typed meanwhile.
    void MarkLoaded() {
        m_discLoaded = true;
        m_discSeen = true;
    }

    bool DiscSeen() const { return m_discSeen; }
    bool DiscLoaded() const { return m_discLoaded; }

private:
    std::atomic<bool> m_discSeen{false};
    std::atomic<bool> m_discLoaded{false};
    std::atomic<bool> m_skipNextPoll{false};
};

}  // namespace ac
