/* expressions.h: what the language says about expressions. Only the runtime knows the rest of their grammar. */
#ifndef CDGEN_LANGUAGE_EXPRESSIONS_H
#define CDGEN_LANGUAGE_EXPRESSIONS_H

#include <cstddef>
#include <string_view>

namespace language {

inline bool is_quote(char c) {
    return c == '"' || c == '\'';
}

/* The end of the quoted text that begins at a quote, after its closing quote; npos if it has none. A quote after a
 * backslash counts, as in all of a source. */
inline std::size_t end_of_quoted(std::string_view expression, std::size_t open) {
    std::size_t close = expression.find(expression[open], open + 1);
    return close == std::string_view::npos ? close : close + 1;
}

} // namespace language

#endif
