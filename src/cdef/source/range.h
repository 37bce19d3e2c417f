/* range.h: decides which dynamic attributes get a Range line.
 *
 * Both dynamic kinds share one mark "a Range was given", which the completion of either clears, and a class attribute's
 * Range goes to a resource attribute that is still open. So a line may take effect elsewhere, or an attribute without
 * one may get no default. If a source made the database, some choice of lines gives its bounds. That choice is searched
 * for stanza by stanza, over the few states that the compiler can be in: first with the stanzas in their order, then
 * over all ways to mix the two kinds. */
#ifndef CDGEN_CDEF_SOURCE_RANGE_H
#define CDGEN_CDEF_SOURCE_RANGE_H

#include "cdef/source/bounds.h"

#include <optional>

namespace cdef::source {

/* The dynamic attributes of a class. */
struct dynamic_attributes {
    std::vector<range> of_class;
    std::vector<range> of_resource;
    std::vector<table> order;        /* the kinds of the stanzas */
    std::optional<table> has_to_end; /* the kind of the last stanza, if it cannot change places */
    bool cut_short = false;          /* by a following class */
};

/* The values of the Range lines of a class's dynamic attributes (empty: no line), and the kinds of their stanzas in
 * their order. */
struct range_lines {
    std::vector<std::string> of_class;
    std::vector<std::string> of_resource;
    std::vector<table> order;
};

/* Range lines that give every attribute its bounds, by class; no value if there are no such lines. */
std::optional<std::vector<range_lines>> find_range_lines(const std::vector<dynamic_attributes> &classes);

/* Sets the Range lines of all dynamic attributes, and their order. Throws no_source_error if there are none. */
void plan_ranges(class_plans &classes);

} // namespace cdef::source

#endif
