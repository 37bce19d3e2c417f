/* Numbers in a source, as the C library reads them. */

#include "check/numbers.h"

#include "compiler/cdgen.h"

#include <gtest/gtest.h>

#include <string>

namespace {

using check::number;
using check::number_form;

TEST(Number, IsReadInItsBase) {
    EXPECT_EQ(number("12", 0).value, 12);
    EXPECT_EQ(number("-12", 0).value, -12);
    EXPECT_EQ(number("012", 0).value, 10);
    EXPECT_EQ(number("012", 10).value, 12);
    EXPECT_EQ(number("0x12", 0).value, 18);
    EXPECT_EQ(number("999999999999999999", 0).value, 999999999999999999);
}

TEST(Number, HasARest) {
    EXPECT_EQ(number("12 x", 0).rest(), "x");
    EXPECT_EQ(number("12 \t", 0).rest(), "");
    EXPECT_EQ(number("x", 0).read, 0u);
    EXPECT_EQ(number("", 0).read, 0u);
}

TEST(Number, OverflowsBeyond64Bits) {
    EXPECT_FALSE(number("9223372036854775807", 10).overflow);
    EXPECT_TRUE(number("9223372036854775808", 10).overflow);
    EXPECT_TRUE(number("-9223372036854775809", 10).overflow);
}

TEST(PlainNumber, HasFewDigitsAndNoLeadingZero) {
    for (const char *text : {"0", "1", "9999", "10000", "65535"})
        EXPECT_TRUE(check::is_plain(text, 16)) << text;
    for (const char *text : {"", "00", "01234", "65536", "99999", "100000", "-1", "1 ", "0x1"})
        EXPECT_FALSE(check::is_plain(text, 16)) << text;
    EXPECT_TRUE(check::is_plain("999999999", 32));
    EXPECT_FALSE(check::is_plain("4294967295", 32));
}

TEST(Bounds, AreDividedAtTheFirstComma) {
    check::bounds two("1,2,3");
    EXPECT_EQ(two.low, "1");
    EXPECT_EQ(two.high, "2,3");
    EXPECT_EQ(two.offset, 2u);
    EXPECT_FALSE(check::bounds("1").two());
    EXPECT_EQ(check::bounds("1").high, "1");
}

/* "text@offset" for each. */
std::string parts(int attr_type, vx_data_type_t type, std::string_view value) {
    std::string all;
    for (const check::number_part &part : check::numbers_in(attr_type, type, value))
        all.append(part.text).append("@").append(std::to_string(part.offset)).append(" ");
    return all;
}

TEST(NumbersIn, AreThoseThatTheCompilerDoesNotCheck) {
    EXPECT_EQ(parts(AT_ID, VX_CHAR_PTR, "7"), "7@0 ");
    EXPECT_EQ(parts(AT_STRING, VX_INT32, "7"), "");
    EXPECT_EQ(parts(AT_RANGE, VX_INT32, "1,22"), "1@0 22@2 ");
    EXPECT_EQ(parts(AT_RANGE, VX_INT32_ARRAY, "1,22"), "1@0 22@2 ");
    EXPECT_EQ(parts(AT_RANGE, VX_FLOAT32, "1,22"), "");
    EXPECT_EQ(parts(AT_VARIETY, VX_UNKNOWN, "5"), "5@0 5@0 ");
}

TEST(NumbersIn, OfAVersionAreFourAndARest) {
    EXPECT_EQ(parts(AT_VERSION, VX_UNKNOWN, "1.2"), "1@0 2@2 ");
    EXPECT_EQ(parts(AT_VERSION, VX_UNKNOWN, "1..3.4"), "1@0 @2 3@3 4@5 ");
    EXPECT_EQ(parts(AT_VERSION, VX_UNKNOWN, "1.2.3.4.5.6"), "1@0 2@2 3@4 4@6 5.6@8 ");
}

TEST(LowAboveHigh, ComparesPlainNumbersByTheirValues) {
    for (vx_data_type_t type : {VX_INT32, VX_UINT64, VX_FLOAT64}) {
        EXPECT_TRUE(check::is_low_above_high(false, type, "10,9"));
        EXPECT_FALSE(check::is_low_above_high(false, type, "9,10"));
        EXPECT_FALSE(check::is_low_above_high(false, type, "10,10"));
    }
}

TEST(LowAboveHigh, ComparesAsTheTypeDoes) {
    EXPECT_TRUE(check::is_low_above_high(false, VX_INT32, "1,-1"));
    EXPECT_FALSE(check::is_low_above_high(false, VX_UINT64, "1,18446744073709551615"));
    EXPECT_TRUE(check::is_low_above_high(false, VX_FLOAT64, "1e1,9.5"));
    EXPECT_TRUE(check::is_low_above_high(true, VX_UNKNOWN, "0x10,010"));
}

} // namespace
