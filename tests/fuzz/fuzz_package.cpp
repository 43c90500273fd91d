// Packages from anywhere: a damaged download, a truncated user.pkg, a crafted skin pack. Opening,
// listing, reading and rewriting must never crash, hang or allocate what the bytes merely claim.

#include "resources/Package.h"
#include "resources/PackageWriter.h"
#include "resources/ZipArchive.h"

#include <cstdlib>
#include <string>

namespace {

// Enough to read every honest entry a fuzzer builds; small enough that forged sizes stay cheap.
constexpr std::size_t kFuzzReadLimit = 1u << 20;
constexpr std::size_t kMaxEntriesVisited = 256;

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* bytes, size_t size) {
    const std::string input(reinterpret_cast<const char*>(bytes), size);
    auto archive = ac::ZipArchive::OpenFromMemory(input);
    if (archive != nullptr) {
        std::string contents;
        std::size_t visited = 0;
        for (const ac::ZipEntry& entry : archive->Entries()) {
            if (++visited > kMaxEntriesVisited) {
                break;
            }
            unsigned index = archive->Find(entry.name);
            if (index == ac::kNoEntry) {
                std::abort();  // every listed name must be found again
            }
            // Of two entries of one name the first wins, so compare with the one found.
            archive->Read(index, contents, kFuzzReadLimit);
            if (contents.size() > archive->Entries()[index].size) {
                std::abort();
            }
        }
    }

    // The writer over the same bytes: an edit and a rebuild must give a readable archive that
    // holds the edit.
    ac::PackageWriter writer;
    if (writer.OpenFromMemory(input) != ac::PackageWriter::OpenResult::Ok) {
        return 0;
    }
    if (!writer.Put("profile/user/fuzz.pf", "[General]\r\nKey = value\r\n")) {
        return 0;
    }
    writer.Remove("profile/user/other.pf");
    std::string rebuilt;
    if (!writer.Finish(rebuilt)) {
        return 0;  // a damaged source entry may refuse to be copied; the input stays as it was
    }
    auto again = ac::ZipArchive::OpenFromMemory(rebuilt);
    std::string text;
    if (again == nullptr ||
        again->Read("profile\\user\\FUZZ.pf", text, kFuzzReadLimit) !=
            ac::ZipArchive::ReadStatus::Ok ||
        text != "[General]\r\nKey = value\r\n") {
        std::abort();
    }
    return 0;
}
