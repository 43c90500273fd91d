#include "platform/TextDecoding.h"

#include <iconv.h>
#include <uchardet.h>

#include <cerrno>
#include <cstring>
#include <strings.h>

namespace ac {

bool IsValidUtf8(std::string_view s) {
    std::size_t i = 0;
    while (i < s.size()) {
        const auto c = static_cast<unsigned char>(s[i]);
        std::size_t extra = 0;
        if (c < 0x80) {
            ++i;
            continue;
        } else if (c >= 0xC2 && c <= 0xDF) {
            extra = 1;
        } else if (c >= 0xE0 && c <= 0xEF) {
            extra = 2;
        } else if (c >= 0xF0 && c <= 0xF4) {
            extra = 3;
        } else {
            return false;
        }
        if (i + extra >= s.size()) {
            return false;
        }
        for (std::size_t k = 1; k <= extra; ++k) {
            if ((static_cast<unsigned char>(s[i + k]) & 0xC0) != 0x80) {
                return false;
            }
        }
        i += extra + 1;
    }
    return true;
}

std::string ConvertToUtf8(std::string_view bytes, const char* codePage) {
    iconv_t cd = iconv_open("UTF-8", codePage);
    if (cd == reinterpret_cast<iconv_t>(-1)) {
        return std::string(bytes);
    }
    std::string out;
    std::string in(bytes);
    char* inPtr = in.data();
    std::size_t inLeft = in.size();
    char buffer[4096];
    while (inLeft > 0) {
        char* outPtr = buffer;
        std::size_t outLeft = sizeof buffer;
        const std::size_t r = iconv(cd, &inPtr, &inLeft, &outPtr, &outLeft);
        out.append(buffer, static_cast<std::size_t>(outPtr - buffer));
        if (r == static_cast<std::size_t>(-1) && errno != E2BIG) {
            // An unmappable or cut-off byte: keep going without it.
            ++inPtr;
            --inLeft;
        }
    }
    iconv_close(cd);
    return out;
}

std::string GuessCodePage(std::string_view bytes) {
    if (IsValidUtf8(bytes)) {
        return "UTF-8";
    }
    std::string guess;
    if (uchardet_t detector = uchardet_new()) {
        if (uchardet_handle_data(detector, bytes.data(), bytes.size()) == 0) {
            uchardet_data_end(detector);
            guess = uchardet_get_charset(detector);
        }
        uchardet_delete(detector);
    }
    // Latin-1 and ASCII answers mean "Western": Windows-1252 is the same there and also maps
    // the curly quotes and dashes Windows programs write in 0x80..0x9F.
    if (guess.empty() || strcasecmp(guess.c_str(), "ISO-8859-1") == 0 ||
        strcasecmp(guess.c_str(), "ASCII") == 0 || strcasecmp(guess.c_str(), "UTF-8") == 0) {
        return "WINDOWS-1252";
    }
    return guess;
}

std::string DecodeUnlabelledText(std::string_view bytes) {
    const std::string codePage = GuessCodePage(bytes);
    if (codePage == "UTF-8") {
        return std::string(bytes);
    }
    return ConvertToUtf8(bytes, codePage.c_str());
}

}  // namespace ac
