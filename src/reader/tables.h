/* tables.h: the tables that the references in a section's records lead into. */
#ifndef CDGEN_READER_TABLES_H
#define CDGEN_READER_TABLES_H

#include "cdb_view.h"

namespace cdb {

/* Of a class, all of its tables. Of any other section, its strings: of one that has no table of strings, the whole
 * section. section: its position among the anchors. */
class_tables tables_of(const database &db, std::size_t section);

} // namespace cdb

#endif
