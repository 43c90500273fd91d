#pragma once
// Options > Preferences: a property sheet of five pages (General, File, CDDB, CDRip, CDBurn).
// Every opening starts from the stored settings; Apply (or OK) writes the settings of each
// changed page and then tells the running program, which reads them again at once: the
// conversion limits of a run under way, the naming of the next output, the rip panel's record
// folder. A page whose Apply is refused writes nothing and keeps the sheet open on it.
//
// Thread contract: UI thread only.

#include <wx/panel.h>
#include <wx/propdlg.h>

#include <chrono>
#include <functional>
#include <map>
#include <string>
#include <vector>

class wxCheckBox;
class wxChoice;
class wxRadioButton;
class wxStaticText;
class wxTextCtrl;
class wxButton;

namespace ac {

// One page: reads the settings when made, writes them on Apply.
class CPropPage : public wxPanel {
public:
    CPropPage(wxWindow* parent, int dialogId);
    virtual bool Apply() = 0;
    bool IsModified() const { return m_modified; }
    void SetModified(bool modified = true);
    int DialogId() const { return m_dialogId; }
    // id=value of every control with an id, for the test hook.
    std::string Describe() const;
    // A test sets a control as a user would: text for an edit, 0/1 for a box or a radio, an
    // index for a list.
    bool SetControl(int id, const std::string& value);

protected:
    // A path button: "Change" when its path is set, "Choose" when it is empty.
    void FollowPath(wxButton* button, wxTextCtrl* path);
    void WatchChanges();
    int m_dialogId;
    bool m_modified = false;
};

class CPreferencesSheet : public wxPropertySheetDialog {
public:
    // `applied` runs after any page wrote its settings: the program reads them again.
    CPreferencesSheet(wxWindow* parent, std::function<void()> applied);
    ~CPreferencesSheet() override;

    // Applies every changed page in order; false at the first one refused.
    bool ApplyAll();
    std::vector<CPropPage*> Pages() const { return m_pages; }
    static CPreferencesSheet* Shown() { return s_shown; }
    std::string Describe() const;

private:
    void UpdateApplyButton();
    std::vector<CPropPage*> m_pages;
    std::function<void()> m_applied;
    // From the start of construction to the first idle moment after showing: the benchmark's
    // figure, reported by the test hook.
    std::chrono::steady_clock::time_point m_started;
    double m_openMs = 0;
    static CPreferencesSheet* s_shown;
};

// The preview of a naming pattern ("AEB" gives "01-filename-year.mp3"), and the item the list
// shows for it ("<Index>-<FileName>-<Year>"). Letters outside A to H are left out.
std::string SchemePreview(const std::string& pattern);
std::string SchemeItemText(const std::string& pattern);
// The patterns of `allscheme`, comma-separated, of at most 259 characters.
std::vector<std::string> SchemePatterns(const std::string& allScheme);

}  // namespace ac
