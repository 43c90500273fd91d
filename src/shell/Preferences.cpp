#include "shell/Preferences.h"

#include "cddb/ui/CddbAddrDlg.h"
#include "resources/Language.h"
#include "resources/TextFormat.h"
#include "shell/AppConfig.h"
#include "shell/MessageBoxes.h"
#include "skin/WindowTranslation.h"

#include <wx/bookctrl.h>
#include <wx/button.h>
#include <wx/checkbox.h>
#include <wx/choice.h>
#include <wx/dirdlg.h>
#include <wx/filedlg.h>
#include <wx/radiobut.h>
#include <wx/sizer.h>
#include <wx/statbox.h>
#include <wx/stattext.h>
#include <wx/textctrl.h>

#include <sstream>
#include <sys/stat.h>
#include <sys/statvfs.h>

namespace ac {

namespace {

constexpr int kSheetTitleId = 102;
constexpr int kChangeTextId = 276;
constexpr int kChooseTextId = 275;
constexpr int kChooseFolderTitleId = 129;
constexpr int kTooManyRunningId = 131;
constexpr int kRunningAboveProcessesId = 170;
constexpr int kSomeInfoMissingId = 246;
constexpr int kSelectAtLeastOneId = 247;
constexpr int kBadTempFolderId = 433;
constexpr std::uint32_t kNumberRangeId = 0xC186;
constexpr std::uint32_t kMustSelectId = 0xC187;
constexpr std::uint32_t kCddbEmailId = 0xC188;
constexpr std::uint32_t kCddbProtoId = 0xC189;
constexpr std::uint32_t kApplyTextId = 0xC18A;
constexpr std::size_t kMaxAllScheme = 259;

std::string Text(std::uint32_t id) {
    return g_Language.GetString(id);
}
wxString WxText(std::uint32_t id) {
    return wxString::FromUTF8(Text(id));
}
wxString Wx(const std::string& text) {
    return wxString::FromUTF8(text);
}
std::string Utf8(const wxString& text) {
    return text.utf8_string();
}

// A labelled group of controls, as the pages' group boxes.
wxStaticBoxSizer* Group(wxWindow* page, int id, const wxString& label) {
    return new wxStaticBoxSizer(new wxStaticBox(page, id, label), wxVERTICAL);
}

wxBoxSizer* Row(wxWindow* left, wxWindow* right, wxWindow* third = nullptr) {
    auto* row = new wxBoxSizer(wxHORIZONTAL);
    row->Add(left, 0, wxALIGN_CENTER_VERTICAL | wxRIGHT, 8);
    row->Add(right, 1, wxALIGN_CENTER_VERTICAL);
    if (third != nullptr) {
        row->Add(third, 0, wxALIGN_CENTER_VERTICAL | wxLEFT, 6);
    }
    return row;
}

bool ParseNumber(wxString text, long& value) {
    return text.Trim().Trim(false).ToLong(&value);
}

// A number of an edit, or a message naming the range and the edit focused.
bool ReadRange(wxTextCtrl* edit, long low, long high, long& value) {
    if (ParseNumber(edit->GetValue(), value) && value >= low && value <= high) {
        return true;
    }
    AppMessageBox(FormatText(Text(kNumberRangeId), {std::to_string(low), std::to_string(high)}),
                  wxOK | wxICON_WARNING, edit);
    edit->SetFocus();
    return false;
}

// A folder on a read-only file system stands where a CD-ROM drive would: a temporary folder
// there cannot take the files of a burn. A folder that does not exist cannot either.
bool IsReadOnlyFolder(const std::string& path) {
    struct stat status;
    if (::stat(path.c_str(), &status) != 0 || !S_ISDIR(status.st_mode)) {
        return true;
    }
    struct statvfs info;
    return ::statvfs(path.c_str(), &info) == 0 && (info.f_flag & ST_RDONLY) != 0;
}

std::string ChooseFolder(wxWindow* parent, const std::string& start) {
    wxDirDialog dialog(parent, WxText(kChooseFolderTitleId), Wx(start),
                       wxDD_DEFAULT_STYLE | wxDD_DIR_MUST_EXIST);
    return dialog.ShowModal() == wxID_OK ? Utf8(dialog.GetPath()) : std::string();
}

// ---- General -------------------------------------------------------------------------------

class CPropGeneral : public CPropPage {
public:
    explicit CPropGeneral(wxWindow* parent) : CPropPage(parent, 106) {
        AppConfig& config = GetAppConfig();
        auto* top = new wxBoxSizer(wxVERTICAL);

        wxStaticBoxSizer* process = Group(this, 1050, WxText(164));
        m_maxProcesses =
            new wxTextCtrl(this, 1019, wxString::Format("%d", config.GetInt("max_processes")));
        m_maxRunning = new wxTextCtrl(
            this, 1020, wxString::Format("%d", config.GetInt("max_running_processes")));
        process->Add(Row(new wxStaticText(this, 1048, WxText(163)), m_maxProcesses), 0,
                     wxEXPAND | wxALL, 4);
        process->Add(Row(new wxStaticText(this, 1049, WxText(162)), m_maxRunning), 0,
                     wxEXPAND | wxALL, 4);
        top->Add(process, 0, wxEXPAND | wxALL, 6);

        wxStaticBoxSizer* overwrite = Group(this, 1051, WxText(167));
        m_overwrite = new wxRadioButton(this, 1052, WxText(168), wxDefaultPosition, wxDefaultSize,
                                        wxRB_GROUP);
        m_keep = new wxRadioButton(this, 1053, WxText(169));
        (config.GetInt("output_file_overwrite") != 0 ? m_overwrite : m_keep)->SetValue(true);
        overwrite->Add(m_overwrite, 0, wxALL, 3);
        overwrite->Add(m_keep, 0, wxALL, 3);
        top->Add(overwrite, 0, wxEXPAND | wxLEFT | wxRIGHT | wxBOTTOM, 6);

        wxStaticBoxSizer* after = Group(this, 1089, "After Converting");
        static const char* const kActions[] = {"Shut Down", "Standby", "Hibernate", "Close me",
                                               "Nothing"};
        auto* actions = new wxBoxSizer(wxHORIZONTAL);
        const int action = config.GetInt("afterconvert");
        for (int i = 0; i < 5; ++i) {
            m_actions[i] = new wxRadioButton(this, 1090 + i, kActions[i], wxDefaultPosition,
                                             wxDefaultSize, i == 0 ? wxRB_GROUP : 0);
            m_actions[i]->SetValue(i == action);
            actions->Add(m_actions[i], 0, wxALL, 3);
        }
        after->Add(actions);
        top->Add(after, 0, wxEXPAND | wxLEFT | wxRIGHT | wxBOTTOM, 6);

        m_playSound = new wxCheckBox(this, 1095, "Play Sound:");
        m_playSound->SetValue(config.GetInt("playsound") != 0);
        m_soundPath = new wxTextCtrl(this, 1096, Wx(config.GetString("last_wavopenpath")));
        m_soundButton = new wxButton(this, 1097, WxText(kChangeTextId));
        top->Add(Row(m_playSound, m_soundPath, m_soundButton), 0, wxEXPAND | wxLEFT | wxRIGHT, 6);

        wxStaticBoxSizer* background = Group(this, 1098, "BackGround");
        m_slowdown = new wxCheckBox(this, 1099, "Slowdown Priority");
        m_idle = new wxCheckBox(this, 1100, "Idle Convert");
        m_slowdown->SetValue(config.GetInt("slowdown") != 0);
        m_idle->SetValue(config.GetInt("idle") != 0);
        auto* boxes = new wxBoxSizer(wxHORIZONTAL);
        boxes->Add(m_slowdown, 0, wxALL, 3);
        boxes->Add(m_idle, 0, wxALL, 3);
        background->Add(boxes);
        top->Add(background, 0, wxEXPAND | wxALL, 6);

        m_noAutoDecoder = new wxCheckBox(this, 1214, "Don't try to automic select decoder");
        m_noAutoDecoder->SetValue(config.GetInt("notautoselectdecoder") != 0);
        top->Add(m_noAutoDecoder, 0, wxLEFT | wxRIGHT | wxBOTTOM, 9);
        SetSizer(top);

        FollowPath(m_soundButton, m_soundPath);
        m_soundButton->Enable(m_playSound->GetValue());
        m_playSound->Bind(wxEVT_CHECKBOX, [this](wxCommandEvent&) {
            m_soundButton->Enable(m_playSound->GetValue());
        });
        m_soundButton->Bind(wxEVT_BUTTON, [this](wxCommandEvent&) { ChooseSound(); });
        // At least one of the two stays on: clearing the last one is refused.
        for (wxCheckBox* box : {m_slowdown, m_idle}) {
            box->Bind(wxEVT_CHECKBOX, [this, box](wxCommandEvent&) {
                wxCheckBox* other = box == m_slowdown ? m_idle : m_slowdown;
                if (!box->GetValue() && !other->GetValue()) {
                    box->SetValue(true);
                    AppMessageBox(Text(kSelectAtLeastOneId), wxOK | wxICON_INFORMATION, this);
                }
            });
        }
        TranslateWindow(*this, m_dialogId);
        WatchChanges();
    }

