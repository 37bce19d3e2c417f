#include "text/shown.h"

#include <gtest/gtest.h>

using namespace std::string_view_literals;

TEST(text_shown, printable_characters) {
    EXPECT_EQ(text::printable_length(" "), 1U);
    EXPECT_EQ(text::printable_length("\xC3\xA4"), 2U);
    EXPECT_EQ(text::printable_length("e\xCC\x81"), 1U); /* a combining mark follows, and is printable too */
    EXPECT_EQ(text::printable_length("\xCC\x81"), 2U);
}

TEST(text_shown, characters_that_steer_or_hide) {
    for (std::string_view bad : {"\x1B["sv, "\t"sv, "\x7F"sv, "\xC2\x9B"sv, "\xC2\xAD"sv, "\xE2\x80\xAE"sv,
                                 "\xEF\xBB\xBF"sv, "\xF3\xA0\x80\x81"sv, "\xFF"sv})
        EXPECT_EQ(text::printable_length(bad), 0U) << bad.size();
}

TEST(text_shown, escaped_leaves_usual_text_as_it_is) {
    EXPECT_EQ(text::escaped("C:\\a \"b\" \xC3\xA4"), "C:\\a \"b\" \xC3\xA4");
    EXPECT_EQ(text::escaped("a\t\r\n\x1B[0m\xFF\0"sv), "a\\t\\r\\n\\x1b[0m\\xff\\x00");
    EXPECT_EQ(text::escaped("\xE2\x80\xAE"), "\\xe2\\x80\\xae");
}

TEST(text_shown, quoted) {
    EXPECT_EQ(text::quoted(""), "\"\"");
    EXPECT_EQ(text::quoted("a\"\\\n\xC3\xA4"), "\"a\\\"\\\\\\n\xC3\xA4\"");
}

TEST(text_shown, quoted_ascii) {
    EXPECT_EQ(text::quoted_ascii("it's \\ \"x\"~"), "'it\\'s \\\\ \"x\"~'");
    EXPECT_EQ(text::quoted_ascii("\n\xC3\xA4"), "'\\x0a\\xc3\\xa4'");
}

TEST(text_shown, masked_keeps_tabs_and_columns) {
    EXPECT_EQ(text::masked("\ta\x1B\xE2\x80\xAE\xFF\xC3\xA4"), "\ta???\xC3\xA4");
}
