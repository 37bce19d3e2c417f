/* failure.cpp: messages on standard error. */

#include "cdef/support/failure.h"

#include "text/shown.h"

#include <cstdio>

namespace cdef {

/* File names are part of messages, and a name may contain any characters. */
void print_error(const std::string &message) {
    std::fprintf(stderr, "cdef: %s\n", text::escaped(message).c_str());
}

} // namespace cdef
