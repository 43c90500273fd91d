// burn_iso_image OUT FILE...: writes the files as a data disc image through the image recorder
// (libisofs and libburn's stdio: drive, as a burn of an MP3 disc does), for burn_bench.sh.
// Prints the seconds the write took.
#include "burn/DiscTree.h"
#include "burn/ImageRecorder.h"

#include <chrono>
#include <cstdio>
#include <filesystem>

namespace {

class Silent : public ac::burn::IBurnEvents {
public:
    int OnBurnEvent(int, int) override { return 0; }
};

}  // namespace

int main(int argc, char** argv) {
    if (argc < 3) {
        std::fputs("usage: burn_iso_image OUT FILE...\n", stderr);
        return 2;
    }
    ac::burn::DiscTree tree;
    for (int i = 2; i < argc; ++i) {
        const std::string name = std::filesystem::path(argv[i]).filename().string();
        if (auto item = ac::burn::CreateFileItem(name, std::filesystem::absolute(argv[i]).string()))
            tree.AddChild(name, std::move(item));
    }
    ac::burn::ImageRecorder recorder(argv[1]);
    ac::burn::BurnJob job;
    job.audio = false;
    job.tree = &tree;
    Silent events;
    const auto start = std::chrono::steady_clock::now();
    const bool written = recorder.Burn(job, events);
    const double seconds =
        std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count();
    if (!written) {
        std::fputs("burn_iso_image: the image was not written\n", stderr);
        return 1;
    }
    std::printf("%.3f\n", seconds);
    return 0;
}
