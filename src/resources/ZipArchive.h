#pragma once
// A read-only Zip archive: the entry table is read once at opening and kept in memory, so
// lookups and listings never touch the file again; only entry reads do.
//
// Thread contract: any thread. The entry table is immutable after opening; entry reads are
// serialised by a mutex of the archive, because libzip allows one reader per archive.

#include <cstddef>
#include <cstdint>
#include <memory>
#include <mutex>
#include <string>
#include <string_view>
#include <unordered_map>
#include <vector>

struct zip;

namespace ac {

// Bit 4 of the DOS attributes in the low byte of an entry's external attributes.
inline constexpr std::uint32_t kDirectoryAttribute = 0x10;

struct ZipEntry {
    std::string name;  // '\' as separator, whatever the archive stores
    std::uint64_t size = 0;
    std::uint32_t attributes = 0;  // external attributes as stored

    bool IsDirectory() const { return (attributes & kDirectoryAttribute) != 0; }
};

class ZipArchive {
public:
    enum class ReadStatus { Ok, NoEntry, TooLarge, Failed };

    // Null when the file is missing, unreadable or no Zip archive.
    static std::shared_ptr<ZipArchive> Open(const std::string& filePath);
    // The archive keeps its own copy of the bytes.
    static std::shared_ptr<ZipArchive> OpenFromMemory(std::string bytes);

    ~ZipArchive();
    ZipArchive(const ZipArchive&) = delete;
    ZipArchive& operator=(const ZipArchive&) = delete;

    const std::vector<ZipEntry>& Entries() const { return m_entries; }
    std::size_t EntryCount() const { return m_entries.size(); }

    // Case-insensitive, '/' and '\' alike, trailing separators ignored. The first entry of a
    // name wins. Answers kNoEntry (see Package.h) when there is none.
    unsigned Find(std::string_view name) const;

    // Reads the whole entry; fails for an entry declared larger than maxSize and for a read
    // that delivers fewer bytes than declared.
    ReadStatus Read(unsigned index, std::string& contents, std::size_t maxSize) const;
    ReadStatus Read(std::string_view name, std::string& contents, std::size_t maxSize) const;

    // The key Find compares on; exposed so that writers agree with readers on "same name".
    static std::string LookupKey(std::string_view name);

private:
    ZipArchive() = default;
    bool LoadEntryTable();

    struct zip* m_zip = nullptr;
    std::string m_bytes;  // backing store of an archive opened from memory
    std::vector<ZipEntry> m_entries;
    std::unordered_map<std::string, unsigned> m_lookup;
    mutable std::mutex m_readMutex;
};

}  // namespace ac
