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

constexpr var_id_t TWICE = 100, ONCE = 101;

/* IDs that two members each have, and two lists each of one of these IDs. */
struct pairs {
    explicit pairs(var_id_t count) {
        for (var_id_t id = 0; id < count; ++id) {
            half.push_back(id);
            to.insert(to.end(), {{id}, {id}});
        }
    }
    std::optional<owners> dealt(const ids &before, const ids &after) const {
        ids members = before;
        members.insert(members.end(), half.begin(), half.end());
        members.insert(members.end(), half.begin(), half.end());
        members.insert(members.end(), after.begin(), after.end());
        return deal_out(members, to);
    }

    ids half;
    lists to = {{TWICE}, {TWICE, ONCE}};
};

/* The first member goes to the first list. When it is seen that the second list needs it, all ways to deal out the
 * pairs are tried before it is taken back. */
TEST(SourceGroups, FewMembersMayHaveManyWrongChoices) {
    std::optional<owners> dealt = pairs(14).dealt({TWICE}, {ONCE, TWICE});
    ASSERT_TRUE(dealt);
    EXPECT_EQ(dealt->front(), 1);
    EXPECT_EQ(dealt->back(), 0);
}

/* There are 2 to the 17th ways, and for each of them at least the second half of the pairs is looked at again. */
TEST(SourceGroups, TheSearchEndsBeforeItTakesLong) {
    EXPECT_EQ(pairs(17).dealt({TWICE}, {ONCE, TWICE}), std::nullopt);
}

/* The second member has to be in a list, so the choice for the first one was wrong, whatever follows. */
TEST(SourceGroups, AWrongChoiceShowsAtAMemberThatCannotBeSpared) {
    std::optional<owners> dealt = pairs(40).dealt({TWICE, ONCE}, {TWICE});
    ASSERT_TRUE(dealt);
    EXPECT_EQ(dealt->front(), 1);
    EXPECT_EQ(dealt->back(), 0);
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
