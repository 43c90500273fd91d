// CDDB lookups against the loopback test server, which answers at once: one whole lookup of a
// disc (query, read, record), and a batch pass over 1,000 kept records with each answer written
// as a .cddb file. Goals: a lookup well under 50 ms, the batch pass under 10 s.
#include "cddb/BatchFile.h"
#include "cddb/CddbLookup.h"
#include "cddb/DiscFile.h"

#include <benchmark/benchmark.h>

#include <filesystem>

#include "../tests/support/CddbTestServer.h"
#include "../tests/support/TempDir.h"

namespace {

class QuietObserver : public cddb::ILookupObserver {
public:
    void ShowAction(const std::string&) override {}
    void ShowMessage(const std::string& text) override { bytes += text.size(); }
    int ChooseMatch(const std::vector<std::string>&) override { return 0; }
    std::size_t bytes = 0;
};

cddb::DiscToc Toc(int tracks, int seed) {
    cddb::DiscToc toc;
    for (int i = 0; i <= tracks; ++i)
        toc.push_back(cddb::TocPosition::FromFrames(150 + i * (15000 + seed)));
    return toc;
}

std::string Entry(std::uint32_t id, int tracks) {
    std::string text =
        "# xmcd\r\n#\r\n# Track frame offsets:\r\n#\t150\r\n#\r\n# Disc length: 3000 "
        "seconds\r\n#\r\n"
        "# Submitted via: bench 1.0\r\n#\r\nDISCID=" +
        cddb::FormatDiscId(id) + "\r\nDTITLE=Bench Artist / Bench Album\r\nDYEAR=2001\r\n";
    for (int i = 0; i < tracks; ++i)
        text += "TTITLE" + std::to_string(i) + "=Track title number " + std::to_string(i) + "\r\n";
    return text + "EXTD=\r\n";
}

void BM_LookupOneDisc(benchmark::State& state) {
    ac::test::CddbTestServer server;
    const cddb::DiscToc toc = Toc(12, 0);
    const std::uint32_t id = cddb::ComputeDiscId(toc);
    server.AddRecord("rock", id, "Bench Artist / Bench Album", Entry(id, 12));
    cddb::LookupSettings settings;
    settings.host = cddb::ParseHostSetting(server.HostSetting());
    QuietObserver observer;
    for (auto _ : state) {
        cddb::CDDiscInfo info;
        if (!cddb::LookupDisc(settings, toc, observer, nullptr, info))
            state.SkipWithError("lookup failed");
        benchmark::DoNotOptimize(info);
    }
}
BENCHMARK(BM_LookupOneDisc)->Unit(benchmark::kMillisecond);

void BM_BatchPass1000(benchmark::State& state) {
    ac::test::CddbTestServer server;
    std::string batch;
    for (int i = 0; i < 1000; ++i) {
        const cddb::DiscToc toc = Toc(10 + i % 8, i);
        const std::uint32_t id = cddb::ComputeDiscId(toc);
        server.AddRecord("misc", id, "Bench Artist / Bench Album", Entry(id, 10 + i % 8));
        batch += cddb::QueryFields(toc) + "*";
    }
    ac::test::TempDir folder;
    cddb::LookupSettings settings;
    settings.host = cddb::ParseHostSetting(server.HostSetting());
    QuietObserver observer;
    for (auto _ : state) {
        const cddb::BatchPassResult result =
            cddb::RunBatchPass(settings, batch, folder.Path(), observer, nullptr);
        if (!result.complete)
            state.SkipWithError("batch pass failed");
        state.counters["answered"] = result.answered;
    }
}
BENCHMARK(BM_BatchPass1000)->Unit(benchmark::kMillisecond)->Iterations(2);

}  // namespace

BENCHMARK_MAIN();
