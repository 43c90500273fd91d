#pragma once
// Where things live on a Linux desktop. The program's own files (data.pkg, ctt) are found from
// the executable's path; the user's files follow the XDG base directory rules.
//
// Thread contract: any thread. Results are computed from the environment at each call, so a
// test may point them elsewhere with setenv before it starts its work.

#include <cstdint>
#include <optional>
#include <string>

namespace ac::platform {

// Directory of the running executable, from /proc/self/exe.
std::string ExecutableDirectory();

// The directory that holds data.pkg: AUDIOCONV_BASEDIR if set; the executable's directory when
// data.pkg lies there (the build tree); else <exe>/../share/audio-converter (installed).
std::string FindBaseDirectory();

// $XDG_DATA_HOME/audio-converter (default ~/.local/share/audio-converter): user.pkg, CDDB,
// lang_miss.txt. Not created here.
std::string UserDataDirectory();

// $XDG_CONFIG_HOME/audio-converter (default ~/.config/audio-converter): settings.ini.
std::string UserConfigDirectory();

// The user's music folder (XDG user-dirs MUSIC), else ~/Music.
std::string MusicDirectory();

// The conversion tool: AC_CTT_PATH if set (tests put a fake there); else ctt beside the
// executable (the build tree) or in <prefix>/lib/audio-converter (installed).
std::string FindConversionTool();

// Creates a directory and its parents (mode 0700 for new ones under the user's home).
// `mode` before the umask: 0700 for the program's own folders, 0777 for the user's (output
// folders), which must look like any other folder the user makes.
bool EnsureDirectory(const std::string& path, unsigned mode = 0700);

// Bytes an unprivileged user may still write on the volume of `folder`; none when the folder
// does not exist or its volume cannot be read.
std::optional<std::uint64_t> FreeDiskBytes(const std::string& folder);

// The rip and burn panels stop short of a full disk: a folder with less than 200 MB left.
inline bool IsLowOnDiskSpace(const std::string& folder) {
    const std::optional<std::uint64_t> free = folder.empty() ? std::nullopt : FreeDiskBytes(folder);
    return free && *free < 209715200;
}

}  // namespace ac::platform
