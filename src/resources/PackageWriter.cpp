#include "resources/PackageWriter.h"

#include "platform/AtomicFile.h"
#include "resources/Package.h"
#include "resources/ZipArchive.h"

#include <zip.h>

#include <algorithm>
#include <cstdlib>
#include <cstring>
#include <vector>

namespace ac {
namespace {

// A rewrite holds the old and the new archive in memory at once; a user package is a few
// profiles, so anything near this is not ours to rewrite.
constexpr std::size_t kMaxPackageFile = 512u * 1024u * 1024u;

constexpr zip_uint32_t kUnixFileMode = 0100644u;
constexpr zip_uint32_t kUnixDirectoryMode = 040755u;

// An archive without entries is only its end-of-central-directory record. libzip deletes the
// file instead of writing this, and a missing package is not what a caller who removed the
// last entry asked for.
constexpr unsigned char kEmptyArchive[22] = {0x50, 0x4b, 0x05, 0x06};

bool ReadWholeSource(zip_source_t* source, std::string& bytes) {
    bytes.clear();
    if (zip_source_open(source) < 0) {
        return false;
    }
    char chunk[65536];
    bool ok = true;
    for (;;) {
        zip_int64_t got = zip_source_read(source, chunk, sizeof chunk);
        if (got < 0) {
            ok = false;
            break;
        }
        if (got == 0) {
            break;
        }
        bytes.append(chunk, static_cast<std::size_t>(got));
    }
    zip_source_close(source);
    return ok;
}

}  // namespace

PackageWriter::~PackageWriter() {
    Discard();
}

void PackageWriter::Discard() {
    if (m_zip != nullptr) {
        zip_discard(m_zip);
        m_zip = nullptr;
    }
    if (m_source != nullptr) {
        zip_source_free(m_source);
        m_source = nullptr;
    }
    m_original.clear();
    m_entries.clear();
    m_liveCount = 0;
}

std::vector<zip_uint64_t> PackageWriter::Matches(std::string_view name) const {
    auto found = m_entries.find(ZipArchive::LookupKey(name));
    return found == m_entries.end() ? std::vector<zip_uint64_t>() : found->second;
}

void PackageWriter::Remember(const std::string& name, zip_uint64_t index) {
    m_entries[ZipArchive::LookupKey(name)].push_back(index);
    ++m_liveCount;
}

bool PackageWriter::DeleteAll(std::string_view name) {
    auto found = m_entries.find(ZipArchive::LookupKey(name));
    if (found == m_entries.end()) {
        return false;
    }
    for (zip_uint64_t index : found->second) {
        if (zip_delete(m_zip, index) != 0) {
            return false;
        }
        --m_liveCount;
    }
    m_entries.erase(found);
    return true;
}

std::string PackageWriter::StoredName(std::string_view name) {
    std::string stored(name);
    std::replace(stored.begin(), stored.end(), '\\', '/');
    stored.erase(0, stored.find_first_not_of('/'));
    return stored;
}

PackageWriter::OpenResult PackageWriter::Open(const std::string& filePath) {
    Discard();
    std::string bytes;
    switch (platform::ReadWholeFile(filePath, bytes, kMaxPackageFile)) {
        case platform::ReadResult::Ok:
            return OpenFromMemory(std::move(bytes));
        case platform::ReadResult::Missing:
            return OpenResult::Missing;
        default:
            return OpenResult::Failed;
    }
}

PackageWriter::OpenResult PackageWriter::OpenFromMemory(std::string bytes) {
    Discard();
    m_original = std::move(bytes);
    zip_error_t error;
    zip_error_init(&error);
    zip_source_t* source =
        zip_source_buffer_create(m_original.data(), m_original.size(), 0, &error);
    zip_error_fini(&error);
    if (source == nullptr) {
        return OpenResult::Failed;
    }
    return OpenSource(source);
}

bool PackageWriter::Create() {
    Discard();
    zip_error_t error;
    zip_error_init(&error);
    zip_source_t* source = zip_source_buffer_create(nullptr, 0, 0, &error);
    zip_error_fini(&error);
    return source != nullptr && OpenSource(source) == OpenResult::Ok;
}

PackageWriter::OpenResult PackageWriter::OpenSource(zip_source_t* source) {
    zip_error_t error;
    zip_error_init(&error);
    m_zip = zip_open_from_source(source, 0, &error);
    zip_error_fini(&error);
    if (m_zip == nullptr) {
        zip_source_free(source);
        m_original.clear();
        return OpenResult::NotAnArchive;
    }
    // The archive owns one reference; ours keeps the buffer alive past zip_close, which is
    // where the finished archive is read back from.
    zip_source_keep(source);
    m_source = source;
    zip_int64_t count = zip_get_num_entries(m_zip, 0);
    for (zip_int64_t index = 0; index < count; ++index) {
        if (const char* name = zip_get_name(m_zip, static_cast<zip_uint64_t>(index), 0)) {
            Remember(name, static_cast<zip_uint64_t>(index));
        }
    }
    return OpenResult::Ok;
}

bool PackageWriter::Has(std::string_view name) const {
    return m_zip != nullptr && m_entries.count(ZipArchive::LookupKey(name)) != 0;
}

bool PackageWriter::Read(std::string_view name, std::string& contents,
                         std::size_t maxSize) const {
    contents.clear();
    if (m_zip == nullptr) {
        return false;
    }
    auto matches = Matches(name);
    if (matches.empty()) {
        return false;
    }
    zip_stat_t stat;
    zip_stat_init(&stat);
    if (zip_stat_index(m_zip, matches.front(), 0, &stat) != 0 || !(stat.valid & ZIP_STAT_SIZE) ||
        stat.size > maxSize) {
        return false;
    }
    zip_file_t* file = zip_fopen_index(m_zip, matches.front(), 0);
    if (file == nullptr) {
        return false;
    }
    contents.resize(static_cast<std::size_t>(stat.size));
    std::size_t done = 0;
    while (done < contents.size()) {
        zip_int64_t got = zip_fread(file, contents.data() + done, contents.size() - done);
        if (got <= 0) {
            break;
        }
        done += static_cast<std::size_t>(got);
    }
    zip_fclose(file);
    bool complete = done == contents.size();
    contents.resize(done);
    return complete;
}

bool PackageWriter::SetAttributes(std::uint64_t index, bool directory, std::time_t mtime) {
    zip_uint32_t attributes = directory ? (kUnixDirectoryMode << 16) | kDirectoryAttribute
                                        : (kUnixFileMode << 16);
    if (mtime == 0) {
        mtime = std::time(nullptr);
    }
    return zip_file_set_external_attributes(m_zip, index, 0, ZIP_OPSYS_UNIX, attributes) == 0 &&
           zip_file_set_mtime(m_zip, index, mtime, 0) == 0;
}

bool PackageWriter::Put(std::string_view name, std::string_view data, std::time_t mtime) {
    std::string stored = StoredName(name);
    while (!stored.empty() && stored.back() == '/') {
        stored.pop_back();
    }
    if (m_zip == nullptr || stored.empty()) {
        return false;
    }
    auto matches = Matches(stored);
    if (!matches.empty()) {
        // A replacement keeps the spelling it replaces: listings match names with case, so
        // writing "mp3.pf" over "MP3.pf" must not move the profile out of sight.
        stored = StoredName(zip_get_name(m_zip, matches.front(), 0));
        while (!stored.empty() && stored.back() == '/') {
            stored.pop_back();
        }
        if (!DeleteAll(stored)) {
            return false;
        }
    }
    if (stored.empty() || m_liveCount >= kNoEntry) {
        return false;
    }
    // libzip frees the copy once the archive is written or discarded.
    void* copy = nullptr;
    if (!data.empty()) {
        copy = std::malloc(data.size());
        if (copy == nullptr) {
            return false;
        }
        std::memcpy(copy, data.data(), data.size());
    }
    zip_source_t* source = zip_source_buffer(m_zip, copy, data.size(), 1);
    if (source == nullptr) {
        std::free(copy);
        return false;
    }
    zip_int64_t index = zip_file_add(m_zip, stored.c_str(), source, ZIP_FL_ENC_GUESS);
    if (index < 0) {
        zip_source_free(source);
        return false;
    }
    auto entry = static_cast<zip_uint64_t>(index);
    Remember(stored, entry);
    zip_int32_t method = data.empty() ? ZIP_CM_STORE : ZIP_CM_DEFLATE;
    return zip_set_file_compression(m_zip, entry, method, 0) == 0 &&
           SetAttributes(entry, false, mtime);
}

bool PackageWriter::Remove(std::string_view name) {
    return m_zip != nullptr && DeleteAll(name);
}

bool PackageWriter::AddDirectory(std::string_view name, std::time_t mtime) {
    std::string stored = StoredName(name);
    while (!stored.empty() && stored.back() == '/') {
        stored.pop_back();
    }
    if (m_zip == nullptr || stored.empty()) {
        return false;
    }
    if (Has(stored)) {
        return true;
    }
    if (m_liveCount >= kNoEntry) {
        return false;
    }
    zip_int64_t index = zip_dir_add(m_zip, stored.c_str(), ZIP_FL_ENC_GUESS);
    if (index < 0) {
        return false;
    }
    Remember(stored, static_cast<zip_uint64_t>(index));
    return SetAttributes(static_cast<zip_uint64_t>(index), true, mtime);
}

bool PackageWriter::AddParentDirectories(std::string_view name) {
    std::string stored = StoredName(name);
    for (std::size_t slash = stored.find('/'); slash != std::string::npos;
         slash = stored.find('/', slash + 1)) {
        if (slash + 1 < stored.size() && !AddDirectory(stored.substr(0, slash))) {
            return false;
        }
    }
    return true;
}

bool PackageWriter::Finish(std::string& bytes) {
    bytes.clear();
    if (m_zip == nullptr) {
        return false;
    }
    if (m_liveCount == 0) {
        Discard();
        bytes.assign(std::begin(kEmptyArchive), std::end(kEmptyArchive));
        return true;
    }
    if (zip_close(m_zip) != 0) {
        Discard();
        return false;
    }
    m_zip = nullptr;
    bool ok = ReadWholeSource(m_source, bytes);
    Discard();
    return ok;
}

bool PackageWriter::Commit(const std::string& filePath) {
    std::string bytes;
    return Finish(bytes) && platform::WriteFileAtomically(filePath, bytes);
}

}  // namespace ac
