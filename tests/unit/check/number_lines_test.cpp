/* Numbers, each with the line that gave it first. */

#include "check/number_lines.h"

#include <gtest/gtest.h>

namespace {

TEST(NumberLines, RemembersTheFirstLine) {
    check::number_lines lines;
    EXPECT_EQ(lines.find(7), 0);
    EXPECT_EQ(lines.add(7, 5), 0);
    EXPECT_EQ(lines.add(7, 6), 5);
    EXPECT_EQ(lines.find(7), 5);
    EXPECT_EQ(lines.find(0), 0);
}

TEST(NumberLines, DistinguishesNumbersWithTheSameHash) {
    check::number_lines lines;
    EXPECT_EQ(lines.add(1176, 1), 0);
    EXPECT_EQ(lines.find(26580224), 0);
    EXPECT_EQ(lines.add(26580224, 2), 0);
    EXPECT_EQ(lines.find(1176), 1);
    EXPECT_EQ(lines.find(26580224), 2);
}

TEST(NumberLines, HoldsMany) {
    check::number_lines lines;
    for (int i = 1; i <= 10000; ++i)
        EXPECT_EQ(lines.add(static_cast<vx_uint32_t>(i) * 64, i), 0);
    for (int i = 1; i <= 10000; ++i) {
        EXPECT_EQ(lines.find(static_cast<vx_uint32_t>(i) * 64), i);
        EXPECT_EQ(lines.find(static_cast<vx_uint32_t>(i) * 64 + 1), 0);
    }
}

TEST(NumberLines, IsEmptyWhenCleared) {
    check::number_lines lines;
    for (int count : {1000, 1, 100}) {
        for (int i = 1; i <= count; ++i)
            EXPECT_EQ(lines.add(static_cast<vx_uint32_t>(i), i), 0);
        lines.clear();
        EXPECT_EQ(lines.find(1), 0);
    }
}

} // namespace
