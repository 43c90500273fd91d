// Pictures out of the package: the image rule and the fall-backs for missing or damaged files.

#include "../support/PackageDir.h"
#include "skin/SkinManager.h"
#include "skin/SkinPicture.h"

#include <wx/image.h>
#include <wx/init.h>
#include <wx/mstream.h>

#include <gtest/gtest.h>

namespace ac {
namespace {

std::string PngBytes(int w, int h, bool alpha) {
    wxImage image(w, h);
    image.SetRGB(wxRect(0, 0, w, h), 10, 20, 30);
    if (alpha) {
        image.InitAlpha();
        image.SetAlpha(0, 0, 0);
    }
    wxMemoryOutputStream out;
    image.SaveFile(out, wxBITMAP_TYPE_PNG);
    std::string bytes(out.GetSize(), '\0');
    out.CopyTo(bytes.data(), bytes.size());
    return bytes;
}

class SkinPictureTest : public test::PackageDir {
protected:
    static void SetUpTestSuite() {
        wxInitialize();
        wxInitAllImageHandlers();
    }
    static void TearDownTestSuite() { wxUninitialize(); }
};

TEST_F(SkinPictureTest, PngKeepsAlphaAndDamagedPicturesReadAsMissing) {
    std::string damaged = PngBytes(8, 8, false);
    damaged.resize(damaged.size() / 2);
    WritePackage({{"skin/", ""},
                  {"skin/Default/", ""},
                  {"skin/Default/skin.ini", "[Main]\nName=x\n"},
                  {"skin/Default/ok.png", PngBytes(8, 6, true)},
                  {"skin/Default/bad.png", damaged},
                  {"skin/Default/text.bmp", "not a picture at all"}});
    const wxImage ok = LoadImageResource(Logical("Skin\\Default\\ok.png"));
    ASSERT_TRUE(ok.IsOk());
    EXPECT_EQ(ok.GetWidth(), 8);
    EXPECT_TRUE(ok.HasAlpha());
    EXPECT_FALSE(LoadImageResource(Logical("Skin\\Default\\bad.png")).IsOk());
    EXPECT_FALSE(LoadImageResource(Logical("Skin\\Default\\text.bmp")).IsOk());
    EXPECT_FALSE(LoadImageResource(Logical("Skin\\Default\\missing.png")).IsOk());
}

TEST_F(SkinPictureTest, CornerPictureThatIsNotA24BitBmpGivesNoShape) {
    wxImage image(4, 4);
    wxMemoryOutputStream out;
    image.SaveFile(out, wxBITMAP_TYPE_PNG);
    std::string png(out.GetSize(), '\0');
    out.CopyTo(png.data(), png.size());
    WritePackage({{"skin/", ""}, {"skin/Default/", ""}, {"skin/Default/corner.bmp", png}});
    EXPECT_TRUE(LoadRegionResource(Logical("Skin\\Default\\corner.bmp")).empty());
    EXPECT_TRUE(LoadRegionResource(Logical("Skin\\Default\\gone.bmp")).empty());
}

}  // namespace
}  // namespace ac
