/* sources.h: finds the sources that operands name. */
#ifndef CDGEN_CDEF_SUPPORT_SOURCES_H
#define CDGEN_CDEF_SUPPORT_SOURCES_H

#include <string>
#include <vector>

namespace cdef {

/* Each operand that is a directory stands for all files called *.cdefsrc in it and below it, in the order of their
 * names, except hidden ones. A link of that name that leads to no file is among them. Throws failure for a directory
 * that cannot be read, or that has no such files. */
std::vector<std::string> sources_of(const std::vector<std::string> &operands);

} // namespace cdef

#endif
