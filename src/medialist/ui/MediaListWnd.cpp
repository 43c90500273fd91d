#include "medialist/ui/MediaListWnd.h"

#include "medialist/MediaListRules.h"
#include "medialist/ui/OutputPanelWnd.h"
#include "platform/UiQueue.h"
#include "shell/MainHub.h"
#include "skin/ListCtrl.h"

#include <wx/app.h>
#include <wx/thread.h>

#include <algorithm>

namespace ac {

CMediaListWnd* g_MediaList = nullptr;


CMediaListWnd::CMediaListWnd(wxWindow* parent)
    : ImSkinPanel(parent, 1001, "MediaList", kMediaListDialogId),
      m_timer(this, 1),
      m_alive(std::make_shared<CMediaListWnd*>(this)) {
    CreateControls();
    BindEvents();
    g_MediaList = this;
    OnLanguageChanged();
    m_timer.Start(1000);
}

CMediaListWnd::~CMediaListWnd() {
    m_timer.Stop();
    m_alive.reset();
    if (g_MediaList == this) {
        g_MediaList = nullptr;
    }
    RowList doomed;
    {
        std::lock_guard list(m_listLock);
        std::lock_guard model(m_modelMutex);
        doomed.swap(m_rows);
    }
}

// ---- IMediaList -------------------------------------------------------------------------

int CMediaListWnd::GetRowCount() {
    std::lock_guard model(m_modelMutex);
    return static_cast<int>(m_rows.size());
}

MediaItem* CMediaListWnd::GetItem(int row) {
    std::lock_guard model(m_modelMutex);
    if (row < 0 || row >= static_cast<int>(m_rows.size())) {
        return nullptr;
    }
    return m_rows[std::size_t(row)]->item.get();
}

bool CMediaListWnd::IsChecked(int row) {
    std::lock_guard model(m_modelMutex);
    return row >= 0 && row < static_cast<int>(m_rows.size()) && m_rows[std::size_t(row)]->checked;
}

bool CMediaListWnd::IsSelected(int row) {
    std::lock_guard model(m_modelMutex);
    return row >= 0 && row < static_cast<int>(m_rows.size()) &&
           m_rows[std::size_t(row)]->selected;
}

void CMediaListWnd::SelectOnly(int row) {
    // The model answers at once, so the driver's next IsSelected sees its choice; the window
    // follows when the UI thread gets to it.
    {
        std::lock_guard model(m_modelMutex);
        for (std::size_t i = 0; i < m_rows.size(); ++i) {
            m_rows[i]->selected = static_cast<int>(i) == row;
        }
    }
    if (wxThread::IsMain()) {
        ApplySelectOnly(row);
        return;
    }
    PostToUi([row](CMediaListWnd& self) { self.ApplySelectOnly(row); });
}

void CMediaListWnd::RefreshRow(int row) {
    if (wxThread::IsMain()) {
        DrawStatus(row);
        return;
    }
    PostToUi([row](CMediaListWnd& self) { self.DrawStatus(row); });
}

bool CMediaListWnd::TryLock() {
    return m_listLock.try_lock();
}

void CMediaListWnd::Unlock() {
    m_listLock.unlock();
}

std::string CMediaListWnd::GetOutputDirectory() {
    return g_OutputPanel != nullptr ? g_OutputPanel->GetOutputDirectory() : std::string();
}

void CMediaListWnd::EnableChecking(bool enable) {
    if (wxThread::IsMain()) {
        ApplyCheckingEnabled(enable);
        return;
    }
    PostToUi([enable](CMediaListWnd& self) { self.ApplyCheckingEnabled(enable); });
}

void CMediaListWnd::PostToUi(std::function<void(CMediaListWnd&)> call) {
    // A wxWeakRef would register itself with the window from the worker's thread; a weak
    // pointer to a token that the window drops on the UI thread needs no such step.
    std::weak_ptr<CMediaListWnd*> alive = m_alive;
    auto arrive = [alive, call = std::move(call)] {
        if (auto self = alive.lock()) {
            call(**self);
        }
    };
    if (UiQueue::HasPoster()) {
        UiQueue::Post(std::move(arrive));
    } else if (wxTheApp != nullptr) {
        wxTheApp->CallAfter(std::move(arrive));
    }
}

void CMediaListWnd::ApplySelectOnly(int row) {
    std::vector<char> wanted;
    {
        std::lock_guard model(m_modelMutex);
        for (const auto& r : m_rows) {
            wanted.push_back(r->selected ? 1 : 0);
        }
    }
    m_list->SelectRow(-1);
    for (std::size_t i = 0; i < wanted.size(); ++i) {
        if (wanted[i]) {
            m_list->SelectRow(static_cast<int>(i), false);
        }
    }
    if (row >= 0 && row < m_list->GetItemCount()) {
        NotifySelection(row, false);
    }
}

void CMediaListWnd::ApplyCheckingEnabled(bool enable) {
    m_checkingEnabled = enable;
    for (int row = 0; row < m_list->GetItemCount(); ++row) {
        MediaItem* item = GetItem(row);
        if (item != nullptr && item->Status() != JobStatus::Paused) {
            m_list->SetEnabled(row, enable);
        }
    }
}

// ---- Model changes ----------------------------------------------------------------------

int CMediaListWnd::InsertRow(int position, std::unique_ptr<MediaItem> item,
                             const std::string& name, const std::string& type) {
    auto row = std::make_unique<Row>();
    row->item = std::move(item);
    {
        std::lock_guard list(m_listLock);
        std::lock_guard model(m_modelMutex);
        position = ClampAddPosition(position, static_cast<int>(m_rows.size()));
        m_rows.insert(m_rows.begin() + position, std::move(row));
    }
    m_list->InsertItem(position, "");
    m_list->SetEnabled(position, m_checkingEnabled);
    m_list->SetCheckbox(position, kColCheck, 1);
    MediaItem* added = GetItem(position);
    char duration[32];
    std::snprintf(duration, sizeof duration, "%02d:%02d:%02d", added->info.hours,
                  added->info.minutes, added->info.seconds);
    m_list->SetItemText(position, kColName, name);
    m_list->SetItemText(position, kColDuration, duration);
    m_list->SetItemText(position, kColType, type);
    DrawStatus(position);
    RefreshTarget(position);
    return position;
}

CMediaListWnd::RowList CMediaListWnd::TakeRows(const std::vector<int>& rows) {
    RowList taken;
    {
        std::lock_guard list(m_listLock);
        std::lock_guard model(m_modelMutex);
        // From the back, so the indices still to come stay valid.
        for (auto it = rows.rbegin(); it != rows.rend(); ++it) {
            taken.push_back(std::move(m_rows[std::size_t(*it)]));
            m_rows.erase(m_rows.begin() + *it);
        }
    }
    m_list->Freeze();
    for (auto it = rows.rbegin(); it != rows.rend(); ++it) {
        m_list->DeleteItem(*it);
    }
    m_list->Thaw();
    return taken;
}

// ---- Mode switches ----------------------------------------------------------------------

void CMediaListWnd::OnHidePanel() {
    for (int row = 1; row < m_list->GetItemCount(); ++row) {
        if (m_list->IsSelected(row)) {
            GetItem(row)->reselect = 1;
            SetRowSelected(row, false);
        }
    }
}

void CMediaListWnd::OnShowPanel() {
    for (int row = 0; row < m_list->GetItemCount(); ++row) {
        MediaItem* item = GetItem(row);
        if (item != nullptr && item->reselect.exchange(0) != 0) {
            SetRowSelected(row, true);
        }
    }
}

void CMediaListWnd::SetRowSelected(int row, bool select) {
    {
        std::lock_guard model(m_modelMutex);
        m_rows[std::size_t(row)]->selected = select;
    }
    if (select) {
        m_list->SelectRow(row, false);
    } else {
        // The control can only add to its selection; rebuild it without this row.
        std::vector<int> keep;
        for (int i = 0; i < m_list->GetItemCount(); ++i) {
            if (i != row && m_list->IsSelected(i)) {
                keep.push_back(i);
            }
        }
        m_list->SelectRow(-1);
        for (int i : keep) {
            m_list->SelectRow(i, false);
        }
    }
}

// ---- Inspection -------------------------------------------------------------------------

std::vector<MediaItem*> CMediaListWnd::Items() {
    std::lock_guard model(m_modelMutex);
    std::vector<MediaItem*> items;
    for (const auto& row : m_rows) {
        items.push_back(row->item.get());
    }
    return items;
}

std::string CMediaListWnd::DescribeRows() const {
    std::string out;
    std::lock_guard model(m_modelMutex);
    for (int row = 0; row < m_list->GetItemCount() && row < static_cast<int>(m_rows.size());
         ++row) {
        const XListCell* status = m_list->Cell(row, kColStatus);
        std::string statusText = status->text;
        if (status->bProgress) {
            statusText = status->progressFormat.empty()
                             ? std::to_string(status->nProgressPercent) + "%"
                             : status->progressFormat;
        }
        out += "row=" + m_list->GetItemText(row, kColName) + "|" +
               m_list->GetItemText(row, kColDuration) + "|" + m_list->GetItemText(row, kColType) +
               "|" + m_list->GetItemText(row, kColTarget) + "|" + statusText + "|" +
               (m_list->GetCheckbox(row, kColCheck) == 1 ? "1" : "0") + "|" +
               (m_list->IsSelected(row) ? "1" : "0") + "|" +
               m_rows[std::size_t(row)]->item->sourcePath + "\n";
    }
    return out;
}

}  // namespace ac
