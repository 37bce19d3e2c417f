/* error.cpp: why a database has no source. */

#include "cdef/source/error.h"

#include "text/shown.h"

namespace cdef::source {

void no_source(const std::string &what, const std::string &why) {
    throw no_source_error("no source: " + what + ": " + why);
}

std::string text_of(const record_name &what) {
    constexpr std::size_t NAME_MAX_SHOWN = 100; /* characters */
    std::string shown(what.kind);
    if (what.name)
        shown += " " + text::quoted_ascii(what.name->substr(0, NAME_MAX_SHOWN));
    if (what.element)
        shown += ", element " + text::quoted_ascii(*what.element);
    return shown;
}

void no_source(const record_name &what, const std::string &why) {
    no_source(text_of(what), why);
}

} // namespace cdef::source
