/* text_of_file.h: reads a text file. */
#ifndef CDGEN_CDEF_TEXT_OF_FILE_H
#define CDGEN_CDEF_TEXT_OF_FILE_H

#include <string>

namespace cdef {

/* The whole contents of a file; "-" is standard input. Throws failure, which names the path. */
std::string text_of_file(const std::string &path);

} // namespace cdef

#endif
