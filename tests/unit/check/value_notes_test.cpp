#include "check/value_notes.h"

#include <gtest/gtest.h>

using namespace check;

namespace {

const srtable_ctrl &PERSISTENT = sc_tables[SC_PERSISTENT_RESOURCE_ATTRIBUTE];

std::string note(const char *attribute, vx_data_type_t type, const char *value,
                 int kind = SC_DYNAMIC_RESOURCE_ATTRIBUTE) {
    return value_note(*find_attr(sc_tables[static_cast<size_t>(kind)], attribute), type, value);
}

} // namespace

TEST(ValueNote, SpeaksOfTheCommasOfAList) {
    int kind = SC_PERSISTENT_RESOURCE_ATTRIBUTE;
    EXPECT_EQ(note("DefaultValue", VX_UINT32, "1,2,3", kind), "`DefaultValue` takes one value, not a list");
    EXPECT_EQ(note("DefaultValue", VX_UINT32_ARRAY, "1,2,3", kind),
              "`DefaultValue` takes one element of the array: write a line for each element");
    EXPECT_EQ(note("InitialValue", VX_UINT32_ARRAY, "1,2,3"),
              "`InitialValue` takes one element of the array, and there is only one such line");
    EXPECT_EQ(
        note("ValidStateValue", VX_INT32, "1,2,3"),
        "`ValidStateValue` takes one value, or two bounds with a comma between them: write a line for each value");
    EXPECT_EQ(note("Range", VX_INT32, "1,2,3"), "`Range` takes two bounds: `Range=low,high`");
}

TEST(ValueNote, TakesOneCommaForAListOfTwo) {
    int kind = SC_PERSISTENT_RESOURCE_ATTRIBUTE;
    EXPECT_EQ(note("DefaultValue", VX_INT64, "1,2", kind), "`DefaultValue` takes one value, not a list");
    EXPECT_EQ(note("DefaultValue", VX_INT64_ARRAY, "1,2", kind),
              "`DefaultValue` takes one element of the array: write a line for each element");
}

TEST(ValueNote, SaysWhatTheTypeTakes) {
    EXPECT_EQ(note("InitialValue", VX_UINT32, "-1"), "`UInt32` takes a decimal integer from 0 to 4294967295");
    EXPECT_EQ(note("Range", VX_INT32, "1,x"), "`Int32` takes a decimal integer from -2147483648 to 2147483647");
    EXPECT_EQ(note("InitialValue", VX_UINT64, "x"), "`UInt64` takes a decimal integer from 0 to 18446744073709551615");
    EXPECT_EQ(note("InitialValue", VX_INT64, "x"),
              "`Int64` takes a decimal integer from -9223372036854775808 to 9223372036854775807");
    EXPECT_EQ(note("InitialValue", VX_FLOAT32, "x"), "`Float32` takes a floating point number");
    EXPECT_EQ(note("InitialValue", VX_BINARY_PTR, "0x1,2"), "`Binary` takes 0x and pairs of hexadecimal digits");
}

TEST(VarietyNote, ShowsWhatToWrite) {
    EXPECT_EQ(variety_note("5"), "write two numbers with a comma between them; one variety is `VarietyRange=5,5`");
    EXPECT_EQ(variety_note("1-5"), "write two numbers with a comma between them; one variety is `VarietyRange=1,1`");
    EXPECT_EQ(variety_note("1,2,3"), "write a line `VarietyRange=low,high` for each range of varieties");
}

TEST(NoValueNote, QuotesWhatBeginsAComment) {
    const table_attrs &name = *find_attr(PERSISTENT, "Name");
    EXPECT_EQ(no_value_note(name, "#fff "),
              "`#` begins a comment: to make it part of the value, write `Name=\"#fff\"`");
    EXPECT_EQ(no_value_note(name, " //x"), "`//` begins a comment: to make it part of the value, write `Name=\"//x\"`");
    EXPECT_EQ(no_value_note(name, ""), "give it a value: `Name` is required");
    EXPECT_EQ(no_value_note(*find_attr(PERSISTENT, "GroupID"), " "), "give it a value, or leave the line out");
}

TEST(NoEqualsNote, WritesTheLineOfAKnownAttribute) {
    EXPECT_EQ(no_equals_note(PERSISTENT, "DataType: Int32"), "write `DataType=Int32`");
    EXPECT_EQ(no_equals_note(PERSISTENT, "Id 5"), "write `Id=5`");
    EXPECT_EQ(no_equals_note(PERSISTENT, "see below"),
              "an attribute line is `Name=value`; a comment begins with `#` or `//`");
    EXPECT_EQ(no_equals_note(PERSISTENT, "Id"), "an attribute line is `Name=value`; a comment begins with `#` or `//`");
}

TEST(OpenQuoteNote, SaysHowToCloseOrStoreAQuote) {
    EXPECT_EQ(open_quote_note("\"a b"), "close it at the end of the value: `\"a b\"`");
    EXPECT_EQ(open_quote_note("\"a\\\""),
              "a quote after a backslash does not close the value; to store quotes, leave the outer ones out");
    EXPECT_EQ(open_quote_note("\"a\" b"),
              "only a comment may follow the closing quote; to store quotes, leave the outer ones out");
    EXPECT_EQ(open_quote_note("\""), "close it at the end of the value: `\"\"`");
}
