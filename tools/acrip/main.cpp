// acrip: rips the audio tracks of a CD, or of a disc image, from the command line with the
// program's own rip driver, profiles, naming scheme, settings and local disc records.
//
//   acrip [--device DEV|IMAGE.cue|IMAGE.toc] [--profile NAME|PATH] [--out DIR] [--tracks 1,3-5]
//         [--list] [--cddb [--server HOST[:PORT]] [--choose N]]
//
// Exit status: 0 when every asked track ripped (or the table was listed), 1 when some failed,
// 2 for a usage error or when there is no audio disc to rip, 130 after Ctrl-C or SIGTERM (the
// tool ended, its part file removed).

#include "ConsoleRip.h"
#include "ProfileLookup.h"

#include "cddb/BatchFile.h"
#include "cddb/CddbLookup.h"
#include "cddb/DiscFile.h"
#include "convert/OutputNaming.h"
#include "platform/DiscDevice.h"
#include "platform/Paths.h"
#include "profile/TextUtil.h"
#include "rip/DriveWatcher.h"
#include "rip/RipDriver.h"
#include "rip/TrackTable.h"
#include "shell/AppConfig.h"

#include <algorithm>
#include <atomic>
#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <optional>
#include <set>
#include <string>
#include <string_view>
#include <vector>
#include <unistd.h>

extern "C" {
#include <cdio/cdio.h>
#include <cdio/logging.h>
#include <libavutil/log.h>
}

