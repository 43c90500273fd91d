// acburn: burns files onto a disc from the command line with the program's own burn driver:
// every file is converted by ctt into the temporary folder, then written to a recorder, or to
// a disc image (an audio disc as NAME.bin + NAME.cue, a data disc as NAME.iso).
//
//   acburn [--type audio|mp3|wma] [--recorder DEV|--image PATH] [--speed N] [--copies N]
//          [--gap S] [--label TEXT] [--list-recorders] [--times] FILE...
//
// Exit status: 0 only when every copy was written, 1 when a conversion or a write failed,
// 2 for a usage error or an input that cannot be burnt, 130 after Ctrl-C or SIGTERM (children
// ended, temporary files and half-written images removed).

#include "ConsoleBurn.h"
#include "ProfileLookup.h"

#include "burn/BurnDriver.h"
#include "burn/BurnTexts.h"
#include "burn/Compilation.h"
#include "burn/ImageRecorder.h"
#include "convert/CommandLine.h"
#include "convert/OutputNaming.h"
#include "convert/RowParameters.h"
#include "medialist/MediaListRules.h"
#include "medialist/MediaProbe.h"
#include "platform/Paths.h"
#include "profile/ParameterSet.h"
#include "rip/CueExpansion.h"
#include "shell/AppConfig.h"

#include <atomic>
#include <chrono>
#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <string>
#include <thread>
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

constexpr const char* kUsage =
    "usage: acburn [--type audio|mp3|wma] [--recorder DEV|--image PATH] [--speed N] [--copies N]\n"
    "              [--gap S] [--label TEXT] [--list-recorders] [--times] FILE...\n";

struct Options {
    std::string type = "audio";
    std::string recorder;
    std::string image;
    int speed = -1;
    int copies = 1;
    int gap = 2;
    std::string label;
    bool listRecorders = false;
    bool times = false;
    bool help = false;
    std::vector<std::string> files;
};

bool ParseNumber(const char* text, int low, int high, int& value) {
    char* end = nullptr;
    const long parsed = std::strtol(text, &end, 10);
    if (!*text || *end || parsed < low || parsed > high)
        return false;
    value = static_cast<int>(parsed);
    return true;
}

bool ParseArguments(int argc, char** argv, Options& options) {
    for (int i = 1; i < argc; ++i) {
        const std::string word = argv[i];
        auto value = [&]() -> const char* { return i + 1 < argc ? argv[++i] : nullptr; };
        if (word == "--help" || word == "-h") {
            options.help = true;
            return true;
        } else if (word == "--list-recorders") {
            options.listRecorders = true;
        } else if (word == "--times") {
            options.times = true;
        } else if (word == "--type" || word == "--recorder" || word == "--image" ||
                   word == "--speed" || word == "--copies" || word == "--gap" ||
                   word == "--label") {
            const char* text = value();
            if (!text)
                return false;
            if (word == "--type") {
                options.type = text;
                if (options.type != "audio" && options.type != "mp3" && options.type != "wma")
                    return false;
            } else if (word == "--recorder") {
                options.recorder = text;
            } else if (word == "--image") {
                options.image = text;
            } else if (word == "--label") {
                options.label = text;
            } else if (!ParseNumber(text, word == "--gap" ? 0 : 1, word == "--gap" ? 10 : 100,
                                    word == "--speed"    ? options.speed
                                    : word == "--copies" ? options.copies
                                                         : options.gap)) {
                return false;
            }
        } else if (word == "--") {
            for (++i; i < argc; ++i)
                options.files.emplace_back(argv[i]);
        } else if (word.starts_with("--")) {
            return false;
        } else {
            options.files.push_back(word);
        }
    }
    if (!options.recorder.empty() && !options.image.empty())
        return false;
    return options.listRecorders || !options.files.empty();
}

