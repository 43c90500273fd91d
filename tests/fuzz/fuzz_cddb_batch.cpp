// CDDB_Batch.txt is a file people edit by hand: any text must read as records without a crash,
// each record non-empty, without its '*', its id text the start of its query; and an id text
// that names a .cddb file is eight hexadecimal digits at most, never a path.
#include "cddb/BatchFile.h"
#include "cddb/DiscFile.h"

#include <cstdint>
#include <string>

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    const std::string_view text(reinterpret_cast<const char*>(data), size);
    for (const cddb::BatchRecord& record : cddb::ParseBatchText(text)) {
        if (record.query.empty() || record.query.find('*') != std::string::npos)
            __builtin_trap();
        if (!record.query.starts_with(record.idText))
            __builtin_trap();
        if (const auto id = cddb::ParseDiscIdText(record.idText)) {
            const std::string path = cddb::DiscFilePath("/folder", *id);
            if (path.size() != std::string("/folder/00000000.cddb").size())
                __builtin_trap();
        }
    }
    return 0;
}
