/* The catalogue and the facts about fields agree on which lines fill which fields. */

#include "language/fields.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <sstream>
#include <string>
#include <vector>

namespace {

using words = std::vector<std::string>;

words split(std::string_view text) {
    std::istringstream in{std::string(text)};
    words all;
    for (std::string word; in >> word;)
        all.push_back(word);
    return all;
}

std::span<const srtable_ctrl> stanzas() {
    return std::span(sc_tables).first(SC_COUNT);
}

const cdb::field_fact &fact_of(const srtable_ctrl &stanza, const table_attrs &attr) {
    return language::record_of(stanza).fact_at(static_cast<std::size_t>(attr.ta_offset) -
                                               language::record_start(stanza));
}

/* Of these attributes nothing is stored: they are checked only, or refused, or ignored. */
bool fills_nothing(const table_attrs &attr) {
    return attr.ta_type == AT_SD_INDEX || attr.ta_type == AT_SD_DEFAULT_VALUE || attr.ta_type == AT_LIST_ACTION_CLASS ||
           attr.ta_type == AT_LIST_ACTION_RSRC;
}

/* Whether a stanza has such an attribute; record: one that fills this record, or any if no stanza fills it. */
bool is_attribute(std::string_view name, const cdb::record_format &record) {
    bool is_staged = std::any_of(stanzas().begin(), stanzas().end(),
                                 [&](const srtable_ctrl &s) { return &language::record_of(s) == &record; });
    return std::any_of(stanzas().begin(), stanzas().end(), [&](const srtable_ctrl &s) {
        return (!is_staged || &language::record_of(s) == &record) && find_attr(s, name) != nullptr;
    });
}

} // namespace

TEST(language_facts, each_attribute_is_in_the_row_of_the_field_that_it_fills) {
    for (const srtable_ctrl &stanza : stanzas())
        for (const table_attrs &attr : stanza.sc_attrs) {
            const cdb::field_fact &fact = fact_of(stanza, attr);
            EXPECT_EQ(language::fills(attr, fact), !fills_nothing(attr))
                << stanza.sc_name << " " << attr.ta_name << ": " << fact.field;
        }
}

TEST(language_facts, each_line_of_a_row_is_in_the_catalogue) {
    for (const cdb::record_format *record : cdb::record_formats)
        for (const cdb::field_fact &fact : record->facts)
            for (const std::string &line : split(fact.lines))
                EXPECT_TRUE(set_table_id(line.c_str()) >= 0 || is_attribute(line, *record))
                    << record->record << " " << fact.field << ": " << line;
}

TEST(language_facts, a_range_fills_both_bounds) {
    const cdb::record_format &attribute = cdb::format_for<rsrc_dattr_t>;
    EXPECT_EQ(attribute.fact_at(offsetof(rsrc_dattr_t, ra_min_value)).lines, "Range");
    EXPECT_EQ(attribute.fact_at(offsetof(rsrc_dattr_t, ra_max_value)).lines, "Range");
}

TEST(language_facts, a_line_fills_a_field_only_under_its_whole_name) {
    constexpr cdb::field_fact row = cdb::facts::filled("f", "ValidValue Value", "f");
    EXPECT_TRUE(language::fills({"Value", AT_UINT16, 0, 1, 0}, row));
    EXPECT_TRUE(language::fills({"ValidValue", AT_UINT16, 0, 1, 0}, row));
    EXPECT_FALSE(language::fills({"Valid", AT_UINT16, 0, 1, 0}, row));
}
