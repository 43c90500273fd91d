#include "ProfileLookup.h"

#include "resources/Package.h"
#include "resources/PackageWriter.h"

#include <filesystem>
#include <fstream>
#include <iterator>
#include <stdlib.h>

namespace ac::console {
namespace {

namespace fs = std::filesystem;

constexpr const char* kProfileFolders[] = {"\\profile\\", "\\profile\\user\\"};

// Held through its base: the profile keeps its value lists in a type of its own.
std::unique_ptr<ParameterSet> LoadProfile(const std::string& path) {
    auto* profile = new Profile(path);
    std::unique_ptr<ParameterSet> owner(profile);
    return profile->IsLoaded() ? std::move(owner) : nullptr;
}

// Calls `visit(path, name)` for each .pf file of one profile folder, name without ".pf".
template <typename Visit>
void ForEachProfileFile(const std::string& folder, Visit visit) {
    ImPackageFinder finder;
    if (!finder.FindFile(folder + "*.pf"))
        return;
    // FindNextFile steps onto a name and tells whether another follows it.
    for (bool more = true; more;) {
        more = finder.FindNextFile();
        const std::string name = finder.GetFileName();
        if (name.size() <= 3 || !name.ends_with(".pf") || finder.IsDirectory())
            continue;
        if (!visit(finder.GetFilePath(), name.substr(0, name.size() - 3)))
            return;
    }
}

}  // namespace

LoosePackage::~LoosePackage() {
    std::error_code ignored;
    if (!m_folder.empty())
        fs::remove_all(m_folder, ignored);
}

std::string LoosePackage::Wrap(const std::string& file) {
    std::string pattern = (fs::temp_directory_path() / "ac-profile-XXXXXX").string();
    if (!::mkdtemp(pattern.data()))
        return {};
    m_folder = pattern;
    std::ifstream in(file, std::ios::binary);
    std::string text((std::istreambuf_iterator<char>(in)), {});
    // The package's ini reader splits at CR LF, the line end profiles have always had.
    if (text.find("\r\n") == std::string::npos) {
        std::string crlf;
        for (char c : text)
            c == '\n' ? crlf += "\r\n" : crlf += c;
        text.swap(crlf);
    }
    PackageWriter writer;
    std::string package = m_folder + "/cli.pkg";
    if (!writer.Create() || !writer.Put("cli.pf", text) || !writer.Commit(package))
        return {};
    return package + "\\cli.pf";
}

std::unique_ptr<ParameterSet> FindProfile(const std::string& wanted, const std::string& base,
                                          LoosePackage& loose) {
    if (fs::is_regular_file(wanted))
        return LoadProfile(loose.Wrap(wanted));
    for (const char* folder : kProfileFolders) {
        std::string direct = base + folder + wanted + ".pf";
        if (ResourceExists(direct))
            if (auto profile = LoadProfile(direct))
                return profile;
        std::unique_ptr<ParameterSet> found;
        ForEachProfileFile(base + folder, [&](const std::string& path, const std::string&) {
            auto profile = LoadProfile(path);
            if (profile && profile->GetName() == wanted)
                found = std::move(profile);
            return found == nullptr;
        });
        if (found)
            return found;
    }
    return nullptr;
}

void PrintProfiles(const std::string& base, std::FILE* out) {
    for (const char* folder : kProfileFolders) {
        ForEachProfileFile(base + folder, [out](const std::string& path, const std::string& name) {
            Profile profile(path);
            std::fprintf(out, "  %-12s %s\n", name.c_str(),
                         profile.IsLoaded() ? profile.GetName().c_str() : "");
            return true;
        });
    }
}

}  // namespace ac::console
