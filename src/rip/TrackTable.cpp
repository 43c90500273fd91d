#include "rip/TrackTable.h"

namespace ac {

bool IsAudioDisc(const platform::DiscTable& table) {
    return table.firstTrack != 0 && table.firstTrack != table.lastTrack;
}

int TrackLengthSeconds(const cddb::TocPosition& start, const cddb::TocPosition& next) {
    int minutes = next.minute - start.minute;
    int seconds = next.second - start.second;
    if (seconds < 0) {
        seconds += 60;
        --minutes;
    }
    if (next.frame - start.frame < 0) {
        --seconds;
    }
    return minutes * 60 + seconds;
}

std::string DefaultTrackName(int number) {
    const std::string digits = std::to_string(number);
    return (number >= 0 && number < 10 ? "Track0" : "Track") + digits;
}

std::string TrackSourcePath(const std::string& drive, int number) {
    return drive + "/" + DefaultTrackName(number) + ".cda";
}

cddb::DiscToc ToDiscToc(const platform::DiscTable& table) {
    cddb::DiscToc toc;
    if (table.tracks.empty()) {
        return toc;
    }
    for (const platform::TocTrack& track : table.tracks) {
        toc.push_back(cddb::TocPosition::FromFrames(track.lba));
    }
    toc.push_back(cddb::TocPosition::FromFrames(table.leadOutLba));
    return toc;
}

std::uint32_t DiscIdOf(const platform::DiscTable& table) {
    if (table.tracks.empty()) {
        return kNoDiscId;
    }
    return cddb::ComputeDiscId(ToDiscToc(table));
}

std::vector<TrackRow> BuildTrackRows(const platform::DiscTable& table, const std::string& drive,
                                     const cddb::CDDiscInfo* record) {
    std::vector<TrackRow> rows;
    const cddb::DiscToc toc = ToDiscToc(table);
    for (size_t i = 0; i < table.tracks.size(); ++i) {
        const platform::TocTrack& track = table.tracks[i];
        if (track.isData) {
            continue;
        }
        TrackRow row;
        row.number = track.number;
        if (record) {
            row.title = record->Title(track.number - 1);
        }
        if (row.title.empty()) {
            row.title = DefaultTrackName(track.number);
        }
        row.durationSeconds = TrackLengthSeconds(toc[i], toc[i + 1]);
        row.sourcePath = TrackSourcePath(drive, track.number);
        rows.push_back(std::move(row));
    }
    return rows;
}

}  // namespace ac
