/* structure.h: the runs of SD stanzas. */
#ifndef CDGEN_CDEF_SOURCE_STRUCTURE_H
#define CDGEN_CDEF_SOURCE_STRUCTURE_H

#include "cdb_view.h"
#include "cdef/source/writer.h"

namespace cdef::source {

/* The runs of SD stanzas of an attribute. */
struct attribute_structure {
    std::string_view stanza;       /* of the run */
    std::string_view other_stanza; /* of a run that it replaces */
    cdb::sd_definition definition;
    cdb::value value;
    std::uint16_t highest_index;
    bool ends_file;
};

/* place: for messages. Throws no_source_error for what no run can give. */
void write_structure(source_writer &out, const attribute_structure &s, const record_name &place);

/* A run for an action or the class. */
void write_run(source_writer &out, std::string_view stanza, const cdb::sd_definition &definition,
               const record_name &place);

/* Offsets of the fields for whose lines an element's stanza has special functions. */
std::vector<std::size_t> own_element_fields();

} // namespace cdef::source

#endif