void Help() {
    std::fputs(kUsage, stdout);
    std::puts(
        "\nConverts the files (any format the program reads, and the tracks of cue sheets) and "
        "burns\n"
        "them: an audio CD of WAV tracks, or an MP3 or WMA data disc.\n\n"
        "  --type audio|mp3|wma  the disc (default audio)\n"
        "  --recorder DEV        a recorder (see --list-recorders; default the first one)\n"
        "  --image PATH          write a disc image instead: PATH.bin + PATH.cue, or PATH.iso\n"
        "  --speed N             write speed as a multiple of 1x (default the recorder's best)\n"
        "  --copies N            copies, 1 to 100; the second image is PATH-2\n"
        "  --gap S               seconds of silence between audio tracks, 0 to 10 (default 2)\n"
        "  --label TEXT          volume label of a data disc\n"
        "  --list-recorders      the recorders found, the disc image last\n"
        "  --times               the seconds of the conversion and of the writes, on stderr\n\n"
        "Exit status: 0 when every copy was written, 1 when a conversion or write failed, 2 for a\n"
        "usage error or a file that cannot be burnt, 130 when stopped (Ctrl-C).");
}

std::unique_ptr<MediaItem> MakeRow(const std::string& sourcePath, const std::string& name,
                                   const ParameterSet& profile) {
    auto item = std::make_unique<MediaItem>();
    item->sourcePath = sourcePath;
    if (ProbeFile(sourcePath, item->info) != 1)
        return nullptr;
    auto set = profile.Clone();
    ApplyTags(*set, &item->info);
    set->SetValue("outfilename", name);
    item->parameters = std::make_unique<RowParameters>(std::move(set));
    return item;
}

// Cue sheets stand for their tracks, as in the burn list.
bool AddSource(console::ConsoleBurn& run, const std::string& path, const ParameterSet& profile,
               burn::CompilationTally& tally, double& seconds) {
    std::string extension = fs::path(path).extension().string();
    for (auto& c : extension)
        c = static_cast<char>(std::tolower(static_cast<unsigned char>(c)));
    std::vector<std::pair<std::string, std::string>> sources;
    if (extension == ".cue") {
        const CueExpansion sheet = ExpandCueSheet(path);
        if (sheet.rows.empty()) {
            std::fprintf(stderr, "acburn: %s: %s\n", path.c_str(), sheet.error.c_str());
            return false;
        }
        for (const CueRow& row : sheet.rows)
            sources.emplace_back(row.trackPath,
                                 row.title.empty() ? GetDisplayName(row.trackPath) : row.title);
    } else {
        sources.emplace_back(path, fs::path(path).stem().string());
    }
    for (const auto& [source, name] : sources) {
        auto item = MakeRow(source, name, profile);
        if (!item) {
            std::fprintf(stderr, "acburn: %s: not an audio or video file the program reads\n",
                         source.c_str());
            return false;
        }
        tally.Add(item->info);
        seconds += GetEffectiveDuration(*item);
        run.AddRow(std::move(item));
    }
    return true;
}

}  // namespace

