/* fields.h: the fields that the lines of a stanza fill. */
#ifndef CDGEN_LANGUAGE_FIELDS_H
#define CDGEN_LANGUAGE_FIELDS_H

#include "format/records.h"
#include "language/catalogue.h"

#include <algorithm>

namespace language {

/* The record that a stanza fills; for structured data, the one element that is staged at a time. */
constexpr const cdb::record_format &record_of(const srtable_ctrl &stanza) {
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
    case STAGED_SD_DEF:
    case STAGED_COUNT:
        break;
    }
    return cdb::format_for<sd_field_t>;
}

/* The offset of this record in the staging record that the catalogue's offsets refer to, in bytes. */
constexpr std::size_t record_start(const srtable_ctrl &stanza) {
    return stanza.sc_record == STAGED_SD_DEF ? offsetof(sd_def_t, sd_fields) : 0;
}

/* True if the attribute's lines fill the field of this row. An attribute that is only checked, refused or ignored names
 * a field but does not fill it. */
constexpr bool fills(const table_attrs &attribute, const cdb::field_fact &row) {
    std::string_view name(attribute.ta_name, attribute.ta_length);
    std::string_view rest = row.lines;
    while (!rest.empty()) {
        std::string_view line = rest.substr(0, rest.find(' '));
        if (line == name)
            return true;
        rest.remove_prefix(std::min(rest.size(), line.size() + 1));
    }
    return false;
}

/* True if the attribute stores nothing in the field that it names, because it is only checked, refused or ignored. */
constexpr bool stores_nothing(const table_attrs &attribute) {
    return attribute.ta_type == AT_SD_INDEX || attribute.ta_type == AT_SD_DEFAULT_VALUE ||
           attribute.ta_type == AT_LIST_ACTION_CLASS || attribute.ta_type == AT_LIST_ACTION_RSRC;
}

} // namespace language

#endif
