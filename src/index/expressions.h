/* expressions.h: the names in an expression. Only the runtime knows its grammar; anything that looks like a name counts
 * as one. */
#ifndef CDGEN_INDEX_EXPRESSIONS_H
#define CDGEN_INDEX_EXPRESSIONS_H

#include "index/lines.h"

#include <string_view>
#include <vector>

namespace source_index {

struct expression_name {
    span at;             /* in the expression */
    bool member = false; /* true: an element of the name before it; a dot is between them */
};

/* The words of an expression that are outside of quotes and do not begin with a digit. */
std::vector<expression_name> names_in(std::string_view expression);

/* Whether a cursor at this offset is inside of quotes in an expression. */
bool is_in_quotes(std::string_view expression, std::size_t offset);

/* Whether a text is one such word. */
bool is_expression_name(std::string_view text);

} // namespace source_index

#endif
