/* groups.h: which variable class each dynamic attribute names. A database has it the other way round: variable classes
 * list the IDs of their attributes, in the order of the attributes. */
#ifndef CDGEN_CDEF_SOURCE_GROUPS_H
#define CDGEN_CDEF_SOURCE_GROUPS_H

#include "cdef/source/steps.h"

#include <optional>

namespace cdef::source {

/* The list that each member is in, by its position among the lists; nothing inside for a member of none. members: IDs,
 * in the order in which the compiler lists them. As long as IDs are unique, each list says which members it means.
 * Where they are not, members are dealt out so that every list comes about. Nothing if no way was found. */
std::optional<std::vector<std::optional<std::size_t>>> deal_out(const std::vector<var_id_t> &members,
                                                                const std::vector<std::vector<var_id_t>> &lists);

/* Sets the variable class of each dynamic attribute. Throws no_source_error if the lists cannot be had that way. */
void plan_variable_classes(std::vector<class_plan> &classes, const cdb::database &db);

} // namespace cdef::source

#endif
