#include "cddb/BatchFile.h"

#include "cddb/RecordText.h"
#include "platform/AtomicFile.h"

#include <fcntl.h>
#include <unistd.h>

#include <cerrno>

namespace cddb {

std::string BatchFilePath(std::string_view folder) {
    std::string path(folder);
    if (!path.empty() && path.back() != '/') {
        path += '/';
    }
    return path + std::string(kBatchFileName);
}

std::vector<BatchRecord> ParseBatchText(std::string_view text) {
    std::vector<BatchRecord> records;
    for (;;) {
        while (!text.empty() && ac::IsAsciiSpace(text.front())) {
            text.remove_prefix(1);
        }
        const std::size_t star = text.find('*');
        if (star == std::string_view::npos) {
            break;
        }
        const std::string_view query = text.substr(0, star);
        text.remove_prefix(star + 1);
        if (query.empty()) {
            continue;
        }
        records.push_back({std::string(query), std::string(query.substr(0, query.find('+')))});
    }
    return records;
}

std::vector<BatchRecord> ReadBatchFile(const std::string& path) {
    std::string text;
    if (ac::platform::ReadWholeFile(path, text, kMaxBatchFileBytes) !=
        ac::platform::ReadResult::Ok) {
        return {};
    }
    return ParseBatchText(text);
}

bool AppendBatchRecord(const std::string& path, std::string_view query) {
    if (query.empty() || query.find('*') != std::string_view::npos) {
        return false;
    }
    const int fd = ::open(path.c_str(), O_WRONLY | O_APPEND | O_CREAT | O_CLOEXEC, 0644);
    if (fd < 0) {
        return false;
    }
    // One write: with O_APPEND the record lands whole at the end or, if the write is cut
    // short, as a tail without its '*' that the reader drops.
    const std::string record = std::string(query) + "*";
    ssize_t written;
    do {
        written = ::write(fd, record.data(), record.size());
    } while (written < 0 && errno == EINTR);
    const bool complete = written == static_cast<ssize_t>(record.size());
    const bool synced = ::fsync(fd) == 0;
    const bool closed = ::close(fd) == 0;
    return complete && synced && closed;
}

}  // namespace cddb
