/* first_lines.cpp: an open hash table of texts. */

#include "check/first_lines.h"

#include <algorithm>
#include <utility>

namespace check {

size_t first_lines::slot_of(std::string_view text, unsigned tag) const {
    size_t mask = slots.size() - 1;
    size_t at = tag & mask;
    for (; slots[at].position != 0; at = (at + 1) & mask)
        if (slots[at].tag == tag && text_of(slots[at].position) == text)
            break;
    return at;
}

void first_lines::grow() {
    std::vector<slot> old(std::max(FEWEST_SLOTS, 2 * slots.size()), slot{0, 0});
    std::swap(old, slots);
    size_t mask = slots.size() - 1;
    for (const slot &each : old) {
        size_t at = each.tag & mask;
        while (each.position != 0 && slots[at].position != 0)
            at = (at + 1) & mask;
        if (each.position != 0)
            slots[at] = each;
    }
}

int &first_lines::line_of(std::string_view text, unsigned tag) {
    if (2 * entries.size() >= slots.size())
        grow();
    slot &found = slots[slot_of(text, tag)];
    if (found.position == 0) {
        entries.push_back({texts.size(), 0});
        texts += text;
        found = {tag, static_cast<unsigned>(entries.size())};
    }
    return entries[found.position - 1].line;
}

int first_lines::find(std::string_view text, unsigned tag) const {
    size_t position = slots.empty() ? 0 : slots[slot_of(text, tag)].position;
    return position == 0 ? 0 : entries[position - 1].line;
}

std::vector<std::string_view> first_lines::all() const {
    std::vector<std::string_view> names;
    names.reserve(entries.size());
    for (size_t position = 1; position <= entries.size(); ++position)
        names.push_back(text_of(position));
    return names;
}

/* The time that this takes is proportional to the texts, not to the most that there ever were. */
void first_lines::clear() {
    if (entries.empty())
        return;
    bool sparse = slots.size() > FEWEST_SLOTS * entries.size();
    slots.assign(sparse ? 0 : slots.size(), slot{0, 0});
    if (sparse)
        slots.shrink_to_fit();
    texts.clear();
    entries.clear();
}

} // namespace check
