/* current_line.cpp: the line of the source that is being checked, and the places in it. */

#include "check/current_line.h"

#include "text/utf8.h"

#include <algorithm>
#include <cstring>
#include <functional>
#include <utility>

namespace check {

namespace {

bool is_within(const char *p, const char *begin, const char *end) {
    return std::greater_equal<>()(p, begin) && std::less<>()(p, end);
}

} // namespace

[[gnu::noinline]] void current_line::read_after_piece(int line_number) {
    characters_before = fills_piece ? characters_before + text::characters_in(raw) : 0;
    continues = fills_piece;
    if (continues)
        rests.push_back(line_number);
}

/* Many lines at a time, because copying each by itself would take longer than checking it. */
[[gnu::noinline]] void current_line::save(const char *from, const char *to) {
    size_t length = std::min(static_cast<size_t>(to - from), saved.size());
    memmove(saved.data(), from, length); /* GCC makes a slow loop of memcpy */
    saved_begin = begin = from;
    saved_end = from + length;
    saved_of = to;
    find_return();
}

/* Carriage returns are rare, so the next one is searched for once in all that is saved. */
[[gnu::noinline]] void current_line::find_return() {
    const void *found = memchr(saved.data() + (begin - saved_begin), '\r', static_cast<size_t>(saved_end - begin));
    size_t at = found == nullptr ? static_cast<size_t>(saved_end - saved_begin)
                                 : static_cast<size_t>(static_cast<const char *>(found) - saved.data());
    next_return = saved_begin + at;
}

void current_line::end_source() {
    text = {};
    ended = true;
}

attr_text current_line::replaced(std::string_view by, size_t added) {
    size_t length = std::min(by.size(), copy.size() - 1);
    std::copy_n(by.begin(), length, copy.begin());
    copy[length] = '\0';
    copy_added = static_cast<std::ptrdiff_t>(added);
    size_t blanks = std::min(std::string_view(copy.data(), length).find_first_not_of(" \t"), length);
    return {copy.data(), copy.data() + blanks, copy.data() + length};
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

/* The number of a line in the file is less by the number of rests up to it. So all rests of one line of the file have
 * the same number there, and it ascends. */
void current_line::find_in_file(place &at) const {
    if (at.line == 0)
        return;
    auto after = std::upper_bound(rests.begin(), rests.end(), at.line);
    at.file_line = at.line - static_cast<int>(after - rests.begin());
    at.file_column = at.column;
    if (at.column == 0)
        return;
    auto first = std::partition_point(rests.begin(), after, [&](const int &rest) {
        return rest - static_cast<int>(&rest - rests.data() + 1) < at.file_line;
    });
    at.file_column += static_cast<size_t>(after - first) * LINE_MAX_CHARS;
}

edit current_line::replacement(place part, std::string_view source, std::string_view by) const {
    find_in_file(part);
    size_t character = text::characters_in(source.substr(0, part.column - 1)) + 1;
    if (part.line == number)
        character += characters_before;
    return {part.file_line, part.file_column, character, std::string(source.substr(part.column - 1, part.length)),
            std::string(by)};
}

std::optional<edit> current_line::without_returns() const {
    size_t kept = raw.find_last_not_of('\r') + 1;
    if (kept == raw.size() || fills_piece)
        return std::nullopt;
    return replacement({number, kept + 1, raw.size() - kept}, raw, {});
}

edit current_line::removed() const {
    edit whole = replacement({number, 1, raw.size()}, raw, {});
    whole.removed += '\n';
    return whole;
}

edit current_line::followed_by(std::string lines) const {
    edit added = replacement({number, 1, 0}, raw, {});
    if (has_newline) {
        ++added.line;
    } else {
        added = replacement({number, raw.size() + 1, 0}, raw, {});
        lines.insert(0, "\n").pop_back();
    }
    added.text = std::move(lines);
    return added;
}

correction current_line::renamed(const place &part, std::string_view source, const language::guess &meant) const {
    if (meant.name().empty() || std::binary_search(rests.begin(), rests.end(), part.line))
        return {};
    return {meant.is_certain() ? certainty::certain : certainty::likely, {replacement(part, source, meant.name())}};
}

} // namespace check