    bool Apply() override {
        AppConfig& config = GetAppConfig();
        const int oldRunning = config.GetInt("max_running_processes");
        long processes = 0;
        long running = 0;
        if (!ReadRange(m_maxProcesses, 1, 100, processes) ||
            !ReadRange(m_maxRunning, 1, 100, running)) {
            return false;
        }
        if (processes < running) {
            AppMessageBox(Text(kRunningAboveProcessesId), wxOK | wxICON_WARNING, this);
            return false;
        }
        if (running > 4 &&
            AppMessageBox(Text(kTooManyRunningId), wxYES_NO | wxICON_WARNING, this) != wxYES) {
            m_maxRunning->ChangeValue(wxString::Format("%d", oldRunning));
            m_maxRunning->SetFocus();
            return false;
        }
        config.SetInt("max_processes", static_cast<int>(processes));
        config.SetInt("max_running_processes", static_cast<int>(running));
        config.SetInt("output_file_overwrite", m_overwrite->GetValue() ? 1 : 0);
        config.SetInt("playsound", m_playSound->GetValue() ? 1 : 0);
        config.SetString("last_wavopenpath", Utf8(m_soundPath->GetValue()).c_str());
        for (int i = 0; i < 5; ++i) {
            if (m_actions[i]->GetValue())
                config.SetInt("afterconvert", i);
        }
        config.SetInt("slowdown", m_slowdown->GetValue() ? 1 : 0);
        config.SetInt("idle", m_idle->GetValue() ? 1 : 0);
        config.SetInt("notautoselectdecoder", m_noAutoDecoder->GetValue() ? 1 : 0);
        return true;
    }

private:
    void ChooseSound() {
        wxFileDialog dialog(this, wxEmptyString, wxEmptyString, m_soundPath->GetValue(),
                            "Wav Files(*.wav)|*.wav|All Files(*.*)|*", wxFD_OPEN);
        if (dialog.ShowModal() == wxID_OK) {
            m_soundPath->SetValue(dialog.GetPath());
        }
        SetModified();
    }

