#include "text/hex.h"

#include <gtest/gtest.h>

#include <array>

TEST(text_hex, number_has_no_leading_zeros) {
    EXPECT_EQ(text::hex(0), "0x0");
    EXPECT_EQ(text::hex(0xAB0), "0xab0");
    EXPECT_EQ(text::hex(UINT64_MAX), "0xffffffffffffffff");
}

TEST(text_hex, each_byte_has_two_digits) {
    std::array bytes = {std::byte{0}, std::byte{0x1F}, std::byte{0xC0}};
    EXPECT_EQ(text::hex_of(bytes), "001fc0");
    EXPECT_EQ(text::hex_of({}), "");
}
