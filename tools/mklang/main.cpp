// mklang OUTPUT: writes English.lang, the template translators start from, from the program's
// built-in English texts. The file is generated at every build so it can never drift from what
// the program shows.

#include "resources/BuiltinStrings.h"

#include <cstdio>
#include <fstream>
#include <string>
#include <string_view>

namespace {

// The line format has escapes for TAB, LF and CR only, and a text ends at its second quote.
std::string EscapeLangText(std::string_view text) {
    std::string out;
    for (char c : text) {
        switch (c) {
            case '\t': out += "\\t"; break;
            case '\n': out += "\\n"; break;
            case '\r': out += "\\r"; break;
            default: out += c;
        }
    }
    return out;
}

template <typename Entries>
void WriteLines(std::ofstream& out, const Entries& entries, const char* format) {
    for (const auto& entry : entries) {
        char head[32];
        std::snprintf(head, sizeof head, format, static_cast<unsigned>(entry.id));
        if (entry.text.find('"') != std::string_view::npos) {
            // Not expressible in a language file: the built-in text serves instead.
            out << "// " << head << " holds a double quote and stays built in\n";
            continue;
        }
        out << head << " \"" << EscapeLangText(entry.text) << "\"\n";
    }
}

}  // namespace

int main(int argc, char** argv) {
    if (argc != 2) {
        std::fprintf(stderr, "usage: mklang OUTPUT\n");
        return 1;
    }
    std::ofstream out(argv[1], std::ios::binary | std::ios::trunc);
    out << "CODEPAGE=65001\n"
           "LANGUAGE=9\n"
           "SUBLANG=1\n"
           "LANGCODE=\n"
           "CHARSET=1\n"
           "// English: generated from the program's built-in texts at every build.\n"
           "// Copy it under a new name, set CODEPAGE to the code page you save in, and\n"
           "// translate the quoted texts. Lines you leave out show in English.\n";
    WriteLines(out, ac::BuiltinStrings(), "#%04X#");
    out << "// Menus: keyed by command id; a menu bar's captions in one line keyed by its id.\n";
    WriteLines(out, ac::BuiltinMenuTexts(), "#M%04X#");
    out.close();
    if (!out) {
        std::fprintf(stderr, "mklang: cannot write '%s'\n", argv[1]);
        return 1;
    }
    return 0;
}
