// Paint time of XListCtrl with 10,000 rows: scrolls through the list and repaints a frame at a
// time. Run under Xvfb by bench/skin_bench.sh; prints milliseconds per frame.

#include "skin/ListCtrl.h"

#include <wx/app.h>
#include <wx/frame.h>
#include <wx/time.h>

#include <cstdio>

namespace {

class BenchApp : public wxApp {
public:
    bool OnInit() override {
        auto* frame =
            new wxFrame(nullptr, wxID_ANY, "XListCtrl bench", wxPoint(0, 0), wxSize(840, 634));
        auto* list = new ac::XListCtrl(frame, wxID_ANY);
        list->InsertColumn(0, "File", 300, true);
        list->InsertColumn(1, "Duration", 90);
        list->InsertColumn(2, "Progress", 160);
        list->InsertColumn(3, "Status", 200);
        list->SetRowHeight(22);
        for (int i = 0; i < 10000; ++i) {
            const int row =
                list->InsertItem(i, "Track " + std::to_string(i + 1) + " - a long title.flac");
            list->SetCheckbox(row, 0, i % 3 != 0);
            list->SetItemText(row, 1, std::to_string(i % 60) + ":" + std::to_string(10 + i % 50));
            list->SetProgress(row, 2);
            list->UpdateProgress(row, 2, i % 101);
            list->SetItemText(row, 3, i % 5 == 0 ? "Error" : "Done",
                              i % 5 == 0 ? *wxRED : wxNullColour);
        }
        frame->Show();
        CallAfter([frame, list] {
            list->SyncRowCount();
            list->Body()->Update();
            const int frames = 200;
            const wxLongLong begin = wxGetUTCTimeUSec();
            for (int i = 0; i < frames; ++i) {
                list->Body()->ScrollToRow(static_cast<size_t>((i * 97) % 9970));
                list->Body()->Refresh(false);
                list->Body()->Update();
            }
            const double ms = (wxGetUTCTimeUSec() - begin).ToDouble() / 1000.0 / frames;
            std::printf("xlistctrl_10000_rows_ms_per_frame %.3f\n", ms);
            if (wxGetEnv("AC_BENCH_HOLD", nullptr)) {
                wxMilliSleep(1);
                return;
            }
            frame->Close();
        });
        return true;
    }
};

}  // namespace

wxIMPLEMENT_APP(BenchApp);
