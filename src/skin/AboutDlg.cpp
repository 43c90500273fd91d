#include "skin/AboutDlg.h"

#include "resources/Language.h"
#include "resources/TextFormat.h"
#include "skin/SkinLabels.h"
#include "skin/SkinPicture.h"

#include <wx/artprov.h>
#include <wx/button.h>
#include <wx/dcbuffer.h>
#include <wx/statbmp.h>
#include <wx/statbox.h>

#include <cctype>
#include <sstream>
#include <vector>

namespace ac {

namespace {

constexpr std::uint32_t kAboutTitle = 0xC163;
constexpr std::uint32_t kVersionLine = 0xC164;
constexpr std::uint32_t kFileVersionLine = 0xC165;
constexpr std::uint32_t kLegalNotice = 0xC166;
constexpr int kPictureAttempts = 5;

wxString Utf8(const std::string& text) {
    return wxString::FromUTF8(text);
}

bool EndsWithPng(const std::string& path) {
    if (path.size() < 3) {
        return false;
    }
    std::string tail = path.substr(path.size() - 3);
    for (char& c : tail) {
        c = static_cast<char>(std::tolower(static_cast<unsigned char>(c)));
    }
    return tail == "png";
}

}  // namespace

std::string AboutVersionText(const std::string& versionSetting, const std::string& fileVersion) {
    if (!versionSetting.empty()) {
        const std::size_t dot = versionSetting.rfind('.');
        if (dot == std::string::npos) {
            return versionSetting;
        }
        return versionSetting.substr(0, dot) + "  build-" + versionSetting.substr(dot + 1);
    }
    std::vector<std::string> parts;
    std::istringstream in(fileVersion);
    for (std::string part; std::getline(in, part, '.') && parts.size() < 4;) {
        // The version resource holds four 16-bit numbers.
        parts.push_back(std::to_string(std::strtoul(part.c_str(), nullptr, 10) & 0xFFFF));
    }
    parts.resize(4, "0");
    return FormatText(g_Language.GetString(kFileVersionLine),
                      {parts[0], parts[1], parts[2], parts[3], ""});
}

ImAboutDlg::ImAboutDlg(wxWindow* parent, AboutInfo info)
    : ImDialog(parent, kDialogId,
               Utf8(FormatText(g_Language.GetString(kAboutTitle), {info.productName}))),
      m_info(std::move(info)) {
    SetClientSize(ConvertDialogToPixels(wxSize(290, 142)));
    new wxStaticBox(this, kFrameId, wxEmptyString, ConvertDialogToPixels(wxPoint(7, 7)),
                    ConvertDialogToPixels(wxSize(276, 106)));
    new wxStaticBitmap(this, kIconId, wxArtProvider::GetBitmap(wxART_INFORMATION, wxART_OTHER),
                       ConvertDialogToPixels(wxPoint(16, 20)));
    auto* version = new ImLabel(this, kVersionId, wxEmptyString);
    version->SetSize(
        wxRect(ConvertDialogToPixels(wxPoint(50, 22)), ConvertDialogToPixels(wxSize(220, 10))));
    auto* legal = new ImLabel(this, kLegalId, wxEmptyString);
    legal->SetSize(
        wxRect(ConvertDialogToPixels(wxPoint(50, 40)), ConvertDialogToPixels(wxSize(220, 10))));
    auto* link = new ImHyperLink(this, kLinkId, wxEmptyString);
    link->SetPosition(ConvertDialogToPixels(wxPoint(50, 58)));
    new wxButton(this, kOkId, Utf8(g_Language.GetString(kOkId)),
                 ConvertDialogToPixels(wxPoint(120, 120)), ConvertDialogToPixels(wxSize(50, 14)));
    Bind(
        wxEVT_BUTTON, [this](wxCommandEvent&) { EndModal(kOkId); }, kOkId);
    Bind(wxEVT_CHAR_HOOK, [this](wxKeyEvent& event) {
        const int key = event.GetKeyCode();
        if (key == WXK_ESCAPE || key == WXK_RETURN || key == WXK_NUMPAD_ENTER) {
            EndModal(kOkId);
        } else {
            event.Skip();
        }
    });
}

void ImAboutDlg::InitDialog() {
    if (m_started) {
        return;
    }
    m_started = true;
    ImDialog::InitDialog();
    const std::string version = AboutVersionText(m_info.versionSetting, m_info.fileVersion);
    FindWindow(kLegalId)->SetLabel(
        Utf8(FormatText(g_Language.GetString(kLegalNotice), {m_info.companyFullName})));
    FindWindow(kVersionId)
        ->SetLabel(Utf8(FormatText(g_Language.GetString(kVersionLine), {version})));
    auto* link = static_cast<ImHyperLink*>(FindWindow(kLinkId));
    link->SetURL(Utf8(m_info.website));
    link->SetLabel(Utf8(m_info.companyFullName));
    ImDialog::SetTitle(Utf8(FormatText(g_Language.GetString(kAboutTitle), {m_info.productName})));
    if (!m_imagePath.empty()) {
        FindWindow(kIconId)->Hide();
        FindWindow(kFrameId)->Hide();
        FindWindow(kOkId)->Hide();
        SetClientSize(GetClientSize().x - 8, GetClientSize().y);
        PlaceLabelsOverPicture();
        SetBackgroundStyle(wxBG_STYLE_PAINT);
        Bind(wxEVT_PAINT, &ImAboutDlg::OnPaint, this);
    }
}

int ImAboutDlg::DoModal() {
    InitDialog();
    return ShowModal();
}

void ImAboutDlg::PlaceLabelsOverPicture() {
    const wxSize size = FindWindow(kVersionId)->GetSize() + wxSize(0, 2);
    int y = 120;
    for (int id : {kVersionId, kLegalId, kLinkId}) {
        FindWindow(id)->SetSize(10, y, size.x, size.y);
        y += size.y;
    }
}

bool ImAboutDlg::LoadPicture() {
    if (m_image.IsOk()) {
        return true;
    }
    m_bImageIsPng = EndsWithPng(m_imagePath);
    for (int attempt = 0; attempt < kPictureAttempts && !m_image.IsOk(); ++attempt) {
        if (m_bImageIsPng) {
            m_image = LoadImageResource(m_imagePath);
        } else if (wxBitmap bitmap = LoadBitmapResource(m_imagePath); bitmap.IsOk()) {
            m_image = bitmap.ConvertToImage();
        }
    }
    return m_image.IsOk();
}

void ImAboutDlg::OnPaint(wxPaintEvent& /*event*/) {
    wxAutoBufferedPaintDC dc(this);
    dc.SetBackground(wxBrush(GetBackgroundColour()));
    dc.Clear();
    // A picture that will not load leaves the plain dialog with its lines.
    if (!LoadPicture()) {
        return;
    }
    const wxSize client = GetClientSize();
    if (m_bImageIsPng) {
        dc.DrawBitmap(wxBitmap(m_image.Scale(std::max(1, client.x), std::max(1, client.y),
                                             wxIMAGE_QUALITY_BILINEAR)),
                      0, 0, true);
        return;
    }
    const wxBitmap tile(m_image);
    for (int y = 0; y < client.y; y += tile.GetHeight()) {
        for (int x = 0; x < client.x; x += tile.GetWidth()) {
            dc.DrawBitmap(tile, x, y, false);
        }
    }
}

}  // namespace ac
