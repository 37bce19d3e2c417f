/* The values of a source as keys, and sets of ranges of them. */

#include "check/value_keys.h"

#include <gtest/gtest.h>

namespace {

using check::default_key;
using check::key_of;
using check::key_ranges;

/* Whether the first text is a smaller value than the second one. */
bool ascend(vx_data_type_t type, std::string_view one, std::string_view other) {
    return key_of(type, one).value() < key_of(type, other).value();
}

TEST(ValueKeys, AscendWithTheValues) {
    EXPECT_TRUE(ascend(VX_INT32, "-2", "-1"));
    EXPECT_TRUE(ascend(VX_INT64, "-9223372036854775808", "9223372036854775807"));
    EXPECT_TRUE(ascend(VX_UINT32, "2147483647", "4294967295"));
    EXPECT_TRUE(ascend(VX_UINT64, "9223372036854775807", "18446744073709551615"));
    EXPECT_TRUE(ascend(VX_FLOAT64, "-inf", "-2.5"));
    EXPECT_TRUE(ascend(VX_FLOAT64, "-2.5", "-0.5"));
    EXPECT_TRUE(ascend(VX_FLOAT32_ARRAY, "0", "0x1p-3"));
    EXPECT_TRUE(ascend(VX_CHAR_PTR, "a", "ab"));
    EXPECT_TRUE(ascend(VX_BINARY_PTR, "0x7f", "0x80"));
}

TEST(ValueKeys, AreEqualForWhatIsStoredEqually) {
    EXPECT_EQ(key_of(VX_INT32, "4294967297"), key_of(VX_INT32, "+1"));
    EXPECT_EQ(key_of(VX_UINT32, "-1"), key_of(VX_UINT32, "4294967295"));
    EXPECT_EQ(key_of(VX_FLOAT64, "-0.0"), key_of(VX_FLOAT64, "0"));
    EXPECT_EQ(key_of(VX_FLOAT32, "0.1"), key_of(VX_FLOAT32, "0.10000000149"));
    EXPECT_EQ(key_of(VX_BINARY_PTR, "0xAb"), key_of(VX_BINARY_PTR, "0xaB"));
}

TEST(ValueKeys, AreNoneForWhatCannotBeCompared) {
    EXPECT_FALSE(key_of(VX_FLOAT32, "nan"));
    EXPECT_FALSE(key_of(VX_BINARY_PTR, "bytes"));
    EXPECT_FALSE(key_of(VX_RSRC_HANDLE_PTR, "x"));
    EXPECT_FALSE(default_key(VX_SD_PTR));
}

TEST(ValueKeys, HaveTheDefaultOfTheType) {
    EXPECT_EQ(default_key(VX_UINT64_ARRAY), key_of(VX_UINT64, "0"));
    EXPECT_EQ(default_key(VX_CHAR_PTR), key_of(VX_CHAR_PTR, ""));
    EXPECT_EQ(default_key(VX_BINARY_PTR), key_of(VX_BINARY_PTR, "0x"));
}

/* Of Int32. Returns the line of an earlier range that overlaps. */
int add(key_ranges &ranges, std::string_view low, std::string_view high, int line) {
    return ranges.add({*key_of(VX_INT32, low), *key_of(VX_INT32, high), line}).line;
}

TEST(KeyRanges, ReportARangeThatOverlaps) {
    key_ranges ranges;
    EXPECT_EQ(add(ranges, "1", "4", 1), 0);
    EXPECT_EQ(add(ranges, "5", "9", 2), 0);
    EXPECT_EQ(add(ranges, "-3", "0", 3), 0);
    EXPECT_EQ(add(ranges, "4", "4", 4), 1);
    EXPECT_EQ(add(ranges, "9", "12", 5), 2);
    EXPECT_EQ(add(ranges, "12", "12", 6), 2);
    EXPECT_EQ(add(ranges, "3", "2", 7), 0);
    EXPECT_EQ(add(ranges, "-9", "99", 8), 3);
}

TEST(KeyRanges, HaveWhatIsInOneOfThem) {
    key_ranges ranges;
    EXPECT_TRUE(ranges.empty());
    add(ranges, "1", "4", 1);
    add(ranges, "7", "9", 2);
    add(ranges, "3", "5", 3);
    for (const char *in : {"1", "4", "5", "7", "9"})
        EXPECT_TRUE(ranges.has(*key_of(VX_INT32, in))) << in;
    for (const char *out : {"0", "6", "10"})
        EXPECT_FALSE(ranges.has(*key_of(VX_INT32, out))) << out;
    ranges.clear();
    EXPECT_FALSE(ranges.has(*key_of(VX_INT32, "1")));
}

} // namespace
