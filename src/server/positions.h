/* positions.h: places of a text as the protocol counts them: lines from 0, which end with \n, \r\n or \r, and in a line
 * the code units of an encoding. Pure functions of texts. */
#ifndef CDGEN_SERVER_POSITIONS_H
#define CDGEN_SERVER_POSITIONS_H

#include "index/lines.h"

#include <compare>
#include <cstddef>
#include <cstdint>
#include <string_view>
#include <vector>

namespace lsp {

/* What a position counts in a line. */
enum class encoding : std::uint8_t { utf8, utf16 };

struct position {
    std::size_t line = 0;
    std::size_t character = 0; /* code units */
    friend auto operator<=>(const position &, const position &) = default;
};

struct range {
    position start;
    position end;
    friend bool operator==(const range &, const range &) = default;
};

/* Bytes of a text. */
using stretch = source_index::span;

/* Where the lines of a text begin. The text is the caller's. */
class line_table {
public:
    explicit line_table(std::string_view text);

    /* There is one at least; the last one may be empty. */
    std::size_t count() const {
        return begins.size();
    }
    /* line: below count(). In bytes. */
    std::size_t begin(std::size_t line) const {
        return begins[line];
    }
    /* The line without what ends it. */
    stretch line(std::string_view text, std::size_t number) const;
    /* The line that an offset is in. */
    std::size_t line_of(std::size_t offset) const;

    /* Follows a change that has been made: a stretch of the text gave way to so many bytes. */
    void change(std::string_view changed, stretch replaced, std::size_t length);

private:
    std::vector<std::size_t> begins;
};

/* The offset of a position, in bytes. A line after the last one means the end of the text; a character after a line's
 * last one its end; one in the middle of a character that character. */
std::size_t offset_of(std::string_view text, const line_table &lines, const position &at, encoding units);

stretch stretch_of(std::string_view text, const line_table &lines, const range &of, encoding units);

/* Makes positions of offsets. Quick if they ascend, however long a line is. The text and the table must stay. */
class position_maker {
public:
    position_maker(std::string_view of_text, const line_table &of_lines, encoding counted)
        : text(of_text), lines(of_lines), units(counted) {}

    /* An offset within what ends a line is at the line's end. */
    position at(std::size_t offset);
    range of(const stretch &part) {
        position start = at(part.begin);
        return {start, at(part.end)};
    }

private:
    std::string_view text;
    const line_table &lines;
    encoding units;
    std::size_t latest = 0; /* an offset, and */
    position there;         /* its position */
};

} // namespace lsp

#endif
