/* Which list each dynamic attribute is in, from the lists' IDs. */

#include "cdef/source/groups.h"

#include <gtest/gtest.h>

namespace {

using cdef::source::deal_out;

using ids = std::vector<var_id_t>;
using lists = std::vector<ids>;
using owners = std::vector<std::optional<std::size_t>>;
constexpr auto NOWHERE = std::nullopt;

TEST(SourceGroups, UniqueIdsSayIt) {
    EXPECT_EQ(deal_out(ids{1, 2, 3}, lists{{3}, {1}}), (owners{1, NOWHERE, 0}));
}

TEST(SourceGroups, OfEqualIdsTheFirstIsTaken) {
    EXPECT_EQ(deal_out(ids{7, 7}, lists{{7}}), (owners{0, NOWHERE}));
}

/* The first 7 goes to the list that continues with 5, although it would also fit the other list. */
TEST(SourceGroups, AWrongChoiceIsTakenBack) {
    EXPECT_EQ(deal_out(ids{7, 5, 7}, lists{{7}, {7, 5}}), (owners{1, 1, 0}));
}

TEST(SourceGroups, IdsInAnotherOrderCannotBeHad) {
    EXPECT_EQ(deal_out(ids{1, 2}, lists{{2, 1}}), std::nullopt);
}

TEST(SourceGroups, AnIdThatNoMemberHasCannotBeHad) {
    EXPECT_EQ(deal_out(ids{1}, lists{{9}}), std::nullopt);
}

TEST(SourceGroups, WithoutListsNobodyIsInOne) {
    EXPECT_EQ(deal_out(ids{1, 2}, {}), (owners{NOWHERE, NOWHERE}));
}

} // namespace
