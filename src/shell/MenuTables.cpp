#include "shell/MenuTables.h"

#include <span>
#include <vector>

namespace ac {

namespace {

// One row of a menu layout. depth 0 rows are the captions of a bar; a popup row opens the rows
// of depth + 1 that follow it.
enum class Row { Caption, Command, Check, Separator, Popup };
struct MenuRow {
    int depth;
    Row kind;
    int id;
    const char* text;
};

// Shared by all three bars: Options and Help.
#define AC_OPTIONS_AND_HELP                                                                    \
    {0, Row::Caption, 0, "&Options"}, {1, Row::Popup, cmd::kChangeSkin, "Change &Skin..."},    \
        {1, Row::Popup, cmd::kLanguage, "Language"}, {1, Row::Separator, 0, ""},               \
        {1, Row::Command, cmd::kPreferences, "Preferences..."}, {0, Row::Caption, 0, "&Help"}, \
        {1, Row::Command, cmd::kContents, "Contents"},                                         \
        {1, Row::Command, cmd::kSupport, "Support"}, {1, Row::Separator, 0, ""}, {             \
        1, Row::Command, cmd::kAbout, "&About..."                                              \
    }

#define AC_AFTER_CONVERTING(depth)                                                                \
    {depth, Row::Popup, 0, "A&fter Converting"}, {depth + 1, Row::Check, 33109, "No action"},     \
        {depth + 1, Row::Check, 33110, "Shut Down"}, {depth + 1, Row::Check, 33111, "Hibernate"}, \
        {depth + 1, Row::Check, 33112, "Standby"}, {                                              \
        depth + 1, Row::Check, 33113, "Kill me"                                                   \
    }

#define AC_CHECK_UNCHECK                                                             \
    {1, Row::Popup, 0, "&Check"}, {2, Row::Command, 32782, "&All"},                  \
        {2, Row::Command, 33038, "&Selected Items"}, {1, Row::Popup, 0, "&Uncheck"}, \
        {2, Row::Command, 32783, "&All"}, {                                          \
        2, Row::Command, 33037, "&Selected Items"                                    \
    }

#define AC_FILE_ADD_REMOVE                                                             \
    {0, Row::Caption, 0, "&File"}, {1, Row::Command, 32771, "&Add..."},                \
        {1, Row::Command, 33053, "Add Folder"}, {1, Row::Separator, 0, ""},            \
        {1, Row::Command, 32772, "&Remove"}, {1, Row::Command, 32773, "&Clear"},       \
        {1, Row::Separator, 0, ""}, {1, Row::Command, cmd::kBackground, "BackGround"}, \
        {1, Row::Separator, 0, ""}, {                                                  \
        1, Row::Command, cmd::kExit, "E&xit"                                           \
    }

const MenuRow kConvertRows[] = {
    AC_FILE_ADD_REMOVE,
    {0, Row::Caption, 0, "&Edit"},
    AC_CHECK_UNCHECK,
    {1, Row::Separator, 0, ""},
    {1, Row::Command, 33055, "Select &All"},
    {1, Row::Command, 33056, "Select &None"},
    {1, Row::Separator, 0, ""},
    {1, Row::Command, 33065, "Configure To All"},
    {1, Row::Check, 33045, "Show File Infomation"},
    {0, Row::Caption, 0, "&Convert"},
    {1, Row::Command, 32776, "&Encode Checked Items"},
    {1, Row::Command, 32777, "&Pause Checked Items"},
    {1, Row::Command, 32778, "&Stop Checked Items"},
    {1, Row::Separator, 0, ""},
    {1, Row::Command, 32779, "E&ncode Selected Item(s)"},
    {1, Row::Command, 32781, "P&ause Selected Item(s)"},
    {1, Row::Command, 32780, "S&top Seleted Item(s)"},
    {1, Row::Separator, 0, ""},
    AC_AFTER_CONVERTING(1),
    AC_OPTIONS_AND_HELP,
};

const MenuRow kRipRows[] = {
    {0, Row::Caption, 0, "&File"},
    {1, Row::Command, cmd::kBackground, "BackGround"},
    {1, Row::Separator, 0, ""},
    {1, Row::Command, cmd::kExit, "E&xit"},
    {0, Row::Caption, 0, "&Edit"},
    AC_CHECK_UNCHECK,
    {1, Row::Separator, 0, ""},
    {1, Row::Command, 33055, "Select &All"},
    {1, Row::Command, 33056, "Select &None"},
    {0, Row::Caption, 0, "&Rip"},
    {1, Row::Popup, 0, "Select CD Rom"},
    {1, Row::Separator, 0, ""},
    {1, Row::Command, 33115, "&Rip Checked Item(s)"},
    {1, Row::Command, 33122, "&Pause Checked Items"},
    {1, Row::Command, 33121, "&Stop Checked Items"},
    {1, Row::Separator, 0, ""},
    {1, Row::Command, 33116, "R&ip Selected Item(s)"},
    {1, Row::Command, 33120, "P&ause Selected Item(s)"},
    {1, Row::Command, 33118, "S&top Seleted Item(s)"},
    {1, Row::Separator, 0, ""},
    {1, Row::Popup, 0, "CDDB"},
    {2, Row::Command, 33088, "Read From Local CDDB"},
    {2, Row::Command, 33108, "Read Remote CDDB"},
    {2, Row::Command, 33091, "Read WinampCDDB"},
    {2, Row::Separator, 0, ""},
    {2, Row::Command, 33137, "CDDB Batch Query"},
    {1, Row::Separator, 0, ""},
    AC_AFTER_CONVERTING(1),
    AC_OPTIONS_AND_HELP,
};

const MenuRow kBurnRows[] = {
    AC_FILE_ADD_REMOVE,
    {0, Row::Caption, 0, "&Edit"},
    {1, Row::Command, 33055, "Select &All"},
    {1, Row::Command, 33056, "Select &None"},
    {1, Row::Separator, 0, ""},
    {1, Row::Check, 33045, "Show File Infomation"},
    {0, Row::Caption, 0, "&Burn"},
    {1, Row::Command, 33136, "Burn CD"},
    {1, Row::Command, 33077, "Stop Burn CD"},
    {1, Row::Separator, 0, ""},
    {1, Row::Command, 33082, "Erase ReWritable CD"},
    {1, Row::Separator, 0, ""},
    {1, Row::Command, 33139, "Show Message"},
    AC_OPTIONS_AND_HELP,
};

const MenuRow kMediaListContextRows[] = {
    {0, Row::Command, 32771, "&Add..."},
    {0, Row::Command, 32772, "&Remove"},
    {0, Row::Command, 32773, "&Clear"},
    {0, Row::Command, 32779, "E&ncode Selected Item(s)"},
    {0, Row::Command, 32781, "P&ause Selected Item(s)"},
    {0, Row::Command, 32780, "S&top Seleted Item(s)"},
    {0, Row::Command, 33055, "Select &All"},
    {0, Row::Command, 33056, "Select &None"},
    {0, Row::Command, 33065, "Configure To All"},
    {0, Row::Check, 33045, "Show File Infomation"},
};

const MenuRow kRipListContextRows[] = {
    {0, Row::Command, 33064, "CDDB"},
    {0, Row::Command, 33124, "Check Select"},
    {0, Row::Command, 33123, "UnCheck Select"},
    {0, Row::Command, 33138, "Rename\tF2"},
    {0, Row::Command, 33069, "Configure To All"},
};

const MenuRow kBurnListContextRows[] = {
    {0, Row::Command, 33136, "Burn CD"}, {0, Row::Command, 33077, "Stop Burn CD"},
    {0, Row::Command, 32771, "&Add..."}, {0, Row::Command, 32772, "&Remove"},
    {0, Row::Command, 32773, "&Clear"},  {0, Row::Check, 33045, "Show File Infomation"},
};

const MenuRow kTrayRows[] = {
    {0, Row::Command, cmd::kTrayOpen, "Open"},
    {0, Row::Command, cmd::kTrayExit, "Exit"},
};

#undef AC_OPTIONS_AND_HELP
#undef AC_AFTER_CONVERTING
#undef AC_CHECK_UNCHECK
#undef AC_FILE_ADD_REMOVE

// Fills `menu` with the rows of one depth from `at` on; answers the first row not taken.
std::size_t FillMenu(wxMenu& menu, std::span<const MenuRow> rows, std::size_t at, int depth) {
    while (at < rows.size() && rows[at].depth == depth) {
        const MenuRow& row = rows[at++];
        const wxString text = wxString::FromUTF8(row.text);
        switch (row.kind) {
            case Row::Separator:
                menu.AppendSeparator();
                break;
            case Row::Command:
                menu.Append(row.id, text);
                break;
            case Row::Check:
                menu.AppendCheckItem(row.id, text);
                break;
            case Row::Popup: {
                auto* sub = new wxMenu;
                at = FillMenu(*sub, rows, at, depth + 1);
                menu.AppendSubMenu(sub, text);
                break;
            }
            case Row::Caption:
                return at - 1;
        }
    }
    return at;
}

std::span<const MenuRow> RowsOfMode(int mode) {
    switch (mode) {
        case 1:
            return kRipRows;
        case 2:
            return kBurnRows;
        default:
            return kConvertRows;
    }
}

}  // namespace

int MenuIdOfMode(int mode) {
    return mode == 1 ? kRipMenu : mode == 2 ? kBurnMenu : kConvertMenu;
}

std::unique_ptr<ImMenu> BuildModeMenu(int mode) {
    auto menu = std::make_unique<ImMenu>();
    menu->resourceId = MenuIdOfMode(mode);
    const std::span<const MenuRow> rows = RowsOfMode(mode);
    std::size_t at = 0;
    while (at < rows.size()) {
        const MenuRow& caption = rows[at++];
        auto popup = std::make_unique<wxMenu>();
        at = FillMenu(*popup, rows, at, 1);
        menu->tops.emplace_back(wxString::FromUTF8(caption.text), std::move(popup));
    }
    return menu;
}

wxMenu* OptionsPopup(ImMenu& menu) {
    return menu.tops.size() > 3 ? menu.tops[3].second.get() : nullptr;
}

wxMenu* SelectCdRomPopup(ImMenu& menu) {
    if (menu.resourceId != kRipMenu || menu.tops.size() < 3) {
        return nullptr;
    }
    wxMenuItem* first = menu.tops[2].second->FindItemByPosition(0);
    return first != nullptr && first->IsSubMenu() ? first->GetSubMenu() : nullptr;
}

std::unique_ptr<wxMenu> BuildContextMenu(int menuId) {
    std::span<const MenuRow> rows;
    switch (menuId) {
        case kMediaListContextMenu:
            rows = kMediaListContextRows;
            break;
        case kRipListContextMenu:
            rows = kRipListContextRows;
            break;
        case kBurnListContextMenu:
            rows = kBurnListContextRows;
            break;
        case kTrayMenu:
            rows = kTrayRows;
            break;
        default:
            return nullptr;
    }
    auto menu = std::make_unique<wxMenu>();
    FillMenu(*menu, rows, 0, 0);
    return menu;
}

}  // namespace ac
