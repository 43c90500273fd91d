// What a list row's profile costs: heap bytes of one Clone() (a row keeps one for its whole
// life, and lists run to thousands of rows; the budget is 16 KB a row), the time of a clone,
// and the time of the option text the driver builds at every start.

#include "convert/CommandLine.h"
#include "profile/ParameterSet.h"
#include "resources/Package.h"
#include "resources/PackageWriter.h"

#include <benchmark/benchmark.h>
#include <malloc.h>
#include <stdlib.h>

#include <atomic>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <memory>
#include <new>
#include <sstream>
#include <vector>

// The replacements below pair malloc with free on purpose; gcc sees only the new/free pair.
#pragma GCC diagnostic ignored "-Wmismatched-new-delete"

// Live heap bytes through operator new, counted by the allocator's own block sizes so that a
// delete subtracts exactly what its new added.
static std::atomic<long long> g_liveBytes{0};

void* operator new(std::size_t size) {
    void* block = std::malloc(size == 0 ? 1 : size);
    if (block == nullptr) throw std::bad_alloc();
    g_liveBytes += static_cast<long long>(malloc_usable_size(block));
    return block;
}
void operator delete(void* block) noexcept {
    if (block == nullptr) return;
    g_liveBytes -= static_cast<long long>(malloc_usable_size(block));
    std::free(block);
}
void operator delete(void* block, std::size_t) noexcept { operator delete(block); }

namespace {

// The shipped fall-back profile, packed into a data.pkg of a fresh base folder.
struct Fixture {
    std::string base;
    std::string path;
    Fixture() {
        char pattern[] = "/tmp/ac-bench-XXXXXX";
        base = ::mkdtemp(pattern);
        ::setenv("XDG_DATA_HOME", (base + "/user").c_str(), 1);
        // __FILE__ may be relative to the build folder, which holds bin/ with this program.
        std::filesystem::path self(__FILE__);
        if (self.is_relative()) {
            self = std::filesystem::canonical("/proc/self/exe").parent_path().parent_path() / self;
        }
        const auto source = self.parent_path().parent_path() / "data/profile/mp3.pf";
        std::ostringstream text;
        text << std::ifstream(source, std::ios::binary).rdbuf();
        if (text.str().empty()) {
            std::fprintf(stderr, "cannot read %s\n", source.c_str());
            std::exit(1);
        }
        ac::PackageWriter data;
        data.Create();
        data.AddDirectory("profile/");
        data.Put("profile/mp3.pf", text.str());
        data.Commit(base + "/data.pkg");
        path = base + "\\profile\\mp3.pf";
    }
    ~Fixture() {
        std::error_code ignored;
        std::filesystem::remove_all(base, ignored);
    }
};

Fixture& Shared() {
    static Fixture fixture;
    return fixture;
}

void BM_RowProfileHeap(benchmark::State& state) {
    ac::Profile profile(Shared().path);
    constexpr int kRows = 1000;
    double perRow = 0;
    for (auto _ : state) {
        std::vector<std::unique_ptr<ac::ParameterSet>> rows;
        rows.reserve(kRows);
        rows.push_back(profile.Clone());  // warms the ini layer's cache outside the count
        const long long before = g_liveBytes.load();
        for (int i = 1; i <= kRows; ++i) rows.push_back(profile.Clone());
        perRow = static_cast<double>(g_liveBytes.load() - before) / kRows;
    }
    state.counters["heap_bytes_per_row"] = perRow;
    state.counters["records"] = static_cast<double>(profile.Records().size());
}
BENCHMARK(BM_RowProfileHeap)->Iterations(3)->Unit(benchmark::kMillisecond);

void BM_Clone(benchmark::State& state) {
    ac::Profile profile(Shared().path);
    for (auto _ : state) benchmark::DoNotOptimize(profile.Clone());
}
BENCHMARK(BM_Clone)->Unit(benchmark::kMicrosecond);

void BM_ConversionCommandText(benchmark::State& state) {
    ac::Profile profile(Shared().path);
    profile.SetValue("title", "A Title With \"Quotes\"");
    for (auto _ : state) {
        benchmark::DoNotOptimize(
            ac::BuildConversionCommandText("/music/song.wav", "/out/song.mp3", 60, profile));
    }
}
BENCHMARK(BM_ConversionCommandText)->Unit(benchmark::kMicrosecond);

}  // namespace

BENCHMARK_MAIN();
