#pragma once
// Language files: every text the user sees is asked for by number through g_Language, and the
// active .lang file (lang\NAME.lang in data.pkg) answers it, or the built-in English table does.
// A file is plain text in its own code page; lines such as
//   CODEPAGE=1252
//   #0063# "de_DE.UTF-8"
//   #M8004# "&Datei"
//   #D00660000# "Einstellungen"
// set a header value or one text of the string, menu or dialog table.
//
// Thread contract: GetString, GetMenuText, GetDialogText, GetLangCode, GetCharset and the code
// page getters may be called from any thread without a lock: a language switch publishes a
// complete new set of tables, and a reader keeps the set it started with. Everything else
// (Init, SelectLanguage, the Translate calls, the setters, GetLanguageName) is UI thread only.
// Misses are appended to the log under its own mutex.

#include <atomic>
#include <cstdint>
#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

namespace ac {

class ITranslatableDialog;
class ITranslatableMenu;

enum class LanguageTextKind { String, Menu, Dialog };

struct LanguageEntry {
    std::uint32_t id;
    std::string text;
};

// What language files set. The text tables keep file order and the first line of an id wins;
// the header values outlive a language switch unless the next file sets them again, except the
// charset, which every switch resets to 1.
struct LanguageTables {
    std::vector<LanguageEntry> menuTexts;
    std::vector<LanguageEntry> strings;
    std::vector<LanguageEntry> dialogTexts;
    int codePage = 1252;
    int subLang = 1;
    int language = 9;
    std::string langCode;
    int charset = 1;
};

// "\t", "\n" and "\r" as TAB, LF and CR; there is no escape for the backslash itself.
std::string UnescapeLanguageText(std::string_view text);
std::string EscapeLanguageText(std::string_view text);

// One line of a language file, already in UTF-8, into the tables. Lines of no known form are
// comments and change nothing.
void ParseLanguageLine(std::string_view line, LanguageTables& tables);

// The CODEPAGE= value a file sets (the last one when it sets several), read from its raw bytes:
// the line is ASCII in every code page a language file may use.
std::optional<int> FindFileCodePage(const std::vector<std::string>& rawLines);

// The lines of a whole file as read from the package (split at LF, CR kept) into the tables:
// a UTF-8 byte order mark is dropped, every line is converted from the file's code page to
// UTF-8, then parsed. The conversion comes first because in the double-byte code pages (936,
// 932) the byte of the backslash can be the second half of a character.
void ParseLanguageFile(const std::vector<std::string>& rawLines, LanguageTables& tables);

// The text of the first entry with that id, or null.
const std::string* FindLanguageText(const std::vector<LanguageEntry>& table, std::uint32_t id);

// A line in language-file form, as the miss log and the English template write it:
// #%04X# "%s", #M%04X# "%s" or #D%08X# "%s", with TAB, LF and CR escaped.
std::string FormatLanguageLine(LanguageTextKind kind, std::uint32_t id, std::string_view text);

// Caption number `index` of a menu bar's text "#File#Edit#View#". A piece shorter than two
// bytes, or a list with too few '#', answers the whole text.
std::string MenuTextPiece(std::string_view text, int index);

// The English name of the language of a POSIX locale name ("de_DE.UTF-8" gives "German",
// "zh_CN" "Chinese(Simplified)"); "English" for C, POSIX and languages not in the table.
std::string LanguageNameFromLocale(std::string_view localeName);
// The language of the user's locale (LC_ALL, LC_MESSAGES, LANG).
std::string SystemLanguageName();

// The miss log: while on, every text that the active language lacks is appended once to
// lang_miss.txt in the user data folder, in language-file form, so the file collects what a
// translator has to add. Off by default; nothing in the program turns it on.
void SetLanguageMissLog(bool on);
bool LanguageMissLogEnabled();
std::string LanguageMissLogPath();
void NoteLanguageMiss(LanguageTextKind kind, std::uint32_t id, std::string_view englishText);

class ImLanguage {
public:
    ImLanguage();
    virtual ~ImLanguage();
    ImLanguage(const ImLanguage&) = delete;
    ImLanguage& operator=(const ImLanguage&) = delete;

    bool Init(std::string baseDir, const std::string& name);
    void ScanLanguages();
    bool SelectLanguage(const std::string& name);

    std::string GetString(std::uint32_t id) const;
    std::string GetMenuText(std::uint32_t key) const;
    std::string GetDialogText(std::uint32_t key) const;

    bool TranslateDialog(ITranslatableDialog& dialog, int dialogId) const;
    bool TranslateMenu(ITranslatableMenu& menu, int menuId, bool top, int firstNumber);

    const std::string& GetLanguageName() const { return m_strLanguage; }
    int GetLanguageCount() const { return static_cast<int>(m_languages.size()); }
    std::string GetLanguageAt(int index) const;
    std::string GetLangCode() const;
    int GetCharset() const;
    int GetCodePage() const;
    int GetLanguage() const;
    int GetSubLang() const;
    const std::string& GetBaseDir() const { return m_strBaseDir; }

    void SetContentsCommand(int command) { m_contentsCommand = command; }
    void SetAboutCommand(int command) { m_aboutCommand = command; }
    // Put into the texts of the contents and about menu items.
    void SetProductName(std::string name) { m_productName = std::move(name); }
    // Stores the configuration key "language"; called when a missing language file made the
    // program fall back to English, so that the failed name is not tried at the next start.
    void SetLanguageKeyWriter(std::function<void(const std::string&)> writer) {
        m_languageKeyWriter = std::move(writer);
    }

private:
    const LanguageTables* Tables() const { return m_tables.load(std::memory_order_acquire); }
    bool Load(const std::string& name, LanguageTables& tables) const;
    void ApplyLocale() const;
    std::string DecorateCommandText(int command, const std::string& text) const;

    std::string m_strLanguage = "english";
    std::vector<std::string> m_languages;
    // The active tables. Replaced sets are kept, not freed: a worker thread may still be
    // reading one, and a switch is a click in the language menu, so they stay few.
    std::atomic<const LanguageTables*> m_tables;
    std::vector<std::unique_ptr<const LanguageTables>> m_tableSets;
    std::string m_strBaseDir;
    int m_contentsCommand = 0;
    int m_aboutCommand = 0;
    std::string m_productName;
    std::function<void(const std::string&)> m_languageKeyWriter;
    // One walk of a menu bar numbers its nested popups through these; context menus walked
    // later number on from where the bar left the counter.
    std::uint32_t m_popupCounter = 0;
    std::string m_barMissText;
};

extern ImLanguage g_Language;

// fileName with "_" and the language code put in front of its extension ("bg.bmp" becomes
// "bg_de.bmp"); unchanged without a code. With check set, a localized name that the packages
// do not hold answers the name as given, so a skin falls back to its general images.
std::string LocalizeFileName(const ImLanguage& language, std::string_view fileName, bool check);
// key + "_" + language code, or the key alone when there is no code.
std::string LocalizeKey(const ImLanguage& language, std::string_view key);

}  // namespace ac
