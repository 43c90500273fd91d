#include "resources/Language.h"

#include "platform/Paths.h"
#include "resources/BuiltinStrings.h"
#include "resources/CodePage.h"
#include "resources/LanguageUi.h"
#include "resources/Package.h"
#include "resources/TextScan.h"

#include <algorithm>
#include <cinttypes>
#include <climits>
#include <clocale>
#include <cstdio>
#include <cstdlib>
#include <mutex>

namespace ac {

ImLanguage g_Language;

namespace {

constexpr std::string_view kUtf8Bom = "\xEF\xBB\xBF";

// strtoul's reading of a hexadecimal id for a 32-bit unsigned long: leading blanks, a sign, an
// optional 0x, digits up to the first other character, saturating at 0xFFFFFFFF.
std::uint32_t ReadHexId(std::string_view s) {
    std::size_t i = 0;
    while (i < s.size() && IsAsciiSpace(s[i])) {
        ++i;
    }
    bool negative = false;
    if (i < s.size() && (s[i] == '+' || s[i] == '-')) {
        negative = s[i] == '-';
        ++i;
    }
    if (i + 2 < s.size() && s[i] == '0' && ToLowerAscii(s[i + 1]) == 'x' &&
        HexDigitValue(s[i + 2]) >= 0) {
        i += 2;
    }
    std::uint64_t value = 0;
    bool overflow = false;
    for (; i < s.size() && HexDigitValue(s[i]) >= 0; ++i) {
        value = value * 16 + static_cast<std::uint64_t>(HexDigitValue(s[i]));
        if (value > UINT32_MAX) {
            overflow = true;
            value = UINT32_MAX;
        }
    }
    if (overflow) {
        return UINT32_MAX;
    }
    auto result = static_cast<std::uint32_t>(value);
    return negative ? 0u - result : result;
}

// A header line: "CODEPAGE=936", "LANGCODE= de ".
void ParseHeaderLine(std::string_view line, LanguageTables& tables) {
    auto value = [&](std::string_view prefix) -> std::optional<std::string_view> {
        if (line.starts_with(prefix)) {
            return line.substr(prefix.size());
        }
        return std::nullopt;
    };
    if (auto v = value("CODEPAGE=")) {
        tables.codePage = ReadAtoi(*v);
    } else if (auto v = value("LANGUAGE=")) {
        tables.language = ReadAtoi(*v);
    } else if (auto v = value("SUBLANG=")) {
        tables.subLang = ReadAtoi(*v);
    } else if (auto v = value("LANGCODE=")) {
        tables.langCode = std::string(TrimAsciiSpace(*v));
    } else if (value("REVISION=")) {
        // The translators' version-control stamp; nothing reads it.
    } else if (auto v = value("CHARSET=")) {
        tables.charset = ReadAtoi(*v);
    }
}

std::vector<std::string> SplitAtLineFeeds(std::string_view text) {
    std::vector<std::string> pieces;
    std::size_t start = 0;
    for (;;) {
        std::size_t lf = text.find('\n', start);
        pieces.emplace_back(text.substr(start, lf == std::string_view::npos ? lf : lf - start));
        if (lf == std::string_view::npos) {
            return pieces;
        }
        start = lf + 1;
    }
}

std::string JoinWithLineFeeds(const std::vector<std::string>& items) {
    std::string joined;
    for (std::size_t i = 0; i < items.size(); ++i) {
        if (i > 0) {
            joined += '\n';
        }
        joined += items[i];
    }
    return joined;
}

struct LocaleLanguage {
    const char* code;  // ISO 639-1, as POSIX locale names begin
    const char* name;  // the English name, as language files are named
};

constexpr LocaleLanguage kLocaleLanguages[] = {
    {"af", "Afrikaans"},  {"ar", "Arabic"},    {"be", "Belarusian"}, {"bg", "Bulgarian"},
    {"ca", "Catalan"},    {"cs", "Czech"},     {"da", "Danish"},     {"de", "German"},
    {"el", "Greek"},      {"en", "English"},   {"es", "Spanish"},    {"et", "Estonian"},
    {"eu", "Basque"},     {"fa", "Farsi"},     {"fi", "Finnish"},    {"fr", "French"},
    {"ga", "Irish"},      {"gl", "Galician"},  {"he", "Hebrew"},     {"hi", "Hindi"},
    {"hr", "Croatian"},   {"hu", "Hungarian"}, {"hy", "Armenian"},   {"id", "Indonesian"},
    {"is", "Icelandic"},  {"it", "Italian"},   {"ja", "Japanese"},   {"ka", "Georgian"},
    {"kk", "Kazakh"},     {"ko", "Korean"},    {"lt", "Lithuanian"}, {"lv", "Latvian"},
    {"mk", "Macedonian"}, {"ms", "Malay"},     {"nb", "Norwegian"},  {"nl", "Dutch"},
    {"nn", "Norwegian"},  {"no", "Norwegian"}, {"pl", "Polish"},     {"pt", "Portuguese"},
    {"ro", "Romanian"},   {"ru", "Russian"},   {"sk", "Slovak"},     {"sl", "Slovenian"},
    {"sq", "Albanian"},   {"sr", "Serbian"},   {"sv", "Swedish"},    {"th", "Thai"},
    {"tr", "Turkish"},    {"uk", "Ukrainian"}, {"ur", "Urdu"},       {"vi", "Vietnamese"},
};

std::atomic<bool> s_missLogOn{false};
std::mutex s_missLogMutex;

}  // namespace

std::string UnescapeLanguageText(std::string_view text) {
    std::string out;
    out.reserve(text.size());
    for (std::size_t i = 0; i < text.size(); ++i) {
        if (text[i] == '\\' && i + 1 < text.size()) {
            const char next = text[i + 1];
            if (next == 't' || next == 'n' || next == 'r') {
                out += next == 't' ? '\t' : next == 'n' ? '\n' : '\r';
                ++i;
                continue;
            }
        }
        out += text[i];
    }
    return out;
}

std::string EscapeLanguageText(std::string_view text) {
    std::string out;
    out.reserve(text.size());
    for (char c : text) {
        switch (c) {
            case '\t':
                out += "\\t";
                break;
            case '\n':
                out += "\\n";
                break;
            case '\r':
                out += "\\r";
                break;
            default:
                out += c;
        }
    }
    return out;
}

// #0001# "OK"
// #M8004# "&File"
// #D00660401# "Output folder:"
void ParseLanguageLine(std::string_view rawLine, LanguageTables& tables) {
    const std::string line = UnescapeLanguageText(rawLine);
    const std::size_t hash = line.find('#');
    if (hash == std::string::npos) {
        ParseHeaderLine(line, tables);
        return;
    }
    auto kind = LanguageTextKind::String;
    std::size_t idStart = hash + 1;
    if (idStart < line.size() && (line[idStart] == 'M' || line[idStart] == 'D')) {
        kind = line[idStart] == 'M' ? LanguageTextKind::Menu : LanguageTextKind::Dialog;
        ++idStart;
    }
    const std::size_t idEnd = line.find('#', idStart);
    if (idEnd == std::string::npos || idEnd < 3) {
        return;
    }
    const std::uint32_t id = ReadHexId(std::string_view(line).substr(idStart, idEnd - idStart));

    // The text is searched on the whole line, not behind the id.
    const std::size_t open = line.find('"');
    if (open == std::string::npos) {
        return;
    }
    const std::size_t close = line.find('"', open + 1);
    if (close == std::string::npos || close <= 2) {
        return;
    }
    LanguageEntry entry{id, line.substr(open + 1, close - open - 1)};
    switch (kind) {
        case LanguageTextKind::String:
            tables.strings.push_back(std::move(entry));
            break;
        case LanguageTextKind::Menu:
            tables.menuTexts.push_back(std::move(entry));
            break;
        case LanguageTextKind::Dialog:
            tables.dialogTexts.push_back(std::move(entry));
            break;
    }
}

std::optional<int> FindFileCodePage(const std::vector<std::string>& rawLines) {
    std::optional<int> codePage;
    for (std::size_t i = 0; i < rawLines.size(); ++i) {
        std::string_view raw = rawLines[i];
        if (i == 0 && raw.starts_with(kUtf8Bom)) {
            raw.remove_prefix(kUtf8Bom.size());
        }
        if (!raw.starts_with("CODEPAGE=")) {
            continue;
        }
        // Judged as the parser will judge it: a '#' anywhere makes it no header line.
        const std::string line = UnescapeLanguageText(raw);
        if (line.find('#') == std::string::npos) {
            codePage = ReadAtoi(std::string_view(line).substr(9));
        }
    }
    return codePage;
}

void ParseLanguageFile(const std::vector<std::string>& rawLines, LanguageTables& tables) {
    const bool bom = !rawLines.empty() && rawLines[0].starts_with(kUtf8Bom);
    int codePage = tables.codePage;
    if (auto fromFile = FindFileCodePage(rawLines)) {
        codePage = *fromFile;
    } else if (bom) {
        // A byte order mark says UTF-8 more surely than the code page of the file before.
        codePage = kCodePageUtf8;
    }
    CodePageConverter converter(codePage);
    for (std::size_t i = 0; i < rawLines.size(); ++i) {
        std::string_view raw = rawLines[i];
        if (i == 0 && bom) {
            raw.remove_prefix(kUtf8Bom.size());
        }
        ParseLanguageLine(converter.ToUtf8(raw), tables);
    }
}

const std::string* FindLanguageText(const std::vector<LanguageEntry>& table, std::uint32_t id) {
    for (const auto& entry : table) {
        if (entry.id == id) {
            return &entry.text;
        }
    }
    return nullptr;
}

std::string FormatLanguageLine(LanguageTextKind kind, std::uint32_t id, std::string_view text) {
    char head[32];
    switch (kind) {
        case LanguageTextKind::String:
            std::snprintf(head, sizeof head, "#%04" PRIX32 "#", id);
            break;
        case LanguageTextKind::Menu:
            std::snprintf(head, sizeof head, "#M%04" PRIX32 "#", id);
            break;
        case LanguageTextKind::Dialog:
            std::snprintf(head, sizeof head, "#D%08" PRIX32 "#", id);
            break;
    }
    return std::string(head) + " \"" + EscapeLanguageText(text) + "\"";
}

std::string MenuTextPiece(std::string_view text, int index) {
    std::size_t start = text.find('#');
    if (index > 0) {
        // Piece n begins behind the n-th '#' that follows position 0.
        start = 0;
        for (int n = 0; n < index && start != std::string_view::npos; ++n) {
            start = text.find('#', start + 1);
        }
    }
    if (start == std::string_view::npos) {
        return std::string(text);
    }
    const std::size_t end = text.find('#', start + 1);
    std::string_view piece =
        text.substr(start + 1, end == std::string_view::npos ? end : end - start - 1);
    return piece.size() < 2 ? std::string(text) : std::string(piece);
}

// "zh_CN.UTF-8@pinyin": language, then '_' and the country, then '.' codeset, '@' modifier.
std::string LanguageNameFromLocale(std::string_view localeName) {
    const std::size_t languageEnd = localeName.find_first_of("_.@");
    const std::string_view language = localeName.substr(0, languageEnd);
    std::string_view country;
    if (languageEnd != std::string_view::npos && localeName[languageEnd] == '_') {
        country = localeName.substr(languageEnd + 1);
        country = country.substr(0, country.find_first_of(".@"));
    }
    if (EqualsIgnoringCase(language, "zh")) {
        return EqualsIgnoringCase(country, "CN") || EqualsIgnoringCase(country, "SG") ? "Chinese(Simplified)"
                                                                          : "Chinese(Traditional)";
    }
    for (const auto& entry : kLocaleLanguages) {
        if (EqualsIgnoringCase(language, entry.code)) {
            return entry.name;
        }
    }
    return "English";
}

std::string SystemLanguageName() {
    for (const char* variable : {"LC_ALL", "LC_MESSAGES", "LANG"}) {
        const char* value = std::getenv(variable);
        if (value && *value) {
            return LanguageNameFromLocale(value);
        }
    }
    return "English";
}

void SetLanguageMissLog(bool on) {
    s_missLogOn = on;
}

bool LanguageMissLogEnabled() {
    return s_missLogOn;
}

std::string LanguageMissLogPath() {
    return platform::UserDataDirectory() + "/lang_miss.txt";
}

void NoteLanguageMiss(LanguageTextKind kind, std::uint32_t id, std::string_view englishText) {
    if (!s_missLogOn) {
        return;
    }
    const std::string line = FormatLanguageLine(kind, id, englishText);
    std::lock_guard lock(s_missLogMutex);
    platform::EnsureDirectory(platform::UserDataDirectory());
    std::FILE* file = std::fopen(LanguageMissLogPath().c_str(), "a+b");
    if (!file) {
        return;
    }
    std::string contents;
    char buffer[4096];
    std::size_t got;
    while ((got = std::fread(buffer, 1, sizeof buffer, file)) > 0) {
        contents.append(buffer, got);
    }
    bool noted = false;
    for (std::string& existing : SplitAtLineFeeds(contents)) {
        if (!existing.empty() && existing.back() == '\r') {
            existing.pop_back();
        }
        // An empty line is contained in every line and proves nothing.
        if (!existing.empty() && line.find(existing) != std::string::npos) {
            noted = true;
            break;
        }
    }
    if (!noted) {
        std::fputs((line + "\n").c_str(), file);
    }
    std::fclose(file);
}

ImLanguage::ImLanguage() {
    m_tableSets.push_back(std::make_unique<const LanguageTables>());
    m_tables.store(m_tableSets.back().get(), std::memory_order_release);
}

ImLanguage::~ImLanguage() = default;

bool ImLanguage::Init(std::string baseDir, const std::string& name) {
    m_strBaseDir = std::move(baseDir);
    ScanLanguages();
    SelectLanguage(name);
    return true;
}

void ImLanguage::ScanLanguages() {
    m_languages.clear();
    ImPackageFinder finder;
    if (finder.FindFile(m_strBaseDir + "\\lang\\*.lang")) {
        for (const std::string& fileName : finder.Names()) {
            // The listing holds every entry of the folder, whatever its extension.
            if (fileName.size() > 5) {
                m_languages.push_back(fileName.substr(0, fileName.size() - 5));
            }
        }
    }
    std::sort(m_languages.begin(), m_languages.end());
}

bool ImLanguage::SelectLanguage(const std::string& name) {
    const LanguageTables* previous = Tables();
    auto next = std::make_unique<LanguageTables>();
    next->codePage = previous->codePage;
    next->subLang = previous->subLang;
    next->language = previous->language;
    next->langCode = previous->langCode;

    m_strLanguage = "english";
    for (const std::string& known : m_languages) {
        if (EqualsIgnoringCase(known, name)) {
            m_strLanguage = name;
            break;
        }
    }
    // The archive finds the entry whatever the case of the name, so the file loads in either
    // case; only the name shown depends on the scan.
    const bool loaded = Load(name, *next);
    m_tableSets.push_back(std::move(next));
    m_tables.store(m_tableSets.back().get(), std::memory_order_release);
    if (!loaded) {
        if (!EqualsIgnoringCase(name, "English")) {
            SelectLanguage("English");
            if (m_languageKeyWriter) {
                m_languageKeyWriter(GetLanguageName());
            }
        }
        return true;
    }
    ApplyLocale();
    return true;
}

bool ImLanguage::Load(const std::string& name, LanguageTables& tables) const {
    ImPackageFinder finder;
    if (!finder.ReadLines(m_strBaseDir + "\\lang\\" + name + ".lang")) {
        return false;
    }
    ParseLanguageFile(finder.Names(), tables);
    return true;
}

// String 99 names the locale of the language. Files written for another platform may name one
// this system does not know ("German_Germany.1252"); the user's own locale is better than
// keeping the previous language's. Numbers keep the decimal point in every language because
// settings, profiles and tool command lines are written with it. There is no thread locale to
// set beside it on this platform: the C locale is process-wide.
void ImLanguage::ApplyLocale() const {
    const std::string name = GetString(99);
    if (!std::setlocale(LC_ALL, name.c_str())) {
        std::setlocale(LC_ALL, "");
    }
    std::setlocale(LC_NUMERIC, "C");
}

std::string ImLanguage::GetString(std::uint32_t id) const {
    const LanguageTables* tables = Tables();
    const std::string* text = FindLanguageText(tables->strings, id);
    if (text && !text->empty()) {
        return *text;
    }
    const std::string_view builtin = BuiltinString(id);
    NoteLanguageMiss(LanguageTextKind::String, id, builtin);
    return std::string(builtin);
}

std::string ImLanguage::GetMenuText(std::uint32_t key) const {
    const LanguageTables* tables = Tables();
    const std::string* text = FindLanguageText(tables->menuTexts, key);
    return text ? *text : std::string();
}

std::string ImLanguage::GetDialogText(std::uint32_t key) const {
    const LanguageTables* tables = Tables();
    const std::string* text = FindLanguageText(tables->dialogTexts, key);
    return text ? *text : std::string();
}

bool ImLanguage::TranslateDialog(ITranslatableDialog& dialog, int dialogId) const {
    const std::uint32_t dialogKey = static_cast<std::uint32_t>(dialogId) << 16;
    const std::string caption = GetDialogText(dialogKey);
    if (!caption.empty()) {
        dialog.SetCaption(caption);
    } else {
        NoteLanguageMiss(LanguageTextKind::Dialog, dialogKey, dialog.GetCaption());
    }
    for (int index = 0; index < dialog.GetChildCount(); ++index) {
        const TranslatableControlKind kind = dialog.GetChildKind(index);
        if (kind == TranslatableControlKind::Edit || kind == TranslatableControlKind::List ||
            kind == TranslatableControlKind::Spin) {
            continue;
        }
        // Unnumbered labels carry -1 (or, read as 16 bits, 0xFFFF); they keep their text.
        const auto id = static_cast<std::int16_t>(dialog.GetChildId(index));
        if (id < 1) {
            continue;
        }
        const std::uint32_t key = dialogKey | static_cast<std::uint16_t>(id);
        // Ids up to 99 are the common buttons (OK, Cancel...), one translation for all dialogs.
        const std::string text =
            id > 99 ? GetDialogText(key) : GetString(static_cast<std::uint32_t>(id));
        const bool combo = kind == TranslatableControlKind::Combo;
        if (!text.empty()) {
            if (combo) {
                dialog.SetComboItems(index, SplitAtLineFeeds(text));
            } else {
                dialog.SetChildText(index, text);
            }
        } else {
            NoteLanguageMiss(LanguageTextKind::Dialog, key,
                             combo ? JoinWithLineFeeds(dialog.GetComboItems(index))
                                   : dialog.GetChildText(index));
        }
    }
    return true;
}

bool ImLanguage::TranslateMenu(ITranslatableMenu& menu, int menuId, bool top, int firstNumber) {
    if (top) {
        m_popupCounter =
            (static_cast<std::uint32_t>(menuId) << 16) + static_cast<std::uint32_t>(firstNumber);
        m_barMissText.clear();
    }
    for (int position = 0; position < menu.GetItemCount(); ++position) {
        const TranslatableMenuItemKind kind = menu.GetItemKind(position);
        if (kind == TranslatableMenuItemKind::Separator) {
            continue;
        }
        const bool command = kind == TranslatableMenuItemKind::Command;
        const int commandId = command ? menu.GetCommandId(position) : 0;
        std::uint32_t popupKey = 0;
        std::string text;
        if (top) {
            text = MenuTextPiece(GetMenuText(static_cast<std::uint32_t>(menuId)), position);
        } else if (command) {
            text = GetMenuText(static_cast<std::uint32_t>(commandId));
        } else {
            popupKey = m_popupCounter++;
            text = GetMenuText(popupKey);
        }

        if (command) {
            if (text.empty()) {
                NoteLanguageMiss(LanguageTextKind::Menu, static_cast<std::uint32_t>(commandId),
                                 menu.GetItemText(position));
            } else {
                menu.SetItemText(position, DecorateCommandText(commandId, text));
            }
            continue;
        }
        if (!text.empty()) {
            menu.SetItemText(position, text);
        } else if (top) {
            m_barMissText += '#';
            m_barMissText += menu.GetItemText(position);
        } else {
            NoteLanguageMiss(LanguageTextKind::Menu, popupKey, menu.GetItemText(position));
        }
        if (ITranslatableMenu* subMenu = menu.GetSubMenu(position)) {
            TranslateMenu(*subMenu, -1, false, 0);
        }
    }
    if (top && !m_barMissText.empty()) {
        NoteLanguageMiss(LanguageTextKind::Menu, static_cast<std::uint32_t>(menuId),
                         m_barMissText + "#");
    }
    return true;
}

// "Help &Contents" becomes "Help &Contents Velmorant Audio Converter"; "&About..." becomes
// "&About Velmorant Audio Converter ..." and "关于(&A)..." "关于 Velmorant Audio Converter
// (&A)...".
std::string ImLanguage::DecorateCommandText(int command, const std::string& text) const {
    if (command == m_contentsCommand) {
        return text + " " + m_productName;
    }
    if (command != m_aboutCommand) {
        return text;
    }
    std::size_t cut = text.find('(');
    if (cut == std::string::npos || cut == 0) {
        cut = text.find("...");
    }
    if (cut == std::string::npos) {
        return text + " " + m_productName;
    }
    return text.substr(0, cut) + " " + m_productName + " " + text.substr(cut);
}

std::string ImLanguage::GetLanguageAt(int index) const {
    if (index < 0 || index >= GetLanguageCount()) {
        return {};
    }
    return m_languages[static_cast<std::size_t>(index)];
}

std::string ImLanguage::GetLangCode() const {
    return Tables()->langCode;
}

int ImLanguage::GetCharset() const {
    return Tables()->charset;
}

int ImLanguage::GetCodePage() const {
    return Tables()->codePage;
}

int ImLanguage::GetLanguage() const {
    return Tables()->language;
}

int ImLanguage::GetSubLang() const {
    return Tables()->subLang;
}

std::string LocalizeFileName(const ImLanguage& language, std::string_view fileName, bool check) {
    const std::string code = language.GetLangCode();
    if (code.empty()) {
        return std::string(fileName);
    }
    // The extension is the last '.' of the last component, not one in a folder's name.
    const std::size_t dot = fileName.rfind('.');
    const std::size_t separator = fileName.find_last_of("\\/");
    std::string localized;
    if (dot == std::string_view::npos || (separator != std::string_view::npos && dot < separator)) {
        localized = std::string(fileName) + "_" + code;
    } else {
        localized =
            std::string(fileName.substr(0, dot)) + "_" + code + std::string(fileName.substr(dot));
    }
    if (check) {
        ImPackageFinder finder;
        if (!finder.FindFile(localized)) {
            return std::string(fileName);
        }
    }
    return localized;
}

std::string LocalizeKey(const ImLanguage& language, std::string_view key) {
    const std::string code = language.GetLangCode();
    return code.empty() ? std::string(key) : std::string(key) + "_" + code;
}

}  // namespace ac
