/* edits.cpp: changes of a source. */

#include "check/edits.h"

#include <algorithm>
#include <iterator>
#include <set>
#include <tuple>
#include <utility>

namespace check {

namespace {

using place_in_file = std::pair<int, size_t>; /* line, column */

place_in_file begin_of(const edit &each) {
    return {each.line, each.column};
}

/* The place after the bytes that are removed. Only the last of them may be a newline. */
place_in_file end_of(const edit &each) {
    if (each.removed.ends_with('\n'))
        return {each.line + 1, 1};
    return {each.line, each.column + each.removed.size()};
}

bool comes_first(const edit &a, const edit &b) {
    return begin_of(a) < begin_of(b);
}

/* The parts that have been changed so far, by their beginnings. */
using changed_places = std::set<std::pair<place_in_file, place_in_file>>;

/* Insertions at the same place are not compatible either, because their order would be unknown. */
bool is_free(const changed_places &changed, const edit &each) {
    auto next = changed.lower_bound({begin_of(each), begin_of(each)});
    bool free_after = next == changed.end() || (end_of(each) <= next->first && begin_of(each) < next->first);
    return free_after && (next == changed.begin() || std::prev(next)->second <= begin_of(each));
}

/* A line of a text. Its next lines are found one by one, because a list of all would take more memory than they do. */
class line_finder {
public:
    explicit line_finder(std::string_view source) : text(source) {}

    /* Moves forward to a line; false if the text has no such line. */
    bool go_to(int wanted) {
        for (; line < wanted; ++line) {
            size_t newline = text.find('\n', begin);
            if (newline == std::string_view::npos)
                return false;
            begin = newline + 1;
        }
        return line == wanted;
    }

    size_t begin = 0;

private:
    std::string_view text;
    int line = 1;
};

std::vector<const edit *> in_order(std::span<const correction> all) {
    std::vector<const edit *> edits;
    for (const correction &each : all)
        for (const edit &one : each.edits)
            edits.push_back(&one);
    std::stable_sort(edits.begin(), edits.end(), [](const edit *a, const edit *b) { return comes_first(*a, *b); });
    return edits;
}

} // namespace

void add(correction &to, correction more) {
    if (more.edits.empty())
        return;
    to.sure = to.edits.empty() ? more.sure : std::min(to.sure, more.sure);
    std::move(more.edits.begin(), more.edits.end(), std::back_inserter(to.edits));
    std::stable_sort(to.edits.begin(), to.edits.end(), comes_first);
    auto same = [](const edit &a, const edit &b) {
        return begin_of(a) == begin_of(b) && a.removed == b.removed && a.text == b.text;
    };
    to.edits.erase(std::unique(to.edits.begin(), to.edits.end(), same), to.edits.end());
}

std::vector<correction> compatible(std::vector<correction> all) {
    changed_places changed;
    std::erase_if(all, [&](const correction &each) {
        bool free =
            std::all_of(each.edits.begin(), each.edits.end(), [&](const edit &one) { return is_free(changed, one); });
        for (const edit &one : each.edits)
            if (free)
                changed.insert({begin_of(one), end_of(one)});
        return !free || each.edits.empty();
    });
    return all;
}

std::optional<std::string> corrected(std::string_view source, std::span<const correction> all) {
    line_finder line(source);
    std::string made;
    made.reserve(source.size() + source.size() / 8);
    size_t taken = 0;
    for (const edit *each : in_order(all)) {
        if (!line.go_to(each->line) || each->column > source.size() - line.begin + 1)
            return std::nullopt;
        size_t begin = line.begin + each->column - 1;
        if (begin < taken || source.substr(begin, each->removed.size()) != each->removed)
            return std::nullopt;
        made.append(source.substr(taken, begin - taken)).append(each->text);
        taken = begin + each->removed.size();
    }
    return made.append(source.substr(taken));
}

} // namespace check
