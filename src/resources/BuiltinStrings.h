#pragma once
// The program's own English texts, compiled in: the fall-back of every lookup that a language
// file leaves unanswered, and the source that English.lang is generated from.
//
// Thread contract: any thread; the tables are constant.

#include <cstdint>
#include <span>
#include <string_view>

namespace ac {

struct BuiltinStringEntry {
    std::uint32_t id;
    std::string_view text;
};

// Every built-in string, ascending by id, each id once.
std::span<const BuiltinStringEntry> BuiltinStrings();

// The English text of a string id; empty when the program has no such string.
std::string_view BuiltinString(std::uint32_t id);

// The English menu texts, keyed as a language file keys them (command ids, the caption list of
// a menu bar under its menu id, nested popups under (menu id << 16) + n), ascending by key,
// each key once.
std::span<const BuiltinStringEntry> BuiltinMenuTexts();

// The English menu text of a key; empty when there is none.
std::string_view BuiltinMenuText(std::uint32_t key);

}  // namespace ac
