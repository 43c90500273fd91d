// Costs of the resource layer that the windows pay at every skin change and every message:
// lookups in a cached skin.ini, a read from user.pkg (parsed anew each time by design),
// language lookups, and opening a data.pkg of 500 entries.

#include "resources/IniFile.h"
#include "resources/Language.h"
#include "resources/Package.h"
#include "resources/PackageWriter.h"

#include <benchmark/benchmark.h>
#include <stdlib.h>

#include <cstdio>
#include <filesystem>
#include <string>

namespace {

std::string MakeFolder() {
    char pattern[] = "/tmp/ac-bench-XXXXXX";
    return ::mkdtemp(pattern);
}

// A skin.ini of the size a real skin has: 40 sections of 12 keys.
std::string SkinIniText() {
    std::string text;
    for (int section = 0; section < 40; ++section) {
        text += "[Section" + std::to_string(section) + "]\r\n";
        for (int key = 0; key < 12; ++key) {
            text += "Key" + std::to_string(key) + " = " + std::to_string(section * 100 + key) +
                    "\r\n";
        }
    }
    return text;
}

struct Fixture {
    std::string base = MakeFolder();
    Fixture() {
        ::setenv("XDG_DATA_HOME", (base + "/user").c_str(), 1);
        ac::PackageWriter data;
        data.Create();
        data.Put("skin/Default/skin.ini", SkinIniText());
        data.Put("skin/Other/skin.ini", SkinIniText());
        data.AddParentDirectories("skin/Default/skin.ini");
        data.AddParentDirectories("skin/Other/skin.ini");
        std::string lang = "CODEPAGE=1252\r\n";
        for (int id = 100; id < 700; ++id) {
            char line[64];
            std::snprintf(line, sizeof line, "#%04X# \"Text %d\"\r\n", id, id);
            lang += line;
        }
        data.Put("lang/German.lang", lang);
        // Padding entries up to 500, as a data.pkg with two full skins has.
        for (int i = 0; i < 493; ++i) {
            data.Put("skin/Default/picture" + std::to_string(i) + ".png", std::string(64, 'p'));
        }
        data.Commit(base + "/data.pkg");
        ac::WriteIniString("General", "ab", "192", (base + "\\profile\\user\\mine.pf").c_str());
    }
};

Fixture& Shared() {
    static Fixture fixture;
    return fixture;
}

void BM_FiftyLookupsInCachedSkinIni(benchmark::State& state) {
    const std::string path = Shared().base + "\\Skin\\Default\\skin.ini";
    ac::ReadIniInt("Section0", "Key0", 0, path);  // the first lookup parses
    std::size_t loadsBefore = ac::IniLoadCount();
    for (auto _ : state) {
        int sum = 0;
        for (int i = 0; i < 50; ++i) {
            std::string section = "Section" + std::to_string(i % 40);
            std::string key = "Key" + std::to_string(i % 12);
            sum += ac::ReadIniInt(section.c_str(), key.c_str(), 0, path);
        }
        benchmark::DoNotOptimize(sum);
    }
    // Zero: a burst of lookups in one cached skin.ini never parses it again.
    state.counters["parses_per_burst"] = benchmark::Counter(
        double(ac::IniLoadCount() - loadsBefore) / double(state.iterations()));
}
BENCHMARK(BM_FiftyLookupsInCachedSkinIni);

// For contrast: the same fifty lookups alternating between two skins reparse every time.
void BM_FiftyLookupsAlternatingTwoFiles(benchmark::State& state) {
    const std::string paths[] = {Shared().base + "\\Skin\\Default\\skin.ini",
                                 Shared().base + "\\Skin\\Other\\skin.ini"};
    std::size_t loadsBefore = ac::IniLoadCount();
    for (auto _ : state) {
        int sum = 0;
        for (int i = 0; i < 50; ++i) {
            sum += ac::ReadIniInt("Section5", "Key3", 0, paths[i % 2]);
        }
        benchmark::DoNotOptimize(sum);
    }
    state.counters["parses_per_burst"] = benchmark::Counter(
        double(ac::IniLoadCount() - loadsBefore) / double(state.iterations()));
}
BENCHMARK(BM_FiftyLookupsAlternatingTwoFiles);

void BM_ReadIniStringFromUserPkg(benchmark::State& state) {
    const std::string path = Shared().base + "\\profile\\user\\mine.pf";
    char buffer[260];
    for (auto _ : state) {
        benchmark::DoNotOptimize(
            ac::ReadIniString("General", "ab", "", buffer, sizeof buffer, path));
    }
}
BENCHMARK(BM_ReadIniStringFromUserPkg);

void BM_ThousandGetString(benchmark::State& state) {
    ac::ImLanguage language;
    language.Init(Shared().base, "German");
    for (auto _ : state) {
        std::size_t total = 0;
        for (int i = 0; i < 1000; ++i) {
            total += language.GetString(100 + (i * 7) % 600).size();
        }
        benchmark::DoNotOptimize(total);
    }
}
BENCHMARK(BM_ThousandGetString);

void BM_OpenDataPkgOf500Entries(benchmark::State& state) {
    const std::string path = Shared().base + "\\data.pkg\\skin\\Default\\skin.ini";
    for (auto _ : state) {
        auto archive = ac::OpenPackage(path);
        benchmark::DoNotOptimize(archive.get());
        archive.reset();
        ac::ClosePackage(path);
    }
}
BENCHMARK(BM_OpenDataPkgOf500Entries);

}  // namespace

BENCHMARK_MAIN();
