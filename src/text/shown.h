/* shown.h: makes texts of unknown origin safe to show, so that nothing in them controls a terminal, breaks a line or is
 * invisible. */
#ifndef CDGEN_TEXT_SHOWN_H
#define CDGEN_TEXT_SHOWN_H

#include <cstddef>
#include <string>
#include <string_view>

namespace text {

/* The size in bytes of the UTF-8 character at the start of bytes if a terminal can show it as it is, else 0. */
std::size_t printable_length(std::string_view bytes);

/* The text with everything escaped that is not printable UTF-8, as \n, \t, \r or \xNN: for messages. Quotes and
 * backslashes are not escaped, so that ordinary texts do not change. */
std::string escaped(std::string_view bytes);

/* The same in double quotes, with quotes and backslashes escaped too. */
std::string quoted(std::string_view bytes);
void append_quoted(std::string &to, std::string_view bytes);

/* Single quotes and backslashes get a backslash; everything that is not printable ASCII is written as \xNN. */
std::string escaped_ascii(std::string_view bytes);

/* The same in single quotes. */
std::string quoted_ascii(std::string_view bytes);

/* The text with a '?' for each character that is not printable, except tabs: as many columns as the text has. */
std::string masked(std::string_view bytes);

} // namespace text

#endif