    wxTextCtrl* m_maxProcesses;
    wxTextCtrl* m_maxRunning;
    wxRadioButton* m_overwrite;
    wxRadioButton* m_keep;
    wxRadioButton* m_actions[5];
    wxCheckBox* m_playSound;
    wxTextCtrl* m_soundPath;
    wxButton* m_soundButton;
    wxCheckBox* m_slowdown;
    wxCheckBox* m_idle;
    wxCheckBox* m_noAutoDecoder;
};

// ---- File ----------------------------------------------------------------------------------

class CPropFile : public CPropPage {
public:
    explicit CPropFile(wxWindow* parent) : CPropPage(parent, 163) {
        AppConfig& config = GetAppConfig();
        auto* top = new wxBoxSizer(wxVERTICAL);
        m_scheme = new wxChoice(this, 1150);
        m_patterns = SchemePatterns(config.GetString("allscheme"));
        for (const std::string& pattern : m_patterns) {
            m_scheme->Append(Wx(SchemeItemText(pattern)));
        }
        const int scheme = config.GetInt("scheme");
        if (scheme >= 0 && scheme < static_cast<int>(m_patterns.size())) {
            m_scheme->SetSelection(scheme);
        }
        top->Add(Row(new wxStaticText(this, 1149, "Output file name:"), m_scheme), 0,
                 wxEXPAND | wxALL, 6);
        m_preview = new wxStaticText(this, 1152, wxEmptyString);
        top->Add(Row(new wxStaticText(this, 1151, "Preview:"), m_preview), 0,
                 wxEXPAND | wxLEFT | wxRIGHT | wxBOTTOM, 6);
        m_alsoConverter = new wxCheckBox(this, 1214, "Configure to converter");
        m_alsoConverter->SetValue(config.GetInt("alsoconverter") != 0);
        top->Add(m_alsoConverter, 0, wxALL, 6);

        wxStaticBoxSizer* illegal = Group(this, 1153, "Illegal Characters Replacement");
        wxWindow* box = this;
        m_delete = new wxRadioButton(box, 1157, "Automatically Delete", wxDefaultPosition,
                                     wxDefaultSize, wxRB_GROUP);
        m_replaceIllegal = new wxRadioButton(box, 1158, "Replacement:");
        m_illegalChar = new wxTextCtrl(box, 1154, Wx(config.GetString("illegalreplace")),
                                       wxDefaultPosition, wxSize(40, -1));
        m_illegalChar->SetMaxLength(1);
        (config.GetInt("illegal") != 0 ? m_replaceIllegal : m_delete)->SetValue(true);
        illegal->Add(m_delete, 0, wxALL, 3);
        auto* replaceRow = new wxBoxSizer(wxHORIZONTAL);
        replaceRow->Add(m_replaceIllegal, 0, wxALIGN_CENTER_VERTICAL | wxRIGHT, 6);
        replaceRow->Add(m_illegalChar, 0, wxALIGN_CENTER_VERTICAL);
        illegal->Add(replaceRow, 0, wxALL, 3);
        m_spaces = new wxCheckBox(box, 1155, "Convert space Characters to:");
        m_spaces->SetValue(config.GetInt("spacereplace") != 0);
        m_spaceChar = new wxTextCtrl(box, 1156, Wx(config.GetString("replace")), wxDefaultPosition,
                                     wxSize(40, -1));
        m_spaceChar->SetMaxLength(1);
        auto* spaceRow = new wxBoxSizer(wxHORIZONTAL);
        spaceRow->Add(m_spaces, 0, wxALIGN_CENTER_VERTICAL | wxRIGHT, 6);
        spaceRow->Add(m_spaceChar, 0, wxALIGN_CENTER_VERTICAL);
        illegal->Add(spaceRow, 0, wxALL, 3);
        top->Add(illegal, 0, wxEXPAND | wxALL, 6);
        SetSizer(top);

        auto follow = [this] {
            m_illegalChar->Enable(m_replaceIllegal->GetValue());
            m_spaceChar->Enable(m_spaces->GetValue());
            const int selected = m_scheme->GetSelection();
            m_preview->SetLabel(selected == wxNOT_FOUND
                                    ? wxString()
                                    : Wx(SchemePreview(m_patterns[std::size_t(selected)])));
        };
        follow();
        for (int id : {1157, 1158, 1155}) {
            FindWindow(id)->Bind(id == 1155 ? wxEVT_CHECKBOX : wxEVT_RADIOBUTTON,
                                 [follow](wxCommandEvent& event) {
                                     follow();
                                     event.Skip();
                                 });
        }
        m_scheme->Bind(wxEVT_CHOICE, [follow](wxCommandEvent& event) {
            follow();
            event.Skip();
        });
        m_alsoConverter->Bind(wxEVT_CHECKBOX, [this](wxCommandEvent& event) {
            if (m_alsoConverter->GetValue()) {
                AppMessageBox(Text(kSomeInfoMissingId), wxOK | wxICON_INFORMATION, this);
            }
            event.Skip();
        });
        TranslateWindow(*this, m_dialogId);
        WatchChanges();
    }

