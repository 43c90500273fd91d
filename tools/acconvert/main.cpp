// acconvert: converts files from the command line with the program's own driver, profiles,
// naming rules and settings.
//
//   acconvert [--profile NAME|PATH] [--out DIR] [--jobs N] FILE...
//
// Exit status: 0 when every file was converted, 1 when some failed or could not be read,
// 2 for a usage error, 130 after Ctrl-C (children ended, partial outputs removed).

#include "ConsoleRun.h"

#include "convert/CommandLine.h"
#include "convert/OutputNaming.h"
#include "medialist/MediaProbe.h"
#include "platform/Paths.h"
#include "profile/ParameterSet.h"
#include "resources/Package.h"
#include "rip/CueSheet.h"
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

namespace {

namespace fs = std::filesystem;
using namespace ac;

std::atomic<int> g_stopRequested{0};

extern "C" void OnStopSignal(int) { g_stopRequested = 1; }

struct Options {
    std::string profile = "mp3";
    std::string outputDirectory;
    int jobs = 0;
    std::vector<std::string> files;
};

void Usage() {
    std::fputs("usage: acconvert [--profile NAME|PATH] [--out DIR] [--jobs N] FILE...\n", stderr);
}

bool ParseArguments(int argc, char** argv, Options& options) {
    for (int i = 1; i < argc; ++i) {
        std::string word = argv[i];
        auto value = [&]() -> const char* { return i + 1 < argc ? argv[++i] : nullptr; };
        if (word == "--profile" || word == "--out" || word == "--jobs") {
            const char* text = value();
            if (!text) return false;
            if (word == "--profile")
                options.profile = text;
            else if (word == "--out")
                options.outputDirectory = text;
            else if ((options.jobs = std::atoi(text)) <= 0)
                return false;
        } else if (word == "--help" || word == "-h") {
            return false;
        } else if (word == "--") {
            for (++i; i < argc; ++i) options.files.emplace_back(argv[i]);
        } else if (word.starts_with("--")) {
            return false;
        } else {
            options.files.push_back(word);
        }
    }
    return !options.files.empty();
}

// A row's parameter set, seen by the engine through the little it needs.
class ProfileParameters : public JobParameters {
public:
    explicit ProfileParameters(std::unique_ptr<ParameterSet> set) : m_set(std::move(set)) {}
    std::int64_t GetDuration() const override { return m_set->GetDuration(); }
    std::int64_t GetStartTime() const override { return m_set->GetStartTime(); }
    ParameterSet& Set() { return *m_set; }

private:
    std::unique_ptr<ParameterSet> m_set;
};

ParameterSet& SetOf(MediaItem& item) {
    return static_cast<ProfileParameters&>(*item.parameters).Set();
}

// A file on disk, else a system profile, else a user profile, by file name or shown name.
std::unique_ptr<Profile> FindProfile(const std::string& wanted, const std::string& base) {
    if (fs::is_regular_file(wanted)) {
        auto profile = std::make_unique<Profile>(wanted);
        return profile->IsLoaded() ? std::move(profile) : nullptr;
    }
    for (const char* folder : {"\\profile\\", "\\profile\\user\\"}) {
        std::string direct = base + folder + wanted + ".pf";
        if (ResourceExists(direct)) {
            auto profile = std::make_unique<Profile>(direct);
            if (profile->IsLoaded()) return profile;
        }
        ImPackageFinder finder;
        for (bool more = finder.FindFile(base + folder + "*.pf"); more; more = finder.FindNextFile()) {
            auto profile = std::make_unique<Profile>(finder.GetFilePath());
            if (profile->IsLoaded() && profile->GetName() == wanted) return profile;
        }
    }
    return nullptr;
}

std::unique_ptr<MediaItem> MakeRow(const std::string& sourcePath, const Profile& profile) {
    auto item = std::make_unique<MediaItem>();
    item->sourcePath = sourcePath;
    bool probed = ProbeFile(sourcePath, item->info) == 1;
    auto set = profile.Clone();
    if (probed) ApplyTags(*set, &item->info);
    item->parameters = std::make_unique<ProfileParameters>(std::move(set));
    item->SetStatus(probed ? JobStatus::Idle : JobStatus::UnknownFile);
    return item;
}

// Cue sheets stand for their tracks, as in the list: one row per "SHEET|N".
void AddSource(console::ConsoleRun& run, const std::string& path, const Profile& profile) {
    std::string extension = fs::path(path).extension().string();
    for (auto& c : extension) c = static_cast<char>(std::tolower(static_cast<unsigned char>(c)));
    if (extension != ".cue") {
        run.AddRow(MakeRow(path, profile));
        return;
    }
    std::string diagnostics;
    CueOutput quiet{&diagnostics, &diagnostics};
    ParseCueSheet(path, quiet);
    std::uint32_t tracks = g_CueSheet ? g_CueSheet->trackCount : 0;
    FreeCueSheet();
    if (tracks == 0) {
        std::fprintf(stderr, "acconvert: %s: no tracks in the cue sheet\n", path.c_str());
        run.AddRow(MakeRow(path, profile));  // shows as an unknown file
        return;
    }
    for (std::uint32_t track = 1; track <= tracks; ++track)
        run.AddRow(MakeRow(path + "|" + std::to_string(track), profile));
}

std::string FindTool() {
    if (const char* forced = std::getenv("AC_CTT_PATH"); forced && *forced) return forced;
    std::string here = platform::ExecutableDirectory();
    for (std::string candidate : {here + "/ctt", here + "/../lib/audio-converter/ctt"})
        if (::access(candidate.c_str(), X_OK) == 0) return fs::weakly_canonical(candidate).string();
    return here + "/ctt";
}

}  // namespace

int main(int argc, char** argv) {
    Options options;
    if (!ParseArguments(argc, argv, options)) {
        Usage();
        return 2;
    }
    AppConfig& config = GetAppConfig();
    std::string base = config.GetBaseDirectory();
    std::unique_ptr<Profile> profile = FindProfile(options.profile, base);
    if (!profile) {
        std::fprintf(stderr, "acconvert: no profile named %s\n", options.profile.c_str());
        return 2;
    }
    std::string outputDirectory =
        options.outputDirectory.empty() ? config.GetString("OutputDir") : options.outputDirectory;

    DriverConfig driverConfig;
    driverConfig.maxProcesses = config.GetInt("max_processes");
    driverConfig.maxRunningProcesses = config.GetInt("max_running_processes");
    if (options.jobs > 0) {
        driverConfig.maxRunningProcesses = options.jobs;
        driverConfig.maxProcesses = std::max(driverConfig.maxProcesses, options.jobs);
    }
    driverConfig.toolPath = FindTool();
    driverConfig.toolDirectory = base;
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
    for (const auto& file : options.files) AddSource(run, file, *profile);

    OutputNamer namer = [naming](int row, MediaItem& item, const std::string& directory,
                                 const std::string& lastOutput) {
        OutputNameRequest request;
        request.sourcePath = item.sourcePath;
        request.row = row;
        request.lastOutput = lastOutput;
        request.directory = directory;
        return MakeOutputPath(SetOf(item), request, naming);
    };
    CommandBuilder builder = [](MediaItem& item) {
        return BuildConversionCommandText(item.sourcePath, item.outputPath, item.volume,
                                          SetOf(item));
    };
    return run.Run(driverConfig, namer, builder, g_stopRequested);
}
