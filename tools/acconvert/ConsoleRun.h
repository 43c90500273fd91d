#pragma once
// The conversion list of acconvert: every row checked, the driver's questions answered with
// yes, its messages written to standard error, and progress drawn on the terminal (a bar on a
// terminal, plain lines into a pipe or file).
//
// Thread contract: Run() on the main thread; the list and host calls come from the driver
// thread and the children's waiters, under the list's own mutex.

#include "convert/EncodingDriver.h"

#include <atomic>
#include <condition_variable>
#include <cstdio>
#include <memory>
#include <mutex>
#include <string>
#include <vector>

namespace ac::console {

class ConsoleRun : public IMediaList, public IDriverHost {
public:
    ConsoleRun(std::string outputDirectory, bool drawBar, std::FILE* out);
    ~ConsoleRun() override;

    void AddRow(std::unique_ptr<MediaItem> item);
    // Runs the driver until every row has ended or a stop is asked for; returns the exit code
    // of the program: 0 only when every row completed.
    int Run(DriverConfig config, OutputNamer namer, CommandBuilder builder,
            const std::atomic<int>& stopRequested);

    int GetRowCount() override;
    MediaItem* GetItem(int row) override;
    bool IsChecked(int) override { return true; }
    bool IsSelected(int row) override;
    void SelectOnly(int row) override;
    void RefreshRow(int row) override;
    bool TryLock() override { return m_listLock.try_lock(); }
    void Unlock() override { m_listLock.unlock(); }
    std::string GetOutputDirectory() override { return m_outputDirectory; }
    void EnableChecking(bool) override {}

    bool AskYesNo(std::uint32_t) override { return true; }
    void ShowMessage(const std::string& text, bool isError) override;
    void PostRunFinished() override;
    bool IsConvertMode() override { return true; }
    void EnableTabStrip(bool) override {}
    void PlaySound(const std::string&) override {}
    void StartAfterRunAction(int) override {}

private:
    bool AllEnded();
    void Draw(EncodingDriver& driver, bool final);
    void ReportEnded(int row, JobStatus status);

    const std::string m_outputDirectory;
    const bool m_drawBar;
    std::FILE* m_out;

    std::mutex m_mutex;  // rows' selection, and the wake-up of Run
    std::condition_variable m_changed;
    std::vector<std::unique_ptr<MediaItem>> m_rows;
    std::vector<char> m_selected;
    std::vector<JobStatus> m_reported;  // main thread only
    bool m_changeSeen = false;
    std::mutex m_listLock;
};

}  // namespace ac::console
