/* positions.h: positions as the protocol counts them: lines from 0, which end with \n, \r\n or \r, and code units of an
 * encoding in the line. Pure functions of texts. */
#ifndef CDGEN_SERVER_POSITIONS_H
#define CDGEN_SERVER_POSITIONS_H

#include "index/lines.h"

#include <compare>
#include <cstddef>
#include <cstdint>
#include <string_view>
#include <vector>

namespace lsp {

/* The encoding whose code units are counted. */
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

/* The offsets at which the lines of a text begin. The caller owns the text. */
class line_table {
public:
    explicit line_table(std::string_view text);

    /* At least 1; the last line may be empty. */
    std::size_t count() const {
        return begins.size();
    }
    /* The offset of a line, which must be below count(). */
    std::size_t begin(std::size_t line) const {
        return begins[line];
    }
    /* A line without its end. */
    stretch line(std::string_view text, std::size_t number) const;
    /* The line that contains an offset. */
    std::size_t line_of(std::size_t offset) const;

    /* Updates the table after a stretch of the text was replaced with this many bytes. */
    void change(std::string_view changed, stretch replaced, std::size_t length);

private:
    std::vector<std::size_t> begins;
};

/* The offset of a position, in bytes. Positions that do not exist are moved: after the last line to the end of the
 * text, after a line's last character to the line's end, inside a character to its beginning. */
std::size_t offset_of(std::string_view text, const line_table &lines, const position &at, encoding units);

stretch stretch_of(std::string_view text, const line_table &lines, const range &of, encoding units);

/* Converts offsets to positions. Ascending offsets are quick, however long a line is. Text and table must not change.
 */
class position_maker {
public:
    position_maker(std::string_view of_text, const line_table &of_lines, encoding counted)
        : text(of_text), lines(of_lines), units(counted) {}

    /* An offset inside the end of a line counts as the end of its text. */
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
