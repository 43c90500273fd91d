#pragma once
// CCheck: the strip of three tabs that switches the work mode. The tab of the current mode is
// disabled: that is how it shows as current.
//
// Thread contract: UI thread only.

#include "skin/SkinControls.h"
#include "skin/SkinDialog.h"

#include <array>

namespace ac {

inline constexpr int kCheckDialogId = 160;
inline constexpr int kTabConvert = 1086;
inline constexpr int kTabRip = 1087;
inline constexpr int kTabBurn = 1088;

class CCheck : public ImSkinPanel {
public:
    explicit CCheck(wxWindow* parent);

    void OnLanguageChanged() override;
    void DoRecalcLayout() override;
    bool OnSkinChanged(const std::string& skinDir) override;

    // Marks mode's tab as the current one.
    void ShowMode(int mode);
    ImButton* Tab(int mode) const { return m_tabs[static_cast<std::size_t>(mode)]; }

    int m_iWork = 0;
    std::array<int, 3> m_profileIndex{0, 0, 0};

private:
    std::array<ImButton*, 3> m_tabs{};
    int m_textOffsetX = 0;
};

extern CCheck* g_Check;

}  // namespace ac
