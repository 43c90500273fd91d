#pragma once
// The local cache of disc records: one small ini file per disc id, "<folder>/940aac0b.cddb",
// so that a disc seen once is named again with no network.
//
//   [CDINFO]
//   ARITIST=Nightwish        (spelt so by every program that wrote these files)
//   ALBUM=Once
//   GENRE=rock
//   YEAR=2004
//   [MUSIC]
//   Total=11
//   Track00=Dark Chest Of Wonders
//
// Texts are UTF-8 in memory and on writing; a file in another code page is decoded when read.
// A damaged, cut-off or oversized file reads as whatever record its readable lines give.
//
// Thread contract: any thread; two writers of one disc's file must be serialised by the caller.

#include "cddb/DiscInfo.h"

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

namespace cddb {

// The setting `format`: 0 keeps CR LF line ends; 1 overwrites every CR with a NUL byte, so the
// file keeps its length. Only the file of a lookup from the rip panel takes format 1; batch
// mode always writes format 0.
inline constexpr int kWindowsDiscFileFormat = 0;
inline constexpr int kUnixDiscFileFormat = 1;

// "%08x": eight lower-case hexadecimal digits, leading zeros kept.
std::string FormatDiscId(std::uint32_t discId);

// One to eight hexadecimal digits with blanks around them, as the batch file holds ids;
// anything else (a path, a sign, a ninth digit) is no id, so that a damaged batch record
// cannot name a file outside the folder.
std::optional<std::uint32_t> ParseDiscIdText(std::string_view text);

// folder + "/" (unless it ends in one) + FormatDiscId(id) + ".cddb".
std::string DiscFilePath(std::string_view folder, std::uint32_t discId);

// The record of an ini text: CDINFO's four texts, MUSIC's Total and one title per index below
// it (at most kMaxTracks), each cut to its capacity.
void ParseDiscFileText(std::string_view bytes, CDDiscInfo& info);

// The file's text, values in the order of the table above.
std::string DiscFileText(const CDDiscInfo& info, int format);

// Reads the record of a disc. False when there is no file: the disc is unknown and `info` is
// left cleared.
bool LoadDiscFile(const std::string& folder, std::uint32_t discId, CDDiscInfo& info);

// Writes the record (capacities applied) under the id text's name, replacing any file there
// in one rename. False when the id text is no id or the file could not be written.
bool SaveDiscFile(const std::string& folder, std::string_view idText, const CDDiscInfo& info,
                  int format);

// The folder of the setting `localcddb`: the setting itself, or <user data dir>/CDDB when it
// is empty. Created when missing; a folder that cannot be created is still answered, and the
// save into it then fails.
std::string LocalCddbFolder(std::string_view setting);

}  // namespace cddb
