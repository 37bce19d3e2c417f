/* codes.h: all that cdef reports under a code, and what is known about it. */
#ifndef CDGEN_CDEF_EXPLAIN_CODES_H
#define CDGEN_CDEF_EXPLAIN_CODES_H

#include "check/examples.h"
#include "language/suggestions.h"

#include <string>
#include <string_view>
#include <vector>

namespace cdef {

/* What a code means. */
struct explanation {
    std::string_view code;
    std::string_view severity;
    std::string_view name; /* that of a warning; else empty */
    std::string_view title;
    std::string cause;
    std::string cure;
    const check::example *example; /* null: there is none */
};

/* Those of cdef check, then those of cdef verify, then those of cdef diff and cdef gate; each in the order of the
 * codes. */
std::vector<explanation> explanations();

/* The one with a code, in any case, or with a warning's name. Null if there is none. */
const explanation *find(const std::vector<explanation> &all, std::string_view code);

/* The codes and the names of warnings that are one edit from a text. Numbers that are close to each other mean nothing
 * alike, so nothing else is near. */
language::name_list nearest(const std::vector<explanation> &all, std::string_view text);

} // namespace cdef

#endif
