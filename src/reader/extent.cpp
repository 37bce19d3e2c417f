/* extent.cpp: a table that references lead into, and which of its bytes have an owner. */

#include "reader/extent.h"

namespace cdb {

extent::extent(const bytes &covered, std::size_t file_offset)
    : area(covered), offset(file_offset), texts_end(covered.size()), marks(units(covered.size())) {
    while (texts_end > 0 && area.raw()[texts_end - 1] != std::byte{0})
        --texts_end;
}

extent::claim_result extent::claim(std::size_t at, std::size_t length) {
    std::size_t first = at / UNIT;
    std::uint8_t mark = TAKEN | BEGINS;
    for (std::size_t unit = first; unit < first + units(length); ++unit) {
        if ((marks[unit] & TAKEN) != 0)
            return unit == first && (marks[unit] & BEGINS) != 0 ? claim_result::AGAIN : claim_result::OVERLAPS;
        marks[unit] |= mark;
        mark = TAKEN;
    }
    return claim_result::FIRST;
}

/* True if one of eight bytes is zero. If none is, subtracting 1 from each byte sets no highest bit that was clear
 * before. */
static bool has_zero(const std::byte *unit) {
    constexpr std::uint64_t ONES = 0x0101010101010101;
    std::uint64_t word = 0;
    static_assert(sizeof word == extent::UNIT);
    std::memcpy(&word, unit, sizeof word);
    return ((word - ONES) & ~word & (ONES << 7)) != 0;
}

extent::text_claim extent::claim_text(std::size_t at, std::size_t end) {
    std::uint8_t mark = TAKEN | BEGINS;
    for (std::size_t place = at; place < end; place += UNIT) {
        if (is_taken(place))
            return {place - at, false};
        marks[place / UNIT] |= mark;
        mark = TAKEN;
        std::size_t size = std::min(UNIT, end - place);
        if (size == UNIT && !has_zero(area.raw().data() + place))
            continue;
        std::size_t length = area.part(place, size).text(std::size_t{0}).size();
        if (length < size)
            return {place + length + 1 - at, true};
    }
    return {end - at, false};
}

std::size_t extent::next_text(std::size_t at) const {
    auto from = marks.begin() + static_cast<std::ptrdiff_t>(units(at));
    auto found = std::find_if(from, marks.end(), [](std::uint8_t mark) { return (mark & TEXT) != 0; });
    return std::min(static_cast<std::size_t>(found - marks.begin()) * UNIT, area.size());
}

} // namespace cdb
