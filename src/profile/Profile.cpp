// Loading and saving .pf files. Every read and write goes through the ini calls of the package
// layer, which decide from the path whether data.pkg or user.pkg holds the file.
//
//   [Parameter]
//   ab = 0, "Auto", "192", {"64", "128", "192"}
#include "profile/ParameterSet.h"

#include "profile/TextUtil.h"
#include "resources/IniFile.h"
#include "resources/Language.h"
#include "resources/Package.h"

#include <cstring>

namespace ac {
namespace {

// A parameter entry longer than this reads as absent: the ini reader's buffer is 512 bytes.
constexpr std::size_t kEntryBufferSize = 512;

std::string ReadMain(const char* key, std::string_view path) {
    return ReadIniText("Main", key, "", path);
}

// The Parameter section of one file, read once. ReadIniString would do the same per key, but
// user.pkg texts are read anew at every call, and a row's clone reads all 142 keys: a user
// profile then cost milliseconds per row. The lines, the key search and the value cleaning are
// the ini layer's own, so an entry reads here exactly as through ReadIniString.
class ParameterSection {
public:
    explicit ParameterSection(std::string_view path) {
        ImPackageFinder finder;
        if (!finder.ReadLines(path)) return;
        std::string text;
        for (const std::string& line : finder.Names()) {
            text += line;
            text += '\n';
        }
        m_ini.LoadFromText(text);
        m_loaded = true;
    }

