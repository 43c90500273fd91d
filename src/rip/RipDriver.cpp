// The rip run: one track at a time, every step on the UI thread.
#include "rip/RipDriver.h"

#include "convert/CommandLine.h"
#include "platform/CommandLine.h"
#include "platform/PartFiles.h"
#include "platform/UiQueue.h"
#include "profile/TextUtil.h"

#include <sys/stat.h>

#include <algorithm>
#include <cerrno>
#include <cmath>
#include <cstdio>
#include <cstring>
#include <filesystem>

namespace ac {
namespace {

constexpr std::string_view kErrorPrefix = "|Error>>>";

// A folder or file name made from text the user typed or a disc record gave: the file-name
// rules first, then what would still be dangerous as one path component on Linux: control
// characters, and a name of dots alone, which would climb out of OutputCDDir.
std::string CleanComponent(std::string_view text, const NamingSettings& naming) {
    std::string clean = FilterFileName(text, naming);
    std::erase_if(clean, [](char c) { return static_cast<unsigned char>(c) < 0x20 || c == 0x7F; });
    const std::size_t first = clean.find_first_not_of(' ');
    if (first == std::string::npos) return {};
    clean.erase(0, first);
    clean.erase(clean.find_last_not_of(' ') + 1);
    if (clean.find_first_not_of('.') == std::string::npos) return {};
    return clean;
}

// A folder level below OutputCDDir. Linux takes 255 bytes in one component.
std::string FolderComponent(std::string text, const char* fallback) {
    if (text.empty()) return fallback;
    if (text.size() > 255) {
        std::size_t cut = 255;
        while (cut > 0 && (static_cast<unsigned char>(text[cut]) & 0xC0) == 0x80) --cut;
        text.resize(cut);
    }
    return text;
}

std::string TrimmedDirectory(std::string directory) {
    while (directory.size() > 1 && (directory.back() == '/' || directory.back() == '\\')) {
        directory.pop_back();
    }
    return directory;
}

// Only the artist and album levels are made: a missing OutputCDDir is the user's to fix, not
// a tree to create somewhere unexpected.
bool MakeRipFolders(const std::string& base, const std::string& folder, std::string& reason) {
    struct stat info;
    if (::stat(base.c_str(), &info) != 0 || !S_ISDIR(info.st_mode)) {
        reason = "the output folder " + base + " does not exist";
        return false;
    }
    const std::string artistFolder = folder.substr(0, folder.rfind('/'));
    for (const std::string& level : {artistFolder, folder}) {
        if (::mkdir(level.c_str(), 0777) != 0 && errno != EEXIST) {
            reason = "cannot make the folder " + level + ": " + std::strerror(errno);
            return false;
        }
    }
    return true;
}

bool HasErrorLine(const std::vector<std::string>& lines) {
    return std::any_of(lines.begin(), lines.end(),
                       [](const std::string& line) { return line.starts_with(kErrorPrefix); });
}

std::string Number(int value) { return std::to_string(value); }

}  // namespace

int RipVolumeNumber(int volumeFactor) {
    const int half = volumeFactor / 2;
    return static_cast<int>(std::floor(std::pow(2.0, (half - 50) * 0.02) * 256 + 0.5));
}

RipOutputName MakeRipOutputName(const RipSettings& settings, int row, const std::string& title,
                                const RipDiscTexts& disc) {
    const NamingSettings& naming = settings.naming;
    const std::string cleanTitle = CleanComponent(title, naming);
    const std::string artist = CleanComponent(disc.artist, naming);
    const std::string album = CleanComponent(disc.album, naming);
    const std::string genre = CleanComponent(disc.genre, naming);
    const std::string year = CleanComponent(disc.year, naming);

    const std::string pattern = SchemePattern(naming.allScheme, naming.scheme);
    std::string base;
    for (std::size_t i = 0; i < pattern.size(); ++i) {
        std::string field;
        switch (pattern[i]) {
            case 'A': {
                char index[16];
                std::snprintf(index, sizeof index, "%02d", row + 1);
                field = index;
                break;
            }
            case 'B': field = artist; break;
            case 'C': field = year; break;
            case 'E':
            case 'F': field = cleanTitle; break;
            case 'G': field = genre; break;
            case 'H': field = album; break;
            default: break;
        }
        // Fields joined by '-', empty ones left out: a disc without a year gives
        // "01-Song", not "01-Song-".
        if (field.empty()) continue;
        if (!base.empty()) base += '-';
        base += field;
    }
    // A pattern that names nothing would give ".mp3", a hidden file the user never finds.
    if (base.empty() || base.find_first_not_of('.') == std::string::npos) {
        char fallback[32];
        std::snprintf(fallback, sizeof fallback, "Track%02d", row + 1);
        base = fallback;
    }

    RipOutputName name;
    name.folder = TrimmedDirectory(settings.outputDirectory) + "/" +
                  FolderComponent(artist, "unknown artist") + "/" +
                  FolderComponent(album, "unknown album");
    name.base = std::move(base);
    return name;
}

std::string BuildRipCommandText(RipTrackItem& item, const std::string& title,
                                const RipDiscTexts& disc, const std::string& outputPath) {
    if (item.bitRate == 0) item.bitRate = 192;
    const std::string extension = AsciiLowerText(item.extension);
    const std::string volume = Number(RipVolumeNumber(item.volume));

    std::string tags;
    tags += " -title " + platform::QuoteCommandValue(title) + " ";
    tags += " -album " + platform::QuoteCommandValue(disc.album) + " ";
    tags += " -author " + platform::QuoteCommandValue(disc.artist) + " ";
    tags += " -genre " + platform::QuoteCommandValue(disc.genre) + " ";
    tags += " -year " + platform::QuoteCommandValue(disc.year) + " ";

    std::string text = " -relk -y -i " + platform::QuoteCommandValue(item.sourcePath);
    if (extension == "mp3") {
        text += " -acodec " + item.codec;
        text += tags;
        text += " -id3v1 -id3v2 ";
        text += " -ar " + Number(item.sampleRate);
        text += " -ac " + Number(item.channels);
        text += " -ab " + Number(item.bitRate) + " ";
        text += " -vol " + volume + " ";
    } else if (extension == "flac") {
        // A disc's FLAC copy keeps both channels and its level: it is the archive of the disc.
        text += " -f flac ";
        text += " -ar " + Number(item.sampleRate);
        text += " -ac 2 ";
        text += " -ab " + Number(item.bitRate) + " ";
        // Players show a rip's names from its tags; a FLAC or Ogg rip without them would lose
        // what the disc record gave.
        text += tags;
    } else {
        text += " -acodec " + item.codec;
        text += " -ar " + Number(item.sampleRate);
        text += " -ac " + Number(item.channels);
        text += " -ab " + Number(item.bitRate) + " ";
        text += " -vol " + volume + " ";
        text += tags;
    }
    text += " " + platform::QuoteCommandValue(outputPath);
    return text;
}

RipDriver::RipDriver(IRipList& list, IRipHost& host)
    : m_list(list), m_host(host), m_alive(std::make_shared<RipDriver*>(this)) {}

RipDriver::~RipDriver() {
    *m_alive = nullptr;
    EndChild();
}

void RipDriver::RipNextTrack() {
    if (!m_active) {
        m_completed = 0;
        m_failed = 0;
        m_active = true;
    }
    m_host.RunStateChanged(true, false);
    m_host.LockTray(true);

    if (m_child) {
        // A paused run: carry on with the same child.
        if (m_paused) {
            m_child->Resume();
            m_paused = false;
            m_list.SetStatus(m_currentRow, RipStatus::Running, Percent());
        }
        return;
    }
    m_paused = false;

    for (;;) {
        const int rows = m_list.RowCount();
        if (m_cursor >= rows) {
            if (m_mode == 1) {
                int queued = -1;
                for (int row = 0; row < rows && queued < 0; ++row) {
                    if (RipTrackItem* item = m_list.Item(row); item && item->queued) queued = row;
                }
                if (queued >= 0) {
                    m_cursor = queued;
                    continue;
                }
            }
            Finish();
            return;
        }
        RipTrackItem* item = m_list.Item(m_cursor);
        const bool qualifies = item && (m_mode == 0 ? m_list.IsChecked(m_cursor) : item->queued);
        if (!qualifies) {
            ++m_cursor;
            continue;
        }
        if (!m_list.IsChecked(m_cursor)) m_list.SetChecked(m_cursor, true);
        m_currentRow = m_cursor;
        if (item->converted) {
            if (m_askReRip) {
                m_reRip = m_host.AskReRip();
                m_askReRip = false;
            }
            if (!m_reRip) {
                // Unqueued, or a run over selected rows would come back to it for ever.
                item->queued = false;
                ++m_cursor;
                continue;
            }
        }
        break;
    }

    if (!m_waitingPassDone) {
        const int rows = m_list.RowCount();
        for (int row = m_currentRow; row < rows; ++row) {
            RipTrackItem* item = m_list.Item(row);
            if (item && m_list.IsChecked(row) && !item->converted) {
                m_list.SetStatus(row, RipStatus::Waiting, 0);
            }
        }
        m_waitingPassDone = true;
    }
    StartTrack(m_currentRow);
}

void RipDriver::StartTrack(int row) {
    RipTrackItem& item = *m_list.Item(row);
    m_host.RefreshRowParameters(row, item);
    const RipDiscTexts disc = m_host.DiscTexts();
    const std::string title = m_list.Title(row);
    const RipOutputName name = MakeRipOutputName(m_settings, row, title, disc);

    m_trackLength = item.duration;
    m_secondsInTrack = 0;
    const std::uint64_t generation = ++m_generation;

    std::string reason;
    const bool folders = MakeRipFolders(TrimmedDirectory(m_settings.outputDirectory), name.folder, reason);
    m_outputHold = ReserveFreePath(name.folder, name.base, AsciiLowerText(item.extension), 0,
                                   m_settings.naming.outputFileOverwrite != 0);
    const std::string command = BuildRipCommandText(item, title, disc, m_outputHold.Path());

    auto failNow = [&](const std::string& why) {
        if (IStatusText* status = m_host.Status()) status->SetStatusText(why);
        if (IProcessLog* log = m_host.Log()) {
            log->Clear();
            log->Append(why + "\n", LogLineKind::Error);
        }
        m_outputHold.Release();
        m_list.SetStatus(row, RipStatus::Failed, 0);
        item.converted = true;
        item.queued = false;
        ++m_failed;
        ++m_cursor;
        // Later, not from inside this call, so a disc of failing rows does not nest 99 deep.
        std::weak_ptr<RipDriver*> alive = m_alive;
        UiQueue::Post([alive, generation] {
            if (auto driver = alive.lock(); driver && *driver && (*driver)->m_generation == generation &&
                                            (*driver)->m_active && !(*driver)->m_child) {
                (*driver)->RipNextTrack();
            }
        });
    };
    if (!folders) {
        failNow(reason);
        return;
    }

    if (m_sweptFolders.insert(name.folder).second) platform::SweepStalePartFiles(name.folder);
    std::weak_ptr<RipDriver*> alive = m_alive;
    m_child = std::make_unique<CEncodeProcess>([alive, generation](CEncodeProcess*) {
        UiQueue::Post([alive, generation] {
            if (auto driver = alive.lock(); driver && *driver) (*driver)->OnTrackExit(generation);
        });
    });
    m_child->Link(m_host.Log(), m_host.Status());
    m_child->SetCurrentDirectory(m_settings.toolDirectory);
    m_child->SetBackgroundPriority(m_settings.slowdown, m_settings.idle);
    m_child->SetOutputPath(m_outputHold.Path());
    m_list.SetStatus(row, RipStatus::Running, 0);
    m_toolRunning = true;
    if (!m_child->Launch(platform::QuoteCommandValue(m_settings.toolPath) + command)) {
        m_toolRunning = false;
        m_child->WaitForExit();
        const std::string why = m_child->FailureReason();
        m_child.reset();
        failNow(why);
    }
}

void RipDriver::OnTrackExit(std::uint64_t generation) {
    if (generation != m_generation || !m_child) return;  // a child that was stopped
    m_child->WaitForExit();
    const int exitCode = m_child->ExitCode();
    const bool failed = exitCode != 0 || HasErrorLine(m_child->ErrorLines());
    const std::string reason = failed ? m_child->FailureReason() : std::string();
    const std::string output = m_outputHold.Path();
    m_child.reset();
    m_toolRunning = false;

    // The tool reported an error yet completed its file: the file is not what was asked for.
    if (failed && exitCode == 0) {
        std::error_code ignored;
        std::filesystem::remove(output, ignored);
    }
    m_outputHold.Release();

    const int row = m_currentRow;
    if (RipTrackItem* item = m_list.Item(row)) {
        item->converted = true;
        item->queued = false;
        m_list.SetStatus(row, failed ? RipStatus::Failed : RipStatus::Completed, 100);
    }
    if (failed) {
        ++m_failed;
        if (IStatusText* status = m_host.Status()) status->SetStatusText(reason);
    } else {
        ++m_completed;
    }
    m_secondsDone += m_trackLength;
    m_secondsInTrack = 0;
    ++m_cursor;
    RipNextTrack();
}

void RipDriver::Finish() {
    const int completed = m_completed;
    const int failed = m_failed;
    m_active = false;
    m_paused = false;
    m_cursor = 0;
    m_mode = 0;
    m_currentRow = -1;
    m_secondsDone = 0;
    m_secondsInTrack = 0;
    m_waitingPassDone = false;
    m_askReRip = true;
    m_host.RunStateChanged(false, false);
    m_host.LockTray(false);
    if (m_settings.ejectCd) m_host.OpenTray();
    m_host.RunFinished(completed, failed);
}

void RipDriver::EndChild() {
    ++m_generation;  // whatever exit is still on its way belongs to no track now
    if (m_child) {
        m_child->ClearCallback();
        m_child->Kill(kRipStoppedExitCode);  // asks first; the part file goes with it
        m_child->WaitForExit();
        m_child.reset();
    }
    m_outputHold.Release();
    m_toolRunning = false;
}

void RipDriver::ResetRowsBehind(int row, bool keepQueued) {
    const int rows = m_list.RowCount();
    for (int behind = row + 1; behind < rows; ++behind) {
        RipTrackItem* item = m_list.Item(behind);
        if (!item || item->converted || (keepQueued && item->queued)) continue;
        m_list.SetStatus(behind, RipStatus::None, 0);
    }
}

int RipDriver::Percent() const {
    if (m_trackLength <= 0) return 0;
    const double seconds = m_child ? m_child->TimeSeconds() : 0.0;
    return std::clamp(static_cast<int>(seconds / m_trackLength * 100.0), 0, 100);
}

void RipDriver::RefreshProgress() {
    if (!m_child || m_paused || m_currentRow < 0) return;
    m_secondsInTrack = std::min(static_cast<int>(m_child->TimeSeconds()), m_trackLength);
    m_list.SetStatus(m_currentRow, RipStatus::Running, Percent());
}

void RipDriver::RipSelected() {
    if (m_active) return;
    m_mode = 1;
    const int rows = m_list.RowCount();
    for (int row = 0; row < rows; ++row) {
        RipTrackItem* item = m_list.Item(row);
        if (item && m_list.IsSelected(row)) {
            item->queued = true;
            m_list.SetStatus(row, RipStatus::Waiting, 0);
        }
    }
    m_waitingPassDone = true;
    RipNextTrack();
}

void RipDriver::PauseRip() {
    if (!m_active || m_paused) return;
    if (m_child) m_child->Suspend();
    m_paused = true;
    if (m_currentRow >= 0) m_list.SetStatus(m_currentRow, RipStatus::Paused, 0);
    ResetRowsBehind(m_currentRow, m_mode == 1);
    m_waitingPassDone = false;
    m_host.RunStateChanged(false, true);
}

bool RipDriver::StopRip(bool ask) { return StopRun(ask, true); }

bool RipDriver::StopRun(bool ask, bool endSelectedRun) {
    m_askReRip = true;
    if (ask && m_mode == 0 && !m_host.AskStopRun()) return false;
    EndChild();
    if (m_currentRow >= 0 && m_list.Item(m_currentRow)) {
        m_list.SetStatus(m_currentRow, RipStatus::Aborted, 0);
        ResetRowsBehind(m_currentRow, !endSelectedRun);
    }
    if (endSelectedRun) {
        m_mode = 0;
        const int rows = m_list.RowCount();
        for (int row = 0; row < rows; ++row) {
            if (RipTrackItem* item = m_list.Item(row)) item->queued = false;
        }
    }
    m_secondsDone = 0;
    m_secondsInTrack = 0;
    m_active = false;
    m_paused = false;
    m_cursor = 0;
    m_waitingPassDone = false;
    if (IStatusText* status = m_host.Status()) status->SetStatusText("");
    m_host.RunStateChanged(false, false);
    m_host.LockTray(false);
    return true;
}

void RipDriver::StopSelectedRow(RipStatus shown) {
    if (!m_active) return;
    const int was = m_currentRow;
    if (!StopRun(m_mode == 0, false)) return;
    if (RipTrackItem* item = m_list.Item(was)) item->queued = false;
    m_mode = 1;
    m_waitingPassDone = true;
    if (was >= 0 && m_list.Item(was)) m_list.SetStatus(was, shown, 0);
    m_cursor = 0;
    RipNextTrack();
    const int rows = m_list.RowCount();
    for (int row = 0; row < rows; ++row) {
        RipTrackItem* item = m_list.Item(row);
        if (item && item->queued && row != m_currentRow) m_list.SetStatus(row, RipStatus::Waiting, 0);
    }
}

void RipDriver::PauseSelected() { StopSelectedRow(RipStatus::Paused); }

void RipDriver::StopSelected() { StopSelectedRow(RipStatus::Aborted); }

void RipDriver::StopButton() {
    bool allSelected = true;
    const int rows = m_list.RowCount();
    for (int row = 0; row < rows && allSelected; ++row) allSelected = m_list.IsSelected(row);
    if (m_mode == 1 && !allSelected) {
        StopSelected();
    } else {
        StopRip();
    }
}

void RipDriver::AbandonRun() {
    if (!m_active && !m_child) return;
    EndChild();
    m_active = false;
    m_paused = false;
    m_mode = 0;
    m_cursor = 0;
    m_currentRow = -1;
    m_secondsDone = 0;
    m_secondsInTrack = 0;
    m_waitingPassDone = false;
    m_askReRip = true;
    m_host.RunStateChanged(false, false);
    m_host.LockTray(false);
}

}  // namespace ac
