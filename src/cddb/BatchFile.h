#pragma once
// CDDB_Batch.txt: the queries that went unanswered, kept for a later batch run. Records follow
// each other with no line break, each the four query fields and a '*':
//
//   940aac0b+11+150+15420+...+190000+2533*2f0d8939+57+150+4427+...+3467*
//
// The file only ever grows: a crash while appending must never cost the records before.
//
// Thread contract: any thread; appends from two threads are each one write on an O_APPEND
// descriptor, so they do not interleave within a record.

#include <string>
#include <string_view>
#include <vector>

namespace cddb {

inline constexpr std::string_view kBatchFileName = "CDDB_Batch.txt";
// Tens of thousands of discs; a larger file is no batch file and is not read.
inline constexpr std::size_t kMaxBatchFileBytes = 16 * 1024 * 1024;

struct BatchRecord {
    std::string query;   // the text to send behind "cddb+query+"
    std::string idText;  // the query up to its first '+': names the .cddb file of the answer
};

// folder + "/" (unless it ends in one) + kBatchFileName.
std::string BatchFilePath(std::string_view folder);

// Blanks and line ends at the start and behind each '*' are skipped, since people edit the
// file by hand; text behind the last '*' is a record cut off by a crash and is dropped.
std::vector<BatchRecord> ParseBatchText(std::string_view text);

// The records of the file; none when it is missing, unreadable or too large.
std::vector<BatchRecord> ReadBatchFile(const std::string& path);

// Appends query and its '*' in one write, creating the file when missing. False for an empty
// query or one holding a '*' (it would read back as two records), or when writing failed.
bool AppendBatchRecord(const std::string& path, std::string_view query);

}  // namespace cddb