    bool Apply() override {
        AppConfig& config = GetAppConfig();
        if (m_scheme->GetSelection() != wxNOT_FOUND) {
            config.SetInt("scheme", m_scheme->GetSelection());
        }
        config.SetInt("illegal", m_replaceIllegal->GetValue() ? 1 : 0);
        config.SetString("illegalreplace", Utf8(m_illegalChar->GetValue()).c_str());
        config.SetInt("spacereplace", m_spaces->GetValue() ? 1 : 0);
        config.SetString("replace", Utf8(m_spaceChar->GetValue()).c_str());
        config.SetInt("alsoconverter", m_alsoConverter->GetValue() ? 1 : 0);
        return true;
    }

private:
    std::vector<std::string> m_patterns;
    wxChoice* m_scheme;
    wxStaticText* m_preview;
    wxCheckBox* m_alsoConverter;
    wxRadioButton* m_delete;
    wxRadioButton* m_replaceIllegal;
    wxTextCtrl* m_illegalChar;
    wxCheckBox* m_spaces;
    wxTextCtrl* m_spaceChar;
};

// ---- CDDB ----------------------------------------------------------------------------------

class CPropCDDB : public CPropPage {
public:
    explicit CPropCDDB(wxWindow* parent) : CPropPage(parent, 164) {
        AppConfig& config = GetAppConfig();
        auto* top = new wxBoxSizer(wxVERTICAL);
        m_localPath = new wxTextCtrl(this, 1105, Wx(config.GetString("localcddb")));
        m_localButton = new wxButton(this, 1103, WxText(kChangeTextId));
        top->Add(Row(new wxStaticText(this, 1104, "Local CDDB Path:"), m_localPath, m_localButton),
                 0, wxEXPAND | wxALL, 6);
        m_winampPath = new wxTextCtrl(this, 1107, Wx(config.GetString("winampdb")));
        m_winampButton = new wxButton(this, 1108, WxText(kChooseTextId));
        top->Add(Row(new wxStaticText(this, 1106, "WinampDB Path:"), m_winampPath, m_winampButton),
                 0, wxEXPAND | wxLEFT | wxRIGHT | wxBOTTOM, 6);

        wxStaticBoxSizer* format = Group(this, 1109, "CDDB Format");
        m_windows = new wxRadioButton(this, 1110, "Windows Format", wxDefaultPosition,
                                      wxDefaultSize, wxRB_GROUP);
        m_unix = new wxRadioButton(this, 1111, "Unix Format");
        (config.GetInt("format") != 0 ? m_unix : m_windows)->SetValue(true);
        auto* formats = new wxBoxSizer(wxHORIZONTAL);
        formats->Add(m_windows, 0, wxALL, 3);
        formats->Add(m_unix, 0, wxALL, 3);
        format->Add(formats);
        top->Add(format, 0, wxEXPAND | wxLEFT | wxRIGHT | wxBOTTOM, 6);

        m_servers = new wxChoice(this, 1114);
        m_serverButton = new wxButton(this, 1113, WxText(kChangeTextId));
        top->Add(Row(new wxStaticText(this, 1112, "Remote CDDB Path:"), m_servers, m_serverButton),
                 0, wxEXPAND | wxLEFT | wxRIGHT | wxBOTTOM, 6);
        FillServers(config.GetString("remotecddb"));

        m_timeout = new wxTextCtrl(this, 1117, wxString::Format("%d", config.GetInt("timeout")));
        top->Add(Row(new wxStaticText(this, 1115, "TimeOut(sec):"), m_timeout), 0,
                 wxEXPAND | wxLEFT | wxRIGHT | wxBOTTOM, 6);
        m_order = new wxChoice(this, 1178);
        static const int kOrders[6][3] = {{205, 206, 207}, {205, 207, 206}, {206, 205, 207},
                                          {206, 207, 205}, {207, 205, 206}, {207, 206, 205}};
        for (const auto& order : kOrders) {
            m_order->Append(Wx(Text(order[0]) + "->" + Text(order[1]) + "->" + Text(order[2])));
        }
        m_order->SetSelection(std::clamp(config.GetInt("cddborder"), 0, 5));
        top->Add(Row(new wxStaticText(this, 1177, "The Order of CDDB:"), m_order), 0,
                 wxEXPAND | wxLEFT | wxRIGHT | wxBOTTOM, 6);

        // Today's servers want to know who asks: the hello's e-mail and the protocol level.
        m_email = new wxTextCtrl(this, 1231, Wx(config.GetString("cddb_email")));
        top->Add(Row(new wxStaticText(this, 1230, WxText(kCddbEmailId)), m_email), 0,
                 wxEXPAND | wxLEFT | wxRIGHT | wxBOTTOM, 6);
        m_proto = new wxChoice(this, 1233);
        for (const char* level : {"4", "5", "6"})
            m_proto->Append(level);
        m_proto->SetSelection(std::clamp(config.GetInt("cddb_proto"), 4, 6) - 4);
        top->Add(Row(new wxStaticText(this, 1232, WxText(kCddbProtoId)), m_proto), 0,
                 wxEXPAND | wxLEFT | wxRIGHT | wxBOTTOM, 6);
        SetSizer(top);

        FollowPath(m_localButton, m_localPath);
        FollowPath(m_winampButton, m_winampPath);
        for (auto [button, edit] :
             {std::pair{m_localButton, m_localPath}, std::pair{m_winampButton, m_winampPath}}) {
            button->Bind(wxEVT_BUTTON, [this, edit = edit](wxCommandEvent&) {
                const std::string chosen = ChooseFolder(this, Utf8(edit->GetValue()));
                if (!chosen.empty())
                    edit->SetValue(Wx(chosen));
                SetModified();
            });
        }
        m_serverButton->Bind(wxEVT_BUTTON, [this](wxCommandEvent&) { EditServers(); });
        TranslateWindow(*this, m_dialogId);
        WatchChanges();
    }

