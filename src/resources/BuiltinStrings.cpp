#include "resources/BuiltinStrings.h"

#include <algorithm>
#include <array>
#include <iterator>

namespace ac {
namespace {

// The tables are checked at compile time: a lookup by binary search is only right on a sorted
// table, and a second entry of one id would never be found.
constexpr bool StrictlyAscending(std::span<const BuiltinStringEntry> table) {
    return std::adjacent_find(table.begin(), table.end(), [](const auto& a, const auto& b) {
               return a.id >= b.id;
           }) == table.end();
}

std::string_view Find(std::span<const BuiltinStringEntry> table, std::uint32_t id) {
    auto it =
        std::lower_bound(table.begin(), table.end(), id,
                         [](const BuiltinStringEntry& e, std::uint32_t key) { return e.id < key; });
    return it != table.end() && it->id == id ? it->text : std::string_view();
}

#define AC_STRING(id, text) BuiltinStringEntry{id, text},
constexpr BuiltinStringEntry kStrings[] = {
#include "resources/StringTable.inc"
};
#undef AC_STRING
static_assert(StrictlyAscending(kStrings), "StringTable.inc must be sorted by id, no repeats");

// The menu table is written menu by menu in walk order, which is how a translator reads it;
// lookups want it by key.
#define AC_MENU_TEXT(key, text) BuiltinStringEntry{key, text},
constexpr BuiltinStringEntry kMenuTextsInWalkOrder[] = {
#include "resources/MenuTextTable.inc"
};
#undef AC_MENU_TEXT

constexpr auto kMenuTexts = [] {
    std::array<BuiltinStringEntry, std::size(kMenuTextsInWalkOrder)> sorted{};
    std::copy(std::begin(kMenuTextsInWalkOrder), std::end(kMenuTextsInWalkOrder), sorted.begin());
    std::sort(sorted.begin(), sorted.end(),
              [](const auto& a, const auto& b) { return a.id < b.id; });
    return sorted;
}();
static_assert(StrictlyAscending(kMenuTexts), "MenuTextTable.inc holds a key twice");

}  // namespace

std::span<const BuiltinStringEntry> BuiltinStrings() {
    return kStrings;
}

std::string_view BuiltinString(std::uint32_t id) {
    return Find(kStrings, id);
}

std::span<const BuiltinStringEntry> BuiltinMenuTexts() {
    return kMenuTexts;
}

std::string_view BuiltinMenuText(std::uint32_t key) {
    return Find(kMenuTexts, key);
}

}  // namespace ac
