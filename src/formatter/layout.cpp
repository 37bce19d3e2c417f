/* layout.cpp: what each line of a source becomes: its indentation and its blanks, and the empty lines between stanzas.
 */

#include "formatter/layout.h"

#include "language/limits.h"
#include "text/utf8.h"

#include <algorithm>
#include <optional>

namespace formatter {

namespace {

constexpr std::size_t TAB = 8; /* columns */

/* The column, from 0, that follows a text which begins in column 0. */
std::size_t width_of(std::string_view text) {
    std::size_t column = 0;
    while (!text.empty()) {
        column = text.front() == '\t' ? (column / TAB + 1) * TAB : column + 1;
        text.remove_prefix(text::length_or_1(text));
    }
    return column;
}

/* The text with blanks up to a column, at least one. They are tabs if there were only tabs and tabs reach the column.
 */
std::string filled(std::string text, std::size_t column, std::string_view blanks) {
    std::size_t now = width_of(text);
    if (blanks.find(' ') == std::string_view::npos && column % TAB == 0)
        return text.append(std::max(column / TAB, now / TAB + 1) - now / TAB, '\t');
    return text.append(std::max(column, now + 1) - now, ' ');
}

/* The language ignores blanks between the equals sign and a quote. */
std::string without_blanks_before_quote(std::string_view text) {
    std::size_t equals = text.find('=');
    std::size_t value = text.find_first_not_of(" \t", equals == std::string_view::npos ? text.size() : equals + 1);
    if (value == std::string_view::npos || text[value] != '"' || text.substr(value) == "\"\"")
        return std::string(text);
    return std::string(text.substr(0, equals + 1)).append(text.substr(value));
}

/* The lines of a source in their order. */
class line_layout {
public:
    row take(std::size_t index, const line &each) {
        switch (each.kind) {
        case line_kind::empty:
            comment_before = comment_now = std::nullopt;
            return {.line = index};
        case line_kind::comment:
            return comment_row(index, each);
        case line_kind::header:
        case line_kind::attribute:
            return text_row(index, each);
        case line_kind::verbatim:
            break;
        }
        comment_before = comment_now = std::nullopt;
        return {.line = index, .text = std::string(each.whole)};
    }

private:
    row text_row(std::size_t index, const line &each) {
        std::string text = each.indent.empty() ? "" : "\t";
        text += each.kind == line_kind::header ? std::string(each.text) : without_blanks_before_quote(each.text);
        comment_before = comment_now = std::nullopt;
        if (each.comment.empty())
            return {.line = index, .text = text};
        std::string_view old = each.whole.substr(0, each.whole.size() - each.comment.size() - trailing(each));
        comment_before = width_of(old);
        bool moved = text != old.substr(0, old.size() - each.gap.size()) && !each.gap.empty();
        std::string front = moved ? filled(text, *comment_before, each.gap) : text + std::string(each.gap);
        if (front.size() + each.comment.size() > LONGEST)
            front = text + std::string(each.gap);
        comment_now = width_of(front);
        return {.line = index, .text = front.append(each.comment)};
    }

    row comment_row(std::size_t index, const line &each) {
        std::size_t column = width_of(each.indent);
        if (!each.indent.empty() && comment_before == column) {
            std::string front =
                comment_now == column ? std::string(each.indent) : filled("", *comment_now, each.indent);
            if (front.size() + each.comment.size() <= LONGEST)
                return {.line = index, .text = front.append(each.comment), .belongs_up = true};
        }
        comment_before = comment_now = std::nullopt;
        return {.line = index, .text = std::string(each.indent.empty() ? "" : "\t").append(each.comment)};
    }

    static std::size_t trailing(const line &each) {
        return each.whole.size() - each.indent.size() - each.text.size() - each.gap.size() - each.comment.size();
    }

    static constexpr std::size_t LONGEST = LINE_MAX_CHARS - 1; /* bytes of a line without its newline */

    /* The column of the comment of the line above, in the source and now. */
    std::optional<std::size_t> comment_before;
    std::optional<std::size_t> comment_now;
};

bool has_content(const line &each) {
    return each.kind != line_kind::empty && each.kind != line_kind::comment;
}

/* Of several empty lines, only the first stays. */
bool join_empty_lines(std::span<const line> lines, std::span<row> rows) {
    bool any = false;
    for (std::size_t i = 0; i < lines.size(); ++i) {
        bool empty = lines[i].kind == line_kind::empty;
        rows[i].removed = empty && i > 0 && lines[i - 1].kind == line_kind::empty;
        any = any || empty;
    }
    return any;
}

void remove_empty_lines(std::span<const line> lines, std::span<row> rows) {
    for (std::size_t i = 0; i < lines.size() && lines[i].kind == line_kind::empty; ++i)
        rows[i].removed = true;
}

/* The first of the comments in column 1 at the end of these lines: they belong to the stanza that follows. */
std::size_t own_comments(std::span<const line> lines) {
    std::size_t first = lines.size();
    while (first > 0 && lines[first - 1].kind == line_kind::comment && lines[first - 1].indent.empty())
        --first;
    return first;
}

/* The empty lines between stanzas, in front of the first one, and at the end. */
void space_stanzas(std::span<const line> lines, std::span<row> rows) {
    std::size_t free = 0; /* after the latest line that is neither empty nor a comment */
    for (std::size_t i = 0; i < lines.size(); ++i) {
        if (!has_content(lines[i]))
            continue;
        std::span<const line> between = lines.subspan(free, i - free);
        if (lines[i].kind == line_kind::header && !join_empty_lines(between, rows.subspan(free, i - free)) && free > 0)
            rows[free + own_comments(between)].after_empty = true;
        free = i + 1;
    }
    join_empty_lines(lines.subspan(free), rows.subspan(free));
}

void remove_outer_empty_lines(std::span<const line> lines, std::span<row> rows) {
    remove_empty_lines(lines, rows);
    for (std::size_t i = lines.size(); i > 0 && lines[i - 1].kind == line_kind::empty; --i)
        rows[i - 1].removed = true;
}

} // namespace

std::vector<row> layout_of(std::span<const line> lines) {
    std::vector<row> rows;
    rows.reserve(lines.size());
    line_layout layout;
    for (std::size_t i = 0; i < lines.size(); ++i)
        rows.push_back(layout.take(i, lines[i]));
    space_stanzas(lines, rows);
    remove_outer_empty_lines(lines, rows);
    return rows;
}

} // namespace formatter
