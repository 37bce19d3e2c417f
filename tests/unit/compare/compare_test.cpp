#include "compare/compare.h"

#include "format/records.h"

#include <gtest/gtest.h>

namespace {

using cdef::change;
using cdef::difference;
using cdef::thing;

constexpr cdb::field_fact PLAIN_FACT = {.field = "a_field"};

template <class Record> cdef::fact fact(std::size_t offset, std::string text) {
    return {&cdb::format_for<Record>.fact_at(offset), std::move(text)};
}

thing part(std::string kind, std::string name, std::string text = "1") {
    return {std::move(kind), std::move(name), {{&PLAIN_FACT, std::move(text)}}, {}};
}

thing whole(std::vector<thing> parts) {
    return {"database", {}, {}, std::move(parts)};
}

/* "removed b" */
std::vector<std::string> told(const thing &before, const thing &after) {
    std::vector<std::string> texts;
    for (const difference &d : cdef::differences(before, after)) {
        std::string what = d.what == change::removed ? "removed " : d.what == change::added ? "added " : "changed ";
        texts.push_back(what + d.path.back()->name);
    }
    return texts;
}

/* Why a change of this fact breaks readers. */
std::string_view breach_of(const cdef::fact &before) {
    cdef::fact after = before;
    after.text += "'";
    thing holder = {"PersistentResourceAttribute", "'A'", {}, {}};
    return cdef::breach({change::changed, {&holder}, &before, &after});
}

} // namespace

TEST(compare, equal_trees_do_not_differ) {
    thing tree = whole({part("k", "a"), part("k", "a")});
    EXPECT_TRUE(cdef::differences(tree, tree).empty());
}

TEST(compare, order_of_parts_does_not_matter) {
    EXPECT_TRUE(told(whole({part("k", "a"), part("k", "b")}), whole({part("k", "b"), part("k", "a")})).empty());
}

TEST(compare, new_parts_come_after_those_that_were_there) {
    EXPECT_EQ(told(whole({part("k", "a"), part("k", "b"), part("k", "c")}),
                   whole({part("k", "d"), part("k", "b", "2"), part("k", "c")})),
              (std::vector<std::string>{"removed a", "changed b", "added d"}));
}

TEST(compare, parts_of_one_name_pair_in_their_order) {
    thing two = whole({part("k", "a", "1"), part("k", "a", "2")});
    thing three = whole({part("k", "a", "1"), part("k", "a", "2"), part("k", "a", "3")});
    EXPECT_EQ(told(two, three), std::vector<std::string>{"added a"});
    EXPECT_EQ(told(three, two), std::vector<std::string>{"removed a"});
}

TEST(compare, a_name_of_another_kind_is_another_part) {
    EXPECT_EQ(told(whole({part("k", "a")}), whole({part("l", "a")})),
              (std::vector<std::string>{"removed a", "added a"}));
}

TEST(compare, a_difference_says_where_it_is_and_what_was_there) {
    thing before = whole({part("k", "a", "1")}), after = whole({part("k", "a", "2")});
    difference d = cdef::differences(before, after).at(0);
    EXPECT_EQ(d.path, (std::vector<const thing *>{&after, &after.parts[0]}));
    EXPECT_EQ(d.before->text + d.after->text, "12");
}

TEST(compare, what_readers_look_for_must_not_be_removed) {
    thing attribute = part("DynamicClassAttribute", "'A'"), variety = part("variety", "0 to 1");
    EXPECT_EQ(cdef::breach({change::removed, {&attribute}}), "readers miss it");
    EXPECT_EQ(cdef::breach({change::added, {&attribute}}), "");
    EXPECT_EQ(cdef::breach({change::removed, {&variety}}), "");
}

TEST(compare, elements_must_stay_as_they_are) {
    thing element = part("input element", "'E'");
    EXPECT_EQ(cdef::breach({change::added, {&element}}), "another layout of the structure");
    EXPECT_EQ(cdef::breach({change::removed, {&element}}), "another layout of the structure");
    EXPECT_EQ(breach_of({&cdef::ELEMENT_INDEX, "0"}), "another layout of the structure");
}

TEST(compare, numbers_and_types_must_not_change) {
    EXPECT_EQ(breach_of(fact<rsrc_pattr_t>(offsetof(rsrc_pattr_t, ra_attr_id), "1")), "readers know it by its number");
    EXPECT_EQ(breach_of(fact<rsrc_action_t>(offsetof(rsrc_action_t, ac_action_id), "1")),
              "readers know it by its number");
    EXPECT_EQ(breach_of(fact<sd_field_t>(offsetof(sd_field_t, sd_field_type), "Int32")), "values of another type");
    EXPECT_EQ(breach_of(fact<rsrc_dattr_t>(offsetof(rsrc_dattr_t, ra_dscr_msgid), "1")), "");
    EXPECT_EQ(breach_of(fact<rsrc_error_t>(offsetof(rsrc_error_t, re_error_id), "1")), "");
}
