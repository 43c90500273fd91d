// The file information page, byte for byte, for files made at test time and probed as the list
// probes them (a WAV with one audio stream, a video with two video streams and no sound), the
// channel wordings, and the escaping of everything that comes from the file: markup, scripts,
// remote pictures, invalid UTF-8 and a tag of 100,000 characters.

#include "panels/FileInfoPage.h"

#include "medialist/MediaProbe.h"
#include "resources/BuiltinStrings.h"

#include "../support/AudioFixtures.h"
#include "../support/TempDir.h"

#include <gtest/gtest.h>

#include <algorithm>

namespace ac {
namespace {

std::string English(std::uint32_t id) {
    return std::string(BuiltinString(id));
}

// The pieces as the page is built of them, so the expected pages below read as the layout does.
const std::string kHead =
    "<fieldset style=\"width:95%;font-size:10px\" align=\"center\"><legend>"
    "<font color='#0099CC' face=\"verdana\"><strong>";
const std::string kTitleEnd = "</strong></font></legend>";
const std::string kLine = "<pre><font color=\"#333333\" face=\"verdana\">";
const std::string kEnd = "</font></pre></fieldset>";

std::string Top(const std::string& name, const std::string& duration, const std::string& kbps) {
    return "<body bgcolor='#F3F6FA'><p><b><font color='#0000' face=\"Tahoma\" size=1>" + name +
           "</font></b></p><fieldset style=\"width:95%;font-size:10px\" align=\"center\">"
           "<legend><font color='#0099CC' face=\"verdana\"><strong>Summary:\n" +
           kTitleEnd + kLine + "  Duration:\t\t" + duration + "\n  Bit rate:\t\t" + kbps + kEnd;
}

std::string EmptyTags() {
    std::string tags = kHead + "Context" + kTitleEnd;
    for (const char* label : {"Title:", "Aritist:", "Album:", "Year:", "Genre:", "Composer:",
                              "Origaritist:", "Copyright:", "URL:", "Encodeby:"}) {
        tags += kLine + "  " + label + "\t\t\n";
    }
    return tags + "  Comment:\t\n\n" + kEnd;
}

class FileInfoPageTest : public ::testing::Test {
protected:
    test::TempDir m_dir;
};

TEST_F(FileInfoPageTest, WithoutARowThePageIsTheBareBackground) {
    EXPECT_EQ(BuildFileInfoPage(nullptr, "#F3F6FA", English), "<body bgcolor='#F3F6FA'></body>");
    EXPECT_EQ(BuildFileInfoPage(nullptr, "", English), "<body bgcolor=''></body>");
}

TEST_F(FileInfoPageTest, WavWithOneAudioStream) {
    const std::string path = m_dir / "tone.wav";
    test::WriteWav(path, test::MakeNoise(44100 * 3, 1));
    MediaFileInfo info;
    ASSERT_EQ(ProbeFile(path, info), 1);
    const std::string expected = Top("tone", "00:00:03", "1411kbps") + kHead +
                                 "Audio:" + kTitleEnd + kLine +
                                 "  Format:\t\tpcm_s16le\n  Bit rate:\t\t1411kbps\n"
                                 "  Sample rate:\t44100Hz\n  Channels:\t2 (Stereo)" +
                                 kEnd + EmptyTags();
    EXPECT_EQ(BuildFileInfoPage(&info, "#F3F6FA", English), expected);
}

TEST_F(FileInfoPageTest, VideoWithTwoVideoStreamsAndNoSound) {
    const std::string path = m_dir / "two views.mkv";
    ASSERT_TRUE(
        test::RunFfmpeg("-f lavfi -i testsrc=size=320x240:rate=25:duration=2 -f lavfi -i "
                        "testsrc=size=160x120:rate=10:duration=2 -map 0:v -map 1:v "
                        "-c:v mpeg4 '" +
                        path + "'"));
    MediaFileInfo info;
    ASSERT_EQ(ProbeFile(path, info), 1);
    ASSERT_EQ(info.videoStreams.size(), 2u);
    const std::string page = BuildFileInfoPage(&info, "#F3F6FA", English);
    // The overall bit rate depends on the encoder's whims; everything else is fixed.
    const std::string kbps = std::to_string(info.bitRate / 1000) + "kbps";
    const std::string expected =
        Top("two views", "00:00:02", kbps) + kHead + "Video: 0" + kTitleEnd + kLine +
        "  Format:\t\tmpeg4\n  Size:\t\t320x240\n  Frame rate:\t25.00fps" + kEnd + kHead +
        "Video: 1" + kTitleEnd + kLine +
        "  Format:\t\tmpeg4\n  Size:\t\t160x120\n  Frame rate:\t10.00fps" + kEnd;
    EXPECT_EQ(page, expected);
}

TEST_F(FileInfoPageTest, StreamLinesFollowWhatIsKnown) {
    MediaFileInfo info;
    info.path = "/music/Live Set.mka";
    info.hours = 1;
    info.minutes = 2;
    info.seconds = 3;
    info.bitRate = -1;
    info.videoStreams.push_back({"h264 (hq)", 0, 0, 0.0f, 0});
    info.audioStreams.push_back({"aac", 1, 96000, 48000});
    info.audioStreams.push_back({"ac3", 6, 448000, 48000});
    info.dataStreams.push_back({"bin_data", 1000});
    const std::string page = BuildFileInfoPage(&info, "#F3F6FA", English);
    const std::string expected =
        Top("Live Set", "01:02:03", "0kbps") + kHead + "Video:" + kTitleEnd + kLine +
        "  Format:\t\th264 (hq)\n  Frame rate:\t0.00fps" + kEnd + kHead + "Audio: 0" + kTitleEnd +
        kLine + "  Format:\t\taac\n  Bit rate:\t\t96kbps\n  Sample rate:\t48000Hz\n" +
        "  Channels:\t1 (Mono)" + kEnd + kHead + "Audio: 1" + kTitleEnd + kLine +
        "  Format:\t\tac3\n  Bit rate:\t\t448kbps\n  Sample rate:\t48000Hz\n" +
        "  Channels:\t6 Channels" + kEnd + EmptyTags() +
        "<u><font color='#000000' face=\"Tahoma\" size=2>Data:</font></u><br>"
        "<pre><font color='#000000'>  Format: \tbin_data  Bit rate:\t1kbps</font></pre></body><br>";
    EXPECT_EQ(page, expected);
}

TEST_F(FileInfoPageTest, TextsFromTheFileAreEscapedAndThePageStaysAscii) {
    MediaFileInfo info;
    info.path = "/in/<u>x & y.mp3";
    info.audioStreams.push_back({"mp3<i>", 2, 128000, 44100});
    info.title = "<img src=\"http://example.com/x.png\">";
    info.author = "<script>alert('x')</script>";
    info.album = "Caf\xC3\xA9 \xE2\x82\xAC \xF0\x9F\x8E\xB5";
    info.genre = "bad \xFF\xFE bytes \xC3";
    info.comment = std::string(100000, 'w') + "<";
    const std::string page = BuildFileInfoPage(&info, "#F3F6FA", English);
    EXPECT_EQ(page.find("<img"), std::string::npos);
    EXPECT_EQ(page.find("<script"), std::string::npos);
    EXPECT_EQ(page.find("<u>x"), std::string::npos);
    EXPECT_NE(page.find("size=1>&lt;u&gt;x &amp; y</font>"), std::string::npos);
    EXPECT_NE(page.find("mp3&lt;i&gt;"), std::string::npos);
    EXPECT_NE(page.find("&lt;img src=&quot;http://example.com/x.png&quot;&gt;"), std::string::npos);
    EXPECT_NE(page.find("&lt;script&gt;alert(&#39;x&#39;)&lt;/script&gt;"), std::string::npos);
    EXPECT_NE(page.find("Caf&#233; &#8364; &#127925;"), std::string::npos);
    EXPECT_NE(page.find("bad &#65533;&#65533; bytes &#65533;"), std::string::npos);
    EXPECT_NE(page.find(std::string(100000, 'w') + "&lt;\n\n"), std::string::npos);
    EXPECT_TRUE(std::all_of(page.begin(), page.end(),
                            [](char c) { return static_cast<unsigned char>(c) < 0x80; }));
    // Language texts pass the same way: a translation cannot break the page either.
    const std::string german = BuildFileInfoPage(&info, "#FFF", [](std::uint32_t id) {
        return id == 111 ? std::string(
                               "\xC3\x9C"
                               "bersicht & mehr:")
                         : English(id);
    });
    EXPECT_NE(german.find("<strong>&#220;bersicht &amp; mehr:\n</strong>"), std::string::npos);
}

TEST_F(FileInfoPageTest, NestedLineBlocksAreLaidOutOneAfterAnother) {
    MediaFileInfo info;
    info.path = "/a/b.mp3";
    info.title = "T";
    info.audioStreams.push_back({"mp3", 2, 128000, 44100});
    const std::string page = BuildFileInfoPage(&info, "#FFF", English);
    const std::string flat = FlattenLineBlocks(page);
    auto count = [](const std::string& text, const std::string& what) {
        std::size_t n = 0;
        for (auto at = text.find(what); at != std::string::npos; at = text.find(what, at + 1)) {
            ++n;
        }
        return n;
    };
    // Every line block is closed in the flat page; the tag lines after the first gained one.
    EXPECT_EQ(count(flat, kLine), count(flat, "</font></pre>"));
    EXPECT_EQ(count(flat, "</font></pre>"), count(page, "</font></pre>") + 9);
    EXPECT_NE(flat.find(kLine + "  Title:\t\tT\n</font></pre>" + kLine + "  Aritist:"),
              std::string::npos);
    EXPECT_EQ(FlattenLineBlocks(flat), flat);
    EXPECT_EQ(FlattenLineBlocks("<body bgcolor='#FFF'></body>"), "<body bgcolor='#FFF'></body>");
}

TEST_F(FileInfoPageTest, PageIsReplacedWholeAndItsFolderMade) {
    const std::string path = m_dir / "help/tempfile.htm";
    ASSERT_TRUE(WriteFileInfoPage(path, "<body bgcolor='#F3F6FA'></body>"));
    EXPECT_EQ(test::ReadFile(path), "<body bgcolor='#F3F6FA'></body>");
    ASSERT_TRUE(WriteFileInfoPage(path, "second"));
    EXPECT_EQ(test::ReadFile(path), "second");
    EXPECT_FALSE(std::filesystem::exists(path + ".part"));
    EXPECT_FALSE(WriteFileInfoPage("/proc/no/such/help/tempfile.htm", "x"));
}

}  // namespace
}  // namespace ac
