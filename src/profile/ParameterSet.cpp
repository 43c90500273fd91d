// Record lookups of a set, the operations on the sets of several rows, and .pf field splitting.
#include "profile/ParameterSet.h"

#include "medialist/MediaFileInfo.h"
#include "profile/TextUtil.h"

#include <algorithm>
#include <utility>

namespace ac {

std::string ParameterSet::GetSName() const { return AsciiUpper(GetFormat()); }

bool ParameterSet::HasKey(std::string_view key) const { return FindRecord(key) != nullptr; }

const ParameterRecord* ParameterSet::FindRecord(std::string_view key) const {
    for (const ParameterRecord& record : m_records) {
        if (record.name.empty()) break;
        if (record.name == key) return &record;
    }
    return nullptr;
}

ParameterRecord* ParameterSet::FindMutableRecord(std::string_view key) {
    return const_cast<ParameterRecord*>(std::as_const(*this).FindRecord(key));
}

std::string ParameterSet::GetValue(std::string_view key) const {
    const ParameterRecord* record = FindRecord(key);
    return record ? record->value : std::string();
}

std::string ParameterSet::GetDefault(std::string_view key) const {
    const ParameterRecord* record = FindRecord(key);
    return record ? record->defaultValue : std::string();
}

std::uint32_t ParameterSet::GetFlags(std::string_view key) const {
    const ParameterRecord* record = FindRecord(key);
    return record ? record->flags : 0;
}

std::uint32_t ParameterSet::TestFlags(std::string_view key, std::uint32_t mask) const {
    return GetFlags(key) & mask;
}

bool ParameterSet::SetValue(std::string_view key, std::string_view value) {
    ParameterRecord* record = FindMutableRecord(key);
    if (record == nullptr) return false;
    record->value.assign(value);
    return true;
}

std::size_t ParameterSet::GetValueList(std::string_view key, std::vector<std::string>& out) const {
    const ParameterRecord* record = FindRecord(key);
    if (record == nullptr) return 0;
    for (std::string_view item : record->values) {
        out.emplace_back(item);
    }
    return record->values.size();
}

std::int64_t ParameterSet::GetStartTime() {
    BuildCommandLine();
    return m_startTime;
}

std::int64_t ParameterSet::GetDuration() {
    BuildCommandLine();
    return m_duration;
}

FrameSize ParameterSet::GetFrameSize() {
    BuildCommandLine();
    return m_frameSize;
}

double ParameterSet::GetFrameRate() {
    BuildCommandLine();
    return m_frameRate;
}

std::string ParameterSet::GetOutputFileName() {
    BuildCommandLine();
    return m_outputFileName;
}

// ---- Several sets ----

bool AllHaveKey(SetList sets, std::string_view key) {
    if (sets.empty()) return false;
    return std::all_of(sets.begin(), sets.end(),
                       [key](const ParameterSet* set) { return set->HasKey(key); });
}

bool TestFlagOnSets(SetList sets, std::string_view key, std::uint32_t mask, bool all) {
    if (sets.empty()) return false;
    for (const ParameterSet* set : sets) {
        const bool setHas = set->TestFlags(key, mask) != 0;
        if (all && !setHas) return false;
        if (!all && setHas) return true;
    }
    return all;
}

std::string CommonValue(SetList sets, std::string_view key) {
    std::string kept;
    for (const ParameterSet* set : sets) {
        if (!set->HasKey(key)) return {};
        std::string value = set->GetValue(key);
        if (kept.empty()) {
            kept = std::move(value);
        } else if (value != kept) {
            return {};
        }
    }
    return kept;
}

bool SetValueOnSets(SetList sets, std::string_view key, std::string_view value) {
    for (ParameterSet* set : sets) {
        if (!set->SetValue(key, value)) return false;
    }
    return true;
}

std::size_t CommonValueList(SetList sets, std::string_view key, std::vector<std::string>& out) {
    if (sets.empty()) return 0;
    const ParameterRecord* first = sets.front()->FindRecord(key);
    if (first == nullptr) return 0;
    std::size_t count = 0;
    for (std::string_view item : first->values) {
        const bool everywhere = std::all_of(sets.begin() + 1, sets.end(), [&](const ParameterSet* set) {
            const ParameterRecord* record = set->FindRecord(key);
            return record && std::find(record->values.begin(), record->values.end(), item) !=
                                 record->values.end();
        });
        if (everywhere) {
            out.emplace_back(item);
            ++count;
        }
    }
    return count;
}

void ApplyTags(ParameterSet& set, const MediaFileInfo* tags) {
    if (tags == nullptr) return;
    set.SetValue("title", tags->title);
    set.SetValue("author", tags->author);
    set.SetValue("copyright", tags->copyright);
    set.SetValue("comment", tags->comment);
    set.SetValue("album", tags->album);
    set.SetValue("genre", tags->genre);
    set.SetValue("composer", tags->composer);
    set.SetValue("origaritist", tags->origArtist);
    set.SetValue("url", tags->url);
    set.SetValue("encodedby", tags->encodedBy);
    set.SetValue("year", tags->year);
    set.SetValue("timestamp", tags->timestamp);
}

// ---- FieldSplitter ----

void FieldSplitter::Split(std::string_view input) {
    m_slots.clear();
    m_slots.emplace_back(input);
    if (m_delimiter == '\0') {
        m_slots.emplace_back(input);
        return;
    }
    const bool endsWithEmptyField = input.empty() || input.back() == m_delimiter;
    std::string_view rest = input;
    while (!rest.empty()) {
        const std::size_t delimiter = rest.find(m_delimiter);
        if (delimiter == std::string_view::npos) {
            m_slots.emplace_back(rest);
            break;
        }
        std::size_t end = delimiter;
        if (rest.front() == m_quote) {
            // The closing quote shields delimiters up to it; an unclosed quote shields the rest.
            const std::size_t closing = rest.find(m_quote, 1);
            end = closing == std::string_view::npos ? std::string_view::npos
                                                    : rest.find(m_delimiter, closing + 1);
        }
        if (end == std::string_view::npos) {
            m_slots.emplace_back(rest);
            rest = {};
            break;
        }
        m_slots.emplace_back(rest.substr(0, end));
        rest.remove_prefix(end + 1);
    }
    if (endsWithEmptyField) {
        m_slots.emplace_back();
    }
}

std::string FieldSplitter::GetField(std::size_t index, bool stripQuotes) const {
    if (index >= m_slots.size()) return "ERROR: Array index out of range.";
    std::string field = m_slots[index];
    if (stripQuotes) {
        std::erase(field, m_quote);
    }
    return field;
}

}  // namespace ac
