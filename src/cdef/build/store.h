/* store.h: puts a database in its place. */
#ifndef CDGEN_CDEF_BUILD_STORE_H
#define CDGEN_CDEF_BUILD_STORE_H

#include <cstddef>
#include <span>
#include <string>

namespace cdef::build_command {

enum class stored { WRITTEN, UNCHANGED };

/* Replaces the file unless it has the same database already, the time aside. "-" is standard output. sync: the database
 * is on the disk before the function returns. Throws failure; the file is then as it was. */
stored store(std::span<const std::byte> image, const std::string &path, const std::string &source, bool sync);

} // namespace cdef::build_command

#endif