int main(int argc, char** argv) {
    Options options;
    if (!ParseArguments(argc, argv, options)) {
        std::fputs(kUsage, stderr);
        return 2;
    }
    if (options.help) {
        Help();
        return 0;
    }
    av_log_set_level(AV_LOG_QUIET);
    AppConfig& config = GetAppConfig();
    const std::string base = config.GetBaseDirectory();

    const std::string imageBase = options.image.empty()
                                      ? (fs::path(platform::MusicDirectory()) / "disc").string()
                                      : fs::absolute(options.image).lexically_normal().string();
    auto recorders = burn::RetryRecorder(imageBase);
    if (options.listRecorders) {
        for (const auto& recorder : recorders)
            std::printf("%-24s %s\n", recorder->DriveText().c_str(), recorder->Name().c_str());
        return 0;
    }
    burn::ICdRecorder* recorder = nullptr;
    if (!options.image.empty()) {
        recorder = recorders.back().get();
    } else if (!options.recorder.empty()) {
        for (const auto& candidate : recorders)
            if (!candidate->IsImage() && candidate->DriveText() == options.recorder)
                recorder = candidate.get();
        if (!recorder) {
            std::fprintf(stderr, "acburn: %s: no such recorder (see --list-recorders)\n",
                         options.recorder.c_str());
            return 2;
        }
    } else if (recorders.size() > 1) {
        recorder = recorders.front().get();
    } else {
        std::fprintf(stderr, "acburn: %s; write a disc image with --image PATH\n",
                     console::BurnText(burn::text::kNoRecorder).c_str());
        return 2;
    }
    if (const std::string why = recorder->UnavailableReason(); !why.empty()) {
        std::fprintf(stderr, "acburn: %s\n", why.c_str());
        return 2;
    }

    const std::string format = options.type == "audio" ? "wav" : options.type;
    console::LoosePackage loose;
    std::unique_ptr<ParameterSet> profile = console::FindProfile(format, base, loose);
    if (!profile) {
        std::fprintf(stderr, "acburn: no %s profile\n", format.c_str());
        return 2;
    }

    console::ConsoleBurn run(::isatty(STDOUT_FILENO) == 1, stdout);
    burn::CompilationTally tally;
    double seconds = 0;
    for (const std::string& file : options.files) {
        std::error_code error;
        if (fs::is_directory(file, error)) {
            std::fprintf(stderr, "acburn: %s: is a folder\n", file.c_str());
            return 2;
        }
        if (!fs::exists(file, error)) {
            std::fprintf(stderr, "acburn: %s: no such file\n", file.c_str());
            return 2;
        }
        if (!AddSource(run, fs::absolute(file).lexically_normal().string(), *profile, tally,
                       seconds))
            return 2;
    }
    if (options.type == "audio" && run.RowCount() > burn::kMaxAudioTracks) {
        std::fprintf(stderr, "acburn: an audio disc holds at most %d tracks, not %d\n",
                     burn::kMaxAudioTracks, run.RowCount());
        return 2;
    }

    burn::BurnSettings settings;
    settings.temporaryFolder = config.GetString("burntemp");
    settings.maxProcesses = config.GetInt("max_processes");
    settings.maxRunningProcesses = config.GetInt("max_running_processes");
    settings.toolPath = platform::FindConversionTool();
    settings.toolDirectory = base;
    settings.discType = options.type == "audio" ? burn::DiscType::Audio
                        : options.type == "mp3" ? burn::DiscType::Mp3
                                                : burn::DiscType::Wma;
    settings.copies = options.copies;
    settings.speed = options.speed;
    settings.pauseSeconds = options.gap;
    settings.volumeLabel = options.label;
    settings.naming = ReadNamingSettings(config);
    const NamingSettings naming = settings.naming;

    burn::BurnDriver driver(
        run, run,
        [naming](int row, MediaItem& item, const std::string& folder) {
            OutputNameRequest request;
            request.sourcePath = item.sourcePath;
            request.row = row;
            request.directory = folder;
            request.skipSearch = true;
            return ReserveOutputPath(*SetOf(item), request, naming);
        },
        [](MediaItem& item, const std::string& output) {
            return BuildBurnCommandText(item.sourcePath, output, item.volume, *SetOf(item));
        });
    driver.SetSettings(settings);
    driver.SetRecorder(recorder);
    driver.SetCompilation(seconds, tally.minutes);

    struct sigaction stop {};
    stop.sa_handler = OnStopSignal;
    sigemptyset(&stop.sa_mask);
    sigaction(SIGINT, &stop, nullptr);
    sigaction(SIGTERM, &stop, nullptr);
    std::signal(SIGPIPE, SIG_IGN);

    if (!driver.StartBurn())
        return 1;
    bool stopped = false;
    bool warnedData = false;
    while (driver.BurnActive()) {
        // A stop lands in the stage that runs; between stages it waits for the next one. A data
        // write cannot be stopped halfway: it is told once and finishes.
        const bool dataWrite = driver.Writing() && settings.discType != burn::DiscType::Audio;
        if (g_stopRequested && !driver.Aborted() && (driver.Converting() || driver.Writing()) &&
            !(dataWrite && warnedData)) {
            stopped = true;
            warnedData = warnedData || dataWrite;
            run.SetStopping();
            driver.StopBurn();
        }
        std::this_thread::sleep_for(std::chrono::milliseconds(50));
    }
    driver.Join();
    run.Finish();
    if (options.times)
        std::fprintf(stderr, "acburn: conversion %.3f s, writing %.3f s\n", driver.ConversionSeconds(),
                     driver.WriteSeconds());
    if (stopped || g_stopRequested)
        return 130;
    if (!run.AllWritten())
        return 1;
    if (recorder->IsImage()) {
        for (int copy = 0; copy < options.copies; ++copy) {
            const std::string written =
                static_cast<burn::ImageRecorder*>(recorder)->CopyBase(copy) +
                (options.type == "audio" ? ".cue" : ".iso");
            std::printf("%s\n", written.c_str());
        }
    }
    return 0;
}
