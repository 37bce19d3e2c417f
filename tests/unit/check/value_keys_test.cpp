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

/* The values 0, 7, 14, ... modulo a prime come in no order. */
TEST(KeyRanges, KeepManyInAnyOrder) {
    constexpr int PRIME = 2003;
    key_ranges numbers, texts;
    auto text_of = [](int value) {
        return check::value_key{0, std::string(static_cast<size_t>(value % 251), 'x') + "\1"};
    };
    for (int i = 0; i < PRIME; ++i)
        EXPECT_EQ(numbers.add({{i * 7 % PRIME * 2, {}}, {i * 7 % PRIME * 2, {}}, i + 1}).line, 0);
    for (int i = 0; i < PRIME; ++i) {
        EXPECT_TRUE(numbers.has({2 * i, {}})) << i;
        EXPECT_FALSE(numbers.has({2 * i + 1, {}})) << i;
    }
    EXPECT_EQ(numbers.add({{14, {}}, {14, {}}, 9999}).line, 2);
    for (int i = 0; i < 251; ++i)
        EXPECT_EQ(texts.add({text_of(i * 7), text_of(i * 7), i + 1}).line, 0);
    EXPECT_EQ(texts.add({text_of(14), text_of(14), 9999}).line, 3);
}

/* The shorter text comes first; the empty text is below all others. */
TEST(KeyRanges, UniteRangesOfTexts) {
    key_ranges ranges;
    EXPECT_EQ(ranges.add({{}, {}, 1}).line, 0);
    EXPECT_EQ(ranges.add({{0, "b"}, {0, "d"}, 2}).line, 0);
    EXPECT_EQ(ranges.add({{0, "f"}, {0, "h"}, 3}).line, 0);
    EXPECT_EQ(ranges.add({{0, "c"}, {0, "g"}, 4}).line, 2);
    EXPECT_EQ(ranges.add({{0, "e"}, {0, "e"}, 5}).high, (check::value_key{0, "h"}));
    EXPECT_TRUE(ranges.has({}));
    EXPECT_FALSE(ranges.has({0, "a"}));
    EXPECT_FALSE(ranges.has({0, "ha"}));
}

} // namespace
