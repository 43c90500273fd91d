#pragma once
// The page of the file information window: what probing found out about a row (summary,
// streams, tags) as the HTML the window shows, and the writing of it to the page file. Every
// text that comes from the file or a language file is escaped, and the page is plain ASCII
// (other characters as numeric references), so a tag can neither add markup nor depend on the
// reader's guess of a code page.
//
// Thread contract: pure functions, any thread; WriteFileInfoPage writes one file.

#include "medialist/MediaFileInfo.h"

#include <cstdint>
#include <functional>
#include <string>
#include <string_view>

namespace ac {

// Text for HTML: & < > " ' as entities, every character past ASCII as &#N;, bytes that are no
// valid UTF-8 as U+FFFD.
std::string EscapeHtml(std::string_view text);

using PageText = std::function<std::string(std::uint32_t id)>;

// The page for `info`, or without one the empty body in the background colour.
std::string BuildFileInfoPage(const MediaFileInfo* info, const std::string& bgColor,
                              const PageText& text);

// The page as the window lays it out: the tag lines each open a block inside the one before
// and never close it, which browsers take in their stride, while wxHtmlWindow spends some
// forty times longer on ten nested blocks than on ten in a row. Each line block that opens
// inside an open one closes that one first; what shows is the same.
std::string FlattenLineBlocks(std::string_view page);

// Writes the page beside itself under a temporary name and renames it over `path`, so the
// window never reads half a page. Creates the folder. False when it could not be written.
bool WriteFileInfoPage(const std::string& path, const std::string& page);

}  // namespace ac
