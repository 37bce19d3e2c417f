/* findings.cpp: what has been found so far. */

#include "check/findings.h"

#include <algorithm>
#include <utility>

namespace check {

finding &findings::error(const message &known, const place &at, std::string_view source, std::string text) {
    ++count.errors;
    entries.push_back({{.error = true,
                        .code = known.code,
                        .name = "error",
                        .text = std::move(text),
                        .at = at,
                        .source = std::string(source),
                        .notes = {}}});
    return entries.back().found;
}

finding &findings::warn(const warning &known, const place &at, std::string_view source, std::string text, note more) {
    ++count.warnings;
    of_warning[known.id].push_back(entries.size());
    entries.push_back({{.error = false,
                        .code = known.code,
                        .name = known.name,
                        .text = std::move(text),
                        .at = at,
                        .source = std::string(source),
                        .notes = {}}});
    if (!more.text.empty())
        entries.back().found.notes.push_back(std::move(more));
    return entries.back().found;
}

void findings::retract(warning_id id, int line) {
    const std::vector<size_t> &positions = of_warning[id];
    for (size_t left = positions.size(); left > 0; --left) {
        entry &each = entries[positions[left - 1]];
        if (each.found.at.line < line)
            return;
        if (each.found.at.line != line || each.retracted)
            continue;
        each.retracted = true;
        --count.warnings;
    }
}

totals findings::hand_over(const sink &to) {
    std::erase_if(entries, [](const entry &each) { return each.retracted; });
    std::stable_sort(entries.begin(), entries.end(), [](const entry &a, const entry &b) {
        return std::pair(a.found.at.line, !a.found.error) < std::pair(b.found.at.line, !b.found.error);
    });
    for (entry &each : entries)
        to(std::move(each.found));
    return count;
}

} // namespace check
