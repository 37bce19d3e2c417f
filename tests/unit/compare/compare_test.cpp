#include "compare/compare.h"

#include "format/records.h"

#include <gtest/gtest.h>

namespace {

using compare::change;
using compare::difference;
using compare::node;
using compare::node_kind;

constexpr cdb::field_fact PLAIN_FACT = {.field = "a_field"};

template <class Record> compare::fact fact(std::size_t offset, std::string text) {
    return {&cdb::format_for<Record>.fact_at(offset), std::move(text)};
}

node part(node_kind kind, std::string name, std::string text = "1") {
    return {kind, std::move(name), {{&PLAIN_FACT, std::move(text)}}};
}

node whole(std::vector<node> parts) {
    return {node_kind::database, {}, {}, std::move(parts)};
}

/* "removed b" */
std::vector<std::string> texts_of(const node &before, const node &after) {
    std::vector<std::string> texts;
    for (const difference &d : compare::differences(before, after)) {
        std::string what = d.what == change::removed ? "removed " : d.what == change::added ? "added " : "changed ";
        texts.push_back(what + d.path.back()->name);
    }
    return texts;
}

/* Why a change of this fact breaks readers. */
std::string_view breach_of(const compare::fact &before) {
    compare::fact after = before;
    after.text += "'";
    node holder = {node_kind::persistent_attribute, "'A'"};
    return compare::breach({change::changed, {&holder}, &before, &after});
}

} // namespace

TEST(compare, equal_trees_do_not_differ) {
    node tree = whole({part(node_kind::action, "a"), part(node_kind::action, "a")});
    EXPECT_TRUE(compare::differences(tree, tree).empty());
}

TEST(compare, order_of_parts_does_not_matter) {
    EXPECT_TRUE(texts_of(whole({part(node_kind::action, "a"), part(node_kind::action, "b")}),
                         whole({part(node_kind::action, "b"), part(node_kind::action, "a")}))
                    .empty());
}

TEST(compare, new_parts_come_after_those_that_were_there) {
    EXPECT_EQ(
        texts_of(
            whole({part(node_kind::action, "a"), part(node_kind::action, "b"), part(node_kind::action, "c")}),
            whole({part(node_kind::action, "d"), part(node_kind::action, "b", "2"), part(node_kind::action, "c")})),
        (std::vector<std::string>{"removed a", "changed b", "added d"}));
}

TEST(compare, parts_of_one_name_pair_in_their_order) {
    node two = whole({part(node_kind::action, "a", "1"), part(node_kind::action, "a", "2")});
    node three = whole(
        {part(node_kind::action, "a", "1"), part(node_kind::action, "a", "2"), part(node_kind::action, "a", "3")});
    EXPECT_EQ(texts_of(two, three), std::vector<std::string>{"added a"});
    EXPECT_EQ(texts_of(three, two), std::vector<std::string>{"removed a"});
}

TEST(compare, a_name_of_another_kind_is_another_part) {
    EXPECT_EQ(texts_of(whole({part(node_kind::action, "a")}), whole({part(node_kind::class_action, "a")})),
              (std::vector<std::string>{"removed a", "added a"}));
}

TEST(compare, a_difference_says_where_it_is_and_what_was_there) {
    node before = whole({part(node_kind::action, "a", "1")}), after = whole({part(node_kind::action, "a", "2")});
    difference d = compare::differences(before, after).at(0);
    EXPECT_EQ(d.path, (std::vector<const node *>{&after, &after.parts[0]}));
    EXPECT_EQ(d.before->text + d.after->text, "12");
}

TEST(compare, what_readers_look_for_must_not_be_removed) {
    node attribute = part(node_kind::dynamic_class_attribute, "'A'"), variety = part(node_kind::variety, "0 to 1");
    EXPECT_EQ(compare::breach({change::removed, {&attribute}}), "readers miss it");
    EXPECT_EQ(compare::breach({change::added, {&attribute}}), "");
    EXPECT_EQ(compare::breach({change::removed, {&variety}}), "");
}

TEST(compare, elements_must_stay_as_they_are) {
    node element = part(node_kind::element, "'E'");
    EXPECT_EQ(compare::breach({change::added, {&element}}), "another layout of the structure");
    EXPECT_EQ(compare::breach({change::removed, {&element}}), "another layout of the structure");
    EXPECT_EQ(breach_of({&compare::ELEMENT_INDEX, "0"}), "another layout of the structure");
}

TEST(compare, numbers_and_types_must_not_change) {
    EXPECT_EQ(breach_of(fact<rsrc_pattr_t>(offsetof(rsrc_pattr_t, ra_attr_id), "1")), "readers know it by its number");
    EXPECT_EQ(breach_of(fact<rsrc_action_t>(offsetof(rsrc_action_t, ac_action_id), "1")),
              "readers know it by its number");
    EXPECT_EQ(breach_of(fact<sd_field_t>(offsetof(sd_field_t, sd_field_type), "Int32")), "values of another type");
    EXPECT_EQ(breach_of(fact<rsrc_dattr_t>(offsetof(rsrc_dattr_t, ra_dscr_msgid), "1")), "");
    EXPECT_EQ(breach_of(fact<rsrc_error_t>(offsetof(rsrc_error_t, re_error_id), "1")), "");
}

TEST(compare, elements_of_two_structures_do_not_pair) {
    constexpr cdb::field_fact input = {.field = "a", .words = "input element"};
    constexpr cdb::field_fact response = {.field = "b", .words = "response element"};
    node one = part(node_kind::element, "'E'"), other = one;
    one.field = &input;
    other.field = &response;
    EXPECT_EQ(texts_of(whole({one}), whole({other})), (std::vector<std::string>{"removed 'E'", "added 'E'"}));
}

TEST(compare, labels_of_nodes) {
    constexpr cdb::field_fact input = {.field = "a", .words = "input element"};
    node element = {.kind = node_kind::element, .field = &input};
    EXPECT_EQ(element.label(), "input element");
    EXPECT_EQ(node{node_kind::class_action}.label(), "ClassAction");
    EXPECT_EQ(node{node_kind::valid_value}.label(), "valid value");
}
