// XListCtrl's per-cell operations and its header check box, on a real window. Runs under
// xvfb-run.

#include "../support/WxTestApp.h"
#include "skin/ListCtrl.h"

#include <wx/app.h>
#include <wx/frame.h>
#include <wx/init.h>

#include <gtest/gtest.h>

namespace ac {
namespace {

class ListCtrlTest : public ::testing::Test {
protected:
    static void SetUpTestSuite() {
        test::StartWx("list_tests");
    }
    static void TearDownTestSuite() { test::StopWx(); }

    void SetUp() override {
        m_frame = new wxFrame(nullptr, wxID_ANY, "list");
        m_list = new XListCtrl(m_frame, wxID_ANY);
        m_list->InsertColumn(0, "File", 200, true);
        m_list->InsertColumn(1, "Progress", 100);
        m_frame->Bind(EVT_XLIST_HEADER_CHECK, [this](wxCommandEvent& event) {
            m_notices.emplace_back(event.GetInt(), static_cast<int>(event.GetExtraLong()));
        });
        for (int i = 0; i < 3; ++i) {
            m_list->InsertItem(i, "row " + std::to_string(i));
            m_list->SetCheckbox(i, 0, 0);
        }
    }
    void TearDown() override { m_frame->Destroy(); }

    wxFrame* m_frame = nullptr;
    XListCtrl* m_list = nullptr;
    std::vector<std::pair<int, int>> m_notices;
};

TEST_F(ListCtrlTest, OperationsOutsideTheListFailAndChangeNothing) {
    EXPECT_FALSE(m_list->SetItemText(3, 0, "x"));
    EXPECT_FALSE(m_list->SetItemText(0, 2, "x"));
    EXPECT_FALSE(m_list->SetItemText(-1, 0, "x"));
    EXPECT_FALSE(m_list->SetCheckbox(5, 0, 1));
    EXPECT_FALSE(m_list->SetProgress(0, 9));
    EXPECT_FALSE(m_list->UpdateProgress(0, 1, 50)) << "no bar was set on that cell";
    EXPECT_FALSE(m_list->DeleteItem(3));
    EXPECT_EQ(m_list->GetCheckbox(9, 0), -1);
    EXPECT_EQ(m_list->GetCurSel(), -1);
    EXPECT_EQ(m_list->GetItemText(0, 0), "row 0");
    EXPECT_TRUE(m_list->SetProgress(0, 1));
    EXPECT_TRUE(m_list->UpdateProgress(0, 1, 150));
    EXPECT_EQ(m_list->Cell(0, 1)->nProgressPercent, 100);
}

TEST_F(ListCtrlTest, HeaderBoxChecksEveryRowAndFollowsTheRows) {
    m_list->ToggleHeaderCheck(0);
    ASSERT_EQ(m_notices.size(), 1u);
    EXPECT_EQ(m_notices[0], std::make_pair(0, 2));
    for (int row = 0; row < 3; ++row) {
        EXPECT_EQ(m_list->GetCheckbox(row, 0), 1);
    }
    m_list->SetCheckbox(1, 0, 0);
    EXPECT_EQ(m_list->GetHeaderCheck(0), 1) << "one unchecked row unchecks the header";
    m_list->SetCheckbox(1, 0, 1);
    EXPECT_EQ(m_list->GetHeaderCheck(0), 2);
    m_list->DeleteAllItems();
    EXPECT_EQ(m_list->GetHeaderCheck(0), 1) << "deleting the last row unchecks it";
    m_list->ToggleHeaderCheck(0);
    EXPECT_EQ(m_list->GetHeaderCheck(0), 1) << "an empty list cannot be checked";
    m_list->ToggleHeaderCheck(1);
    EXPECT_EQ(m_notices.size(), 2u) << "a column without a box sends nothing";
}

TEST_F(ListCtrlTest, TenThousandRowsKeepTheirCells) {
    for (int i = 3; i < 10000; ++i) {
        m_list->InsertItem(i, "row " + std::to_string(i));
    }
    EXPECT_EQ(m_list->GetItemCount(), 10000);
    m_list->SelectRow(9999);
    EXPECT_EQ(m_list->GetCurSel(), 9999);
    EXPECT_TRUE(m_list->DeleteItem(0));
    EXPECT_EQ(m_list->GetItemText(0, 0), "row 1");
    EXPECT_EQ(m_list->GetCurSel(), 9998) << "the selection moves with its row";
}

}  // namespace
}  // namespace ac
