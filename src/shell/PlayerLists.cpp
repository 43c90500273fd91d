#include "shell/PlayerLists.h"

#include "burn/ui/CDCreatorPanel.h"
#include "convert/MediaItem.h"
#include "medialist/ui/MediaListWnd.h"
#include "rip/ui/RipPanel.h"

namespace ac {
namespace {

class ConvertRows final : public IPreviewList {
public:
    int RowCount() override { return g_MediaList != nullptr ? g_MediaList->GetRowCount() : 0; }
    int FirstSelected() override {
        return g_MediaList != nullptr ? g_MediaList->GetFirstSelected() : -1;
    }
    void MarkRow(int row, bool selected) override {
        if (g_MediaList == nullptr || row < 0 || row >= RowCount()) {
            return;
        }
        // The list selects one row at a time here: the row that follows replaces it.
        if (selected) {
            g_MediaList->SelectOnly(row);
        }
    }
    std::string RowPath(int row) override {
        MediaItem* item = g_MediaList != nullptr ? g_MediaList->GetItem(row) : nullptr;
        return item != nullptr ? item->sourcePath : std::string();
    }
    bool CanPlay(int row) override {
        MediaItem* item = g_MediaList != nullptr ? g_MediaList->GetItem(row) : nullptr;
        return item != nullptr && item->Status() != JobStatus::UnknownFile;
    }
    double RowSeconds(int row) override {
        MediaItem* item = g_MediaList != nullptr ? g_MediaList->GetItem(row) : nullptr;
        if (item == nullptr) {
            return 0;
        }
        return item->info.hours * 3600.0 + item->info.minutes * 60.0 + item->info.seconds;
    }
};

class RipTracks final : public IPreviewList {
public:
    int RowCount() override { return g_RipDlg != nullptr ? g_RipDlg->RowCount() : 0; }
    int FirstSelected() override {
        for (int row = 0; row < RowCount(); ++row) {
            if (g_RipDlg->IsSelected(row)) {
                return row;
            }
        }
        return -1;
    }
    void MarkRow(int row, bool selected) override {
        if (g_RipDlg != nullptr && selected && row >= 0 && row < RowCount()) {
            g_RipDlg->ClickRow(row);
        }
    }
    std::string RowPath(int row) override {
        RipTrackItem* item = g_RipDlg != nullptr ? g_RipDlg->Item(row) : nullptr;
        return item != nullptr ? item->sourcePath : std::string();
    }
    // The drive is the rip's while it runs.
    bool CanPlay(int row) override {
        return g_RipDlg != nullptr && g_RipDlg->Item(row) != nullptr &&
               !g_RipDlg->Driver().IsRunning();
    }
    double RowSeconds(int row) override {
        RipTrackItem* item = g_RipDlg != nullptr ? g_RipDlg->Item(row) : nullptr;
        return item != nullptr ? item->duration : 0.0;
    }
};

class BurnRows final : public IPreviewList {
public:
    int RowCount() override { return g_CreatorPanel != nullptr ? g_CreatorPanel->RowCount() : 0; }
    int FirstSelected() override {
        return g_CreatorPanel != nullptr ? g_CreatorPanel->FirstSelectedRow() : -1;
    }
    void MarkRow(int row, bool selected) override {
        if (g_CreatorPanel != nullptr && selected && row >= 0 && row < RowCount()) {
            g_CreatorPanel->SelectRows({row});
        }
    }
    std::string RowPath(int row) override {
        MediaItem* item = Item(row);
        return item != nullptr ? item->sourcePath : std::string();
    }
    bool CanPlay(int row) override {
        MediaItem* item = Item(row);
        return item != nullptr && item->Status() != JobStatus::UnknownFile;
    }
    double RowSeconds(int row) override {
        MediaItem* item = Item(row);
        if (item == nullptr) {
            return 0;
        }
        return item->info.hours * 3600.0 + item->info.minutes * 60.0 + item->info.seconds;
    }

private:
    static MediaItem* Item(int row) {
        return g_CreatorPanel != nullptr && row >= 0 && row < g_CreatorPanel->RowCount()
                   ? g_CreatorPanel->Item(row)
                   : nullptr;
    }
};

}  // namespace

IPreviewList& ConvertPreviewList() {
    static ConvertRows rows;
    return rows;
}

IPreviewList& RipPreviewList() {
    static RipTracks tracks;
    return tracks;
}

IPreviewList& BurnPreviewList() {
    static BurnRows rows;
    return rows;
}

}  // namespace ac
