/* places.h: places in a source, in the forms that other programs and people read. Pure functions of texts. */
#ifndef CDGEN_REPORT_PLACES_H
#define CDGEN_REPORT_PLACES_H

#include "check/check.h"

#include <cstddef>
#include <string>
#include <string_view>

namespace report {

/* "file:line:column: ", or the part of it that the place has. */
std::string prefix_of(std::string_view file, const check::place &at);

/* The source's line with its number, and below it a caret for each character of the place, in a colour if there is one
 * (an escape sequence); empty for a place without column. */
std::string excerpt_of(const check::place &at, std::string_view source, std::string_view colour = {});

inline constexpr std::string_view NO_COLOUR = "\033[0m"; /* ends a colour */

/* A path as a URI: an absolute one as file:///..., a relative one as a reference. Bytes that a URI may not contain are
 * written as %XX. */
std::string uri_of(std::string_view file);

/* The number of UTF-8 characters that begin in the first bytes of a text. A character that is cut off counts too. */
std::size_t characters_in(std::string_view source, std::size_t bytes);

/* The characters of a place that has a column. */
struct character_range {
    std::size_t column; /* from 1 */
    std::size_t length;
};

/* source: the text of the place's line; if it is empty, bytes are counted instead of characters. */
character_range characters_of(const check::place &at, std::string_view source);

/* "certain" or "likely" */
const char *name_of(check::certainty sure);

/* A place in the file, where each line ends with a newline; the compiler, in contrast, counts a long line several
 * times. If the place has no column, its line may be 0. */
std::size_t line_in_file(const check::place &at);
character_range characters_in_file(const check::place &at, std::string_view source);

/* The line that a note is about; empty if it is not known. */
std::string_view source_of(const check::note &more, const check::finding &found);

} // namespace report

#endif
