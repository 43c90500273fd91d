#include "shell/ProgramIcon.h"

#include "shell/MenuTables.h"
#include "skin/WxTranslate.h"

#include <wx/graphics.h>
#include <wx/menu.h>

#include <algorithm>
#include <memory>

namespace ac {
namespace {

class CTrayIcon : public wxTaskBarIcon {
public:
    explicit CTrayIcon(wxWindow* owner) : m_owner(owner) {
        Bind(wxEVT_TASKBAR_LEFT_DCLICK, [this](wxTaskBarIconEvent&) {
            wxCommandEvent open(wxEVT_MENU, cmd::kTrayOpen);
            wxPostEvent(m_owner, open);
        });
        Bind(wxEVT_MENU, [this](wxCommandEvent& event) {
            wxCommandEvent forward(wxEVT_MENU, event.GetId());
            wxPostEvent(m_owner, forward);
        });
    }

protected:
    wxMenu* CreatePopupMenu() override {
        std::unique_ptr<wxMenu> menu = BuildContextMenu(kTrayMenu);
        TranslatePopupMenu(*menu, kTrayMenu);
        return menu.release();
    }

private:
    wxWindow* m_owner;
};

}  // namespace

wxBitmap MakeProgramIcon(int size) {
    wxImage image(size, size);
    image.InitAlpha();
    std::fill_n(image.GetAlpha(), size * size, 0);
    // Drawn straight into the image: a memory DC over a bitmap costs the start more than the
    // drawing itself.
    if (std::unique_ptr<wxGraphicsContext> gc(wxGraphicsContext::Create(image)); gc) {
        const double s = size;
        gc->SetBrush(gc->CreateLinearGradientBrush(0, 0, 0, s, wxColour(0x3B, 0x82, 0xF6),
                                                   wxColour(0x1E, 0x40, 0xAF)));
        gc->SetPen(*wxTRANSPARENT_PEN);
        gc->DrawRoundedRectangle(0, 0, s, s, s * 0.22);
        gc->SetBrush(*wxWHITE_BRUSH);
        gc->DrawEllipse(s * 0.22, s * 0.58, s * 0.26, s * 0.2);
        gc->DrawRectangle(s * 0.42, s * 0.2, s * 0.07, s * 0.48);
        gc->DrawRectangle(s * 0.42, s * 0.2, s * 0.34, s * 0.08);
        gc->DrawRectangle(s * 0.69, s * 0.2, s * 0.07, s * 0.42);
        gc->DrawEllipse(s * 0.5, s * 0.52, s * 0.26, s * 0.2);
    }  // the context writes the image back as it goes
    return wxBitmap(image);
}

std::unique_ptr<wxTaskBarIcon> MakeTrayIcon(wxWindow* owner) {
    return std::make_unique<CTrayIcon>(owner);
}

}  // namespace ac
