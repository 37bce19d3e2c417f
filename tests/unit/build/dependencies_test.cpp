/* Dependencies in Make's syntax. */

#include "build/dependencies.h"

#include <gtest/gtest.h>

namespace {

using build::rule_name;

TEST(Dependencies, EscapesWhatMakeWouldNotTakeForAName) {
    EXPECT_EQ(rule_name("d/a.cdef"), "d/a.cdef");
    EXPECT_EQ(rule_name("a b\tc"), "a\\ b\\\tc");
    EXPECT_EQ(rule_name("a#b:c"), "a\\#b\\:c");
    EXPECT_EQ(rule_name("a$b"), "a$$b");
    EXPECT_EQ(rule_name("~a"), "./~a");
    EXPECT_THROW(rule_name("a\nb"), build::wrong_request);
    EXPECT_THROW(rule_name("a;b"), build::wrong_request);
    EXPECT_THROW(rule_name("a|b"), build::wrong_request);
}

TEST(Dependencies, DoublesBackslashesOnlyWhereTheyWouldEscape) {
    EXPECT_EQ(rule_name("a\\b"), "a\\b");
    EXPECT_EQ(rule_name("a\\ b"), "a\\\\\\ b");
    EXPECT_EQ(rule_name("a\\"), "a\\\\");
}

TEST(Dependencies, HaveARuleForEachUnit) {
    std::vector<build::unit> units = {{"a b", "c", {{"x", std::endian::little}, {"y", std::endian::big}}},
                                      {"-", "d", {{"d", std::endian::little}}},
                                      {"e", "f", {{"f", std::endian::little}}, "g h/cdef.toml"}};
    EXPECT_EQ(build::dependencies_of(units), "x y: a\\ b\nd:\nf: e g\\ h/cdef.toml\n");
}

} // namespace
