#pragma once
// The catalogue of skins in data.pkg and the current skin. Windows register once, at creation,
// and are told of each change in the order they registered; a window that goes leaves the list
// as it goes.
//
// Thread contract: UI thread only.

#include <string>
#include <string_view>
#include <vector>

namespace ac {

class ImSkinListener {
public:
    virtual ~ImSkinListener();
    // True when the window took the skin; false stops the round of notices.
    virtual bool OnSkinChanged(const std::string& skinDir) = 0;
    // True while the window is out of sight and would rather take the skin when it comes into
    // sight (ImSkinManager::TakeDeferredSkin): a work mode's panel behind another tab.
    virtual bool DefersSkin() const { return false; }
};

class ImSkinManager {
public:
    int Enumerate();
    std::string GetSkinAt(int index) const;
    int GetSkinCount() const { return static_cast<int>(m_skinDirs.size()); }

    bool SetSkin(std::string_view nameOrPath);
    const std::string& GetSkinDir() const { return m_strSkinDir; }
    const std::string& GetSkinName() const { return m_strSkinName; }
    std::string GetImagePath(const class ImLanguage* language, std::string_view fileName) const;

    ~ImSkinManager();

    bool AddListener(ImSkinListener* listener);
    void RemoveListener(ImSkinListener* listener);
    // Hands a listener the skin it put off while out of sight; nothing when it put off none.
    void TakeDeferredSkin(ImSkinListener* listener);
    // Adds a listener made after the start and dresses it in the current skin.
    void DressLateListener(ImSkinListener* listener);
    void SetRoot(std::string root) { m_strRoot = std::move(root); }
    const std::string& GetRoot() const { return m_strRoot; }

    // Start-up choice: the remembered skin, else Default, else the first directory that takes.
    bool ChooseStartSkin(const std::string& lastSkin);

    // Tests reset the global between cases.
    void Reset();

private:
    std::vector<std::string> m_skinDirs;
    std::string m_strRoot;
    std::string m_strSkinDir;
    std::string m_strSkinName;
    std::vector<ImSkinListener*> m_listeners;
    std::vector<ImSkinListener*> m_deferred;  // compared, never called, until taken
};

// The last component of a skin path, whichever separator it uses.
std::string SkinNameOf(std::string_view nameOrPath);

extern ImSkinManager g_Skin;

}  // namespace ac
