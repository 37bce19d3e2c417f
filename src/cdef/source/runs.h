/* runs.h: what the definition and the value of a structure tell about the run of SD stanzas that they came from. */
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

/* Whether the compiler gives elements of this type a value. */
bool has_default(vx_data_type_t type);

/* How many elements of a run had an ElementIndex. highest: the latest index, of which only 16 bits were kept. Nothing
 * if there were too few elements. */
std::optional<std::size_t> indices_given(std::size_t elements, std::uint16_t highest);

/* Which elements of a run have an ElementIndex, if so many do: the last ones that can go without. has_valid_values: by
 * element; only an element that has an index can have valid values, and at most as many have some as are given one. */
std::vector<bool> indexed_elements(const std::vector<bool> &has_valid_values, std::size_t given);

/* By element of a definition. */
std::vector<bool> with_valid_values(const cdb::sd_definition &definition);

/* The value and the highest index are those of a run like the definition. */
bool fits_definition(const cdb::sd_definition &definition, const element_types &value, std::uint16_t highest);

/* The value can only come from a run that the definition's run replaced or, if that run ends the file, came too late
 * for. */
bool comes_too_late(const cdb::sd_definition &definition, const cdb::value &value, std::uint16_t highest);

} // namespace cdef::source

#endif
