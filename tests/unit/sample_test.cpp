/* Which cases of an exhaustive test are run. */

#include "sample.h"

#include <gtest/gtest.h>

#include <vector>

namespace {

std::vector<int> taken(sampling::sample cases, int count) {
    std::vector<int> numbers;
    for (int i = 0; i < count; ++i)
        if (cases.takes())
            numbers.push_back(i);
    return numbers;
}

TEST(Sample, IsEverythingByDefault) {
    EXPECT_EQ(taken({1, 5}, 4), (std::vector{0, 1, 2, 3}));
    EXPECT_EQ(taken({0, 5}, 2), (std::vector{0, 1}));
}

TEST(Sample, SeedChoosesItsCases) {
    EXPECT_EQ(taken({7, 0}, 15), (std::vector{0, 7, 14}));
    EXPECT_EQ(taken({7, 1}, 15), (std::vector{6, 13}));
    EXPECT_EQ(taken({7, 8}, 15), (std::vector{6, 13}));
}

TEST(Sample, SeedsInARowRunEachCaseOnce) {
    std::vector<int> runs(100);
    for (std::uint64_t seed = 3; seed < 10; ++seed)
        for (int number : taken({7, seed}, 100))
            ++runs[static_cast<std::size_t>(number)];
    EXPECT_EQ(runs, std::vector<int>(100, 1));
}

} // namespace
