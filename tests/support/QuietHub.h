#pragma once
// A main-dialog hub for panel tests that answers every call quietly: work mode `mode`, every
// command enabled, nothing selected, no run. A test derives from it and overrides only what
// it watches.

#include "shell/MainHub.h"

#include <functional>
#include <string>
#include <vector>

namespace ac::test {

class QuietHub : public IMainHub {
public:
    int WorkMode() override { return mode; }
    void PostCommand(int) override {}
    bool IsCommandEnabled(int) override { return true; }
    void ShowContextMenu(wxWindow*, int) override {}
    void OnListSelectionChanged(int) override {}
    void SetStatusText(const std::string&) override {}
    void SetBitRateAllowed(bool) override {}
    void ShowFileInfo(MediaItem*) override {}
    void ApplyProfile(Profile&) override {}
    void OnProfileChosen(int) override {}
    void OnCatalogueLoaded() override {}
    std::vector<ParameterSet*> SelectedSets() override { return {}; }
    void EditSets(const std::function<void()>& edit) override { edit(); }
    void SetSelectedVolume(int, bool) override {}
    int RememberedProfileIndex(int) override { return 0; }
    void RememberProfileIndex(int, int) override {}
    bool IsConvertRunActive() override { return false; }
    double RunDoneSeconds() override { return 0; }
    double RunTotalSeconds() override { return 0; }

    int mode = 0;
};

}  // namespace ac::test
