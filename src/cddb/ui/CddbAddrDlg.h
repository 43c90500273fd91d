#pragma once
// CCDDBAddr: "CDDB Server Address", the list of CDDB servers the user keeps (settings addr0,
// addr1, ... and addrcount), each "host & port". With no list kept it offers the default
// public server. The first entry cannot be deleted. Closing the dialog stores the list; OK also
// makes the selected entry the server of the lookups (setting remotecddb).
//
// Thread contract: UI thread only.

#include "skin/ChooseSkinDlg.h"

#include <functional>
#include <string>
#include <vector>

class wxButton;
class wxListBox;
class wxTextCtrl;

namespace ac {

// Where the dialog reads and stores its settings: the program's AppConfig, or a test's map.
struct ServerListStore {
    std::function<int(const char*)> getInt;
    std::function<std::string(const char*)> getString;
    std::function<void(const char*, int)> setInt;
    std::function<void(const char*, const std::string&)> setString;
};

class CCDDBAddr : public ImDialog {
public:
    static constexpr int kDialogId = 167;
    static constexpr int kListId = 1124;
    static constexpr int kAddressId = 1127;
    static constexpr int kPortId = 1122;
    static constexpr int kAddId = 1123;
    static constexpr int kDeleteId = 1121;

    CCDDBAddr(wxWindow* parent, ServerListStore store);
    ~CCDDBAddr() override;

    std::vector<std::string> Entries() const;
    // The buttons as a user presses them, for tests.
    void Add(const std::string& address, const std::string& port);
    void Select(int row);
    void DeleteSelected();
    bool CanDelete() const;
    void Store();

private:
    void OnSelect();

    ServerListStore m_store;
    wxListBox* m_list;
    wxTextCtrl* m_address;
    wxTextCtrl* m_port;
    wxButton* m_delete;
    bool m_stored = false;
};

}  // namespace ac
