/* lines.h: the lines of a source as the compiler reads them, and where their parts are. */
#ifndef CDGEN_INDEX_LINES_H
#define CDGEN_INDEX_LINES_H

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

namespace source_index {

/* Bytes of a source. */
struct span {
    std::size_t begin = 0;
    std::size_t end = 0;

    bool is_empty() const {
        return begin == end;
    }
    /* The offset after the last byte counts too, because a cursor may be there. */
    bool touches(std::size_t offset) const {
        return begin <= offset && offset <= end;
    }
    std::string_view of(std::string_view source) const {
        return source.substr(begin, end - begin);
    }
    friend bool operator==(const span &, const span &) = default;
};

enum class line_kind : std::uint8_t { empty, comment, header, attribute };

struct line {
    line_kind kind = line_kind::empty;
    span whole; /* without the newline. The compiler reads a long line in pieces; each piece is a line here */
    span text;  /* without comment and without blanks around; empty if there is none */
};

std::vector<line> lines_of(std::string_view source);

/* The parts of an attribute line. */
struct attribute_parts {
    bool has_equals = false; /* without, the name is the whole text */
    bool quoted = false;
    bool closed = true; /* false: the opening quote has no closing quote */
    span name;
    span written; /* all after the equals sign */
    span value;   /* the same without quotes */
};

/* text: of an attribute line in the source */
attribute_parts parts_of(std::string_view source, const span &text);

/* Whether a line, without its newline, is an attribute line with this value. */
bool has_value(std::string_view line, std::string_view value);

/* A value as it is written after an equals sign: with quotes if it needs them. A value that no line can have is
 * returned unchanged. */
std::string written_value(std::string_view value);

} // namespace source_index

#endif
