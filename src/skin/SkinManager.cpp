#include "skin/SkinManager.h"

#include "resources/Language.h"
#include "resources/Package.h"

#include <algorithm>

namespace ac {

ImSkinManager g_Skin;

std::string SkinNameOf(std::string_view nameOrPath) {
    while (!nameOrPath.empty() && (nameOrPath.back() == '\\' || nameOrPath.back() == '/')) {
        nameOrPath.remove_suffix(1);
    }
    const std::size_t cut = nameOrPath.find_last_of("\\/");
    return std::string(cut == std::string_view::npos ? nameOrPath : nameOrPath.substr(cut + 1));
}

int ImSkinManager::Enumerate() {
    m_skinDirs.clear();
    ImPackageFinder finder;
    bool more = finder.FindFile(m_strRoot + "\\*.*");
    while (more) {
        more = finder.FindNextFile();
        if (finder.IsDirectory()) {
            m_skinDirs.push_back(finder.GetFilePath());
        }
    }
    return static_cast<int>(m_skinDirs.size());
}

std::string ImSkinManager::GetSkinAt(int index) const {
    if (index < 0 || index >= GetSkinCount()) {
        return {};
    }
    return m_skinDirs[static_cast<std::size_t>(index)];
}

bool ImSkinManager::SetSkin(std::string_view nameOrPath) {
    m_strSkinName = SkinNameOf(nameOrPath);
    m_strSkinDir = m_strRoot + "\\" + m_strSkinName;
    if (m_strSkinName.empty() || !ResourceExists(m_strSkinDir + "\\skin.ini")) {
        return false;
    }
    for (ImSkinListener* listener : m_listeners) {
        if (listener->DefersSkin()) {
            if (std::find(m_deferred.begin(), m_deferred.end(), listener) == m_deferred.end()) {
                m_deferred.push_back(listener);
            }
            continue;
        }
        if (!listener->OnSkinChanged(m_strSkinDir)) {
            return false;
        }
    }
    return true;
}

void ImSkinManager::TakeDeferredSkin(ImSkinListener* listener) {
    const auto found = std::find(m_deferred.begin(), m_deferred.end(), listener);
    if (found == m_deferred.end()) {
        return;
    }
    m_deferred.erase(found);
    listener->OnSkinChanged(m_strSkinDir);
}

std::string ImSkinManager::GetImagePath(const ImLanguage* language,
                                        std::string_view fileName) const {
    std::string path = m_strSkinDir + "\\" + std::string(fileName);
    if (language != nullptr) {
        return LocalizeFileName(*language, path, true);
    }
    return path;
}

void ImSkinManager::DressLateListener(ImSkinListener* listener) {
    AddListener(listener);
    if (m_strSkinName.empty()) {
        return;
    }
    if (listener->DefersSkin()) {
        if (std::find(m_deferred.begin(), m_deferred.end(), listener) == m_deferred.end()) {
            m_deferred.push_back(listener);
        }
        return;
    }
    listener->OnSkinChanged(m_strSkinDir);
}

namespace {

bool s_managerGone = false;  // a listener that outlives the global has nothing to leave

}  // namespace

ImSkinListener::~ImSkinListener() {
    if (!s_managerGone) {
        g_Skin.RemoveListener(this);
    }
}

ImSkinManager::~ImSkinManager() {
    if (this == &g_Skin) {
        s_managerGone = true;
    }
}

void ImSkinManager::RemoveListener(ImSkinListener* listener) {
    std::erase(m_listeners, listener);
    std::erase(m_deferred, listener);
}

bool ImSkinManager::AddListener(ImSkinListener* listener) {
    if (listener == nullptr ||
        std::find(m_listeners.begin(), m_listeners.end(), listener) != m_listeners.end()) {
        return false;
    }
    m_listeners.push_back(listener);
    return true;
}

bool ImSkinManager::ChooseStartSkin(const std::string& lastSkin) {
    if (SetSkin(lastSkin.empty() ? std::string("Default") : lastSkin) || SetSkin("Default")) {
        return true;
    }
    ImPackageFinder finder;
    bool more = finder.FindFile(m_strRoot + "\\*.*");
    std::vector<std::string> names;
    while (more) {
        more = finder.FindNextFile();
        const std::string name = finder.GetFileName();
        if (!name.empty() && name != "." && name != ".." && finder.IsDirectory()) {
            names.push_back(name);
        }
    }
    for (const std::string& name : names) {
        if (SetSkin(name)) {
            return true;
        }
    }
    return false;
}

void ImSkinManager::Reset() {
    m_skinDirs.clear();
    m_strRoot.clear();
    m_strSkinDir.clear();
    m_strSkinName.clear();
    m_listeners.clear();
    m_deferred.clear();
}

}  // namespace ac
