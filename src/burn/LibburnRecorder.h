#pragma once
// A real recorder through libburn. Each operation grabs the drive for its own time and
// releases it, so the recorder poll and a write never hold it at once from two places, and a
// drive the program is not using stays free for other programs.
//
// Thread contract: as ICdRecorder. AbortWrite may come from any thread during Burn.

#include "burn/Recorder.h"

#include <atomic>
#include <mutex>
#include <string>

namespace ac::burn {

class DiscTree;

class LibburnRecorder : public ICdRecorder {
public:
    LibburnRecorder(std::string address, std::string name);

    std::string Name() const override { return m_name; }
    std::string DriveText() const override { return m_address; }

    int MediaType() override;
    bool Capacity(std::int64_t& totalBlocks, std::int64_t& freeBlocks) override;
    bool ReadDiskInfo(DiskInfoBlock& info) override;
    std::vector<int> WriteSpeeds() override;
    bool CanErase() override;
    bool Erase(bool quick) override;
    void Eject() override;
    bool WaitReady(int milliseconds) override;
    void PreventRemoval(bool) override {}  // libburn keeps the tray locked while it writes
    void AbortWrite() override { m_abort = true; }
    bool Burn(const BurnJob& job, IBurnEvents& events) override;

private:
    std::string m_address;
    std::string m_name;
    std::mutex m_driveMutex;  // one grab at a time
    std::atomic<bool> m_abort{false};
};

// Writes the tree as one ISO 9660 session on a libburn drive ("/dev/sr0", or "stdio:PATH" for a
// file). Blocks; reports through events; `abort` or a non-zero poll answer cancels the write.
bool WriteDataThroughLibburn(const std::string& address, const DiscTree& tree, int speed,
                             IBurnEvents& events, std::atomic<bool>& abort, std::string& reason);

}  // namespace ac::burn
