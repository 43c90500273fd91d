#pragma once
// ParameterGrid: the side bar's property grid. It shows the parameters the sets of the selected
// rows have in common and writes an edit into all of them; without a row it shows the current
// profile, disabled. Building, texts and the key of an item come from the parameter table.
//
// Thread contract: UI thread only.

#include "profile/ParameterSet.h"
#include "profile/SideBarLogic.h"
#include "profile/grid/PropertiesCtrl.h"

#include <array>
#include <functional>
#include <string>
#include <utility>
#include <vector>

namespace ac {

class ParameterGrid : public PropertiesCtrl {
public:
    ParameterGrid(wxWindow* parent, int id);

    // The profile the selector shows; also the working set of a save.
    void SetCurrentProfile(Profile* profile) { m_current = profile; }
    Profile* GetCurrentProfile() const { return m_current; }

    // Takes a copy of the list (the rows keep owning the sets) and rebuilds.
    void SetSets(const std::vector<ParameterSet*>& sets);
    const std::vector<ParameterSet*>& Sets() const { return m_sets; }
    void Rebuild();
    void RefreshTexts();

    // "key:value;" for every item built, in grid order.
    std::string Describe() const;
    // Called for ar, ab, ac and vol_factor with their common value, on each rebuild and edit:
    // the side bar keeps its simple controls in step.
    void SetValueListener(std::function<void(const std::string&, const std::string&)> listener) {
        m_valueListener = std::move(listener);
    }

    void OnPropertyChanged(const PropertyIterator& item) override;

private:
    PropertyIterator ParentFor(GridCategory category);
    void NotifyValue(const std::string& key, const std::string& value);
    static bool IsSimpleKey(const std::string& key);

    Profile* m_current = nullptr;
    std::vector<ParameterSet*> m_sets;
    bool m_showingCurrent = false;  // m_sets holds only the current profile, for want of rows
    std::array<PropertyIterator, 7> m_categories{};  // in GridCategory order
    std::vector<std::pair<std::string, PropertyIterator>> m_entries;
    std::function<void(const std::string&, const std::string&)> m_valueListener;
};

}  // namespace ac
