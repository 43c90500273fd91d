#include "cddb/CddbEntry.h"

#include "cddb/RecordText.h"
#include "platform/TextDecoding.h"
#include "resources/CodePage.h"

#include <algorithm>

namespace cddb {
namespace {

// Hands out the lines of a reply one by one. A line ends at the next "\r\n" if there is one
// anywhere ahead, else at the next "\n": so a bare "\n" before a later "\r\n" stays inside
// its line, as it always did for replies of mixed line ends.
class LineReader {
public:
    explicit LineReader(std::string_view text) : m_text(text), m_nextCrlf(text.find("\r\n")) {
        Next();
    }

    bool AtEnd() const { return !m_hasLine; }
    std::string_view Line() const { return m_line; }

    void Next() {
        if (m_position >= m_text.size()) {
            m_hasLine = false;
            m_line = {};
            return;
        }
        // Searched again only once the cursor has passed it, so a long text of bare "\n"
        // lines is not searched for a "\r\n" once per line.
        if (m_nextCrlf != std::string_view::npos && m_nextCrlf < m_position) {
            m_nextCrlf = m_text.find("\r\n", m_position);
        }
        std::size_t end = m_nextCrlf;
        std::size_t skip = 2;
        if (end == std::string_view::npos) {
            end = m_text.find('\n', m_position);
            skip = 1;
        }
        if (end == std::string_view::npos) {
            end = m_text.size();
            skip = 0;
        }
        m_line = m_text.substr(m_position, end - m_position);
        m_position = end + skip;
        m_hasLine = true;
    }

private:
    std::string_view m_text;
    std::size_t m_position = 0;
    std::size_t m_nextCrlf;
    std::string_view m_line;
    bool m_hasLine = false;
};

bool Contains(std::string_view line, std::string_view marker) {
    return line.find(marker) != std::string_view::npos;
}

bool IsComment(std::string_view line) {
    return !line.empty() && line.front() == '#';
}

// "#        150" gives "150"; a line of fewer than three characters is an empty comment.
std::string_view CommentText(std::string_view line) {
    if (line.size() < 3) {
        return {};
    }
    return TrimAsciiSpace(line.substr(1));
}

struct KeyLine {
    std::string_view key;
    std::string value;  // unescaped
};

// "TTITLE3=Planet Hell": split at the first '='; the value is unescaped \n, then \t, then \\,
// in that order, so "\\n" ends as a backslash and a line feed.
bool ParseKeyLine(std::string_view line, KeyLine& out) {
    const std::size_t equals = line.find('=');
    if (equals == std::string_view::npos) {
        return false;
    }
    out.key = line.substr(0, equals);
    std::string value(line.substr(equals + 1));
    ReplaceAll(value, "\\n", "\n");
    ReplaceAll(value, "\\t", "\t");
    ReplaceAll(value, "\\\\", "\\");
    out.value = std::move(value);
    return true;
}

bool IsKeyLine(std::string_view line, std::string_view key, KeyLine& out) {
    return ParseKeyLine(line, out) && out.key == key;
}

// Walks comment lines from the current one until one holds `marker`.
bool SeekComment(LineReader& lines, std::string_view marker) {
    for (; !lines.AtEnd() && IsComment(lines.Line()); lines.Next()) {
        if (Contains(lines.Line(), marker)) {
            return true;
        }
    }
    return false;
}

}  // namespace

// Every ISO-8859-1 byte maps to the code point of its own value.
std::string DecodeServerText(std::string_view bytes) {
    if (ac::IsValidUtf8(bytes)) {
        return ac::SanitizeUtf8(bytes);
    }
    std::string text;
    text.reserve(bytes.size() + bytes.size() / 4);
    for (const char c : bytes) {
        const auto byte = static_cast<unsigned char>(c);
        if (byte < 0x80) {
            text += c;
        } else {
            text += static_cast<char>(0xC0 | (byte >> 6));
            text += static_cast<char>(0x80 | (byte & 0x3F));
        }
    }
    return text;
}

namespace {

// The leading comments: the xmcd mark, the frame offsets and the disc length.
EntryResult ParseDiscComments(LineReader& lines, CddbEntry& out) {
    if (lines.AtEnd() || !IsComment(lines.Line()) || !Contains(lines.Line(), "xmcd")) {
        return EntryResult::NotXmcd;
    }
    lines.Next();
    if (!SeekComment(lines, "Track frame offsets:")) {
        return EntryResult::NoFrameOffsets;
    }
    // "#\t150" ... up to the first empty comment.
    for (lines.Next(); !lines.AtEnd() && IsComment(lines.Line()); lines.Next()) {
        const std::string_view text = CommentText(lines.Line());
        if (text.empty()) {
            break;
        }
        out.frameOffsets.push_back(ReadAtoi(text));
    }
    // "# Disc length: 3608 seconds": the number stands behind the 13 characters of the marker.
    if (!SeekComment(lines, "Disc length:") || CommentText(lines.Line()).size() < 13) {
        return EntryResult::NoDiscLength;
    }
    out.discLengthSeconds = ReadAtoi(CommentText(lines.Line()).substr(13));
    lines.Next();
    return EntryResult::Ok;
}

// The revision, when it is given, and the program that submitted the entry, which must be.
EntryResult ParseSubmitter(LineReader& lines, CddbEntry& out) {
    for (; !lines.AtEnd() && IsComment(lines.Line()); lines.Next()) {
        const std::string_view line = lines.Line();
        if (Contains(line, "Revision:") || Contains(line, "Submitted via:")) {
            break;
        }
    }
    if (lines.AtEnd() || !IsComment(lines.Line())) {
        return EntryResult::NoSubmittedVia;
    }
    if (Contains(lines.Line(), "Revision:")) {
        // "# Revision: 3": the number behind the 9 characters of "Revision:".
        const std::string_view text = CommentText(lines.Line());
        out.revision = text.size() >= 11 ? ReadAtoi(text.substr(9)) : 0;
        if (!SeekComment(lines, "Submitted via:")) {
            return EntryResult::NoSubmittedVia;
        }
    }
    // "# Submitted via: ExactAudioCopy v0.95b4": name, version, and maybe a comment word.
    const std::string_view text = CommentText(lines.Line());
    if (text.size() < 14) {
        return EntryResult::BadSubmittedVia;
    }
    const std::vector<std::string_view> words = SplitWords(text.substr(14), 3);
    if (words.size() < 2) {
        return EntryResult::BadSubmittedVia;
    }
    out.clientName = words[0];
    out.clientVersion = words[1];
    out.clientComments = words.size() > 2 ? words[2] : std::string_view();
    lines.Next();
    return EntryResult::Ok;
}

// DISCID, then DTITLE right behind it, joined with one more DTITLE line.
EntryResult ParseDiscTitle(LineReader& lines, CddbEntry& out) {
    while (!lines.AtEnd() && !Contains(lines.Line(), "DISCID=")) {
        lines.Next();
    }
    KeyLine keyLine;
    // "DISCID=940aac0b,940aad0b": the first id counts; the rest is never read.
    if (lines.AtEnd() || !IsKeyLine(lines.Line(), "DISCID", keyLine) || keyLine.value.size() < 8) {
        return EntryResult::BadDiscId;
    }
    out.discId = ReadHex(keyLine.value);
    lines.Next();
    if (lines.AtEnd() || !IsKeyLine(lines.Line(), "DTITLE", keyLine)) {
        return EntryResult::NoDiscTitle;
    }
    std::string discTitle = std::move(keyLine.value);
    lines.Next();
    if (!lines.AtEnd() && IsKeyLine(lines.Line(), "DTITLE", keyLine)) {
        discTitle += keyLine.value;
        lines.Next();
    }
    const std::size_t slash = discTitle.find('/');
    if (slash == std::string::npos) {
        out.title = TrimAsciiSpace(discTitle);
    } else {
        out.artist = TrimAsciiSpace(std::string_view(discTitle).substr(0, slash));
        out.title = TrimAsciiSpace(std::string_view(discTitle).substr(slash + 1));
    }
    // Servers asked for protocol level 5 or above, and every xmcd file on disk, carry DYEAR
    // and DGENRE between DTITLE and the track titles. Read as any other line they would end
    // the track titles before the first one.
    for (; !lines.AtEnd(); lines.Next()) {
        if (IsKeyLine(lines.Line(), "DYEAR", keyLine)) {
            out.discYear = TrimAsciiSpace(keyLine.value);
        } else if (IsKeyLine(lines.Line(), "DGENRE", keyLine)) {
            out.discGenre = TrimAsciiSpace(keyLine.value);
        } else {
            break;
        }
    }
    return EntryResult::Ok;
}

// "TTITLE3=..." twice in a row is one long title; any other number starts the next
// title, wherever the number points: titles are placed by line order, not by their numbers.
EntryResult ParseTrackTitles(LineReader& lines, CddbEntry& out) {
    int previousNumber = 0;
    KeyLine keyLine;
    for (; !lines.AtEnd() && Contains(lines.Line(), "TTITLE"); lines.Next()) {
        const std::string_view line = lines.Line();
        const int number = line.size() > 6 ? ReadAtoi(line.substr(6)) : 0;
        if (!ParseKeyLine(line, keyLine)) {
            return EntryResult::BadTrackTitle;
        }
        if (!out.trackTitles.empty() && number == previousNumber) {
            out.trackTitles.back() += keyLine.value;
        } else {
            out.trackTitles.push_back(std::move(keyLine.value));
        }
        previousNumber = number;
    }
    return EntryResult::Ok;
}

// EXTD, EXTT and PLAYORDER, each of which may be missing.
EntryResult ParseExtendedData(LineReader& lines, CddbEntry& out) {
    KeyLine keyLine;
    std::string discData;
    for (; !lines.AtEnd() && Contains(lines.Line(), "EXTD="); lines.Next()) {
        if (!ParseKeyLine(lines.Line(), keyLine)) {
            return EntryResult::BadExtendedDiscData;
        }
        discData += keyLine.value;
    }
    std::size_t start = 0;
    for (std::size_t feed; (feed = discData.find('\n', start)) != std::string::npos;
         start = feed + 1) {
        out.extendedDiscData.push_back(discData.substr(start, feed - start));
    }
    if (start < discData.size()) {
        out.extendedDiscData.push_back(discData.substr(start));
    }

    std::string previousKey;
    bool first = true;
    for (; !lines.AtEnd() && Contains(lines.Line(), "EXTT"); lines.Next()) {
        if (!ParseKeyLine(lines.Line(), keyLine)) {
            return EntryResult::BadExtendedTrackData;
        }
        if (!first && keyLine.key == previousKey) {
            out.extendedTrackData.back() += keyLine.value;
        } else {
            out.extendedTrackData.push_back(std::move(keyLine.value));
            previousKey = keyLine.key;
        }
        first = false;
    }

    // "PLAYORDER=0,2,1"; an empty value is the usual "no play order".
    if (!lines.AtEnd() && IsKeyLine(lines.Line(), "PLAYORDER", keyLine)) {
        std::string_view rest = keyLine.value;
        while (!rest.empty()) {
            const std::size_t comma = std::min(rest.find(','), rest.size());
            if (comma > 0) {
                out.playOrder.push_back(ReadAtoi(rest.substr(0, comma)));
            }
            rest.remove_prefix(std::min(comma + 1, rest.size()));
        }
    }
    return EntryResult::Ok;
}

}  // namespace

const char* EntryResultText(EntryResult result) {
    switch (result) {
        case EntryResult::Ok:
            return "The disc entry was read.";
        case EntryResult::BadStatus:
            return "The server sent no disc entry (its reply has no status of 210 to 219).";
        case EntryResult::NotXmcd:
            return "The disc entry does not start with the \"# xmcd\" comment.";
        case EntryResult::NoFrameOffsets:
            return "The disc entry has no \"Track frame offsets:\" comment.";
        case EntryResult::NoDiscLength:
            return "The disc entry has no \"Disc length:\" comment.";
        case EntryResult::NoSubmittedVia:
            return "The disc entry has no \"Submitted via:\" comment.";
        case EntryResult::BadSubmittedVia:
            return "The \"Submitted via:\" comment of the disc entry names no client and version.";
        case EntryResult::BadDiscId:
            return "The disc entry has no valid DISCID line.";
        case EntryResult::NoDiscTitle:
            return "The DISCID line of the disc entry is not followed by DTITLE.";
        case EntryResult::BadTrackTitle:
            return "A TTITLE line of the disc entry has no \"=\".";
        case EntryResult::BadExtendedDiscData:
            return "An EXTD line of the disc entry has no \"=\".";
        case EntryResult::BadExtendedTrackData:
            return "An EXTT line of the disc entry has no \"=\".";
    }
    return "The disc entry could not be read.";
}

EntryResult ParseEntry(std::string_view body, CddbEntry& out) {
    out = CddbEntry{};
    // The reply was always handled as a C string: nothing behind a NUL byte counts.
    body = body.substr(0, body.find('\0'));
    if (body.size() < 3) {
        return EntryResult::BadStatus;
    }
    const int status = ReadAtoi(body.substr(0, 3));
    if (status < 210 || status > 219) {
        return EntryResult::BadStatus;
    }
    const std::string text = DecodeServerText(body);
    LineReader lines(text);
    lines.Next();  // the status line
    for (auto step :
         {ParseDiscComments, ParseSubmitter, ParseDiscTitle, ParseTrackTitles, ParseExtendedData}) {
        if (const EntryResult result = step(lines, out); result != EntryResult::Ok) {
            return result;
        }
    }
    return EntryResult::Ok;
}

void EntryToDiscInfo(std::string_view category, const CddbEntry& entry, CDDiscInfo& info) {
    info.Clear();
    info.artist = entry.artist;
    info.album = entry.title;
    info.genre = category;
    info.year = "Unknown";
    bool genreFromExtd = false;
    for (const std::string& whole : entry.extendedDiscData) {
        // The old buffer looked at 259 characters of a line; cut where a character starts.
        const std::string line = FitText(whole, kTitleCapacity);
        // " YEAR: 1997": from the first digit to the end of the line. Only the last line
        // decides, because every line without YEAR sets it back.
        if (Contains(line, "YEAR")) {
            const std::size_t digit = line.find_first_of("0123456789");
            info.year = digit == std::string::npos ? std::string() : line.substr(digit);
        } else {
            info.year = "Unknown";
        }
        // " GENRE: Rock", written as the YEAR lines are: the genre stands from the ninth
        // character on.
        if (Contains(line, "GENRE")) {
            info.genre = SkipCharacters(line, 8);
            genreFromExtd = true;
        }
    }
    // Level 4 servers put year and genre into EXTD only; from level 5 on they come as DYEAR
    // and DGENRE, and EXTD may say nothing of them.
    if (info.year == "Unknown" && !entry.discYear.empty()) {
        info.year = entry.discYear;
    }
    if (!genreFromExtd && !entry.discGenre.empty()) {
        info.genre = entry.discGenre;
    }
    const std::size_t count =
        std::min(entry.trackTitles.size(), static_cast<std::size_t>(kMaxTracks));
    info.titles.assign(entry.trackTitles.begin(),
                       entry.trackTitles.begin() + static_cast<std::ptrdiff_t>(count));
    info.trackCount = static_cast<int>(count);
    info.Fit();
}

}  // namespace cddb
