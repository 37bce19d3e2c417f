#include "compare/rules.h"

#include "places.h"

#include <gtest/gtest.h>

#include <fstream>
#include <set>
#include <sstream>

TEST(compare_rules, codes_are_permanent_and_begin_with_the_level) {
    std::set<std::string_view> codes;
    for (const compare::breach_rule &rule : compare::breach_rules()) {
        EXPECT_TRUE(codes.insert(rule.code).second) << rule.code;
        EXPECT_EQ(rule.code[3], '1' + static_cast<int>(rule.broken_for)) << rule.code;
    }
}

TEST(compare_rules, a_rule_is_found_by_its_breach) {
    EXPECT_EQ(compare::rule_of(compare::breach::GONE).code, "CMP101");
    EXPECT_EQ(compare::rule_of(compare::breach::STORED_TYPE).code, "CMP303");
}

TEST(compare_rules, the_document_has_all_of_them) {
    std::ostringstream document;
    document << std::ifstream(places::in_project("docs/diff.md")).rdbuf();
    for (const compare::breach_rule &rule : compare::breach_rules()) {
        std::ostringstream row;
        row << "| `" << rule.code << "` | `" << compare::name_of(rule.broken_for) << "` | " << rule.title << " | "
            << rule.reason << " |\n";
        EXPECT_NE(document.str().find(row.str()), std::string::npos) << row.str();
    }
}

TEST(compare_rules, levels_have_names) {
    EXPECT_EQ(compare::name_of(compare::level::READERS), "readers");
    EXPECT_EQ(compare::name_of(compare::level::STORED), "stored");
}
