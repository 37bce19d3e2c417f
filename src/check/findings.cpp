/* findings.cpp: keeps findings until they can be passed on in order. */

#include "check/findings.h"

#include <algorithm>
#include <iterator>
#include <tuple>
#include <utility>

namespace check {

namespace {

size_t parts_of(const finding &each) {
    return each.notes.size() + each.fix.edits.size();
}

} // namespace

finding &findings::add(entry &&added) {
    make_room();
    waiting.push_back(std::move(added));
    return waiting.back().found;
}

finding &findings::error(const message &known, const place &at, std::string_view source, std::string text) {
    ++count.errors;
    finding found = {.error = true,
                     .code = known.code,
                     .name = "error",
                     .text = std::move(text),
                     .at = at,
                     .source = std::string(source),
                     .notes = {}};
    return add({std::move(found), WARNING_COUNT});
}

finding &findings::warn(const warning &known, const place &at, std::string_view source, std::string text, note more) {
    ++count.warnings;
    finding found = {.error = false,
                     .code = known.code,
                     .name = known.name,
                     .text = std::move(text),
                     .at = at,
                     .source = std::string(source),
                     .notes = {}};
    if (!more.text.empty())
        found.notes.push_back(std::move(more));
    return add({std::move(found), known.id});
}

void findings::retract(warning_id id, int line) {
    for (entry &each : waiting) {
        if (each.id != id || each.found.at.line != line || each.retracted)
            continue;
        each.retracted = true;
        --count.warnings;
    }
}

void findings::correct(message_id id, int line, const std::function<correction()> &fix) {
    auto found = std::find_if(waiting.begin(), waiting.end(), [&](const entry &each) {
        return each.id == WARNING_COUNT && each.found.at.line == line && each.found.code == message_of(id).code;
    });
    if (found == waiting.end())
        return;
    found->found.fix = fix();
    if (std::next(found) != waiting.end())
        parts += found->found.fix.edits.size();
}

/* Sorts their positions first, because it takes long to move a finding. */
void findings::sort() {
    struct position {
        int line;
        bool is_warning;
        size_t index; /* among the waiting ones: equal findings stay in their order */
    };
    auto before = [](const position &a, const position &b) {
        return std::tie(a.line, a.is_warning, a.index) < std::tie(b.line, b.is_warning, b.index);
    };
    std::vector<position> order;
    order.reserve(waiting.size());
    for (const entry &each : waiting)
        order.push_back({each.found.at.line, !each.found.error, order.size()});
    if (std::is_sorted(order.begin(), order.end(), before))
        return;
    std::sort(order.begin(), order.end(), before);
    std::vector<entry> sorted;
    sorted.reserve(waiting.size());
    for (const position &each : order)
        sorted.push_back(std::move(waiting[each.index]));
    waiting = std::move(sorted);
}

void findings::hand_over(entry &each) {
    if (!each.retracted)
        to(std::move(each.found));
}

/* If too many findings are kept, or their notes and edits are too many, passes on half of them. */
void findings::make_room() {
    if (!waiting.empty())
        parts += parts_of(waiting.back().found);
    if (waiting.size() < room && parts < parts_room)
        return;
    pass_on_first_half();
    parts = 0;
    for (const entry &each : waiting)
        parts += parts_of(each.found);
    room = std::max(WAITING_MAX, 2 * waiting.size());
    parts_room = std::max(PARTS_MAX, 2 * parts);
}

/* Those of the first lines. */
void findings::pass_on_first_half() {
    sort();
    std::vector<entry> kept;
    kept.reserve(waiting.size());
    for (size_t i = 0; i < waiting.size(); ++i) {
        entry &each = waiting[i];
        bool is_open = each.id != WARNING_COUNT && !each.retracted && may_retract(each.id, each.found.at.line);
        if (is_open || i >= waiting.size() / 2)
            kept.push_back(std::move(each));
        else
            hand_over(each);
    }
    waiting = std::move(kept);
}

totals findings::close() {
    sort();
    for (entry &each : waiting)
        hand_over(each);
    waiting.clear();
    return count;
}

} // namespace check
