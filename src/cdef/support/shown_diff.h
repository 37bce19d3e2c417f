/* shown_diff.h: what a subcommand would change in a source, as a diff. */
#ifndef CDGEN_CDEF_SHOWN_DIFF_H
#define CDGEN_CDEF_SHOWN_DIFF_H

#include <string>
#include <string_view>

namespace cdef {

/* The unified diff from the one text of a source to the other, with the names that git gives the two; empty if they are
 * the same. Of what a terminal would act upon, a terminal as standard output gets nothing; a file gets all, so that
 * patch can use it. */
std::string shown_diff(const std::string &source, std::string_view before, std::string_view after);

} // namespace cdef

#endif
