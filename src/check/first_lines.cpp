/* first_lines.cpp: an open hash table of texts. */

#include "check/first_lines.h"

#include <algorithm>

namespace check {

size_t first_lines::slot_of(std::string_view text, unsigned hash) const {
    mark wanted = mark_of(hash);
    size_t at = home_of(hash);
    for (; marks[at] != 0; at = after(at))
        if (marks[at] == wanted && texts[positions[at]] == text)
            break;
    return at;
}

/* To need little memory, it frees the old slots first, and if they are many, makes only half as many more. */
void first_lines::grow() {
    size_t more = marks.size() < MANY_SLOTS ? marks.size() : marks.size() / 2;
    size_t wanted = std::max(FEWEST_SLOTS, marks.size() + more);
    marks = std::vector<mark>();
    positions = std::vector<unsigned>();
    marks.resize(wanted);
    positions.resize(wanted);
    for (size_t i = 0; i < texts.size(); ++i) {
        unsigned hash = hash_of(texts[i]);
        size_t at = home_of(hash);
        while (marks[at] != 0)
            at = after(at);
        marks[at] = mark_of(hash);
        positions[at] = static_cast<unsigned>(i);
    }
}

int &first_lines::line_of(std::string_view text) {
    if (4 * texts.size() >= 3 * marks.size())
        grow();
    unsigned hash = hash_of(text);
    size_t at = slot_of(text, hash);
    if (marks[at] == 0) {
        texts.add(text);
        lines.push_back(0);
        positions[at] = static_cast<unsigned>(texts.size() - 1);
        marks[at] = mark_of(hash);
    }
    return lines[positions[at]];
}

int first_lines::find(std::string_view text) const {
    if (marks.empty())
        return 0;
    size_t at = slot_of(text, hash_of(text));
    return marks[at] == 0 ? 0 : lines[positions[at]];
}

std::vector<std::string_view> first_lines::all() const {
    std::vector<std::string_view> names;
    names.reserve(texts.size());
    for (size_t i = 0; i < texts.size(); ++i)
        names.push_back(texts[i]);
    return names;
}

size_t first_lines::probes_for(std::string_view text) const {
    unsigned hash = hash_of(text);
    size_t passed = slot_of(text, hash) + marks.size() - home_of(hash);
    return passed % marks.size() + 1;
}

/* The time that this takes is proportional to the texts, not to the most that there ever were. */
void first_lines::clear() {
    if (texts.size() == 0)
        return;
    if (marks.size() > FEWEST_SLOTS * texts.size()) {
        marks = std::vector<mark>();
        positions = std::vector<unsigned>();
    }
    std::fill(marks.begin(), marks.end(), mark{0});
    texts.clear();
    lines.clear();
}

} // namespace check
