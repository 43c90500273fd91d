#include "panels/FileInfoPage.h"

#include "medialist/MediaListRules.h"

#include <cstdio>
#include <filesystem>
#include <fstream>

namespace ac {
namespace {

constexpr const char* kFieldHead =
    "<fieldset style=\"width:95%;font-size:10px\" align=\"center\"><legend><font "
    "color='#0099CC' face=\"verdana\"><strong>";
constexpr const char* kFieldTitleEnd = "</strong></font></legend>";
constexpr const char* kLineOpen = "<pre><font color=\"#333333\" face=\"verdana\">";
constexpr const char* kFieldEnd = "</font></pre></fieldset>";

// One code point from valid UTF-8 at `at`, or -1 (and one byte) for anything else.
long NextCodePoint(std::string_view text, std::size_t& at) {
    const auto byte = static_cast<unsigned char>(text[at]);
    int extra = 0;
    long value = 0;
    if (byte < 0x80) {
        ++at;
        return byte;
    } else if (byte >= 0xC2 && byte <= 0xDF) {
        extra = 1;
        value = byte & 0x1F;
    } else if (byte >= 0xE0 && byte <= 0xEF) {
        extra = 2;
        value = byte & 0x0F;
    } else if (byte >= 0xF0 && byte <= 0xF4) {
        extra = 3;
        value = byte & 0x07;
    } else {
        ++at;
        return -1;
    }
    if (at + static_cast<std::size_t>(extra) >= text.size()) {
        ++at;
        return -1;
    }
    for (int i = 1; i <= extra; ++i) {
        const auto next = static_cast<unsigned char>(text[at + static_cast<std::size_t>(i)]);
        if ((next & 0xC0) != 0x80) {
            ++at;
            return -1;
        }
        value = (value << 6) | (next & 0x3F);
    }
    // Overlong forms, surrogates and values past Unicode are no characters.
    static constexpr long kSmallest[4] = {0, 0x80, 0x800, 0x10000};
    if (value < kSmallest[extra] || (value >= 0xD800 && value <= 0xDFFF) || value > 0x10FFFF) {
        ++at;
        return -1;
    }
    at += static_cast<std::size_t>(extra) + 1;
    return value;
}

std::string Format(const char* format, auto... values) {
    char text[64];
    std::snprintf(text, sizeof text, format, values...);
    return text;
}

}  // namespace

std::string EscapeHtml(std::string_view text) {
    std::string out;
    out.reserve(text.size() + text.size() / 8);
    for (std::size_t at = 0; at < text.size();) {
        const long code = NextCodePoint(text, at);
        switch (code) {
            case '&':
                out += "&amp;";
                break;
            case '<':
                out += "&lt;";
                break;
            case '>':
                out += "&gt;";
                break;
            case '"':
                out += "&quot;";
                break;
            case '\'':
                out += "&#39;";
                break;
            case -1:
                out += "&#65533;";
                break;
            default:
                if (code < 0x80) {
                    out += static_cast<char>(code);
                } else {
                    out += "&#" + std::to_string(code) + ";";
                }
                break;
        }
    }
    return out;
}

std::string BuildFileInfoPage(const MediaFileInfo* info, const std::string& bgColor,
                              const PageText& text) {
    const std::string background = EscapeHtml(bgColor);
    if (info == nullptr) {
        return "<body bgcolor='" + background + "'></body>";
    }
    auto L = [&text](std::uint32_t id) { return EscapeHtml(text(id)); };
    auto kbps = [](std::int32_t bitsPerSecond) { return Format("%dkbps", bitsPerSecond / 1000); };
    std::string page;
    page += "<body bgcolor='" + background + "'><p><b><font color='#0000' face=\"Tahoma\" size=1>" +
            EscapeHtml(GetDisplayName(info->path)) +
            "</font></b></p><fieldset style=\"width:95%;font-size:10px\" align=\"center\">";
    page +=
        "<legend><font color='#0099CC' face=\"verdana\"><strong>" + L(111) + "\n" + kFieldTitleEnd;
    page += std::string(kLineOpen) + "  " + L(116) + "\t\t" +
            Format("%02d:%02d:%02d\n", info->hours, info->minutes, info->seconds);
    page += "  " + L(117) + "\t\t" + kbps(info->bitRate) + kFieldEnd;

    const std::size_t videos = info->videoStreams.size();
    for (std::size_t i = 0; i < videos; ++i) {
        const VideoStreamInfo& video = info->videoStreams[i];
        page += kFieldHead + L(112) + (videos > 1 ? " " + std::to_string(i) : "") + kFieldTitleEnd;
        page += std::string(kLineOpen) + "  " + L(115) + "\t\t" + EscapeHtml(video.codec) + "\n";
        if (video.width != 0) {
            page += "  " + L(118) + "\t\t" + Format("%dx%d\n", video.width, video.height);
        }
        if (video.bitRate != 0) {
            page += "  " + L(117) + "\t\t" + kbps(video.bitRate) + "\n";
        }
        page += "  " + L(119) + "\t" + Format("%0.2ffps", static_cast<double>(video.frameRate)) +
                kFieldEnd;
    }
    const std::size_t audios = info->audioStreams.size();
    if (audios == 0) {
        return page;
    }
    for (std::size_t i = 0; i < audios; ++i) {
        const AudioStreamInfo& audio = info->audioStreams[i];
        page += kFieldHead + L(113) + (audios > 1 ? " " + std::to_string(i) : "") + kFieldTitleEnd;
        page += std::string(kLineOpen) + "  " + L(115) + "\t\t" + EscapeHtml(audio.codec) + "\n";
        page += "  " + L(117) + "\t\t" + kbps(audio.bitRate) + "\n";
        page += "  " + L(120) + "\t" + Format("%dHz\n", audio.sampleRate);
        page += "  " + L(141) + "\t";
        if (audio.channels == 1) {
            page += L(142);
        } else if (audio.channels == 2) {
            page += L(143);
        } else {
            page += Format("%d ", audio.channels) + L(145);
        }
        page += kFieldEnd;
    }

    page += kFieldHead + L(229) + kFieldTitleEnd;
    const std::pair<std::uint32_t, const std::string*> tags[] = {
        {230, &info->title},      {231, &info->author},    {232, &info->album},
        {234, &info->year},       {235, &info->genre},     {236, &info->composer},
        {237, &info->origArtist}, {238, &info->copyright}, {239, &info->url},
        {240, &info->encodedBy}};
    for (const auto& [label, value] : tags) {
        page += std::string(kLineOpen) + "  " + L(label) + "\t\t" + EscapeHtml(*value) + "\n";
    }
    page += "  " + L(233) + "\t" + EscapeHtml(info->comment) + "\n\n" + kFieldEnd;

    const std::size_t data = info->dataStreams.size();
    for (std::size_t i = 0; i < data; ++i) {
        const DataStreamInfo& stream = info->dataStreams[i];
        page += "<u><font color='#000000' face=\"Tahoma\" size=2>" + L(114) +
                (data > 1 ? " " + std::to_string(i) : "") + "</font></u><br>";
        page += "<pre><font color='#000000'>  " + L(115) + " \t" + EscapeHtml(stream.codec);
        page += "  " + L(117) + "\t" + kbps(stream.bitRate) + "</font></pre></body><br>";
    }
    return page;
}

std::string FlattenLineBlocks(std::string_view page) {
    static constexpr std::string_view kOpen = "<pre><font color=\"#333333\" face=\"verdana\">";
    static constexpr std::string_view kClose = "</font></pre>";
    std::string out;
    out.reserve(page.size() + 256);
    bool open = false;
    std::size_t at = 0;
    while (at < page.size()) {
        const std::size_t nextOpen = page.find(kOpen, at);
        const std::size_t nextClose = page.find(kClose, at);
        if (nextOpen == std::string_view::npos && nextClose == std::string_view::npos) {
            out.append(page.substr(at));
            break;
        }
        if (nextClose < nextOpen) {
            out.append(page.substr(at, nextClose + kClose.size() - at));
            at = nextClose + kClose.size();
            open = false;
            continue;
        }
        out.append(page.substr(at, nextOpen - at));
        if (open) {
            out.append(kClose);
        }
        out.append(kOpen);
        at = nextOpen + kOpen.size();
        open = true;
    }
    return out;
}

bool WriteFileInfoPage(const std::string& path, const std::string& page) {
    std::error_code error;
    std::filesystem::create_directories(std::filesystem::path(path).parent_path(), error);
    const std::string temporary = path + ".part";
    {
        std::ofstream out(temporary, std::ios::binary | std::ios::trunc);
        if (!out.write(page.data(), static_cast<std::streamsize>(page.size())) || !out.flush()) {
            return false;
        }
    }
    std::filesystem::rename(temporary, path, error);
    if (error) {
        std::filesystem::remove(temporary, error);
        return false;
    }
    return true;
}

}  // namespace ac
