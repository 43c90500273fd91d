#pragma once
// Reading a cdrdao .toc with libcdio from any folder. libcdio resolves the FILE names of a .toc
// against the process's current directory, and changing that directory would move it under
// every other thread (and under ctt's own relative paths). So a .toc that names its files
// relative to itself is read through a temporary copy that names them absolutely.
//
// Thread contract: any thread.

#include <string>

namespace ac::platform {

// libcdio takes a keyword only as the first word of a line and the name up to the next quote;
// so does this. Returns false when nothing needs changing or a name cannot be written
// absolutely.
bool AbsoluteTocText(const std::string& text, const std::string& folder, std::string& out);

// A temporary .toc, removed with the object; Path() is empty when it could not be written.
class TocCopy {
public:
    explicit TocCopy(const std::string& text);
    ~TocCopy();
    TocCopy(const TocCopy&) = delete;
    TocCopy& operator=(const TocCopy&) = delete;
    const std::string& Path() const { return m_path; }

private:
    std::string m_path;
};

}  // namespace ac::platform
