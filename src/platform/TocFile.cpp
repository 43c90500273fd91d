#include "platform/TocFile.h"

#include <cstdlib>
#include <filesystem>
#include <sstream>
#include <unistd.h>

namespace ac::platform {

namespace fs = std::filesystem;

bool AbsoluteTocText(const std::string& text, const std::string& folder, std::string& out) {
    if (folder.find('"') != std::string::npos) {
        return false;
    }
    bool changed = false;
    std::istringstream lines(text);
    std::string line;
    while (std::getline(lines, line)) {
        const size_t word = line.find_first_not_of(" \t");
        const size_t wordEnd = line.find_first_of(" \t", word);
        const std::string keyword =
            word == std::string::npos ? "" : line.substr(word, wordEnd - word);
        const size_t open = line.find('"', wordEnd == std::string::npos ? line.size() : wordEnd);
        if ((keyword == "FILE" || keyword == "AUDIOFILE" || keyword == "DATAFILE") &&
            open != std::string::npos && open + 1 < line.size() && line[open + 1] != '/' &&
            line[open + 1] != '"') {
            line.insert(open + 1, folder + "/");
            changed = true;
        }
        out += line;
        out += '\n';
    }
    return changed;
}

TocCopy::TocCopy(const std::string& text) {
    std::string pattern = (fs::temp_directory_path() / "ac-toc-XXXXXX.toc").string();
    const int fd = ::mkstemps(pattern.data(), 4);
    if (fd < 0) {
        return;
    }
    const bool written =
        ::write(fd, text.data(), text.size()) == static_cast<ssize_t>(text.size());
    ::close(fd);
    if (written) {
        m_path = pattern;
    } else {
        ::unlink(pattern.c_str());
    }
}

TocCopy::~TocCopy() {
    if (!m_path.empty()) {
        ::unlink(m_path.c_str());
    }
}

}  // namespace ac::platform
