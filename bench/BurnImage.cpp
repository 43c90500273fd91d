// burn_image [--audio] OUT FILE...: writes the files as a disc image through the image recorder
// alone, as the copy loop of a burn does: with --audio the WAV files as the tracks of OUT.bin +
// OUT.cue, else a data disc OUT.iso (libisofs and libburn's stdio: drive). For burn_bench.sh;
// prints the seconds the write took.
#include "burn/DiscTree.h"
#include "burn/ImageRecorder.h"

#include <chrono>
#include <cstdio>
#include <cstring>
#include <filesystem>

namespace {

class Silent : public ac::burn::IBurnEvents {
public:
    int OnBurnEvent(int, int) override { return 0; }
};

}  // namespace

int main(int argc, char** argv) {
    int first = 1;
    const bool audio = argc > 1 && std::strcmp(argv[1], "--audio") == 0;
    if (audio)
        ++first;
    if (argc < first + 2) {
        std::fputs("usage: burn_image [--audio] OUT FILE...\n", stderr);
        return 2;
    }
    ac::burn::DiscTree tree;
    ac::burn::BurnJob job;
    job.audio = audio;
    for (int i = first + 1; i < argc; ++i) {
        const std::string path = std::filesystem::absolute(argv[i]).string();
        const std::string name = std::filesystem::path(path).filename().string();
        if (audio) {
            job.tracks.push_back({path, name});
        } else if (auto item = ac::burn::CreateFileItem(name, path)) {
            tree.AddChild(name, std::move(item));
        }
    }
    job.tree = &tree;
    ac::burn::ImageRecorder recorder(argv[first]);
    Silent events;
    const auto start = std::chrono::steady_clock::now();
    const bool written = recorder.Burn(job, events);
    const double seconds =
        std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count();
    if (!written) {
        std::fputs("burn_image: the image was not written\n", stderr);
        return 1;
    }
    std::printf("%.3f\n", seconds);
    return 0;
}
