/* format.cpp: formats a source, and compiles the result to compare it with the source. */

#include "formatter/format.h"

#include "formatter/layout.h"
#include "formatter/order.h"
#include "formatter/same.h"

#include <algorithm>
#include <utility>

namespace formatter {

namespace {

/* Whether a byte is inside a UTF-8 character. */
bool is_inside(std::string_view text, std::size_t at) {
    return at < text.size() && (static_cast<unsigned char>(text[at]) & 0xC0) == 0x80;
}

/* The bytes that differ, without cutting a character in two. */
change difference(std::size_t begin, std::string_view before, std::string_view after) {
    std::size_t shorter = std::min(before.size(), after.size());
    auto same = static_cast<std::size_t>(
        std::mismatch(before.begin(), before.begin() + static_cast<std::ptrdiff_t>(shorter), after.begin()).first -
        before.begin());
    while (same > 0 && (is_inside(before, same) || is_inside(after, same)))
        --same;
    std::size_t tail = 0;
    while (tail < shorter - same && before[before.size() - tail - 1] == after[after.size() - tail - 1])
        ++tail;
    while (tail > 0 && (is_inside(before, before.size() - tail) || is_inside(after, after.size() - tail)))
        --tail;
    return {begin + same, before.size() - tail - same, std::string(after.substr(same, after.size() - tail - same))};
}

/* Compares rows with the lines of the source. */
class comparison {
public:
    comparison(std::string_view whole, std::span<const line> in) : source(whole), lines(in) {}

    /* Rows change places only with rows next to them, so that the changes are small. */
    std::vector<change> changes(std::span<const row> rows) {
        std::vector<change> found;
        std::size_t begin = 0;
        std::size_t end = 0; /* of the lines that the rows so far have been */
        for (std::size_t i = 0; i < rows.size(); ++i) {
            end = std::max(end, rows[i].line + 1);
            if (end != i + 1)
                continue;
            std::string_view before = source.substr(start_of(begin), start_of(end) - start_of(begin));
            std::string after = text_of(rows.subspan(begin, end - begin), end == rows.size());
            if (before != after)
                found.push_back(difference(start_of(begin), before, after));
            begin = end;
        }
        if (!rows.empty() && lacks_newline(rows.back()))
            found.push_back({source.size(), 0, "\n"});
        return found;
    }

    /* The offset of a line, and that of the end. */
    std::size_t start_of(std::size_t index) const {
        return index < lines.size() ? static_cast<std::size_t>(lines[index].whole.data() - source.data())
                                    : source.size();
    }

private:
    /* Whether this is the last row, and gets a newline. It gets none if it is so long that the compiler would read a
     * newline as another line. */
    bool lacks_newline(const row &last) const {
        return !last.removed && !source.ends_with('\n') && is_short(lines[last.line].whole);
    }

    /* The last row has no newline if the source has none. */
    std::string text_of(std::span<const row> rows, bool last) const {
        std::string text;
        for (const row &each : rows) {
            if (each.removed)
                continue;
            bool ended = !last || &each != &rows.back() || source.ends_with('\n');
            text.append(each.after_empty ? "\n" : "").append(each.text).append(ended ? "\n" : "");
        }
        return text;
    }

    std::string_view source;
    std::span<const line> lines;
};

std::string with_changes(std::string_view source, const std::vector<change> &changes) {
    std::string text;
    std::size_t taken = 0;
    for (const change &each : changes) {
        text.append(source.substr(taken, each.begin - taken)).append(each.text);
        taken = each.begin + each.size;
    }
    return text.append(source.substr(taken));
}

std::vector<change> changes_of(std::string_view source, const options &how) {
    std::vector<line> lines = lines_of(source);
    std::vector<row> rows = layout_of(lines);
    if (how.reorder)
        put_in_order(rows, lines, first_overflow(source));
    comparison compared(source, lines);
    std::vector<change> changes = compared.changes(rows);
    if (how.only) {
        std::size_t begin = compared.start_of(how.only->first);
        std::size_t end = compared.start_of(std::min(how.only->last, lines.size()) + 1);
        std::erase_if(changes, [&](const change &each) {
            bool after = each.begin >= end && end < source.size();
            return each.begin < begin || after || each.begin + each.size > end;
        });
    }
    return changes;
}

formatted left_alone(std::string_view source, std::string why, std::optional<check::finding> error) {
    return {.text = std::string(source), .changes = {}, .error = std::move(error), .refusal = std::move(why)};
}

} // namespace

formatted format(std::string_view source, const std::string &name, const options &how) {
    compiled before = compile(source, name);
    if (before.error)
        return left_alone(source, "it has errors", std::move(before.error));
    formatted result;
    result.changes = changes_of(source, how);
    result.text = with_changes(source, result.changes);
    if (!result.changes.empty() && !is_same(before, compile(result.text, name)))
        return left_alone(source, "formatting it would change the database", std::nullopt);
    return result;
}

} // namespace formatter
