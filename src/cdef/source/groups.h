/* groups.h: finds the variable class that each dynamic attribute names. In a database, the variable classes list the
 * IDs of their attributes, in the order of the attributes. */
#ifndef CDGEN_CDEF_SOURCE_GROUPS_H
#define CDGEN_CDEF_SOURCE_GROUPS_H

#include "cdef/source/steps.h"

#include <optional>

namespace cdef::source {

/* For each member, the position of its list; no value for a member of no list. members: IDs, in the order in which the
 * compiler lists them. Unique IDs identify their members. Members with equal IDs are distributed so that every list is
 * complete. Returns no value if no distribution was found. */
std::optional<std::vector<std::optional<std::size_t>>> deal_out(const std::vector<var_id_t> &members,
                                                                const std::vector<std::vector<var_id_t>> &lists);

/* Sets the variable class of each dynamic attribute. Throws no_source_error if no source produces the lists. */
void plan_variable_classes(class_plans &classes, const cdb::database &db);

} // namespace cdef::source

#endif
