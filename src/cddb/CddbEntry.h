#pragma once
// CddbEntry: the body of a "cddb read" reply (the xmcd format) parsed field by field, and its
// conversion into the flat CDDiscInfo the rip panel works with.
//
// The parser is deliberately literal about line order: servers and old submitters wrote these
// records by hand, and the order in which lines arrive is the only thing every record agrees
// on. It never asserts and never throws on what a server sends.
//
// Thread contract: pure functions on values; any thread.

#include "cddb/DiscInfo.h"

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

namespace cddb {

struct CddbEntry {
    std::vector<int> frameOffsets;
    int discLengthSeconds = 0;
    int revision = 0;
    std::string clientName;
    std::string clientVersion;
    std::string clientComments;
    std::uint32_t discId = 0;
    std::string artist;
    std::string title;
    // DYEAR and DGENRE, which servers send from protocol level 5 on; empty below that.
    std::string discYear;
    std::string discGenre;
    std::vector<std::string> trackTitles;
    std::vector<std::string> extendedDiscData;  // EXTD split at its line feeds
    std::vector<std::string> extendedTrackData;
    std::vector<int> playOrder;
};

// Why a body is no entry; each value names the first line that was missing or wrong, so the
// user can be told what the server sent.
enum class EntryResult {
    Ok = 0,
    BadStatus,             // no status in 210..219: the server sent no entry at all
    NotXmcd,               // the line behind the status is no "# xmcd" comment
    NoFrameOffsets,        // no "Track frame offsets:" in the leading comments
    NoDiscLength,          // no "Disc length:" comment, or one too short to hold a number
    NoSubmittedVia,        // no "Submitted via:" comment (behind "Revision:" or in its place)
    BadSubmittedVia,       // "Submitted via:" without both a client name and a version
    BadDiscId,             // no DISCID line, or one whose value is shorter than eight digits
    NoDiscTitle,           // the line behind DISCID is not DTITLE
    BadTrackTitle,         // a TTITLE line without "="
    BadExtendedDiscData,   // an EXTD line without "="
    BadExtendedTrackData,  // an EXTT line without "="
};

// English text of a result, for the log and the response window.
const char* EntryResultText(EntryResult result);

// Parses a reply body that starts with its status line ("210 rock 940aac0b ...\r\n"). Lines
// end at "\r\n", or at "\n" where no "\r\n" follows anywhere further on; the body ends at its
// first NUL. Bytes that are not UTF-8 are read as ISO-8859-1, which is what servers promise for
// entries that are not UTF-8. `out` is reset first and holds what was parsed up to a failure.
EntryResult ParseEntry(std::string_view body, CddbEntry& out);

// Server text as UTF-8: the bytes as they are where they are valid UTF-8, else read as
// ISO-8859-1, which is what servers promise for replies that are not UTF-8 (levels 4 and 5
// differ from server to server).
std::string DecodeServerText(std::string_view bytes);

// Fills the flat record from an entry and the category of the chosen match: artist and album
// from DTITLE, the track titles in order, and year and genre from the extended disc data (the
// last EXTD line decides the year: "Unknown" unless it holds "YEAR"; a line holding "GENRE"
// gives the genre from its ninth character on). Where EXTD leaves the year unknown, DYEAR gives
// it; where no EXTD line names a genre, DGENRE gives it. Capacities are applied.
void EntryToDiscInfo(std::string_view category, const CddbEntry& entry, CDDiscInfo& info);

}  // namespace cddb
