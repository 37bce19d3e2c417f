/* fix.h: makes the certain corrections of a source. */
#ifndef CDGEN_CHECK_FIX_H
#define CDGEN_CHECK_FIX_H

#include "check/check.h"

#include <cstddef>
#include <string>
#include <string_view>

namespace check {

struct fixed_source {
    std::string text;
    size_t corrected = 0; /* corrections that were made */
    /* Corrections that were not, because more errors would be found with them, or with a group of corrections that they
     * are in and that is too expensive to search. */
    size_t dropped = 0;
};

/* Makes the certain corrections of the errors, and of the wanted warnings. The corrected text has no more errors than
 * the source. Findings that a correction brings to light are corrected too, so fixing the text again changes nothing.
 * Throws cannot_check, with the source's name, if memory runs out. */
fixed_source fix_bytes(std::string_view bytes, const std::string &name, const warning_set &wanted);

} // namespace check

#endif
