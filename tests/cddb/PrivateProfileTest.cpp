#include "cddb/PrivateProfile.h"

#include <gtest/gtest.h>

using cddb::PrivateProfile;

namespace {

TEST(PrivateProfileTest, LenientReadingRules) {
    PrivateProfile profile;
    profile.LoadText(
        "Stray=above every section\n"
        "; ARITIST=commented out\n"
        "  [ cdinfo ]  \r\n"
        "a line without an equals sign\n"
        "  aritist  =  Nightwish  \r\n"
        "ARITIST=second one loses\n"
        "Empty=\n"
        "[MUSIC\n"
        "total=3\r"
        "Track00=Nemo\n");
    EXPECT_EQ(profile.GetString("CDINFO", "ARITIST"), "Nightwish");
    EXPECT_EQ(profile.GetString("CDINFO", "Empty", "default"), "");
    EXPECT_EQ(profile.GetString("CDINFO", "Missing", "default"), "default");
    EXPECT_EQ(profile.GetString("Nowhere", "ARITIST", "default"), "default");
    EXPECT_EQ(profile.GetString("CDINFO", "Stray"), "");
    EXPECT_EQ(profile.GetInt("MUSIC", "Total"), 3) << "a header without ']' and a lone CR";
    EXPECT_EQ(profile.GetString("music", "TRACK00"), "Nemo");
    EXPECT_EQ(profile.GetInt("MUSIC", "Track00", 7), 0);
    EXPECT_EQ(profile.GetInt("MUSIC", "Track01", 7), 7);
}

TEST(PrivateProfileTest, NulBytesEndLinesAndOtherCodePagesBecomeUtf8) {
    PrivateProfile profile;
    constexpr char kUnixForm[] = "[CDINFO]\0\nALBUM=Once\0\nYEAR=2004\0\n";
    profile.LoadText(std::string(kUnixForm, sizeof kUnixForm - 1));
    EXPECT_EQ(profile.GetString("CDINFO", "ALBUM"), "Once");
    EXPECT_EQ(profile.GetString("CDINFO", "YEAR"), "2004");

    // Windows-1252, as a Windows program wrote it; the UTF-8 byte order mark is no part of a name.
    profile.LoadText("[CDINFO]\r\nARITIST=Die \xC4rzte \x96 Live\r\n");
    EXPECT_EQ(profile.GetString("CDINFO", "ARITIST"), "Die \xC3\x84rzte \xE2\x80\x93 Live");
    profile.LoadText("\xEF\xBB\xBF[CDINFO]\nALBUM=Once\n");
    EXPECT_EQ(profile.GetString("CDINFO", "ALBUM"), "Once");
}

}  // namespace
