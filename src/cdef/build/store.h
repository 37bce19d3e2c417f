/* store.h: writes a database to its file. */
#ifndef CDGEN_CDEF_BUILD_STORE_H
#define CDGEN_CDEF_BUILD_STORE_H

#include <cstddef>
#include <span>
#include <string>

namespace cdef::build_command {

enum class stored { WRITTEN, UNCHANGED };

/* Replaces the file unless it already has the same database, apart from the time. "-" is standard output. sync: the
 * database is on the disk before the function returns. Throws failure and then leaves the file as it was. */
stored store(std::span<const std::byte> image, const std::string &path, const std::string &source, bool sync);

} // namespace cdef::build_command

#endif
