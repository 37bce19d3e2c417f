/* codes.h: all that cdef reports under a code, and what is known about it. */
#ifndef CDGEN_CDEF_EXPLAIN_CODES_H
#define CDGEN_CDEF_EXPLAIN_CODES_H

#include "check/examples.h"

#include <string>
#include <string_view>
#include <vector>

namespace cdef {

/* What a code means. */
struct explanation {
    std::string_view code;
    std::string_view severity;
    std::string_view name; /* that of a warning of cdef check; else empty */
    std::string_view title;
    std::string_view cause;
    std::string_view cure;
    const check::example *example; /* null: there is none */
};

/* Those of cdef check, then those of cdef verify; each in the order of the codes. */
std::vector<explanation> explanations();

/* The one with a code, in any case, or with a warning's name. Null if there is none. */
const explanation *find(const std::vector<explanation> &all, std::string_view code);

/* The code, or the name of a warning, that is most like a text; the code with the nearest number if none is like it.
 * Empty if the text is nothing like a code. */
std::string_view nearest(const std::vector<explanation> &all, std::string_view text);

} // namespace cdef

#endif
