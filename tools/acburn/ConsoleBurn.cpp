#include "ConsoleBurn.h"

#include "ProgressLine.h"

#include "burn/BurnTexts.h"
#include "resources/BuiltinStrings.h"

#include <cstring>
#include <filesystem>

namespace ac::console {

std::string BurnText(std::uint32_t id, const std::string& argument) {
    std::string text(BuiltinString(id));
    for (const char* mark : {"%s", "%d"}) {
        const std::size_t at = text.find(mark);
        if (at != std::string::npos)
            text.replace(at, 2, argument);
    }
    return text;
}

ConsoleBurn::ConsoleBurn(bool drawBar, std::FILE* out) : m_drawBar(drawBar), m_out(out) {}

void ConsoleBurn::AddRow(std::unique_ptr<MediaItem> item) {
    std::lock_guard lock(m_mutex);
    m_rows.push_back(std::move(item));
}

int ConsoleBurn::RowCount() {
    std::lock_guard lock(m_mutex);
    return static_cast<int>(m_rows.size());
}

MediaItem* ConsoleBurn::Item(int row) {
    std::lock_guard lock(m_mutex);
    return row >= 0 && row < static_cast<int>(m_rows.size()) ? m_rows[row].get() : nullptr;
}

void ConsoleBurn::RefreshRow(int row, int) {
    MediaItem* item = Item(row);
    if (!item)
        return;
    const JobStatus status = item->Status();
    if (status == JobStatus::Failed) {
        CEncodeProcess* process = item->process.load();
        Line("failed: " + item->sourcePath +
             (process ? ": " + process->FailureReason() : std::string()));
    }
}

void ConsoleBurn::Line(const std::string& text) {
    std::lock_guard lock(m_mutex);
    if (m_drawBar)
        ClearProgressLine(m_out);
    std::fprintf(m_out, "%s\n", text.c_str());
    if (m_drawBar)
        Draw();
    std::fflush(m_out);
}

void ConsoleBurn::Draw() {
    DrawProgressLine(m_out, m_status.empty() ? "Converting ..." : m_status, m_percent, m_percent);
    std::fflush(m_out);
}

bool ConsoleBurn::Ask(const burn::Prompt& prompt) {
    namespace t = burn::text;
    bool answer;
    switch (prompt.textId) {
        case t::kStopEncoding:
        case t::kStopAudioWrite:
            answer = m_stopping;
            break;
        case t::kAnotherCopy:
            answer = true;
            break;
        // A disc with some tracks missing is not what was asked for.
        case t::kSomeFailed:
            answer = false;
            break;
        default:
            answer = false;
            break;  // erasing, ejecting
    }
    if (prompt.textId != t::kAnotherCopy && prompt.textId != t::kSuccessEject)
        Line("acburn: " + BurnText(prompt.textId, prompt.argument) + (answer ? " yes" : " no"));
    return answer;
}

bool ConsoleBurn::Tell(const burn::Prompt& prompt, bool okCancel) {
    Line("acburn: " + BurnText(prompt.textId, prompt.argument));
    return !okCancel;
}

burn::ICdRecorder* ConsoleBurn::WaitForDisc(burn::ICdRecorder*, int code, std::int64_t, bool,
                                            bool&) {
    Line("acburn: " + BurnText(burn::WaitMessageId(code)));
    return nullptr;
}

void ConsoleBurn::SetStatusText(std::uint32_t textId, const std::string& argument) {
    const std::string text = textId ? BurnText(textId, argument) : std::string();
    std::lock_guard lock(m_mutex);
    if (text == m_status)
        return;
    m_status = text;
    if (m_drawBar) {
        Draw();
    } else if (!text.empty()) {
        std::fprintf(m_out, "%s\n", text.c_str());
        std::fflush(m_out);
    }
}

void ConsoleBurn::SetProgress(int percent) {
    std::lock_guard lock(m_mutex);
    if (percent == 0 && m_percent > 0)
        return;  // the reset at the end of a run
    m_percent = percent;
    if (m_drawBar) {
        Draw();
    } else if (percent >= m_lastLinePercent + 10 || percent == 100) {
        m_lastLinePercent = percent;
        std::fprintf(m_out, "%3d%%\n", percent);
        std::fflush(m_out);
    }
}

void ConsoleBurn::PostTracksUnavailable() {
    Line("acburn: " + BurnText(burn::text::kTracksUnavailable));
}

void ConsoleBurn::RunEnded(bool allCopiesWritten) {
    std::lock_guard lock(m_mutex);
    m_allWritten = allCopiesWritten;
}

void ConsoleBurn::Finish() {
    std::lock_guard lock(m_mutex);
    if (m_drawBar) {
        ClearProgressLine(m_out);
        std::fflush(m_out);
    }
}

}  // namespace ac::console
