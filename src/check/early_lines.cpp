/* early_lines.cpp: optional attributes that come before a required one, and how to move them after it. */

#include "check/early_lines.h"

#include <string_view>
#include <utility>

namespace check {

void early_lines::close() {
    first = 0;
    text.clear();
    lines.clear();
}

void early_lines::move(const current_line &line) {
    if (lines.size() == MOVED_MAX)
        return close();
    edit removal = line.removed();
    lines.push_back(removal.line);
    text += removal.removed;
}

correction early_lines::after(const current_line &line) {
    correction moved = {certainty::certain, {}};
    moved.edits.reserve(lines.size() + 1);
    std::string_view rest = text;
    for (int number : lines) {
        size_t length = rest.find('\n') + 1;
        moved.edits.push_back({number, 1, 1, std::string(rest.substr(0, length)), {}});
        rest.remove_prefix(length);
    }
    moved.edits.push_back(line.followed_by(std::move(text)));
    return moved;
}

} // namespace check
