/* positions.cpp: positions as the protocol counts them. */

#include "server/positions.h"

#include "text/utf8.h"

#include <algorithm>
#include <iterator>

namespace lsp {

namespace {

/* Whether this byte ends a line. A carriage return before a newline does not: the newline does. */
bool ends_line(std::string_view text, std::size_t at) {
    return text[at] == '\n' || (text[at] == '\r' && (at + 1 == text.size() || text[at + 1] != '\n'));
}

void add_begins(std::vector<std::size_t> &to, std::string_view text, std::size_t from, std::size_t end) {
    for (std::size_t at = text.find_first_of("\r\n", from); at < end; at = text.find_first_of("\r\n", at + 1))
        if (ends_line(text, at))
            to.push_back(at + 1);
}

struct character {
    std::size_t bytes;
    std::size_t units;
};

/* Bytes that are not UTF-8 are read as U+FFFD. */
character first_of(std::string_view text, encoding units) {
    constexpr std::size_t REPLACEMENT_BYTES = 3;
    constexpr std::size_t ASTRAL_BYTES = 4;
    if (static_cast<unsigned char>(text.front()) < 0x80)
        return {1, 1};
    std::size_t length = text::utf8_length(text);
    if (length == 0)
        return {text::length_replaced(text), units == encoding::utf8 ? REPLACEMENT_BYTES : 1};
    if (units == encoding::utf8)
        return {length, length};
    return {length, length == ASTRAL_BYTES ? 2U : 1U};
}

} // namespace

line_table::line_table(std::string_view text) : begins{0} {
    add_begins(begins, text, 0, text.size());
}

stretch line_table::line(std::string_view text, std::size_t number) const {
    stretch part = {begins[number], number + 1 < begins.size() ? begins[number + 1] : text.size()};
    while (part.end > part.begin && (text[part.end - 1] == '\n' || text[part.end - 1] == '\r'))
        --part.end;
    return part;
}

std::size_t line_table::line_of(std::size_t offset) const {
    return static_cast<std::size_t>(std::upper_bound(begins.begin(), begins.end(), offset) - begins.begin()) - 1;
}

/* The byte before the change is examined too: it may be a carriage return that a newline now follows. */
void line_table::change(std::string_view changed, stretch replaced, std::size_t length) {
    auto first = std::lower_bound(begins.begin() + 1, begins.end(), std::max<std::size_t>(replaced.begin, 1));
    auto last = std::upper_bound(first, begins.end(), replaced.end);
    std::for_each(last, begins.end(),
                  [&](std::size_t &begin) { begin = begin - replaced.end + replaced.begin + length; });
    std::vector<std::size_t> fresh;
    std::size_t from = std::max<std::size_t>(replaced.begin, 1) - 1;
    add_begins(fresh, changed, from, replaced.begin + length);
    auto place = first - begins.begin();
    begins.erase(first, last);
    begins.insert(begins.begin() + place, fresh.begin(), fresh.end());
}

std::size_t offset_of(std::string_view text, const line_table &lines, const position &at, encoding units) {
    if (at.line >= lines.count())
        return text.size();
    stretch line = lines.line(text, at.line);
    std::size_t offset = line.begin;
    for (std::size_t passed = 0; offset < line.end;) {
        character next = first_of(text.substr(offset, line.end - offset), units);
        passed += next.units;
        if (passed > at.character)
            break;
        offset += next.bytes;
    }
    return offset;
}

stretch stretch_of(std::string_view text, const line_table &lines, const range &of, encoding units) {
    std::size_t begin = offset_of(text, lines, of.start, units);
    std::size_t end = offset_of(text, lines, of.end, units);
    return {std::min(begin, end), std::max(begin, end)};
}

position position_maker::at(std::size_t offset) {
    std::size_t number = lines.line_of(std::min(offset, text.size()));
    stretch line = lines.line(text, number);
    std::size_t end = std::min(offset, line.end);
    if (there.line != number || end < latest) {
        there = {number, 0};
        latest = line.begin;
    }
    while (latest < end) {
        character next = first_of(text.substr(latest, line.end - latest), units);
        if (latest + next.bytes > end)
            break;
        latest += next.bytes;
        there.character += next.units;
    }
    return there;
}

} // namespace lsp
