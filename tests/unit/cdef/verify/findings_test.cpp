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

nlohmann::json json_of(const cdb::finding &f) {
    std::string text;
    report::json_writer to([&text](std::string_view part) { text += part; });
    to.open_list();
    add_finding(to, f);
    to.close();
    return nlohmann::json::parse(text).at(0);
}

TEST(VerifyFindings, JsonHasNoSectionForTheFileAsAWhole) {
    EXPECT_TRUE(json_of({&RULE, std::nullopt, {}, 0, {}, 0, {}, {}})["section"].is_null());
    EXPECT_EQ(json_of({&RULE, 3, {}, 0, {}, 0, {}, {}})["section"], 3);
}

TEST(VerifyFindings, JsonHasNumbersWhereNumbersAreShown) {
    EXPECT_EQ(json_value("17"), "17");
    EXPECT_EQ(json_value("0x1f"), "31");
    EXPECT_EQ(json_value("0 to 22"), "\"0 to 22\"");
    EXPECT_EQ(json_value(""), "\"\"");
    EXPECT_EQ(json_value("0x"), "\"0x\"");
}

} // namespace
