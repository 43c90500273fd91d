// The cue sheet reader: a scanner and an LR parser over a small, strict grammar.
//
//   sheet        : header-lines track-list [blank-lines]
//   header-line  : CATALOG NUMBER | PERFORMER STRING | TITLE STRING | FILE STRING STRING | STRING+
//   track        : TRACK NUMBER AUDIO LINEEND track-lines
//   track-line   : ISRC STRING | TITLE STRING | PERFORMER STRING
//                | INDEX NUMBER NUMBER COLON NUMBER COLON NUMBER | STRING+
//
// Every header line and track line ends in a line end, and every list is right-recursive, so the
// parser keeps a stack entry per symbol until its list ends. The parse below walks the same
// states by hand and counts those entries, so a sheet too deep for the stack fails the same way.
#include "rip/CueSheet.h"

#include "resources/Language.h"
#include "resources/TextFormat.h"

#include <cstdio>
#include <cstring>
#include <fstream>
#include <iterator>
#include <new>

namespace ac {

CueSheet* g_CueSheet = nullptr;

namespace {

// Texts of the reader's diagnostics (StringTable.inc, area 0xC0E0).
constexpr std::uint32_t kIdNoTrackMemory = 0xC0E0;
constexpr std::uint32_t kIdCannotOpen = 0xC0E1;
constexpr std::uint32_t kIdParseError = 0xC0E2;
constexpr std::uint32_t kIdSyntax = 0xC0E3;
constexpr std::uint32_t kIdStackOverflow = 0xC0E4;
constexpr std::uint32_t kIdNoMoreTrackMemory = 0xC0E5;
constexpr std::uint32_t kIdCompleted = 0xC0E6;

void Emit(std::string* sink, FILE* stream, std::string_view text) {
    if (sink != nullptr) {
        sink->append(text);
    } else {
        std::fwrite(text.data(), 1, text.size(), stream);
    }
}

void EmitError(const CueOutput& out, std::string_view text) { Emit(out.errors, stderr, text); }
void EmitOutput(const CueOutput& out, std::string_view text) { Emit(out.output, stdout, text); }

void CopyText(char (&field)[kCueTextSize + 1], std::string_view text) {
    const std::size_t length = std::min(text.size(), kCueTextSize);
    std::memcpy(field, text.data(), length);
    field[length] = '\0';
}

enum class Token { End, Number, LineEnd, String, Performer, File, Track, Index, Audio, Title, Catalog, Isrc, Colon };

bool IsDigit(char c) { return c >= '0' && c <= '9'; }
bool IsAlnum(char c) { return IsDigit(c) || (c >= 'A' && c <= 'Z') || (c >= 'a' && c <= 'z'); }

class Scanner {
public:
    Scanner(std::string_view text, const CueOutput& out) : m_text(text), m_out(out) {}

    Token Next() {
        while (m_pos < m_text.size()) {
            const char c = m_text[m_pos];
            if (c == ' ' || c == '\t') {
                ++m_pos;
            } else if (c == '\n' || (c == '\r' && m_pos + 1 < m_text.size() && m_text[m_pos + 1] == '\n')) {
                m_pos += c == '\r' ? 2 : 1;
                ++m_lines;
                return Token::LineEnd;
            } else if (c == '"' && QuotedString()) {
                return Token::String;
            } else if (IsAlnum(c)) {
                return Word();
            } else if (c == ':') {
                ++m_pos;
                return Token::Colon;
            } else {
                // Anything else (a lone CR, punctuation, bytes of non-ASCII text) is echoed, as
                // the scanner's default rule always did.
                EmitOutput(m_out, m_text.substr(m_pos, 1));
                ++m_pos;
            }
        }
        return Token::End;
    }

    std::string_view Text() const { return m_value; }
    std::int32_t Number() const { return m_number; }
    int Lines() const { return m_lines; }

private:
    bool QuotedString() {
        std::size_t close = m_pos + 1;
        while (close < m_text.size() && m_text[close] != '"' && m_text[close] != '\n') ++close;
        if (close >= m_text.size() || m_text[close] != '"') return false;
        m_value = m_text.substr(m_pos + 1, std::min(close - m_pos - 1, kCueTextSize));
        m_pos = close + 1;
        return true;
    }

