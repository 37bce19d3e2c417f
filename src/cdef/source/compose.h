/* compose.h: from a database back to a source. In four steps: what no source can say is refused (check), the order of
 * stanzas and what depends on it is planned (order, range, groups), lines and values get texts that read back (text),
 * and the stanzas are written (stanza, structure, lists). */
#ifndef CDGEN_CDEF_SOURCE_COMPOSE_H
#define CDGEN_CDEF_SOURCE_COMPOSE_H

#include "language/catalogue.h"
#include "reader/ownership.h"

#include <string>
#include <vector>

namespace cdef::source {

/* A source that compiles to a database that means the same as a readable one. Throws no_source_error if there is
 * none. */
std::string source_of(const cdb::database &db, const cdb::ownership &owners);

/* Offsets of the fields whose lines a stanza writes in a way of its own; all others are plain. */
std::vector<std::size_t> own_fields(stanza_id stanza);

} // namespace cdef::source

#endif
