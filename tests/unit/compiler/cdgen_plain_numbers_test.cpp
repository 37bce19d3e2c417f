/* Most numbers convert without the C library. They convert to the same. */

#include "compiler/cdgen.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <random>
#include <string>

namespace {

template <class Number> Number converted(const std::string &text, vx_data_type_t type) {
    static cdgen cx;
    text_pool pool;
    vx_value_t cell = {};
    EXPECT_EQ(str_to_vx(cx, &cell, type, text.c_str(), pool), 0) << text;
    Number number;
    memcpy(&number, &cell, sizeof number);
    return number;
}

template <class Number> std::string bits(Number number) {
    return {reinterpret_cast<const char *>(&number), sizeof number};
}

void expect_library_bits(const std::string &text) {
    EXPECT_EQ(bits(converted<float>(text, VX_FLOAT32)), bits(strtof(text.c_str(), nullptr))) << text;
    EXPECT_EQ(bits(converted<double>(text, VX_FLOAT64)), bits(strtod(text.c_str(), nullptr))) << text;
}

/* At the edges of what is exact: 24 and 53 bits of mantissa, the tenth power of ten, 18 digits. */
TEST(PlainFraction, HasTheLibrarysBits) {
    for (const char *text : {"0",
                             "-0",
                             "0.0",
                             "-0.0",
                             "1.",
                             "0.1",
                             "-0.1",
                             "16777216",
                             "16777217",
                             "16777215.5",
                             "1677721.7",
                             "199987.5",
                             "0.0000000001",
                             "0.00000000001",
                             "0.3333333333333333",
                             "9007199254740992",
                             "9007199254740993",
                             "900719925474099.3",
                             "999999999999999999",
                             "9999999999999999999",
                             "0.000000000000000001",
                             "0.0000000000000000001",
                             "123456789012345678.9",
                             "00000000000000000000000.5"})
        expect_library_bits(text);
}

TEST(PlainFraction, HasTheLibrarysBitsAnywhere) {
    std::mt19937_64 random(1);
    for (int i = 0; i < 20000; ++i) {
        std::string text = std::to_string(random() >> (random() % 64));
        text.insert(text.size() - random() % (text.size() < 9 ? text.size() : 9), ".");
        expect_library_bits((random() % 2 != 0 ? "-" : "") + (text[0] == '.' ? "0" + text : text));
    }
}

TEST(PlainInteger, TakesASignAsTheLibraryDoes) {
    EXPECT_EQ(converted<vx_int64_t>("-5", VX_INT64), -5);
    EXPECT_EQ(converted<vx_int64_t>("-999999999999999999", VX_INT64), -999999999999999999);
    EXPECT_EQ(converted<vx_int64_t>("-1000000000000000000", VX_INT64), -1000000000000000000);
    EXPECT_EQ(converted<vx_int32_t>("-2147483648", VX_INT32), -2147483647 - 1);
    EXPECT_EQ(converted<vx_uint32_t>("-1", VX_UINT32), 4294967295U);
    EXPECT_EQ(converted<vx_uint64_t>("-1", VX_UINT64), 18446744073709551615U);
}

TEST(PlainInteger, RefusesWhatTheLibraryRefuses) {
    cdgen cx;
    text_pool pool;
    for (const char *text : {"-", "--5", "-5x", "- 5", "+-5", "5-"}) {
        vx_value_t cell = {};
        EXPECT_EQ(str_to_vx(cx, &cell, VX_INT64, text, pool), -1) << text;
    }
}

} // namespace
