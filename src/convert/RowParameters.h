#pragma once
// A list row's parameter set as the engine sees it. The set itself is edited on the UI thread
// (grid, side bar, profile choice) and read by the driver while it names and builds a job,
// both under the list lock; the progress display reads only the cut (t and ss), which is
// cached here in atomics so that it never touches the set.
//
// Thread contract: Set() and Refresh() under the list lock (or before any thread shares the
// row); GetDuration/GetStartTime from any thread.

#include "convert/EncodingDriver.h"
#include "convert/MediaItem.h"
#include "convert/OutputNaming.h"
#include "profile/ParameterSet.h"

#include <atomic>
#include <cstdint>
#include <functional>
#include <memory>

namespace ac {

class RowParameters final : public JobParameters {
public:
    explicit RowParameters(std::unique_ptr<ParameterSet> set);

    std::int64_t GetDuration() const override { return m_duration.load(); }
    std::int64_t GetStartTime() const override { return m_startTime.load(); }

    ParameterSet& Set() { return *m_set; }
    const ParameterSet& Set() const { return *m_set; }
    // Gives the row another set (a profile chosen for it) and refreshes the cut.
    void Replace(std::unique_ptr<ParameterSet> set);
    // Reads the cut again after an edit of the set.
    void Refresh();

private:
    std::unique_ptr<ParameterSet> m_set;
    std::atomic<std::int64_t> m_duration{0};
    std::atomic<std::int64_t> m_startTime{0};
};

// The set of a row whose parameters are RowParameters (every row the program makes); null for
// a row without parameters.
ParameterSet* SetOf(MediaItem& item);
RowParameters* RowParametersOf(MediaItem& item);

// The conversion list's namer: the row's set and source, and the naming settings as they are
// when the row starts (the preferences may change them between rows).
OutputNamer MakeRowNamer(std::function<NamingSettings()> settings);

}  // namespace ac
