#pragma once
// Text in a Windows code page, as language files carry it, turned into the UTF-8 that every
// text inside the program is.
//
// Thread contract: a CodePageConverter belongs to one thread at a time; the free functions may
// be called from any thread.

#include <string>
#include <string_view>

namespace ac {

inline constexpr int kCodePageUtf8 = 65001;

// The iconv name of a Windows code page number, or empty when the number is none we know.
std::string CodePageCharsetName(int codePage);

// Copies valid UTF-8 and puts U+FFFD where a byte starts no valid sequence (overlong forms and
// surrogates included), one replacement for each byte that is dropped.
std::string SanitizeUtf8(std::string_view bytes);

class CodePageConverter {
public:
    // A code page without an iconv name is read as UTF-8: on this platform that is what a file
    // written "in the system code page" holds.
    explicit CodePageConverter(int codePage);
    ~CodePageConverter();
    CodePageConverter(const CodePageConverter&) = delete;
    CodePageConverter& operator=(const CodePageConverter&) = delete;

    // Bytes that the code page does not define, or a sequence cut short, become U+FFFD; the
    // conversion always ends and always answers text.
    std::string ToUtf8(std::string_view bytes);

private:
    void* m_iconv = nullptr;  // iconv_t, or null when the text is read as UTF-8
};

std::string CodePageToUtf8(std::string_view bytes, int codePage);

}  // namespace ac
