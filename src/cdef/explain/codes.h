/* codes.h: everything that cdef reports with a code, and its explanation. */
#ifndef CDGEN_CDEF_EXPLAIN_CODES_H
#define CDGEN_CDEF_EXPLAIN_CODES_H

#include "check/examples.h"
#include "language/suggestions.h"

#include <string>
#include <string_view>
#include <vector>

namespace cdef {

/* The explanation of a code. */
struct explanation {
    std::string_view code;
    std::string_view severity;
    std::string_view name; /* that of a warning; else empty */
    std::string_view title;
    std::string cause;
    std::string cure;
    const check::example *example; /* null if there is none */
};

/* Those of cdef check, then those of cdef verify, then those of cdef diff and cdef gate; each in the order of the
 * codes. */
std::vector<explanation> explanations();

/* Finds an explanation by its code, in upper or lower case, or by a warning's name. Null if there is none. */
const explanation *find(const std::vector<explanation> &all, std::string_view code);

/* The codes and the names of warnings that differ from a text by one edit. Codes with similar numbers have nothing in
 * common, so others are not suggested. */
language::name_list nearest(const std::vector<explanation> &all, std::string_view text);

} // namespace cdef

#endif
