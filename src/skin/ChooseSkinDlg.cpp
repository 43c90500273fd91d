#include "skin/ChooseSkinDlg.h"

#include "resources/Language.h"
#include "skin/SkinManager.h"
#include "skin/SkinPicture.h"
#include "skin/WindowTranslation.h"

#include <wx/button.h>
#include <wx/listctrl.h>
#include <wx/sizer.h>
#include <wx/statbmp.h>
#include <wx/stattext.h>

namespace ac {

namespace {

// The platform's OK and Cancel ids, which the language files translate for every dialog.
constexpr int kOkId = 1;
constexpr int kCancelId = 2;
constexpr int kListId = 101;
constexpr int kPreviewId = 102;
constexpr int kApplyId = 105;
constexpr int kPreviewWidth = 200;
constexpr int kPreviewHeight = 140;

bool SameDir(const std::string& a, const std::string& b) {
    return wxString::FromUTF8(SkinNameOf(a)).IsSameAs(wxString::FromUTF8(SkinNameOf(b)), false);
}

}  // namespace

ImDialog::ImDialog(wxWindow* parent, int dialogId, const wxString& title)
    : wxDialog(parent, wxID_ANY, title), m_nDialogId(dialogId) {}

void ImDialog::InitDialog() {
    wxDialog::InitDialog();
    TranslateWindow(*this, m_nDialogId);
}

ImChooseSkinDlg::ImChooseSkinDlg(wxWindow* parent)
    : ImDialog(parent, kDialogId, "Choose skin"),
      m_list(new wxListCtrl(this, kListId, wxDefaultPosition, wxSize(220, kPreviewHeight),
                            wxLC_REPORT | wxLC_NO_HEADER | wxLC_SINGLE_SEL)),
      m_preview(new wxStaticBitmap(this, kPreviewId, wxBitmap(kPreviewWidth, kPreviewHeight))),
      m_apply(new wxButton(this, kApplyId, "Apply")) {
    auto* columns = new wxBoxSizer(wxHORIZONTAL);
    auto* left = new wxBoxSizer(wxVERTICAL);
    left->Add(new wxStaticText(this, wxID_ANY, "Available skins:"), 0, wxBOTTOM, 4);
    left->Add(m_list, 1, wxEXPAND);
    auto* right = new wxBoxSizer(wxVERTICAL);
    right->Add(new wxStaticText(this, wxID_ANY, "Preview:"), 0, wxBOTTOM, 4);
    right->Add(m_preview, 0);
    columns->Add(left, 1, wxEXPAND | wxALL, 10);
    columns->Add(right, 0, wxALL, 10);
    auto* buttons = new wxBoxSizer(wxHORIZONTAL);
    buttons->AddStretchSpacer();
    buttons->Add(new wxButton(this, kOkId, "OK"), 0, wxRIGHT, 6);
    buttons->Add(new wxButton(this, kCancelId, "Cancel"), 0, wxRIGHT, 6);
    buttons->Add(m_apply, 0);
    auto* all = new wxBoxSizer(wxVERTICAL);
    all->Add(columns, 1, wxEXPAND);
    all->Add(buttons, 0, wxEXPAND | wxLEFT | wxRIGHT | wxBOTTOM, 10);
    SetSizerAndFit(all);

    m_list->InsertColumn(0, "");
    m_list->SetColumnWidth(0, m_list->GetClientSize().x);
    m_currentDir = g_Skin.GetSkinDir();
    g_Skin.Enumerate();
    for (int i = 0; i < g_Skin.GetSkinCount(); ++i) {
        auto config = std::make_unique<ImSkinConfig>(&g_Language);
        if (!config->Load(g_Skin.GetSkinAt(i))) {
            continue;
        }
        const long item =
            m_list->InsertItem(m_list->GetItemCount(), wxString::FromUTF8(config->GetName()));
        m_list->SetItemData(item, static_cast<long>(m_skins.size()));
        m_skins.push_back(std::move(config));
    }
    m_apply->Disable();
    m_list->Bind(wxEVT_LIST_ITEM_SELECTED, &ImChooseSkinDlg::OnSelected, this);
    Bind(
        wxEVT_BUTTON, [this](wxCommandEvent&) { Apply(); }, kApplyId);
    Bind(
        wxEVT_BUTTON,
        [this](wxCommandEvent&) {
            Apply();
            EndModal(wxID_OK);
        },
        kOkId);
    Bind(
        wxEVT_BUTTON, [this](wxCommandEvent&) { EndModal(wxID_CANCEL); }, kCancelId);
    for (int i = 0; i < m_list->GetItemCount(); ++i) {
        if (SameDir(m_skins[std::size_t(m_list->GetItemData(i))]->GetDir(), m_currentDir)) {
            m_list->SetItemState(i, wxLIST_STATE_SELECTED | wxLIST_STATE_FOCUSED,
                                 wxLIST_STATE_SELECTED | wxLIST_STATE_FOCUSED);
            ShowPreview(i);
        }
    }
    InitDialog();
    CentreOnParent();
}

void ImChooseSkinDlg::ShowPreview(int index) {
    const ImSkinConfig& skin = *m_skins[std::size_t(m_list->GetItemData(index))];
    wxImage image = LoadImageResource(skin.GetDir() + "\\preview.gif");
    wxBitmap bitmap(kPreviewWidth, kPreviewHeight);
    if (image.IsOk()) {
        image.Rescale(kPreviewWidth, kPreviewHeight, wxIMAGE_QUALITY_HIGH);
        bitmap = wxBitmap(image);
    }
    m_preview->SetBitmap(bitmap);
}

void ImChooseSkinDlg::OnSelected(wxListEvent& event) {
    const int index = static_cast<int>(event.GetIndex());
    ShowPreview(index);
    const ImSkinConfig& skin = *m_skins[std::size_t(m_list->GetItemData(index))];
    m_apply->Enable(!SameDir(skin.GetDir(), m_currentDir));
}

void ImChooseSkinDlg::Apply() {
    const long index = m_list->GetNextItem(-1, wxLIST_NEXT_ALL, wxLIST_STATE_SELECTED);
    if (index < 0) {
        return;
    }
    const ImSkinConfig& skin = *m_skins[std::size_t(m_list->GetItemData(index))];
    if (!SameDir(skin.GetDir(), m_currentDir)) {
        g_Skin.SetSkin(skin.GetDir());
        m_currentDir = skin.GetDir();
    }
    m_apply->Disable();
}

}  // namespace ac
