/* separate.h: that a build does not write to its own sources, nor twice to one file. */
#ifndef CDGEN_CDEF_BUILD_SEPARATE_H
#define CDGEN_CDEF_BUILD_SEPARATE_H

#include "build/plan.h"

#include <optional>
#include <string>
#include <vector>

namespace cdef::build_command {

/* The sources without those that are there already under another spelling of their directory. */
std::vector<std::string> without_repetitions(const std::vector<std::string> &sources);

/* Throws failure if a database or the file of dependencies would replace a source or a project file, or if two of them
 * would be the same file, whatever their names are. */
void require_separate_files(const std::vector<build::unit> &units, const std::optional<std::string> &depfile);

} // namespace cdef::build_command

#endif
