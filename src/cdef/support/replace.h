/* replace.h: a text file that is read and then replaced. */
#ifndef CDGEN_CDEF_REPLACE_H
#define CDGEN_CDEF_REPLACE_H

#include <string>
#include <string_view>

namespace cdef {

/* All of a file; "-" is standard input. Throws failure. */
std::string text_of_file(const std::string &path);

/* Replaces a file at once: whoever opens it finds all of the old or all of the new text, and on failure the old. A
 * symbolic link stays, and what it leads to is replaced. The file keeps its mode, and its owner if that is possible.
 * before: the text that it was read with; a file that has another one by now is not replaced. Throws failure. */
void replace_file(const std::string &path, std::string_view before, std::string_view after);

} // namespace cdef

#endif
