#pragma once
// The program's menus as data: the bars of the three work modes and the context and tray menus,
// laid out as the language files number their nested popups (see resources/MenuTextTable.inc).
//
// Thread contract: UI thread only.

#include "skin/SkinMenu.h"

#include <memory>

namespace ac {

inline constexpr int kConvertMenu = 129;
inline constexpr int kRipMenu = 171;
inline constexpr int kBurnMenu = 170;
inline constexpr int kMediaListContextMenu = 130;
inline constexpr int kRipListContextMenu = 162;
inline constexpr int kBurnListContextMenu = 182;
inline constexpr int kTrayMenu = 131;

// Commands the main window handles itself.
namespace cmd {
inline constexpr int kBackground = 33070;
inline constexpr int kExit = 32785;
inline constexpr int kChangeSkin = 33031;
inline constexpr int kLanguage = 33054;
inline constexpr int kChooseSkinDialog = 10006;
inline constexpr int kPreferences = 33003;
inline constexpr int kContents = 32900;
inline constexpr int kSupport = 10009;
inline constexpr int kAbout = 32903;
inline constexpr int kAfterFirst = 33109;  // No action .. Kill me
inline constexpr int kAfterLast = 33113;
inline constexpr int kTrayOpen = 33072;
inline constexpr int kTrayExit = 33074;
inline constexpr int kFirstSkin = 11300;
inline constexpr int kLastSkin = 11400;
inline constexpr int kFirstLanguage = 11001;
inline constexpr int kFirstDrive = 33100;
}  // namespace cmd

// The bar of a work mode (0 convert, 1 rip, 2 burn) with English texts; the skin and language
// popups stand empty at positions 0 and 1 of Options.
std::unique_ptr<ImMenu> BuildModeMenu(int mode);
int MenuIdOfMode(int mode);
// Options popup of a bar, where the skin and language popups live.
wxMenu* OptionsPopup(ImMenu& menu);
// Select CD Rom of the rip bar, or null.
wxMenu* SelectCdRomPopup(ImMenu& menu);

std::unique_ptr<wxMenu> BuildContextMenu(int menuId);

}  // namespace ac
