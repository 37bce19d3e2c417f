/* Findings as text and as JSON. */

#include "cdef/verify/findings.h"

#include <gtest/gtest.h>
#include <nlohmann/json.hpp>

namespace {

using namespace cdef::verify;

constexpr cdb::rule RULE = {"CDB999", cdb::severity::warning, "wrong shape"};

TEST(VerifyFindings, APlaceIsAsMuchAsIsKnown) {
    EXPECT_EQ(place_of({&RULE, std::nullopt, {}, 0, {}, 0, {}, {}}), "file");
    EXPECT_EQ(place_of({&RULE, 2, {}, 0, {}, 0, {}, {}}), "section 2");
    EXPECT_EQ(place_of({&RULE, 2, "rsrc_pattr_t", 5, "u_ra_name", 0, {}, {}}), "section 2, rsrc_pattr_t 5, u_ra_name");
}

TEST(VerifyFindings, ALineCannotSteerATerminal) {
    EXPECT_EQ(line_of("a\x1b.cdef", {&RULE, 1, {}, 0, {}, 16, "round", "square"}),
              "a\\x1b.cdef: warning: section 1 at offset 16: wrong shape: found round, expected square [CDB999]\n");
}

cdb::diagnosed diagnosed_at(std::size_t offset, std::size_t cause, const cdb::rule &rule) {
    return {{&rule, std::nullopt, {}, 0, {}, offset, "a", "b"}, cause};
}

constexpr cdb::rule ERROR = {"CDB998", cdb::severity::error, "broken"};

nlohmann::json json_of(const cdb::diagnosed &each, std::size_t at) {
    std::string text;
    report::json_writer to([&text](std::string_view part) { text += part; });
    to.open_list();
    add_finding(to, each, at);
    to.close();
    return nlohmann::json::parse(text).at(0);
}

TEST(VerifyFindings, JsonHasNoSectionForTheFileAsAWhole) {
    EXPECT_TRUE(json_of(diagnosed_at(0, 0, RULE), 0)["section"].is_null());
    cdb::diagnosed in_section = diagnosed_at(0, 0, RULE);
    in_section.found.section = 3;
    EXPECT_EQ(json_of(in_section, 0)["section"], 3);
}

TEST(VerifyFindings, JsonNamesTheCauseOfAConsequence) {
    EXPECT_TRUE(json_of(diagnosed_at(0, 4, RULE), 4)["cause"].is_null());
    EXPECT_EQ(json_of(diagnosed_at(0, 4, RULE), 5)["cause"], 4);
}

TEST(VerifyFindings, ConsequencesAreCounted) {
    EXPECT_EQ(note_of("x", 1), "x: note: 1 finding follows from this one; --all shows it\n");
    EXPECT_EQ(note_of("\x1b", 84), "\\x1b: note: 84 findings follow from this one; --all shows them\n");
}

TEST(VerifyFindings, WithoutWarningsCausesAreWhereTheyWere) {
    std::vector<cdb::diagnosed> errors = errors_of(
        {diagnosed_at(1, 0, RULE), diagnosed_at(2, 1, ERROR), diagnosed_at(3, 1, RULE), diagnosed_at(4, 1, ERROR)});
    ASSERT_EQ(errors.size(), 2u);
    EXPECT_EQ(errors[1].found.offset, 4u);
    EXPECT_EQ(errors[1].cause, 0u);
}

TEST(VerifyFindings, JsonHasNumbersWhereNumbersAreShown) {
    EXPECT_EQ(json_value("17"), "17");
    EXPECT_EQ(json_value("0x1f"), "31");
    EXPECT_EQ(json_value("0 to 22"), "\"0 to 22\"");
    EXPECT_EQ(json_value(""), "\"\"");
    EXPECT_EQ(json_value("0x"), "\"0x\"");
}

} // namespace
