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

bool RecordFromCdText(const platform::DiscTable& table, cddb::CDDiscInfo& record) {
    if (!table.HasCdText()) {
        return false;
    }
    record.Clear();
    record.artist = table.cdTextArtist;
    record.album = table.cdTextAlbum;
    for (std::size_t i = 0; i < table.tracks.size(); ++i) {
        if (table.tracks[i].isData)
            continue;
        record.titles.push_back(i < table.cdTextTitles.size() ? table.cdTextTitles[i]
                                                              : std::string());
    }
    record.trackCount = static_cast<int>(record.titles.size());
    record.Fit();
    return true;
}

bool CdTextBeforeLocalRecord(int cddbOrder) {
    // 0 Local-Remote-CD-Text, 1 Local-CD-Text-Remote, 2 Remote-Local-CD-Text,
    // 3 Remote-CD-Text-Local, 4 CD-Text-Local-Remote, 5 CD-Text-Remote-Local.
    return cddbOrder == 3 || cddbOrder == 4 || cddbOrder == 5;
}

}  // namespace ac
