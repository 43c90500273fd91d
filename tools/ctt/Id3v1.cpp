#include "Id3v1.h"

#include <cctype>
#include <cstdlib>
#include <iterator>

namespace ac::ctt {
namespace {

// Numbers 0 to 125, spelled as that list spells them.
const char* const kGenres[] = {
    "Blues", "Classic Rock", "Country", "Dance", "Disco", "Funk", "Grunge", "Hip-Hop", "Jazz",
    "Metal", "New Age", "Oldies", "Other", "Pop", "R&B", "Rap", "Reggae", "Rock", "Techno",
    "Industrial", "Alternative", "Ska", "Death Metal", "Pranks", "Soundtrack", "Euro-Techno",
    "Ambient", "Trip-Hop", "Vocal", "Jazz+Funk", "Fusion", "Trance", "Classical", "Instrumental",
    "Acid", "House", "Game", "Sound Clip", "Gospel", "Noise", "AlternRock", "Bass", "Soul",
    "Punk", "Space", "Meditative", "Instrumental Pop", "Instrumental Rock", "Ethnic", "Gothic",
    "Darkwave", "Techno-Industrial", "Electronic", "Pop-Folk", "Eurodance", "Dream",
    "Southern Rock", "Comedy", "Cult", "Gangsta", "Top 40", "Christian Rap", "Pop/Funk",
    "Jungle", "Native American", "Cabaret", "New Wave", "Psychadelic", "Rave", "Showtunes",
    "Trailer", "Lo-Fi", "Tribal", "Acid Punk", "Acid Jazz", "Polka", "Retro", "Musical",
    "Rock & Roll", "Hard Rock", "Folk", "Folk-Rock", "National Folk", "Swing", "Fast Fusion",
    "Bebob", "Latin", "Revival", "Celtic", "Bluegrass", "Avantgarde", "Gothic Rock",
    "Progressive Rock", "Psychedelic Rock", "Symphonic Rock", "Slow Rock", "Big Band", "Chorus",
    "Easy Listening", "Acoustic", "Humour", "Speech", "Chanson", "Opera", "Chamber Music",
    "Sonata", "Symphony", "Booty Bass", "Primus", "Porn Groove", "Satire", "Slow Jam", "Club",
    "Tango", "Samba", "Folklore", "Ballad", "Power Ballad", "Rhythmic Soul", "Freestyle", "Duet",
    "Punk Rock", "Drum Solo", "A capella", "Euro-House", "Dance Hall",
};

bool SameText(const std::string& a, const char* b) {
    size_t i = 0;
    for (; i < a.size() && b[i]; ++i) {
        if (std::tolower(static_cast<unsigned char>(a[i])) != std::tolower(static_cast<unsigned char>(b[i]))) {
            return false;
        }
    }
    return i == a.size() && !b[i];
}

// UTF-8 to Latin-1; what Latin-1 lacks becomes '?'. Bytes that are no UTF-8 pass as they are.
std::string ToLatin1(const std::string& text) {
    std::string out;
    for (size_t i = 0; i < text.size();) {
        const auto c = static_cast<unsigned char>(text[i]);
        if (c < 0x80) {
            out += static_cast<char>(c);
            ++i;
            continue;
        }
        const int extra = c >= 0xF0 ? 3 : c >= 0xE0 ? 2 : c >= 0xC0 ? 1 : 0;
        if (extra == 0 || i + static_cast<size_t>(extra) >= text.size()) {
            out += static_cast<char>(c);
            ++i;
            continue;
        }
        unsigned code = c & (0x3F >> extra);
        for (int k = 1; k <= extra; ++k) {
            code = (code << 6) | (static_cast<unsigned char>(text[i + static_cast<size_t>(k)]) & 0x3F);
        }
        out += code <= 0xFF ? static_cast<char>(code) : '?';
        i += static_cast<size_t>(extra) + 1;
    }
    return out;
}

void PutField(std::string& tag, size_t at, size_t width, const std::string& text) {
    const std::string latin = ToLatin1(text);
    for (size_t k = 0; k < width && k < latin.size(); ++k) {
        tag[at + k] = latin[k];
    }
}

std::string Get(const std::map<std::string, std::string>& tags, const char* key) {
    auto it = tags.find(key);
    return it == tags.end() ? std::string() : it->second;
}

}  // namespace

int Id3v1GenreNumber(const std::string& genre) {
    if (!genre.empty() && std::isdigit(static_cast<unsigned char>(genre[0]))) {
        const int n = std::atoi(genre.c_str());
        return n >= 0 && n <= 255 ? n : 255;
    }
    for (size_t i = 0; i < std::size(kGenres); ++i) {
        if (SameText(genre, kGenres[i])) {
            return static_cast<int>(i);
        }
    }
    return 255;
}

std::string BuildId3v1Tag(const std::map<std::string, std::string>& tags) {
    std::string tag(128, '\0');
    tag.replace(0, 3, "TAG");
    PutField(tag, 3, 30, Get(tags, "title"));
    PutField(tag, 33, 30, Get(tags, "author"));
    PutField(tag, 63, 30, Get(tags, "album"));
    PutField(tag, 93, 4, Get(tags, "year"));
    PutField(tag, 97, 28, Get(tags, "comment"));
    // ID3v1.1: a zero, then the track number, in the comment's last two bytes.
    tag[126] = static_cast<char>(std::atoi(Get(tags, "track").c_str()) & 0xFF);
    tag[127] = static_cast<char>(Id3v1GenreNumber(Get(tags, "genre")));
    return tag;
}

}  // namespace ac::ctt
