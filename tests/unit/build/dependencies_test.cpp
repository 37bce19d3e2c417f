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

TEST(Dependencies, KnowsWhatNinjaReadsDifferently) {
    for (const char *name : {"a'b", "a\"b", "a`b", "a*b", "a?b", "a<b", "a>b", "a^b", "a&b", "a\tb", "a\\", "a\\#b",
                             "a\\:b", "a\\$b", "a:", "a\rb", "a\x7f"})
        EXPECT_EQ(build::misreader_of(name, build::rule_side::prerequisite), "Ninja") << name;
    for (const char *name :
         {"a b", "a ", "a\\ b", "a#b", "a:b", "a$b", "a\\b", "a\\\\b", "\xc3\xa4", "a+,/_.~()}{@[]!-b", "", "-"})
        for (build::rule_side side : {build::rule_side::target, build::rule_side::prerequisite})
            EXPECT_EQ(build::misreader_of(name, side), "") << name;
}

TEST(Dependencies, KnowsWhatMakeReadsDifferently) {
    for (const char *name : {"a=b", "a(b)", "a\\*b", "a\\[b"})
        for (build::rule_side side : {build::rule_side::target, build::rule_side::prerequisite})
            EXPECT_EQ(build::misreader_of(name, side), "Make") << name;
    EXPECT_EQ(build::misreader_of("a%b", build::rule_side::target), "Make");
    EXPECT_EQ(build::misreader_of("a%b", build::rule_side::prerequisite), "");
    EXPECT_EQ(build::misreader_of("(b)", build::rule_side::target), "");
}

TEST(Dependencies, WarnOfTheFirstNameThatIsReadDifferently) {
    build::unit odd = {"a'b", "c", {{"x", std::endian::little}}, "d*"};
    std::optional<check::finding> found = build::misread_name_in(odd);
    ASSERT_TRUE(found);
    EXPECT_EQ(found->text, "Ninja takes the name `a'b` in the file of dependencies for another one");
    EXPECT_EQ(found->code, std::string("S615"));
    EXPECT_FALSE(build::misread_name_in({"a b", "c", {{"x", std::endian::little}}, "d"}));
}

} // namespace
