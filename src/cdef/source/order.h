/* order.h: the order of a class's stanzas. */
#ifndef CDGEN_CDEF_SOURCE_ORDER_H
#define CDGEN_CDEF_SOURCE_ORDER_H

#include "cdef/source/steps.h"

namespace cdef::source {

/* The first traces that a stanza left in the database. */
struct traces {
    std::uint32_t variety_list; /* offset; of a record */
    std::uint32_t name;         /* offset in the strings */
};

/* A step, and what it left. */
struct traced_step {
    step what;
    traces left;
};

/* The order of stanzas that left these traces. Records of a table keep their order. Those of different tables are mixed
 * by their variety lists, each of which was made when its stanza began; inputs come between them by their names. */
std::vector<step> order_of(const std::array<std::vector<traces>, RECORD_TABLES> &records,
                           std::vector<traced_step> inputs);

/* Sets order and ends_in_run of a plan: the order in the source that the database was made from, as far as the database
 * shows it. The order matters little to a reader, but it matters for a Range, and for getting the same bytes. */
void plan_order(class_plan &plan);

/* Puts an ordinary stanza between an attribute of structured data, or its run, and a run for the class, so that the
 * compiler does not confuse the two: the map, if its place is still open (map_before); otherwise the class's own
 * stanza, which the run then follows. Call it when the order is final. */
void separate_runs(class_plan &plan);

} // namespace cdef::source

#endif
