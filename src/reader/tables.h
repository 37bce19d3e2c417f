/* tables.h: the tables that the references in a section's records lead into. */
#ifndef CDGEN_READER_TABLES_H
#define CDGEN_READER_TABLES_H

#include "cdb_view.h"

namespace cdb {

/* For a class, all of its tables. For any other section, its strings, or the whole section if it has no table of
 * strings. section: its position among the anchors. */
class_tables tables_of(const database &db, std::size_t section);

/* How many records of a table are inside the class section. size: of a record. If the reference to a table is 0, the
 * table has no place (the class record is at 0), and only its count is known. */
inline std::size_t count_placed(const bytes &section, const cdb_ref_t &table, std::uint64_t count, std::size_t size) {
    std::uint64_t at = table.offset[0];
    return at == 0 ? 0 : count_inside(section, at, count, size);
}

} // namespace cdb

#endif
