#include "convert/RowParameters.h"

namespace ac {

RowParameters::RowParameters(std::unique_ptr<ParameterSet> set) : m_set(std::move(set)) {
    Refresh();
}

void RowParameters::Replace(std::unique_ptr<ParameterSet> set) {
    m_set = std::move(set);
    Refresh();
}

void RowParameters::Refresh() {
    if (!m_set) {
        m_duration = 0;
        m_startTime = 0;
        return;
    }
    m_duration = m_set->GetDuration();
    m_startTime = m_set->GetStartTime();
}

RowParameters* RowParametersOf(MediaItem& item) {
    return dynamic_cast<RowParameters*>(item.parameters.get());
}

ParameterSet* SetOf(MediaItem& item) {
    RowParameters* row = RowParametersOf(item);
    return row != nullptr ? &row->Set() : nullptr;
}

}  // namespace ac

namespace ac {

OutputNamer MakeRowNamer(std::function<NamingSettings()> settings) {
    return [settings = std::move(settings)](int row, MediaItem& item, const std::string& directory,
                                            const std::string& lastOutput) {
        ParameterSet* set = SetOf(item);
        if (set == nullptr) {
            return OutputHold();
        }
        OutputNameRequest request;
        request.sourcePath = item.sourcePath;
        request.row = row;
        request.lastOutput = lastOutput;
        request.directory = directory;
        return ReserveOutputPath(*set, request, settings());
    };
}

}  // namespace ac
