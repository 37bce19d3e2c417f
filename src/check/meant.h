/* meant.h: what the names of a source that nothing has were meant to be. */
#ifndef CDGEN_CHECK_MEANT_H
#define CDGEN_CHECK_MEANT_H

#include "check/known.h"

#include <string_view>

namespace check {

/* The attribute that a name in the latest stanza of a kind was meant to be. It is not certain to be one that the stanza
 * has given already and may give only once. Blanks after the name do not count. */
language::guess attribute_meant(const knowledge &known, int kind, std::string_view name);

} // namespace check

#endif
