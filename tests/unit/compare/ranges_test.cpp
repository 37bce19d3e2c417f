#include "compare/ranges.h"

#include <gtest/gtest.h>

#include <cmath>

namespace {

template <class Number> std::optional<compare::ordinal> ordinal(vx_data_type_t type, Number number) {
    std::array<std::byte, 8> cell = {};
    std::memcpy(cell.data(), &number, sizeof number);
    return compare::ordinal_of(
        cdb::value({cell, std::endian::native}, 0, type, {std::span<const std::byte>(), std::endian::native}));
}

} // namespace

TEST(compare_ranges, ordinals_are_in_the_order_of_numbers) {
    EXPECT_LT(ordinal(VX_INT32, -2), ordinal(VX_INT32, 1));
    EXPECT_LT(ordinal(VX_UINT64, std::uint64_t{1}), ordinal(VX_UINT64, ~std::uint64_t{0}));
    EXPECT_LT(ordinal(VX_FLOAT64, -2.5), ordinal(VX_FLOAT64, -1.5));
    EXPECT_LT(ordinal(VX_FLOAT32, -1.5F), ordinal(VX_FLOAT32, 0.5F));
    EXPECT_EQ(ordinal(VX_FLOAT64, -0.0), ordinal(VX_FLOAT64, 0.0));
    EXPECT_EQ(ordinal(VX_FLOAT64, std::nan("")), std::nullopt);
    EXPECT_EQ(ordinal(VX_CHAR_PTR, 8), std::nullopt);
}

TEST(compare_ranges, a_set_has_what_its_ranges_cover_together) {
    compare::range_set set({{6, 9}, {1, 5}, {20, 30}}, true);
    EXPECT_TRUE(set.has({2, 8}));
    EXPECT_TRUE(set.has({20, 30}));
    EXPECT_FALSE(set.has({9, 10}));
    EXPECT_FALSE(set.has({0, 1}));
    EXPECT_FALSE(set.has({9, 20}));
}

TEST(compare_ranges, between_numbers_with_fractions_there_are_others) {
    EXPECT_FALSE(compare::range_set({{1, 5}, {6, 9}}, false).has({1, 9}));
    EXPECT_TRUE(compare::range_set({{1, 6}, {6, 9}}, false).has({1, 9}));
}

TEST(compare_ranges, a_range_whose_low_is_above_its_high_has_nothing) {
    EXPECT_FALSE(compare::range_set({{5, 1}}, true).has({1, 1}));
}
