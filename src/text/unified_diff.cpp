/* unified_diff.cpp: what changed in a text, line by line. */

#include "text/unified_diff.h"

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <utility>
#include <vector>

namespace text {

namespace {

constexpr std::size_t CONTEXT = 3; /* lines shown before and after a change */
constexpr std::size_t WINDOW = 64; /* how many lines ahead to look for a line that both texts have */

/* The lines of a text, with their newlines. There may be very many, so only 32 bits of each offset are kept. */
class line_list {
public:
    explicit line_list(std::string_view whole) : text(whole) {
        begins.reserve(static_cast<std::size_t>(std::count(text.begin(), text.end(), '\n')) + 1);
        for (std::size_t begin = 0, next = 0; begin < text.size(); begin = next) {
            while (carries.size() < std::uint64_t{begin} >> BITS)
                carries.push_back(begins.size());
            begins.push_back(static_cast<std::uint32_t>(begin));
            next = std::min(text.find('\n', begin), text.size() - 1) + 1;
        }
    }

    std::size_t size() const {
        return begins.size();
    }
    /* Where a line begins; the text's end for the line after the last one. */
    std::size_t begin_of(std::size_t line) const {
        if (line == begins.size())
            return text.size();
        auto carried = std::upper_bound(carries.begin(), carries.end(), line) - carries.begin();
        return static_cast<std::size_t>((static_cast<std::uint64_t>(carried) << BITS) + begins[line]);
    }
    std::string_view operator[](std::size_t line) const {
        std::size_t begin = begin_of(line);
        return text.substr(begin, begin_of(line + 1) - begin);
    }

private:
    static constexpr int BITS = 32;

    std::string_view text;
    std::vector<std::uint32_t> begins;
    std::vector<std::size_t> carries; /* the first lines that begin at or after each multiple of 4 GiB */
};

/* A range of lines in both texts; the end is the line after the last. */
struct range {
    std::size_t begin;
    std::size_t end;
};
struct change {
    range before;
    range after;
};

struct comparison {
    line_list before;
    line_list after;

    bool is_same(std::size_t i, std::size_t j) const {
        return i < before.size() && j < after.size() && before[i] == after[j];
    }
    /* How many lines of each text are changed here, where they differ. */
    std::pair<std::size_t, std::size_t> changed(std::size_t i, std::size_t j) const {
        if (i == before.size() || j == after.size())
            return {before.size() - i, after.size() - j};
        for (std::size_t lines = 1; lines <= WINDOW; ++lines)
            for (std::size_t removed = 0; removed <= lines; ++removed)
                if (is_same(i + removed, j + lines - removed))
                    return {removed, lines - removed};
        return {1, 1};
    }
    std::vector<change> changes() const {
        std::vector<change> all;
        std::size_t i = 0;
        std::size_t j = 0;
        while (i < before.size() || j < after.size()) {
            if (is_same(i, j)) {
                ++i;
                ++j;
                continue;
            }
            auto [removed, added] = changed(i, j);
            if (all.empty() || all.back().before.end < i)
                all.push_back({{i, i}, {j, j}});
            i = all.back().before.end = i + removed;
            j = all.back().after.end = j + added;
        }
        return all;
    }
};

void add_lines(std::string &to, char mark, const line_list &lines, range shown) {
    for (std::size_t at = shown.begin; at < shown.end; ++at) {
        to.append(1, mark).append(lines[at]);
        if (!lines[at].ends_with('\n'))
            to += "\n\\ No newline at end of file\n";
    }
}

/* "12,3": the first line and how many; before an empty range, the line in front of it. */
std::string shown(range lines) {
    std::size_t count = lines.end - lines.begin;
    std::string text = std::to_string(lines.begin + (count == 0 ? 0 : 1));
    return count == 1 ? text : text + "," + std::to_string(count);
}

/* Changes that share their context. */
void add_hunk(std::string &to, const comparison &both, const change *first, const change *last) {
    std::size_t context = std::min(CONTEXT, first->before.begin);
    std::size_t rest = std::min(CONTEXT, both.before.size() - last->before.end);
    range before = {first->before.begin - context, last->before.end + rest};
    range after = {first->after.begin - context, last->after.end + rest};
    to += "@@ -" + shown(before) + " +" + shown(after) + " @@\n";
    std::size_t at = before.begin;
    for (const change *each = first; each <= last; ++each) {
        add_lines(to, ' ', both.before, {at, each->before.begin});
        add_lines(to, '-', both.before, each->before);
        add_lines(to, '+', both.after, each->after);
        at = each->before.end;
    }
    add_lines(to, ' ', both.before, {at, before.end});
}

} // namespace

std::vector<line_change> changed_lines(std::string_view before, std::string_view after) {
    comparison both = {line_list(before), line_list(after)};
    std::vector<line_change> all;
    for (const change &each : both.changes()) {
        std::size_t begin = both.after.begin_of(each.after.begin);
        std::size_t end = both.after.begin_of(each.after.end);
        all.push_back({both.before.begin_of(each.before.begin), both.before.begin_of(each.before.end),
                       after.substr(begin, end - begin)});
    }
    return all;
}

std::string unified_diff(std::string_view old_name, std::string_view new_name, std::string_view before,
                         std::string_view after) {
    comparison both = {line_list(before), line_list(after)};
    std::vector<change> changes = both.changes();
    if (changes.empty())
        return {};
    std::string text = "--- " + std::string(old_name) + "\n+++ " + std::string(new_name) + "\n";
    for (std::size_t first = 0, next = 0; first < changes.size(); first = next) {
        next = first + 1;
        while (next < changes.size() && changes[next].before.begin - changes[next - 1].before.end <= 2 * CONTEXT)
            ++next;
        add_hunk(text, both, &changes[first], &changes[next - 1]);
    }
    return text;
}

} // namespace text
