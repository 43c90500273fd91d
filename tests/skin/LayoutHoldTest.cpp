// Held layouts on real windows: nothing is placed while the hold lasts, and on release each
// window is laid out once, the frame before the panels it sizes. Runs under xvfb-run.

#include "../support/WxTestApp.h"
#include "skin/SkinDialog.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

namespace ac {
namespace {

std::vector<std::string> g_layouts;

class CountingPanel : public ImSkinPanel {
public:
    CountingPanel(wxWindow* parent, std::string name)
        : ImSkinPanel(parent, wxID_ANY, "Test", 0), m_name(std::move(name)) {}
    void DoRecalcLayout() override {
        ImSkinPanel::DoRecalcLayout();
        g_layouts.push_back(m_name + "@" + std::to_string(GetSize().x));
    }

private:
    std::string m_name;
};

class CountingFrame : public ImSkinFrame {
public:
    CountingFrame() : ImSkinFrame("frame", 0) {}
    void DoRecalcLayout() override {
        ImSkinFrame::DoRecalcLayout();
        g_layouts.push_back("frame");
        if (m_panel != nullptr) {
            m_panel->SetSize(0, 0, GetClientSize().x / 2, 50);
        }
    }
    CountingPanel* m_panel = nullptr;
};

class LayoutHoldTest : public ::testing::Test {
protected:
    static void SetUpTestSuite() { test::StartWx("layout_hold_tests"); }
    static void TearDownTestSuite() { test::StopWx(); }
};

TEST_F(LayoutHoldTest, HeldLayoutsRunOnceOnReleaseFramesFirst) {
    auto* frame = new CountingFrame();
    frame->SetSize(400, 300);
    ImSkinDialog::HoldLayouts();
    ImSkinDialog::HoldLayouts();
    auto* panel = new CountingPanel(frame, "panel");
    auto* loose = new CountingPanel(frame, "loose");
    frame->m_panel = panel;
    g_layouts.clear();
    panel->RecalcLayout();
    panel->SetSize(10, 10, 30, 30);  // a size event asks too
    loose->RecalcLayout();
    frame->RecalcLayout();
    frame->RecalcLayout();
    EXPECT_TRUE(g_layouts.empty());
    ImSkinDialog::ReleaseLayouts();  // the inner release of a nested hold
    EXPECT_TRUE(g_layouts.empty());

    // A window that goes while held is not laid out afterwards.
    auto* gone = new CountingPanel(frame, "gone");
    gone->RecalcLayout();
    delete gone;

    ImSkinDialog::ReleaseLayouts();
    const int half = frame->GetClientSize().x / 2;
    EXPECT_EQ(g_layouts, (std::vector<std::string>{"frame", "panel@" + std::to_string(half),
                                                    "loose@10"}));
    // Released, a layout runs at once again.
    g_layouts.clear();
    loose->RecalcLayout();
    EXPECT_EQ(g_layouts, std::vector<std::string>{"loose@10"});
    frame->Destroy();
}

}  // namespace
}  // namespace ac
