#include "shell/AppConfig.h"

#include "platform/Paths.h"

#include <array>
#include <cstring>

namespace ac {
namespace {

constexpr ConfigKey I(const char* name, int value, const char* meaning) {
    return {name, ConfigType::Int, value, "", meaning};
}
constexpr ConfigKey S(const char* name, const char* value, const char* meaning) {
    return {name, ConfigType::String, 0, value, meaning};
}

constexpr std::array kKeys = {
    I("max_processes", 10, "children alive at once"),
    I("max_running_processes", 1, "children not suspended at once"),
    I("output_file_overwrite", 0, "1 replaces an existing output; 0 searches a free name"),
    I("afterconvert", 4, "after a run: 0 shut down, 1 standby, 2 hibernate, 3 exit, 4 none"),
    I("playsound", 0, "1 plays last_wavopenpath at the end of a run"),
    S("last_wavopenpath", "", "end-of-run sound; empty means wav/hint1.wav of the program"),
    I("slowdown", 1, "conversion and rip children run at nice 10"),
    I("idle", 0, "conversion and rip children run under SCHED_IDLE"),
    I("notautoselectdecoder", 0, "preference shown and stored only"),
    S("OutputDir", "", "output folder of the conversion list; default the music folder"),
    S("OutputCDDir", "", "output folder of ripping; default the music folder"),
    S("burntemp", "", "folder for the temporary WAV files of a burn"),
    I("burncopies", 1, "copies to burn"),
    S("burnimage", "", "path without extension of the disc image recorder's files; empty: ~/Music/disc"),
    I("scheme", 1, "index into allscheme"),
    S("allscheme", "E,AE,AEB,ABE,AHE,AEH", "naming patterns"),
    I("illegal", 0, "0 drops characters illegal in names; else replaces them"),
    S("illegalreplace", "", "replacement of illegal characters"),
    I("spacereplace", 0, "1 replaces blanks in names"),
    S("replace", "", "replacement of blanks"),
    I("alsoconverter", 0, "1 applies the naming scheme to the conversion list too"),
    S("last_openpath", "", "folder of the last file dialog"),
    I("last_run_function", 0, "work mode at the last exit: 0 convert, 1 rip, 2 burn"),
    S("last_profile_path", "", "profile last used in convert mode"),
    S("lastcd_profile_path", "", "profile last used in rip mode"),
    I("prop_comments_height", 52, "height of the property grid's help area"),
    I("prop_second_column_width", 90, "width of the property grid's label column"),
    S("language", "", "language name; empty asks the system"),
    S("last_skin", "", "skin name"),
    S("window_rect", "", "main window position"),
    S("version", "", "version text of the About dialog"),
    S("localcddb", "", "local disc record folder; empty means CDDB in the user data folder"),
    S("remotecddb", "", "CDDB server as host & port"),
    S("winampdb", "", "path of a Winamp database"),
    I("addrcount", 0, "number of addr entries"),
    S("addr", "", "one server of the list (addr0, addr1, ...), as host & port"),
    I("timeout", 20, "CDDB time-out in seconds"),
    I("format", 0, "CDDB reply format choice"),
    I("cddborder", 0, "order of CDDB sources"),
    S("cddb_email", "", "CDDB hello as user@host; empty uses the login and host names"),
    I("cddb_proto", 4, "CDDB protocol level asked for, 4 to 6"),
    I("ejectcd", 0, "eject the disc when a rip is done"),
    I("lockcd", 0, "preference shown and stored; ripping always locks the tray"),
    S("cdimages", "", "disc images listed as drives after the devices, separated by ';'"),
};

}  // namespace

std::span<const ConfigKey> ConfigKeys() { return kKeys; }

const ConfigKey* FindConfigKey(std::string_view name) {
    for (const ConfigKey& key : kKeys) {
        if (name == key.name) {
            return &key;
        }
    }
    // The server list: addr followed by a decimal index.
    if (name.size() > 4 && name.substr(0, 4) == "addr" &&
        name.find_first_not_of("0123456789", 4) == std::string_view::npos) {
        return FindConfigKey("addr");
    }
    return nullptr;
}

AppConfig::AppConfig()
    : AppConfig(platform::UserConfigDirectory() + "/settings.ini") {}

AppConfig::AppConfig(std::string settingsFile) : m_store(std::move(settingsFile)) {
    // A value below productKey may rename the product (for a rebranded build); it is only read.
    auto name = m_store.Read(m_product.productKey, "product_name");
    if (name && name->type == platform::SettingType::String && name->text.size() >= 2 &&
        name->text.size() < kStringBufferSize) {
        m_product.productName = name->text;
    }
}

const std::string& AppConfig::GetBaseDirectory() {
    std::call_once(m_baseOnce, [this] {
        m_baseDirectory = platform::FindBaseDirectory();
        while (m_baseDirectory.size() > 1 &&
               (m_baseDirectory.back() == '/' || m_baseDirectory.back() == '\\')) {
            m_baseDirectory.pop_back();
        }
    });
    return m_baseDirectory;
}

std::string AppConfig::KeyPath(const char* subkey) const {
    if (subkey == nullptr || *subkey == '\0') {
        return m_product.settingsKey;
    }
    return m_product.settingsKey + "\\" + subkey;
}

int AppConfig::GetInt(const char* name, const char* subkey, int defaultValue) {
    auto value = m_store.Read(KeyPath(subkey), name);
    if (!value || value->type != platform::SettingType::Int) {
        SetInt(name, defaultValue, subkey);
        return defaultValue;
    }
    return value->number;
}

std::string AppConfig::GetString(const char* name, const char* subkey, const char* defaultValue) {
    const char* fallback = defaultValue ? defaultValue : "";
    auto value = m_store.Read(KeyPath(subkey), name);
    // The old fixed buffers hold 260 bytes; the list of disc images is our own and holds as many
    // paths as the user adds.
    const bool limited = std::strcmp(name, "cdimages") != 0;
    if (!value || value->type != platform::SettingType::String ||
        (limited && value->text.size() + 1 > kStringBufferSize)) {
        SetString(name, fallback, subkey);
        return fallback;
    }
    return value->text;
}

bool AppConfig::SetInt(const char* name, int value, const char* subkey) {
    return name != nullptr && m_store.WriteInt(KeyPath(subkey), name, value);
}

bool AppConfig::SetString(const char* name, const char* value, const char* subkey) {
    return name != nullptr && m_store.WriteString(KeyPath(subkey), name, value ? value : "");
}

int AppConfig::GetInt(const char* name) {
    const ConfigKey* key = FindConfigKey(name);
    return GetInt(name, nullptr, key ? key->intDefault : 0);
}

std::string AppConfig::GetString(const char* name) {
    return GetString(name, nullptr, DefaultString(name).c_str());
}

std::string AppConfig::DefaultString(const char* name) {
    if (std::strcmp(name, "OutputDir") == 0 || std::strcmp(name, "OutputCDDir") == 0) {
        return platform::MusicDirectory();
    }
    const ConfigKey* key = FindConfigKey(name);
    return key ? key->textDefault : "";
}

AppConfig& GetAppConfig() {
    static AppConfig config;
    return config;
}

void ReadStartupKeys(AppConfig& config) {
    for (const char* name : {"max_processes", "max_running_processes", "output_file_overwrite",
                             "afterconvert", "playsound", "last_wavopenpath", "slowdown", "idle",
                             "OutputDir", "scheme", "allscheme", "illegal", "illegalreplace",
                             "spacereplace", "replace", "alsoconverter"}) {
        const ConfigKey* key = FindConfigKey(name);
        if (key != nullptr && key->type == ConfigType::Int) {
            config.GetInt(name);
            continue;
        }
        if (!config.GetString(name).empty()) {
            continue;
        }
        if (std::strcmp(name, "last_wavopenpath") == 0) {
            config.SetString(name, (config.GetBaseDirectory() + "/wav/hint1.wav").c_str());
        } else if (std::strcmp(name, "allscheme") == 0) {
            config.SetString(name, AppConfig::DefaultString(name).c_str());
        }
    }
}

}  // namespace ac
