#pragma once
// The program's settings: product strings, the application directory, and typed values read and
// written one at a time. A value missing on reading is created with the caller's default, so the
// settings file always shows every setting the program has used.
//
// Thread contract: any thread. There is no cache of values: each call goes to the store (which
// only re-parses the file when it changed on disk).

#include "platform/SettingsStore.h"

#include <memory>
#include <mutex>
#include <span>
#include <string>
#include <string_view>

namespace ac {

struct ProductStrings {
    std::string companyName = "Velmorant";
    std::string companyFullName = "Velmorant Corporation";
    std::string companyKey = "Software\\Velmorant";
    std::string productFullName = "Velmorant Audio Converter";
    std::string productShortName = "Audio Converter";
    std::string productId = "audio-converter";
    std::string productName = "Velmorant Audio Converter";
    std::string productKey = "Software\\Velmorant\\Audio Converter";
    std::string settingsKey = "Software\\Velmorant\\Audio Converter\\Settings";
};

enum class ConfigType { Int, String };

// One setting the program uses. For the string keys whose default is a place on this machine
// (the output folders), the default comes from DefaultString, not from the table's text.
struct ConfigKey {
    const char* name;
    ConfigType type;
    int intDefault;
    const char* textDefault;
    const char* meaning;
};

std::span<const ConfigKey> ConfigKeys();
// The key of a name; "addr3" finds the "addr" entry of the server list.
const ConfigKey* FindConfigKey(std::string_view name);

class AppConfig {
public:
    // Strings that fit in the reading buffer with their terminating NUL; longer ones read as
    // missing.
    static constexpr std::size_t kStringBufferSize = 260;

    // Settings in $XDG_CONFIG_HOME/audio-converter/settings.ini.
    AppConfig();
    explicit AppConfig(std::string settingsFile);

    const std::string& GetBaseDirectory();
    const ProductStrings& GetProductStrings() const { return m_product; }
    const std::string& SettingsFile() const { return m_store.FilePath(); }

    int GetInt(const char* name, const char* subkey, int defaultValue);
    std::string GetString(const char* name, const char* subkey, const char* defaultValue);
    bool SetInt(const char* name, int value, const char* subkey = nullptr);
    bool SetString(const char* name, const char* value, const char* subkey = nullptr);

    // The same reads with the default of the key table.
    int GetInt(const char* name);
    std::string GetString(const char* name);
    static std::string DefaultString(const char* name);

    // Writes wait in memory between these, for the start of the window (SettingsStore).
    void HoldWrites() { m_store.HoldWrites(); }
    bool ReleaseWrites() { return m_store.ReleaseWrites(); }

    // Where a damaged settings file was moved at loading, once; empty if none.
    std::string TakeSetAsideNotice() { return m_store.TakeSetAsideNotice(); }

private:
    std::string KeyPath(const char* subkey) const;

    ProductStrings m_product;
    platform::SettingsStore m_store;
    std::once_flag m_baseOnce;
    std::string m_baseDirectory;
};

// The program's one configuration object, made at the first call.
AppConfig& GetAppConfig();

// The keys the main window reads when it is made, in its order, each with its default, so that
// the first start writes them all. An empty `last_wavopenpath` becomes the program's own sound
// and an empty `allscheme` the default patterns (an empty scheme would name outputs ".mp3").
void ReadStartupKeys(AppConfig& config);

}  // namespace ac
