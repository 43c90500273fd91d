// PropertiesCtrl on a real window: limits, rows, folding, editors and the order of the change
// notification. Runs under xvfb-run.

#include "../../support/WxTestApp.h"
#include "profile/grid/PropertiesCtrl.h"

#include "profile/grid/PropertyTree.h"

#include <wx/app.h>
#include <wx/frame.h>
#include <wx/init.h>
#include <wx/textctrl.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <functional>

namespace ac {
namespace {

// Records what the notifications saw at the moment they ran.
class RecordingCtrl : public PropertiesCtrl {
public:
    using PropertiesCtrl::PropertiesCtrl;
    void OnPropertyChanged(const PropertyIterator& item) override {
        changes.push_back(GetLabel(item) + "=" + GetValueText(item));
        if (onChange) {
            onChange(item);
        }
    }
    void OnSelectionChanged(const PropertyIterator& item) override {
        selections.push_back(item.IsValid() ? GetLabel(item) : "-");
    }
    std::vector<std::string> changes;
    std::vector<std::string> selections;
    std::function<void(const PropertyIterator&)> onChange;
};

class PropertiesCtrlTest : public ::testing::Test {
protected:
    static void SetUpTestSuite() {
        test::StartWx("grid_tests");
    }
    static void TearDownTestSuite() { test::StopWx(); }

    void SetUp() override {
        m_frame = new wxFrame(nullptr, wxID_ANY, "grid", wxDefaultPosition, wxSize(500, 400));
        m_grid = new RecordingCtrl(m_frame, wxID_ANY);
        m_frame->Show();
        m_audio = m_grid->AddCategory(1, "Audio", "How the sound is coded");
        m_bitrate = m_grid->AddItem(m_audio, 10, "Bitrate", PropertyKind::Int, "128",
                                    "Kilobits a second", "edit");
        m_mode = m_grid->AddItem(m_audio, 11, "Mode", PropertyKind::Text, "Joint", "Channels",
                                 "list");
        for (const char* mode : {"Stereo", "Joint", "Mono"}) {
            m_grid->AddOption(m_mode, mode);
        }
        m_tags = m_grid->AddCategory(2, "Tags", "");
        m_title = m_grid->AddItem(m_tags, 20, "Title", PropertyKind::Text, "", "", "edit");
        m_grid->changes.clear();
        m_grid->selections.clear();
    }
    void TearDown() override { m_frame->Destroy(); }

    std::vector<std::string> Labels(const std::vector<PropertyIterator>& rows) const {
        std::vector<std::string> labels;
        for (const auto& row : rows) {
            labels.push_back(m_grid->GetLabel(row));
        }
        return labels;
    }

    void PressKey(wxWindow* window, int keyCode) {
        wxKeyEvent key(wxEVT_KEY_DOWN);
        key.m_keyCode = keyCode;
        key.SetEventObject(window);
        window->GetEventHandler()->ProcessEvent(key);
    }

    void Mouse(wxWindow* window, wxEventType type, int x, int y, bool leftDown) {
        wxMouseEvent mouse(type);
        mouse.m_x = x;
        mouse.m_y = y;
        mouse.m_leftDown = leftDown;
        mouse.SetEventObject(window);
        window->GetEventHandler()->ProcessEvent(mouse);
    }
    // The middle of a visible row, in the tree's coordinates.
    int RowMiddle(const PropertyIterator& row) {
        const auto rows = m_grid->VisibleRows();
        const int index = static_cast<int>(std::find(rows.begin(), rows.end(), row) - rows.begin());
        return index * m_grid->Tree()->RowHeight() + m_grid->Tree()->RowHeight() / 2;
    }

