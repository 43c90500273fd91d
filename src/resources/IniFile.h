#pragma once
// skin.ini and .pf texts: sections of "key = value" lines, held as an array of lines and never
// parsed further, so that a text that is written back keeps its order, its blank lines and
// everything we do not understand.
//
// The rules are those of the original private-profile texts and are deliberately narrow:
// - lines end in CR LF only; a text with bare LF line ends is one long line without keys;
// - a header is a line of more than two characters starting with '[' and ending with ']',
//   untrimmed, so "[Main] " is an ordinary line;
// - a key line is any other line with a '='; key and value are split at the first '=';
// - there is no comment syntax, and keys above the first header cannot be reached.
//
// Thread contract: none of its own. The package layer keeps one shared instance behind its
// process-wide lock; other instances belong to one thread.

#include <cstddef>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

namespace ac {

class ZipArchive;

class ImIniFile {
public:
    ImIniFile() = default;
    virtual ~ImIniFile() = default;

    int FindSection(const char* section) const;
    // Appends the header as the new last line when it is missing; -1 for a null name.
    int FindOrAddSection(const char* section);
    bool IsSectionLine(int index) const;
    // Searches from line `first` up to the next header; answers the line index or -1.
    int FindKey(int first, const char* key, std::string& value) const;

    bool GetValue(const char* section, const char* key, std::string& value) const;
    // "0x"/"0X" reads as hexadecimal into 32 bits (so the top bit gives a negative number);
    // anything else follows atoi.
    bool GetIntValue(const char* section, const char* key, int& value) const;
    // Replaces the key's line where it stands, or inserts a new one right behind the header.
    bool SetValue(const char* section, const char* key, const char* value);

    // Loads the entry that a mapped package path names, unless it is the text already held.
    // Texts of user.pkg are always read anew, because writes change them behind the cache.
    bool LoadText(std::string_view mappedPath);
    // Replaces the lines with this text (up to its first NUL) and forgets the cached path.
    void LoadFromText(std::string_view text);
    // The lines, each followed by CR LF: the form written back into a package.
    std::string SaveText() const;

    const std::vector<std::string>& Lines() const { return m_lines; }

private:
    void SplitLines(std::string_view text);

    std::string m_lineEnd = "\r\n";
    std::vector<std::string> m_lines;
    // The one-file cache: which text m_lines holds, and the archive it came from, so that a
    // package closed and opened again is read again.
    std::string m_cachedPath;
    std::weak_ptr<ZipArchive> m_cachedArchive;
};

// ReadIniString's view of a value: white space, then double quotes, off both ends.
std::string CleanIniValue(std::string_view value);

// The number of texts parsed since start, for tests and benchmarks of the cache.
std::size_t IniLoadCount();

}  // namespace ac
