/* meant.h: the names that the unknown names of a source were meant to be. */
#ifndef CDGEN_CHECK_MEANT_H
#define CDGEN_CHECK_MEANT_H

#include "check/known.h"

#include <string_view>

namespace check {

/* The attribute that a name in the latest stanza of a kind was meant to be. It is not certain if the stanza already has
 * this attribute and may have it only once. Blanks after the name do not count. */
language::guess attribute_meant(const knowledge &known, int kind, std::string_view name);

} // namespace check

#endif