    Token Word() {
        std::size_t end = m_pos;
        bool digitsOnly = true;
        while (end < m_text.size() && IsAlnum(m_text[end])) {
            digitsOnly = digitsOnly && IsDigit(m_text[end]);
            ++end;
        }
        const std::string_view word = m_text.substr(m_pos, end - m_pos);
        m_pos = end;
        if (digitsOnly) {
            std::int64_t value = 0;
            for (char digit : word) {
                value = std::min<std::int64_t>(value * 10 + (digit - '0'), INT32_MAX);
            }
            m_number = static_cast<std::int32_t>(value);
            return Token::Number;
        }
        static constexpr std::pair<std::string_view, Token> kKeywords[] = {
            {"PERFORMER", Token::Performer}, {"FILE", Token::File},   {"TRACK", Token::Track},
            {"INDEX", Token::Index},         {"AUDIO", Token::Audio}, {"TITLE", Token::Title},
            {"CATALOG", Token::Catalog},     {"ISRC", Token::Isrc}};
        for (const auto& [keyword, token] : kKeywords) {
            if (word == keyword) return token;
        }
        m_value = word.substr(0, kCueTextSize);
        return Token::String;
    }

    std::string_view m_text;
    const CueOutput& m_out;
    std::size_t m_pos = 0;
    int m_lines = 0;
    std::string_view m_value;
    std::int32_t m_number = 0;
};

class Parser {
public:
    Parser(CueSheet& sheet, std::string_view text, const CueOutput& out)
        : m_sheet(sheet), m_scanner(text, out), m_out(out) {}

    bool Run() {
        Advance();
        return Header() && Tracks() && Tail();
    }

private:
    // The stack holds one entry per shifted symbol plus the start state.
    bool Shift() {
        ++m_depth;
        Advance();
        if (m_depth >= kCueMaxStackDepth) return Fail(kIdStackOverflow);
        return true;
    }
    void Reduce(std::size_t symbols) { m_depth -= symbols - 1; }
    void Advance() { m_token = m_scanner.Next(); }

    bool Fail(std::uint32_t reasonId) {
        if (!m_failed) {
            m_failed = true;
            EmitError(m_out, FormatText(g_Language.GetString(kIdParseError),
                                        {std::to_string(m_scanner.Lines()), g_Language.GetString(reasonId)}));
        }
        return false;
    }
    bool Expect(Token token) { return m_token == token ? Shift() : Fail(kIdSyntax); }

    // STRING followed by nothing but STRINGs: read and dropped.
    bool WordList() {
        std::size_t words = 0;
        while (m_token == Token::String) {
            if (!Shift()) return false;
            ++words;
        }
        Reduce(words);
        return true;
    }

    // KEYWORD STRING with a store of the text, reduced as soon as the string is in.
    bool KeywordString(char (&field)[kCueTextSize + 1]) {
        if (!Shift() || m_token != Token::String) return m_failed ? false : Fail(kIdSyntax);
        CopyText(field, m_scanner.Text());
        if (!Shift()) return false;
        Reduce(2);
        return true;
    }

    bool HeaderLine() {
        switch (m_token) {
            case Token::Catalog:
                if (!Shift() || !Expect(Token::Number)) return false;
                Reduce(2);
                return true;
            case Token::Performer: return KeywordString(m_sheet.performer);
            case Token::Title: return KeywordString(m_sheet.title);
            case Token::File: {
                if (!Shift() || m_token != Token::String) return m_failed ? false : Fail(kIdSyntax);
                CopyText(m_sheet.file, m_scanner.Text());
                if (!Shift() || m_token != Token::String) return m_failed ? false : Fail(kIdSyntax);
                CopyText(m_sheet.fileType, m_scanner.Text());
                if (!Shift()) return false;
                Reduce(3);
                return true;
            }
            case Token::String: return WordList();
            default: return Fail(kIdSyntax);
        }
    }

    static bool StartsHeaderLine(Token token) {
        return token == Token::Catalog || token == Token::Performer || token == Token::Title ||
               token == Token::File || token == Token::String;
    }
    static bool StartsTrackLine(Token token) {
        return token == Token::Isrc || token == Token::Title || token == Token::Performer ||
               token == Token::Index || token == Token::String;
    }

    bool Header() {
        std::size_t lines = 0;
        do {
            if (!HeaderLine() || !Expect(Token::LineEnd)) return false;
            ++lines;
        } while (StartsHeaderLine(m_token));
        Reduce(2 * lines);
        return true;
    }

    CueTrack& Current() { return m_sheet.tracks[m_sheet.trackCount]; }

