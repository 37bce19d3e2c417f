/* value_notes.h: notes that say how to write a line that the compiler refuses. Pure functions of texts. */
#ifndef CDGEN_CHECK_VALUE_NOTES_H
#define CDGEN_CHECK_VALUE_NOTES_H

#include "language/catalogue.h"
#include "vx.h"

#include <string>
#include <string_view>

namespace check {

/* A value that is not of its data type. */
std::string value_note(const table_attrs &attr, vx_data_type_t type, std::string_view value);

/* Varieties without a comma, or with more than one. */
std::string variety_note(std::string_view value);

/* An attribute line without a value. rest: of the line, after the equals sign. */
std::string no_value_note(const table_attrs &attr, std::string_view rest);

/* An attribute line of a kind without an equals sign. */
std::string no_equals_note(const srtable_ctrl &kind, std::string_view text);

/* A value that begins with a quote that nothing closes. */
std::string open_quote_note(std::string_view value);

} // namespace check

#endif
