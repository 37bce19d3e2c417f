/* utf8.h: where UTF-8 characters end. */
#ifndef CDGEN_TEXT_UTF8_H
#define CDGEN_TEXT_UTF8_H

#include <cstddef>
#include <string_view>

namespace text {

/* The size in bytes of the well-formed UTF-8 character at the start of bytes; 0 if there is none. */
std::size_t utf8_length(std::string_view bytes);

/* The same, but 1 for a byte that starts no character; 0 only for an empty text. */
std::size_t length_or_1(std::string_view bytes);

/* The same, but for the beginning of a character that is cut short, the number of its bytes. Other programs replace
 * such bytes by one U+FFFD. */
std::size_t length_replaced(std::string_view bytes);

/* True if the text consists of well-formed characters. */
bool is_utf8(std::string_view bytes);

/* How many UTF-8 characters begin in a text. */
std::size_t characters_in(std::string_view bytes);

/* The code point of one whole character. */
char32_t decode(std::string_view character);

} // namespace text

#endif
