#include "skin/SkinConfig.h"

#include "resources/Language.h"
#include "resources/Package.h"

#include <string>

namespace ac {

namespace {

const char* SectionOrMain(const char* section) {
    return section == nullptr || *section == '\0' ? "Main" : section;
}

// Room for a value of 1023 characters and its NUL; longer values read as missing.
constexpr std::size_t kValueBuffer = 1024;
// A skin name is at most 255 characters; a longer one counts as no name at all.
constexpr std::size_t kNameBuffer = 256;

}  // namespace

bool ImSkinConfig::Load(std::string_view dir) {
    if (dir.empty()) {
        return false;
    }
    m_strDir.assign(dir);
    while (!m_strDir.empty() && (m_strDir.back() == '\\' || m_strDir.back() == '/')) {
        m_strDir.pop_back();
    }
    m_bLoaded = !GetName().empty();
    return m_bLoaded;
}

std::string ImSkinConfig::IniPath() const {
    std::string path = m_strDir + "\\skin.ini";
    if (m_pLanguage != nullptr) {
        return LocalizeFileName(*m_pLanguage, path, true);
    }
    return path;
}

std::string ImSkinConfig::GetName() const {
    if (m_strDir.empty()) {
        return {};
    }
    return ReadIniText("Main", "Name", "", IniPath(), kNameBuffer);
}

int ImSkinConfig::GetInt(const char* key, int defaultValue, const char* section) const {
    if (m_strDir.empty()) {
        return defaultValue;
    }
    return ReadIniInt(SectionOrMain(section), key, defaultValue, IniPath());
}

std::string ImSkinConfig::GetString(const char* key, const char* defaultValue,
                                    const char* section) const {
    if (m_strDir.empty()) {
        return defaultValue;
    }
    return ReadIniText(SectionOrMain(section), key, defaultValue, IniPath(), kValueBuffer);
}

void ImSkinConfig::GetMetrics(SkinMetrics& metrics, const char* section) const {
    metrics.LeftMargin = GetInt("LeftMargin", 2, section);
    metrics.RightMargin = GetInt("RightMargin", 2, section);
    metrics.TopMargin = GetInt("TopMargin", 2, section);
    metrics.BottomMargin = GetInt("BottomMargin", 2, section);
    metrics.VSpacing = GetInt("VSpacing", 2, section);
    metrics.HSpacing = GetInt("HSpacing", 2, section);
    metrics.BorderWidth = GetInt("BorderWidth", 0, section);
}

SkinFont ImSkinConfig::GetFont(const char* section, const char* prefix) const {
    const std::string p = prefix == nullptr ? "" : prefix;
    const std::string sec = SectionOrMain(section);
    SkinFont font;
    // "Tohama" is what skins have always carried for the caption; the font system substitutes.
    const char* defaultName = sec == "Caption" ? "Tohama" : "MS Shell Dlg";
    font.name = GetString((p + "FontName").c_str(), defaultName, section);
    font.size = GetInt((p + "FontSize").c_str(), 90, section);
    font.weight = GetInt((p + "FontWeight").c_str(), 400, section);
    font.italic = GetInt((p + "FontItalic").c_str(), 0, section) != 0;
    font.underline = GetInt((p + "FontUnderline").c_str(), 0, section) != 0;
    return font;
}

std::uint32_t ImSkinConfig::GetRgbColour(const char* key, std::uint32_t nativeDefault,
                                         const char* section) const {
    const int value = GetInt(key, static_cast<int>(SwapRedBlue(nativeDefault)), section);
    return SwapRedBlue(static_cast<std::uint32_t>(value));
}

}  // namespace ac
