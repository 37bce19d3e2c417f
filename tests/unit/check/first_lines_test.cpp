/* Texts, each with the line that gave it first. */

#include "check/first_lines.h"

#include <gtest/gtest.h>

#include <string>

namespace {

using names = std::vector<std::string_view>;

TEST(FirstLines, RemembersTheLineOfAText) {
    check::first_lines lines;
    EXPECT_EQ(lines.line_of("a"), 0);
    lines.line_of("a") = 5;
    EXPECT_EQ(lines.line_of("a"), 5);
    EXPECT_EQ(lines.line_of("b"), 0);
    EXPECT_EQ(lines.all(), (names{"a", "b"}));
}

TEST(FirstLines, HasWhatWasAskedFor) {
    check::first_lines lines;
    EXPECT_FALSE(lines.has("a"));
    lines.line_of("a") = 1;
    lines.line_of("") = 2;
    EXPECT_TRUE(lines.has("a"));
    EXPECT_TRUE(lines.has(""));
    EXPECT_FALSE(lines.has("aa"));
}

TEST(FirstLines, HoldsManyTexts) {
    check::first_lines texts;
    for (int i = 1; i <= 10000; ++i)
        texts.line_of(std::to_string(i)) = i;
    for (int i = 1; i <= 10000; ++i)
        EXPECT_EQ(texts.line_of(std::to_string(i)), i);
}

/* With so many texts some share a tag, which has 32 bits. */
TEST(FirstLines, TellsTextsOfOneTagApart) {
    constexpr int COUNT = 300'000;
    check::first_lines lines;
    for (int i = 1; i <= COUNT; ++i)
        lines.line_of(std::to_string(i)) = i;
    int wrong = 0;
    for (int i = 1; i <= COUNT; ++i)
        wrong += lines.find(std::to_string(i)) != i;
    EXPECT_EQ(wrong, 0);
}

TEST(FirstLines, IsEmptyWhenCleared) {
    check::first_lines lines;
    lines.line_of("a") = 1;
    lines.clear();
    EXPECT_FALSE(lines.has("a"));
    EXPECT_EQ(lines.line_of("a"), 0);
    EXPECT_EQ(lines.all(), names{"a"});
}

TEST(FirstLines, IsEmptyWhenClearedAfterMany) {
    check::first_lines lines;
    for (int count : {1000, 1, 100}) {
        for (int i = 1; i <= count; ++i)
            lines.line_of(std::to_string(i)) = i;
        lines.clear();
        EXPECT_FALSE(lines.has("1"));
        EXPECT_TRUE(lines.all().empty());
    }
}

} // namespace
