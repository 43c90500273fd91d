#include "panels/FileInfoWnd.h"

#include "panels/FileInfoPage.h"
#include "platform/AtomicFile.h"
#include "platform/Paths.h"
#include "resources/Language.h"
#include "skin/SkinControls.h"

#include <wx/dcbuffer.h>
#include <wx/html/htmlwin.h>
#include <wx/time.h>

#include <algorithm>

namespace ac {

CFileInfoWnd* g_FileInfoWnd = nullptr;

namespace {

constexpr std::uint32_t kTitleText = 284;
constexpr std::uint32_t kCloseTip = 0xC303;
constexpr int kEdgeGrip = 3;
constexpr int kCellWidth = 150;
constexpr int kCellHeight = 200;
// Room for tags of several megabytes; a page past this is shown from memory.
constexpr std::size_t kLargestPage = 64u << 20;
const wxSize kMinSize(300, 400);
const wxSize kMaxSize(1024, 768);

// The page is ours and local; anything it might name elsewhere (a picture on a server, another
// page) is refused, and a click on a link goes nowhere.
class CInfoHtml : public wxHtmlWindow {
public:
    CInfoHtml(wxWindow* parent, int id)
        : wxHtmlWindow(parent, id, wxDefaultPosition, wxDefaultSize, wxHW_SCROLLBAR_AUTO) {}

