/* compose.h: turns a database back into a source, in four steps: databases that no source can produce are refused
 * (check), the order of stanzas and everything that depends on it is planned (order, range, groups), texts are found
 * for lines and values (text), and the stanzas are written (stanza, structure, lists). */
#ifndef CDGEN_CDEF_SOURCE_COMPOSE_H
#define CDGEN_CDEF_SOURCE_COMPOSE_H

#include "language/catalogue.h"
#include "reader/ownership.h"

#include <string>
#include <vector>

namespace cdef::source {

/* Returns a source that compiles to a database with the same meaning as this readable one. Throws no_source_error if
 * there is no such source. */
std::string source_of(const cdb::database &db, const cdb::ownership &owners);

/* Offsets of the fields for whose lines a stanza has special functions; the lines of all other fields are plain. */
std::vector<std::size_t> own_fields(stanza_id stanza);

} // namespace cdef::source

#endif