namespace {

namespace fs = std::filesystem;
using namespace ac;

std::atomic<int> g_stopRequested{0};

extern "C" void OnStopSignal(int) {
    g_stopRequested = 1;
}

extern "C" void DropCdioLog(cdio_log_level_t, const char*) {}

constexpr int kUsageError = 2;

constexpr const char* kUsage =
    "usage: acrip [--device DEV|IMAGE.cue|IMAGE.toc] [--profile NAME|PATH] [--out DIR]\n"
    "             [--tracks 1,3-5] [--list] [--cddb [--server HOST[:PORT]] [--choose N]]\n";

struct Options {
    std::string device;
    std::string profile = "mp3";
    std::string outputDirectory;
    std::set<int> tracks;  // empty: every audio track
    bool list = false;
    bool cddb = false;
    std::string server;  // HOST[:PORT]; empty: the setting remotecddb
    int choose = 0;      // 1-based match of a list; 0: the first
    bool help = false;
};

void Help(const std::string& base) {
    std::fputs(kUsage, stdout);
    std::puts(
        "\nRips the audio tracks of a CD, or of a disc image, into files with the program's own\n"
        "profiles, naming scheme and settings. Names come from the disc's record in the local\n"
        "disc record folder (setting localcddb) when there is one.\n\n"
        "  --device DEV         a drive (/dev/sr0) or a disc image (.cue beside its .bin, or "
        ".toc);\n"
        "                       default: the first drive, then the first image of the setting\n"
        "                       cdimages, that holds an audio disc\n"
        "  --profile NAME|PATH  a profile by file name or shown name, or a .pf file (default mp3)\n"
        "  --out DIR            the output folder (default: the setting OutputCDDir); files go to\n"
        "                       DIR/artist/album/, named by the naming scheme\n"
        "  --tracks LIST        the tracks to rip, as 1,3-5 (default: every audio track)\n"
        "  --list               show the disc id, the tracks and the disc's record; rip nothing\n"
        "  --cddb               look the disc up on the CDDB server, print its answer and the\n"
        "                       names, and keep them in the local record folder; rip nothing\n"
        "  --server HOST[:PORT] the CDDB server (default: the setting remotecddb, else\n"
        "                       gnudb.gnudb.org:80)\n"
        "  --choose N           take match N when the server offers several (default: the first)\n"
        "  --help               this text\n\n"
        "Exit status: 0 when every track ripped, 1 when some did not, 2 for a usage error or no\n"
        "audio disc, 130 when stopped (Ctrl-C); a stopped rip leaves no partial file.\n\n"
        "Profiles:");
    console::PrintProfiles(base, stdout);
}

int UsageError(const std::string& why) {
    std::fprintf(stderr, "acrip: %s\n%s", why.c_str(), kUsage);
    return kUsageError;
}

// "1,3-5": track numbers and ranges joined by commas, each number 1 to 99.
std::optional<std::set<int>> ParseTrackList(std::string_view text) {
    std::set<int> tracks;
    auto number = [](std::string_view digits) -> int {
        if (digits.empty() || digits.size() > 2 ||
            !std::all_of(digits.begin(), digits.end(), [](char c) { return c >= '0' && c <= '9'; }))
            return 0;
        return std::stoi(std::string(digits));
    };
    while (true) {
        const std::size_t comma = text.find(',');
        const std::string_view item = text.substr(0, comma);
        const std::size_t dash = item.find('-');
        const int first = number(item.substr(0, dash));
        const int last = dash == std::string_view::npos ? first : number(item.substr(dash + 1));
        if (first < 1 || last < first)
            return std::nullopt;
        for (int track = first; track <= last; ++track)
            tracks.insert(track);
        if (comma == std::string_view::npos)
            return tracks;
        text.remove_prefix(comma + 1);
    }
}

// An empty string when the words are good, else why not.
std::string ParseArguments(int argc, char** argv, Options& options) {
    for (int i = 1; i < argc; ++i) {
        const std::string word = argv[i];
        if (word == "--help" || word == "-h") {
            options.help = true;
        } else if (word == "--list") {
            options.list = true;
        } else if (word == "--cddb") {
            options.cddb = true;
        } else if (word == "--choose") {
            if (i + 1 >= argc)
                return word + " needs a value";
            const std::string value = argv[++i];
            options.choose = std::atoi(value.c_str());
            if (options.choose < 1 || value.find_first_not_of("0123456789") != std::string::npos)
                return "--choose " + value + ": not a match number such as 2";
        } else if (word == "--server") {
            if (i + 1 >= argc)
                return word + " needs a value";
            options.server = argv[++i];
        } else if (word == "--device" || word == "--profile" || word == "--out" ||
                   word == "--tracks") {
            if (i + 1 >= argc)
                return word + " needs a value";
            const std::string value = argv[++i];
            if (word == "--device") {
                options.device = value;
            } else if (word == "--profile") {
                options.profile = value;
            } else if (word == "--out") {
                options.outputDirectory = value;
            } else if (auto tracks = ParseTrackList(value)) {
                options.tracks = std::move(*tracks);
            } else {
                return "--tracks " + value + ": not a list of tracks such as 1,3-5";
            }
        } else if (word.starts_with("-")) {
            return "unknown option " + word;
        } else {
            return "unexpected argument " + word;
        }
    }
    if (!options.cddb && (options.choose != 0 || !options.server.empty()))
        return "--server and --choose go with --cddb";
    return {};
}

// "1-3", "1-4,6": the numbers in as few ranges as they make.
std::string RangesText(const std::vector<int>& numbers) {
    std::string text;
    for (std::size_t i = 0; i < numbers.size();) {
        std::size_t end = i;
        while (end + 1 < numbers.size() && numbers[end + 1] == numbers[end] + 1)
            ++end;
        text += (text.empty() ? "" : ",") + std::to_string(numbers[i]);
        if (end > i)
            text += "-" + std::to_string(numbers[end]);
        i = end + 1;
    }
    return text;
}

struct Disc {
    std::string drive;
    platform::DiscTable table;
};

// Says what is wrong with a drive given by hand, the way a user can act on it.
bool ReadGivenDrive(platform::IDiscDevice& device, const std::string& given, Disc& disc) {
    std::error_code error;
    if (!fs::exists(given, error)) {
        std::fprintf(stderr, "acrip: %s: no such drive or disc image\n", given.c_str());
        return false;
    }
    disc.drive = given;
    if (device.IsImage(given)) {
        disc.drive = fs::absolute(given).lexically_normal().string();
        // libcdio reads a cue sheet's audio from the .bin of the cue's own name, whatever
        // the sheet's FILE line says; it names that file itself.
        if (char* bin = cdio_is_cuefile(disc.drive.c_str())) {
            const std::string binPath = bin;
            std::free(bin);
            if (!fs::exists(binPath, error)) {
                std::fprintf(stderr, "acrip: %s: the image's audio file %s is missing\n",
                             given.c_str(), binPath.c_str());
                return false;
            }
        }
    }
    if (!device.ReadToc(disc.drive, disc.table) || !IsAudioDisc(disc.table)) {
        std::fprintf(stderr, "acrip: %s: holds no audio disc\n", given.c_str());
        return false;
    }
    return true;
}

bool FindDisc(platform::IDiscDevice& device, const Options& options, AppConfig& config,
              Disc& disc) {
    if (!options.device.empty())
        return ReadGivenDrive(device, options.device, disc);
    const std::vector<std::string> drives =
        device.ListDrives(platform::SplitImageList(config.GetString("cdimages", nullptr, "")));
    const int index = FindFirstAudioDisc(device, drives, disc.table);
    if (index < 0) {
        if (drives.empty()) {
            std::fputs(
                "acrip: no drive found and no disc image in the setting cdimages; name one "
                "with --device\n",
                stderr);
        } else {
            std::string names;
            for (const std::string& drive : drives)
                names += (names.empty() ? "" : ", ") + drive;
            std::fprintf(stderr, "acrip: no audio disc in %s\n", names.c_str());
        }
        return false;
    }
    disc.drive = drives[static_cast<std::size_t>(index)];
    // The tool runs in the program's folder: an image named relative to here must still be found.
    if (device.IsImage(disc.drive))
        disc.drive = fs::absolute(disc.drive).lexically_normal().string();
    return true;
}

void PrintTable(const Disc& disc, std::uint32_t discId, const std::vector<TrackRow>& rows,
                const cddb::CDDiscInfo* record, const std::string& recordFolder) {
    std::printf("Drive:   %s\n", disc.drive.c_str());
    std::printf("Disc id: %s\n", cddb::FormatDiscId(discId).c_str());
    if (record) {
        std::printf("Artist:  %s\nAlbum:   %s\nYear:    %s\nGenre:   %s\n", record->artist.c_str(),
                    record->album.c_str(), record->year.c_str(), record->genre.c_str());
    } else {
        std::printf("Record:  none (%s)\n", cddb::DiscFilePath(recordFolder, discId).c_str());
    }
    for (const TrackRow& row : rows)
        std::printf("%3d  %02d:%02d  %s\n", row.number, row.durationSeconds / 60,
                    row.durationSeconds % 60, row.title.c_str());
}

// The output folder as given or set: made when missing; the driver only makes artist and album.
bool PrepareOutputFolder(const Options& options, AppConfig& config, std::string& folder) {
    folder =
        options.outputDirectory.empty() ? config.GetString("OutputCDDir") : options.outputDirectory;
    folder = fs::absolute(folder).lexically_normal().string();
    std::error_code error;
    if (fs::exists(folder, error) && !fs::is_directory(folder, error)) {
        std::fprintf(stderr, "acrip: %s: is not a folder\n", folder.c_str());
        return false;
    }
    if (!platform::EnsureDirectory(folder, 0777)) {
        std::fprintf(stderr, "acrip: %s: cannot make the folder\n", folder.c_str());
        return false;
    }
    return true;
}

// The lookup told on the terminal: every answer of the server as it came, and the matches
// numbered when there are several.
class ConsoleLookup : public cddb::ILookupObserver {
public:
    explicit ConsoleLookup(int choose) : m_choose(choose) {}
    void ShowAction(const std::string& text) override { std::printf("== %s\n", text.c_str()); }
    void ShowMessage(const std::string& text) override {
        std::fputs(text.c_str(), stdout);
        if (!text.empty() && text.back() != '\n')
            std::fputc('\n', stdout);
        std::fflush(stdout);
    }
    int ChooseMatch(const std::vector<std::string>& rows) override {
        for (std::size_t i = 0; i < rows.size(); ++i)
            std::printf("%s%zu: %s\n", static_cast<int>(i) + 1 == std::max(m_choose, 1) ? "*" : " ",
                        i + 1, rows[i].c_str());
        if (m_choose > static_cast<int>(rows.size())) {
            std::fprintf(stderr, "acrip: there are only %zu matches; taking the first\n",
                         rows.size());
            return 0;
        }
        return std::max(m_choose, 1) - 1;
    }
    void ShowEntryProblem(const std::string& reason) override {
        std::fprintf(stderr, "acrip: %s\n", reason.c_str());
    }

private:
    int m_choose;
};

// "host", "host:8080"; the port is 80 unless given.
cddb::CddbHost ServerOption(const std::string& text) {
    cddb::CddbHost host;
    const std::size_t colon = text.rfind(':');
    host.host = text.substr(0, colon);
    if (colon != std::string::npos) {
        const int port = std::atoi(text.c_str() + colon + 1);
        host.port = port > 0 && port < 65536 ? port : cddb::kDefaultCddbPort;
    }
    return host;
}

// Looks the disc up, prints the answer, keeps the record. 0 when the disc was named.
int LookUpDisc(const Options& options, AppConfig& config, const Disc& disc, std::uint32_t discId,
               const std::string& recordFolder) {
    cddb::LookupSettings settings;
    settings.host = options.server.empty() ? cddb::ParseHostSetting(config.GetString("remotecddb"))
                                           : ServerOption(options.server);
    settings.timeoutMs = static_cast<unsigned>(std::max(1, config.GetInt("timeout"))) * 1000;
    settings.email = config.GetString("cddb_email");
    settings.protocolLevel = config.GetInt("cddb_proto");
    settings.batchFile = cddb::BatchFilePath(recordFolder);
    ConsoleLookup observer(options.choose);
    cddb::CDDiscInfo info;
    if (!cddb::LookupDisc(settings, ToDiscToc(disc.table), observer, nullptr, info) ||
        info.trackCount == 0) {
        std::fprintf(stderr, "acrip: the CDDB server %s did not name disc %s\n",
                     (settings.host.host.empty() ? std::string(cddb::kDefaultCddbServer)
                                                 : settings.host.host)
                         .c_str(),
                     cddb::FormatDiscId(discId).c_str());
        return 1;
    }
    if (info.genre.empty())
        info.genre = "Other";
    if (!cddb::SaveDiscFile(recordFolder, cddb::FormatDiscId(discId), info,
                            config.GetInt("format"))) {
        std::fprintf(stderr, "acrip: cannot write %s\n",
                     cddb::DiscFilePath(recordFolder, discId).c_str());
        return 1;
    }
    PrintTable(disc, discId, BuildTrackRows(disc.table, disc.drive, &info), &info, recordFolder);
    std::printf("Stored:  %s\n", cddb::DiscFilePath(recordFolder, discId).c_str());
    return 0;
}

void InstallStopHandlers() {
    struct sigaction stop {};
    stop.sa_handler = OnStopSignal;
    sigemptyset(&stop.sa_mask);
    sigaction(SIGINT, &stop, nullptr);
    sigaction(SIGTERM, &stop, nullptr);
    std::signal(SIGPIPE, SIG_IGN);
}

}  // namespace

