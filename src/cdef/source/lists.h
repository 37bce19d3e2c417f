/* lists.h: the lines of varieties and of valid values. */
#ifndef CDGEN_CDEF_SOURCE_LISTS_H
#define CDGEN_CDEF_SOURCE_LISTS_H

#include "cdb_view.h"
#include "cdef/source/writer.h"

namespace cdef::source {

void write_varieties(source_writer &out, const cdb::variety_list &varieties);

/* name: of the lines. */
void write_valid_values(source_writer &out, std::string_view name, const cdb::valid_value_list &values);

} // namespace cdef::source

#endif
