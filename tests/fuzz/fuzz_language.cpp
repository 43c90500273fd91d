// Bytes as a language file: split into lines as the package reader splits them, converted from
// the code page in force, parsed, then looked up. Whatever the bytes, parsing ends, every text
// is valid UTF-8, and each stored line survives the trip through the miss-log form.

#include "resources/CodePage.h"
#include "resources/Language.h"

#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <string>
#include <string_view>
#include <vector>

namespace {

// The code page kept from the file before; the fuzzer reaches the double-byte converters
// without having to find a CODEPAGE= line first.
constexpr int kStartCodePages[] = {1252, 936, 932, 949, 950, 65001, 50220, 1251};

void Check(bool condition) {
    if (!condition) {
        std::abort();
    }
}

void CheckTable(const std::vector<ac::LanguageEntry>& table, ac::LanguageTextKind kind) {
    for (const auto& entry : table) {
        Check(ac::SanitizeUtf8(entry.text) == entry.text);
        const std::string* first = ac::FindLanguageText(table, entry.id);
        Check(first != nullptr);
        // A quote ends a text and a backslash may start an escape: neither form round-trips.
        // Nor does a string id whose hex begins with D (0xD000 and up): the file format reads
        // it as a dialog line. The built-in ids stay below that.
        const std::string line = ac::FormatLanguageLine(kind, entry.id, entry.text);
        const bool readsAsDialog = kind == ac::LanguageTextKind::String && line[1] == 'D';
        if (entry.text.find_first_of("\"\\") == std::string::npos && !readsAsDialog) {
            ac::LanguageTables again;
            ac::ParseLanguageLine(line, again);
            const auto& back = kind == ac::LanguageTextKind::String ? again.strings
                               : kind == ac::LanguageTextKind::Menu ? again.menuTexts
                                                                    : again.dialogTexts;
            Check(back.size() == 1 && back[0].id == entry.id && back[0].text == entry.text);
        }
    }
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    if (size == 0) {
        return 0;
    }
    ac::LanguageTables tables;
    tables.codePage = kStartCodePages[data[0] % std::size(kStartCodePages)];
    std::string_view text(reinterpret_cast<const char*>(data + 1), size - 1);

    std::vector<std::string> lines;
    while (!text.empty()) {
        const std::size_t end = text.find('\n');
        lines.emplace_back(text.substr(0, end));
        if (end == std::string_view::npos) {
            break;
        }
        text.remove_prefix(end + 1);
    }

    ac::ParseLanguageFile(lines, tables);
    CheckTable(tables.strings, ac::LanguageTextKind::String);
    CheckTable(tables.menuTexts, ac::LanguageTextKind::Menu);
    CheckTable(tables.dialogTexts, ac::LanguageTextKind::Dialog);
    for (const auto& entry : tables.menuTexts) {
        for (int piece = 0; piece < 4; ++piece) {
            const std::string caption = ac::MenuTextPiece(entry.text, piece);
            Check(caption.size() <= entry.text.size());
        }
    }
    (void)ac::LanguageNameFromLocale(tables.langCode);
    return 0;
}
