/* error.h: why a database has no source. */
#ifndef CDGEN_CDEF_SOURCE_ERROR_H
#define CDGEN_CDEF_SOURCE_ERROR_H

#include <stdexcept>
#include <string>
#include <string_view>

namespace cdef::source {

/* "no source: DynamicClassAttribute 'X': no varieties" */
struct no_source_error : std::runtime_error {
    using std::runtime_error::runtime_error;
};

/* Throws no_source_error: what cannot be written, and why. */
[[noreturn]] void no_source(const std::string &what, const std::string &why);

/* "DynamicClassAttribute 'X'": the subject of a message. */
std::string place_of(std::string_view kind, std::string_view name);

} // namespace cdef::source

#endif
