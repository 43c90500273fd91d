#pragma once
// The catalogue of profiles the user can pick: the system profiles of data.pkg and the user
// profiles of user.pkg, in the order they were added. It owns every Profile it was ever given,
// also one whose entry was deleted: a row may still hold a clone made from it, and the entries
// are few.
//
// The rules here need no window: which formats enter, which profile is loaded first, the text
// of an entry, where a new profile file goes, and the file operations of Save, Save as, Rename
// and Delete. The side bar mirrors the entries into its selector.
//
// Thread contract: ProfileCatalogue is UI thread only. LoadFirstProfile and LoadProfilesOf run
// on the loader threads; they touch no catalogue and hand out each profile fully loaded.

#include "profile/ParameterSet.h"

#include <atomic>
#include <functional>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

namespace ac {

// Whether a profile of this Format word enters the catalogue (any case; empty never does).
bool IsAdmittedFormat(std::string_view format);
// "NAME  (*.EXT)".
std::string SelectorEntryText(const ParameterSet& profile);
// No bit rate to choose for these extensions: every one but "wav" has one in the creator mode.
bool BitRateAllowed(int workMode, std::string_view extName);

// Logical folders below the base directory (a real path with '/').
std::string SystemProfileDirectory(std::string_view base);  // BASE\profile\ .
std::string UserProfileDirectory(std::string_view base);    // BASE\profile\user\ .
std::string FallbackProfilePath(std::string_view base);     // BASE\profile\mp3.pf
std::string SaveDirectory(std::string_view base);           // BASE\profile\user

// The profile loaded first and shown before the rest: the last one of the convert or burn mode
// (0), or of the rip mode (1), where an empty setting gives the fall-back and is stored.
struct FirstProfileChoice {
    std::string path;              // empty: no first profile (any other mode)
    bool storeLastCdPath = false;  // `path` is the fall-back, to be stored as lastcd_profile_path
};
FirstProfileChoice ChooseFirstProfile(int lastRunFunction, std::string_view lastProfilePath,
                                      std::string_view lastCdProfilePath, std::string_view base);

// Loads `path` when it names an existing entry; its format is not tested. Null otherwise.
std::unique_ptr<Profile> LoadFirstProfile(const std::string& path);
// Every admitted profile of `directory` (a path ending in '\') other than `firstPath` (compared
// without regard to case), in name order; failures are silent. Stops early once `stop` is set.
void LoadProfilesOf(const std::string& directory, const std::string& firstPath,
                    const std::function<void(std::unique_ptr<Profile>)>& deliver,
                    const std::atomic<bool>& stop);

// The name dialog's rules. The file of a name: the name, with ".pf" added unless its text
// behind the last dot already is "pf" in any case; in the save directory.
std::string ProfileFileName(std::string_view name);
std::string ProfileFilePath(std::string_view saveDirectory, std::string_view name);

enum class CatalogueResult { Ok, NoSelection, WriteFailed, LoadFailed, DeleteFailed };

class ProfileCatalogue {
public:
    int Count() const { return static_cast<int>(m_entries.size()); }
    // Null out of range.
    Profile* At(int index) const;
    // Appends an entry; answers its index.
    int Add(std::unique_ptr<Profile> profile);
    // Takes the entry out; the object lives on.
    void RemoveAt(int index);
    // Moves an entry to the end; answers its new index.
    int MoveToEnd(int index);
    int IndexOf(const Profile* profile) const;
    // Path compared without regard to case; -1 if none.
    int FindByPath(std::string_view path) const;
    // The first entry of this name, exact case, as the rows' sets name it; -1 if none.
    int FindByName(std::string_view name) const;
    // The first system profile with this ExtName (any case); -1 if none.
    int FindSystemByExt(std::string_view extName) const;
    // Whether an entry already has this name, without regard to case.
    bool NameTaken(std::string_view name) const;
    std::vector<std::string> EntryTexts() const;

    // Save: writes `working` into the file of the entry and reloads it.
    CatalogueResult Save(int index, const ParameterSet& working);
    // Save as: writes a new file at `path` with `name` and adds its entry at the end.
    CatalogueResult SaveAs(int index, const ParameterSet& working, std::string_view name,
                           std::string_view path);
    // Rename: writes the new name into the entry's own file, reloads it and moves the entry to
    // the end; `newIndex` tells where.
    CatalogueResult Rename(int index, std::string_view name, int& newIndex);
    // Delete: removes the file from user.pkg and the entry; `nextIndex` is the entry that now
    // stands at the same place, or 0.
    CatalogueResult Delete(int index, int& nextIndex);

private:
    std::vector<Profile*> m_entries;
    std::vector<std::unique_ptr<Profile>> m_owned;
};

// The remembered selector indices of the convert and rip modes after loading: the entries
// whose paths equal the two settings (an empty rip setting counts as the convert one); -1 when
// no entry matches.
struct RememberedIndices {
    int convert = -1;
    int rip = -1;
};
RememberedIndices FindRememberedIndices(const ProfileCatalogue& catalogue,
                                        std::string_view lastProfilePath,
                                        std::string_view lastCdProfilePath);

}  // namespace ac
