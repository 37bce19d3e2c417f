/* The index of a fixed list of names: one candidate for a name, found without comparing. */

#include "language/name_index.h"

#include <gtest/gtest.h>

#include <array>
#include <string>

namespace {

constexpr std::array<std::string_view, 8> NAMES = {"a", "b", "ab", "ba", "abc", "Abc", "abcd", "a longer name"};
constexpr name_index INDEX(NAMES.size(), [](std::size_t i) { return NAMES[i]; });

/* It is made while compiling. */
static_assert(INDEX.candidate("abc") == 4);
static_assert(INDEX.candidate("") == name_index::NOT_FOUND);

TEST(NameIndex, CandidateOfAListedNameIsItsPosition) {
    for (std::size_t i = 0; i < NAMES.size(); ++i)
        EXPECT_EQ(INDEX.candidate(NAMES[i]), static_cast<int>(i)) << NAMES[i];
}

TEST(NameIndex, EmptyNameHasNoCandidate) {
    EXPECT_EQ(INDEX.candidate({}), name_index::NOT_FOUND);
    EXPECT_EQ(INDEX.candidate(std::string_view("abc").substr(0, 0)), name_index::NOT_FOUND);
}

TEST(NameIndex, LengthOfANameIsPartOfIt) {
    std::string_view text = "abcd";
    EXPECT_EQ(INDEX.candidate(text.substr(0, 1)), 0);
    EXPECT_EQ(INDEX.candidate(text.substr(0, 2)), 2);
    EXPECT_EQ(INDEX.candidate(text.substr(0, 3)), 4);
    EXPECT_EQ(INDEX.candidate(text), 6);
}

TEST(NameIndex, CandidateOfAnyNameIsAPositionOrNone) {
    int positions = 0, none = 0;
    for (int length = 1; length < 40; ++length)
        for (int c = 0; c < 256; ++c) {
            int candidate = INDEX.candidate(std::string(static_cast<std::size_t>(length), static_cast<char>(c)));
            ASSERT_GE(candidate, name_index::NOT_FOUND);
            ASSERT_LT(candidate, static_cast<int>(NAMES.size()));
            ++(candidate == name_index::NOT_FOUND ? none : positions);
        }
    EXPECT_GT(positions, 0);
    EXPECT_GT(none, positions); /* most slots are empty */
}

TEST(NameIndex, CharactersAreUnsigned) {
    constexpr std::array<std::string_view, 2> high = {"\xff\x80", "\x7f\x80"};
    constexpr name_index index(high.size(), [&](std::size_t i) { return high[i]; });
    EXPECT_EQ(index.candidate("\xff\x80"), 0);
    EXPECT_EQ(index.candidate("\x7f\x80"), 1);
}

TEST(NameIndex, EmptyListHasNoCandidates) {
    constexpr name_index index(0, [](std::size_t) { return std::string_view(); });
    EXPECT_EQ(index.candidate("a"), name_index::NOT_FOUND);
}

} // namespace
