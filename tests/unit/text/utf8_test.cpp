#include "text/utf8.h"

#include <gtest/gtest.h>

using namespace std::string_view_literals;

TEST(text_utf8, length_of_well_formed_characters) {
    EXPECT_EQ(text::utf8_length("ab"), 1U);
    EXPECT_EQ(text::utf8_length("\0"sv), 1U);
    EXPECT_EQ(text::utf8_length("\xC3\xA4x"), 2U);
    EXPECT_EQ(text::utf8_length("\xE2\x82\xAC"), 3U);
    EXPECT_EQ(text::utf8_length("\xF4\x8F\xBF\xBF"), 4U);
}

TEST(text_utf8, no_length_of_anything_else) {
    for (std::string_view bad : {""sv, "\x80"sv, "\xC1\x81"sv, "\xC3"sv, "\xC3x"sv, "\xE0\x9F\xBF"sv, "\xED\xA0\x80"sv,
                                 "\xF0\x8F\xBF\xBF"sv, "\xF4\x90\x80\x80"sv, "\xF5\x80\x80\x80"sv, "\xFF"sv})
        EXPECT_EQ(text::utf8_length(bad), 0U) << bad.size();
    EXPECT_EQ(text::length_or_1("\xFF\xFF"), 1U);
    EXPECT_EQ(text::length_or_1(""), 0U);
}

TEST(text_utf8, whole_texts) {
    EXPECT_TRUE(text::is_utf8(""));
    EXPECT_TRUE(text::is_utf8("a\xC3\xA4"));
    EXPECT_FALSE(text::is_utf8("a\xC3"));
}

TEST(text_utf8, characters_in) {
    EXPECT_EQ(text::characters_in(""), 0U);
    EXPECT_EQ(text::characters_in("a\xC3\xA4z"), 3U);
    EXPECT_EQ(text::characters_in("\x80z"), 1U);
}

TEST(text_utf8, decode) {
    EXPECT_EQ(text::decode("A"), U'A');
    EXPECT_EQ(text::decode("\xC3\xA4"), U'\u00E4');
    EXPECT_EQ(text::decode("\xE2\x82\xAC"), U'\u20AC');
    EXPECT_EQ(text::decode("\xF0\x9F\x98\x80"), U'\U0001F600');
}

TEST(text_utf8, length_of_what_is_replaced) {
    EXPECT_EQ(text::length_replaced(""), 0U);
    EXPECT_EQ(text::length_replaced("\xC3\xA4x"), 2U);
    EXPECT_EQ(text::length_replaced("\xE2\x82x"), 2U);
    EXPECT_EQ(text::length_replaced("\xF0\x9F\x98"), 3U);
    EXPECT_EQ(text::length_replaced("\xF0\x8F\xBF\xBF"), 1U);
    EXPECT_EQ(text::length_replaced("\x80\x80"), 1U);
}
