#pragma once
// A conversion list and a main dialog without windows, for driving the encoding driver.

#include "convert/EncodingDriver.h"

#include <memory>
#include <mutex>
#include <string>
#include <vector>

namespace ac::test {

class FakeParameters : public JobParameters {
public:
    FakeParameters(std::int64_t durationUs, std::int64_t startUs)
        : m_duration(durationUs), m_start(startUs) {}
    std::int64_t GetDuration() const override { return m_duration; }
    std::int64_t GetStartTime() const override { return m_start; }

private:
    std::int64_t m_duration, m_start;
};

class FakeList : public IMediaList {
public:
    struct Row {
        std::unique_ptr<MediaItem> item;
        bool checked = true;
        bool selected = false;
    };

    MediaItem& Add(const std::string& source, JobStatus status = JobStatus::Idle,
                   int seconds = 1) {
        auto item = std::make_unique<MediaItem>();
        item->sourcePath = source;
        item->info.seconds = seconds;
        item->SetStatus(status);
        std::lock_guard lock(m_mutex);
        m_rows.push_back(Row{std::move(item)});
        return *m_rows.back().item;
    }
    void SetChecked(int row, bool checked) {
        std::lock_guard lock(m_mutex);
        m_rows[row].checked = checked;
    }
    void Select(int row) {
        std::lock_guard lock(m_mutex);
        for (std::size_t i = 0; i < m_rows.size(); ++i) m_rows[i].selected = int(i) == row;
    }
    // Items go outside the lock: their children's exits call back into the list.
    void Clear() {
        std::vector<Row> gone;
        {
            std::lock_guard lock(m_mutex);
            gone.swap(m_rows);
        }
    }
    void SetOutputDirectory(std::string directory) {
        std::lock_guard lock(m_mutex);
        m_outputDirectory = std::move(directory);
    }
    bool CheckingEnabled() {
        std::lock_guard lock(m_mutex);
        return m_checkingEnabled;
    }

    int GetRowCount() override {
        std::lock_guard lock(m_mutex);
        return int(m_rows.size());
    }
    MediaItem* GetItem(int row) override {
        std::lock_guard lock(m_mutex);
        return row < 0 || row >= int(m_rows.size()) ? nullptr : m_rows[row].item.get();
    }
    bool IsChecked(int row) override {
        std::lock_guard lock(m_mutex);
        return m_rows.at(row).checked;
    }
    bool IsSelected(int row) override {
        std::lock_guard lock(m_mutex);
        return m_rows.at(row).selected;
    }
    void SelectOnly(int row) override { Select(row); }
    void RefreshRow(int) override {}
    bool TryLock() override { return m_listLock.try_lock(); }
    void Unlock() override { m_listLock.unlock(); }
    std::string GetOutputDirectory() override {
        std::lock_guard lock(m_mutex);
        return m_outputDirectory;
    }
    void EnableChecking(bool enable) override {
        std::lock_guard lock(m_mutex);
        m_checkingEnabled = enable;
    }

    std::mutex m_listLock;  // the lock the driver tries; tests may hold it

private:
    std::mutex m_mutex;
    std::vector<Row> m_rows;
    std::string m_outputDirectory;
    bool m_checkingEnabled = true;
};

class FakeHost : public IDriverHost {
public:
    bool AskYesNo(std::uint32_t textId) override {
        std::lock_guard lock(m_mutex);
        questions.push_back(textId);
        return answer;
    }
    void ShowMessage(const std::string& text, bool) override {
        std::lock_guard lock(m_mutex);
        messages.push_back(text);
    }
    void PostRunFinished() override {
        std::lock_guard lock(m_mutex);
        ++runFinished;
    }
    bool IsConvertMode() override { return true; }
    void EnableTabStrip(bool enable) override {
        std::lock_guard lock(m_mutex);
        tabStripEnabled = enable;
    }
    void PlaySound(const std::string& path) override {
        std::lock_guard lock(m_mutex);
        sounds.push_back(path);
    }
    void StartAfterRunAction(int action) override {
        std::lock_guard lock(m_mutex);
        actions.push_back(action);
    }
    int RunFinished() {
        std::lock_guard lock(m_mutex);
        return runFinished;
    }
    std::vector<std::string> Messages() {
        std::lock_guard lock(m_mutex);
        return messages;
    }
    std::vector<std::uint32_t> Questions() {
        std::lock_guard lock(m_mutex);
        return questions;
    }

    bool answer = true;
    std::vector<std::uint32_t> questions;
    std::vector<std::string> messages;
    std::vector<std::string> sounds;
    std::vector<int> actions;
    int runFinished = 0;
    bool tabStripEnabled = true;

private:
    std::mutex m_mutex;
};

}  // namespace ac::test
