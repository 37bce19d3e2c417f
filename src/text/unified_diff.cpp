/* unified_diff.cpp: what changed in a text, line by line. */

#include "text/unified_diff.h"

#include <algorithm>
#include <array>
#include <optional>
#include <string>

namespace text {

namespace {

constexpr std::size_t CONTEXT = 3; /* lines shown before and after a change */
constexpr std::size_t WINDOW = 64; /* how many lines ahead to look for a line that both texts have */

/* To limit memory: */
constexpr std::size_t KEPT = 1024;   /* changes of a hunk that are kept until it is shown */
constexpr std::size_t PIECE = 65536; /* bytes that are passed on together */

/* Where a line begins, or the text's end. */
struct place {
    std::size_t line = 0; /* from 0 */
    std::size_t byte = 0;
};

/* The lines of a text from a place on, with their newlines. There may be very many, so no more than WINDOW of them are
 * known in advance. */
class line_cursor {
public:
    explicit line_cursor(std::string_view whole, place first = {}) : text(whole), here(first), known_to(first.byte) {}

    place at() const {
        return here;
    }
    bool is_at_end() const {
        return here.byte == text.size();
    }
    /* So many lines after this one; empty if the text ends before. */
    std::string_view line(std::size_t ahead = 0) {
        for (; known <= ahead; ++known) {
            std::size_t end = std::min(text.find('\n', known_to), text.size() - 1) + 1;
            slot(known) = text.substr(known_to, end - known_to);
            known_to = end;
        }
        return slot(ahead);
    }
    void advance(std::size_t lines = 1) {
        for (; lines > 0; --lines) {
            here = {here.line + 1, here.byte + line().size()};
            first_known = (first_known + 1) % lines_known.size();
            --known;
        }
    }
    void advance_to_end() {
        while (!is_at_end())
            advance();
    }

private:
    std::string_view &slot(std::size_t ahead) {
        return lines_known[(first_known + ahead) % lines_known.size()];
    }

    std::string_view text;
    place here;
    std::size_t known_to; /* the byte after the lines that are known */
    std::array<std::string_view, 2 * WINDOW> lines_known;
    std::size_t first_known = 0;
    std::size_t known = 0;
};

struct range {
    place begin;
    place end; /* after the last line */

    std::string_view of(std::string_view text) const {
        return text.substr(begin.byte, end.byte - begin.byte);
    }
};
struct change {
    range before;
    range after;
};

/* Finds the changes in order. */
class comparison {
public:
    comparison(std::string_view text_before, std::string_view text_after) : before(text_before), after(text_after) {}

    /* Those that follow a change. */
    comparison(std::string_view text_before, std::string_view text_after, const change &last)
        : before(text_before, last.before.end), after(text_after, last.after.end) {}

    std::optional<change> next() {
        for (; is_same(0, 0); after.advance())
            before.advance();
        change found = {{before.at(), {}}, {after.at(), {}}};
        if (is_at_end())
            return std::nullopt;
        while (!is_at_end() && !is_same(0, 0))
            pass_changed();
        found.before.end = before.at();
        found.after.end = after.at();
        return found;
    }

private:
    bool is_at_end() const {
        return before.is_at_end() && after.is_at_end();
    }
    bool is_same(std::size_t i, std::size_t j) {
        std::string_view line = before.line(i);
        return !line.empty() && line == after.line(j);
    }
    /* Goes to the next line that both texts have, if it is near. */
    void pass_changed() {
        if (before.is_at_end() || after.is_at_end()) {
            before.advance_to_end();
            after.advance_to_end();
            return;
        }
        for (std::size_t lines = 1; lines <= WINDOW; ++lines)
            for (std::size_t removed = 0; removed <= lines; ++removed)
                if (is_same(removed, lines - removed)) {
                    before.advance(removed);
                    after.advance(lines - removed);
                    return;
                }
        before.advance();
        after.advance();
    }

