// The conversion list's commands: remove, clear, check and select, Configure To All, their
// enable rules, and what profiles and the side bar do to the rows' sets.
#include "convert/RowParameters.h"
#include "medialist/MediaListRules.h"
#include "medialist/ui/MediaListWnd.h"
#include "profile/ParameterSet.h"
#include "shell/MainHub.h"
#include "skin/ListCtrl.h"

#include <algorithm>

namespace ac {

namespace {

// Gives a row another set. An existing RowParameters keeps its address, because the progress
// display reads the cut through it without the list lock. The caller holds the list lock.
RowParameters& AssignSet(MediaItem& item, std::unique_ptr<ParameterSet> set) {
    if (RowParameters* params = RowParametersOf(item)) {
        params->Replace(std::move(set));
        return *params;
    }
    auto params = std::make_unique<RowParameters>(std::move(set));
    RowParameters& kept = *params;
    item.parameters = std::move(params);
    return kept;
}

}  // namespace

// ---- Commands ---------------------------------------------------------------------------

bool CMediaListWnd::AnyRowActive() const {
    std::lock_guard model(m_modelMutex);
    return std::any_of(m_rows.begin(), m_rows.end(), [](const auto& row) {
        const JobStatus status = row->item->Status();
        return status == JobStatus::Running || status == JobStatus::Paused ||
               status == JobStatus::Pending;
    });
}

void CMediaListWnd::Remove() {
    std::vector<int> selected;
    for (int row = 0; row < m_list->GetItemCount(); ++row) {
        if (m_list->IsSelected(row)) {
            selected.push_back(row);
        }
    }
    if (selected.empty()) {
        return;
    }
    RowList doomed = TakeRows(selected);
    doomed.clear();
    FitColumns();
    if (IMainHub* hub = GetMainHub()) {
        hub->ShowFileInfo(nullptr);
        hub->OnListSelectionChanged(-1);
    }
    UpdateButtons();
}

void CMediaListWnd::Clear() {
    std::vector<int> all(static_cast<std::size_t>(m_list->GetItemCount()));
    for (std::size_t i = 0; i < all.size(); ++i) {
        all[i] = static_cast<int>(i);
    }
    const bool hadSelection = GetFirstSelected() >= 0;
    RowList doomed = TakeRows(all);
    doomed.clear();
    FitColumns();
    if (IMainHub* hub = GetMainHub(); hub != nullptr && hadSelection) {
        hub->OnListSelectionChanged(-1);
    }
    UpdateButtons();
}

void CMediaListWnd::SetRowChecked(int row, bool check) {
    {
        std::lock_guard model(m_modelMutex);
        if (row < 0 || row >= static_cast<int>(m_rows.size())) {
            return;
        }
        m_rows[std::size_t(row)]->checked = check;
    }
    m_list->SetCheckbox(row, kColCheck, check ? 1 : 0);
}

void CMediaListWnd::CheckAll(bool check) {
    for (int row = 0; row < m_list->GetItemCount(); ++row) {
        SetRowChecked(row, check);
    }
}

void CMediaListWnd::CheckSelected(bool check) {
    for (int row = 0; row < m_list->GetItemCount(); ++row) {
        if (m_list->IsSelected(row)) {
            SetRowChecked(row, check);
        }
    }
}

void CMediaListWnd::SelectAll(bool select) {
    m_list->SetFocus();
    m_list->SelectRow(-1);
    if (select) {
        for (int row = 0; row < m_list->GetItemCount(); ++row) {
            m_list->SelectRow(row, false);
        }
    }
    SyncSelection();
}

void CMediaListWnd::ConfigureToAll() {
    const int source = GetFirstSelected();
    MediaItem* first = GetItem(source);
    ParameterSet* firstSet = first != nullptr ? SetOf(*first) : nullptr;
    if (firstSet == nullptr) {
        return;
    }
    const std::string percent = VolumePercentText(first->volume);
    const std::string ar = firstSet->GetValue("ar");
    const std::string ab = firstSet->GetValue("ab");
    const std::string ac = firstSet->GetValue("ac");
    const std::string codec = firstSet->GetValue("acodec");
    std::lock_guard list(m_listLock);
    for (int row = 0; row < m_list->GetItemCount(); ++row) {
        MediaItem* item = GetItem(row);
        if (row == source || item == nullptr) {
            continue;
        }
        // A clone is read afresh from the profile's file: only the five values below carry
        // over from the first row's grid.
        RowParameters& params = AssignSet(*item, firstSet->Clone());
        ParameterSet& set = params.Set();
        set.SetValue("ar", ar);
        set.SetValue("ab", ab);
        set.SetValue("ac", ac);
        set.SetValue("vol_factor", percent);
        set.SetValue("acodec", codec);
        params.Refresh();
        item->volume = first->volume.load();
        WriteTarget(row);
    }
}

bool CMediaListWnd::IsCommandEnabled(int commandId) {
    const int count = m_list->GetItemCount();
    bool anySelected = false, anyUnselected = false, anyChecked = false, anyUnchecked = false;
    bool selectedChecked = false, selectedUnchecked = false;
    for (int row = 0; row < count; ++row) {
        const bool selected = m_list->IsSelected(row);
        const bool checked = m_list->GetCheckbox(row, kColCheck) == 1;
        (selected ? anySelected : anyUnselected) = true;
        (checked ? anyChecked : anyUnchecked) = true;
        if (selected) {
            (checked ? selectedChecked : selectedUnchecked) = true;
        }
    }
    switch (commandId) {
        case 32771: return !AnyRowActive();
        case 32772: return !AnyRowActive() && anySelected;
        case 32773: return !AnyRowActive() && count > 0;
        case 32782: return anyUnchecked;
        case 32783: return anyChecked;
        case 33038: return selectedUnchecked;
        case 33037: return selectedChecked;
        case 33055: return anyUnselected;
        case 33056: return anySelected;
        case 33065: return anySelected;
        case 33045: return count > 0 && anySelected;
        default: return false;
    }
}

// ---- Profiles and parameters ------------------------------------------------------------

void CMediaListWnd::ApplyProfile(const Profile& profile) {
    m_currentProfile = &profile;
    std::vector<int> selected;
    for (int row = 0; row < m_list->GetItemCount(); ++row) {
        if (m_list->IsSelected(row)) {
            selected.push_back(row);
        }
    }
    {
        std::lock_guard list(m_listLock);
        for (int row : selected) {
            MediaItem* item = GetItem(row);
            ParameterSet* set = item != nullptr ? SetOf(*item) : nullptr;
            if (item == nullptr || (set != nullptr && set->GetName() == profile.GetName())) {
                continue;
            }
            RowParameters& params = AssignSet(*item, profile.Clone());
            ApplyTags(params.Set(), &item->info);
            params.Refresh();
        }
        for (int row : selected) {
            WriteTarget(row);
        }
    }
    ApplyBitRateRule();
}

std::vector<ParameterSet*> CMediaListWnd::SelectedSets() {
    std::vector<ParameterSet*> sets;
    for (int row = 0; row < m_list->GetItemCount(); ++row) {
        MediaItem* item = m_list->IsSelected(row) ? GetItem(row) : nullptr;
        if (ParameterSet* set = item != nullptr ? SetOf(*item) : nullptr) {
            sets.push_back(set);
        }
    }
    return sets;
}

void CMediaListWnd::EditSets(const std::function<void()>& edit) {
    std::vector<int> touched;
    {
        std::lock_guard list(m_listLock);
        edit();
        for (int row = 0; row < m_list->GetItemCount(); ++row) {
            MediaItem* item = m_list->IsSelected(row) ? GetItem(row) : nullptr;
            if (RowParameters* params = item != nullptr ? RowParametersOf(*item) : nullptr) {
                params->Refresh();
                touched.push_back(row);
            }
        }
    }
    for (int row : touched) {
        DrawStatus(row);
    }
}

void CMediaListWnd::SetSelectedVolume(int volume, bool firstOnly) {
    for (int row = 0; row < m_list->GetItemCount(); ++row) {
        MediaItem* item = m_list->IsSelected(row) ? GetItem(row) : nullptr;
        if (item != nullptr) {
            item->volume = volume;
            if (firstOnly) {
                return;
            }
        }
    }
}

int CMediaListWnd::GetFirstSelected() {
    return m_list->GetCurSel();
}

void CMediaListWnd::RefreshTarget(int row) {
    std::lock_guard list(m_listLock);
    WriteTarget(row);
}

void CMediaListWnd::WriteTarget(int row) {
    MediaItem* item = GetItem(row);
    ParameterSet* set = item != nullptr ? SetOf(*item) : nullptr;
    if (set == nullptr) {
        m_list->SetItemText(row, kColTarget, "");
        return;
    }
    const std::string shortName = set->GetSName();
    set->SetValue("outfilename",
                  RowOutputFileName(m_list->GetItemText(row, kColName), set->GetExtName()));
    m_list->SetItemText(row, kColTarget, TargetColumnText(shortName));
}

}  // namespace ac
