// The floor of a start: an empty wxWidgets frame of the main window's size, shown and painted
// once. Prints "firstpaint_ms N" (milliseconds since the epoch at its first paint) and exits.
// skin_bench.sh times it side by side with the program.

#include <wx/app.h>
#include <wx/frame.h>
#include <wx/time.h>

#include <cstdio>

namespace {

class EmptyFrameApp : public wxApp {
public:
    bool OnInit() override {
        auto* frame = new wxFrame(nullptr, wxID_ANY, "empty", wxDefaultPosition, wxSize(840, 634));
        frame->Bind(wxEVT_PAINT, [frame](wxPaintEvent& event) {
            static bool painted = false;
            if (!painted) {
                painted = true;
                std::printf("firstpaint_ms %lld\n",
                            static_cast<long long>(wxGetUTCTimeMillis().GetValue()));
                std::fflush(stdout);
                frame->CallAfter([frame] { frame->Close(true); });
            }
            event.Skip();
        });
        frame->Centre();
        frame->Show();
        return true;
    }
};

}  // namespace

wxIMPLEMENT_APP(EmptyFrameApp);
