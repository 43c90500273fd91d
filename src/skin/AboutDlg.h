#pragma once
// ImAboutDlg: the program's name, version, legal notice and website. With a picture path set,
// the picture fills the window and the three lines stand at its foot.
//
// Thread contract: UI thread only.

#include "skin/ChooseSkinDlg.h"

#include <wx/image.h>

#include <string>

namespace ac {

// What the dialog shows of the program; the skin engine knows no settings, so the caller fills
// it in.
struct AboutInfo {
    std::string productName;
    std::string companyFullName;
    std::string website;
    std::string versionSetting;  // the setting `version`, empty when unset
    std::string fileVersion;     // "major.minor.patch[.build]"
};

// "1.2.3.45" gives "1.2.3  build-45"; a text without '.' stands as it is; an empty setting takes
// the four numbers of the file version.
std::string AboutVersionText(const std::string& versionSetting, const std::string& fileVersion);

class ImAboutDlg : public ImDialog {
public:
    static constexpr int kDialogId = 10000;
    static constexpr int kOkId = 1;
    static constexpr int kVersionId = 101;
    static constexpr int kLegalId = 102;
    static constexpr int kLinkId = 103;
    static constexpr int kFrameId = 104;
    static constexpr int kIconId = 108;

    ImAboutDlg(wxWindow* parent, AboutInfo info);
    void InitDialog() override;
    int DoModal();

    // A logical resource path or a file on disk; PNG is stretched, anything else tiled.
    std::string m_imagePath;
    wxImage m_image;
    bool m_bImageIsPng = false;

private:
    void PlaceLabelsOverPicture();
    bool LoadPicture();
    void OnPaint(wxPaintEvent& event);

    AboutInfo m_info;
    bool m_started = false;
};

}  // namespace ac
