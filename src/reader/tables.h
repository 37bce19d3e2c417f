/* tables.h: the tables that the references in a section's records lead into. */
#ifndef CDGEN_READER_TABLES_H
#define CDGEN_READER_TABLES_H

#include "cdb_view.h"

namespace cdb {

/* Of a class, all of its tables. Of any other section, its strings: of one that has no table of strings, the whole
 * section. section: its position among the anchors. */
class_tables tables_of(const database &db, std::size_t section);

/* How many records of a table are inside the class section; size: of a record. At 0 is the class record: a table whose
 * reference is 0 has no place, and nothing is known of it but its count. */
inline std::size_t count_placed(const bytes &section, const cdb_ref_t &table, std::uint64_t count, std::size_t size) {
    std::uint64_t at = table.offset[0];
    return at == 0 ? 0 : count_inside(section, at, count, size);
}

} // namespace cdb

#endif
