/* early_lines.cpp: optional attributes that come before a required one, and how to move them after it. */

#include "check/early_lines.h"

#include <utility>

namespace check {

void early_lines::move(const current_line &line) {
    moved.edits.push_back(line.removed());
    text += moved.edits.back().removed;
}

correction early_lines::after(const current_line &line) {
    moved.sure = certainty::certain;
    moved.edits.push_back(line.followed_by(std::move(text)));
    return std::move(moved);
}

} // namespace check
