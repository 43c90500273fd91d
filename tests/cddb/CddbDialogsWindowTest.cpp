// The CDDB dialogs on a real display: the server list keeps its first entry and stores what the
// user leaves, the choice among matches takes the first row unless another is picked, and the
// lookup dialog drops the worker's late posts once it is gone. Runs under xvfb-run.

#include "cddb/ui/CddbAddrDlg.h"
#include "cddb/ui/CddbSelectDlg.h"
#include "cddb/ui/CddbWaitDlg.h"
#include "platform/UiQueue.h"
#include "skin/UiQueueWx.h"

#include <wx/app.h>
#include <wx/evtloop.h>

#include <gtest/gtest.h>

#include <map>

#include "../support/CddbTestServer.h"
#include "../support/WxTestApp.h"

namespace ac {
namespace {

class CddbDialogsTest : public ::testing::Test {
protected:
    static void SetUpTestSuite() {
        test::StartWx("cddb_dialogs");
        InstallWxUiQueue();
    }
    static void TearDownTestSuite() {
        UiQueue::SetPoster(nullptr);
        test::StopWx();
    }

    ServerListStore Store() {
        return {[this](const char* key) { return ints[key]; },
                [this](const char* key) { return strings[key]; },
                [this](const char* key, int value) { ints[key] = value; },
                [this](const char* key, const std::string& value) { strings[key] = value; }};
    }

    std::map<std::string, int> ints;
    std::map<std::string, std::string> strings;
};

TEST_F(CddbDialogsTest, TheServerListKeepsItsFirstEntryAndStoresTheRest) {
    {
        CCDDBAddr dialog(nullptr, Store());
        EXPECT_EQ(dialog.Entries(), (std::vector<std::string>{"gnudb.gnudb.org & 80"}));
        dialog.Add("127.0.0.1", "8880");
        dialog.Add("", "80");             // both boxes must hold text
        dialog.Add("evil & host", "80");  // the separator cannot stand in a part
        dialog.Add("freedb.example", "8080");
        dialog.Select(0);
        EXPECT_FALSE(dialog.CanDelete());
        dialog.DeleteSelected();
        dialog.Select(1);
        EXPECT_TRUE(dialog.CanDelete());
        dialog.DeleteSelected();
    }
    EXPECT_EQ(ints["addrcount"], 2);
    EXPECT_EQ(strings["addr0"], "gnudb.gnudb.org & 80");
    EXPECT_EQ(strings["addr1"], "freedb.example & 8080");

    CCDDBAddr again(nullptr, Store());
    EXPECT_EQ(again.Entries(),
              (std::vector<std::string>{"gnudb.gnudb.org & 80", "freedb.example & 8080"}));
}

TEST_F(CddbDialogsTest, TheChoiceTakesThePickedRowOrTheFirst) {
    const std::vector<std::string> rows = {"rock 1 A / B", "misc 1 C / D\x01", "jazz 1 E / F"};
    CCddbSelectDlg picked(nullptr, rows);
    wxTheApp->CallAfter([&] { picked.ChooseRow(2); });
    picked.ShowModal();
    EXPECT_EQ(picked.Chosen(), 2);

    CCddbSelectDlg cancelled(nullptr, rows);
    wxTheApp->CallAfter([&] { cancelled.EndModal(wxID_CANCEL); });
    cancelled.ShowModal();
    EXPECT_EQ(cancelled.Chosen(), 0);
}

TEST_F(CddbDialogsTest, CancelLeavesTheWorkerNothingToTouch) {
    test::CddbTestServer server;
    server.Next(test::CddbMisbehaviour::Silent);
    LookupJob job;
    job.settings.host = cddb::ParseHostSetting(server.HostSetting());
    job.settings.timeoutMs = 30000;
    job.readToc = [](cddb::DiscToc& toc) {
        toc = {cddb::TocPosition::FromFrames(150), cddb::TocPosition::FromFrames(20000)};
        return true;
    };
    cddb::CDDiscInfo record;
    record.trackCount = 1;
    record.titles = {"stale"};
    // Cancel as soon as the query is on its way; the dialog is gone before the worker ends.
    wxTheApp->CallAfter([] {
        if (CCddbWaitDlg* dialog = CCddbWaitDlg::Shown())
            dialog->PressCancel();
    });
    const auto started = std::chrono::steady_clock::now();
    RunLookupDialog(nullptr, job, record);
    EXPECT_EQ(record.trackCount, 0) << "a cancelled lookup gives an empty record";
    JoinAbandonedLookups();
    EXPECT_LT(std::chrono::steady_clock::now() - started, std::chrono::seconds(5));
    // The worker's last posts arrive now and find no dialog.
    wxEventLoopBase* loop = wxEventLoopBase::GetActive();
    if (loop != nullptr)
        loop->YieldFor(wxEVT_CATEGORY_ALL);
    wxTheApp->ProcessPendingEvents();
    EXPECT_EQ(CCddbWaitDlg::Shown(), nullptr);
}

}  // namespace
}  // namespace ac
