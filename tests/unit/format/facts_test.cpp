#include "format/sections.h"
#include "places.h"

#include <gtest/gtest.h>

#include <fstream>
#include <regex>
#include <set>
#include <sstream>

namespace {

std::string fields_header() {
    std::ifstream in(places::in_project("include/cdb_fields.h"));
    std::stringstream text;
    text << in.rdbuf();
    return text.str();
}

} // namespace

TEST(format_facts, some_meanings_have_a_number_for_nothing) {
    EXPECT_EQ(cdb::none_of(cdb::meaning::NONE_IS_0), 0U);
    EXPECT_EQ(cdb::none_of(cdb::meaning::NONE_IS_255), 255U);
    EXPECT_EQ(cdb::none_of(cdb::meaning::NONE_IS_65535), 65535U);
    EXPECT_EQ(cdb::none_of(cdb::meaning::LOCATOR), 65535U);
    EXPECT_EQ(cdb::none_of(cdb::meaning::PLAIN), std::nullopt);
}

/* Rows are checked against fields while compiling; this shows that no record is left out. */
TEST(format_facts, every_record_with_fields_is_a_format) {
    std::string header = fields_header();
    std::regex declared("fields_of<(\\w+)> =");
    std::set<std::string_view> names;
    for (const cdb::record_format *format : cdb::record_formats)
        names.insert(format->record);
    std::size_t count = 0;
    for (std::sregex_iterator at(header.begin(), header.end(), declared), end; at != end; ++at) {
        if ((*at)[1] == "Record")
            continue;
        ++count;
        EXPECT_TRUE(names.contains((*at)[1].str())) << (*at)[1];
    }
    EXPECT_EQ(count, names.size());
}

TEST(format_facts, rows_have_to_match_their_fields) {
    constexpr cdb::field fields[] = {{"a", 0, 4, 1, cdb::field_kind::number},
                                     {"b", 4, 8, 1, cdb::field_kind::reference, cdb::target::section}};
    constexpr cdb::field_fact right[] = {cdb::facts::layout("a"), cdb::facts::layout("b", cdb::meaning::OFFSET)};
    constexpr cdb::field_fact swapped[] = {right[1], right[0]};
    constexpr cdb::field_fact not_a_place[] = {right[0], cdb::facts::layout("b")};
    static_assert(cdb::rows_match(fields, right));
    static_assert(!cdb::rows_match(fields, swapped));
    static_assert(!cdb::rows_match(fields, not_a_place));
    static_assert(!cdb::rows_match(fields, std::span(right).first(1)));
}

TEST(format_facts, rows_are_found_by_offset) {
    const cdb::record_format &attribute = cdb::format_of("rsrc_dattr_t");
    EXPECT_EQ(attribute.fact_at(offsetof(rsrc_dattr_t, ra_expr_desc)).lines, "ExpressionDescription");
    EXPECT_EQ(attribute.name->offset, offsetof(rsrc_dattr_t, u_ra_name));
    EXPECT_EQ(attribute.type->offset, offsetof(rsrc_dattr_t, ra_data_type));
    EXPECT_EQ(cdb::format_for<rsrc_class_t>.type, nullptr);
    EXPECT_TRUE(cdb::format_of("text").fields.empty());
}

TEST(format_facts, a_field_without_words_has_its_name) {
    EXPECT_EQ(cdb::facts::constant("x").label(), "x");
    EXPECT_EQ(cdb::facts::constant("x", "words").label(), "words");
}

TEST(format_sections, kinds) {
    EXPECT_EQ(cdb::kind_of(CDB_DSECT_CLASS)->root->record, "rsrc_class_t");
    EXPECT_EQ(cdb::kind_of(CDB_DSECT_EMPTY), nullptr);
    EXPECT_EQ(cdb::kind_of(8), nullptr);
    EXPECT_EQ(cdb::type_of_rank(0), CDB_DSECT_CLASS);
    EXPECT_EQ(cdb::type_of_rank(4), CDB_DSECT_CLASS_HASH);
}

TEST(format_sections, sizes_of_side_tables) {
    rsrc_class_t rc = {};
    rc.rc_num_dattrs = 3;
    rc.rc_sd_size = 40;
    EXPECT_EQ(cdb::side_tables[3].size_in(rc), 3 * sizeof(rsrc_dattr_t));
    EXPECT_EQ(cdb::side_tables[10].size_in(rc), 40U);
    EXPECT_EQ(cdb::side_tables[12].size_in(rc), 0U);
}

TEST(format_sections, side_tables_as_made) {
    for (std::size_t i = 0; i < cdb::side_tables_as_made.size(); ++i)
        EXPECT_EQ(cdb::side_tables_as_made[i].made, static_cast<int>(i));
    EXPECT_STREQ(cdb::side_tables_as_made[9].trace_name, "ClassValidVals");
}

/* The compiler names the first of several tables that are too large. */
TEST(format_sections, side_tables_as_counted) {
    std::vector<std::string_view> names;
    for (const cdb::side_table &table : cdb::side_tables_as_counted)
        names.emplace_back(table.trace_name);
    EXPECT_EQ(names, (std::vector<std::string_view>{"ClassPattrsC", "ClassPattrs", "ClassDattrsC", "ClassDattrs",
                                                    "ClassSDDefs", "ClassActionsC", "ClassActions", "ClassVarietyList",
                                                    "ClassValidVals"}));
}

TEST(format_sections, lists) {
    EXPECT_EQ(cdb::list_kind_of(cdb::target::sd_defs).entry->record, "sd_field_t");
    EXPECT_EQ(cdb::list_kind_of(cdb::target::valid_vals).id, CDB_ID_VALID_VALUES);
}
