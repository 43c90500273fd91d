#pragma once
// A base folder whose data.pkg holds a few .pf texts, and a way to write those texts from
// parameter entries, for tests of profiles and of what is built from them.

#include <string>
#include <utility>
#include <vector>

#include "PackageDir.h"
#include "resources/Package.h"

namespace ac::test {

// A .pf text with CR LF line ends: Main keys, then one Parameter line for each entry
// ("ab = 0, \"Auto\", \"192\"").
inline std::string PfText(const std::string& name, const std::string& format,
                          const std::string& extension, const std::vector<std::string>& entries,
                          const std::string& extraMain = "") {
    std::string text = "[Main]\r\n";
    if (!name.empty()) text += "name = " + name + "\r\n";
    text += "Format = " + format + "\r\nExtName = " + extension + "\r\n" + extraMain;
    text += "[Parameter]\r\n";
    for (const std::string& entry : entries) text += entry + "\r\n";
    return text;
}

class ProfileFiles : public PackageDir {
protected:
    // File names below profile\ and their texts, all in one data.pkg.
    void WriteProfiles(const std::vector<std::pair<std::string, std::string>>& files) {
        std::vector<std::pair<std::string, std::string>> entries{{"profile/", ""}};
        for (const auto& [name, text] : files) entries.emplace_back("profile/" + name, text);
        // A package written anew within one test must not be read from the archive held open.
        ac::ClosePackage(SystemPath("x.pf"));
        WritePackage(entries);
    }
    std::string SystemPath(const std::string& name) const { return Logical("profile\\" + name); }
    std::string UserPath(const std::string& name) const { return Logical("profile\\user\\" + name); }
};

}  // namespace ac::test
