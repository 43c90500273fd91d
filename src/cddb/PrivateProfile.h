#pragma once
// A plain ini file read and written the way the Windows private-profile calls did, for the
// .cddb records: other programs wrote these files by hand or in their own code page, so the
// reader forgives what they did.
//
// Reading rules: section and key names are matched without regard to case; blanks around
// names, keys and values are dropped; lines end at LF, CR LF, a lone CR or a NUL byte (the
// Unix form of the records overwrites every CR with a NUL); lines without '=' and lines
// starting with ';' are skipped; keys above the first section are unreachable; the first
// occurrence of a key wins, also across repeated sections. A text that is not UTF-8 is
// decoded by the code-page guess. A missing file, section or key reads as the default.
//
// Thread contract: a plain value; its holder decides.

#include <cstddef>
#include <map>
#include <string>
#include <string_view>

namespace cddb {

// A .cddb record is a few kilobytes; anything past this is no record and is not read at all.
inline constexpr std::size_t kMaxProfileFileBytes = 4 * 1024 * 1024;

class PrivateProfile {
public:
    // False when there is no readable file at path: the record of an unknown disc. A file
    // above kMaxProfileFileBytes counts as found and reads as empty.
    bool LoadFile(const std::string& path);
    void LoadText(std::string_view bytes);

    std::string GetString(std::string_view section, std::string_view key,
                          std::string_view fallback = {}) const;
    // GetPrivateProfileInt: the number at the start of the value, atoi-style.
    int GetInt(std::string_view section, std::string_view key, int fallback = 0) const;

private:
    const std::string* Find(std::string_view section, std::string_view key) const;

    // Lower-cased section name, then lower-cased key.
    std::map<std::string, std::map<std::string, std::string>, std::less<>> m_sections;
};

// Builds an ini text in the order it is given, with CR LF line ends.
class PrivateProfileWriter {
public:
    void Section(std::string_view name);
    // Line ends and NUL bytes inside a value would cut the line: they are written as blanks.
    void Key(std::string_view key, std::string_view value);
    const std::string& Text() const { return m_text; }

private:
    std::string m_text;
};

}  // namespace cddb
