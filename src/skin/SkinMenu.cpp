#include "skin/SkinMenu.h"

#include "resources/Language.h"

#include <wx/eventfilter.h>
#include <wx/dcbuffer.h>
#include <wx/dcclient.h>
#include <wx/settings.h>
#include <wx/toplevel.h>

#include <algorithm>

namespace ac {

namespace {

// What the bar and popups show for a separator, and compare with to tell one.
const wxString kSeparatorText = "~S";

wxString RowText(const wxMenuItem* item) {
    return item->IsSeparator() ? kSeparatorText : item->GetItemLabel();
}

wxString Stripped(const wxString& text) {
    return wxString::FromUTF8(SplitMnemonic(text.utf8_string()).first);
}

char Mnemonic(const wxString& text) {
    return SplitMnemonic(text.utf8_string()).second;
}

// Draws text with its '&' shown as an underline under the character that follows it.
void DrawMnemonicLabel(wxDC& dc, const wxString& text, const wxRect& rect, int alignment) {
    wxString plain;
    int underline = -1;
    for (std::size_t i = 0; i < text.length(); ++i) {
        if (text[i] == '&' && i + 1 < text.length()) {
            if (text[i + 1] != '&') {
                underline = static_cast<int>(plain.length());
            }
            plain += text[++i];
            continue;
        }
        plain += text[i];
    }
    dc.DrawLabel(plain, wxNullBitmap, rect, alignment, underline);
}

}  // namespace

void PopupDestroyer::operator()(ImMenuPopup* popup) const {
    if (popup != nullptr) {
        popup->ClosePopup();
        popup->Destroy();
    }
}

// --- ImMenuPopup --------------------------------------------------------------------------

ImMenuPopup::ImMenuPopup(wxWindow* owner, ImMenuBar* bar, const wxFont& font)
    : wxPopupWindow(wxGetTopLevelParent(owner), wxBORDER_NONE),
      m_pOwner(owner),
      m_pBar(bar),
      m_pMenu(nullptr),
      m_font(font) {
    SetBackgroundStyle(wxBG_STYLE_PAINT);
    Bind(wxEVT_PAINT, &ImMenuPopup::OnPaint, this);
    Bind(wxEVT_MOTION, &ImMenuPopup::OnMouse, this);
    Bind(wxEVT_LEFT_DOWN, &ImMenuPopup::OnMouse, this);
    Bind(wxEVT_LEFT_UP, &ImMenuPopup::OnMouse, this);
    Bind(wxEVT_LEAVE_WINDOW, &ImMenuPopup::OnMouse, this);
}

ImMenuPopup::~ImMenuPopup() {
    // When the frame goes, wx frees every popup itself, the child included.
    (void)m_pChild.release();
}

void ImMenuPopup::Measure() {
    m_rects.clear();
    m_hotKeys.clear();
    if (m_pMenu == nullptr) {
        return;
    }
    wxClientDC dc(this);
    dc.SetFont(m_font);
    std::vector<std::pair<int, int>> sizes;
    for (const wxMenuItem* item : m_pMenu->GetMenuItems()) {
        wxString text = RowText(item);
        m_hotKeys.push_back(Mnemonic(text));
        text.Replace("\t", "        ");
        const wxSize extent = dc.GetTextExtent(Stripped(text));
        sizes.emplace_back(extent.x, extent.y);
    }
    const PopupLayout layout = LayoutPopupRows(sizes);
    m_rects = layout.rows;
    m_width = layout.width;
    m_height = layout.height;
    SetSize(m_width, m_height);
}

void ImMenuPopup::ShowAt(int x, int y) {
    if (m_bShown) {
        ClosePopup();
    }
    Move(x, y);
    m_bShown = true;
    m_ignoreMoves = 3;
    Show();
    Refresh();
}

void ImMenuPopup::ClosePopup() {
    m_pChild.reset();
    if (IsShown()) {
        Hide();
    }
    m_bShown = false;
    m_hot = -1;
}

bool ImMenuPopup::IsDead(int row) const {
    const wxMenuItem* item = m_pMenu->FindItemByPosition(static_cast<std::size_t>(row));
    return item == nullptr || item->IsSeparator() || !item->IsEnabled();
}

int ImMenuPopup::RowAt(const wxPoint& client) const {
    for (std::size_t i = 0; i < m_rects.size(); ++i) {
        if (m_rects[i].Contains(client.x, client.y)) {
            return static_cast<int>(i);
        }
    }
    return -1;
}

void ImMenuPopup::SetHot(int row) {
    if (row == m_hot) {
        return;
    }
    m_hot = row;
    OpenChild(row);
    Refresh(false);
}

void ImMenuPopup::OpenChild(int row) {
    m_pChild.reset();
    if (row < 0 || IsDead(row)) {
        return;
    }
    wxMenuItem* item = m_pMenu->FindItemByPosition(static_cast<std::size_t>(row));
    if (!item->IsSubMenu()) {
        return;
    }
    m_pChild.reset(new ImMenuPopup(m_pOwner, m_pBar, m_font));
    m_pChild->SetMenu(item->GetSubMenu());
    m_pBar->AnnouncePopup(item->GetSubMenu());
    m_pChild->Measure();
    const wxPoint origin = GetScreenPosition();
    const wxSize screen = wxGetDisplaySize();
    const auto [x, y] =
        PlacePopupBeside(origin.x, origin.y, m_width, m_rects[static_cast<std::size_t>(row)].y,
                         m_pChild->m_width, m_pChild->m_height, screen.x, screen.y);
    m_pChild->ShowAt(x, y);
}

bool ImMenuPopup::Activate(int row) {
    if (row < 0 || IsDead(row)) {
        return false;
    }
    wxMenuItem* item = m_pMenu->FindItemByPosition(static_cast<std::size_t>(row));
    if (item->IsSubMenu()) {
        if (!m_pChild) {
            OpenChild(row);
        }
        return true;
    }
    const int id = item->GetId();
    ImMenuBar* bar = m_pBar;
    wxWindow* owner = m_pOwner;
    // Posted, so that the popups close before the command runs.
    bar->CallAfter([bar] { bar->CommandChosen(); });
    wxQueueEvent(owner, new wxCommandEvent(wxEVT_MENU, id));
    return true;
}

void ImMenuPopup::OnMouse(wxMouseEvent& event) {
    if (event.Leaving()) {
        if (!m_pChild) {
            m_hot = -1;
            Refresh(false);
        }
        return;
    }
    if (event.Moving() || event.Dragging()) {
        if (m_ignoreMoves > 0) {
            --m_ignoreMoves;
            return;
        }
        const int row = RowAt(event.GetPosition());
        if (row >= 0) {
            SetHot(row);
        }
        return;
    }
    if (event.LeftUp()) {
        Activate(RowAt(event.GetPosition()));
    }
}

bool ImMenuPopup::OnKey(int key) {
    if (!m_bShown || m_pMenu == nullptr) {
        return false;
    }
    if (m_pChild && m_pChild->m_bShown && key != WXK_LEFT && m_pChild->OnKey(key)) {
        return true;
    }
    const int count = static_cast<int>(m_rects.size());
    auto step = [&](int from, int by) {
        for (int i = 1; i <= count; ++i) {
            const int row = ((from + by * i) % count + count) % count;
            if (!IsDead(row)) {
                return row;
            }
        }
        return -1;
    };
    switch (key) {
        case WXK_DOWN:
            m_hot = step(m_hot < 0 ? -1 : m_hot, 1);
            m_pChild.reset();
            Refresh(false);
            return true;
        case WXK_UP:
            m_hot = step(m_hot < 0 ? 0 : m_hot, -1);
            m_pChild.reset();
            Refresh(false);
            return true;
        case WXK_RIGHT:
            if (m_hot >= 0 && !IsDead(m_hot) &&
                m_pMenu->FindItemByPosition(static_cast<std::size_t>(m_hot))->IsSubMenu()) {
                OpenChild(m_hot);
                if (m_pChild) {
                    m_pChild->OnKey(WXK_DOWN);
                }
                return true;
            }
            return false;
        case WXK_LEFT:
            if (m_pChild && m_pChild->m_bShown) {
                m_pChild.reset();
                return true;
            }
            return false;
        case WXK_RETURN:
        case WXK_NUMPAD_ENTER:
            return m_hot >= 0 && Activate(m_hot);
        default:
            break;
    }
    if (key > 0 && key < 128) {
        const char lower = static_cast<char>(std::tolower(key));
        for (int i = 0; i < count; ++i) {
            if (m_hotKeys[static_cast<std::size_t>(i)] == lower && !IsDead(i)) {
                m_hot = i;
                Refresh(false);
                return Activate(i);
            }
        }
    }
    return false;
}

void ImMenuPopup::OnPaint(wxPaintEvent& /*event*/) {
    wxAutoBufferedPaintDC dc(this);
    const MenuColours& c = m_pBar->Colours();
    const wxColour border =
        c.useColours ? c.menuBorder : wxSystemSettings::GetColour(wxSYS_COLOUR_3DHIGHLIGHT);
    const wxColour face =
        c.useColours ? c.subMenuBg : wxSystemSettings::GetColour(wxSYS_COLOUR_MENU);
    dc.SetPen(wxPen(border));
    dc.SetBrush(wxBrush(face));
    dc.DrawRectangle(0, 0, m_width, m_height);
    if (m_pMenu == nullptr) {
        return;
    }
    dc.SetFont(m_font);
    dc.SetBackgroundMode(wxTRANSPARENT);
    int textY = 6;
    int row = 0;
    for (const wxMenuItem* item : m_pMenu->GetMenuItems()) {
        const SkinRect& r = m_rects[static_cast<std::size_t>(row)];
        const int mid = r.y + r.h / 2;
        const wxString text = RowText(item);
        const int textHeight = dc.GetTextExtent(Stripped(text)).y;
        if (item->IsSeparator()) {
            dc.SetPen(wxPen(c.useColours ? c.groupLine : *wxBLACK));
            dc.DrawLine(2, mid, m_width - 2, mid);
            textY += textHeight + 4;
            ++row;
            continue;
        }
        const bool dead = !item->IsEnabled();
        const bool hot = row == m_hot && !dead;
        if (hot) {
            dc.SetPen(*wxTRANSPARENT_PEN);
            dc.SetBrush(wxBrush(
                c.useColours ? c.selectBg : wxSystemSettings::GetColour(wxSYS_COLOUR_HIGHLIGHT)));
            dc.DrawRectangle(4, r.y + 1, m_width - 8, r.h - 2);
            if (!c.useColours) {
                dc.SetPen(*wxBLACK_PEN);
                dc.SetBrush(*wxTRANSPARENT_BRUSH);
                dc.DrawRectangle(3, r.y, m_width - 6, r.h);
            }
        }
        dc.SetPen(*wxBLACK_PEN);
        if (item->IsSubMenu()) {
            const wxPoint arrow[] = {
                {m_width - 12, mid + 4}, {m_width - 8, mid}, {m_width - 12, mid - 4}};
            dc.SetBrush(*wxBLACK_BRUSH);
            dc.DrawPolygon(3, arrow);
        }
        if (item->IsCheckable() && item->IsChecked()) {
            dc.SetBrush(*wxBLACK_BRUSH);
            dc.DrawRectangle(6, mid - 3, 7, 7);
        }
        wxColour colour;
        if (dead) {
            colour =
                c.useColours ? c.disableText : wxSystemSettings::GetColour(wxSYS_COLOUR_GRAYTEXT);
        } else if (hot) {
            colour = c.useColours ? c.selectedText : wxSystemSettings::GetColour(wxSYS_COLOUR_MENU);
        } else {
            colour =
                c.useColours ? c.normalText : wxSystemSettings::GetColour(wxSYS_COLOUR_MENUTEXT);
        }
        dc.SetTextForeground(colour);
        const wxString label = text.BeforeFirst('\t');
        DrawMnemonicLabel(dc, label, wxRect(23, textY, m_width - 23, textHeight),
                          wxALIGN_LEFT | wxALIGN_TOP);
        if (text.Contains("\t")) {
            const wxString accel = text.AfterFirst('\t');
            dc.DrawText(accel, m_width - 20 - dc.GetTextExtent(accel).x, textY);
        }
        textY += textHeight + 4;
        ++row;
    }
}

// --- ImMenuBar ----------------------------------------------------------------------------

class ImMenuBar::DismissFilter : public wxEventFilter {
public:
    explicit DismissFilter(ImMenuBar* bar) : m_bar(bar) { wxEvtHandler::AddFilter(this); }
    ~DismissFilter() override { wxEvtHandler::RemoveFilter(this); }

