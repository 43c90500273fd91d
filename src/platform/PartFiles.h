#pragma once
// The hidden file a conversion child writes before it renames it to the output's name:
//
//   /music/out/.Song.mp3.ctt4711.part
//
// Whoever ends a child removes what it left; a part file of a child that no longer runs (the
// program was killed with it) is swept when the program next writes into that folder.
//
// Thread contract: any thread.

#include <string>
#include <sys/types.h>

namespace ac::platform {

// Beside the output, so the final rename stays on one file system; short enough for NAME_MAX
// even when the output's own name is near it.
std::string PartFilePath(const std::string& outputPath, pid_t pid);

// Removes the part file of `pid` for that output, if it is there.
void RemovePartFile(const std::string& outputPath, pid_t pid);

// Removes every part file in the folder whose writer is no longer a running conversion tool.
// Returns how many went.
int SweepStalePartFiles(const std::string& directory);

}  // namespace ac::platform
