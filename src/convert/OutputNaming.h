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
// its author, year, composer, genre and album values). A name held by a job of this process
// (OutputHold) is never chosen, whatever the overwrite setting: overwriting replaces a file of
// an earlier run, never a sibling's output that is still being written.
std::string MakeOutputPath(ParameterSet& parameters, const OutputNameRequest& request,
                           const NamingSettings& settings,
                           const FileExistsFn& exists = PathExistsOnDisk);

// An output path that a job of this process is writing or is about to write. Every driver
// (conversion, rip, burn) holds its job's name from naming until the job has ended, so that
// two jobs never pick one name, even while neither file exists yet: the tool writes a hidden
// part file and gives it the name only when it is complete. Move-only; released on
// destruction.
class OutputHold {
public:
    OutputHold() = default;
    ~OutputHold() { Release(); }
    OutputHold(OutputHold&& other) noexcept : m_path(std::move(other.m_path)) { other.m_path.clear(); }
    OutputHold& operator=(OutputHold&& other) noexcept;
    OutputHold(const OutputHold&) = delete;
    OutputHold& operator=(const OutputHold&) = delete;

    const std::string& Path() const { return m_path; }
    bool Empty() const { return m_path.empty(); }
    void Release();

private:
    friend OutputHold ReserveOutputPath(ParameterSet&, const OutputNameRequest&,
                                        const NamingSettings&, const FileExistsFn&);
    friend OutputHold HoldOutputPath(std::string path);
    friend OutputHold ReserveFreePath(std::string_view, std::string, std::string_view, int, bool,
                                      const FileExistsFn&);
    std::string m_path;
};

// Whether a job of this process holds the path (without regard to case, as the search for a
// free name compares).
bool IsOutputHeld(std::string_view path);

// Holds a path named some other way (a fixed name of a test, a temporary file).
OutputHold HoldOutputPath(std::string path);

// The pattern of the naming scheme at index `scheme` of the comma-separated list; an index
// behind the end selects the last pattern.
std::string SchemePattern(std::string_view allScheme, int scheme);

// Finds and holds a free name in `directory`: base.ext, else base-N.ext for N from
// `firstSuffix` on. Names held by jobs of this process are never chosen; files on disk are
// passed over unless `replaceExisting`. `base` is cut to leave room for the extension and the
// number within the file system's name limit. For drivers that make their own base names.
OutputHold ReserveFreePath(std::string_view directory, std::string base, std::string_view extension,
                           int firstSuffix, bool replaceExisting,
                           const FileExistsFn& exists = PathExistsOnDisk);

// MakeOutputPath and the hold of its result in one step, so drivers on several threads cannot
// both take one free name.
OutputHold ReserveOutputPath(ParameterSet& parameters, const OutputNameRequest& request,
                             const NamingSettings& settings,
                             const FileExistsFn& exists = PathExistsOnDisk);

}  // namespace ac
