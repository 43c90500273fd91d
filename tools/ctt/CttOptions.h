#pragma once
// The command line of ctt, already split into words by the launcher:
//
//   -relk -y -i "/music/song.wav" -title "My Song" -acodec "mp3" -ab "192" -ar "44100"
//   -ac "2 (stereo)" -id3v1 -id3v2 -vol 256 "/out/Song.mp3"
//
// Options are the keys of the profile parameter table. Those that mean something for an audio
// output are honoured; the video ones are accepted and named in one warning; anything else is
// an error, as is a value that makes no sense. Parsing is pure (no FFmpeg) so it can be fuzzed.
//
// Thread contract: any thread.

#include <cstdint>
#include <map>
#include <optional>
#include <string>
#include <vector>

namespace ac::ctt {

struct CttOptions {
    std::string input;
    std::string output;
    bool overwrite = false;
    std::string codec;   // FFmpeg encoder name, empty: the format's own
    std::string format;  // FFmpeg muxer name, empty: guessed from the output's extension
    std::string formatWord;
    std::int64_t bitRate = 0;  // bit/s, 0: encoder default
    int sampleRate = 0;        // 0: the source's
    int channels = 0;          // 0: the source's
    int volume = 256;          // 256 = unchanged, linear
    bool noVideo = false;
    bool noAudio = false;
    std::int64_t durationUs = 0;  // 0: all
    std::int64_t startUs = 0;
    std::int64_t tsOffsetUs = 0;
    // Tag option word (title, author, ...) -> value, quotes restored.
    std::map<std::string, std::string> tags;
    bool id3v1 = false;
    bool id3v2 = false;
    int threads = 1;
    std::vector<std::string> ignored;  // video options that mean nothing here
};

struct ParseResult {
    std::optional<CttOptions> options;
    std::string error;  // set when options is empty
};

// words: argv without the program name.
ParseResult ParseArguments(const std::vector<std::string>& words);

// 1000 hours: longer than any medium holds; the bound keeps the microsecond arithmetic far
// from overflow. The option error names it.
inline constexpr std::int64_t kMaxDurationSeconds = 1000 * 3600;

// Durations: "H:M:S[.frac]", "M:S", or seconds with a fraction; a leading "-" negates.
// "full", "auto" and "" mean "not set" (0). nullopt for anything else, and for more than
// kMaxDurationSeconds.
std::optional<std::int64_t> ParseDurationUs(const std::string& text);

// The codec words of the profiles mapped to FFmpeg encoders (mp3 -> libmp3lame, ...);
// empty for an unknown word.
std::string EncoderForCodecWord(const std::string& word);

// The format words mapped to FFmpeg muxers (m4a -> ipod, wma -> asf, ...); empty if unknown.
std::string MuxerForFormatWord(const std::string& word);

}  // namespace ac::ctt
