#pragma once
// Rewrites a package. The archive is changed in memory and only Commit touches the disk, with
// one atomic replacement of the whole file: whatever fails, and whenever the process dies, the
// previous package stays byte-identical or the new one is complete.
//
// Names are taken with '/' or '\'; archives we write store '/', so that ordinary unzip tools
// read them. Matching an existing entry ignores case and trailing separators, as reads do.
//
// Thread contract: one object per thread; two writers of one file must be serialised by the
// caller (the package layer holds its process-wide lock).

#include <cstddef>
#include <cstdint>
#include <ctime>
#include <string>
#include <string_view>
#include <unordered_map>
#include <vector>

struct zip;
struct zip_source;

namespace ac {

class PackageWriter {
public:
    enum class OpenResult { Ok, Missing, NotAnArchive, Failed };

    PackageWriter() = default;
    ~PackageWriter();
    PackageWriter(const PackageWriter&) = delete;
    PackageWriter& operator=(const PackageWriter&) = delete;

    // Starts from the package at filePath. A missing file, or one that is no Zip archive,
    // leaves the writer closed: the caller decides whether to start a new one with Create.
    OpenResult Open(const std::string& filePath);
    // Starts from the bytes of an archive in memory.
    OpenResult OpenFromMemory(std::string bytes);
    // Starts an empty archive.
    bool Create();
    bool IsOpen() const { return m_zip != nullptr; }

    bool Has(std::string_view name) const;
    // Reads an entry as it stands in the archive being edited; false when it is missing,
    // declared larger than maxSize, or short.
    bool Read(std::string_view name, std::string& contents, std::size_t maxSize) const;

    // Adds an entry, replacing every entry of the same name (and keeping the spelling of the
    // first one it replaces). Deflated at zlib's default level;
    // an empty entry is stored. mtime 0 means now.
    bool Put(std::string_view name, std::string_view data, std::time_t mtime = 0);
    // Deletes every entry of that name; false when there was none.
    bool Remove(std::string_view name);
    // Adds a directory entry (trailing '/', attribute 0x10) unless one exists already.
    bool AddDirectory(std::string_view name, std::time_t mtime = 0);
    // Adds the directory entries of all parent folders of name that are missing.
    bool AddParentDirectories(std::string_view name);

    // Builds the finished archive and answers its bytes; the writer is closed afterwards.
    bool Finish(std::string& bytes);
    // Finish, then replace filePath atomically with the result.
    bool Commit(const std::string& filePath);

    // Archive spelling of a name: '/' separators, no leading separator.
    static std::string StoredName(std::string_view name);

private:
    OpenResult OpenMemory(std::string bytes);
    void Discard();
    bool SetAttributes(std::uint64_t index, bool directory, std::time_t mtime);
    std::vector<std::uint64_t> Matches(std::string_view name) const;
    bool DeleteAll(std::string_view name);
    void Remember(const std::string& name, std::uint64_t index);

    struct MemoryArchive;

    struct zip* m_zip = nullptr;
    struct zip_source* m_source = nullptr;
    MemoryArchive* m_memory = nullptr;  // owned by m_source: the old archive, then the new one
    // Live entries by lookup key, so that building a package of thousands of entries does not
    // rescan the archive at every addition.
    std::unordered_map<std::string, std::vector<std::uint64_t>> m_entries;
    std::size_t m_liveCount = 0;
};

}  // namespace ac
