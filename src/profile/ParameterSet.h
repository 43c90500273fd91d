#pragma once
// The parameter vocabulary and the sets built from it. The static table names every parameter
// the program knows; a ParameterSet is the values one list row will be encoded with; a Profile
// is such a set loaded from a .pf file. Every value is text, numbers too.
//
// Value lists are never copied per set: a record's list is a view either into the static table
// or into storage the loading Profile owns. Thousands of rows each hold a Profile, so this is
// what keeps a row small.
//
// Thread contract: a set has no lock. It is built on a loader thread, then used on the UI
// thread and read by the driver threads; BuildCommandLine writes the set's numeric fields, so
// only one thread may build the command line of one set at a time.

#include <cstddef>
#include <cstdint>
#include <memory>
#include <span>
#include <string>
#include <string_view>
#include <vector>

namespace ac {

struct MediaFileInfo;

inline constexpr std::uint32_t PARAM_SWITCH = 0x00000001;
inline constexpr std::uint32_t PARAM_EXPERT = 0x00001000;
inline constexpr std::uint32_t PARAM_VIDEO = 0x00002000;
inline constexpr std::uint32_t PARAM_AUDIO = 0x00004000;
inline constexpr std::uint32_t PARAM_GENERAL = 0x00008000;
inline constexpr std::uint32_t PARAM_SUMMARY = 0x00010000;
inline constexpr std::uint32_t PARAM_TAG = 0x00020000;
inline constexpr std::uint32_t PARAM_READONLY = 0x00100000;
inline constexpr std::uint32_t PARAM_FIXED_LIST = 0x00200000;
inline constexpr std::uint32_t PARAM_HAS_LIST = 0x00400000;
inline constexpr std::uint32_t PARAM_NOT_PASSED = 0x10000000;
inline constexpr std::uint32_t PARAM_KEEP_CASE = 0x20000000;

// The longest value list a record keeps; a file giving more loses the rest.
inline constexpr std::size_t kMaxValueListItems = 200;

using ValueList = std::span<const std::string_view>;

struct ParameterDef {
    std::string_view key;  // empty in the row that ends the table
    std::uint32_t flags;
    std::uint32_t labelId;
    std::uint32_t helpId;
    const char* defaultValue;  // null: the table gives no default
    ValueList values;
};

// One parameter of a set.
struct ParameterRecord {
    // Always a key of the parameter table, which lives as long as the program: every row of a
    // long list holds a set, so the name is not copied into each.
    std::string_view name;
    std::uint32_t flags = 0;  // PARAM_READONLY or 0; every other flag is asked of the table
    std::string defaultValue;
    std::string value;
    ValueList values;
};

// The table, in its fixed order (reading, writing and grid order), without the end row.
std::span<const ParameterDef> ParameterTable();
// The key of table row `index`; empty behind the end.
std::string_view GetParameterKey(int index);
// Row number of a key, -1 if none. All lookups compare exact case.
int FindParameterIndex(std::string_view key);
const ParameterDef* FindParameterDef(std::string_view key);
std::uint32_t TestParameterFlags(std::string_view key, std::uint32_t mask);
// The table's default, empty when it gives none.
std::string_view GetParameterDefault(std::string_view key);
ValueList GetParameterValueList(std::string_view key);

struct FrameSize {
    std::int32_t width = 0;
    std::int32_t height = 0;
};

class ParameterSet {
public:
    ParameterSet() = default;
    ParameterSet(const ParameterSet&) = delete;
    ParameterSet& operator=(const ParameterSet&) = delete;
    virtual ~ParameterSet() = default;

    virtual std::string GetName() const = 0;
    // Short name for lists: GetFormat() in upper case unless a subclass knows better.
    virtual std::string GetSName() const;
    virtual std::string GetFormat() const = 0;
    virtual std::string GetExtName() const = 0;
    virtual std::unique_ptr<ParameterSet> Clone() const = 0;

    virtual bool HasKey(std::string_view key) const;
    virtual const ParameterRecord* FindRecord(std::string_view key) const;
    virtual std::string GetValue(std::string_view key) const;
    virtual std::string GetDefault(std::string_view key) const;
    virtual std::uint32_t GetFlags(std::string_view key) const;
    virtual std::uint32_t TestFlags(std::string_view key, std::uint32_t mask) const;
    // False, and nothing added, for a key the set lacks.
    virtual bool SetValue(std::string_view key, std::string_view value);
    // Appends the record's list to `out`; answers the length of the record's list.
    virtual std::size_t GetValueList(std::string_view key, std::vector<std::string>& out) const;

