#pragma once
// The 128-byte ID3v1.1 trailer of an MP3. FFmpeg's muxer writes one only together with an
// ID3v2 header, and the profiles ask for the two separately, so the tool writes its own.
// Texts go out as Latin-1 where they can (what ID3v1 readers expect), '?' where not.
//
// Thread contract: any thread.

#include <map>
#include <string>

namespace ac::ctt {

// tags: the tool's tag words (title, author, album, year, comment, genre, track).
std::string BuildId3v1Tag(const std::map<std::string, std::string>& tags);

// The genre's number in the ID3v1 list (with the usual extensions up to 125), matched without
// regard to case; 255 when unknown. A number in the text is taken as it stands.
int Id3v1GenreNumber(const std::string& genre);

}  // namespace ac::ctt
