/* current_line.cpp: the line of the source that is being checked, and the places in it. */

#include "check/current_line.h"

#include "language/limits.h"

#include <algorithm>
#include <functional>

namespace check {

namespace {

bool is_within(const char *p, const char *begin, const char *end) {
    return std::greater_equal<>()(p, begin) && std::less<>()(p, end);
}

} // namespace

void current_line::read(const source_line &source, int line_number) {
    raw.assign(source.begin, source.end);
    number = line_number;
    continues = fills_piece;
    fills_piece = raw.size() == LINE_MAX_CHARS;
}

void current_line::end_source() {
    text = {};
    ended = true;
}

attr_text current_line::replaced(std::string_view by, size_t added) {
    size_t length = std::min(by.size(), copy.size() - 1);
    std::copy_n(by.begin(), length, copy.begin());
    copy[length] = '\0';
    copy_added = added;
    size_t blanks = std::min(std::string_view(copy.data(), length).find_first_not_of(" \t"), length);
    return {copy.data(), copy.data() + blanks, copy.data() + length};
}

size_t current_line::column_of(const char *in_text) const {
    if (is_within(in_text, copy.data(), copy.data() + copy.size()))
        return static_cast<size_t>(in_text - copy.data()) - copy_added + 1;
    return static_cast<size_t>(in_text - text.line) + 1;
}

place current_line::all() const {
    return {number, column_of(text.name), whole().size()};
}

place current_line::part_of(const attr_place &attr, size_t offset, size_t length) const {
    return {number, column_of(attr.value) + offset, length};
}

place current_line::marked(mark_kind kind, const attr_place &attr, const char *item) const {
    if (kind == mark_kind::none || text.end == nullptr)
        return none();
    place line = all();
    size_t after = line.column - 1 + line.length;
    size_t equals = raw.find('=', line.column - 1);
    bool split = equals != std::string::npos && equals < after;
    if (kind == mark_kind::text || !split)
        return line;
    if (kind == mark_kind::name)
        return {number, line.column, equals - (line.column - 1)};
    if (kind == mark_kind::item && item != nullptr && is_within(item, text.line, text.end))
        return {number, column_of(item), std::string_view(item).size()};
    if (attr.attr != nullptr && attr.length > 0)
        return part_of(attr, 0, attr.length);
    return {number, equals + 2, after - (equals + 1)};
}

} // namespace check
