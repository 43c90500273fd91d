#pragma once
// How the terminal tools find the profile a user names: a .pf file on disk, else a system
// profile, else a user profile, by file name or by shown name; and the list of names that
// --help prints. Shared by acconvert and acrip, so both take the same words.
//
// Thread contract: main thread of a terminal tool.

#include "profile/ParameterSet.h"

#include <cstdio>
#include <memory>
#include <string>

namespace ac::console {

// Profiles are read through the package layer only, so a .pf file given on the command line
// travels in a one-entry package of its own in a scratch folder, removed with this object.
class LoosePackage {
public:
    LoosePackage() = default;
    ~LoosePackage();
    LoosePackage(const LoosePackage&) = delete;
    LoosePackage& operator=(const LoosePackage&) = delete;

    // The package path of the wrapped profile; empty when it could not be written.
    std::string Wrap(const std::string& file);

private:
    std::string m_folder;
};

// Null when nothing by that name or path loads. `base` is the folder that holds data.pkg.
std::unique_ptr<ParameterSet> FindProfile(const std::string& wanted, const std::string& base,
                                          LoosePackage& loose);

// One line per profile, "  mp3          MP3 - MPEG Layer-3 Audio": system ones, then the user's.
void PrintProfiles(const std::string& base, std::FILE* out);

}  // namespace ac::console