int main(int argc, char** argv) {
    Options options;
    if (const std::string error = ParseArguments(argc, argv, options); !error.empty())
        return UsageError(error);
    // Progress and reasons are printed in words of our own; the libraries' logs would land in
    // the middle of the progress line.
    av_log_set_level(AV_LOG_QUIET);
    AppConfig& config = GetAppConfig();
    const std::string base = config.GetBaseDirectory();
    if (options.help) {
        Help(base);
        return 0;
    }
    InstallStopHandlers();

    console::LoosePackage loose;
    std::unique_ptr<ParameterSet> profile;
    if (!options.list && !options.cddb &&
        !(profile = console::FindProfile(options.profile, base, loose))) {
        std::fprintf(stderr, "acrip: no profile named %s\n", options.profile.c_str());
        return kUsageError;
    }

    const std::unique_ptr<platform::IDiscDevice> device = platform::MakeDiscDevice();
    cdio_log_set_handler(DropCdioLog);
    Disc disc;
    if (!FindDisc(*device, options, config, disc))
        return kUsageError;

    const std::uint32_t discId = DiscIdOf(disc.table);
    const std::string recordFolder = cddb::LocalCddbFolder(config.GetString("localcddb"));
    if (options.cddb)
        return LookUpDisc(options, config, disc, discId, recordFolder);
    cddb::CDDiscInfo record;
    const bool known = cddb::LoadDiscFile(recordFolder, discId, record);
    const std::vector<TrackRow> rows =
        BuildTrackRows(disc.table, disc.drive, known ? &record : nullptr);
    if (options.list) {
        PrintTable(disc, discId, rows, known ? &record : nullptr, recordFolder);
        return 0;
    }

    std::vector<int> numbers;
    for (const TrackRow& row : rows)
        numbers.push_back(row.number);
    for (int wanted : options.tracks) {
        if (std::find(numbers.begin(), numbers.end(), wanted) == numbers.end()) {
            std::fprintf(stderr,
                         "acrip: track %d is not an audio track of the disc in %s "
                         "(audio tracks: %s)\n",
                         wanted, disc.drive.c_str(), RangesText(numbers).c_str());
            return kUsageError;
        }
    }

    RipSettings settings;
    if (!PrepareOutputFolder(options, config, settings.outputDirectory))
        return kUsageError;
    settings.ejectCd = config.GetInt("ejectcd") != 0;
    // The same background priority as the window's runs: the settings file says it for both.
    settings.slowdown = config.GetInt("slowdown") != 0;
    settings.idle = config.GetInt("idle") != 0;
    settings.naming = ReadNamingSettings(config);
    settings.toolPath = platform::FindConversionTool();
    settings.toolDirectory = base;
    // libcdio resolves the file names of a .toc against the working directory of the reader.
    if (AsciiLowerText(fs::path(disc.drive).extension().string()) == ".toc")
        settings.toolDirectory = fs::path(disc.drive).parent_path().string();

    const RipDiscTexts texts{record.artist, record.album, record.genre, record.year};
    const bool terminal = ::isatty(STDOUT_FILENO) == 1;
    console::ConsoleRip run(*device, disc.drive, texts, *profile, terminal, stdout);
    int asked = 0;
    for (const TrackRow& row : rows) {
        RipTrackItem item;
        item.sourcePath = row.sourcePath;
        item.duration = row.durationSeconds;
        item.trackNumber = row.number;
        const bool checked = options.tracks.empty() || options.tracks.count(row.number) > 0;
        asked += checked;
        // Every audio track is a row, as in the window: the scheme numbers a file by its row,
        // so a track gets the same name whichever tracks are asked for.
        run.AddRow(std::move(item), row.title, checked);
    }
    std::printf("Ripping %d of %zu tracks from %s into %s\n", asked, rows.size(),
                disc.drive.c_str(), MakeRipOutputName(settings, 0, "", texts).folder.c_str());
    std::fflush(stdout);
    return run.Run(settings, g_stopRequested);
}
