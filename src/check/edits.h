/* edits.h: changes of a source. Pure functions of texts. */
#ifndef CDGEN_CHECK_EDITS_H
#define CDGEN_CHECK_EDITS_H

#include "check/check.h"

#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <vector>

namespace check {

/* Adds the edits of another correction, except those that are already there. The result is only as certain as the less
 * certain of the two. */
void add(correction &to, correction more);

/* The corrections that can be made together. If two change the same bytes, the first is chosen. */
std::vector<correction> compatible(std::vector<correction> all);

/* The source with its corrections made. No value if it does not have the bytes that they remove. */
std::optional<std::string> corrected(std::string_view source, std::span<const correction> all);

} // namespace check

#endif
