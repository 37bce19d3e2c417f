#include "compiler/cdgen_digits.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <optional>
#include <random>
#include <string>

namespace {

std::optional<uint64_t> number(const std::string &text) {
    std::string exact(text.data(), text.size()); /* the characters after it do not belong to it */
    uint64_t value = 0;
    return all_digits(exact, &value) ? std::optional(value) : std::nullopt;
}

TEST(Digits, OneToSixteen) {
    EXPECT_EQ(number("7"), 7U);
    EXPECT_EQ(number("42"), 42U);
    EXPECT_EQ(number("103"), 103U);
    EXPECT_EQ(number("1234"), 1234U);
    EXPECT_EQ(number("65536"), 65536U);
    EXPECT_EQ(number("00000000"), 0U);
    EXPECT_EQ(number("99999999"), 99999999U);
    EXPECT_EQ(number("123456789"), 123456789U);
    EXPECT_EQ(number("9999999999999999"), 9999999999999999U);
}

TEST(Digits, NoneOrTooMany) {
    EXPECT_EQ(number(""), std::nullopt);
    EXPECT_EQ(number("12345678901234567"), std::nullopt);
}

TEST(Digits, NoOtherCharacterAnywhere) {
    for (size_t length = 1; length <= MOST_DIGITS; ++length)
        for (size_t at = 0; at < length; ++at)
            for (int other = 0; other < 256; ++other) {
                std::string text(length, '9');
                text[at] = static_cast<char>(other);
                EXPECT_EQ(number(text).has_value(), other >= '0' && other <= '9') << text;
            }
}

TEST(Digits, TheNumberThatTheCLibraryReads) {
    std::mt19937_64 random(1);
    for (int i = 0; i < 100000; ++i) {
        std::string text = std::to_string(random());
        text.resize(1 + static_cast<size_t>(random() % std::min(text.size(), MOST_DIGITS)));
        EXPECT_EQ(number(text), strtoull(text.c_str(), nullptr, 10)) << text;
    }
}

} // namespace
