// Text forms of the property grid's values, without a window.

#include "profile/grid/PropertyValue.h"

#include <gtest/gtest.h>

namespace ac {
namespace {

struct TextCase {
    PropertyKind kind;
    const char* input;
    const char* shown;
};

class PropertyValueText : public ::testing::TestWithParam<TextCase> {};

TEST_P(PropertyValueText, ParsesByKindAndReadsBackTheKindsForm) {
    PropertyValue value(GetParam().kind);
    value.SetText(GetParam().input);
    EXPECT_EQ(value.GetText(), GetParam().shown) << "input '" << GetParam().input << "'";
}

INSTANTIATE_TEST_SUITE_P(
    Kinds, PropertyValueText,
    ::testing::Values(TextCase{PropertyKind::Text, " as it stands ", " as it stands "},
                      TextCase{PropertyKind::Bool, "True", "True"},
                      TextCase{PropertyKind::Bool, "false", "False"},
                      TextCase{PropertyKind::Bool, "1", "True"},
                      TextCase{PropertyKind::Int, "-12", "-12"},
                      TextCase{PropertyKind::Int, "+7 kbps", "7"},
                      TextCase{PropertyKind::Int, "99999999999", "2147483647"},
                      TextCase{PropertyKind::UInt, "4294967295", "4294967295"},
                      TextCase{PropertyKind::UInt, "-1", "0"},
                      TextCase{PropertyKind::Short, "40000", "32767"},
                      TextCase{PropertyKind::Short, "-40000", "-32768"},
                      TextCase{PropertyKind::UShort, "65535", "65535"},
                      TextCase{PropertyKind::Char, "xyz", "x"},
                      TextCase{PropertyKind::Float, "1.234", "1.23"},
                      TextCase{PropertyKind::Double, "2.5", "2.50"},
                      TextCase{PropertyKind::Double, "-0.125e1", "-1.25"}));

TEST(PropertyValue, UnreadableTextKeepsTheValue) {
    PropertyValue number(PropertyKind::Int);
    number.SetText("44");
    number.SetText("loud");
    EXPECT_EQ(number.GetText(), "44");
    PropertyValue real(PropertyKind::Double);
    real.SetText("3");
    real.SetText("");
    EXPECT_EQ(real.GetText(), "3.00");
    PropertyValue flag(PropertyKind::Bool);
    flag.SetText("True");
    flag.SetText("maybe");
    EXPECT_EQ(flag.GetText(), "True");
}

TEST(PropertyValue, PrecisionDecidesTheDecimals) {
    PropertyValue value(PropertyKind::Double);
    value.SetText("0.33333");
    value.SetPrecision(4);
    EXPECT_EQ(value.GetText(), "0.3333");
    value.SetPrecision(0);
    EXPECT_EQ(value.GetText(), "0");
}

TEST(PropertyValue, BoolTakesItsOwnOptionsForFalseAndTrue) {
    PropertyValue value(PropertyKind::Bool);
    value.AddOption("Off");
    value.AddOption("On");
    value.SetText("On");
    EXPECT_EQ(value.GetText(), "On");
    value.SetText("False");
    EXPECT_EQ(value.GetText(), "Off");
}

TEST(PropertyValue, IntegerWithOptionsIsTheOptionsIndex) {
    PropertyValue value(PropertyKind::Int);
    for (const char* mode : {"Stereo", "Joint", "Mono"}) {
        value.AddOption(mode);
    }
    value.SetText("Mono");
    EXPECT_EQ(value.GetText(), "Mono");
    value.SetText("1");
    EXPECT_EQ(value.GetText(), "Joint");
    value.SetText("7");
    EXPECT_EQ(value.GetText(), "7") << "an index without an option shows as a number";
}

TEST(PropertyValue, OptionTextGivenBeforeItsOptionIsTakenUpWhenAdded) {
    PropertyValue value(PropertyKind::Int);
    value.SetText("Joint");
    for (const char* mode : {"Stereo", "Joint", "Mono"}) {
        value.AddOption(mode);
    }
    EXPECT_EQ(value.GetText(), "Joint");
}

TEST(PropertyValue, ChosenOptionsJoinWithTheSeparator) {
    PropertyValue value(PropertyKind::Text);
    for (const char* tag : {"Artist", "Album", "Year", "Genre"}) {
        value.AddOption(tag);
    }
    value.UseChosenSet(true);
    EXPECT_EQ(value.GetText(), "");
    value.SetChosen(3, true);
    value.SetChosen(0, true);
    EXPECT_EQ(value.GetText(), "Artist;Genre");
    value.SetText("Year;Nothing;Album");
    EXPECT_TRUE(value.IsChosen(1));
    EXPECT_FALSE(value.IsChosen(0));
    EXPECT_EQ(value.GetText(), "Album;Year") << "options keep their order, unknown texts drop";
    value.SetSeparator(", ");
    EXPECT_EQ(value.GetText(), "Album, Year");
    value.RemoveOptions();
    EXPECT_FALSE(value.IsChosen(1));
}

}  // namespace
}  // namespace ac
