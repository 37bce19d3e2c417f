/* current_line.h: the line of the source that is being checked, and the places in it. */
#ifndef CDGEN_CHECK_CURRENT_LINE_H
#define CDGEN_CHECK_CURRENT_LINE_H

#include "check/check.h"
#include "compiler/cdgen_read.h"
#include "language/limits.h"
#include "language/suggestions.h"

#include <array>
#include <cstddef>
#include <functional>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace check {

class current_line {
public:
    current_line() = default;
    current_line(const current_line &) = delete;
    current_line &operator=(const current_line &) = delete;

    /* The next line, with its number, before the compiler takes it apart. */
    void read(const source_line &source, int line_number) {
        if (is_piece())
            read_after_piece(line_number);
        if (!is_saved(source))
            save(source.begin, source.read_end);
        begin = source.begin;
        if (next_return < begin)
            find_return();
        raw = {saved.data() + (begin - saved_begin), static_cast<size_t>(source.end - begin)};
        number = line_number;
        fills_piece = raw.size() == LINE_MAX_CHARS;
        has_newline = source.read_end > source.end;
    }
    /* No line follows. */
    void end_source();

    /* A text for the compiler to take instead of this line's, which it has already taken apart. The first `added`
     * characters are not in the line. */
    attr_text replaced(std::string_view by, size_t added = 0);

    /* The text without leading blanks. The compiler may have cut it into pieces. */
    std::string_view whole() const {
        return {text.name, static_cast<size_t>(text.end - text.name)};
    }

    place none() const {
        return {number, 0, 0};
    }
    /* All of the text. */
    place all() const {
        return {number, column_of(text.name), whole().size()};
    }
    /* A part of the text. */
    place part(std::string_view in_text) const {
        return {number, column_of(in_text.data()), in_text.size()};
    }
    /* Part of the value of an attribute of this line. */
    place part_of(const attr_place &attr, size_t offset, size_t length) const {
        return {number, column_of(attr.value) + offset, length};
    }
    /* The column of a character of the text. */
    size_t column_of(const char *in_text) const {
        return static_cast<size_t>(is_copied(in_text) ? in_text - copy.data() - copy_added : in_text - text.line) + 1;
    }
    /* The place that an error of this line marks. item: the part of the line that the error names, if it names one. */
    place marked(mark_kind kind, const attr_place &attr, const char *item = nullptr) const;
    /* The text at a place of this line. */
    std::string_view at(const place &part) const {
        return raw.substr(part.column - 1, part.length);
    }

    /* Computes where in the file a place of this line, or of an earlier one, is. */
    void find_in_file(place &at) const;
    /* The edit that replaces a part of this line by a text. It may also be an earlier line, except the rest of one that
     * is too long. source: the line's text */
    edit replacement(place part, std::string_view source, std::string_view by) const;
    /* The correction that replaces a part of a line by the name that was meant. No correction if there is no such name,
     * or if the line is the rest of one that is too long. */
    correction renamed(const place &part, std::string_view source, const language::guess &meant) const;
    /* The removal of carriage returns at the end of this line; nothing if it has none. */
    std::optional<edit> without_returns() const;
    /* The removal of this line, newline included. */
    edit removed() const;
    /* The insertion of whole lines, each with its newline, after this one. */
    edit followed_by(std::string lines) const;

    /* The line is a part of one that is too long. */
    bool is_piece() const {
        return continues || fills_piece;
    }

    /* Where in the line its first carriage return is; at or after its end if it has none. */
    size_t carriage_return() const {
        return static_cast<size_t>(next_return - begin);
    }

    std::string_view raw; /* the line as it was read */
    attr_text text = {};  /* its text, without comment; end is null if it has none */
    int number = 0;
    bool continues = false; /* the line is the rest of one that is too long to be read in one piece */
    bool ended = false;     /* the source has ended; raw is still its last line */

private:
    bool is_copied(const char *in_text) const {
        return std::greater_equal<>()(in_text, copy.data()) && std::less<>()(in_text, copy.data() + copy.size());
    }
    bool is_saved(const source_line &source) const {
        return saved_of == source.read_end && source.begin > begin && source.end <= saved_end;
    }
    void read_after_piece(int line_number);
    void save(const char *from, const char *to);
    void find_return();

    static constexpr size_t SAVED_MAX = 4096;

    /* The lines of the buffer from a line on, as they were read: the compiler takes each line apart. It holds raw. */
    std::array<char, SAVED_MAX> saved;
    const char *saved_begin = nullptr; /* where the saved bytes are in the buffer */
    const char *saved_end = nullptr;
    const char *saved_of = nullptr;    /* the end of what the buffer held */
    const char *begin = nullptr;       /* of the line, in the buffer */
    const char *next_return = nullptr; /* the first carriage return from begin on, or saved_end if there is none */
    std::array<char, 512> copy;        /* holds a replaced text */
    std::ptrdiff_t copy_added = 0;
    bool fills_piece = false;
    bool has_newline = false;     /* false for the last line of a source that does not end with one */
    size_t characters_before = 0; /* in the pieces of the line before this one */
    std::vector<int> rests;       /* numbers of the lines that are the rests of others */
};

} // namespace check

#endif
