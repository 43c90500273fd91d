// Adding files to the conversion list: wall time of AddFolder over a folder of files (probing,
// a profile clone per row and the row's cells), and the memory that rows of the mp3 profile
// take. Run by medialist_bench.sh under Xvfb.
//
//   medialist_add_bench FOLDER BASEDIR ROWS
// prints "add_ms N", "rows N", then for ROWS rows of one file "heap_kib_per_row N" (bytes the
// allocator hands out, which is what a row costs) and "rss_kib_per_row N" (resident pages,
// which also move with what the allocator keeps or returns, so they vary from run to run).

#include "medialist/ui/MediaListWnd.h"
#include "medialist/ui/OutputPanelWnd.h"
#include "profile/ParameterSet.h"

#include <wx/app.h>
#include <wx/frame.h>
#include <wx/init.h>

#include <malloc.h>

#include <chrono>
#include <cstdio>
#include <filesystem>
#include <fstream>
#include <string>

namespace {

long ResidentKiB() {
    std::ifstream status("/proc/self/status");
    for (std::string line; std::getline(status, line);) {
        if (line.rfind("VmRSS:", 0) == 0) {
            return std::stol(line.substr(6));
        }
    }
    return 0;
}

std::size_t HeapBytesInUse() { return mallinfo2().uordblks; }

}  // namespace

int main(int argc, char** argv) {
    if (argc != 4) {
        std::fprintf(stderr, "usage: %s FOLDER BASEDIR ROWS\n", argv[0]);
        return 2;
    }
    const std::string folder = argv[1];
    const std::string base = argv[2];
    const int rows = std::stoi(argv[3]);
    wxApp::SetInstance(new wxApp);
    int wxArgc = 1;
    if (!wxEntryStart(wxArgc, argv) || !wxTheApp->CallOnInit()) {
        return 1;
    }
    {
        auto* frame = new wxFrame(nullptr, wxID_ANY, "bench", wxDefaultPosition, wxSize(800, 600));
        new ac::COutputPanelWnd(frame);
        auto* list = new ac::CMediaListWnd(frame);
        list->SetSize(0, 0, 800, 500);
        ac::Profile mp3(base + "\\profile\\mp3.pf");
        list->SetCurrentProfile(&mp3);

        const auto start = std::chrono::steady_clock::now();
        list->AddFolder(folder, -1);
        const auto end = std::chrono::steady_clock::now();
        std::printf("add_ms %.1f\nrows %d\n",
                    std::chrono::duration<double, std::milli>(end - start).count(),
                    list->GetRowCount());
        list->Clear();

        std::string one;
        for (const auto& entry : std::filesystem::directory_iterator(folder)) {
            one = entry.path().string();
            break;
        }
        const long before = ResidentKiB();
        const std::size_t heapBefore = HeapBytesInUse();
        for (int i = 0; i < rows; ++i) {
            list->AddFile(one, -1);
        }
        const long after = ResidentKiB();
        const double heap = static_cast<double>(HeapBytesInUse() - heapBefore);
        std::printf("heap_kib_per_row %.2f\n", heap / 1024.0 / rows);
        std::printf("rss_kib_per_row %.2f\nrss_mib_total %.1f\n",
                    static_cast<double>(after - before) / rows, (after - before) / 1024.0);
        frame->Destroy();
        wxTheApp->ProcessPendingEvents();
    }
    wxEntryCleanup();
    return 0;
}