    bool Apply() override {
        AppConfig& config = GetAppConfig();
        long timeout = 0;
        if (!ReadRange(m_timeout, 1, 3600, timeout)) {
            return false;
        }
        config.SetString("localcddb", Utf8(m_localPath->GetValue()).c_str());
        config.SetString("winampdb", Utf8(m_winampPath->GetValue()).c_str());
        if (m_servers->GetSelection() != wxNOT_FOUND) {
            config.SetString("remotecddb", Utf8(m_servers->GetStringSelection()).c_str());
        }
        config.SetInt("timeout", static_cast<int>(timeout));
        config.SetInt("format", m_unix->GetValue() ? 1 : 0);
        config.SetInt("cddborder", m_order->GetSelection());
        wxString email = m_email->GetValue();
        config.SetString("cddb_email", Utf8(email.Trim().Trim(false)).c_str());
        config.SetInt("cddb_proto", m_proto->GetSelection() + 4);
        return true;
    }

private:
    // The servers of the keys addr0.. addr(addrcount-1); with none kept, the public default.
    void FillServers(const std::string& remote) {
        AppConfig& config = GetAppConfig();
        m_servers->Clear();
        const int count = config.GetInt("addrcount");
        for (int i = 0; i < count; ++i) {
            const std::string key = "addr" + std::to_string(i);
            const std::string entry = config.GetString(key.c_str());
            if (!entry.empty())
                m_servers->Append(Wx(entry));
        }
        if (m_servers->IsEmpty()) {
            m_servers->Append("gnudb.gnudb.org & 80");
        }
        const int found = m_servers->FindString(Wx(remote), true);
        m_servers->SetSelection(found == wxNOT_FOUND ? 0 : found);
    }

