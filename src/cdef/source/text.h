/* text.h: lines and values, written so that the compiler reads back what they were written for. */
#ifndef CDGEN_CDEF_SOURCE_TEXT_H
#define CDGEN_CDEF_SOURCE_TEXT_H

#include "cdb_view.h"

#include <string>
#include <string_view>
#include <vector>

namespace cdef::source {

/* Appends the line that gives an attribute a value, with its newline. False, and nothing is appended, if no line does.
 */
bool append_attribute_line(std::string &to, std::string_view name, std::string_view value);

/* The texts of a value that are worth trying, the best one first; none if it has no text. They all stand for the same
 * value, but one may fit into a line where another does not. in_pair: the text must not contain a comma. */
std::vector<std::string> texts_of(const cdb::value &value, bool in_pair);

/* True if an attribute of the type has this value without a line for it. */
bool is_default(const cdb::value &value);

} // namespace cdef::source

#endif
