// CPU cost of an idle encoding driver: the thread that walks a long list twice a second must
// stay far below 1% of a core when nothing is to be started. The figure is CPU time of the
// whole process over wall time while the driver thread runs, measured from the kernel's own
// account (the benchmark thread itself only sleeps).

#include "../tests/convert/DriverFakes.h"

#include <benchmark/benchmark.h>

#include <chrono>
#include <thread>
#include <time.h>

namespace {

double ProcessCpuSeconds() {
    timespec now{};
    clock_gettime(CLOCK_PROCESS_CPUTIME_ID, &now);
    return static_cast<double>(now.tv_sec) + now.tv_nsec * 1e-9;
}

// rows idle (status 0), or waiting behind a full set of process slots (state 1).
void BM_IdleDriverCpu(benchmark::State& state) {
    ac::test::FakeList list;
    ac::test::FakeHost host;
    list.SetOutputDirectory("/tmp");
    bool blocked = state.range(1) != 0;
    for (int i = 0; i < state.range(0); ++i)
        list.Add("/nowhere/row" + std::to_string(i) + ".wav",
                 blocked ? ac::JobStatus::Pending : ac::JobStatus::Idle);
    ac::DriverConfig config;
    config.maxRunningProcesses = 0;  // a pending row can never resume: the pass does all its work
    ac::EncodingDriver driver(list, host, config, nullptr, nullptr);
    for (auto _ : state) {
        double cpuBefore = ProcessCpuSeconds();
        auto wallBefore = std::chrono::steady_clock::now();
        driver.Start();
        std::this_thread::sleep_for(std::chrono::seconds(3));
        driver.Stop();
        double wall = std::chrono::duration<double>(std::chrono::steady_clock::now() - wallBefore).count();
        state.counters["cpu_percent_of_core"] = (ProcessCpuSeconds() - cpuBefore) / wall * 100.0;
    }
    list.Clear();
}
BENCHMARK(BM_IdleDriverCpu)->Args({1000, 0})->Args({1000, 1})->Iterations(1)->UseRealTime()->Unit(benchmark::kMillisecond);

}  // namespace

BENCHMARK_MAIN();
