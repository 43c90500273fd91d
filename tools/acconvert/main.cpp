// acconvert: converts files from the command line with the program's own driver, profiles,
// naming rules and settings.
//
//   acconvert [--profile NAME|PATH] [--out DIR] [--jobs N] FILE...
//
// Exit status: 0 when every file was converted, 1 when some failed or could not be read,
// 2 for a usage error, 130 after Ctrl-C (children ended, partial outputs removed).

#include "ConsoleRun.h"
#include "ProfileLookup.h"

#include "convert/CommandLine.h"
#include "convert/OutputNaming.h"
#include "convert/RowParameters.h"
#include "medialist/CueSheet.h"
#include "medialist/MediaListRules.h"
#include "medialist/MediaProbe.h"
#include "platform/Paths.h"
#include "profile/ParameterSet.h"
#include "rip/CueExpansion.h"
#include "shell/AppConfig.h"

#include <atomic>
#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <string>
#include <vector>
#include <unistd.h>

extern "C" {
#include <libavutil/log.h>
}

namespace {

namespace fs = std::filesystem;
using namespace ac;

std::atomic<int> g_stopRequested{0};

extern "C" void OnStopSignal(int) {
    g_stopRequested = 1;
}

struct Options {
    std::string profile = "mp3";
    std::string outputDirectory;
    int jobs = 0;
    std::vector<std::string> files;
    bool help = false;
};

constexpr const char* kUsage = "usage: acconvert [--profile NAME|PATH] [--out DIR] [--jobs N] FILE...\n";

void Usage() { std::fputs(kUsage, stderr); }

void Help(const std::string& base) {
    std::fputs(kUsage, stdout);
    std::puts("\nConverts audio and video files, and the tracks of cue sheets, into audio files with the\n"
              "program's own profiles, naming rules and settings.\n\n"
              "  --profile NAME|PATH  a profile by file name or shown name, or a .pf file (default mp3)\n"
              "  --out DIR            the output folder (default: the program's destination folder)\n"
              "  --jobs N             conversions running at once (default: the program's setting)\n"
              "  --help               this text\n\n"
              "Exit status: 0 when every file converted, 1 when some did not, 2 for a usage error,\n"
              "130 when stopped (Ctrl-C); a stopped run leaves no partial file.\n\n"
              "Profiles:");
    console::PrintProfiles(base, stdout);
}

bool ParseArguments(int argc, char** argv, Options& options) {
    for (int i = 1; i < argc; ++i) {
        std::string word = argv[i];
        auto value = [&]() -> const char* { return i + 1 < argc ? argv[++i] : nullptr; };
        if (word == "--profile" || word == "--out" || word == "--jobs") {
            const char* text = value();
            if (!text)
                return false;
            if (word == "--profile")
                options.profile = text;
            else if (word == "--out")
                options.outputDirectory = text;
            else if ((options.jobs = std::atoi(text)) <= 0)
                return false;
        } else if (word == "--help" || word == "-h") {
            options.help = true;
            return true;
        } else if (word == "--") {
            for (++i; i < argc; ++i)
                options.files.emplace_back(argv[i]);
        } else if (word.starts_with("--")) {
            return false;
        } else {
            options.files.push_back(word);
        }
    }
    return !options.files.empty() || options.help;
}

// A folder given as the output must be one, or not exist yet (it is created).
bool CheckPaths(const Options& options) {
    std::error_code error;
    if (!options.outputDirectory.empty() && fs::exists(options.outputDirectory, error) &&
        !fs::is_directory(options.outputDirectory, error)) {
        std::fprintf(stderr, "acconvert: %s: is not a folder\n", options.outputDirectory.c_str());
        return false;
    }
    return true;
}

// Says why an input cannot be converted at all, as other tools do, so it is not run.
bool InputUsable(const std::string& file) {
    std::error_code error;
    if (!fs::exists(file, error) && !SplitCueTrackPath(file)) {
        std::fprintf(stderr, "acconvert: %s: no such file\n", file.c_str());
        return false;
    }
    if (fs::is_directory(file, error)) {
        std::fprintf(stderr, "acconvert: %s: is a folder\n", file.c_str());
        return false;
    }
    return true;
}

// name: what the list shows in its Name column, which also names the output.
std::unique_ptr<MediaItem> MakeRow(const std::string& sourcePath, const std::string& name,
                                   const ParameterSet& profile) {
    auto item = std::make_unique<MediaItem>();
    item->sourcePath = sourcePath;
    bool probed = ProbeFile(sourcePath, item->info) == 1;
    auto set = profile.Clone();
    if (probed)
        ApplyTags(*set, &item->info);
    set->SetValue("outfilename", name);
    item->parameters = std::make_unique<RowParameters>(std::move(set));
    item->SetStatus(probed ? JobStatus::Idle : JobStatus::UnknownFile);
    return item;
}

// Cue sheets stand for their tracks, as in the list: one row per "SHEET|N".
void AddSource(console::ConsoleRun& run, const std::string& path, const ParameterSet& profile) {
    std::string extension = fs::path(path).extension().string();
    for (auto& c : extension)
        c = static_cast<char>(std::tolower(static_cast<unsigned char>(c)));
    if (extension != ".cue") {
        run.AddRow(MakeRow(path, fs::path(path).stem().string(), profile));
        return;
    }
    const CueExpansion sheet = ExpandCueSheet(path);
    if (sheet.rows.empty()) {
        std::fprintf(stderr, "acconvert: %s\n", sheet.error.c_str());
        run.AddRow(MakeRow(path, fs::path(path).stem().string(), profile));  // an unknown file
        return;
    }
    for (const CueRow& row : sheet.rows)
        run.AddRow(MakeRow(row.trackPath, row.title.empty() ? GetDisplayName(row.trackPath) : row.title,
                           profile));
}

}  // namespace

