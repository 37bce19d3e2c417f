/* tables.cpp: the tables that the references in a section's records lead into. */

#include "reader/tables.h"

namespace cdb {

static bytes strings_of(const bytes &section, cdb_dsect_type_t type) {
    switch (type) {
    case manager::TYPE:
        return manager(section).strings();
    case class_map::TYPE:
        return class_map(section).strings();
    case variable_class::TYPE:
        return variable_class(section).strings();
    default:
        return section;
    }
}

class_tables tables_of(const database &db, std::size_t section) {
    bytes whole = db.section(section);
    cdb_dsect_type_t type = db.anchor(section).cda_type;
    if (type == resource_class::TYPE)
        return resource_class(whole).side_tables();
    return {.section = whole, .strings = strings_of(whole, type), .valid_vals = {}, .variety_lists = {}, .sd_defs = {}};
}

} // namespace cdb
