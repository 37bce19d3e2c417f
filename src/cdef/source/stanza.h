/* stanza.h: the stanzas of attributes, actions and inputs of a class. */
#ifndef CDGEN_CDEF_SOURCE_STANZA_H
#define CDGEN_CDEF_SOURCE_STANZA_H

#include "cdef/source/steps.h"
#include "cdef/source/writer.h"

namespace cdef::source {

/* Writes some stanzas of a class, from the step at first up to the one at last, in the order of its plan. Throws
 * no_source_error for values that no line can give. */
void write_steps(source_writer &out, const class_plan &plan, std::size_t first, std::size_t last);

/* Offsets of the fields for whose lines these stanzas have special functions; empty for any other stanza. */
std::vector<std::size_t> own_attribute_fields(stanza_id stanza);

} // namespace cdef::source

#endif
