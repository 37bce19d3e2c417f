/* compose.h: turns a database back into a source, in four steps: databases that no source can produce are refused
 * (check), the order of stanzas and everything that depends on it is planned (order, range, groups), texts are found
 * for lines and values (text), and the stanzas are written (stanza, structure, lists). */
#ifndef CDGEN_CDEF_SOURCE_COMPOSE_H
#define CDGEN_CDEF_SOURCE_COMPOSE_H

#include "cdef/source/steps.h"
#include "cdef/source/writer.h"

#include <string>
#include <vector>

namespace cdef::source {

/* A source that compiles to a database with the same meaning as a readable one. It is longer than the database, so it
 * is never kept: it is composed once for the compiler, which proves it, and again for each reader. */
class proven_source {
public:
    /* The database and its owners must stay as long as the source. Throws no_source_error if there is no source. */
    proven_source(const cdb::database &database, const cdb::ownership &owners);

    /* Composes the source and passes it on in parts. */
    void compose(const part_taker &to);

private:
    const cdb::database &db;
    class_plans plans;
    std::optional<std::string> output; /* see default_name() */
};

/* Offsets of the fields for whose lines a stanza has special functions; the lines of all other fields are plain. */
std::vector<std::size_t> own_fields(stanza_id stanza);

} // namespace cdef::source

#endif
