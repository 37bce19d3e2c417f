/* lacking.h: the missing attributes that the compiler does not notice. */
#ifndef CDGEN_CHECK_LACKING_H
#define CDGEN_CHECK_LACKING_H

#include "check/view.h"
#include "language/suggestions.h"

namespace check {

/* The required attributes that are missing at the end of the current stanza without an error of the compiler. Empty if
 * another error of the stanza, reported already or later, may explain that. */
language::name_list lacking_unnoticed(const view &see, int next_kind);

} // namespace check

#endif