    void EditServers() {
        AppConfig& config = GetAppConfig();
        ServerListStore store{[&config](const char* key) { return config.GetInt(key); },
                              [&config](const char* key) { return config.GetString(key); },
                              [&config](const char* key, int value) { config.SetInt(key, value); },
                              [&config](const char* key, const std::string& value) {
                                  config.SetString(key, value.c_str());
                              }};
        CCDDBAddr dialog(this, store);
        dialog.ShowModal();
        FillServers(config.GetString("remotecddb"));
        SetModified();
    }

    wxTextCtrl* m_localPath;
    wxButton* m_localButton;
    wxTextCtrl* m_winampPath;
    wxButton* m_winampButton;
    wxRadioButton* m_windows;
    wxRadioButton* m_unix;
    wxChoice* m_servers;
    wxButton* m_serverButton;
    wxTextCtrl* m_timeout;
    wxChoice* m_order;
    wxTextCtrl* m_email;
    wxChoice* m_proto;
};

// ---- CDRip ---------------------------------------------------------------------------------

class CPropCDRip : public CPropPage {
public:
    explicit CPropCDRip(wxWindow* parent) : CPropPage(parent, 165) {
        AppConfig& config = GetAppConfig();
        auto* top = new wxBoxSizer(wxVERTICAL);
        m_eject = new wxCheckBox(this, 1118, "Eject CD After Convert");
        m_eject->SetValue(config.GetInt("ejectcd") != 0);
        m_lockBox = new wxCheckBox(this, 1119, "Lock CD While Converting");
        m_lockBox->SetValue(true);
        m_lock = config.GetInt("lockcd") != 0;
        top->Add(m_eject, 0, wxALL, 8);
        top->Add(m_lockBox, 0, wxLEFT | wxRIGHT | wxBOTTOM, 8);
        SetSizer(top);
        // The tray is always locked during a rip: the box shows it and cannot be cleared.
        m_lockBox->Bind(wxEVT_CHECKBOX, [this](wxCommandEvent& event) {
            m_lock = m_lockBox->GetValue();
            m_lockBox->SetValue(true);
            AppMessageBox(Text(kMustSelectId), wxOK | wxICON_INFORMATION, this);
            event.Skip();
        });
        TranslateWindow(*this, m_dialogId);
        WatchChanges();
    }

    bool Apply() override {
        GetAppConfig().SetInt("ejectcd", m_eject->GetValue() ? 1 : 0);
        GetAppConfig().SetInt("lockcd", m_lock ? 1 : 0);
        return true;
    }

private:
    wxCheckBox* m_eject;
    wxCheckBox* m_lockBox;
    bool m_lock = true;
};

// ---- CDBurn --------------------------------------------------------------------------------

class CPropCDBurn : public CPropPage {
public:
    explicit CPropCDBurn(wxWindow* parent) : CPropPage(parent, 166) {
        auto* top = new wxBoxSizer(wxVERTICAL);
        m_tempPath = new wxTextCtrl(this, 1190, Wx(GetAppConfig().GetString("burntemp")));
        m_button = new wxButton(this, 1135, WxText(kChangeTextId));
        top->Add(Row(new wxStaticText(this, 1213, "Temp Path:"), m_tempPath, m_button), 0,
                 wxEXPAND | wxALL, 8);
        SetSizer(top);
        FollowPath(m_button, m_tempPath);
        m_button->Bind(wxEVT_BUTTON, [this](wxCommandEvent&) {
            const std::string chosen = ChooseFolder(this, Utf8(m_tempPath->GetValue()));
            if (chosen.empty())
                return;
            if (!TakeFolder(chosen))
                return;
            SetModified();
        });
        TranslateWindow(*this, m_dialogId);
        WatchChanges();
    }

    // A folder the burn cannot write its temporary files to is refused, and the path stays.
    bool TakeFolder(const std::string& folder) {
        if (IsReadOnlyFolder(folder)) {
            AppMessageBox(Text(kBadTempFolderId), wxOK | wxICON_WARNING, this);
            return false;
        }
        m_tempPath->SetValue(Wx(folder));
        return true;
    }

