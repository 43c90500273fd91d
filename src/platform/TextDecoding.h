#pragma once
// Text that arrives without a code page: cue sheets and tags that carry no encoding of their
// own (RIFF INFO chunks, Vorbis comments written by old taggers, APE tags), and .cddb records
// that Windows programs wrote in their narrow code page. It lives down here, beside the other
// stand-ins for what Windows did with code pages, so that every core library may reach it
// (the names stay in namespace ac, where their callers already find them). UTF-8 where the bytes
// are valid UTF-8, else the code page uchardet guesses, else Windows-1252, whose every byte
// means something.
//
// Thread contract: any thread.

#include <string>
#include <string_view>

namespace ac {

bool IsValidUtf8(std::string_view bytes);

// Bytes in the named iconv code page as UTF-8; bytes it cannot map are dropped.
std::string ConvertToUtf8(std::string_view bytes, const char* codePage);

// The iconv name of the code page the text most likely is in ("UTF-8" for valid UTF-8).
std::string GuessCodePage(std::string_view bytes);

std::string DecodeUnlabelledText(std::string_view bytes);

}  // namespace ac
