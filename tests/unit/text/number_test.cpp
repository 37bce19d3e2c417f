#include "text/number.h"

#include <gtest/gtest.h>

#include <bit>
#include <cstdint>
#include <limits>

TEST(text_number, shortest_reads_back) {
    EXPECT_EQ(text::shortest(0.1F), "0.1");
    EXPECT_EQ(text::shortest(0.1), "0.1");
    EXPECT_EQ(text::shortest(static_cast<double>(0.1F)), "0.10000000149011612");
    EXPECT_EQ(text::shortest(1e300), "1e+300");
    EXPECT_EQ(text::shortest(-0.0), "-0");
    EXPECT_EQ(text::shortest(-std::numeric_limits<float>::infinity()), "-inf");
}

TEST(text_number, dotted_starts_with_the_highest_byte) {
    EXPECT_EQ(text::dotted(0x010203FF), "1.2.3.255");
    EXPECT_EQ(text::dotted(0), "0.0.0.0");
}

TEST(text_number, nan_shows_sign_and_payload) {
    EXPECT_EQ(text::shortest(std::bit_cast<float>(0x7FC00000U)), "nan");
    EXPECT_EQ(text::shortest(std::bit_cast<float>(0xFFC00000U)), "-nan");
    EXPECT_EQ(text::shortest(std::bit_cast<float>(0x7FC0000AU)), "nan(0xa)");
    EXPECT_EQ(text::shortest(std::bit_cast<double>(std::uint64_t{0xFFF8000000000001})), "-nan(0x1)");
}
