/* number_lines.cpp: an open hash table of numbers. */

#include "check/number_lines.h"

#include <algorithm>
#include <cstdint>
#include <utility>

namespace check {

/* The slot where the search for a number begins. Numbers mostly ascend, so the slots of eight of them are close
 * together. If the slots of more were adjacent, the search for a missing number would take long. */
size_t number_lines::home_of(vx_uint32_t number) const {
    constexpr unsigned NEAR_BITS = 3;
    const vx_uint32_t group = number >> NEAR_BITS;
    std::uint64_t hash = text::hash_of({reinterpret_cast<const char *>(&group), sizeof group}, key);
    return ((static_cast<size_t>(hash) << NEAR_BITS) | (number & ((1u << NEAR_BITS) - 1))) & (slots.size() - 1);
}

/* Where the number is, or where it belongs. */
size_t number_lines::slot_of(vx_uint32_t number) const {
    size_t mask = slots.size() - 1;
    size_t at = home_of(number);
    while (slots[at].line != 0 && slots[at].number != number)
        at = (at + 1) & mask;
    return at;
}

void number_lines::grow() {
    std::vector<slot> old(std::max(FEWEST_SLOTS, 2 * slots.size()), slot{0, 0});
    std::swap(old, slots);
    for (const slot &each : old)
        if (each.line != 0)
            slots[slot_of(each.number)] = each;
}

int number_lines::add(vx_uint32_t number, int line) {
    if (2 * count >= slots.size())
        grow();
    slot &found = slots[slot_of(number)];
    if (found.line != 0)
        return found.line;
    found = {number, line};
    ++count;
    return 0;
}

int number_lines::find(vx_uint32_t number) const {
    return slots.empty() ? 0 : slots[slot_of(number)].line;
}

size_t number_lines::probes_for(vx_uint32_t number) const {
    return ((slot_of(number) - home_of(number)) & (slots.size() - 1)) + 1;
}

/* The time that this takes is proportional to the numbers, not to the most that there ever were. */
void number_lines::clear() {
    if (count == 0)
        return;
    bool sparse = slots.size() > FEWEST_SLOTS * count;
    slots.assign(sparse ? 0 : slots.size(), slot{0, 0});
    if (sparse)
        slots.shrink_to_fit();
    count = 0;
}

} // namespace check
