#pragma once
// Typed lookups in a skin's skin.ini. A window owns one ImSkinConfig and reads its keys in
// OnSkinChanged only: every lookup goes through the package layer's one-file ini cache, and with a
// language set each one also asks the archive for a localized variant, which paint code cannot
// afford.
//
// Thread contract: UI thread (the ini reader itself locks).

#include <cstdint>
#include <string>
#include <string_view>

namespace ac {

class ImLanguage;

struct SkinMetrics {
    int TopMargin = 2;
    int BottomMargin = 2;
    int LeftMargin = 2;
    int RightMargin = 2;
    int VSpacing = 2;
    int HSpacing = 2;
    int BorderWidth = 0;
};

// Five keys that describe one font; sizes are tenths of a point.
struct SkinFont {
    std::string name;
    int size = 90;
    int weight = 400;
    bool italic = false;
    bool underline = false;
};

// Skin authors write colours as web colours (0xRRGGBB); windows keep them in the native
// 0x00BBGGRR order. The swap is its own inverse.
constexpr std::uint32_t SwapRedBlue(std::uint32_t colour) {
    return (colour & 0xFF00FF00u) | ((colour & 0xFFu) << 16) | ((colour >> 16) & 0xFFu);
}

class ImSkinConfig {
public:
    explicit ImSkinConfig(const ImLanguage* language = nullptr) : m_pLanguage(language) {}
    virtual ~ImSkinConfig() = default;

    bool Load(std::string_view dir);
    std::string GetName() const;
    int GetInt(const char* key, int defaultValue, const char* section = nullptr) const;
    std::string GetString(const char* key, const char* defaultValue,
                          const char* section = nullptr) const;
    void GetMetrics(SkinMetrics& metrics, const char* section = nullptr) const;

    // A font block; prefix is "" or "Title" (the side bar's second block).
    SkinFont GetFont(const char* section, const char* prefix = "") const;
    // A colour key of form RGB, answered in native order; the default is given native too.
    std::uint32_t GetRgbColour(const char* key, std::uint32_t nativeDefault,
                               const char* section = nullptr) const;

    void SetLanguage(const ImLanguage* language) { m_pLanguage = language; }
    const std::string& GetDir() const { return m_strDir; }
    bool IsLoaded() const { return m_bLoaded; }

    std::string m_strDir;
    bool m_bLoaded = false;
    const ImLanguage* m_pLanguage = nullptr;

private:
    std::string IniPath() const;
};

}  // namespace ac
