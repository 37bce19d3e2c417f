/* Texts, each with the line that gave it first. */

#include "check/first_lines.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <cstring>
#include <functional>
#include <string>
#include <vector>

namespace {

using names = std::vector<std::string_view>;

constexpr text::hash_key KEY_OF_TEXTS = {1, 2};

TEST(FirstLines, RemembersTheLineOfAText) {
    check::first_lines lines(KEY_OF_TEXTS);
    EXPECT_EQ(lines.line_of("a"), 0);
    lines.line_of("a") = 5;
    EXPECT_EQ(lines.line_of("a"), 5);
    EXPECT_EQ(lines.line_of("b"), 0);
    EXPECT_EQ(lines.all(), (names{"a", "b"}));
}

TEST(FirstLines, HasWhatWasAskedFor) {
    check::first_lines lines(KEY_OF_TEXTS);
    EXPECT_FALSE(lines.has("a"));
    lines.line_of("a") = 1;
    lines.line_of("") = 2;
    EXPECT_TRUE(lines.has("a"));
    EXPECT_TRUE(lines.has(""));
    EXPECT_FALSE(lines.has("aa"));
}

TEST(FirstLines, HoldsManyTexts) {
    check::first_lines texts(KEY_OF_TEXTS);
    for (int i = 1; i <= 10000; ++i)
        texts.line_of(std::to_string(i)) = i;
    for (int i = 1; i <= 10000; ++i)
        EXPECT_EQ(texts.line_of(std::to_string(i)), i);
}

/* With so many texts some share the 32 bits of the hash that count. */
TEST(FirstLines, TellsTextsOfOneHashApart) {
    constexpr int COUNT = 300'000;
    check::first_lines lines(KEY_OF_TEXTS);
    for (int i = 1; i <= COUNT; ++i)
        lines.line_of(std::to_string(i)) = i;
    int wrong = 0;
    for (int i = 1; i <= COUNT; ++i)
        wrong += lines.find(std::to_string(i)) != i;
    EXPECT_EQ(wrong, 0);
}

TEST(FirstLines, IsEmptyWhenCleared) {
    check::first_lines lines(KEY_OF_TEXTS);
    lines.line_of("a") = 1;
    lines.clear();
    EXPECT_FALSE(lines.has("a"));
    EXPECT_EQ(lines.line_of("a"), 0);
    EXPECT_EQ(lines.all(), names{"a"});
}

TEST(FirstLines, IsEmptyWhenClearedAfterMany) {
    check::first_lines lines(KEY_OF_TEXTS);
    for (int count : {1000, 1, 100}) {
        for (int i = 1; i <= count; ++i)
            lines.line_of(std::to_string(i)) = i;
        lines.clear();
        EXPECT_FALSE(lines.has("1"));
        EXPECT_TRUE(lines.all().empty());
    }
}

/* Texts of 16 bytes that have the same hash in the standard library for 64 bits: the second half of each undoes what
 * the first half did. */
std::vector<std::string> colliding_texts(std::uint64_t count) {
    constexpr std::uint64_t MIX = 0xC6A4A7935BD1E995, INVERSE = 0x5F7A0EA7E59B19BD, SEED = 0xC70F6907;
    static_assert(MIX * INVERSE == 1);
    auto folded = [](std::uint64_t n) { return n ^ n >> 47; };
    std::vector<std::string> texts;
    for (std::uint64_t i = 0; i < count; ++i) {
        std::uint64_t state = (SEED ^ 16 * MIX ^ folded(i * MIX) * MIX) * MIX;
        const std::uint64_t halves[] = {i, folded(state * INVERSE) * INVERSE};
        std::string &text = texts.emplace_back(sizeof halves, ' ');
        std::memcpy(text.data(), halves, sizeof halves);
    }
    return texts;
}

/* A source can be made of such names. */
TEST(FirstLines, FindsCollidingTextsSoon) {
    constexpr size_t COUNT = 5000, SOON = 8;
    std::vector<std::string> texts = colliding_texts(COUNT);
    if constexpr (sizeof(size_t) == 8) {
        EXPECT_EQ(std::hash<std::string>()(texts.front()), std::hash<std::string>()(texts.back()));
    }
    check::first_lines lines(KEY_OF_TEXTS);
    for (const std::string &text : texts)
        lines.line_of(text) = 1;
    EXPECT_EQ(lines.size(), COUNT);
    size_t probes = 0;
    for (const std::string &text : texts)
        probes += lines.probes_for(text);
    EXPECT_GE(probes, COUNT);
    EXPECT_LE(probes, SOON * COUNT);
}

TEST(FirstLines, HasSlotsThatDependOnTheKey) {
    check::first_lines one(KEY_OF_TEXTS);
    check::first_lines other({3, 4});
    size_t differ = 0;
    for (int i = 0; i < 1000; ++i) {
        one.line_of(std::to_string(i)) = i;
        other.line_of(std::to_string(i)) = i;
    }
    for (int i = 0; i < 1000; ++i)
        differ += one.probes_for(std::to_string(i)) != other.probes_for(std::to_string(i)) ? 1 : 0;
    EXPECT_GT(differ, 100u);
    EXPECT_EQ(one.all(), other.all());
}

} // namespace
