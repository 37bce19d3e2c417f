/* Most numbers convert without the C library. They convert to the same. */

#include "compiler/cdgen.h"

#include <gtest/gtest.h>

#include <cerrno>
#include <cmath>
#include <cstdio>
#include <cstdlib>
#include <limits>
#include <random>
#include <string>
#include <tuple>

namespace {

template <class Number> Number converted(const std::string &text, vx_data_type_t type) {
    static cdgen cx;
    text_pool pool;
    vx_value_t cell = {};
    EXPECT_EQ(str_to_vx(cx, &cell, type, text, pool), 0) << text;
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

/* A number below count, which is not 0. */
size_t below(size_t count, std::mt19937_64 &random) {
    return static_cast<size_t>(random() % count);
}

TEST(PlainFraction, HasTheLibrarysBitsAnywhere) {
    std::mt19937_64 random(1);
    for (int i = 0; i < 20000; ++i) {
        std::string text = std::to_string(random() >> (random() % 64));
        text.insert(text.size() - below(text.size() < 9 ? text.size() : 9, random), ".");
        expect_library_bits((random() % 2 != 0 ? "-" : "") + (text[0] == '.' ? "0" + text : text));
    }
}

/* ---- Any text -------------------------------------------------------------------------------------------------- */

/* The result of a conversion, the bits of its value if it is 0, and errno as it leaves it. */
using outcome = std::tuple<int, std::string, int>;

template <class Float> outcome by_the_library(const std::string &text, Float (*convert)(const char *, char **)) {
    using limits = std::numeric_limits<Float>;
    char *end = nullptr;
    errno = 0;
    Float value = convert(text.c_str(), &end);
    bool suspicious = value == 0 || value >= limits::max() || value == limits::min();
    bool refused = text.empty() || *end != '\0' || (suspicious && (errno == ERANGE || errno == EINVAL));
    return {refused ? -1 : 0, refused ? "" : bits(value), text.empty() ? 0 : errno};
}

template <class Float> outcome by_the_compiler(const std::string &text, vx_data_type_t type) {
    static cdgen cx;
    text_pool pool;
    vx_value_t cell = {};
    cx.conv_errno = 0;
    int result = str_to_vx(cx, &cell, type, text, pool);
    Float value = 0;
    memcpy(&value, &cell, sizeof value);
    return {result, result == 0 ? bits(value) : "", cx.conv_errno};
}

std::string digits(std::mt19937_64 &random, size_t most) {
    std::string text;
    for (size_t count = below(most + 1, random); count > 0; --count)
        text += static_cast<char>('0' + random() % 10);
    return text;
}

std::string written(const char *form, double number) {
    char text[2000];
    snprintf(text, sizeof text, form, number);
    return text;
}

/* A number near a Float, near the next Float, or near the middle between them, with all its digits or only some. */
template <class Float> std::string close_to(std::mt19937_64 &random) {
    std::conditional_t<sizeof(Float) == 4, uint32_t, uint64_t> pattern = 0;
    pattern = static_cast<decltype(pattern)>(random());
    if (random() % 8 == 0)
        pattern %= decltype(pattern){1} << (random() % (8 * sizeof pattern)); /* small ones lose precision */
    Float number = 0;
    memcpy(&number, &pattern, sizeof number);
    Float next = std::nextafter(number, std::numeric_limits<Float>::infinity());
    double middle = sizeof(Float) == 4 ? (double{number} + double{next}) / 2 : number;
    constexpr const char *FORMS[] = {"%.7g", "%.9g", "%.17g", "%.30e", "%.1080g", "%a"};
    return written(FORMS[random() % std::size(FORMS)], random() % 2 == 0 ? double{number} : middle);
}

std::string any_number(std::mt19937_64 &random) {
    switch (random() % 4) {
    case 0:
        return close_to<float>(random);
    case 1:
        return close_to<double>(random);
    default:
        break;
    }
    std::string text = (random() % 4 == 0 ? "-" : "") + digits(random, below(30, random));
    if (random() % 2 == 0)
        text += "." + digits(random, below(30, random));
    constexpr const char *EXPONENTS[] = {"", "", "e", "E-", "e+", "p", "x"};
    const char *exponent = EXPONENTS[random() % std::size(EXPONENTS)];
    return *exponent == '\0' ? text : text + exponent + digits(random, 3);
}

std::string any_text(std::mt19937_64 &random) {
    constexpr const char *WORDS[] = {"inf", "-inf", "nan", "NAN(1)", "infinity", "", "-", ".", "0x", "0x1p", "1e999"};
    if (random() % 50 == 0)
        return WORDS[random() % std::size(WORDS)];
    std::string text = any_number(random);
    if (random() % 20 == 0)
        text.insert(below(text.size() + 1, random), 1, "+- .e0x,\t1"[random() % 10]);
    return text;
}

/* script/proof asks for millions. */
TEST(PlainFraction, AnyTextHasTheLibrarysOutcome) {
    const char *wanted = getenv("CDGEN_FLOATS");
    const char *seed = getenv("CDGEN_FLOATS_SEED");
    std::mt19937_64 random(seed == nullptr ? 1 : strtoull(seed, nullptr, 10));
    for (unsigned long left = wanted == nullptr ? 30000 : strtoul(wanted, nullptr, 10); left > 0; --left) {
        std::string text = any_text(random);
        ASSERT_EQ(by_the_compiler<float>(text, VX_FLOAT32), by_the_library(text, strtof)) << text;
        ASSERT_EQ(by_the_compiler<double>(text, VX_FLOAT64), by_the_library(text, strtod)) << text;
    }
}

/* These are smaller than the smallest normal number and are rounded to it, which the library reports. */
TEST(PlainFraction, JustBelowTheNormalNumbersIsRefused) {
    const outcome refused = {-1, "", ERANGE};
    EXPECT_EQ(by_the_compiler<float>("1.1754943e-38", VX_FLOAT32), refused);
    EXPECT_EQ(by_the_compiler<double>("2.2250738585072012e-308", VX_FLOAT64), refused);
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
    for (std::string text : {"-", "--5", "-5x", "- 5", "+-5", "5-"}) {
        vx_value_t cell = {};
        EXPECT_EQ(str_to_vx(cx, &cell, VX_INT64, text, pool), -1) << text;
    }
}

} // namespace
