/* current_line.h: the line of the source that is being checked, and the places in it. */
#ifndef CDGEN_CHECK_CURRENT_LINE_H
#define CDGEN_CHECK_CURRENT_LINE_H

#include "check/check.h"
#include "compiler/cdgen_read.h"

#include <array>
#include <string>
#include <string_view>

namespace check {

class current_line {
public:
    /* The next line as it was read, with its number. */
    void read(const source_line &source, int number);
    /* Its text, without comment; end is null if it has none. The compiler takes the text apart in place. */
    void set_text(const attr_text &line_text) {
        text = line_text;
    }
    /* No line follows. */
    void end_source();

    /* A text for the compiler to take instead of this line's, which it has already taken apart. The first `added`
     * characters are not in the line. */
    attr_text replaced(std::string_view by, size_t added = 0);

    /* The text without blanks in front, which the compiler may have cut into pieces. */
    std::string_view whole() const {
        return {text.name, static_cast<size_t>(text.end - text.name)};
    }

    place none() const {
        return {number, 0, 0};
    }
    /* All of the text. */
    place all() const;
    /* Part of the value of an attribute of this line. */
    place part_of(const attr_place &attr, size_t offset, size_t length) const;
    /* What an error of this line marks. item: what the error names, if it is a part of the line. */
    place marked(mark_kind kind, const attr_place &attr, const char *item = nullptr) const;
    /* The text at a place of this line. */
    std::string_view at(const place &part) const {
        return std::string_view(raw).substr(part.column - 1, part.length);
    }

    std::string raw; /* the line as it was read */
    attr_text text = {};
    int number = 0;
    bool continues = false; /* the line is the rest of one that is too long to be read in one piece */
    bool ended = false;     /* the source has ended; raw is still its last line */

private:
    size_t column_of(const char *in_text) const;

    std::array<char, 512> copy; /* holds a replaced text */
    size_t copy_added = 0;
    bool fills_piece = false;
};

} // namespace check

#endif
