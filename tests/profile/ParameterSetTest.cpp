// The operations the side bar runs over the sets of all selected rows, tag copying, field
// splitting and the table lookups.
#include "profile/ParameterSet.h"

#include <gtest/gtest.h>

#include "medialist/MediaFileInfo.h"

namespace {

using Strings = std::vector<std::string>;

// A set made of records directly, as a row's set would be after loading.
class FakeSet : public ac::ParameterSet {
public:
    // Names are literals, as table keys are: a record keeps only a view of its name.
    FakeSet& Add(std::string_view name, std::string value, ac::ValueList values = {}) {
        m_records.push_back({name, 0, "", std::move(value), values});
        return *this;
    }
    std::string GetName() const override { return "fake"; }
    std::string GetFormat() const override { return "mp3"; }
    std::string GetExtName() const override { return "mp3"; }
    std::unique_ptr<ac::ParameterSet> Clone() const override { return nullptr; }
};

constexpr std::string_view kRatesA[] = {"64", "128", "192", "256"};
constexpr std::string_view kRatesB[] = {"256", "128", "32"};

class SetOperations : public ::testing::Test {
protected:
    std::vector<ac::ParameterSet*> Sets(std::initializer_list<FakeSet*> sets) {
        return std::vector<ac::ParameterSet*>(sets.begin(), sets.end());
    }
    FakeSet m_a, m_b, m_c;
};

TEST_F(SetOperations, AllHaveKeyAndFlagTests) {
    m_a.Add("title", "x");
    m_b.Add("title", "y").Add("ab", "128");
    EXPECT_TRUE(ac::AllHaveKey(Sets({&m_a, &m_b}), "title"));
    EXPECT_FALSE(ac::AllHaveKey(Sets({&m_a, &m_b}), "ab"));
    EXPECT_FALSE(ac::AllHaveKey({}, "title"));

    // Records carry only PARAM_READONLY; the flag tests read that.
    FakeSet readOnly;
    readOnly.Add("ab", "1");
    const_cast<ac::ParameterRecord&>(readOnly.Records()[0]).flags = ac::PARAM_READONLY;
    auto mixed = Sets({&m_b, &readOnly});
    EXPECT_TRUE(ac::TestFlagOnSets(mixed, "ab", ac::PARAM_READONLY, false));
    EXPECT_FALSE(ac::TestFlagOnSets(mixed, "ab", ac::PARAM_READONLY, true));
    EXPECT_TRUE(ac::TestFlagOnSets(Sets({&readOnly}), "ab", ac::PARAM_READONLY, true));
    EXPECT_FALSE(ac::TestFlagOnSets({}, "ab", ac::PARAM_READONLY, true));
    EXPECT_FALSE(ac::TestFlagOnSets({}, "ab", ac::PARAM_READONLY, false));
}

struct CommonCase {
    Strings values;  // one set per value; "<none>" is a set without the key
    std::string expected;
};

class CommonValueOf : public ::testing::TestWithParam<CommonCase> {};

TEST_P(CommonValueOf, Sets) {
    std::vector<FakeSet> sets(GetParam().values.size());
    std::vector<ac::ParameterSet*> pointers;
    for (std::size_t i = 0; i < sets.size(); ++i) {
        if (GetParam().values[i] != "<none>") sets[i].Add("ab", GetParam().values[i]);
        pointers.push_back(&sets[i]);
    }
    EXPECT_EQ(ac::CommonValue(pointers, "ab"), GetParam().expected);
}

INSTANTIATE_TEST_SUITE_P(Values, CommonValueOf,
                         ::testing::Values(CommonCase{{"", "128"}, "128"}, CommonCase{{"128", ""}, ""},
                                           CommonCase{{"128", "128"}, "128"},
                                           CommonCase{{"auto", "Auto"}, ""},
                                           CommonCase{{"128", "<none>"}, ""},
                                           CommonCase{{"", "", "7"}, "7"}, CommonCase{{}, ""}));

TEST_F(SetOperations, SetValueStopsAtTheFirstSetWithoutTheKey) {
    m_a.Add("ab", "1");
    m_c.Add("ab", "1");
    EXPECT_FALSE(ac::SetValueOnSets(Sets({&m_a, &m_b, &m_c}), "ab", "2"));
    EXPECT_EQ(m_a.GetValue("ab"), "2");
    EXPECT_EQ(m_c.GetValue("ab"), "1");
    EXPECT_TRUE(ac::SetValueOnSets(Sets({&m_a, &m_c}), "ab", "3"));
    EXPECT_EQ(m_c.GetValue("ab"), "3");
}

TEST_F(SetOperations, CommonValueListKeepsTheFirstSetsOrder) {
    m_a.Add("ab", "", kRatesA);
    m_b.Add("ab", "", kRatesB);
    m_c.Add("title", "");
    Strings common;
    EXPECT_EQ(ac::CommonValueList(Sets({&m_a, &m_b}), "ab", common), 2u);
    EXPECT_EQ(common, (Strings{"128", "256"}));
    Strings none;
    EXPECT_EQ(ac::CommonValueList(Sets({&m_a, &m_c}), "ab", none), 0u);
    EXPECT_TRUE(none.empty());
}

TEST(ApplyTags, CopiesTagsUnderTheirParameterNames) {
    FakeSet set;
    set.Add("title", "old").Add("origaritist", "old").Add("encodedby", "old").Add("album", "old");
    ac::ApplyTags(set, nullptr);
    EXPECT_EQ(set.GetValue("title"), "old");
    ac::MediaFileInfo info;
    info.title = "T";
    info.origArtist = "O";  // the parameter keeps its historic spelling
    info.encodedBy = "E";
    ac::ApplyTags(set, &info);
    EXPECT_EQ(set.GetValue("title"), "T");
    EXPECT_EQ(set.GetValue("origaritist"), "O");
    EXPECT_EQ(set.GetValue("encodedby"), "E");
    EXPECT_EQ(set.GetValue("album"), "");  // empty tags overwrite too
}

// ---- FieldSplitter ----

struct SplitCase {
    std::string input;
    char delimiter;
    Strings fields;
};

class FieldSplit : public ::testing::TestWithParam<SplitCase> {};

TEST_P(FieldSplit, Fields) {
    ac::FieldSplitter splitter(GetParam().delimiter, '"');
    splitter.Split(GetParam().input);
    Strings fields;
    for (std::size_t i = 1; i <= splitter.FieldCount(); ++i) fields.push_back(splitter.GetField(i, false));
    EXPECT_EQ(fields, GetParam().fields);
    EXPECT_EQ(splitter.GetField(0, false), GetParam().input);
}

INSTANTIATE_TEST_SUITE_P(
    Inputs, FieldSplit,
    ::testing::Values(SplitCase{"a,b", ',', {"a", "b"}}, SplitCase{"a,", ',', {"a", ""}},
                      SplitCase{"", ',', {""}}, SplitCase{",", ',', {"", ""}},
                      SplitCase{"\"a,b\",c", ',', {"\"a,b\"", "c"}},
                      SplitCase{"\"a\"x,y", ',', {"\"a\"x", "y"}},
                      SplitCase{" \"a,b\",c", ',', {" \"a", "b\"", "c"}},
                      SplitCase{"\"a,b", ',', {"\"a,b"}}, SplitCase{"\"a,b,", ',', {"\"a,b,", ""}},
                      SplitCase{"a,b", '\0', {"a,b"}}));

TEST(FieldSplitter, StripsQuotesAndGuardsTheIndex) {
    ac::FieldSplitter splitter(',', '"');
    splitter.Split("\"x\"\"y\",z");
    EXPECT_EQ(splitter.GetField(1, true), "xy");
    EXPECT_EQ(splitter.GetField(3, false), "ERROR: Array index out of range.");
}

// ---- Table lookups ----

TEST(ParameterTable, LookupsCompareExactly) {
    EXPECT_EQ(ac::GetParameterKey(142), "");
    EXPECT_EQ(ac::FindParameterIndex("AB"), -1);
    EXPECT_EQ(ac::TestParameterFlags("ac", ac::PARAM_KEEP_CASE), 0u);
    // Genre numbers are ID3v1 numbers: the list index is what a tag byte means.
    const ac::ValueList genres = ac::GetParameterValueList("genre");
    ASSERT_EQ(genres.size(), 126u);
    EXPECT_EQ(genres[17], "Rock");
    EXPECT_EQ(genres[80], "Folk");
    EXPECT_EQ(genres[125], "Dance Hall");
    // A duplicate key would hide a row from reading and writing.
    for (const ac::ParameterDef& def : ac::ParameterTable()) {
        EXPECT_EQ(ac::FindParameterDef(def.key), &def) << def.key;
    }
}

}  // namespace
