/* first_source.h: makes the first source of a new class. */
#ifndef CDGEN_CDEF_NEW_FIRST_SOURCE_H
#define CDGEN_CDEF_NEW_FIRST_SOURCE_H

#include <optional>
#include <string>

namespace cdef::new_command {

/* A source of a class with this name. It compiles without a warning. No value if no source can have the name. */
std::optional<std::string> first_source(const std::string &name);

} // namespace cdef::new_command

#endif
