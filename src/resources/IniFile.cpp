#include "resources/IniFile.h"

#include "resources/Package.h"
#include "resources/TextScan.h"
#include "resources/ZipArchive.h"

#include <atomic>
#include <climits>
#include <cstdint>

namespace ac {
namespace {

std::atomic<std::size_t> s_loadCount{0};

std::string_view TrimChar(std::string_view text, char c) {
    while (!text.empty() && text.front() == c) {
        text.remove_prefix(1);
    }
    while (!text.empty() && text.back() == c) {
        text.remove_suffix(1);
    }
    return text;
}

// Blanks first, then tabs: "key\t " keeps nothing but "key", while "key \t" keeps "key ".
// That is how the texts we read were always split, and skins depend on it.
std::string_view TrimKeyOrValue(std::string_view text) {
    return TrimChar(TrimChar(text, ' '), '\t');
}

// Colours are written as 0xAARRGGBB, so 32 bits are kept and the top bit makes the result
// negative; longer numbers saturate as strtoul does.
int ParseHex(std::string_view digits) {
    std::uint32_t value = 0;
    for (char c : digits) {
        int digit = HexDigitValue(c);
        if (digit < 0) {
            break;
        }
        if (value > 0x0FFFFFFFu) {
            value = 0xFFFFFFFFu;
            break;
        }
        value = (value << 4) | static_cast<std::uint32_t>(digit);
    }
    return static_cast<int>(value);
}

}  // namespace

std::size_t IniLoadCount() {
    return s_loadCount.load(std::memory_order_relaxed);
}

std::string CleanIniValue(std::string_view value) {
    while (!value.empty() && IsAsciiSpace(value.front())) {
        value.remove_prefix(1);
    }
    while (!value.empty() && IsAsciiSpace(value.back())) {
        value.remove_suffix(1);
    }
    return std::string(TrimChar(value, '"'));
}

int ImIniFile::FindSection(const char* section) const {
    if (section == nullptr) {
        return -1;
    }
    std::string header = std::string("[") + section + "]";
    for (std::size_t index = 0; index < m_lines.size(); ++index) {
        if (m_lines[index] == header) {
            return static_cast<int>(index);
        }
    }
    return -1;
}

int ImIniFile::FindOrAddSection(const char* section) {
    if (section == nullptr) {
        return -1;
    }
    int index = FindSection(section);
    if (index >= 0) {
        return index;
    }
    m_lines.push_back(std::string("[") + section + "]");
    return static_cast<int>(m_lines.size() - 1);
}

bool ImIniFile::IsSectionLine(int index) const {
    if (index < 0 || static_cast<std::size_t>(index) >= m_lines.size()) {
        return false;
    }
    const std::string& line = m_lines[static_cast<std::size_t>(index)];
    return line.size() > 2 && line.front() == '[' && line.back() == ']';
}

int ImIniFile::FindKey(int first, const char* key, std::string& value) const {
    if (key == nullptr) {
        return -1;
    }
    std::string_view wanted(key);
    for (int index = first < 0 ? 0 : first; static_cast<std::size_t>(index) < m_lines.size();
         ++index) {
        if (IsSectionLine(index)) {
            return -1;
        }
        std::string_view line(m_lines[static_cast<std::size_t>(index)]);
        std::size_t equals = line.find('=');
        if (equals == std::string_view::npos) {
            continue;
        }
        if (EqualsIgnoringCase(TrimKeyOrValue(line.substr(0, equals)), wanted)) {
            value = TrimKeyOrValue(line.substr(equals + 1));
            return index;
        }
    }
    return -1;
}

bool ImIniFile::GetValue(const char* section, const char* key, std::string& value) const {
    int header = FindSection(section);
    return header >= 0 && FindKey(header + 1, key, value) >= 0;
}

bool ImIniFile::GetIntValue(const char* section, const char* key, int& value) const {
    std::string text;
    if (!GetValue(section, key, text)) {
        return false;
    }
    if (text.size() >= 2 && text[0] == '0' && (text[1] == 'x' || text[1] == 'X')) {
        value = ParseHex(std::string_view(text).substr(2));
    } else {
        value = ReadAtoi(text);
    }
    return true;
}

bool ImIniFile::SetValue(const char* section, const char* key, const char* value) {
    if (section == nullptr || key == nullptr || value == nullptr) {
        return false;
    }
    int header = FindOrAddSection(section);
    std::string line = std::string(key) + " = " + value;
    std::string ignored;
    int existing = FindKey(header + 1, key, ignored);
    if (existing >= 0) {
        m_lines[static_cast<std::size_t>(existing)] = std::move(line);
    } else {
        m_lines.insert(m_lines.begin() + header + 1, std::move(line));
    }
    return true;
}

void ImIniFile::SplitLines(std::string_view text) {
    s_loadCount.fetch_add(1, std::memory_order_relaxed);
    m_lines.clear();
    text = text.substr(0, text.find('\0'));
    while (!text.empty()) {
        std::size_t end = text.find(m_lineEnd);
        if (end == std::string_view::npos) {
            m_lines.emplace_back(text);
            break;
        }
        m_lines.emplace_back(text.substr(0, end));
        text.remove_prefix(end + m_lineEnd.size());
    }
}

void ImIniFile::LoadFromText(std::string_view text) {
    m_cachedPath.clear();
    m_cachedArchive.reset();
    SplitLines(text);
}

std::string ImIniFile::SaveText() const {
    std::size_t total = 0;
    for (const std::string& line : m_lines) {
        total += line.size() + m_lineEnd.size();
    }
    std::string text;
    text.reserve(total);
    for (const std::string& line : m_lines) {
        text += line;
        text += m_lineEnd;
    }
    return text;
}

bool ImIniFile::LoadText(std::string_view mappedPath) {
    const bool userText = mappedPath.find("user.pkg") != std::string_view::npos;
    if (!userText && !m_cachedPath.empty() && mappedPath == m_cachedPath) {
        auto cached = m_cachedArchive.lock();
        if (cached != nullptr && cached == FindOpenPackage(mappedPath)) {
            return true;
        }
    }
    auto archive = OpenPackage(mappedPath);
    if (archive == nullptr) {
        return false;
    }
    m_lines.clear();
    m_cachedPath = mappedPath;
    m_cachedArchive = archive;
    std::string text;
    switch (archive->Read(GetEntryName(mappedPath), text, kMaxEntrySize)) {
        case ZipArchive::ReadStatus::Ok:
            SplitLines(text);
            return true;
        case ZipArchive::ReadStatus::Failed:
            // What came is kept, as a damaged entry still shows what it can.
            SplitLines(text);
            return false;
        default:
            return false;
    }
}

}  // namespace ac
