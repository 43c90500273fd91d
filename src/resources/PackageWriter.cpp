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

}  // namespace

// The archive's bytes as a libzip source that can be read and rewritten in memory. libzip's own
// buffer source is not used: when a change only appends, libzip 1.7 "clones" the old buffer and
// then frees memory it was told it does not own. This source offers no cloning, so every
// rewrite goes to a fresh string and the old bytes stay untouched until the commit.
struct PackageWriter::MemoryArchive {
    std::string data;     // the archive as it stands
    std::string pending;  // the archive zip_close is writing
    std::size_t readOffset = 0;
    std::size_t writeOffset = 0;
    zip_error_t error;

    static zip_int64_t Callback(void* state, void* data, zip_uint64_t length,
                                zip_source_cmd_t command);
};

zip_int64_t PackageWriter::MemoryArchive::Callback(void* state, void* data, zip_uint64_t length,
                                                   zip_source_cmd_t command) {
    auto* self = static_cast<MemoryArchive*>(state);
    switch (command) {
        case ZIP_SOURCE_SUPPORTS:
            return ZIP_SOURCE_SUPPORTS_WRITABLE |
                   ZIP_SOURCE_MAKE_COMMAND_BITMASK(ZIP_SOURCE_ACCEPT_EMPTY);
        case ZIP_SOURCE_ACCEPT_EMPTY:
            return 1;
        case ZIP_SOURCE_OPEN:
            self->readOffset = 0;
            return 0;
        case ZIP_SOURCE_READ: {
            std::size_t left = self->data.size() - std::min(self->readOffset, self->data.size());
            auto count = static_cast<std::size_t>(std::min<zip_uint64_t>(length, left));
            std::memcpy(data, self->data.data() + self->readOffset, count);
            self->readOffset += count;
            return static_cast<zip_int64_t>(count);
        }
        case ZIP_SOURCE_CLOSE:
            return 0;
        case ZIP_SOURCE_STAT: {
            if (length < sizeof(zip_stat_t)) {
                zip_error_set(&self->error, ZIP_ER_INVAL, 0);
                return -1;
            }
            auto* stat = static_cast<zip_stat_t*>(data);
            zip_stat_init(stat);
            stat->size = self->data.size();
            stat->valid = ZIP_STAT_SIZE;
            return sizeof(zip_stat_t);
        }
        case ZIP_SOURCE_ERROR:
            return zip_error_to_data(&self->error, data, length);
        case ZIP_SOURCE_FREE:
            zip_error_fini(&self->error);
            delete self;
            return 0;
        case ZIP_SOURCE_SEEK: {
            zip_int64_t offset = zip_source_seek_compute_offset(self->readOffset, self->data.size(),
                                                                data, length, &self->error);
            if (offset < 0) {
                return -1;
            }
            self->readOffset = static_cast<std::size_t>(offset);
            return 0;
        }
        case ZIP_SOURCE_TELL:
            return static_cast<zip_int64_t>(self->readOffset);
        case ZIP_SOURCE_BEGIN_WRITE:
            self->pending.clear();
            self->writeOffset = 0;
            return 0;
        case ZIP_SOURCE_WRITE: {
            auto count = static_cast<std::size_t>(length);
            if (self->writeOffset + count > self->pending.size()) {
                self->pending.resize(self->writeOffset + count);
            }
            std::memcpy(self->pending.data() + self->writeOffset, data, count);
            self->writeOffset += count;
            return static_cast<zip_int64_t>(count);
        }
        case ZIP_SOURCE_SEEK_WRITE: {
            zip_int64_t offset = zip_source_seek_compute_offset(
                self->writeOffset, self->pending.size(), data, length, &self->error);
            if (offset < 0) {
                return -1;
            }
            self->writeOffset = static_cast<std::size_t>(offset);
            return 0;
        }
        case ZIP_SOURCE_TELL_WRITE:
            return static_cast<zip_int64_t>(self->writeOffset);
        case ZIP_SOURCE_COMMIT_WRITE:
            self->data = std::move(self->pending);
            self->pending.clear();
            self->readOffset = 0;
            return 0;
        case ZIP_SOURCE_ROLLBACK_WRITE:
            self->pending.clear();
            return 0;
        case ZIP_SOURCE_REMOVE:
            self->data.clear();
            return 0;
        default:
            zip_error_set(&self->error, ZIP_ER_OPNOTSUPP, 0);
            return -1;
    }
}

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
    m_memory = nullptr;
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
    return OpenMemory(std::move(bytes));
}

bool PackageWriter::Create() {
    Discard();
    return OpenMemory(std::string()) == OpenResult::Ok;
}

PackageWriter::OpenResult PackageWriter::OpenMemory(std::string bytes) {
    auto* memory = new MemoryArchive;
    memory->data = std::move(bytes);
    zip_error_init(&memory->error);
    zip_error_t error;
    zip_error_init(&error);
    zip_source_t* source = zip_source_function_create(&MemoryArchive::Callback, memory, &error);
    if (source == nullptr) {
        zip_error_fini(&error);
        zip_error_fini(&memory->error);
        delete memory;
        return OpenResult::Failed;
    }
    m_zip = zip_open_from_source(source, 0, &error);
    zip_error_fini(&error);
    if (m_zip == nullptr) {
        zip_source_free(source);  // frees memory too
        return OpenResult::NotAnArchive;
    }
    // The archive owns one reference; ours keeps the bytes reachable past zip_close, which is
    // where the finished archive is taken from.
    zip_source_keep(source);
    m_source = source;
    m_memory = memory;
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

bool PackageWriter::Read(std::string_view name, std::string& contents, std::size_t maxSize) const {
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
    zip_uint32_t attributes =
        directory ? (kUnixDirectoryMode << 16) | kDirectoryAttribute : (kUnixFileMode << 16);
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
    bytes = std::move(m_memory->data);
    Discard();
    return true;
}

bool PackageWriter::Commit(const std::string& filePath) {
    std::string bytes;
    return Finish(bytes) && platform::WriteFileAtomically(filePath, bytes);
}

}  // namespace ac
