// The conversion list's window-free rules: names, the folder filter, positions, the volume
// text of Configure To All, the Target text and the file dialog's filter.
#include "medialist/MediaListRules.h"

#include <gtest/gtest.h>

#include <map>

namespace ac {
namespace {

TEST(MediaListRules, DisplayNameDropsOnlyAShortExtension) {
    EXPECT_EQ(GetDisplayName("/music/my.song.mp3"), "my.song");
    EXPECT_EQ(GetDisplayName("/music/track.backup"), "track.backup") << ".backup is 7 long";
    EXPECT_EQ(GetDisplayName("/music/clip.mpeg"), "clip") << ".mpeg is exactly 5";
    EXPECT_EQ(GetDisplayName("/music/noext"), "noext");
    EXPECT_EQ(GetDisplayName("C:\\Music\\old.wav"), "old") << "a Windows path from a cue sheet";
    EXPECT_EQ(GetDisplayName("/a.dir/file"), "file") << "a dot in a folder is not the name's";
    EXPECT_EQ(GetDisplayName("/music/.ogg"), "") << "a bare short extension leaves nothing";
    EXPECT_EQ(GetDisplayName("/music/AC\\DC live.flac"), "AC\\DC live") << "a Linux name may hold one";
}

TEST(MediaListRules, ExtensionIsTheTextBehindTheLastDot) {
    EXPECT_EQ(GetExtension("/music/my.song.MP3"), "MP3");
    EXPECT_EQ(GetExtension("/music/noext"), "/music/noext");
    EXPECT_EQ(GetExtension("/cd/album.cue|3"), "cue|3") << "a cue track keeps its number";
}

TEST(MediaListRules, FolderFilterTakesKnownMediaTypesInAnyCase) {
    for (const char* name : {"a.wav", "b.MP3", "c.Flac", "d.rmvb", "e.cue", "f.mpa", "x.y.ogg"}) {
        EXPECT_TRUE(IsFolderMediaName(name)) << name;
    }
    for (const char* name : {"notes.txt", "wav", "a.wav.bak", "cover.jpg", "a.mp1", "a.m4v"}) {
        EXPECT_FALSE(IsFolderMediaName(name)) << name;
    }
}

TEST(MediaListRules, PositionOutsideTheListMeansTheEnd) {
    EXPECT_EQ(ClampAddPosition(-1, 4), 4);
    EXPECT_EQ(ClampAddPosition(5, 4), 4);
    EXPECT_EQ(ClampAddPosition(4, 4), 4);
    EXPECT_EQ(ClampAddPosition(0, 4), 0);
    EXPECT_EQ(ClampAddPosition(0, 0), 0);
}

TEST(MediaListRules, VolumeTextRoundsTwiceTheVolumeUpToQuarters) {
    EXPECT_EQ(VolumePercentText(60), "125%");
    EXPECT_EQ(VolumePercentText(50), "100%");
    EXPECT_EQ(VolumePercentText(0), "0%");
    EXPECT_EQ(VolumePercentText(1), "25%");
    EXPECT_EQ(VolumePercentText(100), "200%");
    EXPECT_EQ(VolumePercentText(63), "150%");
}

TEST(MediaListRules, TargetTextLosesATrailingFormatWord) {
    EXPECT_EQ(TargetColumnText("MP3 Format"), "MP3");
    EXPECT_EQ(TargetColumnText("ogg FORMAT"), "ogg");
    EXPECT_EQ(TargetColumnText("Format"), "Format") << "no blank before it";
    EXPECT_EQ(TargetColumnText("Formatted"), "Formatted");
    EXPECT_EQ(TargetColumnText("WAV"), "WAV");
}

TEST(MediaListRules, OutputNameTrimsDotsAndAddsTheProfileExtension) {
    EXPECT_EQ(RowOutputFileName("..my.song.", "mp3"), "my.song.mp3");
    EXPECT_EQ(RowOutputFileName("Track 1", "flac"), "Track 1.flac");
    EXPECT_EQ(RowOutputFileName("...", "wav"), ".wav");
}

TEST(MediaListRules, BitRateBoxIsOffForLosslessTargets) {
    for (const char* ext : {"wav", "WAV", "ape", "Flac", "au"}) EXPECT_FALSE(BitRateAllowedFor(ext));
    for (const char* ext : {"mp3", "ogg", "wave", ""}) EXPECT_TRUE(BitRateAllowedFor(ext));
}

TEST(MediaListRules, OutputFolderTrimsSeparatorsButKeepsARoot) {
    EXPECT_EQ(TrimOutputDirectory("/home/me/Music//"), "/home/me/Music");
    EXPECT_EQ(TrimOutputDirectory("C:\\"), "C:\\");
    EXPECT_EQ(TrimOutputDirectory("/"), "/");
    EXPECT_EQ(TrimOutputDirectory("/ab/"), "/ab");
    EXPECT_EQ(TrimOutputDirectory(""), "");
}

TEST(MediaListRules, FilterHasALabelAndPatternsPerEntry) {
    std::map<std::uint32_t, int> asked;
    const std::string filter = OpenDialogFilter([&](std::uint32_t id) {
        ++asked[id];
        return id == kFilterLabelFirstId ? "Supported|Files" : "L" + std::to_string(id);
    });
    EXPECT_EQ(asked.size(), std::size_t(kFilterEntryCount));
    EXPECT_EQ(asked.begin()->first, kFilterLabelFirstId);
    std::vector<std::string> parts;
    std::size_t start = 0;
    for (std::size_t bar; (bar = filter.find('|', start)) != std::string::npos; start = bar + 1) {
        parts.push_back(filter.substr(start, bar - start));
    }
    parts.push_back(filter.substr(start));
    ASSERT_EQ(parts.size(), std::size_t(2 * kFilterEntryCount)) << "a bar in a label was kept";
    EXPECT_EQ(parts[0], "Supported/Files");
    EXPECT_NE(parts[1].find(";*m4v;"), std::string::npos);
    EXPECT_NE(parts[1].find("*.cda"), std::string::npos);
    EXPECT_EQ(parts[2 * 22 + 1], "*.wma;*.wmv;*.asf") << "no blanks between patterns";
    EXPECT_EQ(parts.back(), "*");

    // Extensions of the installed FFmpeg join the first entry once each; junk never splits it.
    const std::string wider = OpenDialogFilter([](std::uint32_t) { return std::string("L"); },
                                               {"mkv", "OPUS", "mp3", "a|b", "", "x;y", "aif"});
    const std::string all = wider.substr(2, wider.find('|', 2) - 2);
    EXPECT_NE(all.find(";*.mkv;*.opus;*.aif"), std::string::npos) << all;
    EXPECT_EQ(all.find("*.mp3"), all.rfind("*.mp3")) << "listed twice";
    EXPECT_EQ(std::count(wider.begin(), wider.end(), '|'), 2 * kFilterEntryCount - 1);
}

}  // namespace
}  // namespace ac
