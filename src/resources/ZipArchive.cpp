#include "resources/ZipArchive.h"

#include "resources/Package.h"
#include "resources/TextScan.h"

#include <zip.h>

#include <algorithm>

namespace ac {
namespace {

// Entry indexes are 16 bits wide and the top value means "none", so anything past it can
// never be named by a caller.
constexpr zip_uint64_t kMaxEntries = kNoEntry;

// Reads grow the buffer as data arrives instead of trusting the declared size up front: a
// forged header must not make us allocate and clear tens of megabytes for a few bytes.
constexpr std::size_t kReadChunk = 64 * 1024;

}  // namespace

std::string ZipArchive::LookupKey(std::string_view name) {
    std::string key;
    key.reserve(name.size());
    for (char c : name) {
        key.push_back(c == '/' ? '\\' : ToLowerAscii(c));
    }
    while (!key.empty() && key.back() == '\\') {
        key.pop_back();
    }
    return key;
}

std::shared_ptr<ZipArchive> ZipArchive::Open(const std::string& filePath) {
    int error = 0;
    zip_t* handle = zip_open(filePath.c_str(), ZIP_RDONLY, &error);
    if (handle == nullptr) {
        return nullptr;
    }
    std::shared_ptr<ZipArchive> archive(new ZipArchive);
    archive->m_zip = handle;
    if (!archive->LoadEntryTable()) {
        return nullptr;
    }
    return archive;
}

std::shared_ptr<ZipArchive> ZipArchive::OpenFromMemory(std::string bytes) {
    std::shared_ptr<ZipArchive> archive(new ZipArchive);
    archive->m_bytes = std::move(bytes);
    zip_error_t error;
    zip_error_init(&error);
    zip_source_t* source =
        zip_source_buffer_create(archive->m_bytes.data(), archive->m_bytes.size(), 0, &error);
    zip_error_fini(&error);
    if (source == nullptr) {
        return nullptr;
    }
    zip_error_init(&error);
    archive->m_zip = zip_open_from_source(source, ZIP_RDONLY, &error);
    zip_error_fini(&error);
    if (archive->m_zip == nullptr) {
        zip_source_free(source);
        return nullptr;
    }
    if (!archive->LoadEntryTable()) {
        return nullptr;
    }
    return archive;
}

ZipArchive::~ZipArchive() {
    if (m_zip != nullptr) {
        zip_discard(m_zip);
    }
}

bool ZipArchive::LoadEntryTable() {
    zip_int64_t count = zip_get_num_entries(m_zip, 0);
    if (count < 0) {
        return false;
    }
    auto usable = std::min(static_cast<zip_uint64_t>(count), kMaxEntries);
    m_entries.resize(usable);
    for (zip_uint64_t index = 0; index < usable; ++index) {
        ZipEntry& entry = m_entries[index];
        if (const char* name = zip_get_name(m_zip, index, 0)) {
            entry.name = name;
            std::replace(entry.name.begin(), entry.name.end(), '/', '\\');
        }
        zip_stat_t stat;
        zip_stat_init(&stat);
        if (zip_stat_index(m_zip, index, 0, &stat) == 0 && (stat.valid & ZIP_STAT_SIZE)) {
            entry.size = stat.size;
        }
        zip_uint8_t system = 0;
        zip_uint32_t attributes = 0;
        if (zip_file_get_external_attributes(m_zip, index, 0, &system, &attributes) == 0) {
            entry.attributes = attributes;
        }
        m_lookup.emplace(LookupKey(entry.name), static_cast<unsigned>(index));
    }
    return true;
}

unsigned ZipArchive::Find(std::string_view name) const {
    auto found = m_lookup.find(LookupKey(name));
    return found == m_lookup.end() ? kNoEntry : found->second;
}

ZipArchive::ReadStatus ZipArchive::Read(std::string_view name, std::string& contents,
                                        std::size_t maxSize) const {
    unsigned index = Find(name);
    if (index == kNoEntry) {
        contents.clear();
        return ReadStatus::NoEntry;
    }
    return Read(index, contents, maxSize);
}

ZipArchive::ReadStatus ZipArchive::Read(unsigned index, std::string& contents,
                                        std::size_t maxSize) const {
    contents.clear();
    if (index >= m_entries.size()) {
        return ReadStatus::NoEntry;
    }
    const std::uint64_t size = m_entries[index].size;
    if (size > maxSize) {
        return ReadStatus::TooLarge;
    }
    std::lock_guard lock(m_readMutex);
    zip_file_t* file = zip_fopen_index(m_zip, index, 0);
    if (file == nullptr) {
        return ReadStatus::Failed;
    }
    const auto wanted = static_cast<std::size_t>(size);
    std::size_t done = 0;
    while (done < wanted) {
        std::size_t step = std::min(kReadChunk, wanted - done);
        contents.resize(done + step);
        zip_int64_t got = zip_fread(file, contents.data() + done, step);
        if (got <= 0) {
            break;
        }
        done += static_cast<std::size_t>(got);
    }
    zip_fclose(file);
    contents.resize(done);
    return done == wanted ? ReadStatus::Ok : ReadStatus::Failed;
}

}  // namespace ac
