/* runs.h: what the definition and the value of a structure show about the run of SD stanzas that they came from. */
#ifndef CDGEN_CDEF_SOURCE_RUNS_H
#define CDGEN_CDEF_SOURCE_RUNS_H

#include "cdb_view.h"

#include <optional>
#include <vector>

namespace cdef::source {

/* The types of a value's elements; of an array, those of the structure in it. */
struct element_types {
    bool found = false; /* there is a value */
    std::vector<vx_data_type_t> types;
    bool defaults = true; /* the elements have the values that the compiler gives them */
};
element_types types_of(const cdb::value &value);

/* True if the compiler gives elements of this type a value. */
bool has_default(vx_data_type_t type);

/* How many elements of a run had an ElementIndex. highest: the latest index, of which only 16 bits were kept. No value
 * if there were too few elements. */
std::optional<std::size_t> indices_given(std::size_t elements, std::uint16_t highest);

/* Decides which elements of a run have an ElementIndex, if this many do. The last ones that need no index have none.
 * has_valid_values: by element; only an element that has an index can have valid values, and at most as many have some
 * as are given one. */
std::vector<bool> indexed_elements(const std::vector<bool> &has_valid_values, std::size_t given);

/* By element of a definition. */
std::vector<bool> with_valid_values(const cdb::sd_definition &definition);

/* True if the value and the highest index can come from the run that made the definition. */
bool fits_definition(const cdb::sd_definition &definition, const element_types &value, std::uint16_t highest);

/* True if the value can only come from an earlier run, which the definition's run replaced, or after which the
 * definition's run came too late because it ends the file. */
bool comes_too_late(const cdb::sd_definition &definition, const cdb::value &value, std::uint16_t highest);

} // namespace cdef::source

#endif