    line_cursor before;
    line_cursor after;
};

/* Passes a text on in pieces. */
class piecewise {
public:
    explicit piecewise(const piece_sink &sink) : to(sink) {}

    void add(std::string_view text) {
        if (piece.size() + text.size() > PIECE)
            flush();
        if (text.size() > PIECE)
            to(text);
        else
            piece += text;
    }
    void add_lines(std::string_view mark, std::string_view lines) {
        for (line_cursor at(lines); !at.is_at_end(); at.advance()) {
            add(mark);
            add(at.line());
            if (!at.line().ends_with('\n'))
                add("\n\\ No newline at end of file\n");
        }
    }
    void flush() {
        if (!piece.empty())
            to(piece);
        piece.clear();
    }

private:
    const piece_sink &to;
    std::string piece;
};

/* "12,3": the first line and how many; before an empty range, the line in front of it. */
std::string shown(std::size_t begin, std::size_t count) {
    std::string text = std::to_string(begin + (count == 0 ? 0 : 1));
    return count == 1 ? text : text + "," + std::to_string(count);
}

/* Changes that share their context. */
class hunk {
public:
    hunk(std::string_view text_before, std::string_view text_after, const change &one)
        : before(text_before), after(text_after), first(one), last(one), kept({one}) {}

    /* False if the next change is too far away. */
    bool add(const change &next) {
        if (next.before.begin.line - last.before.end.line > 2 * CONTEXT)
            return false;
        last = next;
        if (kept.size() < KEPT)
            kept.push_back(next);
        return true;
    }
    void show(piecewise &to) const {
        std::size_t context = std::min(CONTEXT, first.before.begin.line);
        std::size_t shown_to = first.before.begin.byte;
        for (std::size_t line = 0; line < context; ++line)
            shown_to = before.substr(0, shown_to - 1).rfind('\n') + 1;
        line_cursor end(before, last.before.end);
        while (!end.is_at_end() && end.at().line - last.before.end.line < CONTEXT)
            end.advance();
        std::size_t rest = end.at().line - last.before.end.line;
        to.add("@@ -" + shown(first.before.begin.line - context, context + lines_of(&change::before) + rest));
        to.add(" +" + shown(first.after.begin.line - context, context + lines_of(&change::after) + rest) + " @@\n");
        show_changes(to, shown_to);
        to.add_lines(" ", before.substr(last.before.end.byte, end.at().byte - last.before.end.byte));
    }

private:
    std::size_t lines_of(range change::*side) const {
        return (last.*side).end.line - (first.*side).begin.line;
    }
    void show_changes(piecewise &to, std::size_t shown_to) const {
        auto show_change = [&](const change &each) {
            to.add_lines(" ", before.substr(shown_to, each.before.begin.byte - shown_to));
            to.add_lines("-", each.before.of(before));
            to.add_lines("+", each.after.of(after));
            shown_to = each.before.end.byte;
        };
        std::for_each(kept.begin(), kept.end(), show_change);
        for (comparison again(before, after, kept.back()); shown_to < last.before.end.byte;)
            show_change(*again.next());
    }

    std::string_view before;
    std::string_view after;
    change first;
    change last;
    std::vector<change> kept; /* the first of them */
};

} // namespace

std::vector<line_change> changed_lines(std::string_view before, std::string_view after) {
    comparison both(before, after);
    std::vector<line_change> all;
    while (std::optional<change> each = both.next())
        all.push_back({each->before.begin.byte, each->before.end.byte, each->after.of(after)});
    return all;
}

void unified_diff(std::string_view old_name, std::string_view new_name, std::string_view before, std::string_view after,
                  const piece_sink &to) {
    if (before == after)
        return;
    piecewise pieces(to);
    pieces.add("--- " + std::string(old_name) + "\n+++ " + std::string(new_name) + "\n");
    comparison both(before, after);
    for (std::optional<change> next = both.next(); next;) {
        hunk one(before, after, *next);
        do
            next = both.next();
        while (next && one.add(*next));
        one.show(pieces);
    }
    pieces.flush();
}

} // namespace text