int main(int argc, char** argv) {
    Options options;
    if (!ParseArguments(argc, argv, options)) {
        Usage();
        return 2;
    }
    // Probing runs in this process: FFmpeg's own complaints would land between the progress
    // lines. The reasons a file fails are printed in words of our own.
    av_log_set_level(AV_LOG_QUIET);
    AppConfig& config = GetAppConfig();
    std::string base = config.GetBaseDirectory();
    if (options.help) {
        Help(base);
        return 0;
    }
    if (!CheckPaths(options))
        return 2;
    console::LoosePackage loose;
    std::unique_ptr<ParameterSet> profile = console::FindProfile(options.profile, base, loose);
    if (!profile) {
        std::fprintf(stderr, "acconvert: no profile named %s\n", options.profile.c_str());
        return 2;
    }
    // The tool runs in the program's folder, so every path it gets must stand on its own.
    std::string outputDirectory =
        options.outputDirectory.empty() ? config.GetString("OutputDir") : options.outputDirectory;
    outputDirectory = fs::absolute(outputDirectory).lexically_normal().string();

    DriverConfig driverConfig;
    driverConfig.maxProcesses = config.GetInt("max_processes");
    driverConfig.maxRunningProcesses = config.GetInt("max_running_processes");
    if (options.jobs > 0) {
        driverConfig.maxRunningProcesses = options.jobs;
        driverConfig.maxProcesses = std::max(driverConfig.maxProcesses, options.jobs);
    }
    driverConfig.toolPath = platform::FindConversionTool();
    driverConfig.toolDirectory = base;
    // The same background priority as the window's runs: the settings file says it for both.
    driverConfig.slowdown = config.GetInt("slowdown") != 0;
    driverConfig.idle = config.GetInt("idle") != 0;
    // The end-of-run sound and after-run action belong to the window; a terminal run has none.
    driverConfig.afterConvertAction = 4;
    NamingSettings naming = ReadNamingSettings(config);

    struct sigaction stop {};
    stop.sa_handler = OnStopSignal;
    sigemptyset(&stop.sa_mask);
    sigaction(SIGINT, &stop, nullptr);
    sigaction(SIGTERM, &stop, nullptr);
    std::signal(SIGPIPE, SIG_IGN);

    console::ConsoleRun run(outputDirectory, ::isatty(STDOUT_FILENO) == 1, stdout);
    int unusable = 0;
    for (const auto& file : options.files) {
        if (InputUsable(file))
            AddSource(run, fs::absolute(file).lexically_normal().string(), *profile);
        else
            ++unusable;
    }

    OutputNamer namer = MakeRowNamer([naming] { return naming; });
    CommandBuilder builder = [](MediaItem& item) {
        return BuildConversionCommandText(item.sourcePath, item.outputPath, item.volume,
                                          *SetOf(item));
    };
    const int result = run.Run(driverConfig, namer, builder, g_stopRequested);
    return result == 0 && unusable > 0 ? 1 : result;
}
