/* check.h: refuses what cannot be written as a source. */
#ifndef CDGEN_CDEF_SOURCE_CHECK_H
#define CDGEN_CDEF_SOURCE_CHECK_H

#include "cdb_view.h"

namespace cdef::source {

/* Throws no_source_error unless a source can produce the sections of the database and all plain fields of their
 * records. */
void require_settable(const cdb::database &db);

} // namespace cdef::source

#endif
