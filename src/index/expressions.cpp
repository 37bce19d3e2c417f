/* expressions.cpp: the names in an expression. */

#include "index/expressions.h"

#include "language/expressions.h"

#include <algorithm>
#include <cctype>

namespace source_index {

namespace {

/* A letter of any script: bytes that are not ASCII are parts of letters. */
bool is_letter(char c) {
    auto byte = static_cast<unsigned char>(c);
    return std::isalnum(byte) != 0 || c == '_' || byte >= 0x80;
}

bool is_digit(char c) {
    return c >= '0' && c <= '9';
}

std::size_t end_of_word(std::string_view text, std::size_t begin) {
    return static_cast<std::size_t>(
        std::find_if_not(text.begin() + static_cast<std::ptrdiff_t>(begin), text.end(), is_letter) - text.begin());
}

} // namespace

std::vector<expression_name> names_in(std::string_view expression) {
    std::vector<expression_name> found;
    std::size_t member_at = std::string_view::npos; /* a word that begins here is an element of the name before it */
    for (std::size_t at = 0; at < expression.size();) {
        char c = expression[at];
        if (language::is_quote(c)) {
            at = language::end_of_quoted(expression, at);
        } else if (is_letter(c)) {
            std::size_t end = end_of_word(expression, at);
            if (!is_digit(c))
                found.push_back({{at, end}, at == member_at});
            bool has_member = !is_digit(c) && end < expression.size() && expression[end] == '.';
            member_at = has_member ? end + 1 : std::string_view::npos;
            at = end;
        } else {
            ++at;
        }
    }
    return found;
}

bool is_in_quotes(std::string_view expression, std::size_t offset) {
    for (std::size_t at = 0; at < std::min(offset, expression.size());) {
        if (!language::is_quote(expression[at])) {
            ++at;
            continue;
        }
        std::size_t end = language::end_of_quoted(expression, at);
        if (offset < end)
            return true;
        at = end;
    }
    return false;
}

bool is_expression_name(std::string_view text) {
    return !text.empty() && !is_digit(text.front()) && std::all_of(text.begin(), text.end(), is_letter);
}

} // namespace source_index