    // Empty when absent, or when the entry would not fit the ini reader's buffer.
    std::string Entry(const std::string& key) const {
        std::string value;
        if (!m_loaded || !m_ini.GetValue("Parameter", key.c_str(), value)) return {};
        value = CleanIniValue(value);
        return value.size() < kEntryBufferSize ? value : std::string();
    }

private:
    ImIniFile m_ini;
    bool m_loaded = false;
};

std::string CleanField(const FieldSplitter& splitter, std::size_t index) {
    return std::string(TrimBlanks(splitter.GetField(index, true)));
}

std::uint32_t ParseFlagField(std::string_view field) {
    FieldSplitter words('|', '"');
    words.Split(field);
    for (std::size_t i = 1; i <= words.FieldCount(); ++i) {
        if (EqualsNoCase(TrimBlanks(words.GetField(i, false)), "READONLY")) return PARAM_READONLY;
    }
    return 0;
}

}  // namespace

// The items of one list the file gave: one text block and views into it, so a list costs its
// characters plus one view per item.
struct Profile::OwnedList {
    std::unique_ptr<char[]> text;
    std::vector<std::string_view> items;
};

struct Profile::Snapshot {
    std::vector<ParameterRecord> fileRecords;
    std::vector<ParameterRecord> records;  // filled from the table, as a fresh load has them
    std::vector<std::unique_ptr<OwnedList>> lists;
};

namespace {

ValueList KeepList(std::vector<std::unique_ptr<Profile::OwnedList>>& lists,
                   std::string_view listText);

}  // namespace

Profile::Profile() = default;
Profile::~Profile() = default;
Profile::Profile(std::string path) { Load(std::move(path)); }

namespace {

ValueList KeepList(std::vector<std::unique_ptr<Profile::OwnedList>>& lists,
                   std::string_view listText) {
    if (!listText.empty() && listText.front() == '{') listText.remove_prefix(1);
    if (!listText.empty() && listText.back() == '}') listText.remove_suffix(1);
    FieldSplitter splitter(',', '"');
    splitter.Split(listText);
    const std::size_t count = std::min(splitter.FieldCount(), kMaxValueListItems);

    std::vector<std::string> items;
    items.reserve(count);
    std::size_t total = 0;
    for (std::size_t i = 1; i <= count; ++i) {
        items.push_back(CleanField(splitter, i));
        total += items.back().size();
    }
    auto list = std::make_unique<Profile::OwnedList>();
    list->text = std::make_unique<char[]>(total + 1);
    list->items.reserve(count);
    char* cursor = list->text.get();
    for (const std::string& item : items) {
        std::memcpy(cursor, item.data(), item.size());
        list->items.emplace_back(cursor, item.size());
        cursor += item.size();
    }
    const ValueList view(list->items);
    lists.push_back(std::move(list));
    return view;
}

}  // namespace

bool Profile::Load(std::string path) {
    m_path = std::move(path);
    m_loaded = false;
    m_records.clear();
    m_snapshot.reset();
    if (GetName().empty()) return false;

    auto snapshot = std::make_shared<Snapshot>();
    std::vector<ParameterRecord>& fileRecords = snapshot->fileRecords;
    const ParameterSection section(m_path);
    for (const ParameterDef& def : ParameterTable()) {
        const std::string key(def.key);
        const std::string entry = section.Entry(key);
        if (entry.empty()) continue;

        const std::size_t brace = entry.rfind('{');
        const std::string_view fields =
            brace == std::string::npos ? std::string_view(entry) : std::string_view(entry).substr(0, brace);
        const std::string_view listText =
            brace == std::string::npos ? std::string_view() : std::string_view(entry).substr(brace);

        FieldSplitter splitter(',', '"');
        splitter.Split(fields);
        ParameterRecord record;
        record.name = def.key;
        const std::size_t count = splitter.FieldCount();
        if (count >= 1) record.flags = ParseFlagField(CleanField(splitter, 1));
        if (count >= 2) record.defaultValue = CleanField(splitter, 2);
        if (count >= 3) record.value = CleanField(splitter, 3);
        if (!listText.empty()) record.values = KeepList(snapshot->lists, listText);
        fileRecords.push_back(std::move(record));

        // The start offset and the output name are edited side by side in the grid, so a
        // profile with one always offers the other.
        if (def.key == "ss") {
            ParameterRecord outName;
            outName.name = "outfilename";
            fileRecords.push_back(std::move(outName));
        }
    }

    m_records.reserve(fileRecords.size());
    for (const ParameterRecord& fileRecord : fileRecords) {
        ParameterRecord record = fileRecord;
        if (record.defaultValue.empty()) record.defaultValue = GetParameterDefault(record.name);
        if (!record.defaultValue.empty() && record.value.empty()) record.value = record.defaultValue;
        if (record.values.empty()) record.values = GetParameterValueList(record.name);
        m_records.push_back(std::move(record));
    }
    snapshot->records = m_records;
    m_snapshot = std::move(snapshot);
    m_loaded = true;
    return true;
}

bool Profile::Reload() { return Load(m_path); }

const std::vector<ParameterRecord>& Profile::FileRecords() const {
    static const std::vector<ParameterRecord> kNone;
    return m_snapshot ? m_snapshot->fileRecords : kNone;
}

std::string Profile::GetName() const {
    const std::string tag = g_Language.GetLangCode();
    if (!tag.empty()) {
        const std::string localized = ReadIniText("Main", ("name_" + tag).c_str(), "", m_path);
        if (!localized.empty()) return localized;
    }
    return ReadMain("name", m_path);
}

std::string Profile::GetSName() const {
    std::string shortName = ReadMain("SName", m_path);
    return shortName.empty() ? AsciiUpper(GetFormat()) : shortName;
}

std::string Profile::GetFormat() const { return ReadMain("Format", m_path); }

std::string Profile::GetExtName() const { return ReadMain("ExtName", m_path); }

bool Profile::IsSysProfile() const {
    const std::string value = ReadMain("IsSysProfile", m_path);
    return EqualsNoCase(value, "yes") || EqualsNoCase(value, "true");
}

std::unique_ptr<Profile> Profile::CloneProfile() const {
    if (!m_snapshot) {
        return std::make_unique<Profile>(m_path);
    }
    auto clone = std::make_unique<Profile>();
    clone->m_path = m_path;
    clone->m_loaded = m_loaded;
    clone->m_snapshot = m_snapshot;
    clone->m_records = m_snapshot->records;
    return clone;
}

std::unique_ptr<ParameterSet> Profile::Clone() const { return CloneProfile(); }

// ---- Saving ----

std::string FormatParameterEntry(const ParameterRecord& fileRecord, std::string_view value) {
    std::string entry = (fileRecord.flags & PARAM_READONLY) ? "READONLY" : "0";
    entry += ", \"";
    entry += fileRecord.defaultValue;
    entry += "\", \"";
    entry += value;
    entry += '"';
    if (!fileRecord.values.empty()) {
        entry += ", {";
        for (std::size_t i = 0; i < fileRecord.values.size(); ++i) {
            entry += i == 0 ? "\"" : ", \"";
            entry += fileRecord.values[i];
            entry += '"';
        }
        entry += '}';
    }
    return entry;
}

bool SaveProfile(const Profile& source, const ParameterSet& working, std::string_view name,
                 std::string_view path) {
    const std::string nameText(name);
    if (!WriteIniString("Main", "Name", nameText.c_str(), path)) return false;
    WriteIniString("Main", "SName", source.GetSName().c_str(), path);
    WriteIniString("Main", "Format", source.GetFormat().c_str(), path);
    WriteIniString("Main", "ExtName", source.GetExtName().c_str(), path);
    for (const ParameterRecord& fileRecord : source.FileRecords()) {
        if (fileRecord.name.empty()) break;
        const std::string value(TrimBlanks(working.GetValue(fileRecord.name)));
        WriteIniString("Parameter", std::string(fileRecord.name).c_str(),
                       FormatParameterEntry(fileRecord, value).c_str(), path);
    }
    return true;
}

}  // namespace ac
