/* Places of a text as the protocol counts them. */

#include "server/positions.h"

#include <gtest/gtest.h>

#include <random>
#include <string>

namespace lsp {

void PrintTo(const position &at, std::ostream *to) {
    *to << at.line << ":" << at.character;
}

} // namespace lsp

namespace {

using lsp::encoding;
using lsp::position;

/* Greek, a combining character, and one outside of the first plane: 2, 2 and 4 bytes; 1, 1 and 2 units. */
constexpr std::string_view LETTERS = "\xCE\xB1"
                                     "e\xCC\x81"
                                     "\xF0\x9D\x94\x8A.";

position position_in(std::string_view text, std::size_t offset, encoding units) {
    lsp::line_table lines(text);
    return lsp::position_maker(text, lines, units).at(offset);
}

std::size_t offset_in(std::string_view text, position at, encoding units) {
    return lsp::offset_of(text, lsp::line_table(text), at, units);
}

TEST(Positions, CountUnits) {
    EXPECT_EQ(position_in(LETTERS, 9, encoding::utf16), (position{0, 5}));
    EXPECT_EQ(position_in(LETTERS, 9, encoding::utf8), (position{0, 9}));
    EXPECT_EQ(offset_in(LETTERS, {0, 5}, encoding::utf16), 9U);
    EXPECT_EQ(offset_in(LETTERS, {0, 9}, encoding::utf8), 9U);
}

TEST(Positions, InACharacterAreAtItsBeginning) {
    EXPECT_EQ(offset_in(LETTERS, {0, 4}, encoding::utf16), 5U);
    EXPECT_EQ(offset_in(LETTERS, {0, 6}, encoding::utf8), 5U);
    EXPECT_EQ(position_in(LETTERS, 7, encoding::utf16), (position{0, 3}));
}

TEST(Positions, OutsideAreAtTheNearestEnd) {
    EXPECT_EQ(offset_in("ab\ncd", {0, 9}, encoding::utf16), 2U);
    EXPECT_EQ(offset_in("ab\r\ncd", {0, 9}, encoding::utf16), 2U);
    EXPECT_EQ(offset_in("ab\ncd", {1, 9}, encoding::utf16), 5U);
    EXPECT_EQ(offset_in("ab\ncd", {7, 0}, encoding::utf16), 5U);
}

TEST(Positions, KnowThreeEndsOfLines) {
    constexpr std::string_view text = "a\rb\nc\r\nd";
    EXPECT_EQ(position_in(text, 2, encoding::utf16), (position{1, 0}));
    EXPECT_EQ(position_in(text, 4, encoding::utf16), (position{2, 0}));
    EXPECT_EQ(position_in(text, 6, encoding::utf16), (position{2, 1}));
    EXPECT_EQ(position_in(text, 7, encoding::utf16), (position{3, 0}));
}

TEST(Positions, ReadOtherBytesAsReplacements) {
    EXPECT_EQ(position_in("\xFF\xFF.", 2, encoding::utf16), (position{0, 2}));
    EXPECT_EQ(position_in("\xFF\xFF.", 2, encoding::utf8), (position{0, 6}));
}

TEST(Positions, ComeInAnyOrder) {
    std::string text = "abc\ndef";
    lsp::line_table lines(text);
    lsp::position_maker make(text, lines, encoding::utf16);
    EXPECT_EQ(make.at(6), (position{1, 2}));
    EXPECT_EQ(make.at(5), (position{1, 1}));
    EXPECT_EQ(make.at(1), (position{0, 1}));
    EXPECT_EQ(make.at(2), (position{0, 2}));
}

TEST(Lines, FollowEveryChange) {
    std::mt19937 random(7);
    auto below = [&](std::size_t end) { return static_cast<std::size_t>(random() % end); };
    std::string text;
    lsp::line_table lines(text);
    for (int round = 0; round < 5000; ++round) {
        std::size_t begin = below(text.size() + 1);
        lsp::stretch old = {begin, begin + below(std::min<std::size_t>(text.size() - begin, 4) + 1)};
        std::string fresh;
        for (std::size_t length = below(5); length > 0; --length)
            fresh += "a\r\n"[below(3)];
        text.replace(old.begin, old.end - old.begin, fresh);
        lines.change(text, old, fresh.size());
        lsp::line_table anew(text);
        ASSERT_EQ(lines.count(), anew.count());
        for (std::size_t line = 0; line < lines.count(); ++line)
            ASSERT_EQ(lines.begin(line), anew.begin(line));
    }
}

} // namespace
