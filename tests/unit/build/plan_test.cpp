/* Which databases are made from which sources. */

#include "build/plan.h"

#include <gtest/gtest.h>

namespace {

using build::byte_order;
using build::naming;
using names = std::vector<std::string>;

std::vector<build::unit> plan_of(const names &sources, const naming &how) {
    std::vector<build::request> requests;
    for (const std::string &source : sources)
        requests.push_back({source, how});
    return build::plan_of(requests);
}

names outputs(const names &sources, const naming &how) {
    names all;
    for (const build::unit &each : plan_of(sources, how))
        for (const build::output &made : each.outputs)
            all.push_back(made.path);
    return all;
}

std::string refusal(const names &sources, const naming &how) {
    try {
        plan_of(sources, how);
    } catch (const build::wrong_request &e) {
        return e.what();
    }
    return "";
}

TEST(Plan, PutsDatabasesBesideTheirSources) {
    EXPECT_EQ(outputs({"a.cdefsrc", "d/b.cdefsrc"}, {}), (names{"a.cdef", "d/b.cdef"}));
}

TEST(Plan, PutsThemIntoTheDirectory) {
    EXPECT_EQ(outputs({"a.cdefsrc", "d/b.cdefsrc"}, {.directory = "out"}), (names{"out/a.cdef", "out/b.cdef"}));
    EXPECT_EQ(outputs({"a.cdefsrc"}, {.directory = "/"}), names{"/a.cdef"});
}

TEST(Plan, KeepsOtherEndsOfNames) {
    EXPECT_EQ(outputs({"a.txt", "b", "x/.cdefsrc"}, {}), (names{"a.txt.cdef", "b.cdef", "x/.cdefsrc.cdef"}));
}

TEST(Plan, TakesTheFileAsGiven) {
    EXPECT_EQ(outputs({"a.cdefsrc"}, {.file = "x"}), names{"x"});
    EXPECT_EQ(outputs({"-"}, {.file = "-"}), names{"-"});
}

TEST(Plan, MarksBothByteOrdersAndCallsAClassAfterTheNameWithoutThem) {
    EXPECT_EQ(outputs({"a.cdefsrc"}, {.directory = "out", .order = byte_order::both}),
              (names{"out/a.le.cdef", "out/a.be.cdef"}));
    build::unit both = plan_of({"a.cdefsrc"}, {.file = "x/y.cdef", .order = byte_order::both}).at(0);
    EXPECT_EQ(both.named_after, "x/y.cdef");
    EXPECT_EQ(both.outputs.at(0).order, std::endian::little);
    EXPECT_EQ(both.outputs.at(1).order, std::endian::big);
}

TEST(Plan, ChoosesTheByteOrder) {
    EXPECT_EQ(plan_of({"a"}, {}).at(0).outputs.at(0).order, std::endian::native);
    EXPECT_EQ(plan_of({"a"}, {.order = byte_order::little}).at(0).outputs.at(0).order, std::endian::little);
    EXPECT_EQ(plan_of({"a"}, {.order = byte_order::big}).at(0).outputs.at(0).order, std::endian::big);
}

TEST(Plan, GivesEachSourceWhatItsProjectWants) {
    std::vector<build::request> requests = {{"a.cdefsrc", {}, ""},
                                            {"p/b.cdefsrc", {.directory = "p/out"}, "p/cdef.toml"}};
    std::vector<build::unit> units = build::plan_of(requests);
    EXPECT_EQ(units.at(0).outputs.at(0).path, "a.cdef");
    EXPECT_EQ(units.at(1).outputs.at(0).path, "p/out/b.cdef");
    EXPECT_EQ(units.at(1).project_file, "p/cdef.toml");
}

TEST(Plan, RefusesNamesThatMakeNoSense) {
    EXPECT_EQ(refusal({"a", "b"}, {.file = "x.cdef"}), "-o names one database, and there are 2 sources: use -d");
    EXPECT_EQ(refusal({"-"}, {.directory = "d"}), "standard input has no name: name the database with -o");
    EXPECT_EQ(refusal({"a"}, {.file = "-", .order = byte_order::both}),
              "-: with --byte-order both, the database's name must end in .cdef");
}

TEST(Plan, RefusesTwoDatabasesOfOneName) {
    EXPECT_EQ(refusal({"a/x.cdefsrc", "b/x.cdefsrc"}, {.directory = "d"}),
              "d/x.cdef: it would be built from a/x.cdefsrc and from b/x.cdefsrc");
    EXPECT_EQ(refusal({"a//x.cdefsrc", "a/./x.cdefsrc"}, {}),
              "a/./x.cdef: it would be built from a//x.cdefsrc and from a/./x.cdefsrc");
    EXPECT_EQ(refusal({"x.cdefsrc", "b/x.cdefsrc"}, {}), "");
}

} // namespace
