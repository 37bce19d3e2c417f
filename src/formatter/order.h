/* order.h: puts the attributes of stanzas into their usual order. */
#ifndef CDGEN_FORMATTER_ORDER_H
#define CDGEN_FORMATTER_ORDER_H

#include "formatter/layout.h"

#include <optional>
#include <vector>

namespace formatter {

/* Moves the rows of attributes, each with the comments above it, between the empty lines of its stanza. Lines that
 * store texts or values keep their order relative to each other, because the database stores these in the order of the
 * source. fixed: a line whose stanza is not changed; nothing: there is none. */
void put_in_order(std::vector<row> &rows, std::span<const line> lines, std::optional<std::size_t> fixed);

} // namespace formatter

#endif
