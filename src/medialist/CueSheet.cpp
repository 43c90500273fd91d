#include "medialist/CueSheet.h"

#include "medialist/TextDecoding.h"


#include <algorithm>
#include <cctype>
#include <cerrno>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <system_error>

namespace ac {
namespace {

std::string Upper(std::string_view s) {
    std::string out(s);
    for (char& c : out) {
        c = static_cast<char>(std::toupper(static_cast<unsigned char>(c)));
    }
    return out;
}

// The words of one line: quoted texts (a missing closing quote runs to the line end) and
// runs of non-blanks.
struct LineWords {
    std::vector<std::string> words;
    std::vector<bool> quoted;
};

LineWords SplitLine(std::string_view line) {
    LineWords out;
    size_t i = 0;
    while (i < line.size()) {
        char c = line[i];
        if (c == ' ' || c == '\t') {
            ++i;
            continue;
        }
        if (c == '"') {
            size_t end = line.find('"', i + 1);
            if (end == std::string_view::npos) {
                end = line.size();
            }
            out.words.emplace_back(line.substr(i + 1, end - i - 1));
            out.quoted.push_back(true);
            i = end + 1;
            continue;
        }
        size_t end = i;
        while (end < line.size() && line[end] != ' ' && line[end] != '\t') {
            ++end;
        }
        out.words.emplace_back(line.substr(i, end - i));
        out.quoted.push_back(false);
        i = end;
    }
    return out;
}

// The rest of a line after its keyword, as one text: a quoted text, or the bare words joined.
std::string RestOfLine(const LineWords& lw, size_t from, size_t to) {
    if (from >= to) {
        return {};
    }
    if (lw.quoted[from]) {
        return lw.words[from];
    }
    std::string joined;
    for (size_t k = from; k < to; ++k) {
        if (!joined.empty()) {
            joined += ' ';
        }
        joined += lw.words[k];
    }
    return joined;
}

// mm:ss:ff, lenient about digit counts; minutes may pass 99 on long single-file rips.
std::optional<std::int64_t> ParseMsf(std::string_view text) {
    std::int64_t parts[3] = {0, 0, 0};
    int part = 0;
    bool digit = false;
    for (char c : text) {
        if (c >= '0' && c <= '9') {
            if (parts[part] > 100000000) {
                return std::nullopt;
            }
            parts[part] = parts[part] * 10 + (c - '0');
            digit = true;
        } else if (c == ':' && digit && part < 2) {
            ++part;
            digit = false;
        } else {
            return std::nullopt;
        }
    }
    if (part != 2 || !digit || parts[1] > 59 || parts[2] >= kCueFramesPerSecond) {
        return std::nullopt;
    }
    return (parts[0] * 60 + parts[1]) * kCueFramesPerSecond + parts[2];
}

bool IsFileType(const std::string& word) {
    static const char* const kTypes[] = {"WAVE", "BINARY", "MP3", "AIFF", "MOTOROLA", "FLAC",
                                         "APE", "WV", "OGG"};
    std::string up = Upper(word);
    return std::any_of(std::begin(kTypes), std::end(kTypes),
                       [&](const char* t) { return up == t; });
}

std::string FileNameOnly(const std::string& name) {
    size_t cut = name.find_last_of("/\\");
    return cut == std::string::npos ? name : name.substr(cut + 1);
}

std::string Lower(std::string s) {
    for (char& c : s) {
        c = static_cast<char>(std::tolower(static_cast<unsigned char>(c)));
    }
    return s;
}

}  // namespace

std::string DecodeCueText(std::string_view bytes) {
    if (bytes.size() >= 3 && bytes.substr(0, 3) == "\xEF\xBB\xBF") {
        return std::string(bytes.substr(3));
    }
    if (bytes.size() >= 2 && bytes.substr(0, 2) == "\xFF\xFE") {
        return ConvertToUtf8(bytes.substr(2), "UTF-16LE");
    }
    if (bytes.size() >= 2 && bytes.substr(0, 2) == "\xFE\xFF") {
        return ConvertToUtf8(bytes.substr(2), "UTF-16BE");
    }
    return DecodeUnlabelledText(bytes);
}

CueSheetData ParseCueSheet(std::string_view bytes) {
    const std::string text = DecodeCueText(bytes);
    CueSheetData sheet;
    CueSheetTrack* track = nullptr;
    size_t pos = 0;
    while (pos <= text.size()) {
        size_t end = text.find_first_of("\r\n", pos);
        if (end == std::string::npos) {
            end = text.size();
        }
        const std::string_view line(text.data() + pos, end - pos);
        pos = end + 1;
        const LineWords lw = SplitLine(line);
        if (lw.words.empty() || lw.quoted[0]) {
            continue;
        }
        const std::string key = Upper(lw.words[0]);
        const size_t n = lw.words.size();
        if (key == "FILE" && n >= 2) {
            // Unquoted names with blanks: everything up to a trailing type word.
            size_t to = (n >= 3 && !lw.quoted[1] && IsFileType(lw.words[n - 1])) ? n - 1 : n;
            if (lw.quoted[1]) {
                to = 2;
            }
            sheet.files.push_back(RestOfLine(lw, 1, to));
        } else if (key == "TRACK" && n >= 2) {
            CueSheetTrack next;
            next.number = std::atoi(lw.words[1].c_str());
            next.fileIndex = static_cast<int>(sheet.files.size()) - 1;
            sheet.tracks.push_back(next);
            track = &sheet.tracks.back();
        } else if (key == "INDEX" && n >= 3 && track) {
            std::optional<std::int64_t> at = ParseMsf(lw.words[2]);
            if (!at) {
                continue;
            }
            int number = std::atoi(lw.words[1].c_str());
            if (number == 0) {
                track->index00 = *at;
            } else if (number == 1 && track->index01 < 0) {
                track->index01 = *at;
                track->fileIndex = static_cast<int>(sheet.files.size()) - 1;
            }
        } else if (key == "TITLE") {
            (track ? track->title : sheet.title) = RestOfLine(lw, 1, n);
        } else if (key == "PERFORMER") {
            (track ? track->performer : sheet.performer) = RestOfLine(lw, 1, n);
        } else if (key == "REM" && n >= 3 && !track) {
            const std::string what = Upper(lw.words[1]);
            if (what == "GENRE") {
                sheet.genre = RestOfLine(lw, 2, n);
            } else if (what == "DATE") {
                sheet.date = RestOfLine(lw, 2, n);
            }
        }
    }
    return sheet;
}

std::optional<CueTrackPath> SplitCueTrackPath(std::string_view path) {
    size_t bar = path.rfind('|');
    if (bar == std::string_view::npos || bar == 0 || bar + 1 >= path.size() ||
        path.size() - bar > 6) {
        return std::nullopt;
    }
    int number = 0;
    for (char c : path.substr(bar + 1)) {
        if (c < '0' || c > '9') {
            return std::nullopt;
        }
        number = number * 10 + (c - '0');
    }
    if (number <= 0) {
        return std::nullopt;
    }
    return CueTrackPath{std::string(path.substr(0, bar)), number};
}

std::string FindCueAudioFile(const std::string& sheetDir, const std::string& fileName) {
    namespace fs = std::filesystem;
    const std::string name = FileNameOnly(fileName);
    if (name.empty()) {
        return {};
    }
    std::error_code ec;
    fs::path exact = fs::path(sheetDir) / name;
    if (fs::is_regular_file(exact, ec)) {
        return exact.string();
    }
    const std::string lowerName = Lower(name);
    const std::string lowerStem = Lower(fs::path(name).stem().string());
    std::string sameStem;
    for (fs::directory_iterator it(sheetDir, ec), end; !ec && it != end; it.increment(ec)) {
        if (!it->is_regular_file(ec)) {
            continue;
        }
        const std::string candidate = it->path().filename().string();
        const std::string lowerCandidate = Lower(candidate);
        if (lowerCandidate == lowerName) {
            return it->path().string();
        }
        const std::string ext = Lower(it->path().extension().string());
        if (sameStem.empty() && Lower(it->path().stem().string()) == lowerStem &&
            ext != ".cue" && ext != ".log" && ext != ".txt" && ext != ".m3u") {
            sameStem = it->path().string();
        }
    }
    return sameStem;
}

bool ResolveCueTrack(const std::string& sheetPath, int track, CueTrackSpan& span,
                     std::string& error) {
    std::ifstream in(sheetPath, std::ios::binary);
    if (!in) {
        error = "cannot read cue sheet " + sheetPath;
        return false;
    }
    // Real sheets are a few kilobytes; a huge file here is not a cue sheet.
    std::string bytes;
    bytes.resize(4 << 20);
    in.read(bytes.data(), static_cast<std::streamsize>(bytes.size()));
    bytes.resize(static_cast<size_t>(in.gcount()));
    const CueSheetData sheet = ParseCueSheet(bytes);
    if (track < 1 || static_cast<size_t>(track) > sheet.tracks.size()) {
        error = "track " + std::to_string(track) + " is not in the cue sheet (it has " +
                std::to_string(sheet.tracks.size()) + ")";
        return false;
    }
    const CueSheetTrack& t = sheet.tracks[static_cast<size_t>(track - 1)];
    if (t.fileIndex < 0) {
        error = "track " + std::to_string(track) + " has no FILE in the cue sheet";
        return false;
    }
    const std::string& fileName = sheet.files[static_cast<size_t>(t.fileIndex)];
    const std::string dir = std::filesystem::path(sheetPath).parent_path().string();
    span.audioPath = FindCueAudioFile(dir.empty() ? "." : dir, fileName);
    if (span.audioPath.empty()) {
        error = "the audio file \"" + fileName + "\" of the cue sheet is missing";
        return false;
    }
    span.startFrame = t.index01 >= 0 ? t.index01 : std::max<std::int64_t>(t.index00, 0);
    span.endFrame = -1;
    if (static_cast<size_t>(track) < sheet.tracks.size()) {
        const CueSheetTrack& next = sheet.tracks[static_cast<size_t>(track)];
        if (next.fileIndex == t.fileIndex && next.index01 > span.startFrame) {
            span.endFrame = next.index01;
        }
    }
    span.title = t.title;
    span.performer = t.performer.empty() ? sheet.performer : t.performer;
    span.album = sheet.title;
    span.genre = sheet.genre;
    span.date = sheet.date;
    span.trackNumber = t.number > 0 ? t.number : track;
    return true;
}

}  // namespace ac
