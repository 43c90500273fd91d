#pragma once
// From a disc's table of contents to the rows of the rip list: whether the table is an audio
// disc at all, each track's length as the list shows it, its default name, the path ctt reads
// it from, and the disc id the local cache and the CDDB lookups key on. Pure values.
//
// Thread contract: any thread.

#include "cddb/DiscInfo.h"
#include "cddb/DiscToc.h"
#include "platform/DiscDevice.h"

#include <cstdint>
#include <string>
#include <vector>

namespace ac {

inline constexpr std::uint32_t kNoDiscId = 0xFFFFFFFF;

// A disc is there when the first track is not 0 and differs from the last: a failed read leaves
// 0, and a disc of a single track counts as no disc.
bool IsAudioDisc(const platform::DiscTable& table);

// Whole seconds from one start to the next, by minutes, seconds and frames apart: a negative
// seconds difference borrows a minute, a negative frames difference costs a second, and the
// frames are then dropped. 3:00 apart with fewer frames at the end is 2:59.
int TrackLengthSeconds(const cddb::TocPosition& start, const cddb::TocPosition& next);

// "Track01" to "Track09", then "Track10" to "Track99".
std::string DefaultTrackName(int number);

// drive + "/" + "Track03.cda": what ctt is given for the track (/dev/sr0/Track03.cda,
// /music/disc.cue/Track03.cda).
std::string TrackSourcePath(const std::string& drive, int number);

// Every track of the table, data ones too (CDDB counts them), then the lead-out.
cddb::DiscToc ToDiscToc(const platform::DiscTable& table);
// The CDDB disc id of the table, kNoDiscId when nothing was read.
std::uint32_t DiscIdOf(const platform::DiscTable& table);

struct TrackRow {
    int number = 0;
    std::string title;
    int durationSeconds = 0;
    std::string sourcePath;
};

// One row per audio track, in disc order. A track runs to the next entry of the table, so the
// last audio track before a data track ends where the data track starts. The title is the
// record's title of the track when there is a record and the title is not empty.
// The disc's CD-Text as a record: performer and album title, one title per audio track (a data
// track has no row). False when the disc carries no CD-Text.
bool RecordFromCdText(const platform::DiscTable& table, cddb::CDDiscInfo& record);
// Where a disc that just loaded takes its names from, by the setting cddborder: the local record
// and CD-Text in the order it gives (the remote server is asked by the CDDB button only).
// True when CD-Text comes before the local record.
bool CdTextBeforeLocalRecord(int cddbOrder);

std::vector<TrackRow> BuildTrackRows(const platform::DiscTable& table, const std::string& drive,
                                     const cddb::CDDiscInfo* record);

}  // namespace ac
