#include "cddb/ui/CddbAddrDlg.h"

#include "cddb/CddbClient.h"
#include "cddb/CddbTexts.h"
#include "resources/Language.h"

#include <wx/button.h>
#include <wx/listbox.h>
#include <wx/sizer.h>
#include <wx/stattext.h>
#include <wx/textctrl.h>

namespace ac {

namespace {

constexpr int kOkId = 1;

wxString Text(std::uint32_t id) {
    return wxString::FromUTF8(g_Language.GetString(id));
}

}  // namespace

CCDDBAddr::CCDDBAddr(wxWindow* parent, ServerListStore store)
    : ImDialog(parent, kDialogId, Text(cddb::text::kServerTitle)),
      m_store(std::move(store)),
      m_list(new wxListBox(this, kListId, wxDefaultPosition, wxSize(320, 140))),
      m_address(
          new wxTextCtrl(this, kAddressId, wxEmptyString, wxDefaultPosition, wxSize(200, -1))),
      m_port(new wxTextCtrl(this, kPortId, wxEmptyString, wxDefaultPosition, wxSize(70, -1))),
      m_delete(new wxButton(this, kDeleteId, Text(cddb::text::kDelete))) {
    const int count = m_store.getInt("addrcount");
    for (int index = 0; index < count; ++index) {
        const std::string key = "addr" + std::to_string(index);
        m_list->Append(wxString::FromUTF8(m_store.getString(key.c_str())));
    }
    if (count <= 0) {
        m_list->Append(wxString::FromUTF8(
            cddb::HostSettingText(cddb::kDefaultCddbServer, cddb::kDefaultCddbPort)));
    }
    auto* entry = new wxBoxSizer(wxHORIZONTAL);
    entry->Add(new wxStaticText(this, wxID_ANY, Text(cddb::text::kAddress)), 0,
               wxALIGN_CENTER_VERTICAL | wxRIGHT, 4);
    entry->Add(m_address, 1, wxRIGHT, 8);
    entry->Add(new wxStaticText(this, wxID_ANY, Text(cddb::text::kPort)), 0,
               wxALIGN_CENTER_VERTICAL | wxRIGHT, 4);
    entry->Add(m_port, 0, wxRIGHT, 8);
    entry->Add(new wxButton(this, kAddId, Text(cddb::text::kAdd)), 0);
    auto* buttons = new wxBoxSizer(wxHORIZONTAL);
    buttons->Add(m_delete, 0);
    buttons->AddStretchSpacer();
    buttons->Add(new wxButton(this, kOkId, "OK"), 0);
    auto* all = new wxBoxSizer(wxVERTICAL);
    all->Add(new wxStaticText(this, wxID_ANY, Text(cddb::text::kServers)), 0,
             wxLEFT | wxTOP | wxRIGHT, 10);
    all->Add(m_list, 1, wxEXPAND | wxALL, 10);
    all->Add(entry, 0, wxEXPAND | wxLEFT | wxRIGHT, 10);
    all->Add(buttons, 0, wxEXPAND | wxALL, 10);
    SetSizerAndFit(all);
    SetEscapeId(kOkId);
    m_delete->Disable();
    m_list->Bind(wxEVT_LISTBOX, [this](wxCommandEvent&) { OnSelect(); });
    Bind(
        wxEVT_BUTTON,
        [this](wxCommandEvent&) {
            Add(m_address->GetValue().utf8_string(), m_port->GetValue().utf8_string());
        },
        kAddId);
    Bind(
        wxEVT_BUTTON, [this](wxCommandEvent&) { DeleteSelected(); }, kDeleteId);
    Bind(
        wxEVT_BUTTON,
        [this](wxCommandEvent&) {
            const int selection = m_list->GetSelection();
            if (selection != wxNOT_FOUND) {
                m_store.setString(
                    "remotecddb",
                    m_list->GetString(static_cast<unsigned>(selection)).utf8_string());
            }
            Store();
            if (IsModal())
                EndModal(wxID_OK);
        },
        kOkId);
    Bind(wxEVT_CLOSE_WINDOW, [this](wxCloseEvent& event) {
        Store();
        event.Skip();
    });
    InitDialog();
    CentreOnParent();
}

CCDDBAddr::~CCDDBAddr() {
    Store();
}

std::vector<std::string> CCDDBAddr::Entries() const {
    std::vector<std::string> entries;
    for (unsigned i = 0; i < m_list->GetCount(); ++i)
        entries.push_back(m_list->GetString(i).utf8_string());
    return entries;
}

void CCDDBAddr::Add(const std::string& address, const std::string& port) {
    // The separator of the stored form may not stand in either part.
    if (address.empty() || port.empty() || address.find('&') != std::string::npos ||
        port.find('&') != std::string::npos) {
        return;
    }
    m_list->Append(wxString::FromUTF8(address + " & " + port));
    m_address->Clear();
    m_port->Clear();
    m_stored = false;
}

void CCDDBAddr::Select(int row) {
    m_list->SetSelection(row);
    OnSelect();
}

void CCDDBAddr::OnSelect() {
    m_delete->Enable(CanDelete());
}

bool CCDDBAddr::CanDelete() const {
    return m_list->GetSelection() > 0;
}

void CCDDBAddr::DeleteSelected() {
    if (!CanDelete())
        return;
    m_list->Delete(static_cast<unsigned>(m_list->GetSelection()));
    m_delete->Disable();
    m_stored = false;
}

void CCDDBAddr::Store() {
    if (m_stored)
        return;
    const std::vector<std::string> entries = Entries();
    for (std::size_t i = 0; i < entries.size(); ++i) {
        m_store.setString(("addr" + std::to_string(i)).c_str(), entries[i]);
    }
    m_store.setInt("addrcount", static_cast<int>(entries.size()));
    m_stored = true;
}

}  // namespace ac
