#pragma once
// The package file system: every skin, language file and profile lives inside data.pkg
// (read-only, beside the program) or user.pkg (the user's profiles, in the user data folder).
// Callers build logical paths such as BASE\Skin\Default\skin.ini; the text of the path alone
// decides which package holds the entry. A path naming no package is a plain disk path.
//
// Logical paths use '\' as separator below the base directory; the base directory itself is a
// real path with '/'. Entry names come back with '\' whatever the archive stores.
//
// Thread contract: OpenPackage, ReadResource, ResourceExists and ImPackageFinder may be called
// from any thread; each open archive serialises its own entry reads. ReadIniString, ReadIniInt,
// WriteIniString and RemoveResource run under one process-wide lock.

#include <cstddef>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

namespace ac {

class ZipArchive;

// Entry indexes are 16 bits wide; this one means "no such entry".
inline constexpr unsigned kNoEntry = 0xFFFF;

// The largest entry the layer will inflate into memory. A declared size above this is taken
// for a damaged or hostile archive (a zip bomb), not for a skin picture.
inline constexpr std::size_t kMaxEntrySize = 64u * 1024u * 1024u;

std::string MapResourcePath(std::string_view path);
std::string GetPackageFile(std::string_view path);
std::string GetEntryName(std::string_view path);

// The file on disk behind a package path: user.pkg lives in the user data folder, every other
// package where its path says.
std::string PackageFileOnDisk(std::string_view packagePath);

// The shared archive of the package named in the path, or null when the package file is
// missing or is no readable Zip archive.
std::shared_ptr<ZipArchive> OpenPackage(std::string_view path);
void ClosePackage(std::string_view path);
// The archive the open table holds for the package named in the path, without opening one:
// lets a cache tell whether the archive it read from is still the current one.
std::shared_ptr<ZipArchive> FindOpenPackage(std::string_view path);

bool ResourceExists(std::string_view path);
// Reads a whole entry. False for a missing package or entry, an entry above kMaxEntrySize,
// or a short read.
bool ReadResource(std::string_view path, std::vector<unsigned char>& block);

// Removes one entry of a writable package (user.pkg). True when the entry is gone from the
// file on disk; false when it was not there or the package could not be rewritten.
bool RemoveResource(std::string_view path);

// Private-profile shaped calls on ini entries inside packages (see IniFile.h for the rules).
// ReadIniString copies the value into buffer when it fits with its NUL, and answers the value's
// length, 0 when not found.
std::size_t ReadIniString(const char* section, const char* key, const char* defaultValue,
                          char* buffer, std::size_t bufferSize, std::string_view path);
int ReadIniInt(const char* section, const char* key, int defaultValue, std::string_view path);
bool WriteIniString(const char* section, const char* key, const char* value,
                    std::string_view path);

// Convenience for callers that want a std::string: the same lookup with a buffer of
// bufferSize bytes.
std::string ReadIniText(const char* section, const char* key, const char* defaultValue,
                        std::string_view path, std::size_t bufferSize = 260);

// Enumerator and line reader over package entries; one use at a time.
class ImPackageFinder {
public:
    ImPackageFinder() = default;

    bool FindFile(std::string_view pattern);
    bool FindNextFile();
    std::string GetFileName() const;
    std::string GetFilePath() const;
    bool IsDirectory() const;
    void Close();

    bool ReadLines(std::string_view path);
    bool NextLine(std::string& line);
    void Reset();

    const std::vector<std::string>& Names() const { return m_names; }

private:
    std::vector<std::string> m_names;
    int m_index = -1;
    std::string m_path;
};

}  // namespace ac
