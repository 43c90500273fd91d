#include "platform/SettingsStore.h"

#include "platform/AtomicFile.h"
#include "platform/Paths.h"

#include <fcntl.h>
#include <sys/file.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <charconv>
#include <climits>
#include <utility>

namespace ac::platform {
namespace {

constexpr std::string_view kIntPrefix = "dword:";
constexpr std::string_view kStringPrefix = "sz:";
// Accepted on reading like a plain string, as the registry's expandable strings are.
constexpr std::string_view kExpandPrefix = "expand_sz:";

constexpr std::string_view kFileHeader =
    "; Velmorant Audio Converter settings. The program rewrites this file on every change:\n"
    "; edit it only while the program is closed. Values: dword:<number> or sz:<text>, where\n"
    "; \\\\ \\n \\r \\t and \\xHH stand for a backslash and control characters.\n";

bool EqualsNoCase(std::string_view a, std::string_view b) {
    return a.size() == b.size() &&
           std::equal(a.begin(), a.end(), b.begin(), [](char x, char y) {
               auto lower = [](char c) { return (c >= 'A' && c <= 'Z') ? char(c + 32) : c; };
               return lower(x) == lower(y);
           });
}

std::string_view Trim(std::string_view text) {
    auto blank = [](char c) { return c == ' ' || c == '\t'; };
    while (!text.empty() && blank(text.front())) text.remove_prefix(1);
    while (!text.empty() && blank(text.back())) text.remove_suffix(1);
    return text;
}

// Length of the well-formed UTF-8 sequence that starts at text[i], or 0 if there is none.
std::size_t Utf8SequenceLength(std::string_view text, std::size_t i) {
    auto byte = static_cast<unsigned char>(text[i]);
    std::size_t extra = 0;
    std::uint32_t codePoint = 0;
    if (byte < 0x80) {
        return 1;
    } else if ((byte & 0xE0) == 0xC0) {
        extra = 1, codePoint = byte & 0x1F;
    } else if ((byte & 0xF0) == 0xE0) {
        extra = 2, codePoint = byte & 0x0F;
    } else if ((byte & 0xF8) == 0xF0) {
        extra = 3, codePoint = byte & 0x07;
    } else {
        return 0;
    }
    if (i + extra >= text.size()) {
        return 0;
    }
    for (std::size_t k = 1; k <= extra; ++k) {
        auto next = static_cast<unsigned char>(text[i + k]);
        if ((next & 0xC0) != 0x80) {
            return 0;
        }
        codePoint = (codePoint << 6) | (next & 0x3F);
    }
    static constexpr std::uint32_t kMinimum[] = {0, 0x80, 0x800, 0x10000};
    if (codePoint < kMinimum[extra] || codePoint > 0x10FFFF ||
        (codePoint >= 0xD800 && codePoint <= 0xDFFF)) {
        return 0;
    }
    return extra + 1;
}

bool IsValidUtf8(std::string_view text) {
    for (std::size_t i = 0; i < text.size();) {
        std::size_t length = Utf8SequenceLength(text, i);
        if (length == 0) {
            return false;
        }
        i += length;
    }
    return true;
}

std::string FormatValue(const SettingValue& value) {
    if (value.type == SettingType::Int) {
        return std::string(kIntPrefix) + std::to_string(value.number);
    }
    return std::string(kStringPrefix) + EscapeSettingText(value.text);
}

// Holds an exclusive flock on "<settings>.lock" so that two programs (the window and a
// command-line run) never interleave their read-modify-write.
class FileLock {
public:
    explicit FileLock(const std::string& path)
        : m_fd(::open(path.c_str(), O_RDWR | O_CREAT | O_CLOEXEC, 0600)) {
        if (m_fd >= 0) {
            while (::flock(m_fd, LOCK_EX) != 0 && errno == EINTR) {
            }
        }
    }
    ~FileLock() {
        if (m_fd >= 0) {
            ::close(m_fd);
        }
    }
    FileLock(const FileLock&) = delete;
    FileLock& operator=(const FileLock&) = delete;

private:
    int m_fd;
};

}  // namespace

// Besides control characters, bytes that are not UTF-8 (a Latin-1 file name, say) are written
// as \xHH: the file must stay valid text, or the next start would set it all aside.
std::string EscapeSettingText(std::string_view text) {
    static constexpr char kHex[] = "0123456789ABCDEF";
    auto hex = [&](std::string& out, unsigned char c) {
        out += "\\x";
        out += kHex[c >> 4];
        out += kHex[c & 0xF];
    };
    std::string out;
    out.reserve(text.size());
    for (std::size_t i = 0; i < text.size();) {
        char c = text[i];
        std::size_t length = Utf8SequenceLength(text, i);
        if (length > 1) {
            out.append(text.substr(i, length));
            i += length;
            continue;
        }
        ++i;
        switch (c) {
            case '\\': out += "\\\\"; break;
            case '\n': out += "\\n"; break;
            case '\r': out += "\\r"; break;
            case '\t': out += "\\t"; break;
            default:
                if (length == 0 || static_cast<unsigned char>(c) < 0x20 || c == 0x7F) {
                    hex(out, static_cast<unsigned char>(c));
                } else {
                    out += c;
                }
        }
    }
    return out;
}

std::optional<std::string> UnescapeSettingText(std::string_view text) {
    std::string out;
    out.reserve(text.size());
    for (std::size_t i = 0; i < text.size(); ++i) {
        if (text[i] != '\\') {
            out += text[i];
            continue;
        }
        if (++i >= text.size()) {
            return std::nullopt;
        }
        switch (text[i]) {
            case '\\': out += '\\'; break;
            case 'n': out += '\n'; break;
            case 'r': out += '\r'; break;
            case 't': out += '\t'; break;
            case 'x': {
                unsigned value = 0;
                if (i + 2 >= text.size()) {
                    return std::nullopt;
                }
                auto result = std::from_chars(text.data() + i + 1, text.data() + i + 3, value, 16);
                if (result.ec != std::errc() || result.ptr != text.data() + i + 3 || value == 0) {
                    return std::nullopt;  // a NUL cannot live in a zero-ended string
                }
                out += static_cast<char>(value);
                i += 2;
                break;
            }
            default: return std::nullopt;
        }
    }
    return out;
}

std::optional<SettingValue> ParseSettingValue(std::string_view text) {
    SettingValue value;
    if (text.substr(0, kIntPrefix.size()) == kIntPrefix) {
        std::string_view digits = Trim(text.substr(kIntPrefix.size()));
        long long number = 0;
        auto result = std::from_chars(digits.data(), digits.data() + digits.size(), number);
        if (digits.empty() || result.ec != std::errc() ||
            result.ptr != digits.data() + digits.size() || number < INT32_MIN ||
            number > INT32_MAX) {
            return std::nullopt;
        }
        value.type = SettingType::Int;
        value.number = static_cast<std::int32_t>(number);
        return value;
    }
    for (std::string_view prefix : {kStringPrefix, kExpandPrefix}) {
        if (text.substr(0, prefix.size()) == prefix) {
            auto unescaped = UnescapeSettingText(text.substr(prefix.size()));
            if (!unescaped) {
                return std::nullopt;
            }
            value.type = SettingType::String;
            value.text = std::move(*unescaped);
            return value;
        }
    }
    return std::nullopt;
}

SettingsStore::SettingsStore(std::string filePath) : m_filePath(std::move(filePath)) {}

std::string SettingsStore::TakeSetAsideNotice() {
    std::lock_guard lock(m_mutex);
    return std::exchange(m_setAsideNotice, {});
}

void SettingsStore::LoadLocked() {
    if (ReloadLocked()) {
        for (const Held& held : m_held) {
            ApplyLocked(held.key, held.name, held.value);
        }
    }
}

// True when the lines were read anew (or emptied), false when memory already matched the file.
bool SettingsStore::ReloadLocked() {
    struct stat st {};
    FileIdentity identity;
    if (::stat(m_filePath.c_str(), &st) == 0) {
        identity = {static_cast<unsigned long long>(st.st_dev),
                    static_cast<unsigned long long>(st.st_ino),
                    static_cast<unsigned long long>(st.st_size),
                    static_cast<long long>(st.st_mtim.tv_sec) * 1000000000LL + st.st_mtim.tv_nsec};
    }
    if (m_loadedIdentity && *m_loadedIdentity == identity) {
        return false;
    }
    m_lines.clear();
    m_loadedIdentity.reset();

    std::string contents;
    ReadResult result = ReadWholeFile(m_filePath, contents, kMaxFileSize);
    if (result == ReadResult::Missing) {
        m_loadedIdentity = identity;
        return true;
    }
    if (result == ReadResult::Failed) {
        return true;  // unreadable for now (permissions, a directory): defaults, try again later
    }
    if (contents.substr(0, 3) == "\xEF\xBB\xBF") {
        contents.erase(0, 3);
    }
    if (result == ReadResult::TooLarge || contents.find('\0') != std::string::npos ||
        !IsValidUtf8(contents)) {
        m_setAsideNotice = SetAsideDamagedFile(m_filePath);
        m_loadedIdentity = FileIdentity{};
        return true;
    }

    std::string section;
    std::size_t start = 0;
    while (start < contents.size()) {
        std::size_t end = contents.find('\n', start);
        if (end == std::string::npos) end = contents.size();
        std::string_view raw(contents.data() + start, end - start);
        if (!raw.empty() && raw.back() == '\r') raw.remove_suffix(1);
        start = end + 1;

        Line line;
        line.raw = std::string(raw);
        std::string_view trimmed = Trim(raw);
        if (trimmed.size() >= 2 && trimmed.front() == '[' && trimmed.back() == ']') {
            section = std::string(trimmed.substr(1, trimmed.size() - 2));
            line.isHeader = true;
        } else if (!trimmed.empty() && trimmed.front() != ';' && trimmed.front() != '#') {
            auto equals = raw.find('=');
            if (equals != std::string_view::npos && !Trim(raw.substr(0, equals)).empty()) {
                line.name = std::string(Trim(raw.substr(0, equals)));
                // An entry with a value we cannot read stays in the file as type Other: the
                // next read with a default overwrites it, as a registry value of the wrong
                // type would be.
                line.value = ParseSettingValue(raw.substr(equals + 1)).value_or(SettingValue{});
            }
        }
        line.section = section;
        m_lines.push_back(std::move(line));
    }
    m_loadedIdentity = identity;
    return true;
}

std::optional<SettingValue> SettingsStore::Read(std::string_view key, std::string_view name) {
    std::lock_guard lock(m_mutex);
    LoadLocked();
    for (const Line& line : m_lines) {
        if (!line.isHeader && !line.name.empty() && EqualsNoCase(line.section, key) &&
            EqualsNoCase(line.name, name)) {
            return line.value;
        }
    }
    return std::nullopt;
}

bool SettingsStore::WriteInt(std::string_view key, std::string_view name, std::int32_t value) {
    SettingValue setting;
    setting.type = SettingType::Int;
    setting.number = value;
    return Write(key, name, setting);
}

bool SettingsStore::WriteString(std::string_view key, std::string_view name,
                                std::string_view value) {
    SettingValue setting;
    setting.type = SettingType::String;
    setting.text = std::string(value);
    return Write(key, name, setting);
}

bool SettingsStore::Write(std::string_view key, std::string_view name, const SettingValue& value) {
    if (key.empty() || name.empty() || name.find_first_of("=\n\r[") != std::string_view::npos ||
        key.find_first_of("]\n\r") != std::string_view::npos || !IsValidUtf8(key) ||
        !IsValidUtf8(name)) {
        return false;
    }
    std::lock_guard lock(m_mutex);
    LoadLocked();
    ApplyLocked(key, name, value);
    m_held.push_back({std::string(key), std::string(name), value});
    if (m_holds > 0) {
        return true;
    }
    const bool written = WriteFileLocked();
    m_held.clear();
    return written;
}

void SettingsStore::ApplyLocked(std::string_view key, std::string_view name,
                                const SettingValue& value) {
    Line entry;
    entry.section = std::string(key);
    entry.name = std::string(name);
    entry.value = value;

    auto existing = std::find_if(m_lines.begin(), m_lines.end(), [&](const Line& line) {
        return !line.isHeader && !line.name.empty() && EqualsNoCase(line.section, key) &&
               EqualsNoCase(line.name, name);
    });
    if (existing != m_lines.end()) {
        entry.name = existing->name;
        entry.section = existing->section;
        *existing = std::move(entry);
        return;
    }
    // Behind the last line of the section, or a new section at the end.
    auto last = m_lines.end();
    for (auto it = m_lines.begin(); it != m_lines.end(); ++it) {
        if (EqualsNoCase(it->section, key) && (it->isHeader || !it->name.empty())) {
            last = it;
        }
    }
    if (last == m_lines.end()) {
        Line header;
        header.isHeader = true;
        header.section = std::string(key);
        m_lines.push_back(std::move(header));
        m_lines.push_back(std::move(entry));
    } else {
        entry.section = last->section;
        m_lines.insert(last + 1, std::move(entry));
    }
}

// Lays the held values over the file. Called with the mutex held.
bool SettingsStore::WriteFileLocked() {
    std::string directory = m_filePath.substr(0, m_filePath.find_last_of('/'));
    if (!EnsureDirectory(directory)) {
        m_loadedIdentity.reset();  // memory holds what the file does not: read it again
        return false;
    }
    FileLock fileLock(m_filePath + ".lock");
    if (!m_sweptTemporaries) {
        RemoveStaleTemporaries(m_filePath);
        m_sweptTemporaries = true;
    }
    // Another program may have written since the lines were loaded: their values stay and
    // ours go over them.
    LoadLocked();
    bool written = WriteFileAtomically(m_filePath, Serialise());
    // Memory now matches the file only if the write went through; otherwise reload next time.
    m_loadedIdentity.reset();
    if (written) {
        LoadLocked();
    }
    return written;
}

void SettingsStore::HoldWrites() {
    std::lock_guard lock(m_mutex);
    ++m_holds;
}

bool SettingsStore::ReleaseWrites() {
    std::lock_guard lock(m_mutex);
    if (m_holds == 0 || --m_holds > 0 || m_held.empty()) {
        return true;
    }
    const bool written = WriteFileLocked();
    m_held.clear();
    return written;
}

std::string SettingsStore::Serialise() const {
    std::string out;
    bool hasComment = std::any_of(m_lines.begin(), m_lines.end(), [](const Line& line) {
        return !line.raw.empty() && line.raw[0] == ';';
    });
    if (!hasComment) {
        out += kFileHeader;
    }
    for (const Line& line : m_lines) {
        if (line.isHeader) {
            out += "[" + line.section + "]";
        } else if (!line.name.empty() && line.value.type != SettingType::Other) {
            out += line.name + "=" + FormatValue(line.value);
        } else {
            out += line.raw;
        }
        out += '\n';
    }
    return out;
}

}  // namespace ac::platform