    wxHtmlOpeningStatus OnOpeningURL(wxHtmlURLType /*type*/, const wxString& url,
                                     wxString* /*redirect*/) const override {
        return url.StartsWith("file:") || !url.Contains(":") ? wxHTML_OPEN : wxHTML_BLOCK;
    }
    void OnLinkClicked(const wxHtmlLinkInfo& /*link*/) override {}
};

std::string Text(std::uint32_t id) {
    return g_Language.GetString(id);
}

}  // namespace

CFileInfoWnd::CFileInfoWnd(wxWindow* parent)
    : wxFrame(parent, wxID_ANY, wxString::FromUTF8(Text(kTitleText)), wxDefaultPosition, kMinSize,
              wxFRAME_FLOAT_ON_PARENT | wxFRAME_NO_TASKBAR | wxFRAME_SHAPED | wxBORDER_NONE |
                  wxCLIP_CHILDREN),
      m_skin(&g_Language) {
    SetBackgroundStyle(wxBG_STYLE_PAINT);
    SetSizeHints(kMinSize, kMaxSize);
    SetSize(kMinSize);
    if (parent != nullptr) {
        CentreOnParent();
    }
    m_path = platform::UserDataDirectory() + "/help/tempfile.htm";
    m_browser = new CInfoHtml(this, kBrowserId);
    m_closeButton = new ImButton(this, kCloseId);
    m_closeButton->SetTextShown(false);
    m_closeButton->SetToolTip(wxString::FromUTF8(Text(kCloseTip)));
    Bind(wxEVT_PAINT, &CFileInfoWnd::OnPaint, this);
    Bind(wxEVT_SIZE, &CFileInfoWnd::OnSize, this);
    Bind(wxEVT_LEFT_DOWN, &CFileInfoWnd::OnMouse, this);
    Bind(wxEVT_LEFT_UP, &CFileInfoWnd::OnMouse, this);
    Bind(wxEVT_MOTION, &CFileInfoWnd::OnMouse, this);
    Bind(wxEVT_MOUSE_CAPTURE_LOST, [this](wxMouseCaptureLostEvent&) { m_dragEdges = -1; });
    Bind(
        wxEVT_BUTTON, [this](wxCommandEvent&) { ShowInfo(false); }, kCloseId);
    // The window is hidden, never destroyed, until the main dialog goes.
    Bind(wxEVT_CLOSE_WINDOW, [this](wxCloseEvent& event) {
        if (event.CanVeto()) {
            event.Veto();
            ShowInfo(false);
        } else {
            event.Skip();
        }
    });
    WritePage();
    g_Skin.AddListener(this);
    if (!g_Skin.GetSkinDir().empty()) {
        OnSkinChanged(g_Skin.GetSkinDir());
    }
    g_FileInfoWnd = this;
}

CFileInfoWnd::~CFileInfoWnd() {
    if (g_FileInfoWnd == this) {
        g_FileInfoWnd = nullptr;
    }
}

void CFileInfoWnd::ShowInfo(bool show) {
    if (!show) {
        if (IsShown()) {
            Hide();
        }
        return;
    }
    if (m_picturesPending) {
        ApplyPictures();
    }
    if (!IsShown()) {
        Show();
    }
    WritePage();
}

void CFileInfoWnd::SetItem(const MediaFileInfo* info) {
    if (info != nullptr) {
        m_info = *info;
    } else {
        m_info.reset();
    }
    ShowInfo(IsShown());
}

void CFileInfoWnd::WritePage() {
    const wxLongLong begin = wxGetUTCTimeUSec();
    m_page = BuildFileInfoPage(m_info ? &*m_info : nullptr, m_bgColor, Text);
    // The window reads the page back from its file; the file system's guess of its type (a
    // system without a MIME table calls it plain text) plays no part. Without a page file (a
    // data folder that cannot be written) it shows the page all the same, from memory.
    std::string shown;
    if (!WriteFileInfoPage(m_path, m_page) ||
        platform::ReadWholeFile(m_path, shown, kLargestPage) != platform::ReadResult::Ok) {
        shown = m_page;
    }
    // The page is ASCII: its bytes are its characters.
    m_browser->SetPage(wxString::FromAscii(FlattenLineBlocks(shown).c_str()));
    m_lastShowMs = (wxGetUTCTimeUSec() - begin).ToDouble() / 1000.0;
}

void CFileInfoWnd::OnLanguageChanged() {
    SetTitle(wxString::FromUTF8(Text(kTitleText)));
    m_closeButton->SetToolTip(wxString::FromUTF8(Text(kCloseTip)));
    if (IsShown()) {
        WritePage();
    }
    Refresh();
}

bool CFileInfoWnd::OnSkinChanged(const std::string& skinDir) {
    m_skin.Load(skinDir);
    m_bgColor = m_skin.GetString("BodyBgColor", "#F3F6FA", "FileInfo");
    // The window starts hidden and most sessions never open it: its pictures and shape wait
    // for the first showing instead of slowing the program's start.
    m_picturesPending = true;
    if (IsShown()) {
        ApplyPictures();
        WritePage();
    }
    return true;
}

void CFileInfoWnd::ApplyPictures() {
    m_picturesPending = false;
    m_frame = LoadSkinPicture("Beer1.bmp");
    m_cornerLeft = LoadRegionResource(g_Skin.GetImagePath(&g_Language, "fileinfoLT.bmp"));
    m_cornerRight = LoadRegionResource(g_Skin.GetImagePath(&g_Language, "fileinfoRT.bmp"));
    SkinFont font = m_skin.GetFont("Caption");
    if (font.name.empty()) {
        font.name = "Tohama";
    }
    m_titleFont = MakeSkinFont(font);
    m_titleColour =
        NativeColour(static_cast<std::uint32_t>(m_skin.GetInt("TextColor", 0x808080, "Caption")));
    m_closeButton->SetPicture(LoadSkinPicture("BmpBtn.bmp"));
    m_closeButton->SetSize(m_closeButton->CellSize());
    wxSizeEvent size(GetSize());
    OnSize(size);
    Refresh();
}

void CFileInfoWnd::OnSize(wxSizeEvent& /*event*/) {
    const wxSize size = GetClientSize();
    if (m_closeButton != nullptr) {
        m_closeButton->Move(size.x - 23, 4);
    }
    if (m_browser != nullptr) {
        m_browser->SetSize(4, 25, std::max(0, size.x - 7), std::max(0, size.y - 29));
    }
    ApplyShape();
    Refresh(false);
}

void CFileInfoWnd::ApplyShape() {
    const wxSize size = GetSize();
    if (size.x <= 0 || size.y <= 0 || (m_cornerLeft.empty() && m_cornerRight.empty())) {
        return;
    }
    wxRegion shape(0, 0, size.x, size.y);
    for (const SkinRect& run : PlaceCorner(m_cornerLeft, Corner::LeftTop, size.x, size.y)) {
        shape.Subtract(wxRect(run.x, run.y, run.w, run.h));
    }
    for (const SkinRect& run : PlaceCorner(m_cornerRight, Corner::RightTop, size.x, size.y)) {
        shape.Subtract(wxRect(run.x, run.y, run.w, run.h));
    }
    SetShape(shape);
}

void CFileInfoWnd::OnPaint(wxPaintEvent& /*event*/) {
    wxAutoBufferedPaintDC dc(this);
    const wxSize size = GetClientSize();
    dc.SetBackground(
        wxBrush(wxColour(wxString::FromUTF8(m_bgColor.empty() ? "#F3F6FA" : m_bgColor))));
    dc.Clear();
    if (m_frame.IsOk()) {
        // The picture's corners go to the window's corners as they are, in cells of at most
        // 150 by 200; its edges and middle stretch between them.
        const int pw = m_frame.Width();
        const int ph = m_frame.Height();
        const int cw = std::min({kCellWidth, (pw - 1) / 2, size.x / 2});
        const int ch = std::min({kCellHeight, (ph - 1) / 2, size.y / 2});
        const int sxs[3] = {0, cw, pw - cw};
        const int sws[3] = {cw, pw - 2 * cw, cw};
        const int dxs[3] = {0, cw, size.x - cw};
        const int dws[3] = {cw, size.x - 2 * cw, cw};
        const int sys[3] = {0, ch, ph - ch};
        const int shs[3] = {ch, ph - 2 * ch, ch};
        const int dys[3] = {0, ch, size.y - ch};
        const int dhs[3] = {ch, size.y - 2 * ch, ch};
        wxMemoryDC source(m_frame.bitmap);
        for (int row = 0; row < 3; ++row) {
            for (int column = 0; column < 3; ++column) {
                if (dws[column] > 0 && dhs[row] > 0 && sws[column] > 0 && shs[row] > 0) {
                    dc.StretchBlit(dxs[column], dys[row], dws[column], dhs[row], &source,
                                   sxs[column], sys[row], sws[column], shs[row]);
                }
            }
        }
    }
    dc.SetFont(m_titleFont.IsOk() ? m_titleFont : GetFont());
    dc.SetTextForeground(m_titleColour);
    dc.SetBackgroundMode(wxBRUSHSTYLE_TRANSPARENT);
    dc.DrawText(GetTitle(), 10, 5);
}

int CFileInfoWnd::EdgesAt(const wxPoint& point) const {
    const wxSize size = GetClientSize();
    int edges = 0;
    edges |= point.x < kEdgeGrip ? 1 : 0;
    edges |= point.x >= size.x - kEdgeGrip ? 2 : 0;
    edges |= point.y < kEdgeGrip ? 4 : 0;
    edges |= point.y >= size.y - kEdgeGrip ? 8 : 0;
    return edges;
}

void CFileInfoWnd::OnMouse(wxMouseEvent& event) {
    const wxPoint screen = ClientToScreen(event.GetPosition());
    if (event.LeftDown()) {
        // The edges size the window, everywhere else drags it.
        m_dragEdges = EdgesAt(event.GetPosition());
        m_dragStart = screen;
        m_startRect = GetScreenRect();
        CaptureMouse();
        return;
    }
    if (event.LeftUp()) {
        m_dragEdges = -1;
        if (HasCapture()) {
            ReleaseMouse();
        }
        return;
    }
    if (m_dragEdges < 0 || !HasCapture()) {
        static const wxStockCursor kCursors[16] = {
            wxCURSOR_ARROW,  wxCURSOR_SIZEWE,   wxCURSOR_SIZEWE,   wxCURSOR_ARROW,
            wxCURSOR_SIZENS, wxCURSOR_SIZENWSE, wxCURSOR_SIZENESW, wxCURSOR_ARROW,
            wxCURSOR_SIZENS, wxCURSOR_SIZENESW, wxCURSOR_SIZENWSE, wxCURSOR_ARROW,
            wxCURSOR_ARROW,  wxCURSOR_ARROW,    wxCURSOR_ARROW,    wxCURSOR_ARROW};
        SetCursor(wxCursor(kCursors[EdgesAt(event.GetPosition())]));
        return;
    }
    const wxPoint delta = screen - m_dragStart;
    wxRect rect = m_startRect;
    if (m_dragEdges == 0) {
        Move(rect.GetPosition() + delta);
        return;
    }
    auto clampWidth = [](int w) { return std::clamp(w, kMinSize.x, kMaxSize.x); };
    auto clampHeight = [](int h) { return std::clamp(h, kMinSize.y, kMaxSize.y); };
    if (m_dragEdges & 2) {
        rect.width = clampWidth(m_startRect.width + delta.x);
    }
    if (m_dragEdges & 8) {
        rect.height = clampHeight(m_startRect.height + delta.y);
    }
    if (m_dragEdges & 1) {
        rect.width = clampWidth(m_startRect.width - delta.x);
        rect.x = m_startRect.GetRight() + 1 - rect.width;
    }
    if (m_dragEdges & 4) {
        rect.height = clampHeight(m_startRect.height - delta.y);
        rect.y = m_startRect.GetBottom() + 1 - rect.height;
    }
    SetSize(rect);
}

}  // namespace ac
