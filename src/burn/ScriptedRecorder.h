#pragma once
// A recorder whose disc is described by a small text file, for the window tests of the waiting
// and erasing dialogs: the test changes the disc by rewriting the file, and reads what the
// program did to the recorder (eject, erase, writes) from the log beside it. Listed only when
// the environment variable AC_FAKE_RECORDER names the file; writes go to the image recorder.
//
//   media=10        (MediaType: 0 none, 8 CD-ROM, 9 CD-R, 10 CD-RW; -1 a failed read)
//   state=2         (0 blank, 2 complete)
//   free=300000     (free 2048-byte blocks; -1 a failed read)
//   erasable=1
//   name=FAKE RW
//
// Thread contract: as ICdRecorder; the file is read afresh by every call.

#include "burn/ImageRecorder.h"

#include <map>
#include <mutex>
#include <string>

namespace ac::burn {

class ScriptedRecorder : public ImageRecorder {
public:
    explicit ScriptedRecorder(std::string stateFile);

    std::string Name() const override;
    std::string DriveText() const override { return "fake0"; }
    bool IsImage() const override { return false; }
    std::string UnavailableReason() override { return {}; }
    int MediaType() override;
    bool Capacity(std::int64_t& totalBlocks, std::int64_t& freeBlocks) override;
    bool ReadDiskInfo(DiskInfoBlock& info) override;
    std::vector<int> WriteSpeeds() override { return {7056, 4234, 1764}; }
    bool CanErase() override;
    bool Erase(bool quick) override;
    void Eject() override;
    bool WaitReady(int) override { return true; }
    void BeforeWrite() override { Log("before"); }
    void AfterWrite() override { Log("after"); }

private:
    std::map<std::string, std::string> Read() const;
    int Value(const char* key, int fallback) const;
    void Log(const std::string& line);

    std::string m_stateFile;
    std::mutex m_logMutex;
};

}  // namespace ac::burn
