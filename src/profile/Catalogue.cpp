#include "profile/Catalogue.h"

#include "profile/TextUtil.h"
#include "resources/Package.h"

#include <algorithm>
#include <array>

namespace ac {

namespace {

constexpr std::array<std::string_view, 12> kAdmittedFormats = {
    "aac", "ape", "flac", "ac3", "au", "m4a", "mp2", "mp3", "ogg", "wav", "asf", "xwmv"};

}  // namespace

bool IsAdmittedFormat(std::string_view format) {
    return std::any_of(kAdmittedFormats.begin(), kAdmittedFormats.end(),
                       [&](std::string_view word) { return EqualsNoCase(word, format); });
}

std::string SelectorEntryText(const ParameterSet& profile) {
    return profile.GetName() + "  (*." + profile.GetExtName() + ")";
}

bool BitRateAllowed(int workMode, std::string_view extName) {
    if (workMode == 2)
        return !EqualsNoCase(extName, "wav");
    for (std::string_view lossless : {"wav", "flac", "ape", "au"}) {
        if (EqualsNoCase(extName, lossless))
            return false;
    }
    return true;
}

std::string SystemProfileDirectory(std::string_view base) {
    return std::string(base) + "\\profile\\";
}

std::string UserProfileDirectory(std::string_view base) {
    return std::string(base) + "\\profile\\user\\";
}

std::string FallbackProfilePath(std::string_view base) {
    return std::string(base) + "\\profile\\mp3.pf";
}

std::string SaveDirectory(std::string_view base) {
    return std::string(base) + "\\profile\\user";
}

FirstProfileChoice ChooseFirstProfile(int lastRunFunction, std::string_view lastProfilePath,
                                      std::string_view lastCdProfilePath, std::string_view base) {
    FirstProfileChoice choice;
    if (lastRunFunction == 0) {
        choice.path = lastProfilePath;
    } else if (lastRunFunction == 1) {
        choice.path = lastCdProfilePath;
        if (choice.path.empty()) {
            choice.path = FallbackProfilePath(base);
            choice.storeLastCdPath = true;
        }
    }
    return choice;
}

std::unique_ptr<Profile> LoadFirstProfile(const std::string& path) {
    // ResourceExists, not a finder lookup: the finder's named lookup takes every profile path
    // for one of data.pkg, and would never find the user profile that was chosen last.
    if (path.empty() || !ResourceExists(path))
        return nullptr;
    auto profile = std::make_unique<Profile>(path);
    return profile->IsLoaded() ? std::move(profile) : nullptr;
}

void LoadProfilesOf(const std::string& directory, const std::string& firstPath,
                    const std::function<void(std::unique_ptr<Profile>)>& deliver,
                    const std::atomic<bool>& stop) {
    ImPackageFinder finder;
    if (!finder.FindFile(directory + "*.pf"))
        return;
    // FindNextFile steps onto a name and tells whether another follows it.
    bool more = true;
    while (more && !stop.load()) {
        more = finder.FindNextFile();
        // The finder's own path names the package; entries keep their logical path.
        const std::string path = directory + finder.GetFileName();
        if (finder.IsDirectory() || EqualsNoCase(path, firstPath))
            continue;
        auto profile = std::make_unique<Profile>(path);
        if (!profile->IsLoaded() || !IsAdmittedFormat(profile->GetFormat()))
            continue;
        deliver(std::move(profile));
    }
}

std::string ProfileFileName(std::string_view name) {
    const std::size_t dot = name.rfind('.');
    if (dot != std::string_view::npos && EqualsNoCase(name.substr(dot + 1), "pf")) {
        return std::string(name);
    }
    return std::string(name) + ".pf";
}

std::string ProfileFilePath(std::string_view saveDirectory, std::string_view name) {
    return std::string(saveDirectory) + "\\" + ProfileFileName(name);
}

// ---- ProfileCatalogue ----

Profile* ProfileCatalogue::At(int index) const {
    if (index < 0 || index >= Count())
        return nullptr;
    return m_entries[static_cast<std::size_t>(index)];
}

int ProfileCatalogue::Add(std::unique_ptr<Profile> profile) {
    m_entries.push_back(profile.get());
    m_owned.push_back(std::move(profile));
    return Count() - 1;
}

void ProfileCatalogue::RemoveAt(int index) {
    if (index < 0 || index >= Count())
        return;
    m_entries.erase(m_entries.begin() + index);
}

int ProfileCatalogue::MoveToEnd(int index) {
    Profile* profile = At(index);
    if (profile == nullptr)
        return -1;
    RemoveAt(index);
    m_entries.push_back(profile);
    return Count() - 1;
}

int ProfileCatalogue::IndexOf(const Profile* profile) const {
    const auto found = std::find(m_entries.begin(), m_entries.end(), profile);
    return found == m_entries.end() ? -1 : static_cast<int>(found - m_entries.begin());
}

int ProfileCatalogue::FindByPath(std::string_view path) const {
    for (int i = 0; i < Count(); ++i) {
        if (EqualsNoCase(At(i)->GetPath(), path))
            return i;
    }
    return -1;
}

int ProfileCatalogue::FindByName(std::string_view name) const {
    for (int i = 0; i < Count(); ++i) {
        if (At(i)->GetName() == name)
            return i;
    }
    return -1;
}

int ProfileCatalogue::FindSystemByExt(std::string_view extName) const {
    for (int i = 0; i < Count(); ++i) {
        if (At(i)->IsSysProfile() && EqualsNoCase(At(i)->GetExtName(), extName))
            return i;
    }
    return -1;
}

bool ProfileCatalogue::NameTaken(std::string_view name) const {
    return std::any_of(m_entries.begin(), m_entries.end(),
                       [&](const Profile* entry) { return EqualsNoCase(entry->GetName(), name); });
}

std::vector<std::string> ProfileCatalogue::EntryTexts() const {
    std::vector<std::string> texts;
    for (const Profile* entry : m_entries)
        texts.push_back(SelectorEntryText(*entry));
    return texts;
}

CatalogueResult ProfileCatalogue::Save(int index, const ParameterSet& working) {
    Profile* selected = At(index);
    if (selected == nullptr)
        return CatalogueResult::NoSelection;
    if (!SaveProfile(*selected, working, selected->GetName(), selected->GetPath())) {
        return CatalogueResult::WriteFailed;
    }
    selected->Reload();
    return CatalogueResult::Ok;
}

CatalogueResult ProfileCatalogue::SaveAs(int index, const ParameterSet& working,
                                         std::string_view name, std::string_view path) {
    Profile* selected = At(index);
    if (selected == nullptr)
        return CatalogueResult::NoSelection;
    if (!SaveProfile(*selected, working, name, path))
        return CatalogueResult::WriteFailed;
    auto added = std::make_unique<Profile>(std::string(path));
    if (!added->IsLoaded())
        return CatalogueResult::LoadFailed;
    Add(std::move(added));
    return CatalogueResult::Ok;
}

CatalogueResult ProfileCatalogue::Rename(int index, std::string_view name, int& newIndex) {
    Profile* selected = At(index);
    if (selected == nullptr)
        return CatalogueResult::NoSelection;
    const std::string nameText(name);
    if (!WriteIniString("Main", "Name", nameText.c_str(), selected->GetPath())) {
        return CatalogueResult::WriteFailed;
    }
    selected->Reload();
    newIndex = MoveToEnd(index);
    return CatalogueResult::Ok;
}

CatalogueResult ProfileCatalogue::Delete(int index, int& nextIndex) {
    Profile* selected = At(index);
    if (selected == nullptr)
        return CatalogueResult::NoSelection;
    if (!RemoveResource(selected->GetPath()))
        return CatalogueResult::DeleteFailed;
    RemoveAt(index);
    nextIndex = index < Count() ? index : 0;
    return CatalogueResult::Ok;
}

RememberedIndices FindRememberedIndices(const ProfileCatalogue& catalogue,
                                        std::string_view lastProfilePath,
                                        std::string_view lastCdProfilePath) {
    if (lastCdProfilePath.empty())
        lastCdProfilePath = lastProfilePath;
    RememberedIndices found;
    for (int i = 0; i < catalogue.Count(); ++i) {
        const std::string path = catalogue.At(i)->GetPath();
        if (found.convert < 0 && EqualsNoCase(path, lastProfilePath))
            found.convert = i;
        if (found.rip < 0 && EqualsNoCase(path, lastCdProfilePath))
            found.rip = i;
    }
    return found;
}

}  // namespace ac
