#pragma once
// The burn list and host of acburn: every row goes on the disc, questions are answered the way
// a run without anyone watching should go (no partial disc, no erasing, no waiting for a disc),
// boxes and status lines go to standard error, and the progress is a bar on a terminal or
// whole lines into a pipe or file.
//
// Thread contract: the list and host calls come from the burn thread and the workers; the
// drawing happens under the object's own lock.

#include "burn/BurnDriver.h"

#include <cstdio>
#include <memory>
#include <mutex>
#include <string>
#include <vector>

namespace ac::console {

// The text of a burn text id in English, with its argument put in.
std::string BurnText(std::uint32_t id, const std::string& argument = {});

class ConsoleBurn : public burn::IBurnList, public burn::IBurnHost {
public:
    ConsoleBurn(bool drawBar, std::FILE* out);

    void AddRow(std::unique_ptr<MediaItem> item);
    // Set once a stop was asked for from the terminal: the stop questions answer yes.
    void SetStopping() { m_stopping = true; }
    bool AllWritten() const { return m_allWritten; }
    void Finish();

    int RowCount() override;
    MediaItem* Item(int row) override;
    void SelectOnly(int) override {}
    void RefreshRow(int row, int percent) override;

    bool Ask(const burn::Prompt& prompt) override;
    bool Tell(const burn::Prompt& prompt, bool okCancel) override;
    burn::ICdRecorder* WaitForDisc(burn::ICdRecorder* recorder, int code, std::int64_t sectors,
                                   bool showIgnore, bool& ignored) override;
    void SetStatusText(std::uint32_t textId, const std::string& argument) override;
    void SetProgress(int percent) override;
    void EnablePanels(bool) override {}
    void PostCapacityRefresh() override {}
    void PostTracksUnavailable() override;
    void RunEnded(bool allCopiesWritten) override;

private:
    void Line(const std::string& text);
    void Draw();

    const bool m_drawBar;
    std::FILE* m_out;
    std::mutex m_mutex;
    std::vector<std::unique_ptr<MediaItem>> m_rows;
    std::string m_status;
    int m_percent = 0;
    int m_lastLinePercent = -10;
    bool m_stopping = false;
    bool m_allWritten = false;
};

}  // namespace ac::console