    // The option text for ctt (see convert/CommandLine.h for the job around it). Refreshes start
    // time, duration, frame size and output file name as a side effect.
    virtual std::string BuildCommandLine();
    virtual std::int64_t GetStartTime();
    virtual std::int64_t GetDuration();
    virtual FrameSize GetFrameSize();
    virtual double GetFrameRate();
    // The `outfilename` value as the last command line left it (runs BuildCommandLine first).
    std::string GetOutputFileName();

    virtual bool IsSysProfile() const { return true; }
    virtual std::string GetPath() const { return {}; }
    virtual bool Reload() { return true; }

    // Records in list order (for a Profile, table order).
    const std::vector<ParameterRecord>& Records() const { return m_records; }

protected:
    ParameterRecord* FindMutableRecord(std::string_view key);

    std::vector<ParameterRecord> m_records;
    std::int64_t m_startTime = 0;  // microseconds
    std::int64_t m_duration = 0;   // microseconds
    FrameSize m_frameSize;
    double m_frameRate = 0.0;  // nothing sets it; kept for the grid's reader
    std::string m_outputFileName;
};

class Profile final : public ParameterSet {
public:
    Profile();
    ~Profile() override;
    // Loads at once; IsLoaded() tells whether the file gave a name.
    explicit Profile(std::string path);

    // False when the file gives no name (a missing file gives none).
    bool Load(std::string path);

    std::string GetName() const override;
    std::string GetSName() const override;
    std::string GetFormat() const override;
    std::string GetExtName() const override;
    // A new Profile as the file read at the last load or save: unsaved changes are not carried
    // over. The clone shares what was read (records, value lists) instead of reading the file
    // again; every list row holds one, so this is what adding a file costs.
    std::unique_ptr<ParameterSet> Clone() const override;
    std::unique_ptr<Profile> CloneProfile() const;

    bool IsSysProfile() const override;
    std::string GetPath() const override { return m_path; }
    bool Reload() override;

    // What the file said, unfilled by the table: the writer takes flags, defaults and lists
    // from here.
    const std::vector<ParameterRecord>& FileRecords() const;
    bool IsLoaded() const { return m_loaded; }

    // One value list of the file: its text and views into it (Profile.cpp).
    struct OwnedList;

private:
    // What one load read: shared, never changed, by the profile and all its clones.
    struct Snapshot;

    std::string m_path;
    bool m_loaded = false;
    std::shared_ptr<const Snapshot> m_snapshot;
};

// Writes a profile file: Name, SName, Format, ExtName of Main, then one Parameter entry for
// each record `source` read from its file, valued from `working` (the grid's current set).
// False when the name could not be written (the path is no valid file name); the other writes
// are not checked.
bool SaveProfile(const Profile& source, const ParameterSet& working, std::string_view name,
                 std::string_view path);
// The Parameter entry text of a record: `0, "Auto", "128", {"64", "128"}`.
std::string FormatParameterEntry(const ParameterRecord& fileRecord, std::string_view value);

// ---- Operations on the sets of several selected rows ----
using SetList = std::span<ParameterSet* const>;

bool AllHaveKey(SetList sets, std::string_view key);
bool TestFlagOnSets(SetList sets, std::string_view key, std::uint32_t mask, bool all);
std::string CommonValue(SetList sets, std::string_view key);
bool SetValueOnSets(SetList sets, std::string_view key, std::string_view value);
// The first set's list reduced to the items every other set's list holds; answers its length.
std::size_t CommonValueList(SetList sets, std::string_view key, std::vector<std::string>& out);

// Copies a row's probed tags into its set. A null record changes nothing.
void ApplyTags(ParameterSet& set, const MediaFileInfo* tags);

// ---- .pf field splitting ----
// Slot 0 holds the whole input, slots 1..n the fields. A field that starts with the quote runs
// to the delimiter behind its closing quote; a blank before the quote switches that off.
class FieldSplitter {
public:
    FieldSplitter(char delimiter, char quote) : m_delimiter(delimiter), m_quote(quote) {}

    void Split(std::string_view input);
    std::size_t FieldCount() const { return m_slots.empty() ? 0 : m_slots.size() - 1; }
    std::string GetField(std::size_t index, bool stripQuotes) const;

private:
    char m_delimiter;
    char m_quote;
    std::vector<std::string> m_slots;
};

}  // namespace ac
