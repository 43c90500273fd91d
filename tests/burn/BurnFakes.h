#pragma once
// A burn list, a host that answers from a script, and a recorder whose disc the test changes,
// for driving the burn driver without windows or drives.

#include "burn/BurnDriver.h"
#include "burn/BurnTexts.h"

#include <deque>
#include <functional>
#include <memory>
#include <mutex>
#include <string>
#include <vector>

namespace ac::test {

class FakeCut : public JobParameters {
public:
    std::int64_t GetDuration() const override { return 0; }
    std::int64_t GetStartTime() const override { return 0; }
};

class FakeBurnList : public burn::IBurnList {
public:
    MediaItem& Add(const std::string& source, int seconds = 1) {
        auto item = std::make_unique<MediaItem>();
        item->sourcePath = source;
        item->info.seconds = seconds;
        item->parameters = std::make_unique<FakeCut>();
        std::lock_guard lock(m_mutex);
        m_rows.push_back(std::move(item));
        return *m_rows.back();
    }
    int RowCount() override {
        std::lock_guard lock(m_mutex);
        return static_cast<int>(m_rows.size());
    }
    MediaItem* Item(int row) override {
        std::lock_guard lock(m_mutex);
        return row >= 0 && row < static_cast<int>(m_rows.size()) ? m_rows[row].get() : nullptr;
    }
    void SelectOnly(int) override {}
    void RefreshRow(int, int) override {}

private:
    std::mutex m_mutex;
    std::vector<std::unique_ptr<MediaItem>> m_rows;
};

// Records every question and box by text id and answers from a table (default Yes / OK).
class FakeBurnHost : public burn::IBurnHost {
public:
    std::function<bool(std::uint32_t)> answer = [](std::uint32_t) { return true; };
    // The waiting dialog: the recorder to hand back (null: Cancel); called with the code.
    std::function<burn::ICdRecorder*(burn::ICdRecorder*, int code)> waitForDisc =
        [](burn::ICdRecorder*, int) { return nullptr; };

    bool Ask(const burn::Prompt& prompt) override {
        Record(prompt.textId);
        return answer(prompt.textId);
    }
    bool Tell(const burn::Prompt& prompt, bool) override {
        Record(prompt.textId);
        return answer(prompt.textId);
    }
    burn::ICdRecorder* WaitForDisc(burn::ICdRecorder* recorder, int code, std::int64_t,
                                   bool showIgnore, bool&) override {
        std::lock_guard lock(m_mutex);
        waitCodes.push_back(code);
        waitShowedIgnore.push_back(showIgnore);
        return waitForDisc(recorder, code);
    }
    void SetStatusText(std::uint32_t textId, const std::string&) override {
        std::lock_guard lock(m_mutex);
        statusTexts.push_back(textId);
    }
    void SetProgress(int percent) override {
        std::lock_guard lock(m_mutex);
        progress.push_back(percent);
    }
    void EnablePanels(bool enable) override {
        std::lock_guard lock(m_mutex);
        panelsEnabled = enable;
    }
    void PostCapacityRefresh() override {}
    void PostTracksUnavailable() override {
        std::lock_guard lock(m_mutex);
        tracksUnavailable = true;
    }
    void RunEnded(bool written) override {
        std::lock_guard lock(m_mutex);
        ended = true;
        allWritten = written;
    }
    bool Asked(std::uint32_t id) {
        std::lock_guard lock(m_mutex);
        return std::find(prompts.begin(), prompts.end(), id) != prompts.end();
    }
    int TimesAsked(std::uint32_t id) {
        std::lock_guard lock(m_mutex);
        return static_cast<int>(std::count(prompts.begin(), prompts.end(), id));
    }

    std::mutex m_mutex;
    std::vector<std::uint32_t> prompts;
    std::vector<std::uint32_t> statusTexts;
    std::vector<int> progress;
    std::vector<int> waitCodes;
    std::vector<bool> waitShowedIgnore;
    bool panelsEnabled = true;
    bool tracksUnavailable = false;
    bool ended = false;
    bool allWritten = false;

private:
    void Record(std::uint32_t id) {
        std::lock_guard lock(m_mutex);
        prompts.push_back(id);
    }
};

// A recorder with a disc the test describes; a write counts its tracks and ticks through.
class FakeRecorder : public burn::ICdRecorder {
public:
    int media = burn::kMediaCdR;
    int state = burn::kDiscStateBlank;
    std::int64_t freeBlocks = 360000;
    bool failWrite = false;
    bool capacityFails = false;
    std::function<void()> duringWrite;  // runs in the middle of a write (a Stop)
    std::string drive = "/dev/sr9";

    int ejects = 0, beforeWrites = 0, afterWrites = 0, aborts = 0;
    std::vector<burn::BurnJob> jobs;
    std::vector<std::vector<std::string>> dataFiles;

    std::string Name() const override { return "FAKE RECORDER"; }
    std::string DriveText() const override { return drive; }
    int MediaType() override { return media; }
    bool Capacity(std::int64_t& total, std::int64_t& freeOut) override {
        total = 360000;
        freeOut = freeBlocks;
        return !capacityFails;
    }
    bool ReadDiskInfo(burn::DiskInfoBlock& info) override {
        info.fill(0);
        info[2] = static_cast<std::uint8_t>(state);
        return true;
    }
    std::vector<int> WriteSpeeds() override { return {7056, 3528}; }
    bool CanErase() override { return media == burn::kMediaCdRw; }
    bool Erase(bool) override {
        state = burn::kDiscStateBlank;
        return true;
    }
    void Eject() override { ++ejects; }
    bool WaitReady(int) override { return true; }
    void PreventRemoval(bool) override {}
    void BeforeWrite() override { ++beforeWrites; }
    void AfterWrite() override { ++afterWrites; }
    void AbortWrite() override { ++aborts; }
    bool Burn(const burn::BurnJob& job, burn::IBurnEvents& events) override {
        jobs.push_back(job);
        if (job.tree) {
            std::vector<std::string> names;
            for (const auto& file : job.tree->Files())
                names.push_back(file.first);
            dataFiles.push_back(names);
        }
        events.OnBurnEvent(burn::kEventStarting, 0);
        events.OnBurnEvent(burn::kEventTotalUnits, 220);
        for (int unit = 0; unit < 10; ++unit) {
            if (unit == 5 && duringWrite)
                duringWrite();
            events.OnBurnEvent(burn::kEventUnit, 0);
            if (events.OnBurnEvent(burn::kEventPoll, 0)) {
                events.OnBurnEvent(burn::kEventCancelled, 0);
                return false;
            }
        }
        if (failWrite) {
            events.OnBurnEvent(burn::kEventWriteFailed, 0);
            return false;
        }
        return true;
    }
};

}  // namespace ac::test
