/* first_source.h: the source that a new class begins with. */
#ifndef CDGEN_CDEF_NEW_FIRST_SOURCE_H
#define CDGEN_CDEF_NEW_FIRST_SOURCE_H

#include <optional>
#include <string>

namespace cdef::new_command {

/* A source of a class with this name. It compiles without a warning; nothing if there is no such source. */
std::optional<std::string> first_source(const std::string &name);

} // namespace cdef::new_command

#endif
