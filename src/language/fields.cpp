/* fields.cpp: the fields that the lines of a stanza fill. */

#include "language/fields.h"

namespace language {

const cdb::record_format &record_of(const srtable_ctrl &stanza) {
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

std::size_t record_start(const srtable_ctrl &stanza) {
    return stanza.sc_record == STAGED_SD_DEF ? offsetof(sd_def_t, sd_fields) : 0;
}

bool fills(const table_attrs &attribute, const cdb::field_fact &row) {
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

} // namespace language
