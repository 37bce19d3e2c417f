/* The catalogue and the facts of fields say the same of which lines fill which fields. */

#include "format/records.h"
#include "language/catalogue.h"

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

bool contains(const words &all, std::string_view word) {
    return std::find(all.begin(), all.end(), word) != all.end();
}

std::span<const srtable_ctrl> stanzas() {
    return std::span(sc_tables).first(SC_COUNT);
}

/* The record that a stanza fills; of structured data, the one element that is staged at a time. */
const cdb::record_format &format_of(const srtable_ctrl &stanza) {
    switch (stanza.sc_record) {
    case STAGED_CLASS:
        return cdb::format_for<rsrc_class_t>;
    case STAGED_CMMAP:
        return cdb::format_for<rsrc_cmmap_t>;
    case STAGED_VARIABLE_CLASS:
        return cdb::format_for<rsrc_variable_class_t>;
    case STAGED_PATTR:
    case STAGED_PATTR_C:
        return cdb::format_for<rsrc_pattr_t>;
    case STAGED_DATTR:
    case STAGED_DATTR_C:
        return cdb::format_for<rsrc_dattr_t>;
    case STAGED_ACTION:
    case STAGED_ACTION_C:
        return cdb::format_for<rsrc_action_t>;
    default:
        return cdb::format_for<sd_field_t>;
    }
}

const cdb::field_fact &fact_of(const srtable_ctrl &stanza, const table_attrs &attr) {
    std::size_t skipped = stanza.sc_record == STAGED_SD_DEF ? offsetof(sd_def_t, sd_fields) : 0;
    return format_of(stanza).fact_at(static_cast<std::size_t>(attr.ta_offset) - skipped);
}

/* Of these attributes nothing is stored: they are checked only, or refused, or ignored. */
bool fills_nothing(const table_attrs &attr) {
    return attr.ta_type == AT_SD_INDEX || attr.ta_type == AT_SD_DEFAULT_VALUE || attr.ta_type == AT_LIST_ACTION_CLASS ||
           attr.ta_type == AT_LIST_ACTION_RSRC;
}

/* Whether a stanza has such an attribute; record: one that fills this record, or any if no stanza fills it. */
bool is_attribute(std::string_view name, const cdb::record_format &record) {
    bool is_staged = std::any_of(stanzas().begin(), stanzas().end(),
                                 [&](const srtable_ctrl &s) { return &format_of(s) == &record; });
    return std::any_of(stanzas().begin(), stanzas().end(), [&](const srtable_ctrl &s) {
        return (!is_staged || &format_of(s) == &record) && find_attr(s, name) != nullptr;
    });
}

} // namespace

TEST(language_facts, each_attribute_is_in_the_row_of_the_field_that_it_fills) {
    for (const srtable_ctrl &stanza : stanzas())
        for (const table_attrs &attr : stanza.sc_attrs) {
            const cdb::field_fact &fact = fact_of(stanza, attr);
            EXPECT_EQ(contains(split(fact.lines), attr.ta_name), !fills_nothing(attr))
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
