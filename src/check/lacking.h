/* lacking.h: what a stanza lacks without the compiler's noticing. */
#ifndef CDGEN_CHECK_LACKING_H
#define CDGEN_CHECK_LACKING_H

#include "check/view.h"
#include "language/suggestions.h"

namespace check {

/* The required attributes that the current stanza lacks at its end and that the compiler does not ask for. Nothing if
 * an error of the stanza that has been reported, or will be, may explain it. */
language::name_list lacking_unnoticed(const view &see, int next_kind);

} // namespace check

#endif
