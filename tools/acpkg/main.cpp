// acpkg: looks into and edits packages (.pkg Zip archives) the way the program sees them, and
// packs a folder into a fresh package for the build.
//
//   acpkg list PACKAGE [FOLDER]      entry names, '\'-separated, sorted; FOLDER is matched
//                                    with case, as the program's listings do
//   acpkg cat PACKAGE ENTRY          an entry's bytes to standard output
//   acpkg add PACKAGE ENTRY FILE     add or replace an entry (and its folders' entries)
//   acpkg rm PACKAGE ENTRY           delete an entry
//   acpkg ini-get PACKAGE ENTRY SECTION KEY
//   acpkg ini-set PACKAGE ENTRY SECTION KEY VALUE
//   acpkg pack PACKAGE DIR           a new package of everything under DIR
//
// ENTRY takes '/' or '\'. Exit status 0 on success, 1 with one line on standard error
// otherwise. PACKAGE is always the file named: this tool never redirects user.pkg.

#include "platform/AtomicFile.h"
#include "resources/IniFile.h"
#include "resources/Package.h"
#include "resources/PackageWriter.h"
#include "resources/ZipArchive.h"

#include <sys/stat.h>

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <iostream>
#include <string>
#include <vector>

namespace {

namespace fs = std::filesystem;

constexpr const char* kUsage =
    "usage: acpkg list|cat|add|rm|ini-get|ini-set|pack PACKAGE [ARGUMENTS...]";

int Fail(const std::string& message) {
    std::cerr << "acpkg: " << message << '\n';
    return 1;
}

std::string Quoted(const std::string& text) {
    return "'" + text + "'";
}

std::string LogicalName(std::string name) {
    std::replace(name.begin(), name.end(), '/', '\\');
    name.erase(0, name.find_first_not_of('\\'));
    return name;
}

int OpenForReading(const std::string& package, std::shared_ptr<ac::ZipArchive>& archive) {
    archive = ac::ZipArchive::Open(package);
    if (archive == nullptr) {
        struct stat st {};
        return Fail(::stat(package.c_str(), &st) == 0 ? Quoted(package) + " is not a package"
                                                      : "cannot open " + Quoted(package));
    }
    return 0;
}

// A package that does not exist yet is started empty; one that is damaged is left alone.
int OpenForWriting(const std::string& package, ac::PackageWriter& writer) {
    switch (writer.Open(package)) {
        case ac::PackageWriter::OpenResult::Ok:
            return 0;
        case ac::PackageWriter::OpenResult::Missing:
            return writer.Create() ? 0 : Fail("cannot create " + Quoted(package));
        case ac::PackageWriter::OpenResult::NotAnArchive:
            return Fail(Quoted(package) + " is not a package");
        case ac::PackageWriter::OpenResult::Failed:
            break;
    }
    return Fail("cannot read " + Quoted(package));
}

int Commit(ac::PackageWriter& writer, const std::string& package) {
    return writer.Commit(package) ? 0 : Fail("cannot write " + Quoted(package));
}

int ReadEntry(const std::string& package, const std::string& entry, std::string& contents) {
    std::shared_ptr<ac::ZipArchive> archive;
    if (int failed = OpenForReading(package, archive)) {
        return failed;
    }
    switch (archive->Read(entry, contents, ac::kMaxEntrySize)) {
        case ac::ZipArchive::ReadStatus::Ok:
            return 0;
        case ac::ZipArchive::ReadStatus::NoEntry:
            return Fail("no entry " + Quoted(entry) + " in " + Quoted(package));
        case ac::ZipArchive::ReadStatus::TooLarge:
            return Fail("entry " + Quoted(entry) + " is too large");
        case ac::ZipArchive::ReadStatus::Failed:
            break;
    }
    return Fail("entry " + Quoted(entry) + " in " + Quoted(package) + " is damaged");
}

int List(const std::string& package, const std::string* folder) {
    std::shared_ptr<ac::ZipArchive> archive;
    if (int failed = OpenForReading(package, archive)) {
        return failed;
    }
    std::string prefix;
    if (folder != nullptr) {
        prefix = LogicalName(*folder);
        if (!prefix.empty() && prefix.back() != '\\') {
            prefix += '\\';
        }
    }
    std::vector<std::string> names;
    for (const ac::ZipEntry& entry : archive->Entries()) {
        if (entry.name.size() > prefix.size() &&
            entry.name.compare(0, prefix.size(), prefix) == 0) {
            names.push_back(entry.name);
        }
    }
    if (folder != nullptr && names.empty()) {
        return Fail("nothing below " + Quoted(*folder) + " in " + Quoted(package));
    }
    std::sort(names.begin(), names.end());
    for (const std::string& name : names) {
        std::cout << name << '\n';
    }
    return 0;
}

int Cat(const std::string& package, const std::string& entry) {
    std::string contents;
    if (int failed = ReadEntry(package, entry, contents)) {
        return failed;
    }
    std::cout.write(contents.data(), static_cast<std::streamsize>(contents.size()));
    return std::cout.flush() ? 0 : Fail("cannot write to standard output");
}

int Add(const std::string& package, const std::string& entry, const std::string& file) {
    std::string contents;
    switch (ac::platform::ReadWholeFile(file, contents, ac::kMaxEntrySize)) {
        case ac::platform::ReadResult::Ok:
            break;
        case ac::platform::ReadResult::TooLarge:
            return Fail(Quoted(file) + " is larger than the program will read");
        default:
            return Fail("cannot read " + Quoted(file));
    }
    ac::PackageWriter writer;
    if (int failed = OpenForWriting(package, writer)) {
        return failed;
    }
    if (!writer.AddParentDirectories(entry) || !writer.Put(entry, contents)) {
        return Fail("cannot add " + Quoted(entry) + " to " + Quoted(package));
    }
    return Commit(writer, package);
}

int Remove(const std::string& package, const std::string& entry) {
    ac::PackageWriter writer;
    switch (writer.Open(package)) {
        case ac::PackageWriter::OpenResult::Ok:
            break;
        case ac::PackageWriter::OpenResult::NotAnArchive:
            return Fail(Quoted(package) + " is not a package");
        default:
            return Fail("cannot open " + Quoted(package));
    }
    if (!writer.Remove(entry)) {
        return Fail("no entry " + Quoted(entry) + " in " + Quoted(package));
    }
    return Commit(writer, package);
}

int IniGet(const std::string& package, const std::string& entry, const std::string& section,
           const std::string& key) {
    std::string text;
    if (int failed = ReadEntry(package, entry, text)) {
        return failed;
    }
    ac::ImIniFile ini;
    ini.LoadFromText(text);
    std::string value;
    if (!ini.GetValue(section.c_str(), key.c_str(), value)) {
        return Fail("no key " + Quoted(key) + " in [" + section + "] of " + Quoted(entry));
    }
    std::cout << ac::CleanIniValue(value) << '\n';
    return 0;
}

int IniSet(const std::string& package, const std::string& entry, const std::string& section,
           const std::string& key, const std::string& value) {
    ac::PackageWriter writer;
    if (int failed = OpenForWriting(package, writer)) {
        return failed;
    }
    std::string text;
    if (writer.Has(entry) && !writer.Read(entry, text, ac::kMaxEntrySize)) {
        return Fail("entry " + Quoted(entry) + " in " + Quoted(package) + " is damaged");
    }
    ac::ImIniFile ini;
    ini.LoadFromText(text);
    if (!ini.SetValue(section.c_str(), key.c_str(), value.c_str()) ||
        !writer.AddParentDirectories(entry) || !writer.Put(entry, ini.SaveText())) {
        return Fail("cannot change " + Quoted(entry) + " in " + Quoted(package));
    }
    return Commit(writer, package);
}

struct PackItem {
    std::string name;  // '/'-separated, directories with a trailing '/'
    fs::path source;
    std::time_t mtime = 0;
};

// SOURCE_DATE_EPOCH pins every time stamp, so that two builds of one tree give one package.
std::time_t PackTime(const fs::path& path) {
    if (const char* epoch = std::getenv("SOURCE_DATE_EPOCH")) {
        return static_cast<std::time_t>(std::strtoll(epoch, nullptr, 10));
    }
    struct stat st {};
    return ::stat(path.c_str(), &st) == 0 ? st.st_mtime : 0;
}

int Pack(const std::string& package, const std::string& directory) {
    std::error_code error;
    const fs::path root = fs::canonical(directory, error);
    if (error || !fs::is_directory(root)) {
        return Fail(Quoted(directory) + " is not a folder");
    }
    const fs::path output = fs::weakly_canonical(package, error);
    std::vector<PackItem> items;
    fs::recursive_directory_iterator walk(root, error);
    for (; !error && walk != fs::recursive_directory_iterator(); walk.increment(error)) {
        const fs::path& path = walk->path();
        bool isDirectory = walk->is_directory(error);
        if (!isDirectory && (!walk->is_regular_file(error) || path == output)) {
            continue;
        }
        std::string name = path.lexically_relative(root).generic_string();
        if (isDirectory) {
            name += '/';
        }
        items.push_back({std::move(name), path, PackTime(path)});
    }
    if (error) {
        return Fail("cannot walk " + Quoted(directory) + ": " + error.message());
    }
    std::sort(items.begin(), items.end(),
              [](const PackItem& a, const PackItem& b) { return a.name < b.name; });
    ac::PackageWriter writer;
    writer.Create();
    for (const PackItem& item : items) {
        if (item.name.back() == '/') {
            if (!writer.AddDirectory(item.name, item.mtime)) {
                return Fail("cannot add folder " + Quoted(item.name));
            }
            continue;
        }
        std::string contents;
        if (ac::platform::ReadWholeFile(item.source.string(), contents, ac::kMaxEntrySize) !=
            ac::platform::ReadResult::Ok) {
            return Fail("cannot read " + Quoted(item.source.string()));
        }
        if (!writer.Put(item.name, contents, item.mtime)) {
            return Fail("cannot add " + Quoted(item.name));
        }
    }
    return Commit(writer, package);
}

}  // namespace

int main(int argc, char** argv) {
    std::vector<std::string> args(argv + 1, argv + argc);
    const std::size_t count = args.size();
    if (count < 2) {
        return Fail(kUsage);
    }
    const std::string& command = args[0];
    const std::string& package = args[1];
    if (command == "list" && (count == 2 || count == 3)) {
        return List(package, count == 3 ? &args[2] : nullptr);
    }
    if (command == "cat" && count == 3) {
        return Cat(package, args[2]);
    }
    if (command == "add" && count == 4) {
        return Add(package, args[2], args[3]);
    }
    if (command == "rm" && count == 3) {
        return Remove(package, args[2]);
    }
    if (command == "ini-get" && count == 5) {
        return IniGet(package, args[2], args[3], args[4]);
    }
    if (command == "ini-set" && count == 6) {
        return IniSet(package, args[2], args[3], args[4], args[5]);
    }
    if (command == "pack" && count == 3) {
        return Pack(package, args[2]);
    }
    return Fail(kUsage);
}
