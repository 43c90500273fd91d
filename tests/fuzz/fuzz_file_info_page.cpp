// Tags, names and codec texts come from whatever file the user adds. The file information
// page must stay plain ASCII, and no text from the file may open a tag of its own: every '<'
// in the page is one of the page's own pieces.

#include "panels/FileInfoPage.h"

#include <fuzzer/FuzzedDataProvider.h>

#include <cstdlib>
#include <string>

namespace {

std::size_t Count(const std::string& text, const std::string& what) {
    std::size_t n = 0;
    for (std::size_t at = text.find(what); at != std::string::npos; at = text.find(what, at + 1)) {
        ++n;
    }
    return n;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* bytes, size_t size) {
    FuzzedDataProvider data(bytes, size);
    ac::MediaFileInfo info;
    info.path = data.ConsumeRandomLengthString(64);
    info.title = data.ConsumeRandomLengthString(64);
    info.author = data.ConsumeRandomLengthString(64);
    info.genre = data.ConsumeRandomLengthString(32);
    info.audioStreams.push_back({data.ConsumeRandomLengthString(16), data.ConsumeIntegral<int>(),
                                 data.ConsumeIntegral<int>(), data.ConsumeIntegral<int>()});
    info.comment = data.ConsumeRemainingBytesAsString();
    const auto plain = [](std::uint32_t) { return std::string("label"); };
    const std::string page = ac::BuildFileInfoPage(&info, "#F3F6FA", plain);
    for (char c : page) {
        if (static_cast<unsigned char>(c) >= 0x80) {
            std::abort();
        }
    }
    // The same page with harmless texts has exactly as many tags.
    ac::MediaFileInfo tame;
    tame.audioStreams.push_back(info.audioStreams.front());
    tame.audioStreams.front().codec = "c";
    const std::string reference = ac::BuildFileInfoPage(&tame, "#F3F6FA", plain);
    if (Count(page, "<") != Count(reference, "<")) {
        std::abort();
    }
    return 0;
}
