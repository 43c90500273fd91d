#include "CttOptions.h"

#include "platform/CommandLine.h"

#include <algorithm>
#include <cctype>
#include <cstring>
#include <set>
#include <string_view>

namespace ac::ctt {
namespace {

enum class Kind { Switch, Value };
enum class Use { Honoured, Silent, Video };

struct OptionDef {
    const char* name;
    Kind kind;
    Use use;
};

// Every key of the profile parameter table, plus the tool's own words. "Silent" keys are
// accepted and have nothing to do for a one-input audio conversion (logging, sync, timing
// switches); "Video" keys are named in the warning.
constexpr OptionDef kOptions[] = {
    {"relk", Kind::Switch, Use::Silent},      {"y", Kind::Switch, Use::Honoured},
    {"i", Kind::Value, Use::Honoured},        {"t", Kind::Value, Use::Honoured},
    {"ss", Kind::Value, Use::Honoured},       {"outfilename", Kind::Value, Use::Silent},
    {"copyts", Kind::Switch, Use::Silent},    {"v", Kind::Value, Use::Silent},
    {"target", Kind::Value, Use::Video},      {"hq", Kind::Switch, Use::Video},
    {"bitexact", Kind::Switch, Use::Silent},  {"track", Kind::Value, Use::Silent},
    {"subtitle", Kind::Value, Use::Video},    {"angle", Kind::Value, Use::Video},
    {"title", Kind::Value, Use::Honoured},    {"author", Kind::Value, Use::Honoured},
    {"copyright", Kind::Value, Use::Honoured}, {"comment", Kind::Value, Use::Honoured},
    {"timestamp", Kind::Value, Use::Honoured}, {"album", Kind::Value, Use::Honoured},
    {"genre", Kind::Value, Use::Honoured},    {"composer", Kind::Value, Use::Honoured},
    {"origaritist", Kind::Value, Use::Honoured}, {"url", Kind::Value, Use::Honoured},
    {"encodedby", Kind::Value, Use::Honoured}, {"year", Kind::Value, Use::Honoured},
    {"id3v1", Kind::Switch, Use::Honoured},   {"id3v2", Kind::Switch, Use::Honoured},
    {"itsoffset", Kind::Value, Use::Honoured}, {"vismv", Kind::Value, Use::Video},
    {"benchmark", Kind::Switch, Use::Silent}, {"dump", Kind::Switch, Use::Silent},
    {"hex", Kind::Switch, Use::Silent},       {"re", Kind::Switch, Use::Silent},
    {"loop", Kind::Switch, Use::Silent},      {"threads", Kind::Value, Use::Honoured},
    {"vsync", Kind::Value, Use::Video},       {"async", Kind::Value, Use::Silent},
    {"vcodec", Kind::Value, Use::Video},      {"standard", Kind::Value, Use::Video},
    {"s", Kind::Value, Use::Video},           {"b", Kind::Value, Use::Video},
    {"maxrate", Kind::Value, Use::Video},     {"minrate", Kind::Value, Use::Video},
    {"bufsize", Kind::Value, Use::Video},     {"r", Kind::Value, Use::Video},
    {"aspect", Kind::Value, Use::Video},      {"pix_fmt", Kind::Value, Use::Video},
    {"croptop", Kind::Value, Use::Video},     {"cropbottom", Kind::Value, Use::Video},
    {"cropleft", Kind::Value, Use::Video},    {"cropright", Kind::Value, Use::Video},
    {"padtop", Kind::Value, Use::Video},      {"padbottom", Kind::Value, Use::Video},
    {"padleft", Kind::Value, Use::Video},     {"padright", Kind::Value, Use::Video},
    {"padcolor", Kind::Value, Use::Video},    {"bt", Kind::Value, Use::Video},
    {"sameq", Kind::Switch, Use::Video},      {"pass", Kind::Value, Use::Video},
    {"passlogfile", Kind::Value, Use::Video}, {"deinterlace", Kind::Switch, Use::Video},
    {"acodec", Kind::Value, Use::Honoured},   {"ab", Kind::Value, Use::Honoured},
    {"ar", Kind::Value, Use::Honoured},       {"ac", Kind::Value, Use::Honoured},
    {"vol_factor", Kind::Value, Use::Silent}, {"an", Kind::Switch, Use::Honoured},
    {"g", Kind::Value, Use::Video},           {"intra", Kind::Switch, Use::Video},
    {"vn", Kind::Switch, Use::Honoured},      {"qscale", Kind::Value, Use::Video},
    {"qmin", Kind::Value, Use::Video},        {"qmax", Kind::Value, Use::Video},
    {"lmin", Kind::Value, Use::Video},        {"lmax", Kind::Value, Use::Video},
    {"mbqmin", Kind::Value, Use::Video},      {"mbqmax", Kind::Value, Use::Video},
    {"qdiff", Kind::Value, Use::Video},       {"qblur", Kind::Value, Use::Video},
    {"qcomp", Kind::Value, Use::Video},       {"rc_init_cplx", Kind::Value, Use::Video},
    {"b_qfactor", Kind::Value, Use::Video},   {"i_qfactor", Kind::Value, Use::Video},
    {"b_qoffset", Kind::Value, Use::Video},   {"i_qoffset", Kind::Value, Use::Video},
    {"ibias", Kind::Value, Use::Video},       {"pbias", Kind::Value, Use::Video},
    {"rc_eq", Kind::Value, Use::Video},       {"rc_override", Kind::Value, Use::Video},
    {"me", Kind::Value, Use::Video},          {"dct_algo", Kind::Value, Use::Video},
    {"idct_algo", Kind::Value, Use::Video},   {"me_threshold", Kind::Value, Use::Video},
    {"mb_threshold", Kind::Value, Use::Video}, {"er", Kind::Value, Use::Video},
    {"ec", Kind::Value, Use::Video},          {"bf", Kind::Value, Use::Video},
    {"mbd", Kind::Value, Use::Video},         {"mbcmp", Kind::Value, Use::Video},
    {"ildctcmp", Kind::Value, Use::Video},    {"subcmp", Kind::Value, Use::Video},
    {"cmp", Kind::Value, Use::Video},         {"precmp", Kind::Value, Use::Video},
    {"preme", Kind::Value, Use::Video},       {"lumi_mask", Kind::Value, Use::Video},
    {"dark_mask", Kind::Value, Use::Video},   {"scplx_mask", Kind::Value, Use::Video},
    {"tcplx_mask", Kind::Value, Use::Video},  {"p_mask", Kind::Value, Use::Video},
    {"4mv", Kind::Switch, Use::Video},        {"obmc", Kind::Switch, Use::Video},
    {"lf", Kind::Switch, Use::Video},         {"part", Kind::Switch, Use::Video},
    {"bug", Kind::Value, Use::Video},         {"ps", Kind::Value, Use::Silent},
    {"error", Kind::Value, Use::Silent},      {"strict", Kind::Value, Use::Silent},
    {"ildct", Kind::Switch, Use::Video},      {"ilme", Kind::Switch, Use::Video},
    {"psnr", Kind::Switch, Use::Video},       {"vstats", Kind::Switch, Use::Video},
    {"vhook", Kind::Value, Use::Video},       {"aic", Kind::Switch, Use::Video},
    {"aiv", Kind::Switch, Use::Video},        {"umv", Kind::Switch, Use::Video},
    {"ssm", Kind::Switch, Use::Video},        {"alt", Kind::Switch, Use::Video},
    {"qprd", Kind::Switch, Use::Video},       {"cbp", Kind::Switch, Use::Video},
    {"trell", Kind::Switch, Use::Video},      {"cgop", Kind::Switch, Use::Video},
    {"scan_offset", Kind::Switch, Use::Video}, {"qpel", Kind::Switch, Use::Video},
    {"intra_matrix", Kind::Value, Use::Video}, {"inter_matrix", Kind::Value, Use::Video},
    {"top", Kind::Value, Use::Video},         {"nr", Kind::Value, Use::Video},
    {"qns", Kind::Value, Use::Video},         {"sc_threshold", Kind::Value, Use::Video},
    {"me_range", Kind::Value, Use::Video},    {"dc", Kind::Value, Use::Video},
    {"coder", Kind::Value, Use::Video},       {"context", Kind::Value, Use::Video},
    {"pred", Kind::Value, Use::Video},        {"f", Kind::Value, Use::Honoured},
    {"vol", Kind::Value, Use::Honoured},
};

const OptionDef* FindOption(std::string_view name) {
    for (const OptionDef& def : kOptions) {
        if (name == def.name) {
            return &def;
        }
    }
    return nullptr;
}

std::string Lower(std::string s) {
    for (char& c : s) {
        c = static_cast<char>(std::tolower(static_cast<unsigned char>(c)));
    }
    return s;
}

std::string Trim(const std::string& s) {
    size_t b = s.find_first_not_of(" \t");
    if (b == std::string::npos) {
        return {};
    }
    size_t e = s.find_last_not_of(" \t");
    return s.substr(b, e - b + 1);
}

// The launcher carries a double quote inside a value as 0x0B (platform/CommandLine.h).
std::string RestoreQuotes(const std::string& s) { return ac::platform::RestoreCommandValue(s); }

bool IsUnset(const std::string& lowered) {
    return lowered.empty() || lowered == "auto" || lowered == "full" || lowered == "default";
}

// The number at the start of the text, as profiles write them: "2 (stereo)" is 2. The rest
// must not start with a digit-like character, so "12x" or "1.5" are no counts.
std::optional<std::int64_t> LeadingInteger(const std::string& text, std::string* rest = nullptr) {
    size_t i = 0;
    std::int64_t value = 0;
    while (i < text.size() && std::isdigit(static_cast<unsigned char>(text[i]))) {
        if (value > 1000000000) {
            return std::nullopt;
        }
        value = value * 10 + (text[i] - '0');
        ++i;
    }
    if (i == 0) {
        return std::nullopt;
    }
    if (rest) {
        *rest = Trim(text.substr(i));
    }
    return value;
}

std::optional<std::int64_t> StrictInteger(const std::string& text) {
    std::string rest;
    auto v = LeadingInteger(text, &rest);
    if (!v || !rest.empty()) {
        return std::nullopt;
    }
    return v;
}

}  // namespace

std::optional<std::int64_t> ParseDurationUs(const std::string& raw) {
    std::string text = Lower(Trim(raw));
    if (IsUnset(text)) {
        return 0;
    }
    bool negative = false;
    if (text[0] == '-') {
        negative = true;
        text.erase(0, 1);
    }
    std::int64_t fieldValues[3] = {0, 0, 0};
    int fields = 0;
    size_t i = 0;
    bool digits = false;
    std::int64_t current = 0;
    std::int64_t fractionUs = 0;
    while (i < text.size()) {
        char c = text[i];
        if (c >= '0' && c <= '9') {
            if (current > 100000000000LL) {
                return std::nullopt;
            }
            current = current * 10 + (c - '0');
            digits = true;
        } else if (c == ':' && digits && fields < 2) {
            fieldValues[fields++] = current;
            current = 0;
            digits = false;
        } else if (c == '.' && digits) {
            std::int64_t scale = 100000;
            for (++i; i < text.size(); ++i) {
                if (text[i] < '0' || text[i] > '9') {
                    return std::nullopt;
                }
                fractionUs += (text[i] - '0') * scale;
                scale /= 10;
            }
            break;
        } else {
            return std::nullopt;
        }
        ++i;
    }
    if (!digits) {
        return std::nullopt;
    }
    fieldValues[fields] = current;
    std::int64_t seconds = 0;
    for (int k = 0; k <= fields; ++k) {
        if (k > 0 && fieldValues[k] > 59) {
            return std::nullopt;
        }
        seconds = seconds * 60 + fieldValues[k];
        if (seconds > kMaxDurationSeconds) {
            return std::nullopt;
        }
    }
    std::int64_t us = seconds * 1000000 + fractionUs;
    return negative ? -us : us;
}

std::string EncoderForCodecWord(const std::string& word) {
    static const std::map<std::string, std::string> kCodecs = {
        {"mp3", "libmp3lame"}, {"libmp3lame", "libmp3lame"}, {"mp2", "mp2"},
        {"ac3", "ac3"},        {"aac", "aac"},               {"vorbis", "libvorbis"},
        {"libvorbis", "libvorbis"}, {"flac", "flac"},        {"wmav1", "wmav1"},
        {"wmav2", "wmav2"},    {"g726", "g726"},             {"alac", "alac"},
        {"opus", "libopus"},   {"libopus", "libopus"},
    };
    const std::string w = Lower(Trim(word));
    if (auto it = kCodecs.find(w); it != kCodecs.end()) {
        return it->second;
    }
    // The pcm_ family keeps FFmpeg's own names; the rest of the name is checked by FFmpeg.
    if (w.size() > 4 && w.compare(0, 4, "pcm_") == 0 &&
        std::all_of(w.begin(), w.end(), [](char c) { return std::isalnum(static_cast<unsigned char>(c)) || c == '_'; })) {
        return w;
    }
    return {};
}

std::string MuxerForFormatWord(const std::string& word) {
    static const std::map<std::string, std::string> kFormats = {
        {"mp3", "mp3"},   {"wav", "wav"},   {"flac", "flac"}, {"ogg", "ogg"},
        {"au", "au"},     {"ac3", "ac3"},   {"mp2", "mp2"},   {"adts", "adts"},
        {"aac", "adts"},  {"m4a", "ipod"},  {"mp4", "mp4"},   {"ipod", "ipod"},
        {"asf", "asf"},   {"wma", "asf"},   {"wmv", "asf"},   {"xwmv", "asf"},
    };
    auto it = kFormats.find(Lower(Trim(word)));
    return it == kFormats.end() ? std::string() : it->second;
}

namespace {

// Applies one value option; an empty return means accepted, else the error text.
std::string ApplyValue(CttOptions& o, const std::string& name, const std::string& rawValue) {
    const std::string value = Trim(RestoreQuotes(rawValue));
    const std::string lowered = Lower(value);
    auto bad = [&](const char* what) {
        return "invalid value \"" + value + "\" for -" + name + ": " + what;
    };
    if (name == "i") {
        o.input = RestoreQuotes(rawValue);
    } else if (name == "acodec") {
        if (lowered == "copy") {
            return "-acodec copy is not supported: the audio is always encoded";
        }
        o.codec = EncoderForCodecWord(lowered);
        if (o.codec.empty()) {
            return "unknown audio codec \"" + value + "\"";
        }
    } else if (name == "f") {
        o.format = MuxerForFormatWord(lowered);
        if (lowered == "ape") {
            return "Monkey's Audio (ape) can be read but not written";
        }
        if (o.format.empty()) {
            return "unknown output format \"" + value + "\"";
        }
        o.formatWord = lowered;
    } else if (name == "ab") {
        if (IsUnset(lowered)) {
            o.bitRate = 0;
            return {};
        }
        std::string rest;
        auto kbit = LeadingInteger(lowered, &rest);
        if (!kbit || *kbit == 0 || !(rest.empty() || rest == "k" || rest == "kbps" || rest == "kbit/s")) {
            return bad("expected kbit/s");
        }
        // A few profiles carry bit/s rather than kbit/s.
        o.bitRate = *kbit > 10000 ? *kbit : *kbit * 1000;
        if (o.bitRate > 100000000) {
            return bad("bit rate too high");
        }
    } else if (name == "ar") {
        if (IsUnset(lowered) || lowered == "0") {
            o.sampleRate = 0;
            return {};
        }
        std::string rest;
        auto rate = LeadingInteger(lowered, &rest);
        if (!rate || *rate < 1000 || *rate > 768000 || !(rest.empty() || rest == "hz")) {
            return bad("expected a sample rate in Hz");
        }
        o.sampleRate = static_cast<int>(*rate);
    } else if (name == "ac") {
        if (IsUnset(lowered) || lowered == "0") {
            o.channels = 0;
            return {};
        }
        std::string rest;
        auto count = LeadingInteger(lowered, &rest);
        if (!count || *count < 1 || *count > 8 || (!rest.empty() && rest[0] != '(')) {
            return bad("expected a channel count");
        }
        o.channels = static_cast<int>(*count);
    } else if (name == "vol") {
        auto vol = StrictInteger(value);
        if (!vol || *vol > 65536) {
            return bad("expected a volume, 256 = unchanged");
        }
        o.volume = static_cast<int>(*vol);
    } else if (name == "threads") {
        if (IsUnset(lowered)) {
            o.threads = 0;
            return {};
        }
        auto n = StrictInteger(value);
        if (!n || *n > 64) {
            return bad("expected a thread count");
        }
        o.threads = static_cast<int>(*n);
    } else if (name == "t" || name == "ss" || name == "itsoffset") {
        auto us = ParseDurationUs(value);
        if (!us || (name != "itsoffset" && *us < 0)) {
            return bad("expected H:M:S or seconds, at most 1000 hours");
        }
        (name == "t" ? o.durationUs : name == "ss" ? o.startUs : o.tsOffsetUs) = *us;
    } else if (name == "timestamp" || name == "title" || name == "author" ||
               name == "copyright" || name == "comment" || name == "album" ||
               name == "genre" || name == "composer" || name == "origaritist" ||
               name == "url" || name == "encodedby" || name == "year") {
        o.tags[name] = value;
    }
    return {};
}

}  // namespace

ParseResult ParseArguments(const std::vector<std::string>& words) {
    ParseResult result;
    if (words.empty()) {
        result.error = "no arguments: usage ctt -relk -y -i INPUT [options] OUTPUT";
        return result;
    }
    CttOptions o;
    std::set<std::string> ignored;
    const size_t last = words.size() - 1;
    for (size_t i = 0; i < last; ++i) {
        const std::string& word = words[i];
        if (word.size() < 2 || word[0] != '-') {
            result.error = "unexpected word \"" + RestoreQuotes(word) + "\"";
            return result;
        }
        const std::string name = word.substr(1);
        const OptionDef* def = FindOption(name);
        if (!def) {
            result.error = "unknown option " + word;
            return result;
        }
        if (def->use == Use::Video) {
            ignored.insert(name);
        }
        if (def->kind == Kind::Switch) {
            if (name == "y") o.overwrite = true;
            else if (name == "vn") o.noVideo = true;
            else if (name == "an") o.noAudio = true;
            else if (name == "id3v1") o.id3v1 = true;
            else if (name == "id3v2") o.id3v2 = true;
            continue;
        }
        if (i + 1 >= last) {
            result.error = "option " + word + " needs a value";
            return result;
        }
        // The rip driver writes "-acodec" with an empty codec as a bare word before the next
        // option; a value that is itself an option word is such a hole, not a value.
        const std::string& next = words[i + 1];
        const bool isTag = name == "title" || name == "author" || name == "album" ||
                           name == "comment" || name == "copyright" || name == "genre" ||
                           name == "composer" || name == "origaritist" || name == "url" ||
                           name == "encodedby" || name == "year" || name == "timestamp";
        if (!isTag && next.size() > 1 && next[0] == '-' && FindOption(next.substr(1)) &&
            !std::isdigit(static_cast<unsigned char>(next[1]))) {
            continue;
        }
        const std::string& value = words[++i];
        if (def->use == Use::Honoured) {
            if (std::string error = ApplyValue(o, name, value); !error.empty()) {
                result.error = error;
                return result;
            }
        }
    }
    o.output = RestoreQuotes(words[last]);
    if (o.input.empty()) {
        result.error = "no input given (-i)";
        return result;
    }
    if (o.output.empty() || o.output[0] == '-') {
        result.error = "no output file given (the last word)";
        return result;
    }
    if (o.noAudio) {
        result.error = "-an leaves nothing to write: the output is an audio file";
        return result;
    }
    o.ignored.assign(ignored.begin(), ignored.end());
    result.options = std::move(o);
    return result;
}

}  // namespace ac::ctt
