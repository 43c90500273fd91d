#include "rip/DriveWatcher.h"

#include "rip/TrackTable.h"

namespace ac {

namespace {

// A drive that cannot be opened or read is an empty drive.
bool HoldsAudioDisc(platform::IDiscDevice& device, const std::string& drive,
                    platform::DiscTable& table) {
    return device.ReadToc(drive, table) && IsAudioDisc(table);
}

}  // namespace

int FindFirstAudioDisc(platform::IDiscDevice& device, const std::vector<std::string>& drives,
                       platform::DiscTable& table) {
    for (size_t i = 0; i < drives.size(); ++i) {
        if (HoldsAudioDisc(device, drives[i], table)) {
            return static_cast<int>(i);
        }
    }
    table = platform::DiscTable{};
    return -1;
}

DriveWatcher::PollResult DriveWatcher::PollDrives(platform::IDiscDevice& device,
                                                  const std::vector<std::string>& drives,
                                                  int selected, bool listEmpty) {
    PollResult result;
    result.disableRipButtons = listEmpty;
    if (m_skipNextPoll.exchange(false)) {
        result.skipped = true;
        return result;
    }
    bool selectedRead = false;
    bool found = false;
    for (size_t i = 0; i < drives.size(); ++i) {
        platform::DiscTable table;
        const bool disc = HoldsAudioDisc(device, drives[i], table);
        if (static_cast<int>(i) == selected) {
            selectedRead = true;
            result.selectedDiscId = disc ? DiscIdOf(table) : kNoDiscId;
        }
        if (disc) {
            if (!m_discSeen && !m_discLoaded) {
                result.startLoadTimer = true;
            }
            m_discSeen = true;
            found = true;
            break;
        }
        if (static_cast<int>(i) == selected) {
            result.emptySelected = true;
            m_discSeen = false;
        }
    }
    // The walk ends at the first drive with a disc; the selected drive behind it is read on its
    // own, so its list empties when its disc goes and follows a disc swapped in its place.
    if (!selectedRead && selected >= 0 && selected < static_cast<int>(drives.size())) {
        platform::DiscTable table;
        if (HoldsAudioDisc(device, drives[std::size_t(selected)], table)) {
            result.selectedDiscId = DiscIdOf(table);
        } else {
            result.emptySelected = true;
        }
        return result;
    }
    if (!found) {
        m_discLoaded = false;
    }
    return result;
}

DriveWatcher::FirstDisc DriveWatcher::LoadFirstDisc(platform::IDiscDevice& device,
                                                    const std::vector<std::string>& drives) {
    FirstDisc first;
    first.driveIndex = FindFirstAudioDisc(device, drives, first.table);
    m_discLoaded = true;
    return first;
}

}  // namespace ac
