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
#include "convert/RowParameters.h"
#include "medialist/MediaListRules.h"
#include "medialist/MediaProbe.h"
#include "platform/Paths.h"
#include "profile/ParameterSet.h"
#include "resources/Package.h"
#include "resources/PackageWriter.h"
#include "rip/CueExpansion.h"
#include "shell/AppConfig.h"

#include <atomic>
#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <filesystem>
#include <fstream>
#include <string>
#include <vector>
#include <unistd.h>

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
            if (!text)
                return false;
            if (word == "--profile")
                options.profile = text;
            else if (word == "--out")
                options.outputDirectory = text;
            else if ((options.jobs = std::atoi(text)) <= 0)
                return false;
        } else if (word == "--help" || word == "-h") {
            return false;
        } else if (word == "--") {
            for (++i; i < argc; ++i)
                options.files.emplace_back(argv[i]);
        } else if (word.starts_with("--")) {
            return false;
        } else {
            options.files.push_back(word);
        }
    }
    return !options.files.empty();
}

// Held through its base: the profile keeps its value lists in a type of its own.
std::unique_ptr<ParameterSet> LoadProfile(const std::string& path) {
    auto* profile = new Profile(path);
    std::unique_ptr<ParameterSet> owner(profile);
    return profile->IsLoaded() ? std::move(owner) : nullptr;
}

// Profiles are read through the package layer only, so a .pf file given on the command line
// travels in a one-entry package of its own in a scratch folder, removed when the run ends.
class LoosePackage {
public:
    ~LoosePackage() {
        std::error_code ignored;
        if (!m_folder.empty())
            fs::remove_all(m_folder, ignored);
    }
    std::string Wrap(const std::string& file) {
        std::string pattern = (fs::temp_directory_path() / "acconvert-XXXXXX").string();
        if (!::mkdtemp(pattern.data()))
            return {};
        m_folder = pattern;
        std::ifstream in(file, std::ios::binary);
        std::string text((std::istreambuf_iterator<char>(in)), {});
        // The package's ini reader splits at CR LF, the line end profiles have always had.
        if (text.find("\r\n") == std::string::npos) {
            std::string crlf;
            for (char c : text)
                c == '\n' ? crlf += "\r\n" : crlf += c;
            text.swap(crlf);
        }
        PackageWriter writer;
        std::string package = m_folder + "/cli.pkg";
        if (!writer.Create() || !writer.Put("cli.pf", text) || !writer.Commit(package))
            return {};
        return package + "\\cli.pf";
    }

private:
    std::string m_folder;
};

// A file on disk, else a system profile, else a user profile, by file name or shown name.
std::unique_ptr<ParameterSet> FindProfile(const std::string& wanted, const std::string& base,
                                          LoosePackage& loose) {
    if (fs::is_regular_file(wanted))
        return LoadProfile(loose.Wrap(wanted));
    for (const char* folder : {"\\profile\\", "\\profile\\user\\"}) {
        std::string direct = base + folder + wanted + ".pf";
        if (ResourceExists(direct))
            if (auto profile = LoadProfile(direct))
                return profile;
        ImPackageFinder finder;
        for (bool more = finder.FindFile(base + folder + "*.pf"); more;
             more = finder.FindNextFile()) {
            auto profile = LoadProfile(finder.GetFilePath());
            if (profile && profile->GetName() == wanted)
                return profile;
        }
    }
    return nullptr;
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
    AppConfig& config = GetAppConfig();
    std::string base = config.GetBaseDirectory();
    LoosePackage loose;
    std::unique_ptr<ParameterSet> profile = FindProfile(options.profile, base, loose);
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
    for (const auto& file : options.files)
        AddSource(run, fs::absolute(file).lexically_normal().string(), *profile);

    OutputNamer namer = MakeRowNamer([naming] { return naming; });
    CommandBuilder builder = [](MediaItem& item) {
        return BuildConversionCommandText(item.sourcePath, item.outputPath, item.volume,
                                          *SetOf(item));
    };
    return run.Run(driverConfig, namer, builder, g_stopRequested);
}