    bool Apply() override {
        const std::string path = Utf8(m_tempPath->GetValue());
        if (!path.empty() && IsReadOnlyFolder(path)) {
            AppMessageBox(Text(kBadTempFolderId), wxOK | wxICON_WARNING, this);
            return false;
        }
        GetAppConfig().SetString("burntemp", path.c_str());
        return true;
    }

private:
    wxTextCtrl* m_tempPath;
    wxButton* m_button;
};

}  // namespace

// ---- Scheme texts --------------------------------------------------------------------------

std::vector<std::string> SchemePatterns(const std::string& allScheme) {
    std::vector<std::string> patterns;
    std::istringstream in(allScheme.substr(0, kMaxAllScheme));
    for (std::string pattern; std::getline(in, pattern, ',');) {
        if (!pattern.empty())
            patterns.push_back(pattern);
    }
    return patterns;
}

namespace {

std::string JoinLetters(const std::string& pattern,
                        const std::function<std::string(char)>& textOf) {
    std::string text;
    for (char letter : pattern) {
        if (letter < 'A' || letter > 'H')
            continue;
        if (!text.empty())
            text += "-";
        text += textOf(letter);
    }
    return text;
}

}  // namespace

std::string SchemeItemText(const std::string& pattern) {
    return JoinLetters(pattern,
                       [](char letter) { return Text(static_cast<std::uint32_t>(letter) + 110); });
}

std::string SchemePreview(const std::string& pattern) {
    static const char* const kPreview[] = {"01",       "author", "year",  "composer",
                                           "filename", "music",  "genre", "album"};
    return JoinLetters(pattern, [](char letter) { return std::string(kPreview[letter - 'A']); }) +
           ".mp3";
}

// ---- Pages ---------------------------------------------------------------------------------

CPropPage::CPropPage(wxWindow* parent, int dialogId) : wxPanel(parent), m_dialogId(dialogId) {}

void CPropPage::SetModified(bool modified) {
    m_modified = modified;
    if (auto* sheet = dynamic_cast<CPreferencesSheet*>(wxGetTopLevelParent(this))) {
        if (wxWindow* apply = sheet->FindWindow(wxID_APPLY)) {
            bool any = false;
            for (CPropPage* page : sheet->Pages())
                any = any || page->IsModified();
            apply->Enable(any);
        }
    }
}

void CPropPage::FollowPath(wxButton* button, wxTextCtrl* path) {
    auto follow = [button, path] {
        button->SetLabel(WxText(path->GetValue().empty() ? kChooseTextId : kChangeTextId));
    };
    follow();
    path->Bind(wxEVT_TEXT, [follow](wxCommandEvent& event) {
        follow();
        event.Skip();
    });
}

// Any change of a control marks the page, which enables Apply.
void CPropPage::WatchChanges() {
    auto mark = [this](wxCommandEvent& event) {
        SetModified();
        event.Skip();
    };
    Bind(wxEVT_TEXT, mark);
    Bind(wxEVT_CHECKBOX, mark);
    Bind(wxEVT_RADIOBUTTON, mark);
    Bind(wxEVT_CHOICE, mark);
}

namespace {

void DescribeChildren(const wxWindow* parent, std::ostringstream& out) {
    for (const wxWindow* child : parent->GetChildren()) {
        const int id = child->GetId();
        if (id > 0 && id < 30000) {
            if (auto* edit = dynamic_cast<const wxTextCtrl*>(child)) {
                out << id << "=" << Utf8(edit->GetValue()) << ";";
            } else if (auto* box = dynamic_cast<const wxCheckBox*>(child)) {
                out << id << "=" << (box->GetValue() ? 1 : 0) << ";";
            } else if (auto* radio = dynamic_cast<const wxRadioButton*>(child)) {
                out << id << "=" << (radio->GetValue() ? 1 : 0) << ";";
            } else if (auto* list = dynamic_cast<const wxChoice*>(child)) {
                out << id << "=" << Utf8(list->GetStringSelection()) << ";";
            } else if (auto* label = dynamic_cast<const wxStaticText*>(child)) {
                out << id << "=" << Utf8(label->GetLabel()) << ";";
            } else if (auto* button = dynamic_cast<const wxButton*>(child)) {
                out << id << "=" << Utf8(button->GetLabel()) << "|" << button->IsEnabled() << ";";
            }
        }
        DescribeChildren(child, out);
    }
}

}  // namespace

std::string CPropPage::Describe() const {
    std::ostringstream out;
    DescribeChildren(this, out);
    return out.str();
}

bool CPropPage::SetControl(int id, const std::string& value) {
    wxWindow* control = FindWindow(id);
    if (control == nullptr)
        return false;
    if (auto* edit = dynamic_cast<wxTextCtrl*>(control)) {
        edit->SetValue(Wx(value));
    } else if (auto* box = dynamic_cast<wxCheckBox*>(control)) {
        box->SetValue(value == "1");
        wxCommandEvent click(wxEVT_CHECKBOX, id);
        click.SetEventObject(box);
        click.SetInt(value == "1" ? 1 : 0);
        box->GetEventHandler()->ProcessEvent(click);
    } else if (auto* radio = dynamic_cast<wxRadioButton*>(control)) {
        radio->SetValue(true);
        wxCommandEvent click(wxEVT_RADIOBUTTON, id);
        click.SetEventObject(radio);
        radio->GetEventHandler()->ProcessEvent(click);
    } else if (auto* list = dynamic_cast<wxChoice*>(control)) {
        list->SetSelection(std::stoi(value));
        wxCommandEvent pick(wxEVT_CHOICE, id);
        pick.SetEventObject(list);
        pick.SetInt(list->GetSelection());
        list->GetEventHandler()->ProcessEvent(pick);
    } else {
        return false;
    }
    return true;
}

// ---- Sheet ---------------------------------------------------------------------------------

CPreferencesSheet* CPreferencesSheet::s_shown = nullptr;

CPreferencesSheet::CPreferencesSheet(wxWindow* parent, std::function<void()> applied)
    : m_applied(std::move(applied)), m_started(std::chrono::steady_clock::now()) {
    Create(parent, wxID_ANY, WxText(kSheetTitleId), wxDefaultPosition, wxDefaultSize,
           wxDEFAULT_DIALOG_STYLE | wxRESIZE_BORDER);
    CreateButtons(wxOK | wxCANCEL | wxAPPLY);
    // The buttons speak the program's language, not the locale's.
    const std::pair<int, std::uint32_t> buttons[] = {
        {wxID_OK, 1}, {wxID_CANCEL, 2}, {wxID_APPLY, kApplyTextId}};
    for (const auto& [id, text] : buttons) {
        if (wxWindow* button = FindWindow(id))
            button->SetLabel(WxText(text));
    }
    wxBookCtrlBase* book = GetBookCtrl();
    m_pages = {new CPropGeneral(book), new CPropFile(book), new CPropCDDB(book),
               new CPropCDRip(book), new CPropCDBurn(book)};
    const int tabTexts[] = {165, 171, 172, 173, 174};
    for (std::size_t i = 0; i < m_pages.size(); ++i) {
        book->AddPage(m_pages[i], WxText(static_cast<std::uint32_t>(tabTexts[i])));
    }
    // The pages read their settings as they were made: nothing is changed yet.
    for (CPropPage* page : m_pages)
        page->SetModified(false);
    LayoutDialog();
    UpdateApplyButton();
    Bind(
        wxEVT_BUTTON, [this](wxCommandEvent&) { ApplyAll(); }, wxID_APPLY);
    Bind(
        wxEVT_BUTTON,
        [this](wxCommandEvent&) {
            if (ApplyAll())
                EndModal(wxID_OK);
        },
        wxID_OK);
    Bind(wxEVT_IDLE, [this](wxIdleEvent& event) {
        if (m_openMs == 0 && IsShownOnScreen()) {
            m_openMs = std::chrono::duration<double, std::milli>(std::chrono::steady_clock::now() -
                                                                 m_started)
                           .count();
        }
        event.Skip();
    });
    s_shown = this;
}

CPreferencesSheet::~CPreferencesSheet() {
    if (s_shown == this)
        s_shown = nullptr;
}

bool CPreferencesSheet::ApplyAll() {
    bool wrote = false;
    bool ok = true;
    for (std::size_t i = 0; i < m_pages.size() && ok; ++i) {
        CPropPage* page = m_pages[i];
        if (!page->IsModified())
            continue;
        if (page->Apply()) {
            page->SetModified(false);
            wrote = true;
        } else {
            // The page that refused comes to the front; the ones before it keep their result.
            GetBookCtrl()->SetSelection(i);
            ok = false;
        }
    }
    if (wrote && m_applied)
        m_applied();
    UpdateApplyButton();
    return ok;
}

void CPreferencesSheet::UpdateApplyButton() {
    if (wxWindow* apply = FindWindow(wxID_APPLY)) {
        bool any = false;
        for (CPropPage* page : m_pages)
            any = any || page->IsModified();
        apply->Enable(any);
    }
}

std::string CPreferencesSheet::Describe() const {
    std::ostringstream out;
    out << "prefpage=" << GetBookCtrl()->GetSelection() << "\n";
    out << "prefopenms=" << m_openMs << "\n";
    for (std::size_t i = 0; i < m_pages.size(); ++i) {
        out << "pref" << i << "=" << (m_pages[i]->IsModified() ? "*" : "") << m_pages[i]->Describe()
            << "\n";
    }
    if (const wxWindow* apply = FindWindow(wxID_APPLY)) {
        out << "prefapply=" << (apply->IsEnabled() ? 1 : 0) << "\n";
    }
    return out.str();
}

}  // namespace ac
