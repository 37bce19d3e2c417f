/* Which dynamic attributes get a Range line, from what is known of their bounds. */

#include "cdef/source/range.h"

#include <gtest/gtest.h>

namespace {

using namespace cdef::source;

cell cell_of(std::int32_t number) {
    cell made = {};
    std::memcpy(made.data(), &number, sizeof number);
    return made;
}

/* An Int32 attribute with these bounds. */
range int32(std::int32_t low, std::int32_t high) {
    return {.type = VX_INT32,
            .takes_line = true,
            .is_default = low == 0 && high == 100,
            .is_untouched = low == 0 && high == 0,
            .keeps_bounds = true,
            .has_none = false,
            .wanted = {.known = true, .in_arrays = false, .width = 4, .low = cell_of(low), .high = cell_of(high)}};
}

constexpr table OF_CLASS = table::dynamic_class_attributes;
constexpr table OF_RESOURCE = table::dynamic_attributes;

dynamic_attributes attributes(std::vector<range> of_class, std::vector<range> of_resource, std::vector<table> order) {
    return {std::move(of_class), std::move(of_resource), std::move(order), std::nullopt, false};
}

using lines = std::vector<std::string>;

TEST(SourceRange, DefaultBoundsNeedNoLine) {
    auto found = find_range_lines({attributes({}, {int32(0, 100)}, {OF_RESOURCE})});
    ASSERT_TRUE(found);
    EXPECT_EQ((*found)[0].of_resource, lines{""});
}

TEST(SourceRange, OtherBoundsAreALine) {
    auto found = find_range_lines({attributes({}, {int32(-1, 5)}, {OF_RESOURCE})});
    ASSERT_TRUE(found);
    EXPECT_EQ((*found)[0].of_resource, lines{"-1,5"});
}

/* A class attribute's line goes to the open resource attribute. Its own bounds stay untouched: the mark is set. */
TEST(SourceRange, ALineOfAClassAttributeGoesToAnOpenResourceAttribute) {
    auto found = find_range_lines({attributes({int32(0, 0)}, {int32(3, 4)}, {OF_RESOURCE, OF_CLASS})});
    ASSERT_FALSE(found); /* at the end the resource attribute is completed first, and clears the mark */
    found = find_range_lines({attributes({int32(0, 100)}, {int32(3, 4)}, {OF_RESOURCE, OF_CLASS})});
    ASSERT_TRUE(found);
    EXPECT_EQ((*found)[0].of_resource, lines{"3,4"});
    EXPECT_EQ((*found)[0].of_class, lines{""});
}

/* Its completion takes away what a class attribute's line has left. */
TEST(SourceRange, NothingGivesBoundsToACompletedAttributeThatKeepsNone) {
    range text = int32(5, 6);
    text.type = VX_CHAR_PTR;
    text.takes_line = text.keeps_bounds = false;
    EXPECT_FALSE(find_range_lines({attributes({int32(0, 0)}, {text}, {OF_RESOURCE, OF_CLASS})}));
    text.has_none = true;
    EXPECT_TRUE(find_range_lines({attributes({int32(0, 100)}, {text}, {OF_RESOURCE, OF_CLASS})}));
}

/* A class attribute keeps its own bounds only if no resource attribute is open, so it must come first. */
TEST(SourceRange, KindsChangePlacesIfTheyMust) {
    dynamic_attributes both =
        attributes({int32(1, 2), int32(0, 100)}, {int32(0, 100)}, {OF_RESOURCE, OF_CLASS, OF_CLASS});
    auto found = find_range_lines({both});
    ASSERT_TRUE(found);
    EXPECT_EQ((*found)[0].of_class, (lines{"1,2", ""}));
    EXPECT_EQ((*found)[0].order.front(), OF_CLASS);
}

TEST(SourceRange, AnAttributeCutShortKeepsItsBoundsWithoutDefault) {
    dynamic_attributes first = attributes({}, {int32(0, 0)}, {OF_RESOURCE});
    first.cut_short = true;
    EXPECT_TRUE(find_range_lines({first}));
    first.of_resource[0] = int32(0, 100);
    auto found = find_range_lines({first});
    ASSERT_TRUE(found);
    EXPECT_EQ((*found)[0].of_resource, lines{"0,100"});
}

/* Lines of types that are not numbers have no effect. */
TEST(SourceRange, BoundsThatNoLineGivesCannotBeHad) {
    range stubborn = int32(5, 6);
    stubborn.takes_line = false;
    EXPECT_FALSE(find_range_lines({attributes({}, {stubborn}, {OF_RESOURCE})}));
}

/* ---- One line -------------------------------------------------------------------------------------------------- */

TEST(SourceLineValue, IsOfTheTypeThatTheLineHas) {
    const wanted_bytes bytes = int32(-1, 5).wanted;
    EXPECT_EQ(line_value(bytes, VX_INT32), "-1,5");
    EXPECT_EQ(line_value(bytes, VX_UINT32), "4294967295,5");
    EXPECT_EQ(line_value(bytes, VX_INT32_ARRAY), "");
    EXPECT_EQ(line_value({}, VX_INT32), "");
}

TEST(SourceLineValue, ANarrowLineLeavesTheRestAsItWas) {
    range wide = int32(1, 2);
    wide.type = VX_INT64;
    wide.wanted.width = 8;
    EXPECT_EQ(after_line(wide, bounds::untouched, VX_INT32), bounds::wanted);
    EXPECT_EQ(after_line(wide, bounds::unwanted, VX_INT32), bounds::unwanted);
    EXPECT_EQ(after_line(wide, bounds::unwanted, VX_INT64), bounds::wanted);
}

} // namespace
