#include "profile/grid/PropertiesCtrl.h"

#include "profile/grid/PropertyTree.h"

#include <wx/dcbuffer.h>
#include <wx/settings.h>
#include <wx/tooltip.h>

#include <algorithm>
#include <cmath>
#include <functional>

namespace ac {

namespace {

constexpr int kStartCommentHeight = 40;
constexpr int kHelpMargin = 8;
constexpr long kToolTipStayMs = 32767;

// Tree signs and buttons come from the platform renderer; the editors are ours.
struct EditorEntry {
    const char* name;
    InPlaceStyle style;
};
constexpr EditorEntry kEditors[] = {
    {"list", InPlaceStyle::List},         {"editlist", InPlaceStyle::EditList},
    {"customlist", InPlaceStyle::CustomList}, {"edit", InPlaceStyle::Edit},
    {"editspin", InPlaceStyle::Edit},     {"editpwd", InPlaceStyle::Edit},
    {"button", InPlaceStyle::None},       {"editbutton", InPlaceStyle::Edit},
    {"popup", InPlaceStyle::None},        {"editpopup", InPlaceStyle::Edit},
    {"fontbutton", InPlaceStyle::None},   {"datetime", InPlaceStyle::None},
    {"hotkey", InPlaceStyle::None},       {"checkbox", InPlaceStyle::None},
    {"multicheckbox", InPlaceStyle::None}, {"radiobutton", InPlaceStyle::None},
    {"slider", InPlaceStyle::None},       {"slideredit", InPlaceStyle::Edit},
    {"multilineedit", InPlaceStyle::Edit},
};

double HueToChannel(double low, double high, double hue) {
    hue -= std::floor(hue);
    if (hue < 1.0 / 6) {
        return low + (high - low) * 6 * hue;
    }
    if (hue < 0.5) {
        return high;
    }
    if (hue < 2.0 / 3) {
        return low + (high - low) * (2.0 / 3 - hue) * 6;
    }
    return low;
}

// Hue and saturation of `colour`, with the lightness replaced.
wxColour WithLightness(const wxColour& colour, double lightness) {
    const double red = colour.Red() / 255.0;
    const double green = colour.Green() / 255.0;
    const double blue = colour.Blue() / 255.0;
    const double high = std::max({red, green, blue});
    const double low = std::min({red, green, blue});
    double hue = 0.0;
    double saturation = 0.0;
    if (high > low) {
        const double delta = high - low;
        const double oldLightness = (high + low) / 2;
        saturation = oldLightness > 0.5 ? delta / (2 - high - low) : delta / (high + low);
        if (high == red) {
            hue = (green - blue) / delta / 6;
        } else if (high == green) {
            hue = (2 + (blue - red) / delta) / 6;
        } else {
            hue = (4 + (red - green) / delta) / 6;
        }
    }
    const double top = lightness <= 0.5 ? lightness * (1 + saturation)
                                        : lightness + saturation - lightness * saturation;
    const double bottom = 2 * lightness - top;
    auto channel = [](double value) {
        return static_cast<unsigned char>(std::lround(std::clamp(value, 0.0, 1.0) * 255));
    };
    return wxColour(channel(HueToChannel(bottom, top, hue + 1.0 / 3)),
                    channel(HueToChannel(bottom, top, hue)),
                    channel(HueToChannel(bottom, top, hue - 1.0 / 3)));
}

// Breaks `text` into lines no wider than `width` at spaces, keeping its own line breaks.
std::vector<wxString> WrapText(wxDC& dc, const wxString& text, int width) {
    std::vector<wxString> lines;
    for (const wxString& paragraph : wxSplit(text, '\n', '\0')) {
        wxString line;
        for (const wxString& word : wxSplit(paragraph, ' ', '\0')) {
            const wxString longer = line.empty() ? word : line + " " + word;
            if (!line.empty() && dc.GetTextExtent(longer).GetWidth() > width) {
                lines.push_back(line);
                line = word;
            } else {
                line = longer;
            }
        }
        lines.push_back(line);
    }
    return lines;
}

}  // namespace

struct PropertiesCtrl::Impl {
    std::vector<std::unique_ptr<PropertyEditor>> editors;
    bool commentShown = false;
    int commentHeight = kStartCommentHeight;
    wxColour commentBackground;
    bool dragging = false;
    int dragOffset = 0;
};

PropertiesCtrl::PropertiesCtrl(wxWindow* parent, int id)
    : wxWindow(parent, id, wxDefaultPosition, wxDefaultSize,
               wxBORDER_NONE | wxFULL_REPAINT_ON_RESIZE | wxCLIP_CHILDREN, "PropertiesCtrl"),
      m_impl(std::make_unique<Impl>()) {
    SetBackgroundStyle(wxBG_STYLE_PAINT);
    // No cursor of its own until the mouse is over the grip: making one loads the cursor
    // theme, a cost the start need not pay for a grid that is hidden at first.
    m_impl->commentBackground = wxSystemSettings::GetColour(wxSYS_COLOUR_BTNFACE);
    for (const EditorEntry& entry : kEditors) {
        m_impl->editors.push_back(std::make_unique<PropertyEditor>(entry.name, entry.style));
    }
    m_tree = new PropertyTree(this, wxID_ANY);
    Bind(wxEVT_SIZE, [this](wxSizeEvent& event) {
        const int height = GetClientSize().GetHeight();
        if (m_impl->commentHeight > height - kMinCommentHeight) {
            SetCommentHeight(m_impl->commentHeight);
        }
        LayoutBands();
        event.Skip();
    });
    Bind(wxEVT_PAINT, [this](wxPaintEvent&) { PaintHelpPane(); });
    Bind(wxEVT_LEFT_DOWN, &PropertiesCtrl::OnGripMouse, this);
    Bind(wxEVT_LEFT_UP, &PropertiesCtrl::OnGripMouse, this);
    Bind(wxEVT_MOTION, &PropertiesCtrl::OnGripMouse, this);
    Bind(wxEVT_MOUSE_CAPTURE_LOST, [this](wxMouseCaptureLostEvent&) { m_impl->dragging = false; });
}

PropertiesCtrl::~PropertiesCtrl() {
    m_tree->Shutdown();
    DestroyChildren();
}

// --- bands

wxRect PropertiesCtrl::HelpPaneRect() const {
    const wxSize size = GetClientSize();
    if (!m_impl->commentShown) {
        return wxRect(0, size.GetHeight(), size.GetWidth(), 0);
    }
    return wxRect(0, size.GetHeight() - m_impl->commentHeight, size.GetWidth(),
                  m_impl->commentHeight);
}

void PropertiesCtrl::LayoutBands() {
    const wxSize size = GetClientSize();
    m_tree->SetSize(0, 0, size.GetWidth(), std::max(0, HelpPaneRect().GetTop()));
    Refresh(false);
}

void PropertiesCtrl::ShowComment(bool show) {
    m_impl->commentShown = show;
    LayoutBands();
}

bool PropertiesCtrl::IsCommentShown() const {
    return m_impl->commentShown;
}

int PropertiesCtrl::SetCommentHeight(int height) {
    // Before the first layout the client height is a placeholder; the upper limit then waits.
    const int highest = GetClientSize().GetHeight() - kMinCommentHeight;
    if (highest >= kMinCommentHeight) {
        height = std::min(height, highest);
    }
    height = std::max(height, kMinCommentHeight);
    if (height != m_impl->commentHeight) {
        m_impl->commentHeight = height;
        LayoutBands();
    }
    return m_impl->commentHeight;
}

int PropertiesCtrl::GetCommentHeight() const {
    return m_impl->commentHeight;
}

void PropertiesCtrl::PaintHelpPane() {
    wxAutoBufferedPaintDC dc(this);
    const wxRect pane = HelpPaneRect();
    if (pane.IsEmpty()) {
        return;
    }
    dc.SetPen(*wxTRANSPARENT_PEN);
    dc.SetBrush(wxBrush(m_impl->commentBackground));
    dc.DrawRectangle(pane);
    // The grip: a rule on the tree's edge and a short handle in its middle.
    dc.SetPen(wxPen(m_tree->GridLineColor()));
    dc.DrawLine(pane.GetLeft(), pane.GetTop(), pane.GetRight() + 1, pane.GetTop());
    const int middle = pane.GetLeft() + pane.GetWidth() / 2;
    dc.DrawLine(middle - 12, pane.GetTop() + 2, middle + 12, pane.GetTop() + 2);
    dc.DrawLine(middle - 12, pane.GetTop() + 4, middle + 12, pane.GetTop() + 4);

    const PropertyNode* node = m_tree->Selection();
    if (node == nullptr) {
        return;
    }
    wxDCClipper clip(dc, pane);
    int y = pane.GetTop() + kGripHeight + 2;
    wxFont bold = m_tree->TreeFont();
    dc.SetFont(bold.MakeBold());
    dc.SetTextForeground(m_tree->TextColour());
    dc.DrawText(wxString::FromUTF8(node->item->label), kHelpMargin, y);
    y += dc.GetCharHeight() + 2;
    dc.SetFont(m_tree->TreeFont());
    for (const wxString& line : WrapText(dc, wxString::FromUTF8(node->item->help),
                                         pane.GetWidth() - 2 * kHelpMargin)) {
        if (y >= pane.GetBottom()) {
            break;
        }
        dc.DrawText(line, kHelpMargin, y);
        y += dc.GetCharHeight();
    }
}

void PropertiesCtrl::OnGripMouse(wxMouseEvent& event) {
    const wxRect pane = HelpPaneRect();
    const bool inGrip = !pane.IsEmpty() && event.GetY() >= pane.GetTop() &&
                        event.GetY() < pane.GetTop() + kGripHeight;
    if (event.LeftDown() && inGrip) {
        m_impl->dragging = true;
        m_impl->dragOffset = event.GetY() - pane.GetTop();
        CaptureMouse();
    } else if (event.LeftUp() && m_impl->dragging) {
        m_impl->dragging = false;
        if (HasCapture()) {
            ReleaseMouse();
        }
    } else if (event.Dragging() && m_impl->dragging) {
        SetCommentHeight(GetClientSize().GetHeight() - (event.GetY() - m_impl->dragOffset));
    }
    SetCursor(wxCursor(inGrip || m_impl->dragging ? wxCURSOR_SIZENS : wxCURSOR_ARROW));
    event.Skip();
}

PropertyEditor* PropertiesCtrl::FindEditor(const std::string& name) const {
    for (const auto& editor : m_impl->editors) {
        if (editor->Name() == name) {
            return editor.get();
        }
    }
    return nullptr;
}

// --- look

int PropertiesCtrl::SetLabelColumnWidth(int width) {
    return m_tree->SetLabelColumnWidth(width);
}

int PropertiesCtrl::GetLabelColumnWidth() const {
    return m_tree->LabelColumnWidth();
}

void PropertiesCtrl::EnableToolTips(bool enable) {
    if (enable) {
        wxToolTip::SetDelay(0);
        wxToolTip::SetAutoPop(kToolTipStayMs);
    }
    m_tree->EnableToolTips(enable);
}

void PropertiesCtrl::SetGridLineColor(const wxColour& colour, bool exact) {
    m_tree->SetGridLineColor(exact ? colour : WithLightness(colour, 192.0 / 255.0));
    Refresh(false);
}

wxColour PropertiesCtrl::GetGridLineColor() const {
    return m_tree->GridLineColor();
}

void PropertiesCtrl::SetBackgroundColour2(const wxColour& background,
                                          const wxColour& commentBackground) {
    m_tree->SetRowBackground(background);
    m_impl->commentBackground = commentBackground;
    Refresh(false);
}

void PropertiesCtrl::SetTextColour2(const wxColour& text) {
    m_tree->SetTextColour(text);
    Refresh(false);
}

void PropertiesCtrl::SetTreeFont(const wxFont& font) {
    m_tree->SetTreeFont(font);
    Refresh(false);
}

void PropertiesCtrl::SetListLines(int lines) {
    m_tree->SetListLines(lines);
}

// --- notifications: nothing by default

void PropertiesCtrl::OnPropertyChanged(const PropertyIterator&) {}
void PropertiesCtrl::OnPropertyButtonClicked(const PropertyIterator&) {}
void PropertiesCtrl::OnPropertyButtonBackgroundClicked(const PropertyIterator&) {}
void PropertiesCtrl::OnTreeRebuilt() {}
void PropertiesCtrl::OnSelectionChanged(const PropertyIterator&) {}
void PropertiesCtrl::OnInPlaceShown(wxWindow*, const PropertyIterator&) {}
void PropertiesCtrl::OnHotLinkClicked(const PropertyIterator&) {}
void PropertiesCtrl::OnRequestListBox(const PropertyIterator&) {}

}  // namespace ac
