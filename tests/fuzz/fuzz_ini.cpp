// Ini texts from anywhere: skins are downloaded, profiles are edited by hand. Parsing, lookups
// and edits must hold up, and what is written back must read back as the same lines.

#include "resources/IniFile.h"

#include <fuzzer/FuzzedDataProvider.h>

#include <cstdlib>
#include <string>

namespace {

// Names the program would pass: no line ends, no NUL.
std::string Name(FuzzedDataProvider& data) {
    std::string name = data.ConsumeRandomLengthString(24);
    for (char& c : name) {
        if (c == '\r' || c == '\n' || c == '\0') {
            c = '_';
        }
    }
    return name;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* bytes, size_t size) {
    FuzzedDataProvider data(bytes, size);
    const std::string section = Name(data);
    const std::string key = Name(data);
    const std::string value = Name(data);
    const std::string text = data.ConsumeRemainingBytesAsString();

    ac::ImIniFile ini;
    ini.LoadFromText(text);
    std::string found;
    int number = 0;
    ini.GetValue(section.c_str(), key.c_str(), found);
    ini.GetIntValue(section.c_str(), key.c_str(), number);
    ac::CleanIniValue(found);
    for (int line = 0; line < static_cast<int>(ini.Lines().size()) && line < 64; ++line) {
        ini.IsSectionLine(line);
        ini.FindKey(line, key.c_str(), found);
    }

    if (!ini.SetValue(section.c_str(), key.c_str(), value.c_str())) {
        std::abort();
    }
    // A key that is not reachable as written (a '=' in it, blanks the trim removes, a header
    // spelt as another) is allowed to miss; one that is plain must read back.
    const bool plainKey = !key.empty() && key.find_first_of("=[] \t") == std::string::npos &&
                          section.find_first_of("[]") == std::string::npos;
    if (plainKey) {
        if (!ini.GetValue(section.c_str(), key.c_str(), found)) {
            std::abort();
        }
    }

    // No line holds CR LF or NUL, so what is written back must read back as the same lines.
    const auto lines = ini.Lines();
    ac::ImIniFile reread;
    reread.LoadFromText(ini.SaveText());
    if (reread.Lines() != lines) {
        std::abort();
    }
    return 0;
}
