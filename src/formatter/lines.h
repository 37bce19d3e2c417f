/* lines.h: the lines of a source and their parts, as the compiler reads them. */
#ifndef CDGEN_FORMATTER_LINES_H
#define CDGEN_FORMATTER_LINES_H

#include <cstddef>
#include <cstdint>
#include <string_view>
#include <vector>

namespace formatter {

enum class line_kind : std::uint8_t {
    empty, /* nothing but blanks */
    comment,
    header,
    attribute,
    verbatim /* longer than the compiler reads at once, with a NUL, a carriage return in front of
              * blanks at its end, or quotes without text: not changed */
};

/* A line without its newline. The parts refer to the source; together, and with the blanks at the end of the line, they
 * are the whole line. A verbatim line has no parts. */
struct line {
    std::string_view whole = {};
    line_kind kind = line_kind::verbatim;
    std::string_view indent = {}; /* blanks in front */
    std::string_view text = {};   /* as far as the compiler reads it; of a comment, nothing */
    std::string_view gap = {};    /* blanks between text and comment */
    std::string_view comment = {};
};

/* Whether the compiler reads the line in one piece. The line is given without its newline. */
bool is_short(std::string_view whole);

/* The lines of a source. The last one may lack its newline; an empty source has none. */
std::vector<line> lines_of(std::string_view source);

} // namespace formatter

#endif
