/* replace.h: a text file that is read and then replaced. */
#ifndef CDGEN_CDEF_REPLACE_H
#define CDGEN_CDEF_REPLACE_H

#include <string>
#include <string_view>

namespace cdef {

/* All of a file; "-" is standard input. Throws failure. */
std::string text_of_file(const std::string &path);

/* Replaces a file in one step: programs that open it find either the complete old text or the complete new one, and
 * after a failure the old one. If the path is a symbolic link, the file that it leads to is replaced. The file keeps
 * its mode, and its owner if that is possible. before: the text that was read from it; if the file has another text by
 * now, it is not replaced. Throws failure. */
void replace_file(const std::string &path, std::string_view before, std::string_view after);

} // namespace cdef

#endif
