/* git.h: what the program git says of a repository. */
#ifndef CDGEN_CDEF_GATE_GIT_H
#define CDGEN_CDEF_GATE_GIT_H

#include <optional>
#include <string>
#include <vector>

namespace cdef::gate_command {

/* Standard output of git with these arguments, in a directory and for the repository that contains it, whatever
 * repository the environment names; nothing if its exit status is not 0. Its messages are not shown. Throws failure if
 * git cannot be run. */
std::optional<std::string> git(const std::string &directory, const std::vector<std::string> &arguments);

} // namespace cdef::gate_command

#endif
