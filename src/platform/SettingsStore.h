#pragma once
// The settings file that stands in for the per-user registry key of the program: typed values
// (32-bit int or string) under key paths, kept in one text file.
//
//   [Software\Velmorant\Audio Converter\Settings]
//   max_processes=dword:10
//   OutputDir=sz:/home/ann/Music
//
// Every write replaces the whole file atomically under a process lock and a file lock, so a
// crash never leaves half a file and two programs writing at once lose nothing. A file that is
// not text (binary junk, a huge file) is moved aside and the program starts from defaults.
// Lines the program does not understand are kept as they are.
//
// Thread contract: any thread; all calls are serialised on one mutex per store.

#include <cstdint>
#include <mutex>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace ac::platform {

enum class SettingType { Int, String, Other };

struct SettingValue {
    SettingType type = SettingType::Other;
    std::int32_t number = 0;
    std::string text;
};

class SettingsStore {
public:
    // Above this size a settings file is junk, not settings.
    static constexpr std::size_t kMaxFileSize = 1024 * 1024;

    explicit SettingsStore(std::string filePath);

    const std::string& FilePath() const { return m_filePath; }

    std::optional<SettingValue> Read(std::string_view key, std::string_view name);
    bool WriteInt(std::string_view key, std::string_view name, std::int32_t value);
    bool WriteString(std::string_view key, std::string_view name, std::string_view value);

    // Where a damaged file was moved on the last load, for a one-time notice; empty if none.
    std::string TakeSetAsideNotice();

    // While held, writes change what reads return but reach the file at the last release, in
    // one replacement of the file. Writes of another program meanwhile are kept: the release
    // lays the held values over the file as it is then. Nests.
    void HoldWrites();
    bool ReleaseWrites();

private:
    struct Line {
        std::string raw;      // the line as read, for lines kept verbatim
        std::string section;  // key path of the header above it
        std::string name;     // empty for headers and unknown lines
        SettingValue value;
        bool isHeader = false;
    };
    struct FileIdentity {
        unsigned long long device = 0, inode = 0, size = 0;
        long long mtimeNs = 0;
        bool operator==(const FileIdentity&) const = default;
    };

    struct Held {
        std::string key, name;
        SettingValue value;
    };

    void LoadLocked();
    bool ReloadLocked();
    bool Write(std::string_view key, std::string_view name, const SettingValue& value);
    void ApplyLocked(std::string_view key, std::string_view name, const SettingValue& value);
    bool WriteFileLocked();
    std::string Serialise() const;

    std::string m_filePath;
    std::mutex m_mutex;
    std::vector<Line> m_lines;
    std::optional<FileIdentity> m_loadedIdentity;
    std::string m_setAsideNotice;
    bool m_sweptTemporaries = false;
    int m_holds = 0;
    std::vector<Held> m_held;
};

// Text form of values in the file; exposed for tests and the fuzzer.
std::string EscapeSettingText(std::string_view text);
std::optional<std::string> UnescapeSettingText(std::string_view text);
std::optional<SettingValue> ParseSettingValue(std::string_view text);

}  // namespace ac::platform
