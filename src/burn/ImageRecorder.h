#pragma once
// The recorder "Disc image": writes the disc into files instead of onto a disc. An audio disc
// becomes NAME.bin with NAME.cue (libburn refuses audio on a file, so the image is written
// here: every track padded to whole 2352-byte sectors, the pause between tracks as real silence
// marked INDEX 00, which libcdio and other readers take as the gap); a data disc becomes
// NAME.iso through libburn's stdio: drive. The second copy is NAME-2, and so on.
//
// Nothing half-written ever carries a final name: both files are written under hidden
// temporary names and renamed when complete; a stopped or failed write removes them.
//
// Thread contract: as ICdRecorder.

#include "burn/Recorder.h"

#include <atomic>
#include <string>

namespace ac::burn {

class ImageRecorder : public ICdRecorder {
public:
    // base: the image's path without extension; a ".cue", ".bin" or ".iso" given is dropped.
    explicit ImageRecorder(std::string base);

    std::string Name() const override { return "Disc image"; }
    std::string DriveText() const override { return m_base; }
    bool IsImage() const override { return true; }
    std::string UnavailableReason() override;

    int MediaType() override;
    bool Capacity(std::int64_t& totalBlocks, std::int64_t& freeBlocks) override;
    bool ReadDiskInfo(DiskInfoBlock& info) override;
    std::vector<int> WriteSpeeds() override { return {}; }
    bool CanErase() override { return false; }
    bool Erase(bool) override { return false; }
    void Eject() override {}
    bool WaitReady(int) override { return true; }
    void PreventRemoval(bool) override {}
    void AbortWrite() override { m_abort = true; }
    bool Burn(const BurnJob& job, IBurnEvents& events) override;

    // The files a copy goes to, for tests and for the run's last message.
    std::string CopyBase(int copyIndex) const;
    // The files of the last successful write.
    const std::string& LastWritten() const { return m_lastWritten; }

    // An 80-minute CD: what a reader of the image expects a disc to hold at most.
    static constexpr std::int64_t kDiscBlocks = 360000;

private:
    bool BurnAudio(const BurnJob& job, IBurnEvents& events);
    bool BurnData(const BurnJob& job, IBurnEvents& events);

    std::string m_base;
    std::string m_lastWritten;
    std::atomic<bool> m_abort{false};
};

// The cue sheet of an image: one FILE, each track with its title (CD-Text), INDEX 00 where a
// gap is, INDEX 01. startSectors/gapSectors per track, sectors from the start of the .bin.
std::string MakeCueText(const std::string& binName, const std::vector<std::string>& titles,
                        const std::vector<std::int64_t>& gapStarts,
                        const std::vector<std::int64_t>& trackStarts);

// "mm:ss:ff" of a sector count.
std::string CueTime(std::int64_t sectors);

}  // namespace ac::burn
