#pragma once
// Where a job's output goes: the row's name filtered for the file system, optionally rewritten
// by the naming scheme, in the output folder, made unique unless overwriting is allowed.
//
// Thread contract: any thread. Settings come in as a plain value so that the driver reads the
// store once per pass and tests need no settings file.

#include <functional>
#include <string>
#include <string_view>

namespace ac {

class AppConfig;
class ParameterSet;

struct NamingSettings {
    int alsoConverter = 0;  // 1: the scheme also names conversion-list outputs
    int scheme = 1;         // index into allScheme; behind the end means the last pattern
    std::string allScheme = "E,AE,AEB,ABE,AHE,AEH";
    int illegal = 0;  // 0: illegal characters dropped; else replaced by illegalReplace[0]
    std::string illegalReplace;
    int spaceReplace = 0;  // 0: blanks stay; else replaced by replace[0]
    std::string replace;
    int outputFileOverwrite = 0;  // 0: search a free name; 1: replace an existing file
};

// The settings keys scheme, allscheme, illegal, illegalreplace, spacereplace, replace,
// alsoconverter and output_file_overwrite.
NamingSettings ReadNamingSettings(AppConfig& config);

// The file-name character rules. Illegal are * / : < > ? \ | and NUL. An empty replacement
// text ends the name at that place, as a written zero would.
std::string FilterFileName(std::string_view text, const NamingSettings& settings);

using FileExistsFn = std::function<bool(const std::string& path)>;
// True when something exists at the path (the default check of MakeOutputPath).
bool PathExistsOnDisk(const std::string& path);

struct OutputNameRequest {
    std::string_view sourcePath;  // used for the name when the row gives none
    int row = 0;                  // 0-based list row, for the <Index> letter
    std::string_view lastOutput;  // the path chosen last in this pass of the driver, or empty
    std::string_view directory;   // the output folder
    bool skipSearch = false;      // true for the burn list: its temporary files replace each other
};

// The full output path of a row. Name and tags come from `parameters` (its output file name and
// its author, year, composer, genre and album values).
std::string MakeOutputPath(ParameterSet& parameters, const OutputNameRequest& request,
                           const NamingSettings& settings,
                           const FileExistsFn& exists = PathExistsOnDisk);

}  // namespace ac
