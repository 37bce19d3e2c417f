/* error.cpp: why a database has no source. */

#include "cdef/source/error.h"

#include "text/shown.h"

namespace cdef::source {

void no_source(const std::string &what, const std::string &why) {
    throw no_source_error("no source: " + what + ": " + why);
}

std::string place_of(std::string_view kind, std::string_view name) {
    constexpr std::size_t NAME_MAX_SHOWN = 100; /* characters */
    return std::string(kind) + " " + text::quoted_ascii(name.substr(0, NAME_MAX_SHOWN));
}

} // namespace cdef::source