    int FilterEvent(wxEvent& event) override {
        const wxEventType type = event.GetEventType();
        const bool press = type == wxEVT_LEFT_DOWN || type == wxEVT_RIGHT_DOWN || type == wxEVT_MIDDLE_DOWN;
        const bool key = type == wxEVT_KEY_DOWN || type == wxEVT_CHAR_HOOK;
        if ((!press && !key) || !m_bar->m_popup || !m_bar->m_popup->IsPopupShown()) {
            return Event_Skip;
        }
        if (key) {
            if (static_cast<wxKeyEvent&>(event).GetKeyCode() != WXK_ESCAPE) {
                return Event_Skip;
            }
            m_bar->CloseMenus();
            return Event_Processed;
        }
        // The press still reaches its window: a click on a list both closes the menu and selects.
        if (!m_bar->OwnsWindow(wxDynamicCast(event.GetEventObject(), wxWindow))) {
            m_bar->CloseMenus();
        }
        return Event_Skip;
    }

private:
    ImMenuBar* m_bar;
};

bool ImMenuBar::OwnsWindow(const wxWindow* window) const {
    if (window == this) {
        return true;
    }
    for (const ImMenuPopup* popup = m_popup.get(); popup != nullptr; popup = popup->Child()) {
        if (window == popup) {
            return true;
        }
    }
    return false;
}

ImMenuBar::ImMenuBar(wxWindow* parent, ImSkinDialog* owner)
    : wxWindow(parent, 1, wxDefaultPosition, wxSize(100, 30), wxBORDER_NONE | wxWANTS_CHARS),
      ImSkinObject(this, "menubar.bmp"),
      m_owner(owner) {
    SetBackgroundStyle(wxBG_STYLE_PAINT);
    m_dismissFilter = std::make_unique<DismissFilter>(this);
    Bind(wxEVT_PAINT, &ImMenuBar::OnPaint, this);
    for (auto type :
         {wxEVT_MOTION, wxEVT_LEFT_DOWN, wxEVT_LEFT_UP, wxEVT_LEAVE_WINDOW, wxEVT_LEFT_DCLICK}) {
        Bind(type, &ImMenuBar::OnMouse, this);
    }
    Bind(wxEVT_KEY_DOWN, &ImMenuBar::OnKeyDown, this);
    Bind(wxEVT_MOUSE_CAPTURE_LOST, [this](wxMouseCaptureLostEvent&) { m_bDragging = false; });
}

ImMenuBar::~ImMenuBar() {
    m_dismissFilter.reset();
    (void)m_popup.release();
}

void ImMenuBar::DestroyPopups() {
    m_bOpen = false;
    m_popup.reset();
}

void ImMenuBar::SetMenu(std::unique_ptr<ImMenu> menu) {
    CloseMenus();
    m_menu = std::move(menu);
    Measure();
    Refresh();
}

bool ImMenuBar::OnSkinChanged(const std::string& skinDir) {
    ImSkinObject::OnSkinChanged(skinDir);
    ImSkinConfig skin(&g_Language);
    skin.Load(skinDir);
    m_itemLeft = skin.GetInt("ItemLeft", 0, "Menu");
    m_itemWidth = skin.GetInt("ItemWidth", 66, "Menu");
    m_itemHeight = skin.GetInt("ItemHeight", 16, "Menu");
    m_itemCountSkin = skin.GetInt("ItemCount", 4, "Menu");
    m_itemSpacing = skin.GetInt("ItemSpacing", 3, "Menu");
    m_marginTop = skin.GetInt("MarginTop", 3, "Menu");
    m_splitCol = skin.GetInt("BgVSplitter", 0, "Menu");
    m_textColour = NativeColour(skin.GetRgbColour("TextColor", 0, "Menu"));
    MenuColours c;
    // The key reads the other way round from its effect: 0 means the skin's colours are used.
    c.useColours = skin.GetInt("IsUseDefindColor", 0, "Menu") == 0;
    auto rgb = [&](const char* key, const wxColour& fallback) {
        const int value = skin.GetInt(key, -1, "Menu");
        return value == -1 ? fallback
                           : NativeColour(SwapRedBlue(static_cast<std::uint32_t>(value)));
    };
    c.mainMenuBorder = rgb("MainMenuBorderColor", c.mainMenuBorder);
    c.itemBg = rgb("ItemBgColor", c.itemBg);
    c.menuBorder = rgb("MenuBorderColor", c.menuBorder);
    c.groupLine = rgb("ItemGroupLine", c.groupLine);
    c.selectBg = rgb("SelectBgColor", c.selectBg);
    c.subMenuBg = rgb("SubMenuBgColor", c.subMenuBg);
    c.normalText = rgb("MenuNormalTextColor", wxSystemSettings::GetColour(wxSYS_COLOUR_MENUTEXT));
    c.disableText = rgb("MenuDisableTextColor", wxSystemSettings::GetColour(wxSYS_COLOUR_GRAYTEXT));
    c.selectedText = rgb("MenuSelectedTextColor", wxSystemSettings::GetColour(wxSYS_COLOUR_MENU));
    m_colours = c;
    m_menuFont = MakeSkinFont(skin.GetFont("Menu"));
    m_popupFont = MakeSkinFont(skin.GetFont("PopupMenu"));
    Measure();
    return true;
}

wxString ImMenuBar::EntryText(int index) const {
    if (!m_menu || index < 0 || index >= static_cast<int>(m_menu->tops.size())) {
        return {};
    }
    return m_menu->tops[static_cast<std::size_t>(index)].first;
}

void ImMenuBar::Measure() {
    m_itemCount = m_menu ? static_cast<int>(std::min<std::size_t>(m_menu->tops.size(), 20)) : 0;
    m_itemRects.clear();
    m_hotKeys.clear();
    // Entries keep the skin's slot width; a caption longer than its slot (a translation) widens
    // that slot alone, so captions neither overlap nor drift apart.
    wxClientDC dc(this);
    dc.SetFont(m_menuFont.IsOk() ? m_menuFont : GetFont());
    int x = m_itemLeft;
    for (int k = 0; k < m_itemCount; ++k) {
        SkinRect rect =
            MenuEntryRect(0, x, m_itemWidth, m_itemHeight, m_itemSpacing, m_marginTop);
        rect.w = std::max(m_itemWidth, dc.GetTextExtent(Stripped(EntryText(k))).x + 12);
        m_itemRects.push_back(rect);
        x += rect.w + m_itemSpacing;
        m_hotKeys.push_back(Mnemonic(EntryText(k)));
    }
    if (!m_picture.IsOk() && m_itemCount > 0) {
        // Without a picture the bar is as large as its entries.
        const SkinRect& last = m_itemRects.back();
        SetSize(last.Right() + m_itemLeft + 2, last.Bottom() + m_marginTop);
    }
    // The popup is a window of its own, made when a menu first opens, not with the bar.
    if (m_popup) {
        m_popup->SetPopupFont(m_popupFont);
    }
    Refresh();
}

wxSize ImMenuBar::GetBarSize() const {
    if (m_picture.IsOk()) {
        return {m_picture.Width(), m_picture.Height()};
    }
    return GetSize();
}

void ImMenuBar::CloseMenus() {
    m_bOpen = false;
    if (m_popup) {
        m_popup->ClosePopup();
    }
    Refresh(false);
}

void ImMenuBar::CommandChosen() {
    m_hot = -1;
    CloseMenus();
}

void ImMenuBar::AnnouncePopup(wxMenu* menu) {
    // Enable rules and check marks of the owner hold when the popup paints.
    m_owner->OnInitMenuPopup(menu);
    menu->UpdateUI(m_owner->Window()->GetEventHandler());
}

int ImMenuBar::EntryAt(const wxPoint& point) const {
    for (int i = 0; i < m_itemCount; ++i) {
        const SkinRect& r = m_itemRects[static_cast<std::size_t>(i)];
        if (point.x >= r.x && point.x <= r.Right() && point.y >= r.y && point.y <= r.Bottom()) {
            return i;
        }
    }
    return -1;
}

void ImMenuBar::OpenEntry(int index) {
    if (!m_menu || index < 0 || index >= m_itemCount) {
        CloseMenus();
        return;
    }
    if (!m_popup) {
        m_popup.reset(new ImMenuPopup(this, this, m_popupFont));
    }
    wxMenu* menu = m_menu->tops[static_cast<std::size_t>(index)].second.get();
    m_popup->ClosePopup();
    m_popup->SetMenu(menu);
    m_popup->Measure();
    const wxPoint origin = ClientToScreen(wxPoint(m_itemRects[std::size_t(index)].x, 0));
    const wxSize screen = wxGetDisplaySize();
    const int barHeight = GetSize().y;
    const auto [x, y] = PlacePopupUnderBar(origin.x, origin.y + barHeight, m_popup->PopupWidth(),
                                           m_popup->GetSize().y, barHeight, screen.x, screen.y);
    AnnouncePopup(menu);
    m_popup->ShowAt(x, y);
}

void ImMenuBar::OpenByIndex(int index) {
    if (index < 0 || index >= m_itemCount) {
        return;
    }
    m_bOpen = true;
    m_hot = index;
    Refresh(false);
    OpenEntry(index);
}

void ImMenuBar::OnPaint(wxPaintEvent& /*event*/) {
    wxAutoBufferedPaintDC dc(this);
    const wxSize size = GetClientSize();
    if (m_picture.IsOk()) {
        dc.SetBackground(*wxWHITE_BRUSH);
        dc.Clear();
        DrawSplitPicture(dc, wxRect(size), m_picture, 20, m_splitCol);
    } else {
        dc.SetPen(wxPen(wxSystemSettings::GetColour(wxSYS_COLOUR_3DHIGHLIGHT)));
        dc.SetBrush(wxBrush(wxSystemSettings::GetColour(wxSYS_COLOUR_BTNFACE)));
        dc.DrawRectangle(wxRect(size));
    }
    if (m_hot >= 0 && m_hot < m_itemCount) {
        const SkinRect& r = m_itemRects[static_cast<std::size_t>(m_hot)];
        if (m_colours.useColours) {
            dc.SetPen(*wxTRANSPARENT_PEN);
            dc.SetBrush(wxBrush(m_colours.itemBg));
        } else {
            dc.SetPen(wxPen(m_colours.mainMenuBorder));
            dc.SetBrush(*wxTRANSPARENT_BRUSH);
        }
        dc.DrawRectangle(r.x, r.y, r.w, r.h);
    }
    dc.SetFont(m_menuFont);
    dc.SetBackgroundMode(wxTRANSPARENT);
    for (int i = 0; i < m_itemCount; ++i) {
        const SkinRect& r = m_itemRects[static_cast<std::size_t>(i)];
        wxColour colour = m_textColour;
        if (m_colours.useColours) {
            colour = i == m_hot ? m_colours.selectedText : m_colours.normalText;
        }
        dc.SetTextForeground(colour);
        DrawMnemonicLabel(dc, EntryText(i), wxRect(r.x, r.y, r.w, r.h), wxALIGN_CENTER);
    }
}

void ImMenuBar::OnMouse(wxMouseEvent& event) {
    const wxPoint point = event.GetPosition();
    const int entry = EntryAt(point);
    if (event.Moving() || event.Dragging()) {
        if (m_ignoreMoves > 0) {
            --m_ignoreMoves;
            return;
        }
        if (m_bDragging) {
            const wxPoint screen = ClientToScreen(point);
            wxWindow* top = wxGetTopLevelParent(this);
            top->Move(top->GetPosition() + (screen - m_dragPoint));
            m_dragPoint = screen;
            return;
        }
        if (entry >= 0 && entry != m_hot) {
            m_hot = entry;
            if (m_bOpen) {
                OpenEntry(entry);
            }
            Refresh(false);
        } else if (entry < 0 && !m_bOpen) {
            if (m_hot != -1) {
                m_hot = -1;
                Refresh(false);
            }
        }
        return;
    }
    if (event.LeftDown()) {
        SetFocus();
        if (entry < 0) {
            CloseMenus();
            m_hot = -1;
            m_dragPoint = ClientToScreen(point);
            m_bDragging = true;
            if (!HasCapture()) {
                CaptureMouse();
            }
            return;
        }
        if (entry == m_hot && m_bOpen) {
            CloseMenus();
            return;
        }
        m_bOpen = true;
        m_hot = entry;
        Refresh(false);
        OpenEntry(entry);
        return;
    }
    if (event.LeftUp()) {
        if (m_bDragging) {
            m_bDragging = false;
            if (HasCapture()) {
                ReleaseMouse();
            }
        }
        return;
    }
    if (event.Leaving()) {
        if (!(m_popup && m_popup->IsPopupShown())) {
            m_hot = -1;
        }
        Refresh(false);
        return;
    }
    Refresh(false);
}

void ImMenuBar::OnKeyDown(wxKeyEvent& event) {
    const int key = event.GetKeyCode();
    const bool popupShown = m_popup && m_popup->IsPopupShown();
    switch (key) {
        case WXK_TAB:
            event.Skip();
            return;
        case WXK_RETURN:
        case WXK_NUMPAD_ENTER:
        case WXK_DOWN:
            if (popupShown && m_popup->OnKey(key)) {
                return;
            }
            if (!m_bOpen && m_hot >= 0 && m_hot < m_itemCount) {
                m_bOpen = true;
                Refresh(false);
                OpenEntry(m_hot);
            }
            return;
        case WXK_ESCAPE:
            if (popupShown) {
                CloseMenus();
            }
            return;
        case WXK_LEFT:
        case WXK_RIGHT: {
            if (popupShown && m_popup->OnKey(key)) {
                return;
            }
            if (m_itemCount == 0) {
                return;
            }
            const int by = key == WXK_LEFT ? -1 : 1;
            m_hot = ((m_hot < 0 ? 0 : m_hot + by) + m_itemCount) % m_itemCount;
            Refresh(false);
            if (m_bOpen) {
                OpenEntry(m_hot);
            }
            m_ignoreMoves = 3;
            return;
        }
        default:
            break;
    }
    if (popupShown && m_popup->OnKey(key)) {
        return;
    }
    if (key > 0 && key < 128) {
        const char lower = static_cast<char>(std::tolower(key));
        for (int i = 0; i < m_itemCount; ++i) {
            if (m_hotKeys[static_cast<std::size_t>(i)] == lower) {
                m_bOpen = true;
                m_hot = i;
                Refresh(false);
                OpenEntry(i);
                m_ignoreMoves = 3;
                return;
            }
        }
    }
}

}  // namespace ac