    bool Index() {
        std::int32_t numbers[4] = {};
        if (!Shift()) return false;
        for (int part = 0; part < 4; ++part) {
            if (part >= 2 && !Expect(Token::Colon)) return false;
            if (m_token != Token::Number) return Fail(kIdSyntax);
            numbers[part] = m_scanner.Number();
            if (!Shift()) return false;
        }
        Reduce(7);
        if (numbers[0] == 1 && m_sheet.trackCount > 0) {
            CueTrack& previous = m_sheet.tracks[m_sheet.trackCount - 1];
            previous.endMinute = numbers[1];
            previous.endSecond = numbers[2];
            previous.endFrame = numbers[3];
        }
        return true;
    }

    bool TrackLine() {
        switch (m_token) {
            case Token::Isrc: {
                char ignored[kCueTextSize + 1];
                return KeywordString(ignored);
            }
            case Token::Title: return KeywordString(Current().title);
            case Token::Performer: return KeywordString(Current().performer);
            case Token::Index: return Index();
            default: return WordList();
        }
    }

    void FinishTrack() {
        ++m_sheet.trackCount;
        if (m_sheet.trackCount < m_sheet.capacity) return;
        try {
            m_sheet.tracks.resize(static_cast<std::size_t>(m_sheet.capacity) * 2);
            m_sheet.capacity *= 2;
        } catch (const std::bad_alloc&) {
            EmitError(m_out, g_Language.GetString(kIdNoMoreTrackMemory));
        }
    }

    bool Track() {
        if (!Shift()) return false;  // TRACK
        if (m_token != Token::Number) return Fail(kIdSyntax);
        const std::int32_t number = m_scanner.Number();
        if (!Shift() || !Expect(Token::Audio)) return false;
        // A track whose record cannot be held (the array could not grow) overwrites the last.
        if (m_sheet.trackCount >= m_sheet.capacity) --m_sheet.trackCount;
        Current() = CueTrack{};
        Current().number = number;
        if (!Expect(Token::LineEnd)) return false;
        if (!StartsTrackLine(m_token)) return Fail(kIdSyntax);
        std::size_t lines = 0;
        do {
            if (!TrackLine() || !Expect(Token::LineEnd)) return false;
            ++lines;
        } while (StartsTrackLine(m_token));
        Reduce(2 * lines + 4);
        FinishTrack();
        return true;
    }

    bool Tracks() {
        if (m_token != Token::Track) return Fail(kIdSyntax);
        do {
            if (!Track()) return false;
        } while (m_token == Token::Track);
        return true;
    }

    // Blank lines may only close the sheet.
    bool Tail() {
        while (m_token == Token::LineEnd) {
            if (!Shift()) return false;
        }
        return m_token == Token::End ? true : Fail(kIdSyntax);
    }

    CueSheet& m_sheet;
    Scanner m_scanner;
    const CueOutput& m_out;
    Token m_token = Token::End;
    std::size_t m_depth = 1;
    bool m_failed = false;
};

// Makes the one record of the sheet; false when its track array could not be had.
bool NewSheet(std::string_view path, const CueOutput& out) {
    FreeCueSheet();
    g_CueSheet = new CueSheet;
    try {
        g_CueSheet->tracks.resize(kCueInitialCapacity);
    } catch (const std::bad_alloc&) {
        EmitError(out, g_Language.GetString(kIdNoTrackMemory));
        return false;
    }
    g_CueSheet->capacity = kCueInitialCapacity;
    CopyText(g_CueSheet->title, path);
    return true;
}

int ParseInto(std::string_view text, const CueOutput& out) {
    if (!Parser(*g_CueSheet, text, out).Run()) return 1;
    EmitOutput(out, g_Language.GetString(kIdCompleted));
    return 0;
}

}  // namespace

int ParseCueSheetText(std::string_view text, std::string_view path, const CueOutput& out) {
    if (!NewSheet(path, out)) return 1;
    return ParseInto(text, out);
}

int ParseCueSheet(const std::string& path, const CueOutput& out) {
    if (!NewSheet(path, out)) return 1;
    std::ifstream file(path, std::ios::binary);
    if (!file) {
        EmitError(out, FormatText(g_Language.GetString(kIdCannotOpen), {path}));
        return 1;
    }
    const std::string text((std::istreambuf_iterator<char>(file)), std::istreambuf_iterator<char>());
    return ParseInto(text, out);
}

void FreeCueSheet() {
    delete g_CueSheet;
    g_CueSheet = nullptr;
}

}  // namespace ac
