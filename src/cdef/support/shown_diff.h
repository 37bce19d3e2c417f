/* shown_diff.h: what a subcommand would change in a source, as a diff. */
#ifndef CDGEN_CDEF_SHOWN_DIFF_H
#define CDGEN_CDEF_SHOWN_DIFF_H

#include <string>
#include <string_view>

namespace cdef {

/* Prints the unified diff between two texts of a source, with file names as git writes them; nothing if the texts are
 * the same. If standard output is a terminal, characters that could control it are replaced. Otherwise the diff is
 * complete, so that patch can use it. Throws failure if standard output cannot be written. */
void show_diff(const std::string &source, std::string_view before, std::string_view after);

} // namespace cdef

#endif
