#pragma once
// RipTrackItem: what one row of the rip list knows of its track: where the tool reads it, what it
// becomes, and how far the current run has taken it. A plain record; the row owns it.
//
// Thread contract: written on the UI thread; the rip driver reads a copy for its command line.

#include <string>

namespace ac {

struct RipTrackItem {
    // The drive text, "/", the default track name and ".cda": /dev/sr0/Track03.cda, or
    // /music/disc.cue/Track03.cda for a disc image. ctt reads the track from there.
    std::string sourcePath;
    std::string extension;  // lower case, of the row's profile
    std::string codec;      // the profile's acodec
    int sampleRate = 0;     // ar
    int channels = 0;       // ac
    int bitRate = 0;        // ab, kb/s; 0 becomes 192 when the command line is built
    int volume = 100;       // vol_factor, 100 unchanged
    int duration = 0;       // whole seconds
    int trackNumber = 0;    // the disc's own number of the track
    int profileIndex = 0;   // index in the side bar's profile list
    bool converted = false; // finished in a run (also when it failed)
    bool queued = false;    // part of a run over selected rows
};

}  // namespace ac
