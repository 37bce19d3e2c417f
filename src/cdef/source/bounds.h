/* bounds.h: what the bounds of a dynamic attribute say about the Range line that they came from. */
#ifndef CDGEN_CDEF_SOURCE_BOUNDS_H
#define CDGEN_CDEF_SOURCE_BOUNDS_H

#include "cdef/source/steps.h"

namespace cdef::source {

using cell = std::array<std::byte, sizeof(vx_value_t)>;

/* The bytes that a Range line must produce, in two cells or in the elements of two arrays of one element. */
struct wanted_bytes {
    bool known = false;
    bool in_arrays = false;
    std::size_t width = 0; /* bytes that count */
    cell low = {};
    cell high = {};
};

/* What the bounds show about the Range lines of the attribute. */
struct range {
    vx_data_type_t type;
    bool takes_line;   /* a Range line is accepted and has an effect */
    bool is_default;   /* the completion gives these bounds if no Range was given */
    bool is_untouched; /* these are the bounds of an attribute without any Range line */
    bool keeps_bounds; /* its completion does not take its bounds away */
    bool has_none;     /* the bounds are absent, or cannot be seen */
    wanted_bytes wanted;
};

/* The bounds of an open attribute so far. */
enum class bounds : std::uint8_t { untouched, wanted, unwanted };

/* Of a dynamic attribute. */
range range_of(const class_plan &plan, const step &s);

/* The value of a Range line that produces these bytes if it is converted to this type; empty if there is no such line.
 */
std::string line_value(const wanted_bytes &wanted, vx_data_type_t type);

/* The bounds of an attribute after such a line. */
bounds after_line(const range &target, bounds before, vx_data_type_t type);

} // namespace cdef::source

#endif
