// The start skin's pictures decoded ahead on a thread of their own read exactly as the ones
// decoded on demand (BMPs by the program's reader, PNGs with their alpha), and another skin's
// pictures of the same names load as ever. Runs under xvfb-run.

#include "../support/PackageDir.h"
#include "../support/WxTestApp.h"
#include "skin/SkinManager.h"
#include "skin/SkinPicture.h"

#include <wx/image.h>
#include <wx/mstream.h>

#include <gtest/gtest.h>

namespace ac {
namespace {

std::string Encoded(const wxImage& image, wxBitmapType type) {
    wxMemoryOutputStream out;
    EXPECT_TRUE(image.SaveFile(out, type));
    std::string bytes(out.GetSize(), '\0');
    out.CopyTo(bytes.data(), bytes.size());
    return bytes;
}

// Every pixel different, and a width whose rows need padding in a BMP.
wxImage Gradient(int width, int height) {
    wxImage image(width, height);
    for (int y = 0; y < height; ++y) {
        for (int x = 0; x < width; ++x) {
            image.SetRGB(x, y, static_cast<unsigned char>(x * 7), static_cast<unsigned char>(y * 11),
                         static_cast<unsigned char>(x * y));
        }
    }
    return image;
}

class SkinPrefetchTest : public test::PackageDir {
protected:
    static void SetUpTestSuite() {
        test::StartWx("skin_prefetch_tests");
        wxInitAllImageHandlers();
    }
    static void TearDownTestSuite() { test::StopWx(); }
    void TearDown() override { g_Skin.Reset(); }
};

TEST_F(SkinPrefetchTest, PicturesDecodedAheadMatchThoseDecodedOnDemand) {
    const wxImage odd = Gradient(13, 9);
    const wxImage wide = Gradient(40, 3);
    wxImage glyph = Gradient(6, 5);
    glyph.InitAlpha();
    glyph.SetAlpha(0, 0, 0);
    glyph.SetAlpha(5, 4, 128);
    WritePackage({{"skin/", ""},
                  {"skin/Default/", ""},
                  {"skin/Default/skin.ini", "[Main]\nName=Default\n"},
                  {"skin/Default/Odd.bmp", Encoded(odd, wxBITMAP_TYPE_BMP)},
                  {"skin/Default/wide.bmp", Encoded(wide, wxBITMAP_TYPE_BMP)},
                  {"skin/Default/glyph.png", Encoded(glyph, wxBITMAP_TYPE_PNG)},
                  {"skin/Other/", ""},
                  {"skin/Other/skin.ini", "[Main]\nName=Other\n"},
                  {"skin/Other/Odd.bmp", Encoded(wide, wxBITMAP_TYPE_BMP)}});
    // On demand first, as a reference.
    g_Skin.SetRoot(Logical("Skin"));
    ASSERT_TRUE(g_Skin.SetSkin("Other"));
    const wxImage otherOdd = LoadSkinPicture("Odd.bmp").image;
    ASSERT_TRUE(g_Skin.SetSkin("Default"));
    const wxImage demandOdd = LoadSkinPicture("odd.bmp").image;
    ASSERT_TRUE(demandOdd.IsOk());

    // Ahead: a fresh cache (another skin in between), the names spelt in another case.
    ASSERT_TRUE(g_Skin.SetSkin("Other"));
    PrefetchSkinPictures(Logical("Skin\\Default"));
    ASSERT_TRUE(g_Skin.SetSkin("Default"));
    const SkinPicture ahead = LoadSkinPicture("ODD.bmp");
    ASSERT_TRUE(ahead.IsOk());
    EXPECT_EQ(ahead.Width(), 13);
    EXPECT_EQ(ahead.Height(), 9);
    EXPECT_FALSE(ahead.image.HasAlpha());
    EXPECT_EQ(0, memcmp(ahead.image.GetData(), demandOdd.GetData(), 13 * 9 * 3));
    EXPECT_EQ(0, memcmp(ahead.image.GetData(), odd.GetData(), 13 * 9 * 3));
    const SkinPicture wideAhead = LoadSkinPicture("wide.bmp");
    EXPECT_EQ(0, memcmp(wideAhead.image.GetData(), wide.GetData(), 40 * 3 * 3));
    const SkinPicture png = LoadSkinPicture("glyph.png");
    ASSERT_TRUE(png.image.HasAlpha());
    EXPECT_TRUE(png.fromPng);
    EXPECT_EQ(png.image.GetAlpha(0, 0), 0);
    EXPECT_EQ(png.image.GetAlpha(5, 4), 128);
    EXPECT_EQ(0, memcmp(png.image.GetData(), glyph.GetData(), 6 * 5 * 3));
    // The other skin's picture of the same name is its own, not the one decoded ahead.
    ASSERT_TRUE(g_Skin.SetSkin("Other"));
    EXPECT_EQ(LoadSkinPicture("Odd.bmp").Width(), 40);
    EXPECT_EQ(0, memcmp(LoadSkinPicture("Odd.bmp").image.GetData(), otherOdd.GetData(), 40 * 3 * 3));
}

}  // namespace
}  // namespace ac
