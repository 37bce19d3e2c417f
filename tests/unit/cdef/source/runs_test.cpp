/* What a structure shows about the run of SD stanzas that it came from. */

#include "cdef/source/runs.h"
#include "format/constants.h"

#include <gtest/gtest.h>

namespace {

using namespace cdef::source;

TEST(SourceRuns, TheHighestIndexSaysHowManyElementsHadOne) {
    EXPECT_EQ(indices_given(3, 2), 3);
    EXPECT_EQ(indices_given(3, 0), 1);
    EXPECT_EQ(indices_given(3, NO_SD_INDEX), 0);
    EXPECT_EQ(indices_given(3, 3), std::nullopt);
}

/* Only 16 bits of an index are kept: as many rounds as fit. */
TEST(SourceRuns, IndicesBeyond16BitsWrap) {
    EXPECT_EQ(indices_given(0x10000 + 3, 2), 0x10000 + 3);
    EXPECT_EQ(indices_given(0x10000, NO_SD_INDEX), 0x10000);
}

TEST(SourceRuns, TheLastElementsGoWithoutAnIndex) {
    EXPECT_EQ(indexed_elements({false, false, false}, 1), (std::vector<bool>{true, false, false}));
}

TEST(SourceRuns, ElementsWithValidValuesHaveAnIndex) {
    EXPECT_EQ(indexed_elements({false, true, false}, 2), (std::vector<bool>{true, true, false}));
    EXPECT_EQ(indexed_elements({false, false, true}, 2), (std::vector<bool>{true, false, true}));
}

TEST(SourceRuns, StructuredBytesHaveNoDefault) {
    EXPECT_TRUE(has_default(VX_INT32));
    EXPECT_FALSE(has_default(VX_SBS_PTR));
    EXPECT_FALSE(has_default(VX_UNKNOWN));
}

TEST(SourceRuns, ADefinitionWithoutElementsIsNotLate) {
    EXPECT_FALSE(comes_too_late({}, {}, NO_SD_INDEX));
}

} // namespace
