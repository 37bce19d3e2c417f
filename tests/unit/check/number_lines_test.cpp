/* Numbers, each with the line that gave it first. */

#include "check/number_lines.h"

#include <gtest/gtest.h>

#include <vector>

namespace {

constexpr text::hash_key KEY_OF_NUMBERS = {1, 2};

TEST(NumberLines, RemembersTheFirstLine) {
    check::number_lines lines(KEY_OF_NUMBERS);
    EXPECT_EQ(lines.find(7), 0);
    EXPECT_EQ(lines.add(7, 5), 0);
    EXPECT_EQ(lines.add(7, 6), 5);
    EXPECT_EQ(lines.find(7), 5);
    EXPECT_EQ(lines.find(0), 0);
}

TEST(NumberLines, DistinguishesNumbers) {
    check::number_lines lines(KEY_OF_NUMBERS);
    EXPECT_EQ(lines.add(1176, 1), 0);
    EXPECT_EQ(lines.find(26580224), 0);
    EXPECT_EQ(lines.add(26580224, 2), 0);
    EXPECT_EQ(lines.find(1176), 1);
    EXPECT_EQ(lines.find(26580224), 2);
}

TEST(NumberLines, HoldsMany) {
    check::number_lines lines(KEY_OF_NUMBERS);
    for (int i = 1; i <= 10000; ++i)
        EXPECT_EQ(lines.add(static_cast<vx_uint32_t>(i) * 64, i), 0);
    for (int i = 1; i <= 10000; ++i) {
        EXPECT_EQ(lines.find(static_cast<vx_uint32_t>(i) * 64), i);
        EXPECT_EQ(lines.find(static_cast<vx_uint32_t>(i) * 64 + 1), 0);
    }
}

TEST(NumberLines, IsEmptyWhenCleared) {
    check::number_lines lines(KEY_OF_NUMBERS);
    for (int count : {1000, 1, 100}) {
        for (int i = 1; i <= count; ++i)
            EXPECT_EQ(lines.add(static_cast<vx_uint32_t>(i), i), 0);
        lines.clear();
        EXPECT_EQ(lines.find(1), 0);
    }
}

/* Numbers in groups of eight whose places are the same if they are mixed without a key. A source can be made of them.
 */
std::vector<vx_uint32_t> colliding_numbers(size_t count) {
    constexpr vx_uint32_t MIX = 0x9E3779B1;
    std::vector<vx_uint32_t> numbers;
    for (vx_uint32_t group = 1; numbers.size() < count; ++group)
        if (vx_uint32_t mixed = group * MIX; ((mixed ^ mixed >> 15) & 0x7FF) == 0)
            for (vx_uint32_t number = group * 8; number < group * 8 + 8; ++number)
                numbers.push_back(number);
    return numbers;
}

TEST(NumberLines, FindsCollidingNumbersSoon) {
    constexpr size_t COUNT = 4096, SOON = 8;
    std::vector<vx_uint32_t> numbers = colliding_numbers(COUNT);
    check::number_lines lines(KEY_OF_NUMBERS);
    for (vx_uint32_t number : numbers)
        EXPECT_EQ(lines.add(number, 1), 0);
    size_t probes = 0;
    for (vx_uint32_t number : numbers)
        probes += lines.probes_for(number);
    EXPECT_GE(probes, COUNT);
    EXPECT_LE(probes, SOON * COUNT);
}

} // namespace
