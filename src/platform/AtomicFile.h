#pragma once
// Whole-file reads and crash-safe whole-file replacement.
//
// Thread contract: any thread; two writers of one path must be serialised by the caller.

#include <cstddef>
#include <string>
#include <string_view>

namespace ac::platform {

enum class ReadResult { Ok, Missing, TooLarge, Failed };

// Reads the whole file, refusing one above maxSize bytes without reading it.
ReadResult ReadWholeFile(const std::string& path, std::string& contents, std::size_t maxSize);

// Replaces path with contents so that a crash at any moment leaves either the old file or the
// new one: write a temporary file beside it, fsync, rename over, fsync the directory. The
// file keeps the permission bits of the one it replaces (0644 for a new one, masked by umask).
bool WriteFileAtomically(const std::string& path, std::string_view contents);

// Removes temporaries that WriteFileAtomically left beside path when its process died between
// writing and renaming. Temporaries of live processes are left alone.
void RemoveStaleTemporaries(const std::string& path);

// Moves a file aside as "<path>.damaged-YYYYMMDD-HHMMSS" so the user can still recover it.
// Answers the new name, or an empty string if the move failed.
std::string SetAsideDamagedFile(const std::string& path);

}  // namespace ac::platform