    wxFrame* m_frame = nullptr;
    RecordingCtrl* m_grid = nullptr;
    PropertyIterator m_audio, m_bitrate, m_mode, m_tags, m_title;
};

TEST_F(PropertiesCtrlTest, HelpPaneAndLabelColumnStayWithinTheirLimits) {
    m_grid->ShowComment(true);
    const int height = m_grid->GetClientSize().GetHeight();
    ASSERT_GT(height, 200);
    EXPECT_EQ(m_grid->GetCommentHeight(), 40);
    EXPECT_EQ(m_grid->SetCommentHeight(10), 25);
    EXPECT_EQ(m_grid->SetCommentHeight(1000), height - 25);
    EXPECT_EQ(m_grid->SetCommentHeight(120), 120);
    EXPECT_EQ(m_grid->Tree()->GetSize().GetHeight(), height - 120) << "the tree gives way";
    m_grid->ShowComment(false);
    EXPECT_EQ(m_grid->Tree()->GetSize().GetHeight(), height);

    EXPECT_EQ(m_grid->GetLabelColumnWidth(), 150);
    EXPECT_EQ(m_grid->SetLabelColumnWidth(5), 20);
    const int widest = m_grid->Tree()->GetClientSize().GetWidth() - 16 - 20;
    EXPECT_EQ(m_grid->SetLabelColumnWidth(5000), widest);
    EXPECT_EQ(m_grid->SetLabelColumnWidth(90), 90);
}

TEST_F(PropertiesCtrlTest, GridLineColourKeepsHueAtLightness192UnlessExact) {
    m_grid->SetGridLineColor(wxColour(255, 0, 0), false);
    EXPECT_EQ(m_grid->GetGridLineColor(), wxColour(255, 129, 129));
    m_grid->SetGridLineColor(wxColour(100, 100, 100), false);
    EXPECT_EQ(m_grid->GetGridLineColor(), wxColour(192, 192, 192));
    m_grid->SetGridLineColor(wxColour(10, 20, 30), true);
    EXPECT_EQ(m_grid->GetGridLineColor(), wxColour(10, 20, 30));
}

TEST_F(PropertiesCtrlTest, EveryEditorNameIsRegisteredAndUnknownNamesAreNot) {
    for (const char* name :
         {"list", "editlist", "customlist", "edit", "editspin", "editpwd", "button", "editbutton",
          "popup", "editpopup", "fontbutton", "datetime", "hotkey", "checkbox", "multicheckbox",
          "radiobutton", "slider", "slideredit", "multilineedit"}) {
        EXPECT_NE(m_grid->FindEditor(name), nullptr) << name;
    }
    EXPECT_EQ(m_grid->FindEditor("combo"), nullptr);
    EXPECT_EQ(m_grid->FindEditor(""), nullptr);
    const auto bare = m_grid->AddItem(m_tags, 21, "Bare", PropertyKind::Text, "x", "", "combo");
    m_grid->Select(bare);
    EXPECT_EQ(m_grid->Tree()->EditorNode(), nullptr) << "no editor, nothing opens";
    EXPECT_FALSE(m_grid->CommitEditText("y"));
    EXPECT_EQ(m_grid->GetValueText(bare), "x");
}

TEST_F(PropertiesCtrlTest, CommitAnnouncesOnlyAChangedTextAndTheRowAlreadyHoldsIt) {
    m_grid->Select(m_bitrate);
    EXPECT_FALSE(m_grid->CommitEditText("128"));
    EXPECT_TRUE(m_grid->changes.empty()) << "typing the same text raises nothing";
    EXPECT_TRUE(m_grid->CommitEditText("192"));
    ASSERT_EQ(m_grid->changes, std::vector<std::string>{"Bitrate=192"});
    EXPECT_TRUE(m_grid->CommitEditText(" 256 kbps"));
    EXPECT_EQ(m_grid->Tree()->OpenEditText()->GetValue(), "256") << "the edit shows the form";
    EXPECT_FALSE(m_grid->CommitEditText("256")) << "the normalised text is the same value";
    EXPECT_FALSE(m_grid->CommitEditText("fast")) << "unreadable text leaves the value";
    EXPECT_EQ(m_grid->GetValueText(m_bitrate), "256");
    EXPECT_EQ(m_grid->changes.size(), 2u);
}

TEST_F(PropertiesCtrlTest, ListStepsThroughOptionsAndStopsAtTheEnds) {
    m_grid->Select(m_mode);
    EXPECT_TRUE(m_grid->StepListValue(WXK_DOWN));
    EXPECT_EQ(m_grid->GetValueText(m_mode), "Mono");
    EXPECT_FALSE(m_grid->StepListValue(WXK_DOWN)) << "Down on the last option";
    EXPECT_TRUE(m_grid->StepListValue(WXK_HOME));
    EXPECT_FALSE(m_grid->StepListValue(WXK_UP)) << "Up on the first option";
    EXPECT_FALSE(m_grid->StepListValue(WXK_HOME));
    EXPECT_TRUE(m_grid->StepListValue(WXK_END));
    EXPECT_EQ(m_grid->changes,
              (std::vector<std::string>{"Mode=Mono", "Mode=Stereo", "Mode=Mono"}));
    m_grid->SetValueText(m_mode, "Surround");
    EXPECT_TRUE(m_grid->StepListValue(WXK_DOWN)) << "a text that is no option goes to the first";
    EXPECT_EQ(m_grid->GetValueText(m_mode), "Stereo");
    EXPECT_FALSE(m_grid->CommitEditText("Mono")) << "a plain list has no edit";
}

TEST_F(PropertiesCtrlTest, BoolListWithoutOptionsOffersFalseAndTrue) {
    const auto flag = m_grid->AddItem(m_audio, 14, "Flag", PropertyKind::Bool, "1", "", "list");
    EXPECT_EQ(m_grid->GetValueText(flag), "True");
    m_grid->Select(flag);
    EXPECT_FALSE(m_grid->StepListValue(WXK_DOWN));
    EXPECT_TRUE(m_grid->StepListValue(WXK_UP));
    EXPECT_EQ(m_grid->changes, std::vector<std::string>{"Flag=False"});
}

TEST_F(PropertiesCtrlTest, EditListTakesFreeTextAndStepsOptions) {
    const auto rate = m_grid->AddItem(m_audio, 12, "Rate", PropertyKind::Text, "44100", "",
                                      "editlist");
    for (const char* option : {"22050", "44100", "48000"}) {
        m_grid->AddOption(rate, option);
    }
    m_grid->Select(rate);
    EXPECT_TRUE(m_grid->StepListValue(WXK_UP));
    EXPECT_EQ(m_grid->Tree()->OpenEditText()->GetValue(), "22050") << "the edit follows at once";
    EXPECT_TRUE(m_grid->CommitEditText("32000"));
    EXPECT_EQ(m_grid->GetValueText(rate), "32000");
    EXPECT_TRUE(m_grid->StepListValue(WXK_DOWN));
    EXPECT_EQ(m_grid->GetValueText(rate), "22050");
    EXPECT_EQ(m_grid->changes,
              (std::vector<std::string>{"Rate=22050", "Rate=32000", "Rate=22050"}));
}

TEST_F(PropertiesCtrlTest, DisabledRowShowsItsValueAndOpensNoEditor) {
    m_grid->SetEnabled(m_bitrate, false);
    m_grid->SetEnabled(m_mode, false);
    m_grid->Select(m_bitrate);
    EXPECT_FALSE(m_grid->CommitEditText("320"));
    m_grid->Select(m_mode);
    EXPECT_FALSE(m_grid->StepListValue(WXK_DOWN));
    EXPECT_EQ(m_grid->GetValueText(m_bitrate), "128");
    EXPECT_EQ(m_grid->GetValueText(m_mode), "Joint");
    EXPECT_TRUE(m_grid->changes.empty());

    m_grid->SetEnabled(m_mode, true);
    EXPECT_TRUE(m_grid->StepListValue(WXK_DOWN)) << "enabling the selected row opens its editor";
    m_grid->Select(m_bitrate);
    m_grid->SetEnabled(m_bitrate, true);
    m_grid->SetEnabled(m_bitrate, false);
    EXPECT_EQ(m_grid->Tree()->EditorNode(), nullptr) << "disabling closes an open editor";
}

TEST_F(PropertiesCtrlTest, EditCommitsWhenItLosesTheFocusAndOnEnter) {
    m_grid->Select(m_bitrate);
    wxTextCtrl* edit = m_grid->Tree()->OpenEditText();
    ASSERT_NE(edit, nullptr);
    edit->ChangeValue("160");
    wxCommandEvent enter(wxEVT_TEXT_ENTER, edit->GetId());
    enter.SetEventObject(edit);
    edit->GetEventHandler()->ProcessEvent(enter);
    EXPECT_EQ(m_grid->changes, std::vector<std::string>{"Bitrate=160"});
    edit->ChangeValue("224");
    wxFocusEvent lost(wxEVT_KILL_FOCUS, edit->GetId());
    lost.SetEventObject(edit);
    edit->GetEventHandler()->ProcessEvent(lost);
    EXPECT_EQ(m_grid->GetValueText(m_bitrate), "224");
    edit->ChangeValue("320");
    m_grid->Select(m_title);
    EXPECT_EQ(m_grid->GetValueText(m_bitrate), "320") << "leaving the row commits as well";
    EXPECT_EQ(m_grid->changes.size(), 3u);
}

TEST_F(PropertiesCtrlTest, OpenEditFollowsValuesSetByTheClient) {
    m_grid->Select(m_bitrate);
    m_grid->SetValueText(m_bitrate, "64");
    EXPECT_EQ(m_grid->Tree()->OpenEditText()->GetValue(), "64");
    EXPECT_FALSE(m_grid->Tree()->CommitOpenEdit()) << "a stale edit text would write back 128";
    EXPECT_EQ(m_grid->GetValueText(m_bitrate), "64");
}

TEST_F(PropertiesCtrlTest, FoldingACategoryHidesItsRowsAndMovesTheSelectionUp) {
    EXPECT_EQ(Labels(m_grid->VisibleRows()),
              (std::vector<std::string>{"Audio", "Bitrate", "Mode", "Tags", "Title"}));
    m_grid->Select(m_mode);
    m_grid->SetExpanded(m_audio, false);
    EXPECT_EQ(Labels(m_grid->VisibleRows()), (std::vector<std::string>{"Audio", "Tags", "Title"}));
    EXPECT_EQ(m_grid->GetSelection(), m_audio);
    EXPECT_EQ(m_grid->AllRows().size(), 5u) << "folded rows still exist";
    m_grid->Select(m_bitrate);
    EXPECT_EQ(m_grid->VisibleRows().size(), 5u) << "selecting a hidden row unfolds its parent";
}

TEST_F(PropertiesCtrlTest, ArrowKeysMoveTheSelectionAndFoldCategories) {
    m_grid->SelectFirst();
    EXPECT_EQ(m_grid->GetSelection(), m_audio);
    PressKey(m_grid->Tree(), WXK_DOWN);
    PressKey(m_grid->Tree(), WXK_DOWN);
    EXPECT_EQ(m_grid->GetSelection(), m_mode);
    PressKey(m_grid->Tree(), WXK_LEFT);
    EXPECT_EQ(m_grid->GetSelection(), m_audio) << "Left on a leaf goes to its parent";
    PressKey(m_grid->Tree(), WXK_LEFT);
    EXPECT_EQ(m_grid->VisibleRows().size(), 3u);
    PressKey(m_grid->Tree(), WXK_END);
    EXPECT_EQ(m_grid->GetSelection(), m_title);
    EXPECT_EQ(m_grid->selections,
              (std::vector<std::string>{"Audio", "Bitrate", "Mode", "Audio", "Title"}));
}

TEST_F(PropertiesCtrlTest, SelectingARowBelowTheFoldScrollsItIntoView) {
    for (int id = 200; id < 260; ++id) {
        m_grid->AddItem(m_tags, id, "Row " + std::to_string(id), PropertyKind::Int, "0", "", "edit");
    }
    EXPECT_EQ(m_grid->Tree()->GetScrollPos(wxVERTICAL), 0);
    m_grid->Select(m_grid->FindById(259));
    const int top = m_grid->Tree()->GetScrollPos(wxVERTICAL);
    EXPECT_GT(top, 0);
    const int pageRows = m_grid->Tree()->GetClientSize().GetHeight() / m_grid->Tree()->RowHeight();
    EXPECT_EQ(top, static_cast<int>(m_grid->VisibleRows().size()) - pageRows)
        << "the last row sits at the bottom edge";
    m_grid->SelectFirst();
    EXPECT_EQ(m_grid->Tree()->GetScrollPos(wxVERTICAL), 0);
}

// The in-place editors are made with the first editor opened, and wear the colours the grid
// was given before that.
TEST_F(PropertiesCtrlTest, EditorsAreMadeWhenFirstOpenedInTheGridsColours) {
    EXPECT_TRUE(m_grid->Tree()->GetChildren().empty()) << "no native box before an editor opens";
    m_grid->SetTextColour2(wxColour(0x20, 0x30, 0x40));
    m_grid->SetBackgroundColour2(wxColour(0xF0, 0xE0, 0xD0), *wxWHITE);
    m_grid->Select(m_bitrate);
    wxTextCtrl* edit = m_grid->Tree()->OpenEditText();
    ASSERT_NE(edit, nullptr);
    EXPECT_EQ(edit->GetForegroundColour(), wxColour(0x20, 0x30, 0x40));
    EXPECT_EQ(edit->GetBackgroundColour(), wxColour(0xF0, 0xE0, 0xD0));
    EXPECT_FALSE(m_grid->Tree()->GetChildren().empty());
}

// Rows added out of sight leave the scroll bar alone until the grid shows; then it spans them.
TEST_F(PropertiesCtrlTest, AGridFilledWhileHiddenSetsItsScrollBarWhenItShows) {
    m_grid->Hide();
    for (int id = 200; id < 260; ++id) {
        m_grid->AddItem(m_tags, id, "Row " + std::to_string(id), PropertyKind::Int, "0", "", "edit");
    }
    const int rows = static_cast<int>(m_grid->VisibleRows().size());
    m_grid->Show();
    m_grid->Tree()->Update();
    for (int i = 0; i < 2000 && m_grid->Tree()->GetScrollRange(wxVERTICAL) != rows; ++i) {
        wxTheApp->ProcessPendingEvents();
        wxTheApp->Yield(true);
    }
    EXPECT_EQ(m_grid->Tree()->GetScrollRange(wxVERTICAL), rows);
    m_grid->Select(m_grid->FindById(259));
    EXPECT_GT(m_grid->Tree()->GetScrollPos(wxVERTICAL), 0);
}

TEST_F(PropertiesCtrlTest, ClicksSelectFoldAndOpenTheEditor) {
    wxWindow* tree = m_grid->Tree();
    Mouse(tree, wxEVT_LEFT_DOWN, 40, RowMiddle(m_audio), true);
    EXPECT_EQ(m_grid->GetSelection(), m_audio);
    EXPECT_EQ(m_grid->VisibleRows().size(), 3u) << "a click on a category folds it";
    Mouse(tree, wxEVT_LEFT_DOWN, 40, RowMiddle(m_audio), true);
    EXPECT_EQ(m_grid->VisibleRows().size(), 5u);

    Mouse(tree, wxEVT_LEFT_DOWN, 40, RowMiddle(m_bitrate), true);
    EXPECT_EQ(m_grid->GetSelection(), m_bitrate);
    EXPECT_NE(wxWindow::FindFocus(), m_grid->Tree()->OpenEditText()) << "the label keeps focus";
    const int valueX = m_grid->Tree()->ValueLeft() + 10;
    Mouse(tree, wxEVT_LEFT_DOWN, valueX, RowMiddle(m_title), true);
    EXPECT_EQ(m_grid->GetSelection(), m_title);
    ASSERT_NE(m_grid->Tree()->OpenEditText(), nullptr);
    EXPECT_TRUE(m_grid->Tree()->OpenEditText()->IsShown());
}

TEST_F(PropertiesCtrlTest, DraggingTheColumnEdgeAndTheGripGoesThroughTheLimits) {
    wxWindow* tree = m_grid->Tree();
    const int edge = 16 + 1 + m_grid->GetLabelColumnWidth();
    Mouse(tree, wxEVT_LEFT_DOWN, edge, RowMiddle(m_bitrate), true);
    Mouse(tree, wxEVT_MOTION, 16 + 1 + 100, RowMiddle(m_bitrate), true);
    EXPECT_EQ(m_grid->GetLabelColumnWidth(), 100);
    Mouse(tree, wxEVT_MOTION, 2, RowMiddle(m_bitrate), true);
    EXPECT_EQ(m_grid->GetLabelColumnWidth(), 20);
    Mouse(tree, wxEVT_LEFT_UP, 2, RowMiddle(m_bitrate), false);
    Mouse(tree, wxEVT_MOTION, 16 + 1 + 150, RowMiddle(m_bitrate), false);
    EXPECT_EQ(m_grid->GetLabelColumnWidth(), 20) << "the drag ended with the release";

    m_grid->ShowComment(true);
    const int height = m_grid->GetClientSize().GetHeight();
    const int gripTop = height - m_grid->GetCommentHeight();
    Mouse(m_grid, wxEVT_LEFT_DOWN, 50, gripTop + 2, true);
    Mouse(m_grid, wxEVT_MOTION, 50, gripTop - 60, true);
    EXPECT_EQ(m_grid->GetCommentHeight(), 40 + 62);
    Mouse(m_grid, wxEVT_MOTION, 50, -500, true);
    EXPECT_EQ(m_grid->GetCommentHeight(), height - 25);
    Mouse(m_grid, wxEVT_MOTION, 50, height + 500, true);
    EXPECT_EQ(m_grid->GetCommentHeight(), 25);
    Mouse(m_grid, wxEVT_LEFT_UP, 50, height, false);
}

TEST_F(PropertiesCtrlTest, ToolTipsNameTheRowUnderTheMouseOnlyWhenEnabled) {
    wxWindow* tree = m_grid->Tree();
    Mouse(tree, wxEVT_MOTION, 40, RowMiddle(m_bitrate), false);
    EXPECT_TRUE(tree->GetToolTipText().empty());
    m_grid->EnableToolTips(true);
    Mouse(tree, wxEVT_MOTION, 40, RowMiddle(m_bitrate), false);
    EXPECT_EQ(tree->GetToolTipText(), "Bitrate: 128");
    Mouse(tree, wxEVT_MOTION, 40, RowMiddle(m_tags), false);
    EXPECT_EQ(tree->GetToolTipText(), "Tags");
    m_grid->EnableToolTips(false);
    EXPECT_TRUE(tree->GetToolTipText().empty());
}

TEST_F(PropertiesCtrlTest, DropDownCommitsTheChosenLineAndEscapeKeepsTheValue) {
    m_grid->Select(m_mode);
    m_grid->Tree()->FocusEditor();
    wxWindow* list = wxWindow::FindFocus();
    ASSERT_NE(list, nullptr);
    PressKey(list, WXK_F4);
    PressKey(list, WXK_DOWN);
    PressKey(list, WXK_ESCAPE);
    EXPECT_EQ(m_grid->GetValueText(m_mode), "Joint") << "closing without commit";
    PressKey(list, WXK_F4);
    PressKey(list, WXK_DOWN);
    PressKey(list, WXK_RETURN);
    EXPECT_EQ(m_grid->GetValueText(m_mode), "Mono");
    PressKey(list, WXK_F4);
    PressKey(list, WXK_RETURN);
    EXPECT_EQ(m_grid->changes, std::vector<std::string>{"Mode=Mono"})
        << "choosing the line of the current value raises nothing";
    PressKey(list, WXK_UP);
    EXPECT_EQ(m_grid->GetValueText(m_mode), "Joint") << "closed, the arrows step the value";
}

TEST_F(PropertiesCtrlTest, ChangingTheSelectedRowsEditorSwapsTheOpenWindow) {
    m_grid->Select(m_title);
    ASSERT_NE(m_grid->Tree()->OpenEditText(), nullptr);
    m_grid->SetEditor(m_title, m_grid->FindEditor("list"));
    EXPECT_EQ(m_grid->Tree()->OpenEditText(), nullptr) << "a plain list has no edit";
    EXPECT_EQ(m_grid->Tree()->EditorNode(), m_title.Node());
    m_grid->SetEditor(m_title, nullptr);
    EXPECT_EQ(m_grid->Tree()->EditorNode(), nullptr);
    m_grid->SetEditor(m_title, m_grid->FindEditor("editlist"));
    EXPECT_TRUE(m_grid->CommitEditText("Intro"));
    EXPECT_EQ(m_grid->changes, std::vector<std::string>{"Title=Intro"});
}

TEST_F(PropertiesCtrlTest, NestedRowsFoldUnderTheirItemAndRemovingASiblingKeepsTheSelection) {
    const auto low = m_grid->AddItem(m_bitrate, 30, "Low", PropertyKind::Int, "32", "", "edit");
    m_grid->AddItem(low, 31, "Floor", PropertyKind::Int, "8", "", "edit");
    EXPECT_EQ(Labels(m_grid->VisibleRows()),
              (std::vector<std::string>{"Audio", "Bitrate", "Low", "Floor", "Mode", "Tags",
                                        "Title"}));
    m_grid->SetExpanded(m_bitrate, false);
    EXPECT_EQ(Labels(m_grid->VisibleRows()),
              (std::vector<std::string>{"Audio", "Bitrate", "Mode", "Tags", "Title"}));
    m_grid->SetExpanded(m_bitrate, true);
    m_grid->SetExpanded(low, false);
    EXPECT_EQ(m_grid->VisibleRows().size(), 6u);
    m_grid->Select(m_mode);
    m_grid->Remove(m_bitrate);
    EXPECT_EQ(m_grid->GetSelection(), m_mode);
    EXPECT_EQ(m_grid->ChildCount(m_audio), 1);
    EXPECT_TRUE(m_grid->StepListValue(WXK_DOWN)) << "its editor stayed open";
}

TEST_F(PropertiesCtrlTest, RemovingTakesChildrenAlongAndForgetsTheSelection) {
    const auto nested = m_grid->AddItem(m_bitrate, 13, "Minimum", PropertyKind::Int, "32", "");
    EXPECT_EQ(m_grid->ChildCount(m_bitrate), 1);
    EXPECT_EQ(m_grid->ChildCount(m_audio), 2);
    EXPECT_EQ(m_grid->ChildCount(PropertyIterator()), 2) << "the root holds the categories";
    m_grid->Select(nested);
    EXPECT_EQ(m_grid->FindById(13), nested);
    m_grid->Remove(m_audio);
    EXPECT_FALSE(m_grid->FindById(13).IsValid());
    EXPECT_FALSE(m_grid->FindById(10).IsValid());
    EXPECT_FALSE(m_grid->GetSelection().IsValid());
    EXPECT_EQ(m_grid->selections.back(), "-");
    EXPECT_EQ(Labels(m_grid->AllRows()), (std::vector<std::string>{"Tags", "Title"}));
    m_grid->RemoveAll();
    EXPECT_TRUE(m_grid->AllRows().empty());
    EXPECT_TRUE(m_grid->VisibleRows().empty());
    EXPECT_EQ(m_grid->ChildCount(PropertyIterator()), 0);
}

TEST_F(PropertiesCtrlTest, ValuesRoundTripThroughTheControlByKind) {
    struct Case {
        PropertyKind kind;
        const char* text;
        const char* shown;
    };
    const Case cases[] = {{PropertyKind::Bool, "True", "True"},
                          {PropertyKind::UShort, "70000", "65535"},
                          {PropertyKind::Char, "Q", "Q"},
                          {PropertyKind::Float, "0.5", "0.50"},
                          {PropertyKind::Text, "a;b", "a;b"}};
    int id = 100;
    for (const Case& item : cases) {
        const auto row = m_grid->AddItem(m_tags, ++id, "row", item.kind, "", "", "edit");
        m_grid->SetValueText(row, item.text);
        EXPECT_EQ(m_grid->GetValueText(row), item.shown);
        EXPECT_EQ(m_grid->GetId(m_grid->FindById(id)), id);
    }
    EXPECT_TRUE(m_grid->changes.empty()) << "the client's own writes raise nothing";
}

TEST_F(PropertiesCtrlTest, ClientMayRebuildTheRowsInsideTheNotification) {
    m_grid->onChange = [this](const PropertyIterator& item) {
        EXPECT_EQ(m_grid->GetSelection(), item);
        m_grid->RemoveAll();
        m_grid->AddCategory(3, "Rebuilt", "");
    };
    m_grid->Select(m_bitrate);
    EXPECT_TRUE(m_grid->CommitEditText("96"));
    EXPECT_EQ(Labels(m_grid->AllRows()), std::vector<std::string>{"Rebuilt"});
    EXPECT_FALSE(m_grid->CommitEditText("97")) << "the editor went with its row";
}

}  // namespace
}  // namespace ac
