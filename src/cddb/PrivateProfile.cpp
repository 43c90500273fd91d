#include "cddb/PrivateProfile.h"

#include "cddb/RecordText.h"
#include "platform/AtomicFile.h"
#include "platform/TextDecoding.h"
#include "resources/CodePage.h"

#include <algorithm>

namespace cddb {
namespace {

std::string LowerAscii(std::string_view text) {
    std::string lower(text);
    std::transform(lower.begin(), lower.end(), lower.begin(), ac::ToLowerAscii);
    return lower;
}

constexpr std::size_t kCodePageSampleBytes = 64 * 1024;

bool IsLineEnd(char c) {
    return c == '\n' || c == '\r' || c == '\0';
}

// Any bytes become UTF-8: valid UTF-8 stays, anything else goes through the code-page guess
// (a record written by a Windows program in its narrow code page). NUL bytes are line ends
// before the guess sees them, so a Unix-form record is not taken for UTF-16.
std::string DecodeProfileText(std::string_view bytes) {
    std::string text(bytes);
    std::replace(text.begin(), text.end(), '\0', '\n');
    if (text.starts_with("\xEF\xBB\xBF")) {
        text.erase(0, 3);
    }
    if (!ac::IsValidUtf8(text)) {
        // A record is a few kilobytes; guessing over a damaged megabyte costs half a second
        // and says no more than its start does.
        const std::string codePage =
            ac::GuessCodePage(std::string_view(text).substr(0, kCodePageSampleBytes));
        text = ac::ConvertToUtf8(text, codePage.c_str());
    }
    // The guess may name a code page iconv lacks, which leaves the bytes as they were.
    return ac::SanitizeUtf8(text);
}

}  // namespace

bool PrivateProfile::LoadFile(const std::string& path) {
    m_sections.clear();
    std::string bytes;
    switch (ac::platform::ReadWholeFile(path, bytes, kMaxProfileFileBytes)) {
        case ac::platform::ReadResult::Ok:
            LoadText(bytes);
            return true;
        case ac::platform::ReadResult::TooLarge:
            return true;
        case ac::platform::ReadResult::Missing:
        case ac::platform::ReadResult::Failed:
            break;
    }
    return false;
}

void PrivateProfile::LoadText(std::string_view bytes) {
    m_sections.clear();
    const std::string text = DecodeProfileText(bytes);
    std::map<std::string, std::string>* current = nullptr;
    std::size_t start = 0;
    while (start < text.size()) {
        std::size_t end = start;
        while (end < text.size() && !IsLineEnd(text[end])) {
            ++end;
        }
        const std::string_view line =
            TrimAsciiSpace(std::string_view(text).substr(start, end - start));
        start = end + 1;
        if (line.empty() || line.front() == ';') {
            continue;
        }
        if (line.front() == '[') {
            // "[CDINFO]"; a header without its ']' still names the section.
            std::string_view name = line.substr(1);
            name = name.substr(0, std::min(name.rfind(']'), name.size()));
            current = &m_sections[LowerAscii(TrimAsciiSpace(name))];
            continue;
        }
        const std::size_t equals = line.find('=');
        if (current == nullptr || equals == std::string_view::npos) {
            continue;
        }
        current->emplace(LowerAscii(TrimAsciiSpace(line.substr(0, equals))),
                         std::string(TrimAsciiSpace(line.substr(equals + 1))));
    }
}

const std::string* PrivateProfile::Find(std::string_view section, std::string_view key) const {
    const auto found = m_sections.find(LowerAscii(TrimAsciiSpace(section)));
    if (found == m_sections.end()) {
        return nullptr;
    }
    const auto value = found->second.find(LowerAscii(TrimAsciiSpace(key)));
    return value == found->second.end() ? nullptr : &value->second;
}

std::string PrivateProfile::GetString(std::string_view section, std::string_view key,
                                      std::string_view fallback) const {
    const std::string* value = Find(section, key);
    return value ? *value : std::string(fallback);
}

int PrivateProfile::GetInt(std::string_view section, std::string_view key, int fallback) const {
    const std::string* value = Find(section, key);
    return value ? ReadAtoi(*value) : fallback;
}

void PrivateProfileWriter::Section(std::string_view name) {
    m_text += '[';
    m_text += name;
    m_text += "]\r\n";
}

void PrivateProfileWriter::Key(std::string_view key, std::string_view value) {
    m_text += key;
    m_text += '=';
    for (const char c : value) {
        m_text += IsLineEnd(c) ? ' ' : c;
    }
    m_text += "\r\n";
}

}  // namespace cddb
