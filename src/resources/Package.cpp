#include "resources/Package.h"

#include "platform/AtomicFile.h"
#include "platform/Paths.h"
#include "resources/IniFile.h"
#include "resources/PackageWriter.h"
#include "resources/ZipArchive.h"

#include <glob.h>
#include <sys/stat.h>

#include <algorithm>
#include <cstring>
#include <map>
#include <mutex>

namespace ac {
namespace {

constexpr std::string_view kUserPackage = "user.pkg";

// The open archive table. Entries stay until ClosePackage; callers hold shared pointers, so an
// archive closed under a reader's feet lives on until that reader lets go.
std::mutex s_tableMutex;
std::map<std::string, std::shared_ptr<ZipArchive>, std::less<>> s_openArchives;

// The one lock round the ini calls and package writes: they share one ImIniFile, and two
// rewrites of user.pkg must not interleave or one would lose the other's change.
std::mutex s_iniMutex;

ImIniFile& SharedIniFile() {
    static ImIniFile instance;
    return instance;
}

bool Contains(std::string_view text, std::string_view word) {
    return text.find(word) != std::string_view::npos;
}

void ReplaceAll(std::string& text, std::string_view from, std::string_view to) {
    for (std::size_t pos = text.find(from); pos != std::string::npos;
         pos = text.find(from, pos + to.size())) {
        text.replace(pos, from.size(), to);
    }
}

void ReplaceFirst(std::string& text, std::string_view from, std::string_view to) {
    std::size_t pos = text.find(from);
    if (pos != std::string::npos) {
        text.replace(pos, from.size(), to);
    }
}

// Logical paths keep '\' below the base directory; the disk wants '/'.
std::string DiskPath(std::string_view logicalPath) {
    std::string path(logicalPath);
    std::replace(path.begin(), path.end(), '\\', '/');
    return path;
}

bool IsUserPackageFile(std::string_view packageFile) {
    std::size_t separator = packageFile.find_last_of("\\/");
    std::string_view name =
        separator == std::string_view::npos ? packageFile : packageFile.substr(separator + 1);
    return name == kUserPackage;
}

bool FileExists(const std::string& path) {
    struct stat st {};
    return ::stat(path.c_str(), &st) == 0 && S_ISREG(st.st_mode);
}

bool PlainPathExists(std::string_view path) {
    std::string disk = DiskPath(path);
    if (disk.find_first_of("*?") == std::string::npos) {
        struct stat st {};
        return ::stat(disk.c_str(), &st) == 0;
    }
    glob_t matches{};
    int result = ::glob(disk.c_str(), GLOB_NOSORT | GLOB_NOESCAPE, nullptr, &matches);
    bool found = result == 0 && matches.gl_pathc > 0;
    ::globfree(&matches);
    return found;
}

std::string ParentDirectory(const std::string& path) {
    std::size_t slash = path.find_last_of('/');
    return slash == std::string::npos ? std::string(".") : path.substr(0, slash);
}

struct WriteTarget {
    std::string packageFile;  // as it stands in the logical path: the key of the open table
    std::string entry;
    std::string diskFile;
};

// Only user.pkg is ever written: data.pkg belongs to the installation.
bool ResolveWriteTarget(std::string_view path, WriteTarget& target) {
    std::string mapped = MapResourcePath(path);
    target.packageFile = GetPackageFile(mapped);
    target.entry = GetEntryName(mapped);
    if (target.packageFile.empty() || target.entry.empty() ||
        !IsUserPackageFile(target.packageFile)) {
        return false;
    }
    target.diskFile = PackageFileOnDisk(target.packageFile);
    return true;
}

// Opens user.pkg for a rewrite. A file that is no Zip archive is moved aside, not repaired or
// overwritten: the user may still get something out of it, and can keep saving meanwhile.
bool OpenForRewrite(PackageWriter& writer, const std::string& diskFile, bool createMissing) {
    switch (writer.Open(diskFile)) {
        case PackageWriter::OpenResult::Ok:
            return true;
        case PackageWriter::OpenResult::Missing:
            return createMissing && platform::EnsureDirectory(ParentDirectory(diskFile)) &&
                   writer.Create();
        case PackageWriter::OpenResult::NotAnArchive:
            return createMissing && !platform::SetAsideDamagedFile(diskFile).empty() &&
                   writer.Create();
        case PackageWriter::OpenResult::Failed:
            break;
    }
    return false;
}

bool WriteIniStringLocked(const char* section, const char* key, const char* value,
                          std::string_view path) {
    WriteTarget target;
    if (!ResolveWriteTarget(path, target)) {
        return false;
    }
    PackageWriter writer;
    if (!OpenForRewrite(writer, target.diskFile, true)) {
        return false;
    }
    std::string text;
    if (writer.Has(target.entry) && !writer.Read(target.entry, text, kMaxEntrySize)) {
        // An entry we cannot read whole would be replaced by a fragment plus one key.
        return false;
    }
    ImIniFile& ini = SharedIniFile();
    ini.LoadFromText(text);
    bool ok = ini.SetValue(section, key, value) && writer.Put(target.entry, ini.SaveText()) &&
              writer.Commit(target.diskFile);
    ClosePackage(target.packageFile);
    return ok;
}

}  // namespace

std::string MapResourcePath(std::string_view path) {
    std::string mapped(path);
    if (Contains(mapped, "data.pkg") || Contains(mapped, kUserPackage)) {
        return mapped;
    }
    if (Contains(mapped, "Skin\\")) {
        ReplaceAll(mapped, "Skin\\", "data.pkg\\skin\\");
    }
    if (Contains(mapped, "lang\\")) {
        ReplaceAll(mapped, "lang\\", "data.pkg\\lang\\");
    }
    if (Contains(mapped, "profile\\")) {
        ReplaceAll(mapped, "profile\\",
                   Contains(mapped, "user\\") ? "user.pkg\\profile\\" : "data.pkg\\profile\\");
    }
    return mapped;
}

std::string GetPackageFile(std::string_view path) {
    std::size_t pos = path.find(".pkg");
    return pos == std::string_view::npos ? std::string() : std::string(path.substr(0, pos + 4));
}

std::string GetEntryName(std::string_view path) {
    std::size_t pos = path.find(".pkg\\");
    return pos == std::string_view::npos ? std::string() : std::string(path.substr(pos + 5));
}

std::string PackageFileOnDisk(std::string_view packagePath) {
    std::string packageFile = GetPackageFile(packagePath);
    if (packageFile.empty()) {
        packageFile = packagePath;
    }
    if (IsUserPackageFile(packageFile)) {
        return platform::UserDataDirectory() + "/" + std::string(kUserPackage);
    }
    return DiskPath(packageFile);
}

// The package calls take logical paths too: mapping is a no-op on a path that names a package.
std::shared_ptr<ZipArchive> OpenPackage(std::string_view path) {
    std::string packageFile = GetPackageFile(MapResourcePath(path));
    if (packageFile.empty()) {
        return nullptr;
    }
    std::string diskFile = PackageFileOnDisk(packageFile);
    if (!FileExists(diskFile)) {
        return nullptr;
    }
    {
        std::lock_guard lock(s_tableMutex);
        auto found = s_openArchives.find(packageFile);
        if (found != s_openArchives.end()) {
            return found->second;
        }
    }
    // Opened outside the table lock: a large central directory must not stall readers of
    // other packages. If two threads race, the first one in the table wins.
    auto archive = ZipArchive::Open(diskFile);
    if (archive == nullptr) {
        return nullptr;
    }
    std::lock_guard lock(s_tableMutex);
    auto [slot, inserted] = s_openArchives.emplace(packageFile, archive);
    return slot->second;
}

void ClosePackage(std::string_view path) {
    std::string packageFile = GetPackageFile(MapResourcePath(path));
    std::shared_ptr<ZipArchive> closing;
    std::lock_guard lock(s_tableMutex);
    auto found = s_openArchives.find(packageFile);
    if (found != s_openArchives.end()) {
        closing = std::move(found->second);
        s_openArchives.erase(found);
    }
}

std::shared_ptr<ZipArchive> FindOpenPackage(std::string_view path) {
    std::string packageFile = GetPackageFile(MapResourcePath(path));
    std::lock_guard lock(s_tableMutex);
    auto found = s_openArchives.find(packageFile);
    return found == s_openArchives.end() ? nullptr : found->second;
}

bool ResourceExists(std::string_view path) {
    std::string mapped = MapResourcePath(path);
    if (!Contains(mapped, ".pkg")) {
        return PlainPathExists(path);
    }
    auto archive = OpenPackage(mapped);
    return archive != nullptr && archive->Find(GetEntryName(mapped)) != kNoEntry;
}

bool ReadResource(std::string_view path, std::vector<unsigned char>& block) {
    block.clear();
    std::string mapped = MapResourcePath(path);
    auto archive = OpenPackage(mapped);
    if (archive == nullptr) {
        return false;
    }
    std::string contents;
    if (archive->Read(GetEntryName(mapped), contents, kMaxEntrySize) !=
        ZipArchive::ReadStatus::Ok) {
        return false;
    }
    block.assign(contents.begin(), contents.end());
    return true;
}

bool RemoveResource(std::string_view path) {
    std::lock_guard lock(s_iniMutex);
    WriteTarget target;
    if (!ResolveWriteTarget(path, target)) {
        return false;
    }
    PackageWriter writer;
    bool ok = OpenForRewrite(writer, target.diskFile, false) && writer.Remove(target.entry) &&
              writer.Commit(target.diskFile);
    ClosePackage(target.packageFile);
    return ok;
}

std::size_t ReadIniString(const char* section, const char* key, const char* defaultValue,
                          char* buffer, std::size_t bufferSize, std::string_view path) {
    std::lock_guard lock(s_iniMutex);
    if (buffer != nullptr && bufferSize > 0) {
        std::size_t length = defaultValue == nullptr ? 0 : std::strlen(defaultValue);
        length = std::min(length, bufferSize - 1);
        if (length > 0) {
            std::memcpy(buffer, defaultValue, length);
        }
        buffer[length] = '\0';
    }
    ImIniFile& ini = SharedIniFile();
    std::string value;
    if (!ini.LoadText(MapResourcePath(path)) || !ini.GetValue(section, key, value)) {
        return 0;
    }
    value = CleanIniValue(value);
    if (buffer != nullptr && value.size() < bufferSize) {
        std::memcpy(buffer, value.c_str(), value.size() + 1);
    }
    return value.size();
}

int ReadIniInt(const char* section, const char* key, int defaultValue, std::string_view path) {
    std::lock_guard lock(s_iniMutex);
    ImIniFile& ini = SharedIniFile();
    int value = defaultValue;
    if (ini.LoadText(MapResourcePath(path)) && ini.GetIntValue(section, key, value)) {
        return value;
    }
    return defaultValue;
}

bool WriteIniString(const char* section, const char* key, const char* value,
                    std::string_view path) {
    std::lock_guard lock(s_iniMutex);
    return WriteIniStringLocked(section, key, value, path);
}

std::string ReadIniText(const char* section, const char* key, const char* defaultValue,
                        std::string_view path, std::size_t bufferSize) {
    std::vector<char> buffer(bufferSize + 1, '\0');
    ReadIniString(section, key, defaultValue, buffer.data(), bufferSize, path);
    return std::string(buffer.data());
}

// ImPackageFinder --------------------------------------------------------------------------

bool ImPackageFinder::FindFile(std::string_view pattern) {
    Close();
    std::string path(pattern);

    // A listing is a whole directory: the extension in the pattern is not applied.
    static constexpr std::pair<std::string_view, std::string_view> kDirectoryPatterns[] = {
        {"lang\\*.lang", "data.pkg\\lang\\"},
        {"Skin\\*.*", "data.pkg\\skin\\"},
        {"profile\\*.*", "data.pkg\\profile\\"},
        {"profile\\*.pf", "data.pkg\\profile\\"},
        {"profile\\user\\*.*", "user.pkg\\profile\\user\\"},
        {"profile\\user\\*.pf", "user.pkg\\profile\\user\\"},
    };
    for (const auto& [from, to] : kDirectoryPatterns) {
        if (Contains(path, from)) {
            ReplaceFirst(path, from, to);
            break;
        }
    }

    std::string wanted;
    const bool namedLookup = path.empty() || path.back() != '\\';
    if (namedLookup) {
        // Only the logical part behind the real base directory (from its first '\') is folded
        // to lower case: on this system the base directory's own spelling matters.
        std::size_t lastSlash = path.find_last_of('/');
        std::size_t logical = path.find('\\', lastSlash == std::string::npos ? 0 : lastSlash);
        logical = std::min(logical, path.size());
        std::transform(path.begin() + static_cast<std::ptrdiff_t>(logical), path.end(),
                       path.begin() + static_cast<std::ptrdiff_t>(logical), [](char c) {
                           return (c >= 'A' && c <= 'Z') ? static_cast<char>(c - 'A' + 'a') : c;
                       });
        std::size_t last = path.find_last_of('\\');
        wanted = last == std::string::npos ? path : path.substr(last + 1);
        path = last == std::string::npos ? std::string() : path.substr(0, last + 1);
        std::string logicalPart = path.substr(std::min(logical, path.size()));
        if (!Contains(logicalPart, ".pkg")) {
            if (Contains(logicalPart, "skin")) {
                ReplaceFirst(logicalPart, "skin", "data.pkg\\skin");
            } else if (Contains(logicalPart, "lang")) {
                ReplaceFirst(logicalPart, "lang", "data.pkg\\lang");
            } else if (Contains(logicalPart, "profile")) {
                ReplaceFirst(logicalPart, "profile", "data.pkg\\profile");
            }
            path = path.substr(0, std::min(logical, path.size())) + logicalPart;
        }
    }

    if (GetPackageFile(path).empty()) {
        return false;
    }
    auto archive = OpenPackage(path);
    if (archive == nullptr) {
        return false;
    }
    m_path = path;
    const std::string prefix = GetEntryName(path);
    bool found = false;
    for (const ZipEntry& entry : archive->Entries()) {
        const std::string& name = entry.name;
        if (name.size() <= prefix.size() || name.compare(0, prefix.size(), prefix) != 0) {
            continue;
        }
        std::string_view rest(name);
        rest.remove_prefix(prefix.size());
        rest.remove_prefix(std::min(rest.find_first_not_of('\\'), rest.size()));
        rest = rest.substr(0, rest.find('\\'));
        if (rest.empty()) {
            continue;
        }
        std::string component(rest);
        if (namedLookup && ZipArchive::LookupKey(component) == ZipArchive::LookupKey(wanted)) {
            found = true;
        }
        m_names.push_back(std::move(component));
    }
    std::sort(m_names.begin(), m_names.end());
    m_names.erase(std::unique(m_names.begin(), m_names.end()), m_names.end());
    return namedLookup ? found : !m_names.empty();
}

bool ImPackageFinder::FindNextFile() {
    if (m_index + 1 < static_cast<int>(m_names.size())) {
        ++m_index;
    }
    return m_index + 1 < static_cast<int>(m_names.size());
}

std::string ImPackageFinder::GetFileName() const {
    if (m_index < 0 || static_cast<std::size_t>(m_index) >= m_names.size()) {
        return {};
    }
    return m_names[static_cast<std::size_t>(m_index)];
}

std::string ImPackageFinder::GetFilePath() const {
    return m_path + GetFileName();
}

bool ImPackageFinder::IsDirectory() const {
    std::string entry = GetEntryName(GetFilePath());
    std::size_t first = entry.find_first_not_of('\\');
    if (first == std::string::npos) {
        return false;
    }
    entry = entry.substr(first, entry.find_last_not_of('\\') - first + 1) + "\\";
    auto archive = OpenPackage(m_path);
    if (archive == nullptr) {
        return false;
    }
    unsigned index = archive->Find(entry);
    return index != kNoEntry && archive->Entries()[index].IsDirectory();
}

void ImPackageFinder::Close() {
    m_path.clear();
    m_names.clear();
    m_index = -1;
}

bool ImPackageFinder::ReadLines(std::string_view path) {
    Reset();
    std::string mapped = MapResourcePath(path);
    auto archive = OpenPackage(mapped);
    if (archive == nullptr) {
        return false;
    }
    std::string text;
    auto status = archive->Read(GetEntryName(mapped), text, kMaxEntrySize);
    if (status == ZipArchive::ReadStatus::NoEntry) {
        return false;
    }
    m_path = mapped;
    std::string_view rest(text);
    while (!rest.empty()) {
        std::size_t end = rest.find('\n');
        if (end == std::string_view::npos) {
            m_names.emplace_back(rest);
            break;
        }
        m_names.emplace_back(rest.substr(0, end));
        rest.remove_prefix(end + 1);
    }
    return status == ZipArchive::ReadStatus::Ok;
}

bool ImPackageFinder::NextLine(std::string& line) {
    if (m_index < 0 || static_cast<std::size_t>(m_index) >= m_names.size()) {
        return false;
    }
    line = m_names[static_cast<std::size_t>(m_index++)];
    return true;
}

void ImPackageFinder::Reset() {
    m_path.clear();
    m_names.clear();
    m_index = 0;
}

}  // namespace ac
