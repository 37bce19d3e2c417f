/* cdef_check_lines.cpp: texts, and the lines that gave them first. */

#include "cdef_check_session.h"

#include <algorithm>

namespace cdef::check {

static unsigned tag_of(size_t hash) {
    return static_cast<unsigned>(hash >> 32);
}

size_t first_lines::slot_of(std::string_view text, size_t hash) const {
    size_t mask = slots.size() - 1;
    size_t at = hash & mask;
    for (; slots[at].position != 0; at = (at + 1) & mask)
        if (slots[at].tag == tag_of(hash) && text_of(entries[slots[at].position - 1]) == text)
            break;
    return at;
}

void first_lines::grow() {
    constexpr size_t FEWEST = 64;
    size_t size = std::max(FEWEST, 2 * slots.size());
    slots.assign(size, {0, 0});
    for (size_t i = 0; i < entries.size(); ++i) {
        size_t at = entries[i].hash & (size - 1);
        while (slots[at].position != 0)
            at = (at + 1) & (size - 1);
        slots[at] = {tag_of(entries[i].hash), static_cast<unsigned>(i + 1)};
    }
}

int &first_lines::of(std::string_view text, size_t hash) {
    if (2 * entries.size() >= slots.size())
        grow();
    slot &found = slots[slot_of(text, hash)];
    if (found.position == 0) {
        entries.push_back({hash, texts.size(), text.size(), 0});
        texts += text;
        found = {tag_of(hash), static_cast<unsigned>(entries.size())};
    }
    return entries[found.position - 1].line;
}

bool first_lines::has(std::string_view text) const {
    return !slots.empty() && slots[slot_of(text, std::hash<std::string_view>()(text))].position != 0;
}

name_list first_lines::all() const {
    name_list names;
    for (const entry &each : entries)
        names.push_back(text_of(each));
    return names;
}

void first_lines::clear() {
    if (entries.empty())
        return;
    texts.clear();
    entries.clear();
    std::fill(slots.begin(), slots.end(), slot{0, 0});
}

} // namespace cdef::check
