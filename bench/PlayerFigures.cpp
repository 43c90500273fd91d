// Figures of the preview library, one measurement per run, for bench/player_bench.sh:
//
//   player_bench first FILE          ms from the press (avp_open) to the first sample handed to
//                                    the sound device
//   player_bench seek FILE           ms from avp_set_cur_pos to the first sample of the new
//                                    place handed to the device, median of several seeks
//   player_bench stop FILE           ms from avp_stop to avp_run's return
//   player_bench play FILE SECONDS   % of one core while playing (decoding, resampling, the
//                                    pictures scaled for a 220 by 182 area), and the peak
//                                    resident memory in MB
//
// The picture sink copies each picture, as the panel does; painting is not part of it.

#include "panels/Player.h"

#include <sys/resource.h>

#include <algorithm>
#include <atomic>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <string>
#include <thread>
#include <vector>

namespace {

using SteadyClock = std::chrono::steady_clock;
using namespace std::chrono_literals;

double MsSince(SteadyClock::time_point begin) {
    return std::chrono::duration<double, std::milli>(SteadyClock::now() - begin).count();
}

double CpuSeconds() {
    rusage usage{};
    getrusage(RUSAGE_SELF, &usage);
    return static_cast<double>(usage.ru_utime.tv_sec + usage.ru_stime.tv_sec) +
           static_cast<double>(usage.ru_utime.tv_usec + usage.ru_stime.tv_usec) / 1e6;
}

bool WaitFor(bool (*done)(double), double value, std::chrono::milliseconds limit) {
    const auto end = SteadyClock::now() + limit;
    while (SteadyClock::now() < end) {
        if (done(value)) {
            return true;
        }
        std::this_thread::sleep_for(200us);
    }
    return false;
}

bool PastPosition(double seconds) {
    return avp_get_cur_pos() > seconds;
}

int Fail(const char* what) {
    std::fprintf(stderr, "player_bench: %s\n", what);
    return 1;
}

}  // namespace

int main(int argc, char** argv) {
    if (argc < 3) {
        return Fail("usage: player_bench first|seek|stop|play FILE [SECONDS]");
    }
    const std::string mode = argv[1];
    const char* file = argv[2];
    std::atomic<long> pictures{0};
    ac::player::SetPictureSink([&pictures](const ac::player::Picture& picture) {
        std::vector<std::uint8_t> copy = picture.rgb;
        pictures += copy.empty() ? 0 : 1;
    });
    avp_init_size(220, 182);
    avp_init();

    if (mode == "first") {
        const auto begin = SteadyClock::now();
        if (avp_open(file) == 0) {
            return Fail("cannot open the file");
        }
        std::thread run([] { avp_run(); });
        const bool heard = WaitFor(PastPosition, 0.0, 5000ms);
        const double ms = MsSince(begin);
        avp_stop();
        run.join();
        if (!heard) {
            return Fail("no sound reached the device");
        }
        std::printf("%.1f\n", ms);
    } else if (mode == "seek") {
        if (avp_open(file) == 0) {
            return Fail("cannot open the file");
        }
        std::thread run([] { avp_run(); });
        WaitFor(PastPosition, 0.1, 5000ms);
        const double length = avp_get_length();
        std::vector<double> times;
        for (double fraction : {0.7, 0.2, 0.5, 0.9, 0.35, 0.6, 0.1}) {
            const double target = length * fraction;
            const auto begin = SteadyClock::now();
            avp_set_cur_pos(target);
            if (!WaitFor(PastPosition, target, 5000ms)) {
                avp_stop();
                run.join();
                return Fail("a seek did not land");
            }
            times.push_back(MsSince(begin));
            std::this_thread::sleep_for(300ms);
        }
        avp_stop();
        run.join();
        std::sort(times.begin(), times.end());
        std::printf("%.1f\n", times[times.size() / 2]);
    } else if (mode == "stop") {
        if (avp_open(file) == 0) {
            return Fail("cannot open the file");
        }
        std::atomic<bool> returned{false};
        SteadyClock::time_point end;
        std::thread run([&] {
            avp_run();
            end = SteadyClock::now();
            returned = true;
        });
        WaitFor(PastPosition, 0.5, 5000ms);
        const auto begin = SteadyClock::now();
        avp_stop();
        run.join();
        std::printf("%.1f\n", std::chrono::duration<double, std::milli>(end - begin).count());
    } else if (mode == "play" && argc > 3) {
        const double seconds = std::atof(argv[3]);
        if (avp_open(file) == 0) {
            return Fail("cannot open the file");
        }
        const double cpuBefore = CpuSeconds();
        const auto begin = SteadyClock::now();
        std::thread run([] { avp_run(); });
        std::this_thread::sleep_for(std::chrono::duration<double>(seconds));
        const double cpu = CpuSeconds() - cpuBefore;
        const double wall = MsSince(begin) / 1000.0;
        avp_stop();
        run.join();
        rusage usage{};
        getrusage(RUSAGE_SELF, &usage);
        std::printf("%.1f %.1f %ld\n", 100.0 * cpu / wall, usage.ru_maxrss / 1024.0,
                    pictures.load());
    } else {
        return Fail("unknown measurement");
    }
    avp_deinit();
    return 0;
}
